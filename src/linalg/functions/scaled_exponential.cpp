#include "linalg/complex_functions.h"
#include "linalg/factorisations/range.h"
#include "linalg/functions/diagonal.h"
#include "linalg/functions/functions.h"
#include "linalg/kernels.h"
#include "linalg/products/products.h"
#include "linalg/properties/norm_estimate.h"
#include "linalg/systems/lu.h"

#include <algorithm>
#include <cmath>
#include <initializer_list>
#include <utility>

namespace qx {
namespace {

// The method of A. H. Al-Mohy and N. J. Higham, "A new scaling and squaring algorithm for the matrix
// exponential", 2009: the degree of the Pade approximant and the number of squarings follow from
// norms of powers of the matrix instead of powers of its norm, so that a matrix whose powers are
// small is not squared more often than necessary.

// The coefficients of the approximants, and the largest norm for which each serves.
struct Degree {
    int32_t m;
    double theta;
    double coefficients[14];
    double logError; // -log2 of binomial(2 m, m) (2 m + 1)!
};
constexpr Degree degrees[] = {
    {3, 1.495585217958292e-2, {120, 60, 12, 1}, -16.6211361133},
    {5, 2.539398330063230e-1, {30240, 15120, 3360, 420, 30, 1}, -33.2277726569},
    {7,
     9.504178996162932e-1,
     {17297280, 8648640, 1995840, 277200, 25200, 1512, 56, 1},
     -51.9949743074},
    {9,
     2.097847961257068,
     {17643225600, 8821612800, 2075673600, 302702400, 30270240, 2162160, 110880, 3960, 90, 1},
     -72.3247180989},
    {13,
     4.25,
     {64764752532480000, 32382376266240000, 7771770303897600, 1187353796428800, 129060195264000,
      10559470521600, 670442572800, 33522128640, 1323241920, 40840800, 960960, 16380, 182, 1},
     -116.4470042518}};

template <ElementType E>
class Exponential2009 {
    typedef MatrixView<E> Matrix;

public:
    // The memory of the result serves as work memory until the end.
    explicit Exponential2009(Matrix out) : out_(out) {}

    ErrorCode find(const ConstMatrixView<E> &a) {
        n_ = a.rows();
        if (const ErrorCode failed = memory_.take(
                Sized(a_, n_, n_), Sized(a2_, n_, n_), Sized(a4_, n_, n_), Sized(a6_, n_, n_),
                Sized(odd_, n_, n_), Sized(even_, n_, n_), Sized(x_, n_), Sized(y_, n_),
                Sized(sums_, n_), Sized(next_, n_), Sized(exponents_, n_), Sized(pivots_, n_)))
            return failed;
        CopyMatrix<E>(a, a_);
        const bool isBalanced = OneNorm<E>(a_) >= tooLargeForOnes;
        if (isBalanced)
            balance();
        if (!formPowers()) { // the powers of 2^-power_ a do not overflow
            power_ = ScaleTo<E>(a_, mostBinary);
            formPowers();
        }
        norm_ = OneNorm<E>(a_);
        const int32_t squarings = choose();
        approximate();
        if (const ErrorCode failed = divide())
            return failed;
        for (int32_t i = 0; i < squarings; ++i) {
            OrderedProduct<E>(out_, out_, odd_);
            CopyMatrix<E>(odd_, out_);
        }
        if (isBalanced)
            scaleSimilarly(out_, 1);
        return 0;
    }

private:
    static constexpr int mostBinary = 10;
    static constexpr double tooLargeForOnes = 0x1p53; // at such norms rounding errors exceed 1
    static constexpr int mostExponent = 1024;         // every element is below 2^mostExponent

