#include "fft/execute.h"

#include "fft/kernels/kernels.h"
#include "fft/passes.h"
#include "fft/prime_stages.h"

#include <algorithm>

namespace qx {
namespace {

using std::ptrdiff_t;

PrimeFactor PrimeAt(const FFTPlan &plan, int32_t level) {
    return {plan.factors[level], plan.kinds[level], plan.stages[level]};
}

bool IsInterleaved(const DBL *re, const DBL *im, ptrdiff_t stride) {
    return im == re + 1 && stride == 2;
}

// Complex data at any strides, with real and imaginary parts in separate arrays.
struct ComplexData {
    const DBL *inRe, *inIm;
    DBL *outRe, *outIm;
    ptrdiff_t inStride, outStride;
    DBL *work;

    // The part that begins `in` inputs and `out` results later and takes every p-th input.
    ComplexData part(ptrdiff_t in, ptrdiff_t out, ptrdiff_t p) const {
        return {inRe + in * inStride,
                inIm + in * inStride,
                outRe + out * outStride,
                outIm + out * outStride,
                p * inStride,
                outStride,
                work};
    }
    void leaf(const FFTPlan &plan, int32_t count) const {
        const int32_t last = plan.factorCount - 1;
        if (plan.kinds[last] != KernelFactor)
            PrimeComplexLeaf(PrimeAt(plan, last), inRe, inIm, outRe, outIm, inStride, outStride,
                             count, work);
        else
            plan.complexLeaf[last](inRe, inIm, outRe, outIm, inStride, outStride, count);
    }
    void twiddle(const FFTPlan &plan, int32_t level, int32_t m) const {
        if (plan.kinds[level] != KernelFactor)
            return PrimeComplexTwiddle(PrimeAt(plan, level), outRe, outIm, outStride, m, work);
        const FFTStage &stage = *plan.stages[level];
        plan.complexTwiddle[level](outRe, outIm, stage.twiddleCos, stage.twiddleSin, outStride, m);
    }
};

struct RealData {
    const DBL *in;
    DBL *out;
    ptrdiff_t inStride, outStride;
    DBL *work;

    RealData part(ptrdiff_t inputs, ptrdiff_t results, ptrdiff_t p) const {
        return {in + inputs * inStride, out + results * outStride, p * inStride, outStride, work};
    }
    void leaf(const FFTPlan &plan, int32_t count) const {
        const int32_t last = plan.factorCount - 1;
        if (plan.kinds[last] != KernelFactor)
            PrimeRealLeaf(PrimeAt(plan, last), in, out, inStride, outStride, count, work);
        else
            plan.realLeaf[last](in, out, inStride, outStride, count);
    }
    void twiddle(const FFTPlan &plan, int32_t level, int32_t m) const {
        if (plan.kinds[level] != KernelFactor)
            return PrimeRealTwiddle(PrimeAt(plan, level), out, outStride, m, work);
        const FFTStage &stage = *plan.stages[level];
        if (outStride == 1)
            stage.passes.realTwiddle(out, m, out, stage, m);
        else
            plan.realTwiddle[level](out, stage.twiddleCos, stage.twiddleSin, outStride, m);
    }
};

// The recursion. At each level, a transform of n values with the factor p consists of p transforms of
// every p-th value, one after the other, and then the twiddle stage over all of them. At the last level
// but one, the leaf computes the p transforms in one call.
template <class Data>
void Recurse(const FFTPlan &plan, int32_t level, int32_t n, const Data &data) {
    const int32_t p = plan.factors[level];
    const int32_t m = n / p;
    if (level == plan.factorCount - 2) {
        data.leaf(plan, p);
    } else {
        for (ptrdiff_t j = 0; j < p; ++j)
            Recurse(plan, level + 1, m, data.part(j, j * m, p));
    }
    data.twiddle(plan, level, m);
}

// The recursion in SIMD lanes, for contiguous results and a leaf with kernels. Several transforms of one
// level run together if their inputs are neighbours, so that the leaf reads whole cache lines.
struct Bundle {
    ptrdiff_t count;
    ptrdiff_t inStride;  // from the input of one to that of the next
    ptrdiff_t outStride; // from the results of one to those of the next
    // After every `fold` transforms, the results continue foldStride after the first of these.
    ptrdiff_t fold = PTRDIFF_MAX;
    ptrdiff_t foldStride = 0;

