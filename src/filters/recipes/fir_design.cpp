#include "qx/fir_design.h"

#include "tests/support/recipe.h"

#include <string>

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto CDB = ElementType::CDB;

// The function result of Parks for ErrOutOfMemory if the host has refused nothing.
constexpr int32_t designHasNoMemory = 2;

struct NarrowNumbers {
    int32_t kind, M;
};

std::vector<Recipe> FIRDesignRecipes() {
    std::vector<Recipe> recipes;
    for (int32_t type = 0; type < 4; ++type)
        recipes.push_back({"FIRCoefs: type " + std::to_string(type),
                           [type](Call &c) {
                               auto *clamped = c.record<int32_t>(0);
                               *clamped = type;
                               return FIRCoefs(c.byReference(1000.0), c.byReference(90.0),
                                               c.byReference(210.0), c.byReference(c.n | 1),
                                               c.out<DBL>(0), clamped, c.err());
                           },
                           HostStatusInResult});

    const auto equiripple = [&](const char *name, int32_t kind, int32_t n,
                                std::initializer_list<RemezBand> some) {
        recipes.push_back({name,
                           [=, bands = std::vector<RemezBand>(some)](Call &c) {
                               const auto count = static_cast<int32_t>(bands.size());
                               const int32_t result =
                                   Parks(c.byReference(n), c.byReference(2.0),
                                         c.inRecords<RemezBand1D>(0, count, bands.data(),
                                                                  sizeof(RemezBand) * bands.size()),
                                         c.byReference(kind), c.out<DBL>(0), c.scalar(0),
                                         c.byReference(0), c.err());
                               return result == designHasNoMemory ? 0 : result;
                           },
                           HostStatusInResult,
                           {1}});
    };
    equiripple("Parks: multiband, odd", 0, 61,
               {{1, 0, 0.4, 1}, {0, 0.5, 0.7, 3}, {0.5, 0.8, 1, 1}});
    equiripple("Parks: multiband, even", 0, 60, {{1, 0, 0.4, 1}, {0, 0.5, 1, 3}});
    equiripple("Parks: differentiator", 1, 30, {{1, 0, 1, 1}});
    equiripple("Parks: Hilbert transformer", 2, 31, {{1, 0.1, 0.9, 1}});

    const auto narrow = [&](const char *name, int32_t type, double pass, double stop) {
        recipes.push_back({name,
                           [=](Call &c) {
                               auto *design = c.recordWithHandles<NarrowFIRDesign>(0);
                               *design = {0, 0, c.out<DBL>(0), c.out<DBL>(1)};
                               const int32_t status = FIRNarrowCoef_head(
                                   c.byReference(1000.0), c.byReference(pass), c.byReference(stop),
                                   c.byReference(190.0), c.byReference(0.02), c.byReference(50.0),
                                   c.byReference(type), design, c.err());
                               *c.record<NarrowNumbers>(0) = {design->kind, design->M};
                               return status;
                           },
                           HostStatusInResult,
                           {1}});
    };
    narrow("FIRNarrowCoef_head: lowpass", 0, 20, 28);
    narrow("FIRNarrowCoef_head: highpass", 1, 480, 472);
    narrow("FIRNarrowCoef_head: bandpass", 2, 10, 18);
    narrow("FIRNarrowCoef_head: bandstop", 3, 18, 10);
    narrow("FIRNarrowCoef_head: wide lowpass", 0, 472, 480);
    narrow("FIRNarrowCoef_head: one stage", 0, 200, 240);

    for (const int32_t M : {1, 3})
        for (const int32_t kind : {0, 3}) {
            const std::string variant =
                ": M " + std::to_string(M) + ", kind " + std::to_string(kind);
            const auto design = [=](Call &c) {
                auto *record = c.recordWithHandles<NarrowFIRDesign>(0);
                *record = {kind, M, c.in<DBL>(1, 21), c.in<DBL>(2, 15)};
                if (M == 1)
                    c.mayBeEmpty(2);
                return record;
            };
            recipes.push_back({"FIRnarrowFilter_head" + variant,
                               [=](Call &c) {
                                   return FIRnarrowFilter_head(c.in<DBL>(0), design(c),
                                                               c.out<DBL>(0), c.err());
                               },
                               HostStatusInResult | MayKeepArrayOnFailure});
            recipes.push_back({"CxSigFIRnarrowFilter_head" + variant,
                               [=](Call &c) {
                                   return CxSigFIRnarrowFilter_head(c.in<CDB>(0), design(c),
                                                                    c.out<CDB>(0), c.err());
                               },
                               HostStatusInResult | MayKeepArrayOnFailure});
        }
    return recipes;
}

const RecipeFile file(FIRDesignRecipes);

} // namespace

} // namespace qx::test
