#include "qx/host.h"

#include "frame/platform.h"

#include <cstdint>
#include <map>
#include <new>
#include <unordered_map>

namespace {

enum Mode : int32_t { Withdraw = 0, ForProcess = 1, ForObject = 2 };

struct Sweep {
    QXHostSweep procedure;
    void *argument;
    int32_t mode;
    uint64_t round; // the last run that called it, or in which it was registered
};

// The registered sweeps, numbered in the order of registration. A sweep is called with the lock
// released, because it may register or withdraw others; therefore a run searches each time for the
// next number that it has not called yet.
class Registry {
public:
    int32_t change(QXHostSweep procedure, void *argument, int32_t mode) {
        const Hold hold(lock_);
        auto [entry, end] = ofArgument_.equal_range(argument);
        while (entry != end && sweeps_.at(entry->second).procedure != procedure)
            ++entry;
        const bool isKnown = entry != end;
        if (mode == Withdraw) {
            if (isKnown)
                remove(entry);
            return QXHostDone;
        }
        if (isKnown)
            sweeps_.at(entry->second).mode = mode;
        else
            return add({procedure, argument, mode, round_});
        return QXHostDone;
    }

    // Calls every sweep once, and removes those that belong to objects.
    int32_t runAll() {
        const uint64_t round = nextRound();
        uint64_t number = 0;
        int32_t called = 0;
        for (Sweep sweep; takeFrom(number, round, sweep); ++called)
            sweep.procedure(sweep.argument);
        return called;
    }

    // The same for the sweeps of one object.
    int32_t runFor(void *object) {
        const uint64_t round = nextRound();
        int32_t called = 0;
        for (Sweep sweep; takeOf(object, round, sweep); ++called)
            sweep.procedure(sweep.argument);
        return called;
    }

private:
    typedef std::unordered_multimap<void *, uint64_t> Numbers;

    class Hold {
    public:
        explicit Hold(qx::platform::Mutex &lock) : lock_(lock) { lock_.lock(); }
        ~Hold() { lock_.unlock(); }
        Hold(const Hold &) = delete;
        Hold &operator=(const Hold &) = delete;

    private:
        qx::platform::Mutex &lock_;
    };

    int32_t add(const Sweep &sweep) {
        const uint64_t number = latest_ + 1;
        try {
            sweeps_.emplace(number, sweep);
            ofArgument_.emplace(sweep.argument, number);
        } catch (const std::bad_alloc &) {
            sweeps_.erase(number);
            return QXHostNoMemory;
        }
        latest_ = number;
        return QXHostDone;
    }

    void remove(Numbers::iterator entry) {
        sweeps_.erase(entry->second);
        ofArgument_.erase(entry);
    }

    uint64_t nextRound() {
        const Hold hold(lock_);
        return ++round_;
    }

    // Takes the first sweep from `number` on that this run has not called; sets `number` to the one
    // after it.
    bool takeFrom(uint64_t &number, uint64_t round, Sweep &taken) {
        const Hold hold(lock_);
        for (auto at = sweeps_.lower_bound(number); at != sweeps_.end(); ++at) {
            if (at->second.round >= round)
                continue;
            number = at->first + 1;
            at->second.round = round;
            taken = at->second;
            if (taken.mode == ForObject) {
                auto entry = ofArgument_.equal_range(taken.argument).first;
                while (entry->second != at->first)
                    ++entry;
                remove(entry);
            }
            return true;
        }
        return false;
    }

    bool takeOf(void *object, uint64_t round, Sweep &taken) {
        const Hold hold(lock_);
        const auto [first, end] = ofArgument_.equal_range(object);
        for (auto entry = first; entry != end; ++entry) {
            const Sweep &sweep = sweeps_.at(entry->second);
            if (sweep.mode != ForObject || sweep.round >= round)
                continue;
            taken = sweep;
            remove(entry);
            return true;
        }
        return false;
    }

    qx::platform::Mutex lock_;
    std::map<uint64_t, Sweep> sweeps_;
    Numbers ofArgument_;
    uint64_t latest_ = 0;
    uint64_t round_ = 0;
};

// Never destroyed: destructors that run at exit may still withdraw their sweeps.
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

int32_t QXHostRunSweeps() { return Sweeps().runAll(); }

int32_t QXHostReleaseObject(void *object) { return Sweeps().runFor(object); }
