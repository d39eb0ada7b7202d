#include "qx/linear_systems.h"

#include "linalg/exports/checks.h"
#include "linalg/systems/banded.h"
#include "linalg/systems/least_squares.h"
#include "linalg/systems/lu.h"
#include "linalg/systems/substitution.h"
#include "linalg/systems/triangular.h"

namespace qx {
namespace {

// kept: of the exports that have an `err`, the last failed check decides

// The older exports do not report a lack of rank.
ErrorCode WithoutRankWarning(ErrorCode status) { return status == WarnRankDeficient ? 0 : status; }

// Checks a square system and its right side, and resizes x.
template <class Matrix, class Vector>
Outcome PrepareSystem(const In<Matrix> &a, const In<Vector> &b, Out<Vector> &x) {
    if (const Outcome bad = LastFailed({{a.isEmpty() || b.isEmpty(), ErrEmptyInput},
                                        {!a.isSquare(), ErrNotSquare},
                                        {b.size() != a.rows(), ErrSizeMismatch}}))
        return bad;
    return x.resize(a.rows());
}
// The same with a right side in each column of b, where the first failed check decides.
template <class Matrix>
Outcome PrepareSystems(const In<Matrix> &a, const In<Matrix> &b, Out<Matrix> &x) {
    if (const Outcome bad = FirstFailed({{a.isEmpty() || b.isEmpty(), ErrEmptyInput},
                                         {!a.isSquare(), ErrNotSquare},
                                         {b.rows() != a.rows(), ErrSizeMismatch}}))
        return bad;
    return x.resize(a.rows(), b.cols());
}

// LU.

template <class Matrix, class Vector>
Outcome SolveLU(In<Matrix> a, In<Vector> b, Out<Vector> x) {
    if (const Outcome bad = PrepareSystem(a, b, x))
        return bad;
    return SolveByLU<elementOf<Matrix>>(a.view(), b.view(), x.view());
}

// kept: nothing is solved; the export always fails, even if its arguments are valid.
template <class Matrix>
Outcome SolveSetLU(In<Matrix> a, In<Matrix> b, Out<Matrix> x) {
    if (const Outcome bad = PrepareSystems(a, b, x))
        return bad;
    return ErrNotAvailable;
}

template <class Matrix>
Outcome SolveSetLU2026(In<Matrix> a, In<Matrix> b, Out<Matrix> x, OutDBL reciprocalCondition) {
    if (const Outcome bad = PrepareSystems(a, b, x))
        return bad;
    return SolveSetByLU<elementOf<Matrix>>(a.view(), b.view(), x.view(),
                                           reciprocalCondition.address());
}

template <class Matrix, class Vector>
Outcome SolveWithFactors(In<Matrix> lu, In<I32_1D> pivots, InOut<Vector> b) {
    if (const Outcome bad =
            LastFailed({{lu.isEmpty() || pivots.isEmpty() || b.isEmpty(), ErrEmptyInput},
                        {!lu.isSquare(), ErrNotSquare},
                        {pivots.size() != lu.rows(), ErrSizeMismatch},
                        {b.size() != lu.rows(), ErrSizeMismatch}}))
        return bad;
    return LUSolve<elementOf<Matrix>>(lu.view(), pivots.view(), AsColumn(b.view()),
                                      AsColumn(b.view()));
}

template <class Matrix>
Outcome Invert(InOut<Matrix> a) {
    if (const Outcome bad = SquareLast(a))
        return bad;
    return InvertByLU<elementOf<Matrix>>(a.view(), a.view());
}

template <class Matrix>
Outcome InvertFromFactors(InOut<Matrix> lu, In<I32_1D> pivots) {
    if (const Outcome bad = LastFailed({{lu.isEmpty() || pivots.isEmpty(), ErrEmptyInput},
                                        {!lu.isSquare(), ErrNotSquare},
                                        {pivots.size() != lu.rows(), ErrSizeMismatch}}))
        return bad;
    return InvertFactors<elementOf<Matrix>>(lu.view(), pivots.view());
}

// Least squares.

template <class Matrix, class Vector>
Outcome SolveLeastSquares(In<Matrix> a, In<Vector> b, Out<Vector> x, double tolerance) {
    if (const Outcome bad = LastFailed(
            {{a.isEmpty() || b.isEmpty(), ErrEmptyInput}, {b.size() != a.rows(), ErrSizeMismatch}}))
        return bad;
    if (const Outcome bad = x.resize(a.cols()))
        return bad;
    return WithoutRankWarning(
        SolveBySVD<elementOf<Matrix>>(a.view(), AsColumn(b.view()), AsColumn(x.view()), tolerance));
}

template <class Matrix, class Vector>
Outcome SolveLeastSquares2026(In<Matrix> a, In<Vector> b, Out<Vector> x, double tolerance) {
    if (const Outcome bad = FirstFailed(
            {{a.isEmpty() || b.isEmpty(), ErrEmptyInput}, {b.size() != a.rows(), ErrSizeMismatch}}))
        return bad;
    if (const Outcome bad = x.resize(a.cols()))
        return bad;
    return SolveScaledBySVD<elementOf<Matrix>>(a.view(), AsColumn(b.view()), AsColumn(x.view()),
                                               tolerance);
}
// `Solve` is SolveBySVD of the elements, or SolveScaledBySVD for the revision.
template <class Matrix, auto Solve>
Outcome SolveLeastSquaresSet(In<Matrix> a, In<Matrix> b, Out<Matrix> x, double tolerance) {
    if (const Outcome bad = FirstFailed(
            {{a.isEmpty() || b.isEmpty(), ErrEmptyInput}, {b.rows() != a.rows(), ErrSizeMismatch}}))
        return bad;
    if (const Outcome bad = x.resize(a.cols(), b.cols()))
        return bad;
    return Solve(a.view(), b.view(), x.view(), tolerance);
}

// Resizes the output that serves as work memory, with `more` elements beyond those of the plain
// method.
Outcome ResizeWork(In<DBL2D> a, Out<DBL1D> &work, int64_t more) {
    const int64_t count = LeastSquaresWork(a.rows(), a.cols()) + more;
    if (count > std::numeric_limits<int32_t>::max())
        return ErrOutOfMemory;
    return work.resize(static_cast<int32_t>(count));
}

Outcome SolveShowingWork(In<DBL2D> a, In<DBL1D> b, Out<DBL1D> x, double tolerance,
                         Out<DBL1D> work) {
    if (const Outcome bad = FirstFailed(
            {{a.isEmpty() || b.isEmpty(), ErrEmptyInput}, {b.size() != a.rows(), ErrSizeMismatch}}))
        return bad;
    if (const Outcome bad = x.resize(a.cols()))
        return bad;
    if (const Outcome bad = ResizeWork(a, work, 0))
        return bad;
    return WithoutRankWarning(SolveBySVDIn(work.view(), a.view(), b.view(), x.view(), tolerance));
}

Outcome SolveRefined(In<DBL2D> a, In<DBL1D> b, Out<DBL1D> x, double tolerance, int32_t refinements,
                     Out<DBL1D> work) {
    if (refinements == 0)
        return SolveShowingWork(a, b, x, tolerance, work);
    if (const Outcome bad = FirstFailed(
            {{a.isEmpty() || b.isEmpty(), ErrEmptyInput}, {b.size() != a.rows(), ErrSizeMismatch}}))
        return bad;
    if (const Outcome bad = x.resize(a.cols()))
        return bad;
    if (const Outcome bad = ResizeWork(a, work, int64_t{a.rows()} + a.cols()))
        return bad;
    return WithoutRankWarning(
        SolveBySVDRefined(work.view(), a.view(), b.view(), x.view(), tolerance, refinements));
}

// Positive definite matrices.

template <class Matrix, class Vector>
Outcome SolveDefinite(In<Matrix> a, In<Vector> b, Out<Vector> x) {
    if (const Outcome bad = PrepareSystem(a, b, x))
        return bad;
    return CholeskySolve<elementOf<Matrix>>(a.view(), upperTriangle, AsColumn(b.view()),
                                            AsColumn(x.view()));
}

template <class Matrix>
Outcome SolveDefiniteSet(In<Matrix> a, bool useUpper, In<Matrix> b, Out<Matrix> x) {
    if (const Outcome bad = PrepareSystems(a, b, x))
        return bad;
    return CholeskySolve<elementOf<Matrix>>(a.view(), useUpper ? upperTriangle : lowerTriangle,
                                            b.view(), x.view());
}

template <class Vector>
Outcome SolveWithCholesky(In<Vector> packedFactor, InOut<Vector> b) {
    const int32_t n = OrderOfPacked(packedFactor.size());
    if (const Outcome bad = LastFailed({{packedFactor.isEmpty() || b.isEmpty(), ErrEmptyInput},
                                        {n < 0, ErrNotSquare},
                                        {n >= 0 && b.size() != n, ErrSizeMismatch}}))
        return bad;
    return Substitute<elementOf<Vector>>(Factors::cholesky, packedFactor.view(),
                                         AsColumn(b.view()));
}

// Triangles.

template <class Matrix>
Outcome SolveTriangleSet(In<Matrix> a, int32_t triangle, In<Matrix> b, Out<Matrix> x) {
    if (const Outcome bad = FirstFailed({{a.isEmpty() || b.isEmpty(), ErrEmptyInput},
                                         {!a.isSquare(), ErrNotSquare},
                                         {b.rows() != a.rows(), ErrSizeMismatch},
                                         {IsNoTriangle(triangle), ErrInvalidSelector}}))
        return bad;
    if (const Outcome bad = x.resize(a.rows(), b.cols()))
        return bad;
    constexpr ElementType E = elementOf<Matrix>;
    VectorView<E> packed;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(packed, PackedLength(a.rows()))))
        return failed;
    PackMatrix<E>(a.view(), Triangle{triangle}, packed);
    CopyMatrix<E>(b.view(), x.view());
    return SolveTriangular<E>(packed, Triangle{triangle}, x.view());
}

