#include "alerts/EventTables.h"

#include <initializer_list>
#include <iterator>

namespace CPTA {

namespace {

// The tables are constexpr: the compiler refuses anything that would fill them
// at run time, so they are complete before any event can be read.

constexpr uint32 ids(std::initializer_list<int> list) {
    uint32 bits = 0;
    for (int id : list)
        bits |= uint32(1) << id;
    return bits;
}

constexpr uint32 idRange(int first, int last) {
    uint32 bits = 0;
    for (int id = first; id <= last; id++)
        bits |= uint32(1) << id;
    return bits;
}

const char kNotSupported[] = "Not supported event is triggered.";
const char kNotForRegularProvider[] = "Non supported event by regular provider is triggered.";
constexpr Event_Arguments kNoArguments = {nullptr, {nullptr, nullptr}};
constexpr Event_Arguments kPortIndex = {nullptr, {"portIndexString", nullptr}};

constexpr Event_Category kCategories[] = {
    {2, "Port", ELEMENT_FC_PORT, false, ids({1, 2, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15}), true,
     FORMS_BOTH, 0, nullptr, "Unsupported event-port is triggered.", kPortIndex},
    {3, "Lport", ELEMENT_BASE_FC_PORT, false, ids({1, 2}), true, FORMS_BOTH, 2, nullptr,
     kNotSupported, kNoArguments},
    {4, "Rport", ELEMENT_BASE_FC_PORT, false, idRange(1, 5), true, FORM_VENDOR, 0,
     kNotForRegularProvider, nullptr, kNoArguments},
    {5, "ITNIM", ELEMENT_BASE_FC_PORT, false, idRange(1, 3), true, FORM_VENDOR, 0,
     kNotForRegularProvider, nullptr, kNoArguments},
    {8, "Audit", ELEMENT_FC_PORT, false, ids({1, 2}), true, FORMS_BOTH, 0, nullptr,
     "unsupported eventr-audit is triggered.", kPortIndex},
    {9, "IOC", ELEMENT_BASE_FC_PORT, false, idRange(1, 9), true, FORM_VENDOR, 0, nullptr,
     kNotSupported, kNoArguments},
    {10, "EthPort", ELEMENT_ETHERNET_PORT, false, idRange(1, 4), true, FORMS_BOTH, 0, nullptr,
     kNotSupported, kNoArguments},
};

// Categories 1 to 12 that are not listed above.
constexpr Event_Category kSilentCategory = {
    0, nullptr, ELEMENT_NONE, false, 0, false, FORMS_NONE, 0, nullptr, nullptr, kNoArguments};

// Category 0, negative categories and those above 12.
constexpr Event_Category kUnknownCategory = {
    0, nullptr, ELEMENT_NONE, true, 0, false, FORMS_BOTH, 0, nullptr, nullptr, kNoArguments};

constexpr Standard_Wording kInterfaceEnabled = {"The network port %s has been enabled", 2};
constexpr Standard_Wording kInterfaceDisabled = {"The network port %s has been disabled", 3};

const char kNoAction[] = "No action required.";
const char kAskAdministrator[] = "Please contact the Administrator.";
const char kCheckSwitch[] = "Check switch and HBA configuration.";
const char kCheckFabric[] = "Check fabric/fport configuration.";

// Columns: code, cause, action, message identifier (null: TVRN<code>),
// severity (0: as the category says), message arguments, standard wording.
constexpr Event_Details kEvents[] = {
    {0x20001, "Base port logged into Fabric.", kNoAction, nullptr, 0, {}, nullptr},
    {0x20002, "Base port logged out of Fabric.", kNoAction, nullptr, 0, {}, nullptr},
    {0x20003, "", "No action required. Not supported", nullptr, 0, {}, nullptr},
    {0x20004, "User plugged in a SFP.", kNoAction, nullptr, 0, {}, nullptr},
    {0x20005, "SFP removed.", "Check whether SFP is inserted properly.", nullptr, 0, {}, nullptr},
    {0x20006,
     "A POM is a Pluggable Optical Module inserted into a Small Form-Factor Pluggable (SFP) "
     "socket. Event is triggered if there is a change of current value against threshold of "
     "operational characteristics (temperature, voltage and rx/tx power) of SFP.",
     "If POM level is not normal please check the SFP.",
     nullptr,
     0,
     {"pomLevel", {"pomLevel", "portIndexString"}},
     nullptr},
    {0x20007, "Base port enabled by user command.", kNoAction, nullptr, 0, {}, nullptr},
    {0x20008, "Base port disabled by user command.", kNoAction, nullptr, 0, {}, nullptr},
    {0x20009, "Authentication successful.", kNoAction, nullptr, 0, {}, nullptr},
    {0x2000A,
     "Authentication failure.",
     "Mismatch of FC-SP configuration between switch and HBA. Also, check the secret.",
     nullptr,
     0,
     {},
     nullptr},
    {0x2000B,
     "Base port lost connection with fabric.",
     "Check switch and HBA configuration. Also, check SFP and cable connection.",
     nullptr,
     0,
     {},
     nullptr},
    {0x2000C, "QOS negotiation failed.", kCheckSwitch, nullptr, 0, {}, nullptr},
    {0x2000D,
     "Fabric WWN changed.",
     kCheckSwitch,
     nullptr,
     0,
     {"fWwn", {"portIndexString", "fWwn"}},
     nullptr},
    {0x2000E,
     "Can not read SFP registers.",
     "Recommend to replace the SFP.",
     nullptr,
     0,
     {},
     nullptr},
    {0x2000F, "SFP is not supported.", "Recommend to use supported SFP.", nullptr, 0, {}, nullptr},

    {0x30001, "New logical port created.", kNoAction, nullptr, 0, {}, nullptr},
    {0x30002, "Logical port deleted.", kNoAction, nullptr, 0, {}, nullptr},
    {0x30003,
     "Logical port (base or logical) logged into Fabric.",
     kNoAction,
     nullptr,
     0,
     {},
     nullptr},
    {0x30004,
     "Logical port (base or logical) logged out of Fabric.",
     kNoAction,
     nullptr,
     0,
     {},
     nullptr},
    {0x30005,
     "Logical port (base or logical) lost fabric connectivity.",
     kCheckSwitch,
     nullptr,
     0,
     {},
     nullptr},
    {0x30006, "New virtual port created.", kNoAction, nullptr, 0, {}, nullptr},
    {0x30007, "Virtual port deleted.", kNoAction, nullptr, 0, {}, nullptr},
    {0x30008, "New virtual port created.", kNoAction, nullptr, 0, {}, nullptr},
    {0x30009, "Virtual port deleted.", kNoAction, nullptr, 0, {}, nullptr},
    {0x3000A,
     "Duplicate WWN reported by fabric.",
     "Delete this vport and create with a different WWN.",
     nullptr,
     0,
     {},
     nullptr},
    {0x3000B,
     "Max NPIV ports already exist in fabric/fport.",
     kCheckFabric,
     nullptr,
     0,
     {},
     nullptr},
    {0x3000C, "Unknown error.", kCheckFabric, nullptr, 0, {}, nullptr},

    {0x40001, "Login nexus established with remote port.", kNoAction, nullptr, 0, {}, nullptr},
    {0x40002,
     "Login nexus with remote port terminated by logical port.",
     kNoAction,
     nullptr,
     0,
     {},
     nullptr},
    {0x40003,
     "Login nexus with remote port is lost.",
     "Check if remote port is having issues.",
     nullptr,
     0,
     {},
     nullptr},
    {0x40004, "QOS priority changed.", kNoAction, nullptr, 0, {}, nullptr},
    {0x40005, "QOS flow ID changed.", kNoAction, nullptr, 0, {}, nullptr},

    {0x50001,
     "SCSI IT-Nexus established between Initiator and Target.",
     kNoAction,
     nullptr,
     0,
     {},
     nullptr},
    {0x50002, "SCSI IT-Nexus terminated by Initiator.", kNoAction, nullptr, 0, {}, nullptr},
    {0x50003,
     "SCSI IT-Nexus terminated between Initiator and Target.",
     "Check Fabric and target.",
     nullptr,
     0,
     {},
     nullptr},

    {0x80001, "Authentication enabled by user command.", kNoAction, nullptr, 0, {}, nullptr},
    {0x80002, "Authentication disabled by user command.", kNoAction, nullptr, 0, {}, nullptr},
    {0x80003, "Flash erase done by user command.", kNoAction, nullptr, 0, {}, nullptr},
    {0x80004, "Flash update done by user command.", kNoAction, nullptr, 0, {}, nullptr},

    {0x90001, "Succesful restart of firmware after a failure.", kNoAction, nullptr, 0, {}, nullptr},
    {0x90002,
     "Firmware not responding.",
     "Collect all info and restart the firmware. Invoke tfa_supportsave.",
     nullptr,
     0,
     {},
     nullptr},
    {0x90003, "HBA firmware started by user command.", kNoAction, nullptr, 0, {}, nullptr},
    {0x90004, "HBA firmware stopped by user command.", kNoAction, nullptr, 0, {}, nullptr},
    {0x90005,
     "Converged drivers TFA and TNA are incompatible.",
     "Upgrade converged drivers to the same version.",
     nullptr,
     0,
     {},
     nullptr},
    {0x90006,
     "Unable to read firmware configuration parameters.",
     "Please upload latest boot code image. If problem persists, please contact the "
     "Administrator.",
     nullptr,
     0,
     {},
     nullptr},
    {0x90007, "Unsupported switch vendor.", kAskAdministrator, nullptr, 0, {}, nullptr},
    {0x90008, "Invalid NWWN.", kAskAdministrator, nullptr, 0, {}, nullptr},
    {0x90009, "Invalid PWWN.", kAskAdministrator, nullptr, 0, {}, nullptr},

    {0xA0001,
     "Base port ethernet link is up.",
     kNoAction,
     nullptr,
     0,
     {"cee_state", {"cee_state", nullptr}},
     nullptr},
    {0xA0002, "Base port ethernet link is down.", kNoAction, nullptr, 6, kPortIndex, nullptr},
    {0xA0003,
     "Base port ethernet interface is enabled.",
     kNoAction,
     "PLAT260",
     0,
     {},
     &kInterfaceEnabled},
    {0xA0004,
     "Base port ethernet interface is disabled.",
     kNoAction,
     "PLAT261",
     0,
     {},
     &kInterfaceDisabled},
};

// eventSeverity 1 to 4 and the two PerceivedSeverity mappings.
struct Severity_Row {
    int eventSeverity;
    uint16 perceived;
    uint16 exact;
};

constexpr Severity_Row kSeverities[] = {
    {1, 6, 6},  // critical
    {2, 6, 5},  // critical; exactly: major
    {3, 3, 3},  // degraded/warning
    {4, 2, 2},  // information
};

const Severity_Row* severityRow(int eventSeverity) {
    for (const Severity_Row& row : kSeverities)
        if (row.eventSeverity == eventSeverity)
            return &row;
    return nullptr;
}

}  // namespace

const Event_Category& eventCategory(int category) {
    for (const Event_Category& rule : kCategories)
        if (rule.category == category)
            return rule;
    return category >= 1 && category <= 12 ? kSilentCategory : kUnknownCategory;
}

const Event_Details* eventDetails(sint32 code) {
    for (const Event_Details& event : kEvents)
        if (event.code == code)
            return &event;
    return nullptr;
}

const Event_Category* eventCategories(size_t& count) {
    count = std::size(kCategories);
    return kCategories;
}

const Event_Details* allEventDetails(size_t& count) {
    count = std::size(kEvents);
    return kEvents;
}

bool perceivedSeverity(int eventSeverity, uint16& severity) {
    const Severity_Row* row = severityRow(eventSeverity);
    severity = row ? row->perceived : 0;
    return row != nullptr;
}

bool exactPerceivedSeverity(int eventSeverity, uint16& severity) {
    const Severity_Row* row = severityRow(eventSeverity);
    severity = row ? row->exact : 0;
    return row != nullptr;
}

}  // namespace CPTA
