#ifndef QX_POLY_COMMON_DIVISOR_H
#define QX_POLY_COMMON_DIVISOR_H

#include "frame/scratch.h"
#include "linalg/scalar.h"
#include "poly/sylvester_matrices.h"
#include "qx/errors.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// A dense overdetermined system, solved in the least-squares sense.
class LeastSquaresSystem {
public:
    ErrorCode allocate(int64_t maxRows, int64_t maxCols);
    // Sets all elements to zero.
    void reset(int32_t rows, int32_t cols);

    CDB &at(std::ptrdiff_t row, std::ptrdiff_t col) const {
        return augmented_[row * width() + col];
    }
    CDB &right(std::ptrdiff_t row) const { return at(row, cols_); }
    void scaleRow(std::ptrdiff_t row, double factor);
    // Adds a[0..degree] to column col + s from row `row` + s on, for s = 0 to `shift`: this is the
    // matrix of the multiplication by the polynomial.
    void addProductBy(const CDB *a, int32_t degree, int32_t shift, int32_t row, int32_t col);

    // ErrNonFiniteInput, ErrOutOfMemory. Unknowns whose columns depend on others become NaN or
    // infinite.
    ErrorCode solve(CDB *x);

private:
    std::ptrdiff_t width() const { return cols_ + 1; }
    // The real parts as a matrix at the place of the triangle, if there are no others and no
    // product of two elements overflows.
    bool copyRealParts() const;
    template <ElementType E>
    ErrorCode solveWith(const ElementOf<E> *augmented, ElementOf<E> *triangle, CDB *x) const;

    ComplexVector augmented_, triangle_;
    ScratchParts memory_;
    std::ptrdiff_t rows_ = 0, cols_ = 0;
};

// The greatest common divisor of a monic polynomial p and its derivative, with descending
// coefficients: p = u v and p' / n = u w, nearly. Step k tests whether degree k is sufficient for
// v.
class CommonDivisor {
public:
    ErrorCode allocate(int32_t maxDegree);

    // p is not copied and must outlive this.
    void begin(const CDB *p, int32_t n, double tolerance);
    // Finds the smallest degree of v, up to `largest`, for which the errors of the coefficients of
    // the products are at most `tolerance`, relative to coefficients above 1 and absolute for
    // others. Degree n always qualifies, with u = 1. A search that found nothing may be continued
    // with a larger `largest`.
    ErrorCode search(int32_t largest);
    // A guess of the degree that the search finds, of n^2 operations: it says where to look first,
    // and decides nothing.
    int32_t likelyQuotientDegree();
    bool isFound() const { return quotientDegree_ >= 0; }
    int32_t quotientDegree() const { return quotientDegree_; }
    const CDB *divisor() const { return unknowns_.data(); } // u, of degree n - quotientDegree
    const CDB *quotient() const { return v(); }
    double error() const { return residual_; }

private:
    ErrorCode tryDegree(int32_t k, bool *isDivisor);
    ErrorCode firstGuess();
    ErrorCode refine();
    void setUpStep();
    double residual() const;
    static double weight(CDB coefficient);

    CDB *u() const { return unknowns_.data(); }
    CDB *v() const { return u() + (n_ - degree_ + 1); }
    CDB *w() const { return v() + (degree_ + 1); }

    int32_t n_ = 0, degree_ = 0, tried_ = 0;
    int32_t quotientDegree_ = -1;
    double tolerance_ = 0.0;
    double residual_ = 0.0;
    const CDB *p_ = nullptr;
    SylvesterMatrices sylvester_;
    ComplexVector slope_, unknowns_, step_;
    ScratchParts memory_;
    LeastSquaresSystem system_;
};

} // namespace qx

#endif
