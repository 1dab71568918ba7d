// POSIX threads that carry the creating thread's context with them.
//
// When the creating thread has a Thread_Context, the new thread gets a
// context of its own from that context's thread_create_hook(), installed for
// the lifetime of the thread procedure and framed by its start and exit hooks.
#ifndef CPTA_FRAMEWORK_THREAD_H
#define CPTA_FRAMEWORK_THREAD_H

#include <pthread.h>

namespace CPTA {

typedef void* (*Thread_Proc)(void* arg);

class Thread {
public:
    Thread() : _tid() {}

    // 0, or the POSIX error when the thread cannot be created.
    static int create_joinable(Thread& thread, Thread_Proc proc, void* arg);
    static int create_detached(Thread& thread, Thread_Proc proc, void* arg);

    // Waits for a joinable thread: 0 or the POSIX error.
    static int join(Thread& thread, void*& result);

    // Ends the calling thread after calling its context's exit hook.
    [[noreturn]] static void exit(void* result);

    static Thread self();
    static bool equal(const Thread& a, const Thread& b);

    pthread_t id() const { return _tid; }

private:
    static int _create(Thread& thread, Thread_Proc proc, void* arg, bool detached);

    pthread_t _tid;
};

}  // namespace CPTA

#endif
