#include "qx/shuffling.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto CDB = ElementType::CDB;
constexpr auto I32 = ElementType::I32;

RandomState *State(Call &c) {
    auto *state = c.record<RandomState>(0);
    *state = {c.n, 2, 3};
    return state;
}

// The export with and without its last argument.
template <ElementType Code, class Biased, class Unbiased>
void Add(std::vector<Recipe> &recipes, const std::string &name, Biased biased, Unbiased unbiased) {
    recipes.push_back({name + "_head", [=](Call &c) {
                           return biased(c.inOut<Code>(0), c.out<I32>(0), 7, State(c));
                       }});
    recipes.push_back({name + "2012_head", [=](Call &c) {
                           return unbiased(c.inOut<Code>(0), c.out<I32>(0), -1, State(c), 1);
                       }});
}

std::vector<Recipe> ShufflingRecipes() {
    std::vector<Recipe> recipes = {
        {"RiffleIntNum_head",
         [](Call &c) { return RiffleIntNum_head(c.out<I32>(0), c.n, 7, State(c)); }},
        {"RiffleIntNum2012_head",
         [](Call &c) { return RiffleIntNum2012_head(c.out<I32>(0), c.n, 7, State(c), 1); }},
    };
    const auto add = [&](const char *name, auto run) { recipes.push_back({name, run}); };
    add("RiffleIntNum2026_head",
        [](Call &c) { return RiffleIntNum2026_head(c.out<I32>(0), c.n, 7, 1, 5.0); });
    add("RiffleArrayDBL2026_head",
        [](Call &c) { return RiffleArrayDBL2026_head(c.inOut<DBL>(0), c.out<I32>(0), 7, 1, 0.0); });
    add("RiffleArrayCDB2026_head", [](Call &c) {
        return RiffleArrayCDB2026_head(c.inOut<CDB>(0), c.out<I32>(0), -7, 1, 1e12);
    });
    add("RiffleArrayInt2026_head", [](Call &c) {
        return RiffleArrayInt2026_head(c.inOut<I32>(0), c.out<I32>(0), 7, -1, 0.0);
    });
    Add<DBL>(recipes, "RiffleArrayDBL", RiffleArrayDBL_head, RiffleArrayDBL2012_head);
    Add<CDB>(recipes, "RiffleArrayCDB", RiffleArrayCDB_head, RiffleArrayCDB2012_head);
    Add<I32>(recipes, "RiffleArrayInt", RiffleArrayInt_head, RiffleArrayInt2012_head);
    return recipes;
}

const RecipeFile file(ShufflingRecipes);

} // namespace

} // namespace qx::test
