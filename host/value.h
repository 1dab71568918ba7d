// Host-side CIM values: typed values, date-times, object paths and
// instances, with a stable text form (printing and parsing) shared by the
// tests, the golden files, tvrncli's object paths and its --seed files.
// (tvrncli prints instances and values in MOF instead, see host/mof.h.)
//
// Text forms:
//   object path   //host/root/ns:Class.Key1="v",Key2=5   (host and namespace
//                 optional; keys printed sorted by name)
//   instance      instance root/ns:Class.Key="v" {
//                     string Key = "v";
//                     uint16[] Codes = {2, 3};
//                     ref Antecedent = "root/ns:Other.Id=\"1\"";
//                     datetime When = "20240101120000.000000+000";
//                     string Note = NULL;
//                 }
//                 (properties sorted by name; an embedded instance prints as
//                 `instance Name = instance Class { ... };`)
#ifndef TVRN_HOST_VALUE_H
#define TVRN_HOST_VALUE_H

#include <cstdint>
#include <memory>
#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

namespace tvrnhost {

enum class Type : std::uint8_t {
    Boolean,
    Uint8,
    Sint8,
    Uint16,
    Sint16,
    Uint32,
    Sint32,
    Uint64,
    Sint64,
    Real32,
    Real64,
    Char16,
    String,
    DateTime,
    Reference,
    Instance,
};

// "boolean", "uint8", ..., "char16", "string", "datetime", "ref", "instance".
const char* typeName(Type t);
std::optional<Type> typeFromName(std::string_view name);
bool isSignedInteger(Type t);
bool isUnsignedInteger(Type t);
bool isInteger(Type t);
// The width of an integer type in bits; 0 for other types.
int integerBits(Type t);

// Text forms are malformed, values out of range, and similar.
struct ParseError : std::runtime_error {
    using std::runtime_error::runtime_error;
};

// CIM date-time in its 25-character form: a timestamp
// "yyyymmddhhmmss.mmmmmm+UUU" (UUU: offset from UTC in minutes) or an
// interval "ddddddddhhmmss.mmmmmm:000".
class DateTime {
public:
    DateTime();  // the zero interval
    static std::optional<DateTime> parse(std::string_view text);
    // Microseconds since 1970-01-01 UTC (timestamp) or the interval length.
    static DateTime fromBinary(std::uint64_t usec, bool interval);
    static DateTime now();

    const std::string& text() const { return text_; }
    bool isInterval() const { return text_[21] == ':'; }
    std::uint64_t toBinary() const;

    bool operator==(const DateTime& o) const { return text_ == o.text_; }
    bool operator!=(const DateTime& o) const { return !(*this == o); }

private:
    explicit DateTime(std::string text) : text_(std::move(text)) {}
    std::string text_;
};

class ObjectPath;
class Instance;

// A typed CIM value, scalar or array, possibly null.
class Value {
public:
    Value() = default;  // a null string
    static Value null(Type t, bool array = false);
    static Value boolean(bool v);
    static Value uint8(std::uint8_t v) { return integer(Type::Uint8, v); }
    static Value sint8(std::int8_t v) { return integer(Type::Sint8, std::uint64_t(v)); }
    static Value uint16(std::uint16_t v) { return integer(Type::Uint16, v); }
    static Value sint16(std::int16_t v) { return integer(Type::Sint16, std::uint64_t(v)); }
    static Value uint32(std::uint32_t v) { return integer(Type::Uint32, v); }
    static Value sint32(std::int32_t v) { return integer(Type::Sint32, std::uint64_t(v)); }
    static Value uint64(std::uint64_t v) { return integer(Type::Uint64, v); }
    static Value sint64(std::int64_t v) { return integer(Type::Sint64, std::uint64_t(v)); }
    // Any integer type; the bits are truncated to the type's width.
    static Value integer(Type t, std::uint64_t bits);
    static Value real32(float v);
    static Value real64(double v);
    static Value char16(std::uint16_t v);
    static Value string(std::string v);
    static Value dateTime(DateTime v);
    static Value reference(ObjectPath v);
    static Value instance(Instance v);
    // Elements must be scalars of type `element` (null elements allowed).
    static Value array(Type element, std::vector<Value> elements);

    Type type() const { return type_; }
    bool isArray() const { return array_; }
    bool isNull() const { return null_; }

    bool asBool() const { return bits_ != 0; }
    std::uint64_t asUint() const { return bits_; }
    std::int64_t asSint() const { return static_cast<std::int64_t>(bits_); }
    double asReal() const { return real_; }
    std::uint16_t asChar16() const { return static_cast<std::uint16_t>(bits_); }
    const std::string& asString() const { return str_; }
    const DateTime& asDateTime() const { return dt_; }
    const ObjectPath& asReference() const;
    const Instance& asInstance() const;
    const std::vector<Value>& elements() const { return elems_; }

