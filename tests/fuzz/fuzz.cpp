#include "tests/fuzz/attack.h"
#include "tests/fuzz/cost.h"
#include "tests/fuzz/oddities.h"
#include "tests/fuzz/recipe_case.h"
#include "tests/fuzz/scenario.h"
#include "tests/fuzz/session.h"
#include "tests/fuzz/thunk_case.h"
#include "tests/support/hostile_host.h"

#include <algorithm>
#include <atomic>
#include <chrono>
#include <cinttypes>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <iterator>
#include <thread>

// Calls every export of the catalogue with arguments of every kind (a third of the time with those
// of its recipe, partly spoilt), in a host that refuses requests, and checks what must hold for any
// arguments: no byte is written outside a block or in an input, the sizes of a block never exceed
// it, codes are documented, the same call gives the same bits, one handle as input and output gives
// the result of two handles, the workspace and the heap get back all blocks, and time is bounded.
// The kinds of cases:
//
//     plain     a few calls of an export
//     meetings  a call with each pair of its arrays as one array
//     honesty   a call while the host or the heap refuses: a success must give the same numbers
//     session   several exports on the same slots, instance words and arrays
//     cost      a call with little data and numbers of any size, in a separate process with limits on
//               time and memory; only on request
//
//     fuzz [--seed N] [--rounds N] [--calls N] [--seconds N] [--threads N] [--export NAME]
//          [--round N] [--kind NAME] [--list]
//
// The program ends at the first limit reached (by default 100 rounds), or on a signal. Each round
// makes a case for each export. The case of an export in round k of a seed does not depend on the
// other exports, so that a finding can be repeated with --seed, --export and --round.

