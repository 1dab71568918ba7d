// The adapter library's JSON answers through the inventory builders. The
// input is a simulator fixture (seeded with the simulator's own), whose
// objects the simulator hands back as the library's answers, members added,
// dropped or retyped as the fuzzer mutates them, and whose "faults" may make
// calls answer null or error objects, throw, or lose members. Every class the
// dispatchers route is then enumerated: whatever the answers, the builders
// neither crash nor leak, and every instance they return is whole.
#include <cstddef>
#include <cstdint>
#include <string>

#include "framework/Instance.h"
#include "fuzz/FuzzFixture.h"
#include "fuzz/FuzzSupport.h"
#include "gateway/ProviderInit.h"
#include "inventory/FCHBAManager.h"
#include "inventory/InventoryCommon.h"
#include "simulator/SimControl.h"

using namespace CPTA;

namespace {

template <class Manager>
void enumerateAll(Manager* manager, const InventoryRoute* routes, size_t count) {
    for (size_t r = 0; r < count; r++) {
        for (classId_t id = routes[r].first; id <= routes[r].last; id = classId_t(id + 1)) {
            Array<Instance*> instances = manager->getInstances(id);
            for (size_t i = 0; i < instances.size(); i++)
                tvrnfuzz::require(instances[i] != nullptr && instances[i]->meta_class != nullptr,
                                  "the builders return whole instances");
            destroyInstances(instances);
        }
    }
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
    tvrnfuzz::privateHome();
    tvrnfuzz::fixedHost();
    // The start-up a module does once: binds the simulator and initialises it.
    static ProviderInit init;
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    if (tvrn_sim_load_fixture_text(tvrnfuzz::quickFixture(data, size).c_str()) != 0)
        return 0;
    ProviderInit::driverStatus = 0;
    size_t count = 0;
    const InventoryRoute* routes = FCHBAManager::routes(count);
    enumerateAll(FCHBAManager::getFCHBAManager(), routes, count);
    routes = HDRManager::routes(count);
    enumerateAll(HDRManager::getHDRManager(), routes, count);
    return 0;
}
