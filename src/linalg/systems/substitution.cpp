#include "linalg/systems/substitution.h"

#include "frame/scratch.h"

namespace qx {

ErrorCode Substitute(Factors factors, const DBL *a, int32_t n, int32_t rightSides, DBL *x) {
    Scratch<ElementType::DBL> strip;
    if (rightSides > 1)
        if (const ErrorCode failed = strip.allocate(int64_t{n} * stripWidth))
            return failed;
    SubstituteStrips(factors, a, n, rightSides, x, strip.data());
    return 0;
}

ErrorCode Substitute(Factors factors, const CDB *a, int32_t n, int32_t rightSides, CDB *x) {
    Scratch<ElementType::DBL> strip;
    if (rightSides > 1)
        if (const ErrorCode failed = strip.allocate(int64_t{n} * stripWidth))
            return failed;
    CxSubstituteStrips(factors, a, n, rightSides, x, strip.data());
    return 0;
}

} // namespace qx
