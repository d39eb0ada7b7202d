#include "qx/matrix_properties.h"

#include "linalg/recipes/contents.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto CDB = ElementType::CDB;

const std::vector<int32_t> sizes = {1, 2, 3, 8, 20};

// The same for both element types: real and symmetric, hence Hermitian.
template <ElementType E>
auto Definite(int32_t n) {
    return [n](int32_t i, int32_t j) {
        const double value = PositiveDefinite{n}(i, j);
        if constexpr (E == CDB)
            return ::CDB{value, 0.0};
        else
            return value;
    };
}

// A number of the export's element type.
template <ElementType E>
auto Scalar(Call &c, int number) {
    if constexpr (E == CDB)
        return c.complexScalar(number);
    else
        return c.scalar(number);
}

// One recipe for a real export and for its complex twin.
template <ElementType E, class Export>
Recipe Determinant(const std::string &name, int32_t type, Export determinant) {
    return {name + ": type " + std::to_string(type),
            [=](Call &c) {
                return determinant(c.in2D<E>(0, c.n, c.n, PositiveDefinite{c.n}),
                                   c.byReference(type), Scalar<E>(c, 0), c.err());
            },
            None, sizes};
}
// The rank is -1 after a failure, so it is not a plain integer output.
template <ElementType E, class Export>
Recipe Rank(const std::string &name, Export rank) {
    return {name,
            [=](Call &c) {
                return rank(c.in2D<E>(0, c.n, c.n + 1), c.byReference(-1.0), c.record<int32_t>(0),
                            c.err());
            },
            None, sizes};
}
template <ElementType E, class Export>
Recipe OfNormType(const std::string &name, int32_t type, Export norm) {
    return {name + ": type " + std::to_string(type),
            [=](Call &c) {
                return norm(c.in2D<E>(0, c.n, c.n), c.byReference(type), c.scalar(0), c.err());
            },
            None, sizes};
}
template <ElementType E, class Export>
Recipe Rank2026(const std::string &name, Export rank) {
    return {name, [=](Call &c) { return rank(c.in2D<E>(0, c.n, c.n + 1), -1.0, c.integer(0)); },
            None, sizes};
}
template <ElementType E, class Export>
Recipe OfNormType2026(const std::string &name, int32_t type, Export norm) {
    return {name + ": type " + std::to_string(type),
            [=](Call &c) { return norm(c.in2D<E>(0, c.n, c.n), type, c.scalar(0)); }, None, sizes};
}
template <ElementType E, class Export>
Recipe Trace(const std::string &name, Export trace) {
    return {name, [=](Call &c) { return trace(c.in2D<E>(0, c.n, c.n), Scalar<E>(c, 0), c.err()); },
            None, sizes};
}
template <ElementType E, class Export>
Recipe DotProduct(const std::string &name, Export dot) {
    return {name, [=](Call &c) { return dot(c.in<E>(0), c.in<E>(1), Scalar<E>(c, 0), c.err()); }};
}
template <ElementType E, class Export>
Recipe VectorNorm(const std::string &name, double p, Export norm) {
    return {name + ": p " + std::to_string(p),
            [=](Call &c) { return norm(c.in<E>(0), p, c.scalar(0)); }};
}
template <ElementType E, class Export>
Recipe UnitVector(const std::string &name, Export unit) {
    return {name, [=](Call &c) { return unit(c.inOut<E>(0), c.scalar(0), c.err()); }};
}
template <ElementType E, class Export>
Recipe UnitVectorOfP(const std::string &name, Export unit) {
    return {name, [=](Call &c) { return unit(c.inOut<E>(0), 3.0, c.scalar(0), c.err()); }};
}
template <ElementType E, class Export>
Recipe IsDefinite(const std::string &name, Export test) {
    return {name,
            [=](Call &c) {
                return test(c.in2D<E>(0, c.n, c.n, Definite<E>(c.n)), c.integer(0), c.err());
            },
            None, sizes};
}
template <ElementType E, class Export>
Recipe IsSemiDefinite(const std::string &name, Export test) {
    return {name,
            [=](Call &c) {
                return test(c.in2D<E>(0, c.n, c.n, Definite<E>(c.n)), -1.0, c.integer(0),
                            c.record<int32_t>(0));
            },
            None, sizes};
}
template <ElementType E, class Export>
Recipe Polynomial(const std::string &name, Export polynomial) {
    return {name, [=](Call &c) { return polynomial(c.in2D<E>(0, c.n, c.n), c.out<E>(0), c.err()); },
            None, sizes};
}

