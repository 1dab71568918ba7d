// The inventory instance providers. Each one serves a class whose instances
// an inventory dispatcher builds; a provider's source only says where they
// come from and what to log when there are none:
//
//   const Inventory_Source TAVRIN_FCPort_Source = {
//       CID_FC_PORT, fromFCHBAManager, "No FC Ports Found!", LL_ERR, ANNOUNCED,
//       TVRN_SOURCE_FILE, __LINE__};
//
//   class TAVRIN_FCPort_Provider
//       : public Inventory_Provider<TAVRIN_FCPort, TAVRIN_FCPort_Source>,
//         public TAVRIN_FCPort_Methods {};
//
// Its log lines name the provider's source file and the line of that
// declaration. get_instance looks the object up by its keys where the
// inventory can (inventory/InventoryLookup.h); elsewhere it answers
// unsupported, and the binding serves it by enumerating and comparing keys.
// The writes stay unsupported.
#ifndef CPTA_PROVIDERS_INVENTORY_PROVIDER_H
#define CPTA_PROVIDERS_INVENTORY_PROVIDER_H

#include "framework/Array.h"
#include "framework/Instance.h"
#include "framework/Log.h"
#include "framework/Meta_Lookup.h"
#include "gateway/ClassId.h"
#include "inventory/FCHBAManager.h"
#include "inventory/HostIdentityScope.h"
#include "inventory/InventoryLookup.h"
#include "providers/Provider_Base.h"

namespace CPTA {

inline Array<Instance*> fromFCHBAManager(classId_t classId) {
    return FCHBAManager::getFCHBAManager()->getInstances(classId);
}

inline Array<Instance*> fromHDRManager(classId_t classId) {
    return HDRManager::getHDRManager()->getInstances(classId);
}

// How the instances of a request are handed on.
enum Inventory_Delivery {
    ANNOUNCED,          // logs "Returning instances" first
    QUIET,              // does not
    SINGLE,             // exactly one instance or the request fails
    SINGLE_OR_NOTHING,  // exactly one instance, else none (the request succeeds)
    REQUIRED,           // quiet, and no instance fails the request
    AT_MOST_ONE,        // announced; none is no failure, several fail the request
};

struct Inventory_Source {
    classId_t classId;
    Array<Instance*> (*dispatcher)(classId_t classId);
    // Logged when the dispatcher finds no instance (for SINGLE: not exactly
    // one); null: nothing is logged.
    const char* noInstances;
    Log_Level noInstancesLevel;
    Inventory_Delivery delivery;
    // Where the provider's log lines say they come from.
    const char* file;
    int line;
};

// The instances a dispatcher returned: whatever has not been taken when it
// goes (also when a delivery throws) is destroyed.
class Inventory_Answer {
public:
    explicit Inventory_Answer(const Array<Instance*>& instances) : _instances(instances) {}
    ~Inventory_Answer() {
        for (size_t i = 0; i < _instances.size(); i++)
            destroy(_instances[i]);
    }
    Inventory_Answer(const Inventory_Answer&) = delete;
    Inventory_Answer& operator=(const Inventory_Answer&) = delete;

