// The inventory association providers: a provider states its rule (see
// providers/Pairing_Engine.h) and derives from Pairing_Provider, which runs
// the rule on the sets the inventory dispatchers build.
//
//   constexpr Pairing kStatistics = TVRN_PAIRING
//       .fetch(CID_FC_PORT).when_empty(LL_WARN, "No FC Ports Found")
//       .fetch(CID_FC_PORT_STATISTICS).when_empty(LL_WARN, "...")
//       .for_each(0).as("ManagedElement")
//       .with_all(1, "Stats", key("DeviceID"), key("InstanceID"));
//
//   class TAVRIN_ElementStatisticalData_Provider
//       : public Pairing_Provider<TAVRIN_ElementStatisticalData, kStatistics>,
//         public TAVRIN_ElementStatisticalData_Methods {};
#ifndef CPTA_PROVIDERS_ASSOCIATION_PAIRING_H
#define CPTA_PROVIDERS_ASSOCIATION_PAIRING_H

#include "cmpi/Provider_Handler.h"
#include "gateway/ClassId.h"
#include "providers/Pairing_Engine.h"
#include "providers/Provider_Base.h"

namespace CPTA {

// Runs a rule on the inventory's sets within one host identity for the
// request, logging "Entering" and "Returning" at the rule's source. Never
// throws: an exception ends the request with ENUM_INSTANCES_FAILED (logged).
Enum_Instances_Status enumerate_inventory_pairs(const Pairing& rule, const Meta_Class* association,
                                                Association_Sink sink, void* target) noexcept;

// The association provider whose enum_instances runs RULE.
template <class C, const Pairing& RULE>
class Pairing_Provider : public Association_Provider<C> {
public:
    Enum_Instances_Status enum_instances(const C*, Enum_Instances_Handler<C>* handler) {
        return enumerate_inventory_pairs(RULE, &C::static_meta_class, &deliver, handler);
    }

private:
    // The handler's answer is not looked at: the enumeration runs to the end.
    static void deliver(Instance* association, void* handler) {
        static_cast<Enum_Instances_Handler<C>*>(handler)->handle(static_cast<C*>(association));
    }
};

// ---- keys of physical connectors (their Tag: inventory/ConnectorTag.h) --------

// The adapter number and port position a connector's Tag names; false when
// it names none.
bool parse_connector_tag(const Instance* connector, unsigned& adapter, unsigned& position);
// The adapter number / the port position of a connector, in decimal.
void connector_adapter_number(Key_Sink& keys, const Instance* connector);
void connector_port_position(Key_Sink& keys, const Instance* connector);

}  // namespace CPTA

#endif
