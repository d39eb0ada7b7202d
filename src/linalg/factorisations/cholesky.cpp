#include "linalg/factorisations/cholesky.h"

#include "linalg/kernels.h"

#include <algorithm>
#include <cmath>

namespace qx {
namespace {

// Columns of packed triangles, so that column(j)[i] is element (i, j).
template <ElementType E>
ElementOf<E> *LowerColumn(ElementOf<E> *packed, int32_t n, int64_t j) {
    return packed + j * n - j * (j + 1) / 2;
}
template <ElementType E>
ElementOf<E> *UpperColumn(ElementOf<E> *packed, int64_t j) {
    return packed + j * (j + 1) / 2;
}

// y += factor x
template <ElementType E>
void AddMultiple(ElementOf<E> *y, typename ScalarOf<E>::type factor, const ElementOf<E> *x,
                 int32_t n) {
    const ElementOf<E> f = factor;
    AddOuterProduct<E>({y, 1, n}, {&f, 1}, {x, n});
}

// Column j of the inverse of a lower triangle solves l x = e_j, so it needs the columns from j on
// only, which still stand.
template <ElementType E>
void InvertLower(ElementOf<E> *packed, int32_t n) {
    for (int32_t j = 0; j < n; ++j) {
        ElementOf<E> *const x = LowerColumn<E>(packed, n, j);
        x[j] = ScalarOf<E>::Of(1.0) / x[j];
        for (int32_t i = j + 1; i < n; ++i)
            x[i] = -(x[i] * x[j]);
        for (int32_t k = j + 1; k < n; ++k) {
            const ElementOf<E> *const column = LowerColumn<E>(packed, n, k);
            x[k] = x[k] / column[k];
            AddMultiple<E>(x + k + 1, -x[k], column + k + 1, n - k - 1);
        }
    }
}
template <ElementType E>
void InvertUpper(ElementOf<E> *packed, int32_t n) {
    for (int32_t j = n - 1; j >= 0; --j) {
        ElementOf<E> *const x = UpperColumn<E>(packed, j);
        x[j] = ScalarOf<E>::Of(1.0) / x[j];
        for (int32_t i = 0; i < j; ++i)
            x[i] = -(x[i] * x[j]);
        for (int32_t k = j - 1; k >= 0; --k) {
            const ElementOf<E> *const column = UpperColumn<E>(packed, k);
            x[k] = x[k] / column[k];
            AddMultiple<E>(x, -x[k], column, k);
        }
    }
}

} // namespace

template <ElementType E>
ErrorCode PackedCholesky(VectorView<E> triangle, int32_t n) {
    QX_EXPECTS(triangle.size() >= PackedLength(n));
    ElementOf<E> *const packed = triangle.data();
    ErrorCode status = 0;
    double largest = 0.0, least = HUGE_VAL;
    for (int32_t k = 0; k < n; ++k) {
        ElementOf<E> *const column = LowerColumn<E>(packed, n, k);
        for (int32_t j = 0; j < k; ++j) {
            const ElementOf<E> *const before = LowerColumn<E>(packed, n, j);
            AddMultiple<E>(column + k, -Conj(before[k]), before + k, n - k);
        }
        const double pivot = RealPart(column[k]);
        if (!(pivot > 0.0))
            return ErrNotPositiveDefinite;
        const double root = std::sqrt(pivot);
        column[k] = ScalarOf<E>::Of(root);
        least = std::min(least, root);
        largest = std::max(largest, root);
        for (int32_t i = k + 1; i < n; ++i) {
            column[i] = column[i] / root;
            largest = std::max(largest, Modulus(column[i]));
        }
        if (least < 0x1p-26 * largest)
            status = ErrNotPositiveDefinite;
    }
    return status;
}

template <ElementType E>
ErrorCode InvertFromCholesky(VectorView<E> triangle, int32_t n) {
    QX_EXPECTS(triangle.size() >= PackedLength(n));
    ElementOf<E> *const packed = triangle.data();
    for (int32_t j = 0; j < n; ++j)
        if (AbsSum(LowerColumn<E>(packed, n, j)[j]) == 0.0)
            return ErrSingularMatrix;
    InvertLower<E>(packed, n);
    // Element (i, j) of x^H x reads rows from i on of columns i and j, which still stand.
    for (int32_t j = 0; j < n; ++j) {
        ElementOf<E> *const column = LowerColumn<E>(packed, n, j);
        for (int32_t i = j; i < n; ++i) {
            const ElementOf<E> *const other = LowerColumn<E>(packed, n, i);
            auto sum = ScalarOf<E>::Of(0.0);
            for (int32_t k = i; k < n; ++k)
                sum += Conj(other[k]) * column[k];
            column[i] = sum;
        }
    }
    return 0;
}

template <ElementType E>
ErrorCode InvertTriangle(VectorView<E> elements, int32_t n, Triangle triangle) {
    QX_EXPECTS(elements.size() == PackedLength(n));
    QX_EXPECTS(triangle == lowerTriangle || triangle == upperTriangle);
    if (!AllFinite<E>(elements))
        return ErrNonFiniteInput;
    double largest = 0.0;
    for (const ElementOf<E> &element : elements)
        largest = std::max(largest, Modulus(element));
    ElementOf<E> *const packed = elements.data();
    const bool isUpper = triangle == upperTriangle;
    for (int32_t j = 0; j < n; ++j) {
        const ElementOf<E> *const column =
            isUpper ? UpperColumn<E>(packed, j) : LowerColumn<E>(packed, n, j);
        if (Modulus(column[j]) <= epsilon * largest)
            return ErrSingularMatrix;
    }
    isUpper ? InvertUpper<E>(packed, n) : InvertLower<E>(packed, n);
    return 0;
}

template ErrorCode PackedCholesky(RealVector, int32_t);
template ErrorCode PackedCholesky(ComplexVector, int32_t);
template ErrorCode InvertFromCholesky(RealVector, int32_t);
template ErrorCode InvertFromCholesky(ComplexVector, int32_t);
template ErrorCode InvertTriangle(RealVector, int32_t, Triangle);
template ErrorCode InvertTriangle(ComplexVector, int32_t, Triangle);

} // namespace qx
