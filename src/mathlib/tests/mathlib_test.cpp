#include "tests/support/host_arithmetic.h"
#include "tests/support/test_data.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstdint>
#include <cstdlib>
#include <fstream>
#include <limits>
#include <map>
#include <sstream>
#include <string>

// The mathematics library of the module, through the names that the code uses.

namespace qx::test {
namespace {

typedef double (*Unary)(double);
typedef double (*Binary)(double, double);

const std::map<std::string, Unary> unary = {
    {"sin", std::sin},     {"cos", std::cos},     {"tan", std::tan},     {"asin", std::asin},
    {"acos", std::acos},   {"atan", std::atan},   {"sinh", std::sinh},   {"cosh", std::cosh},
    {"tanh", std::tanh},   {"exp", std::exp},     {"exp2", std::exp2},   {"expm1", std::expm1},
    {"log", std::log},     {"log2", std::log2},   {"log10", std::log10}, {"log1p", std::log1p},
    {"cbrt", std::cbrt},   {"sqrt", std::sqrt},   {"floor", std::floor}, {"ceil", std::ceil},
    {"trunc", std::trunc}, {"round", std::round}, {"rint", std::rint},   {"fabs", std::fabs},
};
const std::map<std::string, Binary> binary = {
    {"atan2", std::atan2}, {"pow", std::pow}, {"hypot", std::hypot}, {"fmod", std::fmod}};

// The error of `value` relative to high + low, in units of the last place of high.
double ErrorInUlps(double value, double high, double low) {
    if (std::isinf(high) || std::isinf(value))
        return value == high ? 0 : HUGE_VAL;
    int exponent;
    std::frexp(high, &exponent);
    const double ulp = std::ldexp(1.0, std::max(exponent - 53, -1074));
    // The difference is exact unless it is large, and the scaling cannot underflow.
    return std::fabs((value - high) / ulp - low / ulp);
}

TEST(MathLibrary, ErrorStaysBelowOneUlpOnHardAndRandomArguments) {
    std::ifstream file(TestData("reference.dat"));
    ASSERT_TRUE(file.is_open());
    std::map<std::string, double> worst;
    int cases = 0;
    for (std::string line; std::getline(file, line); ++cases) {
        std::istringstream words(line);
        std::string name, word;
        words >> name;
        double numbers[4] = {};
        int count = 0;
        while (count < 4 && words >> word)
            numbers[count++] = std::strtod(word.c_str(), nullptr);
        const bool one = unary.count(name) != 0;
        const double value =
            one ? unary.at(name)(numbers[0]) : binary.at(name)(numbers[0], numbers[1]);
        const double error = ErrorInUlps(value, numbers[count - 2], numbers[count - 1]);
        EXPECT_LT(error, 1) << line << " gives " << value;
        worst[name] = std::max(worst[name], error);
    }
    EXPECT_GT(cases, 1000);
    for (const char *rational : {"sqrt", "floor", "fmod"})
        EXPECT_LE(worst[rational], 0.5) << rational;
    for (const auto &[name, error] : worst)
        RecordProperty("ulp_" + name, std::to_string(error));
}

TEST(MathLibrary, SpecialArgumentsGiveTheStandardValues) {
    const double inf = HUGE_VAL, nan = std::numeric_limits<double>::quiet_NaN();
    const double pi = 3.141592653589793;
    for (const auto &[name, f] : unary)
        EXPECT_TRUE(std::isnan(f(nan))) << name;
    for (const char *outside : {"sin", "cos", "tan", "asin", "acos"})
        EXPECT_TRUE(std::isnan(unary.at(outside)(inf))) << outside;
    for (const char *odd : {"sin", "tan", "asin", "atan", "sinh", "tanh", "expm1", "log1p", "cbrt",
                            "floor", "rint", "sqrt"})
        EXPECT_TRUE(std::signbit(unary.at(odd)(-0.0)) && unary.at(odd)(-0.0) == 0) << odd;

    struct Row {
        double value, expected;
    };
    const Row rows[] = {{std::sinh(-inf), -inf},
                        {std::sinh(711.0), inf},
                        {std::cosh(-inf), inf},
                        {std::cosh(-711.0), inf},
                        {std::cosh(0.0), 1},
                        {std::tanh(-inf), -1},
                        {std::exp(-inf), 0},
                        {std::exp(710.0), inf},
                        {std::exp(-746.0), 0},
                        {std::log(0.0), -inf},
                        {std::log1p(-1.0), -inf},
                        {std::atan(inf), pi / 2},
                        {std::pow(0.0, -1.0), inf},
                        {std::pow(-0.0, -3.0), -inf},
                        {std::pow(nan, 0.0), 1},
                        {std::pow(1.0, nan), 1},
                        {std::pow(-1.0, inf), 1},
                        {std::pow(0.5, -inf), inf},
                        {std::hypot(nan, -inf), inf},
                        {std::fmod(5.0, inf), 5},
                        {std::round(-2.5), -3},
                        {std::rint(2.5), 2},
                        {std::rint(-3.5), -4},
                        {std::round(0x1p52), 0x1p52},
                        {std::atan2(0.0, -1.0), pi},
                        {std::atan2(-0.0, -1.0), -pi},
                        {std::atan2(1.0, 0.0), pi / 2},
                        {std::atan2(-inf, 3.0), -pi / 2},
                        {std::atan2(inf, -inf), 3 * pi / 4},
                        {std::atan2(-inf, inf), -pi / 4},
                        {std::atan2(2.0, -inf), pi},
                        {std::atan2(2.0, inf), 0},
                        {std::atan2(-0.0, 0.0), -0.0},
                        {std::atan2(-0.0, -0.0), -pi},
                        {std::ldexp(0x1.8p0, -1074), 0x1p-1073},
                        {std::ldexp(-3.0, 1023), -inf},
                        {std::ldexp(5e-324, 2000), 0x1p926},
                        {std::scalbn(0x1.8p-1022, -1), 0x1.8p-1023}};
    for (const Row &row : rows) {
        EXPECT_EQ(row.value, row.expected) << &row - rows;
        EXPECT_EQ(std::signbit(row.value), std::signbit(row.expected)) << &row - rows;
    }
    EXPECT_TRUE(std::isnan(std::pow(-8.0, 1.0 / 3)));
    EXPECT_TRUE(std::isnan(std::atan2(nan, 1.0)));
    EXPECT_TRUE(std::isnan(std::fmod(1.0, 0.0)));

    int exponent;
    EXPECT_EQ(std::frexp(-5e-324, &exponent), -0.5);
    EXPECT_EQ(exponent, -1073);
    double whole;
    EXPECT_EQ(std::modf(-2.25, &whole), -0.25);
    EXPECT_EQ(whole, -2);
}

// The control words with rounding, precision and exception masks, without the sticky flags.
struct ControlWords {
    ArithmeticModes modes;
    uint16_t x87;

    static ControlWords Read() {
        ControlWords words = {CurrentArithmetic(), 0};
#if defined(__x86_64__) || defined(__i386__)
        __asm__ volatile("fnstcw %0" : "=m"(words.x87));
#endif
        return words;
    }
    bool operator==(const ControlWords &) const = default;
};

TEST(MathLibrary, PreservesRoundingAndMasksOfTheCaller) {
    const double arguments[] = {0, 0.3, -1.7, 1e10, 1e22, 5e-324, 745, -1e300, HUGE_VAL, NAN};
    const ControlWords before = ControlWords::Read();
    for (const double x : arguments) {
        for (const auto &[name, f] : unary) {
            const volatile double value = f(x);
            static_cast<void>(value);
            EXPECT_TRUE(ControlWords::Read() == before) << name << " " << x;
        }
        for (const auto &[name, f] : binary) {
            const volatile double value = f(x, 1.1) + f(-2.0, x);
            static_cast<void>(value);
            EXPECT_TRUE(ControlWords::Read() == before) << name << " " << x;
        }
    }
}

} // namespace
} // namespace qx::test
