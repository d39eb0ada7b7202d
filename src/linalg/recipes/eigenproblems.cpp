#include "qx/eigenproblems.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto CDB = ElementType::CDB;

const std::vector<int32_t> sizes = {1, 2, 3, 7, 20};
// The last size uses the blocked iteration.
const std::vector<int32_t> schurSizes = {1, 2, 3, 7, 20, 81};

template <ElementType Code, class Export>
Recipe Schur(const char *name, Export schur) {
    return {name,
            [schur](Call &c) {
                return schur(c.inOut2D<Code>(0, c.n, c.n), c.n % 2, c.out2D<Code>(0),
                             c.out<CDB>(1));
            },
            None, schurSizes};
}
template <ElementType Code, class Export>
Recipe Schur80(std::string name, int32_t order, Export schur) {
    return {name + ": order " + std::to_string(order),
            [schur, order](Call &c) {
                return schur(c.inOut2D<Code>(0, c.n, c.n), 1, order, c.out2D<Code>(0),
                             c.out<CDB>(1));
            },
            None, sizes};
}

std::vector<Recipe> EigenproblemRecipes() {
    std::vector<Recipe> recipes = {
        Schur<DBL>("Schur_head", Schur_head),
        Schur<CDB>("CxSchur_head", CxSchur_head),
    };
    for (const int32_t order : {0, 1, 2, 3, 4}) {
        recipes.push_back(Schur80<DBL>("Schur80_head", order, Schur80_head));
        recipes.push_back(Schur80<CDB>("CxSchur80_head", order, CxSchur80_head));
        recipes.push_back(Schur80<DBL>("Schur2026_head", order, Schur2026_head));
    }
    for (const int32_t output : {0, 1}) {
        const std::string variant = ": output " + std::to_string(output);
        recipes.push_back({"EigenValueVector_head" + variant,
                           [output](Call &c) {
                               return EigenValueVector_head(c.in2D<DBL>(0, c.n, c.n),
                                                            c.byReference(output), c.out<CDB>(0),
                                                            c.out2D<CDB>(1), c.err());
                           },
                           None, sizes});
        for (const int32_t type : {0, 1})
            recipes.push_back(
                {"CxEigenValueVector_head" + variant + ", type " + std::to_string(type),
                 [output, type](Call &c) {
                     return CxEigenValueVector_head(c.in2D<CDB>(0, c.n, c.n), c.byReference(type),
                                                    c.byReference(output), c.out<CDB>(0),
                                                    c.out2D<CDB>(1), c.err());
                 },
                 None, sizes});
        // The sizes include an order that is solved by blocks.
        recipes.push_back({"EigenValueVector2026_head" + variant,
                           [output](Call &c) {
                               return EigenValueVector2026_head(
                                   c.in2D<DBL>(0, c.n, c.n), c.byReference(output), c.out<CDB>(0),
                                   c.out2D<CDB>(1), c.err());
                           },
                           None,
                           {1, 7, 161}});
        for (const int32_t type : {0, 1})
            recipes.push_back(
                {"CxEigenValueVector2026_head" + variant + ", type " + std::to_string(type),
                 [output, type](Call &c) {
                     return CxEigenValueVector2026_head(c.in2D<CDB>(0, c.n, c.n),
                                                        c.byReference(type), c.byReference(output),
                                                        c.out<CDB>(0), c.out2D<CDB>(1), c.err());
                 },
                 None,
                 type == 0 ? std::vector<int32_t>{1, 7, 161} : std::vector<int32_t>{1, 3, 7, 65}});
        recipes.push_back({"SymEvectorEvalue_head" + variant,
                           [output](Call &c) {
                               return SymEvectorEvalue_head(c.inOut2D<DBL>(0, c.n, c.n),
                                                            c.byReference(output), c.out<DBL>(0),
                                                            c.err());
                           },
                           None, sizes});
        recipes.push_back({"SymEvectorEvalue2026_head" + variant,
                           [output](Call &c) {
                               return SymEvectorEvalue2026_head(c.inOut2D<DBL>(0, c.n, c.n),
                                                                c.byReference(output),
                                                                c.out<DBL>(0), c.err());
                           },
                           None,
                           {1, 7, 65, 161}});
    }
    return recipes;
}

const RecipeFile file(EigenproblemRecipes);

} // namespace

} // namespace qx::test