namespace qx::test {

namespace {

// An export without a success in this many cases is a finding: it or its recipes are at fault, even
// though two thirds of the cases are far from valid arguments.
constexpr int64_t enoughCases = 1000;

std::atomic<bool> isStopped = false;

struct Tally {
    int64_t cases = 0, successes = 0;
};

// The kinds of cases, and the number out of ten of each.
struct CaseKind {
    const char *name;
    int32_t share;
    Outcome (*ofThunk)(Random &, const Subject &);
    Outcome (*ofRecipe)(Random &, const Recipe &);
};
template <Outcome Run(Random &, const Thunk &)>
Outcome OfThunk(Random &random, const Subject &subject) {
    return Run(random, *subject.thunk);
}
constexpr CaseKind caseKinds[] = {
    {"plain", 6, OfThunk<RunThunkCase>, RunRecipeCase},
    {"meetings", 1, OfThunk<RunThunkMeetings>, RunRecipeMeetings},
    {"honesty", 1, OfThunk<RunThunkHonesty>, RunRecipeHonesty},
    {"session", 2, RunSession, RunRecipeCase},
    {"cost", 0, RunCost, RunRecipeCase},
};

const CaseKind &SomeKind(Random &random) {
    int32_t at = random.below(10);
    for (const CaseKind &kind : caseKinds)
        if (options.onlyKind == kind.name || (options.onlyKind.empty() && (at -= kind.share) < 0))
            return kind;
    return caseKinds[0];
}

void RunCase(const Subject &subject, int64_t round, Tally &tally) {
    current->name = subject.name.c_str();
    current->since = ProcessSeconds();
    current->start = time(nullptr);
    current->round = round;
    Random random(SeedOf(options.seed, subject.name, round));
    const CaseKind &kind = SomeKind(random);
    const auto recipes = static_cast<int32_t>(subject.recipes.size());
    Outcome outcome;
    if (recipes == 0 || (subject.thunk != nullptr && !random.oneIn(3)))
        outcome = kind.ofThunk(random, subject);
    else
        outcome = kind.ofRecipe(random,
                                *subject.recipes[static_cast<std::size_t>(random.below(recipes))]);
    EndHeapBalance();
    ++tally.cases;
    tally.successes += outcome.status >= 0;
    current->round = -1;
}

void Work(int thread, std::atomic<int64_t> &next, std::vector<Tally> &tallies) {
    current = &currents[thread];
    const auto end =
        std::chrono::steady_clock::now() + std::chrono::duration<double>(options.seconds);
    Random random(options.seed + static_cast<uint64_t>(thread));
    const auto exports = static_cast<int64_t>(AllSubjects().size());
    while (findings < 50) {
        const int64_t number = next++;
        const int64_t round = options.onlyRound >= 0 ? options.onlyRound : number / exports;
        if (isStopped || (options.rounds > 0 && number >= options.rounds * exports) ||
            (options.calls > 0 && callsMade >= options.calls) ||
            (options.seconds > 0 && std::chrono::steady_clock::now() > end))
            return;
        const auto which = static_cast<std::size_t>(number % exports);
        const Subject &subject = AllSubjects()[which];
        if (options.onlyExport.empty() || options.onlyExport == subject.name)
            RunCase(subject, round, tallies[which]);
        if (options.threads > 1 && random.oneIn(4))
            ChangeWorkspace(random);
    }
}

// Ends the run, which then reports its calls; a second signal ends the process immediately.
void Stop(int signal) {
    isStopped = true;
    std::signal(signal, SIG_DFL);
}

void Die(int signal) {
    TellWhereItEnded();
    std::signal(signal, SIG_DFL);
    std::raise(signal);
}

bool IsSubject(const std::string &name) {
    return std::any_of(AllSubjects().begin(), AllSubjects().end(),
                       [&](const Subject &subject) { return subject.name == name; });
}

bool IsKind(const std::string &name) {
    return std::any_of(std::begin(caseKinds), std::end(caseKinds),
                       [&](const CaseKind &kind) { return name == kind.name; });
}

bool Read(int count, char **words) {
    for (int i = 1; i < count; i += 2) {
        const std::string option = words[i];
        const char *value = i + 1 < count ? words[i + 1] : nullptr;
        if (option == "--list") {
            for (const Subject &subject : AllSubjects())
                std::printf("%s%s\n", subject.name.c_str(),
                            subject.thunk == nullptr ? ": by recipe only" : "");
            for (const char *name : NotDriven())
                if (!IsSubject(name))
                    std::printf("not driven: %s\n", name);
            std::exit(0);
        }
        if (value == nullptr)
            return false;
        if (option == "--seed")
            options.seed = std::strtoull(value, nullptr, 10);
        else if (option == "--rounds")
            options.rounds = std::atoll(value);
        else if (option == "--calls")
            options.calls = std::atoll(value);
        else if (option == "--seconds")
            options.seconds = std::atof(value);
        else if (option == "--threads")
            options.threads = std::atoi(value);
        else if (option == "--round")
            options.onlyRound = std::atoll(value);
        else if (option == "--export")
            options.onlyExport = value;
        else if (option == "--kind" && IsKind(value))
            options.onlyKind = value;
        else
            return false;
    }
    if (options.onlyRound >= 0)
        options.rounds = 1;
    else if (options.rounds == 0 && options.calls == 0 && options.seconds <= 0)
        options.rounds = 100;
    const bool forks = options.onlyKind == "cost";
    return options.threads >= 1 && options.threads <= (forks ? 1 : mostThreads);
}

int Main() {
    std::atomic<int64_t> next = 0;
    std::atomic<bool> done = false;
    std::thread watch([&done] { Watch(done); });
    std::vector<std::vector<Tally>> tallies(static_cast<std::size_t>(options.threads),
                                            std::vector<Tally>(AllSubjects().size()));
    std::vector<std::thread> threads;
    for (int t = 0; t < options.threads; ++t)
        threads.emplace_back([&, t] { Work(t, next, tallies[static_cast<std::size_t>(t)]); });
    for (std::thread &thread : threads)
        thread.join();
    EndWorkspace();
    done = true;
    watch.join();

    Tally all;
    std::string neverRight;
    for (std::size_t i = 0; i < AllSubjects().size(); ++i) {
        Tally one;
        for (const auto &tally : tallies) {
            one.cases += tally[i].cases;
            one.successes += tally[i].successes;
        }
        all.cases += one.cases;
        all.successes += one.successes;
        const char *name = AllSubjects()[i].name.c_str();
        const bool mustFail = IsKept(name, Oddity::AlwaysFails);
        if (one.cases > 0 && one.successes == 0 && !mustFail)
            neverRight += std::string(" ") + name;
        if (one.successes > 0 && mustFail)
            Tell("%s succeeded, although it is listed as always failing", name);
        if (one.successes == 0 && one.cases >= enoughCases && !mustFail)
            Tell("%s never succeeded", name);
    }
    std::printf("seed %" PRIu64 ": %" PRId64 " calls in %" PRId64
                " cases of %zu exports in %d threads, %" PRId64 " cases successful, %d findings\n",
                options.seed, callsMade.load(), all.cases, AllSubjects().size(), options.threads,
                all.successes, findings.load());
    if (!neverRight.empty())
        std::printf("never successful:%s\n", neverRight.c_str());
    PrintCosts();
    if (findings > 0)
        std::printf("Intended deviations of exports are listed in tests/fuzz/oddities.h.\n");
    return findings > 0 ? 1 : 0;
}

} // namespace

} // namespace qx::test

#define QX_FOR_SANITIZER __attribute__((visibility("default")))
extern "C" {
void __sanitizer_set_death_callback(void (*)()) __attribute__((weak));
// Requests beyond the limit fail, as they do without a sanitizer.
QX_FOR_SANITIZER const char *__asan_default_options();
const char *__asan_default_options() {
    return "allocator_may_return_null=1:max_allocation_size_mb=4";
}
QX_FOR_SANITIZER const char *__tsan_default_options();
const char *__tsan_default_options() {
    return "allocator_may_return_null=1:max_allocation_size_mb=4";
}
}

int main(int count, char **words) {
    if (!qx::test::Read(count, words)) {
        std::fprintf(stderr, "usage: fuzz [--seed N] [--rounds N] [--calls N] [--seconds N]"
                             " [--threads N] [--export NAME] [--round N] [--kind NAME] [--list]\n");
        return 2;
    }
    std::signal(SIGTERM, qx::test::Stop);
    if (__sanitizer_set_death_callback != nullptr)
        __sanitizer_set_death_callback(qx::test::TellWhereItEnded);
    else
        for (const int signal : {SIGSEGV, SIGBUS, SIGFPE, SIGILL, SIGABRT})
            std::signal(signal, qx::test::Die);
    return qx::test::Main();
}
