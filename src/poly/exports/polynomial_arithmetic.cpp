#include "qx/polynomial_arithmetic.h"

#include "frame/constants.h"
#include "frame/export.h"
#include "frame/scratch.h"
#include "poly/arithmetic.h"
#include "poly/complex_arithmetic.h"
#include "poly/evaluation.h"
#include "poly/nearest_divisor.h"
#include "poly/partial_fractions.h"

#include <algorithm>

namespace qx {
namespace {

template <class Handle>
int32_t LengthOf(const Block<Handle> &p) {
    return p.isEmpty() ? 0 : p.size();
}
template <class View>
int64_t ElementsOf(const View &view) {
    if constexpr (requires { view.rows(); })
        return view.isEmpty() ? 0 : int64_t{view.rows()} * view.cols();
    else
        return LengthOf(view);
}
template <class View>
bool IsAllFinite(const View &view) {
    const typename View::T *const elements = view.data();
    const int64_t count = ElementsOf(view);
    for (std::ptrdiff_t i = 0; i < count; ++i)
        if (!IsFinite(elements[i]))
            return false;
    return true;
}
template <class... Views>
ErrorCode OverflowIn(const Views &...results) {
    return (IsAllFinite(results) && ...) ? 0 : ErrOverflow;
}

template <class Handle>
using ScalarIn = typename ScalarOf<HandleTraits<Handle>::code>::type;
template <class Handle>
ScalarIn<Handle> Number(double real) {
    return ScalarOf<HandleTraits<Handle>::code>::Of(real);
}

// The polynomial 0, or another constant.
template <class Handle>
Outcome GiveConstant(Out<Handle> &p, ScalarIn<Handle> value) {
    if (const Outcome bad = p.resize(1))
        return bad;
    p.data()[0] = value;
    return 0;
}

template <class Handle>
int32_t LengthWithoutZerosOf(const In<Handle> &p) {
    return LengthWithoutZeros<HandleTraits<Handle>::code>(p.view());
}

enum class Sign { Plus, Minus };

template <class Handle, Sign sign>
Outcome Sum(In<Handle> p, In<Handle> q, Out<Handle> r) {
    if (!IsAllFinite(p) || !IsAllFinite(q))
        return ErrNonFiniteInput;
    const std::ptrdiff_t m = LengthOf(p), n = LengthOf(q);
    if (const Outcome bad = r.resize(static_cast<int32_t>(std::max(m, n))))
        return bad;
    for (std::ptrdiff_t i = 0; i < std::max(m, n); ++i) {
        const ScalarIn<Handle> a = i < m ? p.data()[i] : Number<Handle>(0.0);
        const ScalarIn<Handle> b = i < n ? q.data()[i] : Number<Handle>(0.0);
        r.data()[i] = sign == Sign::Plus ? a + b : a - b;
    }
    return OverflowIn(r);
}

template <class Handle>
Outcome Multiply(In<Handle> p, In<Handle> q, Out<Handle> r) {
    if (!IsAllFinite(p) || !IsAllFinite(q))
        return ErrNonFiniteInput;
    if (p.isEmpty() || q.isEmpty())
        return GiveConstant(r, Number<Handle>(0.0));
    const int64_t length = int64_t{p.size()} + q.size() - 1;
    if (length > INT32_MAX)
        return ErrLengthTooLarge;
    if (const Outcome bad = r.resize(static_cast<int32_t>(length)))
        return bad;
    PolynomialProduct<HandleTraits<Handle>::code>(p.view(), q.view(), r.view());
    return OverflowIn(r);
}

// Computes the quotient, and the remainder at the front of `work`. The divisor has n >= 1
// coefficients without zeros at the top.
template <class Handle>
Outcome DivideInto(const In<Handle> &p, const In<Handle> &q, int32_t n, Out<Handle> &quotient,
                   Scratch<HandleTraits<Handle>::code> &work) {
    const int32_t m = LengthWithoutZerosOf(p);
    if (const ErrorCode failed = work.allocate(std::max(m, n)))
        return failed;
    for (std::ptrdiff_t i = 0; i < std::max(m, n); ++i)
        work[i] = i < m ? ScalarIn<Handle>(p.data()[i]) : Number<Handle>(0.0);
    if (m < n)
        return GiveConstant(quotient, Number<Handle>(0.0));
    if (const Outcome bad = quotient.resize(m - n + 1))
        return bad;
    DivideInPlace<HandleTraits<Handle>::code>({work.data(), m}, q.view().part(0, n),
                                              quotient.view());
    return 0;
}

template <class Handle>
Outcome Divide(In<Handle> p, In<Handle> q, Out<Handle> quotient, Out<Handle> remainder) {
    if (q.isEmpty())
        return ErrEmptyInput;
    if (!IsAllFinite(p) || !IsAllFinite(q))
        return ErrNonFiniteInput;
    const int32_t n = LengthWithoutZerosOf(q);
    if (n == 0)
        return ErrAllCoefficientsZero;
    Scratch<HandleTraits<Handle>::code> work;
    if (const Outcome bad = DivideInto(p, q, n, quotient, work))
        return bad;
    if (n == 1) {
        if (const Outcome bad = GiveConstant(remainder, Number<Handle>(0.0)))
            return bad;
    } else {
        if (const Outcome bad = remainder.resize(n - 1))
            return bad;
        for (std::ptrdiff_t i = 0; i < n - 1; ++i)
            remainder.data()[i] = work[i];
    }
    return Merge(OverflowIn(quotient, remainder), work.release());
}

double ToleranceOr(double tolerance) { return tolerance > 0.0 ? tolerance : 1e-10; }
bool IsInfinite(double tolerance) { return tolerance == kInfinity; }

CDB Widened(double x) { return {x, 0.0}; }
CDB Widened(const CDB &z) { return z; }
void Narrow(CDB value, DBL *out) { *out = value.re; }
void Narrow(CDB value, CDB *out) { *out = value; }

// p divided by its last coefficient, which becomes exactly 1.
template <class Handle>
Outcome GiveMonic(const CDB *p, int32_t n, Out<Handle> &monic) {
    if (const Outcome bad = monic.resize(n))
        return bad;
    for (std::ptrdiff_t i = 0; i < n; ++i)
        Narrow(Quotient(p[i], p[n - 1]), &monic.data()[i]);
    monic.data()[n - 1] = Number<Handle>(1.0);
    return OverflowIn(monic);
}

// Two operands as complex polynomials without zeros at the top, in one block.
template <class Handle>
class Operands {
public:
    ErrorCode assign(const In<Handle> &p, const In<Handle> &q) {
        m_ = LengthWithoutZerosOf(p);
        n_ = LengthWithoutZerosOf(q);
        if (const ErrorCode failed = block_.allocate(int64_t{m_} + n_))
            return failed;
        for (std::ptrdiff_t i = 0; i < m_; ++i)
            block_[i] = Widened(p.data()[i]);
        for (std::ptrdiff_t i = 0; i < n_; ++i)
            block_[m_ + i] = Widened(q.data()[i]);
        while (m_ > 0 && n_ > 0 && IsZero(p.data()[zeros_]) && IsZero(q.data()[zeros_]))
            ++zeros_;
        return 0;
    }
    const CDB *p() const { return block_.data(); }
    const CDB *q() const { return block_.data() + m_; }
    int32_t m() const { return m_; }
    int32_t n() const { return n_; }
    // The number of times that x divides both.
    int32_t zeros() const { return zeros_; }
    ErrorCode findDivisor(double tolerance, NearestDivisor &divisor) const {
        return divisor.find({p() + zeros_, m_ - zeros_}, {q() + zeros_, n_ - zeros_}, tolerance);
    }

private:
    Scratch<ElementType::CDB> block_;
    int32_t m_ = 0, n_ = 0, zeros_ = 0;
};

template <class Handle>
Outcome CommonDivisorOf(In<Handle> p, In<Handle> q, double tolerance, Out<Handle> gcd,
                        OutDBL distance) {
    if (p.isEmpty() || q.isEmpty())
        return ErrEmptyInput;
    if (!IsAllFinite(p) || !IsAllFinite(q) || IsInfinite(tolerance))
        return ErrNonFiniteInput;
    Operands<Handle> operands;
    if (LengthWithoutZerosOf(p) == 0 && LengthWithoutZerosOf(q) == 0)
        return ErrAllCoefficientsZero;
    if (const ErrorCode failed = operands.assign(p, q))
        return failed;
    distance = 0.0;
    if (operands.m() == 0 || operands.n() == 0)
        return GiveMonic(operands.p(), operands.m() + operands.n(), gcd);
    NearestDivisor divisor;
    if (const ErrorCode failed = operands.findDivisor(ToleranceOr(tolerance), divisor))
        return failed;
    distance = divisor.distance();
    const int32_t degree = divisor.degree(), zeros = operands.zeros();
    Scratch<ElementType::CDB> ascending;
    if (const ErrorCode failed = ascending.allocate(int64_t{zeros} + degree + 1))
        return failed;
    for (std::ptrdiff_t i = 0; i < zeros; ++i)
        ascending[i] = {};
    for (std::ptrdiff_t i = 0; i <= degree; ++i)
        ascending[zeros + i] = divisor.divisor()[degree - i];
    return GiveMonic(ascending.data(), zeros + degree + 1, gcd);
}

Outcome CommonMultipleOf(In<DBL1D> p, In<DBL1D> q, double tolerance, Out<DBL1D> lcm) {
    if (p.isEmpty() || q.isEmpty())
        return ErrEmptyInput;
    if (!IsAllFinite(p) || !IsAllFinite(q) || IsInfinite(tolerance))
        return ErrNonFiniteInput;
    const int32_t m = LengthWithoutZerosOf(p);
    if (m == 0 || LengthWithoutZerosOf(q) == 0)
        return ErrAllCoefficientsZero;
    Operands<DBL1D> operands;
    if (const ErrorCode failed = operands.assign(p, q))
        return failed;
    NearestDivisor divisor;
    if (const ErrorCode failed = operands.findDivisor(ToleranceOr(tolerance), divisor))
        return failed;
    // Both factors are made monic, so that the product is monic.
    const int32_t degree = divisor.cofactorDegree();
    const CDB *const cofactor = divisor.cofactorOfQ();
    RealVector monic, other;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(monic, m), Sized(other, int64_t{degree} + 1)))
        return failed;
    for (std::ptrdiff_t i = 0; i < m; ++i)
        monic[i] = p.data()[i] / p.data()[m - 1];
    for (std::ptrdiff_t i = 0; i <= degree; ++i)
        other[i] = cofactor[degree - i].re / cofactor[0].re;
    if (const Outcome bad = lcm.resize(m + degree))
        return bad;
    PolynomialProduct<ElementType::DBL>(monic, other, lcm.view());
    return OverflowIn(lcm);
}

