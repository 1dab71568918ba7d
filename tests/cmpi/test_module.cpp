// A provider module for the tests of the CMPI binding, built from the same
// binding code as libtvrnprovider.so. Its providers keep what they are given
// in memory and answer with statuses that the tests choose, so that every
// path of the binding can be driven through the embedded host:
//
//   Test_Store_Provider  TVRNTEST_Gadget: an in-memory table behind create,
//                        delete, modify and enum_instances (get_instance is
//                        left to the enumeration); Configure()
//   Test_Link_Provider   TVRNTEST_Link: an association that only creates and
//                        enumerates; everything else through the fallbacks
//   Test_Alert_Provider  TAVRIN_AlertIndication: a delivery thread that calls
//                        back into the server for each indication
//
// tvrntest_control() and tvrntest_text() let the tests steer and observe.
#include <strings.h>

#include <chrono>
#include <condition_variable>
#include <cstdio>
#include <cstdlib>
#include <map>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include "cmpi/cimom.h"
#include "framework/Slot.h"
#include "framework/Thread.h"
#include "framework/Value.h"
#include "providers/Provider_Base.h"
#include "schema/generated/CIM_ObjectManager.h"
#include "schema/generated/TAVRIN_AlertIndication.h"
#include "tests/cmpi/test_classes.h"

namespace CPTA {

namespace {

struct Test_State {
    std::mutex mutex;
    std::vector<Instance*> gadgets;
    std::vector<Instance*> links;
    std::map<std::string, long> forced;
    std::map<std::string, long> counters;
    std::string model;    // non-null properties of the last model seen
    std::string created;  // the last instance created, printed
    long flood = -1;      // pause between flooded indications in microseconds; -1: no flood

    void clear() {
        for (Instance* i : gadgets)
            unref(i);
        for (Instance* i : links)
            unref(i);
        gadgets.clear();
        links.clear();
        forced.clear();
        counters.clear();
        model.clear();
        created.clear();
        flood = -1;
    }
    ~Test_State() { clear(); }
};

Test_State& state() {
    static Test_State s;
    return s;
}

void count(const std::string& name) {
    std::lock_guard<std::mutex> g(state().mutex);
    state().counters[name]++;
}

// The status the tests forced for an operation, or -1.
long forced(const std::string& op) {
    std::lock_guard<std::mutex> g(state().mutex);
    auto it = state().forced.find(op);
    return it == state().forced.end() ? -1 : it->second;
}

std::string print_instance(const Instance* instance) {
    char* text = nullptr;
    size_t size = 0;
    FILE* os = open_memstream(&text, &size);
    if (!os)
        return std::string();
    fprint(os, instance);
    fclose(os);
    std::string result(text, size);
    free(text);
    return result;
}

void note_model(const Instance* model) {
    std::string names;
    const Meta_Class* mc = model->meta_class;
    for (size_t i = 0; i < mc->num_meta_features; i++) {
        const Meta_Feature* mf = mc->meta_features[i];
        if (!is_property(mf))
            continue;
        const Meta_Property* mp = as_property(mf);
        if (null_flag(slot_of(model, mp->offset), mp))
            continue;
        if (!names.empty())
            names += ",";
        names += mf->name;
    }
    std::lock_guard<std::mutex> g(state().mutex);
    state().model = names;
}

}  // namespace

//------------------------------------------------------------------------------
// Test_Store_Provider
//------------------------------------------------------------------------------

std::string _call_back(const TVRNTEST_Gadget* self);

class Test_Store_Provider : public Instance_Provider<TVRNTEST_Gadget> {
public:
    Load_Status load() {
        count("load");
        return LOAD_OK;
    }

    Unload_Status unload() {
        count("unload");
        return UNLOAD_OK;
    }

    Get_Instance_Status get_instance(const TVRNTEST_Gadget* model, TVRNTEST_Gadget*&) {
        note_model(model);
        long f = forced("get");
        return f >= 0 ? Get_Instance_Status(f) : GET_INSTANCE_UNSUPPORTED;
    }

