#include "linalg/properties/definiteness.h"

#include "linalg/eigenproblems/symmetric.h"

#include <algorithm>

namespace qx {

namespace {

template <ElementType E>
double LargestModulus(ConstVectorView<E> x) {
    double largest = 0.0;
    for (const ElementOf<E> &element : x)
        largest = std::max(largest, Modulus(element));
    return largest;
}

// Whether all pairs agree within the limit, where the element above the diagonal is compared as it
// is or conjugated.
template <ElementType E>
bool PairsAgree(const ConstMatrixView<E> &a, double limit, bool hermitian) {
    for (int32_t i = 0; i < a.rows(); ++i)
        for (int32_t j = hermitian ? i : i + 1; j < a.cols(); ++j) {
            const auto mirror = a(j, i);
            if (Modulus(a(i, j) - (hermitian ? Conj(mirror) : mirror)) > limit)
                return false;
        }
    return true;
}

template <ElementType E>
bool IsExactlyHermitian(const ConstMatrixView<E> &a) {
    for (int32_t i = 0; i < a.rows(); ++i) {
        if (!(ImagPart(a(i, i)) == 0.0))
            return false;
        for (int32_t j = i + 1; j < a.cols(); ++j) {
            const auto mirror = Conj(a(j, i));
            if (!(RealPart(a(i, j)) == RealPart(mirror) && ImagPart(a(i, j)) == ImagPart(mirror)))
                return false;
        }
    }
    return true;
}

// The state of the elimination: the block from `first` on remains.
template <ElementType E>
class Elimination {
public:
    explicit Elimination(const MatrixView<E> &a) : a_(a), n_(a.rows()) {}

    // The index of the largest remaining diagonal element, or -1 if one is below the limit.
    int32_t largestDiagonal(int32_t first, double lowest) const {
        int32_t largest = first;
        for (int32_t i = first; i < n_; ++i) {
            if (RealPart(a_(i, i)) < lowest)
                return -1;
            if (RealPart(a_(i, i)) > RealPart(a_(largest, largest)))
                largest = i;
        }
        return largest;
    }
    double diagonal(int32_t i) const { return RealPart(a_(i, i)); }

    void exchange(int32_t i, int32_t j) {
        for (int32_t k = 0; i != j && k < n_; ++k)
            Swap(&a_(i, k), &a_(j, k));
        for (int32_t k = 0; i != j && k < n_; ++k)
            Swap(&a_(k, i), &a_(k, j));
    }
    void eliminate(int32_t k) {
        for (int32_t i = k + 1; i < n_; ++i) {
            const auto factor = a_(i, k) / a_(k, k);
            for (int32_t j = k + 1; j < n_; ++j)
                a_(i, j) = a_(i, j) - factor * a_(k, j);
        }
    }
    bool vanishes(int32_t first, double limit) const {
        for (int32_t i = first; i < n_; ++i)
            for (int32_t j = first; j < n_; ++j)
                if (Modulus(a_(i, j)) > limit)
                    return false;
        return true;
    }

private:
    MatrixView<E> a_;
    int32_t n_;
};

} // namespace

template <ElementType E>
ErrorCode CheckSymmetric(const ConstMatrixView<E> &a, double tolerance, bool relative,
                         bool hermitian, int32_t *isSymmetric) {
    QX_EXPECTS(a.isSquare() && !a.isEmpty());
    if (!AllFinite<E>(a))
        return ErrNonFiniteInput;
    double limit = tolerance > 0.0 ? tolerance : 0.0;
    if (relative) {
        const double largest = LargestModulus<E>(a.elements());
        const int32_t n = a.rows();
        limit = tolerance < 0.0 ? largest * (n * epsilon) : (tolerance * n) * largest;
    }
    *isSymmetric = PairsAgree<E>(a, limit, hermitian);
    return 0;
}

template <ElementType E>
ErrorCode CheckPositiveDefinite(const ConstMatrixView<E> &a, int32_t *isDefinite) {
    QX_EXPECTS(a.isSquare() && !a.isEmpty());
    *isDefinite = 0;
    if (!IsExactlyHermitian<E>(a))
        return 0;
    const int32_t n = a.rows();
    RealVector values;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(values, n)))
        return failed;
    if (const ErrorCode failed = SymmetricEigen<E>(a, values, {}))
        return failed;
    const double limit = std::max(std::fabs(values[0]), std::fabs(values[n - 1])) * epsilon;
    for (const DBL &value : values)
        if (!(value > limit))
            return 0;
    *isDefinite = 1;
    return 0;
}

template <ElementType E>
ErrorCode CheckPositiveSemiDefinite(const ConstMatrixView<E> &a, double tolerance,
                                    int32_t *isSemiDefinite, int32_t *rank) {
    QX_EXPECTS(a.isSquare() && !a.isEmpty());
    *isSemiDefinite = 0;
    *rank = -1;
    if (!AllFinite<E>(a))
        return ErrNonFiniteInput;
    const int32_t n = a.rows();
    MatrixView<E> copy;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(copy, n, n)))
        return failed;
    CopyMatrix<E>(a, copy);
    Elimination<E> rest(copy);

    const int32_t start = rest.largestDiagonal(0, 0.0);
    if (start < 0)
        return 0;
    const double limit = rest.diagonal(start) * (tolerance < 0.0 ? n * epsilon : tolerance);
    if (!PairsAgree<E>(a, limit, true))
        return 0;
    for (int32_t k = 0; k < n; ++k) {
        const int32_t pivot = rest.largestDiagonal(k, -limit);
        if (pivot < 0)
            return 0;
        if (!(rest.diagonal(pivot) > limit)) {
            *isSemiDefinite = rest.vanishes(k, limit);
            *rank = *isSemiDefinite != 0 ? k : -1;
            return 0;
        }
        rest.exchange(k, pivot);
        rest.eliminate(k);
    }
    *isSemiDefinite = 1;
    *rank = n;
    return 0;
}

template ErrorCode CheckSymmetric(const ConstRealMatrix &, double, bool, bool, int32_t *);
template ErrorCode CheckSymmetric(const ConstComplexMatrix &, double, bool, bool, int32_t *);
template ErrorCode CheckPositiveDefinite(const ConstRealMatrix &, int32_t *);
template ErrorCode CheckPositiveDefinite(const ConstComplexMatrix &, int32_t *);
template ErrorCode CheckPositiveSemiDefinite(const ConstRealMatrix &, double, int32_t *, int32_t *);
template ErrorCode CheckPositiveSemiDefinite(const ConstComplexMatrix &, double, int32_t *,
                                             int32_t *);

} // namespace qx
