#include "framework/Datetime.h"

#include <sys/time.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <new>

#include "framework/Atomic.h"

namespace CPTA {

// The shared zero interval: never counted, changed or freed (its count of 2
// keeps it from ever looking unshared).
Datetime_Rep Datetime::_zero = {2, 0, 0, 0};

namespace {

const size_t TEXT_SIZE = 25;

Datetime_Rep* _new_rep(uint64 usec, sint32 offset, uint32 is_timestamp) {
    Datetime_Rep* rep = static_cast<Datetime_Rep*>(std::malloc(sizeof(Datetime_Rep)));
    if (!rep)
        throw std::bad_alloc();
    rep->refs = 1;
    rep->usec = usec;
    rep->offset = offset;
    rep->is_timestamp = is_timestamp;
    return rep;
}

// Reads a fixed-width field of decimal digits, from the last digit backwards.
bool _str_to_uint32(const char* s, size_t n, uint32& x) {
    uint32 r = 0;
    uint32 m = 1;
    for (size_t i = n; i-- > 0; m *= 10) {
        if (s[i] < '0' || s[i] > '9')
            return false;
        r += uint32(s[i] - '0') * m;
    }
    x = r;
    return true;
}

// Local calendar fields to seconds since the epoch (daylight saving decided
// by the C library).
bool _to_seconds(uint32 year, uint32 month, uint32 day, uint32 hours, uint32 minutes,
                 uint32 seconds, time_t& t) {
    struct tm tm;
    std::memset(&tm, 0, sizeof(tm));
    tm.tm_year = int(year) - 1900;
    tm.tm_mon = int(month) - 1;
    tm.tm_mday = int(day);
    tm.tm_hour = int(hours);
    tm.tm_min = int(minutes);
    tm.tm_sec = int(seconds);
    tm.tm_isdst = -1;
    errno = 0;
    t = mktime(&tm);
    // A day the month does not have (February 30) is carried into the next
    // month; such a date is refused.
    return !(t == time_t(-1) && errno == EOVERFLOW) && tm.tm_mday == int(day) &&
           tm.tm_mon == int(month) - 1;
}

uint64 _to_usec(time_t t, uint32 microseconds) {
    // Times before the epoch wrap around; get_timestamp() reads them back as
    // signed numbers.
    return uint64(sint64(t) * sint64(Datetime::SEC)) + microseconds;
}

}  // namespace

void Datetime::_ref(Datetime_Rep* rep) {
    if (rep != &_zero)
        atomic_inc(&rep->refs);
}

void Datetime::_unref(Datetime_Rep* rep) {
    if (rep != &_zero && atomic_dec_and_test(&rep->refs))
        std::free(rep);
}

void Datetime::_unshare() {
    if (_rep != &_zero && atomic_get(&_rep->refs) == 1)
        return;
    Datetime_Rep* old = _rep;
    _rep = _new_rep(old->usec, old->offset, old->is_timestamp);
    _unref(old);
}

uint32 Datetime::ref_count() const {
    return atomic_get(&_rep->refs);
}

Datetime::Datetime() : _rep(&_zero) {}

Datetime::Datetime(uint64 usec) : _rep(usec ? _new_rep(usec, 0, 0) : &_zero) {}

Datetime::Datetime(uint64 usec, sint32 offset) : _rep(_new_rep(usec, offset, 1)) {}

Datetime::Datetime(const char* text) : _rep(_new_rep(0, 0, 1)) {
    set(text);
}

Datetime::Datetime(const Datetime& x) : _rep(x._rep) {
    _ref(_rep);
}

Datetime::~Datetime() {
    _unref(_rep);
}

Datetime& Datetime::operator=(const Datetime& x) {
    if (x._rep != _rep) {
        _ref(x._rep);
        _unref(_rep);
        _rep = x._rep;
    }
    return *this;
}

void Datetime::usec(uint64 usec) {
    _unshare();
    _rep->usec = usec;
}

void Datetime::offset(sint32 offset) {
    _unshare();
    _rep->offset = offset;
}

void Datetime::set(uint64 usec) {
    _unshare();
    _rep->usec = usec;
    _rep->offset = 0;
    _rep->is_timestamp = 0;
}

void Datetime::set(uint64 usec, sint32 offset) {
    _unshare();
    _rep->usec = usec;
    _rep->offset = offset;
    _rep->is_timestamp = 1;
}

void Datetime::clear() {
    _unref(_rep);
    _rep = &_zero;
}

bool Datetime::set(const char* text) {
    if (!text || strnlen(text, TEXT_SIZE + 1) != TEXT_SIZE || text[14] != '.')
        return false;

    // Hours, minutes, seconds and microseconds sit at the same positions in
    // both forms; the first eight characters are days, or year, month, day.
    uint32 hours, minutes, seconds, microseconds;
    if (!_str_to_uint32(text + 8, 2, hours) || !_str_to_uint32(text + 10, 2, minutes) ||
        !_str_to_uint32(text + 12, 2, seconds) || !_str_to_uint32(text + 15, 6, microseconds))
        return false;
    // A field out of its range would be carried into the next (a month 00
    // into the year before), and the text written back would not be a
    // date-time a server takes.
    if (hours > 23 || minutes > 59 || seconds > 59)
        return false;

    char kind = text[21];
    if (kind == ':') {
        uint32 days;
        if (!_str_to_uint32(text, 8, days) || std::memcmp(text + 22, "000", 3) != 0)
            return false;
        set(days * DAY + hours * HOUR + minutes * MIN + seconds * SEC + microseconds);
        return true;
    }

    if (kind != '+' && kind != '-')
        return false;
    uint32 year, month, day, utc;
    if (!_str_to_uint32(text, 4, year) || !_str_to_uint32(text + 4, 2, month) ||
        !_str_to_uint32(text + 6, 2, day) || !_str_to_uint32(text + 22, 3, utc))
        return false;
    if (month < 1 || month > 12 || day < 1 || day > 31)
        return false;
    time_t t;
    if (!_to_seconds(year, month, day, hours, minutes, seconds, t))
        return false;
    set(_to_usec(t, microseconds), kind == '-' ? -sint32(utc) : sint32(utc));
    return true;
}

void Datetime::set_interval(uint32 days, uint32 hours, uint32 minutes, uint32 seconds,
                            uint32 microseconds) {
    set(days * DAY + hours * HOUR + minutes * MIN + seconds * SEC + microseconds);
}

void Datetime::get_interval(uint32& days, uint32& hours, uint32& minutes, uint32& seconds,
                            uint32& microseconds) const {
    uint64 usec = _rep->usec;
    days = uint32(usec / DAY);
    hours = uint32(usec / HOUR - uint64(days) * 24);
    minutes = uint32((usec / MIN) % 60);
    seconds = uint32((usec / SEC) % 60);
    microseconds = uint32(usec % SEC);
}

bool Datetime::set_timestamp(uint32 year, uint32 month, uint32 day, uint32 hours, uint32 minutes,
                             uint32 seconds, uint32 microseconds, sint32 utc) {
    time_t t;
    if (!_to_seconds(year, month, day, hours, minutes, seconds, t))
        return false;
    set(_to_usec(t, microseconds), utc);
    return true;
}

void Datetime::get_timestamp(uint32& year, uint32& month, uint32& day, uint32& hours,
                             uint32& minutes, uint32& seconds, uint32& microseconds,
                             sint32& utc) const {
    sint64 usec = sint64(_rep->usec);
    sint64 secs = usec / sint64(SEC);
    sint64 rest = usec % sint64(SEC);
    if (rest < 0) {
        rest += sint64(SEC);
        secs--;
    }
    time_t t = time_t(secs);
    struct tm tm;
    if (!localtime_r(&t, &tm))
        std::memset(&tm, 0, sizeof(tm));
    year = uint32(tm.tm_year + 1900);
    month = uint32(tm.tm_mon + 1);
    day = uint32(tm.tm_mday);
    hours = uint32(tm.tm_hour);
    minutes = uint32(tm.tm_min);
    seconds = uint32(tm.tm_sec);
    microseconds = uint32(rest);
    utc = _rep->offset;
}

void Datetime::ascii(char* buffer, bool prettify) const {
    if (is_timestamp()) {
        uint32 year, month, day, hours, minutes, seconds, microseconds;
        sint32 utc;
        get_timestamp(year, month, day, hours, minutes, seconds, microseconds, utc);
        const char* format = prettify ? "%04d/%02d/%02d %02d:%02d:%02d.%06d%c%03lld"
                                      : "%04d%02d%02d%02d%02d%02d.%06d%c%03lld";
        long long abs_utc = utc < 0 ? -static_cast<long long>(utc) : utc;
        snprintf(buffer, BUFFER_SIZE, format, int(year), int(month), int(day), int(hours),
                 int(minutes), int(seconds), int(microseconds), utc < 0 ? '-' : '+', abs_utc);
    } else {
        uint32 days, hours, minutes, seconds, microseconds;
        get_interval(days, hours, minutes, seconds, microseconds);
        const char* format =
            prettify ? "%08u %02u %02u %02u.%06u:000" : "%08u%02u%02u%02u.%06u:000";
        snprintf(buffer, BUFFER_SIZE, format, days, hours, minutes, seconds, microseconds);
    }
}

String Datetime::ascii(bool prettify) const {
    char buffer[BUFFER_SIZE];
    ascii(buffer, prettify);
    return String(buffer);
}

void Datetime::print(FILE* os, bool prettify) const {
    char buffer[BUFFER_SIZE];
    ascii(buffer, prettify);
    fprintf(os, "%s\n", buffer);
}

Datetime Datetime::now() {
    struct timeval tv;
    if (gettimeofday(&tv, nullptr) != 0)
        return Datetime();
    // The offset of the local zone at that instant, in minutes east of UTC.
    struct tm tm;
    sint32 offset = 0;
    if (localtime_r(&tv.tv_sec, &tm))
        offset = sint32(tm.tm_gmtoff / 60);
    return Datetime(uint64(tv.tv_sec) * SEC + uint64(tv.tv_usec), offset);
}

bool Datetime::equal(const Datetime& x) const {
    return x._rep == _rep || (x._rep->usec == _rep->usec && x._rep->offset == _rep->offset &&
                              x._rep->is_timestamp == _rep->is_timestamp);
}

}  // namespace CPTA
