// The class and instance model, and Value with instance slots.
#include <gtest/gtest.h>

#include "framework/Instance.h"
#include "framework/Meta_Lookup.h"
#include "framework/Value.h"
#include "tests/framework/test_classes.h"

using namespace CPTA;

namespace {

const Meta_Class* const BASE = &Test_Base::static_meta_class;
const Meta_Class* const SUB = &Test_Sub::static_meta_class;
const Meta_Class* const OTHER = &Test_Other::static_meta_class;
const Meta_Class* const ASSOC = &Test_Assoc::static_meta_class;

Test_Base* make_base(const char* id, uint16 number) {
    Test_Base* b = create<Test_Base>(false);
    b->InstanceID.set(id);
    b->Number.set(number);
    return b;
}

Test_Other* make_other(const char* name) {
    Test_Other* o = create<Test_Other>(false);
    o->Name.set(name);
    return o;
}

// An association between b and o, taking over both references.
Test_Assoc* make_assoc(Test_Base* b, Test_Other* o) {
    Test_Assoc* a = create<Test_Assoc>(false);
    a->Antecedent = b;
    a->Dependent = o;
    return a;
}

}  // namespace

TEST(Meta, LookUpsIgnoreCaseAndFollowAncestry) {
    EXPECT_EQ(SUB, find_meta_class(&test_repository, "test_SUB"));
    EXPECT_EQ(BASE, find_meta_class(SUB, "TEST_BASE"));    // an ancestor
    EXPECT_EQ(OTHER, find_meta_class(SUB, "Test_Other"));  // the repository
    EXPECT_FALSE(is_subclass(OTHER, BASE));
    EXPECT_TRUE(is_subclass(&Instance::static_meta_class, ASSOC));
    EXPECT_EQ(0, is_subclass(&test_repository, "test_base", "Test_Sub"));
    EXPECT_EQ(1, is_subclass(&test_repository, "Test_Sub", "Test_Base"));
    EXPECT_EQ(0, is_subclass(&test_repository, "Instance", "Test_Other"));
    EXPECT_EQ(-1, is_subclass(&test_repository, "Test_Nothing", "Test_Base"));
    EXPECT_EQ(-1, is_subclass(&test_repository, nullptr, "Test_Base"));

    EXPECT_EQ(nullptr, find_feature(BASE, "reset", FIND_PROPERTY));
    const Meta_Method* reset = find_method(BASE, "RESET");
    EXPECT_EQ(&Test_Base_Reset_method::static_meta_class, reset);
    EXPECT_NE(nullptr, find_parameter(reset, "level"));
    EXPECT_EQ(nullptr, find_reference(ASSOC, "Note"));
    // A redeclared feature resolves to the subclass's record.
    EXPECT_NE(find_property(BASE, "Caption"), find_property(SUB, "caption"));
    EXPECT_TRUE(has_feature(BASE, FLAG_METHOD | FLAG_REFERENCE));
}

TEST(Instance, CreateWithAndWithoutDefaults) {
    Ref<Test_Base> b(create<Test_Base>(true));
    EXPECT_EQ(5, b->EnabledState.value);
    EXPECT_EQ("hello", b->Caption.value);
    ASSERT_EQ(3u, b->Codes.value.size());
    ASSERT_EQ(2u, b->Names.value.size());
    EXPECT_EQ("b", b->Names.value[1]);
    EXPECT_EQ(Datetime(5 * Datetime::MIN), b->Removal.value);
    EXPECT_TRUE(b->InstanceID.null);  // no default: null
    EXPECT_TRUE(b->Counts.null);

    Ref<Test_Sub> s(create<Test_Sub>(true));
    EXPECT_EQ("sub", s->Caption.value);  // the subclass's own default
    EXPECT_TRUE(s->Extra.null);

    // Without defaults: every slot empty but not null.
    Ref<Test_Base> e(create<Test_Base>(false));
    EXPECT_FALSE(e->InstanceID.null);
    EXPECT_EQ(0, e->EnabledState.value);
    EXPECT_EQ(0u, e->Codes.value.size());
    EXPECT_EQ(Datetime(), e->Removal.value);
    Ref<Test_Assoc> a(create<Test_Assoc>(false));
    EXPECT_FALSE(a->Members.null);

    EXPECT_EQ(nullptr, create(static_cast<const Meta_Class*>(nullptr), true));
}

