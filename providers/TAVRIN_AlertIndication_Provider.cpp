// The provider of TAVRIN_AlertIndication.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_AlertIndication_Methods.h"

namespace CPTA {

class TAVRIN_AlertIndication_Provider : public Indication_Provider<TAVRIN_AlertIndication>,
                                        public TAVRIN_AlertIndication_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(AlertIndication)
