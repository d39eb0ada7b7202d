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
void FoldInput(VectorView<Code> x, int32_t L, int32_t subLength) {
    const auto n = static_cast<int32_t>(x.size());
    const typename Element<Code>::type *next = x.data() + subLength;
    for (int32_t wrap = 1; wrap < n / L; ++wrap)
        for (int32_t t = 0; t < L; ++t)
            Add(x[t], *next++);
    for (int32_t t = 0; t < n % L; ++t)
        Add(x[t], *next++);
}

// The work of one sub-sequence: gathered values and their spectrum, `subLength` bins. Given work memory, a
// transform by a plan of its own length cannot fail.
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
    void transform(const FFTPlan *plan, DBL *work) const {
        FFTRealForward(plan, y, h, 1, 1, n, work);
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
    void transform(const FFTPlan *plan, DBL *work) const {
        FFTComplexForward(plan, yRe, yIm, re, im, 1, 1, n, work);
    }
    CDB bin(int32_t k) const { return {re[k], im[k]}; }
};

// Every sections-th value from j on, with zeros after the input's end.
template <ElementType Code>
void Gather(ConstVectorView<Code> x, int32_t sections, int32_t j, const SubSpectrum<Code> &sub) {
    int64_t u = j;
    for (int32_t t = 0; t < sub.n; ++t, u += sections) {
        if (u < x.size())
            sub.gather(t, x[static_cast<std::ptrdiff_t>(u)]);
        else
            sub.gather(t, {});
    }
}

// Adds the bins of one sub-sequence, each turned by its delay. The turn starts at angle `phase`
// and advances by `step` per output, by multiplication.
template <class Sub>
void Accumulate(const Sub &sub, int32_t firstBin, double step, double phase, ComplexVector out) {
    const double stepCos = std::cos(step);
    const double stepSin = std::sin(step);
    double c = std::cos(phase);
    double s = std::sin(phase);
    int32_t k = firstBin;
    for (CDB &sum : out) {
        const CDB bin = sub.bin(k);
        sum.re += bin.re * c - bin.im * s;
        sum.im += bin.re * s + bin.im * c;
        const double turned = c * stepCos - s * stepSin;
        s = c * stepSin + s * stepCos;
        c = turned;
        k = k + 1 < sub.n ? k + 1 : 0;
    }
}

} // namespace

template <ElementType E>
ErrorCode BandTransform(const FFTPlan *plan, VectorView<E> x, int32_t sections, int32_t subLength,
                        int32_t start, ComplexVector out) {
    if (x.isEmpty())
        return ErrEmptyInput;
    if (sections < 1 || subLength < 1)
        return ErrFFTSizeNotPositive;
    if (!plan || plan->length != subLength)
        return ErrInternal;
    // No input is longer than an L beyond int32, which is reported as ErrLengthTooLarge below.
    const int64_t L = int64_t{sections} * subLength;
    if (x.size() > L)
        FoldInput<E>(x, static_cast<int32_t>(L), subLength);
    for (CDB &value : out)
        value = CDB{};

    const int64_t gathered = SubSpectrum<E>::WorkPerBin * subLength;
    Scratch<ElementType::DBL> work;
    if (const ErrorCode failed = work.allocate(gathered + SubSpectrum<E>::transformWork(plan)))
        return failed;
    if (L - 1 > std::numeric_limits<int32_t>::max()) // the last index of the last sub-sequence
        return ErrLengthTooLarge;
    const SubSpectrum<E> sub(work.data(), subLength);
    const int32_t remainder = start % subLength;
    const int32_t firstBin = remainder < 0 ? remainder + subLength : remainder;
    const double startInL = static_cast<double>(start % L);
    // Sub-sequences from the n-th on are zeros and would add zeros.
    const auto used = static_cast<int32_t>(std::min<std::ptrdiff_t>(sections, x.size()));
    for (int32_t j = 0; j < used; ++j) {
        Gather<E>(x, sections, j, sub);
        sub.transform(plan, work.data() + gathered);
        const double step = -kTwoPi * (static_cast<double>(j) / static_cast<double>(L));
        Accumulate(sub, firstBin, step, startInL * step, out);
    }
    return work.release();
}

template ErrorCode BandTransform(const FFTPlan *, RealVector, int32_t, int32_t, int32_t,
                                 ComplexVector);
template ErrorCode BandTransform(const FFTPlan *, ComplexVector, int32_t, int32_t, int32_t,
                                 ComplexVector);

} // namespace qx
