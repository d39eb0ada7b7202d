#ifndef QX_FIT_LOSS_H
#define QX_FIT_LOSS_H

#include <cmath>
#include <cstdint>

namespace qx {

// The loss of a squared residual z that is divided by the square of a scale.
enum class Loss : int32_t { Linear, SoftAbsolute, Huber, Cauchy, Arctan };
constexpr int32_t lossCount = 5;

// rho(z) and its derivatives.
struct LossAt {
    double value, slope, bend;
};

inline LossAt EvaluateLoss(Loss loss, double z) {
    switch (loss) {
    case Loss::SoftAbsolute: {
        const double root = std::sqrt(1.0 + z);
        return {2.0 * (z / (root + 1.0)), 1.0 / root, -0.5 / (root * (1.0 + z))};
    }
    case Loss::Huber: {
        if (z <= 1.0)
            return {z, 1.0, 0.0};
        const double root = std::sqrt(z);
        return {2.0 * root - 1.0, 1.0 / root, -0.5 / (root * z)};
    }
    case Loss::Cauchy: {
        const double part = 1.0 / (1.0 + z);
        return {std::log1p(z), part, -(part * part)};
    }
    case Loss::Arctan: {
        const double part = 1.0 / (1.0 + z * z);
        return {std::atan(z), part, -2.0 * z * part * part};
    }
    case Loss::Linear:
        break;
    }
    return {z, 1.0, 0.0};
}

} // namespace qx

#endif
