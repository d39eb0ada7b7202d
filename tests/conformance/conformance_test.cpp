#include "qx/frame.h"
#include "tests/support/heap_probe.h"
#include "tests/support/recipe.h"

#include <gtest/gtest.h>

#include <fstream>
#include <set>
#include <string>
#include <thread>

// Every export of the catalogue through what a host can do to it.

namespace qx::test {

namespace {

constexpr int32_t hostRefusal = 4711;

struct Result {
    ErrorCode status;
    uint64_t hash;
    int32_t reshapes;
    int32_t allocations;
};

class Conformance : public testing::TestWithParam<Recipe> {
protected:
    static bool has(Quirk quirk) { return (GetParam().quirks & quirk) != 0; }
    static Result run(Call &call) {
        ResetHost();
        const ErrorCode status = call.status(GetParam().run(call));
        const auto reshapes = static_cast<int32_t>(Host().reshapes.size());
        return {status, call.outputHash(status), reshapes, 0};
    }
    static Result run(int32_t n) {
        Call call(n);
        return run(call);
    }
    static void expectFailure(const Call &call, ErrorCode status) {
        if (!has(MayKeepArrayOnFailure)) {
            EXPECT_TRUE(call.outputsAreEmpty()) << status << call.describeOutputs();
        }
        EXPECT_TRUE(call.inputsAreUnchanged());
    }
    void TearDown() override { ResetHost(); }
};

// The workspace while it is enabled.
class ServingWorkspace {
public:
    ServingWorkspace() {
        InitializeAnalysisWorkspaceH(64U << 20, &status_);
        EnableAnalysisWorkspaceH(&status_);
        EXPECT_EQ(status_.code, 0);
    }
    ~ServingWorkspace() {
        DisableAnalysisWorkspaceH(&status_);
        UninitializeAnalysisWorkspaceH(&status_);
        // Anything else than 0 would tell of a block that was never given back.
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

TEST_P(Conformance, ARefusedResizeEmptiesEverything) {
    const int32_t n = GetParam().sizes.back();
    const int32_t reshapes = run(n).reshapes;
    for (int32_t k = 1; k <= reshapes; ++k) {
        SCOPED_TRACE(k);
        Call call(n);
        ResetHost(k, hostRefusal);
        const ErrorCode status = call.status(GetParam().run(call));
        EXPECT_EQ(status, has(HostStatusPassesThrough) ? hostRefusal : ErrOutOfMemory);
        expectFailure(call, status);
    }
}

TEST_P(Conformance, AnEmptyInputIsAFailure) {
    if (has(TakesEmptyInput) || has(NoStatus))
        return;
    const int32_t n = GetParam().sizes.back();
    Call probe(n);
    run(probe);
    for (int input = 0; input < probe.inputCount(); ++input) {
        SCOPED_TRACE(input);
        Call call(n);
        call.makeEmpty(input);
        const Result result = run(call);
        EXPECT_LT(result.status, 0);
        expectFailure(call, result.status);
    }
}

TEST_P(Conformance, AFailedAllocationIsACodeAndLeaksNothing) {
    if (!HeapProbe::works())
        return;
    const int32_t n = GetParam().sizes.back();
    int32_t allocations = 0;
    uint64_t hash = 0;
    {
        Call call(n);
        ResetHost();
        const HeapProbe probe;
        const ErrorCode status = call.status(GetParam().run(call));
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
            status = call.status(GetParam().run(call));
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
            status = call.status(GetParam().run(call));
            allocations = probe.allocations();
        }
        EXPECT_EQ(call.outputHash(status), onHeap.hash);
        if (!has(UsesHeap)) {
            EXPECT_EQ(allocations, 0);
        }
        call.releaseNodes();
    }
}

TEST_P(Conformance, ThreadsDoNotDisturbEachOther) {
    const int32_t n = GetParam().sizes.back();
    const uint64_t expected = run(n).hash;
    const ServingWorkspace workspace;
    std::vector<std::thread> threads;
    std::atomic<int> differing = 0;
    for (int t = 0; t < 4; ++t)
        threads.emplace_back([&] {
            for (int round = 0; round < 5; ++round)
                if (run(n).hash != expected)
                    ++differing;
        });
    for (std::thread &thread : threads)
        thread.join();
    EXPECT_EQ(differing, 0);
    CheckBlocks();
}

GTEST_ALLOW_UNINSTANTIATED_PARAMETERIZED_TEST(Conformance);
INSTANTIATE_TEST_SUITE_P(Exports, Conformance, testing::ValuesIn(AllRecipes()),
                         [](const auto &recipe) { return std::string(recipe.param.name); });

TEST(Catalogue, EveryExportHasARecipe) {
    std::multiset<std::string> known;
    for (const Recipe &recipe : AllRecipes())
        known.insert(recipe.name);
    for (const Exempt &exempt : ExemptExports())
        known.insert(exempt.name);
    std::ifstream file(QX_EXPORT_LIST);
    std::set<std::string> exports;
    std::string name;
    for (file >> name; file >> name;) // the first word is the heading
        exports.insert(name);
    ASSERT_FALSE(exports.empty()) << QX_EXPORT_LIST;
    for (const std::string &export_ : exports)
        EXPECT_EQ(known.count(export_), 1U) << export_ << " needs one line in the recipes of its family";
    for (const std::string &recipe : known)
        EXPECT_EQ(exports.count(recipe), 1U) << recipe << " is no export";
}

} // namespace

} // namespace qx::test