template <ElementType E>
void Evaluate(ConstVectorView<E> p, ConstVectorView<E> x, VectorView<E> y) {
    const auto n = static_cast<int32_t>(p.size());
    if constexpr (E == ElementType::DBL)
        EvaluateReal(p.data(), n, x.data(), x.size(), y.data());
    else
        EvaluateComplex(p.data(), n, x.data(), x.size(), y.data());
}

template <class Handle>
Outcome EvaluateAtPoints(In<Handle> p, In<Handle> x, Out<Handle> y) {
    if (p.isEmpty())
        return ErrEmptyInput;
    if (!IsAllFinite(p))
        return ErrNonFiniteInput;
    if (const Outcome bad = y.resize(LengthOf(x)))
        return bad;
    Evaluate<HandleTraits<Handle>::code>(p.view(), x.view(), y.view());
    return 0;
}

enum MatrixMode : int32_t { EachElement = 0, OfMatrix = 1 };

template <class Handle, class Matrix>
Outcome EvaluateMatrix(In<Handle> p, In<Matrix> a, int32_t mode, Out<Matrix> y) {
    constexpr ElementType code = HandleTraits<Handle>::code;
    if (const ErrorCode bad =
            FirstFailed({{p.isEmpty(), ErrEmptyInput},
                         {mode != EachElement && mode != OfMatrix, ErrInvalidSelector},
                         {mode == OfMatrix && !a.isSquare(), ErrNotSquare}}))
        return bad;
    if (!IsAllFinite(p) || !IsAllFinite(a))
        return ErrNonFiniteInput;
    if (a.isEmpty())
        return y.resize(0, 0);
    if (const Outcome bad = y.resize(a.rows(), a.cols()))
        return bad;
    if (mode == EachElement) {
        Evaluate<code>(p.view(), a.view().elements(), y.view().elements());
        return 0;
    }
    if (const ErrorCode failed = EvaluateAtMatrix<code>(p.view(), a.view(), y.view()))
        return failed;
    return OverflowIn(y);
}

