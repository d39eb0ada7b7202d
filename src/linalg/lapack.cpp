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

} // namespace lapack

} // namespace qx
