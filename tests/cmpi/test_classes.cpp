#include "tests/cmpi/test_classes.h"

// The class types derive from Instance and add members.
#pragma GCC diagnostic ignored "-Winvalid-offsetof"

namespace CPTA {

namespace {

#define MF(x) reinterpret_cast<const Meta_Feature*>(&(x))

#define PROP(CLS, NAME, TYPE, SUB, FLAGS)                           \
    const Meta_Property CLS##_##NAME = {                            \
        0,   FLAG_PROPERTY | (FLAGS),     #NAME,  nullptr, 0, TYPE, \
        SUB, CPTA_SLOT_OFFSET(CLS, NAME), nullptr}

#define REF(CLS, NAME, SUB, FLAGS, TARGET)                           \
    const Meta_Reference CLS##_##NAME = {0,                          \
                                         FLAG_REFERENCE | (FLAGS),   \
                                         #NAME,                      \
                                         nullptr,                    \
                                         0,                          \
                                         SUB,                        \
                                         &TARGET::static_meta_class, \
                                         CPTA_SLOT_OFFSET(CLS, NAME)}

#define CLASS(CLS, FLAGS, SUPER, NUM_KEYS)                                                         \
    const Meta_Class CLS::static_meta_class = {0,                                                  \
                                               FLAGS,                                              \
                                               #CLS,                                               \
                                               nullptr,                                            \
                                               0,                                                  \
                                               CLS##_features,                                     \
                                               sizeof(CLS##_features) / sizeof(CLS##_features[0]), \
                                               sizeof(CLS),                                        \
                                               CLS##_locals,                                       \
                                               SUPER,                                              \
                                               NUM_KEYS,                                           \
                                               &tvrntest_repository}

// TVRNTEST_Owner
PROP(TVRNTEST_Owner, Id, STRING, 0, FLAG_KEY);
PROP(TVRNTEST_Owner, Name, STRING, 0, 0);
const Meta_Feature* const TVRNTEST_Owner_features[] = {MF(TVRNTEST_Owner_Id),
                                                       MF(TVRNTEST_Owner_Name)};
const bool TVRNTEST_Owner_locals[] = {true, true};

// TVRNTEST_Gadget and its method
PROP(TVRNTEST_Gadget, Name, STRING, 0, FLAG_KEY);
PROP(TVRNTEST_Gadget, Port, UINT16, 0, FLAG_KEY);
PROP(TVRNTEST_Gadget, Index, UINT32, 0, FLAG_KEY);
PROP(TVRNTEST_Gadget, Label, STRING, 0, 0);
PROP(TVRNTEST_Gadget, When, DATETIME, 0, 0);
PROP(TVRNTEST_Gadget, Tags, STRING, -1, 0);
PROP(TVRNTEST_Gadget, Ratio, REAL64, 0, 0);
PROP(TVRNTEST_Gadget, Flag, BOOLEAN, 0, 0);
PROP(TVRNTEST_Gadget, Initial, CHAR16, 0, 0);
REF(TVRNTEST_Gadget, Owner, 0, 0, TVRNTEST_Owner);
REF(TVRNTEST_Gadget, Detail, 0, FLAG_EMBEDDED_INSTANCE, TVRNTEST_Owner);

PROP(TVRNTEST_Gadget_Configure_method, Level, UINT32, 0, FLAG_IN);
REF(TVRNTEST_Gadget_Configure_method, Targets, -1, FLAG_IN, TVRNTEST_Owner);
PROP(TVRNTEST_Gadget_Configure_method, Report, STRING, 0, FLAG_OUT);
REF(TVRNTEST_Gadget_Configure_method, Result, 0, FLAG_OUT, TVRNTEST_Owner);
PROP(TVRNTEST_Gadget_Configure_method, return_value, UINT32, 0, FLAG_OUT);
const Meta_Feature* const TVRNTEST_Gadget_Configure_method_features[] = {
    MF(TVRNTEST_Gadget_Configure_method_Level), MF(TVRNTEST_Gadget_Configure_method_Targets),
    MF(TVRNTEST_Gadget_Configure_method_Report), MF(TVRNTEST_Gadget_Configure_method_Result),
    MF(TVRNTEST_Gadget_Configure_method_return_value)};

}  // namespace

