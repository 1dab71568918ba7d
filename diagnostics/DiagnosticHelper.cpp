// The diagnostic tests offered, the job list, the record lists and the
// instances built from them (see DiagnosticHelper.h).
#include "diagnostics/DiagnosticHelper.h"

#include <chrono>
#include <cstdio>
#include <iterator>
#include <map>
#include <string>
#include <utility>

#include <json/json.h>

#include "framework/Log.h"
#include "framework/Meta_Lookup.h"
#include "framework/Slot.h"
#include "gateway/CIMProviderTfaj.h"
#include "gateway/JsonAccess.h"
#include "gateway/ProviderUtil.h"
#include "inventory/AdapterHelper.h"
#include "inventory/EthernetPortHelper.h"
#include "inventory/FCHBAManager.h"
#include "inventory/HostIdentityScope.h"
#include "inventory/InventoryCommon.h"
#include "inventory/PortHelper.h"
#include "schema/generated/TAVRIN_AffectedJobElement.h"
#include "schema/generated/TAVRIN_CompletionRecordAppliesToElement.h"
#include "schema/generated/TAVRIN_ConcreteJob.h"
#include "schema/generated/TAVRIN_DiagnosticCompletionRecord.h"
#include "schema/generated/TAVRIN_DiagnosticServiceRecord.h"
#include "schema/generated/TAVRIN_DiagnosticSoftwareIdentity.h"
#include "schema/generated/TAVRIN_EthLoopbackDiagnosticTest.h"
#include "schema/generated/TAVRIN_LoopbackDiagnosticTest.h"
#include "schema/generated/TAVRIN_MemoryDiagnosticTest.h"
#include "schema/generated/TAVRIN_PCILoopbackDiagnosticTest.h"
#include "schema/generated/TAVRIN_ServiceRecordAppliesToElement.h"

namespace CPTA {

namespace {

const char kVendor[] = "Tavrin";
// An adapter model whose presence withdraws the external loopback tests.
const char kNoExternalLoopbackModel[] = "Tavrin-K7M";

const char* const kTestNames[] = {"--",
                                  "MemoryTest",
                                  "InternalLoopbackTest",
                                  "ExternalLoopbackTest",
                                  "SerdesLoopbackTest",
                                  "PCILoopbackTest",
                                  "ExternalEthLoopbackTest",
                                  "SerdesEthLoopbackTest",
                                  "--"};
static_assert(std::size(kTestNames) == DIAG_NAME_INVALID + 1, "one name per test id");

const char* const kRecordTexts[] = {
    "--",
    "Checking whether the adapter is disabled for running memory test",
    "Adapter is not disabled",
    "Disabling the adapter for running memory test",
    "Enabling the adapter after running memory test",
    "Running memory test on the adapter",
    "Checking for return codes for memory test run",
    "Memory test run is successful",
    "Memory test failed",
    "Running PCI Loopback test for the port",
    "Checking for return codes for PCI Loopback test run",
    "PCI Loopback test run is successful",
    "PCI Loopback test failed",
    "Checking whether the port is disabled for running loopback test",
    "Port is already disabled",
    "Port is not disabled",
    "Disabling the port for running loopback test",
    "Enabling the port after running loopback test",
    "Running loopback test for the port",
    "Checking for return codes for loopback test run",
    "Loopback test run is successful",
    "Loopback test failed",
    "Checking whether the port is disabled for running eth loopback test",
    "Disabling the port for running eth loopback test",
    "Enabling the port after running eth loopback test",
    "Running eth loopback test for the port",
    "Checking for return codes for eth loopback test run",
    "Eth loopback test run is successful",
    "Eth loopback test failed",
    "Disabling the port",
    "Enabling the port",
    "Failed to disable the port",
    "Running memory test may take a few moments",
    "Adapter is already disabled",
    "Eth loopback test aborted",
    "Unknown failure",
    "--"};
static_assert(std::size(kRecordTexts) == REC_MAX_ID + 1, "one text per record id");

// The Characteristics codes: 2 exclusive, 4 destructive, 10 needs additional
// hardware. Indexed by test id; 0 ends a row.
const uint16 kCharacteristics[][3] = {
    {0, 0, 0}, {4, 0, 0}, {4, 0, 0}, {4, 10, 0}, {4, 0, 0}, {0, 0, 0}, {4, 10, 0}, {4, 0, 0},
};

String fullTestName(diag_test_id_t testId) {
    return String(kVendor, ":", kTestNames[testId]);
}

// A text property of an element (DeviceID, ElementName), or "".
String textOf(const Instance* instance, const char* name) {
    const Meta_Property* mp = find_property(instance->meta_class, name);
    if (mp == nullptr || mp->type != STRING || mp->subscript != 0)
        return String();
    const auto* p = reinterpret_cast<const Property<String>*>(slot_of(instance, mp->offset));
    return p->null ? String() : p->value;
}

// Points reference `role` of an association at `target`, which it takes over.
void setReference(Instance* association, const char* role, Instance* target) {
    const Meta_Reference* mr = find_reference(association->meta_class, role);
    if (mr == nullptr) {
        destroy(target);
        return;
    }
    reference_in(slot_of(association, mr->offset)) = target;
}

// The elements records and jobs name, found by class and DeviceID. Each one
// is built by the walk of its class narrowed to the adapter or port its key
// names (so a look-up costs what its jobs and records cost, not what the
// host has), at most once per look-up session.
class Element_Finder {
public:
    Element_Finder() = default;
    ~Element_Finder() {
        for (auto& entry : _byKey)
            destroyInstances(entry.second);
    }
    Element_Finder(const Element_Finder&) = delete;
    Element_Finder& operator=(const Element_Finder&) = delete;

