// Hand-written classes for the CMPI binding tests, laid out like the
// generated ones. Unlike the module's classes they have integer keys, a
// reference and an embedded instance among their properties, and a method
// with a reference-array parameter.
//
//   TVRNTEST_Owner          key Id; Name
//   TVRNTEST_Gadget         keys Name (string), Port (uint16), Index (uint32);
//                           Label, When, Tags[], Counts[], Ratio, Flag,
//                           Initial, Owner (ref TVRNTEST_Owner), Detail
//                           (embedded TVRNTEST_Owner);
//                           Configure(In Level, In Targets[] ref, Out Report,
//                           Out Result ref) -> uint32
//   TVRNTEST_Special_Gadget TVRNTEST_Gadget plus Extra
//   TVRNTEST_Link           association: keys Left (ref TVRNTEST_Gadget),
//                           Right (ref TVRNTEST_Owner); Note
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
    Property<Array<uint64>> Counts;
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
