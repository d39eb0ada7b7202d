#include "linalg/functions/triangular_functions.h"

#include "frame/constants.h"
#include "linalg/complex_functions.h"
#include "linalg/equations/triangular_equation.h"
#include "linalg/factorisations/range.h"
#include "linalg/kernels.h"
#include "linalg/products/products.h"
#include "linalg/properties/norm_estimate.h"

#include <algorithm>
#include <cmath>

namespace qx {
namespace {

constexpr int32_t smallOrder = 16;

// A remainder of the order of `negligible` counts as 0 if the division by small diagonal elements
// would make it larger than sqrt(negligible). Returns false if there is no root, because the
// remainder between two zeros on the diagonal is not 0.
template <ElementType E>
bool TakeRootByColumns(const MatrixView<E> &t, double negligible) {
    for (int32_t j = 0; j < t.cols(); ++j) {
        t(j, j) = SquareRoot(t(j, j));
        for (int32_t i = j - 1; i >= 0; --i) {
            typename ScalarOf<E>::type rest = t(i, j);
            for (int32_t k = i + 1; k < j; ++k)
                rest -= t(i, k) * t(k, j);
            const typename ScalarOf<E>::type sum = t(i, i) + t(j, j);
            // Each of the j - i terms of the remainder may be as large as `negligible`.
            if (AbsSum(rest) <= (j - i) * negligible &&
                AbsSum(rest) >= std::sqrt(negligible) * AbsSum(sum))
                t(i, j) = ScalarOf<E>::Of(0.0);
            else if (AbsSum(sum) == 0.0)
                return false;
            else
                t(i, j) = rest / sum;
        }
    }
    return true;
}

// For at most one small element on the diagonal.
template <ElementType E>
bool TakeRootByHalves(const MatrixView<E> &t, const MatrixView<E> &work) {
    const int32_t n = t.rows();
    if (n <= smallOrder)
        return TakeRootByColumns<E>(t, 0.0);
    const int32_t half = n / 2, rest = n - half;
    const MatrixView<E> first = t.block(0, 0, half, half), last = t.block(half, half, rest, rest);
    if (!TakeRootByHalves<E>(first, work) || !TakeRootByHalves<E>(last, work))
        return false;
    return SolveTriangularEquation<E>({first, last, false, 0.0, 0.0}, t.block(0, half, half, rest),
                                      work.block(0, 0, half, rest)) == 0;
}

template <ElementType E>
bool TakeRoot(const MatrixView<E> &t, const MatrixView<E> &work, double negligible) {
    int32_t small = 0;
    for (int32_t i = 0; i < t.rows(); ++i)
        small += AbsSum(t(i, i)) <= negligible ? 1 : 0;
    const bool isFound = small > 1 ? TakeRootByColumns<E>(t, negligible) //
                                   : TakeRootByHalves<E>(t, work);
    return isFound && HoldsOnlyNumbers<E>(t);
}

// x becomes t^-1 x for an upper triangular t, where each element adds the terms of the blocks below
// in ascending order.
template <ElementType E>
void SolveUpper(const ConstMatrixView<E> &t, const MatrixView<E> &x) {
    const int32_t n = t.rows();
    if (n > smallOrder) {
        const int32_t half = n / 2, rest = n - half;
        const MatrixView<E> upper = x.block(0, 0, half, x.cols());
        const MatrixView<E> lower = x.block(half, 0, rest, x.cols());
        SolveUpper<E>(t.block(half, half, rest, rest), lower);
        SubtractProduct<E>(t.block(0, half, half, rest), lower, upper);
        SolveUpper<E>(t.block(0, 0, half, half), upper);
        return;
    }
    for (int32_t i = n - 1; i >= 0; --i)
        for (int32_t j = 0; j < x.cols(); ++j) {
            typename ScalarOf<E>::type rest = x(i, j);
            for (int32_t k = i + 1; k < n; ++k)
                rest -= t(i, k) * x(k, j);
            x(i, j) = rest / t(i, i);
        }
}
// The same for an upper triangular x, whose zeros are not touched.
template <ElementType E>
void SolveUpperForTriangle(const ConstMatrixView<E> &t, const MatrixView<E> &x) {
    const int32_t n = t.rows();
    if (n <= smallOrder) {
        SolveUpper<E>(t, x);
        return;
    }
    const int32_t half = n / 2, rest = n - half;
    const MatrixView<E> last = x.block(half, half, rest, rest);
    const MatrixView<E> beside = x.block(0, half, half, rest);
    SolveUpperForTriangle<E>(t.block(half, half, rest, rest), last);
    SubtractProduct<E>(t.block(0, half, half, rest), last, beside);
    SolveUpper<E>(t.block(0, 0, half, half), beside);
    SolveUpperForTriangle<E>(t.block(0, 0, half, half), x.block(0, 0, half, half));
}

// The multiple of 2 pi i by which the difference of two logarithms differs from the logarithm of
// the quotient.
double Turns(double, double) { return 0.0; }
CDB Turns(CDB difference, CDB ofQuotient) {
    return {0.0, kTwoPi * std::rint((difference.im - ofQuotient.im) / kTwoPi)};
}

// The difference of the logarithms of neighbours, without cancellation where they are close.
template <class T>
T DifferenceOfLogarithms(T from, T to, T fromLog, T toLog) {
    const T difference = toLog - fromLog;
    if (!(AbsSum(to - from) < 0.5 * AbsSum(to + from)))
        return difference;
    const T ofQuotient = AreaTangent((to - from) / (to + from)) * 2.0;
    return ofQuotient + Turns(difference, ofQuotient);
}

// The nodes and weights of the formula of C. F. Gauss on (0, 1), of which only the first half is
// stored, because the others mirror it. x times the sum of w / (1 + node x) is the Pade approximant
// of log(1 + x). Theta is the norm up to which an approximant's backward error is a rounding error.
struct Approximant {
    double theta;
    double nodes[4], weights[4];
};
constexpr int32_t highestDegree = 7;
constexpr Approximant approximants[highestDegree + 1] = {
    {},
    {1.586970738772063e-5, {0.5}, {1.0}},
    {2.313807884242979e-3, {0.211324865405187118}, {0.5}},
    {1.938179313533253e-2,
     {0.112701665379258311, 0.5},
     {0.277777777777777778, 0.444444444444444444}},
    {6.209171588994762e-2,
     {0.0694318442029737124, 0.330009478207571868},
     {0.173927422568726929, 0.326072577431273071}},
    {1.276404810806775e-1,
     {0.0469100770306680036, 0.230765344947158454, 0.5},
     {0.118463442528094544, 0.239314335249683234, 0.284444444444444444}},
    {2.060962623452836e-1,
     {0.0337652428984239861, 0.169395306766867743, 0.380690406958401546},
     {0.0856622461895851725, 0.180380786524069304, 0.233956967286345524}},
    {2.879093714241194e-1,
     {0.0254460438286207377, 0.12923440720030278, 0.297077424311301417, 0.5},
     {0.0647424830844348466, 0.139852695744638334, 0.190915025252559472, 0.208979591836734694}}};
double Theta(int32_t degree) { return approximants[degree].theta; }

template <ElementType E>
class TriangleLogarithm {
    typedef MatrixView<E> Matrix;
    typedef typename ScalarOf<E>::type Value;

public:
    ErrorCode replace(const Matrix &t) {
        n_ = t.rows();
        if (const ErrorCode failed =
                memory_.take(Sized(root_, n_, n_), Sized(system_, n_, n_), Sized(fraction_, n_, n_),
                             Sized(logarithms_, n_), Sized(differences_, n_), Sized(beside_, n_),
                             Sized(x_, n_), Sized(y_, n_)))
            return failed;
        takeLogarithms(t);
        CopyMatrix<E>(t, root_);
        if (!bringDiagonalNear() || !chooseDegree())
            return ErrDegenerateValue;
        subtractIdentity(t);
        approximate(t);
        for (int32_t i = 0; i < n_; ++i) {
            t(i, i) = logarithms_[i];
            if (i + 1 < n_)
                t(i, i + 1) = beside_[i];
        }
        return HoldsOnlyNumbers<E>(t) ? 0 : ErrDegenerateValue;
    }

private:
    static constexpr int32_t mostRoots = 2000; // no finite elements need as many

