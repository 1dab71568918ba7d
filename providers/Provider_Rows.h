// The rows of the module table (see cmpi/Module_Definition.h), one per
// provider of providers/generated/Providers.def. Included once per use, so
// it has no include guard.
#define TVRN_PROVIDER(C, INSTANCE, ASSOCIATION, INDICATION) \
    TVRN_ROW(TAVRIN_##C##_Provider, TAVRIN_##C, INSTANCE, ASSOCIATION, INDICATION)
#include "providers/generated/Providers.def"
#undef TVRN_PROVIDER
