// Mutex, Thread, Thread_Context, Time, and sharing of reference-counted
// values between threads.
#include <gtest/gtest.h>

#include <atomic>
#include <cerrno>
#include <mutex>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

#include "framework/Datetime.h"
#include "framework/Instance.h"
#include "framework/Mutex.h"
#include "framework/String.h"
#include "framework/Thread.h"
#include "framework/Thread_Context.h"
#include "framework/Time.h"
#include "framework/Value.h"
#include "tests/framework/test_classes.h"

using namespace CPTA;

namespace {

// Records what happens to contexts, from any thread.
struct Events {
    std::mutex mutex;
    std::vector<std::string> list;

    void add(const std::string& e) {
        std::lock_guard<std::mutex> g(mutex);
        list.push_back(e);
    }
    std::vector<std::string> get() {
        std::lock_guard<std::mutex> g(mutex);
        return list;
    }
};

class Fake_Context : public Thread_Context {
public:
    Fake_Context(Events& events, const std::string& name) : _events(events), _name(name) {}
    ~Fake_Context() override { _events.add(_name + " destroyed"); }

    Thread_Context* thread_create_hook(void* arg) override {
        _events.add(_name + " create " + static_cast<const char*>(arg));
        return new Fake_Context(_events, "child");
    }
    void thread_start_hook() override { _events.add(_name + " start"); }
    void thread_exit_hook() override { _events.add(_name + " exit"); }

    Instance_Enumerator_Rep* instance_enumerator_create(const char*, const Instance*) override {
        return nullptr;
    }
    void instance_enumerator_destroy(Instance_Enumerator_Rep*) override {}
    bool instance_enumerator_more(Instance_Enumerator_Rep*) override { return false; }
    void instance_enumerator_next(Instance_Enumerator_Rep*) override {}
    Instance* instance_enumerator_get(Instance_Enumerator_Rep*) override { return nullptr; }
    Instance* get_instance(const char*, const Instance*) override { return nullptr; }
    int create_instance(const char*, const Instance*) override { return -1; }
    int delete_instance(const char*, const Instance*) override { return -1; }
    int modify_instance(const char*, const Instance*) override { return -1; }
    int invoke_method(const char*, const Instance*, Instance*) override { return -1; }
    void allow_unload(bool) override {}
    bool get_username(String& name) override {
        name = _name.c_str();
        return true;
    }

private:
    Events& _events;
    std::string _name;
};

Events* g_events = nullptr;

void* note_context(void* arg) {
    String name;
    Thread_Context* top = Thread_Context::top();
    if (top && top->get_username(name))
        g_events->add(std::string("proc in ") + name.c_str());
    else
        g_events->add("proc without context");
    if (arg && std::string(static_cast<const char*>(arg)) == "exit")
        Thread::exit(arg);
    return arg;
}

}  // namespace

TEST(Mutex, RecursiveAndPlainLocks) {
    Mutex recursive(true);
    recursive.lock();
    EXPECT_EQ(0, recursive.try_lock());
    recursive.unlock();
    int busy = -2;
    std::thread([&] { busy = recursive.try_lock(); }).join();
    EXPECT_EQ(EBUSY, busy);  // still held once here
    recursive.unlock();
    std::thread([&] {
        busy = recursive.try_lock();
        recursive.unlock();
    }).join();
    EXPECT_EQ(0, busy);

    Mutex plain(false);
    {
        Auto_Mutex hold(plain);
        EXPECT_EQ(EBUSY, plain.try_lock());
    }
    EXPECT_EQ(0, plain.try_lock());
    plain.unlock();
}

