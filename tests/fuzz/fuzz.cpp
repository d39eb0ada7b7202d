#include "tests/fuzz/attack.h"
#include "tests/fuzz/oddities.h"
#include "tests/fuzz/recipe_case.h"
#include "tests/fuzz/thunk.h"
#include "tests/support/hostile_host.h"

#include <algorithm>
#include <atomic>
#include <chrono>
#include <cinttypes>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <optional>
#include <thread>
#include <unistd.h>

#ifdef __GLIBC__
#include <malloc.h>
#endif

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

// One argument as it stands before a call; blocks are made from it for each run.
struct Argument {
    int32_t rows = 0, cols = 0;       // of an array; a 1-D array has cols only
    std::vector<unsigned char> bytes; // elements of an array, or what a pointer shows
    int64_t whole = 0;
    double real = 0;
    int aliasOf = -1; // the array argument whose handle this one shares
};

// One call with all that happens around it.
struct Scenario {
    const Thunk *thunk;
    std::vector<Argument> arguments;
    Disturbance disturbance;
};

// An array argument before `at` whose handle it may share: one of the two is an output. Arrays that
// share the handle of a third do not come into question, so that no two outputs are one.
int SomeAlias(Random &random, const Scenario &scenario, std::size_t at) {
    const std::vector<Parameter> &parameters = scenario.thunk->parameters;
    const auto isShared = [&](std::size_t i) {
        return std::any_of(scenario.arguments.begin(), scenario.arguments.end(),
                           [&](const Argument &a) { return a.aliasOf == static_cast<int>(i); });
    };
    std::vector<int> candidates;
    for (std::size_t i = 0; i < at; ++i)
        if (parameters[i].kind == parameters[at].kind &&
            parameters[i].element == parameters[at].element &&
            parameters[i].isOut != parameters[at].isOut && scenario.arguments[i].aliasOf < 0 &&
            !isShared(i))
            candidates.push_back(static_cast<int>(i));
    if (candidates.empty())
        return -1;
    return candidates[static_cast<std::size_t>(
        random.below(static_cast<int32_t>(candidates.size())))];
}

Argument SomeArgument(Random &random, const Parameter &parameter, const Sizes &sizes,
                      bool isUsual) {
    Argument argument;
    const auto content = static_cast<Content>(random.below(isUsual ? usualContents : allContents));
    if (parameter.isArray()) {
        argument.rows = parameter.dimensions() == 1 ? 1 : SomeDimension(random, sizes, isUsual);
        argument.cols = SomeDimension(random, sizes, isUsual);
        if (parameter.dimensions() == 2) { // what is cubic in the size stays small
            argument.rows %= 33;
            argument.cols %= 33;
        }
        argument.bytes =
            SomeElements(random, parameter.element, argument.rows, argument.cols, content);
    } else if (parameter.kind == Kind::Value || parameter.kind == Kind::Reference) {
        argument.whole = SomeWhole(random, sizes);
        argument.real = SomeReal(random, sizes, isUsual);
        argument.bytes.resize(ElementSize(parameter.element));
        const auto whole = static_cast<int32_t>(argument.whole);
        if (parameter.element == "DBL")
            std::memcpy(argument.bytes.data(), &argument.real, sizeof argument.real);
        else if (argument.bytes.size() <= sizeof whole)
            std::memcpy(argument.bytes.data(), &whole, argument.bytes.size());
        else
            argument.bytes = SomeElements(random, parameter.element, 1, 1, content);
    } else if (!parameter.element.empty()) {
        argument.bytes = SomeElements(random, parameter.element, 1, 1, content);
    }
    return argument;
}

