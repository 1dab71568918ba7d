// CIM date-time: either a timestamp or an interval, shared copy-on-write.
//
// Text form (25 characters):
//   timestamp  yyyymmddhhmmss.mmmmmmsutc   (s is '+' or '-', utc in minutes)
//   interval   ddddddddhhmmss.mmmmmm:000
#ifndef CPTA_FRAMEWORK_DATETIME_H
#define CPTA_FRAMEWORK_DATETIME_H

#include <cstdio>

#include "framework/String.h"
#include "framework/Types.h"

namespace CPTA {

struct Datetime_Rep {
    uint32 refs;
    uint64 usec;    // microseconds since the epoch, or the interval's length
    sint32 offset;  // UTC offset in minutes (timestamps only)
    uint32 is_timestamp;
};

class Datetime {
public:
    static constexpr uint64 USEC = 1;
    static constexpr uint64 MSEC = 1000;
    static constexpr uint64 SEC = 1000000;
    static constexpr uint64 MIN = 60000000;
    static constexpr uint64 HOUR = 3600000000ULL;
    static constexpr uint64 DAY = 86400000000ULL;

    // Size of a buffer that ascii() can always fill.
    static constexpr size_t BUFFER_SIZE = 32;

    Datetime();                            // the zero interval
    explicit Datetime(uint64 usec);        // an interval
    Datetime(uint64 usec, sint32 offset);  // a timestamp
    // The zero timestamp, then parsed from the text (left as is on failure).
    explicit Datetime(const char* text);
    Datetime(const Datetime& x);
    ~Datetime();
    Datetime& operator=(const Datetime& x);

    bool is_interval() const { return _rep->is_timestamp == 0; }
    bool is_timestamp() const { return _rep->is_timestamp != 0; }
    uint64 usec() const { return _rep->usec; }
    void usec(uint64 usec);
    sint32 offset() const { return _rep->offset; }
    void offset(sint32 offset);

    void set(uint64 usec);                 // interval
    void set(uint64 usec, sint32 offset);  // timestamp
    void clear();                          // zero interval

    // Parses the 25-character text form; false (value unchanged) when the
    // text is malformed.
    bool set(const char* text);

    void set_interval(uint32 days, uint32 hours, uint32 minutes, uint32 seconds,
                      uint32 microseconds);
    void get_interval(uint32& days, uint32& hours, uint32& minutes, uint32& seconds,
                      uint32& microseconds) const;

    // Fields in local time; the offset is kept for display only. Returns false
    // (value unchanged) when the fields cannot be converted.
    bool set_timestamp(uint32 year, uint32 month, uint32 day, uint32 hours, uint32 minutes,
                       uint32 seconds, uint32 microseconds, sint32 utc);
    void get_timestamp(uint32& year, uint32& month, uint32& day, uint32& hours, uint32& minutes,
                       uint32& seconds, uint32& microseconds, sint32& utc) const;

    String ascii(bool prettify = false) const;
    // Writes the text form into buffer (at least BUFFER_SIZE bytes).
    void ascii(char* buffer, bool prettify = false) const;
    void print(FILE* os = stdout, bool prettify = false) const;

    // The current time as a timestamp; the zero interval if the clock fails.
    static Datetime now();

    // Same microseconds, offset and kind.
    bool equal(const Datetime& x) const;

    void swap(Datetime& x) noexcept {
        Datetime_Rep* t = _rep;
        _rep = x._rep;
        x._rep = t;
    }

    // Number of Datetime objects sharing the representation (the static zero
    // interval reports 2 and is never counted).
    uint32 ref_count() const;

private:
    void _unshare();
    static void _ref(Datetime_Rep* rep);
    static void _unref(Datetime_Rep* rep);

    static Datetime_Rep _zero;
    Datetime_Rep* _rep;
};

inline bool operator==(const Datetime& a, const Datetime& b) {
    return a.equal(b);
}
inline bool operator!=(const Datetime& a, const Datetime& b) {
    return !a.equal(b);
}

}  // namespace CPTA

#endif
