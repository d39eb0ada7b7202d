#ifndef QX_POLY_SIMPLE_ROOTS_H
#define QX_POLY_SIMPLE_ROOTS_H

#include "frame/scratch.h"
#include "qx/errors.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// Proofs that a polynomial is far from all polynomials with multiple roots, so that no common
// divisor of it and its derivative need be searched for.
class SimpleRootsProof {
public:
    ErrorCode allocate(int32_t maxDegree);

    // Whether the approximations of all n roots prove that p, with descending coefficients, p[0]
    // nearly 1, has no common divisor with its derivative: that there are no polynomials u of
    // degree 1 or more, v and w for which each coefficient of u v differs from that of p, and each
    // coefficient of u w from that of p' / n, by at most `tolerance`, relative to coefficients
    // above 1 and absolute for others. Any approximations may be passed; bad ones prove nothing.
    bool holds(const CDB *p, int32_t n, double tolerance, const CDB *roots);

private:
    bool measureDistances(const CDB *roots, int32_t n);
    double backwardError(const CDB *p, int32_t n, double tolerance, CDB root) const;

    // For each approximation: the product of the distances to the others, the sum of their
    // inverses, the least of them, and how far the roots of all polynomials within the tolerance
    // may be, to first order.
    RealVector product_, inverses_, least_, radius_;
    ScratchParts memory_;
};

} // namespace qx

#endif
