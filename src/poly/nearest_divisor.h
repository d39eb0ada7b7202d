#ifndef QX_POLY_NEAREST_DIVISOR_H
#define QX_POLY_NEAREST_DIVISOR_H

#include "frame/scratch.h"
#include "poly/common_divisor.h"
#include "poly/sylvester_matrices.h"
#include "qx/errors.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// The greatest common divisor u of polynomials near p and q: p = u v and q = u w, nearly. Degrees
// of u are tried in descending order, guided by the singular values of Sylvester matrices;
// Gauss-Newton steps then move u, v and w to where the products come nearest to p and q in the
// 2-norm, and u has the first degree for which both products are within the tolerance.
//
// CommonDivisor does the same for a monic polynomial and its derivative, with errors measured
// coefficient by coefficient.
class NearestDivisor {
public:
    // p and q have at least one coefficient each, in ascending order, all finite and the last one
    // not 0. The tolerance is above 0. ErrOutOfMemory.
    ErrorCode find(ConstComplexVector p, ConstComplexVector q, double tolerance);

    // Descending coefficients.
    int32_t degree() const { return degree_; }
    const CDB *divisor() const { return u(); }
    int32_t cofactorDegree() const { return isSwapped_ ? m_ - degree_ : n_ - degree_; }
    const CDB *cofactorOfQ() const { return isSwapped_ ? v() : w(); }
    // The larger of |p - u v| / |p| and |q - u w| / |q|.
    double distance() const { return distance_; }

private:
    ErrorCode assign(ConstComplexVector p, ConstComplexVector q);
    ErrorCode search(double tolerance);
    ErrorCode tryDegree(int32_t degree);
    ErrorCode firstGuess();
    ErrorCode refine();
    void setUpStep();
    double residual();

    CDB *p() const { return inputs_.data(); }
    CDB *q() const { return p() + (m_ + 1); }
    CDB *u() const { return unknowns_.data(); }
    CDB *v() const { return u() + (degree_ + 1); }
    CDB *w() const { return v() + (m_ - degree_ + 1); }
    int32_t unknowns() const { return m_ + n_ - degree_ + 3; }

    bool isSwapped_ = false;
    int32_t m_ = 0, n_ = 0, degree_ = 0; // m >= n: degrees of the longer and the shorter one
    double distance_ = 0.0;
    ComplexVector inputs_, unknowns_, step_;
    Scratch<ElementType::CDB> direction_;
    ScratchParts memory_;
    SylvesterMatrices sylvester_;
    LeastSquaresSystem system_;
};

} // namespace qx

#endif
