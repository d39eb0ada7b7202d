#ifndef QX_TESTS_FUZZ_ATTACK_H
#define QX_TESTS_FUZZ_ATTACK_H

#include "qx/frame.h"
#include "tests/fuzz/content.h"
#include "tests/support/hostile_host.h"

#include <atomic>
#include <cstdint>
#include <functional>
#include <string>
#include <vector>

namespace qx::test {

// What happens around a call, whoever makes its arguments, and how a finding is told.

struct Options {
    uint64_t seed = 1;
    int64_t rounds = 0, calls = 0;
    double seconds = 0;
    int threads = 1;
    int64_t onlyRound = -1;
    std::string onlyExport;
    std::string onlyKind; // of cases
};
extern Options options;

// What each thread is at, for whoever ends the process.
struct Current {
    std::atomic<int64_t> round = -1;
    std::atomic<const char *> name = nullptr;
    std::atomic<const char *> called = nullptr; // in its case, where that is another export
    std::atomic<double> since = 0;              // seconds of the process's processor time
    std::atomic<int64_t> start = 0;             // of the clock
};
double ProcessSeconds();
constexpr int mostThreads = 64;
extern Current currents[mostThreads];
extern thread_local Current *current;

extern std::atomic<int> findings;
__attribute__((format(printf, 1, 2))) void Tell(const char *format, ...);
void TellWhereItEnded();
// Ends a process in which a case does not come back.
void Watch(const std::atomic<bool> &done);

struct Outcome {
    ErrorCode status = 0;
    uint64_t hash = 0;
};

struct Disturbance {
    int32_t refuseAt = 0, refusal = 0; // the n-th resize, the host's status
    int32_t allocationFails = 0;       // the n-th
    uint32_t workspace = 0;            // bytes; 0 for none
    std::function<void()> atReshape = nullptr;
    bool isNone() const {
        return refuseAt == 0 && allocationFails == 0 && workspace == 0 && !atReshape;
    }
};
Disturbance SomeDisturbance(Random &random);

// What there is to see of one call besides its outputs.
struct Observed {
    int32_t result = 0; // of the function
    std::vector<Reshape> reshapes;
    bool lacksMemory = false; // the heap has refused a request
    int32_t allocations = 0;  // of the heap, refused ones included
    int64_t peakBytes = 0;    // of the heap
    std::string fault;        // what the host complains of
    double seconds = 0;       // of the processor
};
// Calls of exports in this process.
extern std::atomic<int64_t> callsMade;
// Neither the host nor the heap gives more in one piece.
extern std::size_t largestBlock;
// Makes the call in a host that refuses as told and whose new blocks, as those of the heap, hold
// `rubbish`.
Observed Observe(const Disturbance &disturbance, unsigned char rubbish,
                 const std::function<int32_t()> &call);
// The same, and tells of a fault and of a long time.
Observed Attacked(const Disturbance &disturbance, unsigned char rubbish,
                  const std::function<int32_t()> &call);
// Tells of a code that the export does not document.
void CheckStatus(const char *name, ErrorCode status, const Disturbance &disturbance, bool shares);
// Tells of a touched byte outside the blocks, and ends the process: what comes after it would tell
// nothing.
void CheckHost();
// Tells where an array that the call writes in two places is not refused.
void CheckRefusal(ErrorCode status, bool hasStatus);
// A call and the one that `apart` names have to have the same outcome.
void CheckRepetition(const char *name, const Outcome &first, const Outcome &second,
                     const char *apart);

// A call that is successful while the host or the heap refuses has to have the outcome that it has
// when they grant everything.
void CheckHonesty(const char *name, const Disturbance &disturbance, const Outcome &refused,
                  const Outcome &granted);

// For each resize and for some allocations of a call its refusal, and a workspace or two that are
// too small for it.
void ForSomeRefusals(Random &random, const Observed &calm,
                     const std::function<void(const Disturbance &)> &make);

// What the calls of a case take of the heap, and what they and the release of their words give back.
// At the end of a case nothing may be left.
void GiveBack(const std::function<void()> &release);
void EndHeapBalance();

// The workspace for one call in one thread.
class TinyWorkspace {
public:
    explicit TinyWorkspace(uint32_t size);
    ~TinyWorkspace();
    TinyWorkspace(const TinyWorkspace &) = delete;
    TinyWorkspace &operator=(const TinyWorkspace &) = delete;

private:
    uint32_t size_;
    WorkspaceStatus status_ = {0, 0};
};

// Many threads share one region, which each of them reserves, gives back and switches as it likes.
void ChangeWorkspace(Random &random);
// At the end no block may be left in it.
void EndWorkspace();

} // namespace qx::test

#endif
