// Value types: String, Array, Datetime and Buffer.
#include <gtest/gtest.h>

#include <cstdlib>
#include <ctime>
#include <string>

#include "framework/Array.h"
#include "framework/Buffer.h"
#include "framework/Datetime.h"
#include "framework/String.h"
#include "framework/Time.h"

using namespace CPTA;

namespace {

std::string repeat(char c, size_t n) {
    return std::string(n, c);
}

}  // namespace

TEST(String, EmptyStringsShareTheStaticRepresentation) {
    String a, b(""), c("abc", size_t(0)), d(nullptr);
    for (const String* s : {&a, &b, &c, &d}) {
        EXPECT_TRUE(s->is_static_empty());
        EXPECT_STREQ("", s->c_str());
    }
    a.append('x');
    EXPECT_EQ("x", a);
    EXPECT_TRUE(b.is_static_empty());
}

TEST(String, FillingToTheCapacityAndOneMore) {
    for (size_t n : {31, 32, 33, 64}) {
        String s(repeat('x', n).c_str());
        String t;
        for (size_t i = 0; i < n; i++)
            t.append('x');
        s.append('y');
        t.append('y');
        EXPECT_EQ(repeat('x', n) + "y", s.c_str());
        EXPECT_EQ(s, t);
    }
}

TEST(String, ModifyingASharedStringLeavesItsCopiesAlone) {
    String a("abc");
    String b(a), c(a), d(a), e(a), f(a);
    EXPECT_EQ(a.c_str(), b.c_str());
    b.append("def");
    c.set(0, 'X');
    d.remove(1);
    e.clear();
    f.assign("zz");
    EXPECT_EQ("abcdef", b);
    EXPECT_EQ("Xbc", c);
    EXPECT_EQ("a", d);
    EXPECT_TRUE(e.is_static_empty());
    EXPECT_EQ("zz", f);
    EXPECT_EQ("abc", a);
    EXPECT_EQ(1u, a.ref_count());
}

TEST(String, AppendingFromItselfSurvivesReallocation) {
    String s(repeat('a', 30).c_str());
    s.append(s.c_str() + 10, 10);  // grows past 32: the source moves
    EXPECT_EQ(repeat('a', 40), s.c_str());
    s.append(s);
    EXPECT_EQ(repeat('a', 80), s.c_str());
    s.assign(s.c_str() + 70);
    EXPECT_EQ(repeat('a', 10), s.c_str());
}

TEST(String, SearchCompareAndRemoveOutOfRange) {
    String s("abcabc");
    EXPECT_EQ(4u, s.find('b', 2));
    EXPECT_EQ(2u, s.find("cab"));
    EXPECT_EQ(String::npos, s.find(String("abcabcd")));
    EXPECT_EQ(String::npos, s.find('a', 100));
    EXPECT_EQ("ca", s.substr(2, 2));
    EXPECT_EQ("", s.substr(6));
    EXPECT_EQ("", s.substr(99, 3));

    String r(s);
    r.remove(1, 2);
    EXPECT_EQ("aabc", r);
    r.remove(10, 1);
    EXPECT_EQ("aabc", r);

    EXPECT_FALSE(s.equal("abcab"));
    EXPECT_TRUE(s.equal("abcabc and more", 6));
    EXPECT_FALSE(s.equal(3, "abd", 3));
    EXPECT_TRUE(s.equali(2, "CA", 2));
    EXPECT_FALSE(s.equali("ABCAB"));
    EXPECT_TRUE(String().equal(nullptr));
}

TEST(String, BoundedCopyAndConcatenation) {
    char buf[8];
    EXPECT_EQ(11u, strlcpy(buf, "hello world", sizeof(buf)));
    EXPECT_STREQ("hello w", buf);
    strlcpy(buf, "hi", sizeof(buf));
    EXPECT_EQ(7u, strlcat(buf, "there", sizeof(buf)));
    EXPECT_EQ(9u, strlcat(buf, "!!", sizeof(buf)));
    EXPECT_STREQ("hithere", buf);
    EXPECT_EQ(3u, strlcpy(buf, "abc", 0));
    EXPECT_STREQ("hithere", buf);
}

namespace {

// An element type with a live count, to see that construction and
// destruction balance.
struct Counted {
    static int live;
    String text;
    int n;

