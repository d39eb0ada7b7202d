// Products, LU solves and inverses against OpenBLAS and its LAPACK (bench/peer_lapack.h). Also the time
// that an export adds to its inner routine.
//
// bench_linalg_systems [GROUP...]: products, tiny, complexproducts, small, solve, complex, inverse,
// sets, complexsets, frame; all by default.

#include "bench/peer_lapack.h"
#include "bench/timing.h"
#include "linalg/products/products.h"
#include "linalg/systems/lu.h"
#include "qx/host.hpp"
#include "qx/linear_systems.h"

#define lapack_complex_float CSG
#define lapack_complex_double CDB
#include <lapack.h>

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <random>
#include <string>
#include <vector>

namespace {

using qx::bench::Keep;
using qx::bench::Ratios;
using qx::bench::RepeatsFor;
using qx::bench::SecondsOf;

std::vector<double> Random(std::size_t count) {
    std::mt19937_64 random(count);
    std::vector<double> x(count);
    for (double &value : x)
        value = static_cast<double>(random() >> 11) * 0x1p-53 - 0.5;
    return x;
}

// Minima of interleaved runs: other work on the machine only adds to the times.
template <class Ours, class Peer>
std::pair<double, double> Times(const Ours &ours, const Peer &peer) {
    const std::size_t ourRepeats = RepeatsFor(1e-4, ours), peerRepeats = RepeatsFor(1e-4, peer);
    std::pair<double, double> best(1e9, 1e9);
    double taken = 0;
    for (int round = 0; round < 40 && (round < 5 || taken < 2.0); ++round) {
        const double first = SecondsOf(ourRepeats, ours), second = SecondsOf(peerRepeats, peer);
        taken += first + second;
        best.first = std::min(best.first, first / static_cast<double>(ourRepeats));
        best.second = std::min(best.second, second / static_cast<double>(peerRepeats));
    }
    return best;
}

template <class Ours, class Peer>
void Compare(Ratios &ratios, const char *name, int32_t n, const Ours &ours, const Peer &peer) {
    const auto [our, their] = Times(ours, peer);
    std::printf("%-18s n %5d %12.3f us  ratio %5.2f\n", name, n, our * 1e6, our / their);
    std::fflush(stdout);
    ratios.add(our / their, "n " + std::to_string(n));
}

constexpr auto Real = qx::ElementType::DBL;

template <class T>
std::vector<T> RandomOf(std::size_t count) {
    const std::vector<double> numbers = Random(count * (sizeof(T) / sizeof(double)));
    std::vector<T> x(count);
    std::memcpy(x.data(), numbers.data(), count * sizeof(T));
    return x;
}

template <class T>
using Gemm = void(const char *, const char *, const int32_t *, const int32_t *, const int32_t *,
                  const T *, const T *, const int32_t *, const T *, const int32_t *, const T *, T *,
                  const int32_t *, std::size_t, std::size_t);

template <qx::ElementType E>
void Products(const char *name, const char *peer, const char *routine,
              std::initializer_list<int32_t> sizes) {
    typedef qx::ElementOf<E> T;
    Gemm<T> *const gemm = qx::bench::PeerRoutine<Gemm<T>>(routine);
    Ratios ratios(name);
    for (const int32_t n : sizes) {
        const auto a = RandomOf<T>(static_cast<std::size_t>(n) * n);
        std::vector<T> c(a.size());
        const T one = qx::ScalarOf<E>::Of(1.0), zero = qx::ScalarOf<E>::Of(0.0);
        Compare(
            ratios, E == Real ? "product" : "complex product", n,
            [&] {
                qx::MatrixProduct<E>({a.data(), n, n}, {a.data(), n, n}, {c.data(), n, n});
            },
            [&] {
                gemm("N", "N", &n, &n, &n, &one, a.data(), &n, a.data(), &n, &zero, c.data(), &n, 1,
                     1);
            });
    }
    ratios.summary(peer);
}

void SolveByLapack(int32_t n, double *a, int32_t *pivots, double *x) {
    const int32_t one = 1;
    int32_t info;
    static const auto dgesv = qx::bench::PeerRoutine<decltype(dgesv_)>("dgesv_");
    dgesv(&n, &one, a, &n, pivots, x, &n, &info);
}
void SolveByLapack(int32_t n, CDB *a, int32_t *pivots, CDB *x) {
    const int32_t one = 1;
    int32_t info;
    static const auto zgesv = qx::bench::PeerRoutine<decltype(zgesv_)>("zgesv_");
    zgesv(&n, &one, a, &n, pivots, x, &n, &info);
}

template <qx::ElementType E>
void Solve(const char *name, const char *peer, std::initializer_list<int32_t> sizes) {
    Ratios ratios(name);
    for (const int32_t n : sizes) {
        typedef qx::ElementOf<E> T;
        const auto a = RandomOf<T>(static_cast<std::size_t>(n) * n), b = RandomOf<T>(n);
        std::vector<T> factors(a.size()), x(n), y(n);
        std::vector<int32_t> pivots(n);
        Compare(
            ratios, E == Real ? "solve" : "complex solve", n,
            [&] {
                qx::SolveByLU<E>({a.data(), n, n}, {b.data(), n}, {x.data(), n});
            },
            [&] {
                factors = a;
                y = b;
                SolveByLapack(n, factors.data(), pivots.data(), y.data());
            });
    }
    ratios.summary(peer);
}

void Inverse() {
    const auto dgesv = qx::bench::PeerRoutine<decltype(dgesv_)>("dgesv_");
    Ratios ratios("inverses");
    for (const int32_t n : {4, 8, 32, 100, 300}) {
        const auto a = Random(static_cast<std::size_t>(n) * n);
        std::vector<double> factors(a.size()), inverse(a.size()), other(a.size());
        std::vector<int32_t> pivots(n);
        Compare(
            ratios, "inverse", n,
            [&] {
                qx::InvertByLU<Real>({a.data(), n, n}, {inverse.data(), n, n});
            },
            [&] {
                int32_t info;
                factors = a;
                std::fill(other.begin(), other.end(), 0.0);
                for (int32_t i = 0; i < n; ++i)
                    other[static_cast<std::size_t>(i) * (n + 1)] = 1.0;
                dgesv(&n, &n, factors.data(), &n, pivots.data(), other.data(), &n, &info);
            });
    }
    ratios.summary("LAPACK dgesv on the unit matrix");
}

// The drivers of LAPACK that solve a set and estimate the reciprocal condition number, by the type of
// their elements; `work` has 4 n elements, `reals` 2 n, `integers` n.
void SolveSetByLapack(int32_t n, int32_t sides, double *a, int32_t *pivots, double *x, double *work,
                      double *, int32_t *integers, double *reciprocal) {
    static const auto dlange = qx::bench::PeerRoutine<decltype(dlange_)>("dlange_");
    static const auto dgesv = qx::bench::PeerRoutine<decltype(dgesv_)>("dgesv_");
    static const auto dgecon = qx::bench::PeerRoutine<decltype(dgecon_)>("dgecon_");
    int32_t info;
    const double norm = dlange("1", &n, &n, a, &n, work, 1);
    dgesv(&n, &sides, a, &n, pivots, x, &n, &info);
    dgecon("1", &n, a, &n, &norm, reciprocal, work, integers, &info, 1);
}
void SolveSetByLapack(int32_t n, int32_t sides, CDB *a, int32_t *pivots, CDB *x, CDB *work,
                      double *reals, int32_t *, double *reciprocal) {
    static const auto zlange = qx::bench::PeerRoutine<decltype(zlange_)>("zlange_");
    static const auto zgesv = qx::bench::PeerRoutine<decltype(zgesv_)>("zgesv_");
    static const auto zgecon = qx::bench::PeerRoutine<decltype(zgecon_)>("zgecon_");
    int32_t info;
    const double norm = zlange("1", &n, &n, a, &n, reals, 1);
    zgesv(&n, &sides, a, &n, pivots, x, &n, &info);
    zgecon("1", &n, a, &n, &norm, reciprocal, work, reals, &info, 1);
}

// With an estimate of the condition number, for ten right-hand sides. The elders of this revision always
// fail, so there is nothing to compare with but LAPACK.
template <qx::ElementType E>
void SolveSets(const char *name, const char *peer, std::initializer_list<int32_t> sizes) {
    typedef qx::ElementOf<E> T;
    Ratios ratios(name);
    for (const int32_t n : sizes) {
        constexpr int32_t sides = 10;
        const auto a = RandomOf<T>(static_cast<std::size_t>(n) * n);
        const auto b = RandomOf<T>(static_cast<std::size_t>(n) * sides);
        std::vector<T> factors(a.size()), x(b.size()), other(b.size()), work(4 * n);
        std::vector<int32_t> pivots(n), integers(n);
        std::vector<double> reals(2 * n);
        double reciprocal;
        Compare(
            ratios, E == Real ? "solve set" : "complex solve set", n,
            [&] {
                qx::SolveSetByLU<E>({a.data(), n, n}, {b.data(), n, sides}, {x.data(), n, sides},
                                    &reciprocal);
            },
            [&] {
                factors = a;
                other = b;
                SolveSetByLapack(n, sides, factors.data(), pivots.data(), other.data(), work.data(),
                                 reals.data(), integers.data(), &reciprocal);
            });
    }
    ratios.summary(peer);
}

void Frame() {
    const qx::host::Array2D<double> a(1, 1);
    const qx::host::Array1D<double> b({1.0}), x({1.0});
    a.data()[0] = 2.0;
    double y;
    ErrorCode err;
    const auto [call, inner] =
        Times([&] { EqsByLUDri_head(a.handle(), b.handle(), x.handle(), &err); },
              [&] {
                  qx::SolveByLU<Real>({a.data(), 1, 1}, {b.data(), 1}, {&y, 1});
                  Keep(y);
              });
    std::printf("frame of EqsByLUDri_head: %.0f ns (the call %.0f ns)\n", (call - inner) * 1e9,
                call * 1e9);
}

} // namespace

