// Conversion between CMPI data and model instances, against the embedded
// host's broker (and, where a server could send what the host never does,
// against small stand-ins for the server's objects).
#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

#include "cmpi/CMPI_Containers.h"
#include "cmpi/Converter.h"
#include "host/host.h"
#include "tests/cmpi/test_classes.h"
#include "tests/cmpi/test_support.h"

using namespace CPTA;
using tvrntest::Log_Watch;

namespace {

const char* const NS = "root/test";

template <class F>
std::string printed(F print) {
    char* text = nullptr;
    size_t size = 0;
    FILE* os = open_memstream(&text, &size);
    print(os);
    fclose(os);
    std::string s(text, size);
    free(text);
    return s;
}
std::string dump(const Instance* instance) {
    return printed([&](FILE* os) { fprint(os, instance); });
}
std::string dump(const Value& value) {
    return printed([&](FILE* os) { value.fprint(os); });
}

bool contains(const std::string& text, const std::string& part) {
    return text.find(part) != std::string::npos;
}

TVRNTEST_Gadget* make_gadget() {
    TVRNTEST_Gadget* g = create<TVRNTEST_Gadget>(false);
    g->Name.set("g1");
    g->Port.set(80);
    g->Index.set(5);
    g->Label.set("label");
    const String tags[] = {"a", "b"};
    g->Tags.set(Array<String>(tags, 2));
    g->Ratio.set(0.25);
    g->Flag.set(true);
    g->Initial.set(char16('q'));
    g->When.set(Datetime("20240131235959.123456+060"));
    TVRNTEST_Owner* owner = create<TVRNTEST_Owner>(false);
    owner->Id.set("o1");
    owner->Name.set("the owner");
    g->Owner = owner;
    g->Detail = clone(owner);
    return g;
}

CMPIData data_of(CMPIType type, CMPIValue value, CMPIValueState state = CMPI_goodValue) {
    CMPIData d;
    d.type = type;
    d.state = state;
    d.value = value;
    return d;
}

class Conversion : public ::testing::Test {
protected:
    const CMPIBroker* broker() { return host.broker(); }
    int to_value(const CMPIData& data, Value& value) {
        return cmpi_to_cimple_value(&tvrntest_repository, broker(), NS, data, value);
    }

