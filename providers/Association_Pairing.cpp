// The walk behind every Pairing (see Association_Pairing.h).
#include "providers/Association_Pairing.h"

#include <algorithm>
#include <cinttypes>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <exception>
#include <memory>
#include <new>
#include <unordered_map>

#include <json/json.h>

#include "diagnostics/DiagnosticHelper.h"
#include "framework/Meta_Lookup.h"
#include "framework/Slot.h"
#include "gateway/HbaAgentError.h"
#include "gateway/JsonAccess.h"
#include "inventory/EthernetPortHelper.h"
#include "inventory/FCHBAManager.h"
#include "inventory/HostIdentityScope.h"
#include "schema/generated/TAVRIN_AdapterSoftwareIdentity.h"
#include "schema/generated/TAVRIN_AlarmDevice.h"
#include "schema/generated/TAVRIN_CIMXMLCommunicationMechanism.h"
#include "schema/generated/TAVRIN_ComputerSystem.h"
#include "schema/generated/TAVRIN_ConcreteJob.h"
#include "schema/generated/TAVRIN_DiagnosticSoftwareIdentity.h"
#include "schema/generated/TAVRIN_DiagnosticTest.h"
#include "schema/generated/TAVRIN_EthLoopbackDiagnosticTest.h"
#include "schema/generated/TAVRIN_EthernetPort.h"
#include "schema/generated/TAVRIN_FCPort.h"
#include "schema/generated/TAVRIN_FCPortStatistics.h"
#include "schema/generated/TAVRIN_HBASoftwareInstallationService.h"
#include "schema/generated/TAVRIN_HBASoftwareInstallationServiceCapabilities.h"
#include "schema/generated/TAVRIN_LANEndpoint.h"
#include "schema/generated/TAVRIN_LogicalPortGroup.h"
#include "schema/generated/TAVRIN_LoopbackDiagnosticTest.h"
#include "schema/generated/TAVRIN_MemoryDiagnosticTest.h"
#include "schema/generated/TAVRIN_Namespace.h"
#include "schema/generated/TAVRIN_ObjectManager.h"
#include "schema/generated/TAVRIN_PCILoopbackDiagnosticTest.h"
#include "schema/generated/TAVRIN_PhysicalConnector.h"
#include "schema/generated/TAVRIN_PhysicalPackage.h"
#include "schema/generated/TAVRIN_PortController.h"
#include "schema/generated/TAVRIN_Product.h"
#include "schema/generated/TAVRIN_ProfileSoftwareIdentity.h"
#include "schema/generated/TAVRIN_RegisteredProfile.h"
#include "schema/generated/TAVRIN_RegisteredSubProfile.h"
#include "schema/generated/TAVRIN_RemoteServiceAccessPoint.h"
#include "schema/generated/TAVRIN_SCSIProtocolEndpoint.h"
#include "schema/generated/TAVRIN_StorageExtent.h"
#include "schema/generated/TAVRIN_TapeDrive.h"

