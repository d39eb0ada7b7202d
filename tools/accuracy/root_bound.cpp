// root_bound COUNT [SEED]: the residuals of the roots of COUNT polynomials, in 113 bits. SIGTERM ends it
// early and prints the results so far. Built and run as
//
//     g++ -std=gnu++20 -O2 -Iinclude -Ibuild/release/include tools/accuracy/root_bound.cpp
//         -Lbuild/release -lqxanalysis -lqxrt -Wl,-rpath,$PWD/build/release -o root_bound
//     nice -n 19 ./root_bound 100000
//
// Degrees are uniform over 1 to 200. The moduli of the coefficients are in turn 10^u with u uniform over -100
// to 100, normal, and normal times 10^(u/20); half of the polynomials are complex. Prints the largest
// |p(z)| / (4 n eps sum |a_i||z|^i) of each kind, how many are above 1, how many calls return a code, and the
// time of the calls. For |z| above 1, the reversed polynomial is evaluated at 1 / z.

#include "qx/host.h"
#include "qx/polynomial_roots.h"

#include <algorithm>
#include <chrono>
#include <cmath>
#include <csignal>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <random>
#include <vector>

namespace {

typedef __float128 Quad;
struct Complex {
    double re, im;
};

// |p(z)| divided by the bound.
double Share(const std::vector<Complex> &a, Complex z) {
    const int n = static_cast<int>(a.size()) - 1;
    Quad x = z.re, y = z.im;
    const bool isLarge = std::hypot(z.re, z.im) > 1;
    if (isLarge) {
        const double scale = std::max(std::fabs(z.re), std::fabs(z.im));
        const Quad u = x / scale, v = y / scale, squares = u * u + v * v;
        x = u / squares / scale;
        y = -v / squares / scale;
    }
    const long double modulus = hypotl(static_cast<long double>(x), static_cast<long double>(y));
    Quad re = 0, im = 0;
    long double sum = 0;
    for (int i = 0; i <= n; ++i) {
        const Complex c = a[isLarge ? i : n - i];
        const Quad next = re * x - im * y + c.re;
        im = re * y + im * x + c.im;
        re = next;
        sum = sum * modulus + hypotl(c.re, c.im);
    }
    const long double p = hypotl(static_cast<long double>(re), static_cast<long double>(im));
    return static_cast<double>(p / (4 * n * 0x1p-52L * sum));
}

struct Kind {
    const char *name;
    double worst = 0, seconds = 0;
    long polynomials = 0, roots = 0, above = 0, codes = 0, missing = 0;
};

volatile std::sig_atomic_t isEnded = 0;

} // namespace

int main(int argc, char **argv) {
    const long count = argc > 1 ? std::atol(argv[1]) : 1000;
    std::mt19937_64 random(argc > 2 ? std::strtoull(argv[2], nullptr, 10) : 1);
    std::normal_distribution<double> normal;
    std::uniform_real_distribution<double> decades(-100, 100);
    Kind kinds[] = {{"real, 10^u"},    {"real, normal"},    {"real, both"},
                    {"complex, 10^u"}, {"complex, normal"}, {"complex, both"}};
    std::signal(SIGTERM, [](int) { isEnded = 1; });
    for (long i = 0; i < count && isEnded == 0; ++i) {
        Kind &kind = kinds[i % 6];
        const bool isComplex = i % 6 > 2;
        const int n = 1 + static_cast<int>(random() % 200);
        std::vector<Complex> a(n + 1);
        for (Complex &c : a) {
            const double u = decades(random);
            const double size = i % 3 == 0   ? std::pow(10.0, u)
                                : i % 3 == 1 ? 1.0
                                             : std::pow(10.0, u / 20);
            c = {normal(random), isComplex ? normal(random) : 0.0};
            const double modulus = i % 3 == 0 ? std::hypot(c.re, c.im) : 1.0;
            c = {c.re / modulus * size, c.im / modulus * size};
        }
        std::vector<double> real;
        for (const Complex &c : a)
            real.push_back(c.re);
        CDB1D roots = static_cast<CDB1D>(QXHostNew1D(QXTypeCDB, 0));
        DBL1D errors = static_cast<DBL1D>(QXHostNew1D(QXTypeDBL, 0));
        void *given = isComplex ? static_cast<void *>(QXHostCopy1D(QXTypeCDB, n + 1, a.data()))
                                : static_cast<void *>(QXHostCopy1D(QXTypeDBL, n + 1, real.data()));
        const auto start = std::chrono::steady_clock::now();
        const ErrorCode code = isComplex
                                   ? CxPolyRoots2026_head(static_cast<CDB1D>(given), roots, errors)
                                   : PolyRoots2026_head(static_cast<DBL1D>(given), roots, errors);
        kind.seconds +=
            std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
        ++kind.polynomials;
        const auto found =
            *reinterpret_cast<const int32_t *>(*reinterpret_cast<char *const *>(roots));
        kind.codes += code != 0;
        kind.missing += found != n;
        const auto *z = static_cast<const Complex *>(QXHostElements1D(roots));
        for (int32_t j = 0; j < found; ++j) {
            const double share = Share(a, z[j]);
            kind.worst = share > kind.worst || share != share ? share : kind.worst;
            kind.above += !(share <= 1);
        }
        kind.roots += found;
        for (void *block : {static_cast<void *>(roots), static_cast<void *>(errors), given})
            QXHostFree(block);
    }
    for (const Kind &kind : kinds)
        std::printf(
            "%-16s %7ld polynomials, %9ld roots: worst %.3g, above 1: %ld, codes: %ld, without "
            "all roots: %ld, %.3f ms each\n",
            kind.name, kind.polynomials, kind.roots, kind.worst, kind.above, kind.codes,
            kind.missing, 1e3 * kind.seconds / static_cast<double>(kind.polynomials));
}
