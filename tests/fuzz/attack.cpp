#include "tests/fuzz/attack.h"

#include "qx/errors.h"
#include "tests/fuzz/oddities.h"
#include "tests/support/code_list.h"
#include "tests/support/heap_probe.h"
#include "tests/support/hostile_host.h"
#include "tests/support/workspace_changes.h"

#include <algorithm>
#include <chrono>
#include <cinttypes>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <mutex>
#include <set>
#include <stdexcept>
#include <thread>
#include <utility>

namespace qx::test {

Options options;
Current currents[mostThreads];
thread_local Current *current = currents;
std::atomic<int> findings = 0;
std::atomic<int64_t> callsMade = 0;
// Small, so that only a loop over a parameter, and not the data, can take long.
std::size_t largestBlock = 4U << 20;

namespace {

#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
constexpr double slowness = 30;
#else
constexpr double slowness = 1;
#endif
constexpr double secondsPerCall = 5 * slowness; // of processor time

double ProcessorSeconds() {
    timespec now;
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &now);
    return static_cast<double>(now.tv_sec) + 1e-9 * static_cast<double>(now.tv_nsec);
}

const std::map<std::string, Documented> &DocumentedCodes() {
    static const auto all = ReadCodeList(QX_CODE_LIST);
    return all;
}

std::string HowToRepeat(const Current &at) {
    const std::string kind = options.onlyKind.empty() ? "" : " --kind " + options.onlyKind;
    return "--seed " + std::to_string(options.seed) + " --export " +
           (at.name != nullptr ? at.name.load() : "") + " --round " + std::to_string(at.round) +
           kind;
}

} // namespace

void Tell(const char *format, ...) {
    static std::mutex lock;
    static std::set<std::string> told; // one finding of each kind for each export
    char text[300];
    va_list arguments;
    va_start(arguments, format);
    std::vsnprintf(text, sizeof text, format, arguments);
    va_end(arguments);
    const HeapProbe::Pause pause;
    const std::lock_guard hold(lock);
    const char *name = current->name != nullptr ? current->name.load() : "the workspace";
    const char *called = current->called != nullptr ? current->called.load() : name;
    if (!told.insert(called + std::string(text).substr(0, 24)).second)
        return;
    ++findings;
    std::fprintf(stderr, "FOUND: %s: %s   (%s)\n", called, text, HowToRepeat(*current).c_str());
}

void TellWhereItEnded() {
    for (const Current &at : currents)
        if (at.round >= 0)
            std::fprintf(stderr, "ENDED in %s (%s)\n",
                         (at.called != nullptr ? at.called : at.name).load(),
                         HowToRepeat(at).c_str());
}

double ProcessSeconds() { return static_cast<double>(std::clock()) / CLOCKS_PER_SEC; }

// Limits the processor time, since the machine may be busy, and the elapsed time, since a
// deadlocked call uses no processor.
void Watch(const std::atomic<bool> &done) {
    constexpr double most = 60 * slowness;
    while (!done) {
        std::this_thread::sleep_for(std::chrono::milliseconds(200));
        for (const Current &at : currents)
            if (at.round >= 0 && (ProcessSeconds() - at.since > most * options.threads ||
                                  static_cast<double>(time(nullptr) - at.start) > 20 * most)) {
                TellWhereItEnded();
                std::_Exit(3);
            }
    }
}

Disturbance SomeDisturbance(Random &random) {
    Disturbance some;
    if (random.oneIn(5)) {
        constexpr int32_t statuses[] = {1, 2, -1, 4711, -20001, -20003, 20001, -2147483647};
        some.refuseAt = random.oneIn(6) ? everyReshape : 1 + random.below(4);
        some.refusal = random.oneOf(statuses);
    } else if (random.oneIn(5)) {
        some.allocationFails = 1 + random.below(6);
    } else if (options.threads == 1 && random.oneIn(5)) {
        constexpr uint32_t regions[] = {64, 300, 1000, 20000, 1U << 20};
        some.workspace = random.oneOf(regions);
    }
    return some;
}

namespace {
thread_local int64_t heapLeft = 0;
}

Observed Observe(const Disturbance &disturbance, unsigned char rubbish,
                 const std::function<int32_t()> &call) {
    ResetHost(disturbance.refuseAt, disturbance.refusal);
    Host().largestBlock = largestBlock;
    Host().freshByte = rubbish;
    Host().atReshape = disturbance.atReshape;
    ++callsMade;
    Observed seen;
    const double before = ProcessorSeconds();
    try {
        const HeapProbe probe(disturbance.allocationFails, largestBlock, rubbish);
        seen.result = call();
        seen.lacksMemory = probe.refusals() > 0;
        seen.allocations = probe.allocations();
        heapLeft += probe.liveAllocations();
        seen.peakBytes = probe.peakBytes();
    } catch (const std::exception &error) {
        seen.fault = error.what();
    }
    seen.seconds = ProcessorSeconds() - before;
    seen.reshapes = Host().reshapes;
    ResetHost();
    return seen;
}

