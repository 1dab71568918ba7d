// The provider of TAVRIN_Namespace.
#include "providers/Server_Profile.h"
#include "providers/generated/TAVRIN_Namespace_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_Namespace_Source = {CID_NAMESPACE, fromServerManager, nullptr, LL_DBG,
                                                  QUIET,         TVRN_SOURCE_FILE,  __LINE__};

class TAVRIN_Namespace_Provider
    : public Inventory_Provider<TAVRIN_Namespace, TAVRIN_Namespace_Source>,
      public TAVRIN_Namespace_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(Namespace)
