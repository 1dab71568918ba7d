// Calls from providers back into the CIM server. Each is served by the
// calling thread's context: the request being served, or the context that a
// thread started with Thread inherited from it. Without a context they fail
// quietly (-1, null or false).
#ifndef CPTA_CMPI_CIMOM_H
#define CPTA_CMPI_CIMOM_H

#include "framework/Instance.h"
#include "framework/String.h"

namespace CPTA {

class Thread_Context;
struct Instance_Enumerator_Rep;

// Walks the instances of an enumeration that cimom::enum_instances started:
//   Instance_Enumerator e;
//   if (cimom::enum_instances(ns, model, e) == 0)
//       for (; e; e++) { Ref<> instance(e()); ... }
class Instance_Enumerator {
public:
    Instance_Enumerator() : _context(nullptr), _rep(nullptr) {}
    ~Instance_Enumerator();

    Instance_Enumerator(const Instance_Enumerator&) = delete;
    Instance_Enumerator& operator=(const Instance_Enumerator&) = delete;

    // Whether there is a current instance.
    explicit operator bool() const;
    // The current instance with a reference added (the caller releases it).
    Instance* operator()() const;
    // Moves to the next instance.
    void operator++();
    void operator++(int) { ++*this; }

private:
    friend int start_enumeration(Instance_Enumerator& enumerator, Thread_Context* context,
                                 Instance_Enumerator_Rep* rep);
    void _reset();

    Thread_Context* _context;
    Instance_Enumerator_Rep* _rep;
};

namespace cimom {

// The instance whose keys the model holds, from the server (all
// properties), as an instance of the model's class; null on failure.
Instance* get_instance(const char* name_space, const Instance* model);

// Starts an enumeration of the model's class; 0 or -1.
int enum_instances(const char* name_space, const Instance* model, Instance_Enumerator& enumerator);

int create_instance(const char* name_space, const Instance* instance);
int modify_instance(const char* name_space, const Instance* instance);
int delete_instance(const char* name_space, const Instance* instance);

// Invokes the method of the parameter record on the instance: input
// parameters are sent, output parameters and return_value are filled. 0 or -1.
int invoke_method(const char* name_space, const Instance* instance, Instance* meth);

// Whether the server may unload the calling provider (true at start). A
// provider with background work forbids it until the work is done.
void allow_unload(bool flag);

// The principal of the request; false when the server names none.
bool get_username(String& user_name);

}  // namespace cimom

}  // namespace CPTA

#endif
