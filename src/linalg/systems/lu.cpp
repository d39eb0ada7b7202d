#include "linalg/systems/lu.h"

#include "frame/scratch.h"
#include "linalg/matrix.h"
#include "linalg/products/ordered.h"
#include "linalg/systems/substitution.h"

#include <cstring>

namespace qx {

namespace {

// The factorisation halves the columns until they are few, so that nearly all terms are subtracted
// in products of blocks (S. Toledo, "Locality of reference in LU decomposition with partial
// pivoting", 1997). Those of one element are subtracted in ascending order all the same.
constexpr int32_t fewColumns = 16;
constexpr int32_t fewRows = 4;

void SubtractTerms(std::ptrdiff_t m, std::ptrdiff_t n, std::ptrdiff_t k, const DBL *a, const DBL *b,
                   DBL *c, std::ptrdiff_t stride) {
    SubtractProduct(m, n, k, a, stride, b, stride, c, stride);
}
void SubtractTerms(std::ptrdiff_t m, std::ptrdiff_t n, std::ptrdiff_t k, const CDB *a, const CDB *b,
                   CDB *c, std::ptrdiff_t stride) {
    CxSubtractProduct(m, n, k, a, stride, b, stride, c, stride);
}

template <ElementType E>
class Factorisation {
    typedef typename Element<E>::type T;

public:
    Factorisation(T *a, int32_t m, int32_t n, I32 *pivots) : a_(a), m_(m), n_(n), pivots_(pivots) {}

    ErrorCode run(int32_t *parity) {
        const int32_t steps = m_ < n_ ? m_ : n_;
        for (int32_t k = 0; k < m_; ++k)
            pivots_[k] = k;
        factorColumns(0, steps);
        if (steps < n_)
            updateRight(0, steps, n_);
        *parity = parity_;
        return status_;
    }

private:
    T *row(int32_t i) const { return a_ + std::ptrdiff_t{i} * n_; }

    // The columns from `first` to `end`, from which the terms of the columns left of them have been
    // subtracted.
    void factorColumns(int32_t first, int32_t end) {
        if (end - first <= fewColumns) {
            for (int32_t k = first; k < end; ++k)
                eliminate(k, end);
            return;
        }
        const int32_t middle = first + (end - first) / 2;
        factorColumns(first, middle);
        updateRight(first, middle, end);
        factorColumns(middle, end);
    }

    // Column k, whose terms have all been subtracted: pivot, division, and the terms of column k in
    // the columns right of it up to `end`.
    void eliminate(int32_t k, int32_t end) {
        const int32_t p = pivotRow(k);
        if (p < 0)
            status_ = WarnSingular;
        else if (p != k)
            exchange(k, p);
        for (int32_t i = k + 1; i < m_; ++i) {
            if (p >= 0)
                row(i)[k] = row(i)[k] / row(k)[k];
            const auto factor = row(i)[k];
            for (int32_t j = k + 1; j < end; ++j)
                row(i)[j] = row(i)[j] - factor * row(k)[j];
        }
    }

    int32_t pivotRow(int32_t k) const {
        double best = 0.0;
        int32_t p = -1;
        for (int32_t i = k; i < m_; ++i) {
            const double size = Modulus(row(i)[k]);
            if (size > best) {
                best = size;
                p = i;
            }
        }
        return p;
    }

    void exchange(int32_t k, int32_t p) {
        for (int32_t j = 0; j < n_; ++j) {
            const auto held = row(k)[j];
            row(k)[j] = row(p)[j];
            row(p)[j] = held;
        }
        pivots_[k] = p;
        parity_ ^= 1;
    }

    // Subtracts the terms of the columns from `first` to `middle`, which are done, from the columns
    // up to `end`: first in their own rows, which need each other, then in all rows below.
    void updateRight(int32_t first, int32_t middle, int32_t end) {
        const int32_t cols = end - middle;
        updateRows(first, middle, middle, cols);
        SubtractTerms(m_ - middle, cols, middle - first, row(middle) + first, row(first) + middle,
                      row(middle) + middle, n_);
    }
    void updateRows(int32_t first, int32_t end, int32_t col, int32_t cols) {
        if (end - first <= fewRows) {
            for (int32_t i = first + 1; i < end; ++i)
                for (int32_t k = first; k < i; ++k) {
                    const auto factor = row(i)[k];
                    for (int32_t j = col; j < col + cols; ++j)
                        row(i)[j] = row(i)[j] - factor * row(k)[j];
                }
            return;
        }
        const int32_t middle = first + (end - first) / 2;
        updateRows(first, middle, col, cols);
        SubtractTerms(end - middle, cols, middle - first, row(middle) + first, row(first) + col,
                      row(middle) + col, n_);
        updateRows(middle, end, col, cols);
    }

