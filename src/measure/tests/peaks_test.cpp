#include "qx/peaks.h"

#include "measure/parabolas.h"
#include "qx/errors.h"
#include "tests/support/hostile_host.h"
#include "tests/support/recipe.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <limits>
#include <memory>
#include <numbers>
#include <optional>
#include <vector>

namespace qx::test {
namespace {

const double nan = std::numeric_limits<double>::quiet_NaN();
constexpr double inf = std::numeric_limits<double>::infinity();

struct Peak {
    double location, amplitude, derivative;
    bool operator==(const Peak &) const = default;
    friend std::ostream &operator<<(std::ostream &to, const Peak &p) {
        return to << p.location << ": " << p.amplitude;
    }
};
typedef std::vector<Peak> Peaks;
typedef std::vector<double> Samples;

// A stream of PeakD2014: its record, its state and the peaks found so far.
class Stream {
public:
    explicit Stream(int32_t width, double threshold = -inf, int32_t polarity = 0, int32_t mode = 0)
        : width_(width), threshold_(threshold), polarity_(polarity), mode_(mode) {}

    ErrorCode put(const Samples &block, uint32_t flags) {
        data.resize(static_cast<int32_t>(block.size()));
        std::copy(block.begin(), block.end(), data.data());
        return call(flags);
    }
    ErrorCode call(uint32_t flags, DBL1D source = nullptr) {
        PeakDRequest request = {
            data.handle(),       threshold_,           width_, polarity_, locations.handle(),
            amplitudes.handle(), derivatives.handle(), -1,     flags};
        DBL1D handle = buffer.handle();
        ErrorCode err = 12345;
        const ErrorCode status =
            PeakD2014(source, &request, &state, hasBuffer ? &handle : nullptr, &err, mode_);
        EXPECT_EQ(err, status);
        EXPECT_EQ(request.count, locations.size());
        EXPECT_EQ(amplitudes.size(), locations.size());
        EXPECT_EQ(derivatives.size(), locations.size());
        for (int32_t i = 0; i < locations.size(); ++i)
            found.push_back({locations[i], amplitudes[i], derivatives[i]});
        qx::test::CheckBlocks();
        return status;
    }
    bool isReleased() const {
        return buffer.size() == 0 && state.width == 0 && state.fitMatrix == nullptr &&
               state.history == nullptr && state.position == 0 && state.historyCount == 0;
    }