TEST(Instance, CreateParameterRecord) {
    Instance* p = create(&Test_Base_Reset_method::static_meta_class);
    ASSERT_NE(nullptr, p);
    Test_Base_Reset_method* m = static_cast<Test_Base_Reset_method*>(p);
    EXPECT_FALSE(m->return_value.null);
    // Operations that walk superclasses stop at a method record.
    EXPECT_EQ(nullptr, super_meta_class_of(m->meta_class));
    EXPECT_TRUE(key_eq(p, p));
    String path;
    EXPECT_EQ(-1, instance_to_model_path(p, path));
    Instance* q = clone(p);
    EXPECT_TRUE(identical(p, q));
    destroy(q);
    destroy(p);
}

TEST(Instance, CloneIsDeep) {
    Ref<Test_Assoc> a(make_assoc(make_base("b1", 1), make_other("o1")));
    a->Members.value.append(make_other("m1"));
    a->Members.value.append(nullptr);
    a->Note.set("note");
    a->Note.null = true;  // null flags are copied as they are
    a->__name_space = "root/test";
    a->Antecedent->Codes.value.append(9);

    Ref<Test_Assoc> c(clone(a.ptr()));
    ASSERT_TRUE(c);
    EXPECT_TRUE(identical(a.ptr(), c.ptr()));
    EXPECT_NE(a->Antecedent, c->Antecedent);
    EXPECT_NE(a->Members.value[0], c->Members.value[0]);
    EXPECT_EQ(nullptr, c->Members.value[1]);
    EXPECT_TRUE(c->Note.null);
    EXPECT_EQ(2u, a->Note.value.ref_count());  // strings are shared, not copied

    c->Antecedent->Codes.value.append(10);
    c->Members.value[0]->Name.value.append("x");
    EXPECT_EQ(1u, a->Antecedent->Codes.value.size());
    EXPECT_EQ("m1", a->Members.value[0]->Name.value);
    EXPECT_FALSE(identical(a.ptr(), c.ptr()));
}

TEST(Instance, ReleasingAnInstanceReleasesWhatItRefersTo) {
    Test_Other* shared = make_other("shared");
    ref(shared);  // one reference for the association, one kept here
    Test_Assoc* a = make_assoc(make_base("b", 1), shared);
    a->Members.value.append(make_other("m"));
    ref(shared);
    a->Members.value.append(shared);
    EXPECT_EQ(3u, shared->refs);

    unref(a);  // the last: releases the base, the members and shared twice
    EXPECT_EQ(1u, shared->refs);
    EXPECT_EQ(INSTANCE_MAGIC, shared->magic);

    // destroy() frees at once, whatever the count.
    ref(shared);
    destroy(shared);
    destroy(nullptr);
    unref(static_cast<Instance*>(nullptr));
}

TEST(Instance, RefHandles) {
    Test_Other* o = make_other("o");
    {
        Ref<Test_Other> r1(o);  // takes over the creator's reference
        Ref<Test_Other> r2(r1);
        r2 = r1;  // same target: nothing changes
        EXPECT_EQ(2u, o->refs);
        Ref<Test_Other> r3(make_other("p"));
        r2 = r3;
        EXPECT_EQ(1u, o->refs);
        EXPECT_EQ(2u, r3->refs);
        ref(o);
        Test_Other* stolen = r1.steal();
        EXPECT_EQ(o, stolen);
        EXPECT_EQ(2u, o->refs);
        unref(stolen);
    }
    EXPECT_EQ(1u, o->refs);
    unref(o);
}

