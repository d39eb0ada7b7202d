#include "tests/codes/intercept.h"

#include "tests/fuzz/attack.h"
#include "tests/support/hostile_host.h"

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <functional>
#include <sstream>

namespace qx::test {

namespace {

struct Interception {
    std::string exportName;
    const Spoils *spoils = nullptr;
    SpoiltRun run;
};
thread_local Interception *active = nullptr;

// The location of a place in the memory of one call.
struct Located {
    std::string name;
    int dimensions;
    std::string element;
    void **handle;         // where the array's handle is
    unsigned char *number; // of a number
};

unsigned char *BlockOf(const Located &place) {
    return *static_cast<unsigned char **>(*place.handle);
}

std::vector<int32_t> SizesOf(const Located &place) {
    std::vector<int32_t> sizes(static_cast<std::size_t>(place.dimensions));
    if (*place.handle != nullptr)
        std::memcpy(sizes.data(), BlockOf(place), 4 * sizes.size());
    return sizes;
}

bool IsComplex(const std::string &element) { return element == "CDB" || element == "CSG"; }
std::string PartOf(const std::string &element) {
    return element == "CDB" ? "DBL" : element == "CSG" ? "SGL" : element;
}
std::size_t PartSize(const std::string &part) {
    return part == "DBL" || part == "I64"   ? 8
           : part == "U8"                   ? 1
           : part == "I16" || part == "U16" ? 2
                                            : 4;
}
bool IsRecord(const std::string &element) {
    return FindLayout(element) != nullptr && !IsComplex(element);
}

// A double beyond the range of a whole number becomes the nearest one.
int64_t Whole(double value, double least, double most) {
    return value != value ? 0 : static_cast<int64_t>(std::clamp(value, least, most));
}

void Put(const std::string &part, unsigned char *to, double value) {
    const auto put = [to](auto number) { std::memcpy(to, &number, sizeof number); };
    if (part == "DBL")
        put(value);
    else if (part == "SGL")
        put(static_cast<float>(value));
    else if (part == "U8")
        put(static_cast<uint8_t>(Whole(value, 0, 255)));
    else if (part == "I16" || part == "U16")
        put(static_cast<int16_t>(Whole(value, -32768, 32767)));
    else if (part == "U32")
        put(static_cast<uint32_t>(Whole(value, 0, 4294967295.0)));
    else if (part == "I64")
        put(Whole(value, -2147483648.0, 4294967295.0));
    else
        put(static_cast<int32_t>(Whole(value, -2147483648.0, 2147483647.0)));
}

double Get(const std::string &part, const unsigned char *from) {
    const auto get = [from](auto number) {
        std::memcpy(&number, from, sizeof number);
        return static_cast<double>(number);
    };
    return part == "DBL"                    ? get(0.0)
           : part == "SGL"                  ? get(0.0F)
           : part == "U8"                   ? get(uint8_t{0})
           : part == "I16" || part == "U16" ? get(int16_t{0})
           : part == "U32"                  ? get(uint32_t{0})
           : part == "I64"                  ? get(int64_t{0})
                                            : get(int32_t{0});
}

int64_t CountOf(const std::vector<int32_t> &sizes) {
    int64_t count = 1;
    for (const int32_t size : sizes)
        count *= size;
    return count;
}

// Changes only the sizes, for a block that the host cannot resize: to no more than it holds.
bool Shrink(const Located &place, const std::vector<int32_t> &before,
            const std::vector<int32_t> &sizes) {
    if (CountOf(sizes) > CountOf(before))
        return false;
    std::memcpy(BlockOf(place), sizes.data(), 4 * sizes.size());
    return true;
}

bool Resize(const Located &place, const std::vector<int32_t> &sizes) {
    const std::vector<int32_t> before = SizesOf(place);
    const bool isNegative =
        std::any_of(sizes.begin(), sizes.end(), [](int32_t size) { return size < 0; });
    if (sizes.size() != before.size() || *place.handle == nullptr)
        return false;
    if (place.dimensions == 3 || IsRecord(place.element) || isNegative)
        return Shrink(place, before, sizes);
    const std::size_t header = 4 * sizes.size();
    const std::size_t each = PartSize(PartOf(place.element)) * (IsComplex(place.element) ? 2 : 1);
    const auto old = static_cast<std::size_t>(CountOf(before));
    const std::vector<unsigned char> elements(BlockOf(place) + header,
                                              BlockOf(place) + header + old * each);
    const std::map<std::string, int32_t> codes = {
        {"I32", QXTypeI32}, {"U8", QXTypeU8},   {"U32", QXTypeU32}, {"SGL", QXTypeSGL},
        {"DBL", QXTypeDBL}, {"CSG", QXTypeCSG}, {"CDB", QXTypeCDB}};
    if (detail::ReshapeBlock(codes.at(place.element), place.dimensions, place.handle,
                             static_cast<int32_t>(CountOf(sizes))) != 0)
        return false;
    std::memcpy(BlockOf(place), sizes.data(), header);
    const int32_t rows = sizes.size() == 2 ? sizes[0] : 1, cols = sizes.back();
    const int32_t oldRows = before.size() == 2 ? before[0] : 1, oldCols = before.back();
    unsigned char *next = BlockOf(place) + header;
    for (int32_t row = 0; row < rows; ++row)
        for (int32_t col = 0; col < cols; ++col, next += each)
            if (old == 0)
                std::memset(next, 0, each);
            else
                std::memcpy(next,
                            elements.data() +
                                static_cast<std::size_t>(row % oldRows * oldCols + col % oldCols) *
                                    each,
                            each);
    return true;
}

// Sets each part of each element to a function of its index and its old value.
bool Fill(const Located &place, const std::function<double(int64_t, double)> &value) {
    if (*place.handle == nullptr || place.dimensions == 3 || IsRecord(place.element))
        return false;
    const std::string part = PartOf(place.element);
    const int parts = IsComplex(place.element) ? 2 : 1;
    unsigned char *next = BlockOf(place) + 4 * place.dimensions;
    const int64_t count = CountOf(SizesOf(place));
    for (int64_t i = 0; i < count; ++i)
        for (int p = 0; p < parts; ++p, next += PartSize(part))
            Put(part, next, value(i, Get(part, next)));
    return count > 0;
}

// Number i of the sequence that `seed` selects; the range and the share of zeros depend on the
// seed.
double Wild(uint64_t seed, int64_t i) {
    constexpr int range[] = {1000, 500, 100, 330, 1000, 0};
    constexpr double zeros[] = {0, 0, 0.3, 0.6};
    Noise noise(seed * 1000003 + static_cast<uint64_t>(i));
    if (noise.positive() < zeros[seed / 6 % 4])
        return 0;
    const int most = range[seed % 6];
    const double place = noise.symmetric();
    const int exponent =
        most > 0 ? static_cast<int>(most * place) : 1011 + static_cast<int>(12 * place);
    return std::ldexp(noise.symmetric(), exponent);
}

bool Mirror(const Located &place) {
    const std::vector<int32_t> sizes = SizesOf(place);
    if (sizes.size() != 2 || sizes[0] != sizes[1] || PartOf(place.element) != "DBL")
        return false;
    const int parts = IsComplex(place.element) ? 2 : 1;
    auto *elements = reinterpret_cast<DBL *>(BlockOf(place) + 8);
    const int32_t n = sizes[0];
    for (int32_t i = 0; i < n; ++i)
        for (int32_t j = 0; j <= i; ++j) {
            elements[parts * (j * n + i)] = elements[parts * (i * n + j)];
            if (parts == 2)
                elements[2 * (j * n + i) + 1] = i == j ? 0 : -elements[2 * (i * n + j) + 1];
        }
    return true;
}

bool Apply(const std::string &action, const Located &place, const std::vector<Located> &all) {
    std::istringstream words(action);
    std::string verb, word;
    words >> verb >> word;
    const double number = std::strtod(word.c_str(), nullptr);
    if (verb == "=" && place.dimensions == 0) {
        Put(place.element, place.number, number);
        return true;
    }
    if (place.dimensions == 0)
        return false;
    if (verb == "size") {
        std::vector<int32_t> sizes;
        std::replace(word.begin(), word.end(), 'x', ' ');
        std::istringstream numbers(word);
        for (int32_t size; numbers >> size;)
            sizes.push_back(size);
        return Resize(place, sizes);
    }
    if (verb == "fill")
        return Fill(place, [&](int64_t, double) { return number; });
    if (verb == "first")
        return Fill(place, [](int64_t i, double old) { return i == 0 ? old : 0; });
    if (verb == "scale")
        return Fill(place, [&](int64_t, double old) { return old * number; });
    if (verb == "up")
        return Fill(place, [](int64_t i, double) { return static_cast<double>(i + 1); });
    if (verb == "down")
        return Fill(place, [](int64_t i, double) { return static_cast<double>(-i); });
    if (verb == "wave")
        return Fill(place, [](int64_t i, double) {
            const auto t = static_cast<double>(i);
            return std::sin(0.37 * t) * (1.0 + 1e-3 * t);
        });
    if (verb == "wild") {
        int64_t at = 0;
        return Fill(place, [&](int64_t, double) { return Wild(std::stoull(word), at++); });
    }
    if (verb == "mirror")
        return Mirror(place);
    if (verb == "at") {
        std::string value;
        words >> value;
        const double put = std::strtod(value.c_str(), nullptr);
        bool found = false;
        Fill(place, [&](int64_t i, double old) {
            found |= i == static_cast<int64_t>(number);
            return i == static_cast<int64_t>(number) ? put : old;
        });
        return found;
    }
    if (verb == "is")
        for (const Located &other : all)
            if (other.name == word && other.dimensions == place.dimensions &&
                other.element == place.element) {
                *place.handle = *other.handle;
                return true;
            }
    return false;
}

// The places of a call. Arguments that are const for the export are changed in a copy.
class Places {
public:
    Places(const Interceptable &target, Value *values) {
        copies_.reserve(target.arguments.size());
        for (std::size_t i = 0; i < target.arguments.size(); ++i)
            add(target.arguments[i], values[i]);
    }
    const std::vector<Located> &all() const { return all_; }

private:
    void add(const InterceptedArgument &argument, Value &value) {
        const std::string name = argument.name;
        switch (argument.kind) {
        case ArgumentKind::Array1D:
        case ArgumentKind::Array2D:
        case ArgumentKind::Array3D:
            all_.push_back({name, 1 + static_cast<int>(argument.kind), argument.element,
                            &value.pointer, nullptr});
            break;
        case ArgumentKind::Number:
            addNumber(argument, value);
            break;
        case ArgumentKind::Record:
            addRecord(argument, value);
            break;
        default:
            break;
        }
    }
    void addNumber(const InterceptedArgument &argument, Value &value) {
        const bool isReal = argument.element == "DBL" || argument.element == "SGL";
        if (argument.isByValue) {
            all_.push_back(
                {argument.name, 0, isReal ? "DBL" : "I64", nullptr,
                 reinterpret_cast<unsigned char *>(isReal ? static_cast<void *>(&value.real)
                                                          : static_cast<void *>(&value.whole))});
        } else if (!IsComplex(argument.element) && value.pointer != nullptr) {
            copyInput(argument, value, PartSize(argument.element));
            if (!argument.isOutput)
                all_.push_back({argument.name, 0, argument.element, nullptr,
                                static_cast<unsigned char *>(value.pointer)});
        } else {
            addRecord(argument, value);
        }
    }
    void addRecord(const InterceptedArgument &argument, Value &value) {
        const RecordLayout *const layout = FindLayout(argument.element);
        if (layout == nullptr || value.pointer == nullptr)
            return;
        copyInput(argument, value, layout->size);
        auto *bytes = static_cast<unsigned char *>(value.pointer);
        for (const LayoutField &field : layout->fields) {
            const std::string name = std::string(argument.name) + "." + field.name;
            if (field.dimensions > 0)
                all_.push_back({name, field.dimensions, field.element,
                                reinterpret_cast<void **>(bytes + field.offset), nullptr});
            else
                all_.push_back({name, 0, field.element, nullptr, bytes + field.offset});
        }
    }
    void copyInput(const InterceptedArgument &argument, Value &value, std::size_t size) {
        if (!argument.isInput)
            return;
        const auto *bytes = static_cast<const unsigned char *>(value.pointer);
        copies_.emplace_back(bytes, bytes + size);
        value.pointer = copies_.back().data();
    }

