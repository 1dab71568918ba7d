// The steps every inventory instance provider shares, driven by a stand-in
// dispatcher: answers the module's inventory never gives (the wrong class,
// null entries, more or less than the one computer system) still end with
// every instance handed on or destroyed. Run under the sanitizers, a lost
// instance is a leak report.
#include <gtest/gtest.h>

#include <new>
#include <string>
#include <vector>

#include "providers/Inventory_Provider.h"
#include "schema/generated/TAVRIN_FCPort.h"
#include "schema/generated/TAVRIN_Product.h"
#include "tests/cmpi/test_support.h"

using namespace CPTA;
using tvrntest::Log_Watch;

namespace {

// What the stand-in dispatcher answers next, and the class id it was asked for.
std::vector<const Meta_Class*> gAnswer;
classId_t gAskedFor = CID_NONE;

Array<Instance*> standIn(classId_t classId) {
    gAskedFor = classId;
    Array<Instance*> out;
    for (const Meta_Class* mc : gAnswer)
        out.append(mc != nullptr ? create(mc, true) : nullptr);
    return out;
}

const Meta_Class* const kPort = &TAVRIN_FCPort::static_meta_class;
const Meta_Class* const kProduct = &TAVRIN_Product::static_meta_class;

const Inventory_Source kSource = {
    CID_FC_PORT, standIn, "Nothing here!", LL_WARN, ANNOUNCED, "Stand_In_Provider.cpp", 42};

TEST(InventoryProviderSteps, OnlyInstancesOfTheProvidersClassAreDeliveredTheRestDestroyed) {
    struct Case {
        Inventory_Delivery delivery;
        std::vector<const Meta_Class*> answer;
        Enum_Instances_Status status;
        size_t delivered;
        size_t announced, nothing;  // "Returning instances", "Nothing here!" lines
    } cases[] = {
        {ANNOUNCED, {kPort, nullptr, kProduct, kPort}, ENUM_INSTANCES_OK, 2, 1, 0},
        {QUIET, {kPort}, ENUM_INSTANCES_OK, 1, 0, 0},
        {ANNOUNCED, {}, ENUM_INSTANCES_OK, 0, 0, 1},
        // a single-instance provider fails on any other number
        {SINGLE, {}, ENUM_INSTANCES_FAILED, 0, 0, 1},
        {SINGLE, {kPort, kPort}, ENUM_INSTANCES_FAILED, 0, 0, 1},
        {SINGLE, {kPort}, ENUM_INSTANCES_OK, 1, 1, 0},
        {SINGLE, {kProduct}, ENUM_INSTANCES_OK, 0, 1, 0},  // nothing to deliver, not a failure
        // a provider that needs its instances fails without them, quietly otherwise
        {REQUIRED, {}, ENUM_INSTANCES_FAILED, 0, 0, 1},
        {REQUIRED, {kPort, kPort}, ENUM_INSTANCES_OK, 2, 0, 0},
        // at most one: none is no failure, several are (and nothing is delivered)
        {AT_MOST_ONE, {}, ENUM_INSTANCES_OK, 0, 0, 1},
        {AT_MOST_ONE, {kPort}, ENUM_INSTANCES_OK, 1, 1, 0},
        {AT_MOST_ONE, {kPort, kPort}, ENUM_INSTANCES_FAILED, 0, 0, 0},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE("delivery " + std::to_string(c.delivery) + ", " +
                     std::to_string(c.answer.size()) + " answered");
        Log_Watch log;
        Inventory_Source s = kSource;
        s.delivery = c.delivery;
        gAnswer = c.answer;
        gAskedFor = CID_NONE;
        size_t delivered = 0;
        EXPECT_EQ(enumerate_inventory(s, kPort,
                                      [&](Instance* instance) {
                                          EXPECT_EQ(instance->meta_class, kPort);
                                          delivered++;
                                          destroy(instance);  // as the CMPI binding does
                                      }),
                  c.status);
        EXPECT_EQ(gAskedFor, CID_FC_PORT);
        EXPECT_EQ(delivered, c.delivered);
        EXPECT_EQ(log.count("DBG: Stand_In_Provider.cpp(42): Returning instances"), c.announced);
        EXPECT_EQ(log.count("WARN: Stand_In_Provider.cpp(42): Nothing here!"), c.nothing);
    }
}

TEST(InventoryProviderSteps, WhatIsNotDeliveredWhenADeliveryThrowsIsStillDestroyed) {
    gAnswer = {kPort, kProduct, kPort};
    EXPECT_THROW(enumerate_inventory(kSource, kPort,
                                     [](Instance* instance) {
                                         destroy(instance);
                                         throw std::bad_alloc();
                                     }),
                 std::bad_alloc);
}

}  // namespace
