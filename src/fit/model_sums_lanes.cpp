#include "fit/model_sums.h"
#include "frame/lane_masks.h"

extern "C" double exp(double);

namespace qx::QX_WIDTH {

namespace {

typedef Lanes<nativeLanes> Wide;
typedef Lanes<1> One;

constexpr int classes = 4; // of samples, whatever the width

// 2^k for the k in the last bits of a double that is 1.5 * 2^52 + k, for exponents of normal
// numbers.
template <class L>
QX_INLINE L PowerOfTwo(L shifted) {
    return OfBits<L>((ToBits(shifted) + 1023) << 52);
}

// exp(t) as 2^k exp(r) with |r| below 0.35, by Taylor's series, whose remainder is below 5e-18.
template <class L>
QX_INLINE L ExpWithin(L t) {
    const L shift(0x1.8p52);
    const L shifted = t * L(0x1.71547652b82fep+0) + shift;
    const L k = shifted - shift;
    const L r = (t - k * L(0x1.62e42feep-1)) - k * L(0x1.a39ef35793c76p-33);
    const L r2 = r * r, r4 = r2 * r2;
    // 1 / 2!, 1 / 3!, ... 1 / 13!, in pairs, so that few operations depend on each other.
    const L p2 = L(0.5) + L(0x1.5555555555555p-3) * r;
    const L p4 = L(0x1.5555555555555p-5) + L(0x1.1111111111111p-7) * r;
    const L p6 = L(0x1.6c16c16c16c17p-10) + L(0x1.a01a01a01a01ap-13) * r;
    const L p8 = L(0x1.a01a01a01a01ap-16) + L(0x1.71de3a556c734p-19) * r;
    const L p10 = L(0x1.27e4fb7789f5cp-22) + L(0x1.ae64567f544e4p-26) * r;
    const L p12 = L(0x1.1eed8eff8d898p-29) + L(0x1.6124613a86d09p-33) * r;
    const L series = (p2 + p4 * r2) + ((p6 + p8 * r2) + (p10 + p12 * r2) * r4) * r4;
    return (r2 * series + r + L(1.0)) * PowerOfTwo(shifted);
}

template <class L>
QX_INLINE L Exp(L t) {
    constexpr double widest = 708.0; // the results are normal numbers
    L e = ExpWithin(t);
    double values[4], results[4];
    t.store(values);
    bool isWithin = true;
    for (int i = 0; i < L::count; ++i)
        isWithin &= values[i] <= widest && values[i] >= -widest;
    if (isWithin) [[likely]]
        return e;
    for (int i = 0; i < L::count; ++i)
        results[i] = ::exp(values[i]);
    return L::load(results);
}

template <class L>
struct Exponential {
    static constexpr int count = 3;
    L a, b, c;
    QX_INLINE explicit Exponential(const DBL *p) : a(p[0]), b(p[1]), c(p[2]) {}
    QX_INLINE L at(L x, L *d) const {
        d[0] = Exp(b * x);
        d[1] = a * x * d[0];
        d[2] = L(1.0);
        return a * d[0] + c;
    }
};

template <class L>
struct Gaussian {
    static constexpr int count = 4;
    L a, m, s, c;
    QX_INLINE explicit Gaussian(const DBL *p) : a(p[0]), m(p[1]), s(p[2]), c(p[3]) {}
    QX_INLINE L at(L x, L *d) const {
        const L z = (x - m) / s;
        d[0] = Exp(L(-0.5) * (z * z));
        d[1] = a * d[0] * z / s;
        d[2] = d[1] * z;
        d[3] = L(1.0);
        return a * d[0] + c;
    }
};

template <class L>
QX_INLINE L Absolute(L w) {
    return Select(w < L(0.0), -w, w);
}

template <template <class> class Model, bool IsWeighted, class L>
QX_INLINE void Add(const Model<L> &model, const DBL *x, const DBL *y, const DBL *w, L *sums) {
    constexpr int count = Model<L>::count;
    L d[count];
    const L r = L::load(y) - model.at(L::load(x), d);
    const L weight = IsWeighted ? Absolute(L::load(w)) : L(1.0);
    sums[0] = sums[0] + (IsWeighted ? weight * (r * r) : r * r);
    int next = 1;
    for (int i = 0; i < count; ++i) {
        const L weighted = IsWeighted ? weight * d[i] : d[i];
        for (int j = 0; j <= i; ++j, ++next)
            sums[next] = sums[next] + weighted * d[j];
        sums[next] = sums[next] + weighted * r;
        ++next;
    }
}

template <template <class> class Model, bool IsWeighted>
QX_INLINE void Sum(const DBL *x, const DBL *y, const DBL *w, int32_t n, const DBL *p, DBL *out) {
    constexpr int parts = classes / nativeLanes;
    constexpr int32_t count = SumsOfModel(Model<One>::count);
    double sums[count][classes];
    int32_t i = 0;
    {
        const Model<Wide> model(p);
        Wide wide[parts][count];
        for (int part = 0; part < parts; ++part)
            for (int s = 0; s < count; ++s)
                wide[part][s] = Wide(0.0);
        for (; n - i >= classes; i += classes)
            for (int part = 0; part < parts; ++part) {
                const int32_t at = i + part * nativeLanes;
                Add<Model, IsWeighted>(model, x + at, y + at, IsWeighted ? w + at : w, wide[part]);
            }
        for (int part = 0; part < parts; ++part)
            for (int s = 0; s < count; ++s)
                wide[part][s].store(sums[s] + part * nativeLanes);
    }
    const Model<One> model(p);
    for (int32_t rest = 0; i < n; ++i, ++rest) {
        One narrow[count];
        for (int s = 0; s < count; ++s)
            narrow[s] = One(sums[s][rest]);
        Add<Model, IsWeighted>(model, x + i, y + i, IsWeighted ? w + i : w, narrow);
        for (int s = 0; s < count; ++s)
            sums[s][rest] = narrow[s].v;
    }
    for (int s = 0; s < count; ++s)
        out[s] = (sums[s][0] + sums[s][1]) + (sums[s][2] + sums[s][3]);
}

} // namespace

void ExponentialSums(const DBL *x, const DBL *y, const DBL *w, int32_t n, const DBL *p, DBL *sums) {
    if (w == nullptr)
        Sum<Exponential, false>(x, y, w, n, p, sums);
    else
        Sum<Exponential, true>(x, y, w, n, p, sums);
}

void GaussianSums(const DBL *x, const DBL *y, const DBL *w, int32_t n, const DBL *p, DBL *sums) {
    if (w == nullptr)
        Sum<Gaussian, false>(x, y, w, n, p, sums);
    else
        Sum<Gaussian, true>(x, y, w, n, p, sums);
}

} // namespace qx::QX_WIDTH
