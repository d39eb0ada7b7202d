#ifndef QX_FFT_PLAN_H
#define QX_FFT_PLAN_H

#include "frame/scratch.h"
#include "qx/errors.h"
#include "qx/fft.h"
#include "qx/types.h"

#include <atomic>
#include <cstddef>
#include <cstdint>

struct FFTStage;

namespace qx {

// Kernels of one radix p. Strides count in DBL units; `count` and `m` are numbers of columns.
//
// A leaf computes `count` transforms: number i reads element i + j count of the input, j from 0
// to p - 1, and writes its p results to the elements i p onward of the output.
typedef void (*RealLeaf)(const DBL *in, DBL *out, std::ptrdiff_t inStride, std::ptrdiff_t outStride,
                         int32_t count);
typedef void (*ComplexLeaf)(const DBL *inRe, const DBL *inIm, DBL *outRe, DBL *outIm,
                            std::ptrdiff_t inStride, std::ptrdiff_t outStride, int32_t count);
// A twiddle kernel combines, in place, p transforms of length m, block after block, into one of
// length p m. The twiddles are those of the stage.
typedef void (*RealTwiddle)(DBL *data, const DBL *twiddleCos, const DBL *twiddleSin,
                            std::ptrdiff_t stride, int32_t m);
typedef void (*ComplexTwiddle)(DBL *re, DBL *im, const DBL *twiddleCos, const DBL *twiddleSin,
                               std::ptrdiff_t stride, int32_t m);

struct KernelSet;

// The columns of a leaf: a rectangle of transforms, number (a, b) with its input at
// a inStride[0] + b inStride[1] and its output at a outStride[0] + b outStride[1]. Value j of a
// transform is j legStride behind its first.
struct LeafColumns {
    std::ptrdiff_t count[2];
    std::ptrdiff_t inStride[2];
    std::ptrdiff_t outStride[2];
    std::ptrdiff_t legStride;
};

// Where the rows of blocks are: row k of block j at k pitch + j leg.
struct BlockRows {
    std::ptrdiff_t pitch, leg;
};
// Columns of a matrix are transformed abreast: up to mostAbreast neighbouring columns of interleaved complex
// values, of which value j of all columns is a row.
constexpr int mostAbreast = 16;
// Value j is at j inLeg, result k at k outLeg; the two may be the same memory.
typedef void (*AbreastLeaf)(const DBL *in, std::ptrdiff_t inLeg, DBL *out, std::ptrdiff_t outLeg,
                            std::ptrdiff_t columns);
// Combines blocks of m rows. The input has whole lanes in each row, and what is behind `columns` is of no
// account. Input and output may be the same memory, with the same rows.
typedef void (*AbreastTwiddle)(const DBL *in, const BlockRows &inRows, DBL *out,
                               const BlockRows &outRows, const FFTStage &stage, std::ptrdiff_t m,
                               std::ptrdiff_t columns);

// The loops of one radix that run in SIMD lanes: complex data is interleaved, results are contiguous,
// and the twiddles come from tables in the order in which the lanes read them, in blocks of
// complexLanes or realLanes. Every number of lanes gives the same bits.
struct LanesPasses {
    void (*complexLeaf)(const DBL *in, DBL *out, const LeafColumns &columns);
    void (*realLeaf)(const DBL *in, DBL *out, const LeafColumns &columns);
    void (*complexTwiddle)(const DBL *in, std::ptrdiff_t inLeg, DBL *out, const FFTStage &stage,
                           std::ptrdiff_t m);
    void (*realTwiddle)(const DBL *in, std::ptrdiff_t inLeg, DBL *out, const FFTStage &stage,
                        std::ptrdiff_t m);
    // The part of realTwiddle for column 0 and, for even m, column m / 2.
    void (*realEdges)(const DBL *in, std::ptrdiff_t inLeg, DBL *out, std::ptrdiff_t m);
    int32_t complexLanes, realLanes;
    // Columns of a matrix.
    AbreastLeaf abreastLeaf;
    AbreastTwiddle abreastTwiddle;
};

// Straight-line transforms of one length, with contiguous input and results; null where there are
// none.
struct WholeTransform {
    void (*complex)(const DBL *in, DBL *out); // interleaved
    void (*real)(const DBL *in, DBL *out);
    AbreastLeaf abreast;
};
// The longest length with a straight-line transform.
constexpr int32_t longestWhole = 64;

// How the p-point transform of a factor p is done: by a kernel of straight-line code, as a plain
// sum (a prime below 50 that has no kernel), or by Rader's algorithm (any other prime).
enum FactorKind : int32_t { KernelFactor = 0, DirectPrime = 1, RaderPrime = 2 };

} // namespace qx

