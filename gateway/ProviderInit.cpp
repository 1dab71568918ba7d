#include "gateway/ProviderInit.h"

#include <cstring>

#include <json/json.h>

#include "framework/Log.h"
#include "framework/String.h"
#include "gateway/CIMProviderTfaj.h"
#include "gateway/GuardedCall.h"
#include "gateway/JsonAccess.h"
#include "gateway/ProviderUtil.h"

namespace CPTA {

int ProviderInit::driverStatus = 1;

bool ProviderInit::acceptsLogCallback(const char* version) {
    if (version == nullptr || strnlen(version, 5) < 5)
        return false;
    return version[0] > '2' && version[2] > '1' && version[4] > '0';
}

ProviderInit::ProviderInit() {
    TVRN_LOG(LL_DBG, "Inside ProviderInit Constructor.");
    try {
        start();
    } catch (...) {
        // Only an allocation failure can get here; the module must still load.
        TVRN_LOG(LL_ERR, "Adapter library start-up failed");
        driverStatus = 1;
    }
}

void ProviderInit::start() {
    setupDLLEntryPoints();

    const char* version = nullptr;
    guardedCall(LibCall("libGetAgtVersion"), [&] { version = libGetAgtVersion(); });
    // Keep our own copy: the library owns the text.
    String versionText(version);
    if (acceptsLogCallback(version))
        _logCallbackRegistered = guardedCall(LibCall("libRegisterLogMsgCb"),
                                             [] { libRegisterLogMsgCb(&ProviderUtil::logMsg); });

    const char* shown = versionText.c_str();
    if (version == nullptr)
        shown = gTfajLibLoaded ? "Unknown" : "NOT Loaded";
    TVRN_LOG(LL_INFO, "TFAJ Library version: %s", shown);

    Json::Value request(Json::objectValue);
    request["appId"] = 2;
    Json::Value answer;
    if (!guardedCall(LibCall("libInitHbaLib"), libInitHbaLib, request, answer) ||
        !ProviderUtil::isValidJsonResponse(answer)) {
        TVRN_LOG(LL_ERR, "libInitHbaLib returns NULL response or has error");
        driverStatus = 1;
        return;
    }

    int result = jsonInt(answer, "result", -1);
    if (result != 0) {
        TVRN_LOG(LL_ERR, "libInitHbaLib is failed - %d ", result);
        driverStatus = 1;
        return;
    }

    unsigned int count = 0;
    guardedCall(LibCall("libGetNumOfAdapters"), [&] { count = libGetNumOfAdapters(); });
    TVRN_LOG(LL_DBG, "Adapter Count = %d\n", int(count));
    driverStatus = count != 0 ? 0 : 1;
}

ProviderInit::~ProviderInit() {
    TVRN_LOG(LL_DBG, "Inside ProviderInit Destructor.");
    // The library stays mapped after the module is gone: it must not keep a
    // callback into code that is about to be unmapped. The callback is taken
    // back first: once told to free itself, the library is not called again.
    if (_logCallbackRegistered)
        guardedCall(LibCall("libRegisterLogMsgCb"), [] { libRegisterLogMsgCb(nullptr); });
    guardedCall(LibCall("libFreeHbaLib"), [] { libFreeHbaLib(); });
}

int ProviderInit::getDriverStatus() {
    return driverStatus;
}

}  // namespace CPTA
