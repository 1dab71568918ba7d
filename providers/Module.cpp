// The tvrnprovider module: the registrations of its providers, their MI
// factories, and the start-up of the adapter management library.
#define TVRN_MODULE_NAME "tvrnprovider_Module"
#define TVRN_MODULE_ROWS "providers/Provider_Rows.h"
#include "cmpi/Module_Definition.h"

#include "gateway/ProviderInit.h"

namespace CPTA {

// Defined after the registrations, so it is constructed after them.
ProviderInit gProviderInit;

}  // namespace CPTA
