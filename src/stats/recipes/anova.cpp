#include "qx/anova.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto I32 = ElementType::I32;

double ThreeLabels(int32_t i) { return i % 3 - 1; }
double Counts(int32_t i) { return i * 7 % 11 + 1; }

// Crossed factors with c.n observations per cell: the last factor varies fastest.
struct Crossed {
    int32_t levels[3]; // 1 for an absent factor; negative for a random one
    int32_t size(int factor) const { return levels[factor] < 0 ? -levels[factor] : levels[factor]; }
    int32_t cells() const { return size(0) * size(1) * size(2); }
    int32_t level(int factor, int32_t i) const {
        for (int other = 2; other > factor; --other)
            i /= size(other);
        return i % size(factor);
    }
    I32_1D labels(Call &c, int factor) const {
        return c.in<I32>(1 + factor, c.n * cells(), [this, factor](int32_t i) {
            return 7.0 * level(factor, i) - 10.0; // any labels
        });
    }
    // Interactions of two factors are larger than that of three.
    DBL1D values(Call &c) const {
        return c.in<DBL>(0, c.n * cells(), [this](int32_t i) {
            const double a = level(0, i) + 1.0;
            const double b = level(1, i) * 1.3 + 0.4;
            const double d = level(2, i) * 0.7 - 1.1;
            return a * b + b * d + d * a + 0.01 * a * b * d + 0.1 * (i * 37 % 101) / 101.0;
        });
    }
};

void AddFactorialRecipes(std::vector<Recipe> &recipes, const std::string &variant, Crossed design,
                         std::vector<int32_t> sizes) {
    const int32_t a = design.levels[0];
    const int32_t b = design.levels[1];
    const int32_t d = design.levels[2];
    const auto add = [&](const char *name, std::function<int32_t(Call &)> run) {
        recipes.push_back({name + variant, std::move(run), None, sizes});
    };
    if (d != 1) {
        add("ANOVA3Way_head: ", [=](Call &c) {
            return ANOVA3Way_head(design.values(c), design.labels(c, 0), design.labels(c, 1),
                                  design.labels(c, 2), a, b, d, c.n, c.out<DBL>(0), c.out<DBL>(1),
                                  c.out<DBL>(2), c.out<DBL>(3), c.out<DBL>(4), c.out<DBL>(5));
        });
        add("ANOVA3Way_head_2017: ", [=](Call &c) {
            return ANOVA3Way_head_2017(design.values(c), design.labels(c, 0), design.labels(c, 1),
                                       design.labels(c, 2), a, b, d, c.n, 0.05, c.out<DBL>(0),
                                       c.out<DBL>(1), c.out<DBL>(2), c.out<DBL>(3), c.out<DBL>(4),
                                       c.out<DBL>(5), c.out<DBL>(6));
        });
        return;
    }
    add("Anova2Way_head: ", [=](Call &c) {
        return Anova2Way_head(design.values(c), design.labels(c, 0), design.labels(c, 1), a, b, c.n,
                              c.out<DBL>(0), c.out<DBL>(1), c.out<DBL>(2), c.out<DBL>(3),
                              c.out<DBL>(4), c.out<DBL>(5));
    });
    add("Anova2Way_head_2017: ", [=](Call &c) {
        return Anova2Way_head_2017(design.values(c), design.labels(c, 0), design.labels(c, 1), a, b,
                                   c.n, 0.01, c.out<DBL>(0), c.out<DBL>(1), c.out<DBL>(2),
                                   c.out<DBL>(3), c.out<DBL>(4), c.out<DBL>(5), c.out<DBL>(6));
    });
}

std::vector<Recipe> AnovaRecipes() {
    std::vector<Recipe> recipes = {
        {"Contingency_head",
         [](Call &c) {
             return Contingency_head(c.in2D<I32>(0, c.n, c.n + 1, Counts), c.scalar(0), c.scalar(1),
                                     c.err());
         },
         None,
         {2, 3, 50}},
        {"Anova1Way_head",
         [](Call &c) {
             return Anova1Way_head(c.in<DBL>(0), c.in<I32>(1, c.n, ThreeLabels), c.byReference(3),
                                   c.scalar(0), c.scalar(1), c.scalar(2), c.scalar(3), c.scalar(4),
                                   c.scalar(5), c.scalar(6), c.err());
         },
         None,
         {8, 50, 1000}},
        {"Contingency2026_head",
         [](Call &c) {
             return Contingency2026_head(c.in2D<I32>(0, c.n, c.n + 1, Counts), c.scalar(0),
                                         c.scalar(1), c.err());
         },
         None,
         {2, 3, 50}},
        {"Anova1Way_head_2026",
         [](Call &c) {
             return Anova1Way_head_2026(c.in<DBL>(0), c.in<I32>(1, c.n, ThreeLabels),
                                        c.byReference(3), 0.05, c.scalar(0), c.scalar(1),
                                        c.scalar(2), c.scalar(3), c.scalar(4), c.scalar(5),
                                        c.scalar(6), c.scalar(7), c.err());
         },
         None,
         {8, 50, 1000}},
        {"Anova1Way_head_2017",
         [](Call &c) {
             return Anova1Way_head_2017(c.in<DBL>(0), c.in<I32>(1, c.n, ThreeLabels),
                                        c.byReference(3), 0.05, c.scalar(0), c.scalar(1),
                                        c.scalar(2), c.scalar(3), c.scalar(4), c.scalar(5),
                                        c.scalar(6), c.scalar(7), c.err());
         },
         None,
         {8, 50, 1000}},
    };
    AddFactorialRecipes(recipes, "fixed factors", {{3, 2, 1}}, {2, 3, 50});
    AddFactorialRecipes(recipes, "one observation per cell", {{4, 5, 1}}, {1});
    AddFactorialRecipes(recipes, "a random factor", {{3, -4, 1}}, {2, 10});
    AddFactorialRecipes(recipes, "fixed factors", {{3, 2, 4}}, {2, 5, 20});
    AddFactorialRecipes(recipes, "one observation per cell", {{3, 4, 2}}, {1});
    AddFactorialRecipes(recipes, "a random factor", {{3, -2, 4}}, {2});
    AddFactorialRecipes(recipes, "random factors", {{-3, -2, -4}}, {2, 10});
    return recipes;
}

const RecipeFile file(AnovaRecipes);

} // namespace

} // namespace qx::test
