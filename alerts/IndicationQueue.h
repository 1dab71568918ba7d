// The alert indications waiting for delivery: filled on the adapter library's
// event thread, emptied by the delivery thread.
//
// Every queued indication gets the next sequence number (1, 2, ...), so a
// client sees from a gap that indications were lost. The queue has a bound:
// when it is full the oldest indications make room and are counted as
// dropped; the delivery thread reports the count in the log.
#ifndef CPTA_ALERTS_INDICATIONQUEUE_H
#define CPTA_ALERTS_INDICATIONQUEUE_H

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <cstddef>
#include <deque>
#include <mutex>
#include <vector>

#include "framework/Types.h"
#include "schema/generated/TAVRIN_AlertIndication.h"

namespace CPTA {

class IndicationQueue {
public:
    explicit IndicationQueue(size_t bound);
    // Destroys what is still queued.
    ~IndicationQueue();

    IndicationQueue(const IndicationQueue&) = delete;
    IndicationQueue& operator=(const IndicationQueue&) = delete;

    // Numbers the indications in order and appends them, taking them over;
    // they get consecutive sequence numbers whatever other threads queue.
    void push(TAVRIN_AlertIndication* const* indications, size_t count);

    // Waits up to `wait` until something is queued or `open` turns false,
    // then moves every queued indication to `out`, oldest first. `dropped`
    // receives the number dropped since the last call. False (nothing moved)
    // when `open` is false.
    bool takeAll(std::vector<TAVRIN_AlertIndication*>& out, std::chrono::milliseconds wait,
                 const std::atomic<bool>& open, uint64& dropped);
    // Wakes a waiting takeAll, to see a change of its `open` flag.
    void wake();

    // Destroys every queued indication; returns their number.
    size_t discard();

    size_t size() const;
    size_t bound() const { return _bound; }

private:
    const size_t _bound;
    mutable std::mutex _mutex;
    std::condition_variable _ready;
    std::deque<TAVRIN_AlertIndication*> _items;
    sint64 _sequence = 0;
    uint64 _dropped = 0;  // since the last takeAll
};

}  // namespace CPTA

#endif
