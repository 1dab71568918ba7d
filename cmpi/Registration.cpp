#include "cmpi/Registration.h"

#include "framework/Log.h"

namespace CPTA {

Registration* _cimple_registration_head = nullptr;

namespace {

// Closes the message file when the module is unloaded, so that a server
// that unloads and reloads the module does not keep a descriptor per load.
// Created by the first registration, so it is destroyed after every static
// object constructed later in the module's start-up.
struct Log_Closer {
    ~Log_Closer() { close_log(); }
};

}  // namespace

void register_provider(Registration* registration) {
    static Log_Closer closer;
    (void)closer;
    const Meta_Class* meta_class = nullptr;
    registration->proc(registration, OPERATION_GET_META_CLASS, &meta_class, nullptr, nullptr,
                       nullptr, nullptr, nullptr, nullptr, nullptr);
    registration->meta_class = meta_class;
    registration->next = _cimple_registration_head;
    _cimple_registration_head = registration;
}

}  // namespace CPTA

extern "C" CPTA::Registration* cimple_module() {
    return CPTA::_cimple_registration_head;
}