template <class Vector>
Outcome SolveTriangle(In<Vector> packed, int32_t triangle, InOut<Vector> b) {
    const int32_t n = OrderOfPacked(packed.size());
    if (const Outcome bad = LastFailed({{packed.isEmpty() || b.isEmpty(), ErrEmptyInput},
                                        {n < 0, ErrNotSquare},
                                        {n >= 0 && b.size() != n, ErrSizeMismatch},
                                        {IsNoTriangle(triangle), ErrInvalidSelector}}))
        return bad;
    return SolveTriangular<elementOf<Vector>>(packed.view(), Triangle{triangle},
                                              AsColumn(b.view()));
}

// Bands.

// One right side or several, as a matrix.
RealMatrix RightSides(const InOut<DBL1D> &b) { return AsColumn(b.view()); }
ComplexMatrix RightSides(const InOut<CDB1D> &b) { return AsColumn(b.view()); }
RealMatrix RightSides(const InOut<DBL2D> &b) { return b.view(); }
ComplexMatrix RightSides(const InOut<CDB2D> &b) { return b.view(); }

template <class Matrix, class RightSide>
Outcome SolveBands(In<Matrix> band, InOut<RightSide> b, int32_t lowerBands, int32_t upperBands) {
    const auto rightSides = RightSides(b);
    const int64_t bands = int64_t{lowerBands} + upperBands + 1;
    if (const Outcome bad = FirstFailed(
            {{band.rows() != bands, ErrSizesDisagree},
             {rightSides.rows() != band.cols(), ErrBandVectorSize},
             {rightSides.isEmpty(), ErrEmptyInput},
             {lowerBands < 0 || upperBands < 0 || bands > band.cols(), ErrSizesDisagree}}))
        return bad;
    return SolveBand<elementOf<Matrix>>(band.view(), lowerBands, upperBands, rightSides);
}

