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

//==============================================================================
// String
//==============================================================================

TEST(String, EmptyStringsShareTheStaticRepresentation) {
    String a, b(""), c("abc", size_t(0)), d(nullptr);
    for (const String* s : {&a, &b, &c, &d}) {
        EXPECT_TRUE(s->__is_static_empty());
        EXPECT_EQ(0u, s->capacity());
        EXPECT_STREQ("", s->c_str());
    }
    String copy(a);
    EXPECT_EQ(2u, a.__refs());  // never counted

    a.append('x');
    EXPECT_FALSE(a.__is_static_empty());
    EXPECT_EQ(32u, a.capacity());
    EXPECT_EQ("x", a);
    EXPECT_TRUE(b.__is_static_empty());
}

TEST(String, CapacityIsAPowerOfTwoWithAFloorOf32) {
    const struct {
        size_t n, cap;
    } cases[] = {{1, 32}, {31, 32}, {32, 32}, {33, 64}, {100, 128}, {1024, 1024}, {1025, 2048}};
    for (const auto& c : cases) {
        String s(repeat('x', c.n).c_str());
        EXPECT_EQ(c.cap, s.capacity()) << c.n;
        EXPECT_EQ(c.n, s.size());
    }

    // Appending one character at a time doubles the capacity when full.
    String s;
    for (int i = 0; i < 32; i++)
        s.append('a');
    EXPECT_EQ(32u, s.capacity());
    s.append('b');
    EXPECT_EQ(64u, s.capacity());
    EXPECT_EQ(repeat('a', 32) + "b", s.c_str());

    // An unshared string is modified in place.
    String u("hello");
    const char* p = u.c_str();
    u.assign("world!");
    u.clear();
    EXPECT_EQ(p, u.c_str());
    u.reserve(100);
    EXPECT_EQ(128u, u.capacity());
}

