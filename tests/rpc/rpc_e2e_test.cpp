// TAVRIN_AgentService.executeMethod of libtvrnprovider.so through the embedded
// host on the adapter-library simulator: what a CIM client sees, the up-call
// for the host's identity, and what the log keeps of a request.
#include <gtest/gtest.h>
#include <json/json.h>

#include <string>

#include "tests/rpc/Agent_Service.h"

using namespace tvrne2e;
using tvrnhost::Value;

namespace {

const char kParseFailure[] =
    "There was an error parsing the JSON text comprising the Procedure Call:\n";

// The response text of a call that must succeed with return value 0.
std::string responseText(Module_Session& s, const std::string* request) {
    const MethodResult r = executeMethod(s, agentService(s), request);
    EXPECT_TRUE(r.ok()) << r.toString();
    EXPECT_EQ(0u, r.returnValue.asUint());
    return responseOf(r);
}

Json::Value responseJson(Module_Session& s, const std::string& request) {
    Json::Value v;
    const std::string text = responseText(s, &request);
    EXPECT_TRUE(Json::Reader().parse(text, v)) << text;
    return v;
}

// Answers and errors in the output with return value 0 are in
// tests/golden/rpc.golden; a call without the request parameter is not.
TEST(ExecuteMethod, NoRequestParameterIsTextThatIsNotJson) {
    Module_Session& s = Module_Session::open();
    EXPECT_EQ(0u, responseText(s, nullptr).find(kParseFailure));
}

TEST(ExecuteMethod, HostIdentityFromTheHypervisorWhereTheLibraryHasNone) {
    Module_Session& s = Module_Session::open();
    ASSERT_EQ(0, tvrn_sim_load_fixture_text(
                     R"({"host": {"hostManufacturer": "", "hostModel": "NX"}, "adapters": []})"));
    tvrnhost::Host& host = s.host();
    host.addSubclass("VMWARE_ESXComputerSystem", "CIM_ComputerSystem");
    host.store("vmware/esxv2").defineClass("CIM_ComputerSystem");
    tvrnhost::Instance other("vmware/esxv2", "CIM_ComputerSystem");
    other.setKey("Name", Value::string("other"));
    other.set("CreationClassName", Value::string("CIM_ComputerSystem"));
    tvrnhost::Instance esx("vmware/esxv2", "VMWARE_ESXComputerSystem");
    esx.setKey("Name", Value::string("esx01"));
    esx.set("CreationClassName", Value::string("VMWARE_ESXComputerSystem"));
    esx.set("OtherIdentifyingInfo",
            Value::array(tvrnhost::Type::String,
                         {Value::string("id"), Value::string("Arvent"), Value::string("AV-9")}));
    ASSERT_TRUE(host.store("vmware/esxv2").add(other));
    ASSERT_TRUE(host.store("vmware/esxv2").add(esx));

    const Json::Value got = responseJson(s, R"({"id": 1, "method": "discovery.getHost"})");
    for (const Json::Value& where : {got["result"], got["result"]["result"]}) {
        EXPECT_EQ("Arvent", where["hostManufacturer"].asString()) << got;
        EXPECT_EQ("AV-9", where["hostModel"].asString()) << got;
    }
    host.store("vmware/esxv2").clear();
}

TEST(ExecuteMethod, LogsRequestsAsDataWithoutSecrets) {
    Module_Session& s = Module_Session::open();
    const std::string set =
        R"({"id": 1, "method": "configuration.setPortAuthentication",
            "params": ["10:00:00:05:1e:0a:0b:0c", {"authEnabled": true, "chapKey": "hunter2"}]})";
    EXPECT_TRUE(responseJson(s, set).isMember("result"));
    const Json::Value got = responseJson(
        s,
        R"({"id": 2, "method": "discovery.getPortAuthentication", "params": ["10:00:00:05:1e:0a:0b:0c"]})");
    EXPECT_EQ("hunter2", got["result"]["chapKey"].asString());  // the client gets it
    responseJson(s, R"({"id": 3, "method": "%s%s%s%n", "params": []})");

    EXPECT_EQ(0u, s.logCount("hunter2"));
    EXPECT_EQ(1u, s.logCount("\"method\":\"%s%s%s%n\""));
    EXPECT_EQ(3u, s.logCount("rpcResponse : "));
}

}  // namespace
