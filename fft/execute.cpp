#include "fft/execute.h"

#include "fft/prime_stages.h"

namespace qx {
namespace {

using std::ptrdiff_t;

PrimeFactor PrimeAt(const FFTPlan &plan, int32_t level) {
    return {plan.factors[level], plan.kinds[level], plan.stages[level]};
}

ErrorCode RunComplexLeaf(const FFTPlan &plan, const DBL *inRe, const DBL *inIm, DBL *outRe,
                         DBL *outIm, ptrdiff_t inStride, ptrdiff_t outStride, int32_t count) {
    const int32_t last = plan.factorCount - 1;
    if (plan.kinds[last] != KernelFactor)
        return PrimeComplexLeaf(PrimeAt(plan, last), inRe, inIm, outRe, outIm, inStride, outStride,
                                count);
    plan.complexLeaf[last](inRe, inIm, outRe, outIm, inStride, outStride, count);
    return 0;
}

ErrorCode RunComplexTwiddle(const FFTPlan &plan, int32_t level, DBL *re, DBL *im, ptrdiff_t stride,
                            int32_t m) {
    if (plan.kinds[level] != KernelFactor)
        return PrimeComplexTwiddle(PrimeAt(plan, level), re, im, stride, m);
    const FFTStage &stage = *plan.stages[level];
    plan.complexTwiddle[level](re, im, stage.twiddleCos, stage.twiddleSin, stride, m);
    return 0;
}

// The transform of n values at level `level`, which has the factor p: p transforms of every p-th
// value, one behind the other, then the twiddle stage over all of them.
ErrorCode RecurseComplex(const FFTPlan &plan, int32_t level, int32_t n, const DBL *inRe,
                         const DBL *inIm, DBL *outRe, DBL *outIm, ptrdiff_t inStride,
                         ptrdiff_t outStride) {
    const int32_t p = plan.factors[level];
    const int32_t m = n / p;
    ErrorCode status = 0;
    if (level == plan.factorCount - 2) {
        status = RunComplexLeaf(plan, inRe, inIm, outRe, outIm, inStride, outStride, p);
    } else {
        for (ptrdiff_t j = 0; j < p && status >= 0; ++j) {
            const ptrdiff_t in = j * inStride;
            const ptrdiff_t out = j * m * outStride;
            status = RecurseComplex(plan, level + 1, m, inRe + in, inIm + in, outRe + out,
                                    outIm + out, p * inStride, outStride);
        }
    }
    return status < 0 ? status : RunComplexTwiddle(plan, level, outRe, outIm, outStride, m);
}

ErrorCode RunRealLeaf(const FFTPlan &plan, const DBL *in, DBL *out, ptrdiff_t inStride,
                      ptrdiff_t outStride, int32_t count) {
    const int32_t last = plan.factorCount - 1;
    if (plan.kinds[last] != KernelFactor)
        return PrimeRealLeaf(PrimeAt(plan, last), in, out, inStride, outStride, count);
    plan.realLeaf[last](in, out, inStride, outStride, count);
    return 0;
}

ErrorCode RunRealTwiddle(const FFTPlan &plan, int32_t level, DBL *data, ptrdiff_t stride,
                         int32_t m) {
    if (plan.kinds[level] != KernelFactor)
        return PrimeRealTwiddle(PrimeAt(plan, level), data, stride, m);
    const FFTStage &stage = *plan.stages[level];
    plan.realTwiddle[level](data, stage.twiddleCos, stage.twiddleSin, stride, m);
    return 0;
}

ErrorCode RecurseReal(const FFTPlan &plan, int32_t level, int32_t n, const DBL *in, DBL *out,
                      ptrdiff_t inStride, ptrdiff_t outStride) {
    const int32_t p = plan.factors[level];
    const int32_t m = n / p;
    ErrorCode status = 0;
    if (level == plan.factorCount - 2) {
        status = RunRealLeaf(plan, in, out, inStride, outStride, p);
    } else {
        for (ptrdiff_t j = 0; j < p && status >= 0; ++j)
            status = RecurseReal(plan, level + 1, m, in + j * inStride, out + j * m * outStride,
                                 p * inStride, outStride);
    }
    return status < 0 ? status : RunRealTwiddle(plan, level, out, outStride, m);
}

// Sums and differences of mirrored elements: half-complex form to Hartley form and back.
void MirrorSums(DBL *values, ptrdiff_t stride, ptrdiff_t n) {
    for (ptrdiff_t k = 1; k <= (n + 1) / 2 - 1; ++k) {
        const double a = values[k * stride];
        const double b = values[(n - k) * stride];
        values[k * stride] = a - b;
        values[(n - k) * stride] = a + b;
    }
}

} // namespace

ErrorCode ExecuteComplex(const FFTPlan &plan, const DBL *inRe, const DBL *inIm, DBL *outRe,
                         DBL *outIm, ptrdiff_t inStride, ptrdiff_t outStride) {
    if (plan.factorCount == 0) {
        outRe[0] = inRe[0];
        outIm[0] = inIm[0];
        return 0;
    }
    if (plan.factorCount == 1)
        return RunComplexLeaf(plan, inRe, inIm, outRe, outIm, inStride, outStride, 1);
    return RecurseComplex(plan, 0, plan.length, inRe, inIm, outRe, outIm, inStride, outStride);
}

ErrorCode ExecuteReal(const FFTPlan &plan, const DBL *in, DBL *out, ptrdiff_t inStride,
                      ptrdiff_t outStride) {
    if (plan.factorCount == 0) {
        out[0] = in[0];
        return 0;
    }
    if (plan.factorCount == 1)
        return RunRealLeaf(plan, in, out, inStride, outStride, 1);
    return RecurseReal(plan, 0, plan.length, in, out, inStride, outStride);
}

ErrorCode FFTComplexForward(const FFTPlan *plan, const DBL *inRe, const DBL *inIm, DBL *outRe,
                            DBL *outIm, int32_t inStride, int32_t outStride, int32_t n) {
    if (n != plan->length)
        return -1; // kept: the real operations report ErrInternal here
    return ExecuteComplex(*plan, inRe, inIm, outRe, outIm, inStride, outStride);
}

ErrorCode FFTComplexInverse(const FFTPlan *plan, const DBL *inRe, const DBL *inIm, DBL *outRe,
                            DBL *outIm, int32_t inStride, int32_t outStride, int32_t n) {
    const ErrorCode status =
        FFTComplexForward(plan, inRe, inIm, outRe, outIm, inStride, outStride, n);
    if (status < 0)
        return status;
    const double scale = 1.0 / n;
    const ptrdiff_t stride = outStride;
    outRe[0] *= scale;
    outIm[0] *= scale;
    // Reversal of the indices turns a forward transform into an inverse one.
    for (ptrdiff_t k = 1; 2 * k <= n; ++k) {
        DBL *const left[2] = {outRe + k * stride, outIm + k * stride};
        DBL *const right[2] = {outRe + (n - k) * stride, outIm + (n - k) * stride};
        for (int32_t part = 0; part < 2; ++part) {
            const double a = *left[part] * scale;
            const double b = *right[part] * scale;
            *left[part] = b;
            *right[part] = a;
        }
    }
    return status;
}

ErrorCode FFTRealForward(const FFTPlan *plan, const DBL *in, DBL *out, int32_t inStride,
                         int32_t outStride, int32_t n) {
    if (n != plan->length)
        return ErrInternal;
    return ExecuteReal(*plan, in, out, inStride, outStride);
}

ErrorCode FFTRealInverse(const FFTPlan *plan, DBL *in, DBL *out, int32_t inStride,
                         int32_t outStride, int32_t n) {
    if (n != plan->length)
        return ErrInternal;
    const double scale = 1.0 / n;
    for (ptrdiff_t k = 0; k < n; ++k)
        in[k * inStride] *= scale;
    MirrorSums(in, inStride, n);
    const ErrorCode status = ExecuteReal(*plan, in, out, inStride, outStride);
    if (status < 0 || n < 3)
        return status;
    MirrorSums(out, outStride, n);
    return status;
}

} // namespace qx
