#include "spectra/sliding_sums.h"

#include <algorithm>
#include <cmath>

namespace qx {
namespace {

constexpr auto Real = ElementType::DBL;
constexpr auto Complex = ElementType::CDB;

bool IsFinite(double x) { return std::fabs(x) <= 1.7976931348623157e308; }
bool IsFinite(const CDB &x) { return IsFinite(x.re) && IsFinite(x.im); }

// From this many sums on lanes pay.
constexpr int32_t worthLanes = 4;

double Term(double sum, double a, double b) { return sum + a * b; }
CDB Term(const CDB &sum, const CDB &a, const CDB &b) {
    return {sum.re + (a.re * b.re - a.im * b.im), sum.im + (a.im * b.re + a.re * b.im)};
}

template <ElementType Code>
bool AllTapsFinite(const SlidingJob<Code> &job) {
    bool finite = true;
    for (std::ptrdiff_t i = 0; i < job.segments; ++i)
        for (std::ptrdiff_t k = 0; k < job.tapCount; ++k)
            finite &= IsFinite(job.taps.at[i * job.tapSegment + k * job.taps.step]);
    return finite;
}

// One sum after another; at the ends of the signal only as far as the signal goes.
template <ElementType Code>
void OneByOne(const SlidingJob<Code> &job) {
    for (std::ptrdiff_t t = job.count - 1; t >= 0; --t) {
        const int64_t start = job.first + t;
        const auto low = static_cast<std::ptrdiff_t>(std::max<int64_t>(0, -start));
        const auto high =
            static_cast<std::ptrdiff_t>(std::min<int64_t>(job.tapCount, job.length - start));
        typename Element<Code>::type sum = {};
        for (std::ptrdiff_t i = 0; i < job.segments; ++i)
            for (std::ptrdiff_t k = low; k < high; ++k)
                sum = Term(sum, job.taps.at[i * job.tapSegment + k * job.taps.step],
                           job.signal.at[i * job.signalSegment +
                                         static_cast<std::ptrdiff_t>(start + k) * job.signal.step]);
        job.out.at[t * job.out.step] = sum;
    }
}

// The outputs `from` to `to` - 1 of a job.
template <ElementType Code>
SlidingJob<Code> Part(SlidingJob<Code> job, int64_t from, int64_t to) {
    job.first += from;
    job.out.at += static_cast<std::ptrdiff_t>(from) * job.out.step;
    job.count = static_cast<int32_t>(to - from);
    return job;
}

void InLanes(const SlidingJob<Real> &job) { SlidingSumsInLanes(job); }
void InLanes(const SlidingJob<Complex> &job) { ComplexSlidingSumsInLanes(job); }

template <ElementType Code>
void Slide(const SlidingJob<Code> &job) {
    if (job.count < worthLanes)
        return OneByOne(job);
    if (AllTapsFinite(job))
        return InLanes(job);
    // From the last output to the first, as required if the output overlaps the signal.
    const int64_t from = std::clamp<int64_t>(-job.first, 0, job.count);
    const int64_t to =
        std::clamp<int64_t>(job.length - job.tapCount + 1 - job.first, from, job.count);
    OneByOne(Part(job, to, job.count));
    InLanes(Part(job, from, to));
    OneByOne(Part(job, 0, from));
}

} // namespace

void SlidingSums(const SlidingJob<Real> &job) { Slide(job); }
void SlidingSums(const SlidingJob<Complex> &job) { Slide(job); }

} // namespace qx
