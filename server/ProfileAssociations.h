// Which registered profile goes with which element: the pairs of the
// conformance and requirement associations of the server profile, planned
// whole before anything is delivered, so that a request that fails delivers
// nothing.
#ifndef CPTA_SERVER_PROFILEASSOCIATIONS_H
#define CPTA_SERVER_PROFILEASSOCIATIONS_H

#include <vector>

#include "framework/Array.h"
#include "framework/Instance.h"

namespace CPTA {

struct Profile_Pair {
    const Instance* profile;  // a registered profile
    const Instance* element;  // what conforms to it, or what it requires
};

// The conformance pairs, in delivery order: for each profile in order, the
// host (`system`) for "FC HBA", "Host Discovered Resources" and "Storage HBA"
// and the object manager (`manager`) for "Server", names compared without
// regard to case; then the SMI-S profile with every other profile and with
// every sub-profile. A null host or object manager (there was not exactly
// one) is logged and its profiles go without. False, with nothing added to
// `pairs`, when there is no profile or no SMI-S profile.
bool planConformance(const Array<Instance*>& profiles, const Array<Instance*>& subProfiles,
                     const Instance* system, const Instance* manager,
                     std::vector<Profile_Pair>& pairs);

// Each profile with the sub-profiles it requires (ServerManager's table,
// InstanceIDs compared exactly), in profile and then sub-profile order.
// False, with nothing added, when either list is empty.
bool planRequirements(const Array<Instance*>& profiles, const Array<Instance*>& subProfiles,
                      std::vector<Profile_Pair>& pairs);

}  // namespace CPTA

#endif