// The creator's context, if any, makes the new thread's; its hooks run once
// each, whether the procedure returns, calls Thread::exit() or throws.
TEST(Thread, NewThreadsGetAContextFromTheCreator) {
    const struct {
        const char* arg;
        Thread_Proc proc;
        bool returns_arg;
        std::vector<std::string> events;
    } cases[] = {
        {"bare", note_context, true, {"proc without context"}},
        {"work",
         note_context,
         true,
         {"parent create work", "child start", "proc in child", "child exit", "child destroyed"}},
        {"exit",
         note_context,
         true,
         {"parent create exit", "child start", "proc in child", "child exit", "child destroyed"}},
        {"throw",
         [](void*) -> void* { throw std::runtime_error("boom"); },
         false,
         {"parent create throw", "child start", "child exit", "child destroyed"}},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.arg);
        Events events;
        g_events = &events;
        Fake_Context parent(events, "parent");
        bool bare = std::string(c.arg) == "bare";
        if (!bare)
            Thread_Context::push(&parent);
        Thread t;
        std::string arg = c.arg;
        ASSERT_EQ(0, Thread::create_joinable(t, c.proc, &arg[0]));
        void* result = &t;
        ASSERT_EQ(0, Thread::join(t, result));
        EXPECT_EQ(c.returns_arg ? &arg[0] : nullptr, result);
        EXPECT_EQ(bare ? nullptr : &parent, Thread_Context::top());
        Thread_Context::pop();
        EXPECT_EQ(c.events, events.get());
    }
    Thread t;
    EXPECT_EQ(EINVAL, Thread::create_joinable(t, nullptr, nullptr));
}

TEST(Thread, Detached) {
    static std::atomic<bool> done(false);
    Thread t;
    ASSERT_EQ(0, Thread::create_detached(
                     t,
                     [](void*) -> void* {
                         done = true;
                         return nullptr;
                     },
                     nullptr));
    for (int i = 0; i < 5000 && !done; i++)
        Time::sleep(Time::MSEC);
    EXPECT_TRUE(done);
}

TEST(Thread_Context, StackPerThread) {
    Events events;
    Fake_Context a(events, "a"), b(events, "b");
    Thread_Context::pop();  // empty: nothing happens
    Thread_Context::push(&a);
    Thread_Context::push(&b);
    Thread_Context* other = &a;
    std::thread([&] { other = Thread_Context::top(); }).join();
    EXPECT_EQ(nullptr, other);
    Thread_Context::pop();
    EXPECT_EQ(&a, Thread_Context::top());
    Thread_Context::pop();
    EXPECT_EQ(nullptr, Thread_Context::top());
}

// Sharing between threads (meant to run under ThreadSanitizer as well).

namespace {

const int THREADS = 4;
const int ROUNDS = 5000;

template <class F>
void run_threads(F f) {
    std::vector<std::thread> threads;
    for (int t = 0; t < THREADS; t++)
        threads.emplace_back(f, t);
    for (auto& th : threads)
        th.join();
}

}  // namespace

TEST(Sharing, StringsAndDatetimesAcrossThreads) {
    const String shared("shared text that is long enough");
    const Datetime when(12345, 60);
    run_threads([&](int t) {
        for (int i = 0; i < ROUNDS; i++) {
            String copy(shared);
            copy.append(char('a' + t));  // copy on write
            Datetime d(when);
            d.offset(t);  // copy on write
            if (copy.size() != shared.size() + 1 || Datetime(when) != when)
                ADD_FAILURE();
        }
    });
    EXPECT_EQ(1u, shared.ref_count());
    EXPECT_EQ(1u, when.ref_count());
    EXPECT_EQ("shared text that is long enough", shared);
    EXPECT_EQ(60, when.offset());
}

TEST(Sharing, InstanceReferencesAcrossThreads) {
    Test_Other* o = create<Test_Other>(false);
    Ref<Test_Other> keep(o);
    run_threads([&](int) {
        for (int i = 0; i < ROUNDS; i++) {
            Ref<Test_Other> r(keep);
            ref(o);
            Value v;
            v.set_value(static_cast<Instance*>(o));  // hands over the reference just taken
            Value w(v);
        }
    });
    EXPECT_EQ(1u, o->refs);

    // The last release may happen on any thread.
    for (int i = 0; i < THREADS; i++)
        ref(o);
    keep.reset();
    run_threads([&](int) { unref(o); });
}
