// Every class of the server profile and the number of its instances on any
// host, with or without adapters, while no management agent runs.
#ifndef TVRN_TESTS_SERVER_SERVERPROFILECOUNTS_H
#define TVRN_TESTS_SERVER_SERVERPROFILECOUNTS_H

#include <cstddef>
#include <map>
#include <string>

namespace tvrntest {

inline const std::map<std::string, std::size_t>& serverProfileCounts() {
    static const std::map<std::string, std::size_t> counts = {
        {"TAVRIN_RegisteredProfile", 5},
        {"TAVRIN_RegisteredSubProfile", 10},
        {"TAVRIN_Namespace", 1},
        {"TAVRIN_ObjectManager", 1},
        {"TAVRIN_CIMXMLCommunicationMechanism", 1},
        {"TAVRIN_ProfileSoftwareIdentity", 1},
        {"TAVRIN_AgentService", 1},
        {"TAVRIN_RemoteServiceAccessPoint", 0},
        {"TAVRIN_ObjectManagerHostedService", 1},
        {"TAVRIN_CommMechHostedAccessPoint", 1},
        {"TAVRIN_CommMechanismForManager", 1},
        {"TAVRIN_NamespaceInManager", 1},
        {"TAVRIN_RemoteServiceHostedAccessPoint", 0},
        {"TAVRIN_ProfileElementSoftwareIdentity", 15},
        {"TAVRIN_SubProfileRequiresProfile", 10},
        {"TAVRIN_ElementConformsToProfile", 18},
    };
    return counts;
}

}  // namespace tvrntest

#endif
