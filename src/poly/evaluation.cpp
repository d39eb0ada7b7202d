#include "poly/evaluation.h"

#include "frame/scratch.h"
#include "linalg/products/products.h"
#include "linalg/scalar.h"
#include "poly/arithmetic.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

template <ElementType E>
class MatrixPolynomial {
    typedef ElementOf<E> T;

public:
    MatrixPolynomial(ConstVectorView<E> p, const ConstMatrixView<E> &a)
        : p_(p), a_(a.data()), order_(a.rows()), elements_(a.count()),
          degree_(std::max(0, LengthWithoutZeros<E>(p) - 1)) {}

    ErrorCode evaluate(T *y) {
        chooseBlocks();
        if (const ErrorCode failed = work_.allocate(int64_t{powers_} * elements_))
            return failed;
        for (int32_t j = 2; j <= powers_; ++j)
            OrderedProduct<E>(square(power(j - 1)), square(a_), square(powerPlace(j)));
        for (std::ptrdiff_t i = 0; i < elements_; ++i)
            y[i] = ScalarOf<E>::Of(0.0);
        int32_t k = degree_ > 0 ? (degree_ - 1) / powers_ * powers_ : 0;
        addBlock(k, degree_ - k, y);
        for (k -= powers_; k >= 0; k -= powers_) {
            T *const product = powerPlace(1); // the first power is a itself
            OrderedProduct<E>(square(y), square(power(powers_)), square(product));
            for (std::ptrdiff_t i = 0; i < elements_; ++i)
                y[i] = product[i];
            addBlock(k, powers_ - 1, y);
        }
        return work_.release();
    }

private:
    MatrixView<E> square(T *elements) const { return {elements, order_, order_}; }
    ConstMatrixView<E> square(const T *elements) const { return {elements, order_, order_}; }

    // About the square root of the degree gives the fewest products; the memory of the powers is
    // limited to 32 MB or eight matrices.
    void chooseBlocks() {
        const int64_t room = std::max<int64_t>(8, (int64_t{1} << 22) / elements_);
        const int64_t best = static_cast<int64_t>(std::ceil(std::sqrt(double(degree_))));
        powers_ = static_cast<int32_t>(std::clamp<int64_t>(best, 1, room));
    }
    T *powerPlace(int32_t j) { return work_.data() + (j - 1) * elements_; }
    const T *power(int32_t j) { return j == 1 ? a_ : powerPlace(j); }

    // Adds p[k] I + p[k + 1] a + ... + p[k + last] a^last.
    void addBlock(int32_t k, int32_t last, T *y) {
        for (int32_t j = 1; j <= last; ++j) {
            const typename ScalarOf<E>::type factor = p_[k + j];
            const T *const matrix = power(j);
            for (std::ptrdiff_t i = 0; i < elements_; ++i)
                y[i] = y[i] + factor * matrix[i];
        }
        for (std::ptrdiff_t i = 0; i < order_; ++i)
            y[i * order_ + i] = y[i * order_ + i] + p_[k];
    }

    const ConstVectorView<E> p_;
    const T *a_;
    int32_t order_;
    std::ptrdiff_t elements_;
    int32_t degree_, powers_ = 1;
    Scratch<E> work_;
};

} // namespace

template <ElementType E>
ErrorCode EvaluateAtMatrix(ConstVectorView<E> p, const ConstMatrixView<E> &a,
                           const MatrixView<E> &y) {
    QX_EXPECTS(a.isSquare() && a.isWhole() && y.count() == a.count() && y.isWhole());
    return MatrixPolynomial<E>(p, a).evaluate(y.data());
}

template ErrorCode EvaluateAtMatrix(ConstRealVector, const ConstRealMatrix &, const RealMatrix &);
template ErrorCode EvaluateAtMatrix(ConstComplexVector, const ConstComplexMatrix &,
                                    const ComplexMatrix &);

} // namespace qx
