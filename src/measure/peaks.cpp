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

// The vertex of a parabola: its place from the centre, its amplitude, and the second derivative.
struct Vertex {
    double t, y, d;
};
Vertex VertexOf(const Parabola &p) {
    const double d = 2 * p.c2;
    const double t = -p.c1 / d;
    return {t, (t * p.c2 + p.c1) * t + p.c0, d};
}

class PeakScan {
public:
    PeakScan(const PeakBlock &block, double mean, PeakDState *state, PeakList *found)
        : fitMatrix_(state->fitMatrix), w_(state->width), centre_((state->width - 1) * 0.5),
          ofValleys_(block.ofValleys), threshold_(block.threshold - mean), mean_(mean),
          block_(block.data), state_(state), found_(found) {}

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
    void markGroup(const DBL *fitMatrix, const DBL *x, std::ptrdiff_t first, std::ptrdiff_t windows,
                   bool *mayTakeFormer);
    template <int32_t W, class Store>
    ErrorCode runOneByOne(const DBL *fitMatrix, const DBL *x, std::ptrdiff_t first,
                          std::ptrdiff_t windows, const uint64_t *masks, bool *mayTakeFormer,
                          const Store &store);
    template <class Previous, class Store>
    ErrorCode refine(const Parabola &now, const Previous &previous, double scale, double position,
                     bool &tookOwn, const Store &store);

    // A vertex from the centre of its window.
    double furthest() const { return 0.5 * centre_ + 10 * epsilon; }
    VertexLimits limitsAt(double position) const {
        return {position,   centre_, furthest(), smallestCurvature, ofValleys_ ? 1.0 : -1.0,
                threshold_, mean_};
    }
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
    const DBL *block_;
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
                    tookOwn, [this](const Peak &peak) { return found_->store(peak); }))
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
    DBL fitMatrix[3 * W]; // a local copy, which no store of a result can change
    Copy<ElementType::DBL>({fitMatrix_, 3 * W}, {fitMatrix, 3 * W});
    // The first window may use the vertex of the one before the run.
    bool mayTakeFormer = true;
    const std::ptrdiff_t head = std::min<std::ptrdiff_t>(windows, maskWidth);
    const VertexLimits limits = limitsAt(state_->position);
    VertexMarks marks;
    MarkVertices(fitMatrix, W, x, static_cast<int32_t>(head), &limits, &marks);
    const auto store = [this](const Peak &peak, std::ptrdiff_t) { return found_->store(peak); };
    if (const ErrorCode failed =
            runOneByOne<W>(fitMatrix, x, 0, head, marks.possible, &mayTakeFormer, store))
        return failed;
    if (windows > head) {
        if (const ErrorCode failed = found_->beginMarks(fitMatrix, W, limits, x - block_, windows))
            return failed;
        for (std::ptrdiff_t first = head; first < windows; first += groupWidth)
            markGroup<W>(fitMatrix, x, first, std::min<std::ptrdiff_t>(groupWidth, windows - first),
                         &mayTakeFormer);
        found_->endMarks(x);
    }
    passed(fit<W>(x, windows - 1), 1.0, windows);
    return 0;
}

template <int32_t W>
void PeakScan::markGroup(const DBL *fitMatrix, const DBL *x, std::ptrdiff_t first,
                         std::ptrdiff_t windows, bool *mayTakeFormer) {
    const auto count = static_cast<int32_t>(windows);
    const VertexLimits limits =
        limitsAt(static_cast<double>(state_->position) + static_cast<double>(first));
    VertexMarks marks;
    FoundVertices found;
    const auto isPlain = [&] {
        return FindVertices(fitMatrix, W, x + first, marks.doubtful,
                            (count + maskWidth - 1) / maskWidth, &limits, &found);
    };
    bool isDone =
        W == 3 && !*mayTakeFormer && MarkBySteps(x + first, count, &limits, &marks) && isPlain();
    if (!isDone) {
        MarkVertices(fitMatrix, W, x + first, count, &limits, &marks);
        isDone = !*mayTakeFormer && isPlain();
    }
    if (isDone)
        return found_->mark(marks, found, first, count);
    runOneByOne<W>(fitMatrix, x, first, windows, marks.possible, mayTakeFormer,
                   [this](const Peak &peak, std::ptrdiff_t i) {
                       found_->mark(peak, i);
                       return 0;
                   });
}

// The windows of `masks` from number `first` of a run on. `store` takes a peak and the window whose
// vertex it is.
template <int32_t W, class Store>
ErrorCode PeakScan::runOneByOne(const DBL *fitMatrix, const DBL *x, std::ptrdiff_t first,
                                std::ptrdiff_t windows, const uint64_t *masks, bool *mayTakeFormer,
                                const Store &store) {
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
                    tookOwn, [&](const Peak &peak) { return store(peak, tookOwn ? i : i - 1); }))
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
        Copy<ElementType::DBL>({x + i, w_}, {work, w_});
        const double scale = PeakNormalize(work, w_, ofValleys_);
        const Parabola now = fit(work, 0);
        const bool isCandidate =
            w_ < slopeWidth ? isSought(now.c2) : IsRising(now) != (state_->slopeSign != 0);
        bool tookOwn;
        if (isCandidate)
            if (const ErrorCode failed = refine(
                    now, [this] { return previous(); }, scale, state_->position, tookOwn,
                    [this](const Peak &peak) { return found_->store(peak); }))
                return failed;
        passed(now, scale, 1);
    }
    return 0;
}

