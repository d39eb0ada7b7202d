#include "fft/prime_stages.h"

#include "fft/execute.h"
#include "frame/elements.h"
#include "frame/lanes.h"
#include "frame/scratch.h"

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

// The values of work that each of them takes. A padded convolution has its spectrum in work too.
bool IsPadded(const PrimeFactor &factor) {
    return factor.kind == RaderPrime && factor.stage->raderPlan->length != factor.p - 1;
}
int64_t ComplexWork(const PrimeFactor &factor) {
    return IsPadded(factor) ? 4 * int64_t{factor.stage->raderPlan->length} : 2 * int64_t{factor.p};
}
int64_t RealWork(const PrimeFactor &factor) {
    if (factor.kind == DirectPrime)
        return factor.p;
    return IsPadded(factor) ? 4 * int64_t{factor.stage->raderPlan->length} : 4 * int64_t{factor.p};
}

ErrorCode DirectComplex(const PrimeFactor &factor, Input x, Output y, DBL *work) {
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
    // Two sums at a time, for neither has to wait for the other; both are the last if h is odd.
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
    return 0;
}

ErrorCode DirectReal(const PrimeFactor &factor, const DBL *x, ptrdiff_t inStride, DBL *y,
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
    return 0;
}

// Multiplies value k of the spectrum by that of the roots and conjugates it: together with the
// conjugation at the end, a forward transform then serves as the inverse one.
void SetConjugateProduct(const FFTStage &stage, ptrdiff_t k, double a, double b, Output y) {
    const double c = stage.raderCos[k];
    const double s = stage.raderSin[k];
    y.set(k, c * a - s * b, -(a * s) - c * b);
}

ErrorCode RaderComplex(const PrimeFactor &factor, Input x, Output y, DBL *work) {
    const FFTStage &stage = *factor.stage;
    const FFTPlan &plan = *stage.raderPlan;
    const ptrdiff_t p = factor.p;
    const ptrdiff_t n = plan.length;
    const Output gathered = Interleaved(work);
    const Output spectrum = IsPadded(factor) ? Interleaved(work + 2 * n)
                                             : Output{y.re + y.stride, y.im + y.stride, y.stride};
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
    ErrorCode status = ExecuteComplex(plan, gathered.re, gathered.im, spectrum.re, spectrum.im, 2,
                                      spectrum.stride);
    if (status < 0)
        return status;
    for (ptrdiff_t k = 0; k < n; ++k)
        SetConjugateProduct(stage, k, spectrum.re[k * spectrum.stride],
                            spectrum.im[k * spectrum.stride], spectrum);
    status = ExecuteComplex(plan, spectrum.re, spectrum.im, gathered.re, gathered.im,
                            spectrum.stride, 2);
    if (status < 0)
        return status;
    for (ptrdiff_t i = 1; i < p; ++i)
        y.set(stage.raderScatter[i], x0Re + work[2 * i - 2], x0Im - work[2 * i - 1]);
    return 0;
}

// The length of a convolution is even, padded or not.
ErrorCode RaderReal(const PrimeFactor &factor, const DBL *x, ptrdiff_t inStride, DBL *y,
                    ptrdiff_t outStride, DBL *work) {
    const FFTStage &stage = *factor.stage;
    const FFTPlan &plan = *stage.raderPlan;
    const ptrdiff_t p = factor.p;
    const ptrdiff_t n = plan.length;
    DBL *const half = work; // n values, half-complex
    const Output spectrum = Interleaved(work + 2 * n);
    DBL *const gathered = spectrum.re; // n values, before the spectrum
    const double x0 = x[0];
    double sum = x0;
    for (ptrdiff_t i = 1; i < p; ++i) {
        gathered[i - 1] = x[stage.raderGather[i] * inStride];
        sum += gathered[i - 1];
    }
    Fill(gathered + (p - 1), n - (p - 1), 0.0);
    ErrorCode status = ExecuteReal(plan, gathered, half, 1, 1);
    if (status < 0)
        return status;
    SetConjugateProduct(stage, 0, half[0], 0, spectrum);
    for (ptrdiff_t k = 1; 2 * k < n; ++k) {
        SetConjugateProduct(stage, k, half[k], half[n - k], spectrum);
        SetConjugateProduct(stage, n - k, half[k], -half[n - k], spectrum);
    }
    SetConjugateProduct(stage, n / 2, half[n / 2], 0, spectrum);
    status = ExecuteComplex(plan, spectrum.re, spectrum.im, work, work + 1, 2, 2);
    if (status < 0)
        return status;
    y[0] = sum;
    for (ptrdiff_t i = 1; i < p; ++i) {
        const ptrdiff_t k = stage.raderScatter[i];
        if (2 * k > p)
            continue;
        y[k * outStride] = x0 + work[2 * i - 2];
        y[(p - k) * outStride] = -work[2 * i - 1];
    }
    return 0;
}

