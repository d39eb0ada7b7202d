#ifndef QX_FIT_BOUNDED_LM_H
#define QX_FIT_BOUNDED_LM_H

#include "fit/limits.h"
#include "fit/robust_weights.h"
#include "fit/samples.h"

namespace qx {

// The model's value at x.
typedef double (*ModelValue)(double x, const DBL *p, int32_t count, const void *user);
// The partial derivatives at x, one per parameter.
typedef void (*ModelGradient)(double x, const DBL *p, int32_t count, DBL *out, const void *user);
// Over all samples, with r = y - f(x): the mean of |w| r^2, the sum a of |w| times the outer
// products of the derivatives (count by count), the sum g of |w| r times the derivatives, and, if
// `jacobian` is not null, the derivatives themselves, row by row.
typedef void (*ModelNormalEquations)(const FitSamples &samples, const DBL *p, int32_t count,
                                     double *mse, DBL *a, DBL *jacobian, DBL *g, const void *user);

// Gradient and normal equations may be null: without the former the derivatives are central
// differences, without the latter the sums are formed from values and derivatives.
struct FitModel {
    int32_t count; // of parameters
    ModelValue value;
    ModelGradient gradient;
    ModelNormalEquations normal;
    const void *user;
};

// One bound per parameter, infinite if there is none; empty if there are no bounds at all. A
// parameter whose bounds are equal is fixed.
struct FitBounds {
    ConstRealVector lower, upper;
};

// The parameters p, and the cost of a method there, with a and g as above for the weights of the
// method; the cost falls in the direction of g.
struct FitPoint {
    RealVector p;
    RealMatrix a;
    RealVector g;
    double cost;
};

// The work memory of an evaluation.
class EvaluationMemory {
public:
    EvaluationMemory(const FitModel &model, const FitSamples &samples, FitNorm norm)
        : state{norm, model.count, samples.w} {}
    // ErrOutOfMemory.
    ErrorCode take(int32_t n);

    RealVector gradient, moved;
    Reweighting state;
    RealMatrix inverse, jacobian; // for bisquare only

private:
    ScratchParts memory_;
};

// The cost is the mean of |w| r^2, of |w r|, or of r^2 times the bisquare weights
// (fit/robust_weights.h). jacobian may be empty.
//
// ErrNaNInData (a residual is NaN), ErrNonFiniteInput (a is not finite), ErrOutOfMemory,
// ErrIterationLimit (the singular values of a do not converge).
void EvalLeastSquares(const FitModel &model, const FitSamples &samples, FitPoint &at,
                      EvaluationMemory &memory, const RealMatrix &jacobian = {});
ErrorCode EvalLeastAbsolute(const FitModel &model, const FitSamples &samples, FitPoint &at,
                            EvaluationMemory &memory);
ErrorCode EvalBisquare(const FitModel &model, const FitSamples &samples, FitPoint &at,
                       EvaluationMemory &memory);

// Levenberg-Marquardt iteration from p within the bounds, where the damped diagonal of a is a (1 +
// lambda) + lambda (K. Levenberg, "A method for the solution of certain non-linear problems in
// least squares", 1944; D. W. Marquardt, "An algorithm for least-squares estimation of nonlinear
// parameters", 1963). A parameter at a bound takes no part in the normal equations: it stays as
// long as the cost falls outwards, and otherwise moves along the gradient alone.
//
// It ends, with 0, when a step lowers the cost by less than the tolerance times the cost, when the
// damping has passed 10000 without a better point, when the cost is 0, and, with bisquare, when no
// parameter changes by more than the tolerance times itself. A tolerance of 0 or below means 1e-8,
// and such a damping means 1. *iterations is the limit, below 0 for no limit, and becomes the
// number of steps tried after the first. If the damping has fallen to 0 and the step is worse, all
// steps up to the limit would be the same; they are counted without being tried. *lambda becomes
// the last damping. *mse is the cost, with bisquare the mean of |w| r^2.
//
// ErrEmptyInput (no samples, or no p), ErrPolynomialOrderTooHigh (fewer samples than parameters),
// ErrInvalidSelector (no such method), ErrBoundsCrossed, ErrOutOfMemory, ErrNaNInData (no weights
// at the start), ErrNonFiniteInput (no finite cost at the start, nor at the next point),
// ErrSingularMatrix (the damped equations have no solution), ErrIterationLimit, with p valid.
ErrorCode BoundedLM(const FitModel &model, const FitSamples &samples, int32_t method,
                    const FitBounds &bounds, DBL *p, int32_t *iterations, double tolerance,
                    double *lambda, double *mse);

} // namespace qx

#endif
