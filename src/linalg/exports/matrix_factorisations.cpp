#include "qx/matrix_factorisations.h"

#include "linalg/exports/checks.h"
#include "linalg/factorisations/balance.h"
#include "linalg/factorisations/cholesky.h"
#include "linalg/factorisations/hessenberg.h"
#include "linalg/factorisations/qr.h"
#include "linalg/factorisations/svd.h"
#include "linalg/systems/lu.h"

#include <algorithm>

namespace qx {
namespace {

// kept: of all exports here that have an `err`, the last failed check decides

template <class Vector>
ErrorCode CheckPacked(const Block<Vector> &packed) {
    return LastFailed({{packed.isEmpty(), ErrEmptyInput},
                       {!packed.isEmpty() && OrderOfPacked(packed.size()) < 0, ErrNotSquare}});
}

template <class Matrix>
Outcome LU(InOut<Matrix> a, Out<I32_1D> pivots, OutI32 parity) {
    if (a.isEmpty())
        return ErrEmptyInput;
    if (const Outcome bad = pivots.resize(a.rows()))
        return bad;
    return LUDecompose<elementOf<Matrix>>(a.view(), pivots.view(), parity.address());
}

template <class Vector>
Outcome Cholesky(InOut<Vector> packed) {
    if (const ErrorCode bad = CheckPacked(packed))
        return bad;
    return PackedCholesky<elementOf<Vector>>(packed.view(), OrderOfPacked(packed.size()));
}

template <class Matrix>
Outcome FullCholesky(InOut<Matrix> a) {
    if (const ErrorCode bad = SquareLast(a))
        return bad;
    constexpr ElementType E = elementOf<Matrix>;
    VectorView<E> packed;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(packed, PackedLength(a.rows()))))
        return failed;
    PackMatrix<E>(a.view(), lowerTriangle, packed);
    const ErrorCode status = PackedCholesky<E>(packed, a.rows());
    ExpandPacked<E>(packed, lowerTriangle, a.view());
    return status;
}

template <class Vector>
Outcome InverseFromFactor(InOut<Vector> packed) {
    if (const ErrorCode bad = CheckPacked(packed))
        return bad;
    return InvertFromCholesky<elementOf<Vector>>(packed.view(), OrderOfPacked(packed.size()));
}

template <ElementType E>
ErrorCode InvertPositiveDefinite(const MatrixView<E> &a, VectorView<E> packed) {
    PackMatrix<E>(a, symmetric, packed);
    if (const ErrorCode failed = PackedCholesky<E>(packed, a.rows()))
        return failed;
    if (const ErrorCode failed = InvertFromCholesky<E>(packed, a.rows()))
        return failed;
    ExpandPacked<E>(packed, hermitian, a);
    return 0;
}

template <class Matrix>
Outcome InversePositiveDefinite(InOut<Matrix> a) {
    if (const ErrorCode bad = SquareLast(a))
        return bad;
    VectorView<elementOf<Matrix>> packed;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(packed, PackedLength(a.rows()))))
        return failed;
    return InvertPositiveDefinite<elementOf<Matrix>>(a.view(), packed);
}

Outcome InversePreallocated(InOut<DBL2D> a, InOut<DBL1D, OnFailure::Keep> work) {
    if (const ErrorCode bad = LastFailed({{a.isEmpty(), ErrEmptyInput},
                                          {!a.isSquare(), ErrNotSquare},
                                          {work.size() < PackedLength(a.rows()), ErrSizeMismatch}}))
        return bad;
    return InvertPositiveDefinite<ElementType::DBL>(a.view(), work.view());
}

template <class Vector>
Outcome InversePackedTriangle(InOut<Vector> packed, int32_t triangle) {
    if (const ErrorCode bad =
            LastFailed({{packed.isEmpty(), ErrEmptyInput},
                        {!packed.isEmpty() && OrderOfPacked(packed.size()) < 0, ErrNotSquare},
                        {IsNoTriangle(triangle), ErrInvalidSelector}}))
        return bad;
    return InvertTriangle<elementOf<Vector>>(packed.view(), OrderOfPacked(packed.size()),
                                             Triangle{triangle});
}

