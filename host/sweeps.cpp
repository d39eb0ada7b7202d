#include "qx/host.h"

#include "frame/platform.h"

#include <cstdint>
#include <new>

namespace {

enum Mode : int32_t { Withdraw = 0, ForProcess = 1, ForObject = 2 };

struct Sweep {
    QXHostSweep procedure;
    void *argument;
    int32_t mode;
    uint64_t round; // the last run that has called it, or during which it was registered
    Sweep *next;
};

// The registered sweeps, in the order of registration. A sweep is called with the lock released,
// because it may register or withdraw others; a run therefore looks from the start each time for
// one that it has not called yet.
class Registry {
public:
    int32_t change(QXHostSweep procedure, void *argument, int32_t mode) {
        const Hold hold(lock_);
        Sweep **link = find([=](const Sweep &sweep) {
            return sweep.procedure == procedure && sweep.argument == argument;
        });
        if (mode == Withdraw) {
            if (*link != nullptr)
                remove(link);
            return QXHostDone;
        }
        if (*link == nullptr)
            *link = new (std::nothrow) Sweep{procedure, argument, mode, round_, nullptr};
        if (*link == nullptr)
            return QXHostNoMemory;
        (*link)->mode = mode;
        return QXHostDone;
    }

    // Calls every sweep for which `applies` holds, once, and forgets those for objects.
    template <class Condition>
    int32_t run(Condition applies) {
        const uint64_t round = nextRound();
        Sweep sweep;
        int32_t called = 0;
        for (; take(round, applies, sweep); ++called)
            sweep.procedure(sweep.argument);
        return called;
    }

private:
    class Hold {
    public:
        explicit Hold(qx::platform::Mutex &lock) : lock_(lock) { lock_.lock(); }
        ~Hold() { lock_.unlock(); }
        Hold(const Hold &) = delete;
        Hold &operator=(const Hold &) = delete;

    private:
        qx::platform::Mutex &lock_;
    };

    // The link that points at the first such sweep, or the one at the end.
    template <class Condition>
    Sweep **find(Condition condition) {
        Sweep **link = &first_;
        while (*link != nullptr && !condition(**link))
            link = &(*link)->next;
        return link;
    }

    static void remove(Sweep **link) {
        Sweep *sweep = *link;
        *link = sweep->next;
        delete sweep;
    }

    uint64_t nextRound() {
        const Hold hold(lock_);
        return ++round_;
    }

    template <class Condition>
    bool take(uint64_t round, Condition applies, Sweep &sweep) {
        const Hold hold(lock_);
        Sweep **link =
            find([&](const Sweep &found) { return found.round < round && applies(found); });
        if (*link == nullptr)
            return false;
        (*link)->round = round;
        sweep = **link;
        if (sweep.mode == ForObject)
            remove(link);
        return true;
    }

    qx::platform::Mutex lock_;
    Sweep *first_ = nullptr;
    uint64_t round_ = 0;
};

// Never destroyed: what cleans up at exit may still withdraw its sweep.
Registry &Sweeps() {
    static Registry *registry = new Registry;
    return *registry;
}

} // namespace

int32_t HostRegisterSweep(QXHostSweep procedure, void *argument, int32_t mode) {
    if (procedure == nullptr || mode < Withdraw || mode > ForObject)
        return QXHostBadArgument;
    return Sweeps().change(procedure, argument, mode);
}

int32_t QXHostRunSweeps() {
    return Sweeps().run([](const Sweep &) { return true; });
}

int32_t QXHostReleaseObject(void *object) {
    return Sweeps().run(
        [=](const Sweep &sweep) { return sweep.mode == ForObject && sweep.argument == object; });
}
