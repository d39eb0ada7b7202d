#include "linalg/systems/banded.h"

#include "linalg/aligned.h"
#include "linalg/lapack.h"

namespace qx {

namespace {

// LAPACK's storage has `lower` more rows at the top, for the fill-in of row exchanges, and is
// stored column by column: each of its columns is one of our rows.
template <ElementType E>
void FillStorage(const ConstMatrixView<E> &band, int32_t lower, const MatrixView<E> &storage) {
    for (int32_t j = 0; j < storage.rows(); ++j) {
        for (int32_t i = 0; i < lower; ++i)
            storage(j, i) = ScalarOf<E>::Of(0.0);
        for (int32_t i = lower; i < storage.cols(); ++i)
            storage(j, i) = band(i - lower, j);
    }
}

// Memory in which LAPACK may read and write a tridiagonal matrix.
struct AlignedDiagonals : Diagonals<true> {
    // Includes memory for that many columns of right sides, transposed.
    ErrorCode take(int32_t n, int32_t columns) {
        return memory.take(Aligned(Sized(lower, n - 1)), Aligned(Sized(main, n)),
                           Aligned(Sized(upper, n - 1)), Aligned(Sized(upper2, n - 2)),
                           Aligned(Sized(pivots, n)), Aligned(Sized(rightSides, columns, n)));
    }
    ScratchParts memory;
    IndexVector pivots;
    RealMatrix rightSides;
};

constexpr auto Real = ElementType::DBL;
constexpr auto Index = ElementType::I32;

} // namespace

template <ElementType E>
ErrorCode SolveBand(const ConstMatrixView<E> &band, int32_t lower, int32_t upper,
                    const MatrixView<E> &b) {
    const int32_t n = band.cols();
    QX_EXPECTS(lower >= 0 && upper >= 0 && band.rows() == lower + upper + 1 && band.rows() <= n);
    QX_EXPECTS(b.rows() == n && !b.isEmpty());
    MatrixView<E> storage, x;
    I32 *pivots;
    ScratchParts memory;
    const int64_t leading = 2 * int64_t{lower} + upper + 1;
    if (leading > std::numeric_limits<int32_t>::max())
        return ErrOutOfMemory;
    if (const ErrorCode failed =
            memory.take(Aligned(Sized(storage, n, static_cast<int32_t>(leading))),
                        Aligned(Sized(x, b.cols(), n)), Aligned(Sized(pivots, n))))
        return failed;
    FillStorage<E>(band, lower, storage);
    CopyTransposed<E>(b, x);
    const int32_t info =
        lapack::SolveBand(n, lower, upper, b.cols(), storage.data(), pivots, x.data());
    if (info != 0)
        return info > 0 ? ErrSingularMatrix : lapack::CodeOf(info);
    CopyTransposed<E>(x, b);
    return 0;
}

ErrorCode FactorTridiagonal(const Diagonals<true> &matrix, IndexVector pivots) {
    const auto n = static_cast<int32_t>(matrix.main.size());
    AlignedDiagonals d;
    if (const ErrorCode failed = d.take(n, 0))
        return failed;
    Copy<Real>(matrix.lower, d.lower);
    Copy<Real>(matrix.main, d.main);
    Copy<Real>(matrix.upper, d.upper);
    const int32_t info = lapack::FactorTridiagonal(n, d.lower.data(), d.main.data(), d.upper.data(),
                                                   d.upper2.data(), d.pivots.data());
    Copy<Real>(d.lower, matrix.lower);
    Copy<Real>(d.main, matrix.main);
    Copy<Real>(d.upper, matrix.upper);
    Copy<Real>(d.upper2, matrix.upper2);
    Copy<Index>(d.pivots, pivots);
    return info == 0 ? 0 : WarnSingular;
}

ErrorCode SolveTridiagonal(bool transposed, const Diagonals<false> &factors,
                           ConstIndexVector pivots, const RealMatrix &b) {
    const int32_t n = b.rows();
    QX_EXPECTS(factors.main.size() == n && pivots.size() == n);
    for (int32_t i = 0; i < n; ++i)
        if (pivots[i] != i + 1 && (pivots[i] != i + 2 || i + 1 == n))
            return ErrIndexOutOfRange;
    AlignedDiagonals d;
    if (const ErrorCode failed = d.take(n, b.cols()))
        return failed;
    Copy<Real>(factors.lower, d.lower);
    Copy<Real>(factors.main, d.main);
    Copy<Real>(factors.upper, d.upper);
    Copy<Real>(factors.upper2, d.upper2);
    Copy<Index>(pivots, d.pivots);
    CopyTransposed<Real>(b, d.rightSides);
    lapack::SolveTridiagonal(transposed, n, b.cols(), d.lower.data(), d.main.data(), d.upper.data(),
                             d.upper2.data(), d.pivots.data(), d.rightSides.data());
    CopyTransposed<Real>(d.rightSides, b);
    return 0;
}

template ErrorCode SolveBand(const ConstRealMatrix &, int32_t, int32_t, const RealMatrix &);
template ErrorCode SolveBand(const ConstComplexMatrix &, int32_t, int32_t, const ComplexMatrix &);

} // namespace qx