template <class Matrix>
Outcome InverseTriangle(InOut<Matrix> a, int32_t triangle) {
    if (const ErrorCode bad = LastFailed({{a.isEmpty(), ErrEmptyInput},
                                          {!a.isSquare(), ErrNotSquare},
                                          {IsNoTriangle(triangle), ErrInvalidSelector}}))
        return bad;
    constexpr ElementType E = elementOf<Matrix>;
    VectorView<E> packed;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(packed, PackedLength(a.rows()))))
        return failed;
    PackMatrix<E>(a.view(), Triangle{triangle}, packed);
    if (const ErrorCode failed = InvertTriangle<E>(packed, a.rows(), Triangle{triangle}))
        return failed;
    ExpandPacked<E>(packed, Triangle{triangle}, a.view());
    return 0;
}

template <class Matrix>
Outcome QRByAlgorithm(In<Matrix> a, int32_t algorithm, Out<Matrix> q, Out<Matrix> r) {
    if (const ErrorCode bad = LastFailed(
            {{a.isEmpty(), ErrEmptyInput}, {algorithm < 0 || algorithm > 2, ErrInvalidSelector}}))
        return bad;
    const int32_t m = a.rows(), n = a.cols();
    if (const Outcome bad = q.resize(m, m))
        return bad;
    if (const Outcome bad = r.resize(m, n))
        return bad;
    constexpr ElementType E = elementOf<Matrix>;
    if (algorithm == 0)
        return QRDecompose<E>(a.view(), qrFull, q.view(), r.view());
    const GramSchmidt order = algorithm == 1 ? GramSchmidt::Modified : GramSchmidt::Classical;
    return QRByGramSchmidt<E>(a.view(), order, q.view(), r.view());
}

// permutation[pivots[j]][j] = 1
void WritePermutation(ConstIndexVector pivots, const MatrixView<ElementType::I32> &permutation) {
    for (int32_t i = 0; i < permutation.rows(); ++i)
        for (int32_t j = 0; j < permutation.cols(); ++j)
            permutation(i, j) = pivots[j] == i;
}

enum class Reflections { OneByOne, Blocked };
template <class Matrix, Reflections reflections>
Outcome QR(In<Matrix> a, bool pivoting, int32_t form, Out<I32_2D> permutation, Out<Matrix> q,
           Out<Matrix> r) {
    if (const ErrorCode bad = FirstFailed(
            {{a.isEmpty(), ErrEmptyInput}, {form < qrFull || form > qrOnlyR, ErrInvalidSelector}}))
        return bad;
    const int32_t m = a.rows(), n = a.cols();
    const int32_t size = form == qrFull ? m : std::min(m, n);
    if (const Outcome bad = pivoting ? permutation.resize(n, n) : permutation.resize(0, 0))
        return bad;
    if (const Outcome bad = form == qrOnlyR ? q.resize(0, 0) : q.resize(m, size))
        return bad;
    if (const Outcome bad = r.resize(size, n))
        return bad;
    constexpr ElementType E = elementOf<Matrix>;
    constexpr bool isBlocked = reflections == Reflections::Blocked;
    if (!pivoting)
        return isBlocked ? QRDecomposeBlocked<E>(a.view(), QRForm{form}, {}, q.view(), r.view())
                         : QRDecompose<E>(a.view(), QRForm{form}, q.view(), r.view());
    IndexVector pivots;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(pivots, n)))
        return failed;
    const auto decompose = isBlocked ? QRDecomposeBlocked<E> : QRDecomposePivoted<E>;
    if (const ErrorCode failed = decompose(a.view(), QRForm{form}, pivots, q.view(), r.view()))
        return failed;
    WritePermutation(pivots, permutation.view());
    return 0;
}

template <class Matrix>
Outcome SVDInPlace(InOut<Matrix> a, Out<DBL1D> s, Out<Matrix> v) {
    if (const Outcome bad = v.resize(0, 0)) // kept: both are emptied before anything else
        return bad;
    if (const Outcome bad = s.resize(0))
        return bad;
    if (a.isEmpty())
        return ErrEmptyInput;
    const int32_t m = a.rows(), n = a.cols(), k = std::min(m, n);
    constexpr ElementType E = elementOf<Matrix>;
    MatrixView<E> copy;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(copy, m, n)))
        return failed;
    CopyMatrix<E>(a.view(), copy);
    if (const Outcome bad = a.resize(m, k))
        return bad;
    if (const Outcome bad = s.resize(k))
        return bad;
    if (const Outcome bad = v.resize(n, k))
        return bad;
    if (!AllFinite<E>(copy))
        return ErrNonFiniteInput;
    return SVDecompose<E>(copy, a.view(), s.view(), v.view());
}

