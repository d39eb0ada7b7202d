#include "linalg/complex_functions.h"
#include "linalg/equations/schur_factors.h"
#include "linalg/factorisations/range.h"
#include "linalg/functions/diagonal.h"
#include "linalg/functions/functions.h"
#include "linalg/functions/triangular_functions.h"
#include "linalg/products/products.h"

#include <algorithm>
#include <cmath>
#include <cstdlib>

namespace qx {
namespace {

constexpr auto Real = ElementType::DBL;
constexpr auto Complex = ElementType::CDB;

template <ElementType E>
bool IsTriangular(const ConstMatrixView<E> &a) {
    bool isUpper = true, isLower = true;
    for (int32_t i = 0; i < a.rows(); ++i)
        for (int32_t j = 0; j < i; ++j) {
            isUpper = isUpper && AbsSum(a(i, j)) == 0.0;
            isLower = isLower && AbsSum(a(j, i)) == 0.0;
        }
    return isUpper || isLower;
}

// The Schur form 2^exponent z t z^H of a matrix with elements of any magnitude.
template <ElementType E>
struct ScaledSchurForm {
    // ErrOutOfMemory, ErrIterationLimit.
    ErrorCode find(const ConstMatrixView<E> &a) {
        const int32_t n = a.rows();
        if (const ErrorCode failed = factors.allocate(n))
            return failed;
        const MatrixView<E> scaled = factors.t();
        CopyMatrix<E>(a, scaled);
        exponent = ScaleTo<E>(scaled, 0);
        norm = FrobeniusNorm<E>(scaled);
        rounding = IsTriangular<E>(a) ? 0.0 : n * epsilon * norm;
        // The first attempt serves small parts of graded matrices as well.
        ErrorCode status = factors.compute(0.0);
        if (status == ErrIterationLimit) {
            CopyMatrix<E>(a, scaled);
            ScaleTo<E>(scaled, 0);
            status = factors.compute(NegligibleIn(norm));
        }
        // Single eigenvalues are taken from the triangle, from which the computed ones differ by
        // rounding errors.
        for (int32_t i = 0; i < n; ++i)
            if (E == Complex || factors.values()[i].im == 0.0)
                factors.values()[i] = {RealPart(factors.t()(i, i)), ImagPart(factors.t()(i, i))};
        return status;
    }

    SchurFactors<E> factors;
    int exponent = 0;
    double norm = 0.0;     // of t
    double rounding = 0.0; // error bound of the eigenvalues in t; 0 if a itself is triangular
};

// Functions that replace t by the function of 2^exponent t, given the Frobenius norm of t and its
// rounding errors.
struct LogarithmOfScaled {
    template <ElementType E>
    ErrorCode replace(const MatrixView<E> &t, int exponent, double, double) {
        const int within = std::abs(exponent) <= 300 ? exponent : 0;
        DivideByPower<E>(t, -within);
        if (const ErrorCode failed = LogarithmOfTriangle<E>(t))
            return failed;
        if (within != exponent)
            for (int32_t i = 0; i < t.rows(); ++i)
                t(i, i) = t(i, i) + ScalarOf<E>::Of(exponent * std::log(2.0));
        return 0;
    }
};
struct SquareRootOfScaled {
    template <ElementType E>
    ErrorCode replace(const MatrixView<E> &t, int exponent, double norm, double rounding) {
        const int within = exponent % 2;
        DivideByPower<E>(t, -within);
        norm = std::ldexp(norm, within);
        if (const ErrorCode failed = SquareRootOfTriangle<E>(t, std::ldexp(rounding, within)))
            return failed;
        const double rootNorm = FrobeniusNorm<E>(t);
        growth = norm > 0.0 ? rootNorm * (rootNorm / norm) : 1.0;
        DivideByPower<E>(t, (within - exponent) / 2);
        return 0;
    }
    double growth = 0.0; // |root|^2 / |t|
};

// A real triangle with blocks of two as a complex triangle, and back.
class PairRotations {
public:
    ErrorCode allocate(int32_t n) { return memory_.take(Sized(x_, n), Sized(y_, n)); }

