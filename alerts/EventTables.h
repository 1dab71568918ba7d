// The adapter events the module understands, as constant data: how the events
// of each category become alert indications, and the probable cause,
// recommended action and message identifier of every known event. Being
// constant, the tables are complete before the library can call back.
//
// An event is named by its category and an identifier within it; its code is
// the category shifted left by 16 bits, OR the identifier (category 2,
// identifier 6: 0x20006).
#ifndef CPTA_ALERTS_EVENTTABLES_H
#define CPTA_ALERTS_EVENTTABLES_H

#include <cstddef>

#include "framework/Types.h"

namespace CPTA {

// The element an indication is about (its AlertingManagedElement).
enum Alert_Element : uint8 {
    ELEMENT_NONE,           // not set
    ELEMENT_FC_PORT,        // the FC port whose key is "portIndexString"
    ELEMENT_BASE_FC_PORT,   // the FC port of "basePortWWN", colons removed
    ELEMENT_ETHERNET_PORT,  // the Ethernet port whose key is "portIndexString"
};

// The indications an event produces: the standard form, and the vendor form
// (a copy with the exact severity and a "PROP" message identifier).
enum Alert_Forms : uint8 {
    FORMS_NONE = 0,
    FORM_STANDARD = 1,
    FORM_VENDOR = 2,
    FORMS_BOTH = FORM_STANDARD | FORM_VENDOR,
};

// MessageArguments: the named members of the event text, in order (absent
// ones as empty texts). When `condition` is set, the list applies only to an
// event that has that member.
struct Event_Arguments {
    const char* condition;
    const char* members[2];
};

// How the events of one category are translated.
struct Event_Category {
    int category;
    const char* name;  // OtherAlertType and Category; null: neither is set
    Alert_Element element;
    bool anyId;       // every identifier is translated (`accepted` unused)
    uint32 accepted;  // bit n set: identifier n is translated
    bool coded;       // the event code is computed (else it is 0)
    Alert_Forms forms;
    uint16 severity;      // PerceivedSeverity of every event; 0: from the event
    const char* preface;  // logged (warning) before anything else; null: nothing
    const char* refusal;  // logged (warning) for an identifier not translated
    Event_Arguments arguments;
};

// The standard form of an event as the DMTF alert model words it: a message
// naming the network device, and a severity of its own.
struct Standard_Wording {
    const char* messageFormat;  // takes the device name
    uint16 severity;
};

// One known event.
struct Event_Details {
    sint32 code;
    const char* cause;
    const char* action;
    const char* messageId;      // null: "TVRN" followed by the code in decimal
    uint16 severity;            // PerceivedSeverity; 0: the category's rule
    Event_Arguments arguments;  // no members: the category's arguments
    // Reworded standard form, whose message arguments are the device name
    // and the computer system's path; null: the standard form as built.
    const Standard_Wording* standard;
};

// The translation rule of a category: one of the known categories, a rule
// that translates nothing (the other categories up to 12), or the rule of
// unknown categories (0, negative or above 12).
const Event_Category& eventCategory(int category);

// The known event with this code, or null.
const Event_Details* eventDetails(sint32 code);

// Every known category and event (for tests).
const Event_Category* eventCategories(size_t& count);
const Event_Details* allEventDetails(size_t& count);

// PerceivedSeverity of an event severity (1 to 4); false for any other value.
bool perceivedSeverity(int eventSeverity, uint16& severity);
bool exactPerceivedSeverity(int eventSeverity, uint16& severity);

}  // namespace CPTA

#endif