    tvrnhost::Host host;
};

template <class T>
Value value_of(const T& x, bool null = false) {
    Value v;
    v.set_value(x);
    v.null(null);
    return v;
}

TEST_F(Conversion, EveryTypeOfValueSurvivesTheWayThereAndBack) {
    const uint16 numbers[] = {1, 2};
    const String strings[] = {"x", ""};
    const Datetime times[] = {Datetime("20240131235959.123456+000")};
    std::vector<std::pair<Value, uint32>> values;
    for (const Value& v : {value_of(true),
                           value_of(uint8(200)),
                           value_of(sint8(-100)),
                           value_of(uint16(65000)),
                           value_of(sint16(-32000)),
                           value_of(uint32(4000000000u)),
                           value_of(sint32(-2000000000)),
                           value_of(uint64(1ull << 63)),
                           value_of(sint64(-(1ll << 62))),
                           value_of(real32(1.5f)),
                           value_of(real64(-2.25)),
                           value_of(char16(0x263A)),
                           value_of("text"),
                           value_of(Datetime("00000001020304.000005:000")),
                           value_of(Datetime("20240131235959.123456-300")),
                           value_of(Array<uint16>(numbers, 2)),
                           value_of(Array<String>(strings, 2)),
                           value_of(Array<Datetime>(times, 1)),
                           value_of(Array<real64>()),
                           value_of(uint32(0), true),
                           value_of(Array<String>(), true)})
        values.push_back({v, 0});

    Ref<TVRNTEST_Gadget> gadget(make_gadget());
    Instance* owner = gadget->Owner;
    ref(owner);
    Value v = value_of(owner);
    values.push_back({v, 0});                       // a reference: keys only on the way back
    values.push_back({v, FLAG_EMBEDDED_INSTANCE});  // an embedded instance: every property
    Array<Instance*> owners;
    ref(owner);
    ref(owner);
    owners.append(owner);
    owners.append(owner);
    values.push_back({value_of(owners), 0});

    size_t live = tvrnhost::Host::liveObjects();
    for (const auto& [value, flags] : values) {
        CMPIData data;
        Cmpi_Objects made;
        ASSERT_EQ(_to_cmpi_data(&tvrntest_repository, broker(), NS, value, flags, data, &made), 0)
            << dump(value);
        Value back;
        ASSERT_EQ(to_value(data, back), 0) << dump(value);
        made.release();
        EXPECT_EQ(back.type(), value.type());
        EXPECT_EQ(back.null(), value.null());
        if (value.type() != Value::INSTANCE && value.type() != Value::INSTANCE_ARRAY) {
            EXPECT_EQ(dump(back), dump(value));
            continue;
        }
        std::string text = dump(back);
        EXPECT_TRUE(contains(text, "string Id = \"o1\";")) << text;
        EXPECT_TRUE(contains(text, "__name_space = \"root/test\"")) << text;
        EXPECT_EQ(contains(text, "the owner"), flags == FLAG_EMBEDDED_INSTANCE) << text;
    }
    EXPECT_EQ(tvrnhost::Host::liveObjects(), live);
}

TEST_F(Conversion, InstancesAndPathsMapOntoEachOther) {
    Ref<TVRNTEST_Gadget> gadget(make_gadget());
    size_t live = tvrnhost::Host::liveObjects();

    CMPIObjectPath* op = nullptr;
    ASSERT_EQ(make_cmpi_object_path(broker(), gadget.ptr(), NS, op), CMPI_RC_OK);
    EXPECT_EQ(CMGetKeyCount(op, nullptr), 3u);
    CMPIInstance* ci = nullptr;
    ASSERT_EQ(make_cmpi_instance(broker(), gadget.ptr(), NS, op, nullptr, ci), CMPI_RC_OK);

    Instance* back = nullptr;
    ASSERT_EQ(make_cimple_instance(broker(), &TVRNTEST_Gadget::static_meta_class, op, ci, back),
              CMPI_RC_OK);
    Ref<> hold(back);
    gadget->__name_space = NS;
    gadget->Owner->__name_space = NS;
    gadget->Detail->__name_space = NS;
    EXPECT_EQ(dump(back), [&] {
        // A reference carries only the keys of the referenced instance.
        gadget->Owner->Name.clear();
        return dump(gadget.ptr());
    }());

    Instance* keys = nullptr;
    ASSERT_EQ(make_cimple_reference(broker(), &TVRNTEST_Gadget::static_meta_class, op, keys),
              CMPI_RC_OK);
    std::string text = dump(keys);
    unref(keys);
    EXPECT_TRUE(contains(text, "uint16 Port = 80;")) << text;
    EXPECT_TRUE(contains(text, "string Label = NULL;")) << text;
    CMRelease(ci);
    CMRelease(op);
    EXPECT_EQ(tvrnhost::Host::liveObjects(), live);
}

TEST_F(Conversion, KeysArrivingAs64BitIntegersAreNarrowed) {
    CMPIObjectPath* op = CMNewObjectPath(broker(), NS, "TVRNTEST_Gadget", nullptr);
    CMPIValue v;
    v.string = CMNewString(broker(), "g1", nullptr);
    CMAddKey(op, "Name", &v, CMPI_string);
    v.uint64 = 300;
    CMAddKey(op, "Port", &v, CMPI_uint64);
    v.sint64 = 7;
    CMAddKey(op, "Index", &v, CMPI_sint64);

    auto keys_text = [&] {
        Instance* keys = nullptr;
        EXPECT_EQ(make_cimple_reference(broker(), &TVRNTEST_Gadget::static_meta_class, op, keys),
                  CMPI_RC_OK);
        std::string text = keys ? dump(keys) : "";
        unref(keys);
        return text;
    };
    std::string text = keys_text();
    EXPECT_TRUE(contains(text, "uint16 Port = 300;")) << text;
    EXPECT_TRUE(contains(text, "uint32 Index = 7;")) << text;

    // A key the property cannot hold is refused, not cut to another key.
    Log_Watch log;
    v.uint64 = 70000;
    CMAddKey(op, "Port", &v, CMPI_uint64);
    v.sint64 = -1;
    CMAddKey(op, "Index", &v, CMPI_sint64);
    text = keys_text();
    EXPECT_TRUE(contains(text, "uint16 Port = NULL;")) << text;
    EXPECT_TRUE(contains(text, "uint32 Index = NULL;")) << text;
    EXPECT_TRUE(log.has("type mismatch on Port: uint64/uint16")) << log.text();
    EXPECT_TRUE(log.has("type mismatch on Index: sint64/uint32")) << log.text();

    // Other mismatches are not mended.
    v.string = CMNewString(broker(), "80", nullptr);
    CMAddKey(op, "Port", &v, CMPI_string);
    text = keys_text();
    EXPECT_TRUE(contains(text, "uint16 Port = NULL;")) << text;
    EXPECT_TRUE(log.has("type mismatch on Port: string/uint16")) << log.text();
    EXPECT_TRUE(log.has("conversion error: TVRNTEST_Gadget.Port")) << log.text();
    CMRelease(op);
}

// What a server may send that the host never does: a date-time object
// holding any text, an instance with raw CMPI data as properties.
struct Fake_Datetime {
    CMPIDateTime object;
    const CMPIBroker* broker;
    const char* text;

