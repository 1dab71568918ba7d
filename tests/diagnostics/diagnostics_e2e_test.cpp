// Diagnostic test runs through the real module in the embedded host, on the
// simulator's built-in host. The program runs with TVRN_DIAG_PAUSE_MS=0, so
// the loopback runs do not pause. Jobs and records live as long as the module,
// so each test reads the records of its own job.
#include <cmpidt.h>
#include <gtest/gtest.h>
#include <json/json.h>

#include <chrono>
#include <future>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#include "tests/e2e/Module_Session.h"

using namespace tvrne2e;
using tvrnhost::Property;
using tvrnhost::Value;

namespace {

const char kAdapter[] = "200000051e0a0b0c";
const char kPort[] = "100000051e0a0b0c";
const char kFailingPort[] = "100000051e0a0b0d";  // its loopback test fails
const char kDisabledPort[] = "100000051e5c6d71";
const char kEthPort[] = "00051e8a4b01";

// One kind of test: its class, the Name of the instance invoked, the element
// it runs on and the library entry point of the test.
struct Test_Kind {
    const char* testClass;
    const char* testName;
    const char* elementClass;
    const char* deviceId;
    const char* entryPoint;
};

const Test_Kind kMemory = {"MemoryDiagnosticTest", "MemoryTest", "PortController", kAdapter,
                           "diagMemoryTest"};
const Test_Kind kLoopback = {"LoopbackDiagnosticTest", "ExternalLoopbackTest", "FCPort", kPort,
                             "diagLoopbackTest"};
const Test_Kind kPci = {"PCILoopbackDiagnosticTest", "PCILoopbackTest", "FCPort", kPort,
                        "diagPCILoopbackTest"};
const Test_Kind kEth = {"EthLoopbackDiagnosticTest", "ExternalEthLoopbackTest", "EthernetPort",
                        kEthPort, "diagEthLoopbackTest"};

struct Record {
    std::string data;
    long long state;  // -1 for a service record
    bool operator==(const Record& o) const { return data == o.data && state == o.state; }
};

std::ostream& operator<<(std::ostream& os, const Record& r) {
    return os << "{\"" << r.data << "\", " << r.state << "}";
}

std::string text(const Instance& i, const char* property) {
    const Value* v = i.get(property);
    return v == nullptr || v->isNull() ? "" : v->asString();
}

long long number(const Instance& i, const char* property) {
    const Value* v = i.get(property);
    return v == nullptr || v->isNull() ? -1 : (long long)v->asUint();
}

// The record number that ends an InstanceID ("<job>:<n>").
long long recordNumber(const std::string& instanceId) {
    return std::stoll(instanceId.substr(instanceId.rfind(':') + 1));
}

class Diagnostics : public ::testing::Test {
protected:
    void SetUp() override {
        session = &Module_Session::open();
        ASSERT_TRUE(session->loaded());
    }
    // No test leaves a job running for the next.
    void TearDown() override {
        if (session->loaded())
            waitForJob();
    }

    MethodResult run(const Test_Kind& t, const char* testName = nullptr,
                     const char* elementClass = nullptr, const char* deviceId = nullptr) {
        ObjectPath test =
            session->path(std::string("TAVRIN_") + t.testClass + ".CreationClassName=\"TAVRIN_" +
                          t.testClass + "\",Name=\"Tavrin:" + (testName ? testName : t.testName) +
                          "\",SystemCreationClassName=\"TAVRIN_ComputerSystem\","
                          "SystemName=\"<host>\"");
        tvrnhost::PropertyVector in;
        const std::string cls = elementClass ? elementClass : t.elementClass;
        if (!cls.empty())
            in.push_back(Property{"ManagedElement",
                                  Value::reference(session->path(
                                      "TAVRIN_" + cls + ".CreationClassName=\"TAVRIN_" + cls +
                                      "\",DeviceID=\"" + (deviceId ? deviceId : t.deviceId) +
                                      "\",SystemCreationClassName=\"TAVRIN_ComputerSystem\","
                                      "SystemName=\"<host>\""))});
        return session->invoke(test, "RunDiagnostic", in);
    }

    // Starts a test and returns its job id ("" when it did not start).
    std::string start(const Test_Kind& t) {
        MethodResult r = run(t);
        EXPECT_TRUE(r.ok()) << r.toString();
        EXPECT_EQ(r.returnValue.asUint(), 4096u);
        const Value* job = r.outArg("Job");
        if (job == nullptr || job->isNull())
            return "";
        return job->asReference().keys().at(0).value.asString();
    }

