#include "qx/iir_design.h"

#include "tests/support/recipe.h"

#include <string>

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL, CDB = ElementType::CDB;

// What the exports have in common: order, type and form of a variant, and edges for a rate of 1000.
struct Design {
    int32_t order, type, form;

    // `export_` is called with ripple and attenuation, if it has them, between the band and the
    // order.
    template <class Export, class... Levels>
    int32_t plain(Call &c, Export export_, Levels... levels) const {
        return export_(c.byReference(1000.0), c.byReference(80.0), c.byReference(210.0),
                       c.byReference(levels)..., c.byReference(order), c.byReference(type),
                       c.out<DBL>(0), c.out<DBL>(1), c.err());
    }
    template <class Export, class... Levels>
    int32_t formed(Call &c, Export export_, Levels... levels) const {
        return export_(c.byReference(1000.0), c.byReference(80.0), c.byReference(210.0),
                       c.byReference(levels)..., c.byReference(order), c.byReference(type), form,
                       c.out<DBL>(0), c.out<DBL>(1), c.err());
    }
};

template <class Export, class... Levels>
int32_t ByPoles(Call &c, Design d, Export export_, Levels... levels) {
    return export_(1000.0, 80.0, 210.0, levels..., d.order, d.type, c.out<DBL>(0), c.out<DBL>(1),
                   c.out<CDB>(2), c.out<CDB>(3), c.scalar(0));
}

std::vector<Recipe> IIRDesignRecipes() {
    std::vector<Recipe> recipes;
    const auto add = [&](const std::string &name, int32_t forms, auto run,
                         unsigned quirks = HostStatusInResult) {
        for (int32_t type = 0; type < 4; ++type)
            for (int32_t form = 0; form < forms; ++form)
                for (const int32_t order : {4, 7}) {
                    const std::string variant = ": order " + std::to_string(order) + ", type " +
                                                std::to_string(type) +
                                                (forms > 1 ? ", form " + std::to_string(form) : "");
                    recipes.push_back({name + variant,
                                       [=](Call &c) {
                                           return run(c, Design{order, type, form});
                                       },
                                       quirks,
                                       {1}});
                }
    };
    constexpr double ripple = 0.5, attenuation = 45.0;
    add("BWCoefs", 1, [](Call &c, Design d) { return d.plain(c, BWCoefs); });
    add("BWCoefs90", 2, [](Call &c, Design d) { return d.formed(c, BWCoefs90); });
    add("BesselCoefs", 1, [](Call &c, Design d) { return d.plain(c, BesselCoefs); });
    add("BesselCoefs90", 2, [](Call &c, Design d) { return d.formed(c, BesselCoefs90); });
    add("ChebyshevCoefs", 1, [](Call &c, Design d) { return d.plain(c, ChebyshevCoefs, ripple); });
    add("ChebyshevCoefs90", 2,
        [](Call &c, Design d) { return d.formed(c, ChebyshevCoefs90, ripple); });
    add("InvChebyshevCoefs", 1,
        [](Call &c, Design d) { return d.plain(c, InvChebyshevCoefs, attenuation); });
    add("InvChebyshevCoefs90", 2,
        [](Call &c, Design d) { return d.formed(c, InvChebyshevCoefs90, attenuation); });
    add("EllipticCoefs", 1,
        [](Call &c, Design d) { return d.plain(c, EllipticCoefs, ripple, attenuation); });
    add("EllipticCoefs90", 2,
        [](Call &c, Design d) { return d.formed(c, EllipticCoefs90, ripple, attenuation); });
    add(
        "BWCoefs2026", 1, [](Call &c, Design d) { return ByPoles(c, d, BWCoefs2026); }, None);
    add(
        "BesselCoefs2026", 1, [](Call &c, Design d) { return ByPoles(c, d, BesselCoefs2026); },
        None);
    add(
        "ChebyshevCoefs2026", 1,
        [](Call &c, Design d) { return ByPoles(c, d, ChebyshevCoefs2026, ripple); }, None);
    add(
        "InvChebyshevCoefs2026", 1,
        [](Call &c, Design d) { return ByPoles(c, d, InvChebyshevCoefs2026, attenuation); }, None);
    add(
        "EllipticCoefs2026", 1,
        [](Call &c, Design d) { return ByPoles(c, d, EllipticCoefs2026, ripple, attenuation); },
        None);
    return recipes;
}

const RecipeFile file(IIRDesignRecipes);

} // namespace

} // namespace qx::test