    ptrdiff_t resultsOf(ptrdiff_t b) const {
        return b < fold ? b * outStride : b % fold * outStride + b / fold * foldStride;
    }
};

// What differs between complex and real data. A stage takes blocks that are `inLeg` apart and writes
// contiguous results.
struct ComplexLanesPath {
    static constexpr ptrdiff_t width = 2; // DBL units of one value
    static constexpr ptrdiff_t bundle = complexBundle;
    static void leaf(const FFTPlan &plan, const DBL *in, DBL *out, const LeafColumns &columns) {
        plan.stages[plan.factorCount - 1]->passes.complexLeaf(in, out, columns);
    }
    static void twiddle(const FFTStage &stage, const DBL *in, ptrdiff_t inLeg, DBL *out,
                        int32_t m) {
        stage.passes.complexTwiddle(in, inLeg, out, stage, m);
    }
    static void primeTwiddle(const PrimeFactor &factor, DBL *out, int32_t m, DBL *work) {
        PrimeComplexTwiddle(factor, out, out + 1, 2, m, work);
    }
};
struct RealLanesPath {
    static constexpr ptrdiff_t width = 1;
    static constexpr ptrdiff_t bundle = realBundle;
    static void leaf(const FFTPlan &plan, const DBL *in, DBL *out, const LeafColumns &columns) {
        const int32_t radix = plan.factors[plan.factorCount - 1];
        if (columns.count[0] * columns.count[1] <= 2 && gainsByFrequencies(radix))
            oneByOne(radix, in, out, columns);
        else
            plan.stages[plan.factorCount - 1]->passes.realLeaf(in, out, columns);
    }
    static void twiddle(const FFTStage &stage, const DBL *in, ptrdiff_t inLeg, DBL *out,
                        int32_t m) {
        stage.passes.realTwiddle(in, inLeg, out, stage, m);
    }
    static void primeTwiddle(const PrimeFactor &factor, DBL *out, int32_t m, DBL *work) {
        PrimeRealTwiddle(factor, out, 1, m, work);
    }

private:
    // One or two columns leave lanes empty. The transform of a single array fills them with frequencies.
    static bool gainsByFrequencies(int32_t radix) {
        return radix >= 17 && radix % 2 != 0 && lanesInUse >= 4;
    }
    static void oneByOne(int32_t radix, const DBL *in, DBL *out, const LeafColumns &columns) {
        const auto transform = WholeOf(radix).real;
        DBL x[longestWhole];
        for (ptrdiff_t b = 0; b < columns.count[1]; ++b)
            for (ptrdiff_t a = 0; a < columns.count[0]; ++a) {
                const DBL *const column = in + a * columns.inStride[0] + b * columns.inStride[1];
                for (ptrdiff_t j = 0; j < radix; ++j)
                    x[j] = column[j * columns.legStride];
                transform(x, out + a * columns.outStride[0] + b * columns.outStride[1]);
            }
    }
};

// The memory of a transform besides its results; either pointer may be null.
struct LanesMemory {
    DBL *work;   // of the prime stages
    DBL *buffer; // of the plan's bufferLevel
};

template <class Path>
void RecurseLanes(const FFTPlan &plan, int32_t level, int32_t n, const DBL *in, DBL *out,
                  ptrdiff_t inStride, const Bundle &bundle, const LanesMemory &memory) {
    const int32_t p = plan.factors[level];
    const int32_t m = n / p;
    const bool buffered = memory.buffer != nullptr && level == plan.bufferLevel;
    const ptrdiff_t side = m * Path::width;
    const ptrdiff_t block = buffered ? BlockPitch(side) : side;
    DBL *const blocks = buffered ? memory.buffer : out;
    const ptrdiff_t nextBlocks = buffered ? p * block : bundle.outStride;
    if (level == plan.factorCount - 2) {
        if (bundle.count == 1)
            Path::leaf(plan, in, blocks, {{p, 1}, {inStride, 0}, {block, 0}, p * inStride});
        else if (bundle.fold == PTRDIFF_MAX)
            Path::leaf(plan, in, blocks,
                       {{bundle.count, p},
                        {bundle.inStride, inStride},
                        {nextBlocks, block},
                        p * inStride});
        else
            for (ptrdiff_t j = 0; j < p; ++j)
                Path::leaf(plan, in + j * inStride, blocks + j * block,
                           {{bundle.fold, bundle.count / bundle.fold},
                            {bundle.inStride, bundle.fold * bundle.inStride},
                            {nextBlocks, bundle.foldStride},
                            p * inStride});
    } else if (bundle.count > 1) {
        // If the inputs of the next blocks follow those of a short bundle, these blocks join it.
        const ptrdiff_t more = Path::bundle / bundle.count;
        const bool follow = bundle.fold == PTRDIFF_MAX && more > 1 &&
                            Path::bundle % bundle.count == 0 && p % Path::bundle == 0 &&
                            inStride == bundle.count * bundle.inStride;
        const ptrdiff_t step = follow ? more : 1;
        for (ptrdiff_t j = 0; j < p; j += step)
            RecurseLanes<Path>(
                plan, level + 1, m, in + j * inStride, blocks + j * block, p * inStride,
                follow
                    ? Bundle{more * bundle.count, bundle.inStride, nextBlocks, bundle.count, block}
                    : Bundle{bundle.count, bundle.inStride, nextBlocks, bundle.fold,
                             bundle.foldStride},
                memory);
    } else {
        const ptrdiff_t together = p % Path::bundle == 0 ? Path::bundle : 8;
        for (ptrdiff_t j = 0; j < p; j += together)
            RecurseLanes<Path>(plan, level + 1, m, in + j * inStride, blocks + j * block,
                               p * inStride, {std::min(together, p - j), inStride, block}, memory);
    }
    for (ptrdiff_t b = 0; b < bundle.count; ++b) {
        DBL *const results = out + bundle.resultsOf(b);
        if (plan.kinds[level] == KernelFactor)
            Path::twiddle(*plan.stages[level], buffered ? blocks + b * nextBlocks : results, block,
                          results, m);
        else
            Path::primeTwiddle(PrimeAt(plan, level), results, m, memory.work);
    }
}

// Borrows the buffer of a plan for one transform.
class BufferLoan {
public:
    explicit BufferLoan(const FFTPlan &plan)
        : plan_(plan), memory_(plan.buffer.exchange(nullptr, std::memory_order_acquire)) {}
    ~BufferLoan() {
        if (memory_ != nullptr)
            plan_.buffer.store(memory_, std::memory_order_release);
    }
    BufferLoan(const BufferLoan &) = delete;
    BufferLoan &operator=(const BufferLoan &) = delete;

