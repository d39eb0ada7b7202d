#include "linalg/systems/banded.h"

#include "linalg/aligned.h"
#include "linalg/lapack.h"
#include "linalg/matrix.h"

#include <cstring>
#include <initializer_list>

namespace qx {

namespace {

// LAPACK's storage has `lower` rows more at the top, for what the row exchanges fill in, and stands
// column after column.
template <ElementType E>
void FillStorage(const typename Element<E>::type *band, std::ptrdiff_t n, std::ptrdiff_t lower,
                 std::ptrdiff_t upper, typename Element<E>::type *storage) {
    const std::ptrdiff_t leading = 2 * lower + upper + 1;
    for (std::ptrdiff_t j = 0; j < n; ++j) {
        for (std::ptrdiff_t i = 0; i < lower; ++i)
            storage[j * leading + i] = ScalarOf<E>::Of(0.0);
        for (std::ptrdiff_t i = lower; i < leading; ++i)
            storage[j * leading + i] = band[(i - lower) * n + j];
    }
}

template <ElementType E>
ErrorCode Solve(const typename Element<E>::type *band, int32_t n, int32_t lower, int32_t upper,
                int32_t rightSides, typename Element<E>::type *b) {
    if (n < 1 || rightSides < 1)
        return ErrEmptyInput;
    if (lower < 0 || upper < 0 || int64_t{lower} + upper + 1 > n)
        return ErrSizesDisagree;
    AlignedScratch<E> storage, x;
    AlignedScratch<ElementType::I32> pivots;
    for (const ErrorCode failed : {storage.allocate((2 * int64_t{lower} + upper + 1) * n),
                                   x.allocate(int64_t{n} * rightSides), pivots.allocate(n)})
        if (failed != 0)
            return failed;
    FillStorage<E>(band, n, lower, upper, storage.data());
    TransposeInto(b, n, rightSides, x.data());
    const int32_t info =
        lapack::SolveBand(n, lower, upper, rightSides, storage.data(), pivots.data(), x.data());
    if (info != 0)
        return info > 0 ? ErrSingularMatrix : lapack::CodeOf(info);
    TransposeInto(x.data(), rightSides, n, b);
    return 0;
}

// The three diagonals, the fourth one of the factors, and the pivots, where LAPACK may read them.
class Diagonals {
public:
    ErrorCode allocate(int32_t n) {
        for (const ErrorCode failed : {lower.allocate(n), diagonal.allocate(n), upper.allocate(n),
                                       upper2.allocate(n), pivots.allocate(n)})
            if (failed != 0)
                return failed;
        return 0;
    }
    AlignedScratch<ElementType::DBL> lower, diagonal, upper, upper2;
    AlignedScratch<ElementType::I32> pivots;
};

template <class T>
void Copy(const T *from, int32_t count, T *to) {
    if (count > 0)
        std::memcpy(to, from, sizeof(T) * static_cast<std::size_t>(count));
}

} // namespace

ErrorCode SolveBand(const DBL *band, int32_t n, int32_t lower, int32_t upper, int32_t rightSides,
                    DBL *b) {
    return Solve<ElementType::DBL>(band, n, lower, upper, rightSides, b);
}
ErrorCode SolveBand(const CDB *band, int32_t n, int32_t lower, int32_t upper, int32_t rightSides,
                    CDB *b) {
    return Solve<ElementType::CDB>(band, n, lower, upper, rightSides, b);
}

ErrorCode FactorTridiagonal(int32_t n, DBL *lower, DBL *diagonal, DBL *upper, DBL *upper2,
                            I32 *pivots) {
    Diagonals d;
    if (const ErrorCode failed = d.allocate(n))
        return failed;
    Copy(lower, n - 1, d.lower.data());
    Copy(diagonal, n, d.diagonal.data());
    Copy(upper, n - 1, d.upper.data());
    const int32_t info = lapack::FactorTridiagonal(
        n, d.lower.data(), d.diagonal.data(), d.upper.data(), d.upper2.data(), d.pivots.data());
    Copy(d.lower.data(), n - 1, lower);
    Copy(d.diagonal.data(), n, diagonal);
    Copy(d.upper.data(), n - 1, upper);
    Copy(d.upper2.data(), n - 2, upper2);
    Copy(d.pivots.data(), n, pivots);
    return info == 0 ? 0 : WarnSingular;
}

ErrorCode SolveTridiagonal(bool transposed, int32_t n, const DBL *lower, const DBL *diagonal,
                           const DBL *upper, const DBL *upper2, const I32 *pivots,
                           int32_t rightSides, DBL *b) {
    for (int32_t i = 0; i < n; ++i)
        if (pivots[i] != i + 1 && (pivots[i] != i + 2 || i + 1 == n))
            return ErrIndexOutOfRange;
    Diagonals d;
    AlignedScratch<ElementType::DBL> x;
    if (const ErrorCode failed = d.allocate(n))
        return failed;
    if (const ErrorCode failed = x.allocate(int64_t{n} * rightSides))
        return failed;
    Copy(lower, n - 1, d.lower.data());
    Copy(diagonal, n, d.diagonal.data());
    Copy(upper, n - 1, d.upper.data());
    Copy(upper2, n - 2, d.upper2.data());
    Copy(pivots, n, d.pivots.data());
    TransposeInto(b, n, rightSides, x.data());
    lapack::SolveTridiagonal(transposed, n, rightSides, d.lower.data(), d.diagonal.data(),
                             d.upper.data(), d.upper2.data(), d.pivots.data(), x.data());
    TransposeInto(x.data(), rightSides, n, b);
    return 0;
}

} // namespace qx
