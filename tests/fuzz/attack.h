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

// The environment of a call, whatever the source of its arguments, and the reporting of findings.

struct Options {
    uint64_t seed = 1;
    int64_t rounds = 0, calls = 0;
    double seconds = 0;
    int threads = 1;
    int64_t onlyRound = -1;
    std::string onlyExport;
    std::string onlyKind; // of the cases to run
};
extern Options options;

// The current case of each thread, reported when the process ends.
struct Current {
    std::atomic<int64_t> round = -1;
    std::atomic<const char *> name = nullptr;
    std::atomic<const char *> called = nullptr; // the called export, if another one
    std::atomic<double> since = 0;              // seconds of the process's processor time
    std::atomic<int64_t> start = 0;             // time of day
};
double ProcessSeconds();
constexpr int mostThreads = 64;
extern Current currents[mostThreads];
extern thread_local Current *current;

extern std::atomic<int> findings;
__attribute__((format(printf, 1, 2))) void Tell(const char *format, ...);
void TellWhereItEnded();
// Ends the process if a case does not return.
void Watch(const std::atomic<bool> &done);

struct Outcome {
    ErrorCode status = 0;
    uint64_t hash = 0;
};

struct Disturbance {
    int32_t refuseAt = 0, refusal = 0; // the n-th resize and the host's status
    int32_t allocationFails = 0;       // the n-th
    uint32_t workspace = 0;            // bytes; 0 for none
    std::function<void()> atReshape = nullptr;
    bool isNone() const {
        return refuseAt == 0 && allocationFails == 0 && workspace == 0 && !atReshape;
    }
};
Disturbance SomeDisturbance(Random &random);

// The observable effects of one call besides its outputs.
struct Observed {
    int32_t result = 0; // of the function
    std::vector<Reshape> reshapes;
    bool lacksMemory = false; // the heap has refused a request
    int32_t allocations = 0;  // of the heap, refused ones included
    int64_t peakBytes = 0;    // of the heap
    std::string fault;        // the fault that the host reports
    double seconds = 0;       // of the processor
};
// The number of calls made in this process.
extern std::atomic<int64_t> callsMade;
// The largest block that the host and the heap grant.
extern std::size_t largestBlock;
// Makes the call in a host that refuses as `disturbance` specifies. New blocks of the host and of
// the heap are filled with `rubbish`.
Observed Observe(const Disturbance &disturbance, unsigned char rubbish,
                 const std::function<int32_t()> &call);
// The same, but also reports faults and slow calls.
Observed Attacked(const Disturbance &disturbance, unsigned char rubbish,
                  const std::function<int32_t()> &call);
// Reports a code that the export does not document.
void CheckStatus(const char *name, ErrorCode status, const Disturbance &disturbance, bool shares);
// Reports a write outside the blocks and ends the process, since later findings would be
// meaningless.
void CheckHost();
// Reports a call that accepts one array as two outputs.
void CheckRefusal(ErrorCode status, bool hasStatus);
// A call must have the same outcome as the one that `apart` names.
void CheckRepetition(const char *name, const Outcome &first, const Outcome &second,
                     const char *apart);

// A call that succeeds although the host or the heap refuses must have the outcome that it has when
// they grant everything.
void CheckHonesty(const char *name, const Disturbance &disturbance, const Outcome &refused,
                  const Outcome &granted);

// Makes a call with each of its resizes and some of its allocations refused, and with workspaces
// that are too small for it.
void ForSomeRefusals(Random &random, const Observed &calm,
                     const std::function<void(const Disturbance &)> &make);

// Counts the heap blocks that the calls of a case take, and that they and the release of their
// words free. No block may be left at the end of a case.
void GiveBack(const std::function<void()> &release);
void EndHeapBalance();

// The workspace for one call, if there is only one thread.
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

// Many threads share one region, which each of them reserves, releases, enables and disables at
// random.
void ChangeWorkspace(Random &random);
// Reports blocks that are left in the region at the end.
void EndWorkspace();

} // namespace qx::test

#endif
