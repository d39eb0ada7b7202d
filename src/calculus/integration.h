#ifndef QX_CALCULUS_INTEGRATION_H
#define QX_CALCULUS_INTEGRATION_H

#include "qx/errors.h"
#include "qx/types.h"

namespace qx {

enum IntegrationRule : int32_t {
    Trapezoid,
    Simpson,
    SimpsonThreeEighths,
    Bode,
    LeftRectangle,
    RightRectangle
};

// The two revisions of a definite integral: leftover samples closed by a lower rule at the end of
// the data, or by a formula of the rule's order at its start.
enum class Remainder { LowerRuleAtEnd, OwnOrderAtStart };

// include/qx/calculus.h tells what they compute and their codes, of which only ErrEmptyInput and
// ErrSamplingNotPositive are the frames' (the latter RunningIntegral2017's own, too).
ErrorCode DefiniteIntegral(const DBL *x, int32_t n, double dt, int32_t rule, Remainder remainder,
                           double *result);
ErrorCode DefiniteIntegral2D(const DBL *x, int32_t rows, int32_t cols, const DBL *dts,
                             int32_t dtCount, int32_t rule, Remainder remainder, double *result);
ErrorCode DefiniteIntegral3D(const DBL *x, const int32_t (&dims)[3], const DBL *dts,
                             int32_t dtCount, int32_t rule, Remainder remainder, double *result);

// The running integral, `out` may be x. The values beyond the data are as many as the rule looks
// at; pointers that it does not need may be null.
ErrorCode RunningIntegral(const DBL *x, int32_t n, double dt, const DBL *initial, const DBL *final,
                          DBL *out, int32_t rule);
ErrorCode RunningIntegral2017(const DBL *x, int32_t n, double dt, DBL *out, int32_t rule);

} // namespace qx

#endif
