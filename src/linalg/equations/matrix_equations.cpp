#include "linalg/equations/matrix_equations.h"

#include "linalg/equations/schur_factors.h"
#include "linalg/equations/triangular_equation.h"
#include "linalg/transpose.h"

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

// A given matrix, row after row, and the power of two that brings its largest element to between
// 0.5 and 1. For a matrix of zeros the exponent is 0.
template <ElementType E>
struct Given {
    typedef ElementOf<E> T;

    Given(const T *elements, int32_t rowCount, int32_t colCount, bool isNegated)
        : data(elements), rows(rowCount), cols(colCount), negated(isNegated) {}

    // ErrNonFiniteInput.
    ErrorCode findExponent() {
        const int64_t count = int64_t{rows} * cols;
        double largest = 0.0;
        bool isFinite = true;
        for (int64_t i = 0; i < count; ++i) {
            const double size = LargerPart(data[i]);
            isFinite =
                isFinite && std::isfinite(RealPart(data[i])) && std::isfinite(ImagPart(data[i]));
            largest = std::max(largest, size);
        }
        if (!isFinite)
            return ErrNonFiniteInput;
        isZero = largest == 0.0;
        if (!isZero)
            std::frexp(largest, &exponent);
        return 0;
    }
    // The scaled matrix times 2^further.
    void copyTo(Part<T> to, int further = 0) const {
        const PowerOfTwo scale(further - exponent);
        for (int32_t i = 0; i < rows; ++i)
            for (int32_t j = 0; j < cols; ++j) {
                const auto element = scale.times(data[int64_t{i} * cols + j]);
                to.data[i * to.stride + j] = negated ? -element : element;
            }
    }

    const T *data;
    int32_t rows, cols;
    bool negated;
    bool isZero = true;
    int exponent = 0;
};

template <class T>
double FrobeniusNorm(Part<T> a, int32_t rows, int32_t cols) {
    double squares = 0.0;
    for (int32_t i = 0; i < rows; ++i)
        for (int32_t j = 0; j < cols; ++j)
            squares += SquaredModulus(a.data[i * a.stride + j]);
    return std::sqrt(squares);
}

template <class T>
void AdjointInPlace(Part<T> a, int32_t n) {
    for (int32_t i = 0; i < n; ++i)
        for (int32_t j = 0; j <= i; ++j) {
            typename Part<T>::Element *const below = a.data + i * a.stride + j;
            typename Part<T>::Element *const above = a.data + j * a.stride + i;
            const auto held = Conj(*below);
            *below = Conj(*above);
            *above = held;
        }
}

template <ElementType E>
void Scale(const SchurFactors<E> &factors, int32_t n, int exponent) {
    if (exponent == 0)
        return;
    const PowerOfTwo scale(exponent);
    for (int32_t i = 0; i < n; ++i) {
        for (int32_t j = 0; j < n; ++j)
            *factors.t().at(i, j) = scale.times(*factors.t().at(i, j));
        factors.values()[i] = scale.times(factors.values()[i]);
    }
}

// a x + x b = c, or with `products` a x b - x = c. Where `lyapunov`, the equation has a^H in place
// of b, and a is given for b as well.
template <ElementType E>
class EquationSolver {
    typedef ElementOf<E> T;

public:
    EquationSolver(Given<E> a, Given<E> b, Given<E> c, bool products, bool lyapunov)
        : a_(a), b_(b), c_(c), m_(a.rows), n_(b.rows), products_(products), lyapunov_(lyapunov) {}

    ErrorCode solve(T *x) {
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
        c_.copyTo(PartOf(solution_));
        growth_ = solveFactored(solution_);
        if (products_)
            refine();
        if (lyapunov_ && isHermitian())
            makeHermitian();
        return writeTo(x);
    }

private:
    ErrorCode allocate() {
        for (const ErrorCode failed :
             {sFactors_.allocate(m_), tFactors_.allocate(n_),
              square_.allocate(std::max(m_, n_), std::max(m_, n_)), solution_.allocate(m_, n_),
              work_.allocate(m_, n_), products_ ? correction_.allocate(m_, n_) : 0})
            if (failed != 0)
                return failed;
        return 0;
    }

    ErrorCode factor() {
        a_.copyTo(PartOf(sFactors_.t()));
        aNorm_ = FrobeniusNorm(PartOf(sFactors_.t()), m_, m_);
        if (const ErrorCode failed = sFactors_.compute(aNorm_))
            return failed;
        if (lyapunov_) {
            tFactors_.setAdjoint(sFactors_);
            bNorm_ = aNorm_;
            return 0;
        }
        b_.copyTo(PartOf(tFactors_.t()));
        bNorm_ = FrobeniusNorm(PartOf(tFactors_.t()), n_, n_);
        return tFactors_.compute(bNorm_);
    }

    // A common power of two is taken from a and b in a sum; in a x b - x one is taken from the
    // larger of the two terms.
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
        Scale(sFactors_, m_, aExponent_);
        Scale(tFactors_, n_, bExponent);
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

    // The right side in the panel becomes the solution, divided by the power of two whose exponent
    // is returned.
    int solveFactored(const Panel<E> &panel) const {
        const Part<T> c = PartOf(panel), work = PartOf(work_), square = PartOf(square_);
        const Part<T> zA = PartOf(sFactors_.adjoint()), zB = PartOf(tFactors_.adjoint());
        Multiply(m_, n_, m_, zA, c, work);
        CopyAdjoint<E>(zB, n_, square);
        Multiply(m_, n_, n_, work, square, c);
        const TriangularEquation<E> equation = {
            m_,        n_,   PartOf(sFactors_.t()), PartOf(tFactors_.t()),
            products_, tau_, epsilon / 4.0 * norm_};
        const int growth = SolveTriangularEquation(equation, c, work);
        Multiply(m_, n_, n_, c, zB, work);
        CopyAdjoint<E>(zA, m_, square);
        Multiply(m_, n_, m_, square, work, c);
        return growth;
    }

