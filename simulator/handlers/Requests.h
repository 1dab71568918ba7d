// What the handlers share: reading the members of a request, and finding
// the adapter, port, remote port or logical port a request names. A handler
// fails by throwing RequestError (through fail), which the library answers
// as an "error" object.
#ifndef TVRN_SIMULATOR_HANDLERS_REQUESTS_H
#define TVRN_SIMULATOR_HANDLERS_REQUESTS_H

#include "simulator/Handlers.h"

#include <json/json.h>

#include <cstddef>
#include <string>

namespace tvrnsim {

[[noreturn]] void fail(int code, const std::string& message);

std::string quoted(const char* name);

void requireObject(const Json::Value& req);

bool has(const Json::Value& req, const char* name);

const Json::Value& member(const Json::Value& req, const char* name);

std::string text(const Json::Value& req, const char* name);

enum class Form { Wwn, Mac, Any };

std::string key(const Json::Value& req, const char* name, Form form);

// The key of a request that names its object by "wwn" or by "mac".
std::string wwnOrMacKey(const Json::Value& req);

bool flag(const Json::Value& req, const char* name);

// An integer, given as a JSON number or as decimal or 0x-prefixed text.
long long number(const Json::Value& req, const char* name);

const Json::Value& array(const Json::Value& req, const char* name);

const Json::Value& object(const Json::Value& req, const char* name);

// A diagnostic request id: text, or a number given as such.
std::string requestId(const Json::Value& req);

// Null or an object: the entry points that take no key.
void noKeyRequest(const Json::Value& req);

bool sameKey(const std::string& a, const std::string& b);

bool sameType(const Json::Value& a, const Json::Value& b);

// The value without the simulator's own bookkeeping members.
Json::Value stripped(Json::Value v);

Json::Value ok();

int adapterExact(Call& c, const std::string& k);

int adapterOwning(Call& c, const std::string& k);

Json::Value& fcPortWrapper(Call& c, const std::string& k, FcPortRef* ref = nullptr);

Json::Value& ethPortWrapper(Call& c, const std::string& k);

// An FC or Ethernet port; `isEth` tells which.
Json::Value& anyPortWrapper(Call& c, const std::string& k, bool* isEth = nullptr);

// The logical port `l` of physical port `p`: the port itself or one of its virtual ports.
Json::Value& logicalPort(Call& c, const std::string& p, const std::string& l,
                         FcPortRef* base = nullptr);

Json::Value& remotePort(Call& c, const std::string& p, const std::string& l, const std::string& r);

// An object member of a wrapper, created with the given defaults on first use.
Json::Value& materialize(Json::Value& holder, const char* name, const Json::Value& defaults);

// Copies the listed members of `given` into `target`, keeping member types.
void copyListed(Json::Value& target, const Json::Value& given, const Json::Value& names,
                const char* givenName);

// Adds the objects of `added` missing from `list` and removes those of `removed`.
void editList(Json::Value& list, const Json::Value* removed, const Json::Value* added);

// The counters of one statistics group of a port, adapter or LUN, made on
// first use from the group's default ids.
Json::Value& statsGroup(Json::Value& holder, const std::string& group, const std::string& seed,
                        bool fcoe);

// The statistics holder of the LUN named by `lunMember` of the request.
Json::Value& lunHolder(Json::Value& rp, const Json::Value& req, const char* lunMember);

// One row of an area's table: the handler of an entry point.
struct HandlerRow {
    EntryId id;
    Handler handler;
};

template <size_t N>
Handler findHandler(const HandlerRow (&rows)[N], EntryId id) {
    for (const HandlerRow& row : rows)
        if (row.id == id)
            return row.handler;
    return nullptr;
}

// The handler of `id` in each area, or null.
Handler statisticsHandler(EntryId id);
Handler discoveryHandler(EntryId id);
Handler portHandler(EntryId id);
Handler remotePortHandler(EntryId id);
Handler adapterConfigurationHandler(EntryId id);
Handler virtualPortHandler(EntryId id);
Handler advIoProfileHandler(EntryId id);
Handler diagnosticsHandler(EntryId id);
Handler flashUpdateHandler(EntryId id);

}  // namespace tvrnsim

#endif
