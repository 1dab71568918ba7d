// What the providers of the server profile share. Their instances come from
// ServerManager (the remote access point from FCHBAManager, the host's
// dispatcher). Each association request runs as one request of the server
// profile, so that the CIM server is asked for its object manager at most
// once: the associations that fit a pairing rule run it in a
// Profile_Pairing_Provider, the others plan their pairs with
// server/ProfileAssociations.h and deliver them with deliverPlanned.
#ifndef CPTA_PROVIDERS_SERVER_PROFILE_H
#define CPTA_PROVIDERS_SERVER_PROFILE_H

#include <deque>
#include <exception>
#include <new>
#include <vector>

#include "providers/Association_Pairing.h"
#include "providers/Inventory_Provider.h"
#include "server/ProfileAssociations.h"
#include "server/ServerManager.h"

namespace CPTA {

inline Array<Instance*> fromServerManager(classId_t classId) {
    return ServerManager::getServerManager()->getInstances(classId);
}

template <class C, const Pairing& RULE>
class Profile_Pairing_Provider : public Pairing_Provider<C, RULE> {
public:
    Enum_Instances_Status enum_instances(const C* model, Enum_Instances_Handler<C>* handler) {
        ObjectManagerScope request;
        return Pairing_Provider<C, RULE>::enum_instances(model, handler);
    }
};

// The sets a planned association fetched; destroyed with it.
class Profile_Sets {
public:
    const Array<Instance*>& fetch(Array<Instance*> (*from)(classId_t), classId_t classId) {
        return _answers.emplace_back(from(classId)).instances();
    }
    // The one instance of a set; null when it has none or several.
    static const Instance* only(const Array<Instance*>& set) {
        return set.size() == 1 ? set[0] : nullptr;
    }

private:
    std::deque<Inventory_Answer> _answers;
};

// One request of an association whose pairs `plan` makes from the sets it
// fetches (false fails the request): every pair becomes a new association
// of class C whose references `profile` and `element` hold copies of its
// ends. Nothing is delivered before the plan is complete; an exception
// fails the request.
template <class C, class P, class E, class Plan>
Enum_Instances_Status deliverPlanned(Enum_Instances_Handler<C>* handler, P* C::*profile,
                                     E* C::*element, const char* file, int line,
                                     Plan&& plan) noexcept {
    log(LL_DBG, file, line, "Entering: %s", "enum_instances");
    Enum_Instances_Status status = ENUM_INSTANCES_FAILED;
    try {
        HostIdentityScope host;
        ObjectManagerScope request;
        Profile_Sets sets;
        std::vector<Profile_Pair> pairs;
        if (plan(sets, pairs)) {
            for (const Profile_Pair& pair : pairs) {
                C* association = create<C>(true);
                if (association == nullptr)
                    throw std::bad_alloc();
                association->*profile = static_cast<P*>(clone(pair.profile));
                association->*element = static_cast<E*>(clone(pair.element));
                if (association->*profile == nullptr || association->*element == nullptr) {
                    destroy(association);
                    throw std::bad_alloc();
                }
                handler->handle(association);
            }
            status = ENUM_INSTANCES_OK;
        }
    } catch (const std::exception& e) {
        log(LL_ERR, file, line, "enum_instances got std exception: %s", e.what());
    } catch (...) {
        log(LL_ERR, file, line, "enum_instances got default exception");
    }
    log(LL_DBG, file, line, "Returning: %s", "enum_instances");
    return status;
}

}  // namespace CPTA

#endif
