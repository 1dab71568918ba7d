// The instance MI of a provider: the entries of its function table.
#ifndef CPTA_CMPI_CMPI_INSTANCE_MI_H
#define CPTA_CMPI_CMPI_INSTANCE_MI_H

#include <cmpift.h>

namespace CPTA {

// Sets every entry of the table but cleanup (cmpi/CMPI_MI_Factory.h).
void set_instance_entries(CMPIInstanceMIFT& ft);

}  // namespace CPTA

#endif
