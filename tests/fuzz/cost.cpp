#include "tests/fuzz/cost.h"

#include "qx/errors.h"
#include "tests/fuzz/oddities.h"

#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <cinttypes>
#include <cstdio>
#include <limits>
#include <map>
#include <string>

namespace qx::test {

namespace {

// The largest block that the host or the heap grants; a call may have several.
constexpr std::size_t grantedBlock = 32U << 20;
constexpr rlim_t addressSpace = rlim_t{2} << 30;
constexpr int64_t mostHeap = int64_t{512} << 20;
// Limits on processor time: a constant, and an amount for each byte that a call has requested.
constexpr double secondsByItself = 1, secondsPerByte = 1e-7;
constexpr rlim_t secondsToLive = 20;

struct Cost {
    double seconds = 0;
    int64_t heap = 0;
    int64_t hosts = 0; // bytes requested from the host, except refused ones
    ErrorCode status = 0;
};
std::map<std::string, Cost> highest;

int32_t SomeNumber(Random &random, int32_t usual) {
    constexpr int32_t most = std::numeric_limits<int32_t>::max();
    constexpr int32_t large[] = {1000,      10000,   65537, 1000000,  4000000, 16777217,
                                 100000000, 1 << 30, most,  most - 1, -most,   -1000000};
    return random.oneIn(2) ? random.oneOf(large) : usual;
}

double SomeScale(Random &random, double usual) {
    constexpr double scales[] = {1e-300, 1e-30, 1e-12, 1e-9, 1e-6, 1e-3,
                                 1e3,    1e6,   1e9,   1e12, 1e30, 1e300};
    return random.oneIn(3) ? random.oneOf(scales) * (random.oneIn(4) ? -1 : 1) : usual;
}

// Only the numbers of a call are large.
Scenario SomeCostlyScenario(Random &random, const Thunk &thunk) {
    Scenario scenario = SomeScenario(random, thunk);
    scenario.disturbance = {};
    if (IsKept(thunk.name, Oddity::TimeFollowsNumber))
        return scenario;
    for (std::size_t i = 0; i < thunk.parameters.size(); ++i) {
        const Parameter &parameter = thunk.parameters[i];
        Argument &argument = scenario.arguments[i];
        if (parameter.kind != Kind::Value && parameter.kind != Kind::Reference)
            continue;
        argument.whole = SomeNumber(random, static_cast<int32_t>(argument.whole));
        argument.real = SomeScale(random, argument.real);
        const auto whole = static_cast<int32_t>(argument.whole);
        if (parameter.element == "DBL")
            std::copy_n(reinterpret_cast<const unsigned char *>(&argument.real), 8,
                        argument.bytes.data());
        else if (argument.bytes.size() <= sizeof whole)
            std::copy_n(reinterpret_cast<const unsigned char *>(&whole), argument.bytes.size(),
                        argument.bytes.data());
    }
    return scenario;
}

Cost CostOf(const Scenario &scenario) {
    largestBlock = grantedBlock;
    Node node;
    PreparedCall call(scenario, node, {});
    const Observed seen = Observe({}, 0x17, [&call] { return call(); });
    if (!seen.fault.empty())
        Tell("%s", seen.fault.c_str());
    Cost cost = {seen.seconds, seen.peakBytes, 0, call.status(seen.result)};
    for (const Reshape &reshape : seen.reshapes)
        if (const int64_t bytes = int64_t{16} * reshape.count; bytes <= int64_t{grantedBlock})
            cost.hosts += bytes;
    if (seen.seconds >
        secondsByItself + secondsPerByte * static_cast<double>(cost.heap + cost.hosts))
        Tell("took %.1f s of the processor for %" PRId64 " bytes", seen.seconds,
             cost.heap + cost.hosts);
    if (cost.heap > mostHeap)
        Tell("took %" PRId64 " bytes of the heap", cost.heap);
    CheckHost();
    return cost;
}

void Limit(int resource, rlim_t most) {
    const rlimit limit = {most, most};
    setrlimit(resource, &limit);
}

} // namespace

Outcome RunCost(Random &random, const Subject &subject) {
    const Scenario scenario = SomeCostlyScenario(random, *subject.thunk);
    int ends[2];
    if (pipe(ends) != 0)
        return {};
    std::fflush(nullptr);
    const pid_t child = fork();
    if (child == 0) {
        Limit(RLIMIT_CPU, secondsToLive);
#ifndef __SANITIZE_ADDRESS__ // the sanitizer itself reserves more
        Limit(RLIMIT_AS, addressSpace);
#endif
        Limit(RLIMIT_CORE, 0);
        const int before = findings;
        const Cost cost = CostOf(scenario);
        EndHeapBalance();
        const bool isWritten = write(ends[1], &cost, sizeof cost) == sizeof cost;
        _exit(findings > before ? 1 : isWritten ? 0 : 2);
    }
    close(ends[1]);
    Cost cost;
    const bool isRead = read(ends[0], &cost, sizeof cost) == sizeof cost;
    close(ends[0]);
    int how = 0;
    waitpid(child, &how, 0);
    ++callsMade;
    if (WIFSIGNALED(how))
        Tell("ended by signal %d in a separate process", WTERMSIG(how));
    else if (WEXITSTATUS(how) != 0)
        ++findings; // the process has reported it
    if (isRead) {
        Cost &most = highest[subject.name];
        most.seconds = std::max(most.seconds, cost.seconds);
        most.heap = std::max(most.heap, cost.heap);
    }
    return {isRead ? cost.status : ErrInternal, 0};
}

void PrintCosts() {
    std::multimap<double, std::string, std::greater<>> bySeconds;
    std::multimap<int64_t, std::string, std::greater<>> byHeap;
    for (const auto &[name, cost] : highest) {
        bySeconds.emplace(cost.seconds, name);
        byHeap.emplace(cost.heap, name);
    }
    int left = 5;
    for (auto at = bySeconds.begin(); at != bySeconds.end() && left-- > 0; ++at)
        std::printf("most time: %s %.2f s\n", at->second.c_str(), at->first);
    left = 5;
    for (auto at = byHeap.begin(); at != byHeap.end() && left-- > 0; ++at)
        std::printf("most of the heap: %s %" PRId64 " bytes\n", at->second.c_str(), at->first);
}

} // namespace qx::test
