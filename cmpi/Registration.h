// Registration of the providers of a module and the operation codes through
// which the CMPI layer calls a provider without knowing its class.
//
// Every provider has one proc: proc(registration, operation, a0 ... a7)
// dispatches the operation code to the provider class's member functions
// (see Provider_Proc.h, which generates it). Operation codes and arguments:
//
//   0  get meta class          a0: const Meta_Class** out                  -> 0
//   1  create provider         a0: void** out                              -> 0
//   2  destroy provider        a0: provider                                -> 0
//   3  load                    a0: provider                                -> Load_Status
//   4  unload                  a0: provider                                -> Unload_Status
//   5  get_instance            a0 provider, a1 model, a2 Instance** out    -> Get_Instance_Status
//   6  enum_instances          a0 provider, a1 model, a2 Enum_Instances_Proc, a3 data
//                              -> Enum_Instances_Status; the proc is then called once
//                                 more with no instance and that status
//   7  create_instance         a0 provider, a1 instance                    ->
//   Create_Instance_Status 8  delete_instance         a0 provider, a1 instance (keys) ->
//   Delete_Instance_Status 9  modify_instance         a0 provider, a1 model, a2 instance ->
//   Modify_Instance_Status
//  10  invoke method           a0 provider, a1 instance (keys), a2 parameter record
//                              -> Invoke_Method_Status, -1 for an unknown method
//  11  enable_indications      a0 provider, a1 Indication_Proc, a2 data    ->
//  Enable_Indications_Status 12  disable_indications     a0 provider -> Disable_Indications_Status
//  13  get meta repository     a0: const Meta_Repository** out             -> 0
//  14  enum_associator_names   a0 provider, a1 instance, a2 result class, a3 role,
//                              a4 result role (const String*), a5 proc, a6 data
//  15  enum_references         a0 provider, a1 instance, a2 model, a3 role, a4 proc, a5 data
//  16  enum_associators        as 14
//
// 14 to 16 end with the closing call of the proc unless the provider answers
// UNSUPPORTED. A code that the provider does not serve returns -1.
#ifndef CPTA_CMPI_REGISTRATION_H
#define CPTA_CMPI_REGISTRATION_H

#include "framework/Meta.h"

namespace CPTA {

struct Registration;

typedef int (*Provider_Proc)(const Registration* registration, int operation, void* arg0,
                             void* arg1, void* arg2, void* arg3, void* arg4, void* arg5, void* arg6,
                             void* arg7);

enum Provider_Operation {
    OPERATION_GET_META_CLASS = 0,
    OPERATION_CREATE_PROVIDER = 1,
    OPERATION_DESTROY_PROVIDER = 2,
    OPERATION_LOAD = 3,
    OPERATION_UNLOAD = 4,
    OPERATION_GET_INSTANCE = 5,
    OPERATION_ENUM_INSTANCES = 6,
    OPERATION_CREATE_INSTANCE = 7,
    OPERATION_DELETE_INSTANCE = 8,
    OPERATION_MODIFY_INSTANCE = 9,
    OPERATION_INVOKE_METHOD = 10,
    OPERATION_ENABLE_INDICATIONS = 11,
    OPERATION_DISABLE_INDICATIONS = 12,
    OPERATION_GET_REPOSITORY = 13,
    OPERATION_ENUM_ASSOCIATOR_NAMES = 14,
    OPERATION_ENUM_REFERENCES = 15,
    OPERATION_ENUM_ASSOCIATORS = 16
};

// One record per provider of the module, linked from
// _cimple_registration_head (the last registered provider first).
struct Registration {
    const char* module_name;
    const char* provider_name;
    Provider_Proc proc;
    const Meta_Class* meta_class;
    Registration* next;
};

// Head of the module's registration list.
extern Registration* _cimple_registration_head;

// Fills in the record's meta class (operation 0 of its proc) and pushes it
// on the front of the list.
void register_provider(Registration* registration);

}  // namespace CPTA

// The module's registration list, for the CIM server.
extern "C" __attribute__((visibility("default"))) CPTA::Registration* cimple_module();

#endif
