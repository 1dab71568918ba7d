// Generic access to one provider object through its registration's proc,
// with the fallbacks that let a provider leave get_instance and the
// association operations to its enum_instances.
#ifndef CPTA_CMPI_PROVIDER_HANDLE_H
#define CPTA_CMPI_PROVIDER_HANDLE_H

#include "cmpi/Provider_Handler.h"
#include "cmpi/Provider_Status.h"
#include "cmpi/Registration.h"
#include "framework/Instance.h"
#include "framework/String.h"

namespace CPTA {

class Provider_Handle {
public:
    // Creates the provider object (operation 1).
    explicit Provider_Handle(const Registration* registration);
    // Destroys the provider object (operation 2).
    virtual ~Provider_Handle();

    Provider_Handle(const Provider_Handle&) = delete;
    Provider_Handle& operator=(const Provider_Handle&) = delete;

    const Registration* registration() const { return _registration; }
    void* provider() const { return _provider; }

    const Meta_Class* get_meta_class() const;
    const Meta_Repository* get_repository() const;

    Load_Status load();
    Unload_Status unload();

    // Operation 5; when the provider answers GET_INSTANCE_UNSUPPORTED, the
    // provider's enumeration with the same model, keeping the first instance
    // whose keys equal the model's (GET_INSTANCE_NOT_FOUND without one).
    Get_Instance_Status get_instance(const Instance* model, Instance*& instance);

    Enum_Instances_Status enum_instances(const Instance* model, Enum_Instances_Proc proc,
                                         void* client_data);
    Create_Instance_Status create_instance(Instance* instance);
    Delete_Instance_Status delete_instance(const Instance* instance);
    Modify_Instance_Status modify_instance(const Instance* model, const Instance* instance);

    // Invoke_Method_Status, or -1 when the class has no such method.
    int invoke_method(const Instance* instance, Instance* meth);

    Enable_Indications_Status enable_indications(Indication_Proc proc, void* client_data);
    Disable_Indications_Status disable_indications();

    // The provider's own enum_associators (operation 16), no fallback.
    Enum_Associators_Status enum_associators(const Instance* instance, const String& result_class,
                                             const String& role, const String& result_role,
                                             Enum_Associators_Proc proc, void* client_data);

    // Operation 14; when unsupported, the other ends of the association
    // instances that the provider enumerates and that refer to instance.
    // The proc gets a closing call with no instance in every case but a
    // class that is not an association.
    Enum_Associator_Names_Status enum_associator_names(
        const Instance* instance, const String& result_class, const String& role,
        const String& result_role, Enum_Associator_Names_Proc proc, void* client_data);

    // Operation 15; when unsupported, the enumerated association instances
    // that refer to instance (in role, when given).
    Enum_References_Status enum_references(const Instance* instance, const Instance* model,
                                           const String& role, Enum_References_Proc proc,
                                           void* client_data);

protected:
    int call(int operation, void* a1 = nullptr, void* a2 = nullptr, void* a3 = nullptr,
             void* a4 = nullptr, void* a5 = nullptr, void* a6 = nullptr, void* a7 = nullptr);

    const Registration* _registration;
    Provider_Proc _proc;
    void* _provider;
};

}  // namespace CPTA

#endif