namespace CPTA {

namespace {

// The class each class id stands for (only those the associations fetch).
const Meta_Class* class_of(classId_t id) {
    switch (id) {
        case CID_COMPUTER_SYSTEM: return &TAVRIN_ComputerSystem::static_meta_class;
        case CID_PORT_CONTROLLER: return &TAVRIN_PortController::static_meta_class;
        case CID_FC_PORT: return &TAVRIN_FCPort::static_meta_class;
        case CID_SCSI_PROTOCOL_ENDPOINT: return &TAVRIN_SCSIProtocolEndpoint::static_meta_class;
        case CID_FC_PORT_STATISTICS: return &TAVRIN_FCPortStatistics::static_meta_class;
        case CID_PHYSICAL_PACKAGE: return &TAVRIN_PhysicalPackage::static_meta_class;
        case CID_PRODUCT: return &TAVRIN_Product::static_meta_class;
        case CID_ADAPTER_SOFTWARE_IDENTITY:
            return &TAVRIN_AdapterSoftwareIdentity::static_meta_class;
        case CID_STORAGE_EXTENT: return &TAVRIN_StorageExtent::static_meta_class;
        case CID_REGISTERED_PROFILE: return &TAVRIN_RegisteredProfile::static_meta_class;
        case CID_REGISTERED_SUB_PROFILE: return &TAVRIN_RegisteredSubProfile::static_meta_class;
        case CID_NAMESPACE: return &TAVRIN_Namespace::static_meta_class;
        case CID_OBJECT_MANAGER: return &TAVRIN_ObjectManager::static_meta_class;
        case CID_CIMXML_COMMUNICATION_MECHANISM:
            return &TAVRIN_CIMXMLCommunicationMechanism::static_meta_class;
        case CID_PROFILE_SOFTWARE_IDENTITY:
            return &TAVRIN_ProfileSoftwareIdentity::static_meta_class;
        case CID_REMOTE_SERVICE_ACCESS_POINT:
            return &TAVRIN_RemoteServiceAccessPoint::static_meta_class;
        case CID_TAPE_DRIVE: return &TAVRIN_TapeDrive::static_meta_class;
        case CID_HBA_SOFTWARE_INSTALLATION_SERVICE:
            return &TAVRIN_HBASoftwareInstallationService::static_meta_class;
        case CID_HBA_SOFTWARE_INSTALLATION_SERVICE_CAPABILITIES:
            return &TAVRIN_HBASoftwareInstallationServiceCapabilities::static_meta_class;
        case CID_ETHERNET_PORT: return &TAVRIN_EthernetPort::static_meta_class;
        case CID_LOGICAL_PORT_GROUP: return &TAVRIN_LogicalPortGroup::static_meta_class;
        case CID_LAN_ENDPOINT: return &TAVRIN_LANEndpoint::static_meta_class;
        case CID_PHYSICAL_CONNECTOR: return &TAVRIN_PhysicalConnector::static_meta_class;
        case CID_ALARM_DEVICE: return &TAVRIN_AlarmDevice::static_meta_class;
        case CID_MEMORY_DIAGNOSTIC_TEST: return &TAVRIN_MemoryDiagnosticTest::static_meta_class;
        case CID_LOOPBACK_DIAGNOSTIC_TEST: return &TAVRIN_LoopbackDiagnosticTest::static_meta_class;
        case CID_PCI_LOOPBACK_DIAGNOSTIC_TEST:
            return &TAVRIN_PCILoopbackDiagnosticTest::static_meta_class;
        case CID_ETH_LOOPBACK_DIAGNOSTIC_TEST:
            return &TAVRIN_EthLoopbackDiagnosticTest::static_meta_class;
        case CID_DIAGNOSTIC_SOFTWARE_IDENTITY:
            return &TAVRIN_DiagnosticSoftwareIdentity::static_meta_class;
        case CID_CONCRETE_JOB: return &TAVRIN_ConcreteJob::static_meta_class;
        default: return nullptr;
    }
}

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

// The text of a number.
std::string decimal(unsigned long long n) {
    char text[24];
    snprintf(text, sizeof(text), "%llu", n);
    return text;
}

// One enumeration of a rule.
class Pairing_Run : public Pairing_Sets {
public:
    Pairing_Run(const Pairing& rule, const Meta_Class* association, Association_Sink sink,
                void* target)
        : _rule(rule),
          _association(association),
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
    Association_Sink _sink;
    void* _target;
    Adapter_Facts _facts;

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
    if (s.source == Source::DIAGNOSTIC_TESTS) {
        Array<Instance*> tests =
            DiagnosticHelper::getDiagnosticHelperObject()->getDiagnosticServices();
        fetched->take(tests, 0, &TAVRIN_DiagnosticTest::static_meta_class);
    }
    for (uint8 part = 0; part < 2; part++) {
        classId_t id = s.ids[part];
        if (id == CID_NONE)
            continue;
        Array<Instance*> items = s.source == Source::HOST_DISCOVERED
                                     ? HDRManager::getHDRManager()->getInstances(id)
                                     : FCHBAManager::getFCHBAManager()->getInstances(id);
        fetched->take(items, part, class_of(id));
    }
    _current[set] = fetched.get();
    _sets[set] = std::move(fetched);
}

Fetched& Pairing_Run::fetch_element_set(uint8 set, const Instance* walked) {
    const Endpoint_Set& s = _rule.sets[set];
    Key_Sink selector(_facts, true);
    keys_of(s.selector, walked, selector);
    if (selector.size() == 0)
        return _nothing;
    std::unique_ptr<Fetched>& slot = _element_sets[set][selector[0]];
    if (slot)
        return *slot;

    String adapter(selector[0].c_str(), selector[0].size());
    Array<Instance*> items;
    const Meta_Class* expected = &TAVRIN_EthernetPort::static_meta_class;
    switch (s.source) {
        case Source::FC_PORTS_OF_ADAPTER:
            items = FCHBAManager::getFCHBAManager()->getFCPortInstancesByAdapter(adapter);
            expected = &TAVRIN_FCPort::static_meta_class;
            break;
        case Source::ETHERNET_PORTS_OF_ADAPTER:
            items = FCHBAManager::getFCHBAManager()->getEthernetPortInstancesByAdapter(adapter);
            break;
        case Source::ETHERNET_PORTS_OF_ADAPTER_NUMBER:
            items = EthernetPortHelper::getEthernetPortHelperObject()->getInstancesByAdapterId(
                atoi(adapter.c_str()), CID_ETHERNET_PORT);
            break;
        default: break;
    }
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
                failed =
                    size(set, 0) == 0 || (_rule.sets[set].ids[1] != CID_NONE && size(set, 1) == 0);
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

    Key_Sink outer(_facts, e.exact);
    keys_of(e.outer, _picked[end - 1], outer);
    if (outer.size() == 0)
        return;

    if (e.match == Match::POSITION) {
        size_t j = _positions[end - 1];
        if (j >= set->size() || !keeps(e, set->at(j)))
            return;
        Key_Sink inner(_facts, e.exact);
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
    Key_Sink keys(_facts, e.exact);
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
    const unsigned char* slot = __slot(instance, mp->offset);
    if (__null_flag(slot, mp))
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
            if (v >= 0)
                keys.add((unsigned long long)v);
            else
                keys.add(("-" + decimal(0ull - (unsigned long long)v)).c_str());
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
        __ref_slot(__slot(association, _offsets[e])) = copy;
    }
    _sink(association, _target);
}

}  // namespace

// ---- Key_Sink, Adapter_Facts -------------------------------------------------

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
    std::string text = decimal(number);
    add(text.c_str(), text.size());
}

