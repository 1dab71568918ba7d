// Fixture texts for the targets that feed the adapter-library simulator.
#ifndef TVRN_FUZZ_FUZZFIXTURE_H
#define TVRN_FUZZ_FUZZFIXTURE_H

#include <cstddef>
#include <cstdint>
#include <string>

namespace tvrnfuzz {

// The fixture text with what only makes a run slow taken out, so that the
// fuzzer spends its time on the answers: a generated host shrunk to at most
// four of everything, delay faults and diagnostic durations dropped. A text
// that is not JSON comes back as it is (the simulator refuses it).
std::string quickFixture(const uint8_t* data, size_t size);

}  // namespace tvrnfuzz

#endif