    // Takes the logarithms of the diagonal, and the differences of neighbours.
    void takeLogarithms(const ConstMatrixView<E> &t) {
        for (int32_t i = 0; i < n_; ++i)
            logarithms_[i] = PrincipalLogarithm(t(i, i));
        for (int32_t i = 0; i + 1 < n_; ++i) {
            const Value from = t(i, i), to = t(i + 1, i + 1), gap = to - from;
            differences_[i] =
                DifferenceOfLogarithms<Value>(from, to, logarithms_[i], logarithms_[i + 1]);
            const Value quotient = AbsSum(gap) == 0.0 ? ScalarOf<E>::Of(1.0) / from //
                                                      : differences_[i] / gap;
            beside_[i] = t(i, i + 1) * quotient;
        }
    }

    bool takeRoot() { return ++roots_ < mostRoots && TakeRoot<E>(root_, system_, 0.0); }

    // Takes roots until the diagonal is within reach of the approximants.
    bool bringDiagonalNear() {
        int32_t needed = 0;
        for (int32_t i = 0; i < n_; ++i)
            while (needed < mostRoots && !isNear(TimesPower(logarithms_[i], -needed)))
                ++needed;
        while (roots_ < needed)
            if (!takeRoot())
                return false;
        return true;
    }

    static bool isNear(Value logarithm) {
        return Modulus(ExpMinusOne(logarithm)) <= Theta(highestDegree);
    }

