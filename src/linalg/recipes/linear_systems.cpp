#include "qx/linear_systems.h"

#include "linalg/recipes/contents.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto CDB = ElementType::CDB;
constexpr auto I32 = ElementType::I32;

const std::vector<int32_t> sizes = {1, 2, 3, 8, 17, 40};

double Zero(int32_t) { return 0.0; }

// One recipe for a real export and for its complex twin.
template <ElementType E, class Export>
Recipe Solve(const std::string &name, Export solve, unsigned quirks = None) {
    return {name,
            [=](Call &c) {
                return solve(c.in2D<E>(0, c.n, c.n, PositiveDefinite{c.n}), c.in<E>(1), c.out<E>(0),
                             c.err());
            },
            quirks, sizes};
}
template <ElementType E, class Export>
Recipe SolveSet(const std::string &name, Export solve) {
    return {name,
            [=](Call &c) {
                return solve(c.in2D<E>(0, c.n, c.n, PositiveDefinite{c.n}),
                             c.in2D<E>(1, c.n, c.n + 2), c.out2D<E>(0));
            },
            None, sizes};
}
// Solves with given factors; in each step the pivot row is row 0.
template <ElementType E, class Export>
Recipe SolveWithFactors(const std::string &name, Export solve) {
    return {name,
            [=](Call &c) {
                return solve(c.in2D<E>(0, c.n, c.n, PositiveDefinite{c.n}), c.in<I32>(1, c.n, Zero),
                             c.inOut<E>(2), c.err());
            },
            None, sizes};
}
template <ElementType E, class Export>
Recipe Invert(const std::string &name, Export invert) {
    return {
        name,
        [=](Call &c) { return invert(c.inOut2D<E>(0, c.n, c.n, PositiveDefinite{c.n}), c.err()); },
        None, sizes};
}
template <ElementType E, class Export>
Recipe InvertFactors(const std::string &name, Export invert) {
    return {name,
            [=](Call &c) {
                return invert(c.inOut2D<E>(0, c.n, c.n, PositiveDefinite{c.n}),
                              c.in<I32>(1, c.n, Zero), c.err());
            },
            None, sizes};
}
template <ElementType E, class Export>
Recipe LeastSquares(const std::string &name, Export solve, unsigned quirks = None) {
    return {name,
            [=](Call &c) {
                return solve(c.in2D<E>(0, c.n + 3, c.n), c.in<E>(1, c.n + 3), c.out<E>(0), c.err());
            },
            quirks, sizes};
}
template <ElementType E, class Export>
Recipe LeastSquaresSet(const std::string &name, Export solve) {
    return {name,
            [=](Call &c) {
                return solve(c.in2D<E>(0, c.n, c.n + 3), c.in2D<E>(1, c.n, 2), c.out2D<E>(0));
            },
            None, sizes};
}
template <ElementType E, class Export>
Recipe LeastSquares2026(const std::string &name, Export solve) {
    return {name,
            [=](Call &c) {
                return solve(c.in2D<E>(0, c.n + 3, c.n), c.in<E>(1, c.n + 3), c.out<E>(0), 0.0);
            },
            None, sizes};
}
template <ElementType E, class Export>
Recipe SolveSet2026(const std::string &name, Export solve) {
    return {name,
            [=](Call &c) {
                return solve(c.in2D<E>(0, c.n, c.n), c.in2D<E>(1, c.n, c.n + 2), c.out2D<E>(0),
                             c.scalar(0));
            },
            None, sizes};
}
Recipe ShowingWork(const std::string &name, int32_t rows, int32_t refinements) {
    return {name,
            [=](Call &c) {
                return GenLinEqsbySVD2011_head(c.in2D<DBL>(0, c.n + rows, c.n + 2),
                                               c.in<DBL>(1, c.n + rows), c.out<DBL>(0), -1.0,
                                               refinements, c.out<DBL>(1));
            },
            None, sizes};
}
template <ElementType E, class Export>
Recipe CholeskyWithFactor(const std::string &name, Export solve) {
    return {name,
            [=](Call &c) {
                return solve(c.in<E>(0, c.n * (c.n + 1) / 2, PositivePacked{c.n}), c.inOut<E>(1),
                             c.err());
            },
            None, sizes};
}
template <ElementType E, class Packed, class Export>
Recipe SolveTriangle(const std::string &name, int32_t triangle, Export solve) {
    return {name + ": triangle " + std::to_string(triangle),
            [=](Call &c) {
                const auto ones = [](int32_t) { return 1.0; };
                const Packed a = {c.in<E>(0, c.n * (c.n + 1) / 2, ones), triangle};
                return solve(&a, c.inOut<E>(1), c.err());
            },
            None,
            {1, 2, 3, 8, 17}};
}
// Two diagonals above the main one, which is in row 2, and one below it.
double Banded(int32_t i, int32_t j) { return i == 2 ? 9.0 + j : 1.0 / (2 + i + j); }
template <ElementType E, class Export>
Recipe Band(const std::string &name, Export solve) {
    return {name,
            [=](Call &c) { return solve(c.in2D<E>(0, 4, c.n, Banded), c.inOut<E>(1), 1, 2); },
            None,
            {4, 8, 17, 40}};
}
template <ElementType E, class Export>
Recipe BandSet(const std::string &name, Export solve) {
    return {
        name,
        [=](Call &c) { return solve(c.in2D<E>(0, 4, c.n, Banded), c.inOut2D<E>(1, c.n, 3), 1, 2); },
        None,
        {4, 8, 17, 40}};
}
// The factors of (1, 4, 1): no exchange, a pivot of row i at step i, counted from 1.
template <class Export, class RightSide>
Recipe Tridiagonal(const std::string &name, int32_t transposed, Export solve, RightSide b) {
    return {name + ": transposed " + std::to_string(transposed),
            [=](Call &c) {
                const auto four = [](int32_t) { return 4.0; };
                const auto inOrder = [](int32_t i) { return i + 1.0; };
                return solve(transposed, c.in<DBL>(0, c.n - 1), c.in<DBL>(1, c.n, four),
                             c.in<DBL>(2, c.n - 1), c.in<DBL>(3, c.n - 2),
                             c.in<I32>(4, c.n, inOrder), b(c));
            },
            None,
            {3, 4, 17, 40}};
}

