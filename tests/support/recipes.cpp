#include "tests/support/recipe.h"

#include <algorithm>
#include <cstdio>
#include <fstream>
#include <stdexcept>

namespace qx::test {

namespace {

struct Registry {
    std::vector<RecipeFile::Make> files;
    std::vector<Exempt> exempt;
};

Registry &Registered() {
    static Registry registry;
    return registry;
}

} // namespace

RecipeFile::RecipeFile(Make make) { Registered().files.push_back(make); }
RecipeFile::RecipeFile(std::initializer_list<Exempt> exempt) {
    Registered().exempt.insert(Registered().exempt.end(), exempt);
}

const std::vector<Recipe> &AllRecipes() {
    static const std::vector<Recipe> all = [] {
        std::vector<Recipe> recipes;
        for (const RecipeFile::Make make : Registered().files)
            for (Recipe &recipe : make())
                recipes.push_back(std::move(recipe));
        // The order of the files depends on the linker.
        std::stable_sort(recipes.begin(), recipes.end(),
                         [](const Recipe &a, const Recipe &b) { return a.name < b.name; });
        return recipes;
    }();
    return all;
}

const std::vector<Exempt> &ExemptExports() { return Registered().exempt; }

std::map<std::string, std::string> AcceptedHashes(const char *file) {
    std::map<std::string, std::string> accepted;
    std::ifstream lines(file);
    for (std::string name, hash; lines >> name >> hash;)
        if (!accepted.emplace(name, hash).second)
            throw std::logic_error(name + " occurs twice in " + file);
    return accepted;
}

std::string HashText(uint64_t hash) {
    char text[17];
    std::snprintf(text, sizeof text, "%016llx", static_cast<unsigned long long>(hash));
    return text;
}

std::map<std::string, uint64_t> HashEveryExport(const Caller &caller) {
    std::map<std::string, uint64_t> hashes;
    for (const Recipe &recipe : AllRecipes()) {
        uint64_t &hash = hashes[recipe.exportName()];
        for (const int32_t n : recipe.sizes) {
            Call call(n);
            ResetHost();
            const ErrorCode status = call.status(caller(recipe, call));
            hash = hash * 0x9E3779B97F4A7C15U + call.outputHash(status);
        }
    }
    return hashes;
}

} // namespace qx::test
