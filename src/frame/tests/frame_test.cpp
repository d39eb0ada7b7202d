#include "frame/export.h"
#include "qx/frame.h"
#include "tests/support/hostile_host.h"

#include <gtest/gtest.h>

#include <bit>
#include <vector>

namespace qx::test {
namespace {

static_assert(sizeof(WorkspaceStatus) == 5);
static_assert(offsetof(WorkspaceStatus, code) == 1);

constexpr int32_t hostRefusal = 77;
constexpr uint64_t quietNaN = 0x7FF8000000000000;

TEST(Frame, ElementsBeginAtFourAndEight) {
    const DBLArray x(5);
    const auto distance = [](const void *element, const void *block) {
        return static_cast<const char *>(element) - static_cast<const char *>(block);
    };
    EXPECT_EQ(distance(In<DBL1D>(x.handle()).data(), *x.handle()), 4);

    const DBLMatrix a(2, 3);
    DBL2D matrix = a.handle();
    EXPECT_EQ(distance(&Out<DBL2D>(matrix).data()[3], *matrix), 32);
}

TEST(Frame, ViewsFollowABlockThatMoves) {
    const DBLArray x{1.5, 2.5};
    DBL1D handle = x.handle();
    InOut<DBL1D> view(handle);
    const void *before = view.data();
    ASSERT_FALSE(view.resize(3));
    EXPECT_NE(view.data(), before);
    EXPECT_EQ(view.size(), 3);
    EXPECT_EQ(x[1], 2.5);

    const DBLMatrix m(1, 1);
    DBL2D matrix = m.handle();
    EXPECT_EQ(Out<DBL2D>(matrix).resize(65536, 65537).code(), ErrOutOfMemory)
        << "the product does not fit into the host's count";
    EXPECT_EQ(m.rows(), 1);
}

// A body with outputs of each kind that stops at the given step.
struct Outputs {
    DBLArray x{1.0, 2.0, 3.0};
    I32Array i = I32Array(3);
    CDBMatrix m = CDBMatrix(2, 2);
    DBLArray kept{4.0};
    double scalar = 3;
    CDB pair = {3, 4};
    int32_t integer = 3;

