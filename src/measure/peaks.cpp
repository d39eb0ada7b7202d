#include "measure/peaks.h"

#include "measure/parabolas.h"
#include "measure/search.h"

#include <algorithm>
#include <bit>
#include <cmath>
#include <cstring>
#include <limits>

namespace qx {

namespace {

constexpr double epsilon = 2.220446049250313e-16;
constexpr double smallestCurvature = 1e-10; // of the second derivative
constexpr double widestFlat = 1e-8;
// From this width on a change of sign of the slope is required. For narrower windows the list keeps
// only one of neighbouring peaks.
constexpr int32_t slopeWidth = 5;

void Copy(DBL *to, const DBL *from, std::ptrdiff_t count) {
    std::memcpy(to, from, static_cast<std::size_t>(count) * sizeof(DBL));
}

// Divides a window by the magnitude of the extreme that is sought, and returns that magnitude.
double PeakNormalize(DBL *window, int32_t w, bool ofValleys) {
    double extreme = window[0];
    for (int32_t j = 1; j < w; ++j)
        if (ofValleys ? window[j] < extreme : window[j] > extreme)
            extreme = window[j];
    const double scale = std::max(epsilon, std::fabs(extreme));
    for (int32_t j = 0; j < w; ++j)
        window[j] = window[j] / scale;
    return scale;
}

class PeakScan {
public:
    PeakScan(const PeakBlock &block, double mean, PeakDState *state, PeakList *found)
        : fitMatrix_(state->fitMatrix), w_(state->width), centre_((state->width - 1) * 0.5),
          ofValleys_(block.ofValleys), threshold_(block.threshold - mean), mean_(mean),
          state_(state), found_(found) {}

    // The windows at x, x + 1, ... ErrOutOfMemory.
    ErrorCode run(const DBL *x, std::ptrdiff_t windows) {
        if (windows < 1)
            return 0;
        if (w_ >= slopeWidth)
            return runBySlope(x, windows);
        // Most callers want the exact parabola through three samples, so it is unrolled.
        return w_ == 3 ? runByVertex<3>(x, windows) : runByVertex<4>(x, windows);
    }
    // The same with each window scaled to 1, in `work` of a window's length.
    ErrorCode runScaled(const DBL *x, std::ptrdiff_t windows, DBL *work);

private:
    ErrorCode runBySlope(const DBL *x, std::ptrdiff_t windows);
    template <int32_t W>
    ErrorCode runByVertex(const DBL *x, std::ptrdiff_t windows);
    template <int32_t W>
    ErrorCode runOneByOne(const DBL *fitMatrix, const DBL *x, std::ptrdiff_t first,
                          std::ptrdiff_t windows, const uint64_t *masks, bool *mayTakeFormer);
    template <class Previous>
    ErrorCode refine(const Parabola &now, const Previous &previous, double scale, double position,
                     bool &tookOwn);

    // A vertex from the centre of its window.
    double furthest() const { return 0.5 * centre_ + 10 * epsilon; }
    bool isSought(double curvature) const { return ofValleys_ ? curvature > 0 : curvature < 0; }
    Parabola previous() const {
        const DBL *const c = state_->previous;
        return {c[0], c[1], c[2]};
    }
    // The parabola of window i of a run, and that of the window before it.
    template <int32_t W = 0>
    Parabola fit(const DBL *x, std::ptrdiff_t i) const {
        return FitWindow(fitMatrix_, W > 0 ? W : w_, x + i);
    }
    template <int32_t W = 0>
    Parabola before(const DBL *x, std::ptrdiff_t i) const {
        return i > 0 ? fit<W>(x, i - 1) : previous();
    }
    void passed(const Parabola &p, double scale, std::ptrdiff_t windows) {
        state_->slopeSign = IsRising(p);
        state_->previous[0] = p.c0 * scale;
        state_->previous[1] = p.c1 * scale;
        state_->previous[2] = p.c2 * scale;
        state_->position += static_cast<int32_t>(windows);
    }

