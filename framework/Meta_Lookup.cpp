#include "framework/Meta_Lookup.h"

#include <strings.h>

#include "framework/Atomic.h"
#include "framework/Instance.h"

namespace CPTA {

const char* const flag_names[32] = {
    "Property",
    "Reference",
    "Method",
    "Class",
    "Abstract",
    "Aggregate",
    "Aggregation",
    "Association",
    "Composition",
    "Counter",
    "Delete",
    "DN",
    "EmbeddedObject",
    "Exception",
    "Expensive",
    "Experimental",
    "Gauge",
    "IfDeleted",
    "In",
    "Indication",
    "Invisible",
    "Key",
    "Large",
    "OctetString",
    "Out",
    "Read",
    "Required",
    "Static",
    "Terminal",
    "Weak",
    "Write",
    "EmbeddedInstance",
};

namespace {

bool _eqi(const char* a, const char* b) {
    return a && b && strcasecmp(a, b) == 0;
}

// Only a class record carries the fields behind the ones it shares with a
// method record.
bool _is_method(const Meta_Class* mc) {
    return (mc->flags & FLAG_METHOD) != 0;
}

const Meta_Repository* _repository_of(const Meta_Class* mc) {
    return _is_method(mc) ? nullptr : mc->meta_repository;
}

const Meta_Feature* _find(const Meta_Feature* const* features, size_t n, const char* name,
                          uint32 kinds) {
    if (!name)
        return nullptr;
    for (size_t i = 0; i < n; i++) {
        const Meta_Feature* mf = features[i];
        if ((mf->flags & kinds) && _eqi(mf->name, name))
            return mf;
    }
    return nullptr;
}

}  // namespace

int flag_name_to_index(const char* name) {
    for (int i = 0; i < 32; i++) {
        if (_eqi(flag_names[i], name))
            return i;
    }
    return -1;
}

const Meta_Class* super_meta_class_of(const Meta_Class* meta_class) {
    return meta_class && !_is_method(meta_class) ? meta_class->super_meta_class : nullptr;
}

const Meta_Class* find_meta_class(const Meta_Repository* meta_repository, const char* name) {
    if (!meta_repository || !name)
        return nullptr;
    for (size_t i = 0; i < meta_repository->num_meta_classes; i++) {
        const Meta_Class* mc = meta_repository->meta_classes[i];
        if (_eqi(mc->name, name))
            return mc;
    }
    return nullptr;
}

const Meta_Class* find_meta_class(const Meta_Class* meta_class, const char* name) {
    if (!meta_class || !name)
        return nullptr;
    for (const Meta_Class* p = meta_class; p; p = super_meta_class_of(p)) {
        if (_eqi(p->name, name))
            return p;
    }
    return find_meta_class(_repository_of(meta_class), name);
}

bool is_subclass(const Meta_Class* ancestor, const Meta_Class* descendant) {
    if (!ancestor || !descendant)
        return false;
    if (ancestor == &Instance::static_meta_class || _eqi(ancestor->name, "Instance"))
        return true;
    for (const Meta_Class* p = descendant; p; p = super_meta_class_of(p)) {
        if (p == ancestor || _eqi(p->name, ancestor->name))
            return true;
    }
    return false;
}

int is_subclass(const Meta_Repository* meta_repository, const char* ancestor,
                const char* descendant) {
    if (!ancestor || !descendant)
        return -1;
    const Meta_Class* a = _eqi(ancestor, "Instance") ? &Instance::static_meta_class
                                                     : find_meta_class(meta_repository, ancestor);
    const Meta_Class* d = find_meta_class(meta_repository, descendant);
    if (!a || !d)
        return -1;
    return is_subclass(a, d) ? 0 : 1;
}

const Meta_Feature* find_feature(const Meta_Class* meta_class, const char* name, uint32 kinds) {
    if (!meta_class)
        return nullptr;
    return _find(meta_class->meta_features, meta_class->num_meta_features, name, kinds);
}

const Meta_Property* find_property(const Meta_Class* meta_class, const char* name) {
    return reinterpret_cast<const Meta_Property*>(find_feature(meta_class, name, FIND_PROPERTY));
}

const Meta_Reference* find_reference(const Meta_Class* meta_class, const char* name) {
    return reinterpret_cast<const Meta_Reference*>(find_feature(meta_class, name, FIND_REFERENCE));
}

const Meta_Method* find_method(const Meta_Class* meta_class, const char* name) {
    return reinterpret_cast<const Meta_Method*>(find_feature(meta_class, name, FIND_METHOD));
}

const Meta_Feature* find_parameter(const Meta_Method* meta_method, const char* name) {
    if (!meta_method)
        return nullptr;
    return _find(meta_method->meta_features, meta_method->num_meta_features, name,
                 FIND_PROPERTY | FIND_REFERENCE);
}

const Meta_Reference* find_reference(const Meta_Method* meta_method, const char* name) {
    if (!meta_method)
        return nullptr;
    return reinterpret_cast<const Meta_Reference*>(
        _find(meta_method->meta_features, meta_method->num_meta_features, name, FIND_REFERENCE));
}

bool has_feature(const Meta_Class* meta_class, uint32 flags) {
    if (!meta_class)
        return false;
    for (size_t i = 0; i < meta_class->num_meta_features; i++) {
        if (meta_class->meta_features[i]->flags & flags)
            return true;
    }
    return false;
}

void ref(const Meta_Class* meta_class) {
    if (meta_class && atomic_get(&meta_class->refs) != 0)
        atomic_inc(const_cast<uint32*>(&meta_class->refs));
}

uint32 unref(const Meta_Class* meta_class) {
    if (!meta_class || atomic_get(&meta_class->refs) == 0)
        return 0;
    return __atomic_sub_fetch(const_cast<uint32*>(&meta_class->refs), 1, __ATOMIC_ACQ_REL);
}

}  // namespace CPTA
