#include "frame/lanes.h"
#include "util/coordinates.h"

namespace qx::QX_WIDTH {

namespace {

typedef Lanes<nativeLanes> L;
typedef Lanes<1> One;

template <class V>
QX_INLINE void TurnPlane(const DBL *x, const DBL *y, const double *m, DBL *newX, DBL *newY) {
    const V u = V::load(x);
    const V v = V::load(y);
    (V(m[0]) * u + V(m[1]) * v).store(newX);
    (V(m[2]) * u + V(m[3]) * v).store(newY);
}

template <class V>
QX_INLINE void TurnSpace(const DBL *const *from, int32_t i, const Rotation &r, DBL *const *to) {
    const V x = V::load(from[0] + i);
    const V y = V::load(from[1] + i);
    const V z = V::load(from[2] + i);
    for (int row = 0; row < 3; ++row)
        ((V(r.m[row][0]) * x + V(r.m[row][1]) * y) + V(r.m[row][2]) * z).store(to[row] + i);
}

} // namespace

// Zero times a finite number is zero; zero times any other is NaN, which the sum keeps.
bool AllFinite(const DBL *x, int32_t n) {
    const L zero(0.0);
    L sums[4] = {zero, zero, zero, zero};
    int32_t i = 0;
    for (; n - i >= 4 * L::count; i += 4 * L::count)
        for (int k = 0; k < 4; ++k)
            sums[k] = sums[k] + zero * L::load(x + i + k * L::count);
    const L sum = (sums[0] + sums[1]) + (sums[2] + sums[3]);
    double total = 0.0;
    for (int lane = 0; lane < L::count; ++lane)
        total += sum[lane];
    for (; i < n; ++i)
        total += 0.0 * x[i];
    return total == 0.0;
}

void MultiplyPlane(const DBL *x, const DBL *y, int32_t n, const double *matrix, DBL *newX,
                   DBL *newY) {
    int32_t i = 0;
    for (; n - i >= L::count; i += L::count)
        TurnPlane<L>(x + i, y + i, matrix, newX + i, newY + i);
    for (; i < n; ++i)
        TurnPlane<One>(x + i, y + i, matrix, newX + i, newY + i);
}

void MultiplySpace(const DBL *const *from, int32_t n, const Rotation &matrix, DBL *const *to) {
    int32_t i = 0;
    for (; n - i >= L::count; i += L::count)
        TurnSpace<L>(from, i, matrix, to);
    for (; i < n; ++i)
        TurnSpace<One>(from, i, matrix, to);
}

} // namespace qx::QX_WIDTH
