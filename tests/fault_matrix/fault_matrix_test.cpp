// The fault matrix: every JSON entry point of the adapter library that the
// module's requests reach, under every fault kind of the simulator, for every
// request that reaches it (found by recording each request's calls on the
// default host, not listed by hand). Each faulted request is compared with its
// answer on the healthy host and its outcome classified; the table of
// outcomes (entry point x fault kind) must equal fault_matrix.md
// (TVRN_GOLDEN_UPDATE=1 rewrites it; TVRN_FAULT_MATRIX_OUT=<file> also writes
// the table there).
//
// What must hold in every cell: no crash and no leak (the sanitizer build),
// a failed request carries a message, a delay changes nothing, and a request
// that answers with less or other data than the healthy host says so in the
// log at WARN or ERR (the inventory's documented degradations: an object
// skipped, a property left out). A fault may leave a request unchanged where
// it hits data the request does not deliver.
#include <gtest/gtest.h>
#include <json/json.h>

#include <cmpidt.h>

#include <cstdlib>
#include <fstream>
#include <functional>
#include <map>
#include <set>
#include <sstream>
#include <string>
#include <vector>

#include "host/classinfo.h"
#include "tests/e2e/Module_Session.h"

namespace {

using tvrne2e::Instance;
using tvrne2e::Module_Session;
using tvrne2e::Result;

struct Kind {
    tvrn_sim_fault_kind kind;
    const char* name;
};

const Kind kKinds[] = {
    {TVRN_SIM_FAULT_NULL_ANSWER, "null"},
    {TVRN_SIM_FAULT_ERROR_OBJECT, "error object"},
    {TVRN_SIM_FAULT_HBA_AGENT_ERROR, "HbaAgentError"},
    {TVRN_SIM_FAULT_STD_EXCEPTION, "std::exception"},
    {TVRN_SIM_FAULT_NON_STANDARD, "non-standard throw"},
    {TVRN_SIM_FAULT_DROP_MEMBER, "dropped member"},
    {TVRN_SIM_FAULT_WRONG_TYPE, "wrong member type"},
    {TVRN_SIM_FAULT_DELAY, "delay"},
};

// The member a member fault drops or mistypes: the one the module reads
// first from the entry point's answer.
const std::map<std::string, std::string> kMembers = {
    {"getAllAdaptersIndexString", "indexStrings"},
    {"getHbaByWwn", "hbaData"},
    {"getFlashInfo", "flashStatus"},
    {"getFcPhyPortIndicesByAdapter", "indexStrings"},
    {"getEthPhyPortIndicesByAdapter", "indexStrings"},
    {"getPortByWwn", "wwn"},
    {"getDynamicPortStatistics", "0.value"},
    {"getAllRemotePorts", "0.remotePortWwn"},
    {"getCompleteRemotePort", "deviceData"},
    {"getEthPortByEthMac", "ethData"},
    {"getOpticsSFP", "serialNo"},
    {"getAdapterIdByPort", "adapterId"},
    {"getAdapterId", "adapterId"},
    {"getHost", "result"},
    {"setPortByWwn", "port"},
    {"adapterUpdateFlash", "status"},
};

// What one request answered: its status and what it delivered (instances by
// path, or a method's printed result under "result").
struct Answer {
    int rc = 0;
    std::string message;
    std::map<std::string, std::string> instances;
};

Answer answerOf(const tvrnhost::Status& st, const std::vector<Instance>& items) {
    Answer a;
    a.rc = st.rc;
    a.message = st.msg;
    for (const Instance& i : items)
        a.instances[i.path().toString()] = i.toString();
    return a;
}

// One request of the matrix.
struct Request {
    std::string label;
    std::function<Answer(Module_Session&)> run;
    bool changesState;  // the simulator goes back to the fixture before each run
};

Request enumeration(const std::string& className) {
    return {"ei " + className,
            [className](Module_Session& s) {
                Result<Instance> r = s.enumerate(className);
                return answerOf(r, r.items);
            },
            false};
}

Request get(const tvrnhost::ObjectPath& path) {
    return {"gi " + path.toString(),
            [path](Module_Session& s) {
                tvrnhost::InstanceResult r = s.get(path);
                return answerOf(
                    r, r.ok() ? std::vector<Instance>{r.instance} : std::vector<Instance>{});
            },
            false};
}

// A method call as tvrncli makes it; a failure is printed as
// "tvrncli: CMPI_RC_... (<rc>): <message>".
Request method(const std::string& commandLine) {
    return {commandLine,
            [commandLine](Module_Session& s) {
                int status = 0;
                const std::string out = s.cli(commandLine, &status);
                Answer a;
                const std::string failed = "tvrncli: CMPI_RC_";
                if (out.rfind(failed, 0) == 0) {
                    const size_t open = out.find(" ("), close = out.find(")", open);
                    a.rc = std::atoi(out.c_str() + open + 2);
                    if (close + 3 < out.size())
                        a.message = out.substr(close + 3);
                } else {
                    a.instances["result"] = out;
                }
                return a;
            },
            true};
}

// The worst level among the log lines since the mark: "ERR", "WARN" or "".
// A line reads "<time> <LEVEL>: <file>(<line>): <text>".
std::string worstLevel(const Module_Session& s) {
    bool warn = false;
    for (const std::string& line : s.logLines()) {
        if (line.find(" ERR: ") != std::string::npos)
            return "ERR";
        if (line.find(" WARN: ") != std::string::npos)
            warn = true;
    }
    return warn ? "WARN" : "";
}

// The outcome of a faulted request against the healthy answer.
std::string classify(const Answer& healthy, const Answer& got, const std::string& level) {
    const std::string logged = level.empty() ? ", nothing logged" : " + " + level;
    if (got.rc == healthy.rc && got.instances == healthy.instances)
        return "OK, unchanged";
    if (got.rc == CMPI_RC_ERR_NOT_FOUND)
        return "NOT_FOUND" + logged;
    if (got.rc != 0)
        return got.message.empty() ? "FAILED, no message" : "FAILED + message";
    bool lost = false, changed = false;
    for (const auto& h : healthy.instances) {
        auto g = got.instances.find(h.first);
        if (g == got.instances.end())
            lost = true;
        else if (g->second != h.second)
            changed = true;
    }
    for (const auto& g : got.instances)
        if (healthy.instances.count(g.first) == 0)
            changed = true;
    if (healthy.instances.count("result") != 0)
        return "OK, method result changed" + logged;
    std::string what = lost && changed ? "objects skipped, properties changed"
                       : lost          ? "objects skipped"
                                       : "properties changed";
    return "OK, " + what + logged;
}

std::string joined(const std::set<std::string>& outcomes) {
    std::string out;
    for (const std::string& o : outcomes)
        out += (out.empty() ? "" : "; ") + o;
    return out;
}

std::string readFile(const std::string& path) {
    std::ifstream is(path);
    std::stringstream text;
    text << is.rdbuf();
    return text.str();
}

TEST(FaultMatrix, EveryEntryPointUnderEveryFault) {
    Module_Session& s = Module_Session::open();
    ASSERT_TRUE(s.loaded());

    // The requests: an enumeration of every class of the module, a get of
    // the first instance of each, and the inventory's methods. Which entry
    // points each reaches, and its healthy answer.
    std::vector<Request> requests;
    for (const std::string& c : tvrnhost::classinfo::moduleCatalog().classNames())
        if (c.rfind("TAVRIN_", 0) == 0)
            requests.push_back(enumeration(c));
    for (const std::string& c : tvrnhost::classinfo::moduleCatalog().classNames()) {
        Result<Instance> r = c.rfind("TAVRIN_", 0) == 0 ? s.enumerate(c) : Result<Instance>();
        if (!r.items.empty())
            requests.push_back(get(r.items.front().path()));
    }
    const std::string image =
        std::string(std::getenv("TVRN_SOURCE_DIR")) + "/tests/golden/images/fw-9.1.0.2.json";
    requests.push_back(method(
        R"(cm TAVRIN_AlarmDevice.CreationClassName="TAVRIN_AlarmDevice",DeviceID="100000051e0a0b0c",)"
        R"(SystemCreationClassName="TAVRIN_ComputerSystem",SystemName="<host>" )"
        R"(SetAlarmState RequestedAlarmState=3)"));
    requests.push_back(method(
        R"(cm 'TAVRIN_HBASoftwareInstallationService.)"
        R"(CreationClassName="TAVRIN_HBASoftwareInstallationService",)"
        R"(Name="Tavrin Adapter Software Update Service",)"
        R"(SystemCreationClassName="TAVRIN_ComputerSystem",SystemName="<host>"' InstallFromURI )"
        R"('URI="file://)" +
        image +
        R"("' 'Target="TAVRIN_PortController.CreationClassName=\"TAVRIN_PortController\",)"
        R"(DeviceID=\"200000051e0a0b0c\",SystemCreationClassName=\"TAVRIN_ComputerSystem\",)"
        R"(SystemName=\"<host>\""' InstallOptions=uint16[]:{5})"));

    std::vector<Answer> healthy;
    std::map<std::string, std::vector<size_t>> reachedBy;  // entry -> requests
    for (size_t i = 0; i < requests.size(); i++) {
        if (requests[i].changesState)
            Module_Session::open();
        s.clearRecording();
        healthy.push_back(requests[i].run(s));
        EXPECT_EQ(healthy.back().rc, 0) << requests[i].label << ": " << healthy.back().message;
        std::set<std::string> entries;
        for (const std::string& e : s.recordedEntries())
            entries.insert(e);
        for (const std::string& e : entries)
            reachedBy[e].push_back(i);
        if (requests[i].changesState)
            Module_Session::open();
    }
    ASSERT_GE(reachedBy.size(), 10u);

    std::ostringstream table;
    table << "| entry point (requests) |";
    for (const Kind& k : kKinds)
        table << " " << k.name << " |";
    table << "\n|---|";
    for (size_t i = 0; i < sizeof kKinds / sizeof kKinds[0]; i++)
        table << "---|";
    table << "\n";

    for (const auto& entry : reachedBy) {
        const std::string& e = entry.first;
        // Only JSON entry points take faults; the others are start-up calls.
        if (!s.fault(e, "", TVRN_SIM_FAULT_NULL_ANSWER)) {
            tvrn_sim_clear_faults();
            continue;
        }
        tvrn_sim_clear_faults();
        table << "| " << e << " (" << entry.second.size() << ") |";
        for (const Kind& k : kKinds) {
            std::string text = "injected fault";
            const bool member =
                k.kind == TVRN_SIM_FAULT_DROP_MEMBER || k.kind == TVRN_SIM_FAULT_WRONG_TYPE;
            if (member) {
                auto m = kMembers.find(e);
                if (m == kMembers.end()) {
                    ADD_FAILURE() << e << ": no member to fault in kMembers";
                    table << " |";
                    continue;
                }
                text = m->second;
            }
            std::set<std::string> outcomes;
            for (size_t i : entry.second) {
                const Request& r = requests[i];
                SCOPED_TRACE(e + " / " + k.name + " / " + r.label);
                if (r.changesState)
                    Module_Session::open();
                ASSERT_TRUE(
                    s.fault(e, "", k.kind, text, 0, k.kind == TVRN_SIM_FAULT_DELAY ? 1 : 7));
                s.markLog();
                const Answer got = r.run(s);
                tvrn_sim_clear_faults();
                const std::string outcome = classify(healthy[i], got, worstLevel(s));
                if (r.changesState)
                    Module_Session::open();
                outcomes.insert(outcome);
                EXPECT_NE(outcome, "FAILED, no message");
                EXPECT_EQ(outcome.find("nothing logged"), std::string::npos) << outcome;
                if (k.kind == TVRN_SIM_FAULT_DELAY) {
                    EXPECT_EQ(outcome, "OK, unchanged");
                }
            }
            table << " " << joined(outcomes) << " |";
        }
        table << "\n";
    }

    // Healthy again: every request answers as before.
    for (size_t i = 0; i < requests.size(); i++) {
        if (requests[i].changesState)
            Module_Session::open();
        const Answer again = requests[i].run(s);
        EXPECT_EQ(again.rc, healthy[i].rc) << requests[i].label;
        EXPECT_EQ(again.instances, healthy[i].instances) << requests[i].label;
    }

    const std::string matrix = table.str();
    if (const char* out = std::getenv("TVRN_FAULT_MATRIX_OUT"))
        std::ofstream(out) << matrix;
    const std::string golden = TVRN_FAULT_MATRIX;
    const char* update = std::getenv("TVRN_GOLDEN_UPDATE");
    if (update != nullptr && std::string(update) == "1")
        std::ofstream(golden) << matrix;
    EXPECT_EQ(readFile(golden), matrix)
        << "the outcomes changed; TVRN_GOLDEN_UPDATE=1 rewrites " << golden;
}

// At unload the module takes its log callback back before it frees the
// library, and calls nothing after that.
TEST(FaultMatrix, UnloadWithdrawsTheLogCallbackBeforeFreeingTheLibrary) {
    Module_Session& s = Module_Session::open();
    ASSERT_TRUE(s.loaded());
    tvrn_sim_reset();
    Module_Session::close();
    const std::vector<std::string> calls = s.recordedEntries();
    ASSERT_GE(calls.size(), 2u);
    EXPECT_EQ(calls[calls.size() - 2], "registerLogMsgCb");
    EXPECT_EQ(calls.back(), "free_hba_lib");
    EXPECT_EQ(tvrn_sim_calls_after_free(), 0u);
}

}  // namespace
