#include "measure/search.h"

#include "frame/lane_masks.h"

namespace qx::QX_WIDTH {
namespace {

typedef Lanes<nativeLanes> L;
constexpr int together = 4; // vectors that are tested before a branch
constexpr int32_t stride = together * nativeLanes;

// Each test for a single sample and for a vector of samples.
struct Beyond {
    const DBL *y;
    double lower, upper;

    QX_INLINE bool one(int32_t i) const { return y[i] <= lower || y[i] >= upper; }
    QX_INLINE auto many(int32_t i) const {
        const L here = L::load(y + i);
        return (here <= L(lower)) | (here >= L(upper));
    }
};

template <int LevelCount>
struct BeyondOrCrossing {
    Beyond beyond;
    double level[LevelCount];

    static QX_INLINE bool crosses(double here, double next, double level) {
        return (here <= level && next >= level) || (here >= level && next <= level);
    }
    static QX_INLINE auto crosses(L here, L next, L level) {
        return ((here <= level) & (next >= level)) | ((here >= level) & (next <= level));
    }
    QX_INLINE bool one(int32_t i) const {
        bool found = beyond.one(i);
        for (int k = 0; k < LevelCount; ++k)
            found |= crosses(beyond.y[i], beyond.y[i + 1], level[k]);
        return found;
    }
    QX_INLINE auto many(int32_t i) const {
        const L here = L::load(beyond.y + i), next = L::load(beyond.y + i + 1);
        auto found = beyond.many(i);
        for (int k = 0; k < LevelCount; ++k)
            found = found | crosses(here, next, L(level[k]));
        return found;
    }
};

template <class Test>
QX_INLINE int32_t First(int32_t from, int32_t end, const Test &test) {
    // In a waveform with many events the next one is near, so the first vectors are tested one by
    // one.
    int32_t i = from;
    for (int k = 0; k < together && end - i >= nativeLanes; ++k, i += nativeLanes)
        if (const unsigned bits = MaskBits(test.many(i)))
            return i + __builtin_ctz(bits);
    for (; end - i >= stride; i += stride) {
        auto any = test.many(i);
        for (int k = 1; k < together; ++k)
            any = any | test.many(i + k * nativeLanes);
        if (__builtin_expect(MaskBits(any) != 0, 0))
            break;
    }
    for (; end - i >= nativeLanes; i += nativeLanes)
        if (const unsigned bits = MaskBits(test.many(i)))
            return i + __builtin_ctz(bits);
    for (; i < end; ++i)
        if (test.one(i))
            return i;
    return end;
}

} // namespace

int32_t FirstBeyond(const DBL *y, int32_t from, int32_t end, double lower, double upper) {
    return First(from, end, Beyond{y, lower, upper});
}

int32_t FirstBeyondOrCrossing(const DBL *y, int32_t from, int32_t end, double lower, double upper,
                              double levelA, double levelB) {
    const Beyond beyond = {y, lower, upper};
    return levelB != levelB ? First(from, end, BeyondOrCrossing<1>{beyond, {levelA}})
                            : First(from, end, BeyondOrCrossing<2>{beyond, {levelA, levelB}});
}

} // namespace qx::QX_WIDTH