template <class Matrix, SVDScaling Scaling>
Outcome SVD(In<Matrix> a, bool full, Out<Matrix> u, Out<DBL1D> s, Out<Matrix> v) {
    if (a.isEmpty())
        return ErrEmptyInput;
    const int32_t m = a.rows(), n = a.cols(), k = std::min(m, n);
    if (const Outcome bad = u.resize(m, full ? m : k))
        return bad;
    if (const Outcome bad = s.resize(k))
        return bad;
    if (const Outcome bad = v.resize(n, full ? n : k))
        return bad;
    constexpr ElementType E = elementOf<Matrix>;
    if (!MayBeTaken<E>(a.view(), Scaling))
        return ErrNonFiniteInput;
    return SVDecompose<E>(a.view(), u.view(), s.view(), v.view(), Scaling);
}

template <class Matrix, SVDScaling Scaling>
Outcome SVDValues(In<Matrix> a, Out<DBL1D> s) {
    if (a.isEmpty())
        return ErrEmptyInput;
    if (const Outcome bad = s.resize(std::min(a.rows(), a.cols())))
        return bad;
    constexpr ElementType E = elementOf<Matrix>;
    if (!MayBeTaken<E>(a.view(), Scaling))
        return ErrNonFiniteInput;
    return SingularValues<E>(a.view(), s.view(), Scaling);
}

bool IsNoRange(int32_t low, int32_t high, int32_t n) { return low < 1 || high < low || high > n; }

template <class Matrix>
Outcome Hessenberg(InOut<Matrix> a, int32_t low, int32_t high, Out<Matrix> q) {
    const int32_t n = a.rows();
    if (const ErrorCode bad = FirstFailed({{a.isEmpty(), ErrEmptyInput},
                                           {!a.isSquare(), ErrNotSquare},
                                           {IsNoRange(low, high, n), ErrIndexOutOfRange}}))
        return bad;
    if (const Outcome bad = q.resize(n, n))
        return bad;
    constexpr ElementType E = elementOf<Matrix>;
    const MatrixView<E> h = a.view();
    if (!AllFinite<E>(h))
        return ErrNonFiniteInput;
    if (const ErrorCode failed = ReduceToHessenberg<E>(h, low - 1, high - 1, q.view()))
        return failed;
    for (int32_t i = 2; i < n; ++i)
        for (int32_t j = 0; j < i - 1; ++j)
            h(i, j) = {};
    return 0;
}

enum BalanceJob : int32_t { balanceNothing = 0, balanceBoth = 3 };
bool IsNoJob(int32_t job) { return job < balanceNothing || job > balanceBoth; }
bool Permutes(int32_t job) { return (job & 1) != 0; }
bool Scales(int32_t job) { return (job & 2) != 0; }

// Outside the block, `scale` holds the indices of exchanges counted from 1, as are low and high.
template <class Matrix>
Outcome BalanceMatrix(InOut<Matrix> a, int32_t job, OutI32 low, OutI32 high, Out<DBL1D> scale) {
    const int32_t n = a.rows();
    if (const ErrorCode bad = FirstFailed({{a.isEmpty(), ErrEmptyInput},
                                           {!a.isSquare(), ErrNotSquare},
                                           {IsNoJob(job), ErrInvalidSelector}}))
        return bad;
    if (const Outcome bad = scale.resize(n))
        return bad;
    constexpr ElementType E = elementOf<Matrix>;
    if (!AllFinite<E>(a.view()))
        return ErrNonFiniteInput;
    const RealVector factors = scale.view();
    const Balanced range = Balance<E>(a.view(), Permutes(job), Scales(job), factors);
    const bool single = Permutes(job) && range.low == range.high;
    for (int32_t i = 0; i < n; ++i)
        if (single || i < range.low || i > range.high)
            factors[i] += 1.0;
    low = range.low + 1;
    high = range.high + 1;
    return 0;
}

// Whether an exchange, counted from 1, refers to a row that a matrix of order n does not have.
bool LeavesRows(ConstRealVector exchanges, int32_t n) {
    for (const DBL &exchange : exchanges)
        if (!(exchange >= 1.0 && exchange < n + 1.0))
            return true;
    return false;
}