    // The listed jobs, once none is running.
    std::vector<Instance> waitForJob() {
        const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(20);
        for (;;) {
            Result<Instance> jobs = session->enumerate("TAVRIN_ConcreteJob");
            bool running = false;
            for (const Instance& j : jobs.items)
                running = running || number(j, "JobState") == 4;
            if (!running || std::chrono::steady_clock::now() > deadline) {
                EXPECT_FALSE(running) << "a job still runs";
                return jobs.items;
            }
            std::this_thread::sleep_for(std::chrono::milliseconds(10));
        }
    }

    // The records of one job, oldest first.
    std::vector<Record> records(const std::string& jobId, bool service) {
        Result<Instance> all = session->enumerate(service ? "TAVRIN_DiagnosticServiceRecord"
                                                          : "TAVRIN_DiagnosticCompletionRecord");
        EXPECT_TRUE(all.ok()) << all.toString();
        std::vector<Record> out;
        for (const Instance& r : all.items)
            if (text(r, "InstanceID").rfind(jobId + ":", 0) == 0)
                out.push_back({text(r, "RecordData"), service ? -1 : number(r, "CompletionState")});
        return out;
    }

    // The library calls since the recording was cleared, as JSON.
    static Json::Value calls() {
        Json::Value all;
        Json::Reader().parse(tvrn_sim_recorded_calls(), all);
        return all;
    }
    static std::vector<std::string> callsOf(const char* entry) {
        std::vector<std::string> out;
        Json::StreamWriterBuilder w;
        w["indentation"] = "";
        for (const Json::Value& c : calls())
            if (c["entry"].asString() == entry)
                out.push_back(Json::writeString(w, c["request"]));
        return out;
    }

