// Roots of polynomials.
//
// bench_poly. Peer: gsl_poly_complex_solve, all roots of a real polynomial as eigenvalues of its
// balanced companion matrix. bench/polynomials.py compares with numpy.roots, and complex polynomials.

#include "bench/timing.h"
#include "poly/complex_roots.h"
#include "poly/multiple_roots.h"
#include "poly/simultaneous_roots.h"

#include <cstdint>
#include <random>
#include <string>
#include <vector>

#ifdef QX_PEER_GSL
#include <gsl/gsl_errno.h>
#include <gsl/gsl_poly.h>
#endif

namespace {

using qx::bench::Keep;
using qx::bench::LeastTimes;
using qx::bench::Ratios;

std::vector<double> FromRoots(const std::vector<double> &roots) {
    std::vector<double> a = {1.0};
    for (const double root : roots) {
        a.insert(a.begin(), 0.0);
        for (std::size_t k = 0; k + 1 < a.size(); ++k)
            a[k] -= root * a[k + 1];
    }
    return a;
}

struct Kind {
    const char *name;
    std::vector<double> (*coefficients)(int32_t degree);
};
const Kind kinds[] = {
    {"random",
     [](int32_t degree) {
         std::mt19937_64 random(static_cast<uint64_t>(degree));
         std::vector<double> a;
         for (int32_t k = 0; k <= degree; ++k)
             a.push_back(static_cast<double>(random() >> 11) * 0x1p-52 - 1.0);
         return a;
     }},
    {"on a line",
     [](int32_t degree) {
         std::vector<double> roots;
         for (int32_t k = 0; k < degree; ++k)
             roots.push_back((k + 0.5) / degree);
         return FromRoots(roots);
     }},
    {"threefold",
     [](int32_t degree) {
         std::vector<double> roots;
         for (int32_t k = 0; k < degree; ++k)
             roots.push_back(1.0 + k / 3);
         return FromRoots(roots);
     }},
};

double PeerSeconds([[maybe_unused]] const std::vector<double> &a) {
#ifdef QX_PEER_GSL
    gsl_set_error_handler_off();
    gsl_poly_complex_workspace *const work = gsl_poly_complex_workspace_alloc(a.size());
    std::vector<double> roots(2 * a.size());
    const auto times = LeastTimes([&] {
        gsl_poly_complex_solve(a.data(), a.size(), work, roots.data());
        Keep(roots[0]);
    });
    gsl_poly_complex_workspace_free(work);
    return times[0];
#else
    return 0;
#endif
}

} // namespace

int main() {
    Ratios search("all roots by Newton's method"), multiple("roots with multiplicities"),
        simpleTogether("all roots at once, revision, random coefficients"),
        closeTogether("all roots at once, revision, roots on a line or threefold");
    for (const Kind &kind : kinds) {
        const bool isRandom = std::string(kind.name) == "random";
        for (const int32_t degree : {3, 6, 12, 24, 48, 96}) {
            if (degree > 24 && !isRandom)
                continue; // double-precision coefficients do not determine the roots there
            const std::vector<double> a = kind.coefficients(degree);
            const auto n = static_cast<int32_t>(a.size());
            std::vector<CDB> coefficients, roots(a.size()), simple(a.size());
            for (const double value : a)
                coefficients.push_back({value, 0.0});
            std::vector<int32_t> times(a.size());
            std::vector<double> radii(a.size());
            int32_t count = 0;
            const auto seconds = LeastTimes(
                [&] {
                    qx::CxPolynomialRoots({coefficients.data(), n}, 100, {roots.data(), n}, &count);
                    Keep(roots[0]);
                },
                [&] {
                    qx::MultipleRoots found = {
                        {roots.data(), n}, {simple.data(), n}, {times.data(), n}};
                    qx::FindMultipleRoots({coefficients.data(), n}, true, 0.0, &found);
                    Keep(roots[0]);
                },
                [&] {
                    qx::SimultaneousRoots({coefficients.data(), n}, true, {roots.data(), degree},
                                          {radii.data(), degree});
                    Keep(roots[0]);
                });
            const double peer = PeerSeconds(a);
            const auto ratio = [&](int which) {
                return qx::bench::Cell(peer > 0 ? seconds[which] / peer : 0);
            };
            std::printf("%-10s degree %3d  search %10.2f us %s  multiple %10.2f us %s  at once "
                        "%10.2f us %s\n",
                        kind.name, degree, seconds[0] * 1e6, ratio(0).c_str(), seconds[1] * 1e6,
                        ratio(1).c_str(), seconds[2] * 1e6, ratio(2).c_str());
            if (peer > 0) {
                const std::string name =
                    std::string(kind.name) + ", degree " + std::to_string(degree);
                search.add(seconds[0] / peer, name);
                multiple.add(seconds[1] / peer, name);
                (isRandom ? simpleTogether : closeTogether).add(seconds[2] / peer, name);
            }
        }
    }
    search.summary("GSL, eigenvalues");
    multiple.summary("GSL, eigenvalues, without multiplicities");
    simpleTogether.summary("GSL, eigenvalues");
    closeTogether.summary("GSL, eigenvalues");
    return 0;
}