Outcome FactorTridiagonals(InOut<DBL1D> lower, InOut<DBL1D> diag, InOut<DBL1D> upper,
                           Out<DBL1D> upper2, Out<I32_1D> pivots) {
    const int32_t n = diag.size();
    if (const Outcome bad =
            FirstFailed({{n < 3, ErrFewerThanThree},
                         {lower.size() != n - 1 || upper.size() != n - 1, ErrSizesDisagree}}))
        return bad;
    if (const Outcome bad = upper2.resize(n - 2))
        return bad;
    if (const Outcome bad = pivots.resize(n))
        return bad;
    return FactorTridiagonal({lower.view(), diag.view(), upper.view(), upper2.view()},
                             pivots.view());
}

template <class RightSide>
Outcome SolveTridiagonals(bool transposed, In<DBL1D> lower, In<DBL1D> diag, In<DBL1D> upper,
                          In<DBL1D> upper2, In<I32_1D> pivots, InOut<RightSide> b) {
    const int32_t n = diag.size();
    const RealMatrix rightSides = RightSides(b);
    if (const Outcome bad =
            FirstFailed({{n < 3, ErrFewerThanThree},
                         {lower.size() != n - 1 || upper.size() != n - 1, ErrSizesDisagree},
                         {upper2.size() != n - 2 || pivots.size() != n, ErrSizesDisagree},
                         {rightSides.rows() != n || rightSides.cols() < 1, ErrSizesDisagree}}))
        return bad;
    return SolveTridiagonal(transposed, {lower.view(), diag.view(), upper.view(), upper2.view()},
                            pivots.view(), rightSides);
}

} // namespace
} // namespace qx

