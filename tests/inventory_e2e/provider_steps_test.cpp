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

const Inventory_Source kSource = {CID_FC_PORT, standIn, "Nothing here!", LL_WARN, ANNOUNCED,
                                  "Stand_In_Provider.cpp", 42};

// Runs the steps for a provider of TAVRIN_FCPort; returns the status and the
// classes of what was delivered (each delivered instance is destroyed here,
// as the CMPI binding would after converting it).
Enum_Instances_Status run(Inventory_Delivery delivery, std::vector<const Meta_Class*> answer,
                          std::vector<std::string>& delivered) {
    Inventory_Source s = kSource;
    s.delivery = delivery;
    gAnswer = answer;
    return enumerate_inventory(s, kPort, [&](Instance* instance) {
        delivered.push_back(instance->meta_class->name);
        destroy(instance);
    });
}

TEST(InventoryProviderSteps, OnlyInstancesOfTheProvidersClassAreDeliveredTheRestDestroyed) {
    Log_Watch log;
    std::vector<std::string> delivered;
    EXPECT_EQ(run(ANNOUNCED, {kPort, nullptr, kProduct, kPort}, delivered), ENUM_INSTANCES_OK);
    EXPECT_EQ(gAskedFor, CID_FC_PORT);
    EXPECT_EQ(delivered, (std::vector<std::string>{"TAVRIN_FCPort", "TAVRIN_FCPort"}));
    EXPECT_EQ(log.count("DBG: Stand_In_Provider.cpp(42): Returning instances"), 1u);
    EXPECT_EQ(log.count("Nothing here!"), 0u);

    log.mark();
    delivered.clear();
    EXPECT_EQ(run(QUIET, {kPort}, delivered), ENUM_INSTANCES_OK);
    EXPECT_EQ(delivered.size(), 1u);
    EXPECT_EQ(log.count("Returning instances"), 0u);
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

TEST(InventoryProviderSteps, NoInstancesIsSuccessAndOneLineAtTheProvidersLevel) {
    Log_Watch log;
    std::vector<std::string> delivered;
    EXPECT_EQ(run(ANNOUNCED, {}, delivered), ENUM_INSTANCES_OK);
    EXPECT_TRUE(delivered.empty());
    EXPECT_EQ(log.count("WARN: Stand_In_Provider.cpp(42): Nothing here!"), 1u);
    EXPECT_EQ(log.count("Returning instances"), 0u);
}

TEST(InventoryProviderSteps, ASingleInstanceProviderFailsOnAnyOtherNumber) {
    for (const std::vector<const Meta_Class*>& answer :
         {std::vector<const Meta_Class*>{}, std::vector<const Meta_Class*>{kPort, kPort}}) {
        Log_Watch log;
        std::vector<std::string> delivered;
        EXPECT_EQ(run(SINGLE, answer, delivered), ENUM_INSTANCES_FAILED);
        EXPECT_TRUE(delivered.empty());
        EXPECT_EQ(log.count("Nothing here!"), 1u);
    }
    std::vector<std::string> delivered;
    EXPECT_EQ(run(SINGLE, {kPort}, delivered), ENUM_INSTANCES_OK);
    EXPECT_EQ(delivered.size(), 1u);
    // One instance of another class: nothing to deliver, but not a failure.
    delivered.clear();
    EXPECT_EQ(run(SINGLE, {kProduct}, delivered), ENUM_INSTANCES_OK);
    EXPECT_TRUE(delivered.empty());
}

}  // namespace
