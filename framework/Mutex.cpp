#include "framework/Mutex.h"

#include <pthread.h>

#include <cerrno>

#include "framework/Assert.h"

namespace CPTA {

namespace {

struct MutexRep {
    pthread_mutex_t mutex;
};

}  // namespace

Mutex::Mutex(bool recursive) {
    MutexRep* rep = new MutexRep;
    pthread_mutexattr_t attr;
    pthread_mutexattr_init(&attr);
    pthread_mutexattr_settype(&attr, recursive ? PTHREAD_MUTEX_RECURSIVE : PTHREAD_MUTEX_DEFAULT);
    pthread_mutex_init(&rep->mutex, &attr);
    pthread_mutexattr_destroy(&attr);
    _rep = rep;
}

Mutex::~Mutex() {
    MutexRep* rep = static_cast<MutexRep*>(_rep);
    pthread_mutex_destroy(&rep->mutex);
    delete rep;
}

void Mutex::lock() {
    if (pthread_mutex_lock(&((MutexRep*)_rep)->mutex) != 0)
        __cimple_assert(__FILE__, __LINE__, "Mutex",
                        "pthread_mutex_lock(&((MutexRep*)_rep)->mutex) == 0");
}

void Mutex::unlock() {
    pthread_mutex_unlock(&static_cast<MutexRep*>(_rep)->mutex);
}

int Mutex::try_lock() {
    int r = pthread_mutex_trylock(&static_cast<MutexRep*>(_rep)->mutex);
    if (r == 0)
        return 0;
    return r == EBUSY ? EBUSY : -1;
}

}  // namespace CPTA