const String& Adapter_Facts::address(unsigned number) {
    static const String none;
    if (!_listed) {
        _listed = true;
        Json::Value adapters;
        if (ProviderUtil::getNumberOfAdapters(adapters) > 0) {
            const Json::Value& keys = jsonArray(adapters, "indexStrings");
            for (Json::ArrayIndex i = 0; i < keys.size(); i++)
                _addresses.push_back(jsonAsString(keys[i]));
        }
    }
    if (number < 1 || number > _addresses.size()) {
        TVRN_LOG(LL_INFO, "numOfAdapters = %u. Id = %u", unsigned(_addresses.size()), number);
        return none;
    }
    return _addresses[number - 1];
}

String Adapter_Facts::serialNumber(unsigned number) {
    auto known = _serials.find(number);
    if (known != _serials.end())
        return known->second;
    const String& adapter = address(number);
    String serial = adapter.size() ? ProviderUtil::getAdapterSerialNumber(adapter) : String();
    _serials[number] = serial;
    return serial;
}

// ---- the entry --------------------------------------------------------------

Enum_Instances_Status enumerate_pairs(const Pairing& rule, const Meta_Class* association,
                                      Association_Sink sink, void* target) noexcept {
    log(LL_DBG, rule.file, rule.line, "Entering: %s", "enum_instances");
    Enum_Instances_Status status = ENUM_INSTANCES_FAILED;
    try {
        // One host identity for every instance the request builds.
        HostIdentityScope host;
        Pairing_Run run(rule, association, sink, target);
        status = run.run();
    } catch (const HbaAgentError& e) {
        log(LL_ERR, rule.file, rule.line, "enum_instances got User exception %d: %s", e.code,
            e.message.c_str());
    } catch (const std::exception& e) {
        log(LL_ERR, rule.file, rule.line, "enum_instances got std exception: %s", e.what());
    } catch (...) {
        log(LL_ERR, rule.file, rule.line, "enum_instances got default exception");
    }
    log(LL_DBG, rule.file, rule.line, "Returning: %s", "enum_instances");
    return status;
}

const Property<String>* text_property(const Instance* instance, const char* name) {
    const Meta_Property* mp = instance ? find_property(instance->meta_class, name) : nullptr;
    if (mp == nullptr || mp->type != STRING || mp->subscript != 0)
        return nullptr;
    return reinterpret_cast<const Property<String>*>(__slot(instance, mp->offset));
}

// ---- keys of physical connectors -----------------------------------------------

namespace {

// The decimal number that ends text[0..end), and where it begins; false when
// there is none.
bool number_before(const char* text, size_t end, unsigned& value, size_t& begin) {
    begin = end;
    while (begin > 0 && text[begin - 1] >= '0' && text[begin - 1] <= '9')
        begin--;
    if (begin == end || end - begin > 9)
        return false;
    value = unsigned(strtoul(std::string(text + begin, end - begin).c_str(), nullptr, 10));
    return true;
}

}  // namespace

bool parse_connector_tag(const Instance* connector, unsigned& adapter, unsigned& position) {
    const auto* c = static_cast<const TAVRIN_PhysicalConnector*>(connector);
    if (c == nullptr || c->Tag.null)
        return false;
    const char* tag = c->Tag.value.c_str();
    size_t begin = 0;
    if (!number_before(tag, c->Tag.value.size(), position, begin) || begin == 0 ||
        tag[begin - 1] != '_')
        return false;
    if (!number_before(tag, begin - 1, adapter, begin) || begin == 0 || tag[begin - 1] != '_')
        return false;
    return true;
}

void connector_adapter_number(Key_Sink& keys, const Instance* connector) {
    unsigned adapter = 0, position = 0;
    if (parse_connector_tag(connector, adapter, position))
        keys.add(adapter);
}

void connector_port_position(Key_Sink& keys, const Instance* connector) {
    unsigned adapter = 0, position = 0;
    if (parse_connector_tag(connector, adapter, position))
        keys.add(position);
}

}  // namespace CPTA
