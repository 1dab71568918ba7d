// The test runs: the four start operations, which validate a request and
// start a worker, and the four workers (see DiagnosticHelper.h).
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <exception>
#include <memory>
#include <string>

#include <json/json.h>

#include "diagnostics/DiagnosticHelper.h"
#include "framework/Log.h"
#include "gateway/CIMProviderTfaj.h"
#include "gateway/GuardedCall.h"
#include "gateway/JsonAccess.h"
#include "gateway/ProviderUtil.h"
#include "inventory/InventoryCommon.h"
#include "inventory/PortHelper.h"
#include "schema/generated/TAVRIN_ConcreteJob.h"

namespace CPTA {

namespace {

const uint32 kLoopbackFrames = 0x20000;
const uint32 kEthLoopbackFrames = 0x10000;
const uint32 kDataPattern = 0xB5B5B5B5;
const uint64 kSettlePauseUsec = 2000000;
// A formatted record line is cut to fit a buffer of this many bytes.
const size_t kRecordLineBuffer = 200;

// The settling pause of this run: 2 seconds unless TVRN_DIAG_PAUSE_MS
// shortens it (see DiagnosticHelper.h).
uint64 settlePause() {
    const char* text = getenv("TVRN_DIAG_PAUSE_MS");
    if (text == nullptr || *text == '\0')
        return kSettlePauseUsec;
    char* end = nullptr;
    const unsigned long long ms = strtoull(text, &end, 10);
    if (end == nullptr || *end != '\0' || ms >= kSettlePauseUsec / 1000)
        return kSettlePauseUsec;
    return uint64(ms) * 1000;
}

// The text cut to fit `size` bytes with its terminating NUL, never inside a
// UTF-8 character.
String cutText(const std::string& text, size_t size) {
    size_t n = text.size();
    if (n >= size) {
        n = size - 1;
        while (n > 0 && (static_cast<unsigned char>(text[n]) & 0xC0) == 0x80)
            n--;
    }
    return String(text.data(), n);
}

String recordLine(const char* format, ...) __attribute__((format(printf, 1, 2)));
String recordLine(const char* format, ...) {
    va_list ap;
    va_start(ap, format);
    va_list again;
    va_copy(again, ap);
    const int n = vsnprintf(nullptr, 0, format, ap);
    va_end(ap);
    std::string text(n > 0 ? size_t(n) : 0, '\0');
    if (n > 0)
        vsnprintf(&text[0], size_t(n) + 1, format, again);
    va_end(again);
    return cutText(text, kRecordLineBuffer);
}

// An unsigned count of an answer; 0 when missing or not a number that fits.
unsigned count(const Json::Value& answer, const char* name) {
    const Json::Value* m = jsonMember(answer, name);
    if (m == nullptr)
        return 0;
    if (m->isUInt())
        return m->asUInt();
    if (m->isInt())
        return unsigned(m->asInt());
    return 0;
}

enum Test_Outcome { TEST_PASSED, TEST_FAILED, TEST_UNKNOWN };

// Calls a test entry of the library. Only an answer that says whether the
// test failed is a verdict; anything else (an exception, no answer, an error
// object, no boolean "failed") is an unknown outcome.
Test_Outcome callTest(const char* pointer, JsonReqFP fp, const Json::Value& request,
                      Json::Value& answer) {
    if (!guardedCall(LibCall(pointer), fp, request, answer))
        return TEST_UNKNOWN;
    if (!ProviderUtil::isValidJsonResponse(answer)) {
        TVRN_LOG(LL_ERR, "%s response has error", pointer);
        return TEST_UNKNOWN;
    }
    if (!jsonHas(answer, "failed", Json::booleanValue)) {
        TVRN_LOG(LL_ERR, "%s response does not tell whether the test failed", pointer);
        return TEST_UNKNOWN;
    }
    return jsonBool(answer, "failed") ? TEST_FAILED : TEST_PASSED;
}

// A library call that only needs a usable answer.
int setState(const char* pointer, JsonReqFP fp, const Json::Value& request, const String& key,
             LibCall::Wording wording) {
    Json::Value answer;
    if (!guardedCall(LibCall(pointer, key, wording), fp, request, answer))
        return -1;
    return ProviderUtil::isValidJsonResponse(answer) ? 0 : -1;
}

}  // namespace

// ---- element state -----------------------------------------------------------------

bool getAdapterStatus(const String& adapterAddress, bool& known) {
    known = false;
    const String colon = ProviderUtil::getIndexInColonFormat(adapterAddress);
    Json::Value answer;
    if (!guardedCall(LibCall("libGetHbaByWwn"), libGetHbaByWwn,
                     keyRequest(colon.size() == 17 ? "mac" : "wwn", colon), answer) ||
        !ProviderUtil::isValidJsonResponse(answer) ||
        !jsonHas(jsonObject(answer, "hbaData"), "hbaStatus", Json::booleanValue)) {
        TVRN_LOG(LL_ERR, "Unable to get adapater status");
        return false;
    }
    known = true;
    const bool enabled = jsonBool(jsonObject(answer, "hbaData"), "hbaStatus");
    TVRN_LOG(LL_INFO, "%s: adapter status is %d", adapterAddress.c_str(), int(enabled));
    return enabled;
}

int setAdapterStatus(const String& adapterAddress, bool enable) {
    const String colon = ProviderUtil::getIndexInColonFormat(adapterAddress);
    Json::Value request(Json::objectValue);
    request["indexStr"] = jsonText(colon);
    request["enableState"] = enable;
    if (setState("libSetAdapterState", libSetAdapterState, request, colon,
                 LibCall::KEY_AFTER_DEFAULT) != 0)
        return -1;
    TVRN_LOG(LL_INFO, "setAdapterStatus success");
    return 0;
}

int setPortState(const String& port, bool enable) {
    Json::Value request(Json::objectValue);
    request["indexStr"] = jsonText(port);
    request["port"]["portStatus"] = enable;
    request["propArray"].append("portStatus");
    if (setState("libSetPortByWwn", libSetPortByWwn, request, port, LibCall::KEY_FIRST) != 0)
        return -1;
    TVRN_LOG(LL_INFO, "setPortState - %s %d", port.c_str(), int(enable));
    return 0;
}

// ---- one run on its worker thread ------------------------------------------------------

class Diagnostic_Run {
public:
    explicit Diagnostic_Run(DiagnosticTestInput& in) : _in(in), _helper(*in.owner) {}

