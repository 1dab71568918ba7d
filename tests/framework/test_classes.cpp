#include "tests/framework/test_classes.h"

// The class types derive from Instance and add members.
#pragma GCC diagnostic ignored "-Winvalid-offsetof"

namespace CPTA {

namespace {

#define MV(x) reinterpret_cast<const Meta_Value*>(&(x))
#define MF(x) reinterpret_cast<const Meta_Feature*>(&(x))

#define PROP(CLS, NAME, TYPE, SUB, FLAGS, DEF)                                                     \
    const Meta_Property CLS##_##NAME = {0,   FLAG_PROPERTY | (FLAGS),     #NAME, nullptr, 0, TYPE, \
                                        SUB, CPTA_SLOT_OFFSET(CLS, NAME), DEF}

#define REF(CLS, NAME, SUB, FLAGS, TARGET)                           \
    const Meta_Reference CLS##_##NAME = {0,                          \
                                         FLAG_REFERENCE | (FLAGS),   \
                                         #NAME,                      \
                                         nullptr,                    \
                                         0,                          \
                                         SUB,                        \
                                         &TARGET::static_meta_class, \
                                         CPTA_SLOT_OFFSET(CLS, NAME)}

#define CLASS(CLS, FLAGS, SUPER, NUM_KEYS)                                             \
    const Meta_Class CLS::static_meta_class = {0,                                      \
                                               FLAGS,                                  \
                                               #CLS,                                   \
                                               nullptr,                                \
                                               0,                                      \
                                               CLS##_features,                         \
                                               sizeof(CLS##_features) / sizeof(void*), \
                                               sizeof(CLS),                            \
                                               CLS##_locals,                           \
                                               SUPER,                                  \
                                               NUM_KEYS,                               \
                                               &test_repository}

// Defaults.
const Meta_Value_Scalar<uint16> _enabled_state = {5};
const Meta_Value_Scalar<const char*> _caption = {"hello"};
const Meta_Value_Scalar<const char*> _sub_caption = {"sub"};
const uint16 _codes_elements[] = {1, 2, 3};
const Meta_Value_Array<uint16> _codes = {_codes_elements, 3};
const char* const _names_elements[] = {"a", "b"};
const Meta_Value_Array<const char*> _names = {_names_elements, 2};
const Meta_Value_Scalar<const char*> _removal = {"00000000000500.000000:000"};

// Test_Base and its method.
PROP(Test_Base, InstanceID, STRING, 0, FLAG_KEY, nullptr);
PROP(Test_Base, Number, UINT16, 0, FLAG_KEY, nullptr);
PROP(Test_Base, ElementName, STRING, 0, 0, nullptr);
PROP(Test_Base, EnabledState, UINT16, 0, 0, MV(_enabled_state));
PROP(Test_Base, Caption, STRING, 0, 0, MV(_caption));
PROP(Test_Base, Codes, UINT16, -1, 0, MV(_codes));
PROP(Test_Base, Names, STRING, -1, 0, MV(_names));
PROP(Test_Base, Removal, DATETIME, 0, 0, MV(_removal));
PROP(Test_Base, Counts, SINT64, -1, 0, nullptr);

PROP(Test_Base_Reset_method, Level, UINT16, 0, FLAG_IN, nullptr);
PROP(Test_Base_Reset_method, return_value, UINT32, 0, FLAG_OUT, nullptr);

const Meta_Feature* const Test_Base_Reset_method_features[] = {
    MF(Test_Base_Reset_method_Level),
    MF(Test_Base_Reset_method_return_value),
};

}  // namespace

const Meta_Method Test_Base_Reset_method::static_meta_class = {
    0,       FLAG_METHOD,
    "Reset", nullptr,
    0,       Test_Base_Reset_method_features,
    2,       sizeof(Test_Base_Reset_method),
    UINT32};