    std::vector<Located> all_;
    std::vector<std::vector<unsigned char>> copies_;
};

// Sets pointers of a call to null, and words of the caller to something other than a cell, until
// the call returns.
class SpoiltPointers {
public:
    SpoiltPointers(const Interceptable &target, const Spoils &spoils, Value *values) {
        for (const Spoil &spoil : spoils)
            for (std::size_t i = 0; i < target.arguments.size(); ++i)
                if (target.arguments[i].name == spoil.place) {
                    if (spoil.action == "null")
                        values[i].pointer = nullptr;
                    else if (spoil.action == "foreign" && values[i].pointer != nullptr)
                        replace(static_cast<void **>(values[i].pointer));
                }
    }
    ~SpoiltPointers() {
        for (const auto &[word, old] : words_)
            *word = old;
    }
    SpoiltPointers(const SpoiltPointers &) = delete;
    SpoiltPointers &operator=(const SpoiltPointers &) = delete;

private:
    void replace(void **word) {
        words_.push_back({word, *word});
        *word = &noCell_[1]; // the 0 before it marks no kind of cell
    }
    uint64_t noCell_[2] = {};
    std::vector<std::pair<void **, void *>> words_;
};

bool IsOfPointers(const Spoil &spoil) {
    return spoil.action == "null" || spoil.action == "foreign";
}

void SpoilArguments(const Spoils &spoils, const Places &places) {
    for (const Spoil &spoil : spoils) {
        if (IsOfPointers(spoil))
            continue;
        const auto place = std::find_if(places.all().begin(), places.all().end(),
                                        [&](const Located &p) { return p.name == spoil.place; });
        active->run.applied &=
            place != places.all().end() && Apply(spoil.action, *place, places.all());
    }
}

void Remember(const Places &places) {
    for (const Located &place : places.all())
        active->run.places.push_back(
            {place.name, place.dimensions, place.element,
             place.dimensions > 0 ? SizesOf(place) : std::vector<int32_t>{},
             place.dimensions > 0 ? 0 : Get(place.element, place.number)});
}

} // namespace

const RecordLayout *FindLayout(std::string_view name) {
    for (const RecordLayout &layout : AllLayouts())
        if (layout.name == name)
            return &layout;
    return nullptr;
}

int32_t Intercepted(const Interceptable &target, Value *values) {
    if (active == nullptr || active->exportName != target.name)
        return target.real(values);
    const Places places(target, values);
    if (active->run.codes.empty())
        Remember(places);
    SpoilArguments(*active->spoils, places);
    const SpoiltPointers pointers(target, *active->spoils, values);
    const int32_t result = target.real(values);
    ErrorCode code = target.returnsCode ? result : 0;
    for (std::size_t i = 0; i < target.arguments.size(); ++i)
        if (target.arguments[i].kind == ArgumentKind::Error)
            code = *static_cast<const ErrorCode *>(values[i].pointer);
    active->run.codes.push_back(code);
    return result;
}

bool Interceptable::hasInOrder(ErrorCode first, ErrorCode later) const {
    return std::find(std::find(checks.begin(), checks.end(), first), checks.end(), later) !=
           checks.end();
}

bool SpoiltRun::hasRaised(ErrorCode code) const {
    return std::find(codes.begin(), codes.end(), code) != codes.end();
}

namespace {
std::vector<double> NumbersOf(const Call &call) {
    std::vector<double> numbers;
    for (const OutputValue &output : call.outputs()) {
        const std::string part = PartOf(output.element);
        if (part == "DBL" || part == "SGL")
            for (std::size_t at = 0; at < output.bytes; at += PartSize(part))
                numbers.push_back(Get(part, output.elements + at));
    }
    return numbers;
}
} // namespace

SpoiltRun RunSpoilt(const Recipe &recipe, int32_t n, const Spoils &spoils) {
    Interception interception = {recipe.exportName(), &spoils, {}};
    active = &interception;
    {
        Call call(n);
        const Observed seen = Observe({}, 0x17, [&] { return recipe.run(call); });
        interception.run.applied &= seen.fault.empty();
        interception.run.numbers = NumbersOf(call);
    }
    active = nullptr;
    return interception.run;
}

std::string Written(const Spoils &spoils) {
    std::string text;
    for (const Spoil &spoil : spoils)
        text.append(text.empty() ? "" : "; ").append(spoil.place).append(" ").append(spoil.action);
    return text.empty() ? "as it is" : text;
}

Spoils ReadSpoils(const std::string &text) {
    Spoils spoils;
    std::istringstream parts(text == "as it is" ? "" : text);
    for (std::string part; std::getline(parts, part, ';');) {
        part.erase(0, part.find_first_not_of(' '));
        const std::size_t space = part.find(' ');
        spoils.push_back({part.substr(0, space), part.substr(space + 1)});
    }
    return spoils;
}

} // namespace qx::test
