#include "linalg/kernels.h"

#include "frame/lane_masks.h"

namespace qx::QX_WIDTH {

// (-x, x) repeated.
template <class L>
static QX_INLINE L NegativeFirst(double x) {
    return NegatedInPairs(L(x), true);
}

// y += the sum of x[i] a[i], row by row, for one vector of elements.
template <class L, int Rows>
static QX_INLINE void AddSomeOfRows(const DBL *a, std::ptrdiff_t stride, const DBL *x, DBL *y) {
    L sum = L::load(y);
    for (int r = 0; r < Rows; ++r)
        sum = sum + L(x[r]) * L::load(a + r * stride);
    sum.store(y);
}

template <int Rows>
static void AddRows(const DBL *a, std::ptrdiff_t stride, int32_t cols, const DBL *x, DBL *y) {
    int32_t j = 0;
    for (; j + nativeLanes <= cols; j += nativeLanes)
        AddSomeOfRows<Lanes<nativeLanes>, Rows>(a + j, stride, x, y + j);
    for (; j + 2 <= cols; j += 2)
        AddSomeOfRows<Lanes<2>, Rows>(a + j, stride, x, y + j);
    if (j < cols)
        AddSomeOfRows<Lanes<1>, Rows>(a + j, stride, x, y + j);
}

void AddTransposedProductReal(const DBL *a, std::ptrdiff_t stride, int32_t rows, int32_t cols,
                              const DBL *x, DBL *y) {
    int32_t i = 0;
    for (; i + 4 <= rows; i += 4)
        AddRows<4>(a + i * stride, stride, cols, x + i, y);
    for (; i < rows; ++i)
        AddRows<1>(a + i * stride, stride, cols, x + i, y);
}

// y += the sum of x[i] a[i], row by row, for one vector of elements.
template <class L, int Rows>
static QX_INLINE void AddComplexRows(const DBL *a, std::ptrdiff_t stride, const CDB *x, DBL *y) {
    L sum = L::load(y);
    for (int r = 0; r < Rows; ++r) {
        const L row = L::load(a + r * stride);
        sum = sum + (L(x[r].re) * row + NegativeFirst<L>(x[r].im) * Swapped(row));
    }
    sum.store(y);
}

template <int Rows>
static void AddComplexRows(const CDB *a, std::ptrdiff_t stride, int32_t cols, const CDB *x,
                           CDB *y) {
    const DBL *const rows = reinterpret_cast<const DBL *>(a);
    DBL *const sums = reinterpret_cast<DBL *>(y);
    const std::ptrdiff_t end = 2 * std::ptrdiff_t{cols};
    std::ptrdiff_t j = 0;
    for (; j + nativeLanes <= end; j += nativeLanes)
        AddComplexRows<Lanes<nativeLanes>, Rows>(rows + j, 2 * stride, x, sums + j);
    for (; j < end; j += 2)
        AddComplexRows<Lanes<2>, Rows>(rows + j, 2 * stride, x, sums + j);
}

void AddTransposedProductComplex(const CDB *a, std::ptrdiff_t stride, int32_t rows, int32_t cols,
                                 const CDB *x, CDB *y) {
    int32_t i = 0;
    for (; i + 4 <= rows; i += 4)
        AddComplexRows<4>(a + i * stride, stride, cols, x + i, y);
    for (; i < rows; ++i)
        AddComplexRows<1>(a + i * stride, stride, cols, x + i, y);
}

void AddOuterProductReal(DBL *a, std::ptrdiff_t stride, int32_t rows, int32_t cols, const DBL *x,
                         const DBL *y) {
    for (int32_t i = 0; i < rows; ++i)
        AddRows<1>(y, 0, cols, x + i, a + i * stride);
}

void AddOuterProductComplex(CDB *a, std::ptrdiff_t stride, int32_t rows, int32_t cols, const CDB *x,
                            const CDB *y) {
    for (int32_t i = 0; i < rows; ++i)
        AddComplexRows<1>(y, 0, cols, x + i, a + i * stride);
}

// Some vectors of all rows, whose products with v stay in registers.
template <class L, int Vectors>
static QX_INLINE void ReflectSomeColumns(DBL *a, std::ptrdiff_t stride, int32_t rows, const DBL *v,
                                         double kappa) {
    L p[Vectors];
    for (int c = 0; c < Vectors; ++c)
        p[c] = L(0.0);
    for (int32_t i = 0; i < rows; ++i)
        for (int c = 0; c < Vectors; ++c)
            p[c] = p[c] + L(v[i]) * L::load(a + i * stride + c * L::count);
    for (int c = 0; c < Vectors; ++c)
        p[c] = -(p[c] / L(kappa));
    for (int32_t i = 0; i < rows; ++i)
        for (int c = 0; c < Vectors; ++c) {
            DBL *const at = a + i * stride + c * L::count;
            (L::load(at) + L(v[i]) * p[c]).store(at);
        }
}

void ReflectFromLeftReal(DBL *a, std::ptrdiff_t stride, int32_t rows, int32_t cols, const DBL *v,
                         double kappa) {
    typedef Lanes<nativeLanes> L;
    int32_t j = 0;
    for (; j + 4 * nativeLanes <= cols; j += 4 * nativeLanes)
        ReflectSomeColumns<L, 4>(a + j, stride, rows, v, kappa);
    for (; j + 2 * nativeLanes <= cols; j += 2 * nativeLanes)
        ReflectSomeColumns<L, 2>(a + j, stride, rows, v, kappa);
    for (; j + nativeLanes <= cols; j += nativeLanes)
        ReflectSomeColumns<L, 1>(a + j, stride, rows, v, kappa);
    for (; j + 2 <= cols; j += 2)
        ReflectSomeColumns<Lanes<2>, 1>(a + j, stride, rows, v, kappa);
    if (j < cols)
        ReflectSomeColumns<Lanes<1>, 1>(a + j, stride, rows, v, kappa);
}

// The quotient by one complex number, as the operator of frame/complex.h forms it.
struct ComplexDivisor {
    double ratio, denominator;
    bool isMoreReal;