    // The first cache line of the buffer, or null.
    DBL *data() const {
        const auto address = reinterpret_cast<std::uintptr_t>(memory_);
        return reinterpret_cast<DBL *>((address + 63) / 64 * 64);
    }

private:
    const FFTPlan &plan_;
    void *memory_;
};

template <class Path>
__attribute__((noinline)) void RunOnStack(const FFTPlan &plan, const DBL *in, DBL *out,
                                          ptrdiff_t inStride, DBL *work) {
    alignas(64) double buffer[stackBufferValues];
    RecurseLanes<Path>(plan, 0, plan.length, in, out, inStride, {1, 0, 0}, {work, buffer});
}

template <class Path>
void RunLanes(const FFTPlan &plan, const DBL *in, DBL *out, ptrdiff_t inStride, DBL *work) {
    if (!GainsByBuffer(plan, Path::width))
        return RecurseLanes<Path>(plan, 0, plan.length, in, out, inStride, {1, 0, 0},
                                  {work, nullptr});
    if (IsBufferOnStack(plan, Path::width))
        return RunOnStack<Path>(plan, in, out, inStride, work);
    const BufferLoan loan(plan);
    RecurseLanes<Path>(plan, 0, plan.length, in, out, inStride, {1, 0, 0}, {work, loan.data()});
}

bool LeafHasKernels(const FFTPlan &plan) {
    return plan.kinds[plan.factorCount - 1] == KernelFactor;
}

// Whole transforms at any strides.
void WholeComplex(const FFTPlan &plan, const DBL *inRe, const DBL *inIm, DBL *outRe, DBL *outIm,
                  ptrdiff_t inStride, ptrdiff_t outStride) {
    DBL x[2 * longestWhole];
    DBL y[2 * longestWhole];
    for (ptrdiff_t j = 0; j < plan.length; ++j) {
        x[2 * j] = inRe[j * inStride];
        x[2 * j + 1] = inIm[j * inStride];
    }
    plan.whole.complex(x, y);
    for (ptrdiff_t k = 0; k < plan.length; ++k) {
        outRe[k * outStride] = y[2 * k];
        outIm[k * outStride] = y[2 * k + 1];
    }
}
void WholeReal(const FFTPlan &plan, const DBL *in, DBL *out, ptrdiff_t inStride,
               ptrdiff_t outStride) {
    DBL x[longestWhole];
    DBL h[longestWhole];
    for (ptrdiff_t j = 0; j < plan.length; ++j)
        x[j] = in[j * inStride];
    plan.whole.real(x, h);
    for (ptrdiff_t k = 0; k < plan.length; ++k)
        out[k * outStride] = h[k];
}

// MirrorSums at any stride.
void MirrorSumsAt(DBL *values, ptrdiff_t stride, ptrdiff_t n) {
    for (ptrdiff_t k = 1; k <= (n - 1) / 2; ++k) {
        const double a = values[k * stride];
        const double b = values[(n - k) * stride];
        values[k * stride] = a - b;
        values[(n - k) * stride] = a + b;
    }
}

// ScaleReversed at any strides.
void ScaleReversedAt(DBL *re, DBL *im, ptrdiff_t stride, double scale, ptrdiff_t n) {
    re[0] *= scale;
    im[0] *= scale;
    for (ptrdiff_t k = 1; 2 * k <= n; ++k) {
        for (DBL *const part : {re, im}) {
            const double a = part[k * stride] * scale;
            const double b = part[(n - k) * stride] * scale;
            part[k * stride] = b;
            part[(n - k) * stride] = a;
        }
    }
}

} // namespace

void ExecuteComplex(const FFTPlan &plan, const DBL *inRe, const DBL *inIm, DBL *outRe, DBL *outIm,
                    ptrdiff_t inStride, ptrdiff_t outStride, DBL *work) {
    if (plan.whole.complex != nullptr) {
        if (IsInterleaved(inRe, inIm, inStride) && IsInterleaved(outRe, outIm, outStride))
            plan.whole.complex(inRe, outRe);
        else
            WholeComplex(plan, inRe, inIm, outRe, outIm, inStride, outStride);
        return;
    }
    if (plan.factorCount == 0) {
        outRe[0] = inRe[0];
        outIm[0] = inIm[0];
        return;
    }
    const ComplexData data{inRe, inIm, outRe, outIm, inStride, outStride, work};
    if (plan.factorCount == 1)
        return data.leaf(plan, 1);
    if (inIm == inRe + 1 && IsInterleaved(outRe, outIm, outStride) && LeafHasKernels(plan))
        return RunLanes<ComplexLanesPath>(plan, inRe, outRe, inStride, work);
    Recurse(plan, 0, plan.length, data);
}

void ExecuteReal(const FFTPlan &plan, const DBL *in, DBL *out, ptrdiff_t inStride,
                 ptrdiff_t outStride, DBL *work) {
    if (plan.whole.real != nullptr) {
        if (inStride == 1 && outStride == 1)
            plan.whole.real(in, out);
        else
            WholeReal(plan, in, out, inStride, outStride);
        return;
    }
    if (plan.factorCount == 0) {
        out[0] = in[0];
        return;
    }
    const RealData data{in, out, inStride, outStride, work};
    if (plan.factorCount == 1)
        return data.leaf(plan, 1);
    if (outStride == 1 && LeafHasKernels(plan))
        return RunLanes<RealLanesPath>(plan, in, out, inStride, work);
    Recurse(plan, 0, plan.length, data);
}

ErrorCode FFTComplexForward(const FFTPlan *plan, const DBL *inRe, const DBL *inIm, DBL *outRe,
                            DBL *outIm, int32_t inStride, int32_t outStride, int32_t n, DBL *work) {
    if (n != plan->length)
        return -1; // kept: the real operations report ErrInternal here
    ExecuteComplex(*plan, inRe, inIm, outRe, outIm, inStride, outStride, work);
    return 0;
}

ErrorCode FFTComplexInverse(const FFTPlan *plan, const DBL *inRe, const DBL *inIm, DBL *outRe,
                            DBL *outIm, int32_t inStride, int32_t outStride, int32_t n, DBL *work) {
    const ErrorCode status =
        FFTComplexForward(plan, inRe, inIm, outRe, outIm, inStride, outStride, n, work);
    if (status < 0)
        return status;
    if (IsInterleaved(outRe, outIm, outStride))
        ScaleReversed(outRe, 1.0 / n, n);
    else
        ScaleReversedAt(outRe, outIm, outStride, 1.0 / n, n);
    return status;
}

ErrorCode FFTRealForward(const FFTPlan *plan, const DBL *in, DBL *out, int32_t inStride,
                         int32_t outStride, int32_t n, DBL *work) {
    if (n != plan->length)
        return ErrInternal;
    ExecuteReal(*plan, in, out, inStride, outStride, work);
    return 0;
}

ErrorCode FFTRealInverse(const FFTPlan *plan, DBL *in, DBL *out, int32_t inStride,
                         int32_t outStride, int32_t n, DBL *work) {
    if (n != plan->length)
        return ErrInternal;
    const double scale = 1.0 / n;
    if (inStride == 1) {
        ScaledMirrorSums(in, scale, n);
    } else {
        for (ptrdiff_t k = 0; k < n; ++k)
            in[k * inStride] *= scale;
        MirrorSumsAt(in, inStride, n);
    }
    ExecuteReal(*plan, in, out, inStride, outStride, work);
    if (outStride == 1)
        MirrorSums(out, n);
    else
        MirrorSumsAt(out, outStride, n);
    return 0;
}

// The same, with work memory that they allocate themselves.

ErrorCode FFTComplexForward(const FFTPlan *plan, const DBL *inRe, const DBL *inIm, DBL *outRe,
                            DBL *outIm, int32_t inStride, int32_t outStride, int32_t n) {
    // For short transforms, each call and the scope of a scratch block are noticeable.
    if (plan->whole.complex != nullptr && n == plan->length &&
        IsInterleaved(inRe, inIm, inStride) && IsInterleaved(outRe, outIm, outStride)) {
        plan->whole.complex(inRe, outRe);
        return 0;
    }
    if (plan->complexWork == 0)
        return FFTComplexForward(plan, inRe, inIm, outRe, outIm, inStride, outStride, n, nullptr);
    TransformWork work;
    if (const ErrorCode failed = work.take(plan->complexWork))
        return failed;
    return FFTComplexForward(plan, inRe, inIm, outRe, outIm, inStride, outStride, n, work.data());
}

ErrorCode FFTComplexInverse(const FFTPlan *plan, const DBL *inRe, const DBL *inIm, DBL *outRe,
                            DBL *outIm, int32_t inStride, int32_t outStride, int32_t n) {
    TransformWork work;
    if (const ErrorCode failed = work.take(plan->complexWork))
        return failed;
    return FFTComplexInverse(plan, inRe, inIm, outRe, outIm, inStride, outStride, n, work.data());
}

ErrorCode FFTRealForward(const FFTPlan *plan, const DBL *in, DBL *out, int32_t inStride,
                         int32_t outStride, int32_t n) {
    if (plan->whole.real != nullptr && n == plan->length && inStride == 1 && outStride == 1) {
        plan->whole.real(in, out);
        return 0;
    }
    if (plan->realWork == 0)
        return FFTRealForward(plan, in, out, inStride, outStride, n, nullptr);
    TransformWork work;
    if (const ErrorCode failed = work.take(plan->realWork))
        return failed;
    return FFTRealForward(plan, in, out, inStride, outStride, n, work.data());
}

ErrorCode FFTRealInverse(const FFTPlan *plan, DBL *in, DBL *out, int32_t inStride,
                         int32_t outStride, int32_t n) {
    TransformWork work;
    if (const ErrorCode failed = work.take(plan->realWork))
        return failed;
    return FFTRealInverse(plan, in, out, inStride, outStride, n, work.data());
}

} // namespace qx