    // Adds the solution for the residual of a x b - x = c, which takes back what the products with
    // four unitary matrices have cost in digits. Where that is no small correction, the equation is
    // nearly singular and x stays.
    void refine() const {
        if (growth_ != 0)
            return;
        const Part<T> x = PartOf(solution_), residual = PartOf(correction_),
                      square = PartOf(square_), work = PartOf(work_);
        b_.copyTo(square);
        if (lyapunov_)
            AdjointInPlace(square, n_);
        Multiply(m_, n_, n_, x, square, work);
        a_.copyTo(square, aExponent_);
        c_.copyTo(residual);
        Subtract(m_, n_, m_, square, work, residual);
        for (int32_t i = 0; i < m_; ++i)
            for (int32_t j = 0; j < n_; ++j)
                *correction_.at(i, j) += *solution_.at(i, j) * tau_;
        const double size = FrobeniusNorm(x, m_, n_);
        if (solveFactored(correction_) != 0 || !(FrobeniusNorm(residual, m_, n_) < 0.25 * size))
            return;
        for (int32_t i = 0; i < m_; ++i)
            for (int32_t j = 0; j < n_; ++j)
                *solution_.at(i, j) += *correction_.at(i, j);
    }

    bool isHermitian() const {
        for (int32_t i = 0; i < n_; ++i)
            for (int32_t j = 0; j <= i; ++j) {
                const auto upper = c_.data[int64_t{j} * n_ + i],
                           lower = Conj(c_.data[int64_t{i} * n_ + j]);
                if (RealPart(upper) != RealPart(lower) || ImagPart(upper) != ImagPart(lower))
                    return false;
            }
        return true;
    }
    void makeHermitian() const {
        for (int32_t i = 0; i < n_; ++i)
            for (int32_t j = 0; j <= i; ++j) {
                const auto mean = *solution_.at(i, j) * 0.5 + Conj(*solution_.at(j, i)) * 0.5;
                *solution_.at(j, i) = Conj(mean);
                *solution_.at(i, j) = mean;
            }
    }

    ErrorCode writeTo(T *x) const {
        const PowerOfTwo scale(c_.exponent - equationExponent_ + growth_);
        bool isFinite = true;
        for (int32_t i = 0; i < m_; ++i)
            for (int32_t j = 0; j < n_; ++j) {
                const auto value = scale.times(*solution_.at(i, j));
                isFinite =
                    isFinite && std::isfinite(RealPart(value)) && std::isfinite(ImagPart(value));
                x[int64_t{i} * n_ + j] = value;
            }
        return isFinite ? 0 : ErrOverflow;
    }

    Given<E> a_, b_, c_;
    int32_t m_, n_;
    bool products_, lyapunov_;
    SchurFactors<E> sFactors_, tFactors_;
    Panel<E> square_, solution_, work_, correction_;
    double aNorm_ = 0.0, bNorm_ = 0.0, norm_ = 0.0, tau_ = 1.0;
    int aExponent_ = 0; // the scaled a is still multiplied by this power of two
    int equationExponent_ = 0, growth_ = 0;
};

template <ElementType E>
ErrorCode Sylvester(const ElementOf<E> *a, int32_t m, const ElementOf<E> *b, int32_t n,
                    const ElementOf<E> *c, int32_t equation, ElementOf<E> *x) {
    if (equation < sylvesterSum || equation > sylvesterProducts)
        return ErrInvalidSelector;
    return EquationSolver<E>({a, m, m, false}, {b, n, n, equation == sylvesterDifference},
                             {c, m, n, false}, equation == sylvesterProducts, false)
        .solve(x);
}

template <ElementType E>
ErrorCode Lyapunov(const ElementOf<E> *a, int32_t n, const ElementOf<E> *q, int32_t equation,
                   ElementOf<E> *x) {
    if (equation != lyapunovContinuous && equation != lyapunovDiscrete)
        return ErrInvalidSelector;
    const bool isDiscrete = equation == lyapunovDiscrete;
    return EquationSolver<E>({a, n, n, false}, {a, n, n, false}, {q, n, n, isDiscrete}, isDiscrete,
                             true)
        .solve(x);
}

} // namespace

ErrorCode SolveSylvester(const DBL *a, int32_t m, const DBL *b, int32_t n, const DBL *c,
                         int32_t equation, DBL *x) {
    return Sylvester<ElementType::DBL>(a, m, b, n, c, equation, x);
}
ErrorCode SolveSylvester(const CDB *a, int32_t m, const CDB *b, int32_t n, const CDB *c,
                         int32_t equation, CDB *x) {
    return Sylvester<ElementType::CDB>(a, m, b, n, c, equation, x);
}
ErrorCode SolveLyapunov(const DBL *a, int32_t n, const DBL *q, int32_t equation, DBL *x) {
    return Lyapunov<ElementType::DBL>(a, n, q, equation, x);
}
ErrorCode SolveLyapunov(const CDB *a, int32_t n, const CDB *q, int32_t equation, CDB *x) {
    return Lyapunov<ElementType::CDB>(a, n, q, equation, x);
}

} // namespace qx