    Enum_Instances_Status enum_instances(const TVRNTEST_Gadget* model,
                                         Enum_Instances_Handler<TVRNTEST_Gadget>* handler) {
        count("enum");
        note_model(model);
        std::vector<Instance*> copies;
        {
            std::lock_guard<std::mutex> g(state().mutex);
            for (Instance* i : state().gadgets)
                copies.push_back(clone(i));
        }
        for (Instance* i : copies)
            handler->handle(static_cast<TVRNTEST_Gadget*>(i));
        long f = forced("enum");
        return f >= 0 ? Enum_Instances_Status(f) : ENUM_INSTANCES_OK;
    }

    Create_Instance_Status create_instance(TVRNTEST_Gadget* instance) {
        long f = forced("create");
        if (f >= 0)
            return Create_Instance_Status(f);
        std::lock_guard<std::mutex> g(state().mutex);
        for (Instance* i : state().gadgets) {
            if (key_eq(i, instance))
                return CREATE_INSTANCE_DUPLICATE;
        }
        state().gadgets.push_back(clone(instance));
        state().created = print_instance(instance);
        return CREATE_INSTANCE_OK;
    }

    Delete_Instance_Status delete_instance(const TVRNTEST_Gadget* instance) {
        long f = forced("delete");
        if (f >= 0)
            return Delete_Instance_Status(f);
        std::lock_guard<std::mutex> g(state().mutex);
        for (auto it = state().gadgets.begin(); it != state().gadgets.end(); ++it) {
            if (key_eq(*it, instance)) {
                unref(*it);
                state().gadgets.erase(it);
                return DELETE_INSTANCE_OK;
            }
        }
        return DELETE_INSTANCE_NOT_FOUND;
    }

    // Copies the properties that the model names from instance.
    Modify_Instance_Status modify_instance(const TVRNTEST_Gadget* model,
                                           const TVRNTEST_Gadget* instance) {
        note_model(model);
        long f = forced("modify");
        if (f >= 0)
            return Modify_Instance_Status(f);
        std::lock_guard<std::mutex> g(state().mutex);
        for (Instance* stored : state().gadgets) {
            if (!key_eq(stored, instance))
                continue;
            const Meta_Class* mc = model->meta_class;
            for (size_t i = 0; i < mc->num_meta_features; i++) {
                const Meta_Feature* mf = mc->meta_features[i];
                if (!is_property(mf) || is_key(mf))
                    continue;
                const Meta_Property* mp = as_property(mf);
                if (null_flag(slot_of(model, mp->offset), mp))
                    continue;
                Value v;
                if (v.set(instance, mf) == 0)
                    v.get(stored, mf);
            }
            return MODIFY_INSTANCE_OK;
        }
        return MODIFY_INSTANCE_NOT_FOUND;
    }

