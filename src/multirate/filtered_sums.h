#ifndef QX_MULTIRATE_FILTERED_SUMS_H
#define QX_MULTIRATE_FILTERED_SUMS_H

#include "frame/scratch.h"
#include "multirate/samples.h"
#include "multirate/tap_sums.h"

#include <algorithm>
#include <cstdint>

namespace qx {

// The outputs of a filter at a changed rate, computed only at the positions that are kept.

// The taps and samples of one output: terms j = 0, 1, ... of tap + j tapStep and
// sample + j sampleStep, added to 0 in this order.
struct OutputSum {
    int64_t sample;
    int32_t tap;
    int32_t terms;

    int64_t lowestSample(int32_t step) const {
        return step < 0 ? sample + int64_t{terms - 1} * step : sample;
    }
    int64_t highestSample(int32_t step) const {
        return step < 0 ? sample : sample + int64_t{terms - 1} * step;
    }
};

// Output m + period uses the taps of output m, with samples `advance` later.
struct Rhythm {
    int32_t period;
    int32_t advance;
    int32_t tapStep;
    int32_t sampleStep;
};

// A single output.
template <ElementType Code>
void FilteredSum(const Samples<Code> &samples, const RealOf<Code> *h, const Rhythm &rhythm,
                 OutputSum output, RealOf<Code> scale, typename Element<Code>::type *y) {
    constexpr int parts = SampleParts<Code>::count;
    RealOf<Code> sum[parts] = {};
    const RealOf<Code> *tap = h + output.tap;
    int64_t at = output.sample;
    for (int32_t j = 0; j < output.terms; ++j, tap += rhythm.tapStep, at += rhythm.sampleStep) {
        const RealOf<Code> *sample = Reals<Code>(samples.at(at));
        for (int part = 0; part < parts; ++part)
            sum[part] = sum[part] + *tap * sample[part];
    }
    for (int part = 0; part < parts; ++part)
        Reals<Code>(y)[part] = scale * sum[part];
}

// Whole periods of outputs together: output r of every period forms one row of adjacent sums, once
// the samples are arranged in rows of every advance-th one. The order and the bits of each sum are
// those of FilteredSum.
template <ElementType Code>
class PeriodRows {
    typedef typename Element<Code>::type T;
    typedef RealOf<Code> Real;
    typedef TapRow<SampleParts<Code>::real> Row;
    static constexpr int parts = SampleParts<Code>::count;
    static constexpr int32_t rowsAtOnce = 4;

public:
    PeriodRows(const Samples<Code> &samples, const Real *h, const Rhythm &rhythm, Real scale)
        : samples_(samples), h_(h), rhythm_(rhythm), scale_(scale) {}

    // y contains the outputs from `first` on; sumOf(m) describes output m.
    template <class SumOf>
    ErrorCode run(const SumOf &sumOf, int32_t first, int32_t periods, T *y) {
        findSpan(sumOf, first);
        if (const ErrorCode failed = prepare(periods))
            return failed;
        for (int32_t done = 0; done < periods; done += chunk_) {
            const int32_t now = std::min(chunk_, periods - done);
            fillRows(lowest_ + int64_t{done} * rhythm_.advance, now);
            T *to = y + int64_t{done} * rhythm_.period;
            if (rhythm_.period == 1)
                sumOneRow(sumOf(first), now, to);
            else
                for (int32_t r = 0; r < rhythm_.period; r += rowsAtOnce)
                    sumRows(sumOf, first + r, std::min(rowsAtOnce, rhythm_.period - r), now,
                            to + r);
        }
        return 0;
    }

private:
    // Finds the samples that the first period uses.
    template <class SumOf>
    void findSpan(const SumOf &sumOf, int32_t first) {
        int64_t highest = -1;
        for (int32_t r = 0; r < rhythm_.period; ++r) {
            const OutputSum output = sumOf(first + r);
            if (output.terms < 1)
                continue;
            const int64_t lowest = output.lowestSample(rhythm_.sampleStep);
            lowest_ = highest < 0 ? lowest : std::min(lowest_, lowest);
            highest = std::max(highest, output.highestSample(rhythm_.sampleStep));
        }
        span_ = std::max<int64_t>(highest - lowest_ + 1, 1);
    }

    ErrorCode prepare(int32_t periods) {
        // The samples of a chunk stay in the cache unless its windows are too long. In that case
        // the chunk is as long as the windows, because each chunk rearranges the samples of its
        // windows. The rows are long enough for the widest lanes.
        constexpr int64_t samplesAtOnce = 4096, shortestRow = 64;
        rows_ = static_cast<int32_t>(std::min<int64_t>(rhythm_.advance, span_));
        chunk_ = static_cast<int32_t>(std::min<int64_t>(
            periods, std::max({shortestRow, samplesAtOnce / rows_, span_ / rhythm_.advance})));
        pitch_ = (span_ + rhythm_.advance - 1) / rhythm_.advance + paddedWidth(chunk_) / parts;
        const int32_t sums = rhythm_.period == 1 ? 0 : rowsAtOnce * paddedWidth(chunk_);
        if (const ErrorCode failed = memory_.take(Sized(inRows_, parts * rows_ * pitch_),
                                                  Sized(sums_, sums), Sized(offsets_, span_)))
            return failed;
        ClearSamples<SampleParts<Code>::real>(inRows_.data(), parts * rows_ * pitch_);
        for (int64_t i = 0; i < span_; ++i)
            offsets_[i] =
                static_cast<int32_t>(parts * (i % rhythm_.advance * pitch_ + i / rhythm_.advance));
        return 0;
    }

