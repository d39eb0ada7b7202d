#include "special/dawson.h"

#include "frame/constants.h"
#include "special/extended.h"
#include "special/tables/dawson.h"
#include "special/tables/fresnel.h"

#include <cmath>
#include <limits>

namespace qx {

double Dawson(double x) {
    const double a = std::fabs(x);
    if (!std::isfinite(x))
        return std::numeric_limits<double>::quiet_NaN();
    if (a < 3.25)
        return a < 1e-9 ? x : x * table::dawsonSmall(x * x);
    if (a > 1000000000.0)
        return 0.5 / x;
    const double y = 1 / (x * x);
    const double correction = y * (a < 6.25 ? table::dawsonMid(y) : table::dawsonFar(y));
    return 0.5 * (1 / x + correction / x);
}

FresnelValues Fresnel(double x) {
    const double a = std::fabs(x);
    if (std::isnan(x))
        return {x, x};
    if (a < 1.6) {
        const double square = x * x;
        const double w = square * square;
        return {a < 1e-8 ? x : x * table::fresnelCSmall(w), x * square * table::fresnelSSmall(w)};
    }
    double c = 0.5;
    double s = 0.5;
    if (a < 0x1p53) {
        // x^2 modulo 4 from its two exact parts
        const Extended square = ExactProduct(a, a);
        const double quarters = std::fmod(square.high, 4.0) + std::fmod(square.low, 4.0);
        const double sine = SinPi(0.5 * quarters);
        const double cosine = CosPi(0.5 * quarters);
        const double w = 1 / (square.high * square.high);
        const bool far = a >= 3;
        const double f = (far ? table::fresnelFFar(w) : table::fresnelFMid(w)) / (kPi * a);
        const double g =
            (far ? table::fresnelGFar(w) : table::fresnelGMid(w)) / (kPi * kPi * (a * square.high));
        c += f * sine - g * cosine;
        s -= f * cosine + g * sine;
    } else {
        s -= 1 / (kPi * a); // x is even, so the phase is a multiple of 2 pi
    }
    return x < 0 ? FresnelValues{-c, -s} : FresnelValues{c, s};
}

} // namespace qx