const Meta_Method TVRNTEST_Gadget_Configure_method::static_meta_class = {
    0,
    FLAG_METHOD,
    "Configure",
    nullptr,
    0,
    TVRNTEST_Gadget_Configure_method_features,
    sizeof(TVRNTEST_Gadget_Configure_method_features) / sizeof(void*),
    sizeof(TVRNTEST_Gadget_Configure_method),
    UINT32};

namespace {

const Meta_Feature* const TVRNTEST_Gadget_features[] = {
    MF(TVRNTEST_Gadget_Name),    MF(TVRNTEST_Gadget_Port),
    MF(TVRNTEST_Gadget_Index),   MF(TVRNTEST_Gadget_Label),
    MF(TVRNTEST_Gadget_When),    MF(TVRNTEST_Gadget_Tags),
    MF(TVRNTEST_Gadget_Ratio),   MF(TVRNTEST_Gadget_Flag),
    MF(TVRNTEST_Gadget_Initial), MF(TVRNTEST_Gadget_Owner),
    MF(TVRNTEST_Gadget_Detail),  MF(TVRNTEST_Gadget_Configure_method::static_meta_class)};
const bool TVRNTEST_Gadget_locals[] = {true, true, true, true, true, true,
                                       true, true, true, true, true, true};

// TVRNTEST_Special_Gadget
PROP(TVRNTEST_Special_Gadget, Extra, STRING, 0, 0);
const Meta_Feature* const TVRNTEST_Special_Gadget_features[] = {
    MF(TVRNTEST_Gadget_Name),         MF(TVRNTEST_Gadget_Port),
    MF(TVRNTEST_Gadget_Index),        MF(TVRNTEST_Gadget_Label),
    MF(TVRNTEST_Gadget_When),         MF(TVRNTEST_Gadget_Tags),
    MF(TVRNTEST_Gadget_Ratio),        MF(TVRNTEST_Gadget_Flag),
    MF(TVRNTEST_Gadget_Initial),      MF(TVRNTEST_Gadget_Owner),
    MF(TVRNTEST_Gadget_Detail),       MF(TVRNTEST_Gadget_Configure_method::static_meta_class),
    MF(TVRNTEST_Special_Gadget_Extra)};
const bool TVRNTEST_Special_Gadget_locals[] = {false, false, false, false, false, false, false,
                                               false, false, false, false, false, true};

// TVRNTEST_Link
REF(TVRNTEST_Link, Left, 0, FLAG_KEY, TVRNTEST_Gadget);
REF(TVRNTEST_Link, Right, 0, FLAG_KEY, TVRNTEST_Owner);
PROP(TVRNTEST_Link, Note, STRING, 0, 0);
const Meta_Feature* const TVRNTEST_Link_features[] = {
    MF(TVRNTEST_Link_Left), MF(TVRNTEST_Link_Right), MF(TVRNTEST_Link_Note)};
const bool TVRNTEST_Link_locals[] = {true, true, true};

}  // namespace

CLASS(TVRNTEST_Owner, FLAG_CLASS, nullptr, 1);
CLASS(TVRNTEST_Gadget, FLAG_CLASS, nullptr, 3);
CLASS(TVRNTEST_Special_Gadget, FLAG_CLASS, &TVRNTEST_Gadget::static_meta_class, 3);
CLASS(TVRNTEST_Link, FLAG_ASSOCIATION, nullptr, 2);

namespace {

const Meta_Class* const _classes[] = {
    &TVRNTEST_Owner::static_meta_class,
    &TVRNTEST_Gadget::static_meta_class,
    &TVRNTEST_Special_Gadget::static_meta_class,
    &TVRNTEST_Link::static_meta_class,
};

}  // namespace

const Meta_Repository tvrntest_repository = {_classes, sizeof(_classes) / sizeof(_classes[0])};

}  // namespace CPTA
