// The provider of TAVRIN_StorageResourcesSystemDevice.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_StorageResourcesSystemDevice_Methods.h"

namespace CPTA {

class TAVRIN_StorageResourcesSystemDevice_Provider
    : public Association_Provider<TAVRIN_StorageResourcesSystemDevice>,
      public TAVRIN_StorageResourcesSystemDevice_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(StorageResourcesSystemDevice)
