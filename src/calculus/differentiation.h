#ifndef QX_CALCULUS_DIFFERENTIATION_H
#define QX_CALCULUS_DIFFERENTIATION_H

#include "frame/views.h"

namespace qx {

enum DifferentiationRule : int32_t { CentralSecondOrder, CentralFourthOrder, Forward, Backward };

// `out` may be x. The values beyond the data are at least as many as the rule looks at.
void Differentiate(ConstRealVector x, double dt, ConstRealVector initial, ConstRealVector final,
                   DifferentiationRule rule, RealVector out);

} // namespace qx

#endif
