#include "framework/Instance.h"

#include <strings.h>

#include <cstdlib>
#include <cstring>
#include <new>

#include "framework/Atomic.h"
#include "framework/Log.h"
#include "framework/Slot.h"

namespace CPTA {

const Meta_Class Instance::static_meta_class = {
    0,                         // refs: static
    FLAG_CLASS,                // flags
    "Instance",                // name
    nullptr,                   // meta_qualifiers
    0,                         // num_meta_qualifiers
    nullptr,                   // meta_features
    0,                         // num_meta_features
    uint32(sizeof(Instance)),  // size
    nullptr,                   // locals
    nullptr,                   // super_meta_class
    0,                         // num_keys
    nullptr,                   // meta_repository
};

namespace {

const uint32 DEAD_MAGIC = 0xDDDDDDDD;

// Bound on the depth of nested references followed by the recursive
// operations, so that a reference cycle cannot exhaust the stack.
const int MAX_DEPTH = 64;

bool _valid_type(const Meta_Property* mp) {
    return mp->type < NUM_TYPES;
}

bool _check(const Instance* instance, const char* operation) {
    if (instance->magic == INSTANCE_MAGIC)
        return true;
    TVRN_LOG(LL_ERR, "%s: not an instance (magic 0x%08X)", operation, instance->magic);
    return false;
}

//------------------------------------------------------------------------------
// Construction and destruction of single slots
//------------------------------------------------------------------------------

void _set_default_scalar(unsigned char* slot, const Meta_Property* mp) {
    const void* value = mp->value;
    switch (mp->type) {
        case STRING:
            reinterpret_cast<String*>(slot)->assign(
                static_cast<const Meta_Value_Scalar<const char*>*>(value)->value);
            break;
        case DATETIME:
            if (!reinterpret_cast<Datetime*>(slot)->set(
                    static_cast<const Meta_Value_Scalar<const char*>*>(value)->value))
                null_flag(slot, mp) = 1;
            break;
        default: std::memcpy(slot, value, type_size(mp->type)); break;
    }
}

void _append_default_array(__Array_Rep*& rep, const Meta_Property* mp) {
    // Every Meta_Value_Array<T> has the same layout: elements, then count.
    const Meta_Value_Array<char>* value =
        reinterpret_cast<const Meta_Value_Array<char>*>(mp->value);
    size_t n = value->num_elements;
    if (n == 0 || !value->elements)
        return;
    if (mp->type == STRING || mp->type == DATETIME) {
        const char* const* texts = reinterpret_cast<const char* const*>(value->elements);
        __reserve(rep, n);
        for (size_t i = 0; i < n; i++) {
            if (mp->type == STRING) {
                String s(texts[i]);
                __append(rep, &s, 1);
            } else {
                Datetime d(texts[i]);
                __append(rep, &d, 1);
            }
        }
        return;
    }
    __append(rep, value->elements, n);
}

void _construct_slot(const Meta_Feature* mf, Instance* instance, bool defaults) {
    if (is_property(mf)) {
        const Meta_Property* mp = as_property(mf);
        if (!_valid_type(mp))
            return;
        unsigned char* slot = slot_of(instance, mp->offset);
        uint8& null = null_flag(slot, mp);
        null = 0;
        if (mp->subscript) {
            array_rep_in(slot) = nullptr;  // so that a failed construction is undone safely
            __construct(array_rep_in(slot), __cim_array_traits[mp->type], nullptr, 0);
            if (defaults) {
                if (mp->value)
                    _append_default_array(array_rep_in(slot), mp);
                else
                    null = 1;
            }
            return;
        }
        if (mp->type == STRING)
            new (slot) String();
        else if (mp->type == DATETIME)
            new (slot) Datetime();
        else
            std::memset(slot, 0, type_size(mp->type));
        if (defaults) {
            if (mp->value)
                _set_default_scalar(slot, mp);
            else
                null = 1;
        }
    } else if (is_reference(mf)) {
        const Meta_Reference* mr = as_reference(mf);
        unsigned char* slot = slot_of(instance, mr->offset);
        if (mr->subscript) {
            array_rep_in(slot) = nullptr;
            __construct(array_rep_in(slot), __Array_Traits_Factory_Raw<void*>::traits(), nullptr,
                        0);
            ref_array_null(slot) = 0;
        } else {
            reference_in(slot) = nullptr;
        }
    }
}

void _destroy_slot(const Meta_Feature* mf, Instance* instance) {
    if (is_property(mf)) {
        const Meta_Property* mp = as_property(mf);
        if (!_valid_type(mp))
            return;
        unsigned char* slot = slot_of(instance, mp->offset);
        if (mp->subscript) {
            __destruct(array_rep_in(slot));
            array_rep_in(slot) = nullptr;
        } else if (mp->type == STRING) {
            reinterpret_cast<String*>(slot)->~String();
        } else if (mp->type == DATETIME) {
            reinterpret_cast<Datetime*>(slot)->~Datetime();
        }
    } else if (is_reference(mf)) {
        const Meta_Reference* mr = as_reference(mf);
        unsigned char* slot = slot_of(instance, mr->offset);
        if (mr->subscript) {
            __Array_Rep* rep = array_rep_in(slot);
            if (rep) {
                Instance* const* p = reinterpret_cast<Instance* const*>(rep->data());
                for (size_t i = 0; i < rep->size; i++)
                    unref(p[i]);
            }
            __destruct(rep);
            array_rep_in(slot) = nullptr;
        } else {
            unref(reference_in(slot));
            reference_in(slot) = nullptr;
        }
    }
}

void _destroy_slots(const Meta_Class* mc, Instance* instance, size_t n) {
    for (size_t i = 0; i < n; i++)
        _destroy_slot(mc->meta_features[i], instance);
}

void _construct_header(const Meta_Class* mc, Instance* instance, const String& name_space) {
    instance->magic = INSTANCE_MAGIC;
    instance->refs = 1;
    instance->meta_class = mc;
    new (&instance->__name_space) String(name_space);
    ref(mc);
}

void _free(Instance* instance) {
    instance->__name_space.~String();
    unref(instance->meta_class);
    instance->magic = DEAD_MAGIC;
    std::free(instance);
}

Instance* _clone(const Instance* src);

void _clone_slot(const Meta_Feature* mf, Instance* dst, const Instance* src) {
    if (is_property(mf)) {
        const Meta_Property* mp = as_property(mf);
        if (!_valid_type(mp))
            return;
        unsigned char* d = slot_of(dst, mp->offset);
        const unsigned char* s = slot_of(src, mp->offset);
        if (mp->subscript) {
            const __Array_Rep* rep = array_rep_in(s);
            __construct(array_rep_in(d), rep->traits, rep->data(), rep->size);
        } else if (mp->type == STRING) {
            new (d) String(*reinterpret_cast<const String*>(s));
        } else if (mp->type == DATETIME) {
            new (d) Datetime(*reinterpret_cast<const Datetime*>(s));
        } else {
            std::memcpy(d, s, type_size(mp->type));
        }
        null_flag(d, mp) = null_flag(s, mp);
    } else if (is_reference(mf)) {
        const Meta_Reference* mr = as_reference(mf);
        unsigned char* d = slot_of(dst, mr->offset);
        const unsigned char* s = slot_of(src, mr->offset);
        if (mr->subscript) {
            const __Array_Rep* from = array_rep_in(s);
            __Array_Rep*& to = array_rep_in(d);
            __construct(to, from->traits, nullptr, 0);
            __reserve(to, from->size);
            Instance* const* p = ref_array_data(s);
            for (size_t i = 0; i < from->size; i++) {
                Instance* x = p[i] ? _clone(p[i]) : nullptr;
                __append(to, &x, 1);  // cannot fail after the reserve
            }
            ref_array_null(d) = ref_array_null(s);
        } else {
            Instance* p = reference_in(s);
            reference_in(d) = p ? _clone(p) : nullptr;
        }
    }
}

// Throws std::bad_alloc when memory runs out (nothing is leaked then).
Instance* _clone(const Instance* src) {
    const Meta_Class* mc = src->meta_class;
    Instance* dst = static_cast<Instance*>(std::calloc(1, mc->size));
    if (!dst)
        throw std::bad_alloc();
    _construct_header(mc, dst, src->__name_space);
    size_t i = 0;
    try {
        for (; i < mc->num_meta_features; i++)
            _clone_slot(mc->meta_features[i], dst, src);
    } catch (...) {
        _destroy_slot(mc->meta_features[i], dst);  // partially built
        _destroy_slots(mc, dst, i);
        _free(dst);
        throw;
    }
    return dst;
}

}  // namespace

//------------------------------------------------------------------------------
// Life cycle
//------------------------------------------------------------------------------

void __default_construct(const Meta_Class* meta_class, Instance* instance, bool clear,
                         bool defaults) {
    if (clear)
        std::memset(static_cast<void*>(instance), 0, meta_class->size);
    _construct_header(meta_class, instance, String());
    size_t i = 0;
    try {
        for (; i < meta_class->num_meta_features; i++)
            _construct_slot(meta_class->meta_features[i], instance, defaults);
    } catch (...) {
        _destroy_slot(meta_class->meta_features[i], instance);
        _destroy_slots(meta_class, instance, i);
        instance->__name_space.~String();
        unref(meta_class);
        throw;
    }
}

Instance* create(const Meta_Class* meta_class, bool defaults) {
    if (!meta_class || meta_class->size < sizeof(Instance))
        return nullptr;
    Instance* instance = static_cast<Instance*>(std::malloc(meta_class->size));
    if (!instance)
        return nullptr;
    try {
        __default_construct(meta_class, instance, true, defaults);
    } catch (...) {
        std::free(instance);
        return nullptr;
    }
    return instance;
}

Instance* create(const Meta_Method* meta_method) {
    // A method record begins like a class record: same head, features, size.
    return create(reinterpret_cast<const Meta_Class*>(meta_method), false);
}

Instance* clone(const Instance* instance) {
    if (!instance || !_check(instance, "clone"))
        return nullptr;
    try {
        return _clone(instance);
    } catch (...) {
        return nullptr;
    }
}

void destroy(Instance* instance) {
    if (!instance || !_check(instance, "destroy"))
        return;
    const Meta_Class* mc = instance->meta_class;
    _destroy_slots(mc, instance, mc->num_meta_features);
    _free(instance);
}

void ref(const Instance* instance) {
    if (instance && _check(instance, "ref"))
        atomic_inc(&const_cast<Instance*>(instance)->refs);
}

void unref(const Instance* instance) {
    if (!instance || !_check(instance, "unref"))
        return;
    Instance* p = const_cast<Instance*>(instance);
    if (atomic_dec_and_test(&p->refs))
        destroy(p);
}

//------------------------------------------------------------------------------
// Comparison
//------------------------------------------------------------------------------

namespace {

// Two property slots are equal when both are null, or neither is and their
// values are equal.
bool _property_equal(const Meta_Property* mp, const unsigned char* a, const unsigned char* b) {
    uint8 na = null_flag(a, mp);
    if (na != null_flag(b, mp))
        return false;
    return na || property_value_equal(mp, a, b);
}

bool _key_eq(const Instance* a, const Instance* b, int depth) {
    if (!a || !b)
        return a == b;
    if (depth > MAX_DEPTH)
        return false;
    const Meta_Class* mca = a->meta_class;
    const Meta_Class* mcb = b->meta_class;
    for (size_t i = 0; i < mca->num_meta_features; i++) {
        const Meta_Feature* mf = mca->meta_features[i];
        if (!is_key(mf))
            continue;
        if (is_property(mf)) {
            const Meta_Property* mpa = as_property(mf);
            const Meta_Property* mpb = find_property(mcb, mf->name);
            if (!mpb || !(mpb->flags & FLAG_KEY) || mpb->type != mpa->type ||
                mpb->subscript != mpa->subscript || !_valid_type(mpa))
                return false;
            if (!_property_equal(mpa, slot_of(a, mpa->offset), slot_of(b, mpb->offset)))
                return false;
        } else if (is_reference(mf)) {
            const Meta_Reference* mra = as_reference(mf);
            if (mra->subscript)
                continue;
            const Meta_Reference* mrb = find_reference(mcb, mf->name);
            if (!mrb || !(mrb->flags & FLAG_KEY) || mrb->subscript)
                return false;
            if (!is_subclass(mra->meta_class, mrb->meta_class) &&
                !is_subclass(mrb->meta_class, mra->meta_class))
                return false;
            const Instance* ra = reference_in(slot_of(a, mra->offset));
            const Instance* rb = reference_in(slot_of(b, mrb->offset));
            if (!ra || !rb) {
                if (ra != rb)
                    return false;
                continue;
            }
            if (!_key_eq(ra, rb, depth + 1))
                return false;
        }
    }
    return true;
}

bool _identical(const Instance* a, const Instance* b, int depth) {
    if (a == b)
        return true;
    if (!a || !b || a->meta_class != b->meta_class || depth > MAX_DEPTH)
        return false;
    if (a->__name_space != b->__name_space)
        return false;
    const Meta_Class* mc = a->meta_class;
    for (size_t i = 0; i < mc->num_meta_features; i++) {
        const Meta_Feature* mf = mc->meta_features[i];
        if (is_property(mf)) {
            const Meta_Property* mp = as_property(mf);
            if (_valid_type(mp) &&
                !_property_equal(mp, slot_of(a, mp->offset), slot_of(b, mp->offset)))
                return false;
        } else if (is_reference(mf)) {
            const Meta_Reference* mr = as_reference(mf);
            const unsigned char* sa = slot_of(a, mr->offset);
            const unsigned char* sb = slot_of(b, mr->offset);
            if (!mr->subscript) {
                if (!_identical(reference_in(sa), reference_in(sb), depth + 1))
                    return false;
                continue;
            }
            if (ref_array_null(sa) != ref_array_null(sb))
                return false;
            if (ref_array_null(sa))
                continue;
            const __Array_Rep* ra = array_rep_in(sa);
            const __Array_Rep* rb = array_rep_in(sb);
            if (ra->size != rb->size)
                return false;
            for (size_t j = 0; j < ra->size; j++) {
                if (!_identical(ref_array_data(sa)[j], ref_array_data(sb)[j], depth + 1))
                    return false;
            }
        }
    }
    return true;
}

}  // namespace

bool key_eq(const Instance* a, const Instance* b) {
    return _key_eq(a, b, 0);
}

bool identical(const Instance* a, const Instance* b) {
    return _identical(a, b, 0);
}

//------------------------------------------------------------------------------
// Null flags, property selection and name spaces
//------------------------------------------------------------------------------

void __set_null_flags(Instance* instance, bool keys, bool non_keys, bool value) {
    if (!instance)
        return;
    const Meta_Class* mc = instance->meta_class;
    for (size_t i = 0; i < mc->num_meta_features; i++) {
        const Meta_Feature* mf = mc->meta_features[i];
        if (!(is_key(mf) ? keys : non_keys))
            continue;
        if (is_property(mf)) {
            const Meta_Property* mp = as_property(mf);
            if (_valid_type(mp))
                null_flag(slot_of(instance, mp->offset), mp) = value;
        } else if (is_reference(mf) && as_reference(mf)->subscript) {
            ref_array_null(slot_of(instance, as_reference(mf)->offset)) = value;
        }
    }
}

int filter_properties(Instance* instance, const char* const* names, bool keep_keys) {
    if (!instance)
        return -1;
    if (!names) {
        __set_null_flags(instance, true, true, false);
        return 0;
    }
    __set_null_flags(instance, !keep_keys, true, true);

    const Meta_Class* mc = instance->meta_class;
    for (; *names; names++) {
        const Meta_Feature* mf = find_feature(mc, *names, FIND_ANY);
        if (!mf)
            continue;
        if (mf->flags & FLAG_METHOD)
            return -1;
        if (is_key(mf))
            continue;
        if (is_property(mf)) {
            const Meta_Property* mp = as_property(mf);
            if (_valid_type(mp))
                null_flag(slot_of(instance, mp->offset), mp) = 0;
        } else if (is_reference(mf)) {
            const Meta_Reference* mr = as_reference(mf);
            unsigned char* slot = slot_of(instance, mr->offset);
            if (mr->subscript)
                ref_array_null(slot) = 0;
            else if (!reference_in(slot))
                reference_in(slot) = create(mr->meta_class, false);
        }
    }
    return 0;
}

namespace {

void _set_name_space(Instance* instance, const char* name_space, bool force, int depth) {
    if (!instance || depth > MAX_DEPTH)
        return;
    if (force || instance->__name_space.size() == 0)
        instance->__name_space.assign(name_space);
    const Meta_Class* mc = instance->meta_class;
    for (size_t i = 0; i < mc->num_meta_features; i++) {
        const Meta_Feature* mf = mc->meta_features[i];
        if (!is_reference(mf))
            continue;
        const Meta_Reference* mr = as_reference(mf);
        unsigned char* slot = slot_of(instance, mr->offset);
        if (!mr->subscript) {
            _set_name_space(reference_in(slot), name_space, force, depth + 1);
            continue;
        }
        const __Array_Rep* rep = array_rep_in(slot);
        for (size_t j = 0; j < rep->size; j++)
            _set_name_space(ref_array_data(slot)[j], name_space, force, depth + 1);
    }
}

}  // namespace

void __set_name_space_recursive(Instance* instance, const char* name_space, bool force) {
    _set_name_space(instance, name_space, force, 0);
}

//------------------------------------------------------------------------------
// Object paths and associations
//------------------------------------------------------------------------------

namespace {

void _append_key_value(String& out, int type, const unsigned char* p) {
    char buffer[64];
    switch (type) {
        case BOOLEAN: out.append(*reinterpret_cast<const boolean*>(p) ? "true" : "false"); return;
        case UINT8:
            snprintf(buffer, sizeof(buffer), "%u", unsigned(*reinterpret_cast<const uint8*>(p)));
            break;
        case SINT8:
            snprintf(buffer, sizeof(buffer), "%d", int(*reinterpret_cast<const sint8*>(p)));
            break;
        case UINT16:
            snprintf(buffer, sizeof(buffer), "%u", unsigned(*reinterpret_cast<const uint16*>(p)));
            break;
        case SINT16:
            snprintf(buffer, sizeof(buffer), "%d", int(*reinterpret_cast<const sint16*>(p)));
            break;
        case UINT32:
            snprintf(buffer, sizeof(buffer), "%u", unsigned(*reinterpret_cast<const uint32*>(p)));
            break;
        case SINT32:
            snprintf(buffer, sizeof(buffer), "%d", int(*reinterpret_cast<const sint32*>(p)));
            break;
        case UINT64:
            snprintf(buffer, sizeof(buffer), "%llu",
                     static_cast<unsigned long long>(*reinterpret_cast<const uint64*>(p)));
            break;
        case SINT64:
            snprintf(buffer, sizeof(buffer), "%lld",
                     static_cast<long long>(*reinterpret_cast<const sint64*>(p)));
            break;
        case REAL32:
            snprintf(buffer, sizeof(buffer), "%f", double(*reinterpret_cast<const real32*>(p)));
            break;
        case REAL64:
            snprintf(buffer, sizeof(buffer), "%f", *reinterpret_cast<const real64*>(p));
            break;
        case CHAR16:
            snprintf(buffer, sizeof(buffer), "'%c'",
                     char(reinterpret_cast<const char16*>(p)->code));
            break;
        case STRING:
            out.append('"');
            out.append(*reinterpret_cast<const String*>(p));
            out.append('"');
            return;
        case DATETIME: reinterpret_cast<const Datetime*>(p)->ascii(buffer, false); break;
        default: return;
    }
    out.append(buffer);
}

int _model_path(const Instance* instance, String& out, int depth) {
    if (!instance || depth > MAX_DEPTH)
        return -1;
    const Meta_Class* mc = instance->meta_class;
    out.assign(mc->name);
    out.append('.');
    size_t keys = 0;
    for (size_t i = 0; i < mc->num_meta_features; i++) {
        const Meta_Feature* mf = mc->meta_features[i];
        if (!is_key(mf) || !(is_property(mf) || is_reference(mf)))
            continue;
        if (keys++)
            out.append(',');
        out.append(mf->name);
        out.append('=');
        if (is_property(mf)) {
            const Meta_Property* mp = as_property(mf);
            const unsigned char* slot = slot_of(instance, mp->offset);
            if (mp->subscript || !_valid_type(mp) || null_flag(slot, mp))
                return -1;
            _append_key_value(out, mp->type, slot);
        } else {
            const Meta_Reference* mr = as_reference(mf);
            if (mr->subscript)
                return -1;
            String nested;
            if (_model_path(reference_in(slot_of(instance, mr->offset)), nested, depth + 1) != 0)
                return -1;
            out.append('"');
            for (size_t j = 0; j < nested.size(); j++) {
                if (nested[j] == '"')
                    out.append('\\');
                out.append(nested[j]);
            }
            out.append('"');
        }
    }
    return keys ? 0 : -1;
}

bool _eqi(const char* a, const char* b) {
    return a && b && strcasecmp(a, b) == 0;
}

bool _given(const char* s) {
    return s && *s;
}

bool _has_ancestor_named(const Meta_Class* mc, const char* name) {
    for (const Meta_Class* p = mc; p; p = super_meta_class_of(p)) {
        if (_eqi(p->name, name))
            return true;
    }
    return false;
}

}  // namespace

int instance_to_model_path(const Instance* instance, String& path) {
    String s;
    if (_model_path(instance, s, 0) != 0)
        return -1;
    path = s;
    return 0;
}

bool is_reference_of(const Instance* instance, const Instance* association, const char* role) {
    if (!instance || !association)
        return false;
    const Meta_Class* mc = association->meta_class;
    for (size_t i = 0; i < mc->num_meta_features; i++) {
        const Meta_Feature* mf = mc->meta_features[i];
        if (!is_reference(mf) || as_reference(mf)->subscript)
            continue;
        if (_given(role) && !_eqi(mf->name, role))
            continue;
        const Instance* p = reference_in(slot_of(association, as_reference(mf)->offset));
        if (p && key_eq(instance, p))
            return true;
    }
    return false;
}

int get_associators(const Instance* instance, const Instance* association, const char* result_class,
                    const char* role, const char* result_role, const Instance** out) {
    if (!instance || !association || !out)
        return -1;
    bool found = false;
    int n = 0;
    const Meta_Class* mc = association->meta_class;
    for (size_t i = 0; i < mc->num_meta_features; i++) {
        const Meta_Feature* mf = mc->meta_features[i];
        if (!is_reference(mf) || as_reference(mf)->subscript)
            continue;
        const Meta_Reference* mr = as_reference(mf);
        const Instance* p = reference_in(slot_of(association, mr->offset));
        if (!p)
            continue;
        if (is_subclass(mr->meta_class, instance->meta_class) && key_eq(instance, p)) {
            // The source end: never part of the result.
            if (!_given(role) || _eqi(mr->name, role))
                found = true;
            continue;
        }
        if (_given(result_class) && !_has_ancestor_named(p->meta_class, result_class))
            continue;
        if (_given(result_role) && !_eqi(mr->name, result_role))
            continue;
        out[n++] = p;
    }
    return found ? n : -1;
}

//------------------------------------------------------------------------------
// Diagnostic dump
//------------------------------------------------------------------------------

namespace {

void _indent(FILE* os, int level) {
    for (int i = 0; i < level; i++)
        fputs("    ", os);
}

void _fprint(FILE* os, const Instance* instance, bool keys_only, int level);

void _fprint_nested(FILE* os, const Instance* instance, int level) {
    if (!instance) {
        fputs(" NULL;\n", os);
        return;
    }
    fputc('\n', os);
    _fprint(os, instance, false, level);
}

void _fprint(FILE* os, const Instance* instance, bool keys_only, int level) {
    if (level > MAX_DEPTH)
        return;
    const Meta_Class* mc = instance->meta_class;
    _indent(os, level);
    fprintf(os, "%s\n", mc->name);
    _indent(os, level);
    fputs("{\n", os);
    _indent(os, level);
    fprintf(os, "    string __name_space = \"%s\";\n", instance->__name_space.c_str());
    for (size_t i = 0; i < mc->num_meta_features; i++) {
        const Meta_Feature* mf = mc->meta_features[i];
        if (keys_only && !is_key(mf))
            continue;
        if (is_property(mf)) {
            const Meta_Property* mp = as_property(mf);
            if (!_valid_type(mp))
                continue;
            const unsigned char* slot = slot_of(instance, mp->offset);
            _indent(os, level + 1);
            fprintf(os, "%s %s%s = ", type_name(mp->type), mf->name, mp->subscript ? "[]" : "");
            if (null_flag(slot, mp))
                fputs("NULL", os);
            else if (mp->subscript)
                print_array(os, mp->type, array_rep_in(slot));
            else
                print_scalar(os, mp->type, slot);
            fputs(";\n", os);
        } else if (is_reference(mf)) {
            const Meta_Reference* mr = as_reference(mf);
            const unsigned char* slot = slot_of(instance, mr->offset);
            const char* cls = mr->meta_class ? mr->meta_class->name : "Instance";
            _indent(os, level + 1);
            if (!mr->subscript) {
                fprintf(os, "%s %s =", cls, mf->name);
                _fprint_nested(os, reference_in(slot), level + 2);
                continue;
            }
            fprintf(os, "%s %s[] =", cls, mf->name);
            if (ref_array_null(slot)) {
                fputs(" NULL;\n", os);
                continue;
            }
            fputs("\n", os);
            _indent(os, level + 1);
            fputs("{\n", os);
            const __Array_Rep* rep = array_rep_in(slot);
            for (size_t j = 0; j < rep->size; j++) {
                const Instance* p = ref_array_data(slot)[j];
                if (p) {
                    _fprint(os, p, false, level + 2);
                } else {
                    _indent(os, level + 2);
                    fputs("NULL\n", os);
                }
            }
            _indent(os, level + 1);
            fputs("}\n", os);
        }
    }
    _indent(os, level);
    fputs("}\n", os);
}

}  // namespace

void fprint(FILE* os, const Instance* instance, bool keys_only) {
    if (!os || !instance)
        return;
    _fprint(os, instance, keys_only, 0);
}

void print(const Instance* instance, bool keys_only) {
    fprint(stdout, instance, keys_only);
}

}  // namespace CPTA