namespace {

const Meta_Feature* const Test_Base_features[] = {
    MF(Test_Base_InstanceID),  MF(Test_Base_Number),
    MF(Test_Base_ElementName), MF(Test_Base_EnabledState),
    MF(Test_Base_Caption),     MF(Test_Base_Codes),
    MF(Test_Base_Names),       MF(Test_Base_Removal),
    MF(Test_Base_Counts),      MF(Test_Base_Reset_method::static_meta_class),
};
const bool Test_Base_locals[] = {true, true, true, true, true, true, true, true, true, true};

// Test_Sub redeclares Caption with its own default and adds Extra.
PROP(Test_Sub, Caption, STRING, 0, 0, MV(_sub_caption));
PROP(Test_Sub, Extra, UINT32, 0, 0, nullptr);

const Meta_Feature* const Test_Sub_features[] = {
    MF(Test_Base_InstanceID),  MF(Test_Base_Number),
    MF(Test_Base_ElementName), MF(Test_Base_EnabledState),
    MF(Test_Sub_Caption),      MF(Test_Base_Codes),
    MF(Test_Base_Names),       MF(Test_Base_Removal),
    MF(Test_Base_Counts),      MF(Test_Base_Reset_method::static_meta_class),
    MF(Test_Sub_Extra),
};
const bool Test_Sub_locals[] = {false, false, false, false, true, false,
                                false, false, false, false, true};

PROP(Test_Other, Name, STRING, 0, FLAG_KEY, nullptr);
const Meta_Feature* const Test_Other_features[] = {MF(Test_Other_Name)};
const bool Test_Other_locals[] = {true};

REF(Test_Assoc, Antecedent, 0, FLAG_KEY, Test_Base);
REF(Test_Assoc, Dependent, 0, FLAG_KEY, Test_Other);
REF(Test_Assoc, Owner, 0, 0, Test_Other);
REF(Test_Assoc, Members, -1, 0, Test_Other);
PROP(Test_Assoc, Note, STRING, 0, 0, nullptr);
const Meta_Feature* const Test_Assoc_features[] = {MF(Test_Assoc_Antecedent),
                                                   MF(Test_Assoc_Dependent), MF(Test_Assoc_Owner),
                                                   MF(Test_Assoc_Members), MF(Test_Assoc_Note)};
const bool Test_Assoc_locals[] = {true, true, true, true, true};

PROP(Test_Typed, B, BOOLEAN, 0, FLAG_KEY, nullptr);
PROP(Test_Typed, U8, UINT8, 0, FLAG_KEY, nullptr);
PROP(Test_Typed, S64, SINT64, 0, FLAG_KEY, nullptr);
PROP(Test_Typed, C, CHAR16, 0, FLAG_KEY, nullptr);
PROP(Test_Typed, When, DATETIME, 0, FLAG_KEY, nullptr);
PROP(Test_Typed, R, REAL32, 0, FLAG_KEY, nullptr);
const Meta_Feature* const Test_Typed_features[] = {MF(Test_Typed_B),    MF(Test_Typed_U8),
                                                   MF(Test_Typed_S64),  MF(Test_Typed_C),
                                                   MF(Test_Typed_When), MF(Test_Typed_R)};
const bool Test_Typed_locals[] = {true, true, true, true, true, true};

PROP(Test_Keyless, Text, STRING, 0, 0, nullptr);
const Meta_Feature* const Test_Keyless_features[] = {MF(Test_Keyless_Text)};
const bool Test_Keyless_locals[] = {true};

}  // namespace

CLASS(Test_Base, FLAG_CLASS, nullptr, 2);
CLASS(Test_Sub, FLAG_CLASS, &Test_Base::static_meta_class, 2);
CLASS(Test_Other, FLAG_CLASS, nullptr, 1);
CLASS(Test_Assoc, FLAG_ASSOCIATION, nullptr, 2);
CLASS(Test_Typed, FLAG_CLASS, nullptr, 6);
CLASS(Test_Keyless, FLAG_CLASS, nullptr, 0);

namespace {

const Meta_Class* const _test_classes[] = {
    &Test_Base::static_meta_class,  &Test_Sub::static_meta_class,
    &Test_Other::static_meta_class, &Test_Assoc::static_meta_class,
    &Test_Typed::static_meta_class, &Test_Keyless::static_meta_class,
};

}  // namespace

const Meta_Repository test_repository = {_test_classes, 6};

}  // namespace CPTA