TEST(String, ModifyingASharedStringLeavesItsCopiesAlone) {
    String a("abc");
    String b(a);
    EXPECT_EQ(a.c_str(), b.c_str());
    EXPECT_EQ(2u, a.__refs());

    b.append("def");
    EXPECT_EQ("abc", a);
    EXPECT_EQ("abcdef", b);
    EXPECT_EQ(1u, a.__refs());

    // Every modifying operation copies first.
    String c(a), d(a), e(a), f(a);
    c.set(0, 'X');
    d.remove(1);
    e.clear();
    f.assign("zz");
    EXPECT_EQ("Xbc", c);
    EXPECT_EQ("a", d);
    EXPECT_TRUE(e.__is_static_empty());
    EXPECT_EQ("zz", f);
    EXPECT_EQ("abc", a);
    EXPECT_EQ(1u, a.__refs());
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

TEST(String, FindSubstrAndRemove) {
    String s("abcabc");
    EXPECT_EQ(1u, s.find('b'));
    EXPECT_EQ(4u, s.find('b', 2));
    EXPECT_EQ(String::npos, s.find('z'));
    EXPECT_EQ(2u, s.find("cab"));
    EXPECT_EQ(String::npos, s.find("abd"));
    EXPECT_EQ(String::npos, s.find(String("abcabcd")));
    EXPECT_EQ(String::npos, s.find('a', 100));

    EXPECT_EQ("cabc", s.substr(2, String::npos));
    EXPECT_EQ("ca", s.substr(2, 2));
    EXPECT_EQ("", s.substr(6));
    EXPECT_EQ("", s.substr(99, 3));

    String r(s);
    r.remove(2);
    EXPECT_EQ("ab", r);
    r = s;
    r.remove(1, 2);
    EXPECT_EQ("aabc", r);
    r.remove(10, 1);
    EXPECT_EQ("aabc", r);
}

TEST(String, Comparison) {
    String s("Hello");
    EXPECT_TRUE(s.equal("Hello"));
    EXPECT_FALSE(s.equal("Hell"));
    EXPECT_TRUE(s.equal("Hello world", 5));
    EXPECT_TRUE(s.equal(1, "ell", 3));
    EXPECT_FALSE(s.equal(3, "loo", 3));
    EXPECT_TRUE(s.equali("hELLO"));
    EXPECT_FALSE(s.equali("hELL"));
    EXPECT_TRUE(s.equali(String("HELLO")));
    EXPECT_TRUE(s.equali(2, "LL", 2));
    EXPECT_TRUE(String().equal(nullptr));
}

TEST(String, BoundedCopyAndConcatenation) {
    char buf[8];
    EXPECT_EQ(11u, strlcpy(buf, "hello world", sizeof(buf)));
    EXPECT_STREQ("hello w", buf);
    EXPECT_EQ(2u, strlcpy(buf, "hi", sizeof(buf)));
    EXPECT_EQ(7u, strlcat(buf, "there", sizeof(buf)));
    EXPECT_STREQ("hithere", buf);
    EXPECT_EQ(9u, strlcat(buf, "!!", sizeof(buf)));
    EXPECT_STREQ("hithere", buf);
    EXPECT_EQ(3u, strlcpy(buf, "abc", 0));
    EXPECT_STREQ("hithere", buf);
}

//==============================================================================
// Array
//==============================================================================

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

TEST(Array, CapacityGrowsByPowersOfTwoFromEight) {
    Array<uint16> a;
    EXPECT_EQ(0u, a.size());
    EXPECT_EQ(8u, a.capacity());
    a.reserve(8);
    EXPECT_EQ(8u, a.capacity());
    a.reserve(9);
    EXPECT_EQ(16u, a.capacity());
    a.reserve(100);
    EXPECT_EQ(128u, a.capacity());

    Array<uint16> b;
    for (uint16 i = 0; i < 9; i++)
        b.append(i);
    EXPECT_EQ(16u, b.capacity());

    Array<uint16> copy(b);  // a copy gets exactly the room it needs
    EXPECT_EQ(9u, copy.capacity());
    EXPECT_TRUE(copy == b);
}

TEST(Array, FindUsesElementEquality) {
    const uint16 v[] = {7, 9, 9};
    Array<uint16> a(v, 3);
    EXPECT_EQ(1u, a.find(9));
    EXPECT_EQ(size_t(-1), a.find(8));

    // Reals compare as numbers, not bytes.
    Array<real64> r;
    r.append(0.0);
    EXPECT_EQ(0u, r.find(-0.0));
    Array<real64> r2;
    r2.append(-0.0);
    EXPECT_TRUE(r == r2);

    Array<String> s;
    s.append("x");
    s.append("y");
    EXPECT_EQ(1u, s.find(String("y")));
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
    EXPECT_EQ(3u, a.size());
    a.remove(10, 1);
    EXPECT_EQ(3u, a.size());
    EXPECT_EQ(2u, xs[1].__refs());  // the array holds shared copies
}

TEST(Array, AppendingItsOwnElementSurvivesReallocation) {
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
}

TEST(Array, ResizeFillsWithTheGivenValue) {
    Array<uint16> a;
    a.resize(5, 7);
    ASSERT_EQ(5u, a.size());
    for (size_t i = 0; i < 5; i++)
        EXPECT_EQ(7, a[i]);
    a.resize(2);
    EXPECT_EQ(2u, a.size());
    a.resize(4);
    EXPECT_EQ(0, a[3]);

    Array<String> s;
    s.append("keep");
    s.resize(3, s[0]);  // the fill lives in the array itself
    EXPECT_EQ("keep", s[2]);
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
        EXPECT_EQ(5u, a.find(Counted(5)));
        a.remove(0, 10);
        a.resize(15, Counted(1));
        EXPECT_EQ(35, Counted::live);
    }
    EXPECT_EQ(0, Counted::live);
}

//==============================================================================
// Datetime
//==============================================================================

// Local time with daylight saving, without depending on installed zone files.
class Datetime_Test : public testing::Test {
protected:
    void SetUp() override {
        const char* tz = getenv("TZ");
        _saved = tz ? tz : "";
        _had = tz != nullptr;
        setenv("TZ", "CET-1CEST,M3.5.0,M10.5.0/3", 1);
        tzset();
    }
    void TearDown() override {
        if (_had)
            setenv("TZ", _saved.c_str(), 1);
        else
            unsetenv("TZ");
        tzset();
    }

private:
    std::string _saved;
    bool _had = false;
};

