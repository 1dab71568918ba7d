// Adapter event texts, as the library hands them to the event callback,
// through the translation into alert indications. Every event is dropped or
// queued as one or two indications with consecutive sequence numbers, a
// message identifier and a severity; nothing else happens to the queue.
#include <atomic>
#include <chrono>
#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "alerts/IndicationHelper.h"
#include "framework/Instance.h"
#include "fuzz/FuzzSupport.h"

using namespace CPTA;

extern "C" int LLVMFuzzerInitialize(int*, char***) {
    tvrnfuzz::privateHome();
    tvrnfuzz::fixedHost();
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    // The library hands over a NUL-terminated text.
    const std::string text(reinterpret_cast<const char*>(data), size);
    IndicationHelper& helper = *IndicationHelper::getIndicationHelperInstance();
    const int queued = helper.processEvent(text.c_str());

    std::vector<TAVRIN_AlertIndication*> produced;
    const std::atomic<bool> open(true);
    uint64 dropped = 0;
    if (helper.queue().size() > 0)
        helper.queue().takeAll(produced, std::chrono::milliseconds(0), open, dropped);
    tvrnfuzz::require(queued == 0 ? produced.empty() : produced.size() == 1 || produced.size() == 2,
                      "an event queues nothing when dropped, else one or two indications");
    for (size_t i = 0; i < produced.size(); i++) {
        const TAVRIN_AlertIndication& indication = *produced[i];
        tvrnfuzz::require(!indication.MessageID.null && indication.MessageID.value.size() > 0,
                          "every indication has a message identifier");
        tvrnfuzz::require(!indication.PerceivedSeverity.null, "every indication has a severity");
        tvrnfuzz::require(
            i == 0 || indication.SequenceNumber.value == produced[0]->SequenceNumber.value + 1,
            "the two forms of an event are numbered one after the other");
    }
    for (TAVRIN_AlertIndication* indication : produced)
        destroy(indication);
    return 0;
}
