// Identifiers and names of the library entry points, generated from the shared
// table so that the simulator's exports, handlers and call counters can never
// drift from the list the module binds.
#ifndef TVRN_SIMULATOR_ENTRYTABLE_H
#define TVRN_SIMULATOR_ENTRYTABLE_H

namespace tvrnsim {

enum EntryId : int {
#define ENTRY_POINT(kind, symbol, pointer) EP_##symbol,
#include "gateway/EntryPoints.def"
#undef ENTRY_POINT
    EP_COUNT
};

static_assert(EP_COUNT == 117, "the library exposes 117 entry points");

enum class EntryKind { JSON, INT_QUERY, UINT_QUERY, STRING_QUERY, EVENT_CB, LOG_CB };

struct EntryInfo {
    const char* name;
    EntryKind kind;
};

extern const EntryInfo kEntries[EP_COUNT];

// The id of the entry point with this symbol name, or -1.
int entryIdByName(const char* name);

}  // namespace tvrnsim

#endif
