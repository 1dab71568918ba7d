// Shared set-up of the inventory tests: the adapter-library simulator bound
// once per program, a provider start-up against it, a fake host whose look-ups
// are counted, and owning views of the instance arrays the dispatchers return.
#ifndef TVRN_TESTS_INVENTORY_INVENTORYTESTSUPPORT_H
#define TVRN_TESTS_INVENTORY_INVENTORYTESTSUPPORT_H

#include <gtest/gtest.h>

#include <string>

#include "framework/Array.h"
#include "framework/Instance.h"
#include "gateway/ProviderUtil.h"
#include "simulator/SimControl.h"
#include "tests/gateway/TestSupport.h"

namespace invtest {

// The fake host: named "invhost", resolving to 127.0.1.1 and kHostAddress
// (ADDRESS), or as the mode says; hostResolves() counts its look-ups.
extern const char kHostAddress[];
enum class HostMode { ADDRESS, LOOPBACK_ONLY, UNRESOLVABLE, NO_NAME };
void setHostMode(HostMode mode);
int& hostResolves();

// An owned instance array: every instance is destroyed with it.
class Instances {
public:
    explicit Instances(CPTA::Array<CPTA::Instance*> items) : _items(items) {}
    ~Instances();
    Instances(const Instances&) = delete;
    Instances& operator=(const Instances&) = delete;

    size_t size() const { return _items.size(); }
    bool empty() const { return _items.size() == 0; }
    template <class T>
    T* at(size_t i) const {
        return i < _items.size() && _items[i] != nullptr &&
                       _items[i]->meta_class == &T::static_meta_class
                   ? static_cast<T*>(_items[i])
                   : nullptr;
    }
    // The first instance whose string property equals `value`.
    template <class T>
    T* find(CPTA::Property<CPTA::String> T::*property, const std::string& value) const {
        for (size_t i = 0; i < _items.size(); i++) {
            T* t = at<T>(i);
            if (t != nullptr && !(t->*property).null && value == (t->*property).value.c_str())
                return t;
        }
        return nullptr;
    }
    template <class T>
    std::vector<std::string> values(CPTA::Property<CPTA::String> T::*property) const {
        std::vector<std::string> out;
        for (size_t i = 0; i < _items.size(); i++)
            if (T* t = at<T>(i))
                out.push_back((t->*property).value.c_str());
        return out;
    }

private:
    CPTA::Array<CPTA::Instance*> _items;
};

inline CPTA::Array<CPTA::String> strings(std::initializer_list<const char*> values) {
    CPTA::Array<CPTA::String> out;
    for (const char* v : values)
        out.append(CPTA::String(v));
    return out;
}

// The JSON of a fixture of the simulator's source tree ("default", "variants", ...).
Json::Value fixtureJson(const char* name);

// Base of the inventory tests: a usable driver, the simulator's built-in host,
// the fake host in ADDRESS mode, and the log marked.
class InventoryTest : public ::testing::Test {
protected:
    void SetUp() override;
    void TearDown() override;

    gwtest::SimLibrary& sim() { return *_sim; }
    void load(const char* fixture) { _sim->loadFixture(fixture); }
    void loadJson(const Json::Value& fixture);
    void fault(const char* entry, const char* key, int kind, const char* text = nullptr) {
        _sim->setFault(entry, key, kind, 7, text, 0);
    }

    // The dispatchers' answers.
    static CPTA::Array<CPTA::Instance*> fchba(CPTA::classId_t id);
    static CPTA::Array<CPTA::Instance*> hdr(CPTA::classId_t id);

    static int logged(const char* level, const std::string& message) {
        return gwtest::LogCapture::get().count(level, message);
    }
    static std::string log() { return gwtest::LogCapture::get().text(); }

private:
    gwtest::SimLibrary* _sim = nullptr;
};

}  // namespace invtest

#endif
