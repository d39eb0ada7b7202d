#ifndef QX_TESTS_FUZZ_SCENARIO_H
#define QX_TESTS_FUZZ_SCENARIO_H

#include "tests/fuzz/attack.h"
#include "tests/fuzz/content.h"
#include "tests/fuzz/thunk.h"
#include "tests/support/recipe.h"

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace qx::test {

// A call whose arguments come from the catalogue and a random stream alone.

// One argument before a call; blocks are made from it for each run.
struct Argument {
    int32_t rows = 0, cols = 0;       // of an array; a 1-D array has cols only
    std::vector<unsigned char> bytes; // elements of an array, or the target of a pointer
    int64_t whole = 0;
    double real = 0;
    int aliasOf = -1; // the array argument whose handle it shares
    // Negative sizes that the block claims in place of `rows` and `cols`; 0 for none.
    int32_t claims[2] = {0, 0};
    bool saysNegativeSize() const { return claims[0] < 0 || claims[1] < 0; }
};

// One call and its environment.
struct Scenario {
    const Thunk *thunk;
    std::vector<Argument> arguments;
    Disturbance disturbance;
    bool shares() const;
    // Whether two outputs are the same array, which every export refuses.
    bool writesOneTwice() const;
    // Whether an array is read in one place and written in another.
    bool writesInput() const;
    bool saysNegativeSize() const;
};
Scenario SomeScenario(Random &random, const Thunk &thunk);

// An array before a call, in a block of the host, optionally with `rubbish` in place of the
// elements.
void *NewArray(const Parameter &parameter, const Argument &argument,
               const unsigned char *rubbish = nullptr);
std::vector<int32_t> SizesOf(void *handle, const Parameter &parameter);
const unsigned char *ElementsOf(void *handle, const Parameter &parameter);
// The size of the elements in bytes, according to the dimensions; nothing if the block is smaller.
std::optional<std::size_t> ElementBytes(void *handle, const Parameter &parameter);

// The words that a node keeps between its calls.
struct Node {
    void *slots[4] = {};
    void *instance = nullptr;
    int32_t (*release)(void **) = nullptr;
    ~Node();
};

// The way in which a call is made. A second call changes what no result may depend on: the initial
// content of memory and outputs, whether arrays share a handle, and whether an array claims a
// negative size or 0.
struct Manner {
    bool apart = false;
    unsigned char rubbish = 0x17;
    bool empties = false;
};

// The blocks of the array arguments.
class Blocks {
public:
    Blocks(const Scenario &scenario, const Manner &manner);
    ~Blocks();
    Blocks(const Blocks &) = delete;
    Blocks &operator=(const Blocks &) = delete;

    void *handle(std::size_t i) const { return handles_[i]; }
    std::vector<int32_t> sizes(std::size_t i) const { return SizesOf(handles_[i], parameter(i)); }
    const unsigned char *elements(std::size_t i) const {
        return ElementsOf(handles_[i], parameter(i));
    }
    std::optional<std::size_t> bytes(std::size_t i) const {
        return ElementBytes(handles_[i], parameter(i));
    }
    bool isShared(std::size_t i) const;
    // Whether its sizes are unchanged since before the call.
    bool saysAsBefore(std::size_t i) const;

private:
    const Parameter &parameter(std::size_t i) const { return scenario_.thunk->parameters[i]; }
    bool isRead(std::size_t i) const;
    static void claim(void *handle, int dimensions, const Argument &argument, const Manner &manner);

    const Scenario &scenario_;
    std::vector<void *> handles_, own_;
    std::vector<std::vector<int32_t>> before_; // the sizes
};

// A scenario with its blocks: makes the call and returns its results.
class PreparedCall {
public:
    PreparedCall(const Scenario &scenario, Node &node, const Manner &manner);

    int32_t operator()() const { return thunk_.call(values_.data()); }
    bool hasStatus() const { return hasError_ || thunk_.returnsCode; }
    ErrorCode status(int32_t functionResult) const {
        return hasError_ ? error_ : thunk_.returnsCode ? functionResult : 0;
    }
    bool sizesFitBlock(std::size_t i) const {
        return blocks_.bytes(i).has_value() || blocks_.saysAsBefore(i);
    }
    bool inputIsUnchanged(std::size_t i) const;
    // An array whose sizes exceed its block is shown without elements.
    std::vector<OutputValue> outputs() const;

private:
    const Scenario &scenario_;
    const Thunk &thunk_;
    Blocks blocks_;
    std::vector<std::vector<unsigned char>> pointed_;
    std::vector<Value> values_;
    ErrorCode error_ = 0;
    bool hasError_ = false;
};

// All NaNs are equal, since their sign and payload depend on the processor; a negative size counts
// as 0.
class ValueHash {
public:
    void add(const OutputValue &value);
    uint64_t sizes() const { return sizes_; }
    uint64_t elements() const { return elements_; }

private:
    uint64_t sizes_ = 0x632BE59BD9B4E019U, elements_ = 0x632BE59BD9B4E019U;
};

// An export and the ways to call it.
struct Subject {
    std::string name;
    const Thunk *thunk = nullptr;
    std::vector<const Recipe *> recipes;
};
const std::vector<Subject> &AllSubjects();
// The seed of the case of an export in a round, which does not depend on the other exports.
uint64_t SeedOf(uint64_t seed, const std::string &name, int64_t round);

} // namespace qx::test

#endif
