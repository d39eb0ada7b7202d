#include "tests/compare/trampolines.h"
#include "tests/fuzz/recipe_case.h"
#include "tests/fuzz/scenario.h"
#include "tests/support/hostile_host.h"

#include <cinttypes>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <dlfcn.h>
#include <fstream>
#include <functional>
#include <string>
#include <sys/resource.h>
#include <sys/time.h>
#include <unistd.h>
#include <vector>

// Makes the calls of the fuzzer and of the recipes on one module and writes a record of each, so
// that tools/compare_modules can compare two modules.
//
//     record_calls MODULE [--exports FILE] [--seed N] [--from CASE] [--to CASE]
//                  [--seconds N] [--show]
//     record_calls --list
//
// FILE lists the names of the exports to call, one per line. With E exports, case c belongs to
// export c % E in round c / E: round 0 runs its recipes unchanged, at each of their sizes; later
// rounds run the case of the fuzzer. A failing heap and a small workspace are not simulated: the
// memory that a function takes is not part of its results. The records of a case are written
// together when it ends, so that the reader knows in which case the process died; a case that takes
// longer than --seconds of processor time also ends the process. --show prints the calls in words.
//
// No result depends on an address, the time or an earlier call: new blocks of the host and of the
// heap are filled with one byte value, slots and instance words belong to one case, and no export
// reads a clock.

namespace qx::test {

namespace {

// The flags of a record.
constexpr uint32_t lacksMemory = 1;  // the heap refused a request above the limit
constexpr uint32_t hostFault = 2;    // the host reports a fault, such as a write outside a block
constexpr uint32_t inputChanged = 4; // of an argument that is not an output
constexpr uint32_t sizesExceedBlock = 8;

struct Record {
    int64_t caseNumber;
    int32_t step; // index of the call in its case
    int32_t code;
    int32_t result;
    uint32_t flags;
    uint64_t resizes, sizes, elements;
};
static_assert(sizeof(Record) == 48);

constexpr int faultStatus = 3; // exit status: the memory of the process is corrupted
constexpr unsigned char freshByte = 0x17;
constexpr int32_t clockPerProcessor = 15; // elapsed time after which a waiting case is ended
constexpr rlim_t mostMemory = rlim_t{4} << 30;

struct Orders {
    const char *module = nullptr;
    const char *exports = nullptr;
    uint64_t seed = 1;
    int64_t from = 0, to = 0;
    int32_t seconds = 20; // of processor time for one case
    bool show = false;
};
Orders orders;

void Print(const Record &record, const Observed &seen, const std::vector<OutputValue> &outputs);

// One case: its calls in order.
class Case {
public:
    explicit Case(int64_t number) : number_(number) {}

    void add(const Observed &seen, ErrorCode code, const std::vector<OutputValue> &outputs,
             uint32_t flags) {
        Record record = {number_, static_cast<int32_t>(records_.size()), code, seen.result, 0, 0, 0,
                         0};
        record.flags =
            flags | (seen.lacksMemory ? lacksMemory : 0) | (seen.fault.empty() ? 0 : hostFault);
        for (const Reshape &reshape : seen.reshapes)
            for (const int32_t number : {reshape.typeCode, reshape.numDims, reshape.count})
                record.resizes =
                    record.resizes * 0x100000001B3U + static_cast<uint32_t>(number) + 1;
        ValueHash hash;
        for (const OutputValue &value : outputs)
            hash.add(value);
        record.sizes = hash.sizes();
        record.elements = hash.elements();
        records_.push_back(record);
        if (orders.show)
            Print(record, seen, outputs);
        if ((record.flags & hostFault) != 0) {
            write();
            std::_Exit(faultStatus);
        }
    }

