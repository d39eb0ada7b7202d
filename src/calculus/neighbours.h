#ifndef QX_CALCULUS_NEIGHBOURS_H
#define QX_CALCULUS_NEIGHBOURS_H

#include "qx/types.h"

namespace qx {

// What stands beyond the ends of n samples: x[-2], x[-1] and x[n], x[n+1].
struct Beyond {
    double before[2];
    double behind[2];
};

// As many as the formula looks at, the others 0: the last of `before` is x[-1].
inline Beyond ValuesBeyond(const DBL *initial, int32_t initialCount, const DBL *final,
                           int32_t finalCount) {
    Beyond beyond = {};
    for (int32_t i = 0; i < initialCount; ++i)
        beyond.before[2 - initialCount + i] = initial[i];
    for (int32_t i = 0; i < finalCount; ++i)
        beyond.behind[i] = final[i];
    return beyond;
}

// out[i] = formula(x[i-2], x[i-1], x[i], x[i+1], x[i+2]). Reading runs ahead of writing, so `out`
// may be x.
template <class Formula>
void FromNeighbours(const DBL *x, int32_t n, const Beyond &beyond, DBL *out, Formula formula) {
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
