#include "calculus/differentiation.h"

#include "calculus/neighbours.h"

namespace qx {

void Differentiate(ConstRealVector x, double dt, ConstRealVector initial, ConstRealVector final,
                   DifferentiationRule rule, RealVector out) {
    switch (rule) {
    case CentralSecondOrder:
        FromNeighbours(x, ValuesBeyond(initial, 1, final, 1), out,
                       [factor = 0.5 / dt](double, double b, double, double d, double) {
                           return (d - b) * factor;
                       });
        return;
    case CentralFourthOrder:
        FromNeighbours(
            x, ValuesBeyond(initial, 2, final, 2), out,
            [factor = 1.0 / (dt * 12.0)](double a, double b, double, double d, double e) {
                return (a + (8.0 * d - e - 8.0 * b)) * factor;
            });
        return;
    case Forward:
        FromNeighbours(x, ValuesBeyond(initial, 0, final, 1), out,
                       [factor = 1.0 / dt](double, double, double c, double d, double) {
                           return (d - c) * factor;
                       });
        return;
    case Backward:
        FromNeighbours(x, ValuesBeyond(initial, 1, final, 0), out,
                       [factor = 1.0 / dt](double, double b, double c, double, double) {
                           return (c - b) * factor;
                       });
    }
}

} // namespace qx
