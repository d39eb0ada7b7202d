#ifndef QX_CALCULUS_INTEGRATION_H
#define QX_CALCULUS_INTEGRATION_H

#include "frame/views.h"
#include "qx/errors.h"

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

// The elements of a block of three dimensions.
struct Volume {
    const DBL *data;
    int32_t rows, cols, planes;
    ConstRealMatrix plane(int32_t i) const {
        return {data + std::ptrdiff_t{i} * rows * cols, rows, cols};
    }
};

// include/qx/calculus.h documents what they compute and their codes, of which only ErrEmptyInput
// and ErrSamplingNotPositive come from the frames of the exports.
ErrorCode DefiniteIntegral(ConstRealVector x, double dt, int32_t rule, Remainder remainder,
                           double *result);
ErrorCode DefiniteIntegral2D(const ConstRealMatrix &x, ConstRealVector dts, int32_t rule,
                             Remainder remainder, double *result);
ErrorCode DefiniteIntegral3D(const Volume &x, ConstRealVector dts, int32_t rule,
                             Remainder remainder, double *result);

// The running integral; `out` may be x. There must be at least as many values beyond the data as
// the rule reads.
void RunningIntegral(ConstRealVector x, double dt, ConstRealVector initial, ConstRealVector final,
                     IntegrationRule rule, RealVector out);
ErrorCode RunningIntegral2017(ConstRealVector x, double dt, int32_t rule, RealVector out);

} // namespace qx

#endif
