#include "alerts/IndicationHelper.h"

#include <chrono>
#include <cstdio>
#include <cstring>
#include <memory>
#include <mutex>
#include <string>

#include <json/json.h>

#include "alerts/EventTables.h"
#include "framework/Datetime.h"
#include "framework/Log.h"
#include "gateway/CIMProviderTfaj.h"
#include "gateway/ClassId.h"
#include "gateway/GuardedCall.h"
#include "gateway/JsonAccess.h"
#include "gateway/ProviderUtil.h"
#include "schema/generated/TAVRIN_ComputerSystem.h"
#include "schema/generated/TAVRIN_EthernetPort.h"
#include "schema/generated/TAVRIN_FCPort.h"

namespace CPTA {

namespace {

const char kUnknown[] = "Unknown";
// Message identifiers hold at most 15 characters.
const size_t kMessageIdSize = 16;
// The reworded messages of the standard form hold at most 255 characters.
const size_t kMessageSize = 256;

// The members of an event text that are read, with the type each must have.
// An absent (or null) member reads as 0 or as the empty text, unless the
// event cannot do without it.
struct Event_Member {
    const char* name;
    Json::ValueType type;
    const char* missing;  // logged when absent; null: optional
};

const Event_Member kEventMembers[] = {
    {"eventCategory", Json::intValue, "eventCategory is a must in the eventObject. Return error"},
    {"eventId", Json::intValue, "eventId is a must in the eventObject. Return error"},
    {"eventSeverity", Json::intValue, nullptr},
    {"portIndexString", Json::stringValue, nullptr},
    {"basePortWWN", Json::stringValue, nullptr},
    {"eventMsg", Json::stringValue, nullptr},
    {"eventIdValue", Json::stringValue, nullptr},
    {"pomLevel", Json::stringValue, nullptr},
    {"fWwn", Json::stringValue, nullptr},
    {"cee_state", Json::stringValue, nullptr},
};

// Only event names of this form are passed on.
const char kEventNamePrefix[] = "TFA_";

// The text naming this host in indications and paths. A look-up costs some
// 100 microseconds (the resolver reads its files every time), which a burst
// of events would pay for every event; an answer is used for a second.
String hostText() {
    static std::mutex mutex;
    static String text;
    static std::chrono::steady_clock::time_point expires;
    const auto now = std::chrono::steady_clock::now();
    std::lock_guard<std::mutex> lock(mutex);
    if (text.size() == 0 || now >= expires) {
        char host[255];
        std::memset(host, 0, sizeof(host));
        ProviderUtil::getHostInfo(host, sizeof(host));
        text = host;
        expires = now + std::chrono::seconds(1);
    }
    return text;
}

struct Indication_Deleter {
    void operator()(TAVRIN_AlertIndication* indication) const { destroy(indication); }
};
typedef std::unique_ptr<TAVRIN_AlertIndication, Indication_Deleter> Indication_Ptr;

// One event text, read and checked.
class Event {
public:
    bool read(const char* text);

