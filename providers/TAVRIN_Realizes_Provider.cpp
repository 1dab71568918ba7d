// The provider of TAVRIN_Realizes: each port controller with the physical
// package at the same position, when both carry the same serial number. Both
// sets come in adapter order; a pair whose serials differ is dropped, not
// searched for elsewhere.
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_Realizes_Methods.h"

namespace CPTA {

namespace {

constexpr Pairing kPackages =
    TVRN_PAIRING
        .fetch(CID_PORT_CONTROLLER)   // 0
        .fetch(CID_PHYSICAL_PACKAGE)  // 1
        .when_differs(0, LL_ERR, "Error: Invalid number of instances returned!\n")
        .for_each(0)
        .as("Dependent")
        .at_same_position(1, "Antecedent", key("ElementName"), key("SerialNumber"));

constexpr Object_Scopes kScopes =
    Object_Scopes().from(CID_PORT_CONTROLLER, Narrowing::OBJECT, Narrowing::ADAPTER);

}  // namespace

class TAVRIN_Realizes_Provider : public Keyed_Pairing_Provider<TAVRIN_Realizes, kPackages, kScopes>,
                                 public TAVRIN_Realizes_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(Realizes)
