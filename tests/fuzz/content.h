#ifndef QX_TESTS_FUZZ_CONTENT_H
#define QX_TESTS_FUZZ_CONTENT_H

#include "tests/fuzz/thunk.h"
#include "tests/support/recipe.h"

#include <cstdint>
#include <string>
#include <vector>

namespace qx::test {

// The content that the fuzzer puts into arguments: numbers of every class, and sizes that match or
// do not.

class Random : public Noise {
public:
    using Noise::Noise;
    int32_t below(int32_t n) { return static_cast<int32_t>(bits() % static_cast<uint32_t>(n)); }
    bool oneIn(int32_t n) { return below(n) == 0; }
    template <class T, std::size_t N>
    T oneOf(const T (&values)[N]) {
        return values[below(static_cast<int32_t>(N))];
    }
};

enum class Content {
    Noise,
    Positive,
    Integers,
    Ascending,
    Descending,
    Symmetric,
    Dominant, // a diagonal that outweighs its row
    Constant, // up to here, content that a caller could intend
    Zeros,
    Huge,
    Tiny,
    Denormal,
    SomeNaN,
    SomeInfinity,
    RandomBits,
};
constexpr int32_t usualContents = static_cast<int32_t>(Content::Constant) + 1;
constexpr int32_t allContents = static_cast<int32_t>(Content::RandomBits) + 1;

// The sizes of one call, from which those of its arrays and its numbers are chosen.
struct Sizes {
    int32_t n, m;
};
Sizes SomeSizes(Random &random);
// One dimension of an array: mostly one of the sizes.
int32_t SomeDimension(Random &random, const Sizes &sizes, bool fits);
int32_t SomeWhole(Random &random, const Sizes &sizes);
double SomeReal(Random &random, const Sizes &sizes, bool isUsual);

std::size_t ElementSize(const std::string &element);
// The fields of an element: those of a record, or, of any other, `whole`, which this sets.
RecordType LayoutOf(const std::string &element, RecordField &whole);
// The type code of the host; 0 for a record.
int32_t TypeCode(const std::string &element);
// rows by cols elements (a 1-D array is one row); each field of a record is generated separately.
std::vector<unsigned char> SomeElements(Random &random, const std::string &element, int32_t rows,
                                        int32_t cols, Content content);

} // namespace qx::test

#endif
