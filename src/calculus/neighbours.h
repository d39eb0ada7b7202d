#ifndef QX_CALCULUS_NEIGHBOURS_H
#define QX_CALCULUS_NEIGHBOURS_H

#include "frame/views.h"

namespace qx {

// The values beyond the ends of n samples: x[-2], x[-1] and x[n], x[n+1].
struct Beyond {
    double before[2];
    double behind[2];
};

// Takes as many values as the formula reads and sets the others to 0; the last of `before` is
// x[-1].
inline Beyond ValuesBeyond(ConstRealVector initial, int32_t initialCount, ConstRealVector final,
                           int32_t finalCount) {
    QX_EXPECTS(initial.size() >= initialCount && final.size() >= finalCount);
    Beyond beyond = {};
    for (int32_t i = 0; i < initialCount; ++i)
        beyond.before[2 - initialCount + i] = initial[i];
    for (int32_t i = 0; i < finalCount; ++i)
        beyond.behind[i] = final[i];
    return beyond;
}

// out[i] = formula(x[i-2], x[i-1], x[i], x[i+1], x[i+2]). Each sample is read before it is
// overwritten, so `out` may be x.
template <class Formula>
void FromNeighbours(ConstRealVector x, const Beyond &beyond, RealVector out, Formula formula) {
    const auto n = static_cast<int32_t>(x.size());
    const auto at = [&](int32_t i) {
        return i < n ? static_cast<double>(x[i]) : beyond.behind[i - n];
    };
    double a = beyond.before[0];
    double b = beyond.before[1];
    double c = at(0);
    double d = at(1);
    for (int32_t i = 0; i < n; ++i) {
        const double e = n - i > 2 ? static_cast<double>(x[i + 2]) : beyond.behind[i + 2 - n];
        out[i] = formula(a, b, c, d, e);
        a = b;
        b = c;
        c = d;
        d = e;
    }
}

} // namespace qx

#endif