    // The worker procedure of each test kind.
    static void* memory(void* input) { return run(input, &Diagnostic_Run::memoryTest); }
    static void* loopback(void* input) { return run(input, &Diagnostic_Run::loopbackTest); }
    static void* pciLoopback(void* input) { return run(input, &Diagnostic_Run::pciLoopbackTest); }
    static void* ethLoopback(void* input) { return run(input, &Diagnostic_Run::ethLoopbackTest); }

private:
    typedef void (Diagnostic_Run::*Body)();

    // Runs a body; whatever it leaves undone when it throws (the element
    // offline, the outcome) is finished here. The job is completed last.
    static void* run(void* input, Body body) {
        std::unique_ptr<DiagnosticTestInput> in(static_cast<DiagnosticTestInput*>(input));
        Diagnostic_Run r(*in);
        try {
            (r.*body)();
        } catch (const std::exception& e) {
            TVRN_LOG(LL_ERR, "diagnostic run %s ended by exception: %s", in->jobId.c_str(),
                     e.what());
            r.abort();
        } catch (...) {
            TVRN_LOG(LL_ERR, "diagnostic run %s ended by an exception", in->jobId.c_str());
            r.abort();
        }
        try {
            r._helper.updateJobState(in->jobId);
        } catch (...) {
            TVRN_LOG(LL_ERR, "diagnostic run %s: the job could not be completed",
                     in->jobId.c_str());
        }
        r._helper.workerFinished(in->jobId);
        return nullptr;
    }

