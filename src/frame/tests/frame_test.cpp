#include "frame/finish.h"
#include "frame/views.h"
#include "qx/frame.h"
#include "tests/support/hostile_host.h"

#include <gtest/gtest.h>

#include <bit>
#include <vector>

namespace {

using qx::Check;
using qx::ElementType;
using qx::test::Reshape;

static_assert(sizeof(WorkspaceStatus) == 5);
static_assert(offsetof(WorkspaceStatus, code) == 1);

TEST(Frame, ElementsStandAtFourAndEight) {
    qx::test::DBLArray x(5);
    auto handle = x.handle();
    const qx::In1D<ElementType::DBL> in(handle);
    EXPECT_EQ(reinterpret_cast<const char *>(in.data()) - reinterpret_cast<char *>(*handle), 4);

    qx::test::DBLMatrix a(2, 3);
    auto matrix = a.handle();
    const qx::Out2D<ElementType::DBL> out(matrix);
    EXPECT_EQ(reinterpret_cast<char *>(&out.data()[3]) - reinterpret_cast<char *>(*matrix), 32);
}

TEST(Frame, ViewsFollowABlockThatMoves) {
    qx::test::DBLArray x{1.5, 2.5};
    auto handle = x.handle();
    const qx::InOut1D<ElementType::DBL> view(handle);
    const void *before = view.data();
    ASSERT_EQ(view.resize(3), 0);
    EXPECT_NE(view.data(), before);
    EXPECT_EQ(view.size(), 3);
    EXPECT_EQ(x[1], 2.5);
}

TEST(Frame, AFailureEmptiesEveryOutputInOrderUnderItsOwnCode) {
    qx::test::DBLArray x(3);
    qx::test::I32Array i(3);
    qx::test::CDBMatrix m(2, 2);
    auto hx = x.handle();
    auto hi = i.handle();
    auto hm = m.handle();
    const qx::Out1D<ElementType::DBL, ElementType::CDB> first(hx);
    const qx::Out1D<ElementType::I32> second(hi);
    const qx::Out2D<ElementType::CDB> third(hm);

    EXPECT_EQ(qx::Finish(20004, first, second, third), 20004);
    EXPECT_EQ(x.size(), 3) << "a warning keeps the outputs";

    qx::test::ResetHost(2, 77);
    EXPECT_EQ(qx::Finish(-20061, first, second, third), -20061);
    EXPECT_EQ(qx::test::Host().reshapes, (std::vector<Reshape>{{13, 1, 0}, {3, 1, 0}, {13, 2, 0}}));
    EXPECT_EQ(x.size(), 0);
    EXPECT_EQ(i.size(), 0) << "also where the host refuses";
    EXPECT_EQ(m.rows(), 0);
    EXPECT_EQ(m.cols(), 0);
    qx::test::ResetHost();
}

TEST(Frame, AHostStatusIsTranslatedOrPassedOn) {
    qx::test::DBLArray x(1);
    auto handle = x.handle();
    const qx::Out1D<ElementType::DBL> out(handle);
    qx::test::ResetHost(1, 77);
    EXPECT_EQ(out.resize(4), ErrOutOfMemory);
    qx::test::ResetHost(1, 77);
    EXPECT_EQ(out.reshape(4), 77);
    EXPECT_EQ(x.size(), 1) << "the size is written after a success only";
    qx::test::ResetHost();
    EXPECT_EQ(qx::FinishTransform(77, out), 77);
    EXPECT_EQ(x.size(), 0);

    qx::test::DBLMatrix m(1, 1);
    auto matrix = m.handle();
    EXPECT_EQ(qx::Out2D<ElementType::DBL>(matrix).resize(65536, 65537), ErrOutOfMemory)
        << "the product does not fit into the host's count";
}

TEST(Frame, ChecksDecideByTheFirstOrTheLastFailure) {
    EXPECT_EQ(qx::FirstFailed({{false, -1}, {true, -2}, {true, -3}}), -2);
    EXPECT_EQ(qx::LastFailed({{true, -1}, {true, -2}, {false, -3}}), -2);
    EXPECT_EQ(qx::FirstFailed({{false, -1}}), 0);
}

TEST(Frame, AFailedScalarIsTheQuietNaNToTheBit) {
    double value = 3;
    ErrorCode err = 7;
    EXPECT_EQ(qx::Report(&err, 20004, &value), 0);
    EXPECT_EQ(err, 20004);
    EXPECT_EQ(value, 3);
    EXPECT_EQ(qx::Report(&err, -20003, &value), 0);
    EXPECT_EQ(err, -20003);
    EXPECT_EQ(std::bit_cast<uint64_t>(value), 0x7FF8000000000000U);
}

TEST(WorkspaceExports, ReportIntoTheRecordOfTheirCaller) {
    WorkspaceStatus failed = {1, 42};
    EXPECT_EQ(InitializeAnalysisWorkspaceH(100, &failed), 0);
    EXPECT_EQ(failed.code, 42) << "an earlier failure stops the chain";

    const auto run = [](auto &&step) {
        WorkspaceStatus status = {0, 42};
        EXPECT_EQ(step(&status), 0);
        EXPECT_EQ(status.status, status.code < 0 ? 1 : 0);
        return status.code;
    };
    const auto initialize = [](WorkspaceStatus *s) { return InitializeAnalysisWorkspaceH(100, s); };
    const auto initializeZero = [](WorkspaceStatus *s) {
        return InitializeAnalysisWorkspaceH(0, s);
    };
    EXPECT_EQ(run(EnableAnalysisWorkspaceH), ErrWorkspaceNotInitialized);
    EXPECT_EQ(run(DisableAnalysisWorkspaceH), ErrWorkspaceNotInitialized);
    EXPECT_EQ(run(UninitializeAnalysisWorkspaceH), 0);
    EXPECT_EQ(run(initialize), 0);
    EXPECT_EQ(run(initialize), ErrWorkspaceAlreadyInitialized);
    EXPECT_EQ(run(EnableAnalysisWorkspaceH), 0);
    EXPECT_EQ(run(initializeZero), ErrWorkspaceStillEnabled);
    EXPECT_EQ(run(DisableAnalysisWorkspaceH), 0);
    EXPECT_EQ(run(initializeZero), 0);
    EXPECT_EQ(run(EnableAnalysisWorkspaceH), ErrWorkspaceNotInitialized);
    EXPECT_EQ(run([](WorkspaceStatus *s) { return InitializeAnalysisWorkspaceH(100, s); }), 0);
    EXPECT_EQ(run(EnableAnalysisWorkspaceH), 0);
    qx::test::RunSweeps();
    EXPECT_EQ(run(DisableAnalysisWorkspaceH), ErrWorkspaceNotInitialized);
}

} // namespace
