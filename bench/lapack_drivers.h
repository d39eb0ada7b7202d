#ifndef QX_BENCH_LAPACK_DRIVERS_H
#define QX_BENCH_LAPACK_DRIVERS_H

#include "bench/peer_lapack.h"
#include "qx/types.h"

#define lapack_complex_float CSG
#define lapack_complex_double CDB
#include <lapack.h>

#include <cstdint>
#include <cstring>
#include <vector>

namespace qx::bench {

// The peer's drivers for square matrices, by the type of the elements. The work space is an array of elements, whose
// length comes from a query (WorkFor), and `reals`, which only complex drivers use.

inline void Gesvd(char job, int32_t n, double *a, double *s, double *u, double *v, double *work,
                  int32_t length, double *) {
    static const auto dgesvd = PeerRoutine<decltype(dgesvd_)>("dgesvd_");
    int32_t info;
    dgesvd(&job, &job, &n, &n, a, &n, s, u, &n, v, &n, work, &length, &info, 1, 1);
}
inline void Gesvd(char job, int32_t n, CDB *a, double *s, CDB *u, CDB *v, CDB *work, int32_t length,
                  double *reals) {
    static const auto zgesvd = PeerRoutine<decltype(zgesvd_)>("zgesvd_");
    int32_t info;
    zgesvd(&job, &job, &n, &n, a, &n, s, u, &n, v, &n, work, &length, reals, &info, 1, 1);
}

// Eigenvalues and vectors of a symmetric or Hermitian matrix, by the QL iteration.
inline void Heev(int32_t n, double *a, double *w, double *work, int32_t length, double *) {
    static const auto dsyev = PeerRoutine<decltype(dsyev_)>("dsyev_");
    int32_t info;
    dsyev("V", "L", &n, a, &n, w, work, &length, &info, 1, 1);
}
inline void Heev(int32_t n, CDB *a, double *w, CDB *work, int32_t length, double *reals) {
    static const auto zheev = PeerRoutine<decltype(zheev_)>("zheev_");
    int32_t info;
    zheev("V", "L", &n, a, &n, w, work, &length, reals, &info, 1, 1);
}

// The same by divide and conquer.
inline void Heevd(int32_t n, double *a, double *w, double *work, int32_t length, double *,
                  int32_t *integers) {
    static const auto dsyevd = PeerRoutine<decltype(dsyevd_)>("dsyevd_");
    const int32_t count = 3 + 5 * n;
    int32_t info;
    dsyevd("V", "L", &n, a, &n, w, work, &length, integers, &count, &info, 1, 1);
}
inline void Heevd(int32_t n, CDB *a, double *w, CDB *work, int32_t length, double *reals,
                  int32_t *integers) {
    static const auto zheevd = PeerRoutine<decltype(zheevd_)>("zheevd_");
    const int32_t count = 3 + 5 * n, realCount = 1 + 5 * n + 2 * n * n;
    int32_t info;
    zheevd("V", "L", &n, a, &n, w, work, &length, reals, &realCount, integers, &count, &info, 1, 1);
}

// Eigenvalues and right vectors; `reals` receives the values of a real matrix.
inline void Geev(int32_t n, double *a, CDB *, double *v, double *work, int32_t length,
                 double *reals) {
    static const auto dgeev = PeerRoutine<decltype(dgeev_)>("dgeev_");
    int32_t info;
    dgeev("N", "V", &n, a, &n, reals, reals + n, nullptr, &n, v, &n, work, &length, &info, 1, 1);
}
inline void Geev(int32_t n, CDB *a, CDB *w, CDB *v, CDB *work, int32_t length, double *reals) {
    static const auto zgeev = PeerRoutine<decltype(zgeev_)>("zgeev_");
    int32_t info;
    zgeev("N", "V", &n, a, &n, w, nullptr, &n, v, &n, work, &length, reals, &info, 1, 1);
}

inline void Geqrf(int32_t n, double *a, double *tau, double *work, int32_t length) {
    static const auto dgeqrf = PeerRoutine<decltype(dgeqrf_)>("dgeqrf_");
    int32_t info;
    dgeqrf(&n, &n, a, &n, tau, work, &length, &info);
}
inline void Geqrf(int32_t n, CDB *a, CDB *tau, CDB *work, int32_t length) {
    static const auto zgeqrf = PeerRoutine<decltype(zgeqrf_)>("zgeqrf_");
    int32_t info;
    zgeqrf(&n, &n, a, &n, tau, work, &length, &info);
}

// All of q from the reflections of Geqrf.
inline void Ungqr(int32_t n, double *a, double *tau, double *work, int32_t length) {
    static const auto dorgqr = PeerRoutine<decltype(dorgqr_)>("dorgqr_");
    int32_t info;
    dorgqr(&n, &n, &n, a, &n, tau, work, &length, &info);
}
inline void Ungqr(int32_t n, CDB *a, CDB *tau, CDB *work, int32_t length) {
    static const auto zungqr = PeerRoutine<decltype(zungqr_)>("zungqr_");
    int32_t info;
    zungqr(&n, &n, &n, a, &n, tau, work, &length, &info);
}

// The work space of `driver`, which takes its address and its length.
template <class T, class Driver>
std::vector<T> WorkFor(const Driver &driver) {
    T size;
    driver(&size, -1);
    double length;
    std::memcpy(&length, &size, sizeof length); // of a complex number, the real part
    return std::vector<T>(static_cast<std::size_t>(length));
}

} // namespace qx::bench

#endif
