#include "calculus/differentiation.h"

#include "calculus/neighbours.h"

namespace qx {

ErrorCode Differentiate(const DBL *x, int32_t n, double dt, const DBL *initial, const DBL *final,
                        int32_t rule, DBL *out) {
    switch (rule) {
    case CentralSecondOrder:
        FromNeighbours(x, n, ValuesBeyond(initial, 1, final, 1), out,
                       [factor = 0.5 / dt](double, double b, double, double d, double) {
                           return (d - b) * factor;
                       });
        return 0;
    case CentralFourthOrder:
        FromNeighbours(
            x, n, ValuesBeyond(initial, 2, final, 2), out,
            [factor = 1.0 / (dt * 12.0)](double a, double b, double, double d, double e) {
                return (a + (8.0 * d - e - 8.0 * b)) * factor;
            });
        return 0;
    case Forward:
        FromNeighbours(x, n, ValuesBeyond(initial, 0, final, 1), out,
                       [factor = 1.0 / dt](double, double, double c, double d, double) {
                           return (d - c) * factor;
                       });
        return 0;
    case Backward:
        FromNeighbours(x, n, ValuesBeyond(initial, 1, final, 0), out,
                       [factor = 1.0 / dt](double, double b, double c, double, double) {
                           return (c - b) * factor;
                       });
        return 0;
    default:
        return ErrInvalidSelector;
    }
}

} // namespace qx
