#include "alerts/IndicationManager.h"

#include <vector>

#include "framework/Log.h"
#include "gateway/ProviderUtil.h"

namespace CPTA {

namespace {

// The longest the delivery thread sleeps before it looks at its flag again.
const std::chrono::milliseconds kDeliveryPass(20);

}  // namespace

IndicationManager::IndicationManager() : _helper(IndicationHelper::getIndicationHelperInstance()) {
    TVRN_LOG(LL_DBG, "Inside IndicationManager Constructor");
}

IndicationManager* IndicationManager::getIndicationManager() {
    TVRN_LOG(LL_DBG, "Entering: %s", "getIndicationManager");
    static IndicationManager instance;
    TVRN_LOG(LL_DBG, "Returning: %s", "getIndicationManager");
    return &instance;
}

bool IndicationManager::subscribeForEventNotifications() {
    if (!ProviderUtil::getDriverStatus()) {
        TVRN_LOG(LL_ERR,
                 "Driver is not installed or there is a tfal mismatch. Will not invoke "
                 "subscription. ");
        return false;
    }
    return _helper->subscribeForEventNotifications();
}

bool IndicationManager::unsubscribeForEventNotifications() {
    return _helper->unsubscribeForEventNotifications();
}

IndicationDelivery::~IndicationDelivery() {
    if (_running)
        disable();
}

Enable_Indications_Status IndicationDelivery::enable(Handler* handler) {
    TVRN_LOG(LL_DBG, "Entering: %s", "enable_indications");
    if (_running) {
        // The running delivery keeps its thread and its handler.
        TVRN_LOG(LL_INFO, "Indications are already enabled");
        delete handler;
        return ENABLE_INDICATIONS_OK;
    }
    IndicationManager* manager = IndicationManager::getIndicationManager();
    if (!manager->subscribeForEventNotifications()) {
        TVRN_LOG(LL_ERR, "Subscribtion for event notifications FAILED.");
        return ENABLE_INDICATIONS_FAILED;
    }
    _handler = handler;
    TVRN_LOG(LL_INFO, "Subscribtion for event notifications is successful.");
    _running = true;
    const int rc = Thread::create_joinable(_thread, deliverIndications, this);
    if (rc != 0) {
        TVRN_LOG(LL_ERR, "Unable to start the indication thread (error %d)", rc);
        _running = false;
        _handler = nullptr;
        manager->unsubscribeForEventNotifications();
        manager->queue().discard();
        return ENABLE_INDICATIONS_FAILED;
    }
    return ENABLE_INDICATIONS_OK;
}

Disable_Indications_Status IndicationDelivery::disable() {
    TVRN_LOG(LL_DBG, "Entering: %s", "disable_indications");
    if (!_running) {
        TVRN_LOG(LL_INFO, "No subscription for event notifications happened or successful");
        return DISABLE_INDICATIONS_OK;
    }
    IndicationManager* manager = IndicationManager::getIndicationManager();
    if (!manager->unsubscribeForEventNotifications()) {
        TVRN_LOG(LL_ERR, "Un-subscribtion for event notifications FAILED.");
        TVRN_LOG(LL_INFO, "Continue to stop the thread created for listening to events");
    } else {
        TVRN_LOG(LL_INFO, "Unsubscribtion for event notifications is successful.");
    }
    _running = false;
    manager->queue().wake();
    TVRN_LOG(LL_INFO, "Stopping the indication thread created.");
    void* result = nullptr;
    Thread::join(_thread, result);
    if (_handler) {
        _handler->handle(nullptr);  // the end of the indications
        delete _handler;
        _handler = nullptr;
    }
    if (size_t discarded = manager->queue().discard())
        TVRN_LOG(LL_INFO, "%zu undelivered indications discarded", discarded);
    TVRN_LOG(LL_DBG, "Returning: %s", "disable_indications");
    return DISABLE_INDICATIONS_OK;
}

void* IndicationDelivery::deliverIndications(void* delivery) {
    IndicationDelivery* self = static_cast<IndicationDelivery*>(delivery);
    IndicationQueue& queue = IndicationManager::getIndicationManager()->queue();
    std::vector<TAVRIN_AlertIndication*> batch;
    uint64 dropped = 0;
    for (;;) {
        const bool open = queue.takeAll(batch, kDeliveryPass, self->_running, dropped);
        if (dropped)
            TVRN_LOG(LL_WARN, "%llu indications dropped: more than %zu were waiting",
                     (unsigned long long)dropped, queue.bound());
        if (!open)
            break;
        for (TAVRIN_AlertIndication* indication : batch) {
            self->_handler->handle(indication);
            TVRN_LOG(LL_INFO, "Delivered indication to the CIM server");
        }
        batch.clear();
    }
    TVRN_LOG(LL_DBG, "Returning: %s", "deliverIndications");
    return nullptr;
}

}  // namespace CPTA
