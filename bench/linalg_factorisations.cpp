// Singular values, eigenproblems and factorisations against the LAPACK of OpenBLAS
// (bench/peer_lapack.h), and the revisions of 2026 also against their elders.
//
// bench_linalg_factorisations [GROUP...]: svd, values, symmetric, general, qr, complexsvd, complexvalues,
// hermitian, complexgeneral, complexqr, cholesky; all by default.

#include "bench/lapack_drivers.h"
#include "bench/timing.h"
#include "linalg/eigenproblems/general.h"
#include "linalg/eigenproblems/symmetric.h"
#include "linalg/factorisations/cholesky.h"
#include "linalg/factorisations/qr.h"
#include "linalg/factorisations/svd.h"

#include <algorithm>
#include <array>
#include <cstdint>
#include <cstring>
#include <random>
#include <string>
#include <utility>
#include <vector>

namespace {

using qx::ElementOf;
using qx::ElementType;
using qx::bench::LeastTimes;
using qx::bench::Ratios;
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

// The ratios of an elder and of its revision to their peers, and of the revision to the elder.
class Comparison {
public:
    explicit Comparison(const std::string &what)
        : what_(what), elder_(what), revision_(what + ", revision"),
          overElder_(what + ", revision") {}
    void add(int32_t n, const std::array<double, 3> &times) {
        add(n, {times[0], times[1], times[2], times[2]});
    }
    // Of the elder, the revision, the elder's peer and the revision's.
    void add(int32_t n, const std::array<double, 4> &times) {
        const auto [elder, revision, elderPeer, peer] = times;
        std::printf("%-44s n %5d  elder %12.3f us  ratio %5.2f  revision %12.3f us  ratio %5.2f\n",
                    what_.c_str(), n, elder * 1e6, elder / elderPeer, revision * 1e6,
                    revision / peer);
        std::fflush(stdout);
        const std::string name = "n " + std::to_string(n);
        elder_.add(elder / elderPeer, name);
        revision_.add(revision / peer, name);
        overElder_.add(revision / elder, name);
    }
    void summary(const char *elderPeer, const char *peer) const {
        elder_.summary(elderPeer);
        revision_.summary(peer);
        overElder_.summary("elder");
    }

private:
    std::string what_;
    Ratios elder_, revision_, overElder_;
};

const std::vector<int32_t> orders = {2, 4, 8, 16, 50, 100, 200, 500};

template <ElementType E>
const std::string kind = E == Complex ? "complex " : "";

template <ElementType E>
void SingularValueDecomposition(bool withVectors) {
    typedef ElementOf<E> T;
    Comparison comparison(kind<E> +
                          (withVectors ? "singular value decompositions" : "singular values"));
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
        const auto decompose = [&](qx::SVDScaling scaling) {
            if (withVectors)
                qx::SVDecompose<E>({a.data(), n, n}, {u.data(), n, n}, {s.data(), n},
                                   {v.data(), n, n}, scaling);
            else
                qx::SingularValues<E>({a.data(), n, n}, {s.data(), n}, scaling);
        };
        comparison.add(n, LeastTimes([&] { decompose(qx::SVDScaling::LargeNorms); },
                                     [&] { decompose(qx::SVDScaling::Always); },
                                     [&] {
                                         copy = a;
                                         driver(work.data(), static_cast<int32_t>(work.size()));
                                     }));
    }
    const char *const peer = E == Real ? "dgesvd" : "zgesvd";
    comparison.summary(peer, peer);
}

template <ElementType E>
void SymmetricEigenproblem() {
    typedef ElementOf<E> T;
    Comparison comparison(E == Real ? "symmetric eigenproblems" : "Hermitian eigenproblems");
    for (const int32_t n : orders) {
        const std::vector<T> a = Hermitian<E>(n);
        std::vector<T> v(a.size()), copy = a;
        std::vector<double> w(n), reals(1 + 5 * n + 2 * n * n);
        std::vector<int32_t> integers(3 + 5 * n);
        const auto iterate = [&](T *work, int32_t length) {
            qx::bench::Heev(n, copy.data(), w.data(), work, length, reals.data());
        };
        const auto divide = [&](T *work, int32_t length) {
            qx::bench::Heevd(n, copy.data(), w.data(), work, length, reals.data(), integers.data());
        };
        std::vector<T> work = WorkFor<T>(iterate), more = WorkFor<T>(divide);
        comparison.add(
            n,
            LeastTimes(
                [&] {
                    qx::SymmetricEigen<E>({a.data(), n, n}, {w.data(), n}, {v.data(), n, n});
                },
                [&] {
                    qx::SymmetricEigenBlocked<E>({a.data(), n, n}, {w.data(), n}, {v.data(), n, n});
                },
                [&] {
                    copy = a;
                    iterate(work.data(), static_cast<int32_t>(work.size()));
                },
                [&] {
                    copy = a;
                    divide(more.data(), static_cast<int32_t>(more.size()));
                }));
    }
    comparison.summary(E == Real ? "dsyev" : "zheev", E == Real ? "dsyevd" : "zheevd");
}

