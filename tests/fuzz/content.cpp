#include "tests/fuzz/content.h"

#include "tests/fuzz/thunk.h"

#include <cmath>
#include <cstring>
#include <limits>
#include <map>

namespace qx::test {

namespace {

constexpr double infinity = std::numeric_limits<double>::infinity();
constexpr double notANumber = std::numeric_limits<double>::quiet_NaN();
constexpr double largest = std::numeric_limits<double>::max();
constexpr double smallest = std::numeric_limits<double>::denorm_min();
constexpr int32_t int32Min = std::numeric_limits<int32_t>::min();
constexpr int32_t int32Max = std::numeric_limits<int32_t>::max();

double FromBits(Random &random) {
    const uint64_t bits = uint64_t{random.bits()} << 32 | random.bits();
    double value;
    std::memcpy(&value, &bits, sizeof value);
    return value;
}

struct Place {
    int32_t row, col, rows, cols;
    int32_t index() const { return row * cols + col; }
    int32_t count() const { return rows * cols; }
};

// The same for (row, col) and (col, row).
double Mirrored(const Place &at, double scale) {
    const int32_t low = at.row < at.col ? at.row : at.col;
    const int32_t high = at.row < at.col ? at.col : at.row;
    return std::ldexp((low * 37 + high * 101) % 64 - 31.5, -5) * scale;
}

double RealOf(Random &random, Content content, const Place &at, double constant) {
    switch (content) {
    case Content::Noise:
        return random.symmetric();
    case Content::Positive:
        return random.positive();
    case Content::Integers:
        return random.below(19) - 9;
    case Content::Ascending:
        return (at.index() + random.positive()) / (at.count() + 1.0);
    case Content::Descending:
        return 10 - at.index() - random.positive();
    case Content::Symmetric:
        return Mirrored(at, 1);
    case Content::Dominant:
        return at.row == at.col ? at.cols + 2.0 : Mirrored(at, 0.5);
    case Content::Constant:
        return constant;
    case Content::Zeros:
        return random.oneIn(8) ? -0.0 : 0.0;
    case Content::Huge:
        return random.symmetric() * largest;
    case Content::Tiny:
        return random.symmetric() * 1e-300;
    case Content::Denormal:
        return random.below(1000) * smallest;
    case Content::SomeNaN:
        return random.oneIn(4) ? notANumber : random.symmetric();
    case Content::SomeInfinity:
        return random.oneIn(4) ? std::copysign(infinity, random.symmetric()) : random.symmetric();
    case Content::RandomBits:
        return FromBits(random);
    }
    return 0;
}

int64_t WholeOf(Random &random, Content content, const Place &at, int32_t constant) {
    switch (content) {
    case Content::Ascending:
        return at.index();
    case Content::Descending:
        return at.count() - at.index();
    case Content::Constant:
        return constant;
    case Content::Zeros:
        return 0;
    case Content::Huge:
        return random.oneIn(2) ? int32Min : int32Max;
    case Content::RandomBits:
        return static_cast<int32_t>(random.bits());
    case Content::Positive:
    case Content::Dominant:
        return 1 + random.below(at.count() < 9 ? 4 : 9);
    default:
        return random.below(19) - 9;
    }
}

void PutField(Random &random, const std::string &element, Content content, const Place &at,
              double constant, unsigned char *to) {
    const auto put = [to](const auto value) { std::memcpy(to, &value, sizeof value); };
    if (element == "DBL")
        put(RealOf(random, content, at, constant));
    else if (element == "SGL")
        put(static_cast<float>(RealOf(random, content, at, constant)));
    else if (element == "U8")
        put(static_cast<uint8_t>(content == Content::RandomBits ? random.bits() : random.below(2)));
    else if (ElementSize(element) == 2)
        put(static_cast<int16_t>(WholeOf(random, content, at, static_cast<int32_t>(constant))));
    else
        put(static_cast<int32_t>(WholeOf(random, content, at, static_cast<int32_t>(constant))));
}

} // namespace

Sizes SomeSizes(Random &random) {
    constexpr int32_t usual[] = {1, 2, 3, 4, 5, 6, 7, 8, 9, 12, 16, 17, 24, 31, 32, 33, 64, 100};
    constexpr int32_t large[] = {257, 1000, 4099};
    Sizes sizes{random.oneOf(usual), random.oneOf(usual)};
    if (random.oneIn(30))
        sizes.n = random.oneOf(large);
    return sizes;
}

int32_t SomeDimension(Random &random, const Sizes &sizes, bool fits) {
    if (fits)
        return sizes.n;
    const int32_t others[] = {sizes.n, sizes.n,     sizes.n,     sizes.m, sizes.m,
                              0,       sizes.n + 1, sizes.n - 1, 1,       random.below(12)};
    return random.oneOf(others);
}

int32_t SomeWhole(Random &random, const Sizes &sizes) {
    constexpr int32_t extremes[] = {int32Min, int32Min + 1, int32Max,       int32Max - 1, 1 << 30,
                                    65536,    -65536,       0x20000000 - 1, 46341,        -1};
    const int32_t n = sizes.n;
    const int32_t usual[] = {n, n, sizes.m, n - 1, n + 1, n / 2, 2 * n, 0, 1, 2, 3, 4, -1};
    switch (random.below(8)) {
    case 0:
        return random.oneOf(extremes);
    case 1:
        return random.below(70);
    case 2:
    case 3:
        return random.below(8);
    default:
        return random.oneOf(usual);
    }
}

double SomeReal(Random &random, const Sizes &sizes, bool isUsual) {
    constexpr double extremes[] = {notANumber,         infinity, -infinity, 1e300,  -1e300, 1e-300,
                                   smallest,           largest,  -0.0,      2147e6, -1e10,  1e17,
                                   4503599627370497.5, -largest, 0x1p-1022};
    constexpr double usual[] = {0, 1, -1, 0.5, 2, 0.1, 0.25, 0.05, 0.01, 3, 10, 100, 1000};
    if (!isUsual && random.oneIn(4))
        return random.oneIn(3) ? FromBits(random) : random.oneOf(extremes);
    switch (random.below(5)) {
    case 0:
        return random.symmetric();
    case 1:
        return random.positive();
    case 2:
        return random.below(60) + (random.oneIn(2) ? 0.0 : random.symmetric());
    case 3:
        return sizes.n * random.positive();
    default:
        return random.oneOf(usual);
    }
}

int32_t TypeCode(const std::string &element) {
    static const std::map<std::string, int32_t> codes = {
        {"I32", QXTypeI32}, {"U8", QXTypeU8},   {"U32", QXTypeU32}, {"SGL", QXTypeSGL},
        {"DBL", QXTypeDBL}, {"CSG", QXTypeCSG}, {"CDB", QXTypeCDB}};
    const auto found = codes.find(element);
    return found == codes.end() ? 0 : found->second;
}

std::size_t ElementSize(const std::string &element) {
    if (const RecordType *record = FindRecord(element); record != nullptr)
        return record->size;
    return element == "DBL"                       ? 8
           : element == "U8"                      ? 1
           : element == "U16" || element == "I16" ? 2
                                                  : 4;
}

RecordType LayoutOf(const std::string &element, RecordField &whole) {
    if (const RecordType *record = FindRecord(element); record != nullptr)
        return *record;
    whole = {0, 1, element};
    return {element, ElementSize(element), {&whole, 1}};
}

std::vector<unsigned char> SomeElements(Random &random, const std::string &element, int32_t rows,
                                        int32_t cols, Content content) {
    RecordField whole;
    const RecordType type = LayoutOf(element, whole);
    std::vector<unsigned char> bytes(type.size * static_cast<std::size_t>(rows) *
                                     static_cast<std::size_t>(cols));
    const double constant = SomeReal(random, {rows, cols}, true);
    unsigned char *next = bytes.data();
    for (int32_t row = 0; row < rows; ++row)
        for (int32_t col = 0; col < cols; ++col, next += type.size)
            for (const RecordField &field : type.fields)
                for (std::size_t i = 0; i < field.count; ++i)
                    PutField(random, field.element, content, {row, col, rows, cols}, constant,
                             next + field.offset + i * ElementSize(field.element));
    return bytes;
}

} // namespace qx::test
