#include "qx/errors.h"
#include "qx/frame.h"
#include "tests/support/heap_probe.h"
#include "tests/support/hostile_host.h"
#include "tests/support/recipe.h"
#include "tests/support/workspace_changes.h"

#include <malloc.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <cinttypes>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <iterator>
#include <mutex>
#include <set>
#include <string>
#include <thread>
#include <vector>

// Calls all exports by their recipes, for a given time, in one process with many threads, on nodes
// that keep their words from call to call, while the workspace is reserved, enabled, disabled and
// released. The program checks that each call gives the bits that it gives alone, which are the
// accepted ones; that no request is refused while all blocks together take less than a quarter of
// the region; that nothing is left between the phases; and that memory does not grow.
//
//     soak [--seconds N] [--threads N] [--seed N]

namespace qx::test {

namespace {

struct Options {
    double seconds = 60;
    int threads = 8;
    uint64_t seed = 1;
} options;

std::atomic<int> findings = 0;

__attribute__((format(printf, 2, 3))) void Tell(const std::string &name, const char *format, ...) {
    static std::mutex lock;
    static std::set<std::string> told; // one finding of each kind for each export
    char text[200];
    va_list arguments;
    va_start(arguments, format);
    std::vsnprintf(text, sizeof text, format, arguments);
    va_end(arguments);
    const std::lock_guard hold(lock);
    if (!told.insert(name + std::string(text).substr(0, 20)).second)
        return;
    ++findings;
    std::fprintf(stderr, "FOUND: %s: %s\n", name.c_str(), text);
}

// One call of one recipe, and its result when it runs alone.
struct Step {
    const Recipe *recipe;
    int32_t n;
    uint64_t hash;
    int64_t bytes; // peak use of the heap
};

std::vector<Step> AllSteps() {
    std::vector<Step> steps;
    for (const Recipe &recipe : AllRecipes())
        for (const int32_t n : recipe.sizes) {
            Call call(n);
            ResetHost();
            ErrorCode status;
            int64_t bytes;
            {
                const HeapProbe probe;
                status = call.status(recipe.run(call));
                bytes = probe.peakBytes();
            }
            steps.push_back({&recipe, n, call.outputHash(status), bytes});
        }
    return steps;
}

void CompareWithAccepted() {
    const auto accepted = AcceptedHashes(QX_HASHES);
    for (const auto &[name, hash] : HashEveryExport()) {
        const auto known = accepted.find(name);
        if (known == accepted.end() || known->second != HashText(hash))
            Tell(name, "not the accepted bits");
    }
}

// The use of the workspace in a phase. In a scarce region requests are refused; in the others no
// request may be refused, since simultaneous calls take at most a quarter of the region.
enum class Workspace { None, Steady, Changing, Scarce };
constexpr Workspace kinds[] = {Workspace::Steady, Workspace::Changing, Workspace::Scarce,
                               Workspace::None};
constexpr const char *kindNames[] = {"none", "steady", "changing", "scarce"};

struct Phase {
    Workspace workspace;
    uint32_t region; // the smallest size
    std::atomic<int64_t> inUse = 0;
    std::atomic<int64_t> calls = 0, refused = 0;
    std::atomic<bool> over = false;

