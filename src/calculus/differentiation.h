#ifndef QX_CALCULUS_DIFFERENTIATION_H
#define QX_CALCULUS_DIFFERENTIATION_H

#include "qx/errors.h"
#include "qx/types.h"

namespace qx {

enum DifferentiationRule : int32_t { CentralSecondOrder, CentralFourthOrder, Forward, Backward };

// `out` may be x. The values beyond the data are as many as the rule looks at; pointers that it
// does not need may be null. ErrInvalidSelector.
ErrorCode Differentiate(const DBL *x, int32_t n, double dt, const DBL *initial, const DBL *final,
                        int32_t rule, DBL *out);

} // namespace qx

#endif
