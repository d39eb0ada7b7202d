#ifndef QX_TESTS_CODES_INTERCEPT_H
#define QX_TESTS_CODES_INTERCEPT_H

#include "qx/types.h"
#include "tests/compare/trampolines.h"
#include "tests/fuzz/thunk.h"
#include "tests/support/recipe.h"

#include <cstring>
#include <map>
#include <string>
#include <vector>

namespace qx::test {

// Intercepts calls between a recipe and the module. A recipe makes valid arguments; spoils change
// some of them, named as in the declaration, before the module receives them.

enum class ArgumentKind { Array1D, Array2D, Array3D, Number, Record, Word, Error, Other };

struct InterceptedArgument {
    const char *name;
    ArgumentKind kind;
    bool isByValue, isInput, isOutput; // neither isInput nor isOutput: both read and written
    ElementName element;               // a host type, or a record's name
};

struct EffectOfNaN {
    const char *place; // an argument, or "record.field"
    const char *words;
};

struct Interceptable {
    const char *name;
    int32_t (*real)(const Value *);
    bool returnsCode;
    std::span<const ErrorCode> codes;
    std::span<const ErrorCode> checks; // in documentation order: some codes more than once
    bool hasInOrder(ErrorCode first, ErrorCode later) const;
    std::span<const InterceptedArgument> arguments;
    std::span<const EffectOfNaN> nan;
};

struct LayoutField {
    const char *name;
    std::size_t offset;
    int dimensions; // of an array; 0 for a number
    ElementName element;
};
struct RecordLayout {
    const char *name;
    std::size_t size;
    std::span<const LayoutField> fields;
};

// Generated from the catalogue by the build.
std::span<const Interceptable> AllInterceptable();
std::span<const RecordLayout> AllLayouts();
const std::map<std::string, ErrorCode> &AllCodes();

// Null if there is no record of this name.
const RecordLayout *FindLayout(std::string_view name);

int32_t Intercepted(const Interceptable &target, Value *values);

template <class T>
void *Untyped(T pointer) {
    void *plain;
    static_assert(sizeof pointer == sizeof plain);
    std::memcpy(&plain, &pointer, sizeof plain);
    return plain;
}
template <class T>
T Typed(void *plain) {
    T pointer;
    std::memcpy(&pointer, &plain, sizeof pointer);
    return pointer;
}

// A change of one argument, or of a field "record.field":
//     x size 0          a size 3x2           new elements repeat the old ones
//     x fill nan        x at 2 -1            numbers; of a complex element both parts
//     x scale 1e300     x first              0 except for the first element
//     x up    x down    ascending or descending whole numbers
//     x wave            a growing sine in which no value occurs twice
//     a wild 5          powers of 2 of all sizes times noise, and zeros, from that seed
//     a mirror          the lower triangle over the upper one: a symmetric or Hermitian matrix
//     order = -1        y is x               a new value; the same array
//     slot foreign      ref null             a word that holds no cell of the module; a null pointer
struct Spoil {
    std::string place, action;
    bool operator==(const Spoil &) const = default;
};
typedef std::vector<Spoil> Spoils;
std::string Written(const Spoils &spoils);
Spoils ReadSpoils(const std::string &text);

// A place that can be spoilt in a call, with its original content.
struct SpoilPlace {
    std::string name;
    int dimensions; // of an array; 0 for a number
    std::string element;
    std::vector<int32_t> sizes;
    double value; // of a number
};

// Runs a recipe and spoils the arguments of each call of its export.
struct SpoiltRun {
    std::vector<ErrorCode> codes;   // of its calls
    std::vector<SpoilPlace> places; // of the first call
    std::vector<double> numbers;    // of all outputs that may be NaN
    bool applied = true;            // whether a place was found for each spoil
    bool hasRaised(ErrorCode code) const;
};
SpoiltRun RunSpoilt(const Recipe &recipe, int32_t n, const Spoils &spoils);

} // namespace qx::test

#endif
