// Start operations and workers directly on the helper, on the simulator:
// what the embedded host cannot bring about.
#include <cerrno>
#include <string>

#include "diagnostics/DiagnosticHelper.h"
#include "framework/Time.h"
#include "schema/generated/TAVRIN_ConcreteJob.h"
#include "schema/generated/TAVRIN_DiagnosticCompletionRecord.h"
#include "tests/inventory/InventoryTestSupport.h"

using namespace CPTA;
using namespace invtest;

namespace {

class Runs : public InventoryTest {
protected:
    DiagnosticHelper& helper = *DiagnosticHelper::getDiagnosticHelperObject();

    // Starts a test with `start` and waits for its worker; the job id.
    template <class Start>
    std::string run(Start&& start) {
        RunDiagResult r = start();
        EXPECT_EQ(r.returnCode, 4096u);
        std::string job = r.job != nullptr ? r.job->InstanceID.value.c_str() : "";
        destroy(r.job);
        EXPECT_TRUE(helper.waitForWorkers(10 * Time::SEC));
        return job;
    }

    // The latest completion record.
    std::string lastOutcome(long long* state = nullptr) {
        Instances records(helper.getDiagnosticCompletionRecordInstances());
        auto* last = records.at<TAVRIN_DiagnosticCompletionRecord>(records.size() - 1);
        if (last == nullptr)
            return "";
        if (state != nullptr)
            *state = last->CompletionState.value;
        return last->RecordData.value.c_str();
    }
};

int refuse(Thread&, Thread_Proc, void*) {
    return EAGAIN;
}

TEST_F(Runs, AWorkerThatCannotStartEndsItsJobAsFailed) {
    DiagnosticHelper::setThreadStarter(refuse);
    RunDiagResult r = helper.runPCILoopbackTest("100000051e0a0b0c");
    DiagnosticHelper::setThreadStarter(nullptr);
    EXPECT_EQ(r.returnCode, 4u);
    EXPECT_EQ(r.job, nullptr);
    EXPECT_FALSE(helper.isAnyJobRunning());
    long long state = 0;
    EXPECT_EQ(lastOutcome(&state), "Unknown failure");
    EXPECT_EQ(state, 5);
    // The next start is not refused.
    run([&] { return helper.runPCILoopbackTest("100000051e0a0b0c"); });
    EXPECT_EQ(lastOutcome(), "PCI Loopback test run is successful");
}

TEST_F(Runs, OnlyAPortMarkedFCoERefusesTheInternalLoopbackTest) {
    Json::Value fixture = fixtureJson("default");
    fixture["adapters"][0]["fcPorts"][0]["port"]["isFCoE"] = false;
    loadJson(fixture);
    run([&] { return helper.runLoopbackTest("100000051e0a0b0c", "Tavrin:InternalLoopbackTest"); });
    EXPECT_EQ(lastOutcome(), "Loopback test run is successful");
}

TEST_F(Runs, LongAnswersAreCutOnACharacterBoundary) {
    Json::Value fixture = fixtureJson("default");
    std::string output = "x";
    for (int i = 0; i < 150; i++)
        output += "\xc3\xa9";  // two bytes each
    fixture["adapters"][0]["fcPorts"][1]["diagnostics"]["LoopbackTest"]["output"] = output;
    loadJson(fixture);
    run([&] { return helper.runLoopbackTest("100000051e0a0b0d", "tavrin:externalloopbacktest"); });
    const std::string line = lastOutcome();
    // 199 bytes would fit, but the 199th is the first half of a character.
    EXPECT_EQ(line.size(), 198u);
    EXPECT_EQ(line, "Loopback test run status : " + output.substr(0, 171));
}

}  // namespace
