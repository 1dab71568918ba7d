// The operation function (proc) of a provider class, generated from the class
// by a template: it turns the operation codes of Registration.h into calls of
// the provider's members.
//
// The provider class P names its CIM class as P::Class and says through
// P::is_association and P::is_indication which optional groups of members it
// has (the provider base classes of the providers/ directory set all three).
// Extrinsic methods are reached through the generated <Class>_invoke_method.
//
// A provider source ends with
//   TVRN_DEFINE_PROC(TAVRIN_FCPort_Provider, TAVRIN_FCPort)
// which defines CPTA::TAVRIN_FCPort_Provider_proc.
#ifndef CPTA_CMPI_PROVIDER_PROC_H
#define CPTA_CMPI_PROVIDER_PROC_H

#include <memory>

#include "cmpi/Provider_Handler.h"
#include "cmpi/Provider_Status.h"
#include "cmpi/Registration.h"
#include "framework/Instance.h"

namespace CPTA {

template <class P, int (*INVOKE)(P*, const typename P::Class*, Instance*)>
int provider_proc(const Registration*, int operation, void* a0, void* a1, void* a2, void* a3,
                  void* a4, void* a5, void* a6, void*) {
    typedef typename P::Class C;
    P* provider = static_cast<P*>(a0);

    switch (operation) {
        case OPERATION_GET_META_CLASS:
            *static_cast<const Meta_Class**>(a0) = &C::static_meta_class;
            return 0;

        case OPERATION_CREATE_PROVIDER: *static_cast<void**>(a0) = new P; return 0;

        case OPERATION_DESTROY_PROVIDER: delete provider; return 0;

        case OPERATION_LOAD: return provider->load();

        case OPERATION_UNLOAD: return provider->unload();

        case OPERATION_GET_INSTANCE: {
            C* instance = nullptr;
            int status = provider->get_instance(static_cast<const C*>(a1), instance);
            *static_cast<Instance**>(a2) = instance;
            return status;
        }

        case OPERATION_ENUM_INSTANCES: {
            Enum_Instances_Proc proc = reinterpret_cast<Enum_Instances_Proc>(a2);
            Enum_Instances_Handler<C> handler(proc, a3);
            Enum_Instances_Status status =
                provider->enum_instances(static_cast<const C*>(a1), &handler);
            proc(nullptr, status, a3);
            return status;
        }

        case OPERATION_CREATE_INSTANCE: return provider->create_instance(static_cast<C*>(a1));

        case OPERATION_DELETE_INSTANCE: return provider->delete_instance(static_cast<const C*>(a1));

        case OPERATION_MODIFY_INSTANCE:
            return provider->modify_instance(static_cast<const C*>(a1), static_cast<const C*>(a2));

        case OPERATION_INVOKE_METHOD:
            return INVOKE(provider, static_cast<const C*>(a1), static_cast<Instance*>(a2));

        case OPERATION_ENABLE_INDICATIONS:
            if constexpr (P::is_indication) {
                std::unique_ptr<Indication_Handler<C>> handler(
                    new Indication_Handler<C>(reinterpret_cast<Indication_Proc>(a1), a2));
                Enable_Indications_Status status = provider->enable_indications(handler.get());
                if (status == ENABLE_INDICATIONS_OK)
                    handler.release();  // the provider's now
                return status;
            } else {
                return -1;
            }

        case OPERATION_DISABLE_INDICATIONS:
            if constexpr (P::is_indication)
                return provider->disable_indications();
            else
                return -1;

        case OPERATION_GET_REPOSITORY:
            *static_cast<const Meta_Repository**>(a0) = C::static_meta_class.meta_repository;
            return 0;

        case OPERATION_ENUM_ASSOCIATOR_NAMES:
            if constexpr (P::is_association) {
                Enum_Associator_Names_Proc proc = reinterpret_cast<Enum_Associator_Names_Proc>(a5);
                Enum_Associator_Names_Handler<Instance> handler(proc, a6);
                Enum_Associator_Names_Status status = provider->enum_associator_names(
                    static_cast<const Instance*>(a1), *static_cast<const String*>(a2),
                    *static_cast<const String*>(a3), *static_cast<const String*>(a4), &handler);
                if (status != ENUM_ASSOCIATOR_NAMES_UNSUPPORTED)
                    proc(nullptr, status, a6);
                return status;
            } else {
                return -1;
            }

        case OPERATION_ENUM_REFERENCES:
            if constexpr (P::is_association) {
                Enum_References_Proc proc = reinterpret_cast<Enum_References_Proc>(a4);
                Enum_References_Handler<C> handler(proc, a5);
                Enum_References_Status status = provider->enum_references(
                    static_cast<const Instance*>(a1), static_cast<const C*>(a2),
                    *static_cast<const String*>(a3), &handler);
                if (status != ENUM_REFERENCES_UNSUPPORTED)
                    proc(nullptr, status, a5);
                return status;
            } else {
                return -1;
            }

        case OPERATION_ENUM_ASSOCIATORS:
            if constexpr (P::is_association) {
                Enum_Associators_Proc proc = reinterpret_cast<Enum_Associators_Proc>(a5);
                Enum_Associators_Handler<Instance> handler(proc, a6);
                Enum_Associators_Status status = provider->enum_associators(
                    static_cast<const Instance*>(a1), *static_cast<const String*>(a2),
                    *static_cast<const String*>(a3), *static_cast<const String*>(a4), &handler);
                if (status != ENUM_ASSOCIATORS_UNSUPPORTED)
                    proc(nullptr, status, a6);
                return status;
            } else {
                return -1;
            }

        default: return -1;
    }
}

}  // namespace CPTA

// Declares the proc of a provider (in namespace CPTA).
#define TVRN_DECLARE_PROC(PROVIDER)                                                        \
    int PROVIDER##_proc(const ::CPTA::Registration* registration, int operation, void* a0, \
                        void* a1, void* a2, void* a3, void* a4, void* a5, void* a6, void* a7)

// Defines the proc of provider class CPTA::PROVIDER serving CPTA::CLASS.
// Used once, at the end of the provider's source, outside any namespace.
#define TVRN_DEFINE_PROC(PROVIDER, CLASS)                                 \
    namespace CPTA {                                                      \
    TVRN_DECLARE_PROC(PROVIDER);                                          \
    TVRN_DECLARE_PROC(PROVIDER) {                                         \
        return provider_proc<PROVIDER, &CLASS##_invoke_method<PROVIDER>>( \
            registration, operation, a0, a1, a2, a3, a4, a5, a6, a7);     \
    }                                                                     \
    }

#endif