    static CMPIString* string_format(const CMPIDateTime* dt, CMPIStatus* rc) {
        const Fake_Datetime* self = reinterpret_cast<const Fake_Datetime*>(dt);
        if (rc)
            rc->rc = CMPI_RC_OK;
        return CMNewString(self->broker, self->text, nullptr);
    }

    Fake_Datetime(const CMPIBroker* b, const char* t) : broker(b), text(t) {
        static CMPIDateTimeFT ft = {100, nullptr, nullptr, nullptr, string_format, nullptr};
        object.hdl = this;
        object.ft = &ft;
    }
};

struct Fake_Instance {
    CMPIInstance object;
    const CMPIBroker* broker;
    std::vector<std::pair<std::string, CMPIData>> properties;

    static const Fake_Instance* self(const CMPIInstance* i) {
        return reinterpret_cast<const Fake_Instance*>(i);
    }
    static CMPICount count(const CMPIInstance* i, CMPIStatus* rc) {
        if (rc)
            rc->rc = CMPI_RC_OK;
        return CMPICount(self(i)->properties.size());
    }
    static CMPIData at(const CMPIInstance* i, CMPICount n, CMPIString** name, CMPIStatus* rc) {
        const auto& p = self(i)->properties.at(n);
        if (name)
            *name = CMNewString(self(i)->broker, p.first.c_str(), nullptr);
        if (rc)
            rc->rc = CMPI_RC_OK;
        return p.second;
    }

    explicit Fake_Instance(const CMPIBroker* b) : broker(b) {
        static CMPIInstanceFT ft = [] {
            CMPIInstanceFT t;
            std::memset(&t, 0, sizeof(t));
            t.ftVersion = 100;
            t.getPropertyAt = at;
            t.getPropertyCount = count;
            return t;
        }();
        object.hdl = this;
        object.ft = &ft;
    }

