# Writes a C++ source holding the text of a fixture, so that the library can
# serve it without any file next to it.
#   cmake -DFIXTURE=<file.json> -DOUTPUT=<file.cpp> -P EmbedFixture.cmake
file(READ "${FIXTURE}" _text)
set(_delim "tvrnfixture")
string(FIND "${_text}" ")${_delim}\"" _clash)
if(NOT _clash EQUAL -1)
  message(FATAL_ERROR "${FIXTURE} contains the raw-string delimiter )${_delim}\"")
endif()
get_filename_component(_name "${FIXTURE}" NAME)
file(WRITE "${OUTPUT}.tmp"
"// Generated from ${_name} by EmbedFixture.cmake; edit the fixture instead.
#include \"simulator/BuiltinFixture.h\"

namespace tvrnsim {

const char kBuiltinFixture[] = R\"${_delim}(${_text})${_delim}\";
const std::size_t kBuiltinFixtureSize = sizeof(kBuiltinFixture) - 1;

}  // namespace tvrnsim
")
file(RENAME "${OUTPUT}.tmp" "${OUTPUT}")
