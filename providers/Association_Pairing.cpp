// The inventory's side of the pairing engine: the sets of a rule come from
// the dispatchers, and adapter serial numbers from the adapter library.
#include "providers/Association_Pairing.h"

#include <cctype>
#include <cstdio>
#include <cstdlib>
#include <exception>
#include <map>
#include <vector>

#include <json/json.h>

#include "diagnostics/DiagnosticHelper.h"
#include "framework/Request_Failure.h"
#include "gateway/HbaAgentError.h"
#include "gateway/JsonAccess.h"
#include "gateway/ProviderUtil.h"
#include "inventory/AdapterHelper.h"
#include "inventory/ConnectorTag.h"
#include "inventory/EthernetPortHelper.h"
#include "inventory/FCHBAManager.h"
#include "inventory/HostIdentityScope.h"
#include "inventory/InventoryCommon.h"
#include "inventory/InventoryLookup.h"
#include "inventory/PortHelper.h"
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

// The sets of one request, from the dispatchers; the adapter list and serial
// numbers read at most once per request (a key is computed for many
// instances).
class Inventory_Sources : public Pairing_Sources {
public:
    explicit Inventory_Sources(Pairing_Fetcher* fetcher) : _fetcher(fetcher) {}

    Array<Instance*> fetch(Source source, int id, const Meta_Class*& expected) override {
        if (source == Source::DIAGNOSTIC_TESTS) {
            expected = &TAVRIN_DiagnosticTest::static_meta_class;
            return DiagnosticHelper::getDiagnosticHelperObject()->getDiagnosticServices();
        }
        expected = class_of(classId_t(id));
        if (_fetcher != nullptr)
            return _fetcher->fetch(classId_t(id));
        return source == Source::HOST_DISCOVERED
                   ? HDRManager::getHDRManager()->getInstances(classId_t(id))
                   : FCHBAManager::getFCHBAManager()->getInstances(classId_t(id));
    }

    Array<Instance*> fetch_for(Source source, const String& adapter,
                               const Meta_Class*& expected) override {
        expected = &TAVRIN_EthernetPort::static_meta_class;
        switch (source) {
            case Source::FC_PORTS_OF_ADAPTER:
                expected = &TAVRIN_FCPort::static_meta_class;
                return FCHBAManager::getFCHBAManager()->getFCPortInstancesByAdapter(adapter);
            case Source::ETHERNET_PORTS_OF_ADAPTER:
                return FCHBAManager::getFCHBAManager()->getEthernetPortInstancesByAdapter(adapter);
            case Source::ETHERNET_PORTS_OF_ADAPTER_NUMBER:
                return EthernetPortHelper::getEthernetPortHelperObject()->getInstancesByAdapterId(
                    atoi(adapter.c_str()), CID_ETHERNET_PORT);
            default: return Array<Instance*>();
        }
    }

    // ProviderUtil::getAdapterSerialNumber of adapter `number`, whose address
    // comes from one reading of the adapter list per request.
    String adapter_serial_number(unsigned number) override;

private:
    const String& address(unsigned number);

    Pairing_Fetcher* _fetcher;
    bool _listed = false;
    std::vector<String> _addresses;
    std::map<unsigned, String> _serials;
};

const String& Inventory_Sources::address(unsigned number) {
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

String Inventory_Sources::adapter_serial_number(unsigned number) {
    auto known = _serials.find(number);
    if (known != _serials.end())
        return known->second;
    const String& adapter = address(number);
    String serial = adapter.size() ? ProviderUtil::getAdapterSerialNumber(adapter) : String();
    _serials[number] = serial;
    return serial;
}

}  // namespace

namespace {

// Logs why the request failed and gives the client the same text.
template <class... Args>
void failed(const Pairing& rule, const char* format, Args... args) {
    char text[512];
    std::snprintf(text, sizeof text, format, args...);
    log(LL_ERR, rule.file, rule.line, "%s", text);
    note_request_failure(text);
}

}  // namespace

