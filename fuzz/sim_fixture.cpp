// Fixture texts through the simulator's fixture reader: a text is taken
// (and serves the host it describes) or refused with a reason, after which
// the simulator serves a host without adapters. Nothing escapes the reader.
// A generated host is shrunk first (tvrnfuzz::quickFixture): the size of one
// is bounded by the reader, and a large one only slows the fuzzer down.
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <string>

#include "fuzz/FuzzFixture.h"
#include "fuzz/FuzzSupport.h"
#include "simulator/SimControl.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    const std::string text = tvrnfuzz::quickFixture(data, size);
    const int loaded = tvrn_sim_load_fixture_text(text.c_str());
    tvrnfuzz::require((loaded == 0) == (std::strlen(tvrn_sim_last_error()) == 0),
                      "a fixture is taken, or refused with a reason");
    return 0;
}