template <class Handle>
Outcome Derivative(In<Handle> p, int32_t order, Out<Handle> q) {
    if (const ErrorCode bad =
            FirstFailed({{p.isEmpty(), ErrEmptyInput}, {order < 0, ErrNegativeCount}}))
        return bad;
    if (!IsAllFinite(p))
        return ErrNonFiniteInput;
    if (order >= p.size())
        return GiveConstant(q, Number<Handle>(0.0));
    if (const Outcome bad = q.resize(p.size() - order))
        return bad;
    Differentiate<HandleTraits<Handle>::code>(p.view(), order, q.view());
    return OverflowIn(q);
}

template <class Handle>
Outcome Integral(In<Handle> p, ScalarIn<Handle> constant, Out<Handle> q) {
    if (p.isEmpty())
        return ErrEmptyInput;
    if (!IsAllFinite(p) || !IsFinite(constant))
        return ErrNonFiniteInput;
    if (p.size() == INT32_MAX)
        return ErrLengthTooLarge;
    if (const Outcome bad = q.resize(p.size() + 1))
        return bad;
    q.data()[0] = constant;
    for (std::ptrdiff_t k = 0; k < p.size(); ++k)
        q.data()[k + 1] = p.data()[k] / (double(k) + 1.0);
    return 0;
}

