// Hand-written classes for the model tests, laid out the way the generated
// class types are: the Instance header, then one slot per feature.
#ifndef TVRN_TESTS_FRAMEWORK_TEST_CLASSES_H
#define TVRN_TESTS_FRAMEWORK_TEST_CLASSES_H

#include "framework/Instance.h"
#include "framework/Property.h"

namespace CPTA {

struct Test_Base : public Instance {
    Property<String> InstanceID;
    Property<uint16> Number;
    Property<String> ElementName;
    Property<uint16> EnabledState;  // default 5
    Property<String> Caption;       // default "hello"
    Property<Array<uint16>> Codes;  // default {1, 2, 3}
    Property<Array<String>> Names;  // default {"a", "b"}
    Property<Datetime> Removal;     // default five minutes
    Property<Array<sint64>> Counts;

    static const Meta_Class static_meta_class;
};

struct Test_Base_Reset_method : public Instance {
    Property<uint16> Level;
    Property<uint32> return_value;

    static const Meta_Method static_meta_class;
};

struct Test_Sub : public Test_Base {  // with its own default for Caption
    Property<uint32> Extra;

    static const Meta_Class static_meta_class;
};

struct Test_Other : public Instance {
    Property<String> Name;

    static const Meta_Class static_meta_class;
};

struct Test_Assoc : public Instance {
    Test_Base* Antecedent;
    Test_Other* Dependent;
    Test_Other* Owner;
    Property<Array<Test_Other*>> Members;
    Property<String> Note;

    static const Meta_Class static_meta_class;
};

struct Test_Typed : public Instance {  // keys of each kind of scalar
    Property<boolean> B;
    Property<uint8> U8;
    Property<sint64> S64;
    Property<char16> C;
    Property<Datetime> When;
    Property<real32> R;

    static const Meta_Class static_meta_class;
};

struct Test_Keyless : public Instance {
    Property<String> Text;

    static const Meta_Class static_meta_class;
};

extern const Meta_Repository test_repository;

}  // namespace CPTA

#endif
