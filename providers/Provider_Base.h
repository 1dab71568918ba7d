// What all providers share. A provider class derives from the base that fits
// its CIM class and from the generated <Class>_Methods, and defines only the
// members it serves; the members it does not define keep the answers below,
// for which the CMPI binding has its fallbacks (get_instance through
// enum_instances, the association operations through enum_instances).
//
//   class TAVRIN_FCPort_Provider : public Instance_Provider<TAVRIN_FCPort>,
//                                  public TAVRIN_FCPort_Methods {
//   public:
//       Enum_Instances_Status enum_instances(const TAVRIN_FCPort* model,
//                                            Enum_Instances_Handler<TAVRIN_FCPort>* handler);
//   };
//   TVRN_PROVIDER_PROC(FCPort)
#ifndef CPTA_PROVIDERS_PROVIDER_BASE_H
#define CPTA_PROVIDERS_PROVIDER_BASE_H

#include "cmpi/Provider_Handler.h"
#include "cmpi/Provider_Proc.h"
#include "cmpi/Provider_Status.h"
#include "framework/Instance.h"
#include "framework/Log.h"
#include "framework/String.h"

namespace CPTA {

// The operations of every provider.
template <class C>
class Instance_Provider {
public:
    typedef C Class;
    static constexpr bool is_association = false;
    static constexpr bool is_indication = false;

    Load_Status load() { return LOAD_OK; }

    Unload_Status unload() { return UNLOAD_OK; }

    Get_Instance_Status get_instance(const C*, C*&) { return GET_INSTANCE_UNSUPPORTED; }

    // No instances until the class has an inventory behind it.
    Enum_Instances_Status enum_instances(const C*, Enum_Instances_Handler<C>*) {
        return ENUM_INSTANCES_OK;
    }

    Create_Instance_Status create_instance(C*) { return CREATE_INSTANCE_UNSUPPORTED; }

    Delete_Instance_Status delete_instance(const C*) { return DELETE_INSTANCE_UNSUPPORTED; }

    Modify_Instance_Status modify_instance(const C*, const C*) {
        return MODIFY_INSTANCE_UNSUPPORTED;
    }
};

// Providers of association classes.
template <class C>
class Association_Provider : public Instance_Provider<C> {
public:
    static constexpr bool is_association = true;

    Enum_Associator_Names_Status enum_associator_names(const Instance*, const String&,
                                                       const String&, const String&,
                                                       Enum_Associator_Names_Handler<Instance>*) {
        return ENUM_ASSOCIATOR_NAMES_UNSUPPORTED;
    }

    Enum_Associators_Status enum_associators(const Instance*, const String&, const String&,
                                             const String&, Enum_Associators_Handler<Instance>*) {
        return ENUM_ASSOCIATORS_UNSUPPORTED;
    }

    Enum_References_Status enum_references(const Instance*, const C*, const String&,
                                           Enum_References_Handler<C>*) {
        return ENUM_REFERENCES_UNSUPPORTED;
    }
};

// Providers of indication classes. The handler of enable_indications is held
// until disable_indications (or the provider's end).
template <class C>
class Indication_Provider : public Instance_Provider<C> {
public:
    static constexpr bool is_indication = true;

    Indication_Provider() : _handler(nullptr) {}
    ~Indication_Provider() { delete _handler; }

    Indication_Provider(const Indication_Provider&) = delete;
    Indication_Provider& operator=(const Indication_Provider&) = delete;

    Enable_Indications_Status enable_indications(Indication_Handler<C>* handler) {
        delete _handler;
        _handler = handler;
        return ENABLE_INDICATIONS_OK;
    }

    Disable_Indications_Status disable_indications() {
        if (_handler) {
            _handler->handle(nullptr);  // end of the indications
            delete _handler;
            _handler = nullptr;
        }
        return DISABLE_INDICATIONS_OK;
    }

protected:
    Indication_Handler<C>* _handler;
};

}  // namespace CPTA

// Ends the source of TAVRIN_<SHORT>_Provider: defines its proc.
#define TVRN_PROVIDER_PROC(SHORT) TVRN_DEFINE_PROC(TAVRIN_##SHORT##_Provider, TAVRIN_##SHORT)

#endif
