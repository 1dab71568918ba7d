#include "framework/Type_Info.h"

#include <strings.h>

namespace CPTA {

namespace {

struct Type_Entry {
    const char* name;
    size_t size;
};

const Type_Entry _types[NUM_TYPES] = {
    {"boolean", 1}, {"uint8", 1},  {"sint8", 1},  {"uint16", 2},   {"sint16", 2},
    {"uint32", 4},  {"sint32", 4}, {"uint64", 8}, {"sint64", 8},   {"real32", 4},
    {"real64", 8},  {"char16", 2}, {"string", 8}, {"datetime", 8},
};

}  // namespace

size_t type_size(int type) {
    return type >= 0 && type < NUM_TYPES ? _types[type].size : 0;
}

const char* type_name(int type) {
    return type >= 0 && type < NUM_TYPES ? _types[type].name : nullptr;
}

int type_name_to_type(const char* name) {
    if (!name || !*name)
        return -1;
    for (int i = 0; i < NUM_TYPES; i++) {
        if (strcasecmp(_types[i].name, name) == 0)
            return i;
    }
    return -1;
}

}  // namespace CPTA
