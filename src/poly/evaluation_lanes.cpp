#include "frame/lanes.h"
#include "poly/evaluation.h"

namespace qx::QX_WIDTH {

namespace {

typedef Lanes<nativeLanes> L;
typedef Lanes<1> One;

// The high half of the digits (T. J. Dekker, 1971).
template <class V>
QX_INLINE V HighHalf(V a) {
    const V t = V(134217729.0) * a; // 2^27 + 1
    return t - (t - a);
}

// A factor with its halves.
template <class V>
struct Split {
    V value, high, low;
    QX_INLINE Split() = default;
    QX_INLINE explicit Split(V a) : value(a), high(HighHalf(a)), low(a - high) {}
};

// a b = product + error, exactly.
template <class V>
QX_INLINE V Multiply(const Split<V> &a, const Split<V> &b, V &error) {
    const V product = a.value * b.value;
    error = ((a.high * b.high - product) + a.high * b.low + a.low * b.high) + a.low * b.low;
    return product;
}

// a + b = sum + error, exactly.
template <class V>
QX_INLINE V Add(V a, V b, V &error) {
    const V sum = a + b;
    const V t = sum - a;
    error = (a - (sum - t)) + (b - t);
    return sum;
}

// The compensation overflows before the value does.
QX_INLINE double Corrected(double value, double correction) {
    return correction - correction == 0.0 ? value + correction : value;
}

// Two groups of lanes at once keep the arithmetic units busy.
template <class V, int Groups>
QX_INLINE void RealPoints(const DBL *p, int32_t n, const DBL *x, DBL *y) {
    Split<V> points[Groups];
    V value[Groups], correction[Groups];
    for (int g = 0; g < Groups; ++g) {
        points[g] = Split<V>(V::load(x + g * V::count));
        value[g] = V(p[n - 1]);
        correction[g] = V(0.0);
    }
    for (std::ptrdiff_t k = n - 2; k >= 0; --k) {
        const V coefficient(p[k]);
        for (int g = 0; g < Groups; ++g) {
            V ofProduct, ofSum;
            const V product = Multiply(Split<V>(value[g]), points[g], ofProduct);
            value[g] = Add(product, coefficient, ofSum);
            correction[g] = correction[g] * points[g].value + (ofProduct + ofSum);
        }
    }
    for (int g = 0; g < Groups; ++g)
        for (int lane = 0; lane < V::count; ++lane)
            y[g * V::count + lane] = Corrected(value[g][lane], correction[g][lane]);
}

template <class V>
struct ComplexLanes {
    V re, im;
};

// value x + coefficient with the errors of the four products and four sums.
template <class V>
QX_INLINE void HornerStep(const CDB &coefficient, const Split<V> &re, const Split<V> &im,
                          ComplexLanes<V> &value, ComplexLanes<V> &correction) {
    const Split<V> valueRe(value.re), valueIm(value.im);
    V error[8];
    const V reRe = Multiply(valueRe, re, error[0]), imIm = Multiply(valueIm, im, error[1]);
    const V reIm = Multiply(valueRe, im, error[2]), imRe = Multiply(valueIm, re, error[3]);
    const V productRe = Add(reRe, -imIm, error[4]), productIm = Add(reIm, imRe, error[5]);
    value.re = Add(productRe, V(coefficient.re), error[6]);
    value.im = Add(productIm, V(coefficient.im), error[7]);
    const V errorRe = ((error[0] - error[1]) + error[4]) + error[6];
    const V errorIm = ((error[2] + error[3]) + error[5]) + error[7];
    const V re0 = correction.re * re.value - correction.im * im.value;
    const V im0 = correction.re * im.value + correction.im * re.value;
    correction = {re0 + errorRe, im0 + errorIm};
}

template <class V>
QX_INLINE void ComplexPoints(const CDB *p, int32_t n, const CDB *x, CDB *y) {
    const Split<V> re(V::gather(&x->re, 2)), im(V::gather(&x->im, 2));
    ComplexLanes<V> value = {V(p[n - 1].re), V(p[n - 1].im)};
    ComplexLanes<V> correction = {V(0.0), V(0.0)};
    for (std::ptrdiff_t k = n - 2; k >= 0; --k)
        HornerStep(p[k], re, im, value, correction);
    for (int lane = 0; lane < V::count; ++lane) {
        const double ofRe = correction.re[lane], ofIm = correction.im[lane];
        const bool isFinite = ofRe - ofRe == 0.0 && ofIm - ofIm == 0.0;
        y[lane].re = value.re[lane] + (isFinite ? ofRe : 0.0);
        y[lane].im = value.im[lane] + (isFinite ? ofIm : 0.0);
    }
}

} // namespace

void EvaluateReal(const DBL *p, int32_t n, const DBL *x, std::ptrdiff_t count, DBL *y) {
    constexpr int groups = 2;
    std::ptrdiff_t i = 0;
    for (; count - i >= groups * L::count; i += groups * L::count)
        RealPoints<L, groups>(p, n, x + i, y + i);
    for (; i < count; ++i)
        RealPoints<One, 1>(p, n, x + i, y + i);
}

void EvaluateComplex(const CDB *p, int32_t n, const CDB *x, std::ptrdiff_t count, CDB *y) {
    std::ptrdiff_t i = 0;
    for (; count - i >= L::count; i += L::count)
        ComplexPoints<L>(p, n, x + i, y + i);
    for (; i < count; ++i)
        ComplexPoints<One>(p, n, x + i, y + i);
}

} // namespace qx::QX_WIDTH
