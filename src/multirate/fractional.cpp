#include "multirate/fractional.h"

#include "frame/scratch.h"
#include "multirate/samples.h"

#include <algorithm>
#include <cmath>
#include <limits>

namespace qx {

int32_t Truncated(double number) {
    constexpr double lowest = std::numeric_limits<int32_t>::min();
    constexpr int32_t greatest = std::numeric_limits<int32_t>::max();
    if (!(number < greatest))
        return greatest;
    return static_cast<int32_t>(std::max(number, lowest));
}

TapSpan ComputeTapSpan(int32_t len, int32_t oversample, double ratio, double fraction) {
    double r = ratio;
    if (r < 1.0)
        r = 1.0;
    if (!(oversample > r))
        r = oversample;
    TapSpan span;
    span.step = oversample / r;
    const double centre = (int64_t{len} - 1) * 0.5;
    const double shift = span.step * fraction;
    span.left = Truncated(std::floor((centre - shift) / span.step) + 1);
    span.right = Truncated(std::floor((centre + shift) / span.step));
    span.start = (centre - shift) - (span.left - 1.0) * span.step;
    return span;
}

namespace {

// Rounding may move the last positions beyond the ends of the table, where nothing must be read.
double Nearest(const ResampleFilter &filter, double q) {
    return filter.proto[std::clamp(Truncated(q + 0.5), 0, filter.len - 1)];
}
double Interpolated(const ResampleFilter &filter, double q) {
    const int32_t i = std::max(0, Truncated(q));
    if (i >= filter.len - 1)
        return filter.proto[filter.len - 1];
    return (filter.proto[i + 1] - filter.proto[i]) * (q - i) + filter.proto[i];
}

template <double (*Read)(const ResampleFilter &, double)>
void FillTaps(const ResampleFilter &filter, const TapSpan &span, DBL *taps) {
    double q = span.start;
    for (int64_t j = 0; j < span.taps(); ++j, q += span.step)
        taps[j] = Read(filter, q);
}

} // namespace

template <ElementType Code>
ErrorCode LoadFractionalTaps(const ResampleFilter &filter, ResampleCore<Code> &core, double ratio,
                             int32_t position, double fraction) {
    const TapSpan span = ComputeTapSpan(filter.len, filter.oversample, ratio, fraction);
    if (span.taps() > core.tapCapacity)
        return ErrBufferOverrun;
    if (filter.nearest)
        FillTaps<Nearest>(filter, span, core.taps);
    else
        FillTaps<Interpolated>(filter, span, core.taps);
    core.leftTaps = span.left;
    core.rightTaps = span.right;
    core.tapScale = span.step;
    core.position = position;
    core.fraction = fraction;
    return 0;
}

template <ElementType Code>
typename Element<Code>::type ResampleDot(const ResampleCore<Code> &core,
                                         const typename Element<Code>::type *x) {
    constexpr int parts = SampleParts<Code>::count;
    double sum[parts] = {};
    // Adds from the sample `newest` down to `oldest` of an array that begins at sample `origin`.
    const auto add = [&](const typename Element<Code>::type *samples, int64_t origin,
                         int64_t newest, int64_t oldest) {
        const int64_t firstTap = core.firstNeeded();
        for (int64_t i = newest; i >= oldest; --i)
            for (int part = 0; part < parts; ++part)
                sum[part] =
                    sum[part] + core.taps[i - firstTap] * Reals<Code>(samples + (i - origin))[part];
    };
    const int64_t newest = int64_t{core.position} + core.rightTaps;
    const int64_t oldest = std::max<int64_t>(core.firstNeeded(), 0);
    const int64_t held = core.historyCount;
    add(x, held, newest, std::max(oldest, held));
    add(core.history, 0, std::min(newest, held - 1), oldest);

    typename Element<Code>::type result;
    for (int part = 0; part < parts; ++part)
        Reals<Code>(&result)[part] = core.tapScale * sum[part];
    return result;
}

template <ElementType Code>
ErrorCode AdvanceHistory(ResampleCore<Code> &core, const typename Element<Code>::type *x,
                         int32_t n) {
    const Samples<Code> samples{core.history, core.historyCount, x, n};
    const int64_t dropped = std::clamp<int64_t>(core.firstNeeded(), 0, samples.count());
    const int64_t left = samples.count() - dropped;
    if (left > core.historyCapacity)
        return ErrBufferOverrun;
    samples.keepNewest(core.history, left);
    core.historyCount = static_cast<int32_t>(left);
    core.position = static_cast<int32_t>(core.position - dropped);
    return 0;
}

template <ElementType Code>
ErrorCode ResampleConstant(const ResampleFilter &filter, ResampleCore<Code> &core, double ratio,
                           bool antiAlias, ConstVectorView<Code> x, VectorView<Code> y,
                           int32_t *outCount) {
    const auto n = static_cast<int32_t>(x.size());
    double start = core.position + core.fraction;
    if (start < 0) // kept: later outputs count from here, not from the time of the first one
        start = core.historyCount - 1.0;
    // Without anti-aliasing the kernel keeps its natural width.
    const double tapRatio = antiAlias || ratio < 1.0 ? ratio : 1.0;

    *outCount = 0;
    ErrorCode status = LoadFractionalTaps(filter, core, tapRatio, core.position, core.fraction);
    while (status == 0 && core.canServe(n)) {
        if (*outCount >= y.size())
            return ErrIndexNotBelowSize;
        y[(*outCount)++] = ResampleDot(core, x.data());
        // Computed from the count and not from the last position, so that rounding does not
        // accumulate.
        const double time = *outCount * ratio + start;
        const double whole = std::floor(time);
        core.position = Truncated(whole);
        if (time - whole != core.fraction)
            status = LoadFractionalTaps(filter, core, tapRatio, core.position, time - whole);
    }
    return status != 0 ? status : AdvanceHistory(core, x.data(), n);
}

namespace {

DBL &TimeOf(DBL &time) { return time; }
DBL &TimeOf(CDB &time) { return time.re; }

// The stretch of the kernel for the widest gap; 1 if no gap is wider.
template <ElementType TimeCode>
double WidestGap(VectorView<TimeCode> t, double lastTime) {
    double widest = 1.0;
    for (int64_t i = 0; i < t.size(); ++i) {
        const double gap = TimeOf(t[i]) - lastTime;
        if (gap > widest)
            widest = gap;
        lastTime = TimeOf(t[i]);
    }
    return widest;
}

} // namespace

template <ElementType Code, ElementType TimeCode>
ErrorCode ResampleAtTimes(const ResampleFilter &filter, bool antiAlias,
                          const ConstMatrixView<Code> &x, VectorView<TimeCode> t, double *lastTime,
                          const MatrixView<Code> &y, int32_t *outCount, int32_t *consumed) {
    const auto m = static_cast<int32_t>(t.size());
    *outCount = 0;
    *consumed = 0;
    if (m < 1)
        return 0;
    const TapSpan widest = ComputeTapSpan(filter.len, filter.oversample,
                                          antiAlias ? WidestGap<TimeCode>(t, *lastTime) : 1.0, 0);
    const int64_t room = std::max<int64_t>(widest.taps() + 1, 0);
    if (room > std::numeric_limits<int32_t>::max())
        return ErrBufferOverrun;
    Scratch<ElementType::DBL> taps;
    if (const ErrorCode failed = taps.allocate(room))
        return failed;
    ResampleCore<Code> core{};
    core.taps = taps.data();
    core.tapCapacity = static_cast<int32_t>(room);

    for (int32_t i = 0; i < m; ++i) {
        const double time = TimeOf(t[i]);
        const double gap = antiAlias ? time - *lastTime : 1.0;
        const double whole = std::floor(time);
        if (const ErrorCode failed =
                LoadFractionalTaps(filter, core, gap, Truncated(whole), time - whole))
            return failed;
        *consumed = static_cast<int32_t>(std::clamp<int64_t>(core.firstNeeded(), 0, INT32_MAX));
        if (!core.canServe(x.cols()))
            break;
        *lastTime = time;
        for (int32_t c = 0; c < x.rows(); ++c)
            y(c, i) = ResampleDot(core, x.row(c));
        ++*outCount;
    }
    for (int32_t i = *outCount; i < m; ++i)
        TimeOf(t[i]) -= *consumed;
    *lastTime -= *consumed;
    return 0;
}

#define QX_RESAMPLE(Code)                                                                          \
    template ErrorCode ResampleConstant<Code>(const ResampleFilter &, ResampleCore<Code> &,        \
                                              double, bool, ConstVectorView<Code>,                 \
                                              VectorView<Code>, int32_t *);
QX_RESAMPLE(ElementType::DBL)
QX_RESAMPLE(ElementType::CDB)
#undef QX_RESAMPLE
#define QX_RESAMPLE(Code, TimeCode)                                                                \
    template ErrorCode ResampleAtTimes<Code, TimeCode>(                                            \
        const ResampleFilter &, bool, const ConstMatrixView<Code> &, VectorView<TimeCode>,         \
        double *, const MatrixView<Code> &, int32_t *, int32_t *);
QX_RESAMPLE(ElementType::DBL, ElementType::DBL)
QX_RESAMPLE(ElementType::CDB, ElementType::CDB)
QX_RESAMPLE(ElementType::CDB, ElementType::DBL)
#undef QX_RESAMPLE

} // namespace qx
