// The FFT engine against FFTW, one thread, plans made outside the timed loop.
//
// bench_fft [GROUP...]: small, powers, tens, products, primes, cold, plan; all by default.

#include "bench/fftw_plan.h"
#include "bench/timing.h"
#include "fft/plan.h"

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <memory>

namespace {

using qx::PlanReference;
using qx::bench::Cell;
using qx::bench::LeastTimes;
using qx::bench::Ratios;

#ifdef QX_PEER_FFTW3
using qx::bench::FFTWPlan;

// FFTW on as many blocks of data as ours.
class Peer {
public:
    Peer(int32_t n, bool real, unsigned effort, std::size_t copies)
        : real_(real), copies_(copies), distance_(2 * std::size_t(n) + 8),
          plan_(distance_ * copies, [=](double *in, double *out) {
              fftw_complex *const to = FFTWPlan::Complex(out);
              return real ? fftw_plan_dft_r2c_1d(n, in, to, effort)
                          : fftw_plan_dft_1d(n, FFTWPlan::Complex(in), to, FFTW_FORWARD, effort);
          }) {}

    void operator()() const {
        const std::size_t at = next_ * distance_;
        if (real_)
            plan_.realAt(at);
        else
            plan_.complexAt(at);
        next_ = next_ + 1 == copies_ ? 0 : next_ + 1;
    }

private:
    bool real_;
    std::size_t copies_, distance_;
    FFTWPlan plan_;
    mutable std::size_t next_ = 0;
};
#endif

// Ours, with the data at the address of a host's array: 4 modulo 16.
class Ours {
public:
    Ours(int32_t n, bool real, std::size_t copies)
        : n_(n), real_(real), copies_(copies), distance_(2 * std::size_t(n) + 8), plan_(n),
          memory_(new char[16 * distance_ * copies + 64]) {
        const std::size_t shift = 64 - reinterpret_cast<std::uintptr_t>(memory_.get()) % 64;
        in_ = reinterpret_cast<DBL *>(memory_.get() + shift % 64 + 4);
        out_ = in_ + distance_ * copies;
        for (std::size_t i = 0; i < distance_ * copies; ++i)
            in_[i] = static_cast<double>(i * 7919 % 1024) / 512 - 1;
    }
    void operator()() const {
        const DBL *const in = in_ + next_ * distance_;
        DBL *const out = out_ + next_ * distance_;
        if (real_)
            qx::FFTRealForward(plan_.get(), in, out, 1, 1, n_);
        else
            qx::FFTComplexForward(plan_.get(), in, in + 1, out, out + 1, 2, 2, n_);
        next_ = next_ + 1 == copies_ ? 0 : next_ + 1;
    }

private:
    int32_t n_;
    bool real_;
    std::size_t copies_, distance_;
    PlanReference plan_;
    std::unique_ptr<char[]> memory_;
    DBL *in_, *out_;
    mutable std::size_t next_ = 0;
};

struct Totals {
    explicit Totals(const std::string &lengths)
        : complexEstimate("complex transform, " + lengths), complexMeasure(complexEstimate),
          realEstimate("real transform, " + lengths), realMeasure(realEstimate),
          realComplex(realEstimate) {}

    Ratios complexEstimate, complexMeasure, realEstimate, realMeasure, realComplex;

