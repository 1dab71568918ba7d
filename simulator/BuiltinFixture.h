// The built-in host: the text of fixtures/default.json, compiled into the
// library at build time (see EmbedFixture.cmake).
#ifndef TVRN_SIMULATOR_BUILTINFIXTURE_H
#define TVRN_SIMULATOR_BUILTINFIXTURE_H

#include <cstddef>

namespace tvrnsim {

extern const char kBuiltinFixture[];
extern const std::size_t kBuiltinFixtureSize;

}  // namespace tvrnsim

#endif
