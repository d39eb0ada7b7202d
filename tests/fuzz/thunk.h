#ifndef QX_TESTS_FUZZ_THUNK_H
#define QX_TESTS_FUZZ_THUNK_H

#include <cstddef>
#include <cstdint>
#include <span>
#include <string>
#include <string_view>

namespace qx::test {

// Generated from the catalogue by the build: each export with its arguments, callable without
// types. The tables are constants, so no call initialises them, in whichever thread it is.

enum class Kind {
    Array1D,
    Array2D,
    Value,
    Reference,
    Output,
    InOut,
    Record,
    Slot,
    Instance,
    Error
};

// A name in the tables.
struct ElementName : std::string_view {
    constexpr ElementName(const char *name) : std::string_view(name) {}
    ElementName(const std::string &name) : std::string_view(name) {}
    operator std::string() const { return std::string(*this); }
};

struct Parameter {
    const char *name;
    Kind kind;
    bool isOut, isIn;
    ElementName element; // a host type, or a record's name
    bool isArray() const { return kind == Kind::Array1D || kind == Kind::Array2D; }
    int dimensions() const { return kind == Kind::Array2D ? 2 : 1; }
};

struct Value {
    void *pointer = nullptr;
    int64_t whole = 0;
    double real = 0;
};

struct Thunk {
    const char *name;
    int32_t (*call)(const Value *);
    int32_t (*release)(void **); // of an instance word
    bool returnsCode;
    std::span<const Parameter> parameters;
};

struct RecordField {
    std::size_t offset = 0;
    std::size_t count = 0;
    ElementName element = "";
};
struct RecordType {
    ElementName name;
    std::size_t size;
    std::span<const RecordField> fields;
};

std::span<const Thunk> AllThunks();
// Null if there is no record of this name.
const RecordType *FindRecord(std::string_view name);
// Exports whose arguments the catalogue cannot describe.
std::span<const char *const> NotDriven();

} // namespace qx::test

#endif
