// The indication MI of a provider: the entries of its function table.
#ifndef CPTA_CMPI_CMPI_INDICATION_MI_H
#define CPTA_CMPI_CMPI_INDICATION_MI_H

#include <cmpift.h>

#include "cmpi/Provider_Status.h"

namespace CPTA {

class CMPI_Adapter;

// Sets every entry of the table but cleanup (cmpi/CMPI_MI_Factory.h).
void set_indication_entries(CMPIIndicationMIFT& ft);

// Tells the provider to stop its indications when they are enabled, as
// disableIndications does. The caller holds the adapter's mutex, or no
// request of the provider runs (the adapter's last cleanup, which calls it
// before the provider is unloaded: no delivery may outlive the adapter it
// goes through). A delivery waiting for the mutex meanwhile gives up, so the
// provider may join its delivering thread.
Disable_Indications_Status stop_indications(CMPI_Adapter* adapter);

}  // namespace CPTA

#endif
