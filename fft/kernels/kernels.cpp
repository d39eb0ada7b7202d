#include "fft/kernels/kernels.h"

#include <cmath>
#include <cstddef>

namespace qx {
namespace {

using std::ptrdiff_t;

template <int P>
struct RootTable {
    double re[P], im[P];
    RootTable() {
        for (int k = 0; k < P; ++k) {
            re[k] = std::cos(6.283185307179586 * k / P);
            im[k] = -std::sin(6.283185307179586 * k / P);
        }
    }
};

template <int P>
void Transform(const double (&xr)[P], const double (&xi)[P], double (&yr)[P], double (&yi)[P]) {
    static const RootTable<P> roots;
    for (int q = 0; q < P; ++q) {
        yr[q] = yi[q] = 0;
        for (int j = 0; j < P; ++j) {
            const int e = j * q % P;
            yr[q] += xr[j] * roots.re[e] - xi[j] * roots.im[e];
            yi[q] += xr[j] * roots.im[e] + xi[j] * roots.re[e];
        }
    }
}

template <int P>
void ComplexLeafOf(const DBL *inRe, const DBL *inIm, DBL *outRe, DBL *outIm, int32_t inStride,
                   int32_t outStride, int32_t count) {
    for (ptrdiff_t i = 0; i < count; ++i) {
        double xr[P], xi[P], yr[P], yi[P];
        for (int j = 0; j < P; ++j) {
            xr[j] = inRe[(i + j * ptrdiff_t{count}) * inStride];
            xi[j] = inIm[(i + j * ptrdiff_t{count}) * inStride];
        }
        Transform<P>(xr, xi, yr, yi);
        for (int j = 0; j < P; ++j) {
            outRe[(i * P + j) * outStride] = yr[j];
            outIm[(i * P + j) * outStride] = yi[j];
        }
    }
}

template <int P>
void ComplexTwiddleOf(DBL *re, DBL *im, const DBL *twiddleCos, const DBL *twiddleSin,
                      int32_t stride, int32_t m) {
    for (ptrdiff_t k = 0; k < m; ++k) {
        double xr[P], xi[P], yr[P], yi[P];
        for (int j = 0; j < P; ++j) {
            const ptrdiff_t at = (k + j * ptrdiff_t{m}) * stride;
            const ptrdiff_t entry = (k - 1) * (P - 1) + j - 1;
            const double c = k == 0 || j == 0 ? 1 : twiddleCos[entry];
            const double s = k == 0 || j == 0 ? 0 : twiddleSin[entry];
            xr[j] = re[at] * c - im[at] * s;
            xi[j] = re[at] * s + im[at] * c;
        }
        Transform<P>(xr, xi, yr, yi);
        for (int j = 0; j < P; ++j) {
            re[(k + j * ptrdiff_t{m}) * stride] = yr[j];
            im[(k + j * ptrdiff_t{m}) * stride] = yi[j];
        }
    }
}

template <int P>
void RealLeafOf(const DBL *in, DBL *out, int32_t inStride, int32_t outStride, int32_t count) {
    for (ptrdiff_t i = 0; i < count; ++i) {
        double xr[P], xi[P] = {}, yr[P], yi[P];
        for (int j = 0; j < P; ++j)
            xr[j] = in[(i + j * ptrdiff_t{count}) * inStride];
        Transform<P>(xr, xi, yr, yi);
        for (int j = 0; 2 * j <= P; ++j) {
            out[(i * P + j) * outStride] = yr[j];
            if (j > 0 && 2 * j < P)
                out[(i * P + P - j) * outStride] = yi[j];
        }
    }
}

template <int P>
void RealTwiddleOf(DBL *data, const DBL *twiddleCos, const DBL *twiddleSin, int32_t stride,
                   int32_t m) {
    const ptrdiff_t n = ptrdiff_t{m} * P;
    for (ptrdiff_t k = 0; 2 * k <= m; ++k) {
        double xr[P], xi[P], yr[P], yi[P];
        for (int j = 0; j < P; ++j) {
            const double a = data[(j * ptrdiff_t{m} + k) * stride];
            const double b = k == 0 || 2 * k == m ? 0 : data[(j * ptrdiff_t{m} + m - k) * stride];
            const ptrdiff_t entry = (k - 1) * (P - 1) + j - 1;
            const double c = k == 0 || j == 0 ? 1 : twiddleCos[entry];
            const double s = k == 0 || j == 0 ? 0 : twiddleSin[entry];
            xr[j] = a * c - b * s;
            xi[j] = a * s + b * c;
        }
        Transform<P>(xr, xi, yr, yi);
        for (int q = 0; q < P; ++q) {
            const ptrdiff_t t = k + q * ptrdiff_t{m};
            const bool direct = 2 * t <= n;
            const ptrdiff_t place = direct ? t : n - t;
            data[place * stride] = yr[q];
            if (place > 0 && 2 * place < n)
                data[(n - place) * stride] = direct ? yi[q] : -yi[q];
        }
    }
}

template <int P>
constexpr KernelSet kernelsOf = {RealLeafOf<P>, RealTwiddleOf<P>, ComplexLeafOf<P>,
                                 ComplexTwiddleOf<P>};

template <int... P>
const KernelSet *Find(int32_t radix) {
    const KernelSet *found = nullptr;
    ((radix == P ? found = &kernelsOf<P> : nullptr), ...);
    return found;
}

} // namespace

const KernelSet &KernelsOf(int32_t radix) {
    return *Find<2, 3, 4, 5, 7, 8, 9, 10, 11, 13, 14, 16, 17, 18, 19, 29, 31, 32, 37, 41, 43>(
        radix);
}

} // namespace qx