    // a_ becomes D^-1 a_ D, where D is diagonal and has the powers of two 2^exponents_, so that the
    // largest element is as small as this can make it, but not below 1: about the largest geometric
    // mean of the moduli on a cycle, which is at most the spectral radius of the matrix of moduli.
    void balance() {
        for (int32_t i = 0; i < n_; ++i)
            for (int32_t j = 0; j < n_; ++j)
                even_(i, j) = ScalarOf<E>::Of(binaryExponent(a_(i, j)));
        int tooSmall = -1, bound = mostExponent;
        while (bound - tooSmall > 1) {
            const int middle = tooSmall + (bound - tooSmall) / 2;
            (findExponents(middle) ? bound : tooSmall) = middle;
        }
        findExponents(bound);
        scaleSimilarly(a_, -1);
    }
    static double binaryExponent(const ElementOf<E> &element) {
        const double size = std::max(std::fabs(RealPart(element)), std::fabs(ImagPart(element)));
        int exponent;
        std::frexp(size, &exponent);
        return size > 0.0 ? exponent : -HUGE_VAL;
    }
    // Sets exponents with which every scaled element is below 2^bound; returns false if there are
    // none. exponents_[j] - exponents_[i] may be at most `bound` minus the exponent of element (i,
    // j). With that as the length of the edge from i to j, lengths of shortest paths are such
    // exponents (Bellman and Ford): those from any node to j (sums_), and negated those from i to any
    // node (next_). The mean of the two has smaller values.
    bool findExponents(int bound) {
        for (int32_t i = 0; i < n_; ++i)
            sums_[i] = next_[i] = 0.0;
        bool changes = true;
        for (int32_t round = 0; changes && round <= n_; ++round) {
            changes = false;
            for (int32_t i = 0; i < n_; ++i)
                for (int32_t j = 0; j < n_; ++j) {
                    const double length = bound - RealPart(even_(i, j));
                    changes |= sums_[j] > sums_[i] + length || next_[i] < next_[j] - length;
                    sums_[j] = std::min<double>(sums_[j], sums_[i] + length);
                    next_[i] = std::max<double>(next_[i], next_[j] - length);
                }
        }
        if (changes) // a cycle of negative length
            return false;
        for (int32_t i = 0; i < n_; ++i)
            exponents_[i] = static_cast<int32_t>(std::floor((sums_[i] + next_[i]) / 2.0));
        return true;
    }
    // Multiplies the elements of a by 2^(times (exponents_[row] - exponents_[column])).
    void scaleSimilarly(const Matrix &a, int times) const {
        for (int32_t i = 0; i < n_; ++i)
            for (int32_t j = 0; j < n_; ++j)
                a(i, j) = TimesPower(a(i, j), times * (exponents_[i] - exponents_[j]));
    }

    bool formPowers() {
        OrderedProduct<E>(a_, a_, a2_);
        OrderedProduct<E>(a2_, a2_, a4_);
        OrderedProduct<E>(a2_, a4_, a6_);
        // Leaves room for the products of powers that are estimated and for the coefficients of the
        // approximants.
        constexpr double tooLarge = 0x1p600, tooLargeOnce = 0x1p960;
        return OneNorm<E>(a4_) < tooLarge && OneNorm<E>(a6_) < tooLarge &&
               OneNorm<E>(a_) < tooLargeOnce && OneNorm<E>(a2_) < tooLargeOnce;
    }

    // Sets the degree, scales the powers and returns how often the approximant is to be squared.
    int32_t choose() {
        const double d6 = std::pow(normOfProduct({a2_, a2_, a2_}), 1.0 / 6.0);
        const double d4 = std::pow(OneNorm<E>(a4_), 0.25);
        if (power_ == 0) {
            degree_ = &degrees[0];
            if (serves(std::max(d4, d6)))
                return 0;
            degree_ = &degrees[1];
            if (serves(std::max(d4, d6)))
                return 0;
        }
        const double exactD6 = std::pow(OneNorm<E>(a6_), 1.0 / 6.0);
        const double d8 = std::pow(normOfProduct({a4_, a4_}), 0.125);
        const double third = std::max(exactD6, d8);
        if (power_ == 0)
            for (const int32_t which : {2, 3}) {
                degree_ = &degrees[which];
                if (serves(third))
                    return 0;
            }
        degree_ = &degrees[4];
        const double d10 = std::pow(normOfProduct({a4_, a6_}), 0.1);
        const double fifth = std::min(third, std::max(d8, d10));
        int32_t squarings = 0;
        if (fifth > 0.0 && std::isfinite(fifth))
            squarings = std::max(0, int32_t(std::ceil(std::log2(fifth / degree_->theta))) + power_);
        squarings += moreSquarings(squarings - power_);
        scalePowers(power_ - squarings);
        return squarings;
    }
    bool serves(double eta) const { return eta <= degree_->theta && moreSquarings(0) == 0; }

    // The number of further squarings that keep the backward error of the approximant, at
    // 2^-halvings times the matrix, within 2^-53. It follows from the norm of power 2 m + 1 of the
    // matrix of moduli.
    int32_t moreSquarings(int32_t halvings) const {
        const int32_t m = degree_->m;
        for (int32_t j = 0; j < n_; ++j)
            sums_[j] = 1.0;
        double scale = 0.0; // a power of two taken out of the sums
        for (int32_t k = 0; k < 2 * m + 1; ++k) {
            double largest = 0.0;
            for (int32_t j = 0; j < n_; ++j)
                next_[j] = 0.0;
            for (int32_t i = 0; i < n_; ++i)
                for (int32_t j = 0; j < n_; ++j)
                    next_[j] += Modulus(a_(i, j)) * sums_[i];
            for (int32_t j = 0; j < n_; ++j)
                largest = std::max(largest, next_[j] + 0.0);
            if (largest == 0.0)
                return 0;
            int exponent;
            std::frexp(largest, &exponent);
            scale += exponent;
            for (int32_t j = 0; j < n_; ++j)
                sums_[j] = std::ldexp(next_[j], -exponent);
        }
        double largest = 0.0;
        for (int32_t j = 0; j < n_; ++j)
            largest = std::max(largest, sums_[j] + 0.0);
        const double log =
            degree_->logError + scale + std::log2(largest) - std::log2(norm_) - 2.0 * m * halvings;
        return std::max(0, int32_t(std::ceil((log + 53.0) / (2.0 * m))));
    }

