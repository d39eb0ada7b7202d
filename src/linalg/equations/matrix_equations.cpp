#include "linalg/equations/matrix_equations.h"

#include "linalg/equations/schur_factors.h"
#include "linalg/equations/triangular_equation.h"
#include "linalg/products/products.h"

#include <algorithm>
#include <cmath>

namespace qx {
namespace {

double LargerPart(double a) { return std::fabs(a); }
double LargerPart(CDB a) { return std::max(std::fabs(a.re), std::fabs(a.im)); }

// x 2^exponent, rounded once.
class PowerOfTwo {
public:
    explicit PowerOfTwo(int exponent)
        : exponent_(exponent), isPlain_(exponent >= -1000 && exponent <= 1000),
          factor_(isPlain_ ? std::ldexp(1.0, exponent) : 0.0) {}
    double times(double x) const { return isPlain_ ? x * factor_ : std::ldexp(x, exponent_); }
    CDB times(CDB z) const { return {times(z.re), times(z.im)}; }

private:
    int exponent_;
    bool isPlain_;
    double factor_;
};

// A given matrix, and the power of two by which it is divided to bring its largest element between
// 0.5 and 1. For a matrix of zeros the exponent is 0.
template <ElementType E>
struct Given {
    Given(const ConstMatrixView<E> &matrix, bool isNegated)
        : elements(matrix), negated(isNegated) {}

    // ErrNonFiniteInput.
    ErrorCode findExponent() {
        double largest = 0.0;
        bool isFinite = true;
        for (const ElementOf<E> &element : elements.elements()) {
            isFinite =
                isFinite && std::isfinite(RealPart(element)) && std::isfinite(ImagPart(element));
            largest = std::max(largest, LargerPart(element));
        }
        if (!isFinite)
            return ErrNonFiniteInput;
        isZero = largest == 0.0;
        if (!isZero)
            std::frexp(largest, &exponent);
        return 0;
    }
    // The scaled matrix times 2^further.
    void copyTo(const MatrixView<E> &to, int further = 0) const {
        const PowerOfTwo scale(further - exponent);
        for (int32_t i = 0; i < elements.rows(); ++i)
            for (int32_t j = 0; j < elements.cols(); ++j) {
                const auto element = scale.times(elements(i, j));
                to(i, j) = negated ? -element : element;
            }
    }

    ConstMatrixView<E> elements;
    bool negated;
    bool isZero = true;
    int exponent = 0;
};

template <ElementType E>
void AdjointInPlace(const MatrixView<E> &a) {
    for (int32_t i = 0; i < a.rows(); ++i)
        for (int32_t j = 0; j <= i; ++j) {
            const auto held = Conj(a(i, j));
            a(i, j) = Conj(a(j, i));
            a(j, i) = held;
        }
}

template <ElementType E>
void Scale(const SchurFactors<E> &factors, int exponent) {
    if (exponent == 0)
        return;
    const PowerOfTwo scale(exponent);
    const MatrixView<E> t = factors.t();
    for (int32_t i = 0; i < t.rows(); ++i) {
        for (int32_t j = 0; j < t.cols(); ++j)
            t(i, j) = scale.times(t(i, j));
        factors.values()[i] = scale.times(factors.values()[i]);
    }
}

// a x + x b = c, or with `products` a x b - x = c. With `lyapunov`, the equation has a^H in place
// of b, and the caller passes a for b as well.
template <ElementType E>
class EquationSolver {
public:
    EquationSolver(Given<E> a, Given<E> b, Given<E> c, bool products, bool lyapunov)
        : a_(a), b_(b), c_(c), m_(a.elements.rows()), n_(b.elements.rows()), products_(products),
          lyapunov_(lyapunov) {}

    ErrorCode solve(const MatrixView<E> &x) {
        for (Given<E> *given : {&a_, &b_, &c_})
            if (const ErrorCode bad = given->findExponent())
                return bad;
        if (const ErrorCode failed = allocate())
            return failed;
        if (const ErrorCode failed = factor())
            return failed;
        scaleTogether();
        if (isSingular())
            return ErrSingularMatrix;
        c_.copyTo(solution_);
        growth_ = solveFactored(solution_);
        if (products_)
            refine();
        if (lyapunov_ && isHermitian())
            makeHermitian();
        return writeTo(x);
    }

private:
    ErrorCode allocate() {
        const int32_t larger = std::max(m_, n_), correctionRows = products_ ? m_ : 0;
        if (const ErrorCode failed = sFactors_.allocate(m_))
            return failed;
        if (const ErrorCode failed = tFactors_.allocate(n_))
            return failed;
        return memory_.take(SizedPadded(square_, larger, larger), SizedPadded(solution_, m_, n_),
                            SizedPadded(work_, m_, n_),
                            SizedPadded(correction_, correctionRows, n_));
    }