    int category() const { return jsonInt(_object, "eventCategory"); }
    int id() const { return jsonInt(_object, "eventId"); }
    int severity() const { return jsonInt(_object, "eventSeverity"); }
    bool has(const char* member) const { return jsonHas(_object, member, Json::stringValue); }
    String text(const char* member) const { return jsonString(_object, member); }

private:
    Json::Value _object;
};

bool Event::read(const char* text) {
    Json::CharReaderBuilder builder;
    std::unique_ptr<Json::CharReader> reader(builder.newCharReader());
    std::string errors;
    const char* end = text ? text + std::char_traits<char>::length(text) : nullptr;
    if (!text || !reader->parse(text, end, &_object, &errors) || !_object.isObject()) {
        TVRN_LOG(LL_WARN, "Unable to parse json string to object. Return error");
        return false;
    }
    for (const Event_Member& member : kEventMembers) {
        const Json::Value* value = jsonMember(_object, member.name);
        if (!value || value->isNull()) {
            if (member.missing) {
                TVRN_LOG(LL_WARN, "%s", member.missing);
                return false;
            }
        } else if (!jsonIsType(*value, member.type)) {
            TVRN_LOG(LL_WARN, "%s must be %s in the eventObject. Return error", member.name,
                     member.type == Json::intValue ? "an integer" : "a string");
            return false;
        }
    }
    return true;
}

String formatted(size_t size, const char* format, const char* text) {
    std::unique_ptr<char[]> buffer(new char[size]);
    snprintf(buffer.get(), size, format, text);
    return String(buffer.get());
}

String tvrnMessageId(sint32 code) {
    return formatted(kMessageIdSize, "TVRN%s", std::to_string(code).c_str());
}

String elementPath(Alert_Element element, const Event& event) {
    switch (element) {
        case ELEMENT_FC_PORT: return getFCPortObjectPath(event.text("portIndexString"));
        case ELEMENT_BASE_FC_PORT:
            return getFCPortObjectPath(
                ProviderUtil::eraseColonsFromIndex(event.text("basePortWWN")));
        case ELEMENT_ETHERNET_PORT: return getEthernetPortObjectPath(event.text("portIndexString"));
        case ELEMENT_NONE: break;
    }
    return String();
}

Array<String> messageArguments(const Event_Arguments& arguments, const Event& event) {
    Array<String> out;
    for (const char* member : arguments.members)
        if (member)
            out.append(event.text(member));
    return out;
}

// The standard form of an event as it is built before its category's rule.
Indication_Ptr baseIndication(const Event& event, const String& eventName) {
    Indication_Ptr indication(create<TAVRIN_AlertIndication>(true));
    if (!indication)
        return indication;
    TAVRIN_AlertIndication& i = *indication;
    i.AlertingElementFormat.set(2);  // CIM object path
    i.SystemCreationClassName.set(ProviderUtil::getClassName(CID_COMPUTER_SYSTEM));
    i.SystemName.set(hostText());
    i.ProviderName.set("tvrnprovider");
    const Datetime now = Datetime::now();
    i.EventTime.set(now);
    i.IndicationTime.set(now);
    i.OwningEntity.set("TAVRIN");
    i.AlertType.set(1);      // other
    i.ProbableCause.set(1);  // other
    i.IndicationIdentifier.set(eventName);
    i.EventID.set(eventName);
    i.PerceivedSeverity.set(uint16(IndicationHelper::getPerceivedSeverity(event.severity())));
    i.Message.set(event.text("eventMsg"));
    return indication;
}

// Words the standard form as the DMTF alert model has it.
void applyStandardWording(TAVRIN_AlertIndication& i, const Standard_Wording& wording,
                          const Event& event, Array<String>& arguments) {
    const String mac = ProviderUtil::getIndexInColonFormat(event.text("portIndexString"));
    const String device = ProviderUtil::getEthDeviceNameByMAC(mac);
    i.Message.set(formatted(kMessageSize, wording.messageFormat, device.c_str()));
    i.OwningEntity.set("DMTF");
    i.AlertType.set(2);  // communications alert
    i.OtherAlertType.set(String());
    i.PerceivedSeverity.set(wording.severity);
    arguments.clear();
    arguments.append(device);
    arguments.append(getComputerSystemObjectPath());
}

int translate(const char* eventText, IndicationHelper& helper) {
    TVRN_LOG(LL_DBG, "Entering: %s", "processEvent");
    Event event;
    if (!event.read(eventText))
        return 0;
    const int category = event.category();
    const int id = event.id();
    const String name = event.text("eventIdValue");
    const bool named = name.equal(0, kEventNamePrefix, sizeof(kEventNamePrefix) - 1);
    Indication_Ptr standard = baseIndication(event, named ? name : String());
    if (!standard) {
        TVRN_LOG(LL_ERR, "No memory for an alert indication");
        return 0;
    }
    TAVRIN_AlertIndication& i = *standard;
    TVRN_LOG(LL_WARN, "Before event category switch : %d", category);
    TVRN_LOG(LL_WARN, "Event ID  : %d", id);

    const Event_Category& rule = eventCategory(category);
    if (rule.preface)
        TVRN_LOG(LL_WARN, "%s", rule.preface);
    const bool accepted = rule.anyId || (id >= 0 && id < 32 && ((rule.accepted >> id) & 1) != 0);
    if (!accepted || rule.forms == FORMS_NONE) {
        if (rule.refusal)
            TVRN_LOG(LL_WARN, "%s", rule.refusal);
        TVRN_LOG(LL_WARN, "Invoked with a unsporrted or invalid event");
        return 0;
    }

    const sint32 code = rule.coded ? sint32((uint32(category) << 16) | uint32(id)) : 0;
    const Event_Details* details = eventDetails(code);
    if (rule.element != ELEMENT_NONE)
        i.AlertingManagedElement.set(elementPath(rule.element, event));
    if (rule.name) {
        i.OtherAlertType.set(rule.name);
        i.Category.set(rule.name);
    }
    const Event_Arguments* arguments = &rule.arguments;
    if (details && details->arguments.members[0] &&
        (!details->arguments.condition || event.has(details->arguments.condition)))
        arguments = &details->arguments;
    Array<String> collected = messageArguments(*arguments, event);
    const uint16 severity = details && details->severity ? details->severity : rule.severity;
    if (severity)
        i.PerceivedSeverity.set(severity);
    if (details && details->standard)
        applyStandardWording(i, *details->standard, event, collected);

    const String cause = IndicationHelper::getEventCauseById(code);
    i.Description.set(cause);
    i.ProbableCauseDescription.set(cause);
    Array<String> actions;
    actions.append(IndicationHelper::getEventActionById(code));
    i.RecommendedActions.set(actions);
    const String messageId = IndicationHelper::getMessageIDById(code);
    i.MessageID.set(messageId);
    TVRN_LOG(LL_INFO, "Message ID = %s", messageId.c_str());
    i.MessageArguments.set(collected);

    Indication_Ptr vendor;
    if (rule.forms & FORM_VENDOR) {
        vendor.reset(clone(standard.get()));
        if (!vendor) {
            TVRN_LOG(LL_ERR, "No memory for an alert indication");
            return 0;
        }
        TAVRIN_AlertIndication& v = *vendor;
        v.PerceivedSeverity.set(
            uint16(IndicationHelper::getExactPerceivedSeverity(event.severity())));
        const String own = details ? tvrnMessageId(code) : messageId;
        v.MessageID.set(formatted(kMessageIdSize, "PROP%s", own.c_str()));
        v.Message.set(event.text("eventMsg"));
        v.OwningEntity.set("TAVRIN");
        TVRN_LOG(LL_INFO, "Updating tvrnIndication");
    }
    if (!(rule.forms & FORM_STANDARD))
        standard.reset();
    TAVRIN_AlertIndication* produced[] = {standard.release(), vendor.release()};
    helper.queue().push(produced, 2);
    TVRN_LOG(LL_DBG, "Returning: %s", "processEvent");
    return 1;
}

// A key-only instance of C, to be written as an object path.
template <class C>
struct Path_Model {
    Path_Model() : instance(create<C>(false)) {}
    ~Path_Model() { destroy(instance); }
    Path_Model(const Path_Model&) = delete;
    Path_Model& operator=(const Path_Model&) = delete;

