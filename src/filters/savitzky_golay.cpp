#include "filters/savitzky_golay.h"

#include "frame/scratch.h"
#include "linalg/factorisations/cholesky.h"
#include "linalg/factorisations/qr.h"
#include "linalg/matrix.h"
#include "linalg/products/products.h"
#include "spectra/sliding_sums.h"

#include <algorithm>
#include <cmath>
#include <cstring>

namespace qx {
namespace {

constexpr auto Real = ElementType::DBL;

// The fit as two matrices: powers (V, frame by terms) and coefficients (G, terms by frame).
class PolynomialFit {
public:
    PolynomialFit(int32_t order, int32_t frame) : terms_(order + 1), frame_(frame) {}

    ErrorCode compute(const DBL *weights) {
        const int64_t size = int64_t{frame_} * terms_, square = int64_t{terms_} * terms_;
        if (const ErrorCode failed = work_.allocate(3 * size + 3 * square))
            return failed;
        powers_ = work_.data();
        coefficients_ = powers_ + size;
        DBL *const transposed = coefficients_ + size, *const inverse = transposed + size;
        fillPowers();
        if (const ErrorCode failed = invertNormal(weights, transposed, inverse))
            return failed;
        CopyTransposed<Real>({powers_, frame_, terms_}, {transposed, terms_, frame_});
        OrderedProduct<Real>({inverse, terms_, terms_}, {transposed, terms_, frame_},
                             {coefficients_, terms_, frame_});
        if (weights != nullptr)
            for (std::ptrdiff_t i = 0; i < terms_; ++i)
                for (std::ptrdiff_t j = 0; j < frame_; ++j)
                    coefficients_[i * frame_ + j] *= std::fabs(weights[j]);
        return 0;
    }

    const DBL *coefficients() const { return coefficients_; }
    // Rows of V G: the weights of the samples in the smoothed values at these places of the frame.
    void smoothing(int32_t firstRow, int32_t rows, DBL *out) const {
        OrderedProduct<Real>({powers_ + std::ptrdiff_t{firstRow} * terms_, rows, terms_},
                             {coefficients_, terms_, frame_}, {out, rows, frame_});
    }
    ErrorCode release() { return work_.release(); }

private:
    void fillPowers() {
        for (std::ptrdiff_t i = 0; i < frame_; ++i) {
            double power = 1.0;
            for (std::ptrdiff_t j = 0; j < terms_; ++j) {
                powers_[i * terms_ + j] = power;
                power *= static_cast<double>(i - frame_ / 2);
            }
        }
    }

    // (A^T A)^-1 = R^-1 (R^-1)^T, where A = Q R is V with its rows weighted. `inverse` has room for
    // three matrices.
    ErrorCode invertNormal(const DBL *weights, DBL *weighted, DBL *inverse) {
        const std::ptrdiff_t square = std::ptrdiff_t{terms_} * terms_;
        DBL *const r = inverse + square, *const packed = r + square;
        for (std::ptrdiff_t i = 0; i < frame_; ++i) {
            const double factor = weights != nullptr ? std::sqrt(std::fabs(weights[i])) : 1.0;
            for (std::ptrdiff_t j = 0; j < terms_; ++j)
                weighted[i * terms_ + j] = powers_[i * terms_ + j] * factor;
        }
        const RealMatrix triangle(r, terms_, terms_), transposed(packed, terms_, terms_);
        const RealVector elements(packed, PackedLength(terms_));
        if (const ErrorCode failed =
                QRDecompose<Real>({weighted, frame_, terms_}, qrOnlyR, {}, triangle))
            return failed;
        PackMatrix<Real>(triangle, upperTriangle, elements);
        if (const ErrorCode failed = InvertTriangle<Real>(elements, terms_, upperTriangle))
            return failed;
        ExpandPacked<Real>(elements, upperTriangle, triangle);
        CopyTransposed<Real>(triangle, transposed);
        OrderedProduct<Real>(triangle, transposed, {inverse, terms_, terms_});
        return 0;
    }

    int32_t terms_, frame_;
    Scratch<ElementType::DBL> work_;
    DBL *powers_ = nullptr, *coefficients_ = nullptr;
};

// The smoothed values of one frame at `count` places from `first` on.
ErrorCode SmoothEnd(const PolynomialFit &fit, int32_t first, int32_t count, const DBL *x,
                    int32_t frame, DBL *y) {
    constexpr int32_t rowsAtOnce = 16;
    Scratch<ElementType::DBL> rows;
    if (const ErrorCode failed = rows.allocate(int64_t{std::min(rowsAtOnce, count)} * frame))
        return failed;
    for (int32_t done = 0; done < count; done += rowsAtOnce) {
        const int32_t now = std::min(rowsAtOnce, count - done);
        fit.smoothing(first + done, now, rows.data());
        MatrixVectorProduct<Real>({rows.data(), now, frame}, {x, frame}, {y + done, now});
    }
    return rows.release();
}

} // namespace

ErrorCode CheckSavitzkyGolay(int32_t order, int32_t frame) {
    if (order < 1)
        return ErrBadCoefficients;
    return frame <= order ? ErrPolynomialOrderTooHigh : 0;
}

ErrorCode SavitzkyGolayMatrix(int32_t order, int32_t frame, const DBL *weights, DBL *smoothing,
                              DBL *differentiators) {
    if (const ErrorCode failed = CheckSavitzkyGolay(order, frame))
        return failed;
    if (frame % 2 == 0)
        return ErrBadTapCount;
    PolynomialFit fit(order, frame);
    if (const ErrorCode failed = fit.compute(weights))
        return failed;
    fit.smoothing(0, frame, smoothing);
    if (differentiators != nullptr)
        std::memcpy(differentiators, fit.coefficients(),
                    sizeof(DBL) * (static_cast<std::size_t>(order) + 1) *
                        static_cast<std::size_t>(frame));
    return fit.release();
}

ErrorCode SavitzkyGolayFilter(const DBL *x, int32_t n, int32_t order, int32_t frame,
                              const DBL *weights, DBL *y) {
    if (const ErrorCode failed = CheckSavitzkyGolay(order, frame))
        return failed;
    if (frame % 2 == 0)
        return ErrBadTapCount;
    if (n < frame)
        return ErrSizesDisagree;
    PolynomialFit fit(order, frame);
    if (const ErrorCode failed = fit.compute(weights))
        return failed;
    // frame is at least 3, so each end has a place and the middle has a row.
    const int32_t half = frame / 2;
    if (const ErrorCode failed = SmoothEnd(fit, 0, half, x, frame, y))
        return failed;
    if (const ErrorCode failed =
            SmoothEnd(fit, half + 1, half, x + (n - frame), frame, y + (n - half)))
        return failed;
    Scratch<ElementType::DBL> taps;
    if (const ErrorCode failed = taps.allocate(frame))
        return failed;
    fit.smoothing(half, 1, taps.data());
    SlidingSums({.taps = {taps.data()},
                 .tapCount = frame,
                 .signal = {x},
                 .length = n,
                 .first = 0,
                 .out = {y + half},
                 .count = n - frame + 1});
    return taps.release();
}

} // namespace qx
