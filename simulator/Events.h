// Delivery of adapter event texts to the registered callback, on a thread of
// the library's own, while a client is registered for events.
#ifndef TVRN_SIMULATOR_EVENTS_H
#define TVRN_SIMULATOR_EVENTS_H

#include <condition_variable>
#include <cstdint>
#include <deque>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

namespace tvrnsim {

using EventCallback = void (*)(const char*);

class EventHub {
public:
    EventHub() = default;
    EventHub(const EventHub&) = delete;
    EventHub& operator=(const EventHub&) = delete;

    // Stores the callback (null stops deliveries). Returns once no delivery
    // through the previous callback is in progress, unless called from a callback.
    void setCallback(EventCallback cb);
    // Registers the client; queues `initial` behind anything kept. False after shutdown.
    bool subscribe(bool dropOldEvents, const std::vector<std::string>& initial);
    // Unregisters, discards queued events and stops the delivery thread.
    void unsubscribe();
    bool subscribed();
    // Queues one event; false (dropped) while nobody is registered.
    bool emit(const std::string& text);
    // Waits until every queued event has been delivered. False on timeout.
    bool waitDelivered(int timeoutMs);
    std::uint64_t delivered();
    // Discards queued events (registration unchanged).
    void discardQueued();
    // Final stop at unload: no thread is started afterwards.
    void shutdown();

private:
    void run(std::uint64_t generation);
    void stopThread(std::unique_lock<std::mutex>& lock);

    std::mutex mu_;
    std::condition_variable cv_;
    std::deque<std::string> queue_;
    EventCallback cb_ = nullptr;
    bool registered_ = false;
    bool delivering_ = false;
    // A delivery thread runs while generation_ equals the value it started with.
    std::uint64_t generation_ = 0;
    std::uint64_t threadGeneration_ = 0;
    bool shutdown_ = false;
    std::uint64_t delivered_ = 0;
    std::thread thread_;
};

}  // namespace tvrnsim

#endif
