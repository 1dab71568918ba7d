// One entry per module class: its meta class and a call of its generated
// invoke function on a provider that implements no method.
#ifndef CPTA_TESTS_SCHEMA_GLUE_TABLE_H
#define CPTA_TESTS_SCHEMA_GLUE_TABLE_H

#include <cstddef>

#include "framework/Instance.h"

namespace CPTA {

struct Glue_Entry {
    const Meta_Class* meta_class;
    int (*invoke)(Instance* self, Instance* record);
};

extern const Glue_Entry glue_table[];
extern const size_t glue_table_size;

}  // namespace CPTA

#endif
