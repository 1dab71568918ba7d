// Handlers through which providers deliver their results.
//
// A handler is a callback and an opaque pointer. handle(instance) passes the
// instance, status 0 and the pointer to the callback and returns the
// callback's answer (true: go on, false: the receiver wants no more).
// Handing an instance to handle() hands over the caller's reference to it.
// For the enumeration and association handlers the framework calls the
// callback once more, with no instance and the provider's final status, to
// mark the end of the results.
#ifndef CPTA_CMPI_PROVIDER_HANDLER_H
#define CPTA_CMPI_PROVIDER_HANDLER_H

#include "cmpi/Provider_Status.h"
#include "framework/Instance.h"

namespace CPTA {

typedef bool (*Enum_Instances_Proc)(Instance* instance, Enum_Instances_Status status,
                                    void* client_data);
typedef bool (*Enum_Associator_Names_Proc)(Instance* instance, Enum_Associator_Names_Status status,
                                           void* client_data);
typedef bool (*Enum_Associators_Proc)(Instance* instance, Enum_Associators_Status status,
                                      void* client_data);
typedef bool (*Enum_References_Proc)(Instance* instance, Enum_References_Status status,
                                     void* client_data);
typedef bool (*Indication_Proc)(Instance* indication, void* client_data);

template <class T, class STATUS, STATUS OK>
class Result_Handler {
public:
    typedef bool (*Proc)(Instance* instance, STATUS status, void* client_data);

    Result_Handler(Proc proc, void* client_data) : _proc(proc), _client_data(client_data) {}

    bool handle(T* instance) { return _proc(instance, OK, _client_data); }

private:
    Proc _proc;
    void* _client_data;
};

template <class T>
class Enum_Instances_Handler : public Result_Handler<T, Enum_Instances_Status, ENUM_INSTANCES_OK> {
public:
    using Result_Handler<T, Enum_Instances_Status, ENUM_INSTANCES_OK>::Result_Handler;
};

template <class T>
class Enum_Associator_Names_Handler
    : public Result_Handler<T, Enum_Associator_Names_Status, ENUM_ASSOCIATOR_NAMES_OK> {
public:
    using Result_Handler<T, Enum_Associator_Names_Status, ENUM_ASSOCIATOR_NAMES_OK>::Result_Handler;
};

template <class T>
class Enum_Associators_Handler
    : public Result_Handler<T, Enum_Associators_Status, ENUM_ASSOCIATORS_OK> {
public:
    using Result_Handler<T, Enum_Associators_Status, ENUM_ASSOCIATORS_OK>::Result_Handler;
};

template <class T>
class Enum_References_Handler
    : public Result_Handler<T, Enum_References_Status, ENUM_REFERENCES_OK> {
public:
    using Result_Handler<T, Enum_References_Status, ENUM_REFERENCES_OK>::Result_Handler;
};

// The handler of an indication provider. It is made on the heap when
// indications are enabled; once enable_indications() has answered OK it
// belongs to the provider, which deletes it when it stops delivering
// (after handing it a null instance as the end mark). When enabling fails,
// the framework deletes it, so a provider must not keep it then.
template <class T>
class Indication_Handler {
public:
    Indication_Handler(Indication_Proc proc, void* client_data)
        : _proc(proc), _client_data(client_data) {}

    bool handle(T* indication) { return _proc(indication, _client_data); }

private:
    Indication_Proc _proc;
    void* _client_data;
};

}  // namespace CPTA

#endif