// The tables of one factor p. Tables that the factor does not need are null.
struct FFTStage {
    // Direct prime: exp(-2 pi i k / p), p values.
    DBL *rootCos, *rootSin;
    // Every stage but the last; the stage forms transforms of length n and has m = n / p columns:
    // exp(-2 pi i j k / n) at index (k - 1)(p - 1) + (j - 1), k from 1 to m - 1, j from 1 to p - 1.
    DBL *twiddleCos, *twiddleSin;
    // Rader prime: a reference to the plan of its convolution, whose length is RaderLength(p); the
    // spectrum of the roots in the order of the powers of a generator, scaled by 1 / length; and the
    // two permutations of p indices.
    FFTPlan *raderPlan;
    DBL *raderCos, *raderSin;
    int32_t *raderGather, *raderScatter;
    // Factor with kernels: its loops in lanes, and for every stage but the last a second copy of its
    // twiddles in the order in which these loops read them.
    qx::LanesPasses passes;
    DBL *complexLanes, *realLanes;
};

// Everything that a transform of one length needs. A plan is read-only from its creation to its
// release, apart from the last two fields: a buffer that transforms borrow, and a table that is set
// once.
struct FFTPlan {
    static constexpr int32_t maxFactors = 20; // no int32 length has more

    int32_t length;
    int32_t refCount;            // changes under the cache's mutex only
    int32_t factors[maxFactors]; // ascending; the last is the leaf
    int32_t kinds[maxFactors];   // qx::FactorKind
    int32_t factorCount;         // 0 for length 1
    FFTStage *stages[maxFactors];
    qx::RealLeaf realLeaf[maxFactors];
    qx::RealTwiddle realTwiddle[maxFactors];
    qx::ComplexLeaf complexLeaf[maxFactors];
    qx::ComplexTwiddle complexTwiddle[maxFactors];
    FFTPlan *prev, *next; // the cache

    // For a small length, which is transformed in one call: with several factors, the overhead of the
    // stages would exceed the arithmetic.
    qx::WholeTransform whole;

    // The work memory of a transform of complex and of real data, in values; 0 unless a Rader
    // prime is among the factors.
    int64_t complexWork, realWork;

    // The blocks that the stage of one level combines may be kept in a buffer, from which the stage
    // writes to the results (GainsByBuffer). In the buffer each block starts on a cache line, which the
    // host's arrays do not, and the pitch keeps the values of a column from mapping to one set of the
    // cache. The level, -1 for none, and the number of blocks.
    int32_t bufferLevel, bufferBlocks;
    // The buffer, if it does not fit on the stack, for one transform at a time; null while a transform
    // uses it. Other transforms meanwhile run without a buffer, with the same results.
    mutable std::atomic<void *> buffer;

    // Twiddles of the cosine transforms; null until the first call of QuarterWave builds them.
    mutable std::atomic<const double *> quarterWave;
};