    explicit ComplexDivisor(const CDB &by)
        : isMoreReal(__builtin_fabs(by.re) >= __builtin_fabs(by.im)) {
        ratio = isMoreReal ? by.im / by.re : by.re / by.im;
        denominator = isMoreReal ? by.re + by.im * ratio : by.im + by.re * ratio;
    }
    template <class L>
    QX_INLINE L quotient(L x) const {
        const L numerator = isMoreReal ? x + NegativeFirst<L>(-ratio) * Swapped(x)
                                       : x * L(ratio) - NegativeFirst<L>(1.0) * Swapped(x);
        return numerator / L(denominator);
    }
};

template <class L, int Vectors>
static QX_INLINE void ReflectSomeComplexColumns(DBL *a, std::ptrdiff_t stride, int32_t rows,
                                                const CDB *v, const ComplexDivisor &kappa) {
    L p[Vectors], swapped[Vectors];
    for (int c = 0; c < Vectors; ++c)
        p[c] = L(0.0);
    for (int32_t i = 0; i < rows; ++i)
        for (int c = 0; c < Vectors; ++c) {
            const L row = L::load(a + i * stride + c * L::count);
            p[c] = p[c] + (L(v[i].re) * row + NegativeFirst<L>(-v[i].im) * Swapped(row));
        }
    for (int c = 0; c < Vectors; ++c) {
        p[c] = -kappa.quotient(p[c]);
        swapped[c] = Swapped(p[c]);
    }
    for (int32_t i = 0; i < rows; ++i)
        for (int c = 0; c < Vectors; ++c) {
            DBL *const at = a + i * stride + c * L::count;
            (L::load(at) + (L(v[i].re) * p[c] + NegativeFirst<L>(v[i].im) * swapped[c])).store(at);
        }
}

void ReflectFromLeftComplex(CDB *a, std::ptrdiff_t stride, int32_t rows, int32_t cols, const CDB *v,
                            CDB kappa) {
    typedef Lanes<nativeLanes> L;
    const ComplexDivisor divisor(kappa);
    DBL *const parts = reinterpret_cast<DBL *>(a);
    const std::ptrdiff_t end = 2 * std::ptrdiff_t{cols}, step = 2 * stride;
    std::ptrdiff_t j = 0;
    for (; j + 4 * nativeLanes <= end; j += 4 * nativeLanes)
        ReflectSomeComplexColumns<L, 4>(parts + j, step, rows, v, divisor);
    for (; j + 2 * nativeLanes <= end; j += 2 * nativeLanes)
        ReflectSomeComplexColumns<L, 2>(parts + j, step, rows, v, divisor);
    for (; j + nativeLanes <= end; j += nativeLanes)
        ReflectSomeComplexColumns<L, 1>(parts + j, step, rows, v, divisor);
    for (; j < end; j += 2)
        ReflectSomeComplexColumns<Lanes<2>, 1>(parts + j, step, rows, v, divisor);
}

template <class L>
static QX_INLINE void SubtractComplexMultiple(const CDB &factor, const DBL *y, DBL *a) {
    const L row = L::load(y);
    (L::load(a) - MinusPlus(L(factor.re) * row, L(factor.im) * Swapped(row))).store(a);
}

void SubtractOuterProductComplex(CDB *a, std::ptrdiff_t stride, int32_t rows, int32_t cols,
                                 const CDB *x, const CDB *y) {
    const DBL *const from = reinterpret_cast<const DBL *>(y);
    const std::ptrdiff_t end = 2 * std::ptrdiff_t{cols};
    for (int32_t i = 0; i < rows; ++i) {
        const CDB factor = x[i * stride];
        DBL *const to = reinterpret_cast<DBL *>(a + i * stride);
        std::ptrdiff_t j = 0;
        for (; j + nativeLanes <= end; j += nativeLanes)
            SubtractComplexMultiple<Lanes<nativeLanes>>(factor, from + j, to + j);
        for (; j < end; j += 2)
            SubtractComplexMultiple<Lanes<2>>(factor, from + j, to + j);
    }
}

// Subtracts multiples of the rows above from some vectors of a row.
struct RowsAbove {
    const DBL *first;
    std::ptrdiff_t step, change;
    int32_t terms;

