#include "simulator/Events.h"

#include <chrono>

namespace tvrnsim {

void EventHub::setCallback(EventCallback cb) {
    std::unique_lock<std::mutex> lock(mu_);
    cb_ = cb;
    cv_.notify_all();
    if (std::this_thread::get_id() != thread_.get_id())
        cv_.wait(lock, [this] { return !delivering_; });
}

bool EventHub::subscribe(bool dropOldEvents, const std::vector<std::string>& initial) {
    std::unique_lock<std::mutex> lock(mu_);
    if (shutdown_)
        return false;
    if (dropOldEvents)
        queue_.clear();
    // A thread told to stop from inside a callback may still be finishing.
    if (thread_.joinable() && threadGeneration_ != generation_) {
        if (std::this_thread::get_id() == thread_.get_id())
            generation_ = threadGeneration_;
        else
            stopThread(lock);
    }
    registered_ = true;
    queue_.insert(queue_.end(), initial.begin(), initial.end());
    if (!thread_.joinable()) {
        threadGeneration_ = generation_;
        thread_ = std::thread(&EventHub::run, this, generation_);
    }
    cv_.notify_all();
    return true;
}

void EventHub::unsubscribe() {
    std::unique_lock<std::mutex> lock(mu_);
    registered_ = false;
    queue_.clear();
    stopThread(lock);
}

bool EventHub::subscribed() {
    std::lock_guard<std::mutex> lock(mu_);
    return registered_;
}

bool EventHub::emit(const std::string& text) {
    std::lock_guard<std::mutex> lock(mu_);
    if (!registered_)
        return false;
    queue_.push_back(text);
    cv_.notify_all();
    return true;
}

bool EventHub::waitDelivered(int timeoutMs) {
    std::unique_lock<std::mutex> lock(mu_);
    return cv_.wait_for(lock, std::chrono::milliseconds(timeoutMs < 0 ? 0 : timeoutMs),
                        [this] { return queue_.empty() && !delivering_; });
}

std::uint64_t EventHub::delivered() {
    std::lock_guard<std::mutex> lock(mu_);
    return delivered_;
}

void EventHub::discardQueued() {
    std::lock_guard<std::mutex> lock(mu_);
    queue_.clear();
    cv_.notify_all();
}

void EventHub::shutdown() {
    std::unique_lock<std::mutex> lock(mu_);
    shutdown_ = true;
    registered_ = false;
    queue_.clear();
    stopThread(lock);
}

// Called with the lock held; joins the delivery thread unless this is it (a
// callback that unregisters), in which case the thread ends after the callback.
void EventHub::stopThread(std::unique_lock<std::mutex>& lock) {
    ++generation_;
    cv_.notify_all();
    if (!thread_.joinable() || std::this_thread::get_id() == thread_.get_id())
        return;
    std::thread t = std::move(thread_);
    lock.unlock();
    t.join();
    lock.lock();
}

void EventHub::run(std::uint64_t generation) {
    std::unique_lock<std::mutex> lock(mu_);
    for (;;) {
        cv_.wait(lock, [&] {
            return generation_ != generation || (registered_ && cb_ && !queue_.empty());
        });
        if (generation_ != generation)
            break;
        std::string text = std::move(queue_.front());
        queue_.pop_front();
        EventCallback cb = cb_;
        delivering_ = true;
        lock.unlock();
        cb(text.c_str());
        lock.lock();
        delivering_ = false;
        ++delivered_;
        cv_.notify_all();
    }
}

}  // namespace tvrnsim