    // Null when the element is not found.
    const Instance* find(classId_t elementClass, const String& adapterAddress,
                         const String& portWwn, const String& portMac) {
        const String* key = nullptr;
        switch (elementClass) {
            case CID_PORT_CONTROLLER: key = &adapterAddress; break;
            case CID_FC_PORT: key = &portWwn; break;
            case CID_ETHERNET_PORT: key = &portMac; break;
            default: return nullptr;
        }
        if (key->size() == 0)
            return nullptr;
        const Array<Instance*>& found = instancesFor(elementClass, *key);
        for (size_t i = 0; i < found.size(); i++)
            if (found[i] != nullptr && textOf(found[i], "DeviceID").equali(*key))
                return found[i];
        return nullptr;
    }

private:
    const Array<Instance*>& instancesFor(classId_t elementClass, const String& key) {
        const std::pair<int, std::string> at(elementClass, key.c_str());
        auto known = _byKey.find(at);
        if (known != _byKey.end())
            return known->second;
        Array<Instance*> found;
        if (elementClass == CID_FC_PORT) {
            PortScope scope;
            scope.port = key;
            scope.remotes = PortScope::NO_REMOTES;
            found = PortHelper::getPortHelperObject()->getInstancesByPort(CID_FC_PORT, scope);
        } else if (elementClass == CID_ETHERNET_PORT) {
            found = EthernetPortHelper::getEthernetPortHelperObject()->getInstancesByPort(
                CID_ETHERNET_PORT, key);
        } else {
            found = AdapterHelper::getAdapterHelperInstance()->getInstancesByAddress(
                CID_PORT_CONTROLLER, key);
        }
        return _byKey[at] = found;
    }

