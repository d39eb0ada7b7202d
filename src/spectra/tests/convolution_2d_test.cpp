#include "qx/convolution_2d.h"

#include "qx/errors.h"
#include "spectra/convolution_2d.h"
#include "tests/support/hostile_host.h"
#include "tests/support/transform_reference.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>

namespace qx::test {
namespace {

struct Sizes {
    int32_t xRows, xCols, yRows, yCols;
};

void Fill(const DBLMatrix &matrix, uint64_t seed) {
    const auto values = RandomSignal(matrix.size(), seed);
    for (int32_t i = 0; i < matrix.size(); ++i)
        matrix.data()[i] = values[static_cast<std::size_t>(i)];
}
void Fill(const CDBMatrix &matrix, uint64_t seed) {
    const auto values = RandomComplex(matrix.size(), seed);
    for (int32_t i = 0; i < matrix.size(); ++i)
        matrix.data()[i] = values[static_cast<std::size_t>(i)];
}

// The full convolution of x with y, or, with x reversed and conjugated, the correlation.
template <class Matrix>
LongSpectrum Full(const Matrix &x, const Matrix &y, bool correlate) {
    const int32_t rows = x.rows() + y.rows() - 1, cols = x.cols() + y.cols() - 1;
    LongSpectrum sums(static_cast<std::size_t>(rows * cols));
    for (int32_t r = 0; r < x.rows(); ++r)
        for (int32_t c = 0; c < x.cols(); ++c)
            for (int32_t i = 0; i < y.rows(); ++i)
                for (int32_t j = 0; j < y.cols(); ++j) {
                    const auto a = correlate
                                       ? std::conj(ToLong(x.at(x.rows() - 1 - r, x.cols() - 1 - c)))
                                       : ToLong(x.at(r, c));
                    sums[static_cast<std::size_t>((r + i) * cols + c + j)] +=
                        a * ToLong(y.at(i, j));
                }
    return sums;
}

LongSpectrum Cut(const LongSpectrum &full, int32_t fullCols, int32_t row, int32_t col, int32_t rows,
                 int32_t cols) {
    LongSpectrum part;
    for (int32_t r = row; r < row + rows; ++r)
        for (int32_t c = col; c < col + cols; ++c)
            part.push_back(full[static_cast<std::size_t>(r * fullCols + c)]);
    return part;
}

template <class Matrix, class Convolve, class Correlate>
void AgreeWithTheDefinition(const Sizes &s, Convolve convolve, Correlate correlate) {
    SCOPED_TRACE(testing::Message()
                 << s.xRows << "x" << s.xCols << " " << s.yRows << "x" << s.yCols);
    const Matrix x(s.xRows, s.xCols), y(s.yRows, s.yCols);
    Fill(x, 1);
    Fill(y, 2);
    const LongSpectrum full = Full(x, y, false);
    const int32_t fullCols = s.xCols + s.yCols - 1;
    constexpr double bound = 3e-15;
    for (const int32_t algorithm : {0, 1}) {
        const Matrix out(2, 2);
        ASSERT_EQ(convolve(x.handle(), y.handle(), out.handle(), 0, algorithm), 0);
        EXPECT_EQ(out.rows(), s.xRows + s.yRows - 1);
        EXPECT_EQ(out.cols(), fullCols);
        EXPECT_LT(MaxError(out.values(), full), bound);

        ASSERT_EQ(convolve(x.handle(), y.handle(), out.handle(), 1, algorithm), 0);
        EXPECT_EQ(out.rows(), s.xRows);
        EXPECT_EQ(out.cols(), s.xCols);
        EXPECT_LT(
            MaxError(out.values(), Cut(full, fullCols, s.yRows / 2, s.yCols / 2, s.xRows, s.xCols)),
            bound);

        if (s.xRows >= s.yRows && s.xCols >= s.yCols && s.xRows >= s.xCols && s.yRows >= s.yCols) {
            const int32_t rows = s.xRows - s.yRows + 1, cols = s.xCols - s.yCols + 1;
            ASSERT_EQ(convolve(x.handle(), y.handle(), out.handle(), 2, algorithm), 0);
            EXPECT_EQ(out.rows(), rows);
            EXPECT_EQ(out.cols(), cols);
            EXPECT_LT(
                MaxError(out.values(), Cut(full, fullCols, s.yRows - 1, s.yCols - 1, rows, cols)),
                bound);
        }
        ASSERT_EQ(correlate(x.handle(), y.handle(), out.handle(), algorithm), 0);
        EXPECT_EQ(out.rows(), s.xRows + s.yRows - 1);
        EXPECT_LT(MaxError(out.values(), Full(x, y, true)), bound);
    }
}

TEST(Convolution2D, EverySizeAndAlgorithmAgreesWithTheDefinition) {
    for (const Sizes &s :
         {Sizes{1, 1, 1, 1}, Sizes{5, 4, 3, 3}, Sizes{9, 8, 4, 4}, Sizes{3, 3, 7, 6},
          Sizes{1, 30, 1, 5}, Sizes{30, 1, 5, 1}, Sizes{20, 13, 2, 2}, Sizes{6, 60, 3, 17}}) {
        AgreeWithTheDefinition<DBLMatrix>(s, Convolve_2DH, Correlation_2DH);
        AgreeWithTheDefinition<CDBMatrix>(s, CxConvolve_2DH, CxCorrelation_2DH);
    }
}

// The sums run over the elements of the smaller matrix, or of y if the sizes are equal, in order.
TEST(Convolution2D, DirectSumsKeepTheirOrderToTheBit) {
    for (const double broken : {0.5, std::numeric_limits<double>::infinity(), std::nan("")})
        for (const Sizes &s : {Sizes{12, 70, 3, 5}, Sizes{3, 5, 12, 70}, Sizes{6, 4, 4, 6}}) {
            const DBLMatrix x(s.xRows, s.xCols), y(s.yRows, s.yCols);
            Fill(x, 1);
            Fill(y, 2);
            x.data()[4] = y.data()[7] = broken;
            const bool kernelIsX = x.size() < y.size();
            const DBLMatrix &kernel = kernelIsX ? x : y, &big = kernelIsX ? y : x;
            const DBLMatrix out;
            ASSERT_EQ(Convolve_2DH(x.handle(), y.handle(), out.handle(), 0, 0), 0);
            for (int32_t r = 0; r < out.rows(); ++r)
                for (int32_t c = 0; c < out.cols(); ++c) {
                    double sum = 0.0;
                    for (int32_t i = 0; i < kernel.rows(); ++i)
                        for (int32_t j = 0; j < kernel.cols(); ++j)
                            if (r - i >= 0 && r - i < big.rows() && c - j >= 0 &&
                                c - j < big.cols())
                                sum += big.at(r - i, c - j) * kernel.at(i, j);
                    const double value = out.at(r, c);
                    ASSERT_TRUE(value == sum || (std::isnan(value) && std::isnan(sum)));
                }
        }
}

template <class Matrix, class Convolve, class Correlate>
void CheckInOrder(Convolve convolve, Correlate correlate) {
    const Matrix x(3, 2), y(2, 3), none;
    const Matrix empty(0, 4);
    for (const auto &[a, b, outputSize, code] : {std::tuple{&x, &none, 9, ErrEmptyInput},
                                                 {&empty, &x, 9, ErrEmptyInput},
                                                 {&x, &y, 3, ErrInvalidSelector},
                                                 {&x, &y, -1, ErrInvalidSelector},
                                                 {&x, &y, 2, ErrSizesDisagree}}) {
        const Matrix out(2, 2);
        ResetHost();
        EXPECT_EQ(convolve(a->handle(), b->handle(), out.handle(), outputSize, 7), code);
        EXPECT_TRUE(Host().reshapes.empty()) << "the output is not changed";
    }
    for (const int32_t outputSize : {0, 1}) {
        const Matrix out(2, 2);
        EXPECT_EQ(convolve(x.handle(), y.handle(), out.handle(), outputSize, 2),
                  ErrInvalidSelector);
        EXPECT_EQ(out.rows() + out.cols(), 0);
    }
    const Matrix out(2, 2);
    EXPECT_EQ(correlate(none.handle(), y.handle(), out.handle(), 0), ErrEmptyInput);
    EXPECT_EQ(out.rows(), 2);
    EXPECT_EQ(correlate(x.handle(), y.handle(), out.handle(), -1), ErrInvalidSelector);
    EXPECT_EQ(out.rows() + out.cols(), 0);
}

TEST(Convolution2D, ChecksComeInOrder) {
    CheckInOrder<DBLMatrix>(Convolve_2DH, Correlation_2DH);
    CheckInOrder<CDBMatrix>(CxConvolve_2DH, CxCorrelation_2DH);
}

TEST(Convolution2D, TheComplexValidPartRefusesWideMatrices) {
    const DBLMatrix x(2, 5), y(1, 1), out;
    EXPECT_EQ(Convolve_2DH(x.handle(), y.handle(), out.handle(), 2, 0), 0);
    EXPECT_EQ(out.cols(), 5);
    const CDBMatrix z(2, 5), w(1, 1), tall(5, 2), wide(1, 2), complexOut(2, 2);
    EXPECT_EQ(CxConvolve_2DH(z.handle(), w.handle(), complexOut.handle(), 2, 0), ErrSizesDisagree);
    EXPECT_EQ(complexOut.rows() + complexOut.cols(), 0);
    EXPECT_EQ(CxConvolve_2DH(tall.handle(), wide.handle(), complexOut.handle(), 2, 0),
              ErrSizesDisagree);
}

} // namespace
} // namespace qx::test
