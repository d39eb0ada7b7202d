#include "fit/nonlinear.h"

#include "fit/sequential_qr.h"
#include "fit/trust_region_step.h"
#include "frame/constants.h"
#include "linalg/matrix.h"

#include <algorithm>
#include <cmath>
#include <utility>

namespace qx {

namespace {

// The relative accuracy of a parameter if a fit reports that it has converged.
constexpr double claimedDigits = 1e-7;

// A point and the values of the model there.
struct FitState {
    RealVector p, values, residuals; // of the weighted model less y
    double cost;
};

// The model with its weights and its loss.
class WeightedModel {
public:
    explicit WeightedModel(const NonlinearFit &fit)
        : fit_(fit), n_(static_cast<int32_t>(fit.y.size())), k_(fit.model.count) {}

    // ErrOutOfMemory.
    ErrorCode take() {
        if (const ErrorCode failed =
                memory_.take(Sized(roots_, fit_.w.isEmpty() ? 0 : n_), Sized(jacobian_, n_, k_),
                             Sized(moved_, k_), Sized(probes_, 4, n_), Sized(typical_, k_)))
            return failed;
        for (std::ptrdiff_t i = 0; i < roots_.size(); ++i)
            roots_[i] = std::sqrt(std::fabs(fit_.w[i]));
        return 0;
    }
    // The magnitudes that are assumed for parameters that become 0.
    void setTypical(ConstRealVector p) {
        for (int32_t j = 0; j < k_; ++j)
            typical_[j] = p[j] == 0.0 ? 1.0 : 0x1p-26 * std::fabs(p[j]);
    }

    // Computes the residuals and the cost, which is infinite if a residual is not finite.
    // ErrNotAvailable.
    ErrorCode evaluate(FitState &at) const {
        if (fit_.model.values(fit_.model.user, at.p.data(), at.values.data()) != 0)
            return ErrNotAvailable;
        double sum = 0.0;
        for (int32_t i = 0; i < n_; ++i) {
            at.residuals[i] = root(i) * (at.values[i] - fit_.y[i]);
            sum += lossOf(at.residuals[i]);
        }
        at.cost = std::isfinite(sum) ? 0.5 * sum : kInfinity;
        return 0;
    }

    // The decrease of the cost from one point to the other, with the digits that a difference of
    // sums would lose.
    double fall(const FitState &from, const FitState &to) const {
        double sum = 0.0;
        for (int32_t i = 0; i < n_; ++i) {
            const double a = from.residuals[i], b = to.residuals[i];
            sum += fit_.loss == Loss::Linear ? (a - b) * (a + b) : lossOf(a) - lossOf(b);
        }
        return 0.5 * sum;
    }

    // The derivatives at a point; isFine selects differences of higher order.
    // ErrNotAvailable.
    ErrorCode differentiate(const FitState &at, bool isFine) {
        if (fit_.model.jacobian != nullptr)
            return fit_.model.jacobian(fit_.model.user, at.p.data(), jacobian_.data()) != 0
                       ? ErrNotAvailable
                       : 0;
        Copy<ElementType::DBL>(at.p, moved_);
        for (int32_t j = 0; j < k_; ++j) {
            if (const ErrorCode failed = differences(at, j, isFine))
                return failed;
            moved_[j] = at.p[j];
        }
        return 0;
    }

    // The triangle of the derivatives, weighted by the loss, and the residuals beside it.
    // ErrOutOfMemory, ErrNonFiniteInput.
    ErrorCode reduce(const FitState &at, const RealMatrix &r, RealVector z) const {
        const auto write = [&](const RowBlock &block) { writeRows(at, block); };
        SequentialQR triangle;
        if (const ErrorCode failed = triangle.reduce({write, n_, k_, nullptr}))
            return failed;
        for (int32_t i = 0; i < k_; ++i) {
            for (int32_t j = 0; j < k_; ++j)
                r(i, j) = j < i ? 0.0 : triangle.row(i)[j];
            z[i] = triangle.target(i);
        }
        return 0;
    }