    // The value alone in the text form ("NULL", 5, "text", {1, 2}, ...).
    std::string toString() const;

    bool operator==(const Value& o) const;
    bool operator!=(const Value& o) const { return !(*this == o); }

private:
    Type type_ = Type::String;
    bool array_ = false;
    bool null_ = true;
    std::uint64_t bits_ = 0;  // integers (sign-extended), boolean, char16
    double real_ = 0;
    std::string str_;
    DateTime dt_;
    std::shared_ptr<const ObjectPath> ref_;
    std::shared_ptr<const Instance> inst_;
    std::vector<Value> elems_;
};

struct Property {
    std::string name;
    Value value;
    bool operator==(const Property& o) const;
    bool operator!=(const Property& o) const { return !(*this == o); }
};
using PropertyVector = std::vector<Property>;

// Case-insensitive look-up and replacement in a property vector.
const Value* findProperty(const PropertyVector& v, std::string_view name);
void setProperty(PropertyVector& v, std::string name, Value value);
bool equalsIgnoreCase(std::string_view a, std::string_view b);
std::string toLower(std::string_view s);

class ObjectPath {
public:
    ObjectPath() = default;
    ObjectPath(std::string nameSpace, std::string className)
        : ns_(std::move(nameSpace)), class_(std::move(className)) {}
    // Throws ParseError.
    static ObjectPath parse(std::string_view text);

    const std::string& host() const { return host_; }
    const std::string& nameSpace() const { return ns_; }
    const std::string& className() const { return class_; }
    ObjectPath& setHost(std::string h) {
        host_ = std::move(h);
        return *this;
    }
    ObjectPath& setNameSpace(std::string n) {
        ns_ = std::move(n);
        return *this;
    }
    ObjectPath& setClassName(std::string c) {
        class_ = std::move(c);
        return *this;
    }

    ObjectPath& addKey(std::string name, Value v);  // replaces a key of that name
    const Value* key(std::string_view name) const { return findProperty(keys_, name); }
    const PropertyVector& keys() const { return keys_; }
    void clearKeys() { keys_.clear(); }

    std::string toString() const;

    // Exact: same host, namespace and class (case-insensitive) and the same
    // keys with equal values of the same types.
    bool operator==(const ObjectPath& o) const;
    bool operator!=(const ObjectPath& o) const { return !(*this == o); }
    // What a server means by "the same object": class and keys, with
    // integer keys compared by value whatever their width, and namespaces
    // compared only when both are given. Hosts are ignored.
    bool identifies(const ObjectPath& o) const;

private:
    std::string host_, ns_, class_;
    PropertyVector keys_;
};

class Instance {
public:
    Instance() = default;
    explicit Instance(ObjectPath path) : path_(std::move(path)) {}
    Instance(std::string nameSpace, std::string className)
        : path_(std::move(nameSpace), std::move(className)) {}

    const std::string& className() const { return path_.className(); }
    const ObjectPath& path() const { return path_; }
    ObjectPath& path() { return path_; }
    void setPath(ObjectPath p) { path_ = std::move(p); }

    Instance& set(std::string name, Value v);
    // Sets the property and the key of the same name in the path.
    Instance& setKey(std::string name, Value v);
    const Value* get(std::string_view name) const { return findProperty(props_, name); }
    bool remove(std::string_view name);
    const PropertyVector& properties() const { return props_; }

    std::string toString() const;

    bool operator==(const Instance& o) const;
    bool operator!=(const Instance& o) const { return !(*this == o); }

private:
    ObjectPath path_;
    PropertyVector props_;
};

// Parses a sequence of instances in the text form ('#' and '//' comments
// allowed between them). Throws ParseError with a line number.
std::vector<Instance> parseInstances(std::string_view text);

// Parses a value literal. With a type, the literal must be of that type
// (an array literal when `array`). Without one the type is guessed:
// NULL, TRUE/FALSE, integers (uint64, or sint64 when negative), reals
// (real64), quoted text (a reference when it reads as an object path with
// keys, a string otherwise), {a, b} arrays, and a bare word as a string.
// A "type:" or "type[]:" prefix (for example uint16:5) gives the type
// explicitly. Throws ParseError.
Value parseValue(std::string_view text, std::optional<Type> type = std::nullopt,
                 bool array = false);

// Property declarations in the instance text form, one per line, sorted by
// name: `<type>[] <Name> = <value>;`, each line indented by `indent`.
std::string declarations(const PropertyVector& props, int indent = 0);

std::ostream& operator<<(std::ostream& os, const Value& v);
std::ostream& operator<<(std::ostream& os, const ObjectPath& p);
std::ostream& operator<<(std::ostream& os, const Instance& i);

}  // namespace tvrnhost

#endif