template <class Handle>
Outcome Composition(In<Handle> p, In<Handle> q, Out<Handle> r) {
    if (!IsAllFinite(p) || !IsAllFinite(q))
        return ErrNonFiniteInput;
    if (p.isEmpty() || q.isEmpty())
        return GiveConstant(r, p.isEmpty() ? Number<Handle>(0.0) : ScalarIn<Handle>(p.data()[0]));
    const int64_t length = (int64_t{p.size()} - 1) * (q.size() - 1) + 1;
    if (length > INT32_MAX)
        return ErrLengthTooLarge;
    if (const Outcome bad = r.resize(static_cast<int32_t>(length)))
        return bad;
    if (const ErrorCode failed = Compose<HandleTraits<Handle>::code>(p.view(), q.view(), r.view()))
        return failed;
    return OverflowIn(r);
}

template <class Handle>
Outcome ProductOfRoots(In<CDB1D> roots, Out<Handle> p) {
    if (!IsAllFinite(roots))
        return ErrNonFiniteInput;
    const int32_t n = LengthOf(roots);
    if (n == 0)
        return GiveConstant(p, Number<Handle>(1.0));
    if (n == INT32_MAX)
        return ErrLengthTooLarge;
    if (const Outcome bad = p.resize(n + 1))
        return bad;
    if (const ErrorCode failed = FromRoots(roots.view(), p.view()))
        return failed;
    return OverflowIn(p);
}

Outcome Fractions(In<DBL1D> numerator, In<DBL1D> denominator, double tolerance,
                  Out<DBL1D> polynomial, Out<CDB1D> poles, Out<CDB1D> residues) {
    if (numerator.isEmpty() || denominator.isEmpty())
        return ErrEmptyInput;
    if (!IsAllFinite(numerator) || !IsAllFinite(denominator) || IsInfinite(tolerance))
        return ErrNonFiniteInput;
    const int32_t n = LengthWithoutZerosOf(denominator);
    if (n == 0)
        return ErrAllCoefficientsZero;
    Scratch<ElementType::DBL> remainder;
    if (const Outcome bad = DivideInto(numerator, denominator, n, polynomial, remainder))
        return bad;
    if (const Outcome bad = poles.resize(n - 1))
        return bad;
    if (const Outcome bad = residues.resize(n - 1))
        return bad;
    if (n > 1)
        if (const ErrorCode failed =
                PolesAndResidues({remainder.data(), n - 1}, denominator.view().part(0, n),
                                 ToleranceOr(tolerance), poles.view(), residues.view()))
            return failed;
    return Merge(OverflowIn(polynomial, poles, residues), remainder.release());
}

} // namespace
} // namespace qx

using qx::Returned;
using qx::Sign;

ErrorCode AddPolyH(DBL1D p, DBL1D q, DBL1D r) {
    return Returned(qx::Sum<DBL1D, Sign::Plus>, p, q, r);
}
ErrorCode CxAddPolyH(CDB1D p, CDB1D q, CDB1D r) {
    return Returned(qx::Sum<CDB1D, Sign::Plus>, p, q, r);
}

