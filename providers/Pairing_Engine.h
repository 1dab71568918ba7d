// The pairing engine: how the inventory association providers build their
// instances.
//
// Every association of the inventory is made the same way: fetch the endpoint
// sets from the dispatchers, check their counts, walk one set and pair each of
// its instances with partners from the others by a rule, and deliver one
// association per pair (or triple) whose references hold copies of the
// endpoints. A provider states only that rule, as a Pairing; the walk itself,
// the ownership of every fetched instance and the delivery live in
// Pairing_Engine.cpp; the sets come from a Pairing_Sources. Providers include
// providers/Association_Pairing.h, whose Pairing_Provider runs a rule on the
// inventory's sets.
//
//   constexpr Pairing kStatistics = TVRN_PAIRING
//       .fetch(CID_FC_PORT).when_empty(LL_WARN, "No FC Ports Found")           // set 0
//       .fetch(CID_FC_PORT_STATISTICS).when_empty(LL_WARN, "...")              // set 1
//       .for_each(0).as("ManagedElement")
//       .with_all(1, "Stats", key("DeviceID"), key("InstanceID"));
//
//   class TAVRIN_ElementStatisticalData_Provider
//       : public Pairing_Provider<TAVRIN_ElementStatisticalData, kStatistics>,
//         public TAVRIN_ElementStatisticalData_Methods {};
//
// Sets are numbered in the order they are declared. A set is fetched once per
// request, or, for the per-element sources, once for each instance of the
// walked set (and only once for each distinct selector key within a request).
// Count checks follow the set they test and run as soon as it is fetched; a
// failed check of a request-wide set logs its message and ends the request
// with its result, a failed check of a per-element set logs its message and
// goes on with the next walked instance.
//
// End 0 of the association is the walked instance itself (as) or each
// instance of a per-element set (pair); every further end takes its partners
// for the end before it from one set:
//   with_every         every instance of the set;
//   with_first         the first instance whose key equals a key of the end before;
//   with_all           every such instance, in set order;
//   at_same_position   the instance at the same position in its set as the end
//                      before, when their keys are equal; no other is tried.
// Keys are compared without regard to case unless exact() is given. Key
// matches are looked up in an index of the set built once, so a request costs
// time in proportion to the instances it reads and delivers.
//
// Instances of a set that are null or of a class the source does not make are
// skipped, but keep their place (positions and counts are those of the
// fetched arrays).
#ifndef CPTA_PROVIDERS_PAIRING_ENGINE_H
#define CPTA_PROVIDERS_PAIRING_ENGINE_H

#include <cstddef>
#include <string>

#include "cmpi/Provider_Status.h"
#include "framework/Array.h"
#include "framework/Instance.h"
#include "framework/Log.h"
#include "framework/String.h"

namespace CPTA {

class Pairing_Sources;

// Receives the keys of one instance: most give one, some none, a few several.
class Key_Sink {
public:
    static constexpr size_t MAX_KEYS = 4;

    Key_Sink(Pairing_Sources& sources, bool exact) : _sources(sources), _exact(exact), _count(0) {}

    void add(const char* text, size_t size);
    void add(const char* text);
    void add(const String& text) { add(text.c_str(), text.size()); }
    void add(unsigned long long number);

    size_t size() const { return _count; }
    const std::string& operator[](size_t i) const { return _keys[i]; }
    void clear() { _count = 0; }

