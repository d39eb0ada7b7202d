#ifndef QX_TESTS_CODES_WITNESSES_H
#define QX_TESTS_CODES_WITNESSES_H

#include "tests/codes/intercept.h"

#include <fstream>
#include <stdexcept>

namespace qx::test {

// A line of witnesses.txt:
//
//     recipe | n | codes | spoils
//
// With arguments for size n, spoilt in this way, the recipe raises the first of the codes. If there
// is a second code, the spoils are those of two witnesses combined, and the first code is the one
// that comes first in the documentation.
struct Witness {
    const Recipe *recipe = nullptr;
    int32_t n = 0;
    ErrorCode code = 0, later = 0; // `later` is 0 for a single fault
    Spoils spoils;
};

inline std::string NameOf(ErrorCode code) {
    for (const auto &[name, number] : AllCodes())
        if (number == code)
            return name;
    throw std::invalid_argument("no code " + std::to_string(code));
}

inline std::string Written(const Witness &witness) {
    return witness.recipe->name + " | " + std::to_string(witness.n) + " | " + NameOf(witness.code) +
           (witness.later == 0 ? "" : " before " + NameOf(witness.later)) + " | " +
           Written(witness.spoils);
}

inline const Recipe *RecipeOf(const std::string &name) {
    for (const Recipe &recipe : AllRecipes())
        if (recipe.name == name)
            return &recipe;
    return nullptr;
}

inline const Interceptable *ExportOf(const std::string &name) {
    for (const Interceptable &one : AllInterceptable())
        if (one.name == name)
            return &one;
    return nullptr;
}

// The fields of a line between " | ".
inline std::vector<std::string> FieldsOf(const std::string &line) {
    std::vector<std::string> fields;
    std::size_t from = 0;
    for (std::size_t bar; (bar = line.find(" | ", from)) != std::string::npos; from = bar + 3)
        fields.push_back(line.substr(from, bar - from));
    fields.push_back(line.substr(from));
    return fields;
}

inline Witness ReadWitness(const std::string &line) {
    const std::vector<std::string> fields = FieldsOf(line);
    if (fields.size() != 4)
        throw std::invalid_argument("not a witness: " + line);
    Witness witness;
    witness.recipe = RecipeOf(fields[0]);
    if (witness.recipe == nullptr)
        throw std::invalid_argument("no recipe of that name: " + line);
    witness.n = std::stoi(fields[1]);
    const std::size_t before = fields[2].find(" before ");
    witness.code = AllCodes().at(fields[2].substr(0, before));
    if (before != std::string::npos)
        witness.later = AllCodes().at(fields[2].substr(before + 8));
    witness.spoils = ReadSpoils(fields[3]);
    return witness;
}

inline std::vector<std::string> LinesOf(const std::string &path) {
    std::vector<std::string> lines;
    std::ifstream file(path);
    for (std::string line; std::getline(file, line);)
        if (!line.empty() && line[0] != '#')
            lines.push_back(line);
    return lines;
}

} // namespace qx::test

#endif
