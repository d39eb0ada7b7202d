#include "mathlib/elementary.h"
#include "mathlib/lane_functions.h"

#include <cmath>

namespace qx::QX_WIDTH {
namespace {

typedef Lanes<nativeLanes> L;

} // namespace

void Sines(const DBL *x, int32_t n, DBL *sines) {
    ForEachOrRare<nativeLanes>(
        n,
        [&](int32_t i) {
            LaneMask<L> rare = {};
            const L sine = SineCosine(L::load(x + i), rare).sine;
            if (Any(rare))
                return false;
            sine.store(sines + i);
            return true;
        },
        [&](int32_t i) { sines[i] = std::sin(x[i]); });
}

void SinesAndCosines(const DBL *x, int32_t n, DBL *sines, DBL *cosines) {
    ForEachOrRare<nativeLanes>(
        n,
        [&](int32_t i) {
            LaneMask<L> rare = {};
            const SineAndCosine<L> both = SineCosine(L::load(x + i), rare);
            if (Any(rare))
                return false;
            both.sine.store(sines + i);
            both.cosine.store(cosines + i);
            return true;
        },
        [&](int32_t i) {
            const double angle = x[i];
            sines[i] = std::sin(angle);
            cosines[i] = std::cos(angle);
        });
}

} // namespace qx::QX_WIDTH