    void abort() noexcept {
        try {
            elementOnline(false);
            completion(REC_UNKNOWN_FAILURE, COMPLETION_FAILED, LL_ERR);
        } catch (...) {
        }
    }

    // ---- records: each is logged with its text as well -------------------
    void service(diag_record_msg_t msg, Log_Level level = LL_INFO) {
        write(getRecordData(msg), true, COMPLETION_PASSED, level);
    }
    void completion(diag_record_msg_t msg, diag_compl_record_state_t state,
                    Log_Level level = LL_INFO) {
        write(getRecordData(msg), false, state, level);
    }
    void completion(const String& text, diag_compl_record_state_t state,
                    Log_Level level = LL_INFO) {
        write(text, false, state, level);
    }
    void write(const String& text, bool isService, diag_compl_record_state_t state,
               Log_Level level) {
        TVRN_LOG(level, "%s", text.c_str());
        _helper.generateDiagnosticRecord(text, isService, _in, state);
    }

    // ---- the element offline and back ---------------------------------
    String port() const { return _in.portMac.size() ? _in.portMac : _in.portWwn; }

    // Takes the port offline unless it already is; false (recorded) when it
    // cannot be, and the test must not run.
    bool portOffline(bool settle) {
        if (PortHelper::getPortHelperObject()->isPortDisabled(port())) {
            service(REC_PORT_ALREADY_DISABLED);
            return true;
        }
        service(REC_PORT_NOT_DISABLED);
        service(REC_DISABLING_PORT);
        if (setPortState(ProviderUtil::getIndexInColonFormat(port()), false) != 0) {
            completion(REC_PORT_DISABLE_FAILED, COMPLETION_FAILED, LL_ERR);
            return false;
        }
        _offline = PORT_OFFLINE;
        if (settle)
            _helper.pause(_in.pauseUsec);
        return true;
    }

    // Takes the adapter offline unless it is known to be disabled already;
    // false (recorded) when it cannot be.
    bool adapterOffline() {
        service(REC_CHECK_ADAPTER_DISABLED);
        bool known = false;
        const bool enabled = getAdapterStatus(_in.adapterAddress, known);
        if (known && !enabled) {
            service(REC_ADAPTER_ALREADY_DISABLED);
            return true;
        }
        service(REC_ADAPTER_NOT_DISABLED);
        service(REC_DISABLING_ADAPTER, LL_WARN);
        if (setAdapterStatus(_in.adapterAddress, false) != 0) {
            completion(String("Failed to disable the adapter"), COMPLETION_FAILED, LL_ERR);
            return false;
        }
        _offline = ADAPTER_OFFLINE;
        return true;
    }

    // Brings back what this run took offline; a failure is recorded.
    void elementOnline(bool settle) {
        if (_offline == PORT_OFFLINE) {
            _offline = NOTHING_OFFLINE;
            service(REC_ENABLING_PORT);
            if (setPortState(ProviderUtil::getIndexInColonFormat(port()), true) != 0)
                completion(String("Failed to enable the port"), COMPLETION_FAILED, LL_ERR);
            if (settle)
                _helper.pause(_in.pauseUsec);
        } else if (_offline == ADAPTER_OFFLINE) {
            _offline = NOTHING_OFFLINE;
            service(REC_ENABLING_ADAPTER, LL_WARN);
            const int ret = setAdapterStatus(_in.adapterAddress, true);
            TVRN_LOG(LL_INFO, "ret = %d adapterAddress = %s", ret, _in.adapterAddress.c_str());
            if (ret != 0)
                completion(String("Failed to enable the adapter"), COMPLETION_FAILED, LL_ERR);
        }
    }

