#include "tests/fuzz/attack.h"
#include "tests/fuzz/oddities.h"
#include "tests/fuzz/recipe_case.h"
#include "tests/fuzz/scenario.h"
#include "tests/support/hostile_host.h"

#include <algorithm>
#include <atomic>
#include <chrono>
#include <cinttypes>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <thread>

// Calls every export of the catalogue with arguments of every kind (each third time with those of
// its recipe, spoilt here and there), in a host that refuses, and looks at what holds whatever the
// arguments are: no byte is touched outside a block or in an input, the sizes of a block never
// exceed it, codes are those that are documented, the same call gives the same bits, one handle as
// input and output gives what two give, the workspace gets back what it gave, and time stays
// bounded.
//
//     fuzz [--seed N] [--rounds N | --seconds N] [--threads N] [--export NAME] [--round N] [--list]
//
// Each round makes a case for each export. The case of an export in round k of a seed is the same
// whatever other exports there are: what is found is repeated by --seed, --export and --round.

namespace qx::test {

namespace {

// Everything that one call is held to by itself.
Outcome CallAndCheck(const Scenario &scenario, Node &node, const Manner &manner) {
    const Thunk &thunk = *scenario.thunk;
    PreparedCall call(scenario, node, manner);
    const ErrorCode status =
        call.status(Attacked(scenario.disturbance, manner.rubbish, [&call] { return call(); }));
    if (scenario.writesOneTwice() && !IsKept(thunk.name, Oddity::WorksInInput))
        CheckRefusal(status, call.hasStatus());
    else
        CheckStatus(thunk.name, status, scenario.disturbance, scenario.shares());
    CheckHost();
    for (std::size_t i = 0; i < thunk.parameters.size(); ++i) {
        const Parameter &parameter = thunk.parameters[i];
        if (!parameter.isArray())
            continue;
        if (!call.sizesFitBlock(i) && !IsKept(thunk.name, Oddity::SizeBeyondBlock))
            Tell("the sizes of %s exceed its block", parameter.name);
        if (!call.inputIsUnchanged(i))
            Tell("the input %s has changed", parameter.name);
    }
    if (status < 0 || status == statusNoMemory) // an output may keep what it held
        return {status, 0};
    ValueHash hash;
    for (const OutputValue &value : call.outputs())
        hash.add(value);
    return {status, hash.sizes() ^ hash.elements()};
}

Outcome CallAlone(const Scenario &scenario, const Manner &manner) {
    Node node;
    return CallAndCheck(scenario, node, manner);
}

struct Tally {
    int64_t calls = 0, successes = 0;
};

void RunThunkCase(const Thunk &thunk, Random &random, Tally &tally) {
    Node node;
    for (int32_t left = 1 + random.below(3); left > 0; --left) {
        const Scenario scenario = SomeScenario(random, thunk);
        const bool shares = scenario.shares();
        const bool isRefused = scenario.writesOneTwice();
        const bool says = scenario.saysNegativeSize();
        const bool again =
            scenario.disturbance.isNone() && !isRefused && (shares || says || random.oneIn(4));
        Outcome outcome;
        {
            const TinyWorkspace workspace(scenario.disturbance.workspace);
            if (again || scenario.disturbance.workspace != 0)
                outcome = CallAlone(scenario, {});
            else
                outcome = CallAndCheck(scenario, node, {});
        }
        ++tally.calls;
        tally.successes += outcome.status >= 0;
        if (!again)
            continue;
        const Outcome second = CallAlone(scenario, {shares, 0xC2, says});
        if (!says || !IsCodeOfNegativeSize(thunk.name, outcome.status))
            CheckRepetition(thunk.name, outcome, second,
                            says     ? "an empty array for a negative size"
                            : shares ? "an array for each handle"
                                     : "the same call");
    }
}

void RunCase(const Subject &subject, int64_t round, Tally &tally) {
    current->name = subject.name.c_str();
    current->since = time(nullptr);
    current->round = round;
    Random random(SeedOf(options.seed, subject.name, round));
    const auto recipes = static_cast<int32_t>(subject.recipes.size());
    if (recipes == 0 || (subject.thunk != nullptr && !random.oneIn(3))) {
        RunThunkCase(*subject.thunk, random, tally);
    } else {
        const Recipe &recipe = *subject.recipes[static_cast<std::size_t>(random.below(recipes))];
        ++tally.calls;
        tally.successes += RunRecipeCase(random, recipe).status >= 0;
    }
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
        const bool isOver = options.seconds > 0 ? std::chrono::steady_clock::now() > end
                                                : number >= options.rounds * exports;
        if (isOver)
            return;
        const auto which = static_cast<std::size_t>(number % exports);
        const Subject &subject = AllSubjects()[which];
        if (options.onlyExport.empty() || options.onlyExport == subject.name)
            RunCase(subject, round, tallies[which]);
        if (options.threads > 1 && random.oneIn(4))
            ChangeWorkspace(random);
    }
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

bool Read(int count, char **words) {
    for (int i = 1; i < count; i += 2) {
        const std::string option = words[i];
        const char *value = i + 1 < count ? words[i + 1] : nullptr;
        if (option == "--list") {
            for (const Subject &subject : AllSubjects())
                std::printf("%s%s\n", subject.name.c_str(),
                            subject.thunk == nullptr ? ": by recipe only" : "");
            for (const std::string &name : NotDriven())
                if (!IsSubject(name))
                    std::printf("not driven: %s\n", name.c_str());
            std::exit(0);
        }
        if (value == nullptr)
            return false;
        if (option == "--seed")
            options.seed = std::strtoull(value, nullptr, 10);
        else if (option == "--rounds")
            options.rounds = std::atoll(value);
        else if (option == "--seconds")
            options.seconds = std::atof(value);
        else if (option == "--threads")
            options.threads = std::atoi(value);
        else if (option == "--round")
            options.onlyRound = std::atoll(value);
        else if (option == "--export")
            options.onlyExport = value;
        else
            return false;
    }
    if (options.onlyRound >= 0 || (options.rounds == 0 && options.seconds <= 0))
        options.rounds = options.onlyRound >= 0 ? 1 : 100;
    return options.threads >= 1 && options.threads <= mostThreads;
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
            one.calls += tally[i].calls;
            one.successes += tally[i].successes;
        }
        all.calls += one.calls;
        all.successes += one.successes;
        if (one.calls > 0 && one.successes == 0)
            neverRight += std::string(" ") + AllSubjects()[i].name;
    }
    std::printf("seed %" PRIu64 ": %" PRId64 " calls of %zu exports in %d threads, %" PRId64
                " of them successful, %d findings\n",
                options.seed, all.calls, AllSubjects().size(), options.threads, all.successes,
                findings.load());
    if (!neverRight.empty())
        std::printf("never successful:%s\n", neverRight.c_str());
    if (findings > 0)
        std::printf("What an export does on purpose is told in tests/fuzz/oddities.h.\n");
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
        std::fprintf(stderr, "usage: fuzz [--seed N] [--rounds N | --seconds N] [--threads N]"
                             " [--export NAME] [--round N] [--list]\n");
        return 2;
    }
    std::signal(SIGTERM, qx::test::Die);
    if (__sanitizer_set_death_callback != nullptr)
        __sanitizer_set_death_callback(qx::test::TellWhereItEnded);
    else
        for (const int signal : {SIGSEGV, SIGBUS, SIGFPE, SIGILL, SIGABRT})
            std::signal(signal, qx::test::Die);
    return qx::test::Main();
}