TEST(Compare, KeyEqualityAgainstFullEquality) {
    Ref<Test_Base> a(make_base("x", 1));
    Ref<Test_Base> b(make_base("x", 1));
    EXPECT_TRUE(identical(a.ptr(), b.ptr()));
    b->__name_space = "other";
    EXPECT_TRUE(key_eq(a.ptr(), b.ptr()));
    EXPECT_FALSE(identical(a.ptr(), b.ptr()));
    b->Number.value = 2;
    EXPECT_FALSE(key_eq(a.ptr(), b.ptr()));

    // A subclass instance with the same keys.
    Ref<Test_Sub> s(create<Test_Sub>(false));
    s->InstanceID.set("x");
    s->Number.set(2);
    EXPECT_TRUE(key_eq(s.ptr(), b.ptr()));
    EXPECT_FALSE(identical(b.ptr(), s.ptr()));

    // Classes without the keys of the first never match.
    Ref<Test_Other> o(make_other("x"));
    EXPECT_FALSE(key_eq(a.ptr(), o.ptr()));

    // Keyless classes: all instances have the same (no) keys.
    Ref<Instance> k1(create(&Test_Keyless::static_meta_class, false));
    Ref<Instance> k2(create(&Test_Keyless::static_meta_class, true));
    EXPECT_TRUE(key_eq(k1.ptr(), k2.ptr()));
    EXPECT_FALSE(identical(k1.ptr(), k2.ptr()));
}

TEST(Compare, NullKeysAndNullProperties) {
    Ref<Test_Base> a(make_base("x", 1));
    Ref<Test_Base> b(make_base("x", 1));
    b->InstanceID.null = true;
    EXPECT_FALSE(key_eq(a.ptr(), b.ptr()));
    a->InstanceID.null = true;
    EXPECT_TRUE(key_eq(a.ptr(), b.ptr()));

    // A null property has no value: what its slot still holds is ignored.
    a->ElementName.set("stale");
    a->ElementName.null = true;
    b->ElementName.null = true;
    EXPECT_TRUE(identical(a.ptr(), b.ptr()));
}

TEST(Compare, ReferenceKeys) {
    Ref<Test_Assoc> a(make_assoc(nullptr, make_other("o")));
    Ref<Test_Assoc> b(make_assoc(nullptr, make_other("o")));
    EXPECT_TRUE(key_eq(a.ptr(), b.ptr()));  // both null

    b->Antecedent = make_base("b", 1);
    EXPECT_FALSE(key_eq(a.ptr(), b.ptr()));  // one null

    a->Antecedent = make_base("b", 1);
    a->Antecedent->ElementName.set("not a key");
    EXPECT_TRUE(key_eq(a.ptr(), b.ptr()));
    EXPECT_FALSE(identical(a.ptr(), b.ptr()));

    // Reference arrays are not keys but count for full equality.
    a->Antecedent->ElementName = b->Antecedent->ElementName;
    a->Members.value.append(make_other("m"));
    EXPECT_FALSE(identical(a.ptr(), b.ptr()));
    b->Members.value.append(make_other("m"));
    EXPECT_TRUE(identical(a.ptr(), b.ptr()));
}

// Method names fail; non-key references named in the list are filled.
TEST(Filter, ListMarksOnlyTheNamedProperties) {
    Ref<Test_Base> b(create<Test_Base>(false));
    b->Number.null = true;
    const char* names[] = {"ElementName", "nonsense", nullptr};
    EXPECT_EQ(0, filter_properties(b.ptr(), names, true));
    EXPECT_FALSE(b->InstanceID.null);  // keys as they were
    EXPECT_TRUE(b->Number.null);
    EXPECT_FALSE(b->ElementName.null);
    EXPECT_TRUE(b->Codes.null);

    const char* with_key[] = {"InstanceID", "caption", nullptr};
    EXPECT_EQ(0, filter_properties(b.ptr(), with_key, false));
    EXPECT_TRUE(b->InstanceID.null);  // keys are not selected by name
    EXPECT_TRUE(b->ElementName.null);
    EXPECT_FALSE(b->Caption.null);

    EXPECT_EQ(0, filter_properties(b.ptr(), nullptr, false));
    EXPECT_FALSE(b->InstanceID.null);
    EXPECT_FALSE(b->Codes.null);

    const char* method[] = {"ElementName", "Reset", nullptr};
    EXPECT_EQ(-1, filter_properties(b.ptr(), method, true));

    Ref<Test_Assoc> a(create<Test_Assoc>(false));
    const char* refs[] = {"Owner", "Dependent", "Members", nullptr};
    const char* none[] = {nullptr};
    EXPECT_EQ(0, filter_properties(a.ptr(), none, true));
    EXPECT_TRUE(a->Members.null);
    EXPECT_EQ(0, filter_properties(a.ptr(), refs, true));
    ASSERT_NE(nullptr, a->Owner);  // an empty instance of its class
    EXPECT_EQ(OTHER, a->Owner->meta_class);
    EXPECT_EQ(nullptr, a->Dependent);  // a key: skipped
    EXPECT_FALSE(a->Members.null);
    EXPECT_TRUE(a->Note.null);
}