    DBLArray data, buffer, locations, amplitudes, derivatives;
    PeakDState state = {};
    bool hasBuffer = true;
    Peaks found;

private:
    int32_t width_;
    double threshold_;
    int32_t polarity_, mode_;
};

constexpr uint32_t whole = QXPeakFirstBlock | QXPeakLastBlock;

Peaks PeaksOf(const Samples &x, int32_t width, double threshold = -inf, int32_t polarity = 0) {
    Stream stream(width, threshold, polarity);
    EXPECT_EQ(stream.put(x, whole), 0);
    return stream.found;
}

Samples NoiseOf(int32_t n, int seed, double grain = 0) {
    Noise noise(static_cast<uint64_t>(seed));
    Samples x(static_cast<std::size_t>(n));
    for (double &value : x)
        value = grain > 0 ? std::round(noise.symmetric() / grain) * grain : noise.symmetric();
    return x;
}

// The expected peaks, window by window, with parabolas from the moments of the sample times.
class Reference {
public:
    Reference(const Samples &x, int32_t w, double threshold, bool ofValleys)
        : x_(x), w_(w), limit_((w - 1) / 4.0L), sign_(ofValleys ? -1 : 1),
          threshold_(threshold * sign_) {
        for (int32_t j = 0; j < w; ++j) {
            const long double t = j - (w - 1) / 2.0L;
            s2_ += t * t;
            s4_ += t * t * t * t;
        }
    }
    Peaks all() const {
        Peaks found;
        const auto windows = static_cast<int32_t>(x_.size()) - w_ + 1;
        bool wasRising = isRising(fit(0));
        for (int32_t i = 0; i < windows; ++i) {
            const Fit now = fit(i);
            const bool isCandidate = w_ < 5 ? now.c2 < 0 : isRising(now) != wasRising;
            wasRising = isRising(now);
            if (!isCandidate || std::fabs(2 * now.c2) < 1e-10L)
                continue;
            int32_t at = i;
            const bool isEarlier = i > 0 && vertex(now) < -0.5L &&
                                   std::fabs(vertex(now)) > std::fabs(vertex(fit(i - 1)));
            const Fit fit_ = isEarlier ? fit(--at) : now;
            const long double t = vertex(fit_);
            const long double height = fit_.c0 - fit_.c1 * fit_.c1 / (4 * fit_.c2);
            if (fit_.c2 < 0 && std::fabs(t) <= limit_ && height > threshold_)
                add(found, {static_cast<double>(at + (w_ - 1) / 2.0L + t),
                            static_cast<double>(height), static_cast<double>(2 * fit_.c2)});
        }
        for (Peak &peak : found) {
            peak.amplitude *= sign_;
            peak.derivative *= sign_;
        }
        return found;
    }

private:
    // The fit of the data, negated if valleys are sought.
    struct Fit {
        long double c0, c1, c2;
    };
    static long double vertex(const Fit &f) { return -f.c1 / (2 * f.c2); }
    bool isRising(const Fit &f) const {
        return std::fabs(f.c1) <= 1e-10L ? f.c2 * sign_ > 0 : f.c1 * sign_ > 0;
    }
    Fit fit(int32_t i) const {
        long double m0 = 0, m1 = 0, m2 = 0;
        for (int32_t j = 0; j < w_; ++j) {
            const long double t = j - (w_ - 1) / 2.0L;
            const long double value = sign_ * x_[static_cast<std::size_t>(i + j)];
            m0 += value;
            m1 += t * value;
            m2 += t * t * value;
        }
        const long double c2 = (w_ * m2 - s2_ * m0) / (w_ * s4_ - s2_ * s2_);
        return {(m0 - c2 * s2_) / w_, m1 / s2_, c2};
    }
    static void add(Peaks &found, const Peak &peak) {
        if (found.empty() || std::fabs(found.back().location - peak.location) >= 1)
            found.push_back(peak);
        else if (peak.amplitude > found.back().amplitude)
            found.back() = peak;
    }

