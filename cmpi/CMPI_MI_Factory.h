// The life of a provider's MIs: what the exported MI factories do (the
// first creates the provider's adapter and loads the provider, later ones
// count one more MI) and the cleanup entries of the four MIs (the last one
// unloads the provider and destroys the adapter).
#ifndef CPTA_CMPI_CMPI_MI_FACTORY_H
#define CPTA_CMPI_CMPI_MI_FACTORY_H

#include <cmpidt.h>
#include <cmpift.h>

#include "cmpi/CMPI_Adapter.h"

namespace CPTA {

// Creates the provider's adapter on the first call (else counts one more MI)
// and stores the MI record of the kind ('I' instance, 'M' method, 'A'
// association, 'N' indication) in *mi. 0, or -1 with *mi null.
int cimple_cmpi_adapter(CMPI_Static_Data* static_data, const Registration* registration,
                        const CMPIBroker* broker, const CMPIContext* context,
                        const char* provider_name, char kind, void** mi);

// What the exported MI factories do: the MI record of the kind, or null
// with *rc set to CMPI_RC_ERR_FAILED and a message. Never throws.
void* create_mi(CMPI_Static_Data* static_data, const Registration* registration,
                const CMPIBroker* broker, const CMPIContext* context, const char* provider_name,
                char kind, CMPIStatus* rc);

}  // namespace CPTA

#endif
