#include "linalg/factorisations/balance.h"

#include <cmath>

namespace qx {
namespace {

template <ElementType E>
class Balancing {
    typedef ElementOf<E> T;

public:
    Balancing(const MatrixView<E> &a, RealVector scale)
        : a_(a), n_(a.rows()), high_(n_ - 1), scale_(scale) {}

    void permute() {
        for (int32_t j = high_; j >= 0 && high_ > 0;) {
            const bool isolated = rowIsZeroBut(j);
            if (isolated) {
                exchange(j, high_);
                --high_;
            }
            j = isolated ? high_ : j - 1;
        }
        if (high_ == 0) {
            scale_[0] = 0;
            return;
        }
        for (int32_t j = low_; j <= high_;) {
            const bool isolated = columnIsZeroBut(j);
            if (isolated) {
                exchange(j, low_);
                ++low_;
            }
            j = isolated ? low_ : j + 1;
        }
    }
    // Makes one pass over the block and returns whether it changed anything.
    bool scaleOnce() {
        bool changed = false;
        for (int32_t i = low_; i <= high_; ++i)
            changed |= scaleOne(i);
        return changed;
    }
    Balanced range() const { return {low_, high_}; }

private:
    T *at(int32_t row) const { return a_.row(row); }

    bool rowIsZeroBut(int32_t j) const {
        for (int32_t i = 0; i <= high_; ++i)
            if (i != j && AbsSum(at(j)[i]) != 0.0)
                return false;
        return true;
    }
    bool columnIsZeroBut(int32_t j) const {
        for (int32_t i = low_; i <= high_; ++i)
            if (i != j && AbsSum(at(i)[j]) != 0.0)
                return false;
        return true;
    }
    void exchange(int32_t j, int32_t m) {
        scale_[m] = j;
        if (j == m)
            return;
        for (int32_t i = 0; i <= high_; ++i)
            Swap(&at(i)[j], &at(i)[m]);
        for (int32_t i = low_; i < n_; ++i)
            Swap(&at(j)[i], &at(m)[i]);
    }

    // Scaling makes elements below `least` lose digits, and sums that decrease by rounding alone
    // may go on decreasing.
    static bool isFair(double x) { return x > least && x < 1.0 / least; }

    // Whether an element outside the block, which neither sum includes, would become too large.
    bool overflowsBesides(int32_t i, double factor, double inverse) const {
        for (int32_t j = high_ + 1; j < n_; ++j)
            if (AbsSum(at(i)[j]) * inverse >= 1.0 / least)
                return true;
        for (int32_t j = 0; j < low_; ++j)
            if (AbsSum(at(j)[i]) * factor >= 1.0 / least)
                return true;
        return false;
    }

    bool scaleOne(int32_t i) {
        double column = 0.0, row = 0.0;
        for (int32_t j = low_; j <= high_; ++j)
            if (j != i) {
                column += AbsSum(at(j)[i]);
                row += AbsSum(at(i)[j]);
            }
        const double sum = column + row;
        // A sum whose double overflows would never reach its bound.
        if (column == 0.0 || row == 0.0 || !(sum < 1.0 / least))
            return false;
        const double before = column;
        double factor = 1.0;
        for (const double bound = row * 0.5; column < bound; column *= 4.0)
            factor *= 2.0;
        for (const double bound = row * 2.0; column >= bound; column *= 0.25)
            factor *= 0.5;
        if (!((column + row) / factor < sum * 0.95))
            return false;
        const double inverse = 1.0 / factor, scale = scale_[i] * factor;
        if (!isFair(factor) || !isFair(scale) || !isFair(before * factor) ||
            !isFair(row * inverse) || overflowsBesides(i, factor, inverse))
            return false;
        scale_[i] = scale;
        for (int32_t j = low_; j < n_; ++j)
            if (j != i)
                at(i)[j] = at(i)[j] * inverse;
        for (int32_t j = 0; j <= high_; ++j)
            if (j != i)
                at(j)[i] = at(j)[i] * factor;
        return true;
    }

    static constexpr double least = 0x1p-970;

    MatrixView<E> a_;
    int32_t n_, low_ = 0, high_;
    RealVector scale_;
};

} // namespace

template <ElementType E>
Balanced Balance(const MatrixView<E> &a, bool permute, bool scaleToo, RealVector scale) {
    QX_EXPECTS(a.isSquare() && scale.size() == a.rows());
    Balancing<E> balancing(a, scale);
    if (permute)
        balancing.permute();
    const Balanced range = balancing.range();
    // A block of one element is an isolated eigenvalue, exchanged with itself.
    const bool single = permute && range.low == range.high;
    for (int32_t i = range.low; i <= range.high; ++i)
        scale[i] = single ? i : 1.0;
    while (scaleToo && !single && balancing.scaleOnce()) {
    }
    return range;
}

template <ElementType E>
void UndoScaling(ConstRealVector scale, Balanced range, EigenvectorSide side,
                 const MatrixView<E> &v) {
    if (range.low == range.high)
        return;
    for (int32_t i = range.low; i <= range.high; ++i) {
        const double factor = side == EigenvectorSide::Right ? scale[i] : 1.0 / scale[i];
        for (int32_t j = 0; j < v.cols(); ++j)
            v(i, j) = v(i, j) * factor;
    }
}

template <ElementType E>
void UndoPermutation(ConstRealVector scale, Balanced range, const MatrixView<E> &v) {
    const auto exchange = [=](int32_t i) {
        const auto other = static_cast<int32_t>(scale[i]);
        for (int32_t j = 0; other != i && j < v.cols(); ++j)
            Swap(&v(i, j), &v(other, j));
    };
    for (int32_t i = range.low - 1; i >= 0; --i)
        exchange(i);
    for (int32_t i = range.high + 1; i < v.rows(); ++i)
        exchange(i);
}

template Balanced Balance(const RealMatrix &, bool, bool, RealVector);
template Balanced Balance(const ComplexMatrix &, bool, bool, RealVector);
template void UndoScaling(ConstRealVector, Balanced, EigenvectorSide, const RealMatrix &);
template void UndoScaling(ConstRealVector, Balanced, EigenvectorSide, const ComplexMatrix &);
template void UndoPermutation(ConstRealVector, Balanced, const RealMatrix &);
template void UndoPermutation(ConstRealVector, Balanced, const ComplexMatrix &);

} // namespace qx