    void add(const char* name, CMPIType type, CMPIValue value) {
        properties.push_back({name, data_of(type, value)});
    }
};

TEST_F(Conversion, ADatetimeThatDoesNotParseIsLeftNull) {
    Fake_Datetime short_text(broker(), "2024013123595.123456+060");  // 24 characters
    Fake_Datetime good_text(broker(), "20240131235959.123456+060");
    Fake_Instance server(broker());
    CMPIValue v;
    v.dateTime = &short_text.object;
    server.add("When", CMPI_dateTime, v);
    v.string = CMNewString(broker(), "still here", nullptr);
    server.add("Label", CMPI_string, v);

    Log_Watch log;
    Instance* gadget = nullptr;
    ASSERT_EQ(make_cimple_instance(broker(), &TVRNTEST_Gadget::static_meta_class, nullptr,
                                   &server.object, gadget),
              CMPI_RC_OK);
    std::string text = dump(gadget);
    unref(gadget);
    EXPECT_TRUE(contains(text, "datetime When = NULL;")) << text;
    EXPECT_TRUE(contains(text, "string Label = \"still here\";")) << text;
    EXPECT_TRUE(log.has("WARN: CMPI_Containers.cpp")) << log.text();
    EXPECT_TRUE(log.has("conversion error: TVRNTEST_Gadget.When")) << log.text();

    v.dateTime = &good_text.object;
    Value value;
    ASSERT_EQ(to_value(data_of(CMPI_dateTime, v), value), 0);
    Datetime dt;
    ASSERT_EQ(value.get_value(dt), 0);
    EXPECT_EQ(dt.ascii(), String("20240131235959.123456+060"));
}

TEST_F(Conversion, AStringWithoutItsObjectReadsAsEmpty) {
    Log_Watch log;
    CMPIValue v;
    v.string = nullptr;
    Value value;
    ASSERT_EQ(to_value(data_of(CMPI_string, v), value), 0);
    String s("x");
    ASSERT_EQ(value.get_value(s), 0);
    EXPECT_EQ(s, "");
    EXPECT_FALSE(value.null());
    EXPECT_TRUE(log.has("INFO: CMPI_Containers.cpp")) << log.text();
    EXPECT_TRUE(log.has("ignored null CMPI string")) << log.text();

    ASSERT_EQ(to_value(data_of(CMPI_string, v, CMPI_nullValue), value), 0);
    EXPECT_TRUE(value.null());
    EXPECT_EQ(value.type(), Value::STRING);

    // Types that are not taken.
    v.chars = const_cast<char*>("x");
    EXPECT_EQ(to_value(data_of(CMPI_chars, v), value), -1);
    EXPECT_TRUE(log.has("unknown cmpi type 5888")) << log.text();
}

TEST_F(Conversion, ObjectsThatCannotBeReadAreRefused) {
    Log_Watch log;
    CMPIValue v;
    v.ref = CMNewObjectPath(broker(), NS, "CIM_Unknown", nullptr);
    CMPIObjectPath* op = v.ref;
    Value value;
    EXPECT_EQ(to_value(data_of(CMPI_ref, v), value), -1);
    EXPECT_TRUE(log.has("failed to find meta class: CIM_Unknown")) << log.text();
    v.ref = nullptr;
    EXPECT_EQ(to_value(data_of(CMPI_ref, v), value), -1);

    CMPIObjectPath_Container keys(&tvrntest_repository, broker(), NS, op);
    EXPECT_EQ(keys.get_value(0, Value::STRING, value), -1);
    EXPECT_TRUE(log.has("bounds error")) << log.text();
    CMRelease(op);
}

TEST_F(Conversion, ArraysWithNullElementsAreRefused) {
    Log_Watch log;
    CMPIArray* array = CMNewArray(broker(), 2, CMPI_uint16, nullptr);
    CMPIValue v;
    v.uint16 = 4;
    CMSetArrayElementAt(array, 0, &v, CMPI_uint16);
    CMPIValue a;
    a.array = array;
    Value value;
    EXPECT_EQ(to_value(data_of(CMPI_uint16A, a), value), -1);
    EXPECT_TRUE(log.has("encountered null array element")) << log.text();

    CMSetArrayElementAt(array, 1, &v, CMPI_uint16);
    ASSERT_EQ(to_value(data_of(CMPI_uint16A, a), value), 0);
    Array<uint16> numbers;
    ASSERT_EQ(value.get_value(numbers), 0);
    EXPECT_EQ(numbers.size(), 2u);
    CMRelease(array);
}

// A broker whose new instances note, when their property filter is set, its
// keys and how many properties they already hold.
struct Spy_Broker {
    CMPIBroker broker;
    CMPIBrokerEncFT eft;
    static const CMPIBroker* real;
    static CMPIInstanceFT original, spied;
    static std::vector<std::string> filters;

