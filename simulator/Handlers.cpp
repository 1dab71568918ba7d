// The entry points of the simulated library, looked up in the handler
// tables of the areas under handlers/.
#include "simulator/Handlers.h"

#include "simulator/handlers/Requests.h"

namespace tvrnsim {

Json::Value errorAnswer(int code, const std::string& message) {
    Json::Value r(Json::objectValue);
    r["error"]["name"] = "LibraryError";
    r["error"]["code"] = code;
    r["error"]["message"] = message;
    return r;
}

Handler handlerFor(EntryId id) {
    using Area = Handler (*)(EntryId);
    static const Area kAreas[] = {
        statisticsHandler,           discoveryHandler,   portHandler,         remotePortHandler,
        adapterConfigurationHandler, virtualPortHandler, advIoProfileHandler, diagnosticsHandler,
        flashUpdateHandler,
    };
    for (Area area : kAreas)
        if (Handler handler = area(id))
            return handler;
    return nullptr;
}

}  // namespace tvrnsim
