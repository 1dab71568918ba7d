// CIM object paths in text form, as a client writes them, through the
// embedded host's path parser and then, like a CIM server, into the module:
// the conversion layer turns the keys into the module's instance keys and the
// provider answers. An input is "<request> <path>" where the request is get
// (the default when the first word is none of these), refs or assocs;
// "<host>" in the text stands for the host's name, so that seeds name real
// instances. Whatever the path, the module answers with a status, never by
// crashing, and a successful get returns an instance of the class asked for.
#include <cstddef>
#include <cstdint>
#include <iostream>
#include <string>

#include "fuzz/FuzzSupport.h"
#include "host/classinfo.h"
#include "host/host.h"
#include "simulator/SimControl.h"

namespace {

const char kNameSpace[] = "root/tavrin";

tvrnhost::Host* gHost = nullptr;
std::string gHostName;

std::string replaced(std::string text, const std::string& from, const std::string& to) {
    for (size_t at = text.find(from); at != std::string::npos; at = text.find(from, at + to.size()))
        text.replace(at, from.size(), to);
    return text;
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
    tvrnfuzz::privateHome();
    tvrn_sim_load_fixture("default");
    tvrnhost::HostOptions options;
    options.classes = tvrnhost::classinfo::moduleCatalog().classes();
    options.keepMapped = true;
    // Never unloaded: the module stays for the life of the process.
    gHost = new tvrnhost::Host(options);
    const tvrnhost::Status loaded = gHost->load(TVRN_MODULE, TVRN_MODULE_REG);
    if (!loaded.ok()) {
        std::cerr << "object_path: the module did not load: " << loaded.toString() << "\n";
        std::abort();
    }
    auto systems = gHost->enumerateInstances(kNameSpace, "TAVRIN_ComputerSystem");
    const tvrnhost::Value* name =
        systems.ok() && systems.items.size() == 1 ? systems.items[0].get("Name") : nullptr;
    if (name == nullptr || name->isNull()) {
        std::cerr << "object_path: the module names no host\n";
        std::abort();
    }
    gHostName = name->asString();
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    std::string text =
        replaced(std::string(reinterpret_cast<const char*>(data), size), "<host>", gHostName);
    std::string request = "get";
    const size_t blank = text.find(' ');
    if (blank != std::string::npos) {
        const std::string word = text.substr(0, blank);
        if (word == "get" || word == "refs" || word == "assocs") {
            request = word;
            text.erase(0, blank + 1);
        }
    }
    tvrnhost::ObjectPath path;
    try {
        path = tvrnhost::ObjectPath::parse(text);
    } catch (const tvrnhost::ParseError&) {
        return 0;
    }
    if (path.nameSpace().empty())
        path.setNameSpace(kNameSpace);

    if (request == "refs") {
        gHost->referenceNames(path);
    } else if (request == "assocs") {
        gHost->associatorNames(path);
    } else {
        const tvrnhost::InstanceResult got = gHost->getInstance(path);
        tvrnfuzz::require(
            !got.ok() || tvrnhost::equalsIgnoreCase(got.instance.className(), path.className()),
            "get answers an instance of the class asked for");
    }
    return 0;
}
