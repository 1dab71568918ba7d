#include "simulator/EntryTable.h"

#include <cstring>

namespace tvrnsim {

const EntryInfo kEntries[EP_COUNT] = {
#define ENTRY_POINT(kind, symbol, pointer) {#symbol, EntryKind::kind},
#include "gateway/EntryPoints.def"
#undef ENTRY_POINT
};

int entryIdByName(const char* name) {
    if (!name)
        return -1;
    for (int i = 0; i < EP_COUNT; ++i)
        if (std::strcmp(kEntries[i].name, name) == 0)
            return i;
    return -1;
}

}  // namespace tvrnsim
