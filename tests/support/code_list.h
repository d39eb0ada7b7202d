#ifndef QX_TESTS_CODE_LIST_H
#define QX_TESTS_CODE_LIST_H

#include "qx/types.h"

#include <fstream>
#include <map>
#include <set>
#include <sstream>
#include <string>

namespace qx::test {

// The codes that the headers document for an export; success is always included.
struct Documented {
    bool hostStatus = false;
    std::set<ErrorCode> codes = {0};
};

// By export name, from the list that the build writes; exports without a status are not included.
inline std::map<std::string, Documented> ReadCodeList(const char *path) {
    std::map<std::string, Documented> exports;
    std::ifstream file(path);
    for (std::string line; std::getline(file, line);) {
        std::istringstream words(line);
        std::string word;
        words >> word;
        Documented &documented = exports[word];
        while (words >> word)
            if (word == "host")
                documented.hostStatus = true;
            else
                documented.codes.insert(std::stoi(word));
    }
    return exports;
}

} // namespace qx::test

#endif
