// The provider of TAVRIN_ObjectManager.
#include "providers/Server_Profile.h"
#include "providers/generated/TAVRIN_ObjectManager_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_ObjectManager_Source = {
    CID_OBJECT_MANAGER, fromServerManager, nullptr, LL_DBG, QUIET, TVRN_SOURCE_FILE, __LINE__};

class TAVRIN_ObjectManager_Provider
    : public Inventory_Provider<TAVRIN_ObjectManager, TAVRIN_ObjectManager_Source>,
      public TAVRIN_ObjectManager_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(ObjectManager)
