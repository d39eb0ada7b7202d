// Singular values, eigenproblems and factorisations against the LAPACK of OpenBLAS
// (bench/peer_lapack.h).
//
// bench_linalg_factorisations [GROUP...]: svd, values, symmetric, general and qr, each also with 2026 at
// its end for the revision and with "complex" in front of it; cholesky; all by default.

#include "bench/lapack_drivers.h"
#include "bench/timing.h"
#include "linalg/eigenproblems/general.h"
#include "linalg/eigenproblems/symmetric.h"
#include "linalg/factorisations/cholesky.h"
#include "linalg/factorisations/qr.h"
#include "linalg/factorisations/svd.h"

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <functional>
#include <random>
#include <string>
#include <utility>
#include <vector>

namespace {

using qx::ElementOf;
using qx::ElementType;
using qx::bench::Ratios;
using qx::bench::RepeatsFor;
using qx::bench::SecondsOf;
using qx::bench::WorkFor;

constexpr auto Real = ElementType::DBL, Complex = ElementType::CDB;

template <ElementType E>
std::vector<ElementOf<E>> Random(int32_t n) {
    std::mt19937_64 random(static_cast<uint64_t>(n));
    std::vector<ElementOf<E>> x(static_cast<std::size_t>(n) * n);
    std::vector<double> numbers(x.size() * (sizeof(ElementOf<E>) / sizeof(double)));
    for (double &value : numbers)
        value = static_cast<double>(random() >> 11) * 0x1p-53 - 0.5;
    std::memcpy(x.data(), numbers.data(), numbers.size() * sizeof(double));
    return x;
}

double Conjugate(double value) { return value; }
CDB Conjugate(CDB value) { return {value.re, -value.im}; }

// A symmetric or Hermitian matrix.
template <ElementType E>
std::vector<ElementOf<E>> Hermitian(int32_t n) {
    std::vector<ElementOf<E>> a = Random<E>(n);
    const auto at = [&](int32_t i, int32_t j) -> ElementOf<E> & {
        return a[static_cast<std::size_t>(i) * n + j];
    };
    for (int32_t i = 0; i < n; ++i) {
        if constexpr (E == Complex)
            at(i, i).im = 0;
        for (int32_t j = 0; j < i; ++j)
            at(j, i) = Conjugate(at(i, j));
    }
    return a;
}

// Minima of interleaved runs: other work on the machine only adds to the times.
template <class Ours, class Peer>
void Compare(Ratios &ratios, const std::string &name, int32_t n, const Ours &ours,
             const Peer &peer) {
    const std::size_t ourRepeats = RepeatsFor(1e-4, ours), peerRepeats = RepeatsFor(1e-4, peer);
    double our = 1e9, their = 1e9, taken = 0;
    for (int round = 0; round < 40 && (round < 5 || taken < 2.0); ++round) {
        const double first = SecondsOf(ourRepeats, ours), second = SecondsOf(peerRepeats, peer);
        taken += first + second;
        our = std::min(our, first / static_cast<double>(ourRepeats));
        their = std::min(their, second / static_cast<double>(peerRepeats));
    }
    std::printf("%-28s n %5d %12.3f us  ratio %5.2f\n", name.c_str(), n, our * 1e6, our / their);
    std::fflush(stdout);
    ratios.add(our / their, "n " + std::to_string(n));
}

const std::vector<int32_t> orders = {2, 4, 8, 16, 50, 100, 200, 500};

enum class Method { Elder, Revision };

// The names of a group: "complex ..., revision".
template <ElementType E>
std::string Named(const std::string &what, Method method) {
    return (E == Complex ? "complex " : "") + what +
           (method == Method::Revision ? ", revision" : "");
}

template <ElementType E>
void SingularValueDecomposition(bool withVectors, Method method) {
    typedef ElementOf<E> T;
    const auto scaling =
        method == Method::Revision ? qx::SVDScaling::Always : qx::SVDScaling::LargeNorms;
    Ratios ratios(
        Named<E>(withVectors ? "singular value decompositions" : "singular values", method));
    const std::string name = Named<E>(withVectors ? "svd" : "values", method);
    for (const int32_t n : orders) {
        if (E == Complex && n > 200)
            continue; // which would take longer than all other groups
        const std::vector<T> a = Random<E>(n);
        std::vector<T> u(a.size()), v(a.size()), copy = a;
        std::vector<double> s(n), reals(5 * n);
        const auto driver = [&](T *work, int32_t length) {
            qx::bench::Gesvd(withVectors ? 'S' : 'N', n, copy.data(), s.data(), u.data(), v.data(),
                             work, length, reals.data());
        };
        std::vector<T> work = WorkFor<T>(driver);
        Compare(
            ratios, name, n,
            [&] {
                if (withVectors)
                    qx::SVDecompose<E>({a.data(), n, n}, {u.data(), n, n}, {s.data(), n},
                                       {v.data(), n, n}, scaling);
                else
                    qx::SingularValues<E>({a.data(), n, n}, {s.data(), n}, scaling);
            },
            [&] {
                copy = a;
                driver(work.data(), static_cast<int32_t>(work.size()));
            });
    }
    ratios.summary(E == Real ? "dgesvd" : "zgesvd");
}

template <ElementType E>
void SymmetricEigenproblem(Method method) {
    typedef ElementOf<E> T;
    const bool isRevision = method == Method::Revision;
    const auto solve = isRevision ? qx::SymmetricEigenBlocked<E> : qx::SymmetricEigen<E>;
    const char *const what = E == Real ? "symmetric eigenproblems" : "Hermitian eigenproblems";
    Ratios ratios(what + std::string(isRevision ? ", revision" : ""));
    for (const int32_t n : orders) {
        const std::vector<T> a = Hermitian<E>(n);
        std::vector<T> v(a.size()), copy = a;
        std::vector<double> w(n), reals(1 + 5 * n + 2 * n * n);
        std::vector<int32_t> integers(3 + 5 * n);
        const auto driver = [&](T *work, int32_t length) {
            if (isRevision)
                qx::bench::Heevd(n, copy.data(), w.data(), work, length, reals.data(),
                                 integers.data());
            else
                qx::bench::Heev(n, copy.data(), w.data(), work, length, reals.data());
        };
        std::vector<T> work = WorkFor<T>(driver);
        Compare(
            ratios,
            std::string(E == Real ? "symmetric" : "Hermitian") + (isRevision ? ", revision" : ""),
            n,
            [&] {
                solve({a.data(), n, n}, {w.data(), n}, {v.data(), n, n});
            },
            [&] {
                copy = a;
                driver(work.data(), static_cast<int32_t>(work.size()));
            });
    }
    const char *const peers[] = {"dsyev", "dsyevd", "zheev", "zheevd"};
    ratios.summary(peers[2 * (E == Complex) + isRevision]);
}

template <ElementType E>
void GeneralEigenproblem(Method method) {
    typedef ElementOf<E> T;
    const auto solve = method == Method::Revision ? qx::EigenBlocked<E> : qx::EigenGeneral<E>;
    Ratios ratios(Named<E>("general eigenproblems", method));
    for (const int32_t n : orders) {
        const std::vector<T> a = Random<E>(n);
        std::vector<CDB> w(n), vectors(a.size());
        std::vector<T> v(a.size()), copy = a;
        std::vector<double> reals(2 * n);
        const auto driver = [&](T *work, int32_t length) {
            qx::bench::Geev(n, copy.data(), w.data(), v.data(), work, length, reals.data());
        };
        std::vector<T> work = WorkFor<T>(driver);
        Compare(
            ratios, Named<E>("general", method), n,
            [&] {
                solve({a.data(), n, n}, {w.data(), n}, {vectors.data(), n, n});
            },
            [&] {
                copy = a;
                driver(work.data(), static_cast<int32_t>(work.size()));
            });
    }
    ratios.summary(E == Real ? "dgeev" : "zgeev");
}

template <ElementType E>
void QR(Method method) {
    typedef ElementOf<E> T;
    Ratios ratios(Named<E>("QR factorisations with all of q", method));
    for (const int32_t n : orders) {
        const std::vector<T> a = Random<E>(n);
        std::vector<T> q(a.size()), r(a.size()), tau(n), copy = a;
        const auto factor = [&](T *work, int32_t length) {
            qx::bench::Geqrf(n, copy.data(), tau.data(), work, length);
        };
        const auto form = [&](T *work, int32_t length) {
            qx::bench::Ungqr(n, copy.data(), tau.data(), work, length);
        };
        std::vector<T> work = WorkFor<T>(factor), formWork = WorkFor<T>(form);
        Compare(
            ratios, Named<E>("qr", method), n,
            [&] {
                if (method == Method::Revision)
                    qx::QRDecomposeBlocked<E>({a.data(), n, n}, qx::qrFull, {}, {q.data(), n, n},
                                              {r.data(), n, n});
                else
                    qx::QRDecompose<E>({a.data(), n, n}, qx::qrFull, {q.data(), n, n},
                                       {r.data(), n, n});
            },
            [&] {
                copy = a;
                factor(work.data(), static_cast<int32_t>(work.size()));
                form(formWork.data(), static_cast<int32_t>(formWork.size()));
            });
    }
    ratios.summary(E == Real ? "dgeqrf and dorgqr" : "zgeqrf and zungqr");
}

void Cholesky() {
    const auto dpotrf = qx::bench::PeerRoutine<decltype(dpotrf_)>("dpotrf_");
    Ratios ratios("Cholesky factorisations");
    for (const int32_t n : orders) {
        std::vector<double> a = Hermitian<Real>(n);
        for (int32_t i = 0; i < n; ++i)
            a[static_cast<std::size_t>(i) * (n + 1)] += n;
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

typedef std::vector<std::pair<std::string, std::function<void()>>> Groups;

template <ElementType E>
void AddGroups(Method method, Groups *groups) {
    const auto add = [&](const char *name, const std::function<void()> &run) {
        groups->push_back({(E == Complex ? "complex" : "") + std::string(name) +
                               (method == Method::Revision ? "2026" : ""),
                           run});
    };
    add("svd", [=] { SingularValueDecomposition<E>(true, method); });
    add("values", [=] { SingularValueDecomposition<E>(false, method); });
    add("symmetric", [=] { SymmetricEigenproblem<E>(method); });
    add("general", [=] { GeneralEigenproblem<E>(method); });
    add("qr", [=] { QR<E>(method); });
}

} // namespace

int main(int argc, char **argv) {
    Groups groups;
    for (const Method method : {Method::Elder, Method::Revision})
        AddGroups<Real>(method, &groups);
    for (const Method method : {Method::Elder, Method::Revision})
        AddGroups<Complex>(method, &groups);
    groups.push_back({"cholesky", Cholesky});
    for (const auto &[name, run] : groups)
        if (argc < 2 || std::find(argv + 1, argv + argc, name) != argv + argc)
            run();
}
