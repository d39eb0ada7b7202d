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

// The Sylvester matrices of p, of degree m, and q, of degree n <= m, by descending degree n - s of
// a common divisor, s = 0, 1, ...: p = u v and q = u w mean that q v - p w = 0. The columns are the
// coefficients of q x^(m - n - 1) ... q by descending index, then those of q and p alternately:
// those of step s are columns m - n + 2 s and the next. Each matrix is the previous one with two
// more columns and one more row, so a single QR factorisation is extended.
class SylvesterMatrices {
public:
    // Allocates memory for up to this many rows and columns; step s has m + s + 1 and m - n + 2 (s
    // + 1).
    ErrorCode allocate(int64_t rows, int64_t columns);
    // p and q are not copied and must outlive this.
    void begin(const CDB *p, int32_t m, const CDB *q, int32_t n);
    // Goes to the matrix of step 0 at the first call, then to the next.
    void advance();
    // An estimate from above. It leaves the singular vector, v[0] ... v[m - n - 1], then v and -w
    // alternately, in singularVector().
    double smallestSingularValue();
    const CDB *singularVector() const { return vectors_.data(); }
    int32_t columns() const { return columns_; }

private:
    CDB *column(std::ptrdiff_t j) const { return &matrix_[j * rowCapacity_]; }
    void fillColumn(CDB *added, const CDB *a, int32_t degree, int32_t shift) const;
    // Applies the reflectors from j on to the next column, and forms its own reflector.
    void finishColumn(std::ptrdiff_t j, int32_t rows);
    // Applies all reflectors so far to the next two columns.
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

// The inner loops, with the order of arithmetic of the formulas.

// x[j] -= c[j] factors[r] for four columns c, one after the other; column r is at columns - r stride.
QX_BY_WIDTH(void, SubtractFourColumns,
            (const CDB *columns, std::ptrdiff_t stride, const CDB *factors, std::ptrdiff_t n,
             CDB *x))
// sums[r] -= conj(c[j]) y[j] for j = 0 to n - 1 and four columns c; column r is at columns + r stride.
QX_BY_WIDTH(void, SubtractAdjointProducts,
            (const CDB *columns, std::ptrdiff_t stride, const CDB *y, std::ptrdiff_t n, CDB *sums))
// For two vectors k = 0, 1, whose elements i are x[i] = pairs[2 i + k]: sums[k] +=
// conj(reflector[i]) x[i].
QX_BY_WIDTH(void, AddAdjointProducts,
            (const CDB *reflector, std::ptrdiff_t n, const CDB *pairs, CDB *sums))
// x[i] -= reflector[i] factors[k], and then sums[k] += conj(next[i]) x[i].
QX_BY_WIDTH(void, ReflectPairs,
            (const CDB *reflector, const CDB *factors, const CDB *next, std::ptrdiff_t n,
             CDB *pairs, CDB *sums))

// a[i] -= factor a[i - 1] for i = count to 1, in this order.
QX_BY_WIDTH(void, SubtractShifted, (CDB factor, int32_t count, CDB *a))

// y[k] -= factor x[k] for k = 0 to n - 1.
QX_BY_WIDTH(void, SubtractMultiple, (CDB factor, std::ptrdiff_t n, const CDB *x, CDB *y))

} // namespace qx

#endif
