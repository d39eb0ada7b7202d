#ifndef QX_POLY_SYLVESTER_MATRICES_H
#define QX_POLY_SYLVESTER_MATRICES_H

#include "frame/scratch.h"
#include "frame/widths.h"
#include "qx/errors.h"
#include "qx/types.h"

#include <cstddef>
#include <cstdint>

namespace qx {

// Coefficients descend here: a[0] belongs to the highest power.

double CoefficientNorm(const CDB *a, std::ptrdiff_t count);
// Coefficient i of the product of polynomials of these degrees.
CDB ProductAt(std::ptrdiff_t i, const CDB *a, std::ptrdiff_t degreeA, const CDB *b,
              std::ptrdiff_t degreeB);

// The Sylvester matrices of p, of degree m, and q, of degree n <= m, by falling degree n - s of a
// common divisor, s = 0, 1, ...: p = u v and q = u w mean that q v - p w = 0. The columns are the
// coefficients of q x^(m - n - 1) ... q by falling index, then of q and p by turns: those of step s
// are columns m - n + 2 s and the next. Each matrix is the one before with two columns and a row
// more, so one QR factorisation grows along.
class SylvesterMatrices {
public:
    // For up to so many rows and columns; step s has m + s + 1 and m - n + 2 (s + 1).
    ErrorCode allocate(int64_t rows, int64_t columns);
    // p and q stay where they are.
    void begin(const CDB *p, int32_t m, const CDB *q, int32_t n);
    // The matrix of step 0 at first, then of the next.
    void advance();
    // An estimate from above. The singular vector v[0] ... v[m - n - 1], then v and -w by turns, is
    // left in singularVector().
    double smallestSingularValue();
    const CDB *singularVector() const { return vectors_.data(); }
    int32_t columns() const { return columns_; }

private:
    CDB *column(std::ptrdiff_t j) const { return &matrix_[j * rowCapacity_]; }
    void fillColumn(CDB *added, const CDB *a, int32_t degree, int32_t shift) const;
    // Reflects the next column by the reflectors from j on, and has it make one of its own.
    void finishColumn(std::ptrdiff_t j, int32_t rows);
    // By all reflectors so far the next two columns.
    void reflectPair(int32_t rows);
    double pivot(std::ptrdiff_t i) const;
    void solveAdjoint(const CDB *x, CDB *y) const;
    void solveTriangle(CDB *x) const;

    std::ptrdiff_t rowCapacity_ = 0;
    const CDB *p_ = nullptr, *q_ = nullptr;
    int32_t m_ = 0, n_ = 0, step_ = 0, columns_ = 0;
    ComplexVector matrix_, vectors_, kappas_, pairs_;
    RealVector diagonal_;
    ScratchParts memory_;
};

// The inner loops, with the order of arithmetic of their plain text.

// x[j] -= c[j] factors[r] for four columns c, one after the other; column r is at columns - r stride.
QX_BY_WIDTH(void, SubtractFourColumns,
            (const CDB *columns, std::ptrdiff_t stride, const CDB *factors, std::ptrdiff_t n,
             CDB *x))
// sums[r] -= conj(c[j]) y[j] for j = 0 to n - 1 and four columns c; column r is at columns + r stride.
QX_BY_WIDTH(void, SubtractAdjointProducts,
            (const CDB *columns, std::ptrdiff_t stride, const CDB *y, std::ptrdiff_t n, CDB *sums))
// Of two vectors, whose elements i are pairs[2 i] and pairs[2 i + 1]: sums[k] += conj(reflector[i])
// x[i].
QX_BY_WIDTH(void, AddAdjointProducts,
            (const CDB *reflector, std::ptrdiff_t n, const CDB *pairs, CDB *sums))
// x[i] -= reflector[i] factors[k], and then sums[k] += conj(next[i]) x[i].
QX_BY_WIDTH(void, ReflectPairs,
            (const CDB *reflector, const CDB *factors, const CDB *next, std::ptrdiff_t n,
             CDB *pairs, CDB *sums))

} // namespace qx

#endif
