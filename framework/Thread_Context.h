// The per-thread context through which providers call back into the CIM
// server. Contexts form a stack per thread; the top is found through one
// process-wide thread-specific key. The CMPI layer supplies the only
// implementation.
#ifndef CPTA_FRAMEWORK_THREAD_CONTEXT_H
#define CPTA_FRAMEWORK_THREAD_CONTEXT_H

#include "framework/String.h"

namespace CPTA {

struct Instance;
struct Instance_Enumerator_Rep;

class Thread_Context {
public:
    Thread_Context() : _prev(nullptr) {}
    virtual ~Thread_Context();

    Thread_Context(const Thread_Context&) = delete;
    Thread_Context& operator=(const Thread_Context&) = delete;

    // Called on the creating thread: a new context for a thread about to be
    // started with arg (null when the thread cannot get one).
    virtual Thread_Context* thread_create_hook(void* arg) = 0;
    // Called on the new thread around its procedure.
    virtual void thread_start_hook() = 0;
    virtual void thread_exit_hook() = 0;
    // Called on the creating thread instead, when the thread that a context
    // from thread_create_hook() was made for could not be started: releases
    // what was prepared for it.
    virtual void thread_not_started_hook() {}

    virtual Instance_Enumerator_Rep* instance_enumerator_create(const char* name_space,
                                                                const Instance* model) = 0;
    virtual void instance_enumerator_destroy(Instance_Enumerator_Rep* rep) = 0;
    virtual bool instance_enumerator_more(Instance_Enumerator_Rep* rep) = 0;
    virtual void instance_enumerator_next(Instance_Enumerator_Rep* rep) = 0;
    virtual Instance* instance_enumerator_get(Instance_Enumerator_Rep* rep) = 0;

    virtual Instance* get_instance(const char* name_space, const Instance* model) = 0;
    virtual int create_instance(const char* name_space, const Instance* instance) = 0;
    virtual int delete_instance(const char* name_space, const Instance* instance) = 0;
    virtual int modify_instance(const char* name_space, const Instance* instance) = 0;
    virtual int invoke_method(const char* name_space, const Instance* instance, Instance* meth) = 0;
    virtual void allow_unload(bool flag) = 0;
    virtual bool get_username(String& user_name) = 0;

    // The context on top of the calling thread's stack, or null.
    static Thread_Context* top();
    // Installs context on top; it remembers the previous top.
    static void push(Thread_Context* context);
    // Restores the top that the current one remembered (does not destroy it).
    static void pop();

private:
    Thread_Context* _prev;
};

}  // namespace CPTA

#endif