    const Samples &x_;
    int32_t w_;
    long double limit_, s2_ = 0, s4_ = 0;
    int sign_;
    double threshold_;
};

// The largest difference of locations and of amplitudes and derivatives.
std::optional<double> Difference(const Peaks &a, const Peaks &b) {
    if (a.size() != b.size())
        return std::nullopt;
    double largest = 0;
    for (std::size_t i = 0; i < a.size(); ++i)
        largest = std::max({largest, std::fabs(a[i].location - b[i].location),
                            std::fabs(a[i].amplitude - b[i].amplitude),
                            std::fabs(a[i].derivative - b[i].derivative)});
    return largest;
}

TEST(PeakD, FindsThePeaksOfTheDefinition) {
    int seed = 0;
    std::size_t found = 0;
    for (const int32_t width : {3, 4, 5, 6, 7, 12, 33, 100})
        for (const int32_t n : {width, width + 1, 70, 500, 3000})
            for (const double threshold : {-inf, -0.2, 0.35})
                for (const int32_t polarity : {0, 1}) {
                    if (n < width)
                        continue;
                    SCOPED_TRACE(testing::Message() << width << ' ' << n << ' ' << threshold);
                    const Samples x = NoiseOf(n, ++seed);
                    const double limit = polarity == 0 ? threshold : -threshold;
                    const Peaks peaks = PeaksOf(x, width, limit, polarity);
                    const Peaks expected = Reference(x, width, limit, polarity == 1).all();
                    const auto difference = Difference(peaks, expected);
                    ASSERT_TRUE(difference) << peaks.size() << " not " << expected.size();
                    EXPECT_LE(*difference, 5e-12);
                    found += peaks.size();
                }
    EXPECT_GT(found, 15000U);
    // A window of four seldom takes a peak from the previous window, and even less often at the end
    // of 64 windows.
    for (seed = 1; seed <= 60; ++seed) {
        const Samples x = NoiseOf(4000, seed);
        const auto difference = Difference(PeaksOf(x, 4), Reference(x, 4, -inf, false).all());
        ASSERT_TRUE(difference) << seed;
        EXPECT_LE(*difference, 5e-12);
    }
    // Windows share a vertex if the data are quantised, and some have too little curvature if the
    // data are small.
    const auto level = [](double v) { return std::round(2 * v) / 4; };
    const auto small = [](double v) { return 0x1p-35 * std::round(3 * v); };
    for (seed = 1; seed <= 20; ++seed)
        for (const int32_t polarity : {0, 1}) {
            Samples x = NoiseOf(4000, seed);
            std::transform(x.begin(), x.end(), x.begin(), level);
            if (seed % 2 == 0)
                std::transform(x.begin() + 2000, x.end(), x.begin() + 2000, small);
            const double limit = polarity == 0 ? -1 : 1;
            const auto difference = Difference(PeaksOf(x, 3, limit, polarity),
                                               Reference(x, 3, limit, polarity == 1).all());
            ASSERT_TRUE(difference) << seed;
            EXPECT_LE(*difference, 5e-12);
        }
}

// The rule of narrow windows for one window after the other, whose numbers have the same bits.
Peaks OneByOne(const Samples &x, int32_t w, double threshold, int32_t polarity) {
    DBL fitMatrix[12];
    EXPECT_EQ(qx::BuildFitMatrix(w, fitMatrix), 0);
    const double sign = polarity == 1 ? 1 : -1, centre = (w - 1) * 0.5;
    struct Vertex {
        double c2, t, y;
    };
    const auto vertex = [&](std::size_t i) {
        const qx::Parabola p = qx::FitWindow(fitMatrix, w, x.data() + i);
        const double t = -p.c1 / (2 * p.c2);
        return Vertex{p.c2, t, (t * p.c2 + p.c1) * t + p.c0};
    };
    Peaks found;
    for (std::size_t i = 0; i + static_cast<std::size_t>(w) <= x.size(); ++i) {
        Vertex v = vertex(i);
        std::size_t at = i;
        if (!(sign * v.c2 > 0) || std::fabs(2 * v.c2) < 1e-10)
            continue;
        if (i > 0 && v.t < -0.5) {
            const Vertex former = vertex(i - 1);
            if (former.c2 == 0)
                continue;
            if (std::fabs(v.t) > std::fabs(former.t)) {
                v = former;
                --at;
            }
        }
        if (!(sign * v.c2 > 0) || std::fabs(v.t) > 0.5 * centre + 0x1.4p-49 ||
            !(sign * v.y < sign * threshold))
            continue;
        const Peak peak = {static_cast<double>(at) + centre + v.t, v.y, 2 * v.c2};
        if (!found.empty() && std::fabs(found.back().location - peak.location) < 1) {
            if (!(sign * peak.amplitude < sign * found.back().amplitude))
                continue;
            found.pop_back();
        }
        found.push_back(peak);
    }
    return found;
}

// Narrow windows are scanned in groups of 512, and many samples are only compared. What this leaves
// in doubt: equal and nearly equal neighbours, tiny steps, thresholds near the samples, values that
// are not finite.
TEST(PeakD, GroupsOfWindowsGiveThePeaksOfSingleWindows) {
    typedef double (*Kind)(Noise &, double);
    const Kind kinds[] = {
        [](Noise &, double v) { return v; },
        [](Noise &, double v) { return std::round(4 * v) * 0.005; },
        [](Noise &, double v) { return std::round(v); },
        [](Noise &noise, double v) {
            return (3 + std::round(2 * v)) * (1 + 0x1p-52 * static_cast<double>(noise.bits() % 5));
        },
        [](Noise &, double v) { return 1000 + 1e-10 * std::round(3 * v); },
        [](Noise &, double v) { return 2e-10 * v; },
        [](Noise &, double v) { return 1e307 * v; },
        [](Noise &noise, double v) {
            const uint64_t which = noise.bits() % 400;
            return which == 0 ? nan : which == 1 ? inf : which == 2 ? -inf : v;
        },
        [](Noise &noise, double v) { return noise.bits() % 300 == 0 ? 1e14 * v : v; },
    };
    int seed = 0;
    std::size_t found = 0;
    for (const Kind &kind : kinds)
        for (const int32_t n : {66, 67, 69, 70, 71, 133, 134, 578, 580, 581, 582, 583, 646, 3000})
            for (const int32_t width : {3, 4})
                for (const double threshold : {-inf, -0.5, 0.0049, 1.0})
                    for (const int32_t polarity : {0, 1}) {
                        SCOPED_TRACE(testing::Message()
                                     << (&kind - kinds) << ' ' << n << ' ' << width << ' '
                                     << threshold << ' ' << polarity);
                        Noise noise(static_cast<uint64_t>(++seed));
                        Samples x(static_cast<std::size_t>(n));
                        for (double &value : x)
                            value = kind(noise, noise.symmetric());
                        const double limit = polarity == 0 ? threshold : -threshold;
                        const Peaks peaks = PeaksOf(x, width, limit, polarity);
                        ASSERT_EQ(peaks, OneByOne(x, width, limit, polarity));
                        found += peaks.size();
                    }
    EXPECT_GT(found, 100000U);
}

TEST(PeakD, FindsThePeaksOfKnownWaveforms) {
    // The fit of a parabola is exact for any width.
    for (const int32_t width : {3, 4, 5, 8, 21}) {
        Samples x;
        for (int i = 0; i < 60; ++i)
            x.push_back(7 - 0.25 * (i - 30.3) * (i - 30.3));
        const Peaks peaks = PeaksOf(x, width, 6);
        ASSERT_EQ(peaks.size(), 1U) << width;
        EXPECT_NEAR(peaks[0].location, 30.3, 1e-11);
        EXPECT_NEAR(peaks[0].amplitude, 7, 1e-11);
        EXPECT_NEAR(peaks[0].derivative, -0.5, 1e-12);
    }
    // A chirp is not a parabola; the measured errors reach 2e-5.
    Samples chirp;
    const auto phase = [](double i) { return 0.05 * i + 2e-5 * i * i; };
    for (int i = 0; i < 2000; ++i)
        chirp.push_back(std::sin(phase(i)));
    for (const int32_t polarity : {0, 1}) {
        const Peaks peaks = PeaksOf(chirp, 5, 0, polarity);
        ASSERT_EQ(peaks.size(), polarity == 0 ? 29U : 28U);
        for (std::size_t k = 0; k < peaks.size(); ++k) {
            const double turns =
                phase(peaks[k].location) / (2 * std::numbers::pi) - static_cast<double>(k);
            EXPECT_NEAR(turns, polarity == 0 ? 0.25 : 0.75, 8e-5);
            EXPECT_NEAR(peaks[k].amplitude, polarity == 0 ? 1 : -1, 8e-5);
        }
    }
    EXPECT_EQ(PeaksOf({0, 1, 0}, 3, 0), (Peaks{{1, 1, -2}}));
    EXPECT_EQ(PeaksOf({0, 1, 0}, 3, 1), Peaks()) << "a value equal to the threshold is not a peak";
    EXPECT_EQ(PeaksOf({5, 1, 3}, 3, 4, 1).size(), 1U);
    // Two windows find the top between samples 2 and 3, and one entry remains.
    EXPECT_EQ(PeaksOf({0, 1, 3, 3, 1, 0}, 3).size(), 1U);
    EXPECT_EQ(PeaksOf({0, 1, 3, 2.9, 1, 0}, 4).size(), 1U);
}

TEST(PeakD, NaNsAffectOnlyTheirWindows) {
    Samples x;
    for (int i = 0; i < 400; ++i)
        x.push_back(std::sin(0.25 * i));
    for (const int32_t width : {3, 4, 5, 9}) {
        const Peaks clean = PeaksOf(x, width, 0.5);
        for (const double bad : {nan, inf, -inf}) {
            Samples y = x;
            y[200] = bad;
            Peaks rest = PeaksOf(y, width, 0.5);
            std::erase_if(rest, [](const Peak &p) { return std::fabs(p.location - 200) < 20; });
            Peaks expected = clean;
            std::erase_if(expected, [](const Peak &p) { return std::fabs(p.location - 200) < 20; });
            EXPECT_EQ(rest, expected);
        }
    }
    EXPECT_EQ(PeaksOf(x, 5, nan), Peaks());
    EXPECT_EQ(PeaksOf(Samples(300, 1.1), 7), Peaks());
}

// The peaks of a stream in blocks of random sizes, at least the width.
Peaks InBlocks(const Samples &x, int32_t width, int seed, int32_t polarity = 0) {
    Noise noise(static_cast<uint64_t>(seed));
    Stream stream(width, polarity == 0 ? -inf : inf, polarity);
    std::size_t at = 0;
    while (at < x.size()) {
        const auto least = static_cast<std::size_t>(width);
        std::size_t size = least + noise.bits() % (3 * least + (noise.bits() % 4 == 0 ? 150 : 1));
        if (x.size() - at < size + least)
            size = x.size() - at;
        const Samples block(x.begin() + static_cast<std::ptrdiff_t>(at),
                            x.begin() + static_cast<std::ptrdiff_t>(at + size));
        uint32_t flags = 0;
        if (at == 0)
            flags |= QXPeakFirstBlock;
        if (at + size == x.size())
            flags |= QXPeakLastBlock;
        EXPECT_EQ(stream.put(block, flags), 0);
        at += size;
    }
    EXPECT_TRUE(stream.isReleased());
    return stream.found;
}

// Blocks report the peaks of the whole signal, except that two peaks within a sample of each other,
// on both sides of a block boundary, are both reported if the second is more extreme.
TEST(PeakD, TheBlocksOfAStreamDoNotAffectThePeaks) {
    std::size_t twice = 0, told = 0;
    for (const int32_t width : {3, 4, 5, 6, 11, 40})
        for (int seed = 1; seed <= 40; ++seed) {
            SCOPED_TRACE(testing::Message() << width << ' ' << seed);
            const Samples x = NoiseOf(900, seed, seed % 3 == 0 ? 0.25 : 0);
            const int32_t polarity = seed % 2;
            const Peaks once = PeaksOf(x, width, polarity == 0 ? -inf : inf, polarity);
            const Peaks split = InBlocks(x, width, seed, polarity);
            told += split.size();
            std::size_t k = 0;
            for (std::size_t i = 0; i < split.size(); ++i) {
                if (k < once.size() && split[i] == once[k]) {
                    ++k;
                    continue;
                }
                ++twice;
                ASSERT_LT(i + 1, split.size());
                ASSERT_LT(split[i + 1].location - split[i].location, 1);
                ASSERT_EQ(split[i + 1].amplitude > split[i].amplitude, polarity == 0);
            }
            ASSERT_EQ(k, once.size());
        }
    EXPECT_LT(twice, told / 300);
    // A peak on the block boundary itself.
    const Samples tent = {0, 1, 2, 3, 4, 3, 2, 1, 0, 0};
    for (const std::ptrdiff_t seam : {3, 4, 5, 6, 7}) {
        Stream stream(3);
        EXPECT_EQ(stream.put({tent.begin(), tent.begin() + seam}, QXPeakFirstBlock), 0);
        EXPECT_EQ(stream.put({tent.begin() + seam, tent.end()}, QXPeakLastBlock), 0);
        EXPECT_EQ(stream.found, (Peaks{{4, 4, -2}})) << seam;
    }
}

TEST(PeakD, TheLastWindowWaitsForTheNextBlock) {
    Stream stream(3);
    EXPECT_EQ(stream.put({0, 1, 0}, QXPeakFirstBlock), 0);
    EXPECT_EQ(stream.found, Peaks());
    EXPECT_EQ(stream.state.position, 0);
    EXPECT_EQ(stream.state.historyCount, 3);
    EXPECT_EQ(stream.buffer.size(), 18);
    EXPECT_EQ(stream.put({0, 1, 0}, 0), 0);
    EXPECT_EQ(stream.found, (Peaks{{1, 1, -2}}));
    EXPECT_EQ(stream.state.position, 3);
    // A first block discards all earlier state.
    EXPECT_EQ(stream.put({0, 1, 0, 0}, QXPeakFirstBlock), 0);
    EXPECT_EQ(stream.found.back(), (Peak{1, 1, -2}));
    EXPECT_EQ(stream.state.position, 1);
}

TEST(PeakD, ManyPeaksComeInOrder) {
    Samples x;
    for (int i = 0; i < 20001; ++i)
        x.push_back(i % 2);
    const Peaks peaks = PeaksOf(x, 3, 0.5);
    ASSERT_EQ(peaks.size(), 10000U);
    for (std::size_t k = 0; k < peaks.size(); ++k)
        ASSERT_EQ(peaks[k], (Peak{2.0 * static_cast<double>(k) + 1, 1, -2}));
}

// A ripple far below 1e-8 around 3.
Samples Ripple(int32_t n) {
    Samples x;
    for (int32_t i = 0; i < n; ++i)
        x.push_back(3 + 2e-10 * std::sin(2 * std::numbers::pi * i / 25));
    return x;
}

TEST(PeakD, FlatBlocksAreScaled) {
    const Samples x = Ripple(200);
    EXPECT_EQ(PeaksOf(x, 7, 3), Peaks()) << "without scaling no peak is found";
    for (const int32_t polarity : {0, 1}) {
        Stream stream(7, 3, polarity, 1);
        EXPECT_EQ(stream.put(x, whole), 0);
        ASSERT_EQ(stream.found.size(), 8U);
        for (std::size_t k = 0; k < 8; ++k) {
            const double place = 25 * (static_cast<double>(k) + (polarity == 0 ? 0.25 : 0.75));
            EXPECT_NEAR(stream.found[k].location, place, 0.05);
            EXPECT_NEAR(stream.found[k].amplitude, polarity == 0 ? 3 + 2e-10 : 3 - 2e-10, 1e-11);
        }
        for (const double value : stream.data.values())
            EXPECT_LT(std::fabs(value), 1e-9)
                << "the mean remains subtracted from the caller's array";
    }
    // In the history for the next block, the mean is added again.
    Stream two(7, 3, 0, 1), one(7, 3, 0, 1);
    EXPECT_EQ(two.put({x.begin(), x.begin() + 90}, QXPeakFirstBlock), 0);
    EXPECT_NEAR(two.buffer[4 * 7], 3, 1e-8);
    EXPECT_EQ(two.put({x.begin() + 90, x.end()}, QXPeakLastBlock), 0);
    EXPECT_EQ(two.found.size(), 8U);

    // Mode 2 scans the source and touches neither array.
    const DBLArray source(x);
    Stream ofSource(7, 3, 0, 2);
    ofSource.data.resize(0);
    EXPECT_EQ(ofSource.call(whole, source.handle()), 0);
    EXPECT_EQ(ofSource.found.size(), 8U);
    EXPECT_EQ(source.values(), x);
    EXPECT_EQ(ofSource.put(x, whole), ErrWidthOutOfRange) << "without a source there is no data";

    // Data that are not flat, or whose mean is not finite, are scanned unscaled.
    for (const double other : {nan, 3.5, -inf}) {
        Samples y = x;
        y[100] = other;
        Stream stream(7, 3.25, 0, 1);
        EXPECT_EQ(stream.put(y, whole), 0);
        EXPECT_EQ(stream.data[0], x[0]);
    }
    Stream huge(3, 0, 0, 1);
    EXPECT_EQ(huge.put(Samples(50, 1.7e308), whole), 0);
    EXPECT_EQ(huge.data[0], 1.7e308);
}

TEST(PeakD, EveryFailureReleasesTheStream) {
    const Samples x = NoiseOf(20, 1);
    const auto started = [&](int32_t width) {
        auto stream = std::make_unique<Stream>(width);
        EXPECT_EQ(stream->put(x, QXPeakFirstBlock), 0);
        EXPECT_FALSE(stream->isReleased());
        return stream;
    };
    for (const int32_t width : {-1, 0, 2, (1 << 30) + 1}) {
        Stream stream(width);
        EXPECT_EQ(stream.put(x, whole), ErrInvalidSelector);
    }
    EXPECT_EQ(Stream(5, 0, 2).put(x, whole), ErrInvalidSelector);
    EXPECT_EQ(Stream(5, 0, 0, 3).put(x, whole), ErrInvalidSelector);
    EXPECT_EQ(Stream(5).put({1, 2, 3, 4}, whole), ErrWidthOutOfRange);
    EXPECT_EQ(Stream(5).put(x, 0), ErrStateSizeMismatch) << "a stream that was never started";
    EXPECT_EQ(Stream(1 << 29).put(x, whole), ErrOutOfMemory)
        << "more elements than an array can have";
    qx::test::ResetHost();
    EXPECT_EQ(Stream(100000).put(x, whole), ErrWidthOutOfRange);
    for (const qx::test::Reshape &reshape : qx::test::Host().reshapes)
        EXPECT_LE(reshape.count, 20) << "a buffer was requested";
    {
        Stream stream(5);
        stream.hasBuffer = false;
        EXPECT_EQ(stream.put(x, whole), ErrNoUsableFit);
    }
    const auto shortBlock = started(5);
    EXPECT_EQ(shortBlock->put({1, 2, 3, 4}, 0), ErrWidthOutOfRange);
    EXPECT_TRUE(shortBlock->isReleased());
    EXPECT_EQ(shortBlock->put(x, 0), ErrStateSizeMismatch)
        << "after a failure the stream must be restarted";
    // A record or an array that differs from what the last call left.
    const auto otherArray = started(5);
    otherArray->buffer.resize(27);
    EXPECT_EQ(otherArray->put(x, 0), ErrStateSizeMismatch);
    const auto otherRecord = started(5);
    otherRecord->state.position = -3;
    EXPECT_EQ(otherRecord->put(x, 0), ErrStateSizeMismatch);
    const auto old = started(5);
    old->state.position = std::numeric_limits<int32_t>::max() - 10;
    EXPECT_EQ(old->put(x, 0), ErrOverflow);
    // Stale pointers are not followed.
    const auto moved = started(5);
    moved->state.fitMatrix = moved->state.history = moved->state.previous = nullptr;
    EXPECT_EQ(moved->put(x, QXPeakLastBlock), 0);
}

TEST(PeakD, EldersForward) {
    const DBLArray data(NoiseOf(50, 3));
    const DBLArray locations, amplitudes, derivatives, buffer;
    PeakDRequest request = {
        data.handle(),        -inf, 5,    0, locations.handle(), amplitudes.handle(),
        derivatives.handle(), 0,    whole};
    PeakDState state = {};
    DBL1D handle = buffer.handle();
    ErrorCode err;
    EXPECT_EQ(PeakD(&request, &state, &handle, &err), 0);
    const std::vector<double> found = locations.values();
    EXPECT_FALSE(found.empty());
    EXPECT_EQ(PeakD2010(&request, &state, &handle, &err, 0), 0);
    EXPECT_EQ(locations.values(), found);
    EXPECT_EQ(PeakD2010(&request, &state, &handle, &err, 2), ErrWidthOutOfRange);
}

TEST(FitMatrix, GivesTheLeastSquaresParabola) {
    for (const int32_t w : {4, 5, 10, 101, 1000, 5000}) {
        std::vector<double> matrix(3 * static_cast<std::size_t>(w));
        ASSERT_EQ(qx::BuildFitMatrix(w, matrix.data()), 0);
        // The samples of t^k give the k-th unit vector, within bounds for the magnitude of each
        // coefficient.
        for (int k = 0; k < 3; ++k) {
            const double half = (w - 1) / 2.0;
            std::vector<double> power;
            for (int32_t i = 0; i < w; ++i)
                power.push_back(std::pow(i - half, k));
            const qx::Parabola p = qx::FitWindow(matrix.data(), w, power.data());
            const double c[] = {p.c0, p.c1 * half, p.c2 * half * half};
            for (int j = 0; j < 3; ++j)
                EXPECT_NEAR(c[j] / std::pow(half, k), j == k ? 1 : 0, 2e-11) << w;
        }
    }
}

TEST(PeakDetector, FindsLongRuns) {
    struct Runs {
        int32_t result, count;
        ErrorCode err;
        std::vector<int32_t> indices;
    };
    const auto runs = [](const Samples &samples, double threshold, int32_t width) {
        const DBLArray x(samples);
        const I32Array indices(2);
        Runs found{};
        found.count = 77;
        found.result = PeakDetector(x.handle(), &threshold, &width, indices.handle(), &found.count,
                                    &found.err);
        found.indices = indices.values();
        EXPECT_EQ(found.count, static_cast<int32_t>(found.indices.size()));
        return found;
    };
    EXPECT_EQ(runs({1, 1, 0, 1, 1, 1, 0, 1}, 1, 2).indices, (std::vector<int32_t>{0, 3}));
    EXPECT_EQ(runs({1, 1, nan, 1, 1, 1, 0, 1}, 0.5, 1).indices, (std::vector<int32_t>{0, 3, 7}));
    EXPECT_EQ(runs({0, 0, 0}, 1, 1).indices, (std::vector<int32_t>{}));
    // Each reported index follows a sample below the threshold and begins a run of at least the
    // width.
    for (int seed = 1; seed <= 20; ++seed) {
        const Samples x = NoiseOf(700, seed);
        const int32_t width = 1 + seed % 5;
        std::vector<int32_t> expected;
        for (int32_t i = 0; i + width <= 700; ++i) {
            const auto at = x.begin() + i;
            const bool isLong = std::all_of(at, at + width, [](double v) { return v >= -0.5; });
            if (isLong && (i == 0 || x[static_cast<std::size_t>(i) - 1] < -0.5))
                expected.push_back(i);
        }
        EXPECT_EQ(runs(x, -0.5, width).indices, expected);
        EXPECT_FALSE(expected.empty());
    }
    for (const auto &[n, width] : {std::pair(5, 0), {5, 5}, {5, 6}, {0, 1}}) {
        const Runs failed = runs(Samples(static_cast<std::size_t>(n), 1.0), 0, width);
        EXPECT_EQ(failed.err, ErrWidthOutOfRange);
        EXPECT_EQ(failed.result, ErrWidthOutOfRange);
        EXPECT_EQ(failed.count, 0);
    }
}

} // namespace
} // namespace qx::test