Enum_Instances_Status enumerate_inventory_pairs(const Pairing& rule, const Meta_Class* association,
                                                Association_Sink sink, void* target,
                                                Pairing_Fetcher* fetcher) noexcept {
    log(LL_DBG, rule.file, rule.line, "Entering: %s", "enum_instances");
    Enum_Instances_Status status = ENUM_INSTANCES_FAILED;
    try {
        // One host identity for every instance the request builds.
        HostIdentityScope host;
        Inventory_Sources sources(fetcher);
        status = enumerate_pairs(rule, association, sources, sink, target);
    } catch (const HbaAgentError& e) {
        failed(rule, "enum_instances got User exception %d: %s", e.code, e.message.c_str());
    } catch (const std::exception& e) {
        failed(rule, "enum_instances got std exception: %s", e.what());
    } catch (...) {
        failed(rule, "%s", "enum_instances got default exception");
    }
    log(LL_DBG, rule.file, rule.line, "Returning: %s", "enum_instances");
    return status;
}

// ---- requests from one object ----------------------------------------------

namespace {

struct Scoped_Names {
    const Instance* source;
    const char* result_class;
    const char* role;
    const char* result_role;
    Enum_Associator_Names_Handler<Instance>* handler;
    bool stopped;
};

const char* c_str_or_null(const String& s) {
    return s.size() ? s.c_str() : nullptr;
}

// As the binding does with each association of an enumeration: hands on the
// ends other than the source, then lets the association go.
void deliver_associators(Instance* association, void* target) {
    Scoped_Names* names = static_cast<Scoped_Names*>(target);
    Ref<> hold(association);
    if (names->stopped)
        return;
    std::vector<const Instance*> ends(association->meta_class->num_meta_features + 1);
    int n = get_associators(names->source, association, names->result_class, names->role,
                            names->result_role, ends.data());
    for (int i = 0; i < n && !names->stopped; i++) {
        ref(ends[i]);
        if (!names->handler->handle(const_cast<Instance*>(ends[i])))
            names->stopped = true;
    }
}

struct Scoped_References {
    const Instance* source;
    const char* role;
    bool (*hand_on)(Instance* association, void* handler);
    void* handler;
    bool stopped;
};

void deliver_reference(Instance* association, void* target) {
    Scoped_References* refs = static_cast<Scoped_References*>(target);
    bool refers = false;
    if (!refs->stopped) {
        try {
            refers = is_reference_of(refs->source, association, refs->role);
        } catch (...) {
            refs->stopped = true;
        }
    }
    if (!refers) {
        unref(association);
        return;
    }
    if (!refs->hand_on(association, refs->handler))
        refs->stopped = true;
}

}  // namespace

Enum_Associator_Names_Status scoped_associator_names(
    const Pairing& rule, const Meta_Class* association, Pairing_Fetcher& fetcher,
    const Instance* source, const String& result_class, const String& role,
    const String& result_role, Enum_Associator_Names_Handler<Instance>* handler) noexcept {
    Scoped_Names names = {source,
                          c_str_or_null(result_class),
                          c_str_or_null(role),
                          c_str_or_null(result_role),
                          handler,
                          false};
    return enumerate_inventory_pairs(rule, association, deliver_associators, &names, &fetcher) ==
                   ENUM_INSTANCES_FAILED
               ? ENUM_ASSOCIATOR_NAMES_FAILED
               : ENUM_ASSOCIATOR_NAMES_OK;
}

Enum_References_Status scoped_references(const Pairing& rule, const Meta_Class* association,
                                         Pairing_Fetcher& fetcher, const Instance* source,
                                         const String& role,
                                         bool (*hand_on)(Instance* association, void* handler),
                                         void* handler) noexcept {
    Scoped_References refs = {source, c_str_or_null(role), hand_on, handler, false};
    return enumerate_inventory_pairs(rule, association, deliver_reference, &refs, &fetcher) ==
                   ENUM_INSTANCES_FAILED
               ? ENUM_REFERENCES_FAILED
               : ENUM_REFERENCES_OK;
}

// ---- scopes as data -------------------------------------------------------------