    // Rotates each pair so that the first of its eigenvalues comes first.
    void triangulate(const ConstRealMatrix &t, ConstComplexVector values, const ComplexMatrix &c) {
        const int32_t n = t.rows();
        for (int32_t i = 0; i < n; ++i)
            for (int32_t j = 0; j < n; ++j)
                c(i, j) = {t(i, j), 0.0};
        for (int32_t i = 1; i < n; ++i) {
            x_[i] = {1.0, 0.0};
            y_[i] = 0.0;
            if (!(values[i].im < 0.0))
                continue;
            const CDB mean = values[i - 1] - CDB{t(i, i), 0.0};
            const double below = t(i, i - 1), size = std::hypot(Modulus(mean), below);
            x_[i] = mean / size;
            y_[i] = below / size;
            rotate(c, i, Conj(x_[i]), y_[i]);
            c(i, i - 1) = {0.0, 0.0};
            c(i - 1, i - 1) = values[i - 1];
            c(i, i) = values[i];
        }
    }
    void turnBack(const ComplexMatrix &c) const {
        for (int32_t i = 1; i < c.rows(); ++i)
            if (x_[i].re != 1.0 || y_[i] != 0.0)
                rotate(c, i, x_[i], -y_[i]);
    }

private:
    // g c g^H with rows i - 1 and i of g equal to (x, y) and (-y, conj(x)).
    static void rotate(const ComplexMatrix &c, int32_t i, CDB x, double y) {
        for (int32_t j = i - 1; j < c.cols(); ++j) {
            const CDB upper = c(i - 1, j), lower = c(i, j);
            c(i - 1, j) = x * upper + lower * y;
            c(i, j) = Conj(x) * lower - upper * y;
        }
        for (int32_t k = 0; k <= i; ++k) {
            const CDB left = c(k, i - 1), right = c(k, i);
            c(k, i - 1) = Conj(x) * left + right * y;
            c(k, i) = x * right - left * y;
        }
    }

    ScratchParts memory_;
    ComplexVector x_;
    RealVector y_;
};

// t becomes z t z^H.
template <ElementType E>
class BackToMatrix {
public:
    ErrorCode prepare(const SchurFactors<E> &factors) {
        const int32_t n = factors.t().rows();
        if (const ErrorCode failed = memory_.take(SizedPadded(z_, n, n), SizedPadded(half_, n, n)))
            return failed;
        adjoint_ = factors.adjoint();
        CopyAdjoint<E>(adjoint_, z_);
        return 0;
    }
    void replace(const MatrixView<E> &t) const {
        OrderedProduct<E>(t, adjoint_, half_);
        OrderedProduct<E>(z_, half_, t);
    }

private:
    ScratchParts memory_;
    ConstMatrixView<E> adjoint_;
    MatrixView<E> z_, half_;
};

// Moves an eigenvalue that rounding errors may have put below the negative axis onto the axis.
void PutOnCut(const ComplexMatrix &t, double rounding) {
    for (int32_t i = 0; i < t.rows(); ++i)
        if (t(i, i).re < 0.0 && t(i, i).im <= 0.0 && -t(i, i).im <= rounding)
            t(i, i).im = 0.0;
}

template <class Function>
ErrorCode Apply(const ScaledSchurForm<Complex> &form, Function &function,
                const ComplexMatrix &out) {
    BackToMatrix<Complex> back;
    if (const ErrorCode failed = back.prepare(form.factors))
        return failed;
    CopyMatrix<Complex>(form.factors.t(), out);
    PutOnCut(out, form.rounding);
    if (const ErrorCode failed = function.replace(out, form.exponent, form.norm, form.rounding))
        return failed;
    back.replace(out);
    return 0;
}

// Uses real arithmetic if no eigenvalue is complex or negative. The result is real if no eigenvalue
// is real and negative.
template <class Function>
ErrorCode Apply(const ScaledSchurForm<Real> &form, Function &function, const ComplexMatrix &out) {
    const int32_t n = out.rows();
    bool hasNegative = false, hasPairs = false;
    for (const CDB &value : form.factors.values()) {
        hasNegative = hasNegative || (value.im == 0.0 && value.re < 0.0);
        hasPairs = hasPairs || value.im != 0.0;
    }
    BackToMatrix<Real> back;
    if (const ErrorCode failed = back.prepare(form.factors))
        return failed;
    RealMatrix re, im;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(re, n, n), Sized(im, n, n)))
        return failed;
    if (hasNegative || hasPairs) {
        PairRotations pairs;
        if (const ErrorCode failed = pairs.allocate(n))
            return failed;
        pairs.triangulate(form.factors.t(), form.factors.values(), out);
        if (const ErrorCode failed = function.replace(out, form.exponent, form.norm, form.rounding))
            return failed;
        pairs.turnBack(out);
        for (int32_t i = 0; i < n; ++i)
            for (int32_t j = 0; j < n; ++j) {
                re(i, j) = out(i, j).re;
                im(i, j) = out(i, j).im;
            }
    } else {
        CopyMatrix<Real>(form.factors.t(), re);
        if (const ErrorCode failed = function.replace(re, form.exponent, form.norm, form.rounding))
            return failed;
    }
    back.replace(re);
    if (hasNegative)
        back.replace(im);
    for (int32_t i = 0; i < n; ++i)
        for (int32_t j = 0; j < n; ++j)
            out(i, j) = {re(i, j), hasNegative ? im(i, j) : 0.0};
    return 0;
}

