#include "linalg/systems/banded.h"

#include "frame/scratch.h"
#include "linalg/lapack.h"
#include "linalg/matrix.h"

#include <cstring>

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
    if (lower < 0 || upper < 0 || int64_t{lower} + upper > n)
        return ErrSizesDisagree;
    Scratch<E> storage;
    Scratch<ElementType::I32> pivots;
    if (const ErrorCode failed = storage.allocate((2 * int64_t{lower} + upper + 1) * n))
        return failed;
    if (const ErrorCode failed = pivots.allocate(n))
        return failed;
    FillStorage<E>(band, n, lower, upper, storage.data());
    if (const ErrorCode failed = TransposeMatrix(b, n, rightSides, nullptr))
        return failed;
    const int32_t info =
        lapack::SolveBand(n, lower, upper, rightSides, storage.data(), pivots.data(), b);
    if (info != 0)
        return info > 0 ? ErrSingularMatrix : lapack::CodeOf(info);
    return TransposeMatrix(b, rightSides, n, nullptr);
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
    return lapack::FactorTridiagonal(n, lower, diagonal, upper, upper2, pivots) == 0 ? 0
                                                                                     : WarnSingular;
}

ErrorCode SolveTridiagonal(bool transposed, int32_t n, const DBL *lower, const DBL *diagonal,
                           const DBL *upper, const DBL *upper2, const I32 *pivots,
                           int32_t rightSides, DBL *b) {
    for (int32_t i = 0; i < n; ++i)
        if (pivots[i] - 1 != i && (pivots[i] - 1 != i + 1 || i + 1 == n))
            return ErrIndexOutOfRange;
    if (const ErrorCode failed = TransposeMatrix(b, n, rightSides, nullptr))
        return failed;
    lapack::SolveTridiagonal(transposed, n, rightSides, lower, diagonal, upper, upper2, pivots, b);
    return TransposeMatrix(b, rightSides, n, nullptr);
}

} // namespace qx
