// Provider registration files ("providerRegister" text form):
//
//   # comment
//   [TAVRIN_FCPort]
//      provider: TAVRIN_FCPort_Provider
//      location: tvrnprovider
//      type: instance method
//      namespace: root/tavrin
//
// One block per class; `type` lists any of instance, association, method,
// indication; `namespace` may repeat or list several namespaces.
#ifndef TVRN_HOST_REGISTRATION_H
#define TVRN_HOST_REGISTRATION_H

#include <string>
#include <string_view>
#include <vector>

namespace tvrnhost {

enum MIKind : unsigned {
    kInstanceMI = 1u << 0,
    kAssociationMI = 1u << 1,
    kMethodMI = 1u << 2,
    kIndicationMI = 1u << 3,
};

struct Registration {
    std::string className;
    std::string provider;
    std::string location;  // library name without "lib" and ".so"
    unsigned kinds = 0;    // MIKind bits
    std::vector<std::string> namespaces;
    int line = 0;  // of the [Class] header
};

// Throws ParseError (value.h) naming the line.
std::vector<Registration> parseRegistrations(std::string_view text);
std::vector<Registration> readRegistrationFile(const std::string& path);

}  // namespace tvrnhost

#endif
