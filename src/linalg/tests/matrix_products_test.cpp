#include "qx/matrix_products.h"

#include "linalg/tests/host_matrix.h"
#include "linalg/tests/matrices.h"
#include "linalg/tests/residuals.h"
#include "qx/errors.h"

#include <gtest/gtest.h>

#include <cmath>

namespace qx::test {
namespace {

// Sizes on both sides of the threshold between plain sums and BLAS, and of the panels of BLAS.
const int shapes[][3] = {{1, 1, 1},    {2, 3, 4},    {8, 8, 8},    {9, 8, 8},
                         {5, 1, 7},    {1, 40, 1},   {13, 17, 11}, {64, 64, 64},
                         {3, 130, 70}, {130, 65, 3}, {40, 300, 3}};

template <class Array>
Exact Row(const Array &x) {
    return Exact(1, x.size(), x.data());
}
template <class Array>
Exact Column(const Array &x) {
    return Exact(x.size(), 1, x.data());
}

// The three products of one element type, each in its plain form, without and with a copy.
template <class Array, class Matrices, class Plain, class Copying, class Times, class TimesCopying,
          class From, class FromCopying>
void ExpectProducts(const Matrices &matrixOf, Plain product, Copying productCopying, Times times,
                    TimesCopying timesCopying, From from, FromCopying fromCopying) {
    for (const auto &[m, k, n] : shapes) {
        SCOPED_TRACE(testing::Message() << m << " " << k << " " << n);
        const auto a = Matrix(m, k, matrixOf(m, k)), b = Matrix(k, n, matrixOf(k, n));
        const Array left(matrixOf(1, m)), right(matrixOf(1, k));
        const Exact A = Contents(a), C = A * Contents(b), Ax = A * Column(right),
                    xA = Row(left) * A;
        for (const int32_t way : {-1, 0, 1}) { // plain, without a copy, with one
            auto c = Matrix(0, 0, matrixOf(0, 0));
            Array y, z;
            ErrorCode err = 99;
            ASSERT_EQ(way < 0 ? product(a.handle(), b.handle(), c.handle(), &err)
                              : productCopying(a.handle(), b.handle(), c.handle(), way, &err),
                      0);
            EXPECT_EQ(err, 0);
            EXPECT_LT(Deviation(Contents(c), C), 7.0);
            ASSERT_EQ(way < 0 ? times(a.handle(), right.handle(), y.handle(), &err)
                              : timesCopying(a.handle(), right.handle(), y.handle(), way, &err),
                      0);
            EXPECT_LT(Deviation(Column(y), Ax), 7.0);
            ASSERT_EQ(way < 0 ? from(left.handle(), a.handle(), z.handle(), &err)
                              : fromCopying(left.handle(), a.handle(), z.handle(), way, &err),
                      0);
            EXPECT_LT(Deviation(Row(z), xA), 7.0);
        }
    }
}

TEST(MatrixProducts, AgreeWithTheDefinitionInEveryShape) {
    const qx::test::MatrixKind &random = qx::test::MatrixKinds()[0];
    ExpectProducts<DBLArray>([&](int m, int n) { return RealMatrix(random, m, n); }, MatrixMul_head,
                             MatrixMulAligned_head, AxVect_head, AxVectAligned_head, vectxA_head,
                             vectxAAligned_head);
    ExpectProducts<CDBArray>([&](int m, int n) { return ComplexMatrix(random, m, n); }, AxBCxCIN,
                             AxBCxAlignedCIN, AxVectorCx, AxVectorCxAligned, CxVectxA_head,
                             CxVectxAAligned_head);
}

// 1e16 absorbs a 1 that is added to it, but not one that is added after -1e16 has cancelled it.
TEST(MatrixProducts, OfFewTermsAreSummedInAscendingOrder) {
    const DBL2DArray row(1, 4, {1e16, 1, -1e16, 1}), ones(4, 1, {1, 1, 1, 1});
    const DBLArray x(row.values()), y(ones.values());
    DBL2DArray c;
    DBLArray sums;
    ErrorCode err;
    MatrixMul_head(row.handle(), ones.handle(), c.handle(), &err);
    EXPECT_EQ(c.values(), std::vector<double>{1.0});
    AxVect_head(row.handle(), y.handle(), sums.handle(), &err);
    EXPECT_EQ(sums.values(), std::vector<double>{1.0});
    vectxA_head(x.handle(), ones.handle(), sums.handle(), &err);
    EXPECT_EQ(sums.values(), std::vector<double>{1.0});
}

TEST(MatrixProducts, OfOperandsWithoutElementsOrThatDoNotFit) {
    const DBL2DArray twoByThree(2, 3), threeByNone(3, 0), noneByTwo(0, 2), twoByNone(2, 0);
    DBL2DArray c(5, 5);
    ErrorCode err = 99;
    EXPECT_EQ(MatrixMul_head(twoByThree.handle(), twoByThree.handle(), c.handle(), &err), 0);
    EXPECT_EQ(err, ErrInnerDimensionMismatch);
    EXPECT_EQ(c.rows() + c.cols(), 0);
    MatrixMul_head(twoByThree.handle(), threeByNone.handle(), c.handle(), &err);
    EXPECT_EQ(err, 0);
    EXPECT_EQ(c.rows(), 2);
    EXPECT_EQ(c.cols(), 0);
    MatrixMul_head(twoByNone.handle(), noneByTwo.handle(), c.handle(), &err);
    EXPECT_EQ(err, 0);
    ASSERT_EQ(c.size(), 4);
    for (int i = 0; i < 4; ++i)
        EXPECT_TRUE(std::isnan(c[i])) << "a sum of no terms";

    const DBLArray none, two(2), three(3);
    DBLArray y(4);
    AxVect_head(twoByThree.handle(), none.handle(), y.handle(), &err);
    EXPECT_EQ(err, 0);
    EXPECT_EQ(y.size(), 0);
    AxVect_head(twoByThree.handle(), two.handle(), y.handle(), &err);
    EXPECT_EQ(err, ErrInnerDimensionMismatch);
    AxVect_head(threeByNone.handle(), three.handle(), y.handle(), &err);
    EXPECT_EQ(err, 0) << "an empty operand is checked before mismatched sizes";
    vectxA_head(three.handle(), twoByThree.handle(), y.handle(), &err);
    EXPECT_EQ(err, ErrInnerDimensionMismatch);
    vectxA_head(three.handle(), threeByNone.handle(), y.handle(), &err);
    EXPECT_EQ(err, 0);
    EXPECT_EQ(y.size(), 0);
}

} // namespace
} // namespace qx::test
