#include "gateway/CIMProviderTfaj.h"

#include <dlfcn.h>

#include <mutex>

#include "framework/Log.h"

namespace CPTA {

Json::Value default_JsonReqFP(const Json::Value&) {
    return Json::Value();
}
int default_voidRetIntFP() {
    return -1;
}
unsigned int default_voidRetUIntFP() {
    return 0xFFFF;
}
const char* default_voidRetStrFP() {
    return nullptr;
}
void default_evtProcessCBRetVoidFP(EvtProcessCB) {}
void default_log4cxxMsgRetVoidFP(LogMsgCB) {}
void default_JsonReqVoidFP(const Json::Value&) {}

// Constant-initialised to the fallbacks, so no pointer is ever empty.
#define ENTRY_POINT(kind, symbol, pointer) TVRN_EP_TYPE_##kind pointer = TVRN_EP_DEFAULT_##kind;
#include "gateway/EntryPoints.def"
#undef ENTRY_POINT

#define ENTRY_POINT(kind, symbol, pointer) +1
const int kEntryPointCount = 0
#include "gateway/EntryPoints.def"
    ;
#undef ENTRY_POINT

void* libHandle = nullptr;
bool gTfajLibLoaded = false;

namespace {

const char kLibraryName[] = "libdtfaj.so";

// Points `slot` at the library's symbol, or at `fallback` when there is no
// library or the library lacks the symbol.
template <typename FP>
void bindEntryPoint(FP& slot, FP fallback, const char* symbol) {
    slot = fallback;
    if (libHandle == nullptr)
        return;
    dlerror();
    void* address = dlsym(libHandle, symbol);
    const char* error = dlerror();
    if (error != nullptr) {
        TVRN_LOG(LL_ERR, "%s not found. %s ", symbol, error);
        return;
    }
    if (address != nullptr)
        slot = reinterpret_cast<FP>(address);
}

void bindAll() {
    TVRN_LOG(LL_DBG, "inside setupDLLEntryPoints");

    dlerror();
    libHandle = dlopen(kLibraryName, RTLD_NOW);
    const char* error = dlerror();
    if (libHandle == nullptr)
        TVRN_LOG(LL_DBG, "Error in loading library: %s", error != nullptr ? error : "");
    else
        gTfajLibLoaded = true;

#define ENTRY_POINT(kind, symbol, pointer) \
    bindEntryPoint<TVRN_EP_TYPE_##kind>(pointer, TVRN_EP_DEFAULT_##kind, #symbol);
#include "gateway/EntryPoints.def"
#undef ENTRY_POINT
}

}  // namespace

void setupDLLEntryPoints() {
    static std::once_flag bound;
    std::call_once(bound, bindAll);
}

}  // namespace CPTA