    // ---- the four tests ---------------------------------------------------
    void memoryTest() {
        if (!adapterOffline())
            return;
        service(REC_RUNNING_MEMORY_TEST);
        service(REC_MEMORY_TEST_TAKES_TIME);
        Json::Value answer;
        const Test_Outcome outcome = callTest(
            "libDiagMemoryTest", libDiagMemoryTest,
            keyRequest("hbaWwn", ProviderUtil::getIndexInColonFormat(_in.adapterAddress)), answer);
        elementOnline(false);
        service(REC_CHECKING_MEMORY_TEST);
        if (outcome == TEST_PASSED) {
            completion(REC_MEMORY_TEST_PASSED, COMPLETION_PASSED);
            return;
        }
        if (outcome == TEST_FAILED && count(answer, "status") != 0) {
            completion(REC_MEMORY_TEST_FAILED, COMPLETION_FAILED);
            static const char* const kDetails[][2] = {{"Status         :\t0x%x", "status"},
                                                      {"Addr           :\t0x%x", "address"},
                                                      {"Expected value :\t0x%x", "expected value"},
                                                      {"Actual value   :\t0x%x", "actual value"},
                                                      {"Error state    :\t0x%x", "error status"},
                                                      {"Error address  :\t0x%x", "error address"}};
            for (const auto& d : kDetails)
                TVRN_LOG(LL_INFO, d[0], count(answer, d[1]));
            TVRN_LOG(LL_INFO, "Algorithm      :\t%s", jsonString(answer, "type").c_str());
            TVRN_LOG(LL_INFO, "Memory test run status : %s", jsonString(answer, "output").c_str());
            return;
        }
        if (outcome == TEST_FAILED)
            TVRN_LOG(LL_INFO, "Memory test run status : %s", jsonString(answer, "output").c_str());
        completion(REC_MEMORY_TEST_FAILED, COMPLETION_FAILED);
        if (outcome == TEST_UNKNOWN)
            completion(REC_UNKNOWN_FAILURE, COMPLETION_FAILED, LL_ERR);
    }

    // The FC and the Ethernet loopback test differ only in their texts, their
    // library entry and the FC test's settling pauses.
    struct Loopback_Kind {
        diag_record_msg_t check, running, checking, passed, failed;
        const char* pointer;
        JsonReqFP* entry;
        bool fc;  // sends the speed and pauses
        const char* status;
    };
    static const Loopback_Kind kFcLoopback, kEthLoopback;

    void loopbackTest() { loopback(kFcLoopback); }
    void ethLoopbackTest() { loopback(kEthLoopback); }

    void loopback(const Loopback_Kind& kind) {
        service(kind.check);
        if (!portOffline(kind.fc))
            return;
        service(kind.running);
        Json::Value request(Json::objectValue);
        request["portWwn"] = jsonText(ProviderUtil::getIndexInColonFormat(port()));
        request["mode"] = _in.mode;
        if (kind.fc)
            request["speed"] = _in.speed;
        request["dataPattern"] = _in.dataPattern;
        request["frameCount"] = _in.frameCount;
        Json::Value answer;
        const Test_Outcome outcome = callTest(kind.pointer, *kind.entry, request, answer);
        if (kind.fc)
            _helper.pause(_in.pauseUsec);
        elementOnline(kind.fc);
        service(kind.checking);
        if (outcome == TEST_PASSED) {
            completion(kind.passed, COMPLETION_PASSED);
            return;
        }
        completion(kind.failed, COMPLETION_FAILED, LL_ERR);
        if (outcome == TEST_UNKNOWN) {
            completion(REC_UNKNOWN_FAILURE, COMPLETION_FAILED, LL_ERR);
            return;
        }
        completion(recordLine("Tx frames = %u, Rx frames = %u, OSF frames = %u",
                              count(answer, "transmitFrames"), count(answer, "GoodFrameRcv"),
                              count(answer, "outstandingFrames")),
                   COMPLETION_FAILED);
        const unsigned badNumber = count(answer, "BadFrameNo");
        const unsigned badInfo = count(answer, "BadFrameInfo");
        if (badNumber != 0 || badInfo != 0)
            completion(recordLine("Mis-match frame number = %u; Mis-match frame info = %u",
                                  badNumber, badInfo),
                       COMPLETION_FAILED);
        completion(recordLine("%s : %s", kind.status, jsonString(answer, "output").c_str()),
                   COMPLETION_FAILED, LL_ERR);
    }

