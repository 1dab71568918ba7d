#include "server/ProfileAssociations.h"

#include "framework/Log.h"
#include "schema/generated/TAVRIN_RegisteredProfile.h"
#include "schema/generated/TAVRIN_RegisteredSubProfile.h"
#include "server/ServerManager.h"

namespace CPTA {

namespace {

const char* const kHostProfiles[] = {"FC HBA", "Host Discovered Resources", "Storage HBA"};

// Element i as a C; null when it is of another class.
template <class C>
const C* elementAt(const Array<Instance*>& instances, size_t i) {
    const Instance* instance = instances[i];
    return instance != nullptr && instance->meta_class == &C::static_meta_class
               ? static_cast<const C*>(instance)
               : nullptr;
}

const TAVRIN_RegisteredProfile* profileAt(const Array<Instance*>& profiles, size_t i) {
    return elementAt<TAVRIN_RegisteredProfile>(profiles, i);
}

bool named(const Property<String>& name, const char* text) {
    return !name.null && name.value.equali(text);
}

bool isHostProfile(const TAVRIN_RegisteredProfile* profile) {
    for (const char* name : kHostProfiles)
        if (named(profile->InstanceID, name))
            return true;
    return false;
}

}  // namespace

bool planConformance(const Array<Instance*>& profiles, const Array<Instance*>& subProfiles,
                     const Instance* system, const Instance* manager,
                     std::vector<Profile_Pair>& pairs) {
    if (profiles.size() == 0) {
        TVRN_LOG(LL_ERR, "Error: No instances of RegisteredProfile class returned.");
        return false;
    }
    const TAVRIN_RegisteredProfile* smis = nullptr;
    for (size_t i = 0; i < profiles.size() && smis == nullptr; i++)
        if (const TAVRIN_RegisteredProfile* profile = profileAt(profiles, i))
            if (named(profile->RegisteredName, "SMI-S"))
                smis = profile;
    if (smis == nullptr) {
        TVRN_LOG(LL_ERR, "No instances representing SMI-S standard is returned");
        return false;
    }

    for (size_t i = 0; i < profiles.size(); i++) {
        const TAVRIN_RegisteredProfile* profile = profileAt(profiles, i);
        if (profile == nullptr)
            continue;
        TVRN_LOG(LL_INFO, "Building association instance for profile : %s",
                 profile->InstanceID.value.c_str());
        if (isHostProfile(profile)) {
            if (system == nullptr)
                TVRN_LOG(LL_ERR, "Invalid number of ComputerSystem class instances");
            else
                pairs.push_back({profile, system});
        } else if (named(profile->InstanceID, "Server")) {
            if (manager == nullptr)
                TVRN_LOG(LL_ERR, "Invalid number of ObjectManager class instances");
            else
                pairs.push_back({profile, manager});
        }
    }
    for (size_t i = 0; i < profiles.size(); i++) {
        const TAVRIN_RegisteredProfile* profile = profileAt(profiles, i);
        if (profile != nullptr && !named(profile->RegisteredName, "SMI-S"))
            pairs.push_back({smis, profile});
    }
    for (size_t i = 0; i < subProfiles.size(); i++)
        if (subProfiles[i] != nullptr)
            pairs.push_back({smis, subProfiles[i]});
    return true;
}

bool planRequirements(const Array<Instance*>& profiles, const Array<Instance*>& subProfiles,
                      std::vector<Profile_Pair>& pairs) {
    if (profiles.size() == 0 || subProfiles.size() == 0) {
        TVRN_LOG(LL_ERR, "Invalid number of instances");
        return false;
    }
    ServerManager* server = ServerManager::getServerManager();
    for (size_t i = 0; i < profiles.size(); i++) {
        const TAVRIN_RegisteredProfile* profile = profileAt(profiles, i);
        if (profile == nullptr || profile->InstanceID.null)
            continue;
        const Array<String> required = server->getSubProfilesOfProfile(profile->InstanceID.value);
        for (size_t j = 0; j < subProfiles.size(); j++) {
            const auto* sub = elementAt<TAVRIN_RegisteredSubProfile>(subProfiles, j);
            if (sub != nullptr && !sub->InstanceID.null &&
                required.find(sub->InstanceID.value) != size_t(-1))
                pairs.push_back({profile, sub});
        }
    }
    return true;
}

}  // namespace CPTA
