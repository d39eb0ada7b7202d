#include "calculus/integration.h"
#include "frame/outcome.h"
#include "frame/scratch.h"

#include <cmath>

namespace qx {

namespace {

// The sum of the panels of a rule from sample `first` on; each panel is summed in the stated order.
template <class Panel>
double SumOfPanels(const DBL *x, int32_t first, int32_t panels, int32_t width, const Panel &panel) {
    double sum = 0.0;
    const DBL *at = x + first;
    for (int32_t i = 0; i < panels; ++i, at += width)
        sum += panel(at);
    return sum;
}

double SimpsonPanel(const DBL *x) { return 4.0 * x[1] + x[0] + x[2]; }
double ThreeEighthsPanel(const DBL *x) { return 3.0 * x[0] + 9.0 * x[1] + 9.0 * x[2] + 3.0 * x[3]; }
double BodePanel(const DBL *x) {
    return 14.0 * x[0] + 64.0 * x[1] + 24.0 * x[2] + 64.0 * x[3] + 14.0 * x[4];
}

// The integral over the whole panels after the first `from` intervals.
double Panels(const DBL *x, int32_t n, double h, int32_t rule, int32_t from) {
    const int32_t width = rule + 1;
    const int32_t panels = (n - 1 - from) / width;
    switch (rule) {
    case Simpson:
        return SumOfPanels(x, from, panels, width, SimpsonPanel) * (h / 3.0);
    case SimpsonThreeEighths:
        return SumOfPanels(x, from, panels, width, ThreeEighthsPanel) * (h * 0.125);
    default:
        return SumOfPanels(x, from, panels, width, BodePanel) * h / 45.0;
    }
}

double SumBetween(const DBL *x, int32_t from, int32_t to, double sum) {
    for (int32_t i = from; i < to; ++i)
        sum += x[i];
    return sum;
}

double TrapezoidSum(const DBL *x, int32_t n, double h) {
    return SumBetween(x, 1, n - 1, (x[n - 1] + x[0]) * 0.5 + 0.0) * h;
}

// The integral over the last `rest` intervals by the trapezoidal, Simpson's or the 3/8 rule.
double AtEnd(const DBL *last, int32_t rest, double h) {
    switch (rest) {
    case 1:
        return (last[0] + last[-1]) * (h * 0.5);
    case 2:
        return h * (last[-1] * 4.0 + last[-2] + last[0]) / 3.0;
    case 3:
        return h * ((last[0] + last[-3]) * 3.0 + (last[-2] + last[-1]) * 9.0) * 0.125;
    default:
        return 0.0;
    }
}

// The integral over the first `rest` intervals by the interpolating polynomial of the rule's order.
double AtStart(const DBL *x, int32_t rule, int32_t rest, double h) {
    if (rest == 0)
        return 0.0;
    if (rule == Simpson)
        return (5.0 * x[0] + 8.0 * x[1] - x[2]) * h / 12.0;
    if (rule == SimpsonThreeEighths)
        return rest == 1 ? (9.0 * x[0] + 19.0 * x[1] - 5.0 * x[2] + x[3]) * h / 24.0
                         : (x[0] + 4.0 * x[1] + x[2]) * h / 3.0;
    if (rest == 1)
        return (251.0 * x[0] + 646.0 * x[1] - 264.0 * x[2] + 106.0 * x[3] - 19.0 * x[4]) * h /
               720.0;
    if (rest == 2)
        return (29.0 * x[0] + 124.0 * x[1] + 24.0 * x[2] + 4.0 * x[3] - x[4]) * h / 90.0;
    return (27.0 * x[0] + 102.0 * x[1] + 72.0 * x[2] + 42.0 * x[3] - 3.0 * x[4]) * h / 80.0;
}

// kept: with formulas at the start the count is checked before the rule, even if the rule does not
// exist.
ErrorCode CheckSamples(std::ptrdiff_t n, int32_t rule, Remainder remainder) {
    if (remainder == Remainder::LowerRuleAtEnd)
        return FirstFailed({{rule < Trapezoid || rule > Bode, ErrInvalidSelector},
                            {n < int64_t{rule} + 2, ErrSizesDisagree}});
    const bool isRectangle = rule == LeftRectangle || rule == RightRectangle;
    const int64_t least = isRectangle ? 2 : int64_t{rule} + 2;
    return FirstFailed({{n < least, ErrSizesDisagree},
                        {rule < Trapezoid || rule > RightRectangle, ErrInvalidSelector}});
}

double Integrate(ConstRealVector samples, double dt, int32_t rule, Remainder remainder) {
    const DBL *const x = samples.data();
    const auto n = static_cast<int32_t>(samples.size());
    const double h = std::fabs(dt);
    if (rule == Trapezoid)
        return TrapezoidSum(x, n, h);
    if (rule == LeftRectangle)
        return h * SumBetween(x, 0, n - 1, 0.0);
    if (rule == RightRectangle)
        return h * SumBetween(x, 1, n, 0.0);
    const int32_t rest = (n - 1) % (rule + 1);
    return remainder == Remainder::LowerRuleAtEnd
               ? Panels(x, n, h, rule, 0) + AtEnd(x + n - 1, rest, h)
               : AtStart(x, rule, rest, h) + Panels(x, n, h, rule, rest);
}

} // namespace

ErrorCode DefiniteIntegral(ConstRealVector x, double dt, int32_t rule, Remainder remainder,
                           double *result) {
    if (const ErrorCode bad = CheckSamples(x.size(), rule, remainder))
        return bad;
    *result = Integrate(x, dt, rule, remainder);
    return 0;
}

ErrorCode DefiniteIntegral2D(const ConstRealMatrix &x, ConstRealVector dts, int32_t rule,
                             Remainder remainder, double *result) {
    if (const ErrorCode bad = FirstFailed({{x.rows() < 3 || x.cols() < 3, ErrSizesDisagree},
                                           {dts.size() < 2, ErrFewerThanTwo},
                                           {rule < Trapezoid || rule > Bode, ErrInvalidSelector}}))
        return bad;
    Scratch<ElementType::DBL> ofRows;
    if (const ErrorCode failed = ofRows.allocate(x.rows()))
        return failed;
    if (const ErrorCode bad = CheckSamples(x.cols(), rule, remainder))
        return bad;
    for (int32_t row = 0; row < x.rows(); ++row)
        ofRows[row] = Integrate({x.row(row), x.cols()}, dts[0], rule, remainder);
    return DefiniteIntegral({ofRows.data(), x.rows()}, dts[1], rule, remainder, result);
}

// kept: the last dimension is the number of planes, whatever its position in the block.
ErrorCode DefiniteIntegral3D(const Volume &x, ConstRealVector dts, int32_t rule,
                             Remainder remainder, double *result) {
    if (const ErrorCode bad =
            FirstFailed({{x.rows < 3 || x.cols < 3 || x.planes < 3, ErrSizesDisagree},
                         {dts.size() < 3, ErrFewerThanThree},
                         {rule < Trapezoid || rule > Bode, ErrInvalidSelector}}))
        return bad;
    Scratch<ElementType::DBL> ofPlanes;
    if (const ErrorCode failed = ofPlanes.allocate(x.planes))
        return failed;
    for (int32_t i = 0; i < x.planes; ++i) {
        double integral = 0.0;
        if (const ErrorCode bad = DefiniteIntegral2D(x.plane(i), dts, rule, remainder, &integral))
            return bad;
        ofPlanes[i] = integral;
    }
    return DefiniteIntegral({ofPlanes.data(), x.planes}, dts[2], rule, remainder, result);
}

} // namespace qx