ErrorCode SubtractPolyH(DBL1D p, DBL1D q, DBL1D r) {
    return Returned(qx::Sum<DBL1D, Sign::Minus>, p, q, r);
}
ErrorCode CxSubtractPolyH(CDB1D p, CDB1D q, CDB1D r) {
    return Returned(qx::Sum<CDB1D, Sign::Minus>, p, q, r);
}

ErrorCode MultiplyPolyH(DBL1D p, DBL1D q, DBL1D r) {
    return Returned(qx::Multiply<DBL1D>, p, q, r);
}
ErrorCode CxMultiplyPolyH(CDB1D p, CDB1D q, CDB1D r) {
    return Returned(qx::Multiply<CDB1D>, p, q, r);
}

ErrorCode DividePolyH(DBL1D p, DBL1D q, DBL1D quotient, DBL1D remainder) {
    return Returned(qx::Divide<DBL1D>, p, q, quotient, remainder);
}
ErrorCode CxDividePolyH(CDB1D p, CDB1D q, CDB1D quotient, CDB1D remainder) {
    return Returned(qx::Divide<CDB1D>, p, q, quotient, remainder);
}

ErrorCode PolyGCD_H(DBL1D p, DBL1D q, double tolerance, DBL1D gcd, double *distance) {
    return Returned(qx::CommonDivisorOf<DBL1D>, p, q, tolerance, gcd, distance);
}
ErrorCode CxPolyGCD_H(CDB1D p, CDB1D q, double tolerance, CDB1D gcd, double *distance) {
    return Returned(qx::CommonDivisorOf<CDB1D>, p, q, tolerance, gcd, distance);
}

ErrorCode PolyLCM_H(DBL1D p, DBL1D q, double tolerance, DBL1D lcm) {
    return Returned(qx::CommonMultipleOf, p, q, tolerance, lcm);
}

ErrorCode PolyEv(DBL1D p, DBL1D x, DBL1D y) {
    return Returned(qx::EvaluateAtPoints<DBL1D>, p, x, y);
}
ErrorCode CxPolyEv(CDB1D p, CDB1D x, CDB1D y) {
    return Returned(qx::EvaluateAtPoints<CDB1D>, p, x, y);
}

ErrorCode EvPoly2D(DBL1D p, DBL2D a, int32_t mode, DBL2D y) {
    return Returned(qx::EvaluateMatrix<DBL1D, DBL2D>, p, a, mode, y);
}
ErrorCode CxEvPoly2D(CDB1D p, CDB2D a, int32_t mode, CDB2D y) {
    return Returned(qx::EvaluateMatrix<CDB1D, CDB2D>, p, a, mode, y);
}

ErrorCode PolyDerivativeH(DBL1D p, int32_t order, DBL1D q) {
    return Returned(qx::Derivative<DBL1D>, p, order, q);
}
ErrorCode CxPolyDerivativeH(CDB1D p, int32_t order, CDB1D q) {
    return Returned(qx::Derivative<CDB1D>, p, order, q);
}

ErrorCode PolyIntegralH(DBL1D p, double constant, DBL1D q) {
    return Returned(qx::Integral<DBL1D>, p, constant, q);
}
ErrorCode CxPolyIntegralH(CDB1D p, const CDB *constant, CDB1D q) {
    return Returned(qx::Integral<CDB1D>, p, *constant, q);
}

ErrorCode PolyComposeH(DBL1D p, DBL1D q, DBL1D r) {
    return Returned(qx::Composition<DBL1D>, p, q, r);
}
ErrorCode CxPolyComposeH(CDB1D p, CDB1D q, CDB1D r) {
    return Returned(qx::Composition<CDB1D>, p, q, r);
}

ErrorCode PolyFromRootsH(CDB1D roots, DBL1D p) {
    return Returned(qx::ProductOfRoots<DBL1D>, roots, p);
}
ErrorCode CxPolyFromRootsH(CDB1D roots, CDB1D p) {
    return Returned(qx::ProductOfRoots<CDB1D>, roots, p);
}

ErrorCode PartialFractionsH(DBL1D numerator, DBL1D denominator, double tolerance, DBL1D polynomial,
                            CDB1D poles, CDB1D residues) {
    return Returned(qx::Fractions, numerator, denominator, tolerance, polynomial, poles, residues);
}
