#include "qx/special_matrices.h"

#include "linalg/tests/host_matrix.h"
#include "qx/matrix_properties.h"
#include "tests/support/recipe.h"

#include <gtest/gtest.h>

#include <cmath>
#include <vector>

namespace qx::test {
namespace {

typedef DBL2DArray DBLMatrix;
typedef CDB2DArray CDBMatrix;
typedef Array1D<qx::ElementType::DBL> DBLVector;
typedef Array1D<qx::ElementType::CDB> CDBVector;
typedef std::vector<double> Values;

Values Special(int32_t kind, int32_t size, const DBLVector &x, const DBLVector &y,
               ErrorCode expected = 0) {
    const DBLMatrix out(1, 1);
    ErrorCode err = 1;
    SpecialMatrix_head(&kind, &size, x.handle(), y.handle(), out.handle(), &err);
    EXPECT_EQ(err, expected);
    return out.values();
}

TEST(SpecialMatrix, OfEachKind) {
    const DBLVector none(0), x({2, 4, 6}), y({9, 5});
    EXPECT_EQ(Special(0, 2, none, none), (Values{1, 0, 0, 1}));
    EXPECT_EQ(Special(1, 0, x, none), (Values{2, 0, 0, 0, 4, 0, 0, 0, 6}));
    EXPECT_EQ(Special(2, 0, x, y), (Values{2, 5, 4, 2, 6, 4}));
    EXPECT_EQ(Special(3, 0, x, none), (Values{4, 2, 1, 16, 4, 1, 36, 6, 1}));
    EXPECT_EQ(Special(4, 0, x, none), (Values{-2, -3, 1, 0}));
    EXPECT_EQ(Special(5, 1, x, y, ErrInvalidSelector), Values());
    EXPECT_EQ(Special(0, 0, x, y, ErrEmptyInput), Values());
    EXPECT_EQ(Special(2, 1, x, none, ErrEmptyInput), Values());
    EXPECT_EQ(Special(4, 1, DBLVector({1}), y, ErrFewerThanTwo), Values());
    EXPECT_EQ(Special(0, 65536, x, y, ErrOutOfMemory), Values()); // 2^32 elements
}

TEST(Products, OuterAndKronecker) {
    ErrorCode err;
    const DBLVector x({1, 2}), y({3, 4, 5});
    const DBLMatrix out(0, 0), a(1, 2, {1, 10}), b(2, 1, {3, 4});
    OuterProd_head(x.handle(), y.handle(), out.handle(), &err);
    EXPECT_EQ(out.values(), (Values{3, 4, 5, 6, 8, 10}));
    EXPECT_EQ(KroneckerProd_H(a.handle(), b.handle(), out.handle()), 0);
    EXPECT_EQ(out.values(), (Values{3, 30, 4, 40}));
    const CDBMatrix z(1, 1, {{0, 1}}), zout(0, 0);
    EXPECT_EQ(CxKroneckerProd_H(z.handle(), z.handle(), zout.handle()), 0);
    EXPECT_EQ(zout[0].re, -1.0);
    const DBLMatrix wide(1, 50000);
    EXPECT_EQ(KroneckerProd_H(wide.handle(), wide.handle(), out.handle()), ErrOutOfMemory);
    EXPECT_EQ(out.rows(), 0);
}

TEST(PackedStorage, ExpandsAndPacksEachTriangle) {
    ErrorCode err;
    const DBLVector packed({1, 2, 3, 4, 5, 6}), back(0);
    const Values expanded[] = {
        {1, 0, 0, 2, 4, 0, 3, 5, 6}, {1, 2, 4, 0, 3, 5, 0, 0, 6}, {1, 2, 3, 2, 4, 5, 3, 5, 6}};
    for (int32_t triangle = 0; triangle < 3; ++triangle) {
        const DBLMatrix out(0, 0);
        const PackedTriangle a = {packed.handle(), triangle};
        Compact_to_Matrix_head(&a, out.handle(), &err);
        EXPECT_EQ(out.values(), expanded[triangle]);
        Matrix_to_Compact_head(out.handle(), &triangle, back.handle(), &err);
        EXPECT_EQ(back.values(), packed.values());
    }
    // An unknown triangle changes nothing and is not a failure.
    const DBLMatrix out(1, 1, {7});
    const PackedTriangle other = {packed.handle(), 3};
    Compact_to_Matrix_head(&other, out.handle(), &err);
    EXPECT_EQ(err, 0);
    EXPECT_EQ(out.values(), Values{7});
    EXPECT_EQ(CompactToMatrix_H(DBLVector({1, 2}).handle(), out.handle()), ErrNotSquare);
    const CDBVector z(std::vector<CDB>{{1, 0}, {2, 3}, {4, 0}});
    const CDBMatrix zout(0, 0);
    const CxPackedTriangle mirrored = {z.handle(), 2};
    CxCompact_to_Matrix_head(&mirrored, zout.handle(), &err);
    EXPECT_EQ(zout.at(0, 1).im, 3.0); // not conjugated
}

TEST(InitialMatrix, IsZeroOrEmpty) {
    const DBLMatrix out(1, 1, {7});
    EXPECT_EQ(InitialMatrixH(2, 2, out.handle()), 0);
    EXPECT_EQ(out.values(), Values(4, 0.0));
    EXPECT_EQ(InitialMatrixH(2, 0, out.handle()), ErrEmptyInput);
    EXPECT_EQ(InitialMatrixH(1 << 20, 1 << 20, out.handle()), ErrOutOfMemory);
    EXPECT_EQ(out.rows(), 0);
}

// The matrix has the given eigenvalues and is not diagonal.
TEST(MatrixFromEigenvalues, HasThem) {
    ErrorCode err;
    const DBLVector values({3, -1, 0.5, 2});
    const DBLMatrix a(0, 0);
    CreateMatrixFromEVs_head(values.handle(), a.handle(), &err);
    EXPECT_GT(std::fabs(a.at(0, 3)), 0.1);
    EXPECT_EQ(a.at(1, 2), a.at(2, 1));
    const DBLVector polynomial(0);
    MatrixCharacteristicPoly_head(a.handle(), polynomial.handle(), &err);
    for (const double root : values.values()) {
        double value = 0;
        for (int k = 4; k >= 0; --k)
            value = value * root + polynomial[k];
        EXPECT_NEAR(value, 0.0, 1e-13);
    }
}

TEST(CorrelationMatrix, IsToeplitzOfTheCorrelation) {
    const DBLVector x({1, 2, 3}), y({0, 1, 0});
    const DBLMatrix out(0, 0);
    // r(k) = sum over i of x[i + k] y[i] = x[1 + k].
    EXPECT_EQ(AutoCorrMtrxH(x.handle(), y.handle(), 1, 0, out.handle()), 0);
    EXPECT_EQ(out.values(), (Values{2, 1, 3, 2}));
    AutoCorrMtrxH(x.handle(), x.handle(), 1, 1, out.handle());
    EXPECT_EQ(out.values(), (Values{14. / 3, 4, 4, 14. / 3}));
    AutoCorrMtrxH(x.handle(), x.handle(), 1, 2, out.handle());
    EXPECT_EQ(out.values(), (Values{14. / 3, 8. / 3, 8. / 3, 14. / 3}));
    const CDBVector z(std::vector<CDB>{{0, 1}, {1, 0}});
    const CDBMatrix zout(0, 0);
    CxAutoCorrMtrxH(z.handle(), z.handle(), 1, 0, zout.handle()); // r(1) = 1 conj(i) = -i
    EXPECT_EQ(zout.at(1, 0).im, -1.0);
    EXPECT_EQ(zout.at(0, 1).im, 1.0);
    EXPECT_EQ(AutoCorrMtrxH(x.handle(), y.handle(), 3, 0, out.handle()), ErrIndexOutOfRange);
    EXPECT_EQ(AutoCorrMtrxH(x.handle(), y.handle(), 0, 3, out.handle()), ErrInvalidSelector);
}

} // namespace
} // namespace qx::test