    // Level 99 forbids unloading, 98 allows it again, 97 calls back into the
    // server (Report tells how that went). Otherwise Report tells what
    // arrived. Result is a new owner; the return value is 7.
    Invoke_Method_Status Configure(const TVRNTEST_Gadget* self, const Property<uint32>& Level,
                                   const Property<Array<TVRNTEST_Owner*>>& Targets,
                                   Property<String>& Report, TVRNTEST_Owner*& Result,
                                   Property<uint32>& return_value) {
        long f = forced("invoke");
        if (f >= 0)
            return Invoke_Method_Status(f);
        if (!Level.null && Level.value == 99)
            cimom::allow_unload(false);
        if (!Level.null && Level.value == 98)
            cimom::allow_unload(true);
        if (!Level.null && Level.value == 97) {
            Report.set(_call_back(self).c_str());
            return_value.set(7);
            return INVOKE_METHOD_OK;
        }
        String user;
        bool has_user = cimom::get_username(user);
        char text[256];
        snprintf(text, sizeof(text), "level=%u targets=%zu null=%d user=%s",
                 Level.null ? 0u : unsigned(Level.value), Targets.value.size(), int(Targets.null),
                 has_user ? user.c_str() : "?");
        Report.set(String(text));
        TVRNTEST_Owner* owner = create<TVRNTEST_Owner>(false);
        owner->Id.set("result");
        owner->Name.set("made by Configure");
        Result = owner;
        return_value.set(7);
        return INVOKE_METHOD_OK;
    }
};

// Every kind of call back into the server, on owners kept by the server and
// on the gadget itself.
std::string _call_back(const TVRNTEST_Gadget* self) {
    Ref<TVRNTEST_Owner> model(create<TVRNTEST_Owner>(false));
    int owners = 0;
    {
        Instance_Enumerator e;
        if (cimom::enum_instances("root/test", model.ptr(), e) == 0) {
            for (; e; e++) {
                Ref<> owner(e());
                owners++;
            }
        }
    }
    model->Id.set("made");
    model->Name.set("made");
    int created = cimom::create_instance("root/test", model.ptr());
    model->Name.set("renamed");
    int modified = cimom::modify_instance("root/test", model.ptr());
    Ref<TVRNTEST_Owner> got(
        static_cast<TVRNTEST_Owner*>(cimom::get_instance("root/test", model.ptr())));
    int deleted = cimom::delete_instance("root/test", model.ptr());

    Ref<TVRNTEST_Gadget_Configure_method> meth(static_cast<TVRNTEST_Gadget_Configure_method*>(
        create(&TVRNTEST_Gadget_Configure_method::static_meta_class)));
    __set_null_flags(meth.ptr(), true, true, true);
    meth->Level.set(5);
    int invoked = cimom::invoke_method("root/test", self, meth.ptr());

    char text[512];
    snprintf(text, sizeof(text),
             "owners=%d create=%d modify=%d get=%s delete=%d invoke=%d return=%u inner=%s "
             "result=%s",
             owners, created, modified, got ? got->Name.value.c_str() : "?", deleted, invoked,
             meth->return_value.null ? 0u : unsigned(meth->return_value.value),
             meth->Report.null ? "?" : meth->Report.value.c_str(),
             meth->Result ? meth->Result->Id.value.c_str() : "?");
    return text;
}

template <class P>
int TVRNTEST_Gadget_invoke_method(P* provider, const TVRNTEST_Gadget* self, Instance* record) {
    if (strcasecmp(record->meta_class->name, "Configure") != 0)
        return -1;
    TVRNTEST_Gadget_Configure_method* r = static_cast<TVRNTEST_Gadget_Configure_method*>(record);
    return provider->Configure(self, r->Level, r->Targets, r->Report, r->Result, r->return_value);
}

//------------------------------------------------------------------------------
// Test_Link_Provider
//------------------------------------------------------------------------------

class Test_Link_Provider : public Association_Provider<TVRNTEST_Link> {
public:
    Enum_Instances_Status enum_instances(const TVRNTEST_Link*,
                                         Enum_Instances_Handler<TVRNTEST_Link>* handler) {
        std::vector<Instance*> copies;
        {
            std::lock_guard<std::mutex> g(state().mutex);
            for (Instance* i : state().links)
                copies.push_back(clone(i));
        }
        for (Instance* i : copies)
            handler->handle(static_cast<TVRNTEST_Link*>(i));
        long f = forced("link.enum");
        return f >= 0 ? Enum_Instances_Status(f) : ENUM_INSTANCES_OK;
    }

    Create_Instance_Status create_instance(TVRNTEST_Link* instance) {
        std::lock_guard<std::mutex> g(state().mutex);
        state().links.push_back(clone(instance));
        return CREATE_INSTANCE_OK;
    }