Scenario SomeScenario(Random &random, const Thunk &thunk) {
    const bool isUsual = random.oneIn(2);
    const Sizes sizes = SomeSizes(random);
    Scenario scenario{&thunk, {}, {}};
    const bool shares = random.oneIn(6);
    for (std::size_t i = 0; i < thunk.parameters.size(); ++i) {
        const Parameter &parameter = thunk.parameters[i];
        Argument argument = SomeArgument(random, parameter, sizes, isUsual);
        if (IsKept(thunk.name, Oddity::TimeFollowsNumber))
            argument.whole %= 2000;
        if (shares && parameter.isArray()) {
            argument.aliasOf = SomeAlias(random, scenario, i);
            if (argument.aliasOf >= 0) {
                const int aliasOf = argument.aliasOf;
                argument = scenario.arguments[static_cast<std::size_t>(aliasOf)];
                argument.aliasOf = aliasOf;
            }
        }
        scenario.arguments.push_back(std::move(argument));
    }
    scenario.disturbance = SomeDisturbance(random);
    return scenario;
}

// The words that a node keeps between its calls.
struct Node {
    void *slots[4] = {};
    void *instance = nullptr;
    int32_t (*release)(void **) = nullptr;
    ~Node() {
        for (void *slot : slots)
            RunSweepOf(slot);
        if (instance != nullptr && release != nullptr)
            release(&instance);
    }
};

// How a call is made. The second time what no result may depend on is another: what memory and
// outputs hold before, and whether arrays share a handle.
struct Manner {
    bool apart = false;
    unsigned char rubbish = 0x17;
};

class Blocks {
public:
    Blocks(const Scenario &scenario, const Manner &manner) : scenario_(scenario) {
        for (std::size_t i = 0; i < scenario.arguments.size(); ++i) {
            const Argument &argument = scenario.arguments[i];
            const Parameter &parameter = scenario.thunk->parameters[i];
            void *handle = nullptr;
            if (parameter.isArray() && argument.aliasOf >= 0 && !manner.apart) {
                handle = handles_[static_cast<std::size_t>(argument.aliasOf)];
            } else if (parameter.isArray()) {
                handle = NewArray(parameter, argument, isRead(i) ? nullptr : &manner.rubbish);
                own_.push_back(handle);
            }
            handles_.push_back(handle);
        }
    }
    ~Blocks() {
        for (void *handle : own_)
            detail::FreeBlock(handle);
    }
    Blocks(const Blocks &) = delete;
    Blocks &operator=(const Blocks &) = delete;

    void *handle(std::size_t i) const { return handles_[i]; }
    unsigned char *block(std::size_t i) const {
        return *static_cast<unsigned char **>(handles_[i]);
    }
    std::vector<int32_t> sizes(std::size_t i) const {
        std::vector<int32_t> found(static_cast<std::size_t>(parameter(i).dimensions()));
        std::memcpy(found.data(), block(i), 4 * found.size());
        return found;
    }
    const unsigned char *elements(std::size_t i) const {
        return block(i) + 4 * parameter(i).dimensions();
    }
    // Of the elements, as the sizes tell; none where the block has not so many.
    std::optional<std::size_t> bytes(std::size_t i) const {
        std::size_t count = 1;
        for (const int32_t size : sizes(i)) {
            if (size < 0)
                return std::nullopt;
            count *= static_cast<std::size_t>(size);
        }
        const std::size_t header = 4 * static_cast<std::size_t>(parameter(i).dimensions());
        const std::size_t size = count * ElementSize(parameter(i).element);
        if (size > detail::BlockSize(handles_[i]) - header)
            return std::nullopt;
        return size;
    }
    bool isShared(std::size_t i) const {
        return std::count(handles_.begin(), handles_.end(), handles_[i]) > 1;
    }

private:
    const Parameter &parameter(std::size_t i) const { return scenario_.thunk->parameters[i]; }
    bool isRead(std::size_t i) const {
        bool reads = parameter(i).isIn;
        for (std::size_t other = i + 1; other < scenario_.arguments.size(); ++other)
            reads |=
                scenario_.arguments[other].aliasOf == static_cast<int>(i) && parameter(other).isIn;
        return reads;
    }
    static void *NewArray(const Parameter &parameter, const Argument &argument,
                          const unsigned char *rubbish) {
        const int32_t rows = parameter.dimensions() == 1 ? argument.cols : argument.rows;
        void *handle = detail::NewBlock(parameter.dimensions(), TypeCode(parameter.element),
                                        ElementSize(parameter.element), rows, argument.cols);
        unsigned char *elements =
            *static_cast<unsigned char **>(handle) + 4 * parameter.dimensions();
        if (rubbish != nullptr)
            std::fill_n(elements, argument.bytes.size(), *rubbish);
        else if (!argument.bytes.empty())
            std::memcpy(elements, argument.bytes.data(), argument.bytes.size());
        return handle;
    }

