#include "qx/matrix_equations.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto CDB = ElementType::CDB;

// The substitution halves the last size several times.
const std::vector<int32_t> sizes = {1, 2, 3, 7, 33};

template <ElementType Code, class Export>
Recipe Sylvester(const char *name, Export solve) {
    return {name,
            [solve](Call &c) {
                return solve(c.in2D<Code>(0, c.n, c.n), c.in2D<Code>(1, c.n + 2, c.n + 2),
                             c.in2D<Code>(2, c.n, c.n + 2), c.out2D<Code>(0));
            },
            0, sizes};
}
template <ElementType Code, class Export>
Recipe Sylvester2011(std::string name, int32_t equation, Export solve) {
    return {name + ": equation " + std::to_string(equation),
            [=](Call &c) {
                return solve(c.in2D<Code>(0, c.n, c.n), c.in2D<Code>(1, c.n + 2, c.n + 2),
                             c.in2D<Code>(2, c.n, c.n + 2), equation, c.out2D<Code>(0));
            },
            0, sizes};
}

// A symmetric right side.
double Mirrored(int32_t i, int32_t j) { return 1.0 / (1.0 + i + j) - (i == j ? 2.0 : 0.0); }

template <ElementType Code, class Export>
Recipe Lyapunov(const char *name, Export solve) {
    return {name,
            [solve](Call &c) {
                return solve(c.in2D<Code>(0, c.n, c.n), c.in2D<Code>(1, c.n, c.n, Mirrored),
                             c.out2D<Code>(0));
            },
            0, sizes};
}
template <ElementType Code, class Export>
Recipe Lyapunov2011(std::string name, int32_t equation, Export solve) {
    return {name + ": equation " + std::to_string(equation),
            [=](Call &c) {
                return solve(c.in2D<Code>(0, c.n, c.n), c.in2D<Code>(1, c.n, c.n), equation,
                             c.out2D<Code>(0));
            },
            0, sizes};
}

std::vector<Recipe> EquationRecipes() {
    std::vector<Recipe> recipes = {
        Sylvester<DBL>("Sylvester_head", Sylvester_head),
        Sylvester<CDB>("CxSylvester_head", CxSylvester_head),
        Lyapunov<DBL>("Lyapunov_head", Lyapunov_head),
        Lyapunov<CDB>("CxLyapunov_head", CxLyapunov_head),
    };
    for (const int32_t equation : {0, 1, 2}) {
        recipes.push_back(Sylvester2011<DBL>("Sylvester2011_head", equation, Sylvester2011_head));
        recipes.push_back(
            Sylvester2011<CDB>("CxSylvester2011_head", equation, CxSylvester2011_head));
    }
    for (const int32_t equation : {0, 1}) {
        recipes.push_back(Lyapunov2011<DBL>("Lyapunov2011_head", equation, Lyapunov2011_head));
        recipes.push_back(Lyapunov2011<CDB>("CxLyapunov2011_head", equation, CxLyapunov2011_head));
    }
    return recipes;
}

const RecipeFile file(EquationRecipes);

} // namespace

} // namespace qx::test