    Counted(int n_ = 0) : text("counted"), n(n_) { live++; }
    Counted(const Counted& x) : text(x.text), n(x.n) { live++; }
    ~Counted() { live--; }
    bool operator==(const Counted& x) const { return n == x.n; }
};
int Counted::live = 0;

}  // namespace

TEST(Array, FindUsesElementEquality) {
    Array<real64> r;  // reals compare as numbers, not bytes
    r.append(0.0);
    EXPECT_EQ(0u, r.find(-0.0));
    EXPECT_EQ(size_t(-1), r.find(1.0));
    Array<real64> r2;
    r2.append(-0.0);
    EXPECT_TRUE(r == r2);
}

TEST(Array, InsertRemoveAndPrependKeepOrder) {
    Array<String> a;
    const String xs[] = {"c", "d"};
    a.append("e");
    a.prepend(xs, 2);
    a.insert(0, String("a"));
    a.insert(1, String("b"));
    a.insert(99, String("f"));  // beyond the end: appended
    ASSERT_EQ(6u, a.size());
    const char* expect[] = {"a", "b", "c", "d", "e", "f"};
    for (size_t i = 0; i < 6; i++)
        EXPECT_EQ(expect[i], a[i]);

    a.remove(1, 2);
    EXPECT_EQ("d", a[1]);
    a.remove(3, 50);
    a.remove(10, 1);
    EXPECT_EQ(3u, a.size());
}

TEST(Array, ElementsFromItselfSurviveReallocation) {
    Array<String> a;
    for (int i = 0; i < 8; i++)
        a.append(String("s", std::to_string(i).c_str()));
    ASSERT_EQ(8u, a.capacity());
    a.append(a[3]);  // grows: a[3] moves
    a.insert(0, a.data() + 5, 4);
    ASSERT_EQ(13u, a.size());
    const char* expect[] = {"s5", "s6", "s7", "s3", "s0", "s1", "s2",
                            "s3", "s4", "s5", "s6", "s7", "s3"};
    for (size_t i = 0; i < 13; i++)
        EXPECT_EQ(expect[i], a[i]) << i;

    Array<String> s;
    s.append("keep");
    s.resize(9, s[0]);  // the fill lives in the array itself
    EXPECT_EQ("keep", s[8]);
    Array<uint16> n;
    n.resize(2, 7);
    n.resize(1);
    n.resize(3);
    EXPECT_EQ(7, n[0]);
    EXPECT_EQ(0, n[2]);
}

TEST(Array, CopiesAreDeepAndElementsBalance) {
    {
        Array<Counted> a;
        for (int i = 0; i < 20; i++)
            a.append(Counted(i));
        Array<Counted> b(a);
        b[0].n = 100;
        EXPECT_EQ(0, a[0].n);
        EXPECT_FALSE(a == b);
        b = a;
        EXPECT_TRUE(a == b);
        a.remove(0, 10);
        a.resize(15, Counted(1));
        EXPECT_EQ(35, Counted::live);
    }
    EXPECT_EQ(0, Counted::live);
}

// Local time with daylight saving, without depending on installed zone files.
[[maybe_unused]] const bool _local_time_zone = [] {
    setenv("TZ", "CET-1CEST,M3.5.0,M10.5.0/3", 1);
    tzset();
    return true;
}();

TEST(Datetime, TextRoundTrips) {
    const char* texts[] = {
        "20240131235959.123456+060",  // winter
        "20240715120000.000001+120",  // summer
        "19600101000000.000000+000",  // before the epoch
        "20000229060708.999999-300",  // leap day
        "00000001020304.000005:000",  // interval
    };
    for (const char* text : texts) {
        Datetime d;
        ASSERT_TRUE(d.set(text)) << text;
        EXPECT_EQ(text, d.ascii()) << text;
    }

    Datetime d("20240131235959.123456+060");
    EXPECT_EQ("2024/01/31 23:59:59.123456+060", d.ascii(true));
    uint32 y, mo, da, h, mi, s, us;
    sint32 utc;
    d.get_timestamp(y, mo, da, h, mi, s, us, utc);
    EXPECT_EQ(2024u, y);
    EXPECT_EQ(31u, da);
    EXPECT_EQ(123456u, us);
    EXPECT_EQ(60, utc);
    ASSERT_TRUE(d.set_timestamp(2024, 7, 15, 12, 0, 0, 1, 120));
    EXPECT_EQ(Datetime("20240715120000.000001+120"), d);

    Datetime i("00000001020304.000005:000");
    EXPECT_TRUE(i.is_interval());
    EXPECT_EQ(Datetime::DAY + 2 * Datetime::HOUR + 3 * Datetime::MIN + 4 * Datetime::SEC + 5,
              i.usec());
    EXPECT_EQ("00000001 02 03 04.000005:000", i.ascii(true));
    Datetime e;
    e.set_interval(1, 2, 3, 4, 5);
    EXPECT_EQ(i, e);
}