    // Takes more roots until an approximant is accurate enough, and sets its degree.
    bool chooseDegree() {
        const double second = rootOfNorm(2);
        double third = rootOfNorm(3);
        for (degree_ = 1; degree_ <= 2; ++degree_)
            if (std::max(second, third) <= Theta(degree_))
                return true;
        for (int32_t extra = 0;;) {
            const double fourth = rootOfNorm(4), lower = std::max(third, fourth);
            if (!(lower < HUGE_VAL))
                return false;
            for (degree_ = 3; degree_ < highestDegree; ++degree_)
                if (lower <= Theta(degree_))
                    return true;
            // One more root is cheaper than the degrees that it saves.
            const bool isWorthRoot =
                lower <= Theta(highestDegree) && 0.5 * lower <= Theta(5) && extra < 2;
            extra += isWorthRoot ? 1 : 0;
            const double least = std::min(lower, std::max(fourth, rootOfNorm(5)));
            for (degree_ = 6; !isWorthRoot && degree_ <= highestDegree; ++degree_)
                if (least <= Theta(degree_))
                    return true;
            if (!takeRoot())
                return false;
            third = rootOfNorm(3);
        }
    }

    // |(root - 1)^power|^(1/power) in the 1-norm, as an estimate.
    double rootOfNorm(int32_t power) const {
        const double norm = EstimateOneNorm<E>(
            x_,
            [&](VectorView<E> x) {
                for (int32_t k = 0; k < power; ++k) {
                    MatrixVectorProduct<E>(root_, x, y_);
                    for (int32_t i = 0; i < n_; ++i)
                        x[i] = y_[i] - x[i];
                }
            },
            [&](VectorView<E> x) {
                for (int32_t i = 0; i < n_; ++i)
                    x[i] = Conj(x[i]);
                for (int32_t k = 0; k < power; ++k) {
                    for (int32_t i = 0; i < n_; ++i)
                        y_[i] = -x[i];
                    AddTransposedProduct<E>(root_, x, y_);
                    Copy<E>(y_, x);
                }
                for (int32_t i = 0; i < n_; ++i)
                    x[i] = Conj(x[i]);
            });
        return std::pow(norm, 1.0 / power);
    }

