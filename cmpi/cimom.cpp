#include "cmpi/cimom.h"

#include "framework/Thread_Context.h"

namespace CPTA {

int start_enumeration(Instance_Enumerator& enumerator, Thread_Context* context,
                      Instance_Enumerator_Rep* rep) {
    enumerator._reset();
    if (!rep)
        return -1;
    enumerator._context = context;
    enumerator._rep = rep;
    return 0;
}

Instance_Enumerator::~Instance_Enumerator() {
    _reset();
}

void Instance_Enumerator::_reset() {
    if (_rep && _context)
        _context->instance_enumerator_destroy(_rep);
    _context = nullptr;
    _rep = nullptr;
}

Instance_Enumerator::operator bool() const {
    return _rep && _context->instance_enumerator_more(_rep);
}

Instance* Instance_Enumerator::operator()() const {
    return _rep ? _context->instance_enumerator_get(_rep) : nullptr;
}

void Instance_Enumerator::operator++() {
    if (_rep)
        _context->instance_enumerator_next(_rep);
}

namespace cimom {

Instance* get_instance(const char* name_space, const Instance* model) {
    Thread_Context* context = Thread_Context::top();
    return context ? context->get_instance(name_space, model) : nullptr;
}

int enum_instances(const char* name_space, const Instance* model, Instance_Enumerator& enumerator) {
    Thread_Context* context = Thread_Context::top();
    if (!context)
        return -1;
    return start_enumeration(enumerator, context,
                             context->instance_enumerator_create(name_space, model));
}

int create_instance(const char* name_space, const Instance* instance) {
    Thread_Context* context = Thread_Context::top();
    return context ? context->create_instance(name_space, instance) : -1;
}

int modify_instance(const char* name_space, const Instance* instance) {
    Thread_Context* context = Thread_Context::top();
    return context ? context->modify_instance(name_space, instance) : -1;
}

int delete_instance(const char* name_space, const Instance* instance) {
    Thread_Context* context = Thread_Context::top();
    return context ? context->delete_instance(name_space, instance) : -1;
}

int invoke_method(const char* name_space, const Instance* instance, Instance* meth) {
    Thread_Context* context = Thread_Context::top();
    return context ? context->invoke_method(name_space, instance, meth) : -1;
}

void allow_unload(bool flag) {
    if (Thread_Context* context = Thread_Context::top())
        context->allow_unload(flag);
}

bool get_username(String& user_name) {
    Thread_Context* context = Thread_Context::top();
    return context && context->get_username(user_name);
}

}  // namespace cimom

}  // namespace CPTA
