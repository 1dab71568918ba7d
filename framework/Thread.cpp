#include "framework/Thread.h"

#include <cxxabi.h>

#include <cerrno>
#include <memory>

#include "framework/Assert.h"
#include "framework/Log.h"
#include "framework/Thread_Context.h"

namespace CPTA {

namespace {

struct Thread_Start {
    Thread_Proc proc;
    void* arg;
    Thread_Context* context;
};

// Removes and destroys the thread's context however the procedure ends
// (including Thread::exit(), which unwinds the stack).
struct Context_Guard {
    Thread_Context* context;

    ~Context_Guard() {
        if (!context)
            return;
        if (Thread_Context::top() == context)
            Thread_Context::pop();
        delete context;
    }
};

void* _thread_proc(void* p) {
    Thread_Start* start = static_cast<Thread_Start*>(p);
    Thread_Proc proc = start->proc;
    void* arg = start->arg;
    Thread_Context* context = start->context;
    delete start;

    Context_Guard guard{context};
    void* result = nullptr;
    bool attached = false;
    try {
        if (context) {
            Thread_Context::push(context);
            context->thread_start_hook();
            attached = true;
        }
        result = proc(arg);
        if (context) {
            if (context != Thread_Context::top())
                __cimple_assert(__FILE__, __LINE__, "Thread", "context == Thread_Context::top()");
            attached = false;
            context->thread_exit_hook();
        }
    } catch (...) {
        // Thread exit and cancellation unwind with a foreign exception that
        // has no C++ type; it must go on unwinding.
        if (!abi::__cxa_current_exception_type())
            throw;
        TVRN_LOG(LL_ERR, "thread procedure ended by an exception");
        result = nullptr;
        // The thread still leaves the server it was attached to.
        if (attached) {
            try {
                context->thread_exit_hook();
            } catch (...) {
            }
        }
    }
    return result;
}

}  // namespace

int Thread::_create(Thread& thread, Thread_Proc proc, void* arg, bool detached) {
    if (!proc)
        return EINVAL;
    Thread_Context* parent = Thread_Context::top();
    std::unique_ptr<Thread_Context> context(parent ? parent->thread_create_hook(arg) : nullptr);
    std::unique_ptr<Thread_Start> start(new Thread_Start{proc, arg, context.get()});

    pthread_attr_t attr;
    int r = pthread_attr_init(&attr);
    pthread_t tid;
    if (r == 0) {
        pthread_attr_setdetachstate(&attr,
                                    detached ? PTHREAD_CREATE_DETACHED : PTHREAD_CREATE_JOINABLE);
        r = pthread_create(&tid, &attr, _thread_proc, start.get());
        pthread_attr_destroy(&attr);
    }
    if (r != 0) {
        if (context)
            context->thread_not_started_hook();
        return r;  // the context and the start record are destroyed here
    }
    thread._tid = tid;
    start.release();  // now owned by the new thread
    context.release();
    return 0;
}

int Thread::create_joinable(Thread& thread, Thread_Proc proc, void* arg) {
    return _create(thread, proc, arg, false);
}

int Thread::create_detached(Thread& thread, Thread_Proc proc, void* arg) {
    return _create(thread, proc, arg, true);
}

int Thread::join(Thread& thread, void*& result) {
    return pthread_join(thread._tid, &result);
}

void Thread::exit(void* result) {
    if (Thread_Context* context = Thread_Context::top())
        context->thread_exit_hook();
    pthread_exit(result);
}

Thread Thread::self() {
    Thread t;
    t._tid = pthread_self();
    return t;
}

bool Thread::equal(const Thread& a, const Thread& b) {
    return pthread_equal(a._tid, b._tid) != 0;
}

}  // namespace CPTA