namespace {

const size_t kWwnDigits = 16;
const size_t kMacDigits = 12;

// The class id a class stands for, 0 when the associations fetch none.
classId_t class_id_of(const Meta_Class* meta_class) {
    for (int id = 1; id < MAXCLASSID; id++)
        if (class_of(classId_t(id)) == meta_class)
            return classId_t(id);
    return classId_t(0);
}

// The value of a text key, or "".
String key_text(const Instance* source, const char* name) {
    const Property<String>* p = text_property(source, name);
    return p == nullptr || p->null ? String() : p->value;
}

// `text` up to its first "_" when it is `digits` hexadecimal digits, else "".
String address_in(const String& text, size_t digits) {
    size_t end = text.find('_');
    if (end == String::npos)
        end = text.size();
    if (end != digits)
        return String();
    for (size_t i = 0; i < end; i++)
        if (!isxdigit(static_cast<unsigned char>(text[i])))
            return String();
    return text.substr(0, end);
}

bool is_adapter_class(classId_t id) {
    return id == CID_PORT_CONTROLLER || id == CID_PHYSICAL_PACKAGE || id == CID_PRODUCT ||
           id == CID_ADAPTER_SOFTWARE_IDENTITY;
}

}  // namespace

Object_Scope::Object_Scope(const Pairing& rule, const Object_Scopes& scopes, const Instance* source)
    : _rule(rule) {
    try {
        const classId_t from = source ? class_id_of(source->meta_class) : CID_NONE;
        _from = from;
        for (size_t r = 0; r < scopes.num_rows && from != CID_NONE; r++)
            if (scopes.rows[r].from == from)
                _row = &scopes.rows[r];
        if (_row == nullptr)
            return;
        // What the keys name: an adapter, an FC port (the local one of a
        // target or LUN) or an Ethernet port.
        switch (from) {
            case CID_PORT_CONTROLLER: {
                const String id = key_text(source, "DeviceID");
                _adapter = address_in(id, kWwnDigits).size() ? address_in(id, kWwnDigits)
                                                             : address_in(id, kMacDigits);
                if (_adapter.size() != id.size())
                    _adapter = String();
                _adapterKnown = true;
                break;
            }
            case CID_ADAPTER_SOFTWARE_IDENTITY: {
                // Only a firmware or BIOS identity names its adapter; a
                // driver's pairs with every adapter that has the driver.
                const String id = key_text(source, "InstanceID");
                const size_t end = id.find('_');
                const String kind = end == String::npos ? String() : id.substr(end + 1);
                if (kind != "firmware" && kind != "bios")
                    return;
                _adapter = address_in(id, kWwnDigits).size() ? address_in(id, kWwnDigits)
                                                             : address_in(id, kMacDigits);
                _adapterKnown = true;
                break;
            }
            case CID_FC_PORT_STATISTICS:
                _port = address_in(key_text(source, "InstanceID"), kWwnDigits);
                break;
            case CID_SCSI_PROTOCOL_ENDPOINT: {
                // The port's own: its WWN; a target's: that, "_", the target's.
                const String name = key_text(source, "Name");
                _port = address_in(name, kWwnDigits);
                if (_port.size() > 0 && name.size() > _port.size()) {
                    _remote = name.substr(_port.size() + 1);
                    if (address_in(_remote, kWwnDigits).size() != _remote.size() ||
                        _remote.size() == 0)
                        _port = _remote = String();
                }
                break;
            }
            case CID_ETHERNET_PORT: {
                const String id = key_text(source, "DeviceID");
                _mac = address_in(id, kMacDigits).size() == id.size() ? id : String();
                break;
            }
            case CID_FC_PORT:
            case CID_ALARM_DEVICE: {
                const String id = key_text(source, "DeviceID");
                _port = address_in(id, kWwnDigits).size() == id.size() ? id : String();
                break;
            }
            case CID_STORAGE_EXTENT:
            case CID_TAPE_DRIVE:
            case CID_LOGICAL_DISK: {
                // The local port's WWN, "_", the target's, "_", and the LUN.
                const String id = key_text(source, "DeviceID");
                const size_t remote = kWwnDigits + 1, end = remote + kWwnDigits;
                if (address_in(id, kWwnDigits).size() > 0 && id.size() > end && id[end] == '_' &&
                    address_in(id.substr(remote), kWwnDigits).size() > 0) {
                    _port = id.substr(0, kWwnDigits);
                    _remote = id.substr(remote, kWwnDigits);
                }
                break;
            }
            default: break;
        }

        _reach = NOTHING;
        // As the walks: nothing is asked while the driver is not usable, and
        // then every set that could hold the source is empty.
        if (!ProviderUtil::getDriverStatus())
            return;
        for (size_t set = 0; set < rule.num_sets; set++) {
            if (is_per_element(rule.sets[set].source))
                continue;
            switch (_row->sets[set]) {
                case Narrowing::NONE: return;
                case Narrowing::WHOLE: break;
                case Narrowing::OBJECT:
                    if (!lookupInventory(from, source, _object)) {
                        _reach = UNKNOWN;
                        return;
                    }
                    if (_object.size() == 0)
                        return;
                    break;
                case Narrowing::ADAPTER:
                    if (_adapter.size() == 0 && _port.size() == 0 && _mac.size() == 0)
                        return;
                    break;
                case Narrowing::PORT:
                case Narrowing::PATHS:
                    if (_port.size() == 0)
                        return;
                    break;
                case Narrowing::ETHERNET_PORT:
                    if (_mac.size() == 0)
                        return;
                    break;
            }
        }
        _reach = NARROWED;
    } catch (...) {
        _reach = UNKNOWN;
    }
}

