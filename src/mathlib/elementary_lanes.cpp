#include "mathlib/elementary.h"
#include "mathlib/lane_functions.h"

#include <cmath>

namespace qx::QX_WIDTH {
namespace {

typedef Lanes<nativeLanes> L;

} // namespace

void ArcTangents(const DBL *y, const DBL *x, int32_t n, DBL *angles) {
    ForEachOrRare<nativeLanes>(
        n,
        [&](int32_t i) {
            LaneMask<L> rare = {};
            const L angle = ArcTangent(L::load(y + i), L::load(x + i), rare);
            if (Any(rare))
                return false;
            angle.store(angles + i);
            return true;
        },
        [&](int32_t i) { angles[i] = std::atan2(y[i], x[i]); });
}

void Hypotenuses(const DBL *x, const DBL *y, int32_t n, DBL *lengths) {
    ForEachOrRare<nativeLanes>(
        n,
        [&](int32_t i) {
            LaneMask<L> rare = {};
            const L length = Hypotenuse(L::load(x + i), L::load(y + i), rare);
            if (Any(rare))
                return false;
            length.store(lengths + i);
            return true;
        },
        [&](int32_t i) { lengths[i] = std::hypot(x[i], y[i]); });
}

} // namespace qx::QX_WIDTH
