#include "qx/matrix_factorisations.h"
#include "linalg/recipes/contents.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto CDB = ElementType::CDB;
constexpr auto I32 = ElementType::I32;

const std::vector<int32_t> sizes = {1, 2, 3, 7, 20};

// One recipe for a real export and for its complex twin.
template <ElementType Code, class Export>
Recipe LU(const char *name, Export lu) {
    return {name,
            [lu](Call &c) {
                return lu(c.inOut2D<Code>(0, c.n, c.n + 1), c.out<I32>(0), c.integer(0), c.err());
            },
            None, sizes};
}
template <ElementType Code, class Export>
Recipe OnPacked(const char *name, Export inPlace) {
    return {name,
            [inPlace](Call &c) {
                return inPlace(c.inOut<Code>(0, c.n * (c.n + 1) / 2, PositivePacked{c.n}), c.err());
            },
            None, sizes};
}
template <ElementType Code, class Export>
Recipe OnPositiveDefinite(const char *name, Export inPlace) {
    return {name,
            [inPlace](Call &c) {
                return inPlace(c.inOut2D<Code>(0, c.n, c.n, PositiveDefinite{c.n}), c.err());
            },
            None, sizes};
}
template <ElementType Code, class Record, class Export>
Recipe OnPackedTriangle(const char *name, Export inPlace) {
    return {name,
            [inPlace](Call &c) {
                Record a = {c.inOut<Code>(0, c.n * (c.n + 1) / 2, PositivePacked{c.n}), 0};
                return inPlace(&a, c.err());
            },
            None, sizes};
}
template <ElementType Code, class Export>
Recipe OnTriangle(std::string name, int32_t triangle, Export inPlace) {
    return {name + ": triangle " + std::to_string(triangle),
            [inPlace, triangle](Call &c) {
                return inPlace(c.inOut2D<Code>(0, c.n, c.n, PositiveDefinite{c.n}),
                               c.byReference(triangle), c.err());
            },
            None, sizes};
}
template <ElementType Code, class Export>
Recipe QRBy(std::string name, int32_t algorithm, Export qr) {
    return {name + ": algorithm " + std::to_string(algorithm),
            [qr, algorithm](Call &c) {
                return qr(c.in2D<Code>(0, c.n + 2, c.n), c.byReference(algorithm), c.out2D<Code>(0),
                          c.out2D<Code>(1), c.err());
            },
            None, sizes};
}
template <ElementType Code, class Export>
Recipe QR(std::string name, int32_t pivoting, int32_t economy, Export qr) {
    return {name + ": pivoting " + std::to_string(pivoting) + ", economy " +
                std::to_string(economy),
            [=](Call &c) {
                return qr(c.in2D<Code>(0, c.n + 2, c.n), pivoting, economy, c.out2D<I32>(0),
                          c.out2D<Code>(1), c.out2D<Code>(2));
            },
            None, sizes};
}
template <ElementType Code, class Export>
Recipe SVD(const char *name, Export svd) {
    return {name,
            [svd](Call &c) {
                return svd(c.inOut2D<Code>(0, c.n, c.n + 2), c.out<DBL>(0), c.out2D<Code>(1),
                           c.err());
            },
            None, sizes};
}
template <ElementType Code, class Export>
Recipe SVDEx(std::string name, int32_t full, Export svd) {
    return {name + ": fullSize " + std::to_string(full),
            [svd, full](Call &c) {
                return svd(c.in2D<Code>(0, c.n + 2, c.n), full, c.out2D<Code>(0), c.out<DBL>(1),
                           c.out2D<Code>(2));
            },
            None, sizes};
}
template <ElementType Code, class Export>
Recipe SVDS(const char *name, Export svd) {
    return {name,
            [svd](Call &c) { return svd(c.in2D<Code>(0, c.n + 2, c.n), c.out<DBL>(0), c.err()); },
            None, sizes};
}
template <ElementType Code, class Export>
Recipe SVDS2026(const char *name, Export svd) {
    return {name, [svd](Call &c) { return svd(c.in2D<Code>(0, c.n + 2, c.n), c.out<DBL>(0)); },
            None, sizes};
}
template <ElementType Code, class Export>
Recipe Hessenberg(const char *name, Export reduce) {
    return {name,
            [reduce](Call &c) {
                return reduce(c.inOut2D<Code>(0, c.n, c.n), 1, c.n, c.out2D<Code>(0));
            },
            None, sizes};
}
template <ElementType Code, class Export>
Recipe Balance(std::string name, int32_t job, Export balance) {
    return {name + ": job " + std::to_string(job),
            [balance, job](Call &c) {
                return balance(c.inOut2D<Code>(0, c.n, c.n, Graded{}), job, c.integer(0),
                               c.integer(1), c.out<DBL>(0));
            },
            None, sizes};
}
template <ElementType Code, class Export>
Recipe VectorsBack(std::string name, int32_t side, Export back) {
    return {name + ": side " + std::to_string(side),
            [back, side](Call &c) {
                const auto scale = [n = c.n](int32_t i) { return i == n - 1 ? 1.0 : 0.5; };
                return back(3, side, 1, c.n > 1 ? c.n - 1 : 1, c.in<DBL>(0, c.n, scale),
                            c.inOut2D<Code>(1, c.n, c.n + 1));
            },
            None, sizes};
}

