// Singular values, eigenproblems and factorisations against the LAPACK of OpenBLAS
// (bench/peer_lapack.h).
//
// bench_linalg_factorisations [GROUP...]: svd, values, svd2026, values2026, symmetric, general, qr,
// cholesky; all by default.

#include "bench/peer_lapack.h"
#include "bench/timing.h"
#include "linalg/eigenproblems/general.h"
#include "linalg/eigenproblems/symmetric.h"
#include "linalg/factorisations/cholesky.h"
#include "linalg/factorisations/qr.h"
#include "linalg/factorisations/svd.h"

#define lapack_complex_float CSG
#define lapack_complex_double CDB
#include <lapack.h>

#include <algorithm>
#include <cstdint>
#include <random>
#include <string>
#include <utility>
#include <vector>

namespace {

using qx::bench::Ratios;
using qx::bench::RepeatsFor;
using qx::bench::SecondsOf;

std::vector<double> Random(int32_t n) {
    std::mt19937_64 random(static_cast<uint64_t>(n));
    std::vector<double> x(static_cast<std::size_t>(n) * n);
    for (double &value : x)
        value = static_cast<double>(random() >> 11) * 0x1p-53 - 0.5;
    return x;
}
// The lower triangle of a symmetric matrix, with `shift` on the diagonal.
std::vector<double> Symmetric(int32_t n, double shift) {
    std::vector<double> a = Random(n);
    for (int32_t i = 0; i < n; ++i) {
        a[static_cast<std::size_t>(i) * n + i] += shift;
        for (int32_t j = 0; j < i; ++j)
            a[static_cast<std::size_t>(j) * n + i] = a[static_cast<std::size_t>(i) * n + j];
    }
    return a;
}

// Minima of interleaved runs: other work on the machine only adds to the times.
template <class Ours, class Peer>
void Compare(Ratios &ratios, const char *name, int32_t n, const Ours &ours, const Peer &peer) {
    const std::size_t ourRepeats = RepeatsFor(1e-4, ours), peerRepeats = RepeatsFor(1e-4, peer);
    double our = 1e9, their = 1e9, taken = 0;
    for (int round = 0; round < 40 && (round < 5 || taken < 2.0); ++round) {
        const double first = SecondsOf(ourRepeats, ours), second = SecondsOf(peerRepeats, peer);
        taken += first + second;
        our = std::min(our, first / static_cast<double>(ourRepeats));
        their = std::min(their, second / static_cast<double>(peerRepeats));
    }
    std::printf("%-18s n %5d %12.3f us  ratio %5.2f\n", name, n, our * 1e6, our / their);
    std::fflush(stdout);
    ratios.add(our / their, "n " + std::to_string(n));
}

// A driver of LAPACK with its work space, whose size comes from a query.
template <class Driver>
std::vector<double> WorkFor(const Driver &driver) {
    double size = 0.0;
    driver(&size, -1);
    return std::vector<double>(static_cast<std::size_t>(size));
}

constexpr auto Real = qx::ElementType::DBL;

const std::vector<int32_t> orders = {2, 4, 8, 16, 50, 100, 200, 500};

void SingularValueDecomposition(bool withVectors, qx::SVDScaling scaling) {
    const auto dgesvd = qx::bench::PeerRoutine<decltype(dgesvd_)>("dgesvd_");
    const std::string revision = scaling == qx::SVDScaling::Always ? ", revision" : "";
    const std::string title = withVectors ? "singular value decompositions" : "singular values";
    Ratios ratios((title + revision).c_str());
    for (const int32_t n : orders) {
        const std::vector<double> a = Random(n);
        std::vector<double> u(a.size()), s(n), v(a.size()), copy;
        const char job = withVectors ? 'S' : 'N';
        const auto driver = [&](double *work, int32_t length) {
            int32_t info;
            dgesvd(&job, &job, &n, &n, copy.data(), &n, s.data(), u.data(), &n, v.data(), &n, work,
                   &length, &info, 1, 1);
        };
        copy = a;
        std::vector<double> work = WorkFor(driver);
        Compare(
            ratios, ((withVectors ? "svd" : "values") + revision).c_str(), n,
            [&] {
                if (withVectors)
                    qx::SVDecompose<Real>({a.data(), n, n}, {u.data(), n, n}, {s.data(), n},
                                          {v.data(), n, n}, scaling);
                else
                    qx::SingularValues<Real>({a.data(), n, n}, {s.data(), n}, scaling);
            },
            [&] {
                copy = a;
                driver(work.data(), static_cast<int32_t>(work.size()));
            });
    }
    ratios.summary("dgesvd");
}

enum class Method { Elder, Revision };

void SymmetricEigenproblem(Method method) {
    const auto dsyev = qx::bench::PeerRoutine<decltype(dsyev_)>("dsyev_");
    const auto dsyevd = qx::bench::PeerRoutine<decltype(dsyevd_)>("dsyevd_");
    const bool isRevision = method == Method::Revision;
    const auto solve = isRevision ? qx::SymmetricEigenBlocked<Real> : qx::SymmetricEigen<Real>;
    Ratios ratios(isRevision ? "symmetric eigenproblems, revision" : "symmetric eigenproblems");
    for (const int32_t n : orders) {
        const std::vector<double> a = Symmetric(n, 0.0);
        std::vector<double> w(n), v(a.size()), copy = a;
        std::vector<int32_t> integers(3 + 5 * n);
        const auto count = static_cast<int32_t>(integers.size());
        const auto driver = [&](double *work, int32_t length) {
            int32_t info;
            if (isRevision)
                dsyevd("V", "L", &n, copy.data(), &n, w.data(), work, &length, integers.data(),
                       &count, &info, 1, 1);
            else
                dsyev("V", "L", &n, copy.data(), &n, w.data(), work, &length, &info, 1, 1);
        };
        std::vector<double> work = WorkFor(driver);
        Compare(
            ratios, isRevision ? "symmetric, revision" : "symmetric", n,
            [&] {
                solve({a.data(), n, n}, {w.data(), n}, {v.data(), n, n});
            },
            [&] {
                copy = a;
                driver(work.data(), static_cast<int32_t>(work.size()));
            });
    }
    ratios.summary(isRevision ? "dsyevd" : "dsyev");
}

void GeneralEigenproblem(Method method) {
    const auto dgeev = qx::bench::PeerRoutine<decltype(dgeev_)>("dgeev_");
    const bool isRevision = method == Method::Revision;
    const auto solve = isRevision ? qx::EigenBlocked<Real> : qx::EigenGeneral<Real>;
    Ratios ratios(isRevision ? "general eigenproblems, revision" : "general eigenproblems");
    for (const int32_t n : orders) {
        const std::vector<double> a = Random(n);
        std::vector<CDB> w(n), vectors(a.size());
        std::vector<double> re(n), im(n), v(a.size()), copy = a;
        const auto driver = [&](double *work, int32_t length) {
            int32_t info;
            dgeev("N", "V", &n, copy.data(), &n, re.data(), im.data(), nullptr, &n, v.data(), &n,
                  work, &length, &info, 1, 1);
        };
        std::vector<double> work = WorkFor(driver);
        Compare(
            ratios, isRevision ? "general, revision" : "general", n,
            [&] {
                solve({a.data(), n, n}, {w.data(), n}, {vectors.data(), n, n});
            },
            [&] {
                copy = a;
                driver(work.data(), static_cast<int32_t>(work.size()));
            });
    }
    ratios.summary("dgeev");
}

void QR(Method method) {
    const auto dgeqrf = qx::bench::PeerRoutine<decltype(dgeqrf_)>("dgeqrf_");
    const auto dorgqr = qx::bench::PeerRoutine<decltype(dorgqr_)>("dorgqr_");
    const bool isRevision = method == Method::Revision;
    Ratios ratios(isRevision ? "QR factorisations with all of q, revision"
                             : "QR factorisations with all of q");
    for (const int32_t n : orders) {
        const std::vector<double> a = Random(n);
        std::vector<double> q(a.size()), r(a.size()), tau(n), copy = a;
        const auto factor = [&](double *work, int32_t length) {
            int32_t info;
            dgeqrf(&n, &n, copy.data(), &n, tau.data(), work, &length, &info);
        };
        const auto form = [&](double *work, int32_t length) {
            int32_t info;
            dorgqr(&n, &n, &n, copy.data(), &n, tau.data(), work, &length, &info);
        };
        std::vector<double> work = WorkFor(factor), formWork = WorkFor(form);
        Compare(
            ratios, isRevision ? "qr, revision" : "qr", n,
            [&] {
                if (isRevision)
                    qx::QRDecomposeBlocked<Real>({a.data(), n, n}, qx::qrFull, {}, {q.data(), n, n},
                                                 {r.data(), n, n});
                else
                    qx::QRDecompose<Real>({a.data(), n, n}, qx::qrFull, {q.data(), n, n},
                                          {r.data(), n, n});
            },
            [&] {
                copy = a;
                factor(work.data(), static_cast<int32_t>(work.size()));
                form(formWork.data(), static_cast<int32_t>(formWork.size()));
            });
    }
    ratios.summary("dgeqrf and dorgqr");
}

void Cholesky() {
    const auto dpotrf = qx::bench::PeerRoutine<decltype(dpotrf_)>("dpotrf_");
    Ratios ratios("Cholesky factorisations");
    for (const int32_t n : orders) {
        const std::vector<double> a = Symmetric(n, n);
        std::vector<double> packed, copy, work;
        for (int32_t j = 0; j < n; ++j)
            for (int32_t i = j; i < n; ++i)
                packed.push_back(a[static_cast<std::size_t>(i) * n + j]);
        Compare(
            ratios, "cholesky", n,
            [&] {
                work = packed;
                qx::PackedCholesky<Real>({work.data(), qx::PackedLength(n)}, n);
            },
            [&] {
                copy = a;
                int32_t info;
                dpotrf("L", &n, copy.data(), &n, &info, 1);
            });
    }
    ratios.summary("dpotrf");
}

} // namespace

int main(int argc, char **argv) {
    const std::pair<const char *, void (*)()> groups[] = {
        {"svd", [] { SingularValueDecomposition(true, qx::SVDScaling::LargeNorms); }},
        {"values", [] { SingularValueDecomposition(false, qx::SVDScaling::LargeNorms); }},
        {"svd2026", [] { SingularValueDecomposition(true, qx::SVDScaling::Always); }},
        {"values2026", [] { SingularValueDecomposition(false, qx::SVDScaling::Always); }},
        {"symmetric", [] { SymmetricEigenproblem(Method::Elder); }},
        {"symmetric2026", [] { SymmetricEigenproblem(Method::Revision); }},
        {"general", [] { GeneralEigenproblem(Method::Elder); }},
        {"general2026", [] { GeneralEigenproblem(Method::Revision); }},
        {"qr", [] { QR(Method::Elder); }},
        {"qr2026", [] { QR(Method::Revision); }},
        {"cholesky", Cholesky}};
    for (const auto &[name, run] : groups)
        if (argc < 2 || std::find(argv + 1, argv + argc, std::string(name)) != argv + argc)
            run();
}