    Enum_Associator_Names_Status enum_associator_names(const Instance*, const String&,
                                                       const String&, const String&,
                                                       Enum_Associator_Names_Handler<Instance>*) {
        long f = forced("associator_names");
        return f >= 0 ? Enum_Associator_Names_Status(f) : ENUM_ASSOCIATOR_NAMES_UNSUPPORTED;
    }

    Enum_Associators_Status enum_associators(const Instance*, const String&, const String&,
                                             const String&, Enum_Associators_Handler<Instance>*) {
        long f = forced("associators");
        return f >= 0 ? Enum_Associators_Status(f) : ENUM_ASSOCIATORS_UNSUPPORTED;
    }

    Enum_References_Status enum_references(const Instance*, const TVRNTEST_Link*, const String&,
                                           Enum_References_Handler<TVRNTEST_Link>*) {
        long f = forced("references");
        return f >= 0 ? Enum_References_Status(f) : ENUM_REFERENCES_UNSUPPORTED;
    }
};

template <class P>
int TVRNTEST_Link_invoke_method(P*, const TVRNTEST_Link*, Instance*) {
    return -1;
}

//------------------------------------------------------------------------------
// Test_Alert_Provider
//------------------------------------------------------------------------------

// Each requested indication carries in Message the ElementName of the object
// manager that the thread reads from the server for it.
class Test_Alert_Provider : public Indication_Provider<TAVRIN_AlertIndication> {
public:
    Enable_Indications_Status enable_indications(
        Indication_Handler<TAVRIN_AlertIndication>* handler) {
        count("enable");
        long f = forced("enable");
        if (f >= 0)
            return Enable_Indications_Status(f);
        _handler = handler;
        _stop = false;
        _pending = 0;
        if (Thread::create_joinable(_thread, _deliver, this) != 0) {
            _handler = nullptr;
            return ENABLE_INDICATIONS_FAILED;
        }
        _running = true;
        return ENABLE_INDICATIONS_OK;
    }

    Disable_Indications_Status disable_indications() {
        count("disable");
        if (_running) {
            {
                std::lock_guard<std::mutex> g(_mutex);
                _stop = true;
            }
            _wake.notify_all();
            void* result;
            Thread::join(_thread, result);
            _running = false;
        }
        return Indication_Provider<TAVRIN_AlertIndication>::disable_indications();
    }

    // A forced unload answers at once, leaving its indications running.
    Unload_Status unload() {
        if (forced("unload") < 0)
            disable_indications();
        return UNLOAD_OK;
    }

    void request(long n) {
        {
            std::lock_guard<std::mutex> g(_mutex);
            _pending += n;
        }
        _wake.notify_all();
    }

private:
    static void* _deliver(void* arg) {
        Test_Alert_Provider* self = static_cast<Test_Alert_Provider*>(arg);
        long sequence = 0;
        for (;;) {
            long flood;
            {
                std::lock_guard<std::mutex> g(state().mutex);
                flood = state().flood;
            }
            if (flood > 0)
                std::this_thread::sleep_for(std::chrono::microseconds(flood));
            {
                std::unique_lock<std::mutex> lock(self->_mutex);
                if (flood < 0)
                    self->_wake.wait_for(lock, std::chrono::milliseconds(20),
                                         [self] { return self->_stop || self->_pending > 0; });
                if (self->_stop)
                    break;
                if (flood < 0 && self->_pending == 0)
                    continue;
                if (self->_pending > 0)
                    self->_pending--;
            }
            TAVRIN_AlertIndication* indication = create<TAVRIN_AlertIndication>(true);
            char id[32];
            snprintf(id, sizeof(id), "%ld", ++sequence);
            indication->IndicationIdentifier.set(id);
            if (flood < 0) {
                CIM_ObjectManager* model = create<CIM_ObjectManager>(false);
                model->SystemCreationClassName.set("CIM_ComputerSystem");
                model->SystemName.set("host");
                model->CreationClassName.set("CIM_ObjectManager");
                model->Name.set("manager");
                Instance* manager = cimom::get_instance("root/PG_InterOp", model);
                unref(model);
                indication->Message.set(
                    manager ? static_cast<CIM_ObjectManager*>(manager)->ElementName.value
                            : String("no answer"));
                unref(manager);
            }
            if (self->_handler->handle(indication))
                count("delivered");
        }
        return nullptr;
    }

