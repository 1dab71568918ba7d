// CIM date-time texts, through the module's parser (what it reads from the
// CIM server's date-time objects) and the embedded host's (what a server
// accepts). A text the module takes is written back in a form it takes again
// with the same value; a text a server accepts, the module takes as well and
// writes back as the same time (in UTC, where no local-time gap interferes).
#include <stdlib.h>
#include <time.h>

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <optional>
#include <string>

#include "framework/Datetime.h"
#include "fuzz/FuzzSupport.h"
#include "host/value.h"

using CPTA::Datetime;

extern "C" int LLVMFuzzerInitialize(int*, char***) {
    setenv("TZ", "UTC", 1);
    tzset();
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    const std::string text(reinterpret_cast<const char*>(data), size);

    Datetime module;
    const bool taken = module.set(text.c_str());
    if (taken) {
        const CPTA::String written = module.ascii();
        Datetime again;
        tvrnfuzz::require(again.set(written.c_str()) && again == module,
                          "a date-time the module reads, it writes back readably, same value");
        char pretty[Datetime::BUFFER_SIZE];
        module.ascii(pretty, true);
        tvrnfuzz::require(std::strlen(pretty) < Datetime::BUFFER_SIZE, "the pretty form fits");
    }

    const std::optional<tvrnhost::DateTime> server = tvrnhost::DateTime::parse(text);
    if (server) {
        tvrnfuzz::require(taken && text.size() == std::strlen(text.c_str()),
                          "a date-time a server accepts, the module reads");
        const std::optional<tvrnhost::DateTime> back =
            tvrnhost::DateTime::parse(module.ascii().c_str());
        tvrnfuzz::require(back && back->toBinary() == server->toBinary() &&
                              back->isInterval() == server->isInterval(),
                          "the module writes a server's date-time back as the same time");
    }
    return 0;
}
