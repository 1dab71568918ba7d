// Hand-written classes for the CMPI binding tests, laid out like the
// generated ones. Unlike the module's classes they have integer keys, a
// reference (Owner) and an embedded instance (Detail) among their
// properties, and a method with a reference-array parameter.
#ifndef TVRN_TESTS_CMPI_TEST_CLASSES_H
#define TVRN_TESTS_CMPI_TEST_CLASSES_H

#include "framework/Instance.h"
#include "framework/Property.h"

namespace CPTA {

extern const Meta_Repository tvrntest_repository;

struct TVRNTEST_Owner : public Instance {
    Property<String> Id;
    Property<String> Name;

    static const Meta_Class static_meta_class;
};

struct TVRNTEST_Gadget : public Instance {
    Property<String> Name;
    Property<uint16> Port;
    Property<uint32> Index;
    Property<String> Label;
    Property<Datetime> When;
    Property<Array<String>> Tags;
    Property<real64> Ratio;
    Property<boolean> Flag;
    Property<char16> Initial;
    TVRNTEST_Owner* Owner;
    TVRNTEST_Owner* Detail;

    static const Meta_Class static_meta_class;
};

struct TVRNTEST_Gadget_Configure_method : public Instance {
    Property<uint32> Level;
    Property<Array<TVRNTEST_Owner*>> Targets;
    Property<String> Report;
    TVRNTEST_Owner* Result;
    Property<uint32> return_value;

    static const Meta_Method static_meta_class;
};

struct TVRNTEST_Special_Gadget : public TVRNTEST_Gadget {
    Property<String> Extra;

    static const Meta_Class static_meta_class;
};

struct TVRNTEST_Link : public Instance {
    TVRNTEST_Gadget* Left;
    TVRNTEST_Owner* Right;
    Property<String> Note;

    static const Meta_Class static_meta_class;
};

}  // namespace CPTA

#endif
