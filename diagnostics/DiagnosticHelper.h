// Diagnostics: the tests this host offers, the job of the latest test run and
// the service and completion records that runs leave behind, all kept in
// memory for the life of the module; and the runs themselves, each on a worker
// thread of its own (DiagnosticRuns.cpp).
//
// A run: RunDiagnostic calls a start operation (runMemoryTest, ...), which
// checks that no job is running, validates the element, creates the job
// (state 4, Running) and starts the worker; these steps are one, under the
// start lock, so two requests arriving together start one job. The worker
// takes the port or adapter offline when the test needs it, calls the adapter
// library's test, brings the element back, writes its records and only then
// completes the job (state 7, 100 percent). Whatever fails inside a worker
// (a library call that fails or throws, an answer without a verdict) ends the
// run with a completion record of state 5; no job is left running. A
// destructive test never runs on an element that could not be taken offline,
// and only what the worker took offline is brought back online.
//
// While a worker runs, the provider that started it may not be unloaded (the
// start operation clears the unload flag through the gate the providers set,
// the worker sets it again as it ends), and waitForWorkers() is what unload
// and the module's own end wait on (bounded), so that no worker runs on in an
// unloaded module.
//
// Pauses: the FC loopback run pauses 2 seconds after taking the port offline,
// after the test and after bringing the port back, so that the link settles.
// The environment variable TVRN_DIAG_PAUSE_MS (milliseconds), read at each
// start, shortens them. It exists for the tests, which set it to 0; production
// never sets it, and it can only shorten a pause.
#ifndef CPTA_DIAGNOSTICS_DIAGNOSTICHELPER_H
#define CPTA_DIAGNOSTICS_DIAGNOSTICHELPER_H

#include <atomic>
#include <condition_variable>
#include <deque>
#include <mutex>
#include <vector>

#include "framework/Array.h"
#include "framework/Datetime.h"
#include "framework/Instance.h"
#include "framework/Mutex.h"
#include "framework/String.h"
#include "framework/Thread.h"
#include "gateway/ClassId.h"