    size_t size() const { return _instances.size(); }
    const Array<Instance*>& instances() const { return _instances; }
    Instance* take(size_t i) {
        Instance* instance = _instances[i];
        _instances[i] = nullptr;
        return instance;
    }

private:
    Array<Instance*> _instances;
};

// One request of the provider: asks the dispatcher and hands each instance
// of `meta_class` (or of a subclass) to `deliver`, which takes it over.
// Every other instance the dispatcher returned is destroyed.
template <class Deliver>
Enum_Instances_Status enumerate_inventory(const Inventory_Source& source,
                                          const Meta_Class* meta_class, Deliver&& deliver) {
    HostIdentityScope scope;
    log(LL_DBG, source.file, source.line, "Entering: %s", "enum_instances");
    Inventory_Answer answer(source.dispatcher(source.classId));

    if (source.delivery == AT_MOST_ONE && answer.size() > 1) {
        log(LL_ERR, source.file, source.line, "Error: Invalid mapping information");
        log(LL_DBG, source.file, source.line, "Returning: %s", "enum_instances");
        return ENUM_INSTANCES_FAILED;
    }
    const bool single = source.delivery == SINGLE || source.delivery == SINGLE_OR_NOTHING;
    const bool found = single ? answer.size() == 1 : answer.size() != 0;
    if (!found) {
        if (source.noInstances != nullptr)
            log(source.noInstancesLevel, source.file, source.line, "%s", source.noInstances);
        log(LL_DBG, source.file, source.line, "Returning: %s", "enum_instances");
        return source.delivery == SINGLE || source.delivery == REQUIRED ? ENUM_INSTANCES_FAILED
                                                                        : ENUM_INSTANCES_OK;
    }

    if (source.delivery != QUIET && source.delivery != REQUIRED)
        log(LL_DBG, source.file, source.line, "Returning instances");
    for (size_t i = 0; i < answer.size(); i++) {
        // The dispatcher's instances are ours: handing one on hands over our
        // reference, as a copy would.
        Instance* instance = answer.take(i);
        if (instance != nullptr && is_subclass(meta_class, instance->meta_class))
            deliver(instance);
        else
            destroy(instance);
    }
    log(LL_DBG, source.file, source.line, "Returning: %s", "enum_instances");
    return ENUM_INSTANCES_OK;
}

// get_instance of the provider: the instance that the look-up by keys built
// and whose keys equal the model's, as the enumeration would deliver it (of
// `meta_class` or a subclass). GET_INSTANCE_UNSUPPORTED when the keys cannot
// be looked up, or when the provider's delivery can fail a request.
inline Get_Instance_Status lookup_inventory(const Inventory_Source& source,
                                            const Meta_Class* meta_class, const Instance* model,
                                            Instance*& instance) {
    if (source.delivery != ANNOUNCED && source.delivery != QUIET)
        return GET_INSTANCE_UNSUPPORTED;
    Array<Instance*> found;
    if (!lookupInventory(source.classId, model, found))
        return GET_INSTANCE_UNSUPPORTED;
    Inventory_Answer answer(found);
    log(LL_DBG, source.file, source.line, "Entering: %s", "get_instance");
    for (size_t i = 0; i < answer.size(); i++) {
        const Instance* candidate = answer.instances()[i];
        if (candidate != nullptr && is_subclass(meta_class, candidate->meta_class) &&
            key_eq(model, candidate)) {
            instance = answer.take(i);
            log(LL_DBG, source.file, source.line, "Returning: %s", "get_instance");
            return GET_INSTANCE_OK;
        }
    }
    log(LL_DBG, source.file, source.line, "Returning: %s", "get_instance");
    return GET_INSTANCE_NOT_FOUND;
}

// An association class whose instances a dispatcher builds names its base:
// Inventory_Provider<C, SOURCE, Association_Provider<C>>.
template <class C, const Inventory_Source& SOURCE, class Base = Instance_Provider<C>>
class Inventory_Provider : public Base {
public:
    Get_Instance_Status get_instance(const C* model, C*& instance) {
        Instance* found = nullptr;
        const Get_Instance_Status status =
            lookup_inventory(SOURCE, &C::static_meta_class, model, found);
        instance = static_cast<C*>(found);
        return status;
    }

    // The model (the properties asked for) is not looked at, nor whether the
    // handler wants more: every instance is delivered whole.
    Enum_Instances_Status enum_instances(const C*, Enum_Instances_Handler<C>* handler) {
        return enumerate_inventory(SOURCE, &C::static_meta_class, [handler](Instance* instance) {
            handler->handle(static_cast<C*>(instance));
        });
    }
};

}  // namespace CPTA

#endif
