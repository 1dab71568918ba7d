// Holder of an encapsulated CMPI object that we made or were given and must
// release when we no longer need it (getters' results, temporaries).
#ifndef CPTA_CMPI_CMPI_PTR_H
#define CPTA_CMPI_CMPI_PTR_H

#include <cmpidt.h>
#include <cmpift.h>
#include <cmpimacs.h>

namespace CPTA {

template <class T>
class Cmpi_Ptr {
public:
    explicit Cmpi_Ptr(T* p = nullptr) : _p(p) {}
    ~Cmpi_Ptr() {
        if (_p)
            CMRelease(_p);
    }
    Cmpi_Ptr(const Cmpi_Ptr&) = delete;
    Cmpi_Ptr& operator=(const Cmpi_Ptr&) = delete;

    T* get() const { return _p; }
    T* release() {
        T* p = _p;
        _p = nullptr;
        return p;
    }
    void reset(T* p) {
        if (_p)
            CMRelease(_p);
        _p = p;
    }
    explicit operator bool() const { return _p != nullptr; }

private:
    T* _p;
};

}  // namespace CPTA

#endif
