#include "qx/special_complex.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

typedef ErrorCode (*Bessel)(double, const ::CDB *, int32_t, ::CDB *);
typedef ErrorCode (*Airy)(const ::CDB *, int32_t, ::CDB *);

// Orders and arguments that cover each method and each quadrant as the size grows.
Recipe OfOrder(const char *name, Bessel function) {
    return {name, [function](Call &c) {
                const double x = 1 + c.n % 23;
                const struct {
                    double order;
                    ::CDB z;
                } points[] = {{0.0, {0.02 * x, 0.01}},       {1.3, {-0.1 * x, 0.4}},
                              {-2.5, {0.3 * x, -0.2 * x}},   {3.0, {4.0, 0.6 * x}},
                              {-0.25, {-1.1 * x, -0.0}},     {0.5 * x, {0.1 * x, 0.2 * x}},
                              {7.0 * x, {7.2 * x, 0.7}},     {-9.1 * x, {9.0 * x, -2.0}},
                              {2.5, {30.0 + x, 20.0}},       {40.0 + x, {0.3, -55.0}},
                              {11.0, {0.4, 12.0 + 0.1 * x}}, {0.4, {0.0, 6.0 + x}},
                              {60.5, {61.0 + 0.2 * x, 0.0}}, {-4.0, {12.5, 3.0}}};
                int output = 0;
                for (const int32_t scaled : {0, 1})
                    for (const auto &p : points)
                        if (const ErrorCode code =
                                function(p.order, &p.z, scaled, c.complexScalar(output++)))
                            return code;
                return ErrorCode(0);
            }};
}

Recipe OfArgument(const char *name, Airy function) {
    return {name, [function](Call &c) {
                const double x = 1 + c.n % 23;
                const ::CDB points[] = {{0.03 * x, 0.2},     {-0.2 * x, 0.1},  {0.4 * x, -0.3 * x},
                                        {0.0, 0.7 * x},      {-0.9 * x, 0.0},  {-0.9 * x, -0.0},
                                        {2.5 + 0.01 * x, 0}, {-12.0, 6.0 + x}, {14.0, -x}};
                int output = 0;
                for (const int32_t scaled : {0, 1})
                    for (const auto &z : points)
                        if (const ErrorCode code = function(&z, scaled, c.complexScalar(output++)))
                            return code;
                return ErrorCode(0);
            }};
}

std::vector<Recipe> SpecialComplexRecipes() {
    return {
        OfOrder("QX_CxBesselJr", QX_CxBesselJr),   OfOrder("QX_CxBesselYr", QX_CxBesselYr),
        OfOrder("QX_CxBesselIr", QX_CxBesselIr),   OfOrder("QX_CxBesselKr", QX_CxBesselKr),
        OfOrder("QX_CxBesselH1r", QX_CxBesselH1r), OfOrder("QX_CxBesselH2r", QX_CxBesselH2r),
        OfArgument("QX_CxAiryAi", QX_CxAiryAi),    OfArgument("QX_CxAiryAiP", QX_CxAiryAiP),
        OfArgument("QX_CxAiryBi", QX_CxAiryBi),    OfArgument("QX_CxAiryBiP", QX_CxAiryBiP),
    };
}

const RecipeFile file(SpecialComplexRecipes);

} // namespace

} // namespace qx::test