    // The weighted length of y.
    double sizeOfY() const {
        double squares = 0.0;
        for (int32_t i = 0; i < n_; ++i)
            squares += root(i) * fit_.y[i] * (root(i) * fit_.y[i]);
        return std::sqrt(squares);
    }
    bool hasDerivatives() const { return fit_.model.jacobian != nullptr; }

private:
    double root(int32_t i) const { return roots_.isEmpty() ? 1.0 : roots_[i]; }
    // C^2 rho(r^2 / C^2).
    double lossOf(double r) const {
        if (fit_.loss == Loss::Linear)
            return r * r;
        const double ratio = r / fit_.scale;
        return fit_.scale * (fit_.scale * EvaluateLoss(fit_.loss, ratio * ratio).value);
    }

    // Triggs' correction: the rows of a least-squares problem with the gradient of the loss, and
    // with its curvature as far as that is positive.
    void writeRows(const FitState &at, const RowBlock &block) const {
        DBL *const target = block.column(k_);
        for (int32_t i = 0; i < block.count; ++i) {
            const int32_t sample = block.first + i;
            const DBL *const derivatives = jacobian_.row(sample);
            double factor = 1.0, r = at.residuals[sample];
            if (fit_.loss != Loss::Linear) {
                const double z = r / fit_.scale * (r / fit_.scale);
                const LossAt loss = EvaluateLoss(fit_.loss, z);
                factor = std::sqrt(std::max(loss.slope + 2.0 * loss.bend * z, kEpsilon));
                r *= loss.slope / factor;
            }
            factor *= root(sample);
            for (int32_t j = 0; j < k_; ++j)
                block.column(j)[i] = factor * derivatives[j];
            target[i] = r;
        }
    }

    // The values at p with parameter j moved by h, into a row of probes_.
    ErrorCode probe(const FitState &at, int32_t j, double h, int32_t row) {
        moved_[j] = at.p[j] + h;
        const bool hasEnded =
            fit_.model.values(fit_.model.user, moved_.data(), probes_.row(row)) != 0;
        return hasEnded ? ErrNotAvailable : 0;
    }

    double lower(int32_t j) const {
        return fit_.bounds.lower.isEmpty() ? -kInfinity : fit_.bounds.lower[j];
    }
    double upper(int32_t j) const {
        return fit_.bounds.upper.isEmpty() ? kInfinity : fit_.bounds.upper[j];
    }

    // Computes column j. The steps are powers of two, so that a parameter moves as nearly as
    // possible by the number by which the difference is divided.
    ErrorCode differences(const FitState &at, int32_t j, bool isFine) {
        const double below = at.p[j] - lower(j), above = upper(j) - at.p[j];
        if (below + above == 0.0) {
            for (int32_t i = 0; i < n_; ++i)
                jacobian_(i, j) = 0.0;
            return 0;
        }
        int exponent;
        std::frexp(std::max(std::fabs(at.p[j]), double{typical_[j]}), &exponent);
        const double fine = std::ldexp(1.0, exponent - 14), usual = std::ldexp(1.0, exponent - 18);
        if (isFine && below >= 2.0 * fine && above >= 2.0 * fine)
            return fourthOrder(at, j, fine);
        if (below >= usual && above >= usual)
            return secondOrder(at, j, usual);
        const double room = 0.5 * std::max(below, above);
        return oneSided(at, j, std::min(usual, room), above > below);
    }
    ErrorCode fourthOrder(const FitState &at, int32_t j, double h) {
        const double steps[] = {-2.0 * h, -h, h, 2.0 * h};
        for (int32_t row = 0; row < 4; ++row)
            if (const ErrorCode failed = probe(at, j, steps[row], row))
                return failed;
        for (int32_t i = 0; i < n_; ++i)
            jacobian_(i, j) =
                (8.0 * (probes_(2, i) - probes_(1, i)) - (probes_(3, i) - probes_(0, i))) /
                (12.0 * h);
        return 0;
    }
    ErrorCode secondOrder(const FitState &at, int32_t j, double h) {
        if (const ErrorCode failed = probe(at, j, h, 0))
            return failed;
        const double up = moved_[j];
        if (const ErrorCode failed = probe(at, j, -h, 1))
            return failed;
        const double width = up - moved_[j];
        for (int32_t i = 0; i < n_; ++i)
            jacobian_(i, j) = (probes_(0, i) - probes_(1, i)) / width;
        return 0;
    }
    ErrorCode oneSided(const FitState &at, int32_t j, double size, bool isUp) {
        const double h = isUp ? size : -size;
        for (int32_t row = 0; row < 2; ++row)
            if (const ErrorCode failed = probe(at, j, (row + 1) * h, row))
                return failed;
        for (int32_t i = 0; i < n_; ++i)
            jacobian_(i, j) =
                (4.0 * (probes_(0, i) - at.values[i]) - (probes_(1, i) - at.values[i])) / (2.0 * h);
        return 0;
    }

