// The provider of TAVRIN_NamespaceInManager.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_NamespaceInManager_Methods.h"

namespace CPTA {

class TAVRIN_NamespaceInManager_Provider : public Association_Provider<TAVRIN_NamespaceInManager>,
                                           public TAVRIN_NamespaceInManager_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(NamespaceInManager)