Object_Scope::~Object_Scope() {
    for (size_t i = 0; i < _object.size(); i++)
        if (_object[i] != nullptr)
            destroy(_object[i]);
}

const String& Object_Scope::adapter() {
    if (!_adapterKnown) {
        _adapterKnown = true;
        _adapter =
            ProviderUtil::eraseColonsFromIndex(owningAdapterKey(_port.size() ? _port : _mac));
    }
    return _adapter;
}

Array<Instance*> Object_Scope::fetch(classId_t id) {
    size_t set = 0;
    while (set < _rule.num_sets && (is_per_element(_rule.sets[set].source) ||
                                    (_rule.sets[set].ids[0] != id && _rule.sets[set].ids[1] != id)))
        set++;
    const Narrowing narrowing = set < _rule.num_sets ? _row->sets[set] : Narrowing::WHOLE;
    Array<Instance*> found;
    switch (narrowing) {
        case Narrowing::NONE: return found;
        case Narrowing::WHOLE:
            return set < _rule.num_sets && _rule.sets[set].source == Source::HOST_DISCOVERED
                       ? HDRManager::getHDRManager()->getInstances(id)
                       : FCHBAManager::getFCHBAManager()->getInstances(id);
        case Narrowing::OBJECT:
            // The part of a set that holds the source; its other part has
            // nothing that can be the source.
            if (id == _from)
                found.swap(_object);
            return found;
        case Narrowing::ADAPTER:
            if (is_adapter_class(id) && adapter().size() > 0)
                found =
                    AdapterHelper::getAdapterHelperInstance()->getInstancesByAddress(id, adapter());
            return found;
        case Narrowing::PORT: {
            PortScope scope;
            scope.port = _port;
            scope.remotes = PortScope::NO_REMOTES;
            return FCHBAManager::getFCHBAManager()->getInstancesByPort(id, scope);
        }
        case Narrowing::PATHS: {
            FCHBAManager* inventory = FCHBAManager::getFCHBAManager();
            PortScope scope;
            scope.port = _port;
            if (_remote.size() > 0) {
                scope.remote = _remote;
                scope.remotes = PortScope::ONE_REMOTE;
            }
            found = inventory->getInstancesByPort(id, scope);
            if (id == CID_SCSI_PROTOCOL_ENDPOINT && _remote.size() > 0) {
                // The port's own endpoint, first, as the walk gives it.
                scope.remotes = PortScope::NO_REMOTES;
                Array<Instance*> own = inventory->getInstancesByPort(id, scope);
                own.append(found.data(), found.size());
                found.clear();
                return own;
            }
            return found;
        }
        case Narrowing::ETHERNET_PORT:
            return EthernetPortHelper::getEthernetPortHelperObject()->getInstancesByPort(id, _mac);
    }
    return found;
}

// ---- keys of physical connectors ---------------------------------------------

bool parse_connector_tag(const Instance* connector, unsigned& adapter, unsigned& position) {
    const auto* c = static_cast<const TAVRIN_PhysicalConnector*>(connector);
    return c != nullptr && !c->Tag.null && parseConnectorTag(c->Tag.value, adapter, position);
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
