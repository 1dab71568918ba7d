// What the association tests read from associations: their ends, written
// short, "FCPort:100000051e0a0b0c" (the class without "TAVRIN_" and the key
// that tells the instances of the class apart; the host is "ComputerSystem").
#ifndef TVRN_TESTS_ASSOCIATIONS_ASSOCIATION_ENDS_H
#define TVRN_TESTS_ASSOCIATIONS_ASSOCIATION_ENDS_H

#include <initializer_list>
#include <string>
#include <vector>

#include "host/value.h"

namespace assoctest {

inline std::string shortName(const tvrnhost::ObjectPath& path) {
    std::string name = path.className();
    if (name.compare(0, 7, "TAVRIN_") == 0)
        name.erase(0, 7);
    if (name == "ComputerSystem")
        return name;
    for (const char* key : {"IdentifyingNumber", "DeviceID", "Tag", "InstanceID", "Name"})
        if (const tvrnhost::Value* v = path.key(key))
            return name + ":" + v->asString();
    return name + ":?";
}

inline std::vector<std::string> shortNames(const std::vector<tvrnhost::ObjectPath>& paths) {
    std::vector<std::string> out;
    for (const tvrnhost::ObjectPath& p : paths)
        out.push_back(shortName(p));
    return out;
}

inline std::vector<std::string> shortNames(const std::vector<tvrnhost::Instance>& instances) {
    std::vector<std::string> out;
    for (const tvrnhost::Instance& i : instances)
        out.push_back(shortName(i.path()));
    return out;
}

// The ends of each association in the order of `roles`, blank-separated.
inline std::vector<std::string> ends(const std::vector<tvrnhost::Instance>& associations,
                                     std::initializer_list<const char*> roles) {
    std::vector<std::string> out;
    for (const tvrnhost::Instance& a : associations) {
        std::string line;
        for (const char* role : roles) {
            const tvrnhost::Value* v = a.get(role);
            line += line.empty() ? "" : " ";
            line += v == nullptr || v->isNull() ? std::string(role) + ":NULL"
                                                : shortName(v->asReference());
        }
        out.push_back(line);
    }
    return out;
}

}  // namespace assoctest

#endif
