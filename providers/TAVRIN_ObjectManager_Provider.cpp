// The provider of TAVRIN_ObjectManager.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_ObjectManager_Methods.h"

namespace CPTA {

class TAVRIN_ObjectManager_Provider : public Instance_Provider<TAVRIN_ObjectManager>,
                                      public TAVRIN_ObjectManager_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(ObjectManager)
