#ifndef QX_POLY_MULTIPLE_ROOTS_H
#define QX_POLY_MULTIPLE_ROOTS_H

#include "frame/views.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// Distinct roots as they come along, in as many places as there are coefficients. `refined` follows
// `simple` where it is not refined.
struct MultipleRoots {
    ComplexVector refined, simple;
    VectorView<ElementType::I32> multiplicity;
    int32_t count = 0;
};

// The distinct roots of a complex polynomial of ascending coefficients, at least one, with their
// multiplicities (poly/root_structure.h), for which errors of the coefficients up to `tolerance`
// are allowed; one not above 0 is 1e-10. `simple` holds the roots as the structure gives them, and
// `refined` the same again or, with `refines`, the refined ones; then all are sorted, by rising
// multiplicity and falling modulus. Without a structure that adds up, or without convergence, the
// eigenvalues of the companion matrix are taken, of which exactly equal ones count as one.
//
// ErrBadCoefficients (a coefficient is not finite); ErrAllCoefficientsZero; ErrOrderNotPositive (a
// constant); ErrOutOfMemory; ErrNonFiniteInput (the monic polynomial overflows); ErrIterationLimit
// (eigenvalues do not converge).
ErrorCode FindMultipleRoots(ConstComplexVector coef, bool refines, double tolerance,
                            MultipleRoots *roots);

} // namespace qx

#endif
