#ifndef QX_TESTS_TABLE_H
#define QX_TESTS_TABLE_H

#include <cstdlib>
#include <fstream>
#include <sstream>
#include <string>
#include <vector>

namespace qx::test {

// A line of a reference file: NAME ARGUMENT ... VALUE, numbers as hex floats.
struct TableRow {
    std::string text, name;
    std::vector<double> arguments;
    double value;
};

inline std::vector<TableRow> ReadTable(const std::string &path) {
    std::ifstream file(path);
    std::vector<TableRow> rows;
    for (std::string line; std::getline(file, line);) {
        std::istringstream words(line);
        TableRow row = {line, {}, {}, 0};
        words >> row.name;
        for (std::string word; words >> word;)
            row.arguments.push_back(std::strtod(word.c_str(), nullptr));
        row.value = row.arguments.back();
        row.arguments.pop_back();
        rows.push_back(row);
    }
    return rows;
}

} // namespace qx::test

#endif