// The vertex of a candidate at `position`, or that of the previous window if it is nearer.
// `tookOwn` is set to whether the candidate's own vertex was tested, accepted or not.
template <class Previous, class Store>
ErrorCode PeakScan::refine(const Parabola &now, const Previous &previous, double scale,
                           double position, bool &tookOwn, const Store &store) {
    tookOwn = false;
    if (std::fabs(2 * now.c2) < smallestCurvature)
        return 0;
    auto [t, y, d] = VertexOf(now);
    tookOwn = true;
    if (position > 0 && t < -0.5) {
        const Parabola former = previous();
        tookOwn = false;
        if (2 * former.c2 == 0)
            return 0;
        const Vertex formers = VertexOf(former);
        tookOwn = !(std::fabs(t) > std::fabs(formers.t));
        if (!tookOwn) {
            position -= 1;
            t = formers.t;
            y = formers.y;
            d = formers.d;
            scale = 1.0;
        }
    }
    if (std::fabs(t) > furthest() || !isSought(d))
        return 0;
    if (!(ofValleys_ ? scale * y < threshold_ : scale * y > threshold_))
        return 0;
    return store(Peak{position + centre_ + t, scale * y + mean_, scale * d});
}

ErrorCode BeginStream(const PeakBlock &block, PeakDState *state) {
    if (state->fitMatrix == nullptr)
        return ErrNoUsableFit;
    if (const ErrorCode failed = BuildFitMatrix(state->width, state->fitMatrix))
        return failed;
    const int32_t w = state->width;
    Copy<ElementType::DBL>({block.data, w}, {state->history, w});
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

ErrorCode PeakList::beginMarks(const DBL *fitMatrix, int32_t w, const VertexLimits &limits,
                               std::ptrdiff_t offset, std::ptrdiff_t windows) {
    words_ = static_cast<int32_t>((windows + maskWidth - 1) / maskWidth);
    const int64_t bytes = int64_t{words_} * int64_t{sizeof(Word)};
    if (const ErrorCode failed = marks_.allocate(bytes))
        return failed;
    std::memset(marks_.bytes(), 0, static_cast<std::size_t>(bytes));
    Copy<ElementType::DBL>({fitMatrix, 3 * std::ptrdiff_t{w}}, {fitMatrix_, 3 * std::ptrdiff_t{w}});
    w_ = w;
    limits_ = limits;
    offset_ = offset;
    return 0;
}

void PeakList::mark(const Peak &peak, std::ptrdiff_t i) {
    if (isClose(peak)) {
        if (!isBetter(peak))
            return;
        if (lastMark_ >= 0)
            word(lastMark_ / maskWidth) &= ~(uint64_t{1} << lastMark_ % maskWidth);
        else
            size_ -= size_ > 0;
    }
    word(i / maskWidth) |= uint64_t{1} << i % maskWidth;
    lastMark_ = i;
    setLast(peak);
}

void PeakList::mark(const VertexMarks &marks, const FoundVertices &found, std::ptrdiff_t first,
                    int32_t count) {
    for (int32_t i = 0; i * maskWidth < count; ++i)
        word(first / maskWidth + i) = marks.possible[i];
    const auto clear = [&](int32_t i) {
        word((first + found.places[i]) / maskWidth) &=
            ~(uint64_t{1} << found.places[i] % maskWidth);
    };
    for (int32_t begin = 0; begin < found.count; begin += maskWidth) {
        const int32_t some = std::min(maskWidth, found.count - begin);
        uint64_t kept;
        if (KeptOfClose(found.locations + begin, found.amplitudes + begin, some,
                        ofValleys_ ? 1.0 : -1.0, lastLocation_, &kept)) {
            for (uint64_t dropped = ~kept & ~uint64_t{0} >> (maskWidth - some); dropped != 0;
                 dropped &= dropped - 1)
                clear(begin + std::countr_zero(dropped));
            if (kept == 0)
                continue;
            const int32_t last = begin + maskWidth - 1 - std::countl_zero(kept);
            lastMark_ = first + found.places[last];
            setLast(Peak{found.locations[last], found.amplitudes[last], 0});
            continue;
        }
        for (int32_t i = begin; i < begin + some; ++i) {
            clear(i);
            if (!std::isnan(found.locations[i]))
                mark(Peak{found.locations[i], found.amplitudes[i], 0}, first + found.places[i]);
        }
    }
}

void PeakList::endMarks(const DBL *x) {
    for (int32_t i = 0; i < words_; ++i) {
        const uint64_t bits = word(i);
        marked_ += std::popcount(bits);
        if (bits != 0)
            lastMark_ = std::ptrdiff_t{i} * maskWidth + maskWidth - 1 - std::countl_zero(bits);
    }
    if (marked_ == 0)
        return;
    const Vertex last = VertexOf(FitWindow(fitMatrix_, w_, x + lastMark_));
    const double position = limits_.position + static_cast<double>(lastMark_);
    setLast(Peak{position + limits_.centre + last.t, last.y + limits_.mean, last.d});
}

void PeakList::copyTo(const DBL *block, DBL *locations, DBL *amplitudes, DBL *derivatives) const {
    for (int32_t i = 0; i < size_; i += chunk) {
        const int32_t count = std::min(chunk, size_ - i);
        const DBL *const from = place(i);
        Copy<ElementType::DBL>({from, count}, {locations + i, count});
        Copy<ElementType::DBL>({from + chunk, count}, {amplitudes + i, count});
        Copy<ElementType::DBL>({from + 2 * chunk, count}, {derivatives + i, count});
    }
    if (marked_ > 0)
        StoreVertices(fitMatrix_, w_, block + offset_, static_cast<const char *>(marks_.bytes()),
                      words_, &limits_,
                      {locations + size_, amplitudes + size_, derivatives + size_, marked_});
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
    Copy<ElementType::DBL>({state->history, w}, {seam, w});
    const int32_t incoming = std::min(w, state->tailCount);
    Copy<ElementType::DBL>({state->incoming, incoming}, {seam + w, incoming});
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
