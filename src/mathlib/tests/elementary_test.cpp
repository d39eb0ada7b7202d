#include "mathlib/elementary.h"

#include "tests/support/recipe.h"

#include <gtest/gtest.h>

#include <bit>
#include <cmath>
#include <cstdint>
#include <cstdlib>
#include <limits>
#include <vector>

// Compares the functions over lanes with the scalar ones, to the bit.

namespace qx::test {
namespace {

typedef std::vector<double> Numbers;

constexpr double pi = 3.141592653589793;
constexpr double inf = std::numeric_limits<double>::infinity();

// Random bit patterns, with all exponents equally likely, and numbers in the range of usual angles.
class Arguments {
public:
    explicit Arguments(uint64_t seed) : state_(seed) {}
    uint64_t bits() {
        state_ += 0x9e3779b97f4a7c15;
        uint64_t z = state_;
        z = (z ^ (z >> 30)) * 0xbf58476d1ce4e5b9;
        z = (z ^ (z >> 27)) * 0x94d049bb133111eb;
        return z ^ (z >> 31);
    }
    double anything() { return std::bit_cast<double>(bits()); }
    double upTo(double largest) { return largest * (static_cast<double>(bits()) * 0x1p-63 - 1); }
    // Near k quarter turns, with relative distances from 2^-60 to 1.
    double nearQuarter() {
        const double offset = std::ldexp(upTo(1), -static_cast<int>(bits() % 60));
        return std::round(upTo(std::ldexp(1.0, static_cast<int>(bits() % 22)))) * (pi / 4) *
               (1 + offset);
    }

private:
    uint64_t state_;
};

bool SameBits(double a, double b) {
    return (std::isnan(a) && std::isnan(b)) ||
           std::bit_cast<uint64_t>(a) == std::bit_cast<uint64_t>(b);
}

void ExpectSame(const Numbers &found, const Numbers &x, const Numbers &y,
                double (*scalar)(double, double), const char *name) {
    int differing = 0;
    for (std::size_t i = 0; i < found.size(); ++i) {
        const double expected = scalar(x[i], y[i]);
        if (!SameBits(found[i], expected) && ++differing < 10)
            ADD_FAILURE() << std::hexfloat << name << "(" << x[i] << ", " << y[i] << ") gives "
                          << found[i] << ", not " << expected;
    }
    EXPECT_EQ(differing, 0) << name;
}

double Sine(double x, double) { return std::sin(x); }
double Cosine(double x, double) { return std::cos(x); }
double ArcTangent(double y, double x) { return std::atan2(y, x); }
double Hypotenuse(double x, double y) { return std::hypot(x, y); }

void Compare(const Numbers &x, const Numbers &y) {
    const auto n = static_cast<int32_t>(x.size());
    Numbers one(x.size()), other(x.size());
    qx::Sines(x.data(), n, one.data());
    ExpectSame(one, x, y, Sine, "sin");
    qx::SinesAndCosines(x.data(), n, one.data(), other.data());
    ExpectSame(one, x, y, Sine, "sin");
    ExpectSame(other, x, y, Cosine, "cos");
    qx::ArcTangents(x.data(), y.data(), n, one.data());
    ExpectSame(one, x, y, ArcTangent, "atan2");
    qx::Hypotenuses(x.data(), y.data(), n, one.data());
    ExpectSame(one, x, y, Hypotenuse, "hypot");
}

// The environment variable QX_ELEMENTARY_CASES requests more.
int64_t Cases() {
    const char *const asked = std::getenv("QX_ELEMENTARY_CASES");
    return asked != nullptr ? std::atoll(asked) : 100000;
}

TEST(Elementary, HaveTheBitsOfTheScalarFunctions) {
    constexpr std::size_t together = 1000;
    Arguments arguments(1);
    Numbers x(together), y(together);
    for (int64_t left = Cases(); left > 0; left -= 4 * int64_t{together})
        for (int kind = 0; kind < 4; ++kind) {
            for (std::size_t i = 0; i < together; ++i) {
                x[i] = kind == 0   ? arguments.anything()
                       : kind == 1 ? arguments.upTo(10)
                       : kind == 2 ? arguments.upTo(2e6)
                                   : arguments.nearQuarter();
                // For two arguments: any values, similar magnitudes, or both sides of the edge of
                // an octant.
                y[i] = kind == 0   ? arguments.anything()
                       : kind == 1 ? arguments.upTo(10)
                       : kind == 2
                           ? x[i] * std::ldexp(arguments.upTo(2),
                                               static_cast<int>(arguments.bits() % 130) - 65)
                           : x[i] * (static_cast<double>(arguments.bits() % 24) / 16 +
                                     std::ldexp(arguments.upTo(1), -50));
            }
            Compare(x, y);
        }
}

// Each special argument in each place of a group, so that effects on its neighbours are detected.
TEST(Elementary, HaveTheBitsForSpecialArguments) {
    const Numbers special = {0.0,      -0.0,    1,        -1,       inf,      -inf,   NAN,
                             5e-324,   1e-310,  0x1p-27,  0x1p-26,  0x1p26,   0x1p27, 1e22,
                             1e308,    pi / 4,  pi / 2,   pi,       -pi,      2 * pi, 0x1.921fbp20,
                             0x1p511,  0x1p512, 0x1p-450, 0x1p-900, 2.2e-308, 3,      0x1p-1022,
                             0x1.8p511};
    for (const double first : special)
        for (const double second : special)
            for (std::size_t n = 1; n <= 9; ++n) {
                Numbers x(n, 0.75), y(n, 0.5);
                x[n - 1] = first;
                y[n - 1] = second;
                Compare(x, y); // both in one lane
                y[n - 1] = 0.5;
                y[n / 2] = second;
                Compare(x, y);
                std::vector<double> inPlace = x;
                qx::SinesAndCosines(inPlace.data(), static_cast<int32_t>(n), inPlace.data(),
                                    y.data());
                ExpectSame(inPlace, x, x, Sine, "sin in place");
                ExpectSame(y, x, x, Cosine, "cos computed with it");
            }
}

} // namespace
} // namespace qx::test
