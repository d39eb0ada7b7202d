#include "linalg/properties/definiteness.h"

#include "frame/scratch.h"
#include "linalg/eigenproblems/symmetric.h"
#include "linalg/matrix.h"

#include <cstring>

namespace qx {

namespace {

template <ElementType E>
double LargestModulus(const ElementOf<E> *a, int64_t count) {
    double largest = 0.0;
    for (int64_t i = 0; i < count; ++i) {
        const double size = Modulus(a[i]);
        largest = size > largest ? size : largest;
    }
    return largest;
}

// Whether all pairs agree within the limit, the element beyond the diagonal being compared as it is
// or conjugated.
template <ElementType E>
bool PairsAgree(const ElementOf<E> *a, std::ptrdiff_t n, double limit, bool hermitian) {
    for (std::ptrdiff_t i = 0; i < n; ++i)
        for (std::ptrdiff_t j = hermitian ? i : i + 1; j < n; ++j) {
            const auto mirror = a[j * n + i];
            if (Modulus(a[i * n + j] - (hermitian ? Conj(mirror) : mirror)) > limit)
                return false;
        }
    return true;
}

template <ElementType E>
ErrorCode Symmetric(const ElementOf<E> *a, int32_t n, double tolerance, int32_t relative,
                    int32_t hermitian, int32_t *isSymmetric) {
    *isSymmetric = 0;
    if (n < 1)
        return ErrEmptyInput;
    const int64_t count = int64_t{n} * n;
    if (CheckFinite(a, count) != 0)
        return ErrNonFiniteInput;
    double limit = tolerance > 0.0 ? tolerance : 0.0;
    if (relative != 0) {
        const double largest = LargestModulus<E>(a, count);
        limit = tolerance < 0.0 ? largest * (n * epsilon) : (tolerance * n) * largest;
    }
    *isSymmetric = PairsAgree<E>(a, n, limit, hermitian != 0);
    return 0;
}

// NaN counts as a difference.
template <ElementType E>
bool IsExactlyHermitian(const ElementOf<E> *a, std::ptrdiff_t n) {
    for (std::ptrdiff_t i = 0; i < n; ++i) {
        if (!(ImagPart(a[i * n + i]) == 0.0))
            return false;
        for (std::ptrdiff_t j = i + 1; j < n; ++j) {
            const auto mirror = Conj(a[j * n + i]);
            if (!(RealPart(a[i * n + j]) == RealPart(mirror) &&
                  ImagPart(a[i * n + j]) == ImagPart(mirror)))
                return false;
        }
    }
    return true;
}

template <ElementType E>
ErrorCode Definite(const ElementOf<E> *a, int32_t n, int32_t *isDefinite) {
    *isDefinite = 0;
    if (!IsExactlyHermitian<E>(a, n))
        return 0;
    Scratch<ElementType::DBL> values;
    if (const ErrorCode failed = values.allocate(n))
        return failed;
    if (const ErrorCode failed = SymmetricEigen(a, n, 0, values.data(), nullptr))
        return failed;
    const double first = std::fabs(values[0]), last = std::fabs(values[n - 1]);
    const double limit = (first > last ? first : last) * epsilon;
    for (int32_t i = 0; i < n; ++i)
        if (!(values[i] > limit))
            return 0;
    *isDefinite = 1;
    return 0;
}

// The state of the elimination: the block from `first` on is what is left.
template <ElementType E>
class Elimination {
    typedef ElementOf<E> T;

public:
    Elimination(T *a, int32_t n) : a_(a), n_(n) {}

    // The index of the largest diagonal element that is left, or -1 where one is below the limit.
    int32_t largestDiagonal(int32_t first, double lowest) const {
        int32_t largest = first;
        for (int32_t i = first; i < n_; ++i) {
            if (RealPart(at(i, i)) < lowest)
                return -1;
            if (RealPart(at(i, i)) > RealPart(at(largest, largest)))
                largest = i;
        }
        return largest;
    }
    double diagonal(int32_t i) const { return RealPart(at(i, i)); }

    void exchange(int32_t i, int32_t j) {
        for (int32_t k = 0; i != j && k < n_; ++k)
            Swap(&at(i, k), &at(j, k));
        for (int32_t k = 0; i != j && k < n_; ++k)
            Swap(&at(k, i), &at(k, j));
    }
    void eliminate(int32_t k) {
        for (int32_t i = k + 1; i < n_; ++i) {
            const auto factor = at(i, k) / at(k, k);
            for (int32_t j = k + 1; j < n_; ++j)
                at(i, j) = at(i, j) - factor * at(k, j);
        }
    }
    bool vanishes(int32_t first, double limit) const {
        for (int32_t i = first; i < n_; ++i)
            for (int32_t j = first; j < n_; ++j)
                if (Modulus(at(i, j)) > limit)
                    return false;
        return true;
    }

private:
    T &at(int32_t i, int32_t j) const { return a_[std::ptrdiff_t{i} * n_ + j]; }
    T *a_;
    int32_t n_;
};

template <ElementType E>
ErrorCode SemiDefinite(const ElementOf<E> *a, int32_t n, double tolerance, int32_t *isSemiDefinite,
                       int32_t *rank) {
    *isSemiDefinite = 0;
    *rank = -1;
    if (n < 1)
        return ErrEmptyInput;
    const int64_t count = int64_t{n} * n;
    if (CheckFinite(a, count) != 0)
        return ErrNonFiniteInput;
    Scratch<E> copy;
    if (const ErrorCode failed = copy.allocate(count))
        return failed;
    std::memcpy(copy.data(), a, static_cast<std::size_t>(count) * sizeof *a);
    Elimination<E> rest(copy.data(), n);

    const int32_t start = rest.largestDiagonal(0, 0.0);
    if (start < 0)
        return 0;
    const double limit = rest.diagonal(start) * (tolerance < 0.0 ? n * epsilon : tolerance);
    if (!PairsAgree<E>(a, n, limit, true))
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

} // namespace

ErrorCode CheckSymmetric(const DBL *a, int32_t n, double tolerance, int32_t relative,
                         int32_t *isSymmetric) {
    return Symmetric<ElementType::DBL>(a, n, tolerance, relative, 0, isSymmetric);
}
ErrorCode CheckSymmetric(const CDB *a, int32_t n, double tolerance, int32_t relative,
                         int32_t hermitian, int32_t *isSymmetric) {
    return Symmetric<ElementType::CDB>(a, n, tolerance, relative, hermitian, isSymmetric);
}

ErrorCode CheckPositiveDefinite(const DBL *a, int32_t n, int32_t *isDefinite) {
    return Definite<ElementType::DBL>(a, n, isDefinite);
}
ErrorCode CheckPositiveDefinite(const CDB *a, int32_t n, int32_t *isDefinite) {
    return Definite<ElementType::CDB>(a, n, isDefinite);
}

ErrorCode CheckPositiveSemiDefinite(const DBL *a, int32_t n, double tolerance,
                                    int32_t *isSemiDefinite, int32_t *rank) {
    return SemiDefinite<ElementType::DBL>(a, n, tolerance, isSemiDefinite, rank);
}
ErrorCode CheckPositiveSemiDefinite(const CDB *a, int32_t n, double tolerance,
                                    int32_t *isSemiDefinite, int32_t *rank) {
    return SemiDefinite<ElementType::CDB>(a, n, tolerance, isSemiDefinite, rank);
}

} // namespace qx