    // Replaces the diagonal of root_ by that of root_ - 1, and recomputes the superdiagonal, both
    // from t without cancellation (A. H. Al-Mohy, "A more accurate Briggs method for the
    // logarithm", 2012, computes the diagonal in another way; N. J. Higham and L. Lin, "A
    // Schur-Pade algorithm for fractional powers of a matrix", 2011, have the superdiagonal).
    void subtractIdentity(const ConstMatrixView<E> &t) {
        for (int32_t i = 0; i < n_; ++i) {
            root_(i, i) = ExpMinusOne(divided(logarithms_[i]));
            if (i + 1 < n_)
                root_(i, i + 1) = t(i, i + 1) * quotientOfRoots(t, i);
        }
    }
    // (root of t[i+1][i+1] - root of t[i][i]) / (t[i+1][i+1] - t[i][i]).
    Value quotientOfRoots(const ConstMatrixView<E> &t, int32_t i) const {
        const Value gap = t(i + 1, i + 1) - t(i, i), small = divided(logarithms_[i]);
        if (AbsSum(gap) == 0.0)
            return Exponential(small) * std::ldexp(1.0, -roots_) / t(i, i);
        const Value mean = Exponential((small + divided(logarithms_[i + 1])) * 0.5);
        return mean * (HyperbolicSine(divided(differences_[i]) * 0.5) * 2.0 / gap);
    }
    Value divided(Value logarithm) const { return TimesPower(logarithm, -roots_); }

    // log becomes 2^roots times the approximant at root_.
    void approximate(const Matrix &log) {
        const Approximant &approximant = approximants[degree_];
        for (ElementOf<E> &element : log.elements())
            element = ScalarOf<E>::Of(0.0);
        for (int32_t k = 0; k < degree_; ++k) {
            const int32_t mirrored = degree_ - 1 - k;
            const double node =
                k <= mirrored ? approximant.nodes[k] : 1.0 - approximant.nodes[mirrored];
            addFraction(log, node, approximant.weights[std::min(k, mirrored)]);
        }
        for (ElementOf<E> &element : log.elements())
            element = TimesPower(element, roots_);
    }
    void addFraction(const Matrix &log, double node, double weight) {
        for (int32_t i = 0; i < n_; ++i) {
            for (int32_t j = 0; j < n_; ++j) {
                system_(i, j) = root_(i, j) * node;
                fraction_(i, j) = root_(i, j) * weight;
            }
            system_(i, i) = system_(i, i) + ScalarOf<E>::Of(1.0);
        }
        SolveUpperForTriangle<E>(system_, fraction_);
        for (int32_t i = 0; i < n_; ++i)
            for (int32_t j = i; j < n_; ++j)
                log(i, j) += fraction_(i, j);
    }

    int32_t n_ = 0, roots_ = 0, degree_ = 0;
    ScratchParts memory_;
    Matrix root_, system_, fraction_;
    VectorView<E> logarithms_, differences_, beside_, x_, y_;
};

} // namespace

template <ElementType E>
ErrorCode SquareRootOfTriangle(const MatrixView<E> &t, double negligible) {
    QX_EXPECTS(t.isSquare() && !t.isEmpty());
    MatrixView<E> work;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(work, t.rows(), t.rows())))
        return failed;
    return TakeRoot<E>(t, work, negligible) ? 0 : ErrDegenerateValue;
}

template <ElementType E>
ErrorCode LogarithmOfTriangle(const MatrixView<E> &t) {
    QX_EXPECTS(t.isSquare() && t.isWhole() && !t.isEmpty());
    return TriangleLogarithm<E>().replace(t);
}

template ErrorCode SquareRootOfTriangle(const RealMatrix &, double);
template ErrorCode SquareRootOfTriangle(const ComplexMatrix &, double);
template ErrorCode LogarithmOfTriangle(const RealMatrix &);
template ErrorCode LogarithmOfTriangle(const ComplexMatrix &);

} // namespace qx
