#include "qx/polynomial_roots.h"

#include "frame/export.h"
#include "frame/scratch.h"
#include "poly/complex_roots.h"
#include "poly/multiple_roots.h"
#include "poly/newton_bairstow.h"
#include "poly/simultaneous_roots.h"

namespace qx {
namespace {

// A null handle counts as an empty array.
template <class Handle>
int32_t CountOf(const In<Handle> &guesses) {
    return guesses.identity() == nullptr || guesses.isEmpty() ? 0 : guesses.size();
}

Outcome PolishRoots(In<DBL1D> coef, In<DBL1D> realGuesses, RootLimits newton,
                    In<CDB1D> complexGuesses, RootLimits bairstow, Out<CDB1D> roots) {
    if (coef.isEmpty()) {
        roots.empty();
        return WarnEmptyResult;
    }
    const int32_t realCount = CountOf(realGuesses), complexCount = CountOf(complexGuesses);
    if (realCount > INT32_MAX - complexCount)
        return ErrOutOfMemory;
    if (const Outcome bad = roots.resize(realCount + complexCount))
        return bad;
    Scratch<ElementType::DBL> memory;
    if (const ErrorCode failed = memory.allocate(coef.size()))
        return failed;
    const RealVector derivative(memory.data(), coef.size() - 1);
    PolyDerivative(coef.view(), derivative);
    for (int32_t i = 0; i < realCount; ++i)
        roots.data()[i] = {NewtonRoot(coef.view(), derivative, realGuesses.data()[i], newton), 0.0};
    if (complexCount == 0)
        return 0;
    return BairstowRoots(coef.view(), complexGuesses.view(), bairstow,
                         roots.view().part(realCount, complexCount));
}

Outcome FindRoots(InOut<CDB1D> coef, int32_t maxIterations) {
    if (coef.isEmpty())
        return ErrEmptyInput;
    int32_t count = 0;
    if (const ErrorCode failed = CxPolynomialRoots(coef.view(), maxIterations, coef.view(), &count))
        return failed;
    return coef.resize(count);
}

CDB Widened(double x) { return {x, 0.0}; }
CDB Widened(const CDB &z) { return z; }

template <class Handle, ElementType E>
Outcome CopyOut(VectorView<E> roots, int32_t count, Out<Handle> &out) {
    if (const Outcome bad = out.resize(count))
        return bad;
    for (std::ptrdiff_t i = 0; i < count; ++i)
        out.data()[i] = roots[i];
    return 0;
}

// kept: a failure also empties the coefficients.
template <class Handle>
Outcome RootsWithMultiplicities(InOut<Handle> coef, int32_t refine, double tolerance,
                                Out<CDB1D> refined, Out<CDB1D> simple, Out<I32_1D> multiplicities) {
    if (coef.isEmpty())
        return ErrEmptyInput;
    const int32_t n = coef.size();
    ComplexVector widened;
    MultipleRoots roots;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(widened, n), Sized(roots.refined, n),
                                             Sized(roots.simple, n), Sized(roots.multiplicity, n)))
        return failed;
    for (std::ptrdiff_t k = 0; k < n; ++k)
        widened[k] = Widened(coef.data()[k]);
    if (const ErrorCode failed = FindMultipleRoots(widened, refine != 0, tolerance, &roots))
        return failed;
    if (const Outcome bad = CopyOut(roots.refined, roots.count, refined))
        return bad;
    if (const Outcome bad = CopyOut(roots.simple, roots.count, simple))
        return bad;
    return CopyOut(roots.multiplicity, roots.count, multiplicities);
}

template <class Handle>
Outcome AllRoots(In<Handle> coef, Out<CDB1D> roots, Out<DBL1D> radii) {
    if (coef.isEmpty())
        return ErrEmptyInput;
    ComplexVector widened;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(widened, coef.size())))
        return failed;
    for (std::ptrdiff_t k = 0; k < coef.size(); ++k)
        widened[k] = Widened(coef.data()[k]);
    const int32_t degree = DegreeOf(widened);
    if (degree < 1)
        return ErrBadCoefficients;
    if (const Outcome bad = roots.resize(degree))
        return bad;
    if (const Outcome bad = radii.resize(degree))
        return bad;
    constexpr bool isReal = HandleTraits<Handle>::code == ElementType::DBL;
    return SimultaneousRoots(widened, isReal, roots.view(), radii.view());
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
                    qx::RootLimits{newtonMaxIterations, newtonTolerance}, complexGuesses,
                    qx::RootLimits{bairstowMaxIterations, bairstowTolerance}, roots);
}

int32_t CxPolyRoots_head(CDB1D coef, const int32_t *maxIterations, ErrorCode *err) {
    return InErr(err, qx::FindRoots, coef, *maxIterations);
}

ErrorCode PolyRoots2026_head(DBL1D coef, CDB1D roots, DBL1D radii) {
    return Returned(qx::AllRoots<DBL1D>, coef, roots, radii);
}
ErrorCode CxPolyRoots2026_head(CDB1D coef, CDB1D roots, DBL1D radii) {
    return Returned(qx::AllRoots<CDB1D>, coef, roots, radii);
}

ErrorCode MultPolyRoots_head(DBL1D coef, int32_t refine, double tolerance, CDB1D refined,
                             CDB1D simple, I32_1D multiplicities) {
    return Returned(qx::RootsWithMultiplicities<DBL1D>, coef, refine, tolerance, refined, simple,
                    multiplicities);
}

ErrorCode CxMultPolyRoots_head(CDB1D coef, int32_t refine, double tolerance, CDB1D refined,
                               CDB1D simple, I32_1D multiplicities) {
    return Returned(qx::RootsWithMultiplicities<CDB1D>, coef, refine, tolerance, refined, simple,
                    multiplicities);
}