TEST(NameSpace, SetRecursivelyWithoutOverridingUnlessForced) {
    Ref<Test_Assoc> a(make_assoc(make_base("b", 1), make_other("o")));
    a->Dependent->__name_space = "own";
    a->Members.value.append(make_other("m"));

    __set_name_space_recursive(a.ptr(), "root/test", false);
    EXPECT_EQ("root/test", a->__name_space);
    EXPECT_EQ("root/test", a->Antecedent->__name_space);
    EXPECT_EQ("own", a->Dependent->__name_space);
    EXPECT_EQ("root/test", a->Members.value[0]->__name_space);

    __set_name_space_recursive(a.ptr(), "root/forced", true);
    EXPECT_EQ("root/forced", a->Dependent->__name_space);
    EXPECT_EQ("root/forced", a->Members.value[0]->__name_space);
}

TEST(ModelPath, KeysInMetaDataOrder) {
    Ref<Test_Sub> s(create<Test_Sub>(true));
    s->InstanceID.set("abc");
    s->Number.set(7);
    String path;
    ASSERT_EQ(0, instance_to_model_path(s.ptr(), path));
    EXPECT_EQ("Test_Sub.InstanceID=\"abc\",Number=7", path);

    Ref<Test_Typed> t(create<Test_Typed>(false));
    t->B.set(true);
    t->U8.set(200);
    t->S64.set(-5);
    t->C.set(char16('z'));
    t->When.set(Datetime(1));
    t->R.set(1.5f);
    ASSERT_EQ(0, instance_to_model_path(t.ptr(), path));
    EXPECT_EQ("Test_Typed.B=true,U8=200,S64=-5,C='z',When=00000000000000.000001:000,R=1.500000",
              path);

    // Nested references are quoted and escaped.
    Ref<Test_Assoc> a(make_assoc(make_base("b1", 3), make_other("o1")));
    ASSERT_EQ(0, instance_to_model_path(a.ptr(), path));
    EXPECT_EQ(
        "Test_Assoc.Antecedent=\"Test_Base.InstanceID=\\\"b1\\\",Number=3\","
        "Dependent=\"Test_Other.Name=\\\"o1\\\"\"",
        path);
}

TEST(ModelPath, Failures) {
    String path("unchanged");

    Ref<Test_Base> b(make_base("b", 1));
    b->Number.null = true;
    EXPECT_EQ(-1, instance_to_model_path(b.ptr(), path));

    Ref<Instance> k(create(&Test_Keyless::static_meta_class, false));
    EXPECT_EQ(-1, instance_to_model_path(k.ptr(), path));

    Ref<Test_Assoc> a(make_assoc(nullptr, make_other("o")));
    EXPECT_EQ(-1, instance_to_model_path(a.ptr(), path));  // null reference key
    a->Antecedent = b.ptr();
    ref(b.ptr());
    EXPECT_EQ(-1, instance_to_model_path(a.ptr(), path));  // its key is null

    EXPECT_EQ(-1, instance_to_model_path(nullptr, path));
    EXPECT_EQ("unchanged", path);
}

