#include "poly/partial_fractions.h"

#include "frame/constants.h"
#include "frame/scratch.h"
#include "linalg/scalar.h"
#include "poly/complex_arithmetic.h"
#include "poly/multiple_roots.h"

#include <cmath>

namespace qx {

namespace {

// The distinct poles and their multiplicities.
class Poles {
public:
    ErrorCode find(const DBL *denominator, int32_t n, double tolerance) {
        ComplexVector widened;
        MultipleRoots found;
        if (const ErrorCode failed =
                memory_.take(Sized(widened, n), Sized(found.refined, n), Sized(found.simple, n),
                             Sized(found.multiplicity, n)))
            return failed;
        for (int32_t k = 0; k < n; ++k)
            widened[k] = {denominator[k], 0.0};
        if (const ErrorCode failed = FindMultipleRoots(widened, true, tolerance, &found))
            return failed == ErrNonFiniteInput ? ErrOverflow : failed;
        roots_ = found.refined;
        times_ = found.multiplicity;
        count_ = found.count;
        joinQuadratic(denominator, n, tolerance);
        joinEqual();
        pairConjugates();
        return 0;
    }

    int32_t count() const { return count_; }
    CDB operator[](int32_t i) const { return roots_[i]; }
    int32_t multiplicity(int32_t i) const { return times_[i]; }
    // The pole that is conjugate to a pole off the real axis; -1 for others.
    int32_t conjugate(int32_t i) const {
        for (int32_t j = 0; j < count_ && roots_[i].im != 0.0; ++j)
            if (roots_[j].re == roots_[i].re && roots_[j].im == -roots_[i].im)
                return j;
        return -1;
    }

private:
    // The search for multiple roots does not treat quadratics, not counting roots at 0.
    void joinQuadratic(const DBL *denominator, int32_t n, double tolerance) {
        int32_t zeros = 0;
        while (denominator[zeros] == 0.0)
            ++zeros;
        if (n - zeros != 3)
            return;
        const double c = denominator[zeros], b = denominator[zeros + 1], a = denominator[n - 1];
        const double off = (0.5 * b / a) * (0.5 * b / c) - 1.0;
        if (!(std::fabs(off) <= tolerance))
            return;
        roots_[0] = {-0.5 * b / a, 0.0};
        times_[0] = 2;
        --count_;
        for (int32_t i = 1; i < count_; ++i) {
            roots_[i] = roots_[i + 1];
            times_[i] = times_[i + 1];
        }
    }
    void joinEqual() {
        int32_t kept = 0;
        for (int32_t i = 0; i < count_; ++i) {
            int32_t same = 0;
            while (same < kept && !IsZero(roots_[same] - roots_[i]))
                ++same;
            if (same < kept) {
                times_[same] += times_[i];
                continue;
            }
            roots_[kept] = roots_[i];
            times_[kept++] = times_[i];
        }
        count_ = kept;
    }
    // The polynomial is real, so a root off the axis has a conjugate; a root that is nearer to the
    // axis than to a partner is real except for rounding errors.
    void pairConjugates() {
        for (int32_t i = 0; i < count_; ++i) {
            if (roots_[i].im == 0.0 || conjugate(i) >= 0)
                continue;
            int32_t partner = -1;
            double least = std::fabs(roots_[i].im);
            for (int32_t j = i + 1; j < count_; ++j) {
                const double distance = ScaledHypot(Conj(roots_[j]) - roots_[i]);
                if (times_[j] == times_[i] && distance < least && conjugate(j) < 0) {
                    partner = j;
                    least = distance;
                }
            }
            if (partner >= 0) {
                roots_[i] = roots_[i] * 0.5 + Conj(roots_[partner]) * 0.5;
                roots_[partner] = Conj(roots_[i]);
            } else {
                roots_[i].im = 0.0;
            }
        }
    }

    ComplexVector roots_;
    VectorView<ElementType::I32> times_;
    int32_t count_ = 0;
    ScratchParts memory_;
};

// The first terms of a power series in t = x - pole, with a separate exponent of 2.
class Series {
public:
    ErrorCode allocate(int32_t coefficients) { return a_.allocate(coefficients); }

    // A polynomial of n >= 1 ascending coefficients, by synthetic division; `terms` is at most n.
    void expand(const DBL *p, int32_t n, CDB pole, int32_t terms) {
        terms_ = terms;
        exponent_ = 0;
        for (int32_t j = 0; j < n; ++j)
            a_[j] = {p[j], 0.0};
        for (int32_t k = 0; k < terms; ++k)
            for (int32_t j = n - 2; j >= k; --j)
                a_[j] += pole * a_[j + 1];
        scale();
    }
    void divideBy(CDB constant) {
        for (int32_t k = 0; k < terms_; ++k)
            a_[k] = Quotient(a_[k], constant);
        scale();
    }
    void divideByConstantPlusT(CDB constant) {
        CDB before = {};
        for (int32_t k = 0; k < terms_; ++k)
            before = a_[k] = Quotient(a_[k] - before, constant);
        scale();
    }
    CDB coefficient(int32_t k) const {
        return {std::ldexp(a_[k].re, exponent_), std::ldexp(a_[k].im, exponent_)};
    }

private:
    void scale() {
        double largest = 0.0;
        for (int32_t k = 0; k < terms_; ++k)
            largest = std::fmax(largest, AbsSum(a_[k]));
        if (!(largest > 0.0) || !std::isfinite(largest) ||
            (largest > 0x1p-300 && largest < 0x1p300))
            return;
        int by = 0;
        std::frexp(largest, &by);
        for (int32_t k = 0; k < terms_; ++k)
            a_[k] = {std::ldexp(a_[k].re, -by), std::ldexp(a_[k].im, -by)};
        exponent_ += by;
    }

    Scratch<ElementType::CDB> a_;
    int32_t terms_ = 0, exponent_ = 0;
};

} // namespace

ErrorCode PolesAndResidues(ConstRealVector numerator, ConstRealVector denominator, double tolerance,
                           ComplexVector poles, ComplexVector residues) {
    const auto n = static_cast<int32_t>(denominator.size());
    QX_EXPECTS(n > 1 && numerator.size() == n - 1 && tolerance > 0.0);
    Poles found;
    if (const ErrorCode failed = found.find(denominator.data(), n, tolerance))
        return failed;
    Series series;
    if (const ErrorCode failed = series.allocate(n - 1))
        return failed;
    for (int32_t i = 0, first = 0; i < found.count(); first += found.multiplicity(i), ++i) {
        const int32_t times = found.multiplicity(i);
        const CDB pole = found[i];
        // Below the axis, the residues are the conjugates of those above it.
        const CDB above = pole.im < 0.0 ? Conj(pole) : pole;
        series.expand(numerator.data(), n - 1, above, times);
        for (int32_t j = 0; j < found.count(); ++j) {
            const CDB distance = above - found[j];
            const bool isOwn = above.re == found[j].re && above.im == found[j].im;
            for (int32_t k = 0; k < found.multiplicity(j) && !isOwn; ++k)
                series.divideByConstantPlusT(distance);
        }
        series.divideBy({denominator[n - 1], 0.0});
        for (int32_t k = 0; k < times; ++k) {
            const CDB residue = series.coefficient(times - 1 - k);
            poles[first + k] = pole;
            residues[first + k] = pole.im < 0.0 ? Conj(residue) : residue;
            if (pole.im == 0.0)
                residues[first + k].im = 0.0;
        }
    }
    return 0;
}

} // namespace qx
