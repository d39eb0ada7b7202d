#include "qx/polynomial_roots.h"

#include "frame/export.h"
#include "frame/scratch.h"
#include "poly/complex_roots.h"
#include "poly/multiple_roots.h"
#include "poly/polished_roots.h"

namespace qx {
namespace {

// A null handle counts as an empty array.
template <class Handle>
int32_t CountOf(const In<Handle> &guesses) {
    return guesses.identity() == nullptr || guesses.isEmpty() ? 0 : guesses.size();
}

struct Limit {
    int32_t maxIterations;
    double tolerance;
};

Outcome PolishRoots(In<DBL1D> coef, In<DBL1D> realGuesses, Limit newton, In<CDB1D> complexGuesses,
                    Limit bairstow, Out<CDB1D> roots) {
    if (coef.isEmpty()) {
        roots.empty();
        return WarnEmptyResult;
    }
    const int32_t n = coef.size();
    const int32_t realCount = CountOf(realGuesses), complexCount = CountOf(complexGuesses);
    if (realCount > INT32_MAX - complexCount)
        return ErrOutOfMemory;
    if (const Outcome bad = roots.resize(realCount + complexCount))
        return bad;
    Scratch<ElementType::DBL> derivative;
    if (const ErrorCode failed = derivative.allocate(n))
        return failed;
    PolyDerivative(coef.data(), n, derivative.data());
    for (int32_t i = 0; i < realCount; ++i) {
        DBL root;
        NewtonRoot(coef.data(), n, realGuesses.data()[i], newton.maxIterations, newton.tolerance,
                   &root, derivative.data());
        roots.data()[i] = {root, 0.0};
    }
    if (complexCount == 0)
        return derivative.release();
    int32_t count;
    return Merge(BairstowRoots(coef.data(), n, complexGuesses.data(), complexCount,
                               bairstow.maxIterations, bairstow.tolerance, roots.data() + realCount,
                               &count),
                 derivative.release());
}

Outcome FindRoots(InOut<CDB1D> coef, int32_t maxIterations) {
    int32_t count = 0;
    if (const ErrorCode failed =
            CxPolynomialRoots(coef.data(), coef.size(), maxIterations, coef.data(), &count))
        return failed;
    return coef.resize(count);
}

CDB Widened(double x) { return {x, 0.0}; }
CDB Widened(const CDB &z) { return z; }

template <class Handle>
Outcome CopyOut(const typename Out<Handle>::T *roots, int32_t count, Out<Handle> &out) {
    if (const Outcome bad = out.resize(count))
        return bad;
    for (std::ptrdiff_t i = 0; i < count; ++i)
        out.data()[i] = roots[i];
    return 0;
}

// kept: a failure empties the coefficients, too.
template <class Handle>
Outcome FindMultipleRoots(InOut<Handle> coef, int32_t refine, double tolerance, Out<CDB1D> refined,
                          Out<CDB1D> simple, Out<I32_1D> multiplicities) {
    if (coef.isEmpty())
        return ErrEmptyInput;
    const std::ptrdiff_t n = coef.size();
    Scratch<ElementType::CDB> work;
    if (const ErrorCode failed = work.allocate(3 * int64_t{n}))
        return failed;
    Scratch<ElementType::I32> times;
    if (const ErrorCode failed = times.allocate(n))
        return failed;
    for (std::ptrdiff_t k = 0; k < n; ++k)
        work[k] = Widened(coef.data()[k]);
    int32_t refinedCount = 0, simpleCount = 0;
    if (const ErrorCode failed =
            MultipleRootsComplex(work.data(), static_cast<int32_t>(n), refine, tolerance, &work[n],
                                 &refinedCount, &work[2 * n], times.data(), &simpleCount))
        return failed;
    if (const Outcome bad = CopyOut(&work[n], refinedCount, refined))
        return bad;
    if (const Outcome bad = CopyOut(&work[2 * n], simpleCount, simple))
        return bad;
    if (const Outcome bad = CopyOut(times.data(), simpleCount, multiplicities))
        return bad;
    return Merge(work.release(), times.release());
}

} // namespace
} // namespace qx

using qx::InErr;
using qx::Returned;

ErrorCode PolyRootsNtBst_head(DBL1D coef, DBL1D realGuesses, int32_t newtonMaxIterations,
                              double newtonTolerance, CDB1D complexGuesses,
                              int32_t bairstowMaxIterations, double bairstowTolerance,
                              CDB1D roots) {
    return Returned(qx::PolishRoots, coef, realGuesses,
                    qx::Limit{newtonMaxIterations, newtonTolerance}, complexGuesses,
                    qx::Limit{bairstowMaxIterations, bairstowTolerance}, roots);
}

int32_t CxPolyRoots_head(CDB1D coef, const int32_t *maxIterations, ErrorCode *err) {
    return InErr(err, qx::FindRoots, coef, *maxIterations);
}

ErrorCode MultPolyRoots_head(DBL1D coef, int32_t refine, double tolerance, CDB1D refined,
                             CDB1D simple, I32_1D multiplicities) {
    return Returned(qx::FindMultipleRoots<DBL1D>, coef, refine, tolerance, refined, simple,
                    multiplicities);
}

ErrorCode CxMultPolyRoots_head(CDB1D coef, int32_t refine, double tolerance, CDB1D refined,
                               CDB1D simple, I32_1D multiplicities) {
    return Returned(qx::FindMultipleRoots<CDB1D>, coef, refine, tolerance, refined, simple,
                    multiplicities);
}
