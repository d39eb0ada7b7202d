// Ten engineering tasks with the functions by topics. Each task prints the error of its result, and the program
// fails if an error exceeds its limit.
//
//     c++ -std=c++20 -Iinclude -Ibuild/release/include examples/ten_tasks.cpp
//         -Lbuild/release -Wl,-rpath,$PWD/build/release -lqxanalysis -lqxrt

#include "qx/qx.hpp"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <functional>
#include <numbers>
#include <numeric>
#include <vector>

namespace {

typedef std::vector<double> Samples;
constexpr double pi = std::numbers::pi;
constexpr double fs = 1000;

Samples Made(std::size_t n, const std::function<double(double)> &value) {
    Samples x(n);
    for (std::size_t i = 0; i < n; ++i)
        x[i] = value(static_cast<double>(i));
    return x;
}

// The largest difference, ignoring some values at both ends.
double Apart(std::span<const double> x, std::span<const double> y, std::size_t ends = 0) {
    double most = x.size() == y.size() ? 0 : INFINITY;
    for (std::size_t i = ends; i + ends < std::min(x.size(), y.size()); ++i)
        most = std::max(most, std::abs(x[i] - y[i]));
    return most;
}

// A lowpass without delay: keeps a slow wave and removes a disturbance at 200 Hz.
double DesignAndApply() {
    const Samples truth = Made(4001, [](double i) { return std::sin(2 * pi * 2 * i / fs); });
    Samples x = truth;
    for (std::size_t i = 0; i < x.size(); ++i)
        x[i] += 0.5 * std::sin(2 * pi * 200 * static_cast<double>(i) / fs);
    const auto [a, b, zeros, poles, gain] = qx::filters::butterworth(40, 4, fs);
    return Apart(qx::filters::zero_phase(x, a, b), truth, 100);
}

// Converts a tone from 48 kHz to 44.1 kHz through a windowed lowpass.
double ResampleAudio() {
    const Samples x = Made(48000, [](double i) { return std::sin(2 * pi * 5000 * i / 48000); });
    const int32_t taps = 2 * 10 * 160 + 1;
    const auto [h, type] = qx::filters::windowed(0.5 / 160, taps);
    const Samples windowed = qx::windows::apply(h, qx::windows::Selector::hamming);
    const double sum = std::accumulate(windowed.begin(), windowed.end(), 0.0);
    qx::multirate::ResampleStream stream(147, 160, windowed, qx::multirate::Mode::rational, 1 / sum,
                                         1);
    const Samples found = stream(x);
    const Samples due =
        Made(found.size(), [](double i) { return std::sin(2 * pi * 5000 * i / 44100); });
    return Apart(found, due, 2000);
}

// Locates pulses to a fraction of a sample.
double FindPeaks() {
    Samples places(12);
    for (std::size_t i = 0; i < 12; ++i)
        places[i] = 200 + 310.3 * static_cast<double>(i);
    const Samples x = Made(4000, [&](double i) {
        double sum = 0;
        for (const double place : places)
            sum += std::exp(-std::pow((i - place) / 20, 2));
        return sum;
    });
    qx::measure::PeakFinder finder(0.5, 9);
    return Apart(finder.last(x).locations, places);
}

// Fits a decay whose rate is known to be at least 1.
double BoundedExponential() {
    const Samples t = Made(4000, [](double i) { return i / fs; });
    const Samples y = Made(4000, [](double i) { return 3 * std::exp(-1.5 * i / fs) + 0.2; });
    const Samples lower{-INFINITY, -10, -INFINITY}, upper{INFINITY, -1, INFINITY};
    const auto fit = qx::fit::exponential(y, t, {}, 1e-12, 500, {}, lower, upper);
    return Apart(Samples{fit.a, fit.b, fit.c}, Samples{3, -1.5, 0.2});
}

qx::Matrix<double> Hilbertlike(std::size_t n) {
    qx::Matrix<double> a(n, n);
    for (std::size_t i = 0; i < n; ++i)
        for (std::size_t j = 0; j < n; ++j)
            a(i, j) = (i == j ? 10.0 : 0.0) + std::cos(static_cast<double>(3 * i * i + 7 * j));
    return a;
}

// Solves a system of 100 equations.
double Solve() {
    const auto a = Hilbertlike(100);
    const Samples x = Made(100, [](double i) { return std::sin(i); });
    Samples b(100);
    for (std::size_t i = 0; i < 100; ++i)
        for (std::size_t j = 0; j < 100; ++j)
            b[i] += a(i, j) * x[j];
    return Apart(qx::linalg::solve(a, b), x);
}

// The frequencies of a chain of 20 masses.
double Eigenvalues() {
    qx::Matrix<double> k(20, 20);
    for (std::size_t i = 0; i < 20; ++i) {
        k(i, i) = 2;
        if (i > 0)
            k(i, i - 1) = k(i - 1, i) = -1;
    }
    Samples found = qx::linalg::eigh(k, qx::linalg::Output::values_only).values;
    for (double &one : found)
        one = std::sqrt(one);
    return Apart(found, Made(20, [](double i) { return 2 * std::sin(pi * (i + 1) / 42); }));
}

// The amplitude of a tone between two lines of the spectrum.
double WindowedSpectrum() {
    const Samples x = Made(4000, [](double i) { return 2 * std::sin(2 * pi * 100.1 * i / fs); });
    const Samples window = qx::windows::apply(Samples(4000, 1.0), qx::windows::Selector::flat_top);
    Samples windowed(x);
    for (std::size_t i = 0; i < x.size(); ++i)
        windowed[i] *= window[i];
    double most = 0;
    for (const auto &line : qx::fft::rfft(windowed))
        most = std::max(most, std::abs(line));
    return std::abs(2 * most / std::accumulate(window.begin(), window.end(), 0.0) / 2 - 1);
}

// From an acceleration with an offset to the displacement of a motion that swings up and comes to rest.
double Displacement() {
    const double w = 2 * pi * 5, v = pi / 4;
    const auto swing = [&](double t) { return std::sin(w * t); };
    const auto envelope = [&](double t) { return std::pow(std::sin(v * t), 2); };
    const Samples truth = Made(4000, [&](double i) { return swing(i / fs) * envelope(i / fs); });
    Samples motion = Made(4000, [&](double i) {
        const double t = i / fs;
        return 0.1 - w * w * swing(t) * envelope(t) +
               2 * w * std::cos(w * t) * v * std::sin(2 * v * t) +
               2 * v * v * swing(t) * std::cos(2 * v * t);
    });
    for (int order = 0; order < 2; ++order)
        motion = qx::calculus::cumulative(motion, 1 / fs);
    const Samples t = Made(4000, [](double i) { return i / fs; });
    const Samples drift = qx::fit::polynomial(t, motion, 2).fit;
    for (std::size_t i = 0; i < motion.size(); ++i)
        motion[i] -= drift[i];
    return Apart(motion, truth);
}

// The delay between two records of noise, to the nearest sample.
double Delay() {
    const Samples noise = qx::noise::gaussian(5000, 7);
    const std::span<const double> x(noise.data() + 100, 4000), y(noise.data() + 93, 4000);
    const Samples r = qx::signals::correlate(x, y);
    const auto best = std::max_element(r.begin(), r.end()) - r.begin();
    return std::abs(static_cast<double>(best) - (4000 - 1) - 7);
}

// Filters blocks of any size; the results have the bits of the whole signal.
double StreamingFilter() {
    const auto [a, b, zeros, poles, gain] = qx::filters::elliptic(100, 0.1, 60, 5, fs);
    const Samples x = qx::noise::gaussian(4000, 3);
    const Samples whole = qx::filters::filter_cascade(x, a, b);
    qx::filters::CascadeStream stream(a, b);
    Samples found(x.size());
    std::size_t from = 0;
    for (const std::size_t to : {10, 1000, 1001, 3500, 4000}) {
        stream(std::span(x).subspan(from, to - from), std::span(found).subspan(from, to - from));
        from = to;
    }
    return Apart(found, whole);
}

} // namespace

int main() {
    const struct {
        const char *name;
        double (*error)();
        double most;
    } tasks[] = {{"a lowpass without delay", DesignAndApply, 1e-3},
                 {"audio at another rate", ResampleAudio, 2e-3},
                 {"peaks between the samples", FindPeaks, 1e-2},
                 {"a decay within bounds", BoundedExponential, 1e-6},
                 {"a hundred equations", Solve, 1e-12},
                 {"frequencies of a chain", Eigenvalues, 1e-12},
                 {"the amplitude of a tone", WindowedSpectrum, 1e-3},
                 {"displacement", Displacement, 1e-3},
                 {"a delay", Delay, 0},
                 {"a filter in blocks", StreamingFilter, 0}};
    int failed = 0;
    for (const auto &task : tasks) {
        try {
            const double error = task.error();
            const bool holds = error <= task.most;
            std::printf("%-26s %8.1e%s\n", task.name, error, holds ? "" : "  too far");
            failed += !holds;
        } catch (const qx::Error &error) {
            std::printf("%-26s %s\n", task.name, error.what());
            ++failed;
        }
    }
    return failed;
}
