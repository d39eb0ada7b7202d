#include "transforms/dzt.h"

#include "frame/constants.h"
#include "frame/scratch.h"

#include <algorithm>
#include <cmath>
#include <cstddef>
#include <limits>

namespace qx {
namespace {

void Add(DBL &sum, DBL value) { sum += value; }
void Add(CDB &sum, const CDB &value) {
    sum.re += value.re;
    sum.im += value.im;
}

// Wraps an input longer than L around.
// kept: the walk begins at element subLength and not at element L, as a plain wrap would.
template <ElementType Code>
void FoldInput(typename Element<Code>::type *x, int32_t n, int32_t L, int32_t subLength) {
    const typename Element<Code>::type *next = x + subLength;
    for (int32_t wrap = 1; wrap < n / L; ++wrap)
        for (int32_t t = 0; t < L; ++t)
            Add(x[t], *next++);
    for (int32_t t = 0; t < n % L; ++t)
        Add(x[t], *next++);
}

// The work of one sub-sequence: gathered values and their spectrum, `subLength` bins.
template <ElementType Code>
struct SubSpectrum;

template <>
struct SubSpectrum<ElementType::DBL> {
    static constexpr int64_t WorkPerBin = 2;
    DBL *y, *h;
    int32_t n;

    SubSpectrum(DBL *work, int32_t subLength) : y(work), h(work + subLength), n(subLength) {}
    void gather(int32_t t, DBL value) const { y[t] = value; }
    static int64_t transformWork(const FFTPlan *plan) { return plan->realWork; }
    ErrorCode transform(const FFTPlan *plan, DBL *work) const {
        return FFTRealForward(plan, y, h, 1, 1, n, work);
    }
    CDB bin(int32_t k) const {
        const int32_t mirror = n - k;
        if (k == 0 || k == mirror)
            return {h[k], 0};
        return k < mirror ? CDB{h[k], h[mirror]} : CDB{h[mirror], -h[k]};
    }
};

template <>
struct SubSpectrum<ElementType::CDB> {
    static constexpr int64_t WorkPerBin = 4;
    DBL *yRe, *yIm, *re, *im;
    int32_t n;

    SubSpectrum(DBL *work, int32_t subLength)
        : yRe(work), yIm(yRe + subLength), re(yIm + subLength), im(re + subLength), n(subLength) {}
    void gather(int32_t t, const CDB &value) const {
        yRe[t] = value.re;
        yIm[t] = value.im;
    }
    static int64_t transformWork(const FFTPlan *plan) { return plan->complexWork; }
    ErrorCode transform(const FFTPlan *plan, DBL *work) const {
        return FFTComplexForward(plan, yRe, yIm, re, im, 1, 1, n, work);
    }
    CDB bin(int32_t k) const { return {re[k], im[k]}; }
};

// Every sections-th value from j on, with zeros behind the input's end.
template <ElementType Code>
void Gather(const typename Element<Code>::type *x, int32_t n, int32_t sections, int32_t j,
            const SubSpectrum<Code> &sub) {
    int64_t u = j;
    for (int32_t t = 0; t < sub.n; ++t, u += sections) {
        if (u < n)
            sub.gather(t, x[u]);
        else
            sub.gather(t, {});
    }
}

// Adds the bins of one sub-sequence, each turned by its delay. The turn starts at angle `phase`
// and advances by `step` per output, by multiplication.
template <class Sub>
void Accumulate(const Sub &sub, int32_t firstBin, double step, double phase, int32_t size,
                CDB *out) {
    const double stepCos = std::cos(step);
    const double stepSin = std::sin(step);
    double c = std::cos(phase);
    double s = std::sin(phase);
    int32_t k = firstBin;
    for (int32_t i = 0; i < size; ++i) {
        const CDB bin = sub.bin(k);
        out[i].re += bin.re * c - bin.im * s;
        out[i].im += bin.re * s + bin.im * c;
        const double turned = c * stepCos - s * stepSin;
        s = c * stepSin + s * stepCos;
        c = turned;
        k = k + 1 < sub.n ? k + 1 : 0;
    }
}

} // namespace

template <ElementType Code>
ErrorCode BandTransform(const FFTPlan *plan, typename Element<Code>::type *x, int32_t n,
                        int32_t sections, int32_t subLength, int32_t start, int32_t size,
                        CDB *out) {
    if (n < 1)
        return ErrEmptyInput;
    if (sections < 1 || subLength < 1)
        return ErrFFTSizeNotPositive;
    if (!plan || plan->length != subLength)
        return ErrInternal;
    // A length beyond int32 cannot be folded into; it ends in ErrLengthTooLarge below.
    const int64_t L = int64_t{sections} * subLength;
    if (n > L)
        FoldInput<Code>(x, n, static_cast<int32_t>(L), subLength);
    for (int32_t i = 0; i < size; ++i)
        out[i] = CDB{};

    const int64_t gathered = SubSpectrum<Code>::WorkPerBin * subLength;
    Scratch<ElementType::DBL> work;
    if (const ErrorCode failed = work.allocate(gathered + SubSpectrum<Code>::transformWork(plan)))
        return failed;
    if (L - 1 > std::numeric_limits<int32_t>::max()) // the last index of the last sub-sequence
        return ErrLengthTooLarge;
    const SubSpectrum<Code> sub(work.data(), subLength);
    const int32_t remainder = start % subLength;
    const int32_t firstBin = remainder < 0 ? remainder + subLength : remainder;
    const double startInL = static_cast<double>(start % L);
    ErrorCode status = 0;
    // Sub-sequences from the n-th on are zeros and would add zeros.
    const int32_t used = std::min(sections, n);
    for (int32_t j = 0; j < used; ++j) {
        Gather<Code>(x, n, sections, j, sub);
        // A sub-sequence whose transform failed is left out; only the last status is reported.
        status = sub.transform(plan, work.data() + gathered);
        if (status != 0)
            continue;
        const double step = -kTwoPi * (static_cast<double>(j) / static_cast<double>(L));
        Accumulate(sub, firstBin, step, startInL * step, size, out);
    }
    return Merge(status, work.release());
}

template ErrorCode BandTransform<ElementType::DBL>(const FFTPlan *, DBL *, int32_t, int32_t,
                                                   int32_t, int32_t, int32_t, CDB *);
template ErrorCode BandTransform<ElementType::CDB>(const FFTPlan *, CDB *, int32_t, int32_t,
                                                   int32_t, int32_t, int32_t, CDB *);

} // namespace qx
