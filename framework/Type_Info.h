// Names and storage sizes of the CIM scalar types.
#ifndef CPTA_FRAMEWORK_TYPE_INFO_H
#define CPTA_FRAMEWORK_TYPE_INFO_H

#include "framework/Types.h"

namespace CPTA {

// Storage size of a scalar of the given type code (a String or Datetime is
// one pointer); 0 for a code that is not a type.
size_t type_size(int type);

// "boolean", "uint8", ... "datetime"; null for a code that is not a type.
const char* type_name(int type);

// The type code of a name (case-insensitive), or -1 when the name is unknown,
// empty or null.
int type_name_to_type(const char* name);

// Size of the slot that an array property occupies (one Array pointer).
const size_t ARRAY_SLOT_SIZE = sizeof(void*);

}  // namespace CPTA

#endif
