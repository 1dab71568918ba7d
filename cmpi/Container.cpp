#include "cmpi/Container.h"

#include "cmpi/Conversion_Log.h"
#include "framework/Slot.h"

namespace CPTA {

Container::~Container() {}

namespace {

bool _selected(const Meta_Feature* mf, uint32 flags) {
    return flags == 0 || (mf->flags & flags) != 0;
}

// A null property that the class gives a default: it is sent as a null,
// since a server that fills new instances with the class defaults would
// otherwise show the default instead.
bool _null_over_default(const Meta_Feature* mf) {
    return is_property(mf) && as_property(mf)->value != nullptr;
}

// Whether the slot of the feature holds nothing to convert.
bool _is_null(const Instance* instance, const Meta_Feature* mf) {
    if (is_property(mf)) {
        const Meta_Property* mp = as_property(mf);
        return null_flag(slot_of(instance, mp->offset), mp) != 0;
    }
    const Meta_Reference* mr = as_reference(mf);
    const unsigned char* slot = slot_of(instance, mr->offset);
    return mr->subscript ? ref_array_null(slot) != 0 : reference_in(slot) == nullptr;
}

void _set_null(Instance* instance, const Meta_Feature* mf) {
    if (is_property(mf)) {
        const Meta_Property* mp = as_property(mf);
        null_flag(slot_of(instance, mp->offset), mp) = 1;
        return;
    }
    const Meta_Reference* mr = as_reference(mf);
    unsigned char* slot = slot_of(instance, mr->offset);
    if (mr->subscript) {
        ref_array_null(slot) = 1;
    } else {
        Instance*& p = reference_in(slot);
        unref(p);
        p = nullptr;
    }
}

}  // namespace

int Container::convert(const Instance* instance, uint32 flags) {
    if (!instance) {
        TVRN_WARN("ignored null instance arg");
        return -1;
    }
    const Meta_Class* mc = instance->meta_class;
    for (size_t i = 0; i < mc->num_meta_features; i++) {
        const Meta_Feature* mf = mc->meta_features[i];
        if (!_selected(mf, flags) || !(is_property(mf) || is_reference(mf)))
            continue;
        if (_is_null(instance, mf) && !_null_over_default(mf))
            continue;
        Value value;
        if (value.set(instance, mf) != 0) {
            TVRN_WARN("unexpected failure: %s.%s", mc->name, mf->name);
            _failures++;
            continue;
        }
        if (set_value(mf->name, value, mf->flags) != 0) {
            TVRN_WARN("conversion error: %s.%s", mc->name, mf->name);
            _failures++;
        }
    }
    return 0;
}

int Container::convert(const Meta_Class* meta_class, uint32 flags, Instance*& instance) {
    if (!instance) {
        instance = create(meta_class, false);
        if (!instance)
            return -1;
        __set_null_flags(instance, true, true, true);
    } else {
        const Meta_Class* mc = instance->meta_class;
        for (size_t i = 0; i < mc->num_meta_features; i++) {
            const Meta_Feature* mf = mc->meta_features[i];
            if (_selected(mf, flags) && (is_property(mf) || is_reference(mf)))
                _set_null(instance, mf);
        }
    }
    const Meta_Class* mc = instance->meta_class;

    size_t size = get_size();
    for (size_t i = 0; i < size; i++) {
        String name;
        if (get_name(i, name) != 0) {
            TVRN_WARN("get_name() failed: class=%s, index=%u", mc->name, unsigned(i));
            _failures++;
            continue;
        }
        const Meta_Feature* mf = find_feature(mc, name.c_str(), FIND_PROPERTY | FIND_REFERENCE);
        if (!mf) {
            TVRN_WARN("unknown feature: %s.%s", mc->name, name.c_str());
            continue;
        }
        if (!_selected(mf, flags))
            continue;
        int type = type_of(mf);
        if (type == Value::NONE) {
            TVRN_WARN("unexpected error: %s.%s", mc->name, mf->name);
            continue;
        }
        Value value;
        if (get_value(i, Value::Type(type), value) != 0 || value.get(instance, mf) != 0) {
            TVRN_WARN("conversion error: %s.%s", mc->name, mf->name);
            _failures++;
        }
    }
    return 0;
}

}  // namespace CPTA
