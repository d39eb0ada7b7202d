#include "qx/matrix_functions.h"
#include "linalg/recipes/contents.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto CDB = ElementType::CDB;

const std::vector<int32_t> sizes = {1, 2, 3, 7, 20};

template <ElementType Code, class Export>
Recipe InPlace(const char *name, Export function) {
    return {name,
            [function](Call &c) {
                return function(c.inOut2D<Code>(0, c.n, c.n, PositiveDefinite{c.n}), c.err());
            },
            None, sizes};
}
template <ElementType Code, class Export>
Recipe Power(std::string name, int32_t power, Export function) {
    return {name + ": power " + std::to_string(power),
            [=](Call &c) { return function(c.inOut2D<Code>(0, c.n, c.n), power); }, None, sizes};
}
template <ElementType Code, class Export>
Recipe PseudoInverse(const char *name, Export function) {
    return {name,
            [function](Call &c) {
                return function(c.inOut2D<Code>(0, c.n, c.n + 2), c.byReference(-1.0), c.err());
            },
            None, sizes};
}

template <ElementType Code, class Export>
Recipe Exponential2026(const char *name, Export function) {
    return {name,
            [function](Call &c) { return function(c.in2D<Code>(0, c.n, c.n), c.out2D<Code>(0)); },
            None, sizes};
}
// Random matrices have negative and complex eigenvalues, definite ones have real functions.
template <ElementType Code, class Export>
void AddComplexFunctions(std::vector<Recipe> *recipes, const std::string &name, Export function) {
    recipes->push_back(
        {name,
         [=](Call &c) { return function(c.in2D<Code>(0, c.n, c.n), c.out2D<ElementType::CDB>(0)); },
         None, sizes});
    recipes->push_back({name + ": definite",
                        [=](Call &c) {
                            return function(c.in2D<Code>(0, c.n, c.n, PositiveDefinite{c.n}),
                                            c.out2D<ElementType::CDB>(0));
                        },
                        None, sizes});
}
template <ElementType Code, class Export>
Recipe Power2026(std::string name, int32_t power, Export function) {
    return {name + ": power " + std::to_string(power),
            [=](Call &c) { return function(c.in2D<Code>(0, c.n, c.n), power, c.out2D<Code>(0)); },
            None, sizes};
}
template <ElementType Code, class Export>
Recipe PseudoInverse2026(const char *name, Export function) {
    return {name,
            [function](Call &c) {
                return function(c.in2D<Code>(0, c.n, c.n + 2), -1.0, c.out2D<Code>(0));
            },
            None, sizes};
}

std::vector<Recipe> FunctionRecipes() {
    std::vector<Recipe> recipes = {
        InPlace<DBL>("MatrixExp_head", MatrixExp_head),
        InPlace<CDB>("CxMatrixExp_head", CxMatrixExp_head),
        {"MatrixLn_head",
         [](Call &c) {
             return MatrixLn_head(c.in2D<DBL>(0, c.n, c.n, PositiveDefinite{c.n}), c.out2D<CDB>(0),
                                  c.err());
         },
         None, sizes},
        InPlace<CDB>("CxMatrixLn_head", CxMatrixLn_head),
        InPlace<DBL>("MatrixSqrt_head", MatrixSqrt_head),
        {"MatrixSqrtH",
         [](Call &c) { return MatrixSqrtH(c.in2D<DBL>(0, c.n, c.n), c.out2D<CDB>(0)); }, None,
         sizes},
        InPlace<CDB>("CxMatrixSqrt_head", CxMatrixSqrt_head),
        PseudoInverse<DBL>("PseudoInverse_head", PseudoInverse_head),
        PseudoInverse<CDB>("CxPseudoInverse_head", CxPseudoInverse_head),
        Exponential2026<DBL>("MatrixExp2026_head", MatrixExp2026_head),
        Exponential2026<CDB>("CxMatrixExp2026_head", CxMatrixExp2026_head),
        PseudoInverse2026<DBL>("PseudoInverse2026_head", PseudoInverse2026_head),
        PseudoInverse2026<CDB>("CxPseudoInverse2026_head", CxPseudoInverse2026_head),
    };
    AddComplexFunctions<DBL>(&recipes, "MatrixLn2026_head", MatrixLn2026_head);
    AddComplexFunctions<CDB>(&recipes, "CxMatrixLn2026_head", CxMatrixLn2026_head);
    AddComplexFunctions<DBL>(&recipes, "MatrixSqrt2026_head", MatrixSqrt2026_head);
    AddComplexFunctions<CDB>(&recipes, "CxMatrixSqrt2026_head", CxMatrixSqrt2026_head);
    for (const int32_t power : {-2, 0, 5}) {
        recipes.push_back(Power2026<DBL>("MatrixPower2026_head", power, MatrixPower2026_head));
        recipes.push_back(Power2026<CDB>("CxMatrixPower2026_head", power, CxMatrixPower2026_head));
        recipes.push_back(Power<DBL>("MatrixPower_head", power, MatrixPower_head));
        recipes.push_back(Power<CDB>("CxMatrixPower_head", power, CxMatrixPower_head));
    }
    return recipes;
}

const RecipeFile file(FunctionRecipes);

} // namespace

} // namespace qx::test