    template <class L, int Vectors>
    QX_INLINE void subtractReal(DBL *row, std::ptrdiff_t at) const {
        L sum[Vectors];
        for (int v = 0; v < Vectors; ++v)
            sum[v] = L::load(row + at + v * L::count);
        const DBL *above = first;
        std::ptrdiff_t next = step;
        for (int32_t i = 0; i < terms; ++i, above += next, next -= change) {
            const L factor(*above);
            for (int v = 0; v < Vectors; ++v)
                sum[v] = sum[v] - factor * L::load(above + at + v * L::count);
        }
        for (int v = 0; v < Vectors; ++v)
            sum[v].store(row + at + v * L::count);
    }
    template <class L, int Vectors>
    QX_INLINE void subtractComplex(DBL *row, std::ptrdiff_t at) const {
        L sum[Vectors];
        for (int v = 0; v < Vectors; ++v)
            sum[v] = L::load(row + at + v * L::count);
        const DBL *above = first;
        std::ptrdiff_t next = step;
        for (int32_t i = 0; i < terms; ++i, above += next, next -= change) {
            const L re(-above[0]), im = NegativeFirst<L>(above[1]);
            for (int v = 0; v < Vectors; ++v) {
                const L x = L::load(above + at + v * L::count);
                sum[v] = sum[v] + (re * x + im * Swapped(x));
            }
        }
        for (int v = 0; v < Vectors; ++v)
            sum[v].store(row + at + v * L::count);
    }
};

void SubtractRowsAboveReal(DBL *row, int32_t cols, const DBL *above, std::ptrdiff_t step,
                           std::ptrdiff_t change, int32_t terms) {
    typedef Lanes<nativeLanes> L;
    const RowsAbove rows = {above, step, change, terms};
    int32_t j = 0;
    for (; j + 4 * nativeLanes <= cols; j += 4 * nativeLanes)
        rows.subtractReal<L, 4>(row, j);
    for (; j + nativeLanes <= cols; j += nativeLanes)
        rows.subtractReal<L, 1>(row, j);
    if constexpr (nativeLanes > 4)
        for (; j + 4 <= cols; j += 4)
            rows.subtractReal<Lanes<4>, 1>(row, j);
    for (; j + 2 <= cols; j += 2)
        rows.subtractReal<Lanes<2>, 1>(row, j);
    if (j < cols)
        rows.subtractReal<Lanes<1>, 1>(row, j);
}

void SubtractRowsAboveComplex(CDB *row, int32_t cols, const CDB *above, std::ptrdiff_t step,
                              std::ptrdiff_t change, int32_t terms) {
    typedef Lanes<nativeLanes> L;
    const RowsAbove rows = {reinterpret_cast<const DBL *>(above), 2 * step, 2 * change, terms};
    DBL *const to = reinterpret_cast<DBL *>(row);
    const std::ptrdiff_t end = 2 * std::ptrdiff_t{cols};
    std::ptrdiff_t j = 0;
    for (; j + 4 * nativeLanes <= end; j += 4 * nativeLanes)
        rows.subtractComplex<L, 4>(to, j);
    for (; j + nativeLanes <= end; j += nativeLanes)
        rows.subtractComplex<L, 1>(to, j);
    for (; j < end; j += 2)
        rows.subtractComplex<Lanes<2>, 1>(to, j);
}

double DivideRow(DBL *row, int32_t cols, double divisor) {
    typedef Lanes<nativeLanes> L;
    int32_t j = 0;
    double largest = 0.0;
    if (cols >= nativeLanes) {
        L most(0.0);
        for (; j + nativeLanes <= cols; j += nativeLanes) {
            const L quotient = L::load(row + j) / L(divisor);
            quotient.store(row + j);
            most = Select(most < Magnitude(quotient), Magnitude(quotient), most);
        }
        for (int k = 0; k < nativeLanes; ++k)
            largest = largest < most[k] ? most[k] : largest;
    }
    for (; j < cols; ++j) {
        row[j] = row[j] / divisor;
        const double size = __builtin_fabs(row[j]);
        largest = largest < size ? size : largest;
    }
    return largest;
}

// The products of several rows with x at once.
template <int Rows>
static void DotRows(const DBL *a, std::ptrdiff_t stride, int32_t n, const DBL *x, DBL *y) {
    typedef Lanes<nativeLanes> L;
    constexpr int32_t vectors = 8 / nativeLanes;
    int32_t j = 0;
    double sum[Rows] = {};
    if (n >= 8) {
        L partial[Rows][vectors];
        for (int r = 0; r < Rows; ++r)
            for (int32_t v = 0; v < vectors; ++v)
                partial[r][v] = L(0.0);
        for (; j + 8 <= n; j += 8)
            for (int32_t v = 0; v < vectors; ++v) {
                const L factor = L::load(x + j + v * nativeLanes);
                for (int r = 0; r < Rows; ++r)
                    partial[r][v] =
                        partial[r][v] + L::load(a + r * stride + j + v * nativeLanes) * factor;
            }
        for (int r = 0; r < Rows; ++r) {
            DBL p[8];
            for (int32_t v = 0; v < vectors; ++v)
                partial[r][v].store(p + v * nativeLanes);
            sum[r] = ((p[0] + p[4]) + (p[2] + p[6])) + ((p[1] + p[5]) + (p[3] + p[7]));
        }
    }
    for (int r = 0; r < Rows; ++r) {
        for (int32_t k = j; k < n; ++k)
            sum[r] += a[r * stride + k] * x[k];
        y[r] = sum[r];
    }
}

void RowProductsReal(const DBL *a, std::ptrdiff_t stride, int32_t rows, int32_t cols, const DBL *x,
                     DBL *y) {
    constexpr int atOnce = nativeLanes == 2 ? 2 : 4; // what the registers hold
    int32_t i = 0;
    for (; i + atOnce <= rows; i += atOnce)
        DotRows<atOnce>(a + i * stride, stride, cols, x, y + i);
    for (; i < rows; ++i)
        DotRows<1>(a + i * stride, stride, cols, x, y + i);
}

// Elements 2 j and 2 j + 1 of the rows go into separate sums.
template <int Rows>
static void ComplexDotRows(const CDB *a, std::ptrdiff_t stride, int32_t n, const CDB *x, CDB *y) {
    typedef Lanes<nativeLanes == 2 ? 2 : 4> L;
    constexpr int32_t vectors = 4 / L::count;
    const L sign = NegativeFirst<L>(1.0);
    L partial[Rows][vectors];
    for (int r = 0; r < Rows; ++r)
        for (int32_t v = 0; v < vectors; ++v)
            partial[r][v] = L(0.0);
    int32_t j = 0;
    for (; j + 2 <= n; j += 2)
        for (int32_t v = 0; v < vectors; ++v) {
            const L factor = L::load(&x[j].re + v * L::count);
            const L turned = Swapped(factor) * sign;
            for (int r = 0; r < Rows; ++r) {
                const L row = L::load(&a[r * stride + j].re + v * L::count);
                partial[r][v] =
                    partial[r][v] + (FirstsTwice(row) * factor + SecondsTwice(row) * turned);
            }
        }
    for (int r = 0; r < Rows; ++r) {
        DBL p[4];
        for (int32_t v = 0; v < vectors; ++v)
            partial[r][v].store(p + v * L::count);
        if (j < n) {
            const CDB &z = a[r * stride + j];
            p[0] += z.re * x[j].re - z.im * x[j].im;
            p[1] += z.re * x[j].im + z.im * x[j].re;
        }
        y[r].re = p[0] + p[2];
        y[r].im = p[1] + p[3];
    }
}

void RowProductsComplex(const CDB *a, std::ptrdiff_t stride, int32_t rows, int32_t cols,
                        const CDB *x, CDB *y) {
    int32_t i = 0;
    for (; i + 4 <= rows; i += 4)
        ComplexDotRows<4>(a + i * stride, stride, cols, x, y + i);
    for (; i < rows; ++i)
        ComplexDotRows<1>(a + i * stride, stride, cols, x, y + i);
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

// A panel of 16 columns goes through all rotations before the next one, so that it stays in the
// cache.
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

template <class L>
static QX_INLINE void RotateComplexSome(DBL *p, DBL *q, double c, CDB s) {
    const L x = L::load(p), y = L::load(q), turn = NegativeFirst<L>(s.im);
    (L(c) * x + (L(s.re) * y + turn * Swapped(y))).store(p);
    (L(c) * y - (L(s.re) * x - turn * Swapped(x))).store(q);
}

void RotateComplexRows(CDB *p, CDB *q, int32_t width, double c, CDB s) {
    DBL *const x = reinterpret_cast<DBL *>(p), *const y = reinterpret_cast<DBL *>(q);
    const std::ptrdiff_t end = 2 * std::ptrdiff_t{width};
    std::ptrdiff_t j = 0;
    for (; j + nativeLanes <= end; j += nativeLanes)
        RotateComplexSome<Lanes<nativeLanes>>(x + j, y + j, c, s);
    for (; j < end; j += 2)
        RotateComplexSome<Lanes<2>>(x + j, y + j, c, s);
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

// A reflection of two or three rows and columns, I - w u^T from the left and I - u w^T from the
// right with u[0] = 1 in the first and w[0] = 1 in the second.
struct BulgeReflection {
    double q, r, x, y, z;

    template <class L, int Size>
    QX_INLINE void ofRows(DBL *row, std::ptrdiff_t stride) const {
        const L a = L::load(row), b = L::load(row + stride);
        L p = a + b * L(q);
        if constexpr (Size == 3) {
            const L c = L::load(row + 2 * stride);
            p = p + c * L(r);
            (c - p * L(z)).store(row + 2 * stride);
        }
        (a - p * L(x)).store(row);
        (b - p * L(y)).store(row + stride);
    }
    template <int Size>
    QX_INLINE void ofColumns(DBL *row) const {
        double p = row[0] * x + row[1] * y;
        if constexpr (Size == 3) {
            p = p + row[2] * z;
            row[2] -= p * r;
        }
        row[0] -= p;
        row[1] -= p * q;
    }
};

// A vector that is loaded should not straddle elements that were stored apart just before, which
// the processor has to wait for. So vectors start at fixed columns, and the elements next to the
// diagonal, which column reflections store one by one, are loaded so. The rows from which the next
// reflection is formed are processed first.
template <int Size>
static QX_INLINE void ReflectBulge(DBL *h, std::ptrdiff_t stride, int32_t top, int32_t k,
                                   int32_t last, const BulgeReflection &by) {
    const int32_t end = last + 1;
    DBL *const row = h + k * stride;
    int32_t j = k;
    for (; j < end && (j < k + 3 || j % 2 != 0); ++j)
        by.ofRows<Lanes<1>, Size>(row + j, stride);
    const int32_t bottom = last < k + 3 ? last : k + 3;
    for (int32_t i = bottom; i >= k; --i)
        by.ofColumns<Size>(h + i * stride + k);
    for (; j + 2 <= end && j % nativeLanes != 0; j += 2)
        by.ofRows<Lanes<2>, Size>(row + j, stride);
    for (; j + nativeLanes <= end; j += nativeLanes)
        by.ofRows<Lanes<nativeLanes>, Size>(row + j, stride);
    for (; j + 2 <= end; j += 2)
        by.ofRows<Lanes<2>, Size>(row + j, stride);
    if (j < end)
        by.ofRows<Lanes<1>, Size>(row + j, stride);
    for (int32_t i = k - 1; i >= top; --i)
        by.ofColumns<Size>(h + i * stride + k);
}

void ChaseBulge(DBL *h, std::ptrdiff_t stride, int32_t top, int32_t first, int32_t last,
                const double *column) {
    double a = column[0], b = column[1], c = column[2];
    for (int32_t k = first; k < last; ++k) {
        DBL *const row = h + k * stride;
        double scale = 1.0;
        if (k != first) {
            a = row[k - 1];
            b = row[stride + k - 1];
            c = k == last - 1 ? 0.0 : double(row[2 * stride + k - 1]);
            scale = __builtin_fabs(a) + __builtin_fabs(b) + __builtin_fabs(c);
            if (scale == 0.0)
                continue;
            a /= scale;
            b /= scale;
            c /= scale;
        }
        const double s = __builtin_copysign(__builtin_sqrt(a * a + b * b + c * c), a);
        if (k != first)
            row[k - 1] = -s * scale;
        else if (top != first)
            row[k - 1] = -row[k - 1];
        if (s == 0.0)
            continue;
        a += s;
        const BulgeReflection by = {b / a, c / a, a / s, b / s, c / s};
        if (k == last - 1)
            ReflectBulge<2>(h, stride, top, k, last, by);
        else
            ReflectBulge<3>(h, stride, top, k, last, by);
    }
}

} // namespace qx::QX_WIDTH
