#ifndef QX_TESTS_TEST_DATA_H
#define QX_TESTS_TEST_DATA_H

#include <string>

namespace qx::test {

extern const char *const testDataFolder;

// The path of a file in tests/data of the folder that the test program belongs to.
inline std::string TestData(const char *file) { return std::string(testDataFolder) + file; }

} // namespace qx::test

#endif
