// The records through which the inventory helpers hand one adapter, FC port,
// Ethernet function, optic or LUN to the routine that builds its instance.
//
// A record is filled field by field from one library answer and passed by
// value to a builder. Text fields are unbounded strings; where a field is
// known to be cut at a fixed width, the filling code applies that width
// (see the *_WIDTH constants). Numbers are host-order integers.
#ifndef CPTA_INVENTORY_INVENTORYRECORDS_H
#define CPTA_INVENTORY_INVENTORYRECORDS_H

#include <cstddef>

#include "framework/String.h"
#include "framework/Types.h"

namespace CPTA {

// One adapter.
struct _adapterData {
    String adapterWwn;         // "hbaData"."wwn" without colons (storage driver present)
    String adapterMac;         // "hbaData"."hbaMAC" without colons (CNAs)
    uint32 adapterStatus = 0;  // 11 in service, 10 stopped (port controllers only)
    String hostName;
    String model;
    String serialNumber;  // the OEM serial number when the VPD has one
    String vendorCode;
    String fruNumber;  // empty for HP and DELL adapters
    String partNumber;
    String storageDriverName;
    String storageDriverVersion;  // trimmed
    String networkDriverName;
    String networkDriverVersion;  // trimmed
    String firmwareVersion;       // trimmed
    String biosVersion;           // trimmed; empty when not UTF-8
    bool isCNA = false;
    String uuid;

    // Widths of the trimmed version texts.
    static constexpr size_t VERSION_WIDTH = 64;
};

// One FC port, or one remote target port seen through it.
struct _hbaPortInfo {
    String portId;  // colon-free WWN; for a target "<port>_<remote port>"
    String nodeWwn;
    String symbolicName;
    sint32 portState = 0;  // CIM operational status
    String hostName;
    sint32 portType = 0;  // CIM FC port type
    sint64 maxFrameSize = 0;
    sint64 speed = 0;       // bits per second
    sint64 maxSpeed = 0;    // bits per second
    sint32 portNumber = 0;  // position in the adapter's FC port list
};

// The counters of one FC or FCoE port. Filled from the library's statistics
// list by statistic id (see PortHelper); everything not filled stays zero.
struct prov_pport_stats_s {
    // FC ports
    uint64 txFrames = 0;
    uint64 txWords = 0;
    uint64 rxFrames = 0;
    uint64 rxWords = 0;
    uint64 lipCount = 0;
    uint64 nosCount = 0;
    uint64 errorFrames = 0;
    uint64 droppedFrames = 0;
    uint64 linkFailures = 0;
    uint64 lossOfSync = 0;
    uint64 lossOfSignal = 0;
    uint64 primitiveSeqErrors = 0;
    uint64 invalidTxWords = 0;
    uint64 crcErrors = 0;
    // FCoE ports
    uint64 fcoeErrA = 0;
    uint64 fcoeDropped = 0;
    uint64 fcoeErrB = 0;
    uint64 fcoeCrc = 0;
    uint64 fcoeErrC = 0;
    uint64 fcoeErrD = 0;
    // Room for FCoE traffic counters; no statistic id feeds them yet.
    uint64 fcoeTxFrames = 0;
    uint64 fcoeTxBytes = 0;
    uint64 fcoeRxFrames = 0;
    uint64 fcoeRxBytes = 0;
};

// One Ethernet function of a CNA.
struct _ethPortInfo {
    String macId;          // index string (the MAC) without colons
    String deviceName;     // the host's interface name
    uint32 portState = 0;  // CIM operational status
    String hostName;
    String permanentMac;  // copy of macId
    sint32 portType = 0;  // CIM Ethernet port type from the transceiver
    sint32 portNumber = 0;
    uint32 mtu = 0;  // 0 when unknown
};

// The optic of one FC port.
struct _sfpInfo {
    String vendorName;  // trimmed
    String vendorPart;  // trimmed
    String serialNo;    // trimmed
    String tag;         // "<serial>_<adapter number>_<port position>"
    String extendedId;  // cut at EXTENDED_ID_WIDTH
    String speed;       // cut at SPEED_WIDTH
    String revision;    // trimmed

    static constexpr size_t IDENT_WIDTH = 18;  // buffer of the trimmed SFF texts
    static constexpr size_t REVISION_WIDTH = 6;
    static constexpr size_t EXTENDED_ID_WIDTH = 8;
    static constexpr size_t SPEED_WIDTH = 32;
};

// One LUN of one remote target.
struct _hbaLunInfo {
    uint32 lunNumber = 0;
    String remotePortWwn;        // colon-free
    String vendor;               // first VENDOR_WIDTH characters
    String productId;            // first PRODUCT_ID_WIDTH characters
    String productSerialNumber;  // first SERIAL_WIDTH characters
    String lunDescription;       // first DESCRIPTION_WIDTH characters
    uint32 lunDescIdType = 0;    // what kind of identifier lunDescription is

    static constexpr size_t VENDOR_WIDTH = 8;
    static constexpr size_t PRODUCT_ID_WIDTH = 16;
    static constexpr size_t SERIAL_WIDTH = 64;
    static constexpr size_t DESCRIPTION_WIDTH = 65;
};

}  // namespace CPTA

#endif