    void pciLoopbackTest() {
        service(REC_RUNNING_PCI_LOOPBACK);
        Json::Value request(Json::objectValue);
        request["portWwn"] = jsonText(ProviderUtil::getIndexInColonFormat(port()));
        request["dataPattern"] = _in.dataPattern;
        request["frameCount"] = _in.frameCount;
        Json::Value answer;
        const Test_Outcome outcome =
            callTest("libDiagPCILoopbackTest", libDiagPCILoopbackTest, request, answer);
        service(REC_CHECKING_PCI_LOOPBACK);
        if (outcome == TEST_PASSED) {
            completion(REC_PCI_LOOPBACK_PASSED, COMPLETION_PASSED);
            return;
        }
        if (outcome == TEST_FAILED)
            completion(recordLine("PCILoopback test run status : %s",
                                  jsonString(answer, "output").c_str()),
                       COMPLETION_FAILED, LL_ERR);
        completion(REC_PCI_LOOPBACK_FAILED, COMPLETION_FAILED);
        if (outcome == TEST_UNKNOWN)
            completion(REC_UNKNOWN_FAILURE, COMPLETION_FAILED, LL_ERR);
    }

    enum Offline { NOTHING_OFFLINE, PORT_OFFLINE, ADAPTER_OFFLINE };