template <ElementType E>
void GeneralEigenproblem() {
    typedef ElementOf<E> T;
    Comparison comparison(kind<E> + "general eigenproblems");
    for (const int32_t n : orders) {
        const std::vector<T> a = Random<E>(n);
        std::vector<CDB> w(n), vectors(a.size());
        std::vector<T> v(a.size()), copy = a;
        std::vector<double> reals(2 * n);
        const auto driver = [&](T *work, int32_t length) {
            qx::bench::Geev(n, copy.data(), w.data(), v.data(), work, length, reals.data());
        };
        std::vector<T> work = WorkFor<T>(driver);
        comparison.add(
            n, LeastTimes(
                   [&] {
                       qx::EigenGeneral<E>({a.data(), n, n}, {w.data(), n}, {vectors.data(), n, n});
                   },
                   [&] {
                       qx::EigenBlocked<E>({a.data(), n, n}, {w.data(), n}, {vectors.data(), n, n});
                   },
                   [&] {
                       copy = a;
                       driver(work.data(), static_cast<int32_t>(work.size()));
                   }));
    }
    const char *const peer = E == Real ? "dgeev" : "zgeev";
    comparison.summary(peer, peer);
}

template <ElementType E>
void QR() {
    typedef ElementOf<E> T;
    Comparison comparison(kind<E> + "QR factorisations with all of q");
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
        comparison.add(n, LeastTimes(
                              [&] {
                                  qx::QRDecompose<E>({a.data(), n, n}, qx::qrFull, {q.data(), n, n},
                                                     {r.data(), n, n});
                              },
                              [&] {
                                  qx::QRDecomposeBlocked<E>({a.data(), n, n}, qx::qrFull, {},
                                                            {q.data(), n, n}, {r.data(), n, n});
                              },
                              [&] {
                                  copy = a;
                                  factor(work.data(), static_cast<int32_t>(work.size()));
                                  form(formWork.data(), static_cast<int32_t>(formWork.size()));
                              }));
    }
    const char *const peer = E == Real ? "dgeqrf and dorgqr" : "zgeqrf and zungqr";
    comparison.summary(peer, peer);
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
        const auto [ours, peer] = LeastTimes(
            [&] {
                work = packed;
                qx::PackedCholesky<Real>({work.data(), qx::PackedLength(n)}, n);
            },
            [&] {
                copy = a;
                int32_t info;
                dpotrf("L", &n, copy.data(), &n, &info, 1);
            });
        std::printf("%-44s n %5d        %12.3f us  ratio %5.2f\n", "cholesky", n, ours * 1e6,
                    ours / peer);
        ratios.add(ours / peer, "n " + std::to_string(n));
    }
    ratios.summary("dpotrf");
}

} // namespace

int main(int argc, char **argv) {
    const std::pair<const char *, void (*)()> groups[] = {
        {"svd", [] { SingularValueDecomposition<Real>(true); }},
        {"values", [] { SingularValueDecomposition<Real>(false); }},
        {"symmetric", SymmetricEigenproblem<Real>},
        {"general", GeneralEigenproblem<Real>},
        {"qr", QR<Real>},
        {"complexsvd", [] { SingularValueDecomposition<Complex>(true); }},
        {"complexvalues", [] { SingularValueDecomposition<Complex>(false); }},
        {"hermitian", SymmetricEigenproblem<Complex>},
        {"complexgeneral", GeneralEigenproblem<Complex>},
        {"complexqr", QR<Complex>},
        {"cholesky", Cholesky}};
    for (const auto &[name, run] : groups)
        if (argc < 2 || std::find(argv + 1, argv + argc, std::string(name)) != argv + argc)
            run();
}
