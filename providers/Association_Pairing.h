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

// ---- scopes as data -------------------------------------------------------------
//
// Most associations are scoped the same way: the keys of the source name an
// adapter, an FC port or an Ethernet port, and each request-wide set of the
// rule is narrowed to what the walk of its class builds for that object. A
// provider states, for each class a source may be of, how each set of its
// rule is narrowed (by set number; per-element sets are already fetched per
// walked instance and are left as they are):
//
//   constexpr Object_Scopes kScopes = Object_Scopes()
//       .from(CID_PORT_CONTROLLER, Narrowing::OBJECT)   // set 0: the controller
//       .from(CID_FC_PORT, Narrowing::ADAPTER);         // set 0: its adapter's
//
//   class TAVRIN_ControlledBy_Provider
//       : public Keyed_Pairing_Provider<TAVRIN_ControlledBy, kPorts, kScopes>, ...
//
// A source of a class without a row, or whose own object cannot be looked up
// by its keys (inventory/InventoryLookup.h), is served by the binding's
// fallbacks. Narrowed sets keep the order of the whole ones, so the answer is
// the enumeration's, as long as the partners of the source are all among
// what the narrowing gives.
enum class Narrowing : uint8 {
    NONE,           // no instance of the set can pair with the source (whose keys
                    // are not those of any end): nothing is asked, nothing answered
    WHOLE,          // as the enumeration fetches it (the host, the diagnostic tests)
    OBJECT,         // the source itself, looked up by its keys (a set of its class)
    ADAPTER,        // the port controller, package, product or software identities
                    // of the source's adapter (named by the source, or owning its port)
    PORT,           // what the walk builds for the source's FC port, no remote port
    ETHERNET_PORT,  // what the walk builds for the source's Ethernet port
    PATHS,          // what the walk builds for the source's FC port and the one remote
                    // port it names (a target endpoint, a LUN), or all of them (the
                    // port's own endpoint); the port's own endpoint always comes first
};

struct Scope_Row {
    classId_t from;  // the class of the source
    Narrowing sets[Pairing::MAX_SETS];
};

struct Object_Scopes {
    static constexpr size_t MAX_ROWS = 4;
    Scope_Row rows[MAX_ROWS];
    size_t num_rows;

    constexpr Object_Scopes() : rows{}, num_rows(0) {}
    constexpr Object_Scopes from(classId_t source, Narrowing set0,
                                 Narrowing set1 = Narrowing::WHOLE,
                                 Narrowing set2 = Narrowing::WHOLE) const {
        Object_Scopes s = *this;
        s.rows[s.num_rows++] = Scope_Row{source, {set0, set1, set2, Narrowing::WHOLE}};
        return s;
    }
};

// The sets of a rule narrowed for one source by a table of Object_Scopes.
class Object_Scope : public Pairing_Fetcher {
public:
    Object_Scope(const Pairing& rule, const Object_Scopes& scopes, const Instance* source);
    ~Object_Scope();
    Object_Scope(const Object_Scope&) = delete;
    Object_Scope& operator=(const Object_Scope&) = delete;

    Reach reach() const { return _reach; }
    Array<Instance*> fetch(classId_t id) override;

private:
    const String& adapter();

    const Pairing& _rule;
    const Scope_Row* _row = nullptr;
    classId_t _from = CID_NONE;
    Reach _reach = UNKNOWN;
    String _adapter, _port, _remote, _mac;
    bool _adapterKnown = false;
    Array<Instance*> _object;  // the source looked up, until fetched
};

template <const Pairing& RULE, const Object_Scopes& SCOPES>
class Keyed_Scope : public Object_Scope {
public:
    explicit Keyed_Scope(const Instance* source) : Object_Scope(RULE, SCOPES, source) {}
};

template <class C, const Pairing& RULE, const Object_Scopes& SCOPES>
using Keyed_Pairing_Provider = Scoped_Pairing_Provider<C, RULE, Keyed_Scope<RULE, SCOPES>>;

// ---- keys of physical connectors (their Tag: inventory/ConnectorTag.h) --------

// The adapter number and port position a connector's Tag names; false when
// it names none.
bool parse_connector_tag(const Instance* connector, unsigned& adapter, unsigned& position);
// The adapter number / the port position of a connector, in decimal.
void connector_adapter_number(Key_Sink& keys, const Instance* connector);
void connector_port_position(Key_Sink& keys, const Instance* connector);

}  // namespace CPTA

#endif