TEST_F(Datetime_Test, TimestampTextRoundTrips) {
    const char* texts[] = {
        "20240131235959.123456+060",  // winter
        "20240715120000.000001+120",  // summer
        "19600101000000.000000+000",  // before the epoch
        "20000229060708.999999-300",
    };
    for (const char* text : texts) {
        Datetime d;
        ASSERT_TRUE(d.set(text)) << text;
        EXPECT_TRUE(d.is_timestamp());
        EXPECT_EQ(text, d.ascii()) << text;
    }

    Datetime d("20240131235959.123456+060");
    EXPECT_EQ(60, d.offset());
    EXPECT_EQ("2024/01/31 23:59:59.123456+060", d.ascii(true));
    uint32 y, mo, da, h, mi, s, us;
    sint32 utc;
    d.get_timestamp(y, mo, da, h, mi, s, us, utc);
    EXPECT_EQ(2024u, y);
    EXPECT_EQ(31u, da);
    EXPECT_EQ(123456u, us);

    // A negative offset prints its sign and absolute value.
    EXPECT_EQ('-', Datetime(0, -300).ascii()[21]);
    EXPECT_EQ("300", Datetime(0, -300).ascii().substr(22));

    // Set from local fields.
    ASSERT_TRUE(d.set_timestamp(2024, 7, 15, 12, 0, 0, 1, 120));
    EXPECT_EQ(Datetime("20240715120000.000001+120"), d);
}

TEST_F(Datetime_Test, IntervalFieldsAndText) {
    Datetime d;
    ASSERT_TRUE(d.set("00000001020304.000005:000"));
    EXPECT_TRUE(d.is_interval());
    uint32 days, hours, minutes, seconds, us;
    d.get_interval(days, hours, minutes, seconds, us);
    EXPECT_EQ(1u, days);
    EXPECT_EQ(2u, hours);
    EXPECT_EQ(3u, minutes);
    EXPECT_EQ(4u, seconds);
    EXPECT_EQ(5u, us);
    EXPECT_EQ(Datetime::DAY + 2 * Datetime::HOUR + 3 * Datetime::MIN + 4 * Datetime::SEC + 5,
              d.usec());
    EXPECT_EQ("00000001020304.000005:000", d.ascii());
    EXPECT_EQ("00000001 02 03 04.000005:000", d.ascii(true));

    Datetime e;
    e.set_interval(1, 2, 3, 4, 5);
    EXPECT_EQ(d, e);
    EXPECT_EQ("00000000000000.000000:000", Datetime().ascii());
}

TEST_F(Datetime_Test, MalformedTextIsRejectedAndLeavesTheValue) {
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
        "20240131235959.123456 060",
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

TEST_F(Datetime_Test, CopiesShareUntilModified) {
    Datetime a(5 * Datetime::MIN);
    Datetime b(a);
    EXPECT_EQ(2u, a.__refs());
    b.offset(30);
    b.usec(7);
    EXPECT_EQ(5 * Datetime::MIN, a.usec());
    EXPECT_EQ(0, a.offset());
    EXPECT_EQ(1u, a.__refs());
    EXPECT_NE(a, b);

    // Equality looks at microseconds, offset and kind.
    EXPECT_NE(Datetime(100), Datetime(100, 0));
    EXPECT_NE(Datetime(100, 60), Datetime(100, 0));
    EXPECT_EQ(Datetime(100, 60), Datetime(100, 60));
    b.clear();
    EXPECT_EQ(Datetime(), b);
}

TEST_F(Datetime_Test, NowIsALocalTimestamp) {
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

//==============================================================================
// Buffer
//==============================================================================

TEST(Buffer, FormatGrowsToFitLongText) {
    Buffer b;
    EXPECT_EQ(0u, b.capacity());
    b.append("x:", 2);
    EXPECT_EQ(4096u, b.capacity());
    std::string big = repeat('y', 5000);
    EXPECT_EQ(5002, b.format("%s%d", big.c_str(), 42));
    EXPECT_EQ(8192u, b.capacity());
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
    EXPECT_STREQ("worldworld!", b.c_str());
    b.remove(5, 100);
    EXPECT_STREQ("world", b.c_str());
    Buffer c(b);
    c.append('s');
    EXPECT_STREQ("world", b.c_str());
    EXPECT_STREQ("worlds", c.c_str());
}