    const Scenario &scenario_;
    std::vector<void *> handles_, own_;
};

class Hash {
public:
    // A NaN counts as a NaN: its sign and payload are the processor's.
    void add(const unsigned char *bytes, std::size_t count, bool isReal) {
        for (std::size_t i = 0; i < count; i += 8) {
            uint64_t word = 0;
            std::memcpy(&word, bytes + i, count - i < 8 ? count - i : 8);
            double real;
            std::memcpy(&real, &word, sizeof real);
            word = isReal && real != real ? 1 : word;
            value_ = (value_ ^ word) * 0x9E3779B97F4A7C15U;
            value_ ^= value_ >> 29;
        }
    }
    uint64_t value() const { return value_; }

private:
    uint64_t value_ = 0x632BE59BD9B4E019U;
};

// Everything that one call is held to by itself.
class Run {
public:
    Run(const Scenario &scenario, Node &node, const Manner &manner)
        : scenario_(scenario), thunk_(*scenario.thunk), manner_(manner), blocks_(scenario, manner) {
        pointed_.resize(thunk_.parameters.size());
        std::size_t slots = 0;
        for (std::size_t i = 0; i < thunk_.parameters.size(); ++i) {
            const Parameter &parameter = thunk_.parameters[i];
            const Argument &argument = scenario.arguments[i];
            pointed_[i] = argument.bytes;
            if (!parameter.isIn)
                std::fill(pointed_[i].begin(), pointed_[i].end(), manner.rubbish);
            Value value{pointed_[i].data(), argument.whole, argument.real};
            if (parameter.isArray())
                value.pointer = blocks_.handle(i);
            else if (parameter.kind == Kind::Slot)
                value.pointer = &node.slots[slots++ % 4];
            else if (parameter.kind == Kind::Instance)
                value.pointer = &node.instance;
            else if (parameter.kind == Kind::Error)
                value.pointer = &error_;
            hasError_ |= parameter.kind == Kind::Error;
            values_.push_back(value);
        }
        node.release = thunk_.release;
    }

    Outcome call() {
        const int32_t result = Attacked(scenario_.disturbance, manner_.rubbish,
                                        [this] { return thunk_.call(values_.data()); });
        status_ = hasError_ ? error_ : thunk_.returnsCode ? result : 0;
        const bool shares =
            std::any_of(scenario_.arguments.begin(), scenario_.arguments.end(),
                        [](const Argument &argument) { return argument.aliasOf >= 0; });
        CheckStatus(thunk_.name, status_, scenario_.disturbance, shares);
        checkBlocks();
        return {status_, hash()};
    }

private:
    void checkBlocks() const {
        CheckHost();
        for (std::size_t i = 0; i < thunk_.parameters.size(); ++i) {
            const Parameter &parameter = thunk_.parameters[i];
            if (!parameter.isArray())
                continue;
            if (!blocks_.bytes(i) && !IsKept(thunk_.name, Oddity::SizeBeyondBlock))
                Tell("the sizes of %s exceed its block", parameter.name);
            else if (blocks_.bytes(i) && !parameter.isOut && !blocks_.isShared(i))
                checkInput(i);
        }
    }
    void checkInput(std::size_t i) const {
        const Argument &argument = scenario_.arguments[i];
        const unsigned char *elements = blocks_.elements(i);
        const bool isSame = std::equal(elements, elements + *blocks_.bytes(i),
                                       argument.bytes.begin(), argument.bytes.end());
        if (!isSame)
            Tell("the input %s has changed", thunk_.parameters[i].name);
    }
    // A record by its fields: what lies between them is nobody's.
    void addPointed(Hash &hash, std::size_t i) const {
        const std::string &element = thunk_.parameters[i].element;
        const auto record = AllRecords().find(element);
        if (record == AllRecords().end()) {
            hash.add(pointed_[i].data(), pointed_[i].size(), element == "DBL");
            return;
        }
        for (const RecordField &field : record->second.fields)
            hash.add(pointed_[i].data() + field.offset, field.count * ElementSize(field.element),
                     field.element == "DBL");
    }
    uint64_t hash() const {
        Hash hash;
        // An output may keep what it held.
        if (status_ < 0 || status_ == statusNoMemory)
            return 0;
        for (std::size_t i = 0; i < thunk_.parameters.size(); ++i) {
            const Parameter &parameter = thunk_.parameters[i];
            const bool isReal = parameter.element == "DBL" || parameter.element == "CDB";
            if (parameter.isArray() && parameter.isOut && blocks_.bytes(i)) {
                const std::vector<int32_t> sizes = blocks_.sizes(i);
                hash.add(reinterpret_cast<const unsigned char *>(sizes.data()), 4 * sizes.size(),
                         false);
                hash.add(blocks_.elements(i), *blocks_.bytes(i), isReal);
            } else if (!parameter.isArray() && parameter.isOut && !parameter.element.empty() &&
                       parameter.kind != Kind::Error) {
                addPointed(hash, i);
            }
        }
        return hash.value();
    }