    double normOfProduct(std::initializer_list<Matrix> factors) const {
        return EstimateOneNorm<E>(
            x_,
            [&](VectorView<E> x) {
                for (const Matrix &factor : factors) {
                    MatrixVectorProduct<E>(factor, x, y_);
                    Copy<E>(y_, x);
                }
            },
            [&](VectorView<E> x) {
                for (const Matrix &factor : factors) {
                    for (int32_t i = 0; i < n_; ++i) {
                        x[i] = Conj(x[i]);
                        y_[i] = ScalarOf<E>::Of(0.0);
                    }
                    AddTransposedProduct<E>(factor, x, y_);
                    for (int32_t i = 0; i < n_; ++i)
                        x[i] = Conj(y_[i]);
                }
            });
    }

    void scalePowers(int32_t power) {
        const auto scale = [power](Matrix a, int32_t times) {
            for (ElementOf<E> &element : a.elements())
                element = TimesPower(element, times * power);
        };
        scale(a_, 1);
        scale(a2_, 2);
        scale(a4_, 4);
        scale(a6_, 6);
    }

    // odd_ and even_ become the odd and the even part of the numerator.
    void approximate() {
        const double *c = degree_->coefficients;
        if (degree_->m == 13) {
            sum(odd_, 0.0, c[9], c[11], c[13]);
            multiplyAndAdd(odd_, c[1], c[3], c[5], c[7]);
            sum(even_, 0.0, c[8], c[10], c[12]);
            multiplyAndAdd(even_, c[0], c[2], c[4], c[6]);
        } else {
            const int32_t m = degree_->m;
            const auto at = [&](int32_t k) { return k <= m ? c[k] : 0.0; };
            sum(odd_, c[1], at(3), at(5), at(7));
            sum(even_, c[0], c[2], at(4), at(6));
            if (m == 9) {
                OrderedProduct<E>(a4_, a4_, spare());
                addTimes(odd_, c[9]);
                addTimes(even_, c[8]);
            }
        }
        CopyMatrix<E>(odd_, spare());
        OrderedProduct<E>(a_, spare(), odd_);
    }
    // The memory of a^2, which is free after its last use.
    Matrix spare() const { return a2_; }
    void addTimes(Matrix to, double factor) const {
        for (int32_t i = 0; i < n_; ++i)
            for (int32_t j = 0; j < n_; ++j)
                to(i, j) = to(i, j) + spare()(i, j) * factor;
    }
    // c0 + c2 a^2 + c4 a^4 + c6 a^6.
    void sum(Matrix to, double c0, double c2, double c4, double c6) const {
        for (int32_t i = 0; i < n_; ++i) {
            for (int32_t j = 0; j < n_; ++j)
                to(i, j) = a6_(i, j) * c6 + a4_(i, j) * c4 + a2_(i, j) * c2;
            to(i, i) = to(i, i) + ScalarOf<E>::Of(c0);
        }
    }
    // `to` becomes a^6 times itself plus such a sum.
    void multiplyAndAdd(Matrix to, double c0, double c2, double c4, double c6) const {
        CopyMatrix<E>(to, out_);
        sum(to, c0, c2, c4, c6);
        AddProduct<E>(a6_, out_, to);
    }
    // out_ = (even - odd)^-1 (even + odd).
    ErrorCode divide() {
        for (int32_t i = 0; i < n_; ++i)
            for (int32_t j = 0; j < n_; ++j) {
                const auto u = odd_(i, j), v = even_(i, j);
                out_(i, j) = v + u;
                even_(i, j) = v - u;
            }
        int32_t parity;
        LUDecompose<E>(even_, pivots_, &parity);
        return LUSolve<E>(even_, pivots_, out_, out_);
    }

    int32_t n_ = 0;
    int power_ = 0;
    double norm_ = 0.0;
    const Degree *degree_ = nullptr;
    ScratchParts memory_;
    Matrix a_, a2_, a4_, a6_, odd_, even_, out_;
    VectorView<E> x_, y_;
    RealVector sums_, next_;
    IndexVector exponents_, pivots_;
};

} // namespace

template <ElementType E>
ErrorCode ScaledExponential(const ConstMatrixView<E> &a, const MatrixView<E> &out) {
    QX_EXPECTS(a.isSquare() && !a.isEmpty() && out.rows() == a.rows() && out.cols() == a.rows());
    if (!HoldsOnlyNumbers<E>(a))
        return ErrNonFiniteInput;
    if (!IsDiagonal<E>(a))
        return Exponential2009<E>(out).find(a);
    CopyMatrix<E>(a, out);
    for (int32_t i = 0; i < a.rows(); ++i)
        out(i, i) = Exponential(a(i, i));
    return 0;
}

template ErrorCode ScaledExponential(const ConstRealMatrix &, const RealMatrix &);
template ErrorCode ScaledExponential(const ConstComplexMatrix &, const ComplexMatrix &);

} // namespace qx