template <ElementType E>
CDB AsComplex(const ElementOf<E> &x) {
    return {RealPart(x), ImagPart(x) + 0.0}; // no negative zero
}

// Applies the function to each diagonal element; the other elements are 0.
template <ElementType E, class Scalar>
void ApplyToDiagonal(const ConstMatrixView<E> &a, const ComplexMatrix &out, Scalar function) {
    for (CDB &element : out.elements())
        element = {0.0, 0.0};
    for (int32_t i = 0; i < a.rows(); ++i)
        out(i, i) = function(AsComplex<E>(a(i, i)));
}

template <ElementType E>
ErrorCode Logarithm(const ConstMatrixView<E> &a, const ComplexMatrix &out) {
    if (IsDiagonal<E>(a)) {
        ApplyToDiagonal<E>(a, out, [](CDB z) { return PrincipalLogarithm(z); });
        return HoldsOnlyNumbers<Complex>(out) ? 0 : ErrDegenerateValue;
    }
    ScaledSchurForm<E> form;
    if (const ErrorCode failed = form.find(a))
        return failed;
    double least = HUGE_VAL;
    for (const CDB &value : form.factors.values())
        least = std::min(least, Modulus(value));
    if (least == 0.0)
        return ErrDegenerateValue;
    LogarithmOfScaled logarithm;
    if (const ErrorCode failed = Apply(form, logarithm, out))
        return failed;
    return least <= form.rounding ? WarnLowAccuracy : 0;
}

template <ElementType E>
ErrorCode SquareRootOf(const ConstMatrixView<E> &a, const ComplexMatrix &out) {
    if (IsDiagonal<E>(a)) {
        ApplyToDiagonal<E>(a, out, [](CDB z) { return SquareRoot(z); });
        return 0;
    }
    constexpr double lossOfHalf = 1e8;
    ScaledSchurForm<E> form;
    if (const ErrorCode failed = form.find(a))
        return failed;
    SquareRootOfScaled root;
    if (const ErrorCode failed = Apply(form, root, out))
        return failed;
    if (!HoldsOnlyNumbers<Complex>(out))
        return ErrDegenerateValue;
    return root.growth > lossOfHalf && form.rounding > 0.0 ? WarnLowAccuracy : 0;
}

// A complex matrix without imaginary parts is taken as a real one.
template <class OfReal, class OfComplex>
ErrorCode ByParts(const ConstComplexMatrix &a, const ComplexMatrix &out, OfReal ofReal,
                  OfComplex ofComplex) {
    for (int32_t i = 0; i < a.rows(); ++i)
        for (int32_t j = 0; j < a.cols(); ++j)
            if (a(i, j).im != 0.0)
                return ofComplex(a, out);
    RealMatrix re;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(re, a.rows(), a.rows())))
        return failed;
    for (int32_t i = 0; i < a.rows(); ++i)
        for (int32_t j = 0; j < a.cols(); ++j)
            re(i, j) = a(i, j).re;
    return ofReal(re, out);
}

} // namespace

template <>
ErrorCode PrincipalMatrixLogarithm<Real>(const ConstRealMatrix &a, const ComplexMatrix &out) {
    QX_EXPECTS(a.isSquare() && !a.isEmpty() && out.rows() == a.rows() && out.cols() == a.rows());
    return HoldsOnlyNumbers<Real>(a) ? Logarithm<Real>(a, out) : ErrNonFiniteInput;
}
template <>
ErrorCode PrincipalMatrixLogarithm<Complex>(const ConstComplexMatrix &a, const ComplexMatrix &out) {
    QX_EXPECTS(a.isSquare() && !a.isEmpty() && out.rows() == a.rows() && out.cols() == a.rows());
    if (!HoldsOnlyNumbers<Complex>(a))
        return ErrNonFiniteInput;
    return ByParts(a, out, Logarithm<Real>, Logarithm<Complex>);
}

template <>
ErrorCode PrincipalMatrixSquareRoot<Real>(const ConstRealMatrix &a, const ComplexMatrix &out) {
    QX_EXPECTS(a.isSquare() && !a.isEmpty() && out.rows() == a.rows() && out.cols() == a.rows());
    return HoldsOnlyNumbers<Real>(a) ? SquareRootOf<Real>(a, out) : ErrNonFiniteInput;
}
template <>
ErrorCode PrincipalMatrixSquareRoot<Complex>(const ConstComplexMatrix &a,
                                             const ComplexMatrix &out) {
    QX_EXPECTS(a.isSquare() && !a.isEmpty() && out.rows() == a.rows() && out.cols() == a.rows());
    if (!HoldsOnlyNumbers<Complex>(a))
        return ErrNonFiniteInput;
    return ByParts(a, out, SquareRootOf<Real>, SquareRootOf<Complex>);
}

} // namespace qx
