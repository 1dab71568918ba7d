// The broker's own services called directly, as a provider would call them:
// factories, type checks, conversions at the CMPI boundary and the memory
// rules of encapsulated objects.
#include <cmpift.h>
#include <cmpimacs.h>

#include <cstring>

#include "tests/host/host_fixture.h"

namespace hosttest {
namespace {

class Broker : public ::testing::Test {
protected:
    Host host;
    const CMPIBroker* b = host.broker();
    CMPIStatus rc{CMPI_RC_OK, nullptr};
};

TEST_F(Broker, DateTimesFromCharsAndBinary) {
    CMPIDateTime* d = CMNewDateTimeFromChars(b, "20231114231320.000001+060", &rc);
    ASSERT_EQ(rc.rc, CMPI_RC_OK);
    EXPECT_EQ(CMGetBinaryFormat(d, nullptr), 1700000000000001ULL);
    EXPECT_FALSE(CMIsInterval(d, nullptr));
    EXPECT_STREQ(CMGetCharsPtr(CMGetStringFormat(d, nullptr), nullptr),
                 "20231114231320.000001+060");

    EXPECT_EQ(CMNewDateTimeFromChars(b, "20231114231320.000001+06", &rc), nullptr);
    EXPECT_EQ(rc.rc, CMPI_RC_ERR_INVALID_PARAMETER);

    CMPIDateTime* i = CMNewDateTimeFromBinary(b, 90061000002ULL, 1, &rc);
    EXPECT_STREQ(CMGetCharsPtr(CMGetStringFormat(i, nullptr), nullptr),
                 "00000001010101.000002:000");
    EXPECT_TRUE(CMIsInterval(i, nullptr));
}

TEST_F(Broker, ArraysCheckTypesAndBounds) {
    CMPIArray* a = CMNewArray(b, 2, CMPI_uint16, &rc);
    ASSERT_EQ(rc.rc, CMPI_RC_OK);
    EXPECT_EQ(CMGetArrayType(a, nullptr), CMPI_uint16);
    CMPIData e = CMGetArrayElementAt(a, 1, nullptr);
    EXPECT_TRUE(CMIsNullValue(e));  // new elements are null
    CMPIUint16 v = 7;
    EXPECT_EQ(CMSetArrayElementAt(a, 0, &v, CMPI_uint16).rc, CMPI_RC_OK);
    CMPIUint32 wide = 7;
    EXPECT_EQ(CMSetArrayElementAt(a, 1, &wide, CMPI_uint32).rc, CMPI_RC_ERR_TYPE_MISMATCH);
    EXPECT_EQ(CMSetArrayElementAt(a, 2, &v, CMPI_uint16).rc, CMPI_RC_ERR_NO_SUCH_PROPERTY);
    CMGetArrayElementAt(a, 5, &rc);
    EXPECT_EQ(rc.rc, CMPI_RC_ERR_NO_SUCH_PROPERTY);
    EXPECT_EQ(CMGetArrayElementAt(a, 0, nullptr).value.uint16, 7);

    CMPIArray* s = CMNewArray(b, 1, CMPI_chars, nullptr);  // chars arrays hold strings
    EXPECT_EQ(CMSetArrayElementAt(s, 0, "x", CMPI_chars).rc, CMPI_RC_OK);
    EXPECT_EQ(CMGetArrayType(s, nullptr), CMPI_string);
    EXPECT_EQ(CMNewArray(b, 1, CMPI_class, &rc), nullptr);
    EXPECT_EQ(rc.rc, CMPI_RC_ERR_INVALID_DATA_TYPE);
}

TEST_F(Broker, InstancesFilterPropertiesAndKeepPathKeysInStep) {
    CMPIObjectPath* op = CMNewObjectPath(b, "root/t", "C", nullptr);
    CMAddKey(op, "Id", "k1", CMPI_chars);
    CMPIInstance* i = CMNewInstance(b, op, nullptr);
    CMPIUint32 n = 3;
    CMSetProperty(i, "Before", &n, CMPI_uint32);
    const char* props[] = {"Wanted", nullptr};
    ASSERT_EQ(CMSetPropertyFilter(i, props, nullptr).rc, CMPI_RC_OK);
    EXPECT_EQ(CMGetPropertyCount(i, nullptr), 0u);  // Before is dropped
    CMSetProperty(i, "Wanted", &n, CMPI_uint32);
    CMSetProperty(i, "Other", &n, CMPI_uint32);
    CMSetProperty(i, "Id", "k2", CMPI_chars);  // a key: always admitted
    EXPECT_EQ(CMGetPropertyCount(i, nullptr), 2u);
    CMGetProperty(i, "Other", &rc);
    EXPECT_EQ(rc.rc, CMPI_RC_ERR_NO_SUCH_PROPERTY);

    CMPIData id = CMGetProperty(i, "id", &rc);
    ASSERT_EQ(rc.rc, CMPI_RC_OK);
    EXPECT_EQ(id.type, CMPI_string);  // CMPI_chars is stored as a string
    CMPIObjectPath* p = CMGetObjectPath(i, nullptr);
    CMPIData key = CMGetKey(p, "Id", nullptr);
    EXPECT_TRUE(CMIsKeyValue(key));
    EXPECT_STREQ(CMGetCharsPtr(key.value.string, nullptr), "k2");
    EXPECT_STREQ(CMGetCharsPtr(CMObjectPathToString(p, nullptr), nullptr), "root/t:C.Id=\"k2\"");
}

TEST_F(Broker, TypeServicesAndMessages) {
    host.addSubclass("Sub", "Base");
    CMPIObjectPath* op = CMNewObjectPath(b, "ns", "Sub", nullptr);
    EXPECT_TRUE(CMClassPathIsA(b, op, "base", nullptr));
    EXPECT_FALSE(CMClassPathIsA(b, op, "Other", nullptr));
    EXPECT_TRUE(CDIsOfType(b, op, "CMPIObjectPath", nullptr));
    EXPECT_STREQ(CMGetCharsPtr(CDGetType(b, op, nullptr), nullptr), "CMPIObjectPath");
    EXPECT_STREQ(CMGetCharsPtr(CDToString(b, op, nullptr), nullptr), "ns:Sub");

    CMPIString* s = CMNewString(b, "str", nullptr);
    CMPIString* m =
        CMGetMessage(b, "ID1", "$0 of $1 at $2 ($3, $5)", &rc,
                     CMFmtArgs4(CMFmtSint(-1), CMFmtUint(2), CMFmtChars("c"), CMFmtString(s)));
    ASSERT_EQ(rc.rc, CMPI_RC_OK);
    EXPECT_STREQ(CMGetCharsPtr(m, nullptr), "-1 of 2 at c (str, $5)");
    CMLogMessage(b, CMPI_SEV_INFO, "TEST", "logged", nullptr);
    EXPECT_EQ(host.logMessages().back(), "log[2] TEST: logged");
}

TEST_F(Broker, ContextsArgsAndHandles) {
    CMPIArgs* args = CMNewArgs(b, nullptr);
    CMPISint64 big = -5;
    CMAddArg(args, "N", &big, CMPI_sint64);
    CMPIString* name = nullptr;
    CMPIData d = CMGetArgAt(args, 0, &name, nullptr);
    EXPECT_STREQ(CMGetCharsPtr(name, nullptr), "N");
    EXPECT_EQ(d.value.sint64, -5);
    CMGetArgAt(args, 1, &name, &rc);
    EXPECT_EQ(rc.rc, CMPI_RC_ERR_NOT_FOUND);

    alignas(16) static char junk[256] = {};
    CMPIString* real = CMNewString(b, "x", nullptr);
    CMPIString foreign{junk, real->ft};
    EXPECT_EQ(CMGetCharsPtr(&foreign, &rc), nullptr);  // not a broker object
    EXPECT_EQ(rc.rc, CMPI_RC_ERR_INVALID_HANDLE);
    CMPIUint8 bad = 0;
    EXPECT_EQ(CMAddArg(args, "X", &bad, CMPI_class).rc, CMPI_RC_ERR_INVALID_DATA_TYPE);
}

TEST_F(Broker, ReleaseAndCloneOwnership) {
    const size_t before = Host::liveObjects();
    CMPIString* s = CMNewString(b, "a", nullptr);
    CMPIString* c = CMClone(s, nullptr);
    EXPECT_EQ(Host::liveObjects(), before + 2);
    EXPECT_EQ(CMRelease(s).rc, CMPI_RC_OK);
    EXPECT_STREQ(CMGetCharsPtr(c, nullptr), "a");  // the clone is independent
    EXPECT_EQ(CMRelease(c).rc, CMPI_RC_OK);
    EXPECT_EQ(Host::liveObjects(), before);

    // Objects read out of another object belong to it.
    CMPIObjectPath* op = CMNewObjectPath(b, "ns", "C", nullptr);
    CMGetClassName(op, nullptr);
    CMGetNameSpace(op, nullptr);
    EXPECT_EQ(Host::liveObjects(), before + 3);
    CMRelease(op);
    EXPECT_EQ(Host::liveObjects(), before);

    // Memory services: a mark releases what was made after it.
    CMNewString(b, "kept", nullptr);
    CMPIGcStat* mark = b->mft->mark(b, nullptr);
    CMNewString(b, "dropped", nullptr);
    void* mem = b->mft->cmpiMalloc(b, 16);
    mem = b->mft->cmpiRealloc(b, mem, 4096);
    std::memset(mem, 1, 4096);
    EXPECT_EQ(b->mft->release(b, mark).rc, CMPI_RC_OK);
    EXPECT_EQ(Host::liveObjects(), before + 1);
}

}  // namespace
}  // namespace hosttest
