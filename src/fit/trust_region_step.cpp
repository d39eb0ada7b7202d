#include "fit/trust_region_step.h"

#include "frame/constants.h"

#include <algorithm>
#include <cmath>
#include <utility>

namespace qx {

namespace {

double Dot(const DBL *a, const DBL *b, int32_t n) {
    double sum = 0.0;
    for (int32_t i = 0; i < n; ++i)
        sum += a[i] * b[i];
    return sum;
}

void Rotate(DBL *a, DBL *b, int32_t n, double c, double s) {
    for (int32_t i = 0; i < n; ++i) {
        const double x = a[i], y = b[i];
        a[i] = c * x - s * y;
        b[i] = s * x + c * y;
    }
}

} // namespace

ErrorCode ScaledColumns::take(int32_t columns) {
    return memory_.take(Sized(u_, columns, columns), Sized(v_, columns, columns),
                        Sized(sigma_, columns), Sized(columns_, columns));
}

void ScaledColumns::decompose(const RealMatrix &r, ConstVectorView<ElementType::I32> isFree,
                              ConstRealVector scale) {
    constexpr int mostSweeps = 60;
    const int32_t k = r.cols();
    count_ = 0;
    for (int32_t j = 0; j < k; ++j)
        if (isFree[j] != 0)
            columns_[count_++] = j;
    for (int32_t i = 0; i < count_; ++i) {
        const int32_t j = columns_[i];
        for (int32_t row = 0; row < k; ++row)
            u_(i, row) = row <= j ? r(row, j) / scale[j] : 0.0;
        for (int32_t other = 0; other < count_; ++other)
            v_(i, other) = other == i;
    }
    bool hasRotated = true;
    for (int sweep = 0; hasRotated && sweep < mostSweeps; ++sweep) {
        hasRotated = false;
        for (int32_t p = 0; p < count_; ++p)
            for (int32_t q = p + 1; q < count_; ++q)
                hasRotated |= rotate(p, q);
    }
    for (int32_t i = 0; i < count_; ++i)
        sigma_[i] = std::sqrt(Dot(u_.row(i), u_.row(i), k));
}

// Makes two columns orthogonal; returns false if they already are.
bool ScaledColumns::rotate(int32_t p, int32_t q) {
    const int32_t k = u_.cols();
    const double pp = Dot(u_.row(p), u_.row(p), k), qq = Dot(u_.row(q), u_.row(q), k);
    const double pq = Dot(u_.row(p), u_.row(q), k);
    if (!(std::fabs(pq) > kEpsilon * std::sqrt(pp) * std::sqrt(qq)))
        return false;
    const double cotangent = (qq - pp) / (2.0 * pq);
    const double t = 1.0 / (std::fabs(cotangent) + std::sqrt(1.0 + cotangent * cotangent));
    const double tangent = cotangent < 0.0 ? -t : t;
    const double c = 1.0 / std::sqrt(1.0 + tangent * tangent), s = c * tangent;
    Rotate(u_.row(p), u_.row(q), k, c, s);
    Rotate(v_.row(p), v_.row(q), count_, c, s);
    return true;
}

double ScaledColumns::largest() const {
    double largest = 0.0;
    for (int32_t i = 0; i < count_; ++i)
        largest = std::max(largest, double{sigma_[i]});
    return largest;
}

double ScaledColumns::projection(int32_t i, ConstRealVector z) const {
    return sigma_[i] == 0.0 ? 0.0 : Dot(u_.row(i), z.data(), u_.cols()) / sigma_[i];
}

ErrorCode TrustRegionStep::take(int32_t count) {
    if (const ErrorCode failed = columns_.take(count))
        return failed;
    return memory_.take(Sized(step, count), Sized(first_, count), Sized(rest_, count),
                        Sized(projections_, count), Sized(isFree, count), Sized(isMoving_, count));
}

void TrustRegionStep::find(const LinearisedFit &fit, ConstRealVector scale, ConstRealVector lowest,
                           ConstRealVector highest, double radius) {
    holdWhatIsAtABound(fit, lowest, highest);
    const int32_t k = fit.r.cols();
    for (int32_t j = 0; j < k; ++j) {
        isMoving_[j] = isFree[j];
        step[j] = 0.0;
    }
    solve(fit, scale, radius);
    for (int32_t j = 0; j < k; ++j)
        first_[j] = step[j];
    bool isCut = false;
    while (putAtBounds(lowest, highest)) {
        isCut = true;
        solve(fit, scale, radius);
    }
    predicted = fallOf(fit, step);
    if (isCut) {
        cutAtFirstBound(lowest, highest);
        const double fall = fallOf(fit, first_);
        if (!(predicted >= fall)) {
            predicted = fall;
            for (int32_t j = 0; j < k; ++j)
                step[j] = first_[j];
        }
    }
    double squares = 0.0;
    for (int32_t j = 0; j < k; ++j)
        squares += scale[j] * step[j] * (scale[j] * step[j]);
    length = std::sqrt(squares);
    isInside = !isCut && length < 0.9 * radius;
}

void TrustRegionStep::holdWhatIsAtABound(const LinearisedFit &fit, ConstRealVector lowest,
                                         ConstRealVector highest) {
    for (int32_t j = 0; j < fit.r.cols(); ++j) {
        double slope = 0.0;
        for (int32_t i = 0; i <= j; ++i)
            slope += fit.r(i, j) * fit.z[i];
        const bool isHeld = (lowest[j] == 0.0 && (slope >= 0.0 || highest[j] == 0.0)) ||
                            (highest[j] == 0.0 && slope <= 0.0);
        isFree[j] = !isHeld;
    }
}

// Solves for the steps of the moving parameters; the steps of the others are given.
void TrustRegionStep::solve(const LinearisedFit &fit, ConstRealVector scale, double radius) {
    const int32_t k = fit.r.cols();
    columns_.decompose(fit.r, isMoving_, scale);
    double spent = 0.0;
    for (int32_t i = 0; i < k; ++i)
        rest_[i] = fit.z[i];
    for (int32_t j = 0; j < k; ++j) {
        if (isMoving_[j] != 0)
            continue;
        spent += scale[j] * step[j] * (scale[j] * step[j]);
        for (int32_t i = 0; i <= j; ++i)
            rest_[i] += fit.r(i, j) * step[j];
    }
    const double room = radius < kInfinity
                            ? std::sqrt(std::max(radius * radius - spent, 0.01 * radius * radius))
                            : kInfinity;
    const int32_t n = columns_.count();
    for (int32_t i = 0; i < n; ++i)
        projections_[i] = columns_.projection(i, rest_);
    const double lambda = damping(room);
    const double least = kEpsilon * columns_.largest();
    for (int32_t i = 0; i < n; ++i)
        step[columns_.column(i)] = 0.0;
    for (int32_t i = 0; i < n; ++i) {
        const double sigma = columns_.sigma(i);
        if (!(sigma > least))
            continue;
        const double along = -projections_[i] * (sigma / (sigma * sigma + lambda));
        for (int32_t row = 0; row < n; ++row)
            step[columns_.column(row)] += columns_.v(row, i) * along / scale[columns_.column(row)];
    }
}

// The length of the step with the damping lambda, and its derivative with respect to lambda.
double TrustRegionStep::lengthAt(double lambda, double *slope) const {
    double squares = 0.0, cubes = 0.0;
    const double least = kEpsilon * columns_.largest();
    for (int32_t i = 0; i < columns_.count(); ++i) {
        const double sigma = columns_.sigma(i);
        if (!(sigma > least))
            continue;
        const double denominator = sigma * sigma + lambda;
        const double along = projections_[i] * sigma / denominator;
        squares += along * along;
        cubes += along * along / denominator;
    }
    const double root = std::sqrt(squares);
    *slope = root > 0.0 ? -cubes / root : 0.0;
    return root;
}

// Returns 0 if the undamped step is within the radius, otherwise the damping for which the length
// differs from the radius by at most a tenth: by Newton's method on 1 / length, between limits.
double TrustRegionStep::damping(double radius) const {
    double slope;
    double reach = lengthAt(0.0, &slope);
    if (!(reach > 1.1 * radius))
        return 0.0;
    double low = slope < 0.0 ? (radius - reach) / slope : 0.0, squares = 0.0;
    for (int32_t i = 0; i < columns_.count(); ++i)
        squares += columns_.sigma(i) * projections_[i] * (columns_.sigma(i) * projections_[i]);
    double high = std::sqrt(squares) / radius;
    double lambda = std::max(low, 0.001 * high);
    for (int round = 0; round < 20; ++round) {
        reach = lengthAt(lambda, &slope);
        if (std::fabs(reach - radius) <= 0.1 * radius)
            break;
        (reach > radius ? low : high) = lambda;
        const double next = lambda - (reach - radius) / slope * (reach / radius);
        const double middle = std::max(0.001 * high, std::sqrt(low) * std::sqrt(high));
        lambda = next > low && next < high ? next : middle;
    }
    return lambda;
}

// Fixes the moving parameters whose steps pass a bound at that bound; returns false if there are
// none.
bool TrustRegionStep::putAtBounds(ConstRealVector lowest, ConstRealVector highest) {
    bool any = false;
    for (std::ptrdiff_t j = 0; j < step.size(); ++j) {
        if (isMoving_[j] == 0 || (step[j] >= lowest[j] && step[j] <= highest[j]))
            continue;
        step[j] = step[j] < lowest[j] ? lowest[j] : highest[j];
        isMoving_[j] = 0;
        any = true;
    }
    return any;
}

void TrustRegionStep::cutAtFirstBound(ConstRealVector lowest, ConstRealVector highest) {
    double part = 1.0;
    for (std::ptrdiff_t j = 0; j < first_.size(); ++j) {
        const double most = first_[j] < 0.0 ? lowest[j] : highest[j];
        if (std::fabs(first_[j]) > std::fabs(most))
            part = std::min(part, most / first_[j]);
    }
    for (DBL &one : first_)
        one *= part;
}

double TrustRegionStep::fallOf(const LinearisedFit &fit, ConstRealVector s) const {
    double fall = 0.0;
    for (int32_t i = 0; i < fit.r.rows(); ++i) {
        const double moved = Dot(fit.r.row(i) + i, s.data() + i, fit.r.cols() - i);
        fall -= moved * (fit.z[i] + 0.5 * moved);
    }
    return fall;
}

} // namespace qx
