// Translation of the adapter library's events into TAVRIN_AlertIndication
// instances, and the queue they wait in for delivery.
//
// The library calls providerHandleEvent on a thread of its own with one JSON
// text per event, from the moment subscribeForEventNotifications registers it
// until unsubscribeForEventNotifications withdraws it. processEvent parses the
// text, applies the rule of the event's category and the event's own details
// (alerts/EventTables.h) and queues one or two indications: the standard form
// and the vendor form, with consecutive sequence numbers. A text that is not a
// JSON object, lacks the category or identifier, or holds a member of the
// wrong type is dropped with a log line; nothing is thrown to the library.
#ifndef CPTA_ALERTS_INDICATIONHELPER_H
#define CPTA_ALERTS_INDICATIONHELPER_H

#include "alerts/IndicationQueue.h"
#include "framework/String.h"
#include "schema/generated/TAVRIN_AlertIndication.h"

namespace CPTA {

class IndicationHelper {
public:
    // Indications that may wait for delivery. Each takes about 1.5 KB, so a
    // full queue holds some 15 MB of the CIM server's memory; that holds a
    // storm in which every remote port of a large SAN logs out at once (some
    // thousands of events) even while the server takes no indications.
    static constexpr size_t kQueueBound = 10000;

    static IndicationHelper* getIndicationHelperInstance();

    // Translates one event text and queues what it produces: 1 when
    // something was queued, 0 when the event was dropped (and logged).
    int processEvent(const char* eventText) noexcept;

    // The texts of an event code; "Unknown" for a code not in the tables.
    static String getEventCauseById(int code);
    static String getEventActionById(int code);
    static String getMessageIDById(int code);

    // PerceivedSeverity of an event severity; 0 (with a warning) outside 1 to 4.
    static int getPerceivedSeverity(int eventSeverity);
    static int getExactPerceivedSeverity(int eventSeverity);

    // Numbers and queues an indication, taking it over. Always 1.
    int updateIndicationObjects(TAVRIN_AlertIndication* indication);
    IndicationQueue& queue() { return _queue; }

    // Asks the library for events (dropping any it kept) and, when it
    // agrees, registers providerHandleEvent. False when the library refused.
    bool registerForEvents();
    // Withdraws the callback (the library runs none after this returns), then
    // ends the registration. False when the library refused the latter.
    bool deRegisterForEvents();
    bool subscribeForEventNotifications() { return registerForEvents(); }
    bool unsubscribeForEventNotifications() { return deRegisterForEvents(); }

private:
    IndicationHelper();

    IndicationQueue _queue;
};

// The event callback registered with the library.
void providerHandleEvent(const char* eventText) noexcept;

// Object paths in text form, "//<host>/root/tavrin:<Class>.<keys>"; empty
// when a key cannot be written.
String getFCPortObjectPath(const String& deviceId);
String getEthernetPortObjectPath(const String& deviceId);
String getComputerSystemObjectPath();

}  // namespace CPTA

#endif
