#include "tests/fuzz/recipe_case.h"

#include "tests/fuzz/oddities.h"

#include <algorithm>
#include <cstring>
#include <limits>

namespace qx::test {

namespace {

// Two arrays of one type of an undisturbed call.
std::optional<std::pair<Call::Pair, Call::Meeting>> SomePair(Random &random, const Recipe &recipe,
                                                             int32_t n) {
    Call probe(n);
    Observe({}, 0x17, [&] { return recipe.run(probe); });
    GiveBack([&] { probe.releaseNodes(); });
    const auto pairs = probe.pairsOfOneType();
    if (pairs.empty())
        return std::nullopt;
    return pairs[static_cast<std::size_t>(random.below(static_cast<int32_t>(pairs.size())))];
}

} // namespace

RecipeSpoiling SomeSpoiling(Random &random, const Recipe &recipe) {
    RecipeSpoiling some = {};
    const auto &sizes = recipe.sizes;
    const int32_t least = *std::min_element(sizes.begin(), sizes.end());
    const int32_t most =
        std::max(least, std::min(*std::max_element(sizes.begin(), sizes.end()), 60));
    some.n = sizes[static_cast<std::size_t>(random.below(static_cast<int32_t>(sizes.size())))];
    if (some.n > most || random.oneIn(2))
        some.n = least + random.below(most - least + 1);
    some.seed = random.bits();
    some.spoilsContent = random.oneIn(2);
    some.input = random.below(8); // no input, if the call has fewer
    some.dimension = random.oneIn(3) ? 1 : 0;
    const int32_t others[] = {0, 1, 2, 3, some.n - 1, some.n + 1, some.n / 2, 2 * some.n};
    some.size = random.oneIn(2) ? random.oneOf(others) : -1;
    some.disturbance = SomeDisturbance(random);
    const int32_t negatives[] = {-1, -2, -some.n - 1, -65536, std::numeric_limits<int32_t>::min()};
    if (random.oneIn(10)) {
        some.claimed = random.oneOf(negatives);
        some.claimsBoth = random.oneIn(2);
        some.input = random.below(5);
    } else if (random.oneIn(6)) {
        some.shared = SomePair(random, recipe, some.n);
    }
    return some;
}

namespace {

const char *PartOf(ElementType element) {
    switch (element) {
    case ElementType::I32:
        return "I32";
    case ElementType::U8:
        return "U8";
    case ElementType::U32:
        return "U32";
    case ElementType::SGL:
    case ElementType::CSG:
        return "SGL";
    case ElementType::DBL:
    case ElementType::CDB:
        return "DBL";
    }
    return "";
}

// Replaces some or all elements by numbers of one class.
void SpoilElements(Random &random, unsigned char *elements, ElementType element, int32_t rows,
                   int32_t cols) {
    if (random.oneIn(2))
        return;
    const int32_t parts =
        element == ElementType::CDB || element == ElementType::CSG ? 2 * cols : cols;
    const auto content = static_cast<Content>(random.below(allContents));
    const std::string name = PartOf(element);
    const std::vector<unsigned char> others = SomeElements(random, name, rows, parts, content);
    const std::size_t each = ElementSize(name);
    const int32_t oneIn = random.oneIn(3) ? 1 : 8;
    for (std::size_t at = 0; at < others.size(); at += each)
        if (random.oneIn(oneIn))
            std::memcpy(elements + at, others.data() + at, each);
}

} // namespace

void Spoil(Call &call, const RecipeSpoiling &spoiling, Made made) {
    if (spoiling.spoilsContent)
        call.spoil([content = Random(spoiling.seed)](unsigned char *elements, ElementType element,
                                                     int32_t rows, int32_t cols) mutable {
            const HeapProbe::Pause pause;
            SpoilElements(content, elements, element, rows, cols);
        });
    if (spoiling.size >= 0)
        call.alter(spoiling.input, spoiling.dimension, spoiling.size);
    if (spoiling.claimed < 0)
        call.claim(spoiling.input, spoiling.claimsBoth ? Call::all : spoiling.dimension,
                   made == Made::Otherwise ? 0 : spoiling.claimed);
    if (spoiling.shared && made == Made::Otherwise)
        call.keepApart(spoiling.shared->first);
    else if (spoiling.shared)
        call.share(spoiling.shared->first);
}

namespace {

bool IsRefused(const RecipeSpoiling &spoiling) {
    return spoiling.shared && spoiling.shared->second == Call::Meeting::WrittenTwice;
}

// Two inputs that are one array may take another path, and the content of an array that is written
// as a side effect is unspecified.
bool IsRepeatable(const RecipeSpoiling &spoiling) {
    return spoiling.disturbance.isNone() &&
           (!spoiling.shared || spoiling.shared->second == Call::Meeting::ReadAndWritten);
}

Outcome RunOnce(const Recipe &recipe, const RecipeSpoiling &spoiling, unsigned char rubbish,
                Made made, Observed *observed = nullptr) {
    Call call(spoiling.n);
    Spoil(call, spoiling, made);
    const std::string name = recipe.exportName();
    const Observed seen = Attacked(spoiling.disturbance, rubbish, [&] { return recipe.run(call); });
    if (observed != nullptr)
        *observed = seen;
    GiveBack([&] { call.releaseNodes(); });
    const ErrorCode status = call.status(seen.result);
    if (IsRefused(spoiling))
        CheckRefusal(status, (recipe.quirks & NoStatus) == 0);
    else if (status != ErrInternal || !spoiling.shared)
        CheckStatus(name.c_str(), status, spoiling.disturbance, spoiling.shared.has_value());
    CheckHost();
    if (!call.sizesFitBlocks()) {
        if (!IsKept(name.c_str(), Oddity::SizeBeyondBlock))
            Tell("the sizes of an array exceed its block");
        return {status, 0};
    }
    if (!spoiling.shared && !call.inputsAreUnchanged())
        Tell("an input has changed");
    return {status, status < 0 || status == statusNoMemory ? 0 : call.outputHash(status)};
}

} // namespace

Outcome RunRecipeCase(Random &random, const Recipe &recipe) {
    const RecipeSpoiling spoiling = SomeSpoiling(random, recipe);
    const std::string name = recipe.exportName();
    const bool isSpecial = spoiling.shared || spoiling.claimed < 0;
    const bool again = IsRepeatable(spoiling) && (isSpecial || random.oneIn(4));
    Outcome outcome;
    {
        const TinyWorkspace workspace(spoiling.disturbance.workspace);
        outcome = RunOnce(recipe, spoiling, 0x17, Made::AsSpoilt);
    }
    if (!again)
        return outcome;
    const Outcome second = RunOnce(recipe, spoiling, 0xC2, Made::Otherwise);
    if (spoiling.claimed == 0 || !IsCodeOfNegativeSize(name.c_str(), outcome.status))
        CheckRepetition(name.c_str(), outcome, second,
                        spoiling.claimed < 0 ? "an empty array for a negative size"
                        : spoiling.shared    ? "an array for each handle"
                                             : "the same call");
    return outcome;
}

Outcome RunRecipeMeetings(Random &random, const Recipe &recipe) {
    RecipeSpoiling spoiling = SomeSpoiling(random, recipe);
    spoiling.disturbance = {};
    spoiling.claimed = 0;
    spoiling.shared.reset();
    const Outcome apart = RunOnce(recipe, spoiling, 0x17, Made::AsSpoilt);
    Call probe(spoiling.n);
    Observe({}, 0x17, [&] { return recipe.run(probe); });
    GiveBack([&] { probe.releaseNodes(); });
    for (const auto &meeting : probe.pairsOfOneType()) {
        spoiling.shared = meeting;
        const Outcome outcome = RunOnce(recipe, spoiling, 0x17, Made::AsSpoilt);
        if (IsRepeatable(spoiling))
            CheckRepetition(recipe.exportName().c_str(), outcome,
                            RunOnce(recipe, spoiling, 0xC2, Made::Otherwise),
                            "an array for each handle");
    }
    return apart;
}

Outcome RunRecipeHonesty(Random &random, const Recipe &recipe) {
    RecipeSpoiling spoiling = SomeSpoiling(random, recipe);
    spoiling.disturbance = {};
    spoiling.shared.reset();
    Observed calm;
    const Outcome granted = RunOnce(recipe, spoiling, 0x17, Made::AsSpoilt, &calm);
    ForSomeRefusals(random, calm, [&](const Disturbance &disturbance) {
        spoiling.disturbance = disturbance;
        const TinyWorkspace workspace(disturbance.workspace);
        CheckHonesty(recipe.exportName().c_str(), disturbance,
                     RunOnce(recipe, spoiling, 0x17, Made::AsSpoilt), granted);
    });
    return granted;
}

} // namespace qx::test