    DiagnosticTestInput& _in;
    DiagnosticHelper& _helper;
    Offline _offline = NOTHING_OFFLINE;
};

const Diagnostic_Run::Loopback_Kind Diagnostic_Run::kFcLoopback = {
    REC_CHECK_PORT_DISABLED,   REC_RUNNING_LOOPBACK,  REC_CHECKING_LOOPBACK, REC_LOOPBACK_PASSED,
    REC_LOOPBACK_FAILED,       "libDiagLoopbackTest", &libDiagLoopbackTest,  true,
    "Loopback test run status"};
const Diagnostic_Run::Loopback_Kind Diagnostic_Run::kEthLoopback = {
    REC_CHECK_PORT_DISABLED_ETH,  REC_RUNNING_ETH_LOOPBACK,
    REC_CHECKING_ETH_LOOPBACK,    REC_ETH_LOOPBACK_PASSED,
    REC_ETH_LOOPBACK_FAILED,      "libDiagEthLoopbackTest",
    &libDiagEthLoopbackTest,      false,
    "EthLoopback test run status"};

// ---- the start operations -------------------------------------------------------------

namespace {

struct Loopback_Mode {
    diag_test_id_t testId;
    uint32 mode;
    const char* log;
};

const Loopback_Mode kFcModes[] = {
    {DIAG_INTERNAL_LOOPBACK_TEST, 1, "Loopback test mode : internal"},
    {DIAG_EXTERNAL_LOOPBACK_TEST, 8, "Loopback test mode : external"},
    {DIAG_SERDES_LOOPBACK_TEST, 4, "Loopback test mode : serdes"},
};

const Loopback_Mode kEthModes[] = {
    {DIAG_EXTERNAL_ETH_LOOPBACK_TEST, 8, "Eth Loopback test mode : external"},
    {DIAG_SERDES_ETH_LOOPBACK_TEST, 4, "Eth Loopback test mode : serdes"},
};

// Sets the test and mode named by `testName` (any case); false when none is.
template <size_t N>
bool selectMode(const Loopback_Mode (&modes)[N], const String& testName, DiagnosticTestInput& in) {
    for (const Loopback_Mode& m : modes) {
        if (!getDiagTestName(m.testId).equali(testName))
            continue;
        in.testId = m.testId;
        in.mode = m.mode;
        TVRN_LOG(LL_INFO, "%s", m.log);
        return true;
    }
    TVRN_LOG(LL_ERR, "No loopback test is named %s", testName.c_str());
    return false;
}

// The two forms of a port identifier: a WWN (16 characters) names an FC
// port, a MAC (12) an Ethernet port; the loopback test runs at 4 or 10 Gb/s.
struct Port_Form {
    size_t length;
    classId_t elementClass;
    String DiagnosticTestInput::*id;
    const char* name;
    uint32 speed;
};

const Port_Form kPortForms[] = {
    {16, CID_FC_PORT, &DiagnosticTestInput::portWwn, "WWN", 4},
    {12, CID_ETHERNET_PORT, &DiagnosticTestInput::portMac, "MAC", 10},
};

// The element of a port identifier; false for any other length.
bool setPortElement(const String& portId, bool withSpeed, DiagnosticTestInput& in) {
    for (const Port_Form& form : kPortForms) {
        if (portId.size() != form.length)
            continue;
        in.elementClass = form.elementClass;
        in.*form.id = portId;
        TVRN_LOG(LL_INFO, "Given Port %s : %s", form.name, portId.c_str());
        if (withSpeed) {
            in.speed = form.speed;
            TVRN_LOG(LL_INFO, "Speed chosen : %u GBS", unsigned(form.speed));
        }
        return true;
    }
    return false;
}

bool portExists(const String& portId, Json::Value& details) {
    if (PortHelper::getPortHelperObject()->getPortDetails(portId, details) == 0)
        return true;
    TVRN_LOG(LL_ERR, "Unable get Port INFO for %s", portId.c_str());
    return false;
}

}  // namespace

template <class Validate>
RunDiagResult DiagnosticHelper::startRun(const char* operation, Worker_Slot slot,
                                         Thread_Proc worker, Validate&& validate) noexcept {
    TVRN_LOG(LL_DBG, "Entering: %s", operation);
    RunDiagResult result{nullptr, 0};
    String startedJob;
    try {
        Auto_Mutex start(_startLock);
        if (isAnyJobRunning()) {
            TVRN_LOG(LL_ERR, "A diagnostic test is already running");
            result.returnCode = RUN_DIAG_RETURN_FAILED;
            return result;
        }
        std::unique_ptr<DiagnosticTestInput> input(new DiagnosticTestInput());
        result.returnCode = validate(*input);
        if (result.returnCode != 0)
            return result;
        input->owner = this;
        input->pauseUsec = settlePause();
        TVRN_LOG(LL_INFO, "Creating the Job instance.");
        const DiagnosticJob job = createDiagnosticJob(*input);
        input->jobId = job.jobId;
        addDiagnosticJob(job);
        startedJob = job.jobId;
        if (!launch(slot, worker, input.get())) {
            generateDiagnosticRecord(getRecordData(REC_UNKNOWN_FAILURE), false, *input,
                                     COMPLETION_FAILED);
            updateJobState(job.jobId);
            result.returnCode = RUN_DIAG_RETURN_FAILED;
            return result;
        }
        input.release();  // the worker's now
        startedJob = String();
        TAVRIN_ConcreteJob* ref = create<TAVRIN_ConcreteJob>(false);
        if (ref != nullptr)
            ref->InstanceID.set(job.jobId);
        result.job = ref;
        result.returnCode = RUN_DIAG_RETURN_JOB_STARTED;
    } catch (...) {
        TVRN_LOG(LL_ERR, "%s failed by an exception", operation);
        if (startedJob.size())
            updateJobState(startedJob);
        result.returnCode = RUN_DIAG_RETURN_FAILED;
    }
    TVRN_LOG(LL_DBG, "Returning: %s", operation);
    return result;
}

RunDiagResult DiagnosticHelper::runMemoryTest(const String& adapterAddress) {
    return startRun("runMemoryTest", MEMORY_PCI_SLOT, &Diagnostic_Run::memory,
                    [&](DiagnosticTestInput& in) -> uint32 {
                        TVRN_LOG(LL_INFO, "Adapter Address : %s", adapterAddress.c_str());
                        int adapterId = -1;
                        if (!guardedCall(LibCall("libGetAdapterId", adapterAddress), [&] {
                                adapterId = ProviderUtil::getAdapterId(adapterAddress);
                            }))
                            return RUN_DIAG_RETURN_FAILED;
                        if (adapterId <= 0)
                            return RUN_DIAG_RETURN_INVALID_PARAMETER;
                        TVRN_LOG(LL_INFO, "Adapter ID  : %d", adapterId);
                        in.testId = DIAG_MEMORY_TEST;
                        in.elementClass = CID_PORT_CONTROLLER;
                        in.adapterId = uint32(adapterId);
                        in.adapterAddress = adapterAddress;
                        return 0;
                    });
}

RunDiagResult DiagnosticHelper::runLoopbackTest(const String& portId, const String& testName) {
    return startRun(
        "runLoopbackTest", FC_LOOPBACK_SLOT, &Diagnostic_Run::loopback,
        [&](DiagnosticTestInput& in) -> uint32 {
            if (!setPortElement(portId, true, in)) {
                TVRN_LOG(LL_ERR, "Invalid port WWN or MAC value");
                return RUN_DIAG_RETURN_INVALID_PARAMETER;
            }
            Json::Value details;
            if (!portExists(portId, details))
                return RUN_DIAG_RETURN_FAILED;
            if (jsonBool(details, "isFCoE") &&
                getDiagTestName(DIAG_INTERNAL_LOOPBACK_TEST).equali(testName)) {
                TVRN_LOG(LL_DBG, "Returning: %s", "runLoopbackTest - RUN_DIAG_RETURN_UNSUPPORTED");
                return RUN_DIAG_RETURN_UNSUPPORTED;
            }
            in.frameCount = kLoopbackFrames;
            in.dataPattern = kDataPattern;
            return selectMode(kFcModes, testName, in) ? 0u
                                                      : uint32(RUN_DIAG_RETURN_INVALID_PARAMETER);
        });
}

RunDiagResult DiagnosticHelper::runPCILoopbackTest(const String& portId) {
    return startRun("runPCILoopbackTest", MEMORY_PCI_SLOT, &Diagnostic_Run::pciLoopback,
                    [&](DiagnosticTestInput& in) -> uint32 {
                        Json::Value details;
                        if (!setPortElement(portId, false, in)) {
                            TVRN_LOG(LL_ERR, "%s - Invalid port WWN or MAC value", portId.c_str());
                            return RUN_DIAG_RETURN_INVALID_PARAMETER;
                        }
                        if (!portExists(portId, details))
                            return RUN_DIAG_RETURN_INVALID_PARAMETER;
                        in.testId = DIAG_PCI_LOOPBACK_TEST;
                        in.frameCount = kLoopbackFrames;
                        in.dataPattern = kDataPattern;
                        return 0;
                    });
}

RunDiagResult DiagnosticHelper::runEthLoopbackTest(const String& portMac, const String& testName) {
    return startRun("runEthLoopbackTest", ETH_LOOPBACK_SLOT, &Diagnostic_Run::ethLoopback,
                    [&](DiagnosticTestInput& in) -> uint32 {
                        in.elementClass = CID_ETHERNET_PORT;
                        if (portMac.size() != 12) {
                            TVRN_LOG(LL_ERR, "Invalid port MAC value");
                            return RUN_DIAG_RETURN_INVALID_PARAMETER;
                        }
                        TVRN_LOG(LL_INFO, "Given Port MAC : %s", portMac.c_str());
                        in.portMac = portMac;
                        in.frameCount = kEthLoopbackFrames;
                        in.dataPattern = kDataPattern;
                        return selectMode(kEthModes, testName, in)
                                   ? 0u
                                   : uint32(RUN_DIAG_RETURN_INVALID_PARAMETER);
                    });
}

}  // namespace CPTA
