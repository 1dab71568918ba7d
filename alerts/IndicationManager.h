// Delivery of alert indications to the CIM server.
//
// IndicationManager is the alert provider's way to the library's events: it
// subscribes only while the adapter driver is usable.
//
// IndicationDelivery is what the provider holds while the server wants alert
// indications. enable() subscribes to the library's events and starts the
// delivery thread (through Thread, so that it carries a context of the CIM
// server and may deliver); the thread hands everything queued to the
// server's handler, waking at least every 20 ms. disable() withdraws the
// subscription, stops and joins the thread, ends and deletes the handler,
// and discards what was queued and not delivered, so that a later subscriber
// gets only new indications. enable() and disable() are called by one thread
// at a time (the CMPI binding serialises a provider's requests).
#ifndef CPTA_ALERTS_INDICATIONMANAGER_H
#define CPTA_ALERTS_INDICATIONMANAGER_H

#include <atomic>

#include "alerts/IndicationHelper.h"
#include "cmpi/Provider_Handler.h"
#include "framework/Thread.h"

namespace CPTA {

class IndicationManager {
public:
    static IndicationManager* getIndicationManager();

    // False (without asking the library) when the driver is missing or
    // mismatched, else IndicationHelper::subscribeForEventNotifications.
    bool subscribeForEventNotifications();
    bool unsubscribeForEventNotifications();
    IndicationQueue& queue() { return _helper->queue(); }

private:
    IndicationManager();

    IndicationHelper* _helper;
};

class IndicationDelivery {
public:
    typedef Indication_Handler<TAVRIN_AlertIndication> Handler;

    IndicationDelivery() = default;
    // Stops a delivery still running, as disable() does.
    ~IndicationDelivery();

    IndicationDelivery(const IndicationDelivery&) = delete;
    IndicationDelivery& operator=(const IndicationDelivery&) = delete;

    // OK: the handler is ours (while already enabled it is deleted, and the
    // running delivery keeps its own). FAILED: the handler stays the
    // caller's; nothing is subscribed and no thread runs.
    Enable_Indications_Status enable(Handler* handler);
    // Always OK; without a running delivery the library is not called.
    Disable_Indications_Status disable();
    bool running() const { return _running; }

private:
    static void* deliverIndications(void* delivery);

    Thread _thread;
    std::atomic<bool> _running{false};
    Handler* _handler = nullptr;
};

}  // namespace CPTA

#endif