    Thread _thread;
    bool _running = false;
    std::mutex _mutex;
    std::condition_variable _wake;
    bool _stop = false;
    long _pending = 0;
};

template <class P>
int TAVRIN_AlertIndication_invoke_method(P*, const TAVRIN_AlertIndication*, Instance*) {
    return -1;
}

}  // namespace CPTA

TVRN_DEFINE_PROC(Test_Store_Provider, TVRNTEST_Gadget)
TVRN_DEFINE_PROC(Test_Link_Provider, TVRNTEST_Link)
TVRN_DEFINE_PROC(Test_Alert_Provider, TAVRIN_AlertIndication)

#define TVRN_MODULE_NAME "tvrntest_Module"
#define TVRN_MODULE_ROWS "tests/cmpi/test_rows.h"
#include "cmpi/Module_Definition.h"

//------------------------------------------------------------------------------
// Control
//------------------------------------------------------------------------------

namespace {

std::string _text;

}  // namespace

// "reset"         clears the tables, counters and forced statuses
// "count:<name>"  a counter: load, unload, enum, enable, disable, delivered
// "force:<op>"    forces value as the status of get, enum, create, modify,
//                 delete, invoke, link.enum, associator_names, associators,
//                 references, enable, unload (-1: no longer)
// "flood"         the alert thread delivers continuously, pausing value
//                 microseconds between indications (-1: only on request)
// "deliver"       the alert thread delivers value indications
// "orphan"        1 when cimom::get_instance answers on a thread that has
//                 no context
extern "C" CMPI_EXPORT long tvrntest_control(const char* command, long value) {
    using namespace CPTA;
    std::string c(command ? command : "");
    if (c == "reset") {
        std::lock_guard<std::mutex> g(state().mutex);
        state().clear();
        return 0;
    }
    if (c.rfind("count:", 0) == 0) {
        std::lock_guard<std::mutex> g(state().mutex);
        return state().counters[c.substr(6)];
    }
    if (c.rfind("force:", 0) == 0) {
        std::lock_guard<std::mutex> g(state().mutex);
        if (value < 0)
            state().forced.erase(c.substr(6));
        else
            state().forced[c.substr(6)] = value;
        return 0;
    }
    if (c == "flood") {
        std::lock_guard<std::mutex> g(state().mutex);
        state().flood = value;
        return 0;
    }
    if (c == "deliver") {
        // The provider object lives as long as its adapter; the tests ask
        // only while indications are enabled.
        if (!_cmpi_static_data_Test_Alert_Provider.adapter)
            return -1;
        static_cast<Test_Alert_Provider*>(_cmpi_static_data_Test_Alert_Provider.adapter->provider())
            ->request(value);
        return 0;
    }
    if (c == "orphan") {
        long answer = -1;
        std::thread t([&answer] {
            TVRNTEST_Owner* model = create<TVRNTEST_Owner>(false);
            model->Id.set("o1");
            Instance* instance = cimom::get_instance("root/test", model);
            answer = instance ? 1 : 0;
            unref(instance);
            unref(model);
        });
        t.join();
        return answer;
    }
    return -1;
}

// "model"    the non-null properties of the last model the store provider got
// "created"  the last instance it created, printed
extern "C" CMPI_EXPORT const char* tvrntest_text(const char* what) {
    using namespace CPTA;
    std::lock_guard<std::mutex> g(state().mutex);
    std::string w(what ? what : "");
    _text = w == "model" ? state().model : w == "created" ? state().created : std::string();
    return _text.c_str();
}
