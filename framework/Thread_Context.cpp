#include "framework/Thread_Context.h"

#include <pthread.h>

namespace CPTA {

namespace {

pthread_once_t _thread_context_once = PTHREAD_ONCE_INIT;
pthread_key_t _thread_context_key;

void _create_key() {
    pthread_key_create(&_thread_context_key, nullptr);
}

pthread_key_t _key() {
    pthread_once(&_thread_context_once, _create_key);
    return _thread_context_key;
}

}  // namespace

Thread_Context::~Thread_Context() {}

Thread_Context* Thread_Context::top() {
    return static_cast<Thread_Context*>(pthread_getspecific(_key()));
}

void Thread_Context::push(Thread_Context* context) {
    if (!context)
        return;
    context->_prev = top();
    pthread_setspecific(_key(), context);
}

void Thread_Context::pop() {
    Thread_Context* context = top();
    if (context) {
        pthread_setspecific(_key(), context->_prev);
        context->_prev = nullptr;
    }
}

}  // namespace CPTA
