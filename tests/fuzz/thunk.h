#ifndef QX_TESTS_FUZZ_THUNK_H
#define QX_TESTS_FUZZ_THUNK_H

#include <cstddef>
#include <cstdint>
#include <map>
#include <string>
#include <vector>

namespace qx::test {

// Generated from the catalogue by the build: each export with its arguments, callable without
// types.

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

struct Parameter {
    const char *name;
    Kind kind;
    bool isOut, isIn;
    std::string element; // a host type, or a record's name
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
    std::vector<Parameter> parameters;
};

struct RecordField {
    std::size_t offset;
    std::size_t count;
    std::string element;
};
struct RecordType {
    std::size_t size;
    std::vector<RecordField> fields;
};

const std::vector<Thunk> &AllThunks();
const std::map<std::string, RecordType> &AllRecords();
// Exports whose arguments the catalogue cannot describe.
const std::vector<std::string> &NotDriven();

} // namespace qx::test

#endif