namespace CPTA {

struct TAVRIN_ConcreteJob;

// The test kinds; each indexes the test-name table.
enum diag_test_id_t {
    DIAG_NONE = 0,
    DIAG_MEMORY_TEST = 1,
    DIAG_INTERNAL_LOOPBACK_TEST = 2,
    DIAG_EXTERNAL_LOOPBACK_TEST = 3,
    DIAG_SERDES_LOOPBACK_TEST = 4,
    DIAG_PCI_LOOPBACK_TEST = 5,
    DIAG_EXTERNAL_ETH_LOOPBACK_TEST = 6,
    DIAG_SERDES_ETH_LOOPBACK_TEST = 7,
    DIAG_NAME_INVALID = 8
};

// The texts of records; each indexes the record-text table.
enum diag_record_msg_t {
    REC_NONE = 0,
    REC_CHECK_ADAPTER_DISABLED = 1,
    REC_ADAPTER_NOT_DISABLED = 2,
    REC_DISABLING_ADAPTER = 3,
    REC_ENABLING_ADAPTER = 4,
    REC_RUNNING_MEMORY_TEST = 5,
    REC_CHECKING_MEMORY_TEST = 6,
    REC_MEMORY_TEST_PASSED = 7,
    REC_MEMORY_TEST_FAILED = 8,
    REC_RUNNING_PCI_LOOPBACK = 9,
    REC_CHECKING_PCI_LOOPBACK = 10,
    REC_PCI_LOOPBACK_PASSED = 11,
    REC_PCI_LOOPBACK_FAILED = 12,
    REC_CHECK_PORT_DISABLED = 13,
    REC_PORT_ALREADY_DISABLED = 14,
    REC_PORT_NOT_DISABLED = 15,
    REC_DISABLING_PORT_FOR_LOOPBACK = 16,
    REC_ENABLING_PORT_AFTER_LOOPBACK = 17,
    REC_RUNNING_LOOPBACK = 18,
    REC_CHECKING_LOOPBACK = 19,
    REC_LOOPBACK_PASSED = 20,
    REC_LOOPBACK_FAILED = 21,
    REC_CHECK_PORT_DISABLED_ETH = 22,
    REC_DISABLING_PORT_FOR_ETH = 23,
    REC_ENABLING_PORT_AFTER_ETH = 24,
    REC_RUNNING_ETH_LOOPBACK = 25,
    REC_CHECKING_ETH_LOOPBACK = 26,
    REC_ETH_LOOPBACK_PASSED = 27,
    REC_ETH_LOOPBACK_FAILED = 28,
    REC_DISABLING_PORT = 29,
    REC_ENABLING_PORT = 30,
    REC_PORT_DISABLE_FAILED = 31,
    REC_MEMORY_TEST_TAKES_TIME = 32,
    REC_ADAPTER_ALREADY_DISABLED = 33,
    REC_ETH_LOOPBACK_ABORTED = 34,
    REC_UNKNOWN_FAILURE = 35,
    REC_MAX_ID = 36
};

// Completion state of a completion record.
enum diag_compl_record_state_t { COMPLETION_PASSED = 2, COMPLETION_FAILED = 5 };

// RunDiagnostic's return values.
enum RunDiagReturn : uint32 {
    RUN_DIAG_RETURN_UNSUPPORTED = 1,
    RUN_DIAG_RETURN_FAILED = 4,
    RUN_DIAG_RETURN_INVALID_PARAMETER = 5,
    RUN_DIAG_RETURN_JOB_STARTED = 4096
};

// "Tavrin:" + the table entry for 1 to 7; "INVALID DIAGNOSTIC ID" above.
String getDiagTestName(diag_test_id_t testId);
// The table text below REC_MAX_ID; "INVALID RECORD ID" otherwise.
String getRecordData(diag_record_msg_t msg);

class DiagnosticHelper;

// One requested run, made by a start operation and owned by its worker.
struct DiagnosticTestInput {
    diag_test_id_t testId = DIAG_NONE;
    String jobId;
    classId_t elementClass = CID_NONE;  // 2 port controller, 3 FC port, 20 Ethernet port
    uint32 adapterId = 0;               // memory test only
    String adapterAddress;              // DeviceID of the port controller (memory test)
    String portWwn;                     // 16 hex digits, for an FC port
    String portMac;                     // 12 hex digits, for an Ethernet port
    uint32 frameCount = 0;
    uint32 dataPattern = 0;
    uint32 mode = 0;
    uint32 speed = 0;
    DiagnosticHelper* owner = nullptr;
    uint64 pauseUsec = 0;  // the FC loopback pauses
};

// One run as the job list keeps it.
struct DiagnosticJob {
    String jobId;  // also InstanceID and Name of the job instance
    classId_t elementClass = CID_NONE;
    uint16 jobState = 4;  // 4 Running, 7 Completed
    Datetime startTime;
    Datetime elapsedTime;  // set when the job completes
    uint16 percentComplete = 0;
    String adapterAddress, portWwn, portMac;
};

// One service or completion record.
struct DiagnosticRecord {
    bool isServiceRecord = true;
    String instanceId;  // job id ":" record number
    Datetime creationTime;
    String recordData;
    String serviceName;
    String recordFormat;
    uint16 recordType = 4;  // 4 service, 6 completion
    classId_t elementClass = CID_NONE;
    String adapterAddress, portWwn, portMac;
    uint16 completionState = COMPLETION_PASSED;
};

// What a start operation gives RunDiagnostic: the job reference (a
// TAVRIN_ConcreteJob with its InstanceID, owned by the caller; null unless a
// job started) and the return value.
struct RunDiagResult {
    TAVRIN_ConcreteJob* job;
    uint32 returnCode;
};

class DiagnosticHelper {
public:
    // The one helper, made on first use; it waits for running workers when
    // the module ends.
    static DiagnosticHelper* getDiagnosticHelperObject();

    // ---- numbering ---------------------------------------------------------
    // Process-wide, from 1, across jobs and record kinds.
    uint32 getNextRecordID();
    uint32 getNextJobID();
    String getInstanceIDForRecord(const String& jobId);

    // ---- the tests offered -------------------------------------------------
    static Array<uint16> getDiagCharacteristics(diag_test_id_t testId);
    Instance* getMemoryDiagnosticTestInstance(diag_test_id_t testId, classId_t classId);
    Instance* getLoopbackDiagnosticTestInstance(diag_test_id_t testId, classId_t classId);
    Instance* getPCILoopbackDiagnosticTestInstance(diag_test_id_t testId, classId_t classId);
    Instance* getEthLoopbackDiagnosticTestInstance(diag_test_id_t testId, classId_t classId);
    Instance* getDiagnosticSoftwareIdentityInstance();
    // Every test instance this host offers (without asking for adapters).
    Array<Instance*> getDiagnosticServices();

    // ---- jobs and records --------------------------------------------------
    DiagnosticJob createDiagnosticJob(const DiagnosticTestInput& input);
    // Replaces the listed job: the list holds the latest job only.
    void addDiagnosticJob(const DiagnosticJob& job);
    bool isAnyJobRunning();
    // Completes the job (any case of its id): state 7, 100 percent, and its
    // elapsed time.
    void updateJobState(const String& jobId);
    void generateDiagnosticRecord(const String& text, bool isServiceRecord,
                                  const DiagnosticTestInput& input,
                                  diag_compl_record_state_t state);
    // Appends to the record's list, which keeps the latest MAX_RECORDS.
    void addDiagnosticRecord(const DiagnosticRecord& record);
    static constexpr size_t MAX_RECORDS = 100;