std::vector<Recipe> MatrixPropertyRecipes() {
    std::vector<Recipe> recipes = {
        Determinant<DBL>("Determinant_head", 0, Determinant_head),
        Determinant<CDB>("CxDeterminant_head", 0, CxDeterminant_head),
        OfNormType<DBL>("CondNumber_head", 0, CondNumber_head),
        OfNormType<CDB>("CxCondNumber_head", 0, CxCondNumber_head),
        OfNormType<DBL>("Norm_head", 0, Norm_head),
        OfNormType<CDB>("CxNorm_head", 0, CxNorm_head),
        Determinant<DBL>("Determinant_head", 1, Determinant_head),
        Determinant<CDB>("CxDeterminant_head", 1, CxDeterminant_head),
        OfNormType<DBL>("CondNumber_head", 1, CondNumber_head),
        OfNormType<CDB>("CxCondNumber_head", 1, CxCondNumber_head),
        OfNormType<DBL>("Norm_head", 1, Norm_head),
        OfNormType<CDB>("CxNorm_head", 1, CxNorm_head),
        Determinant<DBL>("Determinant_head", 2, Determinant_head),
        Determinant<CDB>("CxDeterminant_head", 2, CxDeterminant_head),
        OfNormType<DBL>("CondNumber_head", 2, CondNumber_head),
        OfNormType<CDB>("CxCondNumber_head", 2, CxCondNumber_head),
        OfNormType<DBL>("Norm_head", 2, Norm_head),
        OfNormType<CDB>("CxNorm_head", 2, CxNorm_head),
        Determinant<DBL>("Determinant_head", 3, Determinant_head),
        Determinant<CDB>("CxDeterminant_head", 3, CxDeterminant_head),
        OfNormType<DBL>("CondNumber_head", 3, CondNumber_head),
        OfNormType<CDB>("CxCondNumber_head", 3, CxCondNumber_head),
        OfNormType<DBL>("Norm_head", 3, Norm_head),
        OfNormType<CDB>("CxNorm_head", 3, CxNorm_head),
        Rank<DBL>("Rank_head", Rank_head),
        Rank<CDB>("CxRank_head", CxRank_head),
        Trace<DBL>("Trace_head", Trace_head),
        Trace<CDB>("CxTrace_head", CxTrace_head),
        DotProduct<DBL>("DotProduct_head", DotProduct_head),
        DotProduct<CDB>("DotprodCx", DotprodCx),
        VectorNorm<DBL>("vectorNormH", 1.0, vectorNormH),
        VectorNorm<CDB>("CxVectorNormH", 1.0, CxVectorNormH),
        VectorNorm<DBL>("vectorNormH", 2.0, vectorNormH),
        VectorNorm<CDB>("CxVectorNormH", 2.0, CxVectorNormH),
        VectorNorm<DBL>("vectorNormH", 2.5, vectorNormH),
        VectorNorm<CDB>("CxVectorNormH", 2.5, CxVectorNormH),
        VectorNorm<DBL>("vectorNormH", HUGE_VAL, vectorNormH),
        VectorNorm<CDB>("CxVectorNormH", HUGE_VAL, CxVectorNormH),
        VectorNorm<DBL>("vectorNormH", -HUGE_VAL, vectorNormH),
        VectorNorm<CDB>("CxVectorNormH", -HUGE_VAL, CxVectorNormH),
        UnitVector<DBL>("unitVector_head", unitVector_head),
        UnitVector<CDB>("CxUnitVector_head", CxUnitVector_head),
        UnitVectorOfP<DBL>("unitVector80_head", unitVector80_head),
        UnitVectorOfP<CDB>("CxUnitVector80_head", CxUnitVector80_head),
        {"CheckSym_head",
         [](Call &c) {
             return CheckSym_head(c.in2D<DBL>(0, c.n, c.n, Definite<DBL>(c.n)), -1.0, 1,
                                  c.integer(0));
         },
         None, sizes},
        {"CxCheckSym_head",
         [](Call &c) {
             return CxCheckSym_head(c.in2D<CDB>(0, c.n, c.n, Definite<CDB>(c.n)), -1.0, 1, 1,
                                    c.integer(0));
         },
         None, sizes},
        IsDefinite<DBL>("CheckPosdef_head", CheckPosdef_head),
        IsDefinite<CDB>("CxCheckPosdef_head", CxCheckPosdef_head),
        IsSemiDefinite<DBL>("CheckPosSemiDef_head", CheckPosSemiDef_head),
        IsSemiDefinite<CDB>("CxCheckPosSemiDef_head", CxCheckPosSemiDef_head),
        Polynomial<DBL>("MatrixCharacteristicPoly_head", MatrixCharacteristicPoly_head),
        Polynomial<CDB>("CxMatrixCharacteristicPoly_head", CxMatrixCharacteristicPoly_head),
    };
    recipes.push_back(Rank2026<DBL>("Rank2026_head", Rank2026_head));
    recipes.push_back(Rank2026<CDB>("CxRank2026_head", CxRank2026_head));
    for (const int32_t type : {0, 1, 2, 3}) {
        recipes.push_back(OfNormType2026<DBL>("CondNumber2026_head", type, CondNumber2026_head));
        recipes.push_back(
            OfNormType2026<CDB>("CxCondNumber2026_head", type, CxCondNumber2026_head));
        recipes.push_back(OfNormType2026<DBL>("Norm2026_head", type, Norm2026_head));
        recipes.push_back(OfNormType2026<CDB>("CxNorm2026_head", type, CxNorm2026_head));
    }
    return recipes;
}

const RecipeFile file(MatrixPropertyRecipes);

} // namespace

} // namespace qx::test
