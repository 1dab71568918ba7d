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

// Where the request-wide sets of a run come from when not from the
// dispatchers: a request about one object hands the sets narrowed to what can
// pair with it. fetch returns the instances of one class id of a set (the
// caller owns them), in the order the dispatcher would give them.
class Pairing_Fetcher {
public:
    enum Reach { UNKNOWN, NOTHING, NARROWED };
    virtual Array<Instance*> fetch(classId_t id) = 0;

protected:
    ~Pairing_Fetcher() = default;
};

// Runs a rule on the inventory's sets (the request-wide ones from `fetcher`
// when given) within one host identity for the request, logging "Entering"
// and "Returning" at the rule's source. Never throws: an exception ends the
// request with ENUM_INSTANCES_FAILED (logged).
Enum_Instances_Status enumerate_inventory_pairs(const Pairing& rule, const Meta_Class* association,
                                                Association_Sink sink, void* target,
                                                Pairing_Fetcher* fetcher = nullptr) noexcept;

// Associator names and references of one source object, from a run of the
// rule on the sets that `fetcher` narrows: what the binding's fallbacks give
// by enumerating the whole association and keeping what refers to the
// source, in the same order, as long as the narrowed sets keep every
// instance that can pair with it (in their order).
Enum_Associator_Names_Status scoped_associator_names(
    const Pairing& rule, const Meta_Class* association, Pairing_Fetcher& fetcher,
    const Instance* source, const String& result_class, const String& role,
    const String& result_role, Enum_Associator_Names_Handler<Instance>* handler) noexcept;
// hand_on(association, handler) passes one on; false: no more are wanted.
Enum_References_Status scoped_references(const Pairing& rule, const Meta_Class* association,
                                         Pairing_Fetcher& fetcher, const Instance* source,
                                         const String& role,
                                         bool (*hand_on)(Instance* association, void* handler),
                                         void* handler) noexcept;

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

// An association provider that answers associator-name and reference
// requests from one object by running RULE on sets narrowed to that object.
// SCOPE is constructed from the source object and is the run's
// Pairing_Fetcher; reach() tells whether it narrows the sets (NARROWED),
// knows that nothing can pair with the source (NOTHING: no result, no
// library call), or cannot tell (UNKNOWN: the binding's fallbacks enumerate
// the association). Associators follow the binding's fallback through the
// associator names.
template <class C, const Pairing& RULE, class SCOPE>
class Scoped_Pairing_Provider : public Pairing_Provider<C, RULE> {
public:
    Enum_Associator_Names_Status enum_associator_names(
        const Instance* source, const String& result_class, const String& role,
        const String& result_role, Enum_Associator_Names_Handler<Instance>* handler) {
        SCOPE scope(source);
        if (scope.reach() != Pairing_Fetcher::NARROWED)
            return scope.reach() == Pairing_Fetcher::NOTHING ? ENUM_ASSOCIATOR_NAMES_OK
                                                             : ENUM_ASSOCIATOR_NAMES_UNSUPPORTED;
        return scoped_associator_names(RULE, &C::static_meta_class, scope, source, result_class,
                                       role, result_role, handler);
    }

    Enum_References_Status enum_references(const Instance* source, const C*, const String& role,
                                           Enum_References_Handler<C>* handler) {
        SCOPE scope(source);
        if (scope.reach() != Pairing_Fetcher::NARROWED)
            return scope.reach() == Pairing_Fetcher::NOTHING ? ENUM_REFERENCES_OK
                                                             : ENUM_REFERENCES_UNSUPPORTED;
        return scoped_references(RULE, &C::static_meta_class, scope, source, role, &hand_on,
                                 handler);
    }

private:
    static bool hand_on(Instance* association, void* handler) {
        return static_cast<Enum_References_Handler<C>*>(handler)->handle(
            static_cast<C*>(association));
    }
};

// The scope of the associations among the objects of one FC port (the port,
// its statistics, alarm device and own SCSI endpoint): the source's key
// DeviceID, InstanceID or Name names the port by its WWN; anything else
// (a target's endpoint, a LUN, another class) pairs with none of them.
class One_Port_Scope : public Pairing_Fetcher {
public:
    explicit One_Port_Scope(const Instance* source);
    Reach reach() const { return _reach; }
    Array<Instance*> fetch(classId_t id) override;

private:
    Reach _reach;
    String _port;
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
