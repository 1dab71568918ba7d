// A name/value store that model instances are converted to and from, one
// feature at a time, through Value.
#ifndef CPTA_CMPI_CONTAINER_H
#define CPTA_CMPI_CONTAINER_H

#include "framework/Instance.h"
#include "framework/String.h"
#include "framework/Value.h"

namespace CPTA {

class Container {
public:
    explicit Container(const Meta_Repository* meta_repository)
        : _meta_repository(meta_repository) {}
    virtual ~Container();

    Container(const Container&) = delete;
    Container& operator=(const Container&) = delete;

    // Number of elements.
    virtual size_t get_size() = 0;
    // Name of element pos: 0 or -1.
    virtual int get_name(size_t pos, String& name) = 0;
    // Value of element pos, which must come out with the tag expected: 0 or -1.
    virtual int get_value(size_t pos, Value::Type expected, Value& value) = 0;
    // Stores a value under name; flags are those of the feature: 0 or -1.
    virtual int set_value(const char* name, const Value& value, uint32 flags) = 0;

    // Model to container: every feature of the instance that is not null,
    // and every null property whose class gives it a default, as a null
    // (restricted to features with one of the flag bits when flags is not 0).
    // Features that cannot be converted are logged and skipped. -1 only for
    // a missing instance.
    int convert(const Instance* instance, uint32 flags);

    // Container to model: the elements that name a property or reference of
    // the class (with one of the flag bits when flags is not 0). Creates the
    // instance (without defaults, everything null) unless one is given; a
    // given instance has the selected features set null first. Elements that
    // cannot be converted are logged and skipped. 0, or -1 when the instance
    // cannot be created.
    int convert(const Meta_Class* meta_class, uint32 flags, Instance*& instance);

    const Meta_Repository* meta_repository() const { return _meta_repository; }

    // Number of features that the conversions so far could not convert.
    size_t failures() const { return _failures; }

private:
    const Meta_Repository* _meta_repository;
    size_t _failures = 0;
};

}  // namespace CPTA

#endif
