// The providers of the four diagnostic test classes. Their instances come
// from the inventory dispatcher like any inventory class; RunDiagnostic starts
// the test on the element it is given. A provider's source states which
// element classes its test accepts and which start operation runs it:
//
//   const Diagnostic_Start TAVRIN_MemoryDiagnosticTest_Start = {
//       {{"TAVRIN_PortController", nullptr}}, start_on<&DiagnosticHelper::runMemoryTest>};
//
// While a test it started runs, the provider may not be unloaded; unloading
// it at the server's end waits (bounded) for that test to finish.
#ifndef CPTA_PROVIDERS_DIAGNOSTIC_TEST_PROVIDER_H
#define CPTA_PROVIDERS_DIAGNOSTIC_TEST_PROVIDER_H

#include <strings.h>

#include "cmpi/cimom.h"
#include "diagnostics/DiagnosticHelper.h"
#include "providers/Association_Pairing.h"
#include "providers/Inventory_Provider.h"
#include "schema/generated/CIM_ConcreteJob.h"
#include "schema/generated/CIM_ManagedElement.h"
#include "schema/generated/TAVRIN_ConcreteJob.h"

namespace CPTA {

struct CIM_DiagnosticSetting;
struct CIM_JobSettingData;

struct Diagnostic_Target {
    const char* elementClass;  // a ManagedElement class the test accepts (any case)
    const char* message;       // logged when it is given; null for none
};

struct Diagnostic_Start {
    Diagnostic_Target targets[2];  // unused entries are null
    // Starts the test on the element with this DeviceID; testName is the
    // Name of the test instance the method was invoked on.
    RunDiagResult (*start)(DiagnosticHelper& helper, const String& deviceId,
                           const String& testName);
};

// The start operations in the form of Diagnostic_Start::start: those of a
// test kind (memory, PCI loopback) and those of the test the Name selects.
template <RunDiagResult (DiagnosticHelper::*RUN)(const String& deviceId)>
RunDiagResult start_on(DiagnosticHelper& helper, const String& deviceId, const String&) {
    return (helper.*RUN)(deviceId);
}
template <RunDiagResult (DiagnosticHelper::*RUN)(const String& deviceId, const String& testName)>
RunDiagResult start_named(DiagnosticHelper& helper, const String& deviceId,
                          const String& testName) {
    return (helper.*RUN)(deviceId, testName);
}

template <class C, const Inventory_Source& SOURCE, const Diagnostic_Start& START>
class Diagnostic_Test_Provider : public Inventory_Provider<C, SOURCE> {
public:
    Load_Status load() {
        DiagnosticHelper::setUnloadGate(&cimom::allow_unload);
        return LOAD_OK;
    }

    Unload_Status unload() {
        if (_startedJob.size() != 0)
            DiagnosticHelper::getDiagnosticHelperObject()->waitForWorkers(
                DiagnosticHelper::UNLOAD_WAIT_USEC, _startedJob);
        return UNLOAD_OK;
    }

    // DiagSetting and JobSetting are not used. The outcome is the return
    // value (4096 with the job, or 1, 4, 5); the method itself succeeds.
    Invoke_Method_Status RunDiagnostic(const C* self, const CIM_ManagedElement* ManagedElement,
                                       const CIM_DiagnosticSetting*, const CIM_JobSettingData*,
                                       CIM_ConcreteJob*& Job, Property<uint32>& return_value) {
        TVRN_LOG(LL_DBG, "Entering: %s", "RunDiagnostic");
        Job = nullptr;
        const Diagnostic_Target* target = accepted(ManagedElement);
        if (target == nullptr) {
            TVRN_LOG(LL_ERR, "Error: Invalid input object path!");
            return_value.set(RUN_DIAG_RETURN_INVALID_PARAMETER);
            return INVOKE_METHOD_OK;
        }
        if (target->message != nullptr)
            TVRN_LOG(LL_INFO, "%s", target->message);
        const String testName = self->Name.null ? String() : self->Name.value;
        const RunDiagResult result = START.start(*DiagnosticHelper::getDiagnosticHelperObject(),
                                                 deviceId(ManagedElement), testName);
        TVRN_LOG(LL_INFO, "Return value: %d", int(result.returnCode));
        if (result.job != nullptr)
            _startedJob = result.job->InstanceID.value;
        Job = static_cast<CIM_ConcreteJob*>(static_cast<Instance*>(result.job));
        return_value.set(result.returnCode);
        TVRN_LOG(LL_DBG, "Returning: %s", "RunDiagnostic");
        return INVOKE_METHOD_OK;
    }

private:
    static const Diagnostic_Target* accepted(const CIM_ManagedElement* element) {
        if (element == nullptr)
            return nullptr;
        for (const Diagnostic_Target& t : START.targets)
            if (t.elementClass != nullptr &&
                strcasecmp(t.elementClass, element->meta_class->name) == 0)
                return &t;
        return nullptr;
    }

    static String deviceId(const Instance* element) {
        const Property<String>* p = text_property(element, "DeviceID");
        return p == nullptr || p->null ? String() : p->value;
    }

    String _startedJob;  // the latest job this provider started
};

}  // namespace CPTA

#endif