    bool mayRefuse() const { return workspace == Workspace::Scarce; }
    // Takes the memory of a call from the quarter that all calls share.
    bool enters(int64_t bytes) {
        if (workspace == Workspace::None || mayRefuse())
            return true;
        if (inUse.fetch_add(bytes) + bytes <= region / 4)
            return true;
        inUse.fetch_sub(bytes);
        return false;
    }
    void leaves(int64_t bytes) {
        if (workspace != Workspace::None && !mayRefuse())
            inUse.fetch_sub(bytes);
    }
};

void ChangeWorkspace(Noise &noise, uint32_t region) {
    const auto choice = static_cast<uint32_t>(noise.bits() % 8);
    const auto size = static_cast<uint32_t>(region + noise.bits() % (3 * region));
    if (const ErrorCode code = test::ChangeWorkspace(choice, size, false))
        Tell("the workspace", "gives %d", code);
}

bool IsOutOfMemory(ErrorCode status) {
    return status == ErrOutOfMemory || status == ErrMeasureOutOfMemory ||
           status == ErrMultirateBuffer;
}

void Run(const Step &step, NodeWords &node, Phase &phase) {
    Call call(step.n);
    call.use(node);
    ResetHost();
    const ErrorCode status = call.status(step.recipe->run(call));
    ++phase.calls;
    if (call.outputHash(status) == step.hash)
        return;
    const bool isRefusal = IsOutOfMemory(status);
    phase.refused += isRefusal;
    if (isRefusal && !phase.mayRefuse())
        Tell(step.recipe->name, "refused at n = %d though it needs %" PRId64 " of %u bytes", step.n,
             step.bytes, phase.region);
    else if (!isRefusal && !(phase.mayRefuse() && (step.recipe->quirks & MemoryFailureMayPass)))
        Tell(step.recipe->name, "other bits at n = %d, with code %d", step.n, status);
}

void Work(const std::vector<Step> &steps, uint64_t seed, Phase &phase) {
    Noise noise(seed);
    std::map<std::string, NodeWords> nodes; // one for each export, shared by its recipes
    while (!phase.over) {
        const Step &step = steps[noise.bits() % steps.size()];
        if (phase.enters(step.bytes)) {
            Run(step, nodes[step.recipe->exportName()], phase);
            phase.leaves(step.bytes);
        }
        const bool isChanging =
            phase.workspace == Workspace::Changing || phase.workspace == Workspace::Scarce;
        if (isChanging && noise.bits() % 4 == 0)
            ChangeWorkspace(noise, phase.region);
        if (noise.bits() % 64 == 0)
            nodes.erase(step.recipe->exportName());
    }
    LeaveHost();
}

// The memory of the process while no call runs.
struct Memory {
    int64_t heap;     // bytes in use
    int64_t resident; // bytes
    int sweeps;
};

Memory MemoryNow() {
    std::thread(ForgetMovedBlocks).join(); // the thread's heap cache ends with it
    malloc_trim(0);
    const struct mallinfo2 heap = mallinfo2();
    int64_t pages = 0, resident = 0;
    std::ifstream("/proc/self/statm") >> pages >> resident;
    return {static_cast<int64_t>(heap.uordblks + heap.hblkhd), resident * sysconf(_SC_PAGESIZE),
            RegisteredSweeps()};
}

// Called after the threads have ended: no block may be left in the workspace or the host.
void EndOfPhase() {
    WorkspaceStatus status = {0, 0};
    DisableAnalysisWorkspaceH(&status);
    status = {0, 0};
    UninitializeAnalysisWorkspaceH(&status);
    if (status.code != 0)
        Tell("the workspace", "blocks were not released (%d)", status.code);
    if (LiveBlocks() != 0)
        Tell("the host", "%d blocks are left", LiveBlocks());
}

void RunPhase(const std::vector<Step> &steps, uint64_t number, double seconds, Phase &phase) {
    if (phase.workspace == Workspace::Steady) {
        WorkspaceStatus status = {0, 0};
        InitializeAnalysisWorkspaceH(phase.region, &status);
        EnableAnalysisWorkspaceH(&status);
    }
    std::vector<std::thread> threads;
    for (int t = 0; t < options.threads; ++t)
        threads.emplace_back(Work, std::cref(steps),
                             options.seed + 1000 * number + static_cast<uint64_t>(t),
                             std::ref(phase));
    std::this_thread::sleep_for(std::chrono::duration<double>(seconds));
    phase.over = true;
    for (std::thread &thread : threads)
        thread.join();
    EndOfPhase();
}

// A phase may leave this much behind in the caches of the C library.
constexpr int64_t heapNoise = 16 << 10, residentNoise = 16 << 20;

int Main() {
    // Makes the C library keep little freed memory.
    mallopt(M_MMAP_THRESHOLD, 1 << 20);
    mallopt(M_TRIM_THRESHOLD, 128 << 10);
    mallopt(M_ARENA_MAX, options.threads);
    CompareWithAccepted();
    const std::vector<Step> steps = AllSteps();
    constexpr uint32_t regions[] = {1U << 20, 4U << 20, 16U << 20, 64U << 20};
    // The first minute, or the first two thirds of a short run, fills what is kept permanently.
    const double each = std::clamp(options.seconds / 60, 0.25, 3.75);
    const auto phases = static_cast<uint64_t>(options.seconds / each);
    const uint64_t warm = std::min<uint64_t>(phases * 2 / 3, 16);
    Memory first = {0, 0, 0}, last = {0, 0, 0};
    int64_t calls = 0, refused = 0;
    for (uint64_t i = 0; i < phases && findings < 50; ++i) {
        const Workspace workspace = kinds[i % std::size(kinds)];
        Phase phase{workspace, workspace == Workspace::Scarce
                                   ? 50000U
                                   : regions[i / std::size(kinds) % std::size(regions)]};
        RunPhase(steps, i, each, phase);
        last = MemoryNow();
        if (i < warm)
            first = {std::max(first.heap, last.heap), std::max(first.resident, last.resident),
                     last.sweeps};
        calls += phase.calls;
        refused += phase.refused;
        std::printf("phase %" PRIu64 ", workspace %s, %u bytes: %" PRId64 " calls, %" PRId64
                    " refused; heap %" PRId64 ", resident %" PRId64 " bytes, %d sweeps\n",
                    i, kindNames[static_cast<int>(workspace)], phase.region, phase.calls.load(),
                    phase.refused.load(), last.heap, last.resident, last.sweeps);
        std::fflush(stdout);
    }
    if (last.heap > first.heap + heapNoise || last.resident > first.resident + residentNoise ||
        last.sweeps != first.sweeps)
        Tell("memory",
             "it grows: heap from %" PRId64 " to %" PRId64 ", resident from %" PRId64 " to %" PRId64
             " bytes, sweeps from %d to %d",
             first.heap, last.heap, first.resident, last.resident, first.sweeps, last.sweeps);
    CompareWithAccepted();
    std::printf(
        "seed %" PRIu64 ": %" PRId64 " calls of %zu exports (%zu kinds of call) in %d threads,"
        " %" PRIu64 " phases, %" PRId64 " refused where the region is scarce; heap in use"
        " %" PRId64 " then %" PRId64 " bytes, resident %" PRId64 " then %" PRId64
        " bytes; %d findings\n",
        options.seed, calls, HashEveryExport().size(), steps.size(), options.threads, phases,
        refused, first.heap, last.heap, first.resident, last.resident, findings.load());
    return findings > 0 ? 1 : 0;
}

bool Read(int count, char **words) {
    for (int i = 1; i + 1 < count; i += 2) {
        const std::string option = words[i];
        if (option == "--seconds")
            options.seconds = std::atof(words[i + 1]);
        else if (option == "--threads")
            options.threads = std::atoi(words[i + 1]);
        else if (option == "--seed")
            options.seed = std::strtoull(words[i + 1], nullptr, 10);
        else
            return false;
    }
    return count % 2 == 1 && options.seconds > 0 && options.threads > 0;
}

} // namespace

} // namespace qx::test

int main(int count, char **words) {
    if (!qx::test::Read(count, words)) {
        std::fprintf(stderr, "usage: soak [--seconds N] [--threads N] [--seed N]\n");
        return 2;
    }
    return qx::test::Main();
}
