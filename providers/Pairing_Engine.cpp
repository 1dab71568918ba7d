// The walk behind every Pairing (see Pairing_Engine.h).
#include "providers/Pairing_Engine.h"

#include <algorithm>
#include <cstdio>
#include <cstring>
#include <map>
#include <memory>
#include <new>
#include <unordered_map>
#include <vector>

#include "framework/Meta_Lookup.h"
#include "framework/Slot.h"

namespace CPTA {

namespace {

// Positions of a set's instances under one key.
typedef std::unordered_map<std::string, std::vector<uint32>> Key_Index;

// One fetched set: owns the array and every instance in it.
class Fetched {
public:
    Fetched() : _parts{0, 0} {}
    ~Fetched() {
        for (size_t i = 0; i < _items.size(); i++)
            if (_items[i] != nullptr)
                destroy(_items[i]);
    }
    Fetched(const Fetched&) = delete;
    Fetched& operator=(const Fetched&) = delete;

    // Takes over the instances of `items` (and empties it) as part 0 or 1 of
    // the set; `expected` is the class they must be of.
    void take(Array<Instance*>& items, uint8 part, const Meta_Class* expected) {
        _parts[part] = items.size();
        for (size_t i = 0; i < items.size(); i++) {
            const Instance* x = items[i];
            _usable.push_back(x != nullptr && expected != nullptr &&
                              is_subclass(expected, x->meta_class));
        }
        _items.append(items.data(), items.size());
        items.clear();
    }

    size_t size() const { return _items.size(); }
    size_t part(uint8 i) const { return i < 2 ? _parts[i] : 0; }
    // Null for an instance that is skipped.
    const Instance* at(size_t i) const { return _usable[i] ? _items[i] : nullptr; }

    Key_Index* index(size_t end) { return _indexes[end].get(); }
    Key_Index& make_index(size_t end) {
        _indexes[end].reset(new Key_Index());
        return *_indexes[end];
    }

private:
    Array<Instance*> _items;
    std::vector<bool> _usable;
    size_t _parts[2];
    std::unique_ptr<Key_Index> _indexes[Pairing::MAX_ENDS];
};

// One enumeration of a rule.
class Pairing_Run : public Pairing_Sets {
public:
    Pairing_Run(const Pairing& rule, const Meta_Class* association, Pairing_Sources& sources,
                Association_Sink sink, void* target)
        : _rule(rule),
          _association(association),
          _sources(sources),
          _sink(sink),
          _target(target),
          _sets(),
          _current(),
          _offsets(),
          _picked(),
          _positions() {}

    Enum_Instances_Status run();

    // Pairing_Sets
    size_t size(uint8 set) const override { return _current[set] ? _current[set]->size() : 0; }
    size_t size(uint8 set, uint8 part) const override {
        return _current[set] ? _current[set]->part(part) : 0;
    }
    const Instance* at(uint8 set, size_t i) const override {
        return _current[set] && i < _current[set]->size() ? _current[set]->at(i) : nullptr;
    }

private:
    bool find_roles();
    void fetch_request_set(uint8 set);
    Fetched& fetch_element_set(uint8 set, const Instance* walked);
    const Count_Check* failed_check(uint8 set) const;
    bool select_element_sets(const Instance* walked);
    void pair_from(size_t end);
    void candidates(size_t end, std::vector<uint32>& out);
    const Key_Index& index_of(size_t end);
    bool keeps(const Association_End& end, const Instance* instance) const {
        return instance != nullptr && (end.filter == nullptr || end.filter(instance));
    }
    void keys_of(const Key& key, const Instance* instance, Key_Sink& keys);
    void property_keys(const char* name, const Instance* instance, Key_Sink& keys);
    void deliver();

    const Pairing& _rule;
    const Meta_Class* _association;
    Pairing_Sources& _sources;
    Association_Sink _sink;
    void* _target;