    String path() const {
        String model;
        if (!instance || instance_to_model_path(instance, model) != 0) {
            TVRN_LOG(LL_ERR, "Unable to build the object path of a %s", C::static_meta_class.name);
            return String();
        }
        return ProviderUtil::namespacePath(hostText().c_str(), model);
    }

    C* instance;
};

template <class C>
String devicePath(classId_t classId, const String& deviceId) {
    Path_Model<C> model;
    if (model.instance) {
        model.instance->SystemCreationClassName.set(
            ProviderUtil::getClassName(CID_COMPUTER_SYSTEM));
        model.instance->SystemName.set(hostText());
        model.instance->CreationClassName.set(ProviderUtil::getClassName(classId));
        model.instance->DeviceID.set(deviceId);
    }
    return model.path();
}

}  // namespace

IndicationHelper::IndicationHelper() : _queue(kQueueBound) {}

IndicationHelper* IndicationHelper::getIndicationHelperInstance() {
    static IndicationHelper instance;
    return &instance;
}

int IndicationHelper::processEvent(const char* eventText) noexcept {
    try {
        return translate(eventText, *this);
    } catch (const std::exception& e) {
        TVRN_LOG(LL_ERR, "Event dropped: %s", e.what());
    } catch (...) {
        TVRN_LOG(LL_ERR, "Event dropped: unexpected exception");
    }
    return 0;
}

String IndicationHelper::getEventCauseById(int code) {
    const Event_Details* details = eventDetails(code);
    return details ? String(details->cause) : String(kUnknown);
}

String IndicationHelper::getEventActionById(int code) {
    const Event_Details* details = eventDetails(code);
    return details ? String(details->action) : String(kUnknown);
}

String IndicationHelper::getMessageIDById(int code) {
    const Event_Details* details = eventDetails(code);
    if (!details)
        return String(kUnknown);
    return details->messageId ? String(details->messageId) : tvrnMessageId(code);
}

int IndicationHelper::getPerceivedSeverity(int eventSeverity) {
    uint16 severity = 0;
    if (!perceivedSeverity(eventSeverity, severity))
        TVRN_LOG(LL_WARN, "Received a un-expected severity value: %d", eventSeverity);
    return severity;
}

int IndicationHelper::getExactPerceivedSeverity(int eventSeverity) {
    uint16 severity = 0;
    if (!exactPerceivedSeverity(eventSeverity, severity))
        TVRN_LOG(LL_WARN, "Received a un-expected severity value: %d", eventSeverity);
    return severity;
}

int IndicationHelper::updateIndicationObjects(TAVRIN_AlertIndication* indication) {
    _queue.push(&indication, 1);
    return 1;
}

bool IndicationHelper::registerForEvents() {
    Json::Value request(Json::objectValue);
    request["dropOldEvents"] = true;
    Json::Value answer;
    if (!guardedCall(LibCall("libRegisterForEvents"), libRegisterForEvents, request, answer) ||
        !ProviderUtil::isValidJsonResponse(answer))
        return false;
    if (guardedCall(LibCall("libRegisterEventProcessingCb"),
                    [] { libRegisterEventProcessingCb(providerHandleEvent); }))
        return true;
    deRegisterForEvents();
    return false;
}

bool IndicationHelper::deRegisterForEvents() {
    guardedCall(LibCall("libRegisterEventProcessingCb"),
                [] { libRegisterEventProcessingCb(nullptr); });
    Json::Value answer;
    return guardedCall(LibCall("libUnRegisterForEvents"), libUnRegisterForEvents,
                       Json::Value(Json::objectValue), answer) &&
           ProviderUtil::isValidJsonResponse(answer);
}

void providerHandleEvent(const char* eventText) noexcept {
    IndicationHelper::getIndicationHelperInstance()->processEvent(eventText);
}

String getFCPortObjectPath(const String& deviceId) {
    return devicePath<TAVRIN_FCPort>(CID_FC_PORT, deviceId);
}

String getEthernetPortObjectPath(const String& deviceId) {
    return devicePath<TAVRIN_EthernetPort>(CID_ETHERNET_PORT, deviceId);
}

String getComputerSystemObjectPath() {
    Path_Model<TAVRIN_ComputerSystem> model;
    if (model.instance) {
        model.instance->CreationClassName.set(ProviderUtil::getClassName(CID_COMPUTER_SYSTEM));
        model.instance->Name.set(hostText());
    }
    return model.path();
}

}  // namespace CPTA