int main(int argc, char **argv) {
    const auto wanted = [&](const char *group) {
        return argc < 2 || std::any_of(argv + 1, argv + argc, [&](const char *argument) {
                   return std::strcmp(argument, group) == 0;
               });
    };
    if (wanted("tiny"))
        Products<Real>("matrix products of 2 to 32", "dgemm", "dgemm_", {2, 4, 8, 16, 32});
    if (wanted("products"))
        Products<Real>("matrix products of 64 and up", "dgemm", "dgemm_",
                       {64, 100, 150, 200, 300, 500, 1000, 2000});
    if (wanted("complexproducts"))
        Products<qx::ElementType::CDB>("complex matrix products of 64 and up", "zgemm", "zgemm_",
                                       {64, 100, 200, 500, 1000});
    if (wanted("small"))
        Solve<Real>("linear systems up to 8 by 8", "LAPACK dgesv", {1, 2, 3, 4, 5, 6, 7, 8});
    if (wanted("solve"))
        Solve<Real>("linear systems of 16 to 2000", "LAPACK dgesv",
                    {16, 32, 64, 100, 200, 300, 500, 1000, 2000});
    if (wanted("complex"))
        Solve<qx::ElementType::CDB>("complex linear systems of 1 to 1000", "LAPACK zgesv",
                                    {1, 2, 4, 8, 16, 32, 64, 100, 200, 500, 1000});
    if (wanted("inverse"))
        Inverse();
    if (wanted("sets"))
        SolveSets<Real>("ten right sides with the condition", "LAPACK dgesv and dgecon",
                        {4, 8, 32, 100, 300, 1000});
    if (wanted("complexsets"))
        SolveSets<qx::ElementType::CDB>("ten complex right sides with the condition",
                                        "LAPACK zgesv and zgecon", {4, 8, 32, 100, 300});
    if (wanted("frame"))
        Frame();
}
