// A POSIX mutex, recursive or not.
#ifndef CPTA_FRAMEWORK_MUTEX_H
#define CPTA_FRAMEWORK_MUTEX_H

namespace CPTA {

class Mutex {
public:
    // true: the owning thread may lock it again (and must unlock as often).
    explicit Mutex(bool recursive = true);
    ~Mutex();

    Mutex(const Mutex&) = delete;
    Mutex& operator=(const Mutex&) = delete;

    // A failure of the system lock is fatal.
    void lock();
    void unlock();
    // 0 when acquired, 16 (EBUSY) when held elsewhere, -1 on other errors.
    int try_lock();

private:
    void* _rep;
};

// Holds a mutex for the lifetime of a scope.
class Auto_Mutex {
public:
    explicit Auto_Mutex(Mutex& mutex) : _mutex(mutex) { _mutex.lock(); }
    ~Auto_Mutex() { _mutex.unlock(); }

    Auto_Mutex(const Auto_Mutex&) = delete;
    Auto_Mutex& operator=(const Auto_Mutex&) = delete;

private:
    Mutex& _mutex;
};

}  // namespace CPTA

#endif