    const DBL *fitMatrix_;
    int32_t w_;
    double centre_;
    bool ofValleys_;
    double threshold_, mean_;
    PeakDState *state_;
    PeakList *found_;
};

int32_t WindowsFrom(std::ptrdiff_t first, std::ptrdiff_t windows) {
    return static_cast<int32_t>(std::min<std::ptrdiff_t>(maskWidth, windows - first));
}

// Wide windows: candidates are where the slope changes its sign.
ErrorCode PeakScan::runBySlope(const DBL *x, std::ptrdiff_t windows) {
    uint64_t wasRising = state_->slopeSign != 0;
    const double position = state_->position;
    for (std::ptrdiff_t first = 0; first < windows; first += maskWidth) {
        const int32_t count = WindowsFrom(first, windows);
        const uint64_t all = ~uint64_t{0} >> (maskWidth - count);
        const uint64_t rising = RisingWindows(fitMatrix_, w_, x + first, count);
        for (uint64_t left = (rising ^ (rising << 1 | wasRising)) & all; left != 0;
             left &= left - 1) {
            const std::ptrdiff_t i = first + std::countr_zero(left);
            bool tookOwn;
            if (const ErrorCode failed = refine(
                    fit(x, i), [&] { return before(x, i); }, 1.0, position + static_cast<double>(i),
                    tookOwn))
                return failed;
        }
        wasRising = rising >> (count - 1) & 1;
    }
    passed(fit(x, windows - 1), 1.0, windows);
    return 0;
}

// Narrow windows: candidates are windows with the required curvature. Only those whose own vertex
// is near the centre and beyond the threshold need to be tested, and the windows after them, which
// may use their vertex; this has no effect if that vertex has been tested already.
template <int32_t W>
ErrorCode PeakScan::runByVertex(const DBL *x, std::ptrdiff_t windows) {
    // Twice the limit of the vertex position, because c1 is compared with c2, plus more than
    // rounding could hide.
    const double reach = centre_ * (1 + 1e-9);
    const double sign = ofValleys_ ? 1.0 : -1.0;
    DBL fitMatrix[3 * W]; // a local copy, which no store of a result can change
    Copy(fitMatrix, fitMatrix_, 3 * W);
    bool mayTakeFormer = true, isPlain = true;
    FoundVertices found;
    std::ptrdiff_t end;
    for (std::ptrdiff_t first = 0; first < windows; first += end) {
        end = std::min<std::ptrdiff_t>(windows - first,
                                       first == 0 ? maskWidth : FoundVertices::windows);
        uint64_t masks[FoundVertices::windows / maskWidth];
        int32_t count = 0;
        for (std::ptrdiff_t i = 0; i < end; i += maskWidth)
            masks[count++] = NarrowWindowsAtVertex(fitMatrix, W, x + first + i, WindowsFrom(i, end),
                                                   reach, sign, threshold_);
        const double position = static_cast<double>(state_->position) + static_cast<double>(first);
        const VertexLimits limits = {position, centre_,    furthest(), smallestCurvature,
                                     sign,     threshold_, mean_};
        isPlain = isPlain && (mayTakeFormer ||
                              FindVertices(fitMatrix, W, x + first, masks, count, &limits, &found));
        if (const ErrorCode failed =
                isPlain && !mayTakeFormer
                    ? found_->store(found)
                    : runOneByOne<W>(fitMatrix, x, first, end, masks, &mayTakeFormer))
            return failed;
    }
    passed(fit<W>(x, windows - 1), 1.0, windows);
    return 0;
}

// The windows of `masks` from number `first` of a run on.
template <int32_t W>
ErrorCode PeakScan::runOneByOne(const DBL *fitMatrix, const DBL *x, std::ptrdiff_t first,
                                std::ptrdiff_t windows, const uint64_t *masks,
                                bool *mayTakeFormer) {
    const double position = state_->position;
    for (std::ptrdiff_t done = 0; done < windows; done += maskWidth) {
        const uint64_t all = ~uint64_t{0} >> (maskWidth - WindowsFrom(done, windows));
        uint64_t left = masks[done / maskWidth] | uint64_t{*mayTakeFormer};
        *mayTakeFormer = false;
        while (left != 0) {
            const uint64_t bit = left & -left;
            left ^= bit;
            const std::ptrdiff_t i = first + done + std::countr_zero(bit);
            const Parabola now = FitWindow(fitMatrix, W, x + i);
            if (!isSought(now.c2))
                continue;
            bool tookOwn = false;
            if (const ErrorCode failed = refine(
                    now, [&] { return before<W>(x, i); }, 1.0, position + static_cast<double>(i),
                    tookOwn))
                return failed;
            if (__builtin_expect(!tookOwn, 0)) {
                left |= bit << 1 & all;
                *mayTakeFormer |= bit << 1 == 0;
            }
        }
    }
    return 0;
}

ErrorCode PeakScan::runScaled(const DBL *x, std::ptrdiff_t windows, DBL *work) {
    for (std::ptrdiff_t i = 0; i < windows; ++i) {
        Copy(work, x + i, w_);
        const double scale = PeakNormalize(work, w_, ofValleys_);
        const Parabola now = fit(work, 0);
        const bool isCandidate =
            w_ < slopeWidth ? isSought(now.c2) : IsRising(now) != (state_->slopeSign != 0);
        bool tookOwn;
        if (isCandidate)
            if (const ErrorCode failed = refine(
                    now, [this] { return previous(); }, scale, state_->position, tookOwn))
                return failed;
        passed(now, scale, 1);
    }
    return 0;
}

// The vertex of a candidate at `position`, or that of the previous window if it is nearer.
// `tookOwn` is set to whether the candidate's own vertex was tested, accepted or not.
template <class Previous>
ErrorCode PeakScan::refine(const Parabola &now, const Previous &previous, double scale,
                           double position, bool &tookOwn) {
    tookOwn = false;
    double d = 2 * now.c2;
    if (std::fabs(d) < smallestCurvature)
        return 0;
    double t = -now.c1 / d;
    double y = (t * now.c2 + now.c1) * t + now.c0;
    tookOwn = true;
    if (position > 0 && t < -0.5) {
        const Parabola former = previous();
        const double dp = 2 * former.c2;
        tookOwn = false;
        if (dp == 0)
            return 0;
        const double tp = -former.c1 / dp;
        tookOwn = !(std::fabs(t) > std::fabs(tp));
        if (!tookOwn) {
            position -= 1;
            d = dp;
            y = (tp * former.c2 + former.c1) * tp + former.c0;
            t = tp;
            scale = 1.0;
        }
    }
    if (std::fabs(t) > furthest() || !isSought(d))
        return 0;
    if (!(ofValleys_ ? scale * y < threshold_ : scale * y > threshold_))
        return 0;
    return found_->store(Peak{position + centre_ + t, scale * y + mean_, scale * d});
}

ErrorCode BeginStream(const PeakBlock &block, PeakDState *state) {
    if (state->fitMatrix == nullptr)
        return ErrNoUsableFit;
    if (const ErrorCode failed = BuildFitMatrix(state->width, state->fitMatrix))
        return failed;
    const int32_t w = state->width;
    Copy(state->history, block.data, w);
    Fill(state->previous, 3, 0.0);
    state->position = 0;
    state->historyCount = w;
    state->slopeSign = 0;
    state->reserved = 0;
    state->incoming = block.data + w;
    state->tailCount = block.n - w;
    return 0;
}

struct Flatness {
    bool isFlat;
    double mean;
};

Flatness LookForFlat(const PeakBlock &block, const PeakDState &state) {
    double max = state.history[0];
    double min = max;
    double sum = 0;
    const auto isWithin = [&](const DBL *x, int32_t n) {
        for (int32_t i = 0; i < n; ++i) {
            sum += x[i];
            max = x[i] > max ? x[i] : max;
            min = x[i] < min ? x[i] : min;
            if (!(max - min < widestFlat))
                return false;
        }
        return true;
    };
    if (!isWithin(state.history, state.historyCount) || !isWithin(block.data, block.n))
        return {false, 0};
    const double mean = sum / (static_cast<double>(state.historyCount) + block.n);
    // With NaN, or if the sum overflows, there is no mean to subtract.
    return std::isfinite(mean) ? Flatness{true, mean} : Flatness{false, 0};
}

void Subtract(double mean, DBL *x, int32_t n) {
    for (int32_t i = 0; i < n; ++i)
        x[i] -= mean;
}

// Scans the windows that start in the history, in `seam`, and those that start in the new samples.
ErrorCode ScanAll(PeakScan &scan, const PeakDState &state, const DBL *seam, int64_t windows,
                  bool isScaled) {
    const int32_t w = state.width;
    const auto inSeam = static_cast<std::ptrdiff_t>(std::min<int64_t>(windows, w));
    const auto behind = static_cast<std::ptrdiff_t>(windows) - inSeam;
    if (!isScaled) {
        const ErrorCode failed = scan.run(seam, inSeam);
        return failed ? failed : scan.run(state.incoming, behind);
    }
    Scratch<ElementType::DBL> work;
    if (const ErrorCode failed = work.allocate(w))
        return failed;
    const ErrorCode failed = scan.runScaled(seam, inSeam, work.data());
    return failed ? failed : scan.runScaled(state.incoming, behind, work.data());
}

// Stores the last w samples of the stream. `seam` contains the old history followed by new samples.
void StoreHistory(PeakDState *state, const DBL *seam, double mean) {
    const int32_t w = state->width;
    const DBL *const last =
        state->tailCount >= w ? state->incoming + state->tailCount - w : seam + state->tailCount;
    std::memmove(state->history, last, static_cast<std::size_t>(w) * sizeof(DBL));
    for (int32_t i = 0; i < w; ++i)
        state->history[i] += mean;
    state->historyCount = w;
}

} // namespace

int32_t FindRuns(const DBL *x, int32_t n, double threshold, int32_t width, I32 *starts) {
    constexpr double none = std::numeric_limits<double>::quiet_NaN();
    int32_t found = 0;
    for (int32_t i = FirstBeyond(x, 0, n, none, threshold); i < n;
         i = FirstBeyond(x, i, n, none, threshold)) {
        const int32_t start = i;
        while (i < n && x[i] >= threshold)
            ++i;
        if (i - start >= width)
            starts[found++] = start;
    }
    return found;
}

ErrorCode PeakList::grow() {
    // By half as much again, so that a long list is not copied too often.
    const int64_t grown = int64_t{capacity_} + chunk + capacity_ / 2 / chunk * chunk;
    if (const ErrorCode failed = memory_.resize(grown * int64_t{sizeof(Peak)}))
        return failed;
    capacity_ = static_cast<int32_t>(grown);
    return 0;
}

ErrorCode PeakList::store(const FoundVertices &found) {
    for (int32_t first = 0; first < found.count; first += maskWidth) {
        const int32_t count = std::min(maskWidth, found.count - first);
        uint64_t kept;
        if (KeptOfClose(found.locations + first, found.amplitudes + first, count,
                        ofValleys_ ? 1.0 : -1.0, lastLocation_, &kept)) {
            if (const ErrorCode failed = append(found, first, kept))
                return failed;
            continue;
        }
        for (int32_t i = first; i < first + count; ++i)
            if (const ErrorCode failed =
                    store(Peak{found.locations[i], found.amplitudes[i], found.curvatures[i]}))
                return failed;
    }
    return 0;
}

ErrorCode PeakList::append(const FoundVertices &found, int32_t first, uint64_t kept) {
    while (kept != 0) {
        if (size_ == capacity_)
            if (const ErrorCode failed = grow())
                return failed;
        DBL *to = place(size_);
        DBL *const end = to + chunk - size_ % chunk;
        DBL *const begin = to;
        for (; kept != 0 && to != end; kept &= kept - 1, ++to) {
            const int32_t i = first + std::countr_zero(kept);
            to[0] = found.locations[i];
            to[chunk] = found.amplitudes[i];
            to[2 * chunk] = found.curvatures[i];
        }
        size_ += static_cast<int32_t>(to - begin);
        lastLocation_ = to[-1];
        lastAmplitude_ = to[chunk - 1];
    }
    return 0;
}

void PeakList::copyTo(DBL *locations, DBL *amplitudes, DBL *derivatives) const {
    for (int32_t i = 0; i < size_; i += chunk) {
        const int32_t count = std::min(chunk, size_ - i);
        const DBL *const from = place(i);
        Copy(locations + i, from, count);
        Copy(amplitudes + i, from + chunk, count);
        Copy(derivatives + i, from + 2 * chunk, count);
    }
}

void PointInto(DBL *buffer, int32_t w, PeakDState *state) {
    state->fitMatrix = buffer;
    state->window = buffer + 3 * std::ptrdiff_t{w};
    state->history = state->window + w;
    state->previous = state->history + w;
}

PeakList ListFor(const PeakBlock &block, const PeakDState &state) {
    constexpr double none = std::numeric_limits<double>::quiet_NaN();
    if (block.isFirst)
        return {block.ofValleys, none, none};
    return {block.ofValleys, state.window[0], state.window[1]};
}

ErrorCode PeakDetectStep(const PeakBlock &block, PeakDState *state, PeakList *found) {
    const int32_t w = state->width;
    if (block.n < w)
        return ErrWidthOutOfRange;
    if (block.isFirst) {
        if (const ErrorCode failed = BeginStream(block, state))
            return failed;
    } else {
        state->incoming = block.data;
        state->tailCount = block.n;
    }
    // The last window of the block is the first one of the next block, unless this block is the
    // last.
    const int64_t windows = int64_t{state->tailCount} + block.isLast;
    if (state->position + windows > std::numeric_limits<int32_t>::max())
        return ErrOverflow;

    const Flatness flat = block.mayBeFlat ? LookForFlat(block, *state) : Flatness{false, 0};
    if (flat.isFlat) {
        Subtract(flat.mean, block.data, block.n);
        Subtract(flat.mean, state->history, w);
    }
    // The work window and the history are adjacent in the buffer. With the history copied into the
    // former and new samples in place of the latter, all windows are contiguous.
    DBL *const seam = state->window;
    Copy(seam, state->history, w);
    Copy(seam + w, state->incoming, std::min(w, state->tailCount));
    if (state->position == 0)
        state->slopeSign = IsRising(FitWindow(state->fitMatrix, w, seam));

    PeakScan scan(block, flat.mean, state, found);
    const ErrorCode status = ScanAll(scan, *state, seam, windows, flat.isFlat);
    StoreHistory(state, seam, flat.mean);
    state->window[0] = found->lastLocation();
    state->window[1] = found->lastAmplitude();
    return status;
}

} // namespace qx
