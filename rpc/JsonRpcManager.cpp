#include "rpc/JsonRpcManager.h"

#include <cctype>
#include <exception>
#include <memory>

#include "framework/Log.h"
#include "gateway/HbaAgentError.h"
#include "gateway/JsonAccess.h"
#include "rpc/MethodRegistration.h"
#include "rpc/RpcErrors.h"

namespace CPTA {

const char JsonRpcManager::kParseFailure[] =
    "There was an error parsing the JSON text comprising the Procedure Call:\n";

namespace {

// What is left to say when even writing a response failed (out of memory).
const char kLastResort[] =
    "{\n   \"error\" : {\n      \"code\" : 5000,\n      \"message\" : \"Unknown error that was "
    "not caught\",\n      \"name\" : \"UnCaughtError\"\n   },\n   \"version\" : \"1.1\"\n}\n";

const char kMask[] = "****";

Json::Value errorObject(const char* name, int code, const std::string& message) {
    Json::Value e(Json::objectValue);
    e["name"] = name;
    e["code"] = code;
    e["message"] = message;
    return e;
}

// Comments are allowed, as the management applications send them. The
// nesting limit keeps every later step (copies, handlers, the writer, which
// all recurse as deep as the request) well inside a server thread's stack.
const Json::CharReaderBuilder& readerBuilder() {
    static const struct Builder : Json::CharReaderBuilder {
        Builder() {
            (*this)["collectComments"] = false;
            (*this)["allowComments"] = true;
            (*this)["stackLimit"] = JsonRpcManager::kMaxNesting;
        }
    } builder;
    return builder;
}

// False with the parser's messages in `errors` when `text` is not JSON.
bool parse(const std::string& text, Json::Value& value, std::string& errors) {
    std::unique_ptr<Json::CharReader> reader(readerBuilder().newCharReader());
    try {
        return reader->parse(text.data(), text.data() + text.size(), &value, &errors);
    } catch (const std::exception& e) {  // nesting beyond the limit
        errors = std::string("* ") + e.what() + "\n";
        return false;
    }
}

bool secretName(const std::string& name) {
    std::string lower(name);
    for (char& c : lower)
        c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    for (const char* word : {"secret", "password", "passwd", "passphrase", "credential"})
        if (lower.find(word) != std::string::npos)
            return true;
    return false;
}

void maskSecrets(Json::Value& v) {
    if (v.isObject()) {
        for (const std::string& name : v.getMemberNames()) {
            if (secretName(name))
                v[name] = kMask;
            else
                maskSecrets(v[name]);
        }
    } else if (v.isArray()) {
        for (Json::Value& item : v)
            maskSecrets(item);
    }
}

}  // namespace

JsonRpcManager* JsonRpcManager::instance() {
    // Filled before it is published; a second first caller waits here. It
    // lives as long as the module: a server that unloads the module gets the
    // table's memory back.
    static struct Built {
        JsonRpcManager rpc;
        Built() { MethodRegistration::registerMethods(rpc); }
    } built;
    return &built.rpc;
}

void JsonRpcManager::_registerMethod(const std::string& name, Handler handler, bool secret) {
    _methods[name] = Method{std::move(handler), secret};
}

std::vector<std::string> JsonRpcManager::getMethods() const {
    std::vector<std::string> names;
    names.reserve(_methods.size());
    for (const auto& m : _methods)
        names.push_back(m.first);
    return names;
}

const JsonRpcManager::Method* JsonRpcManager::find(const Json::Value* name) const {
    if (name == nullptr || !name->isString())
        return nullptr;
    auto it = _methods.find(name->asString());
    return it == _methods.end() ? nullptr : &it->second;
}

void JsonRpcManager::dispatch(const Json::Value& request, Json::Value& reply) const {
    reply["version"] = "1.1";
    if (!request.isObject()) {
        const ErrorBadJsonObject e;
        reply["error"] = errorObject("USERDEFINEDError", e.code, e.message);
        return;
    }
    if (const Json::Value* id = jsonMember(request, "id"))
        reply["id"] = *id;
    const Method* method = find(jsonMember(request, "method"));
    if (method == nullptr) {
        reply["error"] = errorObject("JSONRPCError", 105, "Procedure not found");
        return;
    }
    const Json::Value* params = jsonMember(request, "params");
    static const Json::Value none;
    Json::Value error;
    try {
        Json::Value& result = reply["result"];
        method->handler(params != nullptr ? *params : none, result);
        if (result.isObject() && result.isMember("error"))
            error = result["error"];
    } catch (const HbaAgentError& e) {
        error = errorObject("USERDEFINEDError", e.code, e.message);
    } catch (const std::exception& e) {
        error = errorObject("JSONRPCError", 200, e.what());
    } catch (...) {
        error = errorObject("UnCaughtError", 5000, "Unknown error that was not caught");
    }
    if (!error.isNull()) {
        reply.removeMember("result");
        reply["error"] = std::move(error);
    }
}

void JsonRpcManager::process(const std::string& text, response& out) const noexcept {
    try {
        Json::Value request;
        std::string errors;
        if (!parse(text, request, errors)) {
            out.status = 500;
            out.body = kParseFailure + errors;
            return;
        }
        Json::Value reply(Json::objectValue);
        dispatch(request, reply);
        out.body = Json::StyledWriter().write(reply);
        out.status = 200;
    } catch (...) {
        try {
            out.body = kLastResort;
        } catch (...) {
            out.body.clear();
        }
        out.status = 200;
    }
}

bool JsonRpcManager::isSecret(const std::string& request) const {
    Json::Value value;
    std::string errors;
    if (!parse(request, value, errors))
        return false;
    const Method* method = find(jsonMember(value, "method"));
    return method != nullptr && method->secret;
}

std::string JsonRpcManager::loggable(const std::string& text, bool secret) const {
    Json::Value value;
    std::string errors;
    if (!parse(text, value, errors))
        return "(" + std::to_string(text.size()) + " bytes that are not JSON)";
    if (secret && value.isObject())
        for (const char* whole : {"params", "result"})
            if (value.isMember(whole))
                value[whole] = kMask;
    maskSecrets(value);
    Json::StreamWriterBuilder writer;
    writer["indentation"] = "";
    return Json::writeString(writer, value);
}

String JsonRpcManager::executeMethod(const Property<String>& request) noexcept {
    try {
        const bool debug = log_enabled(LL_DBG);
        if (debug)
            TVRN_LOG(LL_DBG, "Entering: %s", "executeMethod");
        const std::string text =
            request.null ? std::string() : std::string(request.value.c_str(), request.value.size());
        const JsonRpcManager* rpc = instance();
        const bool secret = debug && rpc->isSecret(text);
        if (debug)
            TVRN_LOG(LL_DBG, "rpcRequest : %s", rpc->loggable(text, secret).c_str());
        response answer;
        rpc->process(text, answer);
        if (debug) {
            // A parse failure is our own text; a response may carry secrets.
            const std::string shown =
                answer.status == 200 ? rpc->loggable(answer.body, secret) : answer.body;
            TVRN_LOG(LL_DBG, "rpcResponse : %s", shown.c_str());
            TVRN_LOG(LL_DBG, "Returning: %s", "executeMethod");
        }
        return String(answer.body.c_str(), answer.body.size());
    } catch (...) {
        return String(kLastResort);
    }
}

}  // namespace CPTA