template <class Matrix>
Outcome VectorsBack(int32_t job, int32_t side, int32_t low, int32_t high, In<DBL1D> scale,
                    InOut<Matrix> v) {
    const int32_t n = v.rows();
    if (const ErrorCode bad = FirstFailed({{v.isEmpty() || scale.isEmpty(), ErrEmptyInput},
                                           {IsNoJob(job), ErrInvalidSelector},
                                           {side != 0 && side != 1, ErrInvalidSelector},
                                           {scale.size() != n, ErrSizeMismatch},
                                           {IsNoRange(low, high, n), ErrIndexOutOfRange}}))
        return bad;
    constexpr ElementType E = elementOf<Matrix>;
    const Balanced range = {low - 1, high - 1};
    const ConstRealVector given = scale.view();
    if (Permutes(job) &&
        (LeavesRows(given.part(0, range.low), n) || LeavesRows(given.part(high, n - high), n)))
        return ErrIndexOutOfRange;
    RealVector fromZero;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(fromZero, n)))
        return failed;
    for (int32_t i = 0; i < n; ++i)
        fromZero[i] = i < range.low || i > range.high ? given[i] - 1.0 : given[i];
    if (Scales(job))
        UndoScaling<E>(fromZero, range, side == 0 ? EigenvectorSide::Right : EigenvectorSide::Left,
                       v.view());
    if (Permutes(job))
        UndoPermutation<E>(fromZero, range, v.view());
    return 0;
}

} // namespace
} // namespace qx

using qx::InErr;
using qx::Returned;
constexpr auto OneByOne = qx::Reflections::OneByOne, Blocked = qx::Reflections::Blocked;
constexpr auto LargeNorms = qx::SVDScaling::LargeNorms;
constexpr auto Always = qx::SVDScaling::Always;

int32_t LU_head(DBL2D a, I32_1D pivots, int32_t *parity, ErrorCode *err) {
    return InErr(err, qx::LU<DBL2D>, a, pivots, parity);
}
int32_t CxLU_head(CDB2D a, I32_1D pivots, int32_t *parity, ErrorCode *err) {
    return InErr(err, qx::LU<CDB2D>, a, pivots, parity);
}

int32_t Cholesky_head(DBL1D packed, ErrorCode *err) {
    return InErr(err, qx::Cholesky<DBL1D>, packed);
}
int32_t CxCholesky_head(CDB1D packed, ErrorCode *err) {
    return InErr(err, qx::Cholesky<CDB1D>, packed);
}
int32_t FullCholesky_head(DBL2D a, ErrorCode *err) {
    return InErr(err, qx::FullCholesky<DBL2D>, a);
}
int32_t CxFullCholesky_head(CDB2D a, ErrorCode *err) {
    return InErr(err, qx::FullCholesky<CDB2D>, a);
}
int32_t Cholesky_InvMatrix_head(DBL1D packedFactor, ErrorCode *err) {
    return InErr(err, qx::InverseFromFactor<DBL1D>, packedFactor);
}
int32_t CxCholesky_InvMatrix_head(CDB1D packedFactor, ErrorCode *err) {
    return InErr(err, qx::InverseFromFactor<CDB1D>, packedFactor);
}
int32_t InvMatrixChoDri_head(DBL2D a, ErrorCode *err) {
    return InErr(err, qx::InversePositiveDefinite<DBL2D>, a);
}
int32_t CxInvMatrixChoDri_head(CDB2D a, ErrorCode *err) {
    return InErr(err, qx::InversePositiveDefinite<CDB2D>, a);
}
int32_t PreallocInvMatrixChoDri_H(DBL2D a, DBL1D packedWork, ErrorCode *err) {
    return InErr(err, qx::InversePreallocated, a, packedWork);
}

int32_t Tri_InvMatrix_head(PackedTriangle *a, ErrorCode *err) {
    return InErr(err, qx::InversePackedTriangle<DBL1D>, a->packed, a->triangle);
}
int32_t CxTri_InvMatrix_head(CxPackedTriangle *a, ErrorCode *err) {
    return InErr(err, qx::InversePackedTriangle<CDB1D>, a->packed, a->triangle);
}
int32_t InvMatrixTriDri_head(DBL2D a, const int32_t *triangle, ErrorCode *err) {
    return InErr(err, qx::InverseTriangle<DBL2D>, a, *triangle);
}
int32_t CxInvMatrixTriDri_head(CDB2D a, const int32_t *triangle, ErrorCode *err) {
    return InErr(err, qx::InverseTriangle<CDB2D>, a, *triangle);
}