    // What a key function may ask besides the instance.
    Pairing_Sources& sources() const { return _sources; }

private:
    Pairing_Sources& _sources;
    bool _exact;
    size_t _count;
    std::string _keys[MAX_KEYS];
};

typedef void (*Key_Function)(Key_Sink& keys, const Instance* instance);
typedef bool (*Instance_Filter)(const Instance* instance);
// A filter that also sees the instance being walked.
typedef bool (*Walk_Filter)(const Instance* walked, const Instance* instance);

// The key of an instance: the value of one of its properties (a text, or an
// integer in decimal; a null value gives no key), or what a function derives.
struct Key {
    const char* property;
    Key_Function derive;
};

constexpr Key key(const char* property) {
    return Key{property, nullptr};
}
constexpr Key key(Key_Function derive) {
    return Key{nullptr, derive};
}

// Where a set comes from (the Pairing_Sources of the request knows how to ask).
enum class Source : uint8 {
    NONE,
    INVENTORY,        // FCHBAManager::getInstances of its class ids
    HOST_DISCOVERED,  // HDRManager::getInstances of its class ids
    // Request-wide, without class ids:
    DIAGNOSTIC_TESTS,  // every diagnostic test offered
    // Per element, selected by a key of the walked instance:
    FC_PORTS_OF_ADAPTER,              // FCHBAManager::getFCPortInstancesByAdapter(key)
    ETHERNET_PORTS_OF_ADAPTER,        // FCHBAManager::getEthernetPortInstancesByAdapter(key)
    ETHERNET_PORTS_OF_ADAPTER_NUMBER  // EthernetPortHelper::getInstancesByAdapterId(key, 20)
};

constexpr bool is_whole_source(Source s) {
    return s == Source::DIAGNOSTIC_TESTS;
}

constexpr bool is_per_element(Source s) {
    return s == Source::FC_PORTS_OF_ADAPTER || s == Source::ETHERNET_PORTS_OF_ADAPTER ||
           s == Source::ETHERNET_PORTS_OF_ADAPTER_NUMBER;
}

// Class ids are the dispatchers' (gateway/ClassId.h); 0 names no class.
struct Endpoint_Set {
    Source source;
    int ids[2];    // request-wide sources: the classes, concatenated in this order
    Key selector;  // per-element sources: which adapter
};

enum class Count_Rule : uint8 { EMPTY, ANY_EMPTY, NOT_ONE, DIFFERS };

struct Count_Check {
    uint8 set;
    Count_Rule rule;
    uint8 other;  // DIFFERS: the set whose count must be the same
    Log_Level level;
    const char* message;
    Enum_Instances_Status result;
};

enum class Match : uint8 { EVERY, FIRST, ALL, POSITION };

struct Association_End {
    const char* role;        // the reference property
    uint8 set;               // ITERATED: the walked instance itself
    Instance_Filter filter;  // null: every instance of the set
    Match match;             // how it is found for the end before it
    Key outer;               // key of the end before it
    Key inner;               // key of this end
    bool exact;
    Walk_Filter walk_filter;  // null: every partner
};

// A read-only view of the request-wide sets, for a rule's report().
class Pairing_Sets {
public:
    virtual size_t size(uint8 set) const = 0;
    // The number of instances of one class of a concatenated set.
    virtual size_t size(uint8 set, uint8 part) const = 0;
    // Null for an instance that is skipped.
    virtual const Instance* at(uint8 set, size_t i) const = 0;

protected:
    ~Pairing_Sets() = default;
};

typedef void (*Pairing_Report)(const Pairing_Sets& sets);

struct Pairing {
    static constexpr uint8 ITERATED = 0xff;
    static constexpr size_t MAX_SETS = 4;
    static constexpr size_t MAX_CHECKS = 4;
    static constexpr size_t MAX_ENDS = 3;

    const char* file;  // the provider's source, for the log
    int line;
    Endpoint_Set sets[MAX_SETS];
    size_t num_sets;
    Count_Check checks[MAX_CHECKS];
    size_t num_checks;
    uint8 walked;
    Instance_Filter walked_filter;
    Association_End ends[MAX_ENDS];
    size_t num_ends;
    Log_Level announce_level;
    const char* announcement;
    Pairing_Report reporter;

    constexpr Pairing(const char* file_, int line_)
        : file(file_),
          line(line_),
          sets{},
          num_sets(0),
          checks{},
          num_checks(0),
          walked(0),
          walked_filter(nullptr),
          ends{},
          num_ends(0),
          announce_level(LL_DBG),
          announcement("Building and returning association instances"),
          reporter(nullptr) {}

    // ---- sets, in the order they are fetched -----------------------------
    constexpr Pairing fetch(int id, int then = 0) const {
        return with_set(Endpoint_Set{Source::INVENTORY, {id, then}, Key{nullptr, nullptr}});
    }
    constexpr Pairing fetch_discovered(int id, int then = 0) const {
        return with_set(Endpoint_Set{Source::HOST_DISCOVERED, {id, then}, Key{nullptr, nullptr}});
    }
    constexpr Pairing fetch_diagnostic_tests() const {
        return with_set(Endpoint_Set{Source::DIAGNOSTIC_TESTS, {0, 0}, Key{nullptr, nullptr}});
    }
    constexpr Pairing fetch_for_each(Source source, Key selector) const {
        return with_set(Endpoint_Set{source, {0, 0}, selector});
    }

    // ---- count checks of the set declared last ---------------------------
    constexpr Pairing when_empty(Log_Level level, const char* message,
                                 Enum_Instances_Status result = ENUM_INSTANCES_OK) const {
        return with_check(Count_Rule::EMPTY, 0, level, message, result);
    }
    // A set of two classes where one of them has no instance.
    constexpr Pairing when_any_empty(Log_Level level, const char* message,
                                     Enum_Instances_Status result = ENUM_INSTANCES_FAILED) const {
        return with_check(Count_Rule::ANY_EMPTY, 0, level, message, result);
    }
    constexpr Pairing when_not_one(Log_Level level, const char* message,
                                   Enum_Instances_Status result = ENUM_INSTANCES_FAILED) const {
        return with_check(Count_Rule::NOT_ONE, 0, level, message, result);
    }
    constexpr Pairing when_differs(uint8 other, Log_Level level, const char* message,
                                   Enum_Instances_Status result = ENUM_INSTANCES_FAILED) const {
        return with_check(Count_Rule::DIFFERS, other, level, message, result);
    }

    // What is logged once the sets are complete, before the first
    // association; a report replaces it.
    constexpr Pairing announce(Log_Level level, const char* message) const {
        Pairing p = *this;
        p.announce_level = level;
        p.announcement = message;
        return p;
    }
    constexpr Pairing report(Pairing_Report reporter_) const {
        Pairing p = *this;
        p.reporter = reporter_;
        return p;
    }

