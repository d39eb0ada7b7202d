#include "qx/generalised_problems.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto CDB = ElementType::CDB;

const std::vector<int32_t> sizes = {1, 2, 3, 7, 20};

template <ElementType E, class Export>
Recipe QZ(const char *name, Export qz) {
    return {name,
            [qz](Call &c) {
                return qz(c.inOut2D<E>(0, c.n, c.n), c.inOut2D<E>(1, c.n, c.n), c.n % 2,
                          c.out2D<E>(0), c.out2D<E>(1), c.out<CDB>(2), c.out<E>(3));
            },
            None, sizes};
}
template <ElementType E, class Export>
Recipe QZ80(std::string name, int32_t order, Export qz) {
    return {name + ": order " + std::to_string(order),
            [=](Call &c) {
                return qz(c.inOut2D<E>(0, c.n, c.n), c.inOut2D<E>(1, c.n, c.n), 1, order,
                          c.out2D<E>(0), c.out2D<E>(1), c.out<CDB>(2), c.out<E>(3));
            },
            None, sizes};
}
template <ElementType E, class Export>
Recipe TmiQZ(const char *name, Export qz) {
    return {name,
            [qz](Call &c) {
                return qz(c.inOut2D<E>(0, c.n, c.n), c.inOut2D<E>(1, c.n, c.n), c.n % 5,
                          c.out2D<E>(0), c.out2D<E>(1), c.out<CDB>(2), c.out<E>(3),
                          c.out2D<CDB>(4));
            },
            None, sizes};
}
template <ElementType E, class Export>
Recipe Eigen(std::string name, int32_t output, Export eigen) {
    return {name + ": output " + std::to_string(output),
            [=](Call &c) {
                return eigen(c.in2D<E>(0, c.n, c.n), c.in2D<E>(1, c.n, c.n), output, c.out<CDB>(0),
                             c.out2D<CDB>(1));
            },
            None, sizes};
}
template <ElementType E, class Export>
Recipe GSVD(const char *name, Export gsvd) {
    return {name,
            [gsvd](Call &c) {
                return gsvd(c.inOut2D<E>(0, c.n, c.n + 1), c.inOut2D<E>(1, c.n + 2, c.n + 1),
                            c.out<DBL>(0), c.out<DBL>(1), c.out2D<E>(2), c.out2D<E>(3),
                            c.out2D<E>(4), c.integer(0), c.integer(1));
            },
            None, sizes};
}

std::vector<Recipe> GeneralisedRecipes() {
    std::vector<Recipe> recipes = {
        QZ<DBL>("QZ_head", QZ_head),          QZ<CDB>("CxQZ_head", CxQZ_head),
        TmiQZ<DBL>("TmiQZ_head", TmiQZ_head), TmiQZ<CDB>("CxTmiQZ_head", CxTmiQZ_head),
        GSVD<DBL>("GSVD_head", GSVD_head),    GSVD<CDB>("CxGSVD_head", CxGSVD_head),
    };
    for (const int32_t order : {0, 1, 4}) {
        recipes.push_back(QZ80<DBL>("QZ80_head", order, QZ80_head));
        recipes.push_back(QZ80<CDB>("CxQZ80_head", order, CxQZ80_head));
    }
    for (const int32_t output : {0, 1}) {
        recipes.push_back(Eigen<DBL>("GenEigenEx_head", output, GenEigenEx_head));
        recipes.push_back(Eigen<CDB>("CxGenEigenEx_head", output, CxGenEigenEx_head));
    }
    return recipes;
}

const RecipeFile file(GeneralisedRecipes);

} // namespace

} // namespace qx::test