    template <class Ending>
    int32_t call(Ending ending, int32_t newSize, ErrorCode status) const {
        const auto body = [](Out<DBL1D, OnFailure::Empty, ElementType::CDB> first,
                             Out<I32_1D> second, InOut<CDB2D>, Out<DBL1D, OnFailure::Keep>,
                             qx::OutDBL, qx::OutCDB, qx::OutI32, int32_t size,
                             ErrorCode code) -> Outcome {
            if (const Outcome bad = first.resize(size))
                return bad;
            if (const Outcome bad = second.resize(size))
                return bad;
            return code;
        };
        DBL1D hx = x.handle();
        I32_1D hi = i.handle();
        CDB2D hm = m.handle();
        DBL1D hk = kept.handle();
        auto *self = const_cast<Outputs *>(this);
        return ending(body, hx, hi, hm, hk, &self->scalar, &self->pair, &self->integer, newSize,
                      status);
    }
    void expectSettled() const {
        EXPECT_EQ(x.size(), 0);
        EXPECT_EQ(i.size(), 0);
        EXPECT_EQ(m.rows(), 0);
        EXPECT_EQ(m.cols(), 0);
        EXPECT_EQ(kept.size(), 1);
        EXPECT_EQ(std::bit_cast<uint64_t>(scalar), quietNaN);
        EXPECT_EQ(std::bit_cast<uint64_t>(double{pair.re}), quietNaN);
        EXPECT_EQ(std::bit_cast<uint64_t>(double{pair.im}), quietNaN);
        EXPECT_EQ(integer, 0);
    }
    void expectKept(int32_t newSize) const {
        EXPECT_EQ(x.size(), newSize);
        EXPECT_EQ(i.size(), newSize);
        EXPECT_EQ(m.rows(), 2);
        EXPECT_EQ(scalar, 3);
        EXPECT_EQ(pair.im, 4);
        EXPECT_EQ(integer, 3);
    }
};

const auto returned = [](auto &&...call) { return Returned(call...); };
const auto returnedWithHost = [](auto &&...call) { return ReturnedWithHost(call...); };

TEST(Frame, AFailureSettlesEveryOutputInOrderAndWarningsLeaveThem) {
    for (const ErrorCode status : {0, 20004}) {
        const Outputs outputs;
        EXPECT_EQ(outputs.call(returned, 5, status), status);
        outputs.expectKept(5);
    }
    const Outputs outputs;
    qx::test::ResetHost(4, hostRefusal);
    EXPECT_EQ(outputs.call(returned, 5, -20061), -20061);
    // The third resize uses an element type that differs from that of its array; the fourth is
    // refused, but the array is emptied nevertheless; the kept array is not resized.
    EXPECT_EQ(qx::test::Host().reshapes,
              (std::vector<Reshape>{{10, 1, 5}, {3, 1, 5}, {13, 1, 0}, {3, 1, 0}, {13, 2, 0}}));
    outputs.expectSettled();
    qx::test::ResetHost();
}

TEST(Frame, EachEndingReturnsCodesAndTheHostsStatusInItsWay) {
    ErrorCode err = 0;
    const auto inErr = [&err](auto &&...call) { return InErr(&err, call...); };
    const auto inErrWithHost = [&err](auto &&...call) { return InErrWithHost(&err, call...); };
    const auto expect = [&err](auto ending, ErrorCode status, bool isRefused, int32_t result,
                               ErrorCode code) {
        // A positive status of the host is also a refusal.
        qx::test::ResetHost(isRefused ? 2 : 0, hostRefusal);
        err = 12345;
        const Outputs outputs;
        EXPECT_EQ(outputs.call(ending, 2, status), result);
        EXPECT_EQ(err, code);
        isRefused || status < 0 ? outputs.expectSettled() : outputs.expectKept(2);
        qx::test::ResetHost();
    };
    for (const ErrorCode status : {0, 20001, -20003}) {
        expect(returned, status, false, status, 12345);
        expect(returnedWithHost, status, false, status, 12345);
        expect(inErr, status, false, 0, status);
        expect(inErrWithHost, status, false, 0, status);
    }
    expect(returned, 0, true, ErrOutOfMemory, 12345);
    expect(returnedWithHost, 0, true, hostRefusal, 12345);
    expect(inErr, 0, true, 0, ErrOutOfMemory);
    expect(inErrWithHost, 0, true, hostRefusal, ErrOutOfMemory);
}

// Running sums of x into y, which begin with the first element of z.
ErrorCode Sums(In<DBL1D> x, In<DBL1D> z, Out<DBL1D> y) {
    const int32_t n = x.size();
    if (const Outcome bad = y.resize(n + 1))
        return bad.code();
    y.data()[0] = z.data()[0];
    for (int32_t i = 0; i < n; ++i)
        y.data()[i + 1] = y.data()[i] + x.data()[i];
    return 0;
}

TEST(Frame, AnInputThatIsAnOutputIsReadFromACopy) {
    const DBLArray x{1.0, 2.0, 3.0};
    const DBLArray z{10.0};
    EXPECT_EQ(returned(Sums, x.handle(), z.handle(), x.handle()), 0);
    EXPECT_EQ(x.values(), (std::vector<double>{10, 11, 13, 16}));
    EXPECT_EQ(returned(Sums, x.handle(), x.handle(), x.handle()), 0);
    EXPECT_EQ(x.values(), (std::vector<double>{10, 20, 31, 44, 60}));
    // An array that is declared as read and written is not copied.
    const auto twice = [](InOut<DBL1D> a) -> ErrorCode {
        a.data()[0] *= 2;
        return 0;
    };
    EXPECT_EQ(returned(twice, z.handle()), 0);
    EXPECT_EQ(z[0], 20);
}

// A record of the caller with an array to read and one to write, either of which may be missing.
struct Pair {
    DBL1D read;
    DBL1D written;
};
class InOutPair {
public:
    InOutPair(Pair *pair) : read(pair->read), written(pair->written) {}
    void settleFailure() {
        if (written.identity() != nullptr)
            written.empty();
    }
    auto inputs() { return std::tie(read); }
    auto outputs() const { return std::tuple(written.identity()); }
    In<DBL1D> read;
    Out<DBL1D> written;
};

TEST(Frame, OneArrayAsTwoOutputsIsRefusedAlsoWithinRecords) {
    int bodies = 0;
    const auto body = [&bodies](InOutPair pair, InOut<DBL1D> x, qx::OutDBL,
                                Out<DBL1D> y) -> Outcome {
        ++bodies;
        if (const Outcome bad = y.resize(2))
            return bad;
        if (pair.read.identity() != nullptr)
            y.data()[0] = pair.read.data()[0];
        y.data()[1] = x.data()[0];
        return 0;
    };
    const DBLArray a{1.0}, b{2.0}, c{3.0};
    double scalar = 5;
    Pair pair = {a.handle(), b.handle()};
    const DBLArray y;
    EXPECT_EQ(returned(body, &pair, c.handle(), &scalar, y.handle()), 0);
    EXPECT_EQ(y.values(), (std::vector<double>{1, 3}));
    EXPECT_EQ(returned(body, &pair, c.handle(), &scalar, a.handle()), 0);
    EXPECT_EQ(a.values(), (std::vector<double>{1, 3})) << "read from a copy";
    pair = {nullptr, nullptr};
    EXPECT_EQ(returned(body, &pair, c.handle(), &scalar, y.handle()), 0)
        << "no arrays, so none coincide";
    EXPECT_EQ(bodies, 3);

    pair = {a.handle(), b.handle()};
    EXPECT_EQ(returned(body, &pair, c.handle(), &scalar, c.handle()), ErrInternal);
    EXPECT_EQ(b.size() + c.size(), 0);
    EXPECT_EQ(std::bit_cast<uint64_t>(scalar), quietNaN);
    EXPECT_EQ(a.size(), 2);
    EXPECT_EQ(returned(body, &pair, y.handle(), &scalar, b.handle()), ErrInternal);
    EXPECT_EQ(y.size(), 0);
    EXPECT_EQ(bodies, 3) << "the body has not run";
}

TEST(Frame, ASpoiledInputIsSpoiledInItsCopyIfItIsTheOutput) {
    const auto body = [](qx::Spoiled<DBL2D> in, Out<DBL2D> out) -> Outcome {
        if (const Outcome bad = out.resize(in.rows(), in.cols()))
            return bad;
        for (int32_t k = 0; k < in.rows() * in.cols(); ++k) {
            out.data()[k] = in.data()[k] + 1;
            in.data()[k] = -1;
        }
        return 0;
    };
    const DBLMatrix a(2, 3);
    for (int32_t k = 0; k < 6; ++k)
        a.data()[k] = k;
    const DBLMatrix b;
    EXPECT_EQ(returned(body, a.handle(), b.handle()), 0);
    EXPECT_EQ(a.values(), std::vector<double>(6, -1));
    EXPECT_EQ(returned(body, b.handle(), b.handle()), 0);
    EXPECT_EQ(b.values(), (std::vector<double>{2, 3, 4, 5, 6, 7}));

    // An array that claims a negative size is empty, so there is nothing to copy.
    const auto sizeOf = [](In<DBL1D> in, Out<DBL1D>) -> ErrorCode {
        return in.hasNegativeSize() && in.isEmpty() && in.size() == 0 ? -1 : 0;
    };
    const DBLArray broken(1);
    (*broken.handle())->dimSize = -1;
    EXPECT_EQ(returned(sizeOf, broken.handle(), broken.handle()), -1);
    const DBLMatrix negative(1, 1);
    (*negative.handle())->dimSizes[0] = (*negative.handle())->dimSizes[1] = -2;
    const In<DBL2D> matrix(negative.handle());
    EXPECT_TRUE(matrix.hasNegativeSize() && matrix.isEmpty());
    EXPECT_EQ(matrix.rows() + matrix.cols(), 0);
}

TEST(Frame, ChecksDecideByTheFirstOrTheLastFailure) {
    EXPECT_EQ(qx::FirstFailed({{false, -1}, {true, -2}, {true, -3}}), -2);
    EXPECT_EQ(qx::LastFailed({{true, -1}, {true, -2}, {false, -3}}), -2);
    EXPECT_EQ(qx::FirstFailed({{false, -1}}), 0);
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
} // namespace qx::test