    const NonlinearFit &fit_;
    const int32_t n_, k_;
    RealVector roots_, moved_, typical_;
    RealMatrix jacobian_, probes_;
    ScratchParts memory_;
};

class TrustRegionFit {
public:
    explicit TrustRegionFit(const NonlinearFit &fit)
        : fit_(fit), model_(fit), n_(static_cast<int32_t>(fit.y.size())), k_(fit.model.count) {}

    ErrorCode take() {
        if (const ErrorCode failed = memory_.take(
                Sized(here_.p, k_), Sized(here_.values, n_), Sized(here_.residuals, n_),
                Sized(there_.p, k_), Sized(there_.values, n_), Sized(there_.residuals, n_),
                Sized(r_, k_, k_), Sized(z_, k_), Sized(scale_, k_), Sized(lengths_, k_),
                Sized(lowest_, k_), Sized(highest_, k_)))
            return failed;
        if (const ErrorCode failed = model_.take())
            return failed;
        return move_.take(k_);
    }

    ErrorCode run(NonlinearResult *result) {
        if (const ErrorCode failed = begin(result->p))
            return failed;
        ErrorCode status = descend();
        if (status == 0)
            status = polish();
        if (status != 0)
            return status;
        return finish(result);
    }

private:
    double lower(int32_t j) const {
        return fit_.bounds.lower.isEmpty() ? -kInfinity : fit_.bounds.lower[j];
    }
    double upper(int32_t j) const {
        return fit_.bounds.upper.isEmpty() ? kInfinity : fit_.bounds.upper[j];
    }

    ErrorCode begin(ConstRealVector start) {
        for (int32_t j = 0; j < k_; ++j) {
            here_.p[j] = std::min(std::max(double{start[j]}, lower(j)), upper(j));
            scale_[j] = 0.0;
        }
        model_.setTypical(here_.p);
        sizeOfY_ = model_.sizeOfY();
        if (const ErrorCode failed = model_.evaluate(here_))
            return failed;
        if (here_.cost == kInfinity)
            return ErrNonFiniteFunction;
        if (const ErrorCode failed = linearise(false))
            return failed == ErrNonFiniteInput ? ErrNonFiniteFunction : failed;
        double squares = 0.0;
        for (int32_t j = 0; j < k_; ++j)
            squares += scale_[j] * here_.p[j] * (scale_[j] * here_.p[j]);
        radius_ = squares > 0.0 ? firstRadius * std::sqrt(squares) : firstRadius;
        return 0;
    }

    // ErrOutOfMemory, ErrNotAvailable, ErrNonFiniteInput.
    ErrorCode linearise(bool isFine) {
        if (const ErrorCode failed = model_.differentiate(here_, isFine))
            return failed;
        if (const ErrorCode failed = model_.reduce(here_, r_, z_))
            return failed;
        for (int32_t j = 0; j < k_; ++j) {
            double squares = 0.0;
            for (int32_t i = 0; i <= j; ++i)
                squares += r_(i, j) * r_(i, j);
            lengths_[j] = std::sqrt(squares);
            scale_[j] = std::max(double{scale_[j]}, double{lengths_[j]});
            if (scale_[j] == 0.0)
                scale_[j] = 1.0;
            lowest_[j] = lower(j) - here_.p[j];
            highest_[j] = upper(j) - here_.p[j];
        }
        return 0;
    }