    void write() const {
        const auto *next = reinterpret_cast<const char *>(records_.data());
        std::fflush(stdout);
        for (std::size_t left = orders.show ? 0 : records_.size() * sizeof(Record); left > 0;) {
            const ssize_t written = ::write(STDOUT_FILENO, next, left);
            if (written < 0)
                std::_Exit(1);
            next += written;
            left -= static_cast<std::size_t>(written);
        }
    }

private:
    int64_t number_;
    std::vector<Record> records_;
};

// The size of an element in bytes, and how it is printed.
void PrintElements(const OutputValue &value) {
    RecordField whole;
    const RecordType type = LayoutOf(value.element, whole);
    for (std::size_t at = 0; at + type.size <= value.bytes; at += type.size) {
        std::printf("  %s[%zu] =", value.name.c_str(), at / type.size);
        for (const RecordField &field : type.fields)
            for (std::size_t i = 0; i < field.count; ++i) {
                const unsigned char *bytes =
                    value.elements + at + field.offset + i * ElementSize(field.element);
                const auto as = [bytes](auto number) {
                    std::memcpy(&number, bytes, sizeof number);
                    return number;
                };
                if (field.element == "DBL")
                    std::printf(" %.17g (%a)", as(0.0), as(0.0));
                else if (field.element == "SGL")
                    std::printf(" %.9g", static_cast<double>(as(0.0F)));
                else if (ElementSize(field.element) == 4)
                    std::printf(" %d", as(int32_t{0}));
                else
                    std::printf(" %d", bytes[0]);
            }
        std::printf("\n");
    }
}

void PrintValue(const OutputValue &value) {
    std::printf("  %s (%s", value.name.c_str(), value.element.c_str());
    for (const int32_t size : value.sizes)
        std::printf(", %d", size);
    std::printf(")\n");
    PrintElements(value);
}

void Print(const Record &record, const Observed &seen, const std::vector<OutputValue> &outputs) {
    std::printf("gives code %d, result %d%s%s%s%s\n  resizes:", record.code, record.result,
                (record.flags & lacksMemory) != 0 ? ", the heap refused" : "",
                (record.flags & inputChanged) != 0 ? ", an input has changed" : "",
                (record.flags & sizesExceedBlock) != 0 ? ", sizes exceed their block" : "",
                seen.fault.empty() ? "" : (", the host found " + seen.fault).c_str());
    for (const Reshape &reshape : seen.reshapes)
        std::printf(" type %d, %dD to %d;", reshape.typeCode, reshape.numDims, reshape.count);
    std::printf("\n");
    for (const OutputValue &value : outputs)
        PrintValue(value);
}

void PrintDisturbance(const Disturbance &disturbance) {
    if (disturbance.refuseAt != 0)
        std::printf("  the host refuses %s %d with status %d\n",
                    disturbance.refuseAt == everyReshape ? "every resize," : "resize",
                    disturbance.refuseAt, disturbance.refusal);
}

void PrintScenario(const Scenario &scenario) {
    std::printf("call of %s\n", scenario.thunk->name);
    for (std::size_t i = 0; i < scenario.arguments.size(); ++i) {
        const Parameter &parameter = scenario.thunk->parameters[i];
        const Argument &argument = scenario.arguments[i];
        if (argument.aliasOf >= 0) {
            std::printf(
                "  %s is the array %s\n", parameter.name,
                scenario.thunk->parameters[static_cast<std::size_t>(argument.aliasOf)].name);
        } else if (parameter.isArray()) {
            PrintValue({parameter.name, parameter.element,
                        parameter.dimensions() == 1
                            ? std::vector<int32_t>{argument.cols}
                            : std::vector<int32_t>{argument.rows, argument.cols},
                        argument.bytes.data(), parameter.isIn ? argument.bytes.size() : 0});
            if (argument.saysNegativeSize())
                std::printf("    but claims %d rows, %d columns, where 0 means the true size\n",
                            argument.claims[0], argument.claims[1]);
        } else if (parameter.kind == Kind::Value) {
            std::printf("  %s = %" PRId64 ", or %.17g (%a) if it is real\n", parameter.name,
                        argument.whole, argument.real, argument.real);
        } else if (parameter.isIn && !parameter.element.empty()) {
            PrintValue({parameter.name,
                        parameter.element,
                        {},
                        argument.bytes.data(),
                        argument.bytes.size()});
        }
    }
    PrintDisturbance(scenario.disturbance);
}

// Keeps only the host's part of a disturbance: memory must not affect the records.
Disturbance OfHostOnly(Disturbance disturbance) {
    disturbance.allocationFails = 0;
    disturbance.workspace = 0;
    return disturbance;
}

// Records a fault that the host finds after the call.
void CheckAfter(Observed &seen) {
    try {
        CheckBlocks();
    } catch (const std::exception &error) {
        seen.fault = error.what();
    }
}

void CallByCatalogue(Case &one, const Thunk &thunk, Random &random) {
    Node node;
    for (int32_t left = 1 + random.below(3); left > 0; --left) {
        Scenario scenario = SomeScenario(random, thunk);
        scenario.disturbance = OfHostOnly(scenario.disturbance);
        if (orders.show)
            PrintScenario(scenario);
        PreparedCall call(scenario, node, {.rubbish = freshByte});
        Observed seen = Observe(scenario.disturbance, freshByte, [&call] { return call(); });
        CheckAfter(seen);
        uint32_t flags = 0;
        for (std::size_t i = 0; i < thunk.parameters.size(); ++i) {
            if (thunk.parameters[i].isArray() && !call.sizesFitBlock(i))
                flags |= sizesExceedBlock;
            if (!call.inputIsUnchanged(i))
                flags |= inputChanged;
        }
        one.add(seen, call.status(seen.result), call.outputs(), flags);
    }
}

void PrintSpecial(const RecipeSpoiling &spoiling) {
    if (spoiling.claimed < 0 && spoiling.claimsBoth)
        std::printf("  each dimension of input %d claims %d\n", spoiling.input, spoiling.claimed);
    else if (spoiling.claimed < 0)
        std::printf("  dimension %d of input %d claims %d\n", spoiling.dimension, spoiling.input,
                    spoiling.claimed);
    if (!spoiling.shared)
        return;
    const auto &[first, second] = spoiling.shared->first;
    std::printf("  %s %d and %s %d are the same array\n", first.isOutput ? "output" : "input",
                first.number, second.isOutput ? "output" : "input", second.number);
}

void CallByRecipe(Case &one, const Recipe &recipe, const RecipeSpoiling &spoiling) {
    if (orders.show) {
        std::printf("call of %s, n = %d\n", recipe.name.c_str(), spoiling.n);
        if (spoiling.spoilsContent)
            std::printf("  elements spoilt with seed %" PRIu64 "\n", spoiling.seed);
        if (spoiling.size >= 0)
            std::printf("  dimension %d of input %d is %d\n", spoiling.dimension, spoiling.input,
                        spoiling.size);
        PrintSpecial(spoiling);
        PrintDisturbance(spoiling.disturbance);
    }
    Call call(spoiling.n);
    Spoil(call, spoiling);
    Observed seen = Observe(spoiling.disturbance, freshByte, [&] { return recipe.run(call); });
    CheckAfter(seen);
    uint32_t flags = call.sizesFitBlocks() ? 0 : sizesExceedBlock;
    if (flags == 0 && !call.inputsAreUnchanged())
        flags |= inputChanged;
    one.add(seen, call.status(seen.result), call.outputs(), flags);
}

void MakeCase(int64_t number, const Subject &subject, int64_t round) {
    Case one(number);
    if (round == 0 && !subject.recipes.empty()) {
        for (const Recipe *recipe : subject.recipes)
            for (const int32_t n : recipe->sizes)
                CallByRecipe(one, *recipe, {n, 0, false, 0, 0, -1, {}});
    } else {
        Random random(SeedOf(orders.seed, subject.name, round));
        const auto recipes = static_cast<int32_t>(subject.recipes.size());
        if (recipes == 0 || (subject.thunk != nullptr && !random.oneIn(3))) {
            CallByCatalogue(one, *subject.thunk, random);
        } else {
            const auto which = static_cast<std::size_t>(random.below(recipes));
            const Recipe &recipe = *subject.recipes[which];
            RecipeSpoiling spoiling = SomeSpoiling(random, recipe);
            spoiling.disturbance = OfHostOnly(spoiling.disturbance);
            CallByRecipe(one, recipe, spoiling);
        }
    }
    one.write();
}

// A case that exceeds the limit ends the process: by SIGPROF, or by SIGALRM if it only waits.
void LimitTime() {
    const itimerval limit = {{0, 0}, {orders.seconds, 0}};
    setitimer(ITIMER_PROF, &limit, nullptr);
    alarm(static_cast<unsigned>(orders.seconds * clockPerProcessor));
}

void LimitMemory() {
    const rlimit memory = {mostMemory, mostMemory}, core = {0, 0};
    setrlimit(RLIMIT_AS, &memory);
    setrlimit(RLIMIT_CORE, &core);
}

std::vector<const Subject *> ChosenSubjects() {
    std::vector<const Subject *> chosen;
    if (orders.exports == nullptr) {
        for (const Subject &subject : AllSubjects())
            chosen.push_back(&subject);
        return chosen;
    }
    std::ifstream file(orders.exports);
    for (std::string name; std::getline(file, name);)
        for (const Subject &subject : AllSubjects())
            if (subject.name == name)
                chosen.push_back(&subject);
    return chosen;
}

int List() {
    for (const Subject &subject : AllSubjects())
        std::printf("called %s\n", subject.name.c_str());
    for (const Exempt &exempt : ExemptExports())
        std::printf("exempt %s %s\n", exempt.name, exempt.reason);
    return 0;
}

bool Read(int count, char **words) {
    for (int i = 1; i < count; ++i) {
        const std::string option = words[i];
        const char *value = i + 1 < count ? words[i + 1] : nullptr;
        if (option == "--show") {
            orders.show = true;
            continue;
        }
        if (option[0] != '-' && orders.module == nullptr) {
            orders.module = words[i];
            continue;
        }
        if (value == nullptr)
            return false;
        ++i;
        if (option == "--exports")
            orders.exports = value;
        else if (option == "--seed")
            orders.seed = std::strtoull(value, nullptr, 10);
        else if (option == "--from")
            orders.from = std::atoll(value);
        else if (option == "--to")
            orders.to = std::atoll(value);
        else if (option == "--seconds")
            orders.seconds = std::atoi(value);
        else
            return false;
    }
    return orders.module != nullptr;
}

int Main() {
    if (BindExports(orders.module) == nullptr) {
        std::fprintf(stderr, "record_calls: %s\n", dlerror());
        return 2;
    }
    LimitMemory();
    const std::vector<const Subject *> subjects = ChosenSubjects();
    const auto count = static_cast<int64_t>(subjects.size());
    for (int64_t number = orders.from; number < orders.to && count > 0; ++number) {
        const Subject &subject = *subjects[static_cast<std::size_t>(number % count)];
        LimitTime();
        MakeCase(number, subject, number / count);
    }
    std::fflush(stdout);
    std::_Exit(0);
}

} // namespace

} // namespace qx::test

int main(int count, char **words) {
    if (count == 2 && std::strcmp(words[1], "--list") == 0)
        return qx::test::List();
    if (!qx::test::Read(count, words)) {
        std::fprintf(stderr, "usage: record_calls MODULE [--exports FILE] [--seed N] [--from CASE]"
                             " [--to CASE] [--seconds N] [--show]\n       record_calls --list\n");
        return 2;
    }
    return qx::test::Main();
}