    // ---- the walk and the ends -------------------------------------------
    constexpr Pairing for_each(uint8 set, Instance_Filter filter = nullptr) const {
        Pairing p = *this;
        p.walked = set;
        p.walked_filter = filter;
        return p;
    }
    constexpr Pairing as(const char* role) const { return pair(ITERATED, role); }
    constexpr Pairing pair(uint8 set, const char* role) const {
        return with_end(Association_End{role, set, nullptr, Match::EVERY, Key{nullptr, nullptr},
                                        Key{nullptr, nullptr}, false, nullptr});
    }
    constexpr Pairing with_every(uint8 set, const char* role) const {
        return with_end(Association_End{role, set, nullptr, Match::EVERY, Key{nullptr, nullptr},
                                        Key{nullptr, nullptr}, false, nullptr});
    }
    constexpr Pairing with_first(uint8 set, const char* role, Key outer, Key inner) const {
        return with_end(
            Association_End{role, set, nullptr, Match::FIRST, outer, inner, false, nullptr});
    }
    constexpr Pairing with_all(uint8 set, const char* role, Key outer, Key inner) const {
        return with_end(
            Association_End{role, set, nullptr, Match::ALL, outer, inner, false, nullptr});
    }
    constexpr Pairing at_same_position(uint8 set, const char* role, Key outer, Key inner) const {
        return with_end(
            Association_End{role, set, nullptr, Match::POSITION, outer, inner, false, nullptr});
    }
    // The last end: keys compared exactly / only instances the filter keeps.
    constexpr Pairing exact() const {
        Pairing p = *this;
        p.ends[p.num_ends - 1].exact = true;
        return p;
    }
    constexpr Pairing only(Instance_Filter filter) const {
        Pairing p = *this;
        p.ends[p.num_ends - 1].filter = filter;
        return p;
    }
    // The last end: only partners that keep(walked instance, partner) accepts.
    constexpr Pairing only_for_walked(Walk_Filter keep) const {
        Pairing p = *this;
        p.ends[p.num_ends - 1].walk_filter = keep;
        return p;
    }

    // ---- ready-made rules ------------------------------------------------
    // The host (exactly one; class id 1) with every instance of a class.
    constexpr Pairing host_with_every(int part, const char* host_role, const char* part_role,
                                      const char* host_count_message) const {
        return fetch(1)
            .when_not_one(LL_ERR, host_count_message)
            .fetch(part)
            .for_each(0)
            .as(host_role)
            .with_every(1, part_role);
    }
    // Each port controller (Antecedent) with every port (Dependent) of its
    // adapter that `ports` lists.
    constexpr Pairing controller_with_every(Source ports) const {
        return fetch(2)
            .fetch_for_each(ports, key("DeviceID"))
            .for_each(0)
            .as("Antecedent")
            .with_every(1, "Dependent");
    }

private:
    constexpr Pairing with_set(const Endpoint_Set& set) const {
        Pairing p = *this;
        p.sets[p.num_sets++] = set;
        return p;
    }
    constexpr Pairing with_check(Count_Rule rule, uint8 other, Log_Level level, const char* message,
                                 Enum_Instances_Status result) const {
        Pairing p = *this;
        p.checks[p.num_checks++] =
            Count_Check{uint8(num_sets - 1), rule, other, level, message, result};
        return p;
    }
    constexpr Pairing with_end(const Association_End& end) const {
        Pairing p = *this;
        p.ends[p.num_ends++] = end;
        return p;
    }
};

// A rule begins here, naming the provider's source for the log.
#define TVRN_PAIRING ::CPTA::Pairing(TVRN_SOURCE_FILE, __LINE__)

// Where the sets of one request come from, and what key functions may ask
// besides the instances. One object serves one request, so it may keep what
// it has read.
class Pairing_Sources {
public:
    // The instances of class id `id` from a request-wide source, and the
    // class they must be of (null: none is usable). The caller owns them.
    virtual Array<Instance*> fetch(Source source, int id, const Meta_Class*& expected) = 0;
    // The instances a per-element source selects by the selector key.
    virtual Array<Instance*> fetch_for(Source source, const String& selector,
                                       const Meta_Class*& expected) = 0;
    // The serial number of adapter `number` (from 1); "" when the adapter is
    // unknown or cannot be read.
    virtual String adapter_serial_number(unsigned number) = 0;

protected:
    ~Pairing_Sources() = default;
};

// Receives each association built; takes over the instance.
typedef void (*Association_Sink)(Instance* association, void* target);

// Runs a rule on the sets of `sources`: delivers every association instance
// of the class to the sink. Every instance fetched is destroyed before it
// returns, also when it throws (what the sources throw, or std::bad_alloc).
Enum_Instances_Status enumerate_pairs(const Pairing& rule, const Meta_Class* association,
                                      Pairing_Sources& sources, Association_Sink sink,
                                      void* target);

// A text property of any class by its name; null when the class has none.
const Property<String>* text_property(const Instance* instance, const char* name);

}  // namespace CPTA

#endif