    T *a_;
    int32_t m_, n_;
    I32 *pivots_;
    ErrorCode status_ = 0;
    int32_t parity_ = 0;
};

template <ElementType E>
void Exchange(typename Element<E>::type *x, const I32 *pivots, int32_t n, int32_t rightSides) {
    typedef typename Element<E>::type T;
    for (int32_t k = 0; k < n; ++k) {
        const int32_t p = pivots[k];
        if (p == k)
            continue;
        for (int32_t j = 0; j < rightSides; ++j) {
            T *const upper = x + std::ptrdiff_t{k} * rightSides + j;
            T *const lower = x + std::ptrdiff_t{p} * rightSides + j;
            const T held = *upper;
            *upper = *lower;
            *lower = held;
        }
    }
}

template <ElementType E>
ErrorCode Solve(const typename Element<E>::type *lu, const I32 *pivots,
                const typename Element<E>::type *b, int32_t n, int32_t rightSides,
                typename Element<E>::type *x) {
    for (int32_t k = 0; k < n; ++k)
        if (pivots[k] < 0 || pivots[k] >= n)
            return ErrIndexOutOfRange;
    if (x != b)
        std::memmove(x, b, sizeof *b * static_cast<std::size_t>(n) * rightSides);
    Exchange<E>(x, pivots, n, rightSides);
    return Substitute(Factors::lu, lu, n, rightSides, x);
}

template <ElementType E>
ErrorCode FactorCopy(const typename Element<E>::type *a, int32_t n, Scratch<E> &lu,
                     Scratch<ElementType::I32> &pivots) {
    const int64_t count = int64_t{n} * n;
    if (const ErrorCode failed = lu.allocate(count))
        return failed;
    if (const ErrorCode failed = pivots.allocate(n))
        return failed;
    std::memcpy(lu.data(), a, static_cast<std::size_t>(count) * sizeof *a);
    int32_t parity;
    return LUDecompose(lu.data(), n, n, pivots.data(), &parity) == 0 ? 0 : ErrSingularMatrix;
}

template <ElementType E>
ErrorCode SolveWithCopy(const typename Element<E>::type *a, int32_t n,
                        const typename Element<E>::type *b, typename Element<E>::type *x) {
    Scratch<E> lu;
    Scratch<ElementType::I32> pivots;
    if (const ErrorCode failed = FactorCopy<E>(a, n, lu, pivots))
        return failed;
    return LUSolve(lu.data(), pivots.data(), b, n, 1, x);
}

// All columns of the unit matrix are solved for at once.
template <ElementType E>
ErrorCode Invert(const typename Element<E>::type *lu, const I32 *pivots, int32_t n,
                 typename Element<E>::type *out) {
    for (int32_t i = 0; i < n; ++i)
        for (int32_t j = 0; j < n; ++j)
            out[std::ptrdiff_t{i} * n + j] = ScalarOf<E>::Of(i == j ? 1.0 : 0.0);
    return LUSolve(lu, pivots, out, n, n, out);
}

template <ElementType E>
ErrorCode InvertCopy(const typename Element<E>::type *a, int32_t n,
                     typename Element<E>::type *out) {
    Scratch<E> lu;
    Scratch<ElementType::I32> pivots;
    if (const ErrorCode failed = FactorCopy<E>(a, n, lu, pivots))
        return failed;
    return Invert<E>(lu.data(), pivots.data(), n, out);
}

template <ElementType E>
ErrorCode InvertInPlace(typename Element<E>::type *lu, const I32 *pivots, int32_t n) {
    const int64_t count = int64_t{n} * n;
    Scratch<E> copy;
    if (const ErrorCode failed = copy.allocate(count))
        return failed;
    std::memcpy(copy.data(), lu, static_cast<std::size_t>(count) * sizeof *lu);
    return Invert<E>(copy.data(), pivots, n, lu);
}

} // namespace

ErrorCode LUDecompose(DBL *a, int32_t m, int32_t n, I32 *pivots, int32_t *parity) {
    return Factorisation<ElementType::DBL>(a, m, n, pivots).run(parity);
}
ErrorCode LUDecompose(CDB *a, int32_t m, int32_t n, I32 *pivots, int32_t *parity) {
    return Factorisation<ElementType::CDB>(a, m, n, pivots).run(parity);
}
ErrorCode LUSolve(const DBL *lu, const I32 *pivots, const DBL *b, int32_t n, int32_t rightSides,
                  DBL *x) {
    return Solve<ElementType::DBL>(lu, pivots, b, n, rightSides, x);
}
ErrorCode LUSolve(const CDB *lu, const I32 *pivots, const CDB *b, int32_t n, int32_t rightSides,
                  CDB *x) {
    return Solve<ElementType::CDB>(lu, pivots, b, n, rightSides, x);
}
ErrorCode SolveByLU(const DBL *a, int32_t n, const DBL *b, DBL *x) {
    return SolveWithCopy<ElementType::DBL>(a, n, b, x);
}
ErrorCode SolveByLU(const CDB *a, int32_t n, const CDB *b, CDB *x) {
    return SolveWithCopy<ElementType::CDB>(a, n, b, x);
}
ErrorCode InvertByLU(const DBL *a, int32_t n, DBL *out) {
    return InvertCopy<ElementType::DBL>(a, n, out);
}
ErrorCode InvertByLU(const CDB *a, int32_t n, CDB *out) {
    return InvertCopy<ElementType::CDB>(a, n, out);
}
ErrorCode InvertFactors(DBL *lu, const I32 *pivots, int32_t n) {
    return InvertInPlace<ElementType::DBL>(lu, pivots, n);
}
ErrorCode InvertFactors(CDB *lu, const I32 *pivots, int32_t n) {
    return InvertInPlace<ElementType::CDB>(lu, pivots, n);
}

} // namespace qx
