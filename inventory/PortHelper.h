// FC port inventory: per FC port an FC port, its statistics, its SCSI
// protocol endpoints (the port as initiator and every remote target seen
// through it), a logical port group and an alarm device (the locator beacon).
// The walk also hands each port to the target inventory for storage extents,
// tape drives and logical disks, and small per-port queries serve other parts.
#ifndef CPTA_INVENTORY_PORTHELPER_H
#define CPTA_INVENTORY_PORTHELPER_H

#include <json/json.h>

#include "framework/Array.h"
#include "framework/Instance.h"
#include "framework/String.h"
#include "gateway/ClassId.h"
#include "inventory/InventoryRecords.h"

namespace CPTA {

class InstanceList;
class TargetHelper;

// Narrows a port walk to what the keys of one object name. The default scope
// lets every port and every remote port through.
struct PortScope {
    enum Remotes {
        ALL_REMOTES,  // every remote port, and the port's own endpoint
        NO_REMOTES,   // the port's own endpoint only
        ONE_REMOTE,   // the remote port `remote` only
    };
    String port;  // colon-free WWN of the one local port; "" every port
    Remotes remotes = ALL_REMOTES;
    String remote;  // colon-free WWN of the remote port for ONE_REMOTE

    // Whether the local port / the remote port with this colon-free WWN is in
    // the scope.
    bool admitsPort(const String& wwn) const { return port.size() == 0 || port.equali(wwn); }
    bool admitsRemote(const String& wwn) const {
        return remotes == ALL_REMOTES || (remotes == ONE_REMOTE && remote.equali(wwn));
    }
    // The one remote port named, or "".
    String namedRemote() const { return remotes == ONE_REMOTE ? remote : String(); }
};

class PortHelper {
public:
    static PortHelper* getPortHelperObject();

    // Outcomes of setAlarmState.
    enum AlarmResult {
        ALARM_FAILED = 0,
        ALARM_DONE = 1,
        ALARM_NOT_SUPPORTED = 2,  // mezzanine adapters have no beacon
        ALARM_ALREADY_SET = 3,
    };

    // The instance walks never throw: a library exception ends the walk with
    // no instances (logged).
    //
    // All instances of class 3, 4, 5, 30 or 36 (or 9, 16, 38 through the
    // target inventory) for all adapters.
    Array<Instance*> getInstancesByClass(classId_t classId);
    // The same for adapter `adapterNumber` (from 1) of `allAdapters`, the
    // answer of getAllAdaptersIndexString.
    Array<Instance*> getInstancesByAdapterId(int adapterNumber, classId_t classId,
                                             const Json::Value& allAdapters);
    // The same for the adapter with this key (WWN or MAC, with or without colons).
    Array<Instance*> getInstancesByAdapterAddress(const String& adapterKey, classId_t classId);
    // The TAVRIN_FCPort instances of one adapter.
    Array<Instance*> getFCPortInstancesByAdapter(const String& adapterKey);
    // The instances of the same classes that the walk builds for the port
    // `scope.port` and the remote ports of the scope alone: the library is
    // asked only about that port's adapter, that port and those remote ports.
    // Nothing when no adapter owns the port.
    Array<Instance*> getInstancesByPort(classId_t classId, const PortScope& scope);

    // Builders: one new instance each (null only when memory runs out).
    Instance* getFCPortInstance(const _hbaPortInfo& port);
    Instance* getFCPortStatisticsInstance(const _hbaPortInfo& port, const prov_pport_stats_s& stats,
                                          bool isFCoE);
    Instance* getSCSIProtocolEndpointInstance(const _hbaPortInfo& port, bool isLocalPort);
    Instance* getLogicalPortGroupInstance(const _hbaPortInfo& port);
    Instance* getAlarmDeviceInstance(const _hbaPortInfo& port, bool beaconOn);

    // Number of FC ports of the adapter, their keys left in `ports`; -1 when
    // the library gives no usable list (or throws).
    int getNumberOfPorts(const String& adapterKey, Json::Value& ports);
    // The library's record of one port (a 12-character key is taken as a
    // MAC); 0, or -1.
    int getPortDetails(const String& portKey, Json::Value& port);
    // Whether the port is known and disabled.
    bool isPortDisabled(const String& portKey);
    // The optic of one port; 0, or -1.
    int getOpticsInfo(const String& portKey, Json::Value& sfp);
    // Switches the beacon of the port `deviceId` on (state 3) or off (any
    // other state); an AlarmResult.
    int setAlarmState(const String& deviceId, int state);

    // The counters of one statistics answer (a list of {"id", "value"}), from
    // the FC or the FCoE column.
    static prov_pport_stats_s readStatistics(const Json::Value& list, bool isFCoE);

private:
    PortHelper();
    enum WalkForm { BY_NUMBER, BY_ADDRESS };
    void walkAdapter(const String& adapterKey, classId_t classId, WalkForm form, InstanceList& out,
                     const PortScope& scope);
    void addPortInstances(const Json::Value& port, const String& portKey, _hbaPortInfo& record,
                          classId_t classId, InstanceList& out, const PortScope& scope);
    void addEndpoints(_hbaPortInfo& record, InstanceList& out, const PortScope& scope);
    void addStatistics(const Json::Value& port, const String& portKey, const _hbaPortInfo& record,
                       InstanceList& out);

    TargetHelper* _targetHelper;
};

}  // namespace CPTA

#endif