TEST(Datetime, MalformedTextIsRejectedAndLeavesTheValue) {
    const char* bad[] = {
        nullptr,
        "",
        "2024013123595.123456+060",    // 24 characters
        "20240131235959.1234567+060",  // 26 characters
        "2024013123595X.123456+060",   // letter in the seconds
        "X0240131235959.123456+060",   // letter in the year
        "20240131235959.12345a+060",   // letter in the microseconds
        "20240131235959.123456+06x",   // letter in the offset
        "20240131235959 123456+060",   // no '.'
        "00000001020304.000005:001",   // interval not ending in 000
        "0000000102030X.000005:000",   // letter in an interval
        "20240131235959.123456*060",   // neither ':', '+' nor '-'
        "00000000000000.000000+000",   // month and day 00
        "20241301000000.000000+000",   // month 13
        "20240132000000.000000+000",   // day 32
        "20260229000000.000000+000",   // February 29 of a common year
        "20240431000000.000000+000",   // April 31
        "20240131240000.000000+000",   // hour 24
        "99999999990000.000000:000",   // interval of 99 hours
        "00000000006000.000000:000",   // 60 minutes
        "00000000000060.000000:000",   // 60 seconds
    };
    Datetime d("20240131235959.123456+060");
    Datetime before(d);
    for (const char* text : bad) {
        EXPECT_FALSE(d.set(text)) << (text ? text : "(null)");
        EXPECT_EQ(before, d);
    }
    Datetime z("not a date");
    EXPECT_TRUE(z.is_timestamp());
    EXPECT_EQ(0u, z.usec());
}

TEST(Datetime, CopiesShareUntilModified) {
    Datetime a(5 * Datetime::MIN);
    Datetime b(a);
    b.offset(30);
    b.usec(7);
    EXPECT_EQ(5 * Datetime::MIN, a.usec());
    EXPECT_EQ(0, a.offset());
    EXPECT_EQ(1u, a.ref_count());

    // Equality looks at microseconds, offset and kind.
    EXPECT_NE(Datetime(100), Datetime(100, 0));
    EXPECT_NE(Datetime(100, 60), Datetime(100, 0));
    EXPECT_EQ(Datetime(100, 60), Datetime(100, 60));
}

TEST(Datetime, NowIsALocalTimestamp) {
    uint64 before = Time::now();
    Datetime now = Datetime::now();
    uint64 after = Time::now();
    EXPECT_TRUE(now.is_timestamp());
    EXPECT_GE(now.usec(), before);
    EXPECT_LE(now.usec(), after);
    time_t t = time_t(now.usec() / Datetime::SEC);
    struct tm tm;
    localtime_r(&t, &tm);
    EXPECT_EQ(tm.tm_gmtoff / 60, now.offset());
    EXPECT_TRUE(now.offset() == 60 || now.offset() == 120);
}

TEST(Buffer, FormatGrowsToFitLongText) {
    Buffer b;
    b.append("x:", 2);
    std::string big = repeat('y', 5000);
    EXPECT_EQ(5002, b.format("%s%d", big.c_str(), 42));
    EXPECT_EQ("x:" + big + "42", b.c_str());

    b.clear();
    b.append_uint16(65535);
    b.append(' ');
    b.append_uint32(0);
    b.append(' ');
    b.append_uint64(18446744073709551615ULL);
    EXPECT_STREQ("65535 0 18446744073709551615", b.c_str());
}

TEST(Buffer, InsertAndRemove) {
    Buffer b;
    b.append("world", 5);
    b.insert(0, "hello ", 6);
    b.insert(99, "!", 1);
    EXPECT_STREQ("hello world!", b.c_str());
    b.insert(0, b.data() + 6, 5);  // from itself
    EXPECT_STREQ("worldhello world!", b.c_str());
    b.remove(5, 6);
    b.remove(10, 100);
    EXPECT_STREQ("worldworld", b.c_str());
    Buffer c(b);
    c.append('s');
    EXPECT_STREQ("worldworld", b.c_str());
}
