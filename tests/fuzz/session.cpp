#include "tests/fuzz/session.h"

#include "frame/node_cell.h"
#include "tests/fuzz/oddities.h"
#include "tests/support/hostile_host.h"

#include <algorithm>
#include <cstring>

namespace qx::test {

namespace {

constexpr std::size_t mostArrays = 10;
constexpr std::size_t mostElements = 2000,
                      mostOfMatrix = 33 * 33; // limits for arrays that are kept for later calls

bool HasWord(const Thunk &thunk) {
    return std::any_of(thunk.parameters.begin(), thunk.parameters.end(), [](const Parameter &p) {
        return p.kind == Kind::Slot || p.kind == Kind::Instance;
    });
}

// Half of the time, an export that keeps a state in a word.
const Thunk &SomeThunk(Random &random) {
    static const auto withWord = [] {
        std::vector<const Thunk *> found;
        for (const Thunk &thunk : AllThunks())
            if (HasWord(thunk))
                found.push_back(&thunk);
        return found;
    }();
    if (random.oneIn(2))
        return *withWord[static_cast<std::size_t>(
            random.below(static_cast<int32_t>(withWord.size())))];
    return AllThunks()[static_cast<std::size_t>(
        random.below(static_cast<int32_t>(AllThunks().size())))];
}

// The kind of cell that a word holds; 0 for none.
uint64_t KindOf(void *word) {
    return word == nullptr ? 0 : static_cast<uint64_t>(static_cast<const CellKind *>(word)[-1]);
}

} // namespace

Session::Words::~Words() {
    GiveBack([this] {
        for (void *slot : slots)
            RunSweepOf(slot);
        if (instance != nullptr && releaseInstance != nullptr)
            releaseInstance(&instance);
    });
}

std::vector<void *> Session::Words::all() const {
    std::vector<void *> found(slots.begin(), slots.end());
    found.push_back(instance);
    return found;
}

Session::~Session() {
    for (const Array &array : arrays_)
        detail::FreeBlock(array.handle);
}

std::size_t Session::someArray(Random &random, const Parameter &parameter,
                               const Argument &argument) {
    std::vector<std::size_t> candidates;
    for (std::size_t i = 0; i < arrays_.size(); ++i)
        if (arrays_[i].parameter.kind == parameter.kind &&
            arrays_[i].parameter.element == parameter.element)
            candidates.push_back(i);
    if (!candidates.empty() && !random.oneIn(3))
        return candidates[static_cast<std::size_t>(
            random.below(static_cast<int32_t>(candidates.size())))];
    arrays_.push_back({parameter, NewArray(parameter, argument)});
    return arrays_.size() - 1;
}

// Drops arrays that have become too large, and some at random if there are many.
void Session::dropArrays(Random &random) {
    std::erase_if(arrays_, [&](const Array &array) {
        const std::size_t most = array.parameter.dimensions() == 2 ? mostOfMatrix : mostElements;
        const auto bytes = ElementBytes(array.handle, array.parameter);
        const bool isDropped = !bytes || *bytes > most * ElementSize(array.parameter.element) ||
                               (arrays_.size() > mostArrays && random.oneIn(2));
        if (isDropped)
            detail::FreeBlock(array.handle);
        return isDropped;
    });
}

void *Session::copyOf(const Array &array) {
    const int dimensions = array.parameter.dimensions();
    int32_t sizes[2] = {0, 0};
    std::memcpy(sizes, *static_cast<void **>(array.handle),
                4 * static_cast<std::size_t>(dimensions));
    void *const copy = detail::NewBlock(dimensions, TypeCode(array.parameter.element),
                                        ElementSize(array.parameter.element), sizes[0], sizes[1]);
    std::memcpy(*static_cast<void **>(copy), *static_cast<void **>(array.handle),
                detail::BlockSize(copy));
    return copy;
}

Outcome Session::call(const Scenario &scenario, const Places &places, Words &words,
                      const std::vector<Array> &arrays) {
    const Thunk &thunk = *scenario.thunk;
    std::vector<std::vector<unsigned char>> pointed;
    std::vector<Value> values;
    ErrorCode error = 0;
    bool hasError = false;
    for (std::size_t i = 0; i < thunk.parameters.size(); ++i) {
        const Parameter &parameter = thunk.parameters[i];
        const Argument &argument = scenario.arguments[i];
        pointed.push_back(argument.bytes);
        Value value{pointed.back().data(), argument.whole, argument.real};
        if (parameter.isArray())
            value.pointer = arrays[places[i]].handle;
        else if (parameter.kind == Kind::Slot)
            value.pointer = &words.slots[places[i]];
        else if (parameter.kind == Kind::Instance)
            value.pointer = &words.instance;
        else if (parameter.kind == Kind::Error)
            value.pointer = &error;
        hasError |= parameter.kind == Kind::Error;
        values.push_back(value);
    }
    if (words.instance == nullptr)
        words.releaseInstance = thunk.release;
    const Observed seen =
        Attacked(scenario.disturbance, 0x17, [&] { return thunk.call(values.data()); });
    const ErrorCode status = hasError ? error : thunk.returnsCode ? seen.result : 0;
    if (status != ErrInternal) // the code for two outputs that are the same array
        CheckStatus(thunk.name, status, scenario.disturbance, true);
    CheckHost();

    ValueHash hash;
    for (std::size_t i = 0; i < thunk.parameters.size(); ++i) {
        const Parameter &parameter = thunk.parameters[i];
        if (parameter.isArray()) {
            void *const handle = arrays[places[i]].handle;
            const auto bytes = ElementBytes(handle, parameter);
            if (!bytes && !IsKept(thunk.name, Oddity::SizeBeyondBlock))
                Tell("the sizes of %s exceed its block", parameter.name);
            if (bytes)
                hash.add({parameter.name, parameter.element, SizesOf(handle, parameter),
                          ElementsOf(handle, parameter), *bytes});
        } else if (parameter.isOut && !parameter.element.empty()) {
            hash.add({parameter.name, parameter.element, {}, pointed[i].data(), pointed[i].size()});
        }
    }
    return {status, hash.sizes() ^ hash.elements()};
}

Outcome Session::step(Random &random, const Thunk &thunk) {
    Scenario scenario = SomeScenario(random, thunk);
    Places places(thunk.parameters.size());
    for (std::size_t i = 0; i < places.size(); ++i) {
        Argument &argument = scenario.arguments[i];
        argument.aliasOf = -1;
        std::fill_n(argument.claims, 2, 0);
        if (thunk.parameters[i].isArray())
            places[i] = someArray(random, thunk.parameters[i], argument);
        else if (thunk.parameters[i].kind == Kind::Slot)
            places[i] = static_cast<std::size_t>(random.below(4));
    }
    std::swap(words_.slots[static_cast<std::size_t>(random.below(4))],
              words_.slots[static_cast<std::size_t>(random.below(4))]);
    if (random.oneIn(8))
        scenario.disturbance.atReshape = [this, a = random.below(4), b = random.below(4)] {
            std::swap(words_.slots[static_cast<std::size_t>(a)],
                      words_.slots[static_cast<std::size_t>(b)]);
        };

    // The kinds are read now, because a call that gets no memory frees the cell of its word.
    const std::vector<void *> before = words_.all();
    std::vector<uint64_t> kinds;
    for (void *const word : before)
        kinds.push_back(KindOf(word));
    Outcome outcome;
    if (!scenario.disturbance.isNone()) {
        const TinyWorkspace workspace(scenario.disturbance.workspace);
        outcome = call(scenario, places, words_, arrays_);
    } else {
        std::vector<Array> copies;
        for (const Array &array : arrays_)
            copies.push_back({array.parameter, copyOf(array)});
        Words fresh;
        const Outcome alone = call(scenario, places, fresh, copies);
        for (const Array &copy : copies)
            detail::FreeBlock(copy.handle);
        outcome = call(scenario, places, words_, arrays_);
        // A word that holds a cell of another kind is refused and not changed.
        bool isOfAnotherKind = false;
        const std::vector<void *> wanted = fresh.all(), after = words_.all();
        for (std::size_t i = 0; i < places.size(); ++i) {
            const Kind kind = thunk.parameters[i].kind;
            if (kind != Kind::Slot && kind != Kind::Instance)
                continue;
            const std::size_t word = kind == Kind::Slot ? places[i] : before.size() - 1;
            if (before[word] == nullptr || KindOf(wanted[word]) == kinds[word])
                continue;
            isOfAnotherKind = true;
            if (outcome.status == ErrInternal && after[word] != before[word])
                Tell("a refused word has changed");
        }
        if (outcome.status != ErrInternal || !isOfAnotherKind)
            CheckRepetition(thunk.name, outcome, alone, "a word from earlier calls");
    }
    dropArrays(random);
    return outcome;
}

Outcome RunSession(Random &random, const Subject &subject) {
    Session session;
    Outcome first;
    for (int32_t i = 0, steps = 3 + random.below(8); i < steps; ++i) {
        const Thunk &thunk = i == 0 || random.oneIn(3) ? *subject.thunk : SomeThunk(random);
        current->called = thunk.name;
        const Outcome outcome = session.step(random, thunk);
        if (i == 0)
            first = outcome;
    }
    current->called = nullptr;
    return first;
}

} // namespace qx::test
