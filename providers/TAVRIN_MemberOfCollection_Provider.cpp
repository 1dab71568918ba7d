// The provider of TAVRIN_MemberOfCollection.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_MemberOfCollection_Methods.h"

namespace CPTA {

class TAVRIN_MemberOfCollection_Provider
    : public Association_Provider<TAVRIN_MemberOfCollection>,
      public TAVRIN_MemberOfCollection_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(MemberOfCollection)
