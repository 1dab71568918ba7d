#include "alerts/IndicationQueue.h"

namespace CPTA {

IndicationQueue::IndicationQueue(size_t bound) : _bound(bound > 0 ? bound : 1) {}

IndicationQueue::~IndicationQueue() {
    discard();
}

void IndicationQueue::push(TAVRIN_AlertIndication* const* indications, size_t count) {
    std::vector<TAVRIN_AlertIndication*> evicted;
    {
        std::lock_guard<std::mutex> lock(_mutex);
        for (size_t i = 0; i < count; i++) {
            TAVRIN_AlertIndication* indication = indications[i];
            if (!indication)
                continue;
            indication->SequenceNumber.set(++_sequence);
            if (_items.size() >= _bound) {
                evicted.push_back(_items.front());
                _items.pop_front();
                _dropped++;
            }
            _items.push_back(indication);
        }
    }
    _ready.notify_one();
    for (TAVRIN_AlertIndication* indication : evicted)
        destroy(indication);
}

bool IndicationQueue::takeAll(std::vector<TAVRIN_AlertIndication*>& out,
                              std::chrono::milliseconds wait, const std::atomic<bool>& open,
                              uint64& dropped) {
    std::unique_lock<std::mutex> lock(_mutex);
    _ready.wait_for(lock, wait, [&] { return !open || !_items.empty(); });
    dropped = _dropped;
    _dropped = 0;
    if (!open)
        return false;
    out.insert(out.end(), _items.begin(), _items.end());
    _items.clear();
    return true;
}

void IndicationQueue::wake() {
    // Taking the mutex orders the caller's change of the flag before the
    // waiter's next look at it.
    { std::lock_guard<std::mutex> lock(_mutex); }
    _ready.notify_all();
}

size_t IndicationQueue::discard() {
    std::deque<TAVRIN_AlertIndication*> items;
    {
        std::lock_guard<std::mutex> lock(_mutex);
        items.swap(_items);
        _dropped = 0;
    }
    for (TAVRIN_AlertIndication* indication : items)
        destroy(indication);
    return items.size();
}

size_t IndicationQueue::size() const {
    std::lock_guard<std::mutex> lock(_mutex);
    return _items.size();
}

}  // namespace CPTA
