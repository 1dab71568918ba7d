// JSON-RPC request texts through the management tunnel, as a client sends
// them: TAVRIN_AgentService.executeMethod of the module loaded in the embedded
// host, the module's dispatcher and its methods, down to the simulator (reset
// to the start-up host before every input, so that changes made by one input
// never reach the next).
//
// The input is the request text itself. Its leading comment lines (the
// dispatcher reads comments as blanks) may inject faults first:
//
//   // fault <entryPoint> <kind> [<code> [<text>]]
//
// kind: null, error, agent, exception, throw, drop, retype (see SimControl.h;
// drop and retype name the member in <text>). Whatever the request and the
// library's answers, executeMethod succeeds with return value 0 and a
// response: the parse failure text, or a JSON object of version "1.1" with
// either a result or a whole error object. The module logs at DBG (into
// /dev/null), so that the masking of what it logs of requests and responses
// reads every input too.
#include <sys/stat.h>
#include <unistd.h>

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <fstream>
#include <iostream>
#include <map>
#include <memory>
#include <sstream>
#include <string>

#include <json/json.h>

#include "fuzz/FuzzSupport.h"
#include "host/classinfo.h"
#include "host/host.h"
#include "simulator/SimControl.h"

namespace {

const char kNameSpace[] = "root/tavrin";
const char kParseFailure[] = "There was an error parsing the JSON text";

tvrnhost::Host* gHost = nullptr;
tvrnhost::ObjectPath gAgent;

// The fault lines at the head of the request.
void injectFaults(const std::string& text) {
    static const std::map<std::string, int> kKinds = {
        {"null", TVRN_SIM_FAULT_NULL_ANSWER},      {"error", TVRN_SIM_FAULT_ERROR_OBJECT},
        {"agent", TVRN_SIM_FAULT_HBA_AGENT_ERROR}, {"exception", TVRN_SIM_FAULT_STD_EXCEPTION},
        {"throw", TVRN_SIM_FAULT_NON_STANDARD},    {"drop", TVRN_SIM_FAULT_DROP_MEMBER},
        {"retype", TVRN_SIM_FAULT_WRONG_TYPE},
    };
    std::istringstream lines(text);
    std::string line;
    for (int n = 0; n < 8 && std::getline(lines, line) && line.rfind("// fault ", 0) == 0; n++) {
        std::istringstream words(line.substr(9));
        std::string entry, kind, message;
        int code = 0;
        words >> entry >> kind >> code;
        std::getline(words >> std::ws, message);
        auto k = kKinds.find(kind);
        if (k != kKinds.end())
            tvrn_sim_set_fault(entry.c_str(), "", k->second, code, message.c_str(), 0);
    }
}

// The module's log configuration in the private HOME: every level, written
// to /dev/null. Taken away at exit, so that the directory can go.
void logEverything() {
    static const std::string home = std::getenv("HOME");
    std::ofstream(home + "/.cimplerc") << "LOG_LEVEL = DBG\n";
    mkdir((home + "/.cimple").c_str(), 0700);
    if (symlink("/dev/null", (home + "/.cimple/messages").c_str()) != 0)
        std::abort();
    std::atexit([] {
        for (const char* name : {"/.cimple/messages", "/.cimple/messages.lock", "/.cimplerc"})
            unlink((home + name).c_str());
        rmdir((home + "/.cimple").c_str());
    });
}

bool wholeError(const Json::Value& error) {
    return error.isObject() && error["name"].isString() && error["code"].isInt() &&
           error["message"].isString();
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
    tvrnfuzz::privateHome();
    logEverything();
    tvrn_sim_reset();
    tvrnhost::HostOptions options;
    options.classes = tvrnhost::classinfo::moduleCatalog().classes();
    options.keepMapped = true;
    // Never unloaded: the module stays for the life of the process.
    gHost = new tvrnhost::Host(options);
    const tvrnhost::Status loaded = gHost->load(TVRN_MODULE, TVRN_MODULE_REG);
    auto agents = gHost->enumerateInstanceNames(kNameSpace, "TAVRIN_AgentService");
    if (!loaded.ok() || !agents.ok() || agents.items.size() != 1) {
        std::cerr << "rpc_request: no agent service in the module: " << loaded.toString() << "\n";
        std::abort();
    }
    gAgent = agents.items.front();
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    const std::string text(reinterpret_cast<const char*>(data), size);
    tvrn_sim_reset();
    injectFaults(text);
    const tvrnhost::MethodResult r = gHost->invokeMethod(
        gAgent, "executeMethod", {tvrnhost::Property{"request", tvrnhost::Value::string(text)}});
    tvrn_sim_clear_faults();

    tvrnfuzz::require(r.ok() && !r.returnValue.isNull() && r.returnValue.asUint() == 0,
                      "executeMethod succeeds with return value 0");
    const tvrnhost::Value* response = r.outArg("response");
    tvrnfuzz::require(response != nullptr && !response->isNull() && !response->asString().empty(),
                      "executeMethod answers a response");
    const std::string& body = response->asString();
    if (body.rfind(kParseFailure, 0) == 0)
        return 0;
    Json::Value reply;
    std::string errors;
    std::unique_ptr<Json::CharReader> reader(Json::CharReaderBuilder().newCharReader());
    tvrnfuzz::require(
        reader->parse(body.data(), body.data() + body.size(), &reply, &errors) && reply.isObject(),
        "the response is a JSON object");
    tvrnfuzz::require(reply["version"] == "1.1", "the response is of version 1.1");
    const bool result = reply.isMember("result"), error = reply.isMember("error");
    tvrnfuzz::require(result != error, "the response holds either a result or an error");
    tvrnfuzz::require(!error || wholeError(reply["error"]),
                      "an error has a name, code and message");
    return 0;
}