using qx::InErr;
using qx::InErrWithHost;
using qx::Returned;

int32_t EqsByLUDri_head(DBL2D a, DBL1D b, DBL1D x, ErrorCode *err) {
    return InErrWithHost(err, qx::SolveLU<DBL2D, DBL1D>, a, b, x);
}
int32_t CxEqsByLUDri_head(CDB2D a, CDB1D b, CDB1D x, ErrorCode *err) {
    return InErrWithHost(err, qx::SolveLU<CDB2D, CDB1D>, a, b, x);
}
ErrorCode EqsSetByLUDri_head(DBL2D a, DBL2D b, DBL2D x) {
    return Returned(qx::SolveSetLU<DBL2D>, a, b, x);
}
ErrorCode CxEqsSetByLUDri_head(CDB2D a, CDB2D b, CDB2D x) {
    return Returned(qx::SolveSetLU<CDB2D>, a, b, x);
}
ErrorCode EqsSetByLU2026_head(DBL2D a, DBL2D b, DBL2D x, DBL *reciprocalCondition) {
    return Returned(qx::SolveSetLU2026<DBL2D>, a, b, x, reciprocalCondition);
}
ErrorCode CxEqsSetByLU2026_head(CDB2D a, CDB2D b, CDB2D x, DBL *reciprocalCondition) {
    return Returned(qx::SolveSetLU2026<CDB2D>, a, b, x, reciprocalCondition);
}
int32_t LULinEqs_head(DBL2D lu, I32_1D pivots, DBL1D b, ErrorCode *err) {
    return InErr(err, qx::SolveWithFactors<DBL2D, DBL1D>, lu, pivots, b);
}
int32_t CxLULinEqs_head(CDB2D lu, I32_1D pivots, CDB1D b, ErrorCode *err) {
    return InErr(err, qx::SolveWithFactors<CDB2D, CDB1D>, lu, pivots, b);
}
int32_t InvMatrixLUDri_head(DBL2D a, ErrorCode *err) { return InErr(err, qx::Invert<DBL2D>, a); }
int32_t CxInvMatrixLUDri_head(CDB2D a, ErrorCode *err) { return InErr(err, qx::Invert<CDB2D>, a); }
int32_t LUInvMatrix_head(DBL2D lu, I32_1D pivots, ErrorCode *err) {
    return InErr(err, qx::InvertFromFactors<DBL2D>, lu, pivots);
}
int32_t CxLUInvMatrix_head(CDB2D lu, I32_1D pivots, ErrorCode *err) {
    return InErr(err, qx::InvertFromFactors<CDB2D>, lu, pivots);
}