TEST(Association, ReferencesAndAssociators) {
    Ref<Test_Assoc> a(make_assoc(make_base("b", 1), make_other("o")));
    a->Owner = make_other("owner");
    a->Members.value.append(make_other("member"));  // arrays are not ends
    Ref<Test_Sub> source(create<Test_Sub>(false));  // a subclass with the same keys
    source->InstanceID.set("b");
    source->Number.set(1);
    Ref<Test_Base> stranger(make_base("c", 1));
    EXPECT_TRUE(is_reference_of(source.ptr(), a.ptr(), ""));
    EXPECT_TRUE(is_reference_of(source.ptr(), a.ptr(), "antecedent"));
    EXPECT_FALSE(is_reference_of(source.ptr(), a.ptr(), "Dependent"));
    EXPECT_FALSE(is_reference_of(stranger.ptr(), a.ptr(), nullptr));

    const Instance* out[8];
    const struct {
        const char *result_class, *role, *result_role;
        int n;
        const Instance* first;
    } cases[] = {
        {"", "", "", 2, a->Dependent},
        {nullptr, "Antecedent", nullptr, 2, a->Dependent},
        {nullptr, "Dependent", nullptr, -1, nullptr},
        {"test_other", nullptr, nullptr, 2, a->Dependent},
        {"Test_Base", nullptr, nullptr, 0, nullptr},
        {nullptr, nullptr, "owner", 1, a->Owner},
        {nullptr, nullptr, "Antecedent", 0, nullptr},
    };
    for (const auto& c : cases) {
        int n = get_associators(source.ptr(), a.ptr(), c.result_class, c.role, c.result_role, out);
        EXPECT_EQ(c.n, n) << (c.role ? c.role : "-") << (c.result_role ? c.result_role : "-");
        if (n > 0) {
            EXPECT_EQ(c.first, out[0]);
        }
    }

    // Seen from the other end.
    Ref<Test_Other> o(make_other("o"));
    ASSERT_EQ(2, get_associators(o.ptr(), a.ptr(), nullptr, "Dependent", nullptr, out));
    EXPECT_EQ(a->Antecedent, out[0]);
    EXPECT_EQ(a->Owner, out[1]);  // same class, other keys: an associated object
    Ref<Test_Other> nobody(make_other("nobody"));
    EXPECT_EQ(-1, get_associators(nobody.ptr(), a.ptr(), nullptr, nullptr, nullptr, out));
}

namespace {

template <class T>
void check_round_trip(const T& x, Value::Type tag) {
    Value v;
    v.set_value(x);
    EXPECT_EQ(tag, v.type());
    EXPECT_FALSE(v.null());
    Value copy(v);
    T y{};
    EXPECT_EQ(0, copy.get_value(y));
    EXPECT_TRUE(y == x);
}

}  // namespace

TEST(Value, SetAndGetTheExactType) {
    check_round_trip<sint8>(-100, Value::SINT8);
    check_round_trip<uint64>(18000000000000000000ull, Value::UINT64);
    check_round_trip<char16>(char16(0x263A), Value::CHAR16);
    check_round_trip<Datetime>(Datetime(42, -60), Value::DATETIME);
    const String s[] = {"a", "b"};
    check_round_trip(Array<String>(s, 2), Value::STRING_ARRAY);

    Value v;
    v.set_value("chars");
    EXPECT_EQ(Value::STRING, v.type());
    v.set_value(uint32(7));
    uint64 wide = 99;
    EXPECT_EQ(-1, v.get_value(wide));
    EXPECT_EQ(99u, wide);
    Array<uint32> a;
    EXPECT_EQ(-1, v.get_value(a));
    v.clear();
    EXPECT_TRUE(v.null());

    EXPECT_EQ(Value::UINT16_ARRAY, type_of(find_feature(BASE, "Codes")));
    EXPECT_EQ(Value::INSTANCE_ARRAY, type_of(find_feature(ASSOC, "Members")));
    EXPECT_EQ(Value::NONE, type_of(find_feature(BASE, "Reset")));
}

TEST(Value, InstanceArraysOwnOneReferencePerElement) {
    Array<Instance*> arr;
    for (int i = 0; i < 3; i++) {
        Instance* o = make_other("x");
        ref(o);  // one kept here, one handed to the value
        arr.append(o);
    }
    Value v;
    v.set_value(arr);
    for (size_t i = 0; i < 3; i++)
        EXPECT_EQ(2u, arr[i]->refs);
    {
        Value w(v);
        Value x;
        x = w;
        EXPECT_EQ(4u, arr[2]->refs);
    }
    v.clear();
    for (size_t i = 0; i < 3; i++) {
        EXPECT_EQ(1u, arr[i]->refs);
        unref(arr[i]);
    }

    // A single instance is handed over the same way.
    Test_Other* o = make_other("single");
    Value single;
    single.set_value(o);
    Instance* lent = nullptr;
    EXPECT_EQ(0, single.get_value(lent));
    EXPECT_EQ(o, lent);
    EXPECT_EQ(1u, o->refs);
}

