// The provider of TAVRIN_OwningJobElement: the diagnostic job with the test
// it runs, the test whose Name begins its id (test name, "-", number).
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_OwningJobElement_Methods.h"

namespace CPTA {

namespace {

// The test name of a job: its InstanceID up to the first "-" (after any
// leading ones), of at most the first 128 characters.
void job_test_name(Key_Sink& keys, const Instance* job) {
    const Property<String>* id = text_property(job, "InstanceID");
    if (id == nullptr || id->null)
        return;
    const size_t size = id->value.size() < 128 ? id->value.size() : 128;
    const char* text = id->value.c_str();
    size_t begin = 0;
    while (begin < size && text[begin] == '-')
        begin++;
    size_t end = begin;
    while (end < size && text[end] != '-')
        end++;
    if (end == begin) {
        TVRN_LOG(LL_INFO, "Unable to fetch Test Name form Job instance id : %s", text);
        return;
    }
    keys.add(text + begin, end - begin);
}

constexpr Pairing kOwningTest =
    TVRN_PAIRING.fetch(CID_CONCRETE_JOB)
        .when_empty(LL_INFO, "No jobs are currently running in the system.")  // 0
        .fetch_diagnostic_tests()                                             // 1
        .for_each(0)
        .as("OwnedElement")
        .with_first(1, "OwningElement", key(job_test_name), key("Name"));

}  // namespace

class TAVRIN_OwningJobElement_Provider
    : public Pairing_Provider<TAVRIN_OwningJobElement, kOwningTest>,
      public TAVRIN_OwningJobElement_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(OwningJobElement)
