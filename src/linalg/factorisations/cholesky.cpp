#include "linalg/factorisations/cholesky.h"

#include "frame/scratch.h"
#include "linalg/kernels.h"
#include "linalg/products/ordered.h"

#include <algorithm>
#include <cmath>
#include <cstring>

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

// Column j of the inverse of a lower triangle solves l x = e_j, so it needs only the columns from j
// on, which have not been overwritten yet.
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

// The factor's columns as the rows of an upper triangle. In packed form the rows are factored one
// by one; in a square matrix they are halved until only a few are left, so that nearly all terms
// are subtracted in products of blocks. Either way the terms of one element are subtracted in
// ascending order.
constexpr int32_t fewRows = 48;
constexpr int32_t worthBlocks = 112;
constexpr int32_t worthLanes = 8; // of quotients
constexpr int32_t strip = 96;     // rows in a product; its part left of the diagonal is not used

// Rows of n elements, of which row k counts from element k on; and how they are stored.
template <ElementType E>
struct PackedRows {
    ElementOf<E> *packed;
    int32_t n;
    static constexpr std::ptrdiff_t change = 1; // of the step from row to row

    ElementOf<E> *operator()(int32_t j) const { return LowerColumn<E>(packed, n, j); }
    std::ptrdiff_t step(int32_t j) const { return std::ptrdiff_t{n} - 1 - j; }
};
template <ElementType E>
struct SquareRows {
    MatrixView<E> matrix;
    static constexpr std::ptrdiff_t change = 0;

    ElementOf<E> *operator()(int32_t j) const { return matrix.row(j); }
    std::ptrdiff_t step(int32_t) const { return matrix.stride(); }
};

template <ElementType E, class Rows>
class Factorisation {
public:
    Factorisation(const Rows &rows, int32_t n) : row_(rows), n_(n) {}

    ErrorCode runOneByOne() { return factorOneByOne(0, n_) ? status_ : ErrNotPositiveDefinite; }
    ErrorCode runByHalves() { return factorByHalves(0, n_) ? status_ : ErrNotPositiveDefinite; }

private:
    // Returns false if a pivot is not above 0.
    bool factorOneByOne(int32_t first, int32_t end) {
        for (int32_t k = first; k < end; ++k) {
            if (k > first)
                subtractRows(first, k);
            if (!divide(k))
                return false;
        }
        return true;
    }
    // Those from `first` on in row k.
    void subtractRows(int32_t first, int32_t k) {
        ElementOf<E> *const row = row_(k) + k, *const above = row_(first) + k;
        const std::ptrdiff_t step = row_.step(first);
        if constexpr (E == ElementType::DBL)
            SubtractRowsAboveReal(row, n_ - k, above, step, row_.change, k - first);
        else
            SubtractRowsAboveComplex(row, n_ - k, above, step, row_.change, k - first);
    }
    bool factorByHalves(int32_t first, int32_t end) {
        if (end - first <= fewRows)
            return factorOneByOne(first, end);
        const int32_t middle = first + (end - first) / 2;
        if (!factorByHalves(first, middle))
            return false;
        for (int32_t top = middle; top < end; top += strip)
            subtractTerms(first, middle, top, std::min(end - top, strip));
        return factorByHalves(middle, end);
    }

    // Subtracts the terms of rows `first` to `middle` from `rows` rows from `top` on.
    void subtractTerms(int32_t first, int32_t middle, int32_t top, int32_t rows) {
        ElementOf<E> *const from = row_(first) + top, *const to = row_(top) + top;
        if constexpr (E == ElementType::DBL)
            AddProductReal(rows, n_ - top, middle - first, {-1.0}, {from, 1, n_}, {from, n_, 1}, to,
                           n_);
        else
            AddProductComplex(rows, n_ - top, middle - first, {-1.0, 0.0}, {from, 1, n_, true},
                              {from, n_, 1, false}, to, n_);
    }

    // Returns the largest modulus of the quotients.
    static double divideRow(ElementOf<E> *row, int32_t count, double divisor) {
        if constexpr (E == ElementType::DBL)
            if (count >= worthLanes)
                return DivideRow(row, count, divisor);
        double largest = 0.0;
        for (int32_t i = 0; i < count; ++i) {
            row[i] = row[i] / divisor;
            largest = std::max(largest, Modulus(row[i]));
        }
        return largest;
    }
    // Divides row k, whose terms have all been subtracted, by the root of its pivot.
    bool divide(int32_t k) {
        ElementOf<E> *const row = row_(k);
        const double pivot = RealPart(row[k]);
        if (!(pivot > 0.0))
            return false;
        const double root = std::sqrt(pivot);
        row[k] = ScalarOf<E>::Of(root);
        const double least = std::min(least_, root);
        const double largest =
            std::max(std::max(largest_, root), divideRow(row + k + 1, n_ - k - 1, root));
        if (least < 0x1p-26 * largest)
            status_ = ErrNotPositiveDefinite;
        least_ = least;
        largest_ = largest;
        return true;
    }

    Rows row_;
    int32_t n_;
    double largest_ = 0.0, least_ = HUGE_VAL;
    ErrorCode status_ = 0;
};
} // namespace

template <ElementType E>
ErrorCode PackedCholesky(VectorView<E> triangle, int32_t n) {
    QX_EXPECTS(triangle.size() >= PackedLength(n));
    ElementOf<E> *const packed = triangle.data();
    MatrixView<E> rows;
    ScratchParts memory;
    if (n < worthBlocks || memory.take(Sized(rows, n, n)) != 0)
        return Factorisation<E, PackedRows<E>>({packed, n}, n).runOneByOne();
    std::memset(rows.data(), 0, sizeof(ElementOf<E>) * static_cast<std::size_t>(rows.count()));
    const auto copy = [n](int32_t j, ElementOf<E> *to, const ElementOf<E> *from) {
        std::memcpy(to + j, from + j, sizeof(ElementOf<E>) * static_cast<std::size_t>(n - j));
    };
    for (int32_t j = 0; j < n; ++j)
        copy(j, rows.row(j), LowerColumn<E>(packed, n, j));
    const ErrorCode status = Factorisation<E, SquareRows<E>>({rows}, n).runByHalves();
    for (int32_t j = 0; j < n; ++j)
        copy(j, LowerColumn<E>(packed, n, j), rows.row(j));
    return Merge(status, memory.release());
}

template <ElementType E>
ErrorCode InvertFromCholesky(VectorView<E> triangle, int32_t n) {
    QX_EXPECTS(triangle.size() >= PackedLength(n));
    ElementOf<E> *const packed = triangle.data();
    for (int32_t j = 0; j < n; ++j)
        if (AbsSum(LowerColumn<E>(packed, n, j)[j]) == 0.0)
            return ErrSingularMatrix;
    InvertLower<E>(packed, n);
    // Element (i, j) of x^H x reads rows from i on of columns i and j, which have not been
    // overwritten yet.
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