    const Scenario &scenario_;
    const Thunk &thunk_;
    Manner manner_;
    Blocks blocks_;
    std::vector<std::vector<unsigned char>> pointed_;
    std::vector<Value> values_;
    ErrorCode error_ = 0, status_ = 0;
    bool hasError_ = false;
};

Outcome RunAlone(const Scenario &scenario, const Manner &manner) {
#ifdef __GLIBC__
    if (options.threads == 1)
        mallopt(M_PERTURB, manner.rubbish);
#endif
    Node node;
    return Run(scenario, node, manner).call();
}

struct Tally {
    int64_t calls = 0, successes = 0;
};

uint64_t SeedOf(const std::string &name, int64_t round) {
    uint64_t seed = options.seed;
    for (const char c : name)
        seed = seed * 0x100000001B3U + static_cast<unsigned char>(c);
    return seed * 0x100000001B3U + static_cast<uint64_t>(round);
}

void RunThunkCase(const Thunk &thunk, Random &random, Tally &tally) {
    Node node;
    for (int32_t left = 1 + random.below(3); left > 0; --left) {
        const Scenario scenario = SomeScenario(random, thunk);
        const bool shares = std::any_of(scenario.arguments.begin(), scenario.arguments.end(),
                                        [](const Argument &a) { return a.aliasOf >= 0; });
        const bool again = scenario.disturbance.isNone() && (shares || random.oneIn(4));
        Outcome outcome;
        {
            const TinyWorkspace workspace(scenario.disturbance.workspace);
            if (again || scenario.disturbance.workspace != 0)
                outcome = RunAlone(scenario, {});
            else
                outcome = Run(scenario, node, {}).call();
        }
        ++tally.calls;
        tally.successes += outcome.status >= 0;
        if (!again)
            continue;
        const Outcome second = RunAlone(scenario, {shares, 0xC2});
        CheckRepetition(thunk.name, outcome, second, shares);
    }
}

// An export with the ways to call it.
struct Subject {
    std::string name;
    const Thunk *thunk = nullptr;
    std::vector<const Recipe *> recipes;
};

const std::vector<Subject> &AllSubjects() {
    static const std::vector<Subject> all = [] {
        std::map<std::string, Subject> byName;
        for (const Thunk &thunk : AllThunks())
            byName[thunk.name].thunk = &thunk;
        for (const Recipe &recipe : AllRecipes())
            byName[recipe.exportName()].recipes.push_back(&recipe);
        std::vector<Subject> subjects;
        for (auto &[name, subject] : byName) {
            subject.name = name;
            subjects.push_back(std::move(subject));
        }
        return subjects;
    }();
    return all;
}

void RunCase(const Subject &subject, int64_t round, Tally &tally) {
    current->name = subject.name.c_str();
    current->since = time(nullptr);
    current->round = round;
    Random random(SeedOf(subject.name, round));
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
