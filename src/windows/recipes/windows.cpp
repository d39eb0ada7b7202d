#include "qx/windows.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto CDB = ElementType::CDB;

const std::vector<int32_t> fromTwo = {2, 3, 8, 50, 1000};

std::vector<Recipe> WindowRecipes() {
    return {
        {"KaiserH", [](Call &c) { return KaiserH(c.inOut<DBL>(0), 3.5); }},
        {"CxKaiserH", [](Call &c) { return CxKaiserH(c.inOut<CDB>(0), 3.5); }},
        {"DolChebyWinH", [](Call &c) { return DolChebyWinH(c.inOut<DBL>(0), 300.0, c.n % 2); },
         UsesHeap},
        {"CxDolChebyWinH", [](Call &c) { return CxDolChebyWinH(c.inOut<CDB>(0), 300.0, c.n % 2); },
         UsesHeap},
        {"GaussWinH", [](Call &c) { return GaussWinH(c.inOut<DBL>(0), 0.3, c.n % 2); }},
        {"CxGaussWinH", [](Call &c) { return CxGaussWinH(c.inOut<CDB>(0), 0.3, c.n % 2); }},
        {"ForceWinH", [](Call &c) { return ForceWinH(c.inOut<DBL>(0), 40.0); }, None, fromTwo},
        {"CxForceWinH", [](Call &c) { return CxForceWinH(c.inOut<CDB>(0), 40.0); }, None, fromTwo},
        {"ExpWinH", [](Call &c) { return ExpWinH(c.inOut<DBL>(0), 0.05); }, None, fromTwo},
        {"CxExpWinH", [](Call &c) { return CxExpWinH(c.inOut<CDB>(0), 0.05); }, None, fromTwo},
        {"CosTaperedH", [](Call &c) { return CosTaperedH(c.inOut<DBL>(0), 0.3); }},
        {"CxCosTaperedH", [](Call &c) { return CxCosTaperedH(c.inOut<CDB>(0), 0.3); }},
        {"TriangleWinH", [](Call &c) { return TriangleWinH(c.inOut<DBL>(0)); }},
        {"CxTriangleWinH", [](Call &c) { return CxTriangleWinH(c.inOut<CDB>(0)); }},
        {"WelchWinH", [](Call &c) { return WelchWinH(c.inOut<DBL>(0)); }},
        {"CxWelchWinH", [](Call &c) { return CxWelchWinH(c.inOut<CDB>(0)); }},
        {"BartHannWinH", [](Call &c) { return BartHannWinH(c.inOut<DBL>(0)); }},
        {"CxBartHannWinH", [](Call &c) { return CxBartHannWinH(c.inOut<CDB>(0)); }},
        {"BohmanWinH", [](Call &c) { return BohmanWinH(c.inOut<DBL>(0)); }},
        {"CxBohmanWinH", [](Call &c) { return CxBohmanWinH(c.inOut<CDB>(0)); }},
        {"ParzenWinH", [](Call &c) { return ParzenWinH(c.inOut<DBL>(0)); }},
        {"CxParzenWinH", [](Call &c) { return CxParzenWinH(c.inOut<CDB>(0)); }},
        {"GenCosWinH", [](Call &c) { return GenCosWinH(c.inOut<DBL>(0), c.in<DBL>(1, 4)); }},
        {"CxGenCosWinH", [](Call &c) { return CxGenCosWinH(c.inOut<CDB>(0), c.in<DBL>(1, 4)); }},
        {"ScaledGenCosWinH",
         [](Call &c) { return ScaledGenCosWinH(c.inOut<DBL>(0), c.in<DBL>(1, 6)); }},
        {"ScaledCxGenCosWinH",
         [](Call &c) { return ScaledCxGenCosWinH(c.inOut<CDB>(0), c.in<DBL>(1, 6)); }},
        {"AllCosWinH", [](Call &c) { return AllCosWinH(c.inOut<DBL>(0), 1 + c.n % 9, c.n % 2); }},
        {"CxAllCosWinH",
         [](Call &c) { return CxAllCosWinH(c.inOut<CDB>(0), 1 + c.n % 9, c.n % 2); }},
        {"SymmWinH", [](Call &c) { return SymmWinH(c.inOut<DBL>(0), 30 + c.n % 5, 0.0); }},
        {"SymmWinH: with a parameter", [](Call &c) { return SymmWinH(c.inOut<DBL>(0), 62, 0.2); }},
        {"CxSymmWinH", [](Call &c) { return CxSymmWinH(c.inOut<CDB>(0), 30 + c.n % 5, 0.0); }},
        {"CxSymmWinH: with a parameter",
         [](Call &c) { return CxSymmWinH(c.inOut<CDB>(0), 62, 0.2); }},
        {"ScaledWinH",
         [](Call &c) { return ScaledWinH(c.inOut<DBL>(0), 6, 0.0, c.record<WindowConstants>(0)); },
         TakesEmptyInput},
        {"ScaledWinH: with a parameter",
         [](Call &c) {
             return ScaledWinH(c.inOut<DBL>(0), 62, 0.2, c.record<WindowConstants>(0));
         }},
        {"CxScaledWinH",
         [](Call &c) {
             return CxScaledWinH(c.inOut<CDB>(0), 6, 0.0, c.record<WindowConstants>(0));
         },
         TakesEmptyInput},
        {"CxScaledWinH: with a parameter",
         [](Call &c) {
             return CxScaledWinH(c.inOut<CDB>(0), 62, 0.2, c.record<WindowConstants>(0));
         }},
        {"AllWinH", [](Call &c) { return AllWinH(c.inOut<DBL>(0), 61, 50.0, 1, 0); }, UsesHeap},
        {"CxAllWinH", [](Call &c) { return CxAllWinH(c.inOut<CDB>(0), 61, 50.0, 1, 0); }, UsesHeap},
        {"Kaiser_Bessel",
         [](Call &c) { return Kaiser_Bessel(c.inOut<DBL>(0), c.byReference(2.5), c.err()); }},
        {"ForceWindCIN",
         [](Call &c) { return ForceWindCIN(c.inOut<DBL>(0), c.byReference(30.0), c.err()); }, None,
         fromTwo},
        {"ExpWindCIN",
         [](Call &c) { return ExpWindCIN(c.inOut<DBL>(0), c.byReference(0.2), c.err()); }, None,
         fromTwo},
        {"TriangleWin", [](Call &c) { return TriangleWin(c.inOut<DBL>(0), c.err()); }},
        {"CosTapered", [](Call &c) { return CosTapered(c.inOut<DBL>(0), c.err()); }},
    };
}

const RecipeFile file(WindowRecipes);

} // namespace

} // namespace qx::test
