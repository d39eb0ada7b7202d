#include "linalg/lapack.h"

#include "linalg/aligned.h"

// LAPACK's complex types are the library's own.
#define lapack_complex_float CSG
#define lapack_complex_double CDB
#include <lapack.h>

namespace qx {

namespace lapack {

int32_t SolveBand(int32_t n, int32_t lower, int32_t upper, int32_t rightSides, DBL *band,
                  int32_t *pivots, DBL *b) {
    const int32_t leading = 2 * lower + upper + 1;
    int32_t info = 0;
    LAPACK_dgbsv(&n, &lower, &upper, &rightSides, band, &leading, pivots, b, &n, &info);
    return info;
}

int32_t SolveBand(int32_t n, int32_t lower, int32_t upper, int32_t rightSides, CDB *band,
                  int32_t *pivots, CDB *b) {
    const int32_t leading = 2 * lower + upper + 1;
    int32_t info = 0;
    LAPACK_zgbsv(&n, &lower, &upper, &rightSides, band, &leading, pivots, b, &n, &info);
    return info;
}

int32_t FactorTridiagonal(int32_t n, DBL *lower, DBL *diagonal, DBL *upper, DBL *upper2,
                          I32 *pivots) {
    int32_t info = 0;
    LAPACK_dgttrf(&n, lower, diagonal, upper, upper2, pivots, &info);
    return info;
}

int32_t SolveTridiagonal(bool transposed, int32_t n, int32_t rightSides, const DBL *lower,
                         const DBL *diagonal, const DBL *upper, const DBL *upper2,
                         const I32 *pivots, DBL *b) {
    int32_t info = 0;
    LAPACK_dgttrs(transposed ? "T" : "N", &n, &rightSides, lower, diagonal, upper, upper2, pivots,
                  b, &n, &info);
    return info;
}

namespace {

// A work query returns its answer in the first element.
int32_t Answer(const DBL *work) { return static_cast<int32_t>(*work); }
int32_t Answer(const CDB *work) { return static_cast<int32_t>(work->re); }

char Job(const void *vectors) { return vectors != nullptr ? 'V' : 'N'; }

// Asks a driver how much work memory it needs, and calls it with that memory.
template <class T, class Driver>
int32_t WithWork(const Driver &driver) {
    ScratchParts memory;
    T *work, size;
    int32_t info = 0;
    driver(&size, -1, &info);
    const int32_t length = Answer(&size);
    if (memory.take(Aligned(Sized(work, length))) != 0)
        return noMemory;
    driver(work, length, &info);
    return info;
}

} // namespace

int32_t Eigen(int32_t n, DBL *a, CDB *w, DBL *z) {
    ScratchParts results;
    DBL *wr, *wi;
    if (results.take(Aligned(Sized(wr, n)), Aligned(Sized(wi, n))) != 0)
        return noMemory;
    const char job = Job(z);
    const int32_t one = 1;
    const int32_t info = WithWork<DBL>([&](DBL *work, int32_t length, int32_t *status) {
        LAPACK_dgeev("N", &job, &n, a, &n, wr, wi, nullptr, &one, z, &n, work, &length, status);
    });
    for (int32_t i = 0; i < n; ++i)
        w[i] = {wr[i], wi[i]};
    return info;
}
int32_t Eigen(int32_t n, CDB *a, CDB *w, CDB *z) {
    ScratchParts results;
    DBL *real;
    CDB *values;
    if (results.take(Aligned(Sized(real, 2 * int64_t{n})), Aligned(Sized(values, n))) != 0)
        return noMemory;
    const char job = Job(z);
    const int32_t one = 1;
    const int32_t info = WithWork<CDB>([&](CDB *work, int32_t length, int32_t *status) {
        LAPACK_zgeev("N", &job, &n, a, &n, values, nullptr, &one, z, &n, work, &length, real,
                     status);
    });
    for (int32_t i = 0; i < n; ++i)
        w[i] = values[i];
    return info;
}

// The drivers of divide and conquer also require integer work memory.
int32_t SymmetricEigen(int32_t n, DBL *a, DBL *w, bool withVectors) {
    const char job = withVectors ? 'V' : 'N';
    ScratchParts memory;
    DBL *work, size;
    I32 *integers, count;
    int32_t info = 0, length = -1, integerLength = -1;
    LAPACK_dsyevd(&job, "L", &n, a, &n, w, &size, &length, &count, &integerLength, &info);
    length = Answer(&size);
    integerLength = count;
    if (memory.take(Aligned(Sized(work, length)), Aligned(Sized(integers, integerLength))) != 0)
        return noMemory;
    LAPACK_dsyevd(&job, "L", &n, a, &n, w, work, &length, integers, &integerLength, &info);
    return info;
}
int32_t SymmetricEigen(int32_t n, CDB *a, DBL *w, bool withVectors) {
    const char job = withVectors ? 'V' : 'N';
    ScratchParts memory;
    CDB *work, size;
    DBL *real, realSize;
    I32 *integers, count;
    int32_t info = 0, length = -1, realLength = -1, integerLength = -1;
    LAPACK_zheevd(&job, "L", &n, a, &n, w, &size, &length, &realSize, &realLength, &count,
                  &integerLength, &info);
    length = Answer(&size);
    realLength = Answer(&realSize);
    integerLength = count;
    if (memory.take(Aligned(Sized(work, length)), Aligned(Sized(real, realLength)),
                    Aligned(Sized(integers, integerLength))) != 0)
        return noMemory;
    LAPACK_zheevd(&job, "L", &n, a, &n, w, work, &length, real, &realLength, integers,
                  &integerLength, &info);
    return info;
}

int32_t FactorQR(int32_t m, int32_t n, DBL *a, DBL *tau) {
    return WithWork<DBL>([&](DBL *work, int32_t length, int32_t *info) {
        LAPACK_dgeqrf(&m, &n, a, &m, tau, work, &length, info);
    });
}
int32_t FactorQR(int32_t m, int32_t n, CDB *a, CDB *tau) {
    return WithWork<CDB>([&](CDB *work, int32_t length, int32_t *info) {
        LAPACK_zgeqrf(&m, &n, a, &m, tau, work, &length, info);
    });
}
int32_t FactorPivotedQR(int32_t m, int32_t n, DBL *a, I32 *pivots, DBL *tau) {
    for (int32_t j = 0; j < n; ++j) // any column may be exchanged
        pivots[j] = 0;
    return WithWork<DBL>([&](DBL *work, int32_t length, int32_t *info) {
        LAPACK_dgeqp3(&m, &n, a, &m, pivots, tau, work, &length, info);
    });
}
int32_t FactorPivotedQR(int32_t m, int32_t n, CDB *a, I32 *pivots, CDB *tau) {
    ScratchParts memory;
    DBL *real;
    if (memory.take(Aligned(Sized(real, 2 * int64_t{n}))) != 0)
        return noMemory;
    for (int32_t j = 0; j < n; ++j) // any column may be exchanged
        pivots[j] = 0;
    return WithWork<CDB>([&](CDB *work, int32_t length, int32_t *info) {
        LAPACK_zgeqp3(&m, &n, a, &m, pivots, tau, work, &length, real, info);
    });
}
int32_t FormQ(int32_t m, int32_t columns, int32_t reflections, DBL *q, const DBL *tau) {
    return WithWork<DBL>([&](DBL *work, int32_t length, int32_t *info) {
        LAPACK_dorgqr(&m, &columns, &reflections, q, &m, tau, work, &length, info);
    });
}
int32_t FormQ(int32_t m, int32_t columns, int32_t reflections, CDB *q, const CDB *tau) {
    return WithWork<CDB>([&](CDB *work, int32_t length, int32_t *info) {
        LAPACK_zungqr(&m, &columns, &reflections, q, &m, tau, work, &length, info);
    });
}

int32_t Schur(int32_t n, DBL *t, CDB *w, DBL *z) {
    ScratchParts results, working;
    DBL *wr, *wi, *work, size;
    if (results.take(Aligned(Sized(wr, n)), Aligned(Sized(wi, n))) != 0)
        return noMemory;
    const char job = Job(z);
    int32_t info = 0, selected = 0, length = -1;
    LAPACK_dgees(&job, "N", nullptr, &n, t, &n, &selected, wr, wi, z, &n, &size, &length, nullptr,
                 &info);
    length = Answer(&size);
    if (working.take(Aligned(Sized(work, length))) != 0)
        return noMemory;
    LAPACK_dgees(&job, "N", nullptr, &n, t, &n, &selected, wr, wi, z, &n, work, &length, nullptr,
                 &info);
    for (int32_t i = 0; i < n; ++i)
        w[i] = {wr[i], wi[i]};
    return info;
}
int32_t Schur(int32_t n, CDB *t, CDB *w, CDB *z) {
    ScratchParts results, working;
    DBL *real;
    CDB *values, *work, size;
    if (results.take(Aligned(Sized(real, n)), Aligned(Sized(values, n))) != 0)
        return noMemory;
    const char job = Job(z);
    int32_t info = 0, selected = 0, length = -1;
    LAPACK_zgees(&job, "N", nullptr, &n, t, &n, &selected, values, z, &n, &size, &length, real,
                 nullptr, &info);
    length = Answer(&size);
    if (working.take(Aligned(Sized(work, length))) != 0)
        return noMemory;
    LAPACK_zgees(&job, "N", nullptr, &n, t, &n, &selected, values, z, &n, work, &length, real,
                 nullptr, &info);
    for (int32_t i = 0; i < n; ++i)
        w[i] = values[i];
    return info;
}

int32_t MoveInSchur(int32_t n, DBL *t, DBL *z, int32_t from, int32_t to) {
    ScratchParts working;
    DBL *work;
    if (working.take(Aligned(Sized(work, n))) != 0)
        return noMemory;
    const char job = Job(z);
    int32_t info = 0, first = from + 1, last = to + 1;
    LAPACK_dtrexc(&job, &n, t, &n, z, &n, &first, &last, work, &info);
    return info;
}
int32_t MoveInSchur(int32_t n, CDB *t, CDB *z, int32_t from, int32_t to) {
    const char job = Job(z);
    const int32_t first = from + 1, last = to + 1;
    int32_t info = 0;
    LAPACK_ztrexc(&job, &n, t, &n, z, &n, &first, &last, &info);
    return info;
}

int32_t GeneralisedSchur(int32_t n, DBL *s, DBL *t, CDB *alpha, DBL *beta, DBL *q, DBL *z) {
    ScratchParts results, working;
    DBL *re, *im, *divisor, *work, size;
    if (results.take(Aligned(Sized(re, n)), Aligned(Sized(im, n)), Aligned(Sized(divisor, n))) != 0)
        return noMemory;
    int32_t info = 0, selected = 0, length = -1;
    LAPACK_dgges("V", "V", "N", nullptr, &n, s, &n, t, &n, &selected, re, im, divisor, q, &n, z, &n,
                 &size, &length, nullptr, &info);
    length = Answer(&size);
    if (working.take(Aligned(Sized(work, length))) != 0)
        return noMemory;
    LAPACK_dgges("V", "V", "N", nullptr, &n, s, &n, t, &n, &selected, re, im, divisor, q, &n, z, &n,
                 work, &length, nullptr, &info);
    for (int32_t i = 0; i < n; ++i) {
        alpha[i] = {re[i], im[i]};
        beta[i] = divisor[i];
    }
    return info;
}
int32_t GeneralisedSchur(int32_t n, CDB *s, CDB *t, CDB *alpha, CDB *beta, CDB *q, CDB *z) {
    ScratchParts results, working;
    CDB *dividend, *divisor, *work, size;
    DBL *real;
    if (results.take(Aligned(Sized(dividend, n)), Aligned(Sized(divisor, n)),
                     Aligned(Sized(real, 8 * int64_t{n}))) != 0)
        return noMemory;
    int32_t info = 0, selected = 0, length = -1;
    LAPACK_zgges("V", "V", "N", nullptr, &n, s, &n, t, &n, &selected, dividend, divisor, q, &n, z,
                 &n, &size, &length, real, nullptr, &info);
    length = Answer(&size);
    if (working.take(Aligned(Sized(work, length))) != 0)
        return noMemory;
    LAPACK_zgges("V", "V", "N", nullptr, &n, s, &n, t, &n, &selected, dividend, divisor, q, &n, z,
                 &n, work, &length, real, nullptr, &info);
    for (int32_t i = 0; i < n; ++i) {
        alpha[i] = dividend[i];
        beta[i] = divisor[i];
    }
    return info;
}

int32_t MoveInGeneralisedSchur(int32_t n, DBL *s, DBL *t, DBL *q, DBL *z, int32_t from,
                               int32_t to) {
    ScratchParts working;
    DBL *work;
    const int32_t length = 4 * n + 16, yes = 1;
    if (working.take(Aligned(Sized(work, length))) != 0)
        return noMemory;
    int32_t info = 0, first = from + 1, last = to + 1;
    LAPACK_dtgexc(&yes, &yes, &n, s, &n, t, &n, q, &n, z, &n, &first, &last, work, &length, &info);
    return info;
}
int32_t MoveInGeneralisedSchur(int32_t n, CDB *s, CDB *t, CDB *q, CDB *z, int32_t from,
                               int32_t to) {
    const int32_t yes = 1, first = from + 1;
    int32_t info = 0, last = to + 1;
    LAPACK_ztgexc(&yes, &yes, &n, s, &n, t, &n, q, &n, z, &n, &first, &last, &info);
    return info;
}

int32_t GeneralisedVectors(int32_t n, const DBL *s, const DBL *t, DBL *z) {
    ScratchParts working;
    DBL *work;
    if (working.take(Aligned(Sized(work, 6 * int64_t{n}))) != 0)
        return noMemory;
    int32_t info = 0, found = 0;
    LAPACK_dtgevc("R", "B", nullptr, &n, s, &n, t, &n, nullptr, &n, z, &n, &n, &found, work, &info);
    return info;
}
int32_t GeneralisedVectors(int32_t n, const CDB *s, const CDB *t, CDB *z) {
    ScratchParts working;
    CDB *work;
    DBL *real;
    if (working.take(Aligned(Sized(work, 2 * int64_t{n})), Aligned(Sized(real, 2 * int64_t{n}))) !=
        0)
        return noMemory;
    int32_t info = 0, found = 0;
    LAPACK_ztgevc("R", "B", nullptr, &n, s, &n, t, &n, nullptr, &n, z, &n, &n, &found, work, real,
                  &info);
    return info;
}

int32_t GeneralisedSingular(int32_t m, int32_t n, int32_t p, DBL *a, DBL *b,
                            GeneralisedRanks *ranks, DBL *alpha, DBL *beta, DBL *u, DBL *v,
                            DBL *q) {
    ScratchParts results, working;
    I32 *order;
    DBL *work, size;
    if (results.take(Aligned(Sized(order, n))) != 0)
        return noMemory;
    int32_t info = 0, length = -1, k = 0, l = 0;
    LAPACK_dggsvd3("U", "V", "Q", &m, &n, &p, &k, &l, a, &m, b, &p, alpha, beta, u, &m, v, &p, q,
                   &n, &size, &length, order, &info);
    length = Answer(&size);
    if (working.take(Aligned(Sized(work, length))) != 0)
        return noMemory;
    LAPACK_dggsvd3("U", "V", "Q", &m, &n, &p, &k, &l, a, &m, b, &p, alpha, beta, u, &m, v, &p, q,
                   &n, work, &length, order, &info);
    *ranks = {k, l};
    return info;
}
int32_t GeneralisedSingular(int32_t m, int32_t n, int32_t p, CDB *a, CDB *b,
                            GeneralisedRanks *ranks, DBL *alpha, DBL *beta, CDB *u, CDB *v,
                            CDB *q) {
    ScratchParts results, working;
    I32 *order;
    DBL *real;
    CDB *work, size;
    if (results.take(Aligned(Sized(order, n)), Aligned(Sized(real, 2 * int64_t{n}))) != 0)
        return noMemory;
    int32_t info = 0, length = -1, k = 0, l = 0;
    LAPACK_zggsvd3("U", "V", "Q", &m, &n, &p, &k, &l, a, &m, b, &p, alpha, beta, u, &m, v, &p, q,
                   &n, &size, &length, real, order, &info);
    length = Answer(&size);
    if (working.take(Aligned(Sized(work, length))) != 0)
        return noMemory;
    LAPACK_zggsvd3("U", "V", "Q", &m, &n, &p, &k, &l, a, &m, b, &p, alpha, beta, u, &m, v, &p, q,
                   &n, work, &length, real, order, &info);
    *ranks = {k, l};
    return info;
}

} // namespace lapack

} // namespace qx
