#include "qx/special_matrices.h"

#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto CDB = ElementType::CDB;

const std::vector<int32_t> sizes = {1, 2, 3, 8, 20};

// One recipe for a real export and for its complex twin.
template <ElementType E, class Export>
Recipe Special(const std::string &name, int32_t kind, Export special) {
    return {name + ": kind " + std::to_string(kind),
            [=](Call &c) {
                if (kind == 0)
                    c.mayBeEmpty(0);
                if (kind != 2)
                    c.mayBeEmpty(1);
                return special(c.byReference(kind), c.byReference(c.n + 1), c.in<E>(0, c.n + 1),
                               c.in<E>(1), c.out2D<E>(0), c.err());
            },
            None, sizes};
}
template <ElementType E, class Export>
Recipe Outer(const std::string &name, Export product) {
    return {
        name,
        [=](Call &c) { return product(c.in<E>(0), c.in<E>(1, c.n + 2), c.out2D<E>(0), c.err()); },
        None, sizes};
}
template <ElementType E, class Export>
Recipe Kronecker(const std::string &name, Export product) {
    return {
        name,
        [=](Call &c) { return product(c.in2D<E>(0, c.n, 2), c.in2D<E>(1, 3, c.n), c.out2D<E>(0)); },
        None, sizes};
}
template <ElementType E, class Packed, class Export>
Recipe Expand(const std::string &name, int32_t triangle, Export expand) {
    return {name + ": triangle " + std::to_string(triangle),
            [=](Call &c) {
                const Packed a = {c.in<E>(0, c.n * (c.n + 1) / 2), triangle};
                return expand(&a, c.out2D<E>(0), c.err());
            },
            None, sizes};
}
template <ElementType E, class Export>
Recipe Pack(const std::string &name, int32_t triangle, Export pack) {
    return {name + ": triangle " + std::to_string(triangle),
            [=](Call &c) {
                return pack(c.in2D<E>(0, c.n, c.n), c.byReference(triangle), c.out<E>(0), c.err());
            },
            None, sizes};
}
template <ElementType E, class Export>
Recipe Zeros(const std::string &name, Export zeros) {
    return {name, [=](Call &c) { return zeros(c.n, c.n + 1, c.out2D<E>(0)); }, None, sizes};
}
template <ElementType E, class Export>
Recipe Correlation(const std::string &name, int32_t normalization, Export correlation) {
    return {name + ": normalization " + std::to_string(normalization),
            [=](Call &c) {
                return correlation(c.in<E>(0), c.in<E>(1), c.n / 2, normalization, c.out2D<E>(0));
            },
            None, sizes};
}

std::vector<Recipe> SpecialMatrixRecipes() {
    return {
        Special<DBL>("SpecialMatrix_head", 0, SpecialMatrix_head),
        Special<CDB>("CxSpecialMatrix_head", 0, CxSpecialMatrix_head),
        Special<DBL>("SpecialMatrix_head", 1, SpecialMatrix_head),
        Special<CDB>("CxSpecialMatrix_head", 1, CxSpecialMatrix_head),
        Special<DBL>("SpecialMatrix_head", 2, SpecialMatrix_head),
        Special<CDB>("CxSpecialMatrix_head", 2, CxSpecialMatrix_head),
        Special<DBL>("SpecialMatrix_head", 3, SpecialMatrix_head),
        Special<CDB>("CxSpecialMatrix_head", 3, CxSpecialMatrix_head),
        Special<DBL>("SpecialMatrix_head", 4, SpecialMatrix_head),
        Special<CDB>("CxSpecialMatrix_head", 4, CxSpecialMatrix_head),
        Outer<DBL>("OuterProd_head", OuterProd_head),
        Outer<CDB>("OuterProdCx_head", OuterProdCx_head),
        Kronecker<DBL>("KroneckerProd_H", KroneckerProd_H),
        Kronecker<CDB>("CxKroneckerProd_H", CxKroneckerProd_H),
        Expand<DBL, PackedTriangle>("Compact_to_Matrix_head", 0, Compact_to_Matrix_head),
        Expand<CDB, CxPackedTriangle>("CxCompact_to_Matrix_head", 0, CxCompact_to_Matrix_head),
        Pack<DBL>("Matrix_to_Compact_head", 0, Matrix_to_Compact_head),
        Pack<CDB>("CxMatrix_to_Compact_head", 0, CxMatrix_to_Compact_head),
        Correlation<DBL>("AutoCorrMtrxH", 0, AutoCorrMtrxH),
        Correlation<CDB>("CxAutoCorrMtrxH", 0, CxAutoCorrMtrxH),
        Expand<DBL, PackedTriangle>("Compact_to_Matrix_head", 1, Compact_to_Matrix_head),
        Expand<CDB, CxPackedTriangle>("CxCompact_to_Matrix_head", 1, CxCompact_to_Matrix_head),
        Pack<DBL>("Matrix_to_Compact_head", 1, Matrix_to_Compact_head),
        Pack<CDB>("CxMatrix_to_Compact_head", 1, CxMatrix_to_Compact_head),
        Correlation<DBL>("AutoCorrMtrxH", 1, AutoCorrMtrxH),
        Correlation<CDB>("CxAutoCorrMtrxH", 1, CxAutoCorrMtrxH),
        Expand<DBL, PackedTriangle>("Compact_to_Matrix_head", 2, Compact_to_Matrix_head),
        Expand<CDB, CxPackedTriangle>("CxCompact_to_Matrix_head", 2, CxCompact_to_Matrix_head),
        Pack<DBL>("Matrix_to_Compact_head", 2, Matrix_to_Compact_head),
        Pack<CDB>("CxMatrix_to_Compact_head", 2, CxMatrix_to_Compact_head),
        Correlation<DBL>("AutoCorrMtrxH", 2, AutoCorrMtrxH),
        Correlation<CDB>("CxAutoCorrMtrxH", 2, CxAutoCorrMtrxH),
        {"CompactToMatrix_H",
         [](Call &c) {
             return CompactToMatrix_H(c.in<DBL>(0, c.n * (c.n + 1) / 2), c.out2D<DBL>(0));
         },
         None, sizes},
        {"MatrixToCompact_H",
         [](Call &c) { return MatrixToCompact_H(c.in2D<DBL>(0, c.n, c.n), c.out<DBL>(0)); }, None,
         sizes},
        {"Transpose_head",
         [](Call &c) { return Transpose_head(c.in2D<DBL>(0, c.n, c.n + 1), c.out2D<DBL>(0)); },
         None, sizes},
        {"CxTranspose_head",
         [](Call &c) {
             return CxTranspose_head(c.in2D<CDB>(0, c.n, c.n + 1), c.out2D<CDB>(0), c.err());
         },
         None, sizes},
        {"CreateMatrixFromEVs_head",
         [](Call &c) { return CreateMatrixFromEVs_head(c.in<DBL>(0), c.out2D<DBL>(0), c.err()); },
         None, sizes},
        Zeros<DBL>("InitialMatrixH", InitialMatrixH),
        Zeros<CDB>("CxInitialMatrixH", CxInitialMatrixH),
    };
}

const RecipeFile file(SpecialMatrixRecipes);

} // namespace

} // namespace qx::test
