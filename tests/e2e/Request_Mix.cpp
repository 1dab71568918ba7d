#include "tests/e2e/Request_Mix.h"

#include <malloc.h>
#include <stdlib.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <stdexcept>

#include <json/json.h>

#include "simulator/SimControl.h"

namespace tvrne2e {

using tvrnhost::Property;
using tvrnhost::PropertyVector;
using tvrnhost::Type;
using tvrnhost::Value;

namespace {

// The order of one cycle of the mix: enumerations are the most frequent
// request, as they are from a CIM client.
enum Kind {
    ENUMERATE,
    GET,
    ASSOCIATORS,
    REFERENCES,
    EXECUTE_METHOD,
    RUN_DIAGNOSTIC,
    INDICATIONS,
    INSTALL,
    SET_ALARM_STATE,
    STEPS
};

const Kind kCycle[] = {ENUMERATE, GET,        ENUMERATE,       ASSOCIATORS, EXECUTE_METHOD,
                       ENUMERATE, REFERENCES, SET_ALARM_STATE, ENUMERATE,   RUN_DIAGNOSTIC,
                       GET,       ENUMERATE,  INDICATIONS,     ENUMERATE,   INSTALL};

}  // namespace

const Request_Mix::Step Request_Mix::kStepTable[kSteps] = {
    {"enumerate", &Request_Mix::enumerate},         {"get", &Request_Mix::get},
    {"associators", &Request_Mix::associators},     {"references", &Request_Mix::references},
    {"executeMethod", &Request_Mix::executeMethod}, {"RunDiagnostic", &Request_Mix::runDiagnostic},
    {"indications", &Request_Mix::indications},     {"InstallFromURI", &Request_Mix::install},
    {"SetAlarmState", &Request_Mix::setAlarmState},
};

namespace {

// Classes whose instances the requests of the mix make and replace: the
// diagnostic job of the latest run, its records and their associations.
const char* const kRunDependent[] = {
    "TAVRIN_ConcreteJob",
    "TAVRIN_OwningJobElement",
    "TAVRIN_DiagnosticServiceRecord",
    "TAVRIN_DiagnosticCompletionRecord",
    "TAVRIN_AffectedJobElement",
    "TAVRIN_ServiceRecordAppliesToElement",
    "TAVRIN_CompletionRecordAppliesToElement",
};

bool runDependent(const std::string& className) {
    return std::any_of(std::begin(kRunDependent), std::end(kRunDependent),
                       [&](const char* c) { return className == c; });
}

const char* const kTunnelRequests[] = {
    R"({"id": 1, "method": "discovery.getHbaByWwn", "params": ["20:00:00:05:1e:0a:0b:0c"]})",
    R"({"id": 2, "method": "discovery.getPortStatistics", "params": ["10:00:00:05:1e:0a:0b:0c"]})",
    R"({"id": 3, "method": "discovery.getAllHbasByHost", "params": []})",
    R"({"id": 4, "method": "diagnostics.getRequestID"})",
};

// The diagnostic tests run, on the built-in host's elements: test class and
// name, element class and DeviceID.
struct Diagnostic_Run {
    const char* testClass;
    const char* testName;
    const char* elementClass;
    const char* deviceId;
};

const Diagnostic_Run kRuns[] = {
    {"MemoryDiagnosticTest", "MemoryTest", "PortController", "200000051e0a0b0c"},
    {"LoopbackDiagnosticTest", "ExternalLoopbackTest", "FCPort", "100000051e0a0b0c"},
    {"PCILoopbackDiagnosticTest", "PCILoopbackTest", "FCPort", "100000051e5c6d70"},
    {"EthLoopbackDiagnosticTest", "ExternalEthLoopbackTest", "EthernetPort", "00051e8a4b01"},
};

const char kAlertClass[] = "TAVRIN_AlertIndication";
const char kPortEvent[] = R"({"eventCategory": 2, "eventId": 1, "eventSeverity": 4,)"
                          R"( "portIndexString": "100000051e0a0b0c", "eventMsg": "logged in"})";
// The two forms of the alert the event makes.
const char* const kAlertIds[] = {"TVRN131073", "PROPTVRN131073"};

const char kDeviceKeys[] =
    "\",SystemCreationClassName=\"TAVRIN_ComputerSystem\",SystemName=\"<host>\"";

std::string devicePath(const std::string& cls, const std::string& deviceId) {
    return "TAVRIN_" + cls + ".CreationClassName=\"TAVRIN_" + cls + "\",DeviceID=\"" + deviceId +
           kDeviceKeys;
}

std::string text(const Instance& i, const char* property) {
    const Value* v = i.get(property);
    return v == nullptr || v->isNull() ? std::string() : v->asString();
}

std::string failed(const char* what, const std::string& target, const tvrnhost::Status& st) {
    return std::string(what) + " " + target + ": " + st.toString();
}

std::string unexpected(const char* what, const std::string& target, const std::string& got) {
    return std::string(what) + " " + target + ": " + got;
}

}  // namespace

Request_Mix::Request_Mix(Module_Session& session) : _session(session) {
    if (!session.loaded())
        throw std::runtime_error("Request_Mix: the module is not loaded");
    char pattern[] = "/tmp/tvrn-mix-XXXXXX";
    if (mkdtemp(pattern) == nullptr)
        throw std::runtime_error("Request_Mix: mkdtemp failed");
    _imageDir = pattern;

    for (const tvrnhost::Registration& reg : session.host().registrations()) {
        if (!(reg.kinds & tvrnhost::kInstanceMI))
            continue;
        _classes.push_back(reg.className);
        Result<Instance> all = session.enumerate(reg.className);
        if (!all.ok())
            throw std::runtime_error("Request_Mix: " + failed("enumerate", reg.className, all));
        if (runDependent(reg.className))
            continue;
        _counts[reg.className] = all.items.size();
        if (all.items.empty())
            continue;
        _paths.push_back(all.items.front().path());
        if (!(reg.kinds & tvrnhost::kAssociationMI))
            _objects.push_back(all.items.front().path());
        if (reg.className == "TAVRIN_AgentService")
            _agent = all.items.front().path();
        if (reg.className == "TAVRIN_HBASoftwareInstallationService")
            _installService = all.items.front().path();
        for (const Instance& i : all.items) {
            if (reg.className == "TAVRIN_AlarmDevice")
                _alarms.push_back(i.path());
            if (reg.className == "TAVRIN_PortController" &&
                text(i, "DeviceID").compare(0, 4, "2000") == 0)  // the FC HBAs
                _adapters.push_back(i.path());
        }
    }
    if (_agent.className().empty() || _installService.className().empty() || _alarms.empty() ||
        _adapters.empty())
        throw std::runtime_error("Request_Mix: the module shows no adapters or services");
    // What the objects are associated with at the start: runs add records
    // and jobs, and nothing takes any away.
    for (const ObjectPath& object : _objects) {
        Result<ObjectPath> associated = session.host().associatorNames(object);
        Result<ObjectPath> references = session.host().referenceNames(object);
        if (!associated.ok() || !references.ok())
            throw std::runtime_error("Request_Mix: the associations of " + object.toString());
        _associated.push_back(associated.items.size());
        _references.push_back(references.items.size());
    }
    // Each adapter's image is the firmware it has: a flash changes nothing
    // that names an instance (the version is a key of TAVRIN_Product).
    for (const ObjectPath& adapter : _adapters) {
        const std::string id = adapter.key("DeviceID")->asString();
        InstanceResult firmware = session.get(
            session.path("TAVRIN_AdapterSoftwareIdentity.InstanceID=\"" + id + "_firmware\""));
        const Value* version = firmware.ok() ? firmware.instance.get("VersionString") : nullptr;
        if (version == nullptr || version->isNull())
            throw std::runtime_error("Request_Mix: no firmware version of " + id);
        _images.push_back(_imageDir + "/fw-" + id + ".json");
        std::ofstream(_images.back())
            << "{\"version\": \"" << version->asString() << "\", \"status\": 0}";
    }
}

Request_Mix::~Request_Mix() {
    std::error_code ignored;
    std::filesystem::remove_all(_imageDir, ignored);
}

std::size_t Request_Mix::kinds() const {
    return std::size(kCycle);
}

const char* Request_Mix::kindName(std::size_t request) const {
    return kStepTable[kCycle[request % kinds()]].name;
}

std::string Request_Mix::run(std::size_t request) {
    static_assert(STEPS == kSteps, "one row per step");
    const Kind step = kCycle[request % kinds()];
    return (this->*kStepTable[step].request)(_turns[step]++);
}

std::string Request_Mix::enumerate(std::size_t turn) {
    const std::string& cls = _classes[turn % _classes.size()];
    Result<Instance> got = _session.enumerate(cls);
    if (!got.ok())
        return failed("enumerate", cls, got);
    auto expected = _counts.find(cls);
    if (expected != _counts.end() && got.items.size() != expected->second)
        return unexpected("enumerate", cls,
                          std::to_string(got.items.size()) + " instances instead of " +
                              std::to_string(expected->second));
    for (const Instance& i : got.items)
        if (!tvrnhost::equalsIgnoreCase(i.className(), cls) || i.path().keys().empty())
            return unexpected("enumerate", cls, "an instance with the path " + i.path().toString());
    return "";
}

std::string Request_Mix::get(std::size_t turn) {
    const ObjectPath& path = _paths[turn % _paths.size()];
    InstanceResult got = _session.get(path);
    if (!got.ok())
        return failed("get", path.toString(), got);
    if (!got.instance.path().identifies(path))
        return unexpected("get", path.toString(), "the instance " + got.instance.path().toString());
    return "";
}

std::string Request_Mix::associators(std::size_t turn) {
    return related(turn, false);
}

std::string Request_Mix::references(std::size_t turn) {
    return related(turn, true);
}

std::string Request_Mix::related(std::size_t turn, bool references) {
    const std::size_t object = turn % _objects.size();
    const ObjectPath& path = _objects[object];
    const char* what = references ? "references of" : "associators of";
    Result<Instance> got =
        references ? _session.host().references(path) : _session.host().associators(path);
    const std::size_t least = references ? _references[object] : _associated[object];
    if (!got.ok())
        return failed(what, path.toString(), got);
    if (got.items.size() < least)
        return unexpected(
            what, path.toString(),
            std::to_string(got.items.size()) + " instead of at least " + std::to_string(least));
    return "";
}

std::string Request_Mix::executeMethod(std::size_t turn) {
    const std::string request = kTunnelRequests[turn % std::size(kTunnelRequests)];
    MethodResult r =
        _session.invoke(_agent, "executeMethod", {Property{"request", Value::string(request)}});
    if (!r.ok())
        return failed("executeMethod", request, r);
    const Value* response = r.outArg("response");
    Json::Value answer;
    if (response == nullptr || response->isNull() ||
        !Json::Reader().parse(response->asString(), answer) || !answer.isMember("result") ||
        answer.isMember("error"))
        return unexpected("executeMethod", request,
                          response == nullptr ? "no response" : response->toString());
    return "";
}

// A run starts a job, or is refused while another job runs.
std::string Request_Mix::runDiagnostic(std::size_t turn) {
    const Diagnostic_Run& run = kRuns[turn % std::size(kRuns)];
    const std::string cls = std::string("TAVRIN_") + run.testClass;
    const ObjectPath test = _session.path(cls + ".CreationClassName=\"" + cls +
                                          "\",Name=\"Tavrin:" + run.testName + kDeviceKeys);
    const ObjectPath element = _session.path(devicePath(run.elementClass, run.deviceId));
    MethodResult r = _session.invoke(test, "RunDiagnostic",
                                     {Property{"ManagedElement", Value::reference(element)}});
    if (!r.ok())
        return failed("RunDiagnostic", run.testName, r);
    const unsigned long long rv = r.returnValue.isNull() ? 0 : r.returnValue.asUint();
    const Value* job = r.outArg("Job");
    if (rv == 4096 && (job == nullptr || job->isNull()))
        return unexpected("RunDiagnostic", run.testName, "a job started without a reference");
    if (rv != 4096 && rv != 4)
        return unexpected("RunDiagnostic", run.testName, "returned " + std::to_string(rv));
    return "";
}

// Alert indications on while the simulator sends an event, then off. The
// event is delivered to the host before the subscription ends.
std::string Request_Mix::indications(std::size_t) {
    tvrnhost::Host& host = _session.host();
    const tvrnhost::Status on = host.subscribe(kNameSpace, kAlertClass);
    if (!on.ok())
        return failed("subscribe to", kAlertClass, on);
    const std::size_t before = host.indications().size();
    std::string problem;
    if (tvrn_sim_emit_event(kPortEvent) != 1)
        problem = unexpected("an event for", kAlertClass, "not sent: nobody is registered");
    else if (!host.waitForIndications(before + 2, std::chrono::seconds(20)))
        problem = unexpected("an event for", kAlertClass, "no indication within 20 s");
    const tvrnhost::Status off = host.unsubscribe(kNameSpace, kAlertClass);
    if (problem.empty() && !off.ok())
        problem = failed("unsubscribe from", kAlertClass, off);
    return problem;
}

// Two installs on one adapter at once: the second is refused (6).
std::string Request_Mix::install(std::size_t turn) {
    const std::size_t adapter = turn % _adapters.size();
    const ObjectPath& target = _adapters[adapter];
    MethodResult r = _session.invoke(
        _installService, "InstallFromURI",
        {Property{"URI", Value::string("file://" + _images[adapter])},
         Property{"Target", Value::reference(target)},
         Property{"InstallOptions", Value::array(Type::Uint16, {Value::uint16(5)})}});
    if (!r.ok())
        return failed("InstallFromURI on", target.toString(), r);
    const unsigned long long rv = r.returnValue.isNull() ? 99 : r.returnValue.asUint();
    if (rv != 0 && rv != 6)
        return unexpected("InstallFromURI on", target.toString(), "returned " + std::to_string(rv));
    return "";
}

// On and off in turn; 2 when another request has just set the same state.
std::string Request_Mix::setAlarmState(std::size_t turn) {
    const ObjectPath& alarm = _alarms[(turn / 2) % _alarms.size()];
    const std::uint16_t state = turn % 2 == 0 ? 3 : 1;
    MethodResult r = _session.invoke(alarm, "SetAlarmState",
                                     {Property{"RequestedAlarmState", Value::uint16(state)}});
    if (!r.ok())
        return failed("SetAlarmState on", alarm.toString(), r);
    const unsigned long long rv = r.returnValue.isNull() ? 99 : r.returnValue.asUint();
    if (rv != 0 && rv != 2)
        return unexpected("SetAlarmState on", alarm.toString(), "returned " + std::to_string(rv));
    return "";
}

std::string Request_Mix::takeIndications() {
    for (const tvrnhost::Indication& ind : _session.host().takeIndications()) {
        const std::string id = text(ind.instance, "MessageID");
        if (ind.instance.className() != kAlertClass ||
            std::none_of(std::begin(kAlertIds), std::end(kAlertIds),
                         [&](const char* a) { return id == a; }))
            return unexpected("an indication", ind.instance.className(), "MessageID " + id);
    }
    return "";
}

std::size_t residentBytes() {
    malloc_trim(0);
    std::ifstream statm("/proc/self/statm");
    std::size_t size = 0, resident = 0;
    statm >> size >> resident;
    return resident * std::size_t(sysconf(_SC_PAGESIZE));
}

Soak_Figures soak(Request_Mix& mix, std::size_t warmUp, std::size_t requests) {
    Soak_Figures figures;
    auto part = [&](std::size_t from, std::size_t to) {
        for (std::size_t n = from; n < to; n++) {
            std::string problem = mix.run(n);
            // The host keeps what it receives, the simulator the calls it
            // answered (up to 100,000): both emptied as the requests go.
            if ((n + 1) % mix.kinds() == 0) {
                tvrn_sim_clear_recording();
                if (problem.empty())
                    problem = mix.takeIndications();
            }
            if (!problem.empty() && figures.failures++ == 0)
                figures.firstFailure = problem;
        }
    };
    part(0, warmUp);
    figures.residentWarm = residentBytes();
    const auto started = std::chrono::steady_clock::now();
    part(warmUp, warmUp + requests);
    figures.seconds =
        std::chrono::duration<double>(std::chrono::steady_clock::now() - started).count();
    figures.residentEnd = residentBytes();
    figures.requests = requests;
    return figures;
}

}  // namespace tvrne2e
