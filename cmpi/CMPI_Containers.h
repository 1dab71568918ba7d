// The CMPI side of the conversion: CMPI data to and from Value, and the three
// containers over CMPI instances, object paths and argument lists.
#ifndef CPTA_CMPI_CMPI_CONTAINERS_H
#define CPTA_CMPI_CMPI_CONTAINERS_H

#include <cmpidt.h>
#include <cmpift.h>
#include <cmpimacs.h>

#include <utility>
#include <vector>

#include "cmpi/Container.h"

namespace CPTA {

// Encapsulated objects made for outgoing data (strings, date-times, paths,
// instances, arrays and the elements of arrays), released together once the
// receiver has copied the data.
class Cmpi_Objects {
public:
    Cmpi_Objects() = default;
    ~Cmpi_Objects() { release(); }

    Cmpi_Objects(const Cmpi_Objects&) = delete;
    Cmpi_Objects& operator=(const Cmpi_Objects&) = delete;

    template <class T>
    void add(T* object) {
        if (object)
            _objects.push_back({object, &_release<T>});
    }

    void release() {
        for (auto& o : _objects)
            o.second(o.first);
        _objects.clear();
    }

    // Moves the objects of from into this set.
    void take(Cmpi_Objects& from) {
        _objects.insert(_objects.end(), from._objects.begin(), from._objects.end());
        from._objects.clear();
    }

    // Gives the objects up without releasing them.
    void forget() { _objects.clear(); }

private:
    template <class T>
    static void _release(void* p) {
        CMRelease(static_cast<T*>(p));
    }

    std::vector<std::pair<void*, void (*)(void*)>> _objects;
};

// Reads one CMPI datum into value (a CMPI_ref becomes a key-only instance, a
// CMPI_instance a full one, both of a class of the repository). 0 or -1.
int cmpi_to_cimple_value(const Meta_Repository* meta_repository, const CMPIBroker* broker,
                         const char* name_space, const CMPIData& data, Value& value);

// Writes one scalar value as CMPI data; an instance becomes an embedded
// instance when flags has EmbeddedObject or EmbeddedInstance, otherwise an
// object path. Instances without a name space get name_space. The objects
// made go to made (when given; otherwise the caller owns the value's object
// and the broker the rest). 0 or -1.
int to_cmpi_scalar(const Meta_Repository* meta_repository, const CMPIBroker* broker,
                   const char* name_space, const Value& value, uint32 flags, CMPIValue& cmpi_value,
                   CMPIType& cmpi_type, Cmpi_Objects* made = nullptr);

// The same for scalars and arrays, with the value's null state.
int _to_cmpi_data(const Meta_Repository* meta_repository, const CMPIBroker* broker,
                  const char* name_space, const Value& value, uint32 flags, CMPIData& data,
                  Cmpi_Objects* made = nullptr);

// What the three CMPI containers share: the broker and the name space that
// embedded objects without one of their own get.
class CMPI_Container : public Container {
public:
    CMPI_Container(const Meta_Repository* meta_repository, const CMPIBroker* broker,
                   const char* name_space);

protected:
    // Reads element pos (data and, when wanted, name) through fetch, checks
    // the tag and applies the repair of the subclass. 0 or -1.
    template <class F>
    int _get_value(size_t pos, Value::Type expected, Value& value, const char* what, F fetch);

    // A tag mismatch the container knows how to mend: true when value now
    // has the expected tag.
    virtual bool _repair(Value& value, Value::Type expected);

    const CMPIBroker* _broker;
    String _name_space;
};

class CMPIInstance_Container : public CMPI_Container {
public:
    CMPIInstance_Container(const Meta_Repository* meta_repository, const CMPIBroker* broker,
                           const char* name_space, const CMPIInstance* instance);

    size_t get_size() override;
    int get_name(size_t pos, String& name) override;
    int get_value(size_t pos, Value::Type expected, Value& value) override;
    int set_value(const char* name, const Value& value, uint32 flags) override;

private:
    const CMPIInstance* _instance;
};

// Keys of an object path. Integer keys that arrive as 64-bit integers are
// converted to the integer type of the key property.
class CMPIObjectPath_Container : public CMPI_Container {
public:
    CMPIObjectPath_Container(const Meta_Repository* meta_repository, const CMPIBroker* broker,
                             const char* name_space, const CMPIObjectPath* object_path);

    size_t get_size() override;
    int get_name(size_t pos, String& name) override;
    int get_value(size_t pos, Value::Type expected, Value& value) override;
    int set_value(const char* name, const Value& value, uint32 flags) override;

protected:
    bool _repair(Value& value, Value::Type expected) override;

private:
    const CMPIObjectPath* _object_path;
};

// Method arguments. "return_value" is not added to the list: it is kept for
// the caller (take_return_value). A boolean that arrives where an array of
// references is expected becomes an empty, null array.
class CMPIArgs_Container : public CMPI_Container {
public:
    CMPIArgs_Container(const Meta_Repository* meta_repository, const CMPIBroker* broker,
                       const char* name_space, const CMPIArgs* args);

    size_t get_size() override;
    int get_name(size_t pos, String& name) override;
    int get_value(size_t pos, Value::Type expected, Value& value) override;
    int set_value(const char* name, const Value& value, uint32 flags) override;

    // Hands the kept return value over to the caller, with the objects made
    // for it (to made, when given); false when none was set.
    bool take_return_value(CMPIValue& value, CMPIType& type, Cmpi_Objects* made = nullptr);

protected:
    bool _repair(Value& value, Value::Type expected) override;

private:
    const CMPIArgs* _args;
    CMPIData _return_value;
    Cmpi_Objects _return_objects;
    bool _has_return_value;
};

}  // namespace CPTA

#endif
