#ifndef QX_FIT_ROBUST_WEIGHTS_H
#define QX_FIT_ROBUST_WEIGHTS_H

#include "frame/scratch.h"

namespace qx {

// The norm of the residuals that a fit minimises.
enum FitNorm : int32_t { leastSquares = 0, leastAbsolute = 1, bisquare = 2 };

// The weights with which a least-squares step lowers the sum of |w| |residual|: |w| / |residual|,
// where each residual counts as at least a hundredth of the median of all (E. J. Schlossmacher, "An
// iterative technique for absolute deviations curve fitting", 1973). w may be empty.
//
// ErrNaNInData (a residual is NaN), ErrOutOfMemory.
ErrorCode LeastAbsoluteWeights(ConstRealVector residuals, ConstRealVector w, RealVector out);

// sqrt(|w| / (1 - h)), which make residuals of different leverage h comparable; h counts as at most
// 0.9999. `leverage` may be `factors`.
void LeverageFactors(ConstRealVector leverage, ConstRealVector w, RealVector factors);

// Tukey's biweights times |w|, from residuals times their factors (A. E. Beaton, J. W. Tukey, "The
// fitting of power series, meaning polynomials, illustrated on band-spectroscopic data", 1974; the
// scale and 4.685 as in P. W. Holland, R. E. Welsch, "Robust regression using iteratively
// reweighted least-squares", 1977). If the residuals have no scale, or fewer than `parameters`
// samples would be left, the weights remain |w|, or 1 without w.
//
// ErrNaNInData, ErrOutOfMemory.
ErrorCode BisquareWeights(ConstRealVector residuals, ConstRealVector factors, ConstRealVector w,
                          int32_t parameters, RealVector out);

// The state of a fit in a robust norm between steps: its residuals, and the weights for the next
// least-squares step that follow from them. The fit writes residuals and, for bisquare, leverages.
struct Reweighting {
    FitNorm norm;
    int32_t parameters;
    ConstRealVector w; // those of the caller, or empty
    RealVector residuals = {}, weights = {}, factors = {};
    ScratchParts memory = {};

    ErrorCode take(int32_t n) {
        return memory.take(Sized(residuals, n), Sized(weights, n),
                           Sized(factors, norm == bisquare ? n : 0));
    }
    void setLeverages() { LeverageFactors(factors, w, factors); } // the leverages are in `factors`
    // ErrNaNInData, ErrOutOfMemory.
    ErrorCode findWeights() const {
        return norm == bisquare ? BisquareWeights(residuals, factors, w, parameters, weights)
                                : LeastAbsoluteWeights(residuals, w, weights);
    }
};

} // namespace qx

#endif