    // The reals of a row of sums, rounded up to whole vectors of the widest lanes; values computed
    // beyond the end of the row are not used.
    static int32_t paddedWidth(int32_t periods) {
        constexpr int32_t vector = 32 / sizeof(Real);
        return (parts * periods + vector - 1) / vector * vector;
    }

    // Row r consists of the samples base + r, base + r + advance, ..., as many as `periods` periods
    // need.
    void fillRows(int64_t base, int32_t periods) {
        const int64_t used = span_ + int64_t{periods - 1} * rhythm_.advance;
        for (int32_t r = 0; r < rows_; ++r)
            samples_.gather(base + r, rhythm_.advance, (used - r - 1) / rhythm_.advance + 1,
                            reinterpret_cast<T *>(inRows_.data()) + r * pitch_);
    }

    Row rowOf(const OutputSum &output, Real *sums) const {
        return {h_ + output.tap, offsets_.data() + (output.terms > 0 ? output.sample - lowest_ : 0),
                output.terms, sums};
    }
    void sum(const Row *rows, int32_t count, int32_t width) const {
        if constexpr (SampleParts<Code>::real == ElementType::DBL)
            TapSumsDBL(rows, count, rhythm_.tapStep, rhythm_.sampleStep, inRows_.data(), scale_,
                       width);
        else
            TapSumsSGL(rows, count, rhythm_.tapStep, rhythm_.sampleStep, inRows_.data(), scale_,
                       width);
    }

    void sumOneRow(const OutputSum &output, int32_t periods, T *y) const {
        const Row row = rowOf(output, Reals<Code>(y));
        sum(&row, 1, parts * periods);
    }
    template <class SumOf>
    void sumRows(const SumOf &sumOf, int32_t m, int32_t count, int32_t periods, T *y) const {
        const int32_t width = paddedWidth(periods);
        Row rows[rowsAtOnce];
        for (int32_t r = 0; r < count; ++r)
            rows[r] = rowOf(sumOf(m + r), sums_.data() + r * width);
        sum(rows, count, width);
        if (rhythm_.period == 2)
            interleave<2>(width, periods, y);
        else if (rhythm_.period == 3)
            interleave<3>(width, periods, y);
        else
            for (int32_t r = 0; r < count; ++r)
                for (int32_t s = 0; s < periods; ++s)
                    y[int64_t{s} * rhythm_.period + r] =
                        reinterpret_cast<const T *>(rows[r].sums)[s];
    }
    // Interleaves short periods: with the period known to the compiler, this becomes shuffles.
    template <int Period>
    void interleave(int32_t width, int32_t periods, T *y) const {
        const T *sums = reinterpret_cast<const T *>(sums_.data());
        const int32_t pitch = width / parts;
        for (int64_t s = 0; s < periods; ++s)
            for (int r = 0; r < Period; ++r)
                y[s * Period + r] = sums[r * pitch + s];
    }

    const Samples<Code> samples_;
    const Real *const h_;
    const Rhythm rhythm_;
    const Real scale_;
    int64_t lowest_ = 0, span_ = 0, pitch_ = 0;
    int32_t rows_ = 0, chunk_ = 0;
    VectorView<SampleParts<Code>::real> inRows_, sums_;
    VectorView<ElementType::I32> offsets_;
    ScratchParts memory_;
};

// Writes outputs `first` to `end` - 1 into y. Outputs before `regular` may lack terms that the
// rhythm has.
template <ElementType Code, class SumOf>
ErrorCode FilteredSums(const Samples<Code> &samples, const RealOf<Code> *h, const Rhythm &rhythm,
                       const SumOf &sumOf, RealOf<Code> scale, int32_t first, int32_t regular,
                       int32_t end, typename Element<Code>::type *y) {
    int32_t m = first;
    for (; m < std::min(regular, end); ++m)
        FilteredSum<Code>(samples, h, rhythm, sumOf(m), scale, y + (m - first));
    const int32_t periods = (end - m) / rhythm.period;
    if (periods > 1) {
        PeriodRows<Code> rows(samples, h, rhythm, scale);
        if (const ErrorCode failed = rows.run(sumOf, m, periods, y + (m - first)))
            return failed;
        m += periods * rhythm.period;
    }
    for (; m < end; ++m)
        FilteredSum<Code>(samples, h, rhythm, sumOf(m), scale, y + (m - first));
    return 0;
}

} // namespace qx

#endif