// An export with its last argument, a number, fixed.
template <class Export, class Number>
auto WithLast(Export solve, Number number) {
    return [=](auto a, auto b, auto x) { return solve(a, b, x, number); };
}
template <class Export>
auto WithTolerance(Export solve, double tolerance) {
    return [=](auto a, auto b, auto x, ErrorCode *err) { return solve(a, b, x, tolerance, err); };
}
template <class Export>
auto WithSecond(Export solve, int32_t selector) {
    return [=](auto a, auto b, auto x) { return solve(a, selector, b, x); };
}

std::vector<Recipe> LinearSystemRecipes() {
    return {
        Solve<DBL>("EqsByLUDri_head", ::EqsByLUDri_head, HostStatusInResult),
        Solve<CDB>("CxEqsByLUDri_head", ::CxEqsByLUDri_head, HostStatusInResult),
        SolveWithFactors<DBL>("LULinEqs_head", ::LULinEqs_head),
        SolveWithFactors<CDB>("CxLULinEqs_head", ::CxLULinEqs_head),
        Invert<DBL>("InvMatrixLUDri_head", ::InvMatrixLUDri_head),
        Invert<CDB>("CxInvMatrixLUDri_head", ::CxInvMatrixLUDri_head),
        InvertFactors<DBL>("LUInvMatrix_head", ::LUInvMatrix_head),
        InvertFactors<CDB>("CxLUInvMatrix_head", ::CxLUInvMatrix_head),
        LeastSquares<DBL>("GenLinEqs_head", ::GenLinEqs_head, HostStatusInResult),
        LeastSquares<CDB>("CxGenLinEqs_head", ::CxGenLinEqs_head, HostStatusInResult),
        LeastSquares<DBL>("GenLinEqs82_head", WithTolerance(::GenLinEqs82_head, 0.1)),
        LeastSquares<CDB>("CxGenLinEqs82_head", WithTolerance(::CxGenLinEqs82_head, 0.1)),
        {"GenLinEqs2010_head",
         [](Call &c) {
             return GenLinEqs2010_head(c.in2D<DBL>(0, c.n + 3, c.n), c.in<DBL>(1, c.n + 3),
                                       c.out<DBL>(0), 0.0, c.out<DBL>(1));
         },
         None, sizes},
        ShowingWork("GenLinEqsbySVD2011_head: tall, plain", 5, 0),
        ShowingWork("GenLinEqsbySVD2011_head: tall, refined", 5, 2),
        ShowingWork("GenLinEqsbySVD2011_head: wide, refined", 0, 2),
        LeastSquares2026<DBL>("GenLinEqs2026_head", ::GenLinEqs2026_head),
        LeastSquares2026<CDB>("CxGenLinEqs2026_head", ::CxGenLinEqs2026_head),
        SolveSet2026<DBL>("EqsSetByLU2026_head", ::EqsSetByLU2026_head),
        SolveSet2026<CDB>("CxEqsSetByLU2026_head", ::CxEqsSetByLU2026_head),
        LeastSquaresSet<DBL>("EqsSetBySVD2026_head", WithLast(::EqsSetBySVD2026_head, 0.0)),
        LeastSquaresSet<CDB>("CxEqsSetBySVD2026_head", WithLast(::CxEqsSetBySVD2026_head, 0.0)),
        LeastSquaresSet<DBL>("EqsSetBySVDDri_head", ::EqsSetBySVDDri_head),
        LeastSquaresSet<CDB>("CxEqsSetBySVDDri_head", ::CxEqsSetBySVDDri_head),
        LeastSquaresSet<DBL>("EqsSetBySVDDri82_head", WithLast(::EqsSetBySVDDri82_head, 0.1)),
        LeastSquaresSet<CDB>("CxEqsSetBySVDDri82_head", WithLast(::CxEqsSetBySVDDri82_head, 0.1)),
        Solve<DBL>("EqsByCholeskyDri_head", ::EqsByCholeskyDri_head),
        Solve<CDB>("CxEqsByCholeskyDri_head", ::CxEqsByCholeskyDri_head),
        SolveSet<DBL>("EqsSetByCholeskyDri_head: useUpper 0",
                      WithSecond(::EqsSetByCholeskyDri_head, 0)),
        SolveSet<CDB>("CxEqsSetByCholeskyDri_head: useUpper 0",
                      WithSecond(::CxEqsSetByCholeskyDri_head, 0)),
        SolveSet<DBL>("EqsSetByCholeskyDri_head: useUpper 1",
                      WithSecond(::EqsSetByCholeskyDri_head, 1)),
        SolveSet<CDB>("CxEqsSetByCholeskyDri_head: useUpper 1",
                      WithSecond(::CxEqsSetByCholeskyDri_head, 1)),
        CholeskyWithFactor<DBL>("CholeskyLinEqs_head", ::CholeskyLinEqs_head),
        CholeskyWithFactor<CDB>("CxCholeskyLinEqs_head", ::CxCholeskyLinEqs_head),
        SolveSet<DBL>("TriEqsSetDri_head: triangle 0", WithSecond(::TriEqsSetDri_head, 0)),
        SolveSet<CDB>("CxTriEqsSetDri_head: triangle 0", WithSecond(::CxTriEqsSetDri_head, 0)),
        SolveTriangle<DBL, PackedTriangle>("TriLinEqs_head", 0, ::TriLinEqs_head),
        SolveTriangle<CDB, CxPackedTriangle>("CxTriLinEqs_head", 0, ::CxTriLinEqs_head),
        SolveSet<DBL>("TriEqsSetDri_head: triangle 1", WithSecond(::TriEqsSetDri_head, 1)),
        SolveSet<CDB>("CxTriEqsSetDri_head: triangle 1", WithSecond(::CxTriEqsSetDri_head, 1)),
        SolveTriangle<DBL, PackedTriangle>("TriLinEqs_head", 1, ::TriLinEqs_head),
        SolveTriangle<CDB, CxPackedTriangle>("CxTriLinEqs_head", 1, ::CxTriLinEqs_head),
        Band<DBL>("BandEqsDriH", ::BandEqsDriH),
        Band<CDB>("CxBandEqsDriH", ::CxBandEqsDriH),
        BandSet<DBL>("BandEqsSetDriH", ::BandEqsSetDriH),
        BandSet<CDB>("CxBandEqsSetDriH", ::CxBandEqsSetDriH),
        {"TriDiagLU_head",
         [](Call &c) {
             return TriDiagLU_head(c.inOut<DBL>(0, c.n - 1), c.inOut<DBL>(1, c.n),
                                   c.inOut<DBL>(2, c.n - 1), c.out<DBL>(0), c.out<I32>(1));
         },
         None,
         {3, 4, 17, 40}},
        Tridiagonal("TriDiagEqsByLU_head", 0, TriDiagEqsByLU_head,
                    [](Call &c) { return c.inOut<DBL>(5, c.n); }),
        Tridiagonal("TriDiagEqsSetByLU_head", 0, TriDiagEqsSetByLU_head,
                    [](Call &c) { return c.inOut2D<DBL>(5, c.n, 3); }),
        Tridiagonal("TriDiagEqsByLU_head", 1, TriDiagEqsByLU_head,
                    [](Call &c) { return c.inOut<DBL>(5, c.n); }),
        Tridiagonal("TriDiagEqsSetByLU_head", 1, TriDiagEqsSetByLU_head,
                    [](Call &c) { return c.inOut2D<DBL>(5, c.n, 3); }),
    };
}

const RecipeFile file(LinearSystemRecipes);
const RecipeFile exempt({
    {"EqsSetByLUDri_head", "fails whatever it is given"},
    {"CxEqsSetByLUDri_head", "fails whatever it is given"},
});

} // namespace

} // namespace qx::test