    std::map<std::pair<int, std::string>, Array<Instance*>> _byKey;
};

template <class T>
Instance* buildTest(diag_test_id_t testId, classId_t classId, const char* elementName) {
    T* test = create<T>(true);
    if (test == nullptr)
        return nullptr;
    test->Name.set(getDiagTestName(testId));
    test->ElementName.set(String(elementName));
    test->SystemName.set(HostIdentityScope::hostText());
    test->CreationClassName.set(ProviderUtil::getClassName(classId));
    test->SystemCreationClassName.set(ProviderUtil::getClassName(CID_COMPUTER_SYSTEM));
    test->Characteristics.set(DiagnosticHelper::getDiagCharacteristics(testId));
    test->OtherCharacteristicDescription.set(String(""));
    return test;
}

// The adapter list answers with at least one adapter.
bool hostHasAdapters() {
    Json::Value answer = libGetAllAdaptersIndexString(Json::Value());
    if (!ProviderUtil::isValidJsonResponse(answer)) {
        TVRN_LOG(LL_ERR, "libGetAllAdaptersIndexString returns NULL.");
        return false;
    }
    if (jsonArray(answer, "indexStrings").empty()) {
        TVRN_LOG(LL_WARN, "No adapters in the system for running diagnostics.");
        return false;
    }
    return true;
}

// The dispatcher's routes of the diagnostic class ids; the helper itself is
// made on the first request.
Array<Instance*> diagnosticsRoute(classId_t classId) {
    return DiagnosticHelper::getDiagnosticHelperObject()->getInstancesByClass(classId);
}

struct RoutesFilledAtLoad {
    RoutesFilledAtLoad() {
        FCHBAManager::fillRoute(CID_MEMORY_DIAGNOSTIC_TEST, diagnosticsRoute);
        FCHBAManager::fillRoute(CID_AFFECTED_JOB_ELEMENT, diagnosticsRoute);
    }
} routesFilledAtLoad;

// Where a worker slot's thread comes from.
std::atomic<DiagnosticHelper::Thread_Starter> gThreadStarter{nullptr};
std::atomic<DiagnosticHelper::Unload_Gate> gUnloadGate{nullptr};

// Owns the helper. At the module's end it waits for running workers; a
// worker that is still running then keeps the helper (it is not destroyed).
struct Helper_Holder {
    DiagnosticHelper* helper;
    explicit Helper_Holder(DiagnosticHelper* h) : helper(h) {}
    ~Helper_Holder() {
        if (helper->waitForWorkers(DiagnosticHelper::UNLOAD_WAIT_USEC))
            delete helper;
    }
};

}  // namespace

String getDiagTestName(diag_test_id_t testId) {
    TVRN_LOG(LL_INFO, "Diag Test Id = %d", int(testId));
    if (testId >= DIAG_NONE && testId < DIAG_NAME_INVALID) {
        String name = fullTestName(testId);
        TVRN_LOG(LL_INFO, "Diagnostic Name = %s", name.c_str());
        return name;
    }
    TVRN_LOG(LL_INFO, "Diag Test Id is greater than DIAG_NAME_INVALID");
    return String("INVALID DIAGNOSTIC ID");
}

String getRecordData(diag_record_msg_t msg) {
    if (msg >= REC_NONE && msg < REC_MAX_ID)
        return String(kRecordTexts[msg]);
    TVRN_LOG(LL_ERR, "Record ID is greater than REC_MAX_ID");
    return String("INVALID RECORD ID");
}

// ---- the helper ------------------------------------------------------------------

DiagnosticHelper::DiagnosticHelper() : _recordCounter(0), _jobCounter(0), _startLock(false) {}

DiagnosticHelper* DiagnosticHelper::getDiagnosticHelperObject() {
    static Helper_Holder holder(new DiagnosticHelper());
    return holder.helper;
}

uint32 DiagnosticHelper::getNextRecordID() {
    return ++_recordCounter;
}

uint32 DiagnosticHelper::getNextJobID() {
    return ++_jobCounter;
}

String DiagnosticHelper::getInstanceIDForRecord(const String& jobId) {
    char number[16];
    snprintf(number, sizeof(number), ":%u", unsigned(getNextRecordID()));
    return String(jobId.c_str(), number);
}

Array<uint16> DiagnosticHelper::getDiagCharacteristics(diag_test_id_t testId) {
    Array<uint16> out;
    out.append(2);
    if (testId <= DIAG_NONE || testId >= DIAG_NAME_INVALID) {
        TVRN_LOG(LL_WARN, "WARNING! Control should never come here");
        return out;
    }
    for (uint16 code : kCharacteristics[testId])
        if (code != 0)
            out.append(code);
    return out;
}

Instance* DiagnosticHelper::getMemoryDiagnosticTestInstance(diag_test_id_t testId,
                                                            classId_t classId) {
    return buildTest<TAVRIN_MemoryDiagnosticTest>(testId, classId, "Memory Diagnostic Test");
}

Instance* DiagnosticHelper::getLoopbackDiagnosticTestInstance(diag_test_id_t testId,
                                                              classId_t classId) {
    return buildTest<TAVRIN_LoopbackDiagnosticTest>(testId, classId, "Loopback Diagnostic Test");
}

Instance* DiagnosticHelper::getPCILoopbackDiagnosticTestInstance(diag_test_id_t testId,
                                                                 classId_t classId) {
    return buildTest<TAVRIN_PCILoopbackDiagnosticTest>(testId, classId,
                                                       "PCI Loopback Diagnostic Test");
}

Instance* DiagnosticHelper::getEthLoopbackDiagnosticTestInstance(diag_test_id_t testId,
                                                                 classId_t classId) {
    return buildTest<TAVRIN_EthLoopbackDiagnosticTest>(testId, classId,
                                                       "Eth Loopback Diagnostic Test");
}

Instance* DiagnosticHelper::getDiagnosticSoftwareIdentityInstance() {
    TAVRIN_DiagnosticSoftwareIdentity* si = create<TAVRIN_DiagnosticSoftwareIdentity>(true);
    if (si == nullptr)
        return nullptr;
    si->InstanceID.set(String(kVendor, ":", "Diagnostic"));
    si->Caption.set(String("Diagnostic Software"));
    si->Description.set(String("Diagnostic Software"));
    si->ElementName.set(String("Diagnostic Software"));
    si->Name.set(String("TVRN Diagnostic Software"));
    si->Manufacturer.set(String("TVRN"));
    si->VersionString.set(ProviderUtil::getDriverVersion());
    si->MajorVersion.set(2);
    si->MinorVersion.set(2);
    si->RevisionNumber.set(0);
    si->BuildNumber.set(0);
    si->Classifications.set(arrayOf<uint16>({7}));
    si->IdentityInfoType.set(stringsOf({"SoftwareID", "SoftwareStatus"}));
    si->IdentityInfoValue.set(stringsOf({"Diagnostic Software for Tavrin Adapter", "Primary"}));
    return si;
}

Array<Instance*> DiagnosticHelper::getDiagnosticServices() {
    InstanceList out;
    out.add(getMemoryDiagnosticTestInstance(DIAG_MEMORY_TEST, CID_MEMORY_DIAGNOSTIC_TEST));
    out.add(getLoopbackDiagnosticTestInstance(DIAG_INTERNAL_LOOPBACK_TEST,
                                              CID_LOOPBACK_DIAGNOSTIC_TEST));
    out.add(
        getLoopbackDiagnosticTestInstance(DIAG_SERDES_LOOPBACK_TEST, CID_LOOPBACK_DIAGNOSTIC_TEST));
    if (!ProviderUtil::checkIfThisAdapterModelPresent(kNoExternalLoopbackModel)) {
        out.add(getLoopbackDiagnosticTestInstance(DIAG_EXTERNAL_LOOPBACK_TEST,
                                                  CID_LOOPBACK_DIAGNOSTIC_TEST));
        out.add(getEthLoopbackDiagnosticTestInstance(DIAG_SERDES_ETH_LOOPBACK_TEST,
                                                     CID_ETH_LOOPBACK_DIAGNOSTIC_TEST));
        out.add(getEthLoopbackDiagnosticTestInstance(DIAG_EXTERNAL_ETH_LOOPBACK_TEST,
                                                     CID_ETH_LOOPBACK_DIAGNOSTIC_TEST));
    }
    out.add(getPCILoopbackDiagnosticTestInstance(DIAG_PCI_LOOPBACK_TEST,
                                                 CID_PCI_LOOPBACK_DIAGNOSTIC_TEST));
    return out.release();
}

// ---- jobs ----------------------------------------------------------------------------

DiagnosticJob DiagnosticHelper::createDiagnosticJob(const DiagnosticTestInput& input) {
    char number[16];
    snprintf(number, sizeof(number), "-%u", unsigned(getNextJobID()));
    DiagnosticJob job;
    job.jobId = String(getDiagTestName(input.testId).c_str(), number);
    job.elementClass = input.elementClass;
    job.jobState = 4;
    job.startTime = Datetime::now();
    job.percentComplete = 0;
    job.adapterAddress = input.adapterAddress;
    job.portWwn = input.portWwn;
    job.portMac = input.portMac;
    return job;
}

void DiagnosticHelper::addDiagnosticJob(const DiagnosticJob& job) {
    Auto_Mutex lock(_jobLock);
    _jobs.clear();
    _jobs.push_back(job);
}

bool DiagnosticHelper::isAnyJobRunning() {
    Auto_Mutex lock(_jobLock);
    for (const DiagnosticJob& job : _jobs)
        if (job.jobState == 4)
            return true;
    return false;
}

void DiagnosticHelper::updateJobState(const String& jobId) {
    Auto_Mutex lock(_jobLock);
    for (DiagnosticJob& job : _jobs) {
        if (!job.jobId.equali(jobId))
            continue;
        job.jobState = 7;
        job.percentComplete = 100;
        const uint64 now = Datetime::now().usec();
        job.elapsedTime = Datetime(now > job.startTime.usec() ? now - job.startTime.usec() : 0);
    }
}

// ---- records -------------------------------------------------------------------------

void DiagnosticHelper::generateDiagnosticRecord(const String& text, bool isServiceRecord,
                                                const DiagnosticTestInput& input,
                                                diag_compl_record_state_t state) {
    DiagnosticRecord record;
    record.isServiceRecord = isServiceRecord;
    record.instanceId = getInstanceIDForRecord(input.jobId);
    record.creationTime = Datetime::now();
    record.recordData = text;
    record.serviceName = getDiagTestName(input.testId);
    record.recordType = isServiceRecord ? 4 : 6;
    record.completionState = uint16(state);
    record.elementClass = input.elementClass;
    record.adapterAddress = input.adapterAddress;
    record.portWwn = input.portWwn;
    record.portMac = input.portMac;
    addDiagnosticRecord(record);
}

void DiagnosticHelper::addDiagnosticRecord(const DiagnosticRecord& record) {
    Mutex& lock = record.isServiceRecord ? _serviceLock : _completionLock;
    std::deque<DiagnosticRecord>& list =
        record.isServiceRecord ? _serviceRecords : _completionRecords;
    Auto_Mutex hold(lock);
    list.push_back(record);
    while (list.size() > MAX_RECORDS)
        list.pop_front();
}

// A copy of one list: its elements are looked up (library calls) without the
// list's lock.
std::vector<DiagnosticRecord> DiagnosticHelper::copyRecords(bool service) {
    Auto_Mutex hold(service ? _serviceLock : _completionLock);
    const std::deque<DiagnosticRecord>& list = service ? _serviceRecords : _completionRecords;
    return std::vector<DiagnosticRecord>(list.begin(), list.end());
}

// ---- instances -----------------------------------------------------------------------

Instance* DiagnosticHelper::getConcreteJobInstance(const DiagnosticJob& job) {
    TAVRIN_ConcreteJob* ci = create<TAVRIN_ConcreteJob>(true);
    if (ci == nullptr)
        return nullptr;
    ci->InstanceID.set(job.jobId);
    ci->Name.set(job.jobId);
    ci->JobState.set(job.jobState);
    ci->StartTime.set(job.startTime);
    // A running job has run so far; a completed one for its whole duration.
    Datetime elapsed = job.elapsedTime;
    if (job.jobState == 4) {
        const uint64 now = Datetime::now().usec();
        elapsed = Datetime(now > job.startTime.usec() ? now - job.startTime.usec() : 0);
    }
    ci->ElapsedTime.set(elapsed);
    ci->PercentComplete.set(job.percentComplete);
    return ci;
}

namespace {

template <class R>
Instance* buildRecord(const DiagnosticRecord& record, const String& elementName,
                      const char* caption, const char* description) {
    R* r = create<R>(true);
    if (r == nullptr)
        return nullptr;
    r->Caption.set(String(caption));
    r->ElementName.set(String(caption));
    r->Description.set(String(description));
    r->InstanceID.set(record.instanceId);
    r->CreationTimeStamp.set(record.creationTime);
    r->RecordData.set(record.recordData);
    r->ServiceName.set(record.serviceName);
    r->ManagedElementName.set(elementName);
    r->RecordType.set(record.recordType);
    r->RecordFormat.set(record.recordFormat);
    return r;
}

}  // namespace

Instance* DiagnosticHelper::getDiagnosticRecordInstance(const DiagnosticRecord& record,
                                                        const String& elementName) {
    if (record.isServiceRecord)
        return buildRecord<TAVRIN_DiagnosticServiceRecord>(
            record, elementName, "Diagnostic Service Record",
            "This represents the data generated by the diagnostic service run");
    Instance* r = buildRecord<TAVRIN_DiagnosticCompletionRecord>(
        record, elementName, "Diagnostic Completion Record",
        "This represents the results generated by the diagnostic service run");
    if (r != nullptr)
        static_cast<TAVRIN_DiagnosticCompletionRecord*>(r)->CompletionState.set(
            record.completionState);
    return r;
}

Array<Instance*> DiagnosticHelper::getDiagnosticJobInstances() {
    InstanceList out;
    Auto_Mutex lock(_jobLock);
    for (const DiagnosticJob& job : _jobs)
        out.add(getConcreteJobInstance(job));
    return out.release();
}

Array<Instance*> DiagnosticHelper::recordInstances(bool service) {
    Element_Finder elements;
    InstanceList out;
    for (const DiagnosticRecord& record : copyRecords(service)) {
        const Instance* element = elements.find(record.elementClass, record.adapterAddress,
                                                record.portWwn, record.portMac);
        out.add(getDiagnosticRecordInstance(record,
                                            element ? textOf(element, "ElementName") : String()));
    }
    return out.release();
}

Array<Instance*> DiagnosticHelper::getDiagnosticServiceRecordInstances() {
    return recordInstances(true);
}

Array<Instance*> DiagnosticHelper::getDiagnosticCompletionRecordInstances() {
    return recordInstances(false);
}

namespace {

// A new association of `meta` between copies of `first` (role `firstRole`,
// taken over) and `second`; null when memory runs out.
Instance* associate(const Meta_Class* meta, const char* firstRole, Instance* first,
                    const char* secondRole, const Instance* second) {
    Instance* association = create(meta, true);
    Instance* copy = clone(second);
    if (association == nullptr || first == nullptr || copy == nullptr) {
        destroy(association);
        destroy(first);
        destroy(copy);
        return nullptr;
    }
    setReference(association, firstRole, first);
    setReference(association, secondRole, copy);
    return association;
}

}  // namespace

Array<Instance*> DiagnosticHelper::getDiagnosticAffectedJobElementInstances() {
    std::vector<DiagnosticJob> jobs;
    {
        Auto_Mutex lock(_jobLock);
        jobs = _jobs;
    }
    Element_Finder elements;
    InstanceList out;
    for (const DiagnosticJob& job : jobs) {
        const Instance* element =
            elements.find(job.elementClass, job.adapterAddress, job.portWwn, job.portMac);
        if (element == nullptr) {
            TVRN_LOG(LL_INFO, "No element found for job %s", job.jobId.c_str());
            continue;
        }
        out.add(associate(&TAVRIN_AffectedJobElement::static_meta_class, "AffectingElement",
                          getConcreteJobInstance(job), "AffectedElement", element));
    }
    return out.release();
}

Array<Instance*> DiagnosticHelper::recordAssociations(bool service) {
    const Meta_Class* meta = service ? &TAVRIN_ServiceRecordAppliesToElement::static_meta_class
                                     : &TAVRIN_CompletionRecordAppliesToElement::static_meta_class;
    Element_Finder elements;
    InstanceList out;
    for (const DiagnosticRecord& record : copyRecords(service)) {
        const Instance* element = elements.find(record.elementClass, record.adapterAddress,
                                                record.portWwn, record.portMac);
        if (element == nullptr) {
            TVRN_LOG(LL_INFO, "No element found for record %s", record.instanceId.c_str());
            continue;
        }
        out.add(associate(meta, "Antecedent",
                          getDiagnosticRecordInstance(record, textOf(element, "ElementName")),
                          "Dependent", element));
    }
    return out.release();
}

Array<Instance*> DiagnosticHelper::getServiceRecordAppliesToElementInstances() {
    return recordAssociations(true);
}

Array<Instance*> DiagnosticHelper::getCompletionRecordAppliesToElementInstances() {
    return recordAssociations(false);
}

Array<Instance*> DiagnosticHelper::getInstancesByClass(classId_t classId) {
    TVRN_LOG(LL_INFO, "Requested Class : %s", ProviderUtil::getClassName(classId).c_str());
    if (!hostHasAdapters())
        return Array<Instance*>();
    InstanceList out;
    switch (classId) {
        case CID_MEMORY_DIAGNOSTIC_TEST:
            out.add(getMemoryDiagnosticTestInstance(DIAG_MEMORY_TEST, classId));
            break;
        case CID_LOOPBACK_DIAGNOSTIC_TEST:
            out.add(getLoopbackDiagnosticTestInstance(DIAG_INTERNAL_LOOPBACK_TEST, classId));
            if (!ProviderUtil::checkIfThisAdapterModelPresent(kNoExternalLoopbackModel))
                out.add(getLoopbackDiagnosticTestInstance(DIAG_EXTERNAL_LOOPBACK_TEST, classId));
            out.add(getLoopbackDiagnosticTestInstance(DIAG_SERDES_LOOPBACK_TEST, classId));
            break;
        case CID_PCI_LOOPBACK_DIAGNOSTIC_TEST:
            out.add(getPCILoopbackDiagnosticTestInstance(DIAG_PCI_LOOPBACK_TEST, classId));
            break;
        case CID_ETH_LOOPBACK_DIAGNOSTIC_TEST:
            if (!ProviderUtil::checkIfThisAdapterModelPresent(kNoExternalLoopbackModel)) {
                out.add(
                    getEthLoopbackDiagnosticTestInstance(DIAG_EXTERNAL_ETH_LOOPBACK_TEST, classId));
                out.add(
                    getEthLoopbackDiagnosticTestInstance(DIAG_SERDES_ETH_LOOPBACK_TEST, classId));
            }
            break;
        case CID_DIAGNOSTIC_SOFTWARE_IDENTITY:
            out.add(getDiagnosticSoftwareIdentityInstance());
            break;
        case CID_CONCRETE_JOB: return getDiagnosticJobInstances();
        case CID_DIAGNOSTIC_SERVICE_RECORD: return getDiagnosticServiceRecordInstances();
        case CID_DIAGNOSTIC_COMPLETION_RECORD: return getDiagnosticCompletionRecordInstances();
        case CID_AFFECTED_JOB_ELEMENT: return getDiagnosticAffectedJobElementInstances();
        case CID_SERVICE_RECORD_APPLIES_TO_ELEMENT:
            return getServiceRecordAppliesToElementInstances();
        case CID_COMPLETION_RECORD_APPLIES_TO_ELEMENT:
            return getCompletionRecordAppliesToElementInstances();
        default: TVRN_LOG(LL_WARN, "Not supported class is requested."); break;
    }
    return out.release();
}

// ---- workers and unload ------------------------------------------------------------------

void DiagnosticHelper::setUnloadGate(Unload_Gate gate) {
    gUnloadGate.store(gate);
}

void DiagnosticHelper::setThreadStarter(Thread_Starter starter) {
    gThreadStarter.store(starter);
}

bool DiagnosticHelper::launch(Worker_Slot slot, Thread_Proc worker, DiagnosticTestInput* input) {
    // The slot's previous worker has completed its job; it ends right after.
    Slot& s = _slots[slot];
    if (s.started) {
        void* ignored = nullptr;
        Thread::join(s.thread, ignored);
        s.started = false;
    }
    Unload_Gate gate = gUnloadGate.load();
    {
        std::lock_guard<std::mutex> lock(_workerMutex);
        _running.push_back(input->jobId);
        if (gate != nullptr)
            gate(false);
    }
    Thread_Starter starter = gThreadStarter.load();
    const int rc = starter != nullptr ? starter(s.thread, worker, input)
                                      : Thread::create_joinable(s.thread, worker, input);
    if (rc == 0) {
        s.started = true;
        return true;
    }
    TVRN_LOG(LL_ERR, "Unable to start the diagnostic thread: error %d", rc);
    std::lock_guard<std::mutex> lock(_workerMutex);
    _running.pop_back();
    if (gate != nullptr)
        gate(true);
    return false;
}

void DiagnosticHelper::pause(uint64 usec) {
    std::unique_lock<std::mutex> lock(_workerMutex);
    _workerChange.wait_for(lock, std::chrono::microseconds(usec), [this] { return _stopping; });
}

// Called on the worker's thread, whose context is that of the request that
// started it: the gate opens what that start closed.
void DiagnosticHelper::workerFinished(const String& jobId) {
    std::lock_guard<std::mutex> lock(_workerMutex);
    for (auto it = _running.begin(); it != _running.end(); ++it)
        if (it->equal(jobId)) {
            _running.erase(it);
            break;
        }
    Unload_Gate gate = gUnloadGate.load();
    if (gate != nullptr && !_abandoned)
        gate(true);
    _workerChange.notify_all();
}

bool DiagnosticHelper::waitForWorkers(uint64 usec, const String& jobId) {
    Auto_Mutex start(_startLock);
    bool done;
    {
        std::unique_lock<std::mutex> lock(_workerMutex);
        auto running = [&] {
            for (const String& job : _running)
                if (jobId.size() == 0 || job.equal(jobId))
                    return true;
            return false;
        };
        if (jobId.size() != 0 && !running())
            return true;
        _stopping = true;
        _workerChange.notify_all();
        done = _workerChange.wait_for(lock, std::chrono::microseconds(usec),
                                      [&] { return !running(); });
        if (done) {
            _stopping = false;
        } else {
            _abandoned = true;
            TVRN_LOG(LL_ERR, "A diagnostic test is still running; it is left to end on its own");
        }
    }
    if (jobId.size() != 0)
        return done;  // the threads are reaped by the next start or the module's end
    for (Slot& s : _slots) {
        if (!s.started)
            continue;
        if (done) {
            void* ignored = nullptr;
            Thread::join(s.thread, ignored);
        } else {
            pthread_detach(s.thread.id());
        }
        s.started = false;
    }
    return done;
}

}  // namespace CPTA