    // Request-wide sets, and the per-element sets by selector key.
    std::unique_ptr<Fetched> _sets[Pairing::MAX_SETS];
    std::map<std::string, std::unique_ptr<Fetched>> _element_sets[Pairing::MAX_SETS];
    // The sets seen by the instance being walked.
    Fetched* _current[Pairing::MAX_SETS];
    // The per-element set of an instance that names no adapter.
    Fetched _nothing;

    uint32 _offsets[Pairing::MAX_ENDS];
    const Instance* _picked_walked = nullptr;
    const Instance* _picked[Pairing::MAX_ENDS];
    size_t _positions[Pairing::MAX_ENDS];

    // Property look-ups by class.
    struct Found_Property {
        const Meta_Class* meta_class;
        const char* name;
        const Meta_Property* property;
    };
    std::vector<Found_Property> _properties;
};

bool Pairing_Run::find_roles() {
    for (size_t e = 0; e < _rule.num_ends; e++) {
        const Meta_Reference* mr = find_reference(_association, _rule.ends[e].role);
        if (mr == nullptr || mr->subscript != 0) {
            log(LL_ERR, _rule.file, _rule.line, "%s has no reference %s", _association->name,
                _rule.ends[e].role);
            return false;
        }
        _offsets[e] = mr->offset;
    }
    return true;
}

void Pairing_Run::fetch_request_set(uint8 set) {
    const Endpoint_Set& s = _rule.sets[set];
    std::unique_ptr<Fetched> fetched(new Fetched());
    for (uint8 part = 0; part < 2; part++) {
        if (s.ids[part] == 0 && !(part == 0 && is_whole_source(s.source)))
            continue;
        const Meta_Class* expected = nullptr;
        Array<Instance*> items = _sources.fetch(s.source, s.ids[part], expected);
        fetched->take(items, part, expected);
    }
    _current[set] = fetched.get();
    _sets[set] = std::move(fetched);
}

Fetched& Pairing_Run::fetch_element_set(uint8 set, const Instance* walked) {
    const Endpoint_Set& s = _rule.sets[set];
    Key_Sink selector(_sources, true);
    keys_of(s.selector, walked, selector);
    if (selector.size() == 0)
        return _nothing;
    std::unique_ptr<Fetched>& slot = _element_sets[set][selector[0]];
    if (slot)
        return *slot;

    const Meta_Class* expected = nullptr;
    Array<Instance*> items =
        _sources.fetch_for(s.source, String(selector[0].c_str(), selector[0].size()), expected);
    slot.reset(new Fetched());
    slot->take(items, 0, expected);
    return *slot;
}

// The first check of the set that fails, or null.
const Count_Check* Pairing_Run::failed_check(uint8 set) const {
    for (size_t c = 0; c < _rule.num_checks; c++) {
        const Count_Check& check = _rule.checks[c];
        if (check.set != set)
            continue;
        size_t n = size(set);
        bool failed = false;
        switch (check.rule) {
            case Count_Rule::EMPTY: failed = n == 0; break;
            case Count_Rule::ANY_EMPTY:
                failed = size(set, 0) == 0 || (_rule.sets[set].ids[1] != 0 && size(set, 1) == 0);
                break;
            case Count_Rule::NOT_ONE: failed = n != 1; break;
            case Count_Rule::DIFFERS: failed = n != size(check.other); break;
        }
        if (failed)
            return &check;
    }
    return nullptr;
}

// Fetches the per-element sets for the walked instance; false when one of
// their checks fails (it is logged), and the instance is passed over.
bool Pairing_Run::select_element_sets(const Instance* walked) {
    for (uint8 set = 0; set < _rule.num_sets; set++) {
        if (!is_per_element(_rule.sets[set].source))
            continue;
        _current[set] = &fetch_element_set(set, walked);
        if (const Count_Check* check = failed_check(set)) {
            log(check->level, _rule.file, _rule.line, "%s", check->message);
            return false;
        }
    }
    return true;
}

Enum_Instances_Status Pairing_Run::run() {
    if (!find_roles())
        return ENUM_INSTANCES_FAILED;

    for (uint8 set = 0; set < _rule.num_sets; set++) {
        if (is_per_element(_rule.sets[set].source))
            continue;
        fetch_request_set(set);
        if (const Count_Check* check = failed_check(set)) {
            log(check->level, _rule.file, _rule.line, "%s", check->message);
            return check->result;
        }
    }
    if (_rule.reporter != nullptr)
        _rule.reporter(*this);
    else
        log(_rule.announce_level, _rule.file, _rule.line, "%s", _rule.announcement);

    const Fetched* walked = _current[_rule.walked];
    const size_t n = walked ? walked->size() : 0;
    for (size_t i = 0; i < n; i++) {
        const Instance* instance = walked->at(i);
        if (instance == nullptr || (_rule.walked_filter && !_rule.walked_filter(instance)))
            continue;
        if (!select_element_sets(instance))
            continue;
        _picked_walked = instance;
        const Association_End& first = _rule.ends[0];
        if (first.set == Pairing::ITERATED) {
            _picked[0] = instance;
            _positions[0] = i;
            pair_from(1);
            continue;
        }
        const Fetched* set = _current[first.set];
        for (size_t j = 0; j < set->size(); j++) {
            if (!keeps(first, set->at(j)))
                continue;
            _picked[0] = set->at(j);
            _positions[0] = j;
            pair_from(1);
        }
    }
    return ENUM_INSTANCES_OK;
}

void Pairing_Run::pair_from(size_t end) {
    if (end == _rule.num_ends) {
        deliver();
        return;
    }
    const Fetched* set = _current[_rule.ends[end].set];
    std::vector<uint32> found;
    candidates(end, found);
    const Walk_Filter keep = _rule.ends[end].walk_filter;
    for (uint32 j : found) {
        if (keep != nullptr && !keep(_picked_walked, set->at(j)))
            continue;
        _picked[end] = set->at(j);
        _positions[end] = j;
        pair_from(end + 1);
    }
}

// The positions of the partners of _picked[end - 1] in the set of `end`, in
// set order.
void Pairing_Run::candidates(size_t end, std::vector<uint32>& out) {
    const Association_End& e = _rule.ends[end];
    const Fetched* set = _current[e.set];

    if (e.match == Match::EVERY) {
        for (size_t j = 0; j < set->size(); j++)
            if (keeps(e, set->at(j)))
                out.push_back(uint32(j));
        return;
    }

    Key_Sink outer(_sources, e.exact);
    keys_of(e.outer, _picked[end - 1], outer);
    if (outer.size() == 0)
        return;

    if (e.match == Match::POSITION) {
        size_t j = _positions[end - 1];
        if (j >= set->size() || !keeps(e, set->at(j)))
            return;
        Key_Sink inner(_sources, e.exact);
        keys_of(e.inner, set->at(j), inner);
        for (size_t a = 0; a < outer.size(); a++)
            for (size_t b = 0; b < inner.size(); b++)
                if (outer[a] == inner[b]) {
                    out.push_back(uint32(j));
                    return;
                }
        return;
    }

    const Key_Index& index = index_of(end);
    for (size_t k = 0; k < outer.size(); k++) {
        auto hit = index.find(outer[k]);
        if (hit == index.end())
            continue;
        if (e.match == Match::FIRST)
            out.push_back(hit->second.front());
        else
            out.insert(out.end(), hit->second.begin(), hit->second.end());
    }
    if (outer.size() > 1) {
        // Several keys: keep set order and take each partner once.
        std::sort(out.begin(), out.end());
        out.erase(std::unique(out.begin(), out.end()), out.end());
    }
    if (e.match == Match::FIRST && out.size() > 1)
        out.resize(1);
}

// The index of the set of `end` by the end's inner key, built on first use.
const Key_Index& Pairing_Run::index_of(size_t end) {
    const Association_End& e = _rule.ends[end];
    Fetched* set = _current[e.set];
    if (Key_Index* index = set->index(end))
        return *index;
    Key_Index& index = set->make_index(end);
    Key_Sink keys(_sources, e.exact);
    for (size_t j = 0; j < set->size(); j++) {
        if (!keeps(e, set->at(j)))
            continue;
        keys.clear();
        keys_of(e.inner, set->at(j), keys);
        for (size_t k = 0; k < keys.size(); k++) {
            std::vector<uint32>& at = index[keys[k]];
            if (at.empty() || at.back() != j)
                at.push_back(uint32(j));
        }
    }
    return index;
}

void Pairing_Run::keys_of(const Key& key, const Instance* instance, Key_Sink& keys) {
    if (key.derive != nullptr)
        key.derive(keys, instance);
    else if (key.property != nullptr)
        property_keys(key.property, instance, keys);
}

void Pairing_Run::property_keys(const char* name, const Instance* instance, Key_Sink& keys) {
    const Meta_Property* mp = nullptr;
    bool known = false;
    for (const Found_Property& f : _properties)
        if (f.meta_class == instance->meta_class && f.name == name) {
            mp = f.property;
            known = true;
            break;
        }
    if (!known) {
        mp = find_property(instance->meta_class, name);
        _properties.push_back(Found_Property{instance->meta_class, name, mp});
    }
    if (mp == nullptr || mp->subscript != 0)
        return;
    const unsigned char* slot = slot_of(instance, mp->offset);
    if (null_flag(slot, mp))
        return;
    switch (mp->type) {
        case STRING: keys.add(*reinterpret_cast<const String*>(slot)); break;
        case BOOLEAN: keys.add(*slot ? "true" : "false"); break;
        case UINT8: keys.add(*reinterpret_cast<const uint8*>(slot)); break;
        case UINT16: keys.add(*reinterpret_cast<const uint16*>(slot)); break;
        case UINT32: keys.add(*reinterpret_cast<const uint32*>(slot)); break;
        case UINT64: keys.add(*reinterpret_cast<const uint64*>(slot)); break;
        case SINT8:
        case SINT16:
        case SINT32:
        case SINT64: {
            long long v = mp->type == SINT8    ? *reinterpret_cast<const sint8*>(slot)
                          : mp->type == SINT16 ? *reinterpret_cast<const sint16*>(slot)
                          : mp->type == SINT32 ? *reinterpret_cast<const sint32*>(slot)
                                               : *reinterpret_cast<const sint64*>(slot);
            if (v >= 0) {
                keys.add((unsigned long long)v);
            } else {
                char text[24];
                snprintf(text, sizeof(text), "%lld", v);
                keys.add(text);
            }
            break;
        }
        default: break;
    }
}

void Pairing_Run::deliver() {
    Instance* association = create(_association, true);
    if (association == nullptr)
        throw std::bad_alloc();
    for (size_t e = 0; e < _rule.num_ends; e++) {
        Instance* copy = clone(_picked[e]);
        if (copy == nullptr) {
            destroy(association);
            throw std::bad_alloc();
        }
        reference_in(slot_of(association, _offsets[e])) = copy;
    }
    _sink(association, _target);
}

}  // namespace

void Key_Sink::add(const char* text, size_t size) {
    if (_count == MAX_KEYS || text == nullptr)
        return;
    std::string& k = _keys[_count++];
    k.assign(text, size);
    if (!_exact)
        for (char& c : k)
            if (c >= 'A' && c <= 'Z')
                c = char(c - 'A' + 'a');
}

void Key_Sink::add(const char* text) {
    if (text != nullptr)
        add(text, strlen(text));
}

void Key_Sink::add(unsigned long long number) {
    char text[24];
    snprintf(text, sizeof(text), "%llu", number);
    add(text);
}

Enum_Instances_Status enumerate_pairs(const Pairing& rule, const Meta_Class* association,
                                      Pairing_Sources& sources, Association_Sink sink,
                                      void* target) {
    return Pairing_Run(rule, association, sources, sink, target).run();
}

const Property<String>* text_property(const Instance* instance, const char* name) {
    const Meta_Property* mp = instance ? find_property(instance->meta_class, name) : nullptr;
    if (mp == nullptr || mp->type != STRING || mp->subscript != 0)
        return nullptr;
    return reinterpret_cast<const Property<String>*>(slot_of(instance, mp->offset));
}

}  // namespace CPTA
