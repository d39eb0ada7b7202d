#include "linalg/lapack.h"

#include "linalg/aligned.h"
#include "linalg/blas_memory.h"

// LAPACK's complex elements are ours.
#define lapack_complex_float CSG
#define lapack_complex_double CDB
#include <cblas.h>
#include <lapack.h>

namespace qx {

namespace blas {

ErrorCode Product(int32_t m, int32_t n, int32_t k, const DBL *a, const DBL *b, DBL *c) {
    const BlasMemory memory;
    if (!memory)
        return ErrOutOfMemory;
    cblas_dgemm(CblasRowMajor, CblasNoTrans, CblasNoTrans, m, n, k, 1.0, a, k, b, n, 0.0, c, n);
    return 0;
}

namespace {

ErrorCode ComplexProduct(CBLAS_TRANSPOSE transposition, int32_t m, int32_t n, int32_t k,
                         const CDB *a, const CDB *b, int32_t bCols, CDB *c) {
    const BlasMemory memory;
    if (!memory)
        return ErrOutOfMemory;
    const CDB one = {1.0, 0.0}, zero = {0.0, 0.0};
    cblas_zgemm(CblasRowMajor, CblasNoTrans, transposition, m, n, k, &one, a, k, b, bCols, &zero, c,
                n);
    return 0;
}

} // namespace

ErrorCode Product(int32_t m, int32_t n, int32_t k, const CDB *a, const CDB *b, CDB *c) {
    return ComplexProduct(CblasNoTrans, m, n, k, a, b, n, c);
}

ErrorCode ProductWithConjugate(int32_t m, int32_t n, int32_t k, const CDB *a, const CDB *b,
                               CDB *c) {
    return ComplexProduct(CblasConjTrans, m, n, k, a, b, k, c);
}

} // namespace blas

namespace lapack {

int32_t SolveBand(int32_t n, int32_t lower, int32_t upper, int32_t rightSides, DBL *band,
                  int32_t *pivots, DBL *b) {
    const BlasMemory memory;
    if (!memory)
        return noMemory;
    const int32_t leading = 2 * lower + upper + 1;
    int32_t info = 0;
    LAPACK_dgbsv(&n, &lower, &upper, &rightSides, band, &leading, pivots, b, &n, &info);
    return info;
}

int32_t SolveBand(int32_t n, int32_t lower, int32_t upper, int32_t rightSides, CDB *band,
                  int32_t *pivots, CDB *b) {
    const BlasMemory memory;
    if (!memory)
        return noMemory;
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

// A work query answers in the first element.
int32_t Answer(const DBL *work) { return static_cast<int32_t>(*work); }
int32_t Answer(const CDB *work) { return static_cast<int32_t>(work->re); }

char Job(const void *vectors) { return vectors != nullptr ? 'V' : 'N'; }

} // namespace

int32_t Schur(int32_t n, DBL *t, CDB *w, DBL *z) {
    const BlasMemory memory;
    AlignedScratch<ElementType::DBL> values, work;
    if (!memory || values.allocate(2 * int64_t{n}) != 0)
        return noMemory;
    const char job = Job(z);
    DBL size, *const wi = values.data() + n;
    int32_t info = 0, selected = 0, length = -1;
    LAPACK_dgees(&job, "N", nullptr, &n, t, &n, &selected, values.data(), wi, z, &n, &size, &length,
                 nullptr, &info);
    length = Answer(&size);
    if (work.allocate(length) != 0)
        return noMemory;
    LAPACK_dgees(&job, "N", nullptr, &n, t, &n, &selected, values.data(), wi, z, &n, work.data(),
                 &length, nullptr, &info);
    for (int32_t i = 0; i < n; ++i)
        w[i] = {values[i], wi[i]};
    return info;
}
int32_t Schur(int32_t n, CDB *t, CDB *w, CDB *z) {
    const BlasMemory memory;
    AlignedScratch<ElementType::DBL> real;
    AlignedScratch<ElementType::CDB> work, values;
    if (!memory || real.allocate(n) != 0 || values.allocate(n) != 0)
        return noMemory;
    const char job = Job(z);
    CDB size;
    int32_t info = 0, selected = 0, length = -1;
    LAPACK_zgees(&job, "N", nullptr, &n, t, &n, &selected, values.data(), z, &n, &size, &length,
                 real.data(), nullptr, &info);
    length = Answer(&size);
    if (work.allocate(length) != 0)
        return noMemory;
    LAPACK_zgees(&job, "N", nullptr, &n, t, &n, &selected, values.data(), z, &n, work.data(),
                 &length, real.data(), nullptr, &info);
    for (int32_t i = 0; i < n; ++i)
        w[i] = values[i];
    return info;
}

int32_t MoveInSchur(int32_t n, DBL *t, DBL *z, int32_t from, int32_t to) {
    const BlasMemory memory;
    AlignedScratch<ElementType::DBL> work;
    if (!memory || work.allocate(n) != 0)
        return noMemory;
    const char job = Job(z);
    int32_t info = 0, first = from + 1, last = to + 1;
    LAPACK_dtrexc(&job, &n, t, &n, z, &n, &first, &last, work.data(), &info);
    return info;
}
int32_t MoveInSchur(int32_t n, CDB *t, CDB *z, int32_t from, int32_t to) {
    const BlasMemory memory;
    if (!memory)
        return noMemory;
    const char job = Job(z);
    const int32_t first = from + 1, last = to + 1;
    int32_t info = 0;
    LAPACK_ztrexc(&job, &n, t, &n, z, &n, &first, &last, &info);
    return info;
}

int32_t GeneralisedSchur(int32_t n, DBL *s, DBL *t, CDB *alpha, DBL *beta, DBL *q, DBL *z) {
    const BlasMemory memory;
    AlignedScratch<ElementType::DBL> values, work;
    if (!memory || values.allocate(3 * int64_t{n}) != 0)
        return noMemory;
    DBL size, *const re = values.data(), *const im = re + n, *const divisor = im + n;
    int32_t info = 0, selected = 0, length = -1;
    LAPACK_dgges("V", "V", "N", nullptr, &n, s, &n, t, &n, &selected, re, im, divisor, q, &n, z, &n,
                 &size, &length, nullptr, &info);
    length = Answer(&size);
    if (work.allocate(length) != 0)
        return noMemory;
    LAPACK_dgges("V", "V", "N", nullptr, &n, s, &n, t, &n, &selected, re, im, divisor, q, &n, z, &n,
                 work.data(), &length, nullptr, &info);
    for (int32_t i = 0; i < n; ++i) {
        alpha[i] = {re[i], im[i]};
        beta[i] = divisor[i];
    }
    return info;
}
int32_t GeneralisedSchur(int32_t n, CDB *s, CDB *t, CDB *alpha, CDB *beta, CDB *q, CDB *z) {
    const BlasMemory memory;
    AlignedScratch<ElementType::CDB> values, work;
    AlignedScratch<ElementType::DBL> real;
    if (!memory || values.allocate(2 * int64_t{n}) != 0 || real.allocate(8 * int64_t{n}) != 0)
        return noMemory;
    CDB size, *const dividend = values.data(), *const divisor = dividend + n;
    int32_t info = 0, selected = 0, length = -1;
    LAPACK_zgges("V", "V", "N", nullptr, &n, s, &n, t, &n, &selected, dividend, divisor, q, &n, z,
                 &n, &size, &length, real.data(), nullptr, &info);
    length = Answer(&size);
    if (work.allocate(length) != 0)
        return noMemory;
    LAPACK_zgges("V", "V", "N", nullptr, &n, s, &n, t, &n, &selected, dividend, divisor, q, &n, z,
                 &n, work.data(), &length, real.data(), nullptr, &info);
    for (int32_t i = 0; i < n; ++i) {
        alpha[i] = dividend[i];
        beta[i] = divisor[i];
    }
    return info;
}

int32_t MoveInGeneralisedSchur(int32_t n, DBL *s, DBL *t, DBL *q, DBL *z, int32_t from,
                               int32_t to) {
    const BlasMemory memory;
    AlignedScratch<ElementType::DBL> work;
    const int32_t length = 4 * n + 16, yes = 1;
    if (!memory || work.allocate(length) != 0)
        return noMemory;
    int32_t info = 0, first = from + 1, last = to + 1;
    LAPACK_dtgexc(&yes, &yes, &n, s, &n, t, &n, q, &n, z, &n, &first, &last, work.data(), &length,
                  &info);
    return info;
}
int32_t MoveInGeneralisedSchur(int32_t n, CDB *s, CDB *t, CDB *q, CDB *z, int32_t from,
                               int32_t to) {
    const BlasMemory memory;
    if (!memory)
        return noMemory;
    const int32_t yes = 1, first = from + 1;
    int32_t info = 0, last = to + 1;
    LAPACK_ztgexc(&yes, &yes, &n, s, &n, t, &n, q, &n, z, &n, &first, &last, &info);
    return info;
}

int32_t GeneralisedVectors(int32_t n, const DBL *s, const DBL *t, DBL *z) {
    const BlasMemory memory;
    AlignedScratch<ElementType::DBL> work;
    if (!memory || work.allocate(6 * int64_t{n}) != 0)
        return noMemory;
    int32_t info = 0, found = 0;
    LAPACK_dtgevc("R", "B", nullptr, &n, s, &n, t, &n, nullptr, &n, z, &n, &n, &found, work.data(),
                  &info);
    return info;
}
int32_t GeneralisedVectors(int32_t n, const CDB *s, const CDB *t, CDB *z) {
    const BlasMemory memory;
    AlignedScratch<ElementType::CDB> work;
    AlignedScratch<ElementType::DBL> real;
    if (!memory || work.allocate(2 * int64_t{n}) != 0 || real.allocate(2 * int64_t{n}) != 0)
        return noMemory;
    int32_t info = 0, found = 0;
    LAPACK_ztgevc("R", "B", nullptr, &n, s, &n, t, &n, nullptr, &n, z, &n, &n, &found, work.data(),
                  real.data(), &info);
    return info;
}

int32_t GeneralisedSingular(int32_t m, int32_t n, int32_t p, DBL *a, DBL *b, SingularRanks *ranks,
                            DBL *alpha, DBL *beta, DBL *u, DBL *v, DBL *q) {
    const BlasMemory memory;
    AlignedScratch<ElementType::I32> order;
    AlignedScratch<ElementType::DBL> work;
    if (!memory || order.allocate(n) != 0)
        return noMemory;
    DBL size;
    int32_t info = 0, length = -1, k = 0, l = 0;
    LAPACK_dggsvd3("U", "V", "Q", &m, &n, &p, &k, &l, a, &m, b, &p, alpha, beta, u, &m, v, &p, q,
                   &n, &size, &length, order.data(), &info);
    length = Answer(&size);
    if (work.allocate(length) != 0)
        return noMemory;
    LAPACK_dggsvd3("U", "V", "Q", &m, &n, &p, &k, &l, a, &m, b, &p, alpha, beta, u, &m, v, &p, q,
                   &n, work.data(), &length, order.data(), &info);
    *ranks = {k, l};
    return info;
}
int32_t GeneralisedSingular(int32_t m, int32_t n, int32_t p, CDB *a, CDB *b, SingularRanks *ranks,
                            DBL *alpha, DBL *beta, CDB *u, CDB *v, CDB *q) {
    const BlasMemory memory;
    AlignedScratch<ElementType::I32> order;
    AlignedScratch<ElementType::CDB> work;
    AlignedScratch<ElementType::DBL> real;
    if (!memory || order.allocate(n) != 0 || real.allocate(2 * int64_t{n}) != 0)
        return noMemory;
    CDB size;
    int32_t info = 0, length = -1, k = 0, l = 0;
    LAPACK_zggsvd3("U", "V", "Q", &m, &n, &p, &k, &l, a, &m, b, &p, alpha, beta, u, &m, v, &p, q,
                   &n, &size, &length, real.data(), order.data(), &info);
    length = Answer(&size);
    if (work.allocate(length) != 0)
        return noMemory;
    LAPACK_zggsvd3("U", "V", "Q", &m, &n, &p, &k, &l, a, &m, b, &p, alpha, beta, u, &m, v, &p, q,
                   &n, work.data(), &length, real.data(), order.data(), &info);
    *ranks = {k, l};
    return info;
}

} // namespace lapack

} // namespace qx
