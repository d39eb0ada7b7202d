#include "calculus/integration.h"
#include "calculus/neighbours.h"
#include "frame/outcome.h"

namespace qx {

namespace {

// The running sum of panels, each multiplied by the factor.
template <class Panel>
void SumPanels(ConstRealVector x, const Beyond &beyond, double factor, RealVector out,
               const Panel &panel) {
    double sum = 0.0;
    FromNeighbours(x, beyond, out, [&](double a, double b, double c, double d, double e) {
        return sum += panel(a, b, c, d, e) * factor;
    });
}

// Starts from y[0] = 0; y[i] adds x[i - lag].
void SumRectangles(ConstRealVector x, double dt, int32_t lag, RealVector out) {
    double before = x[0];
    double sum = 0.0;
    out[0] = 0.0;
    for (std::ptrdiff_t i = 1; i < x.size(); ++i) {
        const double here = x[i];
        sum += (lag == 1 ? before : here) * dt;
        out[i] = sum;
        before = here;
    }
}

} // namespace

void RunningIntegral(ConstRealVector x, double dt, ConstRealVector initial, ConstRealVector final,
                     IntegrationRule rule, RealVector out) {
    switch (rule) {
    case Trapezoid:
        SumPanels(x, ValuesBeyond(initial, 1, final, 0), dt * 0.5, out,
                  [](double, double b, double c, double, double) { return b + c; });
        return;
    case Simpson:
        SumPanels(x, ValuesBeyond(initial, 1, final, 1), dt / 6.0, out,
                  [](double, double b, double c, double d, double) { return b + 4.0 * c + d; });
        return;
    case SimpsonThreeEighths:
        SumPanels(x, ValuesBeyond(initial, 2, final, 1), dt * 0.125, out,
                  [](double a, double b, double c, double d, double) {
                      return a + 3.0 * b + 3.0 * c + d;
                  });
        return;
    case Bode:
        SumPanels(x, ValuesBeyond(initial, 2, final, 2), dt / 90.0, out,
                  [](double a, double b, double c, double d, double e) {
                      return 7.0 * a + 32.0 * b + 12.0 * c + 32.0 * d + 7.0 * e;
                  });
        return;
    case LeftRectangle:
        SumRectangles(x, dt, 1, out);
        return;
    case RightRectangle:
        SumRectangles(x, dt, 0, out);
    }
}

namespace {

// y[i] = y[i - width] + panel(x[i - width] ... x[i]) factor from i = width on, where the first
// `width` values of y are given. The samples that these have overwritten are read from `first`.
template <int32_t Width, class Panel>
void ChainPanels(ConstRealVector x, const double *first, double factor, RealVector out,
                 const Panel &panel) {
    double window[Width + 1];
    for (int32_t k = 0; k < Width; ++k)
        window[k] = first[k];
    for (std::ptrdiff_t i = Width; i < x.size(); ++i) {
        window[Width] = x[i];
        out[i] = out[i - Width] + panel(window) * factor;
        for (int32_t k = 0; k < Width; ++k)
            window[k] = window[k + 1];
    }
}

} // namespace

ErrorCode RunningIntegral2017(ConstRealVector x, double dt, int32_t rule, RealVector out) {
    const bool isRectangle = rule == LeftRectangle || rule == RightRectangle;
    const int64_t least = isRectangle ? 2 : int64_t{rule} + 2;
    if (const ErrorCode bad =
            FirstFailed({{x.size() < least, ErrSizesDisagree},
                         {rule < Trapezoid || rule > RightRectangle, ErrInvalidSelector}}))
        return bad;
    if (isRectangle) {
        RunningIntegral(x, dt, {}, {}, static_cast<IntegrationRule>(rule), out);
        return 0;
    }
    double s[5]; // a copy of the samples that the first values overwrite
    for (int32_t k = 0; k < rule + 2; ++k)
        s[k] = x[k];
    out[0] = 0.0;
    switch (rule) {
    case Trapezoid:
        ChainPanels<1>(x, s, dt * 0.5, out, [](const double *w) { return w[0] + w[1]; });
        break;
    case Simpson:
        out[1] = (5.0 * s[0] + 8.0 * s[1] - s[2]) * dt / 12.0;
        ChainPanels<2>(x, s, dt / 3.0, out,
                       [](const double *w) { return w[0] + 4.0 * w[1] + w[2]; });
        break;
    case SimpsonThreeEighths:
        out[1] = (9.0 * s[0] + 19.0 * s[1] - 5.0 * s[2] + s[3]) * dt / 24.0;
        out[2] = dt * (4.0 * s[1] + s[0] + s[2]) / 3.0;
        ChainPanels<3>(x, s, dt * 3.0 * 0.125, out,
                       [](const double *w) { return w[0] + 3.0 * w[1] + 3.0 * w[2] + w[3]; });
        break;
    default:
        out[1] =
            (251.0 * s[0] + 646.0 * s[1] - 264.0 * s[2] + 106.0 * s[3] - 19.0 * s[4]) * dt / 720.0;
        out[2] = (29.0 * s[0] + 124.0 * s[1] + 24.0 * s[2] + 4.0 * s[3] - s[4]) * dt / 90.0;
        out[3] = dt * (27.0 * s[0] + 102.0 * s[1] + 72.0 * s[2] + 42.0 * s[3] - 3.0 * s[4]) / 80.0;
        ChainPanels<4>(x, s, dt * 4.0 / 90.0, out, [](const double *w) {
            return 7.0 * w[0] + 32.0 * w[1] + 12.0 * w[2] + 32.0 * w[3] + 7.0 * w[4];
        });
    }
    return 0;
}

} // namespace qx