    ErrorCode factor() {
        a_.copyTo(sFactors_.t());
        aNorm_ = FrobeniusNorm<E>(sFactors_.t());
        if (const ErrorCode failed = sFactors_.compute(NegligibleIn(aNorm_)))
            return failed;
        if (lyapunov_) {
            tFactors_.setAdjoint(sFactors_);
            bNorm_ = aNorm_;
            return 0;
        }
        b_.copyTo(tFactors_.t());
        bNorm_ = FrobeniusNorm<E>(tFactors_.t());
        return tFactors_.compute(NegligibleIn(bNorm_));
    }

    // In a sum, a common power of two is factored out of a and b; in a x b - x, the larger of the
    // two terms determines it.
    void scaleTogether() {
        int bExponent = 0;
        if (products_) {
            const int both = a_.exponent + b_.exponent;
            equationExponent_ = std::max(both, 0);
            tau_ = std::ldexp(1.0, -equationExponent_);
            aExponent_ = std::min(both, 0);
        } else {
            equationExponent_ = a_.isZero   ? b_.exponent
                                : b_.isZero ? a_.exponent
                                            : std::max(a_.exponent, b_.exponent);
            aExponent_ = a_.isZero ? 0 : a_.exponent - equationExponent_;
            bExponent = b_.isZero ? 0 : b_.exponent - equationExponent_;
        }
        Scale(sFactors_, aExponent_);
        Scale(tFactors_, bExponent);
        aNorm_ = std::ldexp(aNorm_, aExponent_);
        bNorm_ = std::ldexp(bNorm_, bExponent);
        norm_ = products_ ? aNorm_ * bNorm_ + tau_ : aNorm_ + bNorm_;
    }

    bool isSingular() const {
        const double least = epsilon * norm_;
        for (int32_t i = 0; i < m_; ++i)
            for (int32_t j = 0; j < n_; ++j) {
                const CDB l = sFactors_.values()[i], m = tFactors_.values()[j];
                const CDB gap = products_ ? l * m - CDB{tau_, 0.0} : l + m;
                if (LargerPart(gap) <= least && Modulus(gap) <= least)
                    return true;
            }
        return false;
    }

    // A square work matrix of order n.
    MatrixView<E> square(int32_t n) const { return square_.block(0, 0, n, n); }

    // The right side c becomes the solution, divided by the power of two whose exponent is
    // returned.
    int solveFactored(const MatrixView<E> &c) const {
        const ConstMatrixView<E> zA = sFactors_.adjoint(), zB = tFactors_.adjoint();
        OrderedProduct<E>(zA, c, work_);
        CopyAdjoint<E>(zB, square(n_));
        OrderedProduct<E>(work_, square(n_), c);
        const TriangularEquation<E> equation = {sFactors_.t(), tFactors_.t(), products_, tau_,
                                                epsilon / 4.0 * norm_};
        const int growth = SolveTriangularEquation<E>(equation, c, work_);
        OrderedProduct<E>(c, zB, work_);
        CopyAdjoint<E>(zA, square(m_));
        OrderedProduct<E>(square(m_), work_, c);
        return growth;
    }

    // Adds the solution for the residual of a x b - x = c, which recovers the digits lost in the
    // products with four unitary matrices. If this is not a small correction, the equation is
    // nearly singular and x is left as it is.
    void refine() const {
        if (growth_ != 0)
            return;
        b_.copyTo(square(n_));
        if (lyapunov_)
            AdjointInPlace<E>(square(n_));
        OrderedProduct<E>(solution_, square(n_), work_);
        a_.copyTo(square(m_), aExponent_);
        c_.copyTo(correction_); // becomes the residual, and then the solution for it
        SubtractProduct<E>(square(m_), work_, correction_);
        for (int32_t i = 0; i < m_; ++i)
            for (int32_t j = 0; j < n_; ++j)
                correction_(i, j) += solution_(i, j) * tau_;
        const double size = FrobeniusNorm<E>(solution_);
        if (solveFactored(correction_) != 0 || !(FrobeniusNorm<E>(correction_) < 0.25 * size))
            return;
        for (int32_t i = 0; i < m_; ++i)
            for (int32_t j = 0; j < n_; ++j)
                solution_(i, j) += correction_(i, j);
    }

