#include "frame/node_cell.h"
#include "frame/widths.h"
#include "qx/fft.h"
#include "qx/frame.h"
#include "qx/pulses.h"
#include "tests/fuzz/oddities.h"
#include "tests/support/code_list.h"
#include "tests/support/heap_probe.h"
#include "tests/support/recipe.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cctype>
#include <fstream>
#include <limits>
#include <map>
#include <set>
#include <string>
#include <thread>

// Every export of the catalogue under everything that a host can do to it.

namespace qx::test {

namespace {

constexpr int32_t hostRefusal = 4711;

struct Result {
    ErrorCode status;
    uint64_t hash;
    int32_t reshapes;
};

class Conformance : public testing::TestWithParam<Recipe> {
protected:
    static bool has(Quirk quirk) { return (GetParam().quirks & quirk) != 0; }
    static Result run(Call &call) {
        ResetHost();
        const ErrorCode status = statusOf(call);
        return {status, call.outputHash(status), static_cast<int32_t>(Host().reshapes.size())};
    }
    // Makes the call and checks the function result against the export's convention.
    static ErrorCode statusOf(Call &call, int32_t refusal = 0) {
        const int32_t result = GetParam().run(call);
        const HeapProbe::Pause pause;
        const ErrorCode status = call.status(result);
        if (call.hasErr()) {
            const bool isRefusal = refusal != 0 && has(HostStatusInResult);
            EXPECT_EQ(result, isRefusal         ? refusal
                              : has(CodeInBoth) ? status
                                                : 0)
                << "the function result alongside *err";
        }
        // Every export may return this code if two outputs are the same array.
        if (!call.sharesArray() || status != ErrInternal)
            expectDocumented(status, refusal);
        return status;
    }
    static void expectDocumented(ErrorCode status, int32_t refusal) {
        static const auto all = ReadCodeList(QX_CODE_LIST);
        const auto found = all.find(GetParam().exportName());
        if (found == all.end())
            EXPECT_EQ(status, 0) << "the status of an export declared without one";
        else if (refusal != 0 && status == refusal)
            EXPECT_TRUE(found->second.hostStatus) << "the host's status is not under Codes:";
        else
            EXPECT_TRUE(found->second.codes.count(status)) << status << " is not under Codes:";
    }
    static Result run(int32_t n) {
        Call call(n);
        return run(call);
    }
    static void expectFailure(const Call &call, ErrorCode status) {
        if (!has(MayKeepArrayOnFailure)) {
            EXPECT_TRUE(call.outputsAreSettled()) << status << call.describeOutputs();
        }
        EXPECT_TRUE(call.inputsAreUnchanged());
    }
    void TearDown() override { ResetHost(); }
};

// Keeps the workspace enabled during its lifetime.
class ServingWorkspace {
public:
    ServingWorkspace() {
        InitializeAnalysisWorkspaceH(16U << 20, &status_);
        EnableAnalysisWorkspaceH(&status_);
        EXPECT_EQ(status_.code, 0);
    }
    ~ServingWorkspace() {
        DisableAnalysisWorkspaceH(&status_);
        UninitializeAnalysisWorkspaceH(&status_);
        // Anything other than 0 means that a block was never released.
        EXPECT_EQ(status_.code, 0);
    }

private:
    WorkspaceStatus status_ = {0, 0};
};

TEST_P(Conformance, ValidArgumentsGiveOneResultEveryTime) {
    for (int32_t n : GetParam().sizes) {
        SCOPED_TRACE(n);
        Call call(n);
        const Result first = run(call);
        EXPECT_GE(first.status, 0);
        EXPECT_TRUE(call.inputsAreUnchanged());
        EXPECT_EQ(run(n).hash, first.hash);
        CheckBlocks();
    }
}

// A host may work in place: the result is that of two separate arrays, or the call is refused.
TEST_P(Conformance, OneArrayMayBeTwoArguments) {
    typedef Call::Meeting Meeting;
    for (int32_t n : GetParam().sizes) {
        Call probe(n);
        run(probe);
        for (const auto &[pair, meeting] : probe.pairsOfOneType()) {
            const auto name = [](const Call::Place &place) {
                return (place.isOutput ? "output " : "input ") + std::to_string(place.number);
            };
            SCOPED_TRACE(testing::Message()
                         << n << ", " << name(pair.first) << " as " << name(pair.second));
            Call one(n), two(n);
            one.share(pair);
            const Result inPlace = run(one);
            CheckBlocks();
            EXPECT_TRUE(one.sizesFitBlocks());
            if (meeting == Meeting::WrittenTwice) {
                EXPECT_EQ(inPlace.status, ErrInternal);
            }
            if (meeting == Meeting::WrittenTwice ||
                (meeting == Meeting::Unknown && inPlace.status == ErrInternal)) {
                expectFailure(one, inPlace.status);
                continue;
            }
            two.keepApart(pair);
            const Result separate = run(two);
            EXPECT_EQ(inPlace.status, separate.status);
            // The result may differ if two inputs are the same array, which may take another path.
            if (meeting != Meeting::ReadTwice) {
                EXPECT_EQ(inPlace.hash, separate.hash);
            }
        }
    }
}

TEST_P(Conformance, ARefusedResizeEmptiesEverything) {
    const int32_t n = GetParam().sizes.back();
    const int32_t reshapes = run(n).reshapes;
    for (int32_t k = 1; k <= reshapes; ++k) {
        SCOPED_TRACE(k);
        Call call(n);
        ResetHost(k, hostRefusal);
        const ErrorCode status = statusOf(call, hostRefusal);
        if (has(RefusalPasses)) {
            EXPECT_EQ(status, 0);
            CheckBlocks();
            continue;
        }
        EXPECT_EQ(status, has(HostStatusPassesThrough) ? hostRefusal : ErrOutOfMemory);
        expectFailure(call, status);
    }
}

TEST_P(Conformance, AnEmptyInputIsAFailure) {
    const int32_t n = GetParam().sizes.back();
    Call probe(n);
    run(probe);
    for (const Call::Size &size : probe.inputSizes()) {
        SCOPED_TRACE("input " + std::to_string(size.input) + ", dimension " +
                     std::to_string(size.dimension));
        Call call(n);
        call.alter(size.input, size.dimension, 0);
        const Result result = run(call);
        if (result.status < 0)
            expectFailure(call, result.status);
        else
            EXPECT_TRUE(has(TakesEmptyInput) || has(NoStatus) || size.mayBeZero) << result.status;
        CheckBlocks();
    }
}

// Such an array counts as empty, except in the few exports that have a code for it.
TEST_P(Conformance, AnInputWithANegativeSizeIsEmpty) {
    const int32_t n = GetParam().sizes.back();
    Call probe(n);
    run(probe);
    for (const Call::Size &size : probe.inputSizes())
        for (const int32_t negative : {-1, -size.value, std::numeric_limits<int32_t>::min()}) {
            SCOPED_TRACE("input " + std::to_string(size.input) + ", dimension " +
                         std::to_string(size.dimension) + " of " + std::to_string(negative));
            Call broken(n), everyDimension(n), empty(n);
            broken.claim(size.input, size.dimension, negative);
            everyDimension.claim(size.input, Call::all, negative);
            empty.alter(size.input, size.dimension, 0);
            const Result result = run(broken);
            CheckBlocks();
            if (!IsCodeOfNegativeSize(GetParam().exportName().c_str(), result.status)) {
                EXPECT_EQ(result.status, run(empty).status);
            }
            if (result.status < 0)
                expectFailure(broken, result.status);
            const Result other = run(everyDimension);
            CheckBlocks();
            if (other.status < 0)
                expectFailure(everyDimension, other.status);
        }
}

// Arrays whose sizes do not match each other or the numeric arguments: the call is refused or not,
// within the contract, and touches no byte outside a block.
TEST_P(Conformance, AnInputOfAnotherSizeKeepsTheContract) {
    const int32_t n = GetParam().sizes.back();
    Call probe(n);
    run(probe);
    for (const Call::Size &size : probe.inputSizes())
        for (const int32_t other :
             {1, size.value / 2, std::max(0, size.value - 1), size.value + 1, size.value * 2}) {
            SCOPED_TRACE("input " + std::to_string(size.input) + ", dimension " +
                         std::to_string(size.dimension) + " of " + std::to_string(other));
            Call call(n), again(n);
            call.alter(size.input, size.dimension, other);
            again.alter(size.input, size.dimension, other);
            const Result result = run(call);
            if (result.status < 0)
                expectFailure(call, result.status);
            EXPECT_TRUE(call.inputsAreUnchanged());
            EXPECT_EQ(run(again).hash, result.hash);
            CheckBlocks();
        }
}

TEST_P(Conformance, AFailedAllocationReturnsACodeAndLeaksNothing) {
    if (!HeapProbe::works())
        return;
    const int32_t n = GetParam().sizes.back();
    int32_t allocations = 0;
    uint64_t hash = 0;
    {
        Call call(n);
        ResetHost();
        const HeapProbe probe;
        const ErrorCode status = statusOf(call);
        allocations = probe.allocations();
        hash = call.outputHash(status);
    }
    for (int32_t k = 1; k <= std::min(allocations, 200); ++k) {
        SCOPED_TRACE(k);
        Call call(n);
        ResetHost();
        int32_t live = 0;
        ErrorCode status = 0;
        {
            const HeapProbe probe(k);
            status = statusOf(call);
            call.releaseNodes();
            live = probe.liveAllocations();
        }
        EXPECT_EQ(live, 0) << "heap blocks left after the node has been released";
        if (status < 0) {
            expectFailure(call, status);
        } else if (!has(MemoryFailureMayPass)) {
            EXPECT_EQ(call.outputHash(status), hash) << "a success with another result";
        }
    }
}

TEST_P(Conformance, TheWorkspaceChangesNoBitAndSparesTheHeap) {
    for (int32_t n : GetParam().sizes) {
        SCOPED_TRACE(n);
        const Result onHeap = run(n);
        const ServingWorkspace workspace;
        Call call(n);
        ResetHost();
        int32_t allocations = 0;
        ErrorCode status = 0;
        {
            const HeapProbe probe;
            status = statusOf(call);
            allocations = probe.allocations();
        }
        EXPECT_EQ(call.outputHash(status), onHeap.hash);
        if (!has(UsesHeap)) {
            EXPECT_EQ(allocations, 0);
        }
        call.releaseNodes();
    }
}

// One cell of each kind that a node can keep.
class Cells {
public:
    Cells() {
        const CDBArray z(4), spectrum;
        const DBLArray y{0, 0, 1, 1};
        double level[3];
        CxOXFFTH(z.handle(), spectrum.handle(), &words_[0]);
        CxOXFFTH80_IDP(z.handle(), spectrum.handle(), &words_[1], 0, 4, 0);
        StateLevels(y.handle(), 0, 1, 1, 5, &words_[2], &level[0], &level[1], &level[2], 0);
        StateLevels_IDP(y.handle(), 0, 1, 1, 5, &words_[3], &level[0], &level[1], &level[2], 0);
    }
    ~Cells() {
        RunSweepOf(words_[0]);
        TransformUnreserveProc(&words_[1]);
        RunSweepOf(words_[2]);
        MeasurementUnreserveProc(&words_[3]);
    }
    static constexpr CellKind kinds[] = {CellKind::Plan, CellKind::TransformInstance,
                                         CellKind::Histogram, CellKind::HistogramInstance};
    void *operator[](std::size_t i) const { return words_[i]; }

private:
    void *words_[std::size(kinds)] = {};
};

TEST_P(Conformance, AWordThatHoldsSomethingElseIsRefused) {
    const int32_t n = GetParam().sizes.back();
    Call probe(n);
    run(probe);
    const std::vector<void *> own = probe.words();
    if (own.empty() || own[0] == nullptr)
        return;
    const Cells cells;
    for (std::size_t i = 0; i < std::size(Cells::kinds); ++i) {
        if (IsCell(own[0], Cells::kinds[i]))
            continue;
        SCOPED_TRACE(i);
        Call call(n);
        call.preset(cells[i]);
        const Result result = run(call);
        EXPECT_EQ(result.status, ErrInternal);
        expectFailure(call, result.status);
        EXPECT_EQ(call.words(), std::vector<void *>(own.size(), cells[i]));
        EXPECT_TRUE(IsCell(cells[i], Cells::kinds[i]));
    }
}

// A call gives the same result if the host exchanges the words of its node during a resize.
TEST_P(Conformance, TheHostMayExchangeWordsWithinAResize) {
    const int32_t n = GetParam().sizes.back();
    NodeWords node, other;
    Call first(n), second(n);
    first.use(node);
    const Result usual = run(first);
    if (first.words().empty())
        return;
    second.use(node);
    ResetHost();
    other.releaseInstance = node.releaseInstance;
    Host().atReshape = [&node, &other] {
        for (auto &[number, slot] : node.slots)
            std::swap(slot, other.slots[number]);
        std::swap(node.instance, other.instance);
    };
    const ErrorCode status = statusOf(second);
    EXPECT_EQ(second.outputHash(status), usual.hash);
    CheckBlocks();
}

// A sanitizer sees what threads share in the first round.
#if defined(__SANITIZE_THREAD__) || defined(__SANITIZE_ADDRESS__)
constexpr int threadRounds = 1;
#else
constexpr int threadRounds = 5;
#endif

TEST_P(Conformance, ThreadsDoNotDisturbEachOther) {
    const int32_t n = GetParam().sizes.back();
    const uint64_t expected = run(n).hash;
    const ServingWorkspace workspace;
    std::vector<std::thread> threads;
    std::atomic<int> differing = 0;
    for (int t = 0; t < 4; ++t)
        threads.emplace_back([&] {
            for (int round = 0; round < threadRounds; ++round)
                if (run(n).hash != expected)
                    ++differing;
        });
    for (std::thread &thread : threads)
        thread.join();
    EXPECT_EQ(differing, 0);
    CheckBlocks();
}

GTEST_ALLOW_UNINSTANTIATED_PARAMETERIZED_TEST(Conformance);
std::string TestName(const testing::TestParamInfo<Recipe> &info) {
    std::string name = info.param.name;
    std::replace_if(
        name.begin(), name.end(), [](unsigned char c) { return std::isalnum(c) == 0; }, '_');
    return name;
}
INSTANTIATE_TEST_SUITE_P(Exports, Conformance, testing::ValuesIn(AllRecipes()), TestName);

// Any changed bit shows as a changed line of tests/conformance/hashes.txt in the review.
TEST(Hashes, AreTheAcceptedOnes) {
    auto accepted = AcceptedHashes(QX_HASHES);
    std::string changed;
    const auto hashes = HashEveryExport();
    for (const auto &[name, found] : hashes) {
        const auto known = accepted.find(name);
        if (known == accepted.end() || known->second != HashText(found))
            changed += "\n" + name + (known == accepted.end() ? " is new" : " has changed");
        accepted.erase(name);
    }
    for (const auto &gone : accepted)
        changed += "\n" + gone.first + " is gone";
    EXPECT_EQ(changed, "")
        << "If this is intended: tools/compare_hashes --accept, and commit " QX_HASHES;
    // ./test looks for this line at each width of each preset.
    std::printf("hashes of %d exports compared at %d lanes\n", static_cast<int>(hashes.size()),
                static_cast<int>(lanesInUse));
}

TEST(Catalogue, EveryExportHasARecipe) {
    std::set<std::string> recipes, known;
    for (const Recipe &recipe : AllRecipes()) {
        EXPECT_TRUE(recipes.insert(recipe.name).second) << recipe.name << " occurs twice";
        known.insert(recipe.exportName());
    }
    for (const Exempt &exempt : ExemptExports())
        EXPECT_TRUE(known.insert(exempt.name).second)
            << exempt.name << " is exempt but has a recipe";
    std::ifstream file(QX_EXPORT_LIST);
    std::set<std::string> exports;
    std::string name;
    for (file >> name; file >> name;) // the first word is the heading
        exports.insert(name);
    ASSERT_FALSE(exports.empty()) << QX_EXPORT_LIST;
    for (const std::string &export_ : exports)
        EXPECT_EQ(known.count(export_), 1U)
            << export_ << " needs a line in the recipes of its family";
    for (const std::string &recipe : known)
        EXPECT_EQ(exports.count(recipe), 1U) << recipe << " is not an export";
}

} // namespace

} // namespace qx::test
