#include "framework/Slot.h"

#include <cctype>
#include <cstring>

namespace CPTA {

namespace {

template <class T>
bool _eq(const void* a, const void* b) {
    return *static_cast<const T*>(a) == *static_cast<const T*>(b);
}

}  // namespace

bool scalar_equal(int type, const void* a, const void* b) {
    switch (type) {
        case BOOLEAN: return _eq<boolean>(a, b);
        case REAL32: return _eq<real32>(a, b);
        case REAL64: return _eq<real64>(a, b);
        case STRING: return _eq<String>(a, b);
        case DATETIME: return _eq<Datetime>(a, b);
        default: return std::memcmp(a, b, type_size(type)) == 0;
    }
}

bool property_value_equal(const Meta_Property* mp, const unsigned char* a, const unsigned char* b) {
    if (mp->subscript)
        return __equal(array_rep_in(a), array_rep_in(b));
    return scalar_equal(mp->type, a, b);
}

void print_scalar(FILE* os, int type, const void* p, bool prettify) {
    switch (type) {
        case BOOLEAN: fputs(*static_cast<const boolean*>(p) ? "true" : "false", os); break;
        case UINT8: fprintf(os, "%u", unsigned(*static_cast<const uint8*>(p))); break;
        case SINT8: fprintf(os, "%d", int(*static_cast<const sint8*>(p))); break;
        case UINT16: fprintf(os, "%u", unsigned(*static_cast<const uint16*>(p))); break;
        case SINT16: fprintf(os, "%d", int(*static_cast<const sint16*>(p))); break;
        case UINT32: fprintf(os, "%u", unsigned(*static_cast<const uint32*>(p))); break;
        case SINT32: fprintf(os, "%d", int(*static_cast<const sint32*>(p))); break;
        case UINT64:
            fprintf(os, "%llu", static_cast<unsigned long long>(*static_cast<const uint64*>(p)));
            break;
        case SINT64:
            fprintf(os, "%lld", static_cast<long long>(*static_cast<const sint64*>(p)));
            break;
        case REAL32: fprintf(os, "%f", double(*static_cast<const real32*>(p))); break;
        case REAL64: fprintf(os, "%f", *static_cast<const real64*>(p)); break;
        case CHAR16: {
            uint16 c = static_cast<const char16*>(p)->code;
            if (c < 128 && isprint(c))
                fprintf(os, "'%c'", char(c));
            else
                fprintf(os, "0x%04X", unsigned(c));
            break;
        }
        case STRING: fprintf(os, "\"%s\"", static_cast<const String*>(p)->c_str()); break;
        case DATETIME: {
            char buffer[Datetime::BUFFER_SIZE];
            static_cast<const Datetime*>(p)->ascii(buffer, prettify);
            fprintf(os, "\"%s\"", buffer);
            break;
        }
        default: fputs("?", os); break;
    }
}

void print_array(FILE* os, int type, const __Array_Rep* rep, bool prettify) {
    fputc('{', os);
    for (size_t i = 0; i < rep->size; i++) {
        if (i)
            fputs(", ", os);
        print_scalar(os, type, rep->data() + i * rep->traits->size, prettify);
    }
    fputc('}', os);
}

}  // namespace CPTA