    void summary() const {
        complexEstimate.summary("FFTW, FFTW_ESTIMATE");
        complexMeasure.summary("FFTW, FFTW_MEASURE");
        realEstimate.summary("FFTW r2c, FFTW_ESTIMATE");
        realMeasure.summary("FFTW r2c, FFTW_MEASURE");
        realComplex.summary("our complex transform");
    }
};

// One line per length. For data out of cache, enough copies to exceed every cache are used in turn.
void Compare(int32_t n, bool cold, Totals &group, Totals &all) {
    constexpr std::size_t coldBytes = std::size_t{1} << 27;
    const std::size_t copies = cold ? std::max<std::size_t>(2, coldBytes / (32 * n)) : 1;
    const std::string name = std::to_string(n) + (cold ? ", out of cache" : "");
    double oursTimes[2];
    double ratios[2][2] = {};
    for (const bool real : {false, true}) {
        const Ours ours(n, real, copies);
#ifdef QX_PEER_FFTW3
        const Peer estimate(n, real, FFTW_ESTIMATE, copies);
        const Peer measure(n, real, FFTW_MEASURE, copies);
        const auto times = LeastTimes(ours, estimate, measure);
        for (Totals *totals : {&group, &all}) {
            (real ? totals->realEstimate : totals->complexEstimate).add(times[0] / times[1], name);
            (real ? totals->realMeasure : totals->complexMeasure).add(times[0] / times[2], name);
        }
        ratios[real][0] = times[0] / times[1];
        ratios[real][1] = times[0] / times[2];
#else
        const auto times = LeastTimes(ours);
#endif
        oursTimes[real] = times[0];
    }
    for (Totals *totals : {&group, &all})
        totals->realComplex.add(oursTimes[1] / oursTimes[0], name);
    std::printf("%8d complex %10.3f us %s %s   real %10.3f us %s %s   real/complex %4.2f\n", n,
                oursTimes[0] * 1e6, Cell(ratios[0][0]).c_str(), Cell(ratios[0][1]).c_str(),
                oursTimes[1] * 1e6, Cell(ratios[1][0]).c_str(), Cell(ratios[1][1]).c_str(),
                oursTimes[1] / oursTimes[0]);
    std::fflush(stdout);
}

struct Group {
    const char *name;
    const char *about;
    std::vector<int32_t> lengths;
    bool cold;
};

std::vector<Group> Groups() {
    Group small = {"small", "2 to 64", {}, false};
    for (int32_t n = 2; n <= 64; ++n)
        small.lengths.push_back(n);
    Group powers = {"powers", "2^7 to 2^20", {}, false};
    for (int32_t n = 128; n <= 1 << 20; n *= 2)
        powers.lengths.push_back(n);
    return {small,
            powers,
            {"tens", "10^2 to 10^6", {100, 1000, 10000, 100000, 1000000}, false},
            {"products",
             "products of small primes",
             {72,    96,    120,   180,   210,   240,           360,   480,    720,
              840,   1260,  1536,  2310,  2520,  3125,          4725,  5040,   6561,
              10080, 13824, 16807, 27720, 30030, 65536 / 4 * 3, 75600, 177147, 360360},
             false},
            {"primes",
             "primes",
             {53,  59,  67,  83,   97,   107,  127,  167,  193,  251,  257,
              383, 509, 769, 1021, 1283, 2053, 4099, 5003, 8191, 10007},
             false},
            {"cold",
             "out of cache",
             {16, 64, 100, 256, 1000, 1024, 4096, 10000, 16384, 65536, 262144, 1048576},
             true}};
}

bool IsGroup(const char *name) {
    const std::vector<Group> groups = Groups();
    return std::strcmp(name, "plan") == 0 ||
           std::any_of(groups.begin(), groups.end(),
                       [name](const Group &group) { return std::strcmp(name, group.name) == 0; });
}

void ReportPlans() {
    std::printf("-- plan\n");
    for (const int32_t n : {1024, 65536, 1000000, 10007}) {
        const auto build = LeastTimes([n] { const PlanReference plan(n); });
        const auto transform = LeastTimes(Ours(n, false, 1));
        std::printf("%8d built in %.1f us: %.1f transforms\n", n, build[0] * 1e6,
                    build[0] / transform[0]);
    }
    const PlanReference held(1024);
    const auto hit = LeastTimes([] { const PlanReference again(1024); });
    std::printf("cache hit, acquired and released: %.1f ns\n", hit[0] * 1e9);
}

} // namespace

int main(int argc, char **argv) {
    Totals all("all lengths");
    const auto wanted = [&](const char *name) {
        for (int i = 1; i < argc; ++i)
            if (std::strcmp(argv[i], name) == 0)
                return true;
        return argc == 1;
    };
    for (int i = 1; i < argc; ++i)
        if (!IsGroup(argv[i])) {
            std::fprintf(stderr, "bench_fft: there is no group %s\n", argv[i]);
            return 2;
        }
    std::printf("our time; ratios to FFTW with FFTW_ESTIMATE and FFTW_MEASURE\n");
    for (const Group &group : Groups()) {
        if (!wanted(group.name))
            continue;
        Totals totals(group.about);
        for (const int32_t n : group.lengths)
            Compare(n, group.cold, totals, all);
        totals.summary();
    }
    if (wanted("plan"))
        ReportPlans();
    all.summary();
}
