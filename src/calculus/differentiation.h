#ifndef QX_CALCULUS_DIFFERENTIATION_H
#define QX_CALCULUS_DIFFERENTIATION_H

#include "frame/views.h"

namespace qx {

enum DifferentiationRule : int32_t { CentralSecondOrder, CentralFourthOrder, Forward, Backward };

// `out` may be x. There must be at least as many values beyond the data as the rule reads.
void Differentiate(ConstRealVector x, double dt, ConstRealVector initial, ConstRealVector final,
                   DifferentiationRule rule, RealVector out);

} // namespace qx

#endif
