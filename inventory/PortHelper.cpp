#include "inventory/PortHelper.h"

#include <cerrno>
#include <cstdlib>
#include <limits>

#include "gateway/CIMProviderTfaj.h"
#include "gateway/GuardedCall.h"
#include "gateway/JsonAccess.h"
#include "gateway/ProviderUtil.h"
#include "inventory/InventoryCommon.h"
#include "inventory/TargetHelper.h"
#include "schema/generated/TAVRIN_AlarmDevice.h"
#include "schema/generated/TAVRIN_FCPort.h"
#include "schema/generated/TAVRIN_FCPortStatistics.h"
#include "schema/generated/TAVRIN_LogicalPortGroup.h"
#include "schema/generated/TAVRIN_SCSIProtocolEndpoint.h"

namespace CPTA {

namespace {

const sint64 kGigabit = 1000000000;
const sint64 kSpeedUnknown = 99999;  // "operatingSpeed" of a port without link
const size_t kWwnDigits = 16;

// Gigabits per second as bits per second; 0 for a negative or an impossible
// figure.
sint64 bitsPerSecond(sint64 gigabits) {
    if (gigabits < 0 || gigabits > std::numeric_limits<sint64>::max() / kGigabit)
        return 0;
    return gigabits * kGigabit;
}

// ---- statistics ------------------------------------------------------------------

typedef prov_pport_stats_s Stats;

// Which statistic id feeds which counter, per column.
struct StatId {
    int id;
    uint64 Stats::*counter;
};

const StatId kFcStatIds[] = {
    {1402, &Stats::txFrames},       {1403, &Stats::txWords},
    {1409, &Stats::rxFrames},       {1410, &Stats::rxWords},
    {1411, &Stats::lipCount},       {1412, &Stats::nosCount},
    {1421, &Stats::errorFrames},    {1422, &Stats::droppedFrames},
    {1423, &Stats::linkFailures},   {1424, &Stats::lossOfSync},
    {1425, &Stats::lossOfSignal},   {1426, &Stats::primitiveSeqErrors},
    {1428, &Stats::invalidTxWords}, {1416, &Stats::crcErrors},
};

const StatId kFcoeStatIds[] = {
    {1615, &Stats::fcoeErrA}, {1624, &Stats::fcoeDropped}, {1625, &Stats::fcoeErrB},
    {1616, &Stats::fcoeCrc},  {1626, &Stats::fcoeCrc},     {1627, &Stats::fcoeErrC},
    {1628, &Stats::fcoeErrD},
};

// How each property of TAVRIN_FCPortStatistics is computed, per column
// (a missing function means 0).
typedef uint64 (*StatValue)(const Stats&);
struct StatProperty {
    Property<uint64> TAVRIN_FCPortStatistics::*property;
    StatValue fc;
    StatValue fcoe;
};

typedef TAVRIN_FCPortStatistics PS;
const StatProperty kStatProperties[] = {
    {&PS::BytesTransmitted, [](const Stats& s) { return s.txWords * 4; }, nullptr},
    {&PS::BytesReceived, [](const Stats& s) { return s.rxWords * 4; }, nullptr},
    {&PS::PacketsTransmitted, [](const Stats& s) { return s.txFrames; }, nullptr},
    {&PS::PacketsReceived, [](const Stats& s) { return s.rxFrames; }, nullptr},
    {&PS::LIPCount, [](const Stats& s) { return s.lipCount; }, nullptr},
    {&PS::NOSCount, [](const Stats& s) { return s.nosCount; }, nullptr},
    {&PS::ErrorFrames, [](const Stats& s) { return s.errorFrames; },
     [](const Stats& s) { return s.fcoeErrA + s.fcoeCrc + s.fcoeErrB + s.fcoeErrC + s.fcoeErrD; }},
    {&PS::DumpedFrames, [](const Stats& s) { return s.droppedFrames; },
     [](const Stats& s) { return s.fcoeDropped; }},
    {&PS::LinkFailures, [](const Stats& s) { return s.linkFailures; }, nullptr},
    {&PS::LossOfSignalCounter, [](const Stats& s) { return s.lossOfSignal; }, nullptr},
    {&PS::LossOfSyncCounter, [](const Stats& s) { return s.lossOfSync; }, nullptr},
    {&PS::PrimitiveSeqProtocolErrCount, [](const Stats& s) { return s.primitiveSeqErrors; },
     nullptr},
    {&PS::CRCErrors, [](const Stats& s) { return s.crcErrors; },
     [](const Stats& s) { return s.fcoeCrc; }},
    {&PS::InvalidTransmissionWords, [](const Stats& s) { return s.invalidTxWords; }, nullptr},
};

// A counter value: decimal digits only, within 64 bits.
bool parseCounter(const String& text, uint64& value) {
    if (text.size() == 0)
        return false;
    for (size_t i = 0; i < text.size(); i++)
        if (text[i] < '0' || text[i] > '9')
            return false;
    errno = 0;
    unsigned long long v = std::strtoull(text.c_str(), nullptr, 10);
    if (errno == ERANGE)
        return false;
    value = v;
    return true;
}

}  // namespace

PortHelper::PortHelper() : _targetHelper(TargetHelper::getTargetHelperObject()) {}

PortHelper* PortHelper::getPortHelperObject() {
    static PortHelper instance;
    return &instance;
}

// ---- walks -------------------------------------------------------------------------

Array<Instance*> PortHelper::getInstancesByClass(classId_t classId) {
    return runWalk("PortHelper::getInstancesByClass", [&](InstanceList& out) {
        forEachAdapter("No adapters in the system. ", false, [&](int, const String& key) {
            walkAdapter(key, classId, BY_NUMBER, out, PortScope());
        });
    });
}

Array<Instance*> PortHelper::getInstancesByAdapterId(int adapterNumber, classId_t classId,
                                                     const Json::Value& allAdapters) {
    return runWalk("PortHelper::getInstancesByAdapterId", [&](InstanceList& out) {
        walkAdapter(adapterKeyAt(allAdapters, adapterNumber), classId, BY_NUMBER, out, PortScope());
    });
}

Array<Instance*> PortHelper::getInstancesByAdapterAddress(const String& adapterKey,
                                                          classId_t classId) {
    return runWalk("PortHelper::getInstancesByAdapterAddress", [&](InstanceList& out) {
        walkAdapter(ProviderUtil::getIndexInColonFormat(adapterKey), classId, BY_ADDRESS, out,
                    PortScope());
    });
}

Array<Instance*> PortHelper::getInstancesByPort(classId_t classId, const PortScope& scope) {
    return runWalk("PortHelper::getInstancesByPort", [&](InstanceList& out) {
        // As the walk of all ports: the adapter's key from the adapter list.
        const String key = owningAdapterKey(scope.port);
        if (key.size() > 0)
            walkAdapter(key, classId, BY_NUMBER, out, scope);
    });
}

Array<Instance*> PortHelper::getFCPortInstancesByAdapter(const String& adapterKey) {
    TVRN_LOG(LL_DBG, "getFCPortInstancesByAdapter invoked with address= %s", adapterKey.c_str());
    return getInstancesByAdapterAddress(adapterKey, CID_FC_PORT);
}

void PortHelper::walkAdapter(const String& adapterKey, classId_t classId, WalkForm form,
                             InstanceList& out, const PortScope& scope) {
    Json::Value ports;
    guardedCall(LibCall("libGetFcPhyPortIndicesByAdapter"), libGetFcPhyPortIndicesByAdapter,
                keyRequest("indexStr", adapterKey), ports);
    const bool valid = ProviderUtil::isValidJsonResponse(ports);
    if (!valid || !jsonHas(ports, "indexStrings", Json::arrayValue)) {
        if (form == BY_NUMBER)
            TVRN_LOG(LL_ERR, "libGetFcPhyPortIndicesByAdapter returns NULL.");
        else if (!valid)
            TVRN_LOG(LL_ERR, "libGetFcPhyPortIndicesByAdapter returns NULL");
        else if (jsonMember(ports, "indexStrings") == nullptr)
            TVRN_LOG(LL_ERR, "indexStrings is not member");
        else
            TVRN_LOG(LL_ERR, "indexString not Array");
        return;
    }
    const Json::Value& keys = jsonArray(ports, "indexStrings");
    TVRN_LOG(LL_DBG, "numOfPorts = %u", unsigned(keys.size()));

    for (Json::ArrayIndex i = 0; i < keys.size(); i++) {
        const String portKey = jsonAsString(keys[i]);
        // A port listed by its WWN is known to be out of scope without asking.
        const String listed = ProviderUtil::eraseColonsFromIndex(portKey);
        if (listed.size() == kWwnDigits && !scope.admitsPort(listed))
            continue;
        Json::Value port;
        if (!guardedCall(LibCall("libGetPortByWwn"), libGetPortByWwn, keyRequest("wwn", portKey),
                         port))
            continue;
        // A port the library cannot name is skipped, and said so.
        if (!ProviderUtil::isValidJsonResponse(port) || !port.isObject() ||
            !jsonHas(port, "wwn", Json::stringValue)) {
            TVRN_LOG(LL_ERR, "libGetPortByWwn response is null or has error");
            continue;
        }
        _hbaPortInfo record;
        record.portNumber = sint32(i);
        record.hostName = HostIdentityScope::hostText();
        record.portId = ProviderUtil::eraseColonsFromIndex(jsonString(port, "wwn"));
        if (!scope.admitsPort(record.portId))
            continue;
        record.nodeWwn = ProviderUtil::eraseColonsFromIndex(jsonString(port, "nodeWwn"));
        record.symbolicName = jsonString(port, "PortSymbolicName");
        const sint64 speed = jsonInt64(port, "operatingSpeed");
        record.speed = speed == kSpeedUnknown ? 0 : bitsPerSecond(speed);
        const Json::Value& speeds = jsonArray(port, "supportedPortSpeeds");
        if (speeds.size() > 0 && speeds[0].isInt64())
            record.maxSpeed = bitsPerSecond(speeds[0].asInt64());
        record.portType = jsonInt(port, "portTypeMOFValue");
        record.maxFrameSize = jsonInt64(port, "maxFrameSize");
        record.portState = jsonInt(port, "portStatusValue");
        addPortInstances(port, portKey, record, classId, out, scope);
    }
    TVRN_LOG(LL_DBG, "Returning: %s", "getInstancesByAdapterId");
}

void PortHelper::addPortInstances(const Json::Value& port, const String& portKey,
                                  _hbaPortInfo& record, classId_t classId, InstanceList& out,
                                  const PortScope& scope) {
    switch (classId) {
        case CID_FC_PORT: out.add(getFCPortInstance(record)); break;
        case CID_SCSI_PROTOCOL_ENDPOINT:
            if (scope.remotes != PortScope::ONE_REMOTE)
                out.add(getSCSIProtocolEndpointInstance(record, true));
            addEndpoints(record, out, scope);
            break;
        case CID_FC_PORT_STATISTICS: addStatistics(port, portKey, record, out); break;
        case CID_STORAGE_EXTENT:
        case CID_TAPE_DRIVE:
        case CID_LOGICAL_DISK: {
            Array<Instance*> targets = _targetHelper->getTargetInstances(record, classId, scope);
            out.take(targets);
            break;
        }
        case CID_LOGICAL_PORT_GROUP: out.add(getLogicalPortGroupInstance(record)); break;
        case CID_ALARM_DEVICE:
            if (jsonHas(port, "isMezz", Json::booleanValue) &&
                jsonHas(port, "beaconState", Json::booleanValue)) {
                // Mezzanine adapters have no beacon.
                if (!jsonBool(port, "isMezz"))
                    out.add(getAlarmDeviceInstance(record, jsonBool(port, "beaconState")));
            } else {
                TVRN_LOG(LL_INFO, "beaconState is NOT available failed for %s.",
                         jsonString(port, "wwn").c_str());
            }
            break;
        default: TVRN_LOG(LL_INFO, "Unhandled class support"); break;
    }
}

// The endpoints of the remote targets seen through the port.
void PortHelper::addEndpoints(_hbaPortInfo& record, InstanceList& out, const PortScope& scope) {
    if (scope.remotes == PortScope::NO_REMOTES)
        return;
    const String ownId = record.portId;
    Json::Value request, remotePorts;
    if (!listRemotePorts(ownId, scope.namedRemote(), request, remotePorts))
        return;
    TVRN_LOG(LL_DBG, "Number of Rports = %u", unsigned(remotePorts.size()));
    for (const Json::Value& remote : remotePorts) {
        record.portId = ownId;
        const String remoteWwn = jsonString(remote, "remotePortWwn");
        if (!scope.admitsRemote(ProviderUtil::eraseColonsFromIndex(remoteWwn)))
            continue;
        request["rPortWwn"] = jsonText(remoteWwn);
        Json::Value answer;
        // An exception ends the handling of this port's remote ports.
        if (!guardedCall(LibCall("libGetCompleteRemotePort"), libGetCompleteRemotePort, request,
                         answer))
            break;
        if (!ProviderUtil::isValidJsonResponse(answer) ||
            !jsonHas(answer, "deviceData", Json::objectValue)) {
            TVRN_LOG(LL_ERR, "libGetCompleteRemotePort returned NULL for %s", remoteWwn.c_str());
            continue;
        }
        const Json::Value& device = jsonObject(answer, "deviceData");
        if (!jsonBool(device, "isTarget"))
            continue;
        record.portId.append('_');
        record.portId.append(ProviderUtil::eraseColonsFromIndex(remotePortWwn(remote, answer)));
        record.portState = jsonInt(device, "stateMofValue");
        out.add(getSCSIProtocolEndpointInstance(record, false));
    }
    record.portId = ownId;
}

void PortHelper::addStatistics(const Json::Value& port, const String& portKey,
                               const _hbaPortInfo& record, InstanceList& out) {
    Json::Value list;
    guardedCall(LibCall("libGetDynamicPortStatisticsat"), libGetDynamicPortStatistics,
                keyRequest("indexStr", portKey), list);
    if (!ProviderUtil::isValidJsonResponse(list) || !list.isArray() || list.size() == 0) {
        TVRN_LOG(LL_WARN, "libGetDynamicPortStatistics failed for port WWN= %s",
                 record.portId.c_str());
        return;
    }
    const bool isFCoE = jsonBool(port, "isFCoE");
    out.add(getFCPortStatisticsInstance(record, readStatistics(list, isFCoE), isFCoE));
}

prov_pport_stats_s PortHelper::readStatistics(const Json::Value& list, bool isFCoE) {
    prov_pport_stats_s stats;
    if (!list.isArray())
        return stats;
    const StatId* begin = isFCoE ? kFcoeStatIds : kFcStatIds;
    const StatId* end = isFCoE ? std::end(kFcoeStatIds) : std::end(kFcStatIds);
    for (const Json::Value& element : list) {
        if (!jsonHas(element, "id", Json::intValue))
            continue;
        const int id = jsonInt(element, "id");
        for (const StatId* s = begin; s != end; s++) {
            uint64 value;
            if (s->id != id)
                continue;
            if (parseCounter(jsonString(element, "value"), value))
                stats.*(s->counter) = value;
            else
                TVRN_LOG(LL_WARN, "Statistic %d has no decimal value; counted as 0", id);
        }
    }
    return stats;
}

// ---- per-port queries ---------------------------------------------------------------

int PortHelper::getNumberOfPorts(const String& adapterKey, Json::Value& ports) {
    try {
        ports = libGetFcPhyPortIndicesByAdapter(
            keyRequest("indexStr", ProviderUtil::getIndexInColonFormat(adapterKey)));
    } catch (const HbaAgentError& e) {
        logWalkException("PortHelper::getNumberOfPorts", &e, nullptr);
        return -1;
    } catch (const std::exception& e) {
        logWalkException("PortHelper::getNumberOfPorts", nullptr, &e);
        return -1;
    } catch (...) {
        logWalkException("PortHelper::getNumberOfPorts", nullptr, nullptr);
        return -1;
    }
    if (ProviderUtil::isValidJsonResponse(ports) &&
        jsonHas(ports, "indexStrings", Json::arrayValue)) {
        int count = int(jsonArray(ports, "indexStrings").size());
        TVRN_LOG(LL_INFO, "Number of Adapters: %d", count);
        return count;
    }
    TVRN_LOG(LL_ERR, "libGetFcPhyPortIndicesByAdapter returns NULL for %s", adapterKey.c_str());
    return -1;
}

int PortHelper::getPortDetails(const String& portKey, Json::Value& port) {
    const Json::Value request = keyRequest(portKey.size() == 12 ? "mac" : "wwn",
                                           ProviderUtil::getIndexInColonFormat(portKey));
    if (!guardedCall(LibCall("libGetPortByWwn", portKey, LibCall::KEY_AFTER_DEFAULT),
                     libGetPortByWwn, request, port))
        return -1;
    if (!ProviderUtil::isValidJsonResponse(port)) {
        TVRN_LOG(LL_ERR, "Port Info is NOT available");
        return -1;
    }
    TVRN_LOG(LL_INFO, "getPortDetails success - %s", portKey.c_str());
    return 0;
}

bool PortHelper::isPortDisabled(const String& portKey) {
    Json::Value port;
    if (getPortDetails(portKey, port) != 0)
        return false;
    if (!jsonHas(port, "portStatus", Json::booleanValue)) {
        TVRN_LOG(LL_ERR, "Unable to get port status");
        return false;
    }
    return !jsonBool(port, "portStatus");
}

int PortHelper::getOpticsInfo(const String& portKey, Json::Value& sfp) {
    if (!guardedCall(LibCall("libGetOpticsSFP", portKey), libGetOpticsSFP,
                     keyRequest("indexStr", ProviderUtil::getIndexInColonFormat(portKey)), sfp))
        return -1;
    if (!ProviderUtil::isValidJsonResponse(sfp)) {
        TVRN_LOG(LL_ERR, "Unable to get SFP info for %s", portKey.c_str());
        return -1;
    }
    return 0;
}

int PortHelper::setAlarmState(const String& deviceId, int state) {
    const String key = ProviderUtil::getIndexInColonFormat(deviceId);
    Json::Value port;
    if (!guardedCall(LibCall("libGetPortByWwn"), libGetPortByWwn, keyRequest("wwn", key), port))
        return ALARM_FAILED;
    if (!ProviderUtil::isValidJsonResponse(port) || !jsonHas(port, "isMezz", Json::booleanValue) ||
        !jsonHas(port, "beaconState", Json::booleanValue)) {
        TVRN_LOG(LL_ERR, "Current ALARM STATE is not available");
        return ALARM_FAILED;
    }
    if (jsonBool(port, "isMezz")) {
        TVRN_LOG(LL_WARN, "setAlarmState: Operation not supported on Mezz cards");
        return ALARM_NOT_SUPPORTED;
    }
    const bool on = state == 3;
    if (jsonBool(port, "beaconState") == on) {
        TVRN_LOG(LL_WARN, "setAlarmState : State already set");
        return ALARM_ALREADY_SET;
    }
    port["beaconState"] = on;
    Json::Value request = keyRequest("indexStr", key);
    request["port"] = port;
    request["propArray"] = Json::Value(Json::arrayValue);
    request["propArray"].append("beaconState");
    Json::Value answer;
    if (!guardedCall(LibCall("libSetPortByWwn"), libSetPortByWwn, request, answer))
        return ALARM_FAILED;
    if (!ProviderUtil::isValidJsonResponse(answer)) {
        TVRN_LOG(LL_ERR, "libSetPortByWwn response is null or has error");
        return ALARM_FAILED;
    }
    TVRN_LOG(LL_INFO, "setAlarmState success");
    return ALARM_DONE;
}

// ---- builders ----------------------------------------------------------------------

Instance* PortHelper::getFCPortInstance(const _hbaPortInfo& p) {
    TAVRIN_FCPort* fc = create<TAVRIN_FCPort>(true);
    if (fc == nullptr)
        return nullptr;
    const String name(p.nodeWwn.c_str(), ":", p.portId.c_str());
    setDeviceKeys(fc, "TAVRIN_FCPort", p.hostName, p.portId);
    fc->PermanentAddress.set(p.portId);
    fc->Name.set(name);
    fc->ElementName.set(name);
    fc->Caption.set(p.symbolicName);
    fc->OperationalStatus.set(arrayOf<uint16>({uint16(p.portState)}));
    fc->EnabledState.set(enabledStateOf(p.portState));
    fc->EnabledDefault.set(2);
    fc->UsageRestriction.set(3);
    fc->PortType.set(uint16(p.portType));
    fc->LinkTechnology.set(4);
    fc->Speed.set(uint64(p.speed));
    fc->MaxSpeed.set(uint64(p.maxSpeed));
    fc->SupportedMaximumTransmissionUnit.set(uint64(p.maxFrameSize));
    fc->PortNumber.set(uint16(p.portNumber));
    TVRN_LOG(LL_DBG, "returned Instance of FCPortInstance- port WWN= %s", p.portId.c_str());
    return fc;
}

Instance* PortHelper::getSCSIProtocolEndpointInstance(const _hbaPortInfo& p, bool isLocalPort) {
    TAVRIN_SCSIProtocolEndpoint* ep = create<TAVRIN_SCSIProtocolEndpoint>(true);
    if (ep == nullptr)
        return nullptr;
    setEndpointKeys(ep, "TAVRIN_SCSIProtocolEndpoint", p.hostName);
    ep->Name.set(p.portId);
    ep->ElementName.set(p.portId);
    ep->OperationalStatus.set(arrayOf<uint16>({uint16(p.portState)}));
    ep->EnabledState.set(enabledStateOf(p.portState));
    ep->ProtocolIFType.set(1);
    ep->OtherTypeDescription.set(String("SCSI"));
    ep->ConnectionType.set(2);
    ep->Role.set(isLocalPort ? 2 : 3);
    TVRN_LOG(LL_DBG, "returned Instance of SCSIProtocolEndpoint. port WWN= %s", p.portId.c_str());
    return ep;
}

Instance* PortHelper::getFCPortStatisticsInstance(const _hbaPortInfo& p,
                                                  const prov_pport_stats_s& stats, bool isFCoE) {
    TAVRIN_FCPortStatistics* st = create<TAVRIN_FCPortStatistics>(true);
    if (st == nullptr)
        return nullptr;
    st->InstanceID.set(p.portId);
    st->ElementName.set(String("FC Port Statistics"));
    for (const StatProperty& row : kStatProperties) {
        StatValue value = isFCoE ? row.fcoe : row.fc;
        (st->*(row.property)).set(value != nullptr ? value(stats) : 0);
    }
    TVRN_LOG(LL_DBG, "returned Instance of FCPortStatistics. port WWN= %s", p.portId.c_str());
    return st;
}

Instance* PortHelper::getLogicalPortGroupInstance(const _hbaPortInfo& p) {
    TAVRIN_LogicalPortGroup* group = create<TAVRIN_LogicalPortGroup>(true);
    if (group == nullptr)
        return nullptr;
    group->InstanceID.set(p.nodeWwn);
    group->Name.set(p.portId);
    group->NameFormat.set(String("WWN"));
    group->ElementName.set(String(p.nodeWwn.c_str(), ":", p.portId.c_str()));
    group->Caption.set(p.hostName);
    group->Description.set(p.hostName);
    TVRN_LOG(LL_DBG, "returned Instance of getLogicalPortGroupInstance- port WWN= %s",
             p.portId.c_str());
    return group;
}

Instance* PortHelper::getAlarmDeviceInstance(const _hbaPortInfo& p, bool beaconOn) {
    TAVRIN_AlarmDevice* alarm = create<TAVRIN_AlarmDevice>(true);
    if (alarm == nullptr)
        return nullptr;
    setDeviceKeys(alarm, "TAVRIN_AlarmDevice", p.hostName, p.portId);
    alarm->ElementName.set(p.portId);
    alarm->Description.set(p.hostName);
    alarm->Caption.set(p.symbolicName);
    alarm->VisibleAlarm.set(true);
    alarm->Urgency.set(3);
    alarm->AlarmState.set(beaconOn ? 3 : 1);
    return alarm;
}

}  // namespace CPTA