    // Computes the step within `radius`, and the model at its end.
    ErrorCode tryStep(double radius) {
        move_.find({r_, z_}, scale_, lowest_, highest_, radius);
        for (int32_t j = 0; j < k_; ++j) {
            const double s = move_.step[j];
            // A bound is reached to the bit.
            there_.p[j] = s == lowest_[j] ? lower(j)
                          : s == highest_[j]
                              ? upper(j)
                              : std::min(std::max(here_.p[j] + s, lower(j)), upper(j));
        }
        return model_.evaluate(there_);
    }

    // The largest relative change of a parameter by the step. A parameter with little effect may
    // well be 0, so its magnitude is taken to be at least what would change the model by a
    // millionth of y.
    double largestMove() const {
        double largest = 0.0;
        for (int32_t j = 0; j < k_; ++j) {
            const double s = std::fabs(move_.step[j]);
            const double least = lengths_[j] > 0.0 ? 1e-6 * sizeOfY_ / lengths_[j] : 0.0;
            const double size = std::max(std::fabs(here_.p[j]), least);
            if (s > 0.0)
                largest = std::max(largest, s / size);
        }
        return largest;
    }

    // Iterates until the step of the linear model is so small that it is as good as Newton's, or
    // until the cost no longer falls.
    ErrorCode descend() {
        constexpr double smallStep = 1e-5;
        while (iterations_ < fit_.limit) {
            if (here_.cost == 0.0) {
                end_ = FitEnd::Exact;
                return 0;
            }
            ++iterations_;
            if (const ErrorCode failed = tryStep(radius_))
                return failed;
            const bool isNewton = move_.isInside && largestMove() <= smallStep;
            const double actual = there_.cost < kInfinity ? model_.fall(here_, there_) : -kInfinity;
            const bool isBetter = actual > 0.0;
            adapt(actual);
            if (isBetter) {
                std::swap(here_, there_);
                const ErrorCode failed = linearise(false);
                if (failed == ErrNonFiniteInput) { // cannot continue without derivatives
                    std::swap(here_, there_);
                    radius_ = 0.25 * move_.length;
                    if (const ErrorCode again = linearise(false))
                        return again == ErrNonFiniteInput ? ErrNonFiniteFunction : again;
                } else if (failed != 0) {
                    return failed;
                }
            }
            if (isNewton || move_.predicted <= 0.0 ||
                (!isBetter && move_.predicted <= noise * here_.cost) || hasCollapsed()) {
                isAtRest_ = true;
                return 0;
            }
        }
        return 0;
    }

    void adapt(double actual) {
        const double ratio = move_.predicted > 0.0 ? actual / move_.predicted : 0.0;
        if (ratio < 0.25)
            radius_ = 0.25 * std::min(radius_, move_.length);
        else if (ratio > 0.75 && !move_.isInside)
            radius_ = std::max(radius_, 2.0 * move_.length);
    }

    bool hasCollapsed() const {
        for (int32_t j = 0; j < k_; ++j)
            if (scale_[j] * std::fabs(here_.p[j]) * kEpsilon < radius_ && highest_[j] > lowest_[j])
                return false;
        return true;
    }

    // Takes Gauss-Newton steps as long as each is shorter than the one before: parameters that
    // differ in the second half of their digits have the same cost, so the cost cannot rank these
    // points.
    ErrorCode polish() {
        if (end_ == FitEnd::Exact || !isAtRest_)
            return 0;
        if (!model_.hasDerivatives()) {
            const ErrorCode failed = linearise(true);
            if (failed == ErrNonFiniteInput)
                return linearise(false);
            if (failed != 0)
                return failed;
        }
        double before = kInfinity;
        for (int round = 0; round < mostPolishing; ++round) {
            if (const ErrorCode failed = tryStep(kInfinity))
                return failed;
            const double move = largestMove(), length = move_.length;
            const bool isWorse =
                !(there_.cost <= here_.cost * (1.0 + 1e-6) + 0x1p-1000) || !(length < 0.7 * before);
            if (isWorse || length == 0.0 || !(move < 1e-2))
                return 0;
            before = length;
            std::swap(here_, there_);
            ++iterations_;
            const ErrorCode failed = linearise(true);
            if (failed == ErrNonFiniteInput) {
                std::swap(here_, there_);
                return linearise(false);
            }
            if (failed != 0)
                return failed;
            if (move <= fit_.tolerance)
                return 0;
        }
        return 0;
    }