Observed Attacked(const Disturbance &disturbance, unsigned char rubbish,
                  const std::function<int32_t()> &call) {
    const Observed seen = Observe(disturbance, rubbish, call);
    if (!seen.fault.empty())
        Tell("%s", seen.fault.c_str());
    if (seen.seconds > secondsPerCall)
        Tell("took %.1f s of the processor", seen.seconds);
    return seen;
}

void CheckStatus(const char *name, ErrorCode status, const Disturbance &disturbance, bool shares) {
    const auto documented = DocumentedCodes().find(name);
    if (documented == DocumentedCodes().end() || documented->second.codes.count(status) != 0)
        return;
    // The frame copies an input that is also an output, in every export.
    if (shares && status == ErrOutOfMemory)
        return;
    // A limit of the host itself is a refusal like any other.
    const bool isRefusal =
        (disturbance.refuseAt != 0 && status == disturbance.refusal) || status == statusNoMemory;
    if (!isRefusal || !documented->second.hostStatus)
        Tell("code %d is not documented", status);
}

void CheckHost() {
    try {
        CheckBlocks();
    } catch (const std::exception &error) {
        Tell("%s", error.what());
        std::_Exit(3);
    }
}

void CheckRefusal(ErrorCode status, bool hasStatus) {
    if (hasStatus && status != ErrInternal)
        Tell("one array as two outputs is not refused (%d)", status);
}

void CheckRepetition(const char *name, const Outcome &first, const Outcome &second,
                     const char *apart) {
    if (IsKept(name, Oddity::OldContentStays) || IsKept(name, Oddity::DependsOnState))
        return;
    // Other threads may have filled or disabled the region in between.
    const bool lacksMemory = first.status == ErrOutOfMemory || second.status == ErrOutOfMemory;
    if (options.threads > 1 && lacksMemory)
        return;
    if (first.hash != second.hash || first.status != second.status)
        Tell("%s gives another result (%d, %d)", apart, first.status, second.status);
}

void CheckHonesty(const char *name, const Disturbance &disturbance, const Outcome &refused,
                  const Outcome &granted) {
    const bool isHosts = disturbance.refuseAt != 0 && refused.status == disturbance.refusal;
    if (refused.status < 0 || refused.status == statusNoMemory || isHosts ||
        IsKept(name, Oddity::OldContentStays) || IsKept(name, Oddity::RefusalPasses))
        return;
    if (options.threads > 1 &&
        granted.status == ErrOutOfMemory) // in a region that other threads fill
        return;
    if (refused.status != granted.status || refused.hash != granted.hash)
        Tell("a call succeeds despite a refusal, with another result (%d, %d)", refused.status,
             granted.status);
}

void ForSomeRefusals(Random &random, const Observed &calm,
                     const std::function<void(const Disturbance &)> &make) {
    Disturbance some;
    const auto resizes = static_cast<int32_t>(calm.reshapes.size());
    for (some.refuseAt = 1; some.refuseAt <= std::min(resizes, 8); ++some.refuseAt) {
        some.refusal = random.oneIn(2) ? statusNoMemory : 4711;
        make(some);
    }
    some.refuseAt = some.refusal = 0;
    for (int32_t i = 0; i < std::min(calm.allocations, 6); ++i) {
        some.allocationFails = calm.allocations <= 6 ? i + 1 : 1 + random.below(calm.allocations);
        make(some);
    }
    some.allocationFails = 0;
    for (const int64_t part : {2, 8})
        if (options.threads == 1 && calm.peakBytes > 0) {
            some.workspace = static_cast<uint32_t>(calm.peakBytes / part + 1);
            make(some);
        }
}

void GiveBack(const std::function<void()> &release) {
    const HeapProbe probe;
    release();
    heapLeft += probe.liveAllocations();
}

// With several threads, shared blocks may be freed by another thread.
void EndHeapBalance() {
    const int64_t left = std::exchange(heapLeft, 0);
    if (left != 0 && options.threads == 1)
        Tell("%" PRId64 " blocks of the heap are left", left);
}

TinyWorkspace::TinyWorkspace(uint32_t size) : size_(size) {
    if (size_ == 0)
        return;
    InitializeAnalysisWorkspaceH(size_, &status_);
    EnableAnalysisWorkspaceH(&status_);
}

TinyWorkspace::~TinyWorkspace() {
    if (size_ == 0)
        return;
    DisableAnalysisWorkspaceH(&status_);
    UninitializeAnalysisWorkspaceH(&status_);
    if (status_.code != 0)
        Tell("a block of the workspace was not given back (%d)", status_.code);
}

void ChangeWorkspace(Random &random) {
    constexpr uint32_t regions[] = {1U << 20, 2U << 20, 3U << 20};
    const auto choice = static_cast<uint32_t>(random.below(8));
    if (const ErrorCode code = ChangeWorkspace(choice, random.oneOf(regions), true))
        Tell("the workspace gives %d", code);
}

void EndWorkspace() {
    WorkspaceStatus status = {0, 0};
    DisableAnalysisWorkspaceH(&status);
    status = {0, 0};
    UninitializeAnalysisWorkspaceH(&status);
    if (status.code != 0)
        Tell("blocks of the workspace were not given back (%d)", status.code);
}

} // namespace qx::test