int32_t GenLinEqs_head(DBL2D a, DBL1D b, DBL1D x, ErrorCode *err) {
    return InErrWithHost(err, qx::SolveLeastSquares<DBL2D, DBL1D>, a, b, x, -1.0);
}
int32_t CxGenLinEqs_head(CDB2D a, CDB1D b, CDB1D x, ErrorCode *err) {
    return InErrWithHost(err, qx::SolveLeastSquares<CDB2D, CDB1D>, a, b, x, -1.0);
}
int32_t GenLinEqs82_head(DBL2D a, DBL1D b, DBL1D x, double tolerance, ErrorCode *err) {
    return InErr(err, qx::SolveLeastSquares<DBL2D, DBL1D>, a, b, x, tolerance);
}
int32_t CxGenLinEqs82_head(CDB2D a, CDB1D b, CDB1D x, double tolerance, ErrorCode *err) {
    return InErr(err, qx::SolveLeastSquares<CDB2D, CDB1D>, a, b, x, tolerance);
}
ErrorCode GenLinEqs2010_head(DBL2D a, DBL1D b, DBL1D x, double tolerance, DBL1D work) {
    return Returned(qx::SolveShowingWork, a, b, x, tolerance, work);
}
ErrorCode GenLinEqsbySVD2011_head(DBL2D a, DBL1D b, DBL1D x, double tolerance, int32_t refinements,
                                  DBL1D work) {
    return Returned(qx::SolveRefined, a, b, x, tolerance, refinements, work);
}
ErrorCode EqsSetBySVDDri_head(DBL2D a, DBL2D b, DBL2D x) {
    return EqsSetBySVDDri82_head(a, b, x, -1.0);
}
ErrorCode CxEqsSetBySVDDri_head(CDB2D a, CDB2D b, CDB2D x) {
    return CxEqsSetBySVDDri82_head(a, b, x, -1.0);
}
ErrorCode EqsSetBySVDDri82_head(DBL2D a, DBL2D b, DBL2D x, double tolerance) {
    return Returned(qx::SolveLeastSquaresSet<DBL2D, qx::SolveBySVD<qx::elementOf<DBL2D>>>, a, b, x,
                    tolerance);
}
ErrorCode CxEqsSetBySVDDri82_head(CDB2D a, CDB2D b, CDB2D x, double tolerance) {
    return Returned(qx::SolveLeastSquaresSet<CDB2D, qx::SolveBySVD<qx::elementOf<CDB2D>>>, a, b, x,
                    tolerance);
}
ErrorCode GenLinEqs2026_head(DBL2D a, DBL1D b, DBL1D x, double tolerance) {
    return Returned(qx::SolveLeastSquares2026<DBL2D, DBL1D>, a, b, x, tolerance);
}
ErrorCode CxGenLinEqs2026_head(CDB2D a, CDB1D b, CDB1D x, double tolerance) {
    return Returned(qx::SolveLeastSquares2026<CDB2D, CDB1D>, a, b, x, tolerance);
}
ErrorCode EqsSetBySVD2026_head(DBL2D a, DBL2D b, DBL2D x, double tolerance) {
    return Returned(qx::SolveLeastSquaresSet<DBL2D, qx::SolveScaledBySVD<qx::elementOf<DBL2D>>>, a,
                    b, x, tolerance);
}
ErrorCode CxEqsSetBySVD2026_head(CDB2D a, CDB2D b, CDB2D x, double tolerance) {
    return Returned(qx::SolveLeastSquaresSet<CDB2D, qx::SolveScaledBySVD<qx::elementOf<CDB2D>>>, a,
                    b, x, tolerance);
}

