// Simulated entry points: diagnostics.
#include "simulator/handlers/Requests.h"

#include <algorithm>

namespace tvrnsim {

namespace {

Json::Value outcome(const Json::Value& defaults, const Json::Value& holder, const char* test) {
    Json::Value r = defaults;
    const Json::Value& given = holder["diagnostics"][test];
    if (given.isObject())
        for (const std::string& name : given.getMemberNames())
            r[name] = given[name];
    return r;
}

Json::Value diagMemoryTest(Call& c) {
    Json::Value& ad = c.st.model.adapter(adapterExact(c, key(c.req, "hbaWwn", Form::Any)));
    Json::Value d(Json::objectValue);
    d["failed"] = false;
    d["status"] = 0;
    for (const char* n :
         {"address", "expected value", "actual value", "error status", "error address"})
        d[n] = 0;
    d["type"] = "march";
    d["output"] = "Memory test passed";
    return outcome(d, ad, "MemoryTest");
}

Json::Value loopback(Call& c, bool eth) {
    const std::string k = key(c.req, "portWwn", eth ? Form::Mac : Form::Any);
    Json::Value& w = eth ? ethPortWrapper(c, k) : anyPortWrapper(c, k);
    const long long frames = number(c.req, "frameCount");
    number(c.req, "mode");
    number(c.req, "dataPattern");
    if (!eth)
        number(c.req, "speed");
    if (frames < 0)
        fail(kInvalidValue, "\"frameCount\" must not be negative");
    Json::Value d(Json::objectValue);
    d["failed"] = false;
    d["outstandingFrames"] = 0;
    d["GoodFrameRcv"] = static_cast<Json::UInt64>(frames);
    d["transmitFrames"] = static_cast<Json::UInt64>(frames);
    d["BadFrameNo"] = 0;
    d["BadFrameInfo"] = 0;
    d["output"] = eth ? "Ethernet loopback test passed" : "Loopback test passed";
    return outcome(d, w, eth ? "EthLoopbackTest" : "LoopbackTest");
}

Json::Value diagLoopbackTest(Call& c) {
    return loopback(c, false);
}
Json::Value diagEthLoopbackTest(Call& c) {
    return loopback(c, true);
}

Json::Value diagPCILoopbackTest(Call& c) {
    Json::Value& w = anyPortWrapper(c, key(c.req, "portWwn", Form::Any));
    number(c.req, "frameCount");
    number(c.req, "dataPattern");
    Json::Value d(Json::objectValue);
    d["failed"] = false;
    d["output"] = "PCI loopback test passed";
    return outcome(d, w, "PCILoopbackTest");
}

const char* const kTestFunctions[] = {"QuickTest", "MemoryTest", "QueueTest",    "PCILoopbackTest",
                                      "DPortTest", "LEDTest",    "LoopbackTest", "EthLoopbackTest",
                                      "EchoTest",  "FCPingTest", "FCTraceTest"};

Json::Value postDiagnostics(Call& c) {
    const std::string function = text(c.req, "function");
    if (std::none_of(std::begin(kTestFunctions), std::end(kTestFunctions),
                     [&](const char* f) { return function == f; }))
        fail(kInvalidValue, "unknown test function " + function);
    const std::string id = requestId(c.req);
    if (has(c.req, "hbaWwn"))
        adapterExact(c, key(c.req, "hbaWwn", Form::Any));
    if (has(c.req, "portWwn"))
        anyPortWrapper(c, key(c.req, "portWwn", Form::Any));
    for (const char* name : {"localPortWwn", "remotePortWwn"})
        if (has(c.req, name))
            key(c.req, name, Form::Wwn);
    DiagRequest& dr = c.st.diagRequests[id];
    if (dr.state != "posted")
        fail(kInvalidState, "tests of request " + id + " were already started");
    Json::Value t(Json::objectValue);
    t["function"] = function;
    t["request"] = c.req;
    dr.tests.append(t);
    Json::Value r = ok();
    r["requestID"] = id;
    r["function"] = function;
    r["testIndex"] = dr.tests.size() - 1;
    return r;
}

DiagRequest& diagRequest(Call& c, const std::string& id) {
    auto it = c.st.diagRequests.find(id);
    if (it == c.st.diagRequests.end())
        fail(kNotFound, "no diagnostic request " + id);
    DiagRequest& dr = it->second;
    if (dr.state == "running" &&
        std::chrono::steady_clock::now() - dr.started >= std::chrono::milliseconds(dr.durationMs))
        dr.state = "completed";
    return dr;
}

Json::Value startTests(Call& c) {
    const std::string id = requestId(c.req);
    const bool stopOnError = flag(c.req, "stopOnError");
    DiagRequest& dr = diagRequest(c, id);
    if (dr.state != "posted")
        fail(kInvalidState, "tests of request " + id + " were already started");
    dr.stopOnError = stopOnError;
    for (const Json::Value& t : dr.tests) {
        const std::string function = t["function"].asString();
        const Json::Value& req = t["request"];
        Json::Value d(Json::objectValue);
        d["function"] = function;
        d["failed"] = false;
        d["status"] = 0;
        d["output"] = function + " passed";
        Json::Value res = d;
        FcPortRef f;
        EthPortRef e;
        const std::string port = req.get("portWwn", "").asString();
        if (c.st.model.findFcPort(port, f))
            res = outcome(d, c.st.model.fcPort(f.a, f.p), function.c_str());
        else if (c.st.model.findEthPort(port, e))
            res = outcome(d, c.st.model.ethPort(e.a, e.e), function.c_str());
        else if (c.st.model.findAdapter(req.get("hbaWwn", "").asString()) >= 0)
            res = outcome(d, c.st.model.adapter(c.st.model.findAdapter(req["hbaWwn"].asString())),
                          function.c_str());
        dr.results.append(res);
        if (stopOnError && res["failed"].asBool())
            break;
    }
    dr.started = std::chrono::steady_clock::now();
    dr.durationMs = c.st.model.root().get("diagnosticDurationMs", 0).asInt();
    dr.state = dr.durationMs > 0 ? "running" : "completed";
    Json::Value r = ok();
    r["requestID"] = id;
    r["state"] = dr.state;
    return r;
}

Json::Value getDiagnosticsResults(Call& c) {
    const std::string id = requestId(c.req);
    DiagRequest& dr = diagRequest(c, id);
    Json::Value r(Json::objectValue);
    r["requestID"] = id;
    r["state"] = dr.state;
    r["stopOnError"] = dr.stopOnError;
    r["results"] = dr.state == "completed" ? dr.results : Json::Value(Json::arrayValue);
    return r;
}

Json::Value cancelTests(Call& c) {
    const std::string id = requestId(c.req);
    DiagRequest& dr = diagRequest(c, id);
    if (dr.state == "completed")
        fail(kInvalidState, "tests of request " + id + " have completed");
    dr.state = "cancelled";
    Json::Value r = ok();
    r["requestID"] = id;
    r["state"] = dr.state;
    return r;
}

Json::Value setDport(Call& c) {
    const std::string id = requestId(c.req);
    Json::Value& w = fcPortWrapper(c, key(c.req, "portWwn", Form::Wwn));
    const bool state = flag(c.req, "state");
    w["dport"]["enabled"] = state;
    Json::Value r = ok();
    r["requestID"] = id;
    r["dportEnabled"] = state;
    return r;
}

Json::Value getDPortTestResult(Call& c) {
    Json::Value& w = fcPortWrapper(c, key(c.req, "portWwn", Form::Wwn));
    const bool enabled = w["dport"]["enabled"].asBool();
    Json::Value r(Json::objectValue);
    r["portWwn"] = w["port"]["wwn"];
    r["dportEnabled"] = enabled;
    if (w["dportResult"].isObject()) {
        r["result"] = w["dportResult"];
    } else {
        r["result"]["status"] = enabled ? "passed" : "not run";
    }
    return r;
}

const HandlerRow kRows[] = {
    {EP_getDiagnosticsResults, getDiagnosticsResults},
    {EP_getDPortTestResult, getDPortTestResult},
    {EP_setDport, setDport},
    {EP_startTests, startTests},
    {EP_cancelTests, cancelTests},
    {EP_postDiagnostics, postDiagnostics},
    {EP_diagEthLoopbackTest, diagEthLoopbackTest},
    {EP_diagLoopbackTest, diagLoopbackTest},
    {EP_diagMemoryTest, diagMemoryTest},
    {EP_diagPCILoopbackTest, diagPCILoopbackTest},
};

}  // namespace

Handler diagnosticsHandler(EntryId id) {
    return findHandler(kRows, id);
}

}  // namespace tvrnsim
