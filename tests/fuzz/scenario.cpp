#include "tests/fuzz/scenario.h"

#include "tests/fuzz/oddities.h"
#include "tests/support/hostile_host.h"

#include <algorithm>
#include <cstring>
#include <limits>
#include <map>

namespace qx::test {

namespace {

// The arguments that share a handle in a call.
enum class Sharing { Nothing, InputAndOutput, TwoOutputs };

// An array argument before `at` whose handle it may share, or -1. Arguments that already share a
// handle are excluded.
int SomeAlias(Random &random, const Scenario &scenario, std::size_t at, Sharing sharing) {
    const std::span<const Parameter> parameters = scenario.thunk->parameters;
    const auto fit = [sharing](const Parameter &one, const Parameter &other) {
        return one.kind == other.kind && one.element == other.element &&
               (sharing == Sharing::TwoOutputs ? one.isOut && other.isOut
                                               : one.isOut != other.isOut);
    };
    const auto isShared = [&](std::size_t i) {
        return std::any_of(scenario.arguments.begin(), scenario.arguments.end(),
                           [&](const Argument &a) { return a.aliasOf == static_cast<int>(i); });
    };
    std::vector<int> candidates;
    for (std::size_t i = 0; i < at; ++i)
        if (fit(parameters[i], parameters[at]) && scenario.arguments[i].aliasOf < 0 && !isShared(i))
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
        if (parameter.dimensions() == 2) { // limits the cost that is cubic in the size
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

// Makes one array claim a negative size: one of two, or both, so that their product is positive.
void ClaimNegativeSize(Random &random, Scenario &scenario) {
    const std::span<const Parameter> parameters = scenario.thunk->parameters;
    const auto at = static_cast<std::size_t>(random.below(static_cast<int32_t>(parameters.size())));
    Argument &argument = scenario.arguments[at];
    if (!parameters[at].isArray() || argument.aliasOf >= 0)
        return;
    const int32_t negatives[] = {-1, -2, -argument.cols - 1, -65536,
                                 std::numeric_limits<int32_t>::min()};
    const int32_t which = parameters[at].dimensions() == 1 ? 1 : random.below(3);
    if (which != 1)
        argument.claims[0] = random.oneOf(negatives);
    if (which != 0)
        argument.claims[1] = random.oneOf(negatives);
    for (Argument &other : scenario.arguments)
        if (other.aliasOf == static_cast<int>(at))
            std::copy_n(argument.claims, 2, other.claims);
}

Sharing SomeSharing(Random &random) {
    return random.oneIn(6)    ? Sharing::InputAndOutput
           : random.oneIn(16) ? Sharing::TwoOutputs
                              : Sharing::Nothing;
}

} // namespace

bool Scenario::shares() const {
    return std::any_of(arguments.begin(), arguments.end(),
                       [](const Argument &argument) { return argument.aliasOf >= 0; });
}

bool Scenario::writesOneTwice() const {
    const auto isOutput = [this](std::size_t i) { return thunk->parameters[i].isOut; };
    std::vector<int> writers(arguments.size(),
                             0); // of each array, counted at the argument that owns it
    for (std::size_t i = 0; i < arguments.size(); ++i) {
        const int other = arguments[i].aliasOf;
        if (thunk->parameters[i].isArray() && isOutput(i) &&
            ++writers[other < 0 ? i : static_cast<std::size_t>(other)] > 1)
            return true;
    }
    return false;
}

bool Scenario::writesInput() const {
    for (std::size_t i = 0; i < arguments.size(); ++i) {
        const int other = arguments[i].aliasOf;
        if (other >= 0 &&
            thunk->parameters[i].isOut != thunk->parameters[static_cast<std::size_t>(other)].isOut)
            return true;
    }
    return false;
}

bool Scenario::saysNegativeSize() const {
    return std::any_of(arguments.begin(), arguments.end(),
                       [](const Argument &argument) { return argument.saysNegativeSize(); });
}

Scenario SomeScenario(Random &random, const Thunk &thunk) {
    const bool isUsual = random.oneIn(2);
    const Sizes sizes = SomeSizes(random);
    Scenario scenario{&thunk, {}, {}};
    const Sharing sharing = SomeSharing(random);
    for (std::size_t i = 0; i < thunk.parameters.size(); ++i) {
        const Parameter &parameter = thunk.parameters[i];
        Argument argument = SomeArgument(random, parameter, sizes, isUsual);
        if (IsKept(thunk.name, Oddity::TimeFollowsNumber))
            argument.whole %= 2000;
        if (sharing != Sharing::Nothing && parameter.isArray()) {
            argument.aliasOf = SomeAlias(random, scenario, i, sharing);
            if (argument.aliasOf >= 0) {
                const int aliasOf = argument.aliasOf;
                argument = scenario.arguments[static_cast<std::size_t>(aliasOf)];
                argument.aliasOf = aliasOf;
            }
        }
        scenario.arguments.push_back(std::move(argument));
    }
    scenario.disturbance = SomeDisturbance(random);
    if (random.oneIn(10) && !thunk.parameters.empty())
        ClaimNegativeSize(random, scenario);
    return scenario;
}

void *NewArray(const Parameter &parameter, const Argument &argument, const unsigned char *rubbish) {
    const int32_t rows = parameter.dimensions() == 1 ? argument.cols : argument.rows;
    void *handle = detail::NewBlock(parameter.dimensions(), TypeCode(parameter.element),
                                    ElementSize(parameter.element), rows, argument.cols);
    unsigned char *elements = *static_cast<unsigned char **>(handle) + 4 * parameter.dimensions();
    if (rubbish != nullptr)
        std::fill_n(elements, argument.bytes.size(), *rubbish);
    else if (!argument.bytes.empty())
        std::memcpy(elements, argument.bytes.data(), argument.bytes.size());
    return handle;
}

std::vector<int32_t> SizesOf(void *handle, const Parameter &parameter) {
    std::vector<int32_t> found(static_cast<std::size_t>(parameter.dimensions()));
    std::memcpy(found.data(), *static_cast<void **>(handle), 4 * found.size());
    return found;
}

const unsigned char *ElementsOf(void *handle, const Parameter &parameter) {
    return *static_cast<unsigned char **>(handle) + 4 * parameter.dimensions();
}

std::optional<std::size_t> ElementBytes(void *handle, const Parameter &parameter) {
    std::size_t count = 1;
    for (const int32_t size : SizesOf(handle, parameter)) {
        if (size < 0)
            return std::nullopt;
        count *= static_cast<std::size_t>(size);
    }
    const std::size_t header = 4 * static_cast<std::size_t>(parameter.dimensions());
    const std::size_t size = count * ElementSize(parameter.element);
    if (size > detail::BlockSize(handle) - header)
        return std::nullopt;
    return size;
}

Node::~Node() {
    GiveBack([this] {
        for (void *slot : slots)
            RunSweepOf(slot);
        if (instance != nullptr && release != nullptr)
            release(&instance);
    });
}

Blocks::Blocks(const Scenario &scenario, const Manner &manner) : scenario_(scenario) {
    for (std::size_t i = 0; i < scenario.arguments.size(); ++i) {
        const Argument &argument = scenario.arguments[i];
        void *handle = nullptr;
        if (parameter(i).isArray() && argument.aliasOf >= 0 && !manner.apart) {
            handle = handles_[static_cast<std::size_t>(argument.aliasOf)];
        } else if (parameter(i).isArray()) {
            handle = NewArray(parameter(i), argument, isRead(i) ? nullptr : &manner.rubbish);
            own_.push_back(handle);
            claim(handle, parameter(i).dimensions(), argument, manner);
        }
        handles_.push_back(handle);
        before_.push_back(handle != nullptr ? sizes(i) : std::vector<int32_t>());
    }
}

void Blocks::claim(void *handle, int dimensions, const Argument &argument, const Manner &manner) {
    for (int d = 0; d < dimensions; ++d)
        if (const int32_t claimed = argument.claims[2 - dimensions + d]; claimed < 0) {
            const int32_t said = manner.empties ? 0 : claimed;
            std::memcpy(*static_cast<unsigned char **>(handle) + 4 * d, &said, sizeof said);
        }
}

bool Blocks::saysAsBefore(std::size_t i) const { return sizes(i) == before_[i]; }

Blocks::~Blocks() {
    for (void *handle : own_)
        detail::FreeBlock(handle);
}

bool Blocks::isShared(std::size_t i) const {
    return std::count(handles_.begin(), handles_.end(), handles_[i]) > 1;
}

bool Blocks::isRead(std::size_t i) const {
    bool reads = parameter(i).isIn;
    for (std::size_t other = i + 1; other < scenario_.arguments.size(); ++other)
        reads |= scenario_.arguments[other].aliasOf == static_cast<int>(i) && parameter(other).isIn;
    return reads;
}

PreparedCall::PreparedCall(const Scenario &scenario, Node &node, const Manner &manner)
    : scenario_(scenario), thunk_(*scenario.thunk), blocks_(scenario, manner) {
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

bool PreparedCall::inputIsUnchanged(std::size_t i) const {
    const Parameter &parameter = thunk_.parameters[i];
    if (!parameter.isArray() || parameter.isOut || blocks_.isShared(i) || !sizesFitBlock(i))
        return true;
    if (scenario_.arguments[i].saysNegativeSize())
        return blocks_.saysAsBefore(i);
    const std::vector<unsigned char> &before = scenario_.arguments[i].bytes;
    const unsigned char *elements = blocks_.elements(i);
    return std::equal(elements, elements + *blocks_.bytes(i), before.begin(), before.end());
}

std::vector<OutputValue> PreparedCall::outputs() const {
    std::vector<OutputValue> found;
    for (std::size_t i = 0; i < thunk_.parameters.size(); ++i) {
        const Parameter &parameter = thunk_.parameters[i];
        if (!parameter.isOut || parameter.element.empty() || parameter.kind == Kind::Error)
            continue;
        if (parameter.isArray())
            found.push_back({parameter.name, parameter.element, blocks_.sizes(i),
                             blocks_.elements(i), blocks_.bytes(i).value_or(0)});
        else
            found.push_back(
                {parameter.name, parameter.element, {}, pointed_[i].data(), pointed_[i].size()});
    }
    return found;
}

namespace {

void Mix(uint64_t &hash, uint64_t word) {
    hash = (hash ^ word) * 0x9E3779B97F4A7C15U;
    hash ^= hash >> 29;
}

template <class Real>
uint64_t WordOf(const unsigned char *bytes) {
    Real real;
    std::memcpy(&real, bytes, sizeof real);
    uint64_t word = 0;
    std::memcpy(&word, bytes, sizeof real);
    return real != real ? 1 : word;
}

void MixField(uint64_t &hash, const std::string &element, const unsigned char *bytes,
              std::size_t count) {
    if (element == "DBL") {
        for (std::size_t i = 0; i < count; i += 8)
            Mix(hash, WordOf<double>(bytes + i));
    } else if (element == "SGL") {
        for (std::size_t i = 0; i < count; i += 4)
            Mix(hash, WordOf<float>(bytes + i));
    } else {
        for (std::size_t i = 0; i < count; i += 8) {
            uint64_t word = 0;
            std::memcpy(&word, bytes + i, std::min<std::size_t>(8, count - i));
            Mix(hash, word);
        }
    }
}

} // namespace

void ValueHash::add(const OutputValue &value) {
    for (const int32_t size : value.sizes)
        Mix(sizes_, static_cast<uint32_t>(std::max(size, 0)));
    Mix(sizes_, value.bytes);
    const RecordType *const record = FindRecord(value.element);
    if (record == nullptr) {
        MixField(elements_, value.element, value.elements, value.bytes);
        return;
    }
    // Field by field, since the padding between them is undefined.
    for (std::size_t at = 0; at < value.bytes; at += record->size)
        for (const RecordField &field : record->fields)
            MixField(elements_, field.element, value.elements + at + field.offset,
                     field.count * ElementSize(field.element));
}

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

uint64_t SeedOf(uint64_t seed, const std::string &name, int64_t round) {
    for (const char c : name)
        seed = seed * 0x100000001B3U + static_cast<unsigned char>(c);
    return seed * 0x100000001B3U + static_cast<uint64_t>(round);
}

} // namespace qx::test