    bool isHermitian() const {
        for (int32_t i = 0; i < n_; ++i)
            for (int32_t j = 0; j <= i; ++j) {
                const auto upper = c_.elements(j, i), lower = Conj(c_.elements(i, j));
                if (RealPart(upper) != RealPart(lower) || ImagPart(upper) != ImagPart(lower))
                    return false;
            }
        return true;
    }
    void makeHermitian() const {
        for (int32_t i = 0; i < n_; ++i)
            for (int32_t j = 0; j <= i; ++j) {
                const auto mean = solution_(i, j) * 0.5 + Conj(solution_(j, i)) * 0.5;
                solution_(j, i) = Conj(mean);
                solution_(i, j) = mean;
            }
    }

    ErrorCode writeTo(const MatrixView<E> &x) const {
        const PowerOfTwo scale(c_.exponent - equationExponent_ + growth_);
        bool isFinite = true;
        for (int32_t i = 0; i < m_; ++i)
            for (int32_t j = 0; j < n_; ++j) {
                const auto value = scale.times(solution_(i, j));
                isFinite =
                    isFinite && std::isfinite(RealPart(value)) && std::isfinite(ImagPart(value));
                x(i, j) = value;
            }
        return isFinite ? 0 : ErrOverflow;
    }

    Given<E> a_, b_, c_;
    int32_t m_, n_;
    bool products_, lyapunov_;
    SchurFactors<E> sFactors_, tFactors_;
    ScratchParts memory_;
    MatrixView<E> square_, solution_, work_, correction_;
    double aNorm_ = 0.0, bNorm_ = 0.0, norm_ = 0.0, tau_ = 1.0;
    int aExponent_ = 0; // the scaled a is still multiplied by this power of two
    int equationExponent_ = 0, growth_ = 0;
};

} // namespace

template <ElementType E>
ErrorCode SolveSylvester(const ConstMatrixView<E> &a, const ConstMatrixView<E> &b,
                         const ConstMatrixView<E> &c, SylvesterEquation equation,
                         const MatrixView<E> &x) {
    QX_EXPECTS(a.isSquare() && b.isSquare() && c.rows() == a.rows() && c.cols() == b.rows());
    QX_EXPECTS(!c.isEmpty() && x.rows() == c.rows() && x.cols() == c.cols());
    return EquationSolver<E>({a, false}, {b, equation == sylvesterDifference}, {c, false},
                             equation == sylvesterProducts, false)
        .solve(x);
}

template <ElementType E>
ErrorCode SolveLyapunov(const ConstMatrixView<E> &a, const ConstMatrixView<E> &q,
                        LyapunovEquation equation, const MatrixView<E> &x) {
    QX_EXPECTS(a.isSquare() && !a.isEmpty() && q.isSquare() && q.rows() == a.rows());
    QX_EXPECTS(x.isSquare() && x.rows() == a.rows());
    const bool isDiscrete = equation == lyapunovDiscrete;
    return EquationSolver<E>({a, false}, {a, false}, {q, isDiscrete}, isDiscrete, true).solve(x);
}

template ErrorCode SolveSylvester(const ConstRealMatrix &, const ConstRealMatrix &,
                                  const ConstRealMatrix &, SylvesterEquation, const RealMatrix &);
template ErrorCode SolveSylvester(const ConstComplexMatrix &, const ConstComplexMatrix &,
                                  const ConstComplexMatrix &, SylvesterEquation,
                                  const ComplexMatrix &);
template ErrorCode SolveLyapunov(const ConstRealMatrix &, const ConstRealMatrix &, LyapunovEquation,
                                 const RealMatrix &);
template ErrorCode SolveLyapunov(const ConstComplexMatrix &, const ConstComplexMatrix &,
                                 LyapunovEquation, const ComplexMatrix &);

} // namespace qx
