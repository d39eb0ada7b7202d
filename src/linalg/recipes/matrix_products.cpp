#include "qx/matrix_products.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto CDB = ElementType::CDB;

const std::vector<int32_t> sizes = {1, 2, 3, 8, 9, 17, 60};
// The last size is multiplied in blocks.
const std::vector<int32_t> productSizes = {1, 2, 3, 8, 9, 17, 60, 130};

// One product of an n by n+1 with an n+1 by n+2 matrix.
template <ElementType E, class Export>
Recipe Product(const std::string &name, Export product) {
    return {name,
            [=](Call &c) {
                return product(c.in2D<E>(0, c.n, c.n + 1), c.in2D<E>(1, c.n + 1, c.n + 2),
                               c.out2D<E>(0), c.err());
            },
            TakesEmptyInput | HostStatusInResult, productSizes};
}

template <ElementType E, class Export>
Recipe MatrixTimesVector(const std::string &name, Export product) {
    return {name,
            [=](Call &c) {
                return product(c.in2D<E>(0, c.n, c.n + 1), c.in<E>(1, c.n + 1), c.out<E>(0),
                               c.err());
            },
            TakesEmptyInput | HostStatusInResult, sizes};
}

template <ElementType E, class Export>
Recipe VectorTimesMatrix(const std::string &name, Export product) {
    return {name,
            [=](Call &c) {
                return product(c.in<E>(0), c.in2D<E>(1, c.n, c.n + 1), c.out<E>(0), c.err());
            },
            TakesEmptyInput | HostStatusInResult, productSizes};
}

// The same export with the flag fixed.
template <class Export>
auto With(int32_t alignedCopy, Export product) {
    return [=](auto x, auto y, auto out, ErrorCode *err) {
        return product(x, y, out, alignedCopy, err);
    };
}

std::vector<Recipe> MatrixProductRecipes() {
    std::vector<Recipe> recipes = {
        Product<DBL>("MatrixMul_head", MatrixMul_head),
        Product<CDB>("AxBCxCIN", AxBCxCIN),
        MatrixTimesVector<DBL>("AxVect_head", AxVect_head),
        MatrixTimesVector<CDB>("AxVectorCx", AxVectorCx),
        VectorTimesMatrix<DBL>("vectxA_head", vectxA_head),
        VectorTimesMatrix<CDB>("CxVectxA_head", CxVectxA_head),
        MatrixTimesVector<DBL>("AxVectAligned_head", With(1, AxVectAligned_head)),
        MatrixTimesVector<CDB>("AxVectorCxAligned", With(1, AxVectorCxAligned)),
    };
    const auto both = [&](auto make, std::string name, auto product) {
        recipes.push_back(make(name + ": in place", With(0, product)));
        recipes.push_back(make(name + ": of copies", With(1, product)));
    };
    both([](auto... x) { return Product<DBL>(x...); }, "MatrixMulAligned_head",
         MatrixMulAligned_head);
    both([](auto... x) { return Product<CDB>(x...); }, "AxBCxAlignedCIN", AxBCxAlignedCIN);
    both([](auto... x) { return VectorTimesMatrix<DBL>(x...); }, "vectxAAligned_head",
         vectxAAligned_head);
    both([](auto... x) { return VectorTimesMatrix<CDB>(x...); }, "CxVectxAAligned_head",
         CxVectxAAligned_head);
    return recipes;
}

const RecipeFile file(MatrixProductRecipes);

} // namespace

} // namespace qx::test
