// The provider of TAVRIN_HostedCollection.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_HostedCollection_Methods.h"

namespace CPTA {

class TAVRIN_HostedCollection_Provider
    : public Association_Provider<TAVRIN_HostedCollection>,
      public TAVRIN_HostedCollection_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(HostedCollection)