    // ---- instances ---------------------------------------------------------
    Instance* getConcreteJobInstance(const DiagnosticJob& job);
    // `elementName` is the ElementName of the record's element ("" when none).
    Instance* getDiagnosticRecordInstance(const DiagnosticRecord& record,
                                          const String& elementName);
    Array<Instance*> getDiagnosticJobInstances();
    Array<Instance*> getDiagnosticServiceRecordInstances();
    Array<Instance*> getDiagnosticCompletionRecordInstances();
    // An association whose element is not found is left out.
    Array<Instance*> getDiagnosticAffectedJobElementInstances();
    Array<Instance*> getServiceRecordAppliesToElementInstances();
    Array<Instance*> getCompletionRecordAppliesToElementInstances();
    // The instances of diagnostic class id 21 to 28 or 31 to 33; empty when
    // the host has no adapter.
    Array<Instance*> getInstancesByClass(classId_t classId);

    // ---- test runs (DiagnosticRuns.cpp) --------------------------------------
    // `adapterAddress` is the DeviceID of a port controller, `portId` that of
    // an FC port (16 hex digits) or Ethernet port (12), `testName` the Name of
    // the test instance RunDiagnostic was invoked on.
    RunDiagResult runMemoryTest(const String& adapterAddress);
    RunDiagResult runLoopbackTest(const String& portId, const String& testName);
    RunDiagResult runPCILoopbackTest(const String& portId);
    RunDiagResult runEthLoopbackTest(const String& portMac, const String& testName);

    // ---- workers and unload ----------------------------------------------------
    // Called with false by a start (on the request thread) and with true when
    // its worker ends (on the worker thread); the providers set it to
    // cimom::allow_unload.
    typedef void (*Unload_Gate)(bool allowed);
    static void setUnloadGate(Unload_Gate gate);
    // Cuts the pauses of a running worker short and waits until no worker
    // runs, at most `usec`; then reaps the threads. False when a worker still
    // runs (it is then left to end on its own, logged). With a job id, only
    // the worker of that job is waited for, if it still runs, and no thread
    // is reaped.
    bool waitForWorkers(uint64 usec, const String& jobId = String());
    static constexpr uint64 UNLOAD_WAIT_USEC = 30000000;  // 30 seconds

    // How workers are started: Thread::create_joinable unless a test replaces
    // it (null restores it) to see a start fail.
    typedef int (*Thread_Starter)(Thread& thread, Thread_Proc proc, void* arg);
    static void setThreadStarter(Thread_Starter starter);

    // The three worker thread slots.
    enum Worker_Slot { MEMORY_PCI_SLOT, FC_LOOPBACK_SLOT, ETH_LOOPBACK_SLOT, WORKER_SLOTS };

private:
    friend class Diagnostic_Run;

    DiagnosticHelper();
    DiagnosticHelper(const DiagnosticHelper&) = delete;
    DiagnosticHelper& operator=(const DiagnosticHelper&) = delete;

    template <class Validate>
    RunDiagResult startRun(const char* operation, Worker_Slot slot, Thread_Proc worker,
                           Validate&& validate) noexcept;
    bool launch(Worker_Slot slot, Thread_Proc worker, DiagnosticTestInput* input);
    // For the workers: a pause that unload cuts short, and the end of a worker.
    void pause(uint64 usec);
    void workerFinished(const String& jobId);

    std::vector<DiagnosticRecord> copyRecords(bool service);
    Array<Instance*> recordInstances(bool service);
    Array<Instance*> recordAssociations(bool service);

    std::atomic<uint32> _recordCounter;
    std::atomic<uint32> _jobCounter;

    Mutex _serviceLock;  // each list has its own lock; none is held with another
    std::deque<DiagnosticRecord> _serviceRecords;
    Mutex _completionLock;
    std::deque<DiagnosticRecord> _completionRecords;
    Mutex _jobLock;
    std::vector<DiagnosticJob> _jobs;

    // Held from the check for a running job to the start of the worker.
    Mutex _startLock;

    // The workers: guarded by _workerMutex (the slots by _startLock as well).
    std::mutex _workerMutex;
    std::condition_variable _workerChange;
    struct Slot {
        Thread thread;
        bool started = false;
    } _slots[WORKER_SLOTS];
    std::vector<String> _running;  // the jobs whose workers run
    bool _stopping = false;        // pauses end at once
    bool _abandoned = false;       // unload gave up waiting: no gate calls any more
};

// The element state operations of the runs (keys colon-free or in colon form).
// Whether the adapter is enabled; `known` is false when the library could not
// tell (the answer is then false).
bool getAdapterStatus(const String& adapterAddress, bool& known);
// 0, or -1 when the library refuses or fails.
int setAdapterStatus(const String& adapterAddress, bool enable);
int setPortState(const String& port, bool enable);

}  // namespace CPTA

#endif