    Module_Session* session = nullptr;
};

std::vector<Record> services(std::initializer_list<const char*> texts) {
    std::vector<Record> out;
    for (const char* t : texts)
        out.push_back({t, -1});
    return out;
}

TEST_F(Diagnostics, MemoryTestRunsOfflineAndRefusesASecondStartMeanwhile) {
    ASSERT_TRUE(session->fault("diagMemoryTest", "", TVRN_SIM_FAULT_DELAY, "", 1, 150));
    const std::string job = start(kMemory);
    EXPECT_EQ(job.rfind("Tavrin:MemoryTest-", 0), 0u) << job;
    MethodResult second = run(kPci);
    EXPECT_EQ(second.returnValue.asUint(), 4u);
    EXPECT_TRUE(second.outArg("Job") == nullptr || second.outArg("Job")->isNull());

    std::vector<Instance> jobs = waitForJob();
    ASSERT_EQ(jobs.size(), 1u);
    EXPECT_EQ(text(jobs[0], "InstanceID"), job);
    EXPECT_EQ(text(jobs[0], "Name"), job);
    EXPECT_EQ(number(jobs[0], "PercentComplete"), 100);
    // The real duration: at least the 150 ms the test took.
    const std::string elapsed = jobs[0].get("ElapsedTime")->asDateTime().text();
    EXPECT_GE(std::stod(elapsed.substr(12, 9)), 0.15) << elapsed;
    // The job completed after its last record was written.
    const Instance outcome = session->enumerate("TAVRIN_DiagnosticCompletionRecord").items.back();
    EXPECT_LE(outcome.get("CreationTimeStamp")->asDateTime().toBinary(),
              jobs[0].get("StartTime")->asDateTime().toBinary() +
                  jobs[0].get("ElapsedTime")->asDateTime().toBinary());

    // Its records are in tests/golden/diagnostics_run.golden.
    EXPECT_EQ(
        callsOf("setAdapterState"),
        (std::vector<std::string>{R"({"enableState":false,"indexStr":"20:00:00:05:1e:0a:0b:0c"})",
                                  R"({"enableState":true,"indexStr":"20:00:00:05:1e:0a:0b:0c"})"}));
    EXPECT_EQ(callsOf("diagMemoryTest"),
              (std::vector<std::string>{R"({"hbaWwn":"20:00:00:05:1e:0a:0b:0c"})"}));
}

// What the failing port's run records is in tests/golden/diagnostics_run.golden.
TEST_F(Diagnostics, LoopbackTestTakesThePortOfflineWithItsParameters) {
    start({"LoopbackDiagnosticTest", "ExternalLoopbackTest", "FCPort", kFailingPort,
           "diagLoopbackTest"});
    waitForJob();
    EXPECT_EQ(callsOf("diagLoopbackTest"),
              (std::vector<std::string>{R"({"dataPattern":3048584629,"frameCount":131072,"mode":8,)"
                                        R"("portWwn":"10:00:00:05:1e:0a:0b:0d","speed":4})"}));
    const std::string port = R"("indexStr":"10:00:00:05:1e:0a:0b:0d",)";
    EXPECT_EQ(callsOf("setPortByWwn"),
              (std::vector<std::string>{
                  "{" + port + R"("port":{"portStatus":false},"propArray":["portStatus"]})",
                  "{" + port + R"("port":{"portStatus":true},"propArray":["portStatus"]})"}));
}

TEST_F(Diagnostics, DisabledPortIsTestedAsItIsAndStaysDisabled) {
    const std::string job =
        start({"LoopbackDiagnosticTest", "InternalLoopbackTest", "FCPort", kDisabledPort, ""});
    waitForJob();
    EXPECT_EQ(records(job, true),
              services({"Checking whether the port is disabled for running loopback test",
                        "Port is already disabled", "Running loopback test for the port",
                        "Checking for return codes for loopback test run"}));
    EXPECT_EQ(records(job, false), (std::vector<Record>{{"Loopback test run is successful", 2}}));
    EXPECT_TRUE(callsOf("setPortByWwn").empty());
}

// Requests that start nothing: no job, no test call (an FCoE port's internal
// loopback, an element of another class and none are in
// tests/golden/diagnostics_ports.golden).
TEST_F(Diagnostics, RefusedRequestsStartNothing) {
    const struct {
        const char* what;
        Test_Kind kind;
        const char* testName;
        const char* elementClass;
        const char* deviceId;
        unsigned answer;
    } cases[] = {
        {"a test name of no loopback test", kLoopback, "MemoryTest", nullptr, nullptr, 5},
        {"an adapter the library does not know", kMemory, nullptr, nullptr, "200000051e0a0b99", 5},
        {"an identifier of neither length", kMemory, nullptr, nullptr, "20000005", 5},
        {"a PCI test on a port that does not exist", kPci, nullptr, nullptr, "100000051e0a0b99", 5},
    };
    const size_t jobsBefore = waitForJob().size();
    for (const auto& c : cases) {
        SCOPED_TRACE(c.what);
        MethodResult r = run(c.kind, c.testName, c.elementClass, c.deviceId);
        EXPECT_TRUE(r.ok()) << r.toString();
        EXPECT_EQ(r.returnValue.asUint(), c.answer);
        EXPECT_TRUE(r.outArg("Job") == nullptr || r.outArg("Job")->isNull());
    }
    EXPECT_EQ(session->enumerate("TAVRIN_ConcreteJob").items.size(), jobsBefore);
    for (const Test_Kind* t : {&kMemory, &kLoopback, &kPci})
        EXPECT_EQ(session->calls(t->entryPoint), 0u) << t->entryPoint;
}

TEST_F(Diagnostics, RecordListsKeepTheLatestHundred) {
    std::string last;
    for (int run = 0; run < 15; run++) {  // 7 service records each
        last = start(kMemory);
        waitForJob();
    }
    Result<Instance> list = session->enumerate("TAVRIN_DiagnosticServiceRecord");
    ASSERT_EQ(list.items.size(), 100u);
    EXPECT_EQ(text(list.items.back(), "InstanceID").rfind(last + ":", 0), 0u);
    // The 105 written lost their 5 oldest: the list is 100 consecutive records.
    EXPECT_EQ(recordNumber(text(list.items.back(), "InstanceID")) -
                  recordNumber(text(list.items.front(), "InstanceID")),
              99 + 14);  // each run's completion record is numbered in between
    EXPECT_EQ(records(last, false).size(), 1u);
}

// Whatever a test call answers, a run ends: failed, with its element back.
TEST_F(Diagnostics, FailedLibraryCallsEndEveryRunAsFailed) {
    const struct {
        tvrn_sim_fault_kind kind;
        const char* text;
    } faults[] = {
        {TVRN_SIM_FAULT_NULL_ANSWER, ""},
        {TVRN_SIM_FAULT_ERROR_OBJECT, "refused"},
        {TVRN_SIM_FAULT_HBA_AGENT_ERROR, "agent down"},
        {TVRN_SIM_FAULT_STD_EXCEPTION, "bad state"},
        {TVRN_SIM_FAULT_NON_STANDARD, ""},
        {TVRN_SIM_FAULT_DROP_MEMBER, "failed"},
        {TVRN_SIM_FAULT_WRONG_TYPE, "failed"},
    };
    for (const Test_Kind* t : {&kMemory, &kLoopback, &kPci, &kEth}) {
        for (const auto& f : faults) {
            SCOPED_TRACE(std::string(t->entryPoint) + " fault " + std::to_string(f.kind));
            Module_Session::open();
            ASSERT_TRUE(session->fault(t->entryPoint, "", f.kind, f.text, 1));
            const std::string job = start(*t);
            waitForJob();
            std::vector<Record> outcome = records(job, false);
            ASSERT_GE(outcome.size(), 2u);
            EXPECT_EQ(outcome.back(), (Record{"Unknown failure", 5}));
            for (const Record& r : outcome)
                EXPECT_EQ(r.state, 5);
            if (t == &kLoopback || t == &kEth) {
                EXPECT_EQ(callsOf("setPortByWwn").size(), 2u);  // offline and back
            }
        }
    }
}

TEST_F(Diagnostics, TestsDoNotRunOnElementsThatStayOnline) {
    ASSERT_TRUE(session->fault("setPortByWwn", "", TVRN_SIM_FAULT_ERROR_OBJECT, "busy", 1));
    std::string job = start(kLoopback);
    waitForJob();
    EXPECT_EQ(records(job, false), (std::vector<Record>{{"Failed to disable the port", 5}}));
    EXPECT_EQ(session->calls("diagLoopbackTest"), 0u);
    EXPECT_EQ(session->calls("setPortByWwn"), 1u);  // nothing brought back

    Module_Session::open();
    ASSERT_TRUE(session->fault("setAdapterState", "", TVRN_SIM_FAULT_HBA_AGENT_ERROR, "busy", 1));
    job = start(kMemory);
    waitForJob();
    EXPECT_EQ(records(job, false), (std::vector<Record>{{"Failed to disable the adapter", 5}}));
    EXPECT_EQ(session->calls("diagMemoryTest"), 0u);
    EXPECT_EQ(session->calls("setAdapterState"), 1u);

    // A port that does not come back is reported.
    Module_Session::open();
    ASSERT_EQ(tvrn_sim_set_fault_after("setPortByWwn", "", TVRN_SIM_FAULT_NULL_ANSWER, 0, "", 1, 1),
              0);
    job = start(kLoopback);
    waitForJob();
    EXPECT_EQ(records(job, false), (std::vector<Record>{{"Failed to enable the port", 5},
                                                        {"Loopback test run is successful", 2}}));
}

TEST_F(Diagnostics, TwoStartsArrivingTogetherStartOneJob) {
    // The memory start is held up validating its adapter while the PCI start
    // comes in; its test takes a while too.
    ASSERT_TRUE(session->fault("getAdapterId", "", TVRN_SIM_FAULT_DELAY, "", 1, 300));
    ASSERT_TRUE(session->fault("diagMemoryTest", "", TVRN_SIM_FAULT_DELAY, "", 1, 300));
    std::future<MethodResult> memory = std::async(std::launch::async, [&] { return run(kMemory); });
    std::this_thread::sleep_for(std::chrono::milliseconds(50));
    MethodResult pci = run(kPci);
    const unsigned answers[] = {unsigned(memory.get().returnValue.asUint()),
                                unsigned(pci.returnValue.asUint())};
    EXPECT_EQ(answers[0] + answers[1], 4096u + 4u) << answers[0] << " " << answers[1];
    EXPECT_EQ(waitForJob().size(), 1u);
}

TEST_F(Diagnostics, UnloadWaitsForTheRunningTest) {
    ASSERT_TRUE(session->fault("diagLoopbackTest", "", TVRN_SIM_FAULT_DELAY, "", 1, 400));
    start(kLoopback);
    bool refused = false;
    for (const tvrnhost::CleanupReport& r : session->host().cleanup(false))
        if (r.provider == "TAVRIN_LoopbackDiagnosticTest_Provider")
            refused = refused || r.rc == CMPI_RC_DO_NOT_UNLOAD;
    EXPECT_TRUE(refused);

    Module_Session::close();
    // The worker ended before the module went: the port is back online.
    const std::vector<std::string> ports = callsOf("setPortByWwn");
    ASSERT_EQ(ports.size(), 2u);
    EXPECT_NE(ports[1].find(R"("portStatus":true)"), std::string::npos);
    session = &Module_Session::open();
}

}  // namespace
