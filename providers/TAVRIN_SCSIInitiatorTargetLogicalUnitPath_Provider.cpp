// The provider of TAVRIN_SCSIInitiatorTargetLogicalUnitPath: every path from
// a local initiator port through a remote target port to a LUN behind it.
//
// A target endpoint's ElementName is the local port WWN "_" the remote port
// WWN; a LUN's DeviceID begins with the same two WWNs, each followed by "_".
// So an initiator leads to the targets whose local WWN is its own, and a
// target to the LUNs (storage extents, then tape drives) whose two WWNs are
// its own.
//
// The paths from one object are found among the endpoints and LUNs of the
// one local port (and remote port) its keys name: an initiator's Name is its
// port's WWN, a target's the two WWNs, a LUN's DeviceID begins with them.
#include <cstdio>

#include "inventory/FCHBAManager.h"
#include "inventory/PortHelper.h"
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_SCSIInitiatorTargetLogicalUnitPath_Methods.h"
#include "schema/generated/TAVRIN_SCSIProtocolEndpoint.h"

namespace CPTA {

namespace {

const uint16 kInitiator = 2;  // Role
const char kNoInstances[] = "Error: Invalid number of instances returned!\n";

bool is_initiator(const Instance* instance) {
    const auto* endpoint = static_cast<const TAVRIN_SCSIProtocolEndpoint*>(instance);
    return !endpoint->Role.null && endpoint->Role.value == kInitiator;
}

bool is_target(const Instance* instance) {
    return !is_initiator(instance);
}

// The text of a property up to its first "_" (`fields` 1) or its second
// (`fields` 2), or (`fields` 0) the whole text when it has a "_"; nothing
// when it has fewer.
void leading_fields(Key_Sink& keys, const Instance* instance, const char* name, int fields) {
    const Property<String>* text = text_property(instance, name);
    if (text == nullptr || text->null)
        return;
    size_t end = text->value.find('_');
    if (end == String::npos)
        return;
    if (fields == 0)
        end = text->value.size();
    else if (fields == 2 && (end = text->value.find('_', end + 1)) == String::npos)
        return;
    keys.add(text->value.c_str(), end);
}

// A target: its local port WWN / its local and remote port WWNs.
void local_port_of_target(Key_Sink& keys, const Instance* target) {
    leading_fields(keys, target, "ElementName", 1);
}

void ports_of_target(Key_Sink& keys, const Instance* target) {
    leading_fields(keys, target, "ElementName", 0);
}

// A LUN (a storage extent or a tape drive): the two WWNs its DeviceID begins
// with.
void ports_of_unit(Key_Sink& keys, const Instance* unit) {
    leading_fields(keys, unit, "DeviceID", 2);
}

void report_counts(const Pairing_Sets& sets) {
    size_t initiators = 0, targets = 0;
    for (size_t i = 0; i < sets.size(1); i++)
        if (const Instance* endpoint = sets.at(1, i))
            (is_initiator(endpoint) ? initiators : targets)++;
    char text[256];
    snprintf(text, sizeof(text), "Number of SCSIPROTOCOLENDPOINT(Initiator and Target)= %d",
             int(sets.size(1)));
    TVRN_LOG(LL_DBG, "%s", text);
    TVRN_LOG(LL_DBG, "Building and returning association instances");
    TVRN_LOG(LL_DBG,
             "Number of SCSIPROTOCOLENDPOINT(Initiator)= %d; SCSIPROTOCOLENDPOINT(Target)= %d; "
             "STORAGEEXTENT= %d; TAPEDRIVE= %d ",
             int(initiators), int(targets), int(sets.size(0, 0)), int(sets.size(0, 1)));
}

constexpr Pairing kPaths =
    TVRN_PAIRING.fetch_discovered(CID_STORAGE_EXTENT, CID_TAPE_DRIVE)
        .when_empty(LL_ERR, kNoInstances)  // 0
        .fetch(CID_SCSI_PROTOCOL_ENDPOINT)
        .when_empty(LL_ERR, kNoInstances)  // 1
        .report(report_counts)
        .for_each(1, is_initiator)
        .as("Initiator")
        .with_all(1, "Target", key("ElementName"), key(local_port_of_target))
        .only(is_target)
        .with_all(0, "LogicalUnit", key(ports_of_target), key(ports_of_unit));

// The sets of the paths from one object, read from its keys: a Name (an
// endpoint) or a DeviceID (a LUN). Another object of this host has a
// DeviceID without the two WWNs, and no path.
class Path_Scope : public Pairing_Fetcher {
public:
    explicit Path_Scope(const Instance* source) : _reach(UNKNOWN) {
        // The source holds its keys only: a Name or a DeviceID.
        const Property<String>* name = text_property(source, "Name");
        const Property<String>* device = text_property(source, "DeviceID");
        if (name != nullptr && name->null)
            name = nullptr;
        if (device != nullptr && device->null)
            device = nullptr;
        if ((name != nullptr) == (device != nullptr))
            return;
        const String& text = (name ? name : device)->value;
        const size_t first = text.find('_');
        _reach = NOTHING;
        if (name != nullptr) {
            // An initiator: its port's endpoints and LUNs; a target: its own.
            _port = text.substr(0, first);
            if (first != String::npos)
                _remote = text.substr(first + 1);
        } else {
            const size_t second = first == String::npos ? first : text.find('_', first + 1);
            if (second == String::npos)
                return;
            _port = text.substr(0, first);
            _remote = text.substr(first + 1, second - first - 1);
        }
        if (_port.size() > 0 && (first == String::npos || _remote.size() > 0))
            _reach = NARROWED;
    }

    Reach reach() const { return _reach; }

    Array<Instance*> fetch(classId_t id) override {
        FCHBAManager* inventory = FCHBAManager::getFCHBAManager();
        PortScope scope;
        scope.port = _port;
        if (_remote.size() > 0) {
            scope.remote = _remote;
            scope.remotes = PortScope::ONE_REMOTE;
        }
        Array<Instance*> found = inventory->getInstancesByPort(id, scope);
        if (id == CID_SCSI_PROTOCOL_ENDPOINT && _remote.size() > 0) {
            // The port's own endpoint, the initiator of the paths, first.
            scope.remotes = PortScope::NO_REMOTES;
            Array<Instance*> initiator = inventory->getInstancesByPort(id, scope);
            initiator.append(found.data(), found.size());
            return initiator;
        }
        return found;
    }

private:
    Reach _reach;
    String _port, _remote;
};

}  // namespace

class TAVRIN_SCSIInitiatorTargetLogicalUnitPath_Provider
    : public Scoped_Pairing_Provider<TAVRIN_SCSIInitiatorTargetLogicalUnitPath, kPaths, Path_Scope>,
      public TAVRIN_SCSIInitiatorTargetLogicalUnitPath_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(SCSIInitiatorTargetLogicalUnitPath)
