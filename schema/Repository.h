// The meta repository of the module: every class of the class schema, the
// module's own TAVRIN_* classes and the CIM_* classes they derive from.
#ifndef CPTA_SCHEMA_REPOSITORY_H
#define CPTA_SCHEMA_REPOSITORY_H

#include "framework/Meta.h"

namespace CPTA {

extern const Meta_Repository schema_repository;

}  // namespace CPTA

#endif