    static CMPIInstance* new_instance(const CMPIBroker*, const CMPIObjectPath* op, CMPIStatus* rc) {
        CMPIInstance* i = CMNewInstance(real, op, rc);
        original = spied = *i->ft;
        spied.setPropertyFilter = set_filter;
        i->ft = &spied;
        return i;
    }
    static CMPIStatus set_filter(CMPIInstance* i, const char** props, const char** keys) {
        std::string call;
        for (const char** k = keys; k && *k; k++)
            call += std::string(*k) + " ";
        filters.push_back(call + "after " + std::to_string(CMGetPropertyCount(i, nullptr)));
        return original.setPropertyFilter(i, props, keys);
    }

    explicit Spy_Broker(const CMPIBroker* b) : broker(*b), eft(*b->eft) {
        real = b;
        eft.newInstance = new_instance;
        broker.eft = &eft;
        filters.clear();
    }
};

const CMPIBroker* Spy_Broker::real;
CMPIInstanceFT Spy_Broker::original, Spy_Broker::spied;
std::vector<std::string> Spy_Broker::filters;

TEST_F(Conversion, ThePropertyFilterIsSetBeforeAnyProperty) {
    Spy_Broker spy(broker());
    Ref<TVRNTEST_Gadget> gadget(make_gadget());
    const char* properties[] = {"Label", nullptr};
    Log_Watch log;
    CMPIInstance* ci = nullptr;
    ASSERT_EQ(make_cmpi_instance(&spy.broker, gadget.ptr(), NS, nullptr, properties, ci),
              CMPI_RC_OK);
    EXPECT_EQ(Spy_Broker::filters, std::vector<std::string>{"Name Port Index after 0"});
    EXPECT_TRUE(log.has("No ObjectPath built before call to make_CMPI_instance")) << log.text();

    // What the filter lets through: the listed property and the keys.
    EXPECT_EQ(CMGetPropertyCount(ci, nullptr), 4u);
    CMRelease(ci);
}

TEST_F(Conversion, MethodOutputsLeaveTheReturnValueApart) {
    Ref<> meth(create(&TVRNTEST_Gadget_Configure_method::static_meta_class));
    __set_null_flags(meth.ptr(), true, true, true);
    TVRNTEST_Gadget_Configure_method* r =
        static_cast<TVRNTEST_Gadget_Configure_method*>(meth.ptr());
    r->Level.set(3);  // an input: not sent back
    r->Report.set("done");
    TVRNTEST_Owner* owner = create<TVRNTEST_Owner>(false);
    owner->Id.set("o1");
    r->Result = owner;
    r->return_value.set(42);

    CMPIArgs* out = CMNewArgs(broker(), nullptr);
    CMPIValue rv;
    CMPIType rt;
    ASSERT_EQ(make_cmpi_method(broker(), NS, meth.ptr(), out, rv, rt), CMPI_RC_OK);
    EXPECT_EQ(rt, CMPI_uint32);
    EXPECT_EQ(rv.uint32, 42u);
    EXPECT_EQ(CMGetArgCount(out, nullptr), 2u);
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMGetArg(out, "return_value", &rc);
    EXPECT_NE(rc.rc, CMPI_RC_OK);
    CMPIData result = CMGetArg(out, "Result", &rc);
    ASSERT_EQ(rc.rc, CMPI_RC_OK);
    EXPECT_EQ(result.type, CMPI_ref);
    CMRelease(out);

    r->return_value.clear();
    out = CMNewArgs(broker(), nullptr);
    ASSERT_EQ(make_cmpi_method(broker(), NS, meth.ptr(), out, rv, rt), CMPI_RC_OK);
    EXPECT_EQ(rt, CMPI_null);
    CMRelease(out);
}

}  // namespace
