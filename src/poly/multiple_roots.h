#ifndef QX_POLY_MULTIPLE_ROOTS_H
#define QX_POLY_MULTIPLE_ROOTS_H

#include "frame/views.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// The distinct roots, in arrays with as many elements as there are coefficients. `refined` is a
// copy of `simple` if nothing is refined.
struct MultipleRoots {
    ComplexVector refined, simple;
    VectorView<ElementType::I32> multiplicity;
    int32_t count = 0;
};

// The distinct roots of a complex polynomial of ascending coefficients, at least one, with their
// multiplicities (poly/root_structure.h), for which errors of the coefficients up to `tolerance`
// are allowed; a tolerance not above 0 means 1e-10. `simple` holds the roots that belong to the
// structure of multiplicities, and `refined` the same roots or, with `refines`, the refined ones;
// all are then sorted by ascending multiplicity and descending modulus. If the multiplicities do
// not add up to the degree, or if the refinement does not converge, the roots are the eigenvalues
// of the companion matrix, of which exactly equal ones count as one.
//
// ErrBadCoefficients (a coefficient is not finite); ErrAllCoefficientsZero; ErrOrderNotPositive (a
// constant); ErrOutOfMemory; ErrNonFiniteInput (the monic polynomial overflows); ErrIterationLimit
// (eigenvalues do not converge).
ErrorCode FindMultipleRoots(ConstComplexVector coef, bool refines, double tolerance,
                            MultipleRoots *roots);

} // namespace qx

#endif
