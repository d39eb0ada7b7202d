#include "frame/lanes.h"
#include "poly/sylvester_matrices.h"

namespace qx::QX_WIDTH {

namespace {

typedef Lanes<nativeLanes> L;

const DBL *Parts(const CDB *x) { return reinterpret_cast<const DBL *>(x); }
DBL *Parts(CDB *x) { return reinterpret_cast<DBL *>(x); }

// The products a b of complex numbers, a in all pairs.
template <class V>
QX_INLINE V Product(double re, double im, V b) {
    return MinusPlus(V(re) * b, V(im) * Swapped(b));
}

template <class V>
QX_INLINE void SubtractColumns(const DBL *columns, std::ptrdiff_t stride, const CDB *factors,
                               DBL *x) {
    V difference = V::load(x);
    QX_UNROLLED
    for (int r = 0; r < 4; ++r) {
        const V element = V::load(columns - r * stride);
        const V factor = InEveryPair<V::count>(Lanes<2>::load(&factors[r].re));
        difference = difference - MinusPlus(FirstsTwice(element) * factor,
                                            SecondsTwice(element) * Swapped(factor));
    }
    difference.store(x);
}

constexpr int vectors = 4 / nativeLanes; // of a pair of complex numbers

} // namespace

void SubtractShifted(CDB factor, int32_t count, CDB *a) {
    constexpr int32_t together = nativeLanes / 2;
    int32_t i = count;
    for (; i >= together; i -= together) {
        DBL *const at = Parts(a + i - together + 1);
        (L::load(at) - Product(factor.re, factor.im, L::load(at - 2))).store(at);
    }
    for (; i > 0; --i) {
        DBL *const at = Parts(a + i);
        (Lanes<2>::load(at) - Product(factor.re, factor.im, Lanes<2>::load(at - 2))).store(at);
    }
}

void SubtractMultiple(CDB factor, std::ptrdiff_t n, const CDB *x, CDB *y) {
    const DBL *const from = Parts(x);
    DBL *const to = Parts(y);
    std::ptrdiff_t j = 0;
    for (; j + nativeLanes <= 2 * n; j += nativeLanes)
        (L::load(to + j) - Product(factor.re, factor.im, L::load(from + j))).store(to + j);
    for (; j < 2 * n; j += 2)
        (Lanes<2>::load(to + j) - Product(factor.re, factor.im, Lanes<2>::load(from + j)))
            .store(to + j);
}

void SubtractFourColumns(const CDB *columns, std::ptrdiff_t stride, const CDB *factors,
                         std::ptrdiff_t n, CDB *x) {
    std::ptrdiff_t j = 0;
    for (; j + nativeLanes / 2 <= n; j += nativeLanes / 2)
        SubtractColumns<L>(Parts(columns + j), 2 * stride, factors, Parts(x + j));
    for (; j < n; ++j)
        SubtractColumns<Lanes<2>>(Parts(columns + j), 2 * stride, factors, Parts(x + j));
}

void SubtractAdjointProducts(const CDB *columns, std::ptrdiff_t stride, const CDB *y,
                             std::ptrdiff_t n, CDB *sums) {
    L sum[2 * vectors];
    const DBL *from[4];
    for (int r = 0; r < 4; ++r)
        from[r] = Parts(columns + r * stride);
    for (int v = 0; v < 2 * vectors; ++v)
        sum[v] = L::load(Parts(sums) + v * nativeLanes);
    for (std::ptrdiff_t j = 0; j < n; ++j) {
        const L factor = InEveryPair<nativeLanes>(Lanes<2>::load(Parts(y + j)));
        const L turned = Swapped(factor);
        QX_UNROLLED
        for (int v = 0; v < 2 * vectors; ++v) {
            const L element = LoadPairs<nativeLanes>(from + v * nativeLanes / 2, 2 * j);
            sum[v] = sum[v] -
                     MinusPlus(FirstsTwice(element) * factor, -(SecondsTwice(element) * turned));
        }
    }
    for (int v = 0; v < 2 * vectors; ++v)
        sum[v].store(Parts(sums) + v * nativeLanes);
}

void AddAdjointProducts(const CDB *reflector, std::ptrdiff_t n, const CDB *pairs, CDB *sums) {
    L sum[vectors];
    for (int v = 0; v < vectors; ++v)
        sum[v] = L::load(Parts(sums) + v * nativeLanes);
    for (std::ptrdiff_t i = 0; i < n; ++i)
        QX_UNROLLED
    for (int v = 0; v < vectors; ++v)
        sum[v] = sum[v] + Product(reflector[i].re, -reflector[i].im,
                                  L::load(Parts(pairs + 2 * i) + v * nativeLanes));
    for (int v = 0; v < vectors; ++v)
        sum[v].store(Parts(sums) + v * nativeLanes);
}

void ReflectPairs(const CDB *reflector, const CDB *factors, const CDB *next, std::ptrdiff_t n,
                  CDB *pairs, CDB *sums) {
    L sum[vectors], factor[vectors];
    for (int v = 0; v < vectors; ++v) {
        sum[v] = L::load(Parts(sums) + v * nativeLanes);
        factor[v] = L::load(Parts(factors) + v * nativeLanes);
    }
    for (std::ptrdiff_t i = 0; i < n; ++i)
        QX_UNROLLED
    for (int v = 0; v < vectors; ++v) {
        DBL *const at = Parts(pairs + 2 * i) + v * nativeLanes;
        const L reflected = L::load(at) - Product(reflector[i].re, reflector[i].im, factor[v]);
        reflected.store(at);
        sum[v] = sum[v] + Product(next[i].re, -next[i].im, reflected);
    }
    for (int v = 0; v < vectors; ++v)
        sum[v].store(Parts(sums) + v * nativeLanes);
}

} // namespace qx::QX_WIDTH