TEST(Value, StoringIntoSlots) {
    Ref<Test_Base> b(create<Test_Base>(true));
    const Meta_Feature* caption = find_feature(BASE, "Caption");
    const Meta_Feature* codes = find_feature(BASE, "Codes");
    const Meta_Feature* number = find_feature(BASE, "Number");

    Value v;
    v.set_value(String("shared"));
    EXPECT_EQ(-1, v.get(b.ptr(), number));  // type mismatch
    EXPECT_TRUE(b->Number.null);
    EXPECT_EQ(0, v.get(b.ptr(), caption));
    EXPECT_EQ("shared", b->Caption.value);

    v.set_value(uint16(12));
    v.null(true);
    EXPECT_EQ(0, v.get(b.ptr(), number));
    EXPECT_EQ(12, b->Number.value);
    EXPECT_TRUE(b->Number.null);

    const uint16 u[] = {4, 5, 6, 7};
    v.set_value(Array<uint16>(u, 4));
    EXPECT_EQ(0, v.get(b.ptr(), codes));
    EXPECT_EQ(7, b->Codes.value[3]);

    // And back out, with the slot's null flag.
    Value r;
    EXPECT_EQ(0, r.set(b.ptr(), number));
    EXPECT_EQ(Value::UINT16, r.type());
    EXPECT_TRUE(r.null());
    EXPECT_EQ(0, r.set(b.ptr(), caption));
    EXPECT_EQ(2u, b->Caption.value.ref_count());  // the slot and r share it
    EXPECT_EQ(-1, r.get(nullptr, caption));
}

TEST(Value, StoringReferencesChecksTheClassAndCounts) {
    Ref<Test_Assoc> a(create<Test_Assoc>(false));
    const Meta_Feature* antecedent = find_feature(ASSOC, "Antecedent");
    const Meta_Feature* members = find_feature(ASSOC, "Members");

    Test_Other* wrong = make_other("wrong");
    Value v;
    v.set_value(static_cast<Instance*>(wrong));
    EXPECT_EQ(-1, v.get(a.ptr(), antecedent));
    EXPECT_EQ(nullptr, a->Antecedent);

    Test_Sub* sub = create<Test_Sub>(false);
    v.set_value(static_cast<Instance*>(sub));  // releases wrong
    EXPECT_EQ(0, v.get(a.ptr(), antecedent));  // a subclass is accepted
    EXPECT_EQ(sub, a->Antecedent);
    EXPECT_EQ(2u, sub->refs);

    Test_Base* base = make_base("b", 1);
    Value w;
    w.set_value(static_cast<Instance*>(base));
    EXPECT_EQ(0, w.get(a.ptr(), antecedent));  // the old reference is released
    EXPECT_EQ(1u, sub->refs);
    EXPECT_EQ(2u, base->refs);

    Array<Test_Other*> others;
    others.append(make_other("m1"));
    others.append(make_other("m2"));
    Value m;
    m.set_value(others);
    EXPECT_EQ(0, m.get(a.ptr(), members));
    EXPECT_EQ(2u, a->Members.value.size());
    EXPECT_EQ(2u, others[0]->refs);

    Array<Instance*> mixed;
    mixed.append(make_other("m3"));
    mixed.append(make_base("bad", 2));
    Value bad;
    bad.set_value(mixed);
    EXPECT_EQ(-1, bad.get(a.ptr(), members));
    EXPECT_EQ(others[0], a->Members.value[0]);  // unchanged

    Value r;
    EXPECT_EQ(0, r.set(a.ptr(), members));
    EXPECT_EQ(Value::INSTANCE_ARRAY, r.type());
    EXPECT_EQ(3u, others[0]->refs);
    EXPECT_EQ(0, r.set(a.ptr(), find_feature(ASSOC, "Owner")));
    EXPECT_EQ(Value::INSTANCE, r.type());
    EXPECT_TRUE(r.null());
    EXPECT_EQ(2u, others[0]->refs);
}