ErrorCode TransformComplex(const PrimeFactor &factor, Input x, Output y, DBL *work) {
    return (factor.kind == DirectPrime ? DirectComplex : RaderComplex)(factor, x, y, work);
}
ErrorCode TransformReal(const PrimeFactor &factor, const DBL *x, ptrdiff_t inStride, DBL *y,
                        ptrdiff_t outStride, DBL *work) {
    return (factor.kind == DirectPrime ? DirectReal : RaderReal)(factor, x, inStride, y, outStride,
                                                                 work);
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
ErrorCode PrimePair(const PrimeFactor &factor, DBL *data, ptrdiff_t stride, ptrdiff_t m,
                    ptrdiff_t k, DBL *work) {
    const ptrdiff_t p = factor.p;
    const ptrdiff_t n = p * m;
    const Output column = Interleaved(work);
    column.set(0, data[k * stride], data[(m - k) * stride]);
    for (ptrdiff_t j = 1; j < p; ++j) {
        const DBL *const block = data + j * m * stride;
        SetTwiddled(factor, k, j, block[k * stride], block[(m - k) * stride], column);
    }
    const ErrorCode status =
        TransformComplex(factor, {column.re, column.im, 2}, column, work + 2 * p);
    if (status < 0)
        return status;
    for (ptrdiff_t q = 0; q < p; ++q) {
        const ptrdiff_t t = k + q * m;
        const bool direct = t <= (n - 1) / 2;
        data[(direct ? t : n - t) * stride] = work[2 * q];
        data[(direct ? n - t : t) * stride] = direct ? work[2 * q + 1] : -work[2 * q + 1];
    }
    return 0;
}

// Column m/2 of the real twiddle stage: real values, p odd.
ErrorCode PrimeMiddle(const PrimeFactor &factor, DBL *data, ptrdiff_t stride, ptrdiff_t m,
                      DBL *work) {
    const ptrdiff_t p = factor.p;
    const ptrdiff_t n = p * m;
    const ptrdiff_t k = m / 2;
    const Output column = Interleaved(work);
    column.set(0, data[k * stride], 0);
    for (ptrdiff_t j = 1; j < p; ++j)
        SetTwiddled(factor, k, j, data[(j * m + k) * stride], 0, column);
    const ErrorCode status =
        TransformComplex(factor, {column.re, column.im, 2}, column, work + 2 * p);
    if (status < 0)
        return status;
    for (ptrdiff_t q = 0; k + q * m <= n / 2; ++q) {
        const ptrdiff_t t = k + q * m;
        data[t * stride] = work[2 * q];
        if (2 * t < n)
            data[(n - t) * stride] = work[2 * q + 1];
    }
    return 0;
}

} // namespace

ErrorCode PrimeComplexLeaf(const PrimeFactor &factor, const DBL *inRe, const DBL *inIm, DBL *outRe,
                           DBL *outIm, ptrdiff_t inStride, ptrdiff_t outStride, int32_t count) {
    const ptrdiff_t p = factor.p;
    Scratch<ElementType::DBL> work;
    ErrorCode status = work.allocate(ComplexWork(factor));
    for (ptrdiff_t i = 0; i < count && status == 0; ++i) {
        const Input x = {inRe + i * inStride, inIm + i * inStride, count * inStride};
        const Output y = {outRe + i * p * outStride, outIm + i * p * outStride, outStride};
        status = TransformComplex(factor, x, y, work.data());
    }
    return Merge(status, work.release());
}

ErrorCode PrimeRealLeaf(const PrimeFactor &factor, const DBL *in, DBL *out, ptrdiff_t inStride,
                        ptrdiff_t outStride, int32_t count) {
    const ptrdiff_t p = factor.p;
    Scratch<ElementType::DBL> work;
    ErrorCode status = work.allocate(RealWork(factor));
    for (ptrdiff_t i = 0; i < count && status == 0; ++i)
        status = TransformReal(factor, in + i * inStride, count * inStride, out + i * p * outStride,
                               outStride, work.data());
    return Merge(status, work.release());
}

ErrorCode PrimeComplexTwiddle(const PrimeFactor &factor, DBL *re, DBL *im, ptrdiff_t stride,
                              int32_t m) {
    const ptrdiff_t p = factor.p;
    Scratch<ElementType::DBL> work;
    ErrorCode status = work.allocate(2 * int64_t{p} + ComplexWork(factor));
    if (status < 0)
        return status;
    const Output column = Interleaved(work.data());
    for (ptrdiff_t k = 0; k < m && status == 0; ++k) {
        const Output y = {re + k * stride, im + k * stride, m * stride};
        column.set(0, y.re[0], y.im[0]);
        for (ptrdiff_t j = 1; j < p; ++j) {
            if (k == 0)
                column.set(j, y.re[j * y.stride], y.im[j * y.stride]);
            else
                SetTwiddled(factor, k, j, y.re[j * y.stride], y.im[j * y.stride], column);
        }
        status = TransformComplex(factor, {column.re, column.im, 2}, y, work.data() + 2 * p);
    }
    return Merge(status, work.release());
}

ErrorCode PrimeRealTwiddle(const PrimeFactor &factor, DBL *data, ptrdiff_t stride, int32_t m) {
    Scratch<ElementType::DBL> work;
    ErrorCode status = work.allocate(2 * int64_t{factor.p} + ComplexWork(factor));
    if (status == 0)
        status = TransformReal(factor, data, m * stride, data, m * stride, work.data());
    for (ptrdiff_t k = 1; k <= (m - 1) / 2 && status == 0; ++k)
        status = PrimePair(factor, data, stride, m, k, work.data());
    if (m % 2 == 0 && status == 0)
        status = PrimeMiddle(factor, data, stride, m, work.data());
    return Merge(status, work.release());
}

} // namespace qx
