// The provider of TAVRIN_Namespace.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_Namespace_Methods.h"

namespace CPTA {

class TAVRIN_Namespace_Provider : public Instance_Provider<TAVRIN_Namespace>,
                                  public TAVRIN_Namespace_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(Namespace)
