#include "linalg/kernels.h"

#include "frame/lanes.h"

namespace qx::QX_WIDTH {

void AddTransposedProductReal(const DBL *a, std::ptrdiff_t stride, int32_t rows, int32_t cols,
                              const DBL *x, DBL *y) {
    int32_t i = 0;
    for (; i + 4 <= rows; i += 4) {
        const DBL *const row = a + i * stride;
        const double x0 = x[i], x1 = x[i + 1], x2 = x[i + 2], x3 = x[i + 3];
        for (int32_t j = 0; j < cols; ++j) {
            double sum = y[j];
            sum += x0 * row[j];
            sum += x1 * row[j + stride];
            sum += x2 * row[j + 2 * stride];
            sum += x3 * row[j + 3 * stride];
            y[j] = sum;
        }
    }
    for (; i < rows; ++i) {
        const DBL *const row = a + i * stride;
        const double factor = x[i];
        for (int32_t j = 0; j < cols; ++j)
            y[j] += factor * row[j];
    }
}

void AddTransposedProductComplex(const CDB *a, std::ptrdiff_t stride, int32_t rows, int32_t cols,
                                 const CDB *x, CDB *y) {
    for (int32_t i = 0; i < rows; ++i) {
        const CDB *const row = a + i * stride;
        const double re = x[i].re, im = x[i].im;
        for (int32_t j = 0; j < cols; ++j) {
            y[j].re += re * row[j].re - im * row[j].im;
            y[j].im += re * row[j].im + im * row[j].re;
        }
    }
}

void AddOuterProductReal(DBL *a, std::ptrdiff_t stride, int32_t rows, int32_t cols, const DBL *x,
                         const DBL *y) {
    for (int32_t i = 0; i < rows; ++i) {
        DBL *const row = a + i * stride;
        const double factor = x[i];
        for (int32_t j = 0; j < cols; ++j)
            row[j] += factor * y[j];
    }
}

void AddOuterProductComplex(CDB *a, std::ptrdiff_t stride, int32_t rows, int32_t cols, const CDB *x,
                            const CDB *y) {
    for (int32_t i = 0; i < rows; ++i) {
        CDB *const row = a + i * stride;
        const double re = x[i].re, im = x[i].im;
        for (int32_t j = 0; j < cols; ++j) {
            row[j].re += re * y[j].re - im * y[j].im;
            row[j].im += re * y[j].im + im * y[j].re;
        }
    }
}

static double Dot(const DBL *x, const DBL *y, int32_t n) {
    typedef Lanes<nativeLanes> L;
    constexpr int32_t vectors = 8 / nativeLanes;
    double sum = 0.0;
    int32_t j = 0;
    if (n >= 8) {
        L partial[vectors];
        for (int32_t v = 0; v < vectors; ++v)
            partial[v] = L(0.0);
        for (; j + 8 <= n; j += 8)
            for (int32_t v = 0; v < vectors; ++v)
                partial[v] = partial[v] +
                             L::load(x + j + v * nativeLanes) * L::load(y + j + v * nativeLanes);
        DBL p[8];
        for (int32_t v = 0; v < vectors; ++v)
            partial[v].store(p + v * nativeLanes);
        sum = ((p[0] + p[4]) + (p[2] + p[6])) + ((p[1] + p[5]) + (p[3] + p[7]));
    }
    for (; j < n; ++j)
        sum += x[j] * y[j];
    return sum;
}

void RowProductsReal(const DBL *a, std::ptrdiff_t stride, int32_t rows, int32_t cols, const DBL *x,
                     DBL *y) {
    for (int32_t i = 0; i < rows; ++i)
        y[i] = Dot(a + i * stride, x, cols);
}

void RowProductsComplex(const CDB *a, std::ptrdiff_t stride, int32_t rows, int32_t cols,
                        const CDB *x, CDB *y) {
    for (int32_t i = 0; i < rows; ++i) {
        const CDB *const row = a + i * stride;
        double re[2] = {0.0, 0.0}, im[2] = {0.0, 0.0};
        for (int32_t j = 0; j < cols; ++j) {
            re[j & 1] += row[j].re * x[j].re - row[j].im * x[j].im;
            im[j & 1] += row[j].re * x[j].im + row[j].im * x[j].re;
        }
        y[i].re = re[0] + re[1];
        y[i].im = im[0] + im[1];
    }
}

template <class L, int Vectors>
static void RotatePanel(DBL *a, std::ptrdiff_t stride, const Rotation *rotations, int32_t count) {
    for (int32_t r = 0; r < count; ++r) {
        DBL *const p = a + rotations[r].p * stride;
        DBL *const q = a + rotations[r].q * stride;
        const L c(rotations[r].c), s(rotations[r].s);
        for (int v = 0; v < Vectors; ++v) {
            const L x = L::load(p + v * L::count), y = L::load(q + v * L::count);
            (x * c + y * s).store(p + v * L::count);
            (y * c - x * s).store(q + v * L::count);
        }
    }
}

// A panel of 16 columns passes through all rotations at once, so that it stays in the cache.
void RotateRows(DBL *a, std::ptrdiff_t stride, int32_t width, const Rotation *rotations,
                int32_t count) {
    typedef Lanes<nativeLanes> L;
    int32_t j = 0;
    for (; j + 16 <= width; j += 16)
        RotatePanel<L, 16 / nativeLanes>(a + j, stride, rotations, count);
    for (; j + nativeLanes <= width; j += nativeLanes)
        RotatePanel<L, 1>(a + j, stride, rotations, count);
    for (; j < width; ++j)
        RotatePanel<Lanes<1>, 1>(a + j, stride, rotations, count);
}

void RotateComplexRows(CDB *p, CDB *q, int32_t width, double c, CDB s) {
    for (int32_t j = 0; j < width; ++j) {
        const double xRe = p[j].re, xIm = p[j].im, yRe = q[j].re, yIm = q[j].im;
        p[j].re = c * xRe + (s.re * yRe - s.im * yIm);
        p[j].im = c * xIm + (s.re * yIm + s.im * yRe);
        q[j].re = c * yRe - (s.re * xRe + s.im * xIm);
        q[j].im = c * yIm - (s.re * xIm - s.im * xRe);
    }
}

template <class L, int Vectors>
static void ReflectPanel(DBL *a, std::ptrdiff_t stride, const SmallReflection *reflections,
                         int32_t count) {
    for (int32_t r = 0; r < count; ++r) {
        const SmallReflection &h = reflections[r];
        DBL *const row = a + h.first * stride;
        const L u0(h.u[0]), u1(h.u[1]), u2(h.u[2]), w0(h.w[0]), w1(h.w[1]), w2(h.w[2]);
        for (int v = 0; v < Vectors * L::count; v += L::count) {
            const L x = L::load(row + v), y = L::load(row + stride + v);
            L p = x * u0 + y * u1;
            if (h.size == 3) {
                const L z = L::load(row + 2 * stride + v);
                p = p + z * u2;
                (z - p * w2).store(row + 2 * stride + v);
            }
            (x - p * w0).store(row + v);
            (y - p * w1).store(row + stride + v);
        }
    }
}

void ReflectRows(DBL *a, std::ptrdiff_t stride, int32_t width, const SmallReflection *reflections,
                 int32_t count) {
    typedef Lanes<nativeLanes> L;
    int32_t j = 0;
    for (; j + 16 <= width; j += 16)
        ReflectPanel<L, 16 / nativeLanes>(a + j, stride, reflections, count);
    for (; j + nativeLanes <= width; j += nativeLanes)
        ReflectPanel<L, 1>(a + j, stride, reflections, count);
    for (; j < width; ++j)
        ReflectPanel<Lanes<1>, 1>(a + j, stride, reflections, count);
}

void ReflectColumns(DBL *a, std::ptrdiff_t stride, int32_t rows,
                    const SmallReflection *reflection) {
    const SmallReflection h = *reflection;
    for (int32_t i = 0; i < rows; ++i) {
        DBL *const row = a + i * stride + h.first;
        double p = row[0] * h.u[0] + row[1] * h.u[1];
        if (h.size == 3) {
            p = p + row[2] * h.u[2];
            row[2] -= p * h.w[2];
        }
        row[0] -= p * h.w[0];
        row[1] -= p * h.w[1];
    }
}

} // namespace qx::QX_WIDTH