namespace qx {

// In a buffer each block begins on a cache line and is followed by a spare line.
constexpr int32_t lineValues = 64 / sizeof(DBL);
inline std::ptrdiff_t BlockPitch(std::ptrdiff_t values) {
    return (values + lineValues - 1) / lineValues * lineValues + lineValues;
}
// The size of a plan's buffer in values, for data of `width` DBL units a value.
inline std::ptrdiff_t BufferValues(const FFTPlan &plan, std::ptrdiff_t width) {
    return plan.bufferBlocks * BlockPitch(width * (plan.length / plan.bufferBlocks));
}
// Buffers up to this size are on the stack. With a longer one, the input, the buffer and the results of a
// complex transform do not fit into the first-level cache together.
constexpr int32_t stackBufferValues = 1856;
inline bool IsBufferOnStack(const FFTPlan &plan, std::ptrdiff_t width) {
    return BufferValues(plan, width) <= stackBufferValues;
}
// Whether a transform is faster with a buffer: if without it, the stage would have to copy its columns
// (legsCollide in kernels/columns.h), and a complex one also if the cache holds it all. Elsewhere the buffer
// displaces input and results. Real stages read from both ends of each block, and separate input and output
// double their addresses.
inline bool GainsByBuffer(const FFTPlan &plan, std::ptrdiff_t width) {
    if (plan.bufferLevel < 0)
        return false;
    const std::ptrdiff_t side = plan.length / plan.bufferBlocks * width;
    const bool collide =
        plan.factors[plan.bufferLevel] > 4 && side * std::ptrdiff_t{sizeof(DBL)} % 2048 == 0;
    return collide || (width == 2 && IsBufferOnStack(plan, width));
}

// The implementation of the two exports of the same names: returns the shared plan of a length, or
// null, and releases it. (Calls are qualified, because the exports are visible too.)
FFTPlan *create_oxfft_table(int32_t length);
void destroy_oxfft_table(FFTPlan *plan);

// Forward transform, unscaled: X[k] is the sum over j of x[j] exp(-2 pi i j k / n). The inverse has
// the opposite sign and the factor 1/n. Input and output are different memory; strides count in
// DBL units, so interleaved complex data has stride 2. Any number of threads may share a plan.
//
// ErrOutOfMemory: scratch memory for a prime from 53 on; the output is then as it was. A plan of
// another length gives -1.
ErrorCode FFTComplexForward(const FFTPlan *plan, const DBL *inRe, const DBL *inIm, DBL *outRe,
                            DBL *outIm, int32_t inStride, int32_t outStride, int32_t n);
ErrorCode FFTComplexInverse(const FFTPlan *plan, const DBL *inRe, const DBL *inIm, DBL *outRe,
                            DBL *outIm, int32_t inStride, int32_t outStride, int32_t n);

// The transforms of real data. The spectrum is in half-complex form h: h[k] is Re X[k] for k from
// 0 to n/2, h[n-k] is Im X[k] for k from 1 to (n-1)/2. The inverse uses its input as work memory.
// A plan of another length gives ErrInternal.
ErrorCode FFTRealForward(const FFTPlan *plan, const DBL *in, DBL *out, int32_t inStride,
                         int32_t outStride, int32_t n);
ErrorCode FFTRealInverse(const FFTPlan *plan, DBL *in, DBL *out, int32_t inStride,
                         int32_t outStride, int32_t n);

// The work memory of transforms, for callers that run many of one length: the plan's complexWork
// or realWork values, or more. If these are 0, no scratch memory is requested.
class TransformWork {
public:
    ErrorCode take(int64_t values) { return values == 0 ? 0 : memory_.allocate(values); }
    DBL *data() const { return memory_.data(); }

private:
    Scratch<ElementType::DBL> memory_;
};

// The same four transforms in that memory. They fail only for a plan of another length.
ErrorCode FFTComplexForward(const FFTPlan *plan, const DBL *inRe, const DBL *inIm, DBL *outRe,
                            DBL *outIm, int32_t inStride, int32_t outStride, int32_t n, DBL *work);
ErrorCode FFTComplexInverse(const FFTPlan *plan, const DBL *inRe, const DBL *inIm, DBL *outRe,
                            DBL *outIm, int32_t inStride, int32_t outStride, int32_t n, DBL *work);
ErrorCode FFTRealForward(const FFTPlan *plan, const DBL *in, DBL *out, int32_t inStride,
                         int32_t outStride, int32_t n, DBL *work);
ErrorCode FFTRealInverse(const FFTPlan *plan, DBL *in, DBL *out, int32_t inStride,
                         int32_t outStride, int32_t n, DBL *work);

// Holds a plan for the scope.
class PlanReference {
public:
    explicit PlanReference(int32_t length) : plan_(qx::create_oxfft_table(length)) {}
    ~PlanReference() { qx::destroy_oxfft_table(plan_); }
    PlanReference(const PlanReference &) = delete;
    PlanReference &operator=(const PlanReference &) = delete;

    // Null if the length is below 1 or memory ran out.
    const FFTPlan *get() const { return plan_; }
    explicit operator bool() const { return plan_ != nullptr; }

private:
    FFTPlan *plan_;
};

} // namespace qx

#endif