    bool isFixed(int32_t j) const { return lower(j) == upper(j); }

    // Determines why the iteration has ended, and the covariance.
    ErrorCode finish(NonlinearResult *result) {
        Copy<ElementType::DBL>(here_.p, result->p);
        for (std::ptrdiff_t i = 0; i < result->residuals.size(); ++i)
            result->residuals[i] = fit_.y[i] - here_.values[i];
        result->cost = here_.cost;
        result->iterations = iterations_;
        ScaledColumns columns;
        if (const ErrorCode failed = columns.take(k_))
            return failed;
        for (int32_t j = 0; j < k_; ++j) {
            move_.isFree[j] = !isFixed(j);
            lengths_[j] = lengths_[j] > 0.0 ? lengths_[j] : 1.0;
        }
        columns.decompose(r_, move_.isFree, lengths_);
        const bool isDetermined = hasFullRank(columns);
        if (!result->covariance.isEmpty())
            writeCovariance(columns, isDetermined, result->covariance);
        result->end = endOf(isDetermined);
        return 0;
    }

    bool hasFullRank(const ScaledColumns &columns) const {
        // Derivatives from differences have no more digits than this.
        const double least =
            (model_.hasDerivatives() ? 16.0 * kEpsilon : 1e-11) * columns.largest();
        for (int32_t i = 0; i < columns.count(); ++i)
            if (!(columns.sigma(i) > least))
                return false;
        return true;
    }

    void writeCovariance(const ScaledColumns &columns, bool isDetermined, const RealMatrix &out) {
        const int32_t n = columns.count(), dof = n_ - n;
        const double variance = isDetermined && dof > 0 ? 2.0 * here_.cost / dof : kInfinity;
        Fill(out.data(), std::ptrdiff_t{k_} * k_, 0.0);
        for (int32_t a = 0; a < n; ++a)
            for (int32_t b = 0; b <= a; ++b) {
                double sum = 0.0;
                for (int32_t i = 0; variance < kInfinity && i < n; ++i)
                    sum +=
                        columns.v(a, i) / columns.sigma(i) * (columns.v(b, i) / columns.sigma(i));
                const int32_t row = columns.column(a), col = columns.column(b);
                const double element = variance < kInfinity
                                           ? sum * variance / lengths_[row] / lengths_[col]
                                           : kInfinity;
                out(row, col) = out(col, row) = element;
            }
    }

    FitEnd endOf(bool isDetermined) {
        if (end_ != FitEnd::Exact && here_.cost > 0.0 && !isAtRest_)
            return FitEnd::Limit;
        if (!isDetermined)
            return FitEnd::Undetermined;
        if (here_.cost == 0.0)
            return FitEnd::Exact;
        move_.find({r_, z_}, lengths_, lowest_, highest_, kInfinity);
        return largestMove() <= claimedDigits ? FitEnd::Converged : FitEnd::NoLowerCost;
    }

    static constexpr double firstRadius = 1.0;
    static constexpr double noise = 1e-12;
    static constexpr int mostPolishing = 40;

    const NonlinearFit &fit_;
    WeightedModel model_;
    const int32_t n_, k_;
    FitState here_ = {}, there_ = {};
    RealMatrix r_;
    RealVector z_, scale_, lengths_, lowest_, highest_;
    TrustRegionStep move_;
    double radius_ = 0.0, sizeOfY_ = 0.0;
    int32_t iterations_ = 0;
    FitEnd end_ = FitEnd::Limit;
    bool isAtRest_ = false;
    ScratchParts memory_;
};

} // namespace

ErrorCode FitNonlinear(const NonlinearFit &fit, NonlinearResult *result) {
    TrustRegionFit iteration(fit);
    if (const ErrorCode failed = iteration.take())
        return failed;
    return iteration.run(result);
}

} // namespace qx
