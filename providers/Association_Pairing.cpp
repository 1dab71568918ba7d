// The inventory's side of the pairing engine: the sets of a rule come from
// the dispatchers, and adapter serial numbers from the adapter library.
#include "providers/Association_Pairing.h"

#include <cctype>
#include <cstdlib>
#include <exception>
#include <map>
#include <vector>

#include <json/json.h>

#include "diagnostics/DiagnosticHelper.h"
#include "gateway/HbaAgentError.h"
#include "gateway/JsonAccess.h"
#include "gateway/ProviderUtil.h"
#include "inventory/ConnectorTag.h"
#include "inventory/EthernetPortHelper.h"
#include "inventory/FCHBAManager.h"
#include "inventory/HostIdentityScope.h"
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

One_Port_Scope::One_Port_Scope(const Instance* source) : _reach(UNKNOWN) {
    const Property<String>* named = nullptr;
    for (const char* key : {"DeviceID", "InstanceID", "Name"}) {
        const Property<String>* p = text_property(source, key);
        if (p == nullptr || p->null)
            continue;
        if (named != nullptr)
            return;  // not an object of a port
        named = p;
    }
    if (named == nullptr)
        return;
    _reach = NOTHING;
    const String& wwn = named->value;
    if (wwn.size() != 16)
        return;
    for (size_t i = 0; i < wwn.size(); i++)
        if (!isxdigit(static_cast<unsigned char>(wwn[i])))
            return;
    _port = wwn;
    _reach = NARROWED;
}

Array<Instance*> One_Port_Scope::fetch(classId_t id) {
    PortScope scope;
    scope.port = _port;
    scope.remotes = PortScope::NO_REMOTES;
    return FCHBAManager::getFCHBAManager()->getInstancesByPort(id, scope);
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
