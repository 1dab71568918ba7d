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

// The paths from one object are paired from the endpoints and LUNs of the
// one port (and target) its keys name; an FC port is no end of a path.
constexpr Object_Scopes kScopes =
    Object_Scopes()
        .from(CID_SCSI_PROTOCOL_ENDPOINT, Narrowing::PATHS, Narrowing::PATHS)
        .from(CID_STORAGE_EXTENT, Narrowing::PATHS, Narrowing::PATHS)
        .from(CID_TAPE_DRIVE, Narrowing::PATHS, Narrowing::PATHS)
        .from(CID_FC_PORT, Narrowing::NONE, Narrowing::NONE);

}  // namespace

class TAVRIN_SCSIInitiatorTargetLogicalUnitPath_Provider
    : public Keyed_Pairing_Provider<TAVRIN_SCSIInitiatorTargetLogicalUnitPath, kPaths, kScopes>,
      public TAVRIN_SCSIInitiatorTargetLogicalUnitPath_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(SCSIInitiatorTargetLogicalUnitPath)
