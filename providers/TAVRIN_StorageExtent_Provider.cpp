// The provider of TAVRIN_StorageExtent.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_StorageExtent_Methods.h"

namespace CPTA {

class TAVRIN_StorageExtent_Provider
    : public Instance_Provider<TAVRIN_StorageExtent>,
      public TAVRIN_StorageExtent_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(StorageExtent)