int32_t EqsByCholeskyDri_head(DBL2D a, DBL1D b, DBL1D x, ErrorCode *err) {
    return InErr(err, qx::SolveDefinite<DBL2D, DBL1D>, a, b, x);
}
int32_t CxEqsByCholeskyDri_head(CDB2D a, CDB1D b, CDB1D x, ErrorCode *err) {
    return InErr(err, qx::SolveDefinite<CDB2D, CDB1D>, a, b, x);
}
ErrorCode EqsSetByCholeskyDri_head(DBL2D a, int32_t useUpper, DBL2D b, DBL2D x) {
    return Returned(qx::SolveDefiniteSet<DBL2D>, a, useUpper != 0, b, x);
}
ErrorCode CxEqsSetByCholeskyDri_head(CDB2D a, int32_t useUpper, CDB2D b, CDB2D x) {
    return Returned(qx::SolveDefiniteSet<CDB2D>, a, useUpper != 0, b, x);
}
int32_t CholeskyLinEqs_head(DBL1D packedFactor, DBL1D b, ErrorCode *err) {
    return InErr(err, qx::SolveWithCholesky<DBL1D>, packedFactor, b);
}
int32_t CxCholeskyLinEqs_head(CDB1D packedFactor, CDB1D b, ErrorCode *err) {
    return InErr(err, qx::SolveWithCholesky<CDB1D>, packedFactor, b);
}

ErrorCode TriEqsSetDri_head(DBL2D a, int32_t triangle, DBL2D b, DBL2D x) {
    return Returned(qx::SolveTriangleSet<DBL2D>, a, triangle, b, x);
}
ErrorCode CxTriEqsSetDri_head(CDB2D a, int32_t triangle, CDB2D b, CDB2D x) {
    return Returned(qx::SolveTriangleSet<CDB2D>, a, triangle, b, x);
}
int32_t TriLinEqs_head(const PackedTriangle *a, DBL1D b, ErrorCode *err) {
    return InErr(err, qx::SolveTriangle<DBL1D>, a->packed, a->triangle, b);
}
int32_t CxTriLinEqs_head(const CxPackedTriangle *a, CDB1D b, ErrorCode *err) {
    return InErr(err, qx::SolveTriangle<CDB1D>, a->packed, a->triangle, b);
}

ErrorCode BandEqsDriH(DBL2D band, DBL1D b, int32_t lowerBands, int32_t upperBands) {
    return Returned(qx::SolveBands<DBL2D, DBL1D>, band, b, lowerBands, upperBands);
}
ErrorCode CxBandEqsDriH(CDB2D band, CDB1D b, int32_t lowerBands, int32_t upperBands) {
    return Returned(qx::SolveBands<CDB2D, CDB1D>, band, b, lowerBands, upperBands);
}
ErrorCode BandEqsSetDriH(DBL2D band, DBL2D b, int32_t lowerBands, int32_t upperBands) {
    return Returned(qx::SolveBands<DBL2D, DBL2D>, band, b, lowerBands, upperBands);
}
ErrorCode CxBandEqsSetDriH(CDB2D band, CDB2D b, int32_t lowerBands, int32_t upperBands) {
    return Returned(qx::SolveBands<CDB2D, CDB2D>, band, b, lowerBands, upperBands);
}

ErrorCode TriDiagLU_head(DBL1D lower, DBL1D diag, DBL1D upper, DBL1D upper2, I32_1D pivots) {
    return Returned(qx::FactorTridiagonals, lower, diag, upper, upper2, pivots);
}
ErrorCode TriDiagEqsByLU_head(int32_t transposed, DBL1D lower, DBL1D diag, DBL1D upper,
                              DBL1D upper2, I32_1D pivots, DBL1D b) {
    return Returned(qx::SolveTridiagonals<DBL1D>, transposed != 0, lower, diag, upper, upper2,
                    pivots, b);
}
ErrorCode TriDiagEqsSetByLU_head(int32_t transposed, DBL1D lower, DBL1D diag, DBL1D upper,
                                 DBL1D upper2, I32_1D pivots, DBL2D b) {
    return Returned(qx::SolveTridiagonals<DBL2D>, transposed != 0, lower, diag, upper, upper2,
                    pivots, b);
}
