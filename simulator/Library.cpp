#include "simulator/Library.h"

#include "gateway/HbaAgentError.h"
#include "simulator/BuiltinFixture.h"
#include "simulator/SimControl.h"

#include <dlfcn.h>
#include <sys/stat.h>

#include <cerrno>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <memory>
#include <sstream>
#include <stdexcept>
#include <thread>

namespace tvrnsim {

namespace {

const char kDefaultVersion[] = "3.2.1";
const size_t kMaxPendingLogs = 64;
const size_t kMaxRecordedCalls = 100000;
const int kMaxDelayMs = 600000;
const char kBuiltinSource[] = "built-in host";

std::atomic<Library*> gInstance{nullptr};

const char* baseName(const char* path) {
    const char* slash = std::strrchr(path, '/');
    return slash ? slash + 1 : path;
}

struct KindName {
    const char* name;
    int kind;
};
const KindName kKindNames[] = {
    {"null", TVRN_SIM_FAULT_NULL_ANSWER},
    {"error", TVRN_SIM_FAULT_ERROR_OBJECT},
    {"hbaAgentError", TVRN_SIM_FAULT_HBA_AGENT_ERROR},
    {"stdException", TVRN_SIM_FAULT_STD_EXCEPTION},
    {"nonStandardException", TVRN_SIM_FAULT_NON_STANDARD},
    {"dropMember", TVRN_SIM_FAULT_DROP_MEMBER},
    {"wrongType", TVRN_SIM_FAULT_WRONG_TYPE},
    {"delay", TVRN_SIM_FAULT_DELAY},
};

bool isMemberFault(int kind) {
    return kind == TVRN_SIM_FAULT_DROP_MEMBER || kind == TVRN_SIM_FAULT_WRONG_TYPE;
}

bool validFault(int id, int kind, int code, const std::string& text) {
    if (id < 0 || kEntries[id].kind != EntryKind::JSON)
        return false;
    if (kind < TVRN_SIM_FAULT_NULL_ANSWER || kind > TVRN_SIM_FAULT_DELAY)
        return false;
    if (isMemberFault(kind) && text.empty())
        return false;
    if (kind == TVRN_SIM_FAULT_DELAY && (code < 0 || code > kMaxDelayMs))
        return false;
    return true;
}

// "default" and "default.json" name the built-in host.
bool isBuiltinName(const std::string& name) {
    return name == "default" || name == "default.json";
}

// The faults a fixture lists: [{"entryPoint", "kind", "key", "code", "text", "times"}].
std::vector<Fault> parseFaults(const Json::Value& list) {
    std::vector<Fault> out;
    if (list.isNull())
        return out;
    if (!list.isArray())
        throw FixtureError("faults: must be a JSON array");
    for (Json::ArrayIndex i = 0; i < list.size(); ++i) {
        const Json::Value& f = list[i];
        const std::string where = "faults[" + std::to_string(i) + "]";
        if (!f.isObject() || !f["entryPoint"].isString() || !f["kind"].isString())
            throw FixtureError(where + ": needs \"entryPoint\" and \"kind\" texts");
        int kind = 0;
        for (const KindName& k : kKindNames)
            if (f["kind"].asString() == k.name)
                kind = k.kind;
        if ((f.isMember("key") && !f["key"].isString()) ||
            (f.isMember("text") && !f["text"].isString()) ||
            (f.isMember("code") && !f["code"].isInt()) ||
            (f.isMember("times") && !f["times"].isInt()) ||
            (f.isMember("skip") && !f["skip"].isInt()))
            throw FixtureError(
                where +
                ": \"key\" and \"text\" are texts, \"code\", \"times\" and \"skip\" integers");
        Fault fault{entryIdByName(f["entryPoint"].asCString()),
                    lowerCase(f.get("key", "").asString()),
                    kind,
                    f.get("code", 0).asInt(),
                    f.get("text", "").asString(),
                    f.get("times", 0).asInt(),
                    f.get("skip", 0).asInt()};
        if (!validFault(fault.entry, kind, fault.code, fault.text) || fault.skip < 0)
            throw FixtureError(
                where +
                ": unknown JSON entry point or fault kind, a member fault without \"text\","
                " a delay \"code\" that is not 0 to 600000 milliseconds, or a negative"
                " \"skip\"");
        out.push_back(fault);
    }
    return out;
}

// One line of JSON. Fixture comments are left out: on one line a comment
// would swallow the rest of the text.
std::string compact(const Json::Value& v) {
    Json::StreamWriterBuilder w;
    w["indentation"] = "";
    w["commentStyle"] = "None";
    return Json::writeString(w, v);
}

}  // namespace

Library& Library::instance() {
    static Library* lib = [] {
        Library* l = new Library();
        l->version_ = l->intern(kDefaultVersion);
        l->state_.model.clear();
        l->loadFixture(nullptr);
        gInstance.store(l);
        return l;
    }();
    return *lib;
}

Library* Library::existing() {
    return gInstance.load();
}

void Library::shutdown() {
    events_.shutdown();
}

// ---------------------------------------------------------------------------
// Entry points

void Library::note(EntryId id, const Json::Value* request) {
    counters_[id].fetch_add(1, std::memory_order_relaxed);
    RecordedCall call{id, request ? *request : Json::Value()};
    std::lock_guard<std::mutex> lock(recordMu_);
    if (recorded_.size() >= kMaxRecordedCalls) {
        recorded_.pop_front();
        ++recordDropped_;
    }
    recorded_.push_back(std::move(call));
}

bool Library::calledAfterFree(EntryId id, bool withdrawsCallback) {
    if (!freed_.load())
        return false;
    const bool startUp = id == EP_get_agt_version || id == EP_init_hba_lib ||
                         (id == EP_registerLogMsgCb && !withdrawsCallback);
    if (startUp)
        return false;
    callsAfterFree_.fetch_add(1);
    std::fprintf(stderr, "libdtfaj.so: %s called after free_hba_lib\n", kEntries[id].name);
    return true;
}

Json::Value Library::callJson(EntryId id, const Json::Value& request) {
    note(id, &request);
    if (calledAfterFree(id))
        return errorAnswer(kInvalidState, "the library has been freed");
    if (id == EP_init_hba_lib)
        freed_.store(false);
    Fault fault;
    const bool faulted = takeFault(id, request, fault);
    if (faulted) {
        switch (fault.kind) {
            case TVRN_SIM_FAULT_NULL_ANSWER: return Json::Value();
            case TVRN_SIM_FAULT_ERROR_OBJECT: return errorAnswer(fault.code, fault.text);
            case TVRN_SIM_FAULT_HBA_AGENT_ERROR: throw CPTA::HbaAgentError(fault.code, fault.text);
            case TVRN_SIM_FAULT_STD_EXCEPTION: throw std::runtime_error(fault.text);
            case TVRN_SIM_FAULT_NON_STANDARD: throw fault.code;
            case TVRN_SIM_FAULT_DELAY:
                // Outside every lock: other calls go on meanwhile.
                std::this_thread::sleep_for(std::chrono::milliseconds(fault.code));
                break;
            default: break;
        }
    }
    Json::Value answer;
    if (id == EP_register_for_events) {
        answer = registerForEvents(request);
    } else if (id == EP_unregister_for_events) {
        answer = unregisterForEvents(request);
    } else {
        std::vector<LogLine> lines;
        {
            std::lock_guard<std::mutex> lock(mu_);
            Call call{state_, request, id, lines};
            Handler handler = handlerFor(id);
            try {
                answer = handler ? handler(call) : errorAnswer(kInternal, "entry point not served");
            } catch (const RequestError& e) {
                answer = errorAnswer(e.code, e.message);
            } catch (const std::exception& e) {
                answer = errorAnswer(kInternal, std::string("internal error: ") + e.what());
            }
        }
        log(std::move(lines));
    }
    if (faulted && isMemberFault(fault.kind))
        applyMemberFault(answer, fault.text, fault.kind == TVRN_SIM_FAULT_DROP_MEMBER);
    return answer;
}

Json::Value Library::registerForEvents(const Json::Value& request) {
    if (!request.isNull() && !request.isObject())
        return errorAnswer(kBadRequest, "the request must be a JSON object");
    bool drop = false;
    if (request.isObject() && request.isMember("dropOldEvents")) {
        if (!request["dropOldEvents"].isBool())
            return errorAnswer(kBadRequest, "\"dropOldEvents\" must be a boolean");
        drop = request["dropOldEvents"].asBool();
    }
    std::vector<std::string> initial;
    {
        std::lock_guard<std::mutex> lock(mu_);
        for (const Json::Value& e : state_.model.root()["events"])
            initial.push_back(e.isString() ? e.asString() : compact(e));
    }
    if (!events_.subscribe(drop, initial))
        return errorAnswer(kInvalidState, "the library is shutting down");
    log({LogLine{1, __FILE__, __LINE__, "client registered for events"}});
    Json::Value r(Json::objectValue);
    r["status"] = 0;
    return r;
}

Json::Value Library::unregisterForEvents(const Json::Value& request) {
    if (!request.isNull() && !request.isObject())
        return errorAnswer(kBadRequest, "the request must be a JSON object");
    events_.unsubscribe();
    log({LogLine{1, __FILE__, __LINE__, "client unregistered from events"}});
    Json::Value r(Json::objectValue);
    r["status"] = 0;
    return r;
}

int Library::nextRequestId() {
    std::lock_guard<std::mutex> lock(mu_);
    return state_.nextRequestId++;
}

int Library::freeLibrary() {
    freed_.store(true);
    events_.unsubscribe();
    log({LogLine{2, __FILE__, __LINE__, "library released"}});
    return 0;
}

unsigned Library::adapterCount() {
    std::lock_guard<std::mutex> lock(mu_);
    return static_cast<unsigned>(state_.model.adapterCount());
}

const char* Library::version() {
    std::lock_guard<std::mutex> lock(mu_);
    return version_;
}

void Library::setEventCallback(EventCallback cb) {
    events_.setCallback(cb);
}

void Library::setLogCallback(LogCallback cb) {
    logCb_.store(cb);
    std::vector<LogLine> pending;
    {
        std::lock_guard<std::mutex> lock(mu_);
        if (cb)
            pending.swap(pendingLogs_);
    }
    log(std::move(pending));
}

void Library::log(std::vector<LogLine> lines) {
    if (lines.empty())
        return;
    LogCallback cb = logCb_.load();
    if (!cb) {
        // Warnings and errors wait for a callback; the rest is dropped.
        std::lock_guard<std::mutex> lock(mu_);
        for (LogLine& l : lines)
            if (l.level >= 3 && pendingLogs_.size() < kMaxPendingLogs)
                pendingLogs_.push_back(std::move(l));
        return;
    }
    for (const LogLine& l : lines)
        cb(l.level, baseName(l.file), l.line, l.text.c_str());
}

// ---------------------------------------------------------------------------
// Fixtures

std::string Library::fixtureDir() {
    Dl_info info;
    if (dladdr(reinterpret_cast<void*>(&Library::fixtureDir), &info) && info.dli_fname) {
        std::string lib = info.dli_fname;
        size_t slash = lib.find_last_of('/');
        return (slash == std::string::npos ? std::string(".") : lib.substr(0, slash)) + "/fixtures";
    }
    return "fixtures";
}

int Library::loadFixture(const char* nameOrPath) {
    const char* env = std::getenv("TVRN_SIM_FIXTURE");
    const std::string wanted = nameOrPath ? nameOrPath : (env ? env : "");
    if (wanted.empty() || isBuiltinName(wanted))
        return loadFixtureText(std::string(kBuiltinFixture, kBuiltinFixtureSize), kBuiltinSource);
    std::string path = wanted;
    if (wanted.find('/') == std::string::npos) {
        path = fixtureDir() + "/" + wanted;
        struct stat sb;
        const bool hasSuffix =
            wanted.size() > 5 && wanted.compare(wanted.size() - 5, 5, ".json") == 0;
        if (stat(path.c_str(), &sb) != 0 && !hasSuffix)
            path += ".json";
    }
    std::ifstream in(path, std::ios::binary);
    if (!in) {
        fail(path, std::string("cannot open the file: ") + std::strerror(errno));
        return -1;
    }
    std::stringstream text;
    text << in.rdbuf();
    return loadFixtureText(text.str(), path);
}

int Library::loadFixtureText(const std::string& text, const std::string& source) {
    Json::Value fixture;
    Json::CharReaderBuilder builder;
    std::unique_ptr<Json::CharReader> reader(builder.newCharReader());
    std::string errors;
    if (!reader->parse(text.data(), text.data() + text.size(), &fixture, &errors)) {
        fail(source, "not valid JSON: " + errors);
        return -1;
    }
    Model model;
    std::vector<Fault> faults;
    const char* versionText = kDefaultVersion;
    int initResult = 0;
    try {
        model.load(fixture);
        faults = parseFaults(fixture["faults"]);
        if (fixture.isMember("version")) {
            const Json::Value& v = fixture["version"];
            if (!v.isNull() && !v.isString())
                throw FixtureError("version: must be text or null");
            versionText = v.isNull() ? nullptr : v.asCString();
        }
        if (fixture.isMember("initResult")) {
            if (!fixture["initResult"].isInt())
                throw FixtureError("initResult: must be an integer");
            initResult = fixture["initResult"].asInt();
        }
    } catch (const FixtureError& e) {
        fail(source, e.what());
        return -1;
    }
    std::lock_guard<std::mutex> lock(mu_);
    state_.model = std::move(model);
    state_.initResult = initResult;
    state_.diagRequests.clear();
    faults_ = std::move(faults);
    version_ = versionText ? intern(versionText) : nullptr;
    lastError_.clear();
    return 0;
}

void Library::fail(const std::string& source, const std::string& why) {
    std::string message;
    {
        std::lock_guard<std::mutex> lock(mu_);
        state_.model.clear();
        state_.initResult = 0;
        state_.diagRequests.clear();
        faults_.clear();
        version_ = intern(kDefaultVersion);
        lastError_ = source + ": " + why;
        message = "fixture " + lastError_ + "; serving a host with no adapters";
    }
    std::fprintf(stderr, "libdtfaj.so: %s\n", message.c_str());
    log({LogLine{4, __FILE__, __LINE__, message}});
}

int Library::reset() {
    const int rc = loadFixture(nullptr);
    {
        std::lock_guard<std::mutex> lock(mu_);
        state_.nextRequestId = 1;
    }
    resetCounters();
    clearRecording();
    events_.discardQueued();
    freed_.store(false);
    callsAfterFree_.store(0);
    return rc;
}

std::string Library::lastError() {
    std::lock_guard<std::mutex> lock(mu_);
    return lastError_;
}

const char* Library::intern(const std::string& text) {
    return versions_.insert(text).first->c_str();
}

void Library::setVersion(const char* text) {
    std::lock_guard<std::mutex> lock(mu_);
    version_ = text ? intern(text) : nullptr;
}

void Library::setInitResult(int result) {
    std::lock_guard<std::mutex> lock(mu_);
    state_.initResult = result;
}

// ---------------------------------------------------------------------------
// Faults and counters

int Library::setFault(const char* entryPoint, const char* key, int kind, int code, const char* text,
                      int times, int skip) {
    const int id = entryIdByName(entryPoint);
    const std::string t = text ? text : "";
    if (!validFault(id, kind, code, t) || skip < 0)
        return -1;
    std::lock_guard<std::mutex> lock(mu_);
    faults_.push_back(Fault{id, lowerCase(key ? key : ""), kind, code, t, times, skip});
    return 0;
}

void Library::clearFaults() {
    std::lock_guard<std::mutex> lock(mu_);
    faults_.clear();
}

bool Library::takeFault(EntryId id, const Json::Value& request, Fault& out) {
    std::lock_guard<std::mutex> lock(mu_);
    if (faults_.empty())
        return false;
    auto keyed = [&request](const std::string& key) {
        if (!request.isObject())
            return false;
        for (const std::string& name : request.getMemberNames())
            if (request[name].isString() && lowerCase(request[name].asString()) == key)
                return true;
        return false;
    };
    auto chosen = faults_.end();
    for (auto it = faults_.begin(); it != faults_.end(); ++it) {
        if (it->entry != id)
            continue;
        if (!it->key.empty() && keyed(it->key)) {
            chosen = it;
            break;
        }
        if (it->key.empty() && chosen == faults_.end())
            chosen = it;
    }
    if (chosen == faults_.end())
        return false;
    if (chosen->skip > 0) {
        --chosen->skip;
        return false;
    }
    out = *chosen;
    if (chosen->remaining > 0 && --chosen->remaining == 0)
        faults_.erase(chosen);
    return true;
}

std::uint64_t Library::callCount(const char* entryPoint) {
    const int id = entryIdByName(entryPoint);
    return id < 0 ? 0 : counters_[id].load(std::memory_order_relaxed);
}

std::uint64_t Library::totalCalls() {
    std::uint64_t sum = 0;
    for (const auto& c : counters_)
        sum += c.load(std::memory_order_relaxed);
    return sum;
}

void Library::resetCounters() {
    for (auto& c : counters_)
        c.store(0, std::memory_order_relaxed);
}

std::string Library::recordedCalls() {
    Json::Value list(Json::arrayValue);
    {
        std::lock_guard<std::mutex> lock(recordMu_);
        list.resize(static_cast<Json::ArrayIndex>(recorded_.size()));
        Json::ArrayIndex i = 0;
        for (const RecordedCall& call : recorded_) {
            Json::Value& e = list[i++];
            e["entry"] = kEntries[call.id].name;
            e["request"] = call.request;
        }
    }
    return compact(list);
}

std::uint64_t Library::recordedDropped() {
    std::lock_guard<std::mutex> lock(recordMu_);
    return recordDropped_;
}

void Library::clearRecording() {
    std::lock_guard<std::mutex> lock(recordMu_);
    recorded_.clear();
    recordDropped_ = 0;
}

void applyMemberFault(Json::Value& answer, const std::string& path, bool drop) {
    std::vector<std::string> parts;
    std::stringstream ss(path);
    for (std::string part; std::getline(ss, part, '.');)
        parts.push_back(part);
    if (parts.empty())
        return;
    auto index = [](const std::string& s, Json::ArrayIndex& out) {
        if (s.empty() || s.find_first_not_of("0123456789") != std::string::npos)
            return false;
        out = static_cast<Json::ArrayIndex>(std::stoul(s));
        return true;
    };
    Json::Value* cur = &answer;
    for (size_t i = 0; i < parts.size(); ++i) {
        Json::Value* next = nullptr;
        Json::ArrayIndex n = 0;
        if (cur->isArray() && index(parts[i], n) && n < cur->size())
            next = &(*cur)[n];
        else if (cur->isObject() && cur->isMember(parts[i]))
            next = &(*cur)[parts[i]];
        if (!next)
            return;
        if (i + 1 < parts.size()) {
            cur = next;
            continue;
        }
        if (!drop) {
            *next = next->isString() ? Json::Value(12345) : Json::Value("wrong type");
        } else if (cur->isArray()) {
            Json::Value removed;
            cur->removeIndex(n, &removed);
        } else {
            cur->removeMember(parts[i]);
        }
    }
}

}  // namespace tvrnsim