std::vector<Recipe> FactorisationRecipes() {
    std::vector<Recipe> recipes = {
        LU<DBL>("LU_head", LU_head),
        LU<CDB>("CxLU_head", CxLU_head),
        OnPacked<DBL>("Cholesky_head", Cholesky_head),
        OnPacked<CDB>("CxCholesky_head", CxCholesky_head),
        OnPacked<DBL>("Cholesky_InvMatrix_head", Cholesky_InvMatrix_head),
        OnPacked<CDB>("CxCholesky_InvMatrix_head", CxCholesky_InvMatrix_head),
        OnPositiveDefinite<DBL>("FullCholesky_head", FullCholesky_head),
        OnPositiveDefinite<CDB>("CxFullCholesky_head", CxFullCholesky_head),
        OnPositiveDefinite<DBL>("InvMatrixChoDri_head", InvMatrixChoDri_head),
        OnPositiveDefinite<CDB>("CxInvMatrixChoDri_head", CxInvMatrixChoDri_head),
        {"PreallocInvMatrixChoDri_H",
         [](Call &c) {
             return PreallocInvMatrixChoDri_H(c.inOut2D<DBL>(0, c.n, c.n, PositiveDefinite{c.n}),
                                              c.spoiled<DBL>(1, c.n * (c.n + 1) / 2), c.err());
         },
         None, sizes},
        OnPackedTriangle<DBL, PackedTriangle>("Tri_InvMatrix_head", Tri_InvMatrix_head),
        OnPackedTriangle<CDB, CxPackedTriangle>("CxTri_InvMatrix_head", CxTri_InvMatrix_head),
        SVD<DBL>("SVD_head", SVD_head),
        SVD<CDB>("CxSVD_head", CxSVD_head),
        SVDS<DBL>("SVDS_head", SVDS_head),
        SVDS<CDB>("CxSVDS_head", CxSVDS_head),
        SVDS2026<DBL>("SVDS2026_head", SVDS2026_head),
        SVDS2026<CDB>("CxSVDS2026_head", CxSVDS2026_head),
        Hessenberg<DBL>("Hessenberg_head", Hessenberg_head),
        Hessenberg<CDB>("CxHessenberg_head", CxHessenberg_head),
    };
    for (const int32_t selector : {0, 1}) {
        recipes.push_back(OnTriangle<DBL>("InvMatrixTriDri_head", selector, InvMatrixTriDri_head));
        recipes.push_back(
            OnTriangle<CDB>("CxInvMatrixTriDri_head", selector, CxInvMatrixTriDri_head));
        recipes.push_back(SVDEx<DBL>("SVDEx_head", selector, SVDEx_head));
        recipes.push_back(SVDEx<CDB>("CxSVDEx_head", selector, CxSVDEx_head));
        recipes.push_back(SVDEx<DBL>("SVD2026_head", selector, SVD2026_head));
        recipes.push_back(SVDEx<CDB>("CxSVD2026_head", selector, CxSVD2026_head));
        recipes.push_back(VectorsBack<DBL>("EigenVBack_head", selector, EigenVBack_head));
        recipes.push_back(VectorsBack<CDB>("CxEigenVBack_head", selector, CxEigenVBack_head));
    }
    for (const int32_t selector : {0, 1, 2}) {
        recipes.push_back(QRBy<DBL>("qrd_head", selector, qrd_head));
        recipes.push_back(QRBy<CDB>("Cxqrd_head", selector, Cxqrd_head));
        for (const int32_t pivoting : {0, 1}) {
            recipes.push_back(QR<DBL>("QRDecH", pivoting, selector, QRDecH));
            recipes.push_back(QR<CDB>("CxQRDecH", pivoting, selector, CxQRDecH));
            for (Recipe blocked : {QR<DBL>("QRDec2026H", pivoting, selector, QRDec2026H),
                                   QR<CDB>("CxQRDec2026H", pivoting, selector, CxQRDec2026H)}) {
                blocked.sizes = {1, 3, 161}; // the last order is factored by blocks
                recipes.push_back(blocked);
            }
        }
    }
    for (const int32_t job : {0, 1, 2, 3}) {
        recipes.push_back(Balance<DBL>("MatrixBalance_head", job, MatrixBalance_head));
        recipes.push_back(Balance<CDB>("CxMatrixBalance_head", job, CxMatrixBalance_head));
    }
    return recipes;
}

const RecipeFile file(FactorisationRecipes);

} // namespace

} // namespace qx::test