int32_t qrd_head(DBL2D a, const int32_t *algorithm, DBL2D q, DBL2D r, ErrorCode *err) {
    return InErr(err, qx::QRByAlgorithm<DBL2D>, a, *algorithm, q, r);
}
int32_t Cxqrd_head(CDB2D a, const int32_t *algorithm, CDB2D q, CDB2D r, ErrorCode *err) {
    return InErr(err, qx::QRByAlgorithm<CDB2D>, a, *algorithm, q, r);
}
ErrorCode QRDecH(DBL2D a, int32_t pivoting, int32_t economy, I32_2D permutation, DBL2D q, DBL2D r) {
    return Returned(qx::QR<DBL2D, OneByOne>, a, pivoting != 0, economy, permutation, q, r);
}
ErrorCode CxQRDecH(CDB2D a, int32_t pivoting, int32_t economy, I32_2D permutation, CDB2D q,
                   CDB2D r) {
    return Returned(qx::QR<CDB2D, OneByOne>, a, pivoting != 0, economy, permutation, q, r);
}

ErrorCode QRDec2026H(DBL2D a, int32_t pivoting, int32_t economy, I32_2D permutation, DBL2D q,
                     DBL2D r) {
    return Returned(qx::QR<DBL2D, Blocked>, a, pivoting != 0, economy, permutation, q, r);
}
ErrorCode CxQRDec2026H(CDB2D a, int32_t pivoting, int32_t economy, I32_2D permutation, CDB2D q,
                       CDB2D r) {
    return Returned(qx::QR<CDB2D, Blocked>, a, pivoting != 0, economy, permutation, q, r);
}

int32_t SVD_head(DBL2D a, DBL1D s, DBL2D v, ErrorCode *err) {
    return InErr(err, qx::SVDInPlace<DBL2D>, a, s, v);
}
int32_t CxSVD_head(CDB2D a, DBL1D s, CDB2D v, ErrorCode *err) {
    return InErr(err, qx::SVDInPlace<CDB2D>, a, s, v);
}
ErrorCode SVDEx_head(DBL2D a, int32_t fullSize, DBL2D u, DBL1D s, DBL2D v) {
    return Returned(qx::SVD<DBL2D, LargeNorms>, a, fullSize != 0, u, s, v);
}
ErrorCode CxSVDEx_head(CDB2D a, int32_t fullSize, CDB2D u, DBL1D s, CDB2D v) {
    return Returned(qx::SVD<CDB2D, LargeNorms>, a, fullSize != 0, u, s, v);
}
int32_t SVDS_head(DBL2D a, DBL1D s, ErrorCode *err) {
    return InErr(err, qx::SVDValues<DBL2D, LargeNorms>, a, s);
}
int32_t CxSVDS_head(CDB2D a, DBL1D s, ErrorCode *err) {
    return InErr(err, qx::SVDValues<CDB2D, LargeNorms>, a, s);
}
ErrorCode SVD2026_head(DBL2D a, int32_t fullSize, DBL2D u, DBL1D s, DBL2D v) {
    return Returned(qx::SVD<DBL2D, Always>, a, fullSize != 0, u, s, v);
}
ErrorCode CxSVD2026_head(CDB2D a, int32_t fullSize, CDB2D u, DBL1D s, CDB2D v) {
    return Returned(qx::SVD<CDB2D, Always>, a, fullSize != 0, u, s, v);
}
ErrorCode SVDS2026_head(DBL2D a, DBL1D s) { return Returned(qx::SVDValues<DBL2D, Always>, a, s); }
ErrorCode CxSVDS2026_head(CDB2D a, DBL1D s) { return Returned(qx::SVDValues<CDB2D, Always>, a, s); }

ErrorCode Hessenberg_head(DBL2D a, int32_t low, int32_t high, DBL2D q) {
    return Returned(qx::Hessenberg<DBL2D>, a, low, high, q);
}
ErrorCode CxHessenberg_head(CDB2D a, int32_t low, int32_t high, CDB2D q) {
    return Returned(qx::Hessenberg<CDB2D>, a, low, high, q);
}
ErrorCode MatrixBalance_head(DBL2D a, int32_t job, int32_t *low, int32_t *high, DBL1D scale) {
    return Returned(qx::BalanceMatrix<DBL2D>, a, job, low, high, scale);
}
ErrorCode CxMatrixBalance_head(CDB2D a, int32_t job, int32_t *low, int32_t *high, DBL1D scale) {
    return Returned(qx::BalanceMatrix<CDB2D>, a, job, low, high, scale);
}
ErrorCode EigenVBack_head(int32_t job, int32_t side, int32_t low, int32_t high, DBL1D scale,
                          DBL2D v) {
    return Returned(qx::VectorsBack<DBL2D>, job, side, low, high, scale, v);
}
ErrorCode CxEigenVBack_head(int32_t job, int32_t side, int32_t low, int32_t high, DBL1D scale,
                            CDB2D v) {
    return Returned(qx::VectorsBack<CDB2D>, job, side, low, high, scale, v);
}
