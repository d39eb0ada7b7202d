#include "qx/polynomial_roots.h"

#include "poly/common_divisor.h"
#include "poly/root_structure.h"
#include "poly/simple_roots.h"
#include "qx/errors.h"
#include "tests/support/hostile_host.h"
#include "tests/support/recipe.h"
#include "tests/support/test_data.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <complex>
#include <cstdlib>
#include <fstream>
#include <limits>
#include <string>
#include <vector>

namespace qx::test {
namespace {

typedef std::complex<double> Complex;
typedef std::vector<Complex> Complexes;

constexpr double epsilon = 0x1p-52;
constexpr double nan = std::numeric_limits<double>::quiet_NaN();

CDBArray ToHost(const Complexes &values) {
    std::vector<CDB> elements;
    for (const Complex &z : values)
        elements.push_back({z.real(), z.imag()});
    return CDBArray(elements);
}
Complexes Values(const CDBArray &array) {
    Complexes result;
    for (const CDB &z : array.values())
        result.emplace_back(z.re, z.im);
    return result;
}

// The ascending coefficients of the product of all (x - root).
Complexes Product(const Complexes &roots) {
    typedef std::complex<long double> Long;
    std::vector<Long> a = {1};
    for (const Complex &root : roots) {
        a.insert(a.begin(), 0);
        for (std::size_t k = 0; k + 1 < a.size(); ++k)
            a[k] -= Long(root) * a[k + 1];
    }
    return Complexes(a.begin(), a.end());
}

// A polynomial with roots known to more digits than double has.
struct Case {
    std::string name;
    Complexes coefficients;
    struct Root {
        Complex value;
        double condition;
    };
    std::vector<Root> roots;
};

std::vector<Case> ReadCases() {
    std::ifstream file(qx::test::TestData("polynomials.dat"));
    const auto number = [&] {
        std::string word;
        file >> word;
        return std::strtod(word.c_str(), nullptr);
    };
    const auto complexNumber = [&] {
        const double re = number();
        return Complex(re, number());
    };
    std::vector<Case> cases;
    Case next;
    int degree;
    while (file >> next.name >> degree) {
        next.coefficients.clear();
        next.roots.clear();
        for (int k = 0; k <= degree; ++k)
            next.coefficients.push_back(complexNumber());
        for (int k = 0; k < degree; ++k) {
            const Complex root = complexNumber();
            next.roots.push_back({root, number()});
        }
        cases.push_back(next);
    }
    return cases;
}

// The largest error of the roots, each compared with the nearest computed root, relative to the
// root and in units of its condition number times n epsilon.
double WorstError(const Case &example, Complexes found) {
    double worst = 0;
    for (const auto &[root, condition] : example.roots) {
        if (found.empty())
            return HUGE_VAL;
        const auto distance = [&root = root](const Complex &z) { return std::abs(z - root); };
        const auto nearest =
            std::min_element(found.begin(), found.end(), [&](const Complex &a, const Complex &b) {
                return distance(a) < distance(b);
            });
        const double error = distance(*nearest) / (std::abs(root) > 0 ? std::abs(root) : 1);
        worst = std::max(worst, error / (condition * epsilon * example.roots.size()));
        found.erase(nearest);
    }
    return found.empty() ? worst : HUGE_VAL;
}

ErrorCode FindAll(const CDBArray &coefficients, int32_t maxIterations) {
    ErrorCode err = 1;
    EXPECT_EQ(CxPolyRoots_head(coefficients.handle(), &maxIterations, &err), 0);
    return err;
}

TEST(CxPolyRoots, ErrorsAreThoseOfTheCondition) {
    const std::vector<Case> cases = ReadCases();
    ASSERT_GT(cases.size(), 35U);
    for (const Case &example : cases) {
        const CDBArray array = ToHost(example.coefficients);
        ASSERT_EQ(FindAll(array, 100), 0) << example.name;
        // Deflation by roots from the middle of these sets costs two digits.
        const bool isHard = example.name == "Chebyshev-30" || example.name == "Legendre-30";
        EXPECT_LT(WorstError(example, Values(array)), isHard ? 160 : 2) << example.name;
    }
}

TEST(CxPolyRoots, ZeroCoefficientsAtBothEndsAreRemovedFirst) {
    const auto roots = [](const Complexes &coefficients) {
        const CDBArray array = ToHost(coefficients);
        EXPECT_EQ(FindAll(array, 10), 0);
        return Values(array);
    };
    EXPECT_EQ(roots({0, 0, 0, 1}), (Complexes{0, 0, 0}));
    EXPECT_EQ(roots({0, 0, 6, -3}), (Complexes{0, 0, 2}));
    EXPECT_EQ(roots({6, -3, 0, 0}), (Complexes{2})) << "the degree is 1";
    EXPECT_EQ(roots({-1, 0, 1, 0}).size(), 2U);
    EXPECT_EQ(roots({0, {0, 2}, 1, 0}), (Complexes{0, {0, -2}}));
}

// The quadratic formula avoids cancellation, so a root near 0 keeps its digits.
TEST(CxPolyRoots, QuadraticsKeepTheSmallRoot) {
    const CDBArray array = ToHost({1e-3, 1e9, 1});
    ASSERT_EQ(FindAll(array, 10), 0);
    EXPECT_NEAR(array[0].re, -1e9, 1e-6);
    EXPECT_NEAR(array[1].re * 1e12, -1, 1e-15);
}

TEST(CxPolyRoots, MultipleRootsConvergeToo) {
    for (const int multiplicity : {2, 3, 5}) {
        Complexes roots;
        for (const Complex &root : {Complex(0.7, 0.1), Complex(-1.3), Complex(0.2, -1)})
            roots.insert(roots.end(), multiplicity, root);
        const CDBArray array = ToHost(Product(roots));
        ASSERT_EQ(FindAll(array, 100), 0);
        // A perturbation moves a root of multiplicity k by the k-th root of its size.
        for (const Complex &found : Values(array)) {
            double distance = HUGE_VAL;
            for (const Complex &root : roots)
                distance = std::min(distance, std::abs(found - root));
            EXPECT_LT(distance, 40 * std::pow(epsilon, 1.0 / multiplicity));
        }
    }
}

TEST(CxPolyRoots, Failures) {
    const auto code = [](const Complexes &coefficients, int32_t maxIterations = 100) {
        const CDBArray array = ToHost(coefficients);
        const ErrorCode status = FindAll(array, maxIterations);
        EXPECT_EQ(array.size(), 0);
        return status;
    };
    EXPECT_EQ(code({}), ErrEmptyInput);
    EXPECT_EQ(code({5}), ErrBadCoefficients);
    EXPECT_EQ(code({5, 0, 0}), ErrBadCoefficients);
    EXPECT_EQ(code({0, 0}), ErrBadCoefficients);
    EXPECT_EQ(code({1, {0, nan}, 1}), ErrBadCoefficients);
    EXPECT_EQ(code({1, 1, HUGE_VAL, 1}), ErrNonFiniteFunction);
    EXPECT_EQ(code({1, 2, 3, 4, 5}, -1), ErrIterationLimit);
    // The polynomial is so flat around 0 that no direction decreases it.
    Complexes flat(44);
    flat[0] = -1;
    flat[43] = 1;
    EXPECT_EQ(code(flat, INT32_MAX), ErrIterationLimit);
}

ErrorCode AllRoots(const Complexes &coefficients, Complexes &roots, std::vector<double> &radii) {
    const CDBArray coef = ToHost(coefficients), found(1);
    const DBLArray around(1);
    const ErrorCode status = CxPolyRoots2026_head(coef.handle(), found.handle(), around.handle());
    roots = Values(found);
    radii = around.values();
    return status;
}
// Uses the real parts alone.
ErrorCode AllRealRoots(const Complexes &coefficients, Complexes &roots,
                       std::vector<double> &radii) {
    std::vector<double> real;
    for (const Complex &coefficient : coefficients)
        real.push_back(coefficient.real());
    const DBLArray coef(real), around(1);
    const CDBArray found(1);
    const ErrorCode status = PolyRoots2026_head(coef.handle(), found.handle(), around.handle());
    roots = Values(found);
    radii = around.values();
    return status;
}

// The largest |p(z)| / sum of |a[i]| |z|^i over the roots, in units of n eps.
double WorstResidual(const Complexes &a, const Complexes &roots) {
    typedef std::complex<long double> Long;
    long double worst = 0;
    for (const Complex &root : roots) {
        Long p = 0;
        long double sum = 0;
        for (std::size_t i = a.size(); i-- > 0;) {
            p = p * Long(root) + Long(a[i]);
            sum = sum * std::abs(Long(root)) + std::abs(Long(a[i]));
        }
        worst = std::max(worst, sum > 0 ? std::abs(p) / sum : 0);
    }
    return static_cast<double>(worst / (static_cast<long double>(roots.size()) * epsilon));
}

bool AreRealOrPairs(const Complexes &roots) {
    for (std::size_t i = 0; i < roots.size(); ++i)
        if (roots[i].imag() != 0 &&
            (++i == roots.size() || roots[i] != std::conj(roots[i - 1]) || roots[i].imag() > 0))
            return false;
    return true;
}

// Condition numbers are up to 5e13 here; with twice the working precision only the rounding of the
// result remains.
TEST(PolyRoots2026, FindsTheExactRootsOfTheGivenCoefficients) {
    for (const Case &example : ReadCases()) {
        SCOPED_TRACE(example.name);
        Complexes roots;
        std::vector<double> radii;
        ASSERT_EQ(AllRoots(example.coefficients, roots, radii), 0);
        ASSERT_EQ(roots.size(), example.roots.size());
        for (const auto &[root, condition] : example.roots) {
            std::size_t at = 0;
            for (std::size_t i = 1; i < roots.size(); ++i)
                if (std::abs(roots[i] - root) < std::abs(roots[at] - root))
                    at = i;
            const double n = static_cast<double>(roots.size());
            EXPECT_LE(std::abs(roots[at] - root),
                      (4 * epsilon + 8 * n * n * condition * epsilon * epsilon) * std::abs(root));
            EXPECT_LE(std::abs(roots[at] - root), radii[at] + epsilon * std::abs(root));
            if (condition < 1e8) {
                EXPECT_LE(radii[at], 1e-12 * std::abs(root));
            }
        }
        EXPECT_LT(WorstResidual(example.coefficients, roots), 4.0);
    }
}

TEST(PolyRoots2026, LeavesResidualsOfRoundingErrorsOverTheWholeRange) {
    qx::test::Noise noise(26);
    const auto phased = [&](double modulus) {
        return std::polar(modulus, 3.2 * noise.symmetric());
    };
    for (int round = 0; round < 300; ++round) {
        // High degrees with coefficients near 1; low degrees with any coefficients whose powers
        // long double can represent.
        const int kind = round % 3, degree = 1 + (kind == 0 ? round % 200 : round % 23);
        Complexes a;
        for (int i = 0; i <= degree; ++i)
            a.push_back(phased(kind == 0   ? noise.symmetric()
                               : kind == 1 ? std::pow(10.0, 100 * noise.symmetric())
                                           : std::round(3 * noise.symmetric())));
        a.back() = kind == 2 ? 1.0 : a.back();
        SCOPED_TRACE(testing::Message() << round << ", degree " << degree);
        Complexes roots;
        std::vector<double> radii;
        ASSERT_EQ(AllRoots(a, roots, radii), 0);
        EXPECT_EQ(roots.size(), a.size() - 1);
        EXPECT_LT(WorstResidual(a, roots), 4.0);
        for (Complex &coefficient : a)
            coefficient = coefficient.real();
        ASSERT_EQ(AllRealRoots(a, roots, radii), 0);
        EXPECT_LT(WorstResidual(a, roots), 4.0);
        EXPECT_TRUE(AreRealOrPairs(roots));
    }
}

TEST(PolyRoots2026, OfMultipleRootsAreAsAccurateAsTheCoefficientsAllow) {
    const struct {
        Complexes roots;
        double error;
    } cases[] = {{{1, 1, 1, 2, 3}, 1e-8},
                 // A root of multiplicity 12, whose cluster is made symmetric under conjugation.
                 {{2, 2, 2, -2, -2, -2, -2, -2, -2, -2, -2, -2, -2, -2, -2, 0, 0, 0, 3, 3, 3}, 0.2},
                 {{Complex(1, 1), Complex(1, -1), Complex(1, 1), Complex(1, -1)}, 1e-12}};
    for (const auto &[expected, error] : cases) {
        Complexes roots;
        std::vector<double> radii;
        const Complexes a = Product(expected);
        ASSERT_EQ(AllRealRoots(a, roots, radii), 0);
        EXPECT_LT(WorstResidual(a, roots), 4.0);
        EXPECT_TRUE(AreRealOrPairs(roots));
        for (std::size_t i = 0; i < roots.size(); ++i) {
            double nearest = HUGE_VAL;
            for (const Complex &root : expected)
                nearest = std::min(nearest, std::abs(root - roots[i]));
            EXPECT_LE(nearest, error);
            EXPECT_LE(nearest, radii[i]);
        }
    }
}

TEST(PolyRoots2026, EndsOfTheCoefficientsAndFailures) {
    Complexes roots;
    std::vector<double> radii;
    ASSERT_EQ(AllRealRoots({0, 0, -6, 5, -1, 0, 0}, roots, radii), 0);
    EXPECT_EQ(roots, (Complexes{0, 0, 2, 3}));
    EXPECT_EQ(radii[1], 0.0);
    ASSERT_EQ(AllRealRoots({1e300, 0, 1e-300}, roots, radii), 0);
    EXPECT_NEAR(roots[0].imag() * 1e-300, 1.0, 1e-15);
    // Flat around 0, where the elder does not converge.
    Complexes flat(44);
    flat[0] = -1;
    flat[43] = 1;
    ASSERT_EQ(AllRoots(flat, roots, radii), 0);
    for (const Complex &root : roots)
        EXPECT_NEAR(std::abs(root), 1.0, 2 * epsilon);

    for (const auto &[coefficients, code] : {std::pair<Complexes, ErrorCode>{{}, ErrEmptyInput},
                                             {{5}, ErrBadCoefficients},
                                             {{0, 0}, ErrBadCoefficients},
                                             {{5, 0, 0}, ErrBadCoefficients},
                                             {{1, nan}, ErrBadCoefficients},
                                             {{1, 1, HUGE_VAL}, ErrBadCoefficients},
                                             {{1e300, 1e-300}, ErrOverflow}}) {
        EXPECT_EQ(AllRealRoots(coefficients, roots, radii), code);
        EXPECT_EQ(AllRoots(coefficients, roots, radii), code);
        EXPECT_TRUE(roots.empty() && radii.empty());
    }
}

Complexes Polish(const std::vector<double> &coefficients, const std::vector<double> &realGuesses,
                 const Complexes &complexGuesses, int32_t iterations = 50,
                 double tolerance = 1e-14) {
    const DBLArray coef(coefficients), real(realGuesses);
    const CDBArray complex = ToHost(complexGuesses), roots(1);
    EXPECT_EQ(PolyRootsNtBst_head(coef.handle(), real.handle(), iterations, tolerance,
                                  complex.handle(), iterations, tolerance, roots.handle()),
              0);
    return Values(roots);
}

TEST(PolyRootsNtBst, NewtonImprovesEachRealGuess) {
    // (x - 1) (x - 2) (x + 3)
    const Complexes roots = Polish({6, -7, 0, 1}, {0.8, 2.3, -2.5, 1.0, 100.0}, {});
    ASSERT_EQ(roots.size(), 5U);
    const double expected[] = {1, 2, -3, 1, 2};
    for (int i = 0; i < 5; ++i) {
        EXPECT_NEAR(roots[i].real(), expected[i], 1e-14);
        EXPECT_EQ(roots[i].imag(), 0.0);
    }
    EXPECT_EQ(roots[3], Complex(1)) << "a root is not changed";
    // A double root is found to the accuracy that the residual allows.
    EXPECT_NEAR(Polish({1, -2, 1}, {1.5}, {})[0].real(), 1, 1e-7);
    // Without a real root the result is the point of the smallest residual.
    EXPECT_LT(std::abs(Polish({1, 0, 1}, {0.5}, {}, 30)[0]), 0.5);
    EXPECT_EQ(Polish({6, -7, 0, 1}, {0.8}, {}, 0)[0], Complex(0.8));
    EXPECT_NE(Polish({6, -7, 0, 1}, {0.8}, {}, 2)[0], Complex(0.8));
    EXPECT_EQ(Polish({3}, {0.25}, {})[0], Complex(0.25)) << "a constant";
}

TEST(PolyRootsNtBst, BairstowImprovesPairs) {
    // (x^2 + x + 1) (x^2 - 4 x + 13) (x - 1) (x + 2), i.e. pairs -1/2 +- i sqrt(3/4), 2 +- 3 i.
    const Complexes product =
        Product({{-0.5, std::sqrt(0.75)}, {-0.5, -std::sqrt(0.75)}, {2, 3}, {2, -3}, 1, -2});
    std::vector<double> coefficients;
    for (const Complex &a : product)
        coefficients.push_back(std::round(a.real()));
    const Complexes roots = Polish(coefficients, {1.1},
                                   {{-0.49, 0.88},
                                    {-0.49, -0.88},
                                    {0.99, 0},
                                    {-1.98, 0},
                                    {2.01, 2.98},
                                    {2.01, -2.98},
                                    {7, 8}});
    ASSERT_EQ(roots.size(), 8U);
    const Complex expected[] = {
        1, 1, -2, {-0.5, -std::sqrt(0.75)}, {-0.5, std::sqrt(0.75)}, {2, -3}, {2, 3}, {7, 8}};
    for (int i = 0; i < 8; ++i)
        EXPECT_LT(std::abs(roots[i] - expected[i]), 1e-13) << i;

    // With a loose tolerance the iteration ends by both changes, of which the sum's is below the
    // tolerance two steps before the product's.
    const Complexes loose = Polish(coefficients, {}, {{2, 3.24}, {2, -3.24}}, 50, 0.01);
    ASSERT_EQ(loose.size(), 2U);
    EXPECT_LT(std::abs(loose[1] - Complex(2, 3)), 1e-4);
}

TEST(PolyRootsNtBst, GuessesMayStayAsTheyAre) {
    const Complexes guesses = {{1, 2}, {3, 4}, {5, 6}};
    EXPECT_EQ(Polish({2, 3, 1}, {}, guesses), guesses) << "fewer than four coefficients";
    EXPECT_EQ(Polish({6, -7, 0, 1}, {}, {{9, 9}}), (Complexes{{9, 9}})) << "no partner";
    EXPECT_TRUE(Polish({6, -7, 0, 1}, {}, {}).empty());
    // A first change of a tenth or more is rejected.
    EXPECT_EQ(Polish({6, -7, 0, 1}, {}, {{1.8, 0}, {1.2, 0}}).size(), 2U);
    EXPECT_EQ(Polish({6, -7, 0, 1}, {}, {{4, 0}, {3, 0}}), (Complexes{4, 3}));
    // Without iterations, the pair is still treated as a factor.
    const Complexes pair = Polish({6, -7, 0, 1}, {}, {{3, 0}, {5, 0}}, 0);
    EXPECT_EQ(pair, (Complexes{5, 3}));
}

TEST(PolyRootsNtBst, EmptyAndNullArrays) {
    const DBLArray none, coef{6, -7, 0, 1}, real{0.8};
    const CDBArray guesses = ToHost({{1.1, 0}, {1.9, 0}}), roots(3);
    const auto run = [&](const DBLArray &a, DBL1D realGuesses, CDB1D complexGuesses, CDB1D out) {
        return PolyRootsNtBst_head(a.handle(), realGuesses, 50, 1e-14, complexGuesses, 50, 1e-14,
                                   out);
    };
    EXPECT_EQ(run(none, real.handle(), guesses.handle(), roots.handle()), WarnEmptyResult);
    EXPECT_EQ(roots.size(), 0);
    EXPECT_EQ(run(coef, nullptr, nullptr, roots.handle()), 0);
    EXPECT_EQ(roots.size(), 0);
    EXPECT_EQ(run(coef, real.handle(), nullptr, roots.handle()), 0);
    EXPECT_EQ(roots.size(), 1);
    // The guesses are replaced in place.
    EXPECT_EQ(run(coef, real.handle(), guesses.handle(), guesses.handle()), 0);
    ASSERT_EQ(guesses.size(), 3);
    EXPECT_NEAR(guesses[1].re, 2, 1e-14);
    EXPECT_NEAR(guesses[2].re, 1, 1e-14);
}

struct Structure {
    Complexes refined, simple;
    std::vector<int32_t> multiplicities;
};

enum Refine : int32_t { AsFound = 0, Refined = 1 };

Structure FindStructure(const Complexes &coefficients, Refine refine = Refined,
                        double tolerance = 0) {
    const CDBArray coef = ToHost(coefficients), refined, simple;
    const I32Array multiplicities;
    EXPECT_EQ(CxMultPolyRoots_head(coef.handle(), refine, tolerance, refined.handle(),
                                   simple.handle(), multiplicities.handle()),
              0);
    EXPECT_EQ(Values(coef), coefficients) << "the coefficients are unchanged";
    return {Values(refined), Values(simple), multiplicities.values()};
}
// Uses the real export if the coefficients are real.
Structure FindRealStructure(const Complexes &coefficients, Refine refine = Refined) {
    std::vector<double> real;
    for (const Complex &a : coefficients)
        real.push_back(a.real());
    const DBLArray coef(real);
    const CDBArray refined, simple;
    const I32Array multiplicities;
    EXPECT_EQ(MultPolyRoots_head(coef.handle(), refine, 0, refined.handle(), simple.handle(),
                                 multiplicities.handle()),
              0);
    return {Values(refined), Values(simple), multiplicities.values()};
}

struct Multiple {
    Complex root;
    int32_t times;
};
Complexes Expanded(const std::vector<Multiple> &roots) {
    Complexes all;
    for (const auto &[root, times] : roots)
        all.insert(all.end(), times, root);
    return Product(all);
}

// By ascending multiplicity, then by descending modulus, the order of the refined roots.
std::vector<Multiple> Sorted(std::vector<Multiple> roots) {
    std::stable_sort(roots.begin(), roots.end(), [](const Multiple &a, const Multiple &b) {
        return a.times != b.times ? a.times < b.times : std::abs(a.root) > std::abs(b.root);
    });
    return roots;
}

double LargestError(const Complexes &found, const std::vector<Multiple> &expected) {
    double worst = found.size() == expected.size() ? 0 : HUGE_VAL;
    for (const Complex &z : found) {
        double least = HUGE_VAL;
        for (const auto &[root, times] : expected)
            least = std::min(least, std::abs(z - root) / std::abs(root));
        worst = std::max(worst, least);
    }
    return worst;
}

// For the first three, methods that ignore multiplicity give no correct digit.
const std::vector<std::vector<Multiple>> structures = {
    {{1, 20}, {2, 15}, {3, 10}, {4, 5}},
    {{{1, -0.01}, 20}, {{1, 0.01}, 20}, {-2, 3}},
    {{-1, 8}, {0.2, 16}, {0.5, 24}, {1, 8}},
    {{-1, 6}, {{0.5, 1}, 3}, {{0.5, -1}, 3}, {1, 2}, {0.5, 4}},
    {{1, 3}},
    {{{1, 1}, 4}, {{0.5, -2}, 2}, {{-2, 0.125}, 3}, {7, 1}},
    {{1e10, 3}, {3e10, 2}},
    {{1e-10, 3}, {{0, 3e-10}, 2}},
    {{3, 1}, {2, 1}, {-1, 1}},
};

TEST(MultPolyRoots, StructuresAreFoundAndRootsAreAsAccurateAsSimpleOnes) {
    for (const std::vector<Multiple> &example : structures) {
        const Complexes coefficients = Expanded(example);
        const Structure found = FindStructure(coefficients);
        const std::vector<Multiple> expected = Sorted(example);
        ASSERT_EQ(found.multiplicities.size(), expected.size());
        for (std::size_t i = 0; i < expected.size(); ++i) {
            EXPECT_EQ(found.multiplicities[i], expected[i].times);
            EXPECT_NEAR(std::abs(found.refined[i]) / std::abs(expected[i].root), 1, 1e-12);
        }
        EXPECT_LT(LargestError(found.refined, expected), 1e-13);
        EXPECT_LT(LargestError(found.simple, expected), 2e-10);
        // The same without refinement, unsorted.
        const Structure simple = FindStructure(coefficients, AsFound);
        EXPECT_EQ(simple.refined, simple.simple);
        EXPECT_LT(LargestError(simple.simple, expected), 2e-10);
        for (std::size_t i = 0; i < simple.simple.size(); ++i) {
            const Multiple *const nearest = &*std::min_element(
                expected.begin(), expected.end(), [&](const Multiple &a, const Multiple &b) {
                    return std::abs(simple.simple[i] - a.root) <
                           std::abs(simple.simple[i] - b.root);
                });
            EXPECT_EQ(simple.multiplicities[i], nearest->times);
        }
    }
}

TEST(MultPolyRoots, SimpleRootsAreAsAccurateAsTheirCondition) {
    for (const Case &example : ReadCases()) {
        const Structure found = FindStructure(example.coefficients);
        if (example.name == "clustered-0.001") {
            EXPECT_EQ(found.refined.size(), 5U) << "two roots within the tolerance count as one";
            continue;
        }
        // Eigenvalues are accurate relative to the largest, which here is 1e30 times the others.
        if (example.name == "small")
            continue;
        EXPECT_LT(WorstError(example, found.refined), 1.7) << example.name;
    }
}

TEST(MultPolyRoots, RootsOfRealPolynomialsAreRealOrPaired) {
    const std::vector<Multiple> example = {
        {-1, 6}, {{0.5, 1}, 3}, {{0.5, -1}, 3}, {1, 2}, {0.5, 4}};
    for (const Refine refine : {AsFound, Refined}) {
        const Structure found = FindRealStructure(Expanded(example), refine);
        ASSERT_EQ(found.refined.size(), 5U);
        int32_t degree = 0;
        for (std::size_t i = 0; i < 5; ++i) {
            degree += found.multiplicities[i];
            if (std::abs(found.refined[i].imag()) < 0.5)
                EXPECT_EQ(found.refined[i].imag(), 0.0);
            else
                EXPECT_EQ(std::count(found.simple.begin(), found.simple.end(),
                                     std::conj(found.simple[i])),
                          1);
        }
        EXPECT_EQ(degree, 18);
    }
}

TEST(MultPolyRoots, TheToleranceDecidesWhatIsMultiple) {
    Complexes coefficients = Expanded({{1, 3}, {-2, 2}, {{0, 1}, 1}});
    double sign = 1;
    for (Complex &a : coefficients)
        a *= 1 + 1e-8 * (sign = -sign);
    const Structure strict = FindStructure(coefficients);
    EXPECT_EQ(strict.multiplicities, (std::vector<int32_t>(6, 1)));
    const Structure loose = FindStructure(coefficients, Refined, 1e-6);
    EXPECT_EQ(loose.multiplicities, (std::vector<int32_t>{1, 2, 3}));
    EXPECT_LT(LargestError(loose.refined, {{1, 3}, {-2, 2}, {{0, 1}, 1}}), 1e-6);
}

// With a tolerance of 1 nearly every structure is a candidate, but none is confirmed: the result
// consists of the eigenvalues.
TEST(MultPolyRoots, WithoutAStructureTheRootsAreEigenvalues) {
    const Complexes coefficients = {{-4, 1},   {3, 0.5}, {0, -2},  {1, 1},
                                    {-0.5, 0}, {2, -1},  {0.25, 3}};
    const Structure exact = FindStructure(coefficients);
    const Structure loose = FindStructure(coefficients, Refined, 1.0);
    EXPECT_EQ(loose.multiplicities, std::vector<int32_t>(6, 1));
    EXPECT_EQ(loose.refined, loose.simple);
    std::vector<Multiple> expected;
    for (const Complex &root : exact.refined)
        expected.push_back({root, 1});
    EXPECT_LT(LargestError(loose.refined, expected), 1e-14);
}

// Where a careless proof of simple roots would skip the search: few roots among many, near the
// limit of the tolerance, or with coefficients and roots of any size.
TEST(MultPolyRoots, OneMultipleRootAmongManyIsFound) {
    std::vector<Multiple> circle = {{0.5, 2}};
    for (int k = 0; k < 40; ++k)
        circle.push_back({std::polar(1.0 + 0.01 * (k % 5), 0.1 + 0.157 * k), 1});
    const std::vector<Multiple> few = {{2, 3}, {-3, 1}, {{0, 1}, 1}, {{1, -2}, 1}};
    for (const std::vector<Multiple> &example : {circle, few})
        for (const double size : {1.0, 1e3, 1e-4}) {
            std::vector<Multiple> roots = example;
            for (Multiple &root : roots)
                root.root *= size;
            Complexes coefficients = Expanded(roots);
            for (Complex &a : coefficients)
                a *= 1e-30;
            const Structure found = FindStructure(coefficients);
            ASSERT_EQ(found.multiplicities.size(), roots.size());
            EXPECT_EQ(found.multiplicities.back(), example[0].times);
            EXPECT_LT(std::abs(found.refined.back() / roots[0].root - 1.0), 1e-10);
        }
}

TEST(MultPolyRoots, TheDistanceFromAMultipleRootDecides) {
    const auto count = [](double distance, double tolerance) {
        return FindStructure(Product({1, 1 + distance, -2, {0, 1.5}, {0.5, -1}}), Refined,
                             tolerance)
            .refined.size();
    };
    EXPECT_EQ(count(1e-7, 1e-10), 4U);
    EXPECT_EQ(count(1e-6, 1e-10), 4U);
    EXPECT_EQ(count(1e-3, 1e-10), 5U);
    EXPECT_EQ(count(1e-3, 1e-5), 4U);
    EXPECT_EQ(count(0.1, 1e-5), 5U);
    // Ill-conditioned, but simple.
    for (const int degree : {8, 12, 16}) {
        Complexes roots;
        for (int k = 1; k <= degree; ++k)
            roots.emplace_back(k);
        EXPECT_EQ(FindRealStructure(Product(roots)).multiplicities,
                  std::vector<int32_t>(degree, 1));
    }
}

// p with descending coefficients, and whether its eigenvalues prove that its roots are simple.
bool IsProvedSimple(const Complexes &p, double tolerance) {
    std::vector<CDB> a;
    for (const Complex &coefficient : p)
        a.push_back({coefficient.real(), coefficient.imag()});
    const auto n = static_cast<int32_t>(a.size()) - 1;
    std::vector<CDB> roots(a.size());
    EXPECT_EQ(CompanionRoots(a.data(), n, roots.data()), 0);
    SimpleRootsProof proof;
    EXPECT_EQ(proof.allocate(n), 0);
    const bool holds = proof.holds(a.data(), n, tolerance, roots.data());
    roots[0].re += 1.0; // proves nothing
    EXPECT_FALSE(proof.holds(a.data(), n, tolerance, roots.data()));
    roots[0] = roots[1];
    EXPECT_FALSE(proof.holds(a.data(), n, tolerance, roots.data()));
    return holds;
}

// Polynomials with a double root, moved by up to the tolerance, are never proved simple; those
// whose roots are far apart always are.
TEST(SimpleRootsProof, HoldsOnlyAwayFromMultipleRoots) {
    qx::test::Noise noise(5);
    for (int round = 0; round < 120; ++round) {
        const int others = 1 + round % 40;
        const bool isReal = round % 2 == 0;
        const double tolerance = std::pow(10.0, -4.0 - round % 3 * 3);
        Complexes roots = {0.8, 0.8};
        for (int k = 0; k < others; ++k)
            roots.push_back(isReal && others < 8
                                ? Complex(2 * noise.symmetric())
                                : std::polar(1.0 + 0.2 * noise.symmetric(), 3.1 * (k + 0.5)));
        Complexes p = Product(roots);
        std::reverse(p.begin(), p.end());
        for (std::size_t k = 1; k < p.size(); ++k) {
            const double by = 0.95 * tolerance * std::max(1.0, std::abs(p[k]));
            p[k] += round % 4 < 2 ? std::copysign(by, noise.symmetric()) : 0.0;
        }
        EXPECT_FALSE(IsProvedSimple(p, tolerance)) << round;
    }
    for (int degree = 2; degree <= 60; degree += 2) {
        Complexes p(degree + 1);
        for (Complex &coefficient : p)
            coefficient = {0.1 * noise.symmetric() / degree, 0.1 * noise.symmetric() / degree};
        p[0] = 1;
        p[degree] += Complex(0, 1);
        EXPECT_TRUE(IsProvedSimple(p, 1e-10)) << degree;
        EXPECT_FALSE(IsProvedSimple(p, 1e-2)) << degree;
    }
}

// Real systems are solved in real arithmetic. The factor i of a row changes no solution, but makes
// the system complex.
TEST(LeastSquaresSystem, RealAndComplexSystemsHaveTheSameSolution) {
    qx::test::Noise noise(7);
    for (const double size : {1.0, 1e-120, 1e120}) {
        constexpr int rows = 9, cols = 4;
        LeastSquaresSystem real, turned;
        ASSERT_EQ(real.allocate(rows, cols), 0);
        ASSERT_EQ(turned.allocate(rows, cols), 0);
        real.reset(rows, cols);
        turned.reset(rows, cols);
        for (int i = 0; i < rows; ++i)
            for (int j = 0; j <= cols; ++j) {
                const double value = size * noise.symmetric();
                real.at(i, j) = {value, 0.0};
                turned.at(i, j) = i % 2 == 0 ? CDB{0.0, value} : CDB{value, 0.0};
            }
        CDB x[cols], y[cols];
        ASSERT_EQ(real.solve(x), 0);
        ASSERT_EQ(turned.solve(y), 0);
        for (int j = 0; j < cols; ++j) {
            EXPECT_NEAR(x[j].re, y[j].re, 1e-14);
            EXPECT_NEAR(y[j].im, 0.0, 1e-14);
            EXPECT_EQ(x[j].im, 0.0);
        }
        real.at(0, 0).re = HUGE_VAL;
        EXPECT_EQ(real.solve(x), ErrNonFiniteInput);
    }
}

TEST(MultPolyRoots, RootsAtZeroAndLowDegrees) {
    for (const Refine refine : {AsFound, Refined}) {
        const Structure quintic = FindStructure({0, 0, -2, 5, -4, 1}, refine); // x^2 (x-1)^2 (x-2)
        EXPECT_EQ(quintic.multiplicities.back(), 2);
        EXPECT_EQ(quintic.refined.back(), Complex(0));
        EXPECT_EQ(quintic.simple.back(), Complex(0));
        EXPECT_EQ(quintic.refined.size(), 3U);

        const Structure power = FindStructure({0, 0, 0, 2, 0}, refine);
        EXPECT_EQ(power.refined, Complexes{0});
        EXPECT_EQ(power.multiplicities, std::vector<int32_t>{3});

        const Structure linear = FindStructure({0, 6, -3}, refine);
        EXPECT_EQ(linear.refined, (Complexes{2, 0}));
        EXPECT_EQ(linear.multiplicities, (std::vector<int32_t>{1, 1}));

        const Structure square = FindStructure({1, -2, 1, 0, 0}, refine);
        EXPECT_EQ(square.simple, (Complexes{1, 1}));
        EXPECT_EQ(square.multiplicities, (std::vector<int32_t>{1, 1}));
    }
}

TEST(MultPolyRoots, FailuresEmptyTheCoefficientsToo) {
    const auto code = [](const Complexes &coefficients) {
        const CDBArray coef = ToHost(coefficients), refined(2), simple(3);
        const I32Array multiplicities(4);
        const ErrorCode status = CxMultPolyRoots_head(coef.handle(), 1, 0, refined.handle(),
                                                      simple.handle(), multiplicities.handle());
        EXPECT_EQ(coef.size() + refined.size() + simple.size() + multiplicities.size(), 0);
        return status;
    };
    EXPECT_EQ(code({}), ErrEmptyInput);
    EXPECT_EQ(code({1, {0, HUGE_VAL}, 1}), ErrBadCoefficients);
    EXPECT_EQ(code({0, 0, 0}), ErrAllCoefficientsZero);
    EXPECT_EQ(code({7, 0}), ErrOrderNotPositive);
    EXPECT_EQ(code({1, 1e300, 1, 1, 1e-300}), ErrNonFiniteInput);
}

} // namespace
} // namespace qx::test
