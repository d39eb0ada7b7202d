#ifndef QX_FIT_ROBUST_WEIGHTS_H
#define QX_FIT_ROBUST_WEIGHTS_H

#include "qx/errors.h"
#include "qx/types.h"

namespace qx {

// How residuals count.
enum FitNorm : int32_t { leastSquares = 0, leastAbsolute = 1, bisquare = 2 };

// The weights with which a least-squares step lowers the sum of |w| |residual|: |w| / |residual|,
// where no residual counts as smaller than a hundredth of the median of all (E. J. Schlossmacher,
// "An iterative technique for absolute deviations curve fitting", 1973). w may be null.
//
// ErrNaNInData (a residual is NaN), ErrOutOfMemory.
ErrorCode LeastAbsoluteWeights(const DBL *residuals, const DBL *w, int32_t n, DBL *out);

// sqrt(|w| / (1 - h)), by which a residual of leverage h is made comparable to the others; h counts
// as no more than 0.9999. leverage may be factors.
void LeverageFactors(const DBL *leverage, const DBL *w, int32_t n, DBL *factors);

// Tukey's biweights times |w|, from residuals times their factors (A. E. Beaton, J. W. Tukey, "The
// fitting of power series, meaning polynomials, illustrated on band-spectroscopic data", 1974; the
// scale and 4.685 as in P. W. Holland, R. E. Welsch, "Robust regression using iteratively
// reweighted least-squares", 1977). Where the residuals have no scale, or fewer than `parameters`
// samples would be left, the weights stay |w|, or 1 without w. `adjusted` is spoiled.
//
// ErrNaNInData, ErrOutOfMemory.
ErrorCode BisquareWeights(DBL *adjusted, const DBL *w, int32_t n, int32_t parameters, DBL *out);

} // namespace qx

#endif
