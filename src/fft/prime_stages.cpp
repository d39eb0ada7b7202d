#include "fft/prime_stages.h"

#include "fft/execute.h"
#include "frame/elements.h"
#include "frame/lanes.h"

#include <algorithm>
#include <cstddef>

namespace qx {
namespace {

using std::ptrdiff_t;

typedef Lanes<2> Pair; // a complex value

// Complex values at a stride.
struct Input {
    const DBL *re, *im;
    ptrdiff_t stride;

    Pair at(ptrdiff_t i) const { return Pair(Pair::Vector{re[i * stride], im[i * stride]}); }
};
struct Output {
    DBL *re, *im;
    ptrdiff_t stride;

    void set(ptrdiff_t i, Pair value) const { set(i, value[0], value[1]); }
    void set(ptrdiff_t i, double real, double imaginary) const {
        re[i * stride] = real;
        im[i * stride] = imaginary;
    }
};

Output Interleaved(DBL *values) { return {values, values + 1, 2}; }

// The p-point transforms. They gather their input into `work` first, so they may work in place.

// A padded convolution keeps its spectrum in `work` too.
bool IsPadded(const PrimeFactor &factor) { return factor.stage->raderPlan->length != factor.p - 1; }

// Rounded up to whole cache lines, so that the memory that follows keeps its alignment.
int64_t WholeLines(int64_t values) { return (values + 7) / 8 * 8; }

// The number of values of `work` that Rader's algorithm itself uses. The work memory of the transforms of
// its convolution follows.
int64_t RaderComplexWork(const PrimeFactor &factor) {
    const int64_t n = factor.stage->raderPlan->length;
    return WholeLines(IsPadded(factor) ? 4 * n : 2 * n);
}
int64_t RaderRealWork(const PrimeFactor &factor) {
    return WholeLines(4 * int64_t{factor.stage->raderPlan->length});
}

// A plain sum works on the stack, in two columns of complex values.
constexpr ptrdiff_t directWork = 4 * 47;

void DirectComplex(const PrimeFactor &factor, Input x, Output y, DBL *work) {
    const ptrdiff_t p = factor.p;
    const ptrdiff_t h = p / 2;
    const DBL *const rootCos = factor.stage->rootCos;
    const DBL *const rootSin = factor.stage->rootSin;
    const Pair x0 = x.at(0);
    Pair sum = x0;
    for (ptrdiff_t i = 1; i <= h; ++i) {
        const Pair left = x.at(i);
        const Pair right = x.at(p - i);
        (left + right).store(work + 4 * i - 4);
        // i times the difference
        const Pair difference = left - right;
        Pair(Pair::Vector{-difference[1], difference[0]}).store(work + 4 * i - 2);
        sum = sum + (left + right);
    }
    y.set(0, sum);
    // Two sums at a time, because they do not depend on each other; if h is odd, both are the last one.
    for (ptrdiff_t q = 1; q <= h; q += 2) {
        const ptrdiff_t frequencies[2] = {q, std::min(q + 1, h)};
        Pair value[2] = {x0, x0};
        Pair mirrored[2] = {x0, x0};
        ptrdiff_t e[2] = {0, 0};
        for (ptrdiff_t i = 1; i <= h; ++i) {
            for (int which = 0; which < 2; ++which) {
                e[which] += frequencies[which];
                if (e[which] >= p)
                    e[which] -= p;
                const Pair even = Pair::load(work + 4 * i - 4) * Pair(rootCos[e[which]]);
                const Pair odd = Pair::load(work + 4 * i - 2) * Pair(rootSin[e[which]]);
                value[which] = value[which] + (even + odd);
                mirrored[which] = mirrored[which] + (even - odd);
            }
        }
        for (int which = 0; which < 2; ++which) {
            y.set(frequencies[which], value[which]);
            y.set(p - frequencies[which], mirrored[which]);
        }
    }
}

void DirectReal(const PrimeFactor &factor, const DBL *x, ptrdiff_t inStride, DBL *y,
                ptrdiff_t outStride, DBL *work) {
    const ptrdiff_t p = factor.p;
    const ptrdiff_t h = p / 2;
    const double x0 = x[0];
    double sum = x0;
    for (ptrdiff_t i = 1; i <= h; ++i) {
        work[2 * i - 2] = x[i * inStride] + x[(p - i) * inStride];
        work[2 * i - 1] = x[i * inStride] - x[(p - i) * inStride];
        sum += work[2 * i - 2];
    }
    y[0] = sum;
    for (ptrdiff_t q = 1; q <= h; ++q) {
        double re = x0;
        double im = 0;
        ptrdiff_t e = 0;
        for (ptrdiff_t i = 1; i <= h; ++i) {
            e += q;
            if (e >= p)
                e -= p;
            re += work[2 * i - 2] * factor.stage->rootCos[e];
            im += work[2 * i - 1] * factor.stage->rootSin[e];
        }
        y[q * outStride] = re;
        y[(p - q) * outStride] = im;
    }
}

// Multiplies value k of the spectrum by that of the roots and conjugates it: together with the
// conjugation at the end, a forward transform then acts as the inverse transform.
void SetConjugateProduct(const FFTStage &stage, ptrdiff_t k, double a, double b, Output y) {
    const Pair w(Pair::Vector{stage.raderCos[k], stage.raderSin[k]});
    y.set(k, NegatedInPairs(Pair(a) * w, false) - Pair(b) * w.reversed());
}

void RaderComplex(const PrimeFactor &factor, Input x, Output y, DBL *work) {
    const FFTStage &stage = *factor.stage;
    const FFTPlan &plan = *stage.raderPlan;
    const ptrdiff_t p = factor.p;
    const ptrdiff_t n = plan.length;
    const Output gathered = Interleaved(work);
    const Output spectrum = IsPadded(factor) ? Interleaved(work + 2 * n)
                                             : Output{y.re + y.stride, y.im + y.stride, y.stride};
    DBL *const inner = work + RaderComplexWork(factor);
    const double x0Re = x.re[0];
    const double x0Im = x.im[0];
    double sumRe = x0Re;
    double sumIm = x0Im;
    for (ptrdiff_t i = 1; i < p; ++i) {
        const ptrdiff_t source = stage.raderGather[i] * x.stride;
        gathered.set(i - 1, x.re[source], x.im[source]);
        sumRe += x.re[source];
        sumIm += x.im[source];
    }
    Fill(work + 2 * (p - 1), 2 * (n - (p - 1)), 0.0);
    y.set(0, sumRe, sumIm);
    ExecuteComplex(plan, gathered.re, gathered.im, spectrum.re, spectrum.im, 2, spectrum.stride,
                   inner);
    for (ptrdiff_t k = 0; k < n; ++k)
        SetConjugateProduct(stage, k, spectrum.re[k * spectrum.stride],
                            spectrum.im[k * spectrum.stride], spectrum);
    ExecuteComplex(plan, spectrum.re, spectrum.im, gathered.re, gathered.im, spectrum.stride, 2,
                   inner);
    for (ptrdiff_t i = 1; i < p; ++i)
        y.set(stage.raderScatter[i], x0Re + work[2 * i - 2], x0Im - work[2 * i - 1]);
}

// The length of a convolution is even, with or without padding.
void RaderReal(const PrimeFactor &factor, const DBL *x, ptrdiff_t inStride, DBL *y,
               ptrdiff_t outStride, DBL *work) {
    const FFTStage &stage = *factor.stage;
    const FFTPlan &plan = *stage.raderPlan;
    const ptrdiff_t p = factor.p;
    const ptrdiff_t n = plan.length;
    DBL *const half = work; // n values, half-complex
    const Output spectrum = Interleaved(work + 2 * n);
    DBL *const gathered = spectrum.re; // n values, before the spectrum
    DBL *const inner = work + RaderRealWork(factor);
    const double x0 = x[0];
    double sum = x0;
    for (ptrdiff_t i = 1; i < p; ++i) {
        gathered[i - 1] = x[stage.raderGather[i] * inStride];
        sum += gathered[i - 1];
    }
    Fill(gathered + (p - 1), n - (p - 1), 0.0);
    ExecuteReal(plan, gathered, half, 1, 1, inner);
    SetConjugateProduct(stage, 0, half[0], 0, spectrum);
    for (ptrdiff_t k = 1; 2 * k < n; ++k) {
        SetConjugateProduct(stage, k, half[k], half[n - k], spectrum);
        SetConjugateProduct(stage, n - k, half[k], -half[n - k], spectrum);
    }
    SetConjugateProduct(stage, n / 2, half[n / 2], 0, spectrum);
    ExecuteComplex(plan, spectrum.re, spectrum.im, work, work + 1, 2, 2, inner);
    y[0] = sum;
    // The frequencies in places i and i + (p - 1) / 2 are opposite. The lower one is taken.
    const ptrdiff_t opposite = (p - 1) / 2;
    for (ptrdiff_t i = 1; i <= opposite; ++i) {
        const ptrdiff_t first = stage.raderScatter[i];
        const bool isLow = 2 * first < p;
        const ptrdiff_t k = isLow ? first : p - first;
        const DBL *const result = work + 2 * (isLow ? i - 1 : i - 1 + opposite);
        y[k * outStride] = x0 + result[0];
        y[(p - k) * outStride] = -result[1];
    }
}

void TransformComplex(const PrimeFactor &factor, Input x, Output y, DBL *work) {
    (factor.kind == DirectPrime ? DirectComplex : RaderComplex)(factor, x, y, work);
}
void TransformReal(const PrimeFactor &factor, const DBL *x, ptrdiff_t inStride, DBL *y,
                   ptrdiff_t outStride, DBL *work) {
    (factor.kind == DirectPrime ? DirectReal : RaderReal)(factor, x, inStride, y, outStride, work);
}

// Value times the twiddle of column k and block j.
void SetTwiddled(const PrimeFactor &factor, ptrdiff_t k, ptrdiff_t j, double re, double im,
                 Output column) {
    const ptrdiff_t entry = (k - 1) * (factor.p - 1) + (j - 1);
    const double c = factor.stage->twiddleCos[entry];
    const double s = factor.stage->twiddleSin[entry];
    column.set(j, re * c - im * s, re * s + im * c);
}

// Columns k and m - k of the real twiddle stage.
void PrimePair(const PrimeFactor &factor, DBL *data, ptrdiff_t stride, ptrdiff_t m, ptrdiff_t k,
               DBL *work) {
    const ptrdiff_t p = factor.p;
    const ptrdiff_t n = p * m;
    const Output column = Interleaved(work);
    column.set(0, data[k * stride], data[(m - k) * stride]);
    for (ptrdiff_t j = 1; j < p; ++j) {
        const DBL *const block = data + j * m * stride;
        SetTwiddled(factor, k, j, block[k * stride], block[(m - k) * stride], column);
    }
    TransformComplex(factor, {column.re, column.im, 2}, column, work + 2 * p);
    for (ptrdiff_t q = 0; q < p; ++q) {
        const ptrdiff_t t = k + q * m;
        const bool direct = t <= (n - 1) / 2;
        data[(direct ? t : n - t) * stride] = work[2 * q];
        data[(direct ? n - t : t) * stride] = direct ? work[2 * q + 1] : -work[2 * q + 1];
    }
}

// Column m/2 of the real twiddle stage: real values, p odd.
void PrimeMiddle(const PrimeFactor &factor, DBL *data, ptrdiff_t stride, ptrdiff_t m, DBL *work) {
    const ptrdiff_t p = factor.p;
    const ptrdiff_t n = p * m;
    const ptrdiff_t k = m / 2;
    const Output column = Interleaved(work);
    column.set(0, data[k * stride], 0);
    for (ptrdiff_t j = 1; j < p; ++j)
        SetTwiddled(factor, k, j, data[(j * m + k) * stride], 0, column);
    TransformComplex(factor, {column.re, column.im, 2}, column, work + 2 * p);
    for (ptrdiff_t q = 0; k + q * m <= n / 2; ++q) {
        const ptrdiff_t t = k + q * m;
        data[t * stride] = work[2 * q];
        if (2 * t < n)
            data[(n - t) * stride] = work[2 * q + 1];
    }
}

} // namespace

int64_t PrimeComplexWork(const PrimeFactor &factor, bool isLeaf) {
    if (factor.kind == DirectPrime)
        return 0;
    const int64_t column = isLeaf ? 0 : 2 * int64_t{factor.p};
    return column + RaderComplexWork(factor) + factor.stage->raderPlan->complexWork;
}

int64_t PrimeRealWork(const PrimeFactor &factor, bool isLeaf) {
    if (factor.kind == DirectPrime)
        return 0;
    const FFTPlan &plan = *factor.stage->raderPlan;
    const int64_t whole = RaderRealWork(factor) + std::max(plan.complexWork, plan.realWork);
    return isLeaf ? whole : std::max(whole, PrimeComplexWork(factor, false));
}

void PrimeComplexLeaf(const PrimeFactor &factor, const DBL *inRe, const DBL *inIm, DBL *outRe,
                      DBL *outIm, ptrdiff_t inStride, ptrdiff_t outStride, int32_t count,
                      DBL *work) {
    const ptrdiff_t p = factor.p;
    DBL stack[directWork];
    DBL *const space = factor.kind == DirectPrime ? stack : work;
    for (ptrdiff_t i = 0; i < count; ++i) {
        const Input x = {inRe + i * inStride, inIm + i * inStride, count * inStride};
        const Output y = {outRe + i * p * outStride, outIm + i * p * outStride, outStride};
        TransformComplex(factor, x, y, space);
    }
}

void PrimeRealLeaf(const PrimeFactor &factor, const DBL *in, DBL *out, ptrdiff_t inStride,
                   ptrdiff_t outStride, int32_t count, DBL *work) {
    const ptrdiff_t p = factor.p;
    DBL stack[directWork];
    DBL *const space = factor.kind == DirectPrime ? stack : work;
    for (ptrdiff_t i = 0; i < count; ++i)
        TransformReal(factor, in + i * inStride, count * inStride, out + i * p * outStride,
                      outStride, space);
}

void PrimeComplexTwiddle(const PrimeFactor &factor, DBL *re, DBL *im, ptrdiff_t stride, int32_t m,
                         DBL *work) {
    const ptrdiff_t p = factor.p;
    DBL stack[directWork];
    DBL *const space = factor.kind == DirectPrime ? stack : work;
    const Output column = Interleaved(space);
    for (ptrdiff_t k = 0; k < m; ++k) {
        const Output y = {re + k * stride, im + k * stride, m * stride};
        column.set(0, y.re[0], y.im[0]);
        for (ptrdiff_t j = 1; j < p; ++j) {
            if (k == 0)
                column.set(j, y.re[j * y.stride], y.im[j * y.stride]);
            else
                SetTwiddled(factor, k, j, y.re[j * y.stride], y.im[j * y.stride], column);
        }
        TransformComplex(factor, {column.re, column.im, 2}, y, space + 2 * p);
    }
}

void PrimeRealTwiddle(const PrimeFactor &factor, DBL *data, ptrdiff_t stride, int32_t m,
                      DBL *work) {
    DBL stack[directWork];
    DBL *const space = factor.kind == DirectPrime ? stack : work;
    TransformReal(factor, data, m * stride, data, m * stride, space);
    for (ptrdiff_t k = 1; k <= (m - 1) / 2; ++k)
        PrimePair(factor, data, stride, m, k, space);
    if (m % 2 == 0)
        PrimeMiddle(factor, data, stride, m, space);
}

} // namespace qx
