#ifndef QX_TESTS_RECIPE_H
#define QX_TESTS_RECIPE_H

#include "qx/windows.h"
#include "tests/support/heap_probe.h"
#include "tests/support/hostile_host.h"

#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <ostream>
#include <string>
#include <type_traits>
#include <vector>

// A recipe is one line per export that calls it with valid arguments. From the recipes, the
// conformance tests drive every export through failing resizes and allocations, empty and
// mismatched inputs, the workspace, moving blocks and several threads, and the bit hashes are
// computed. The hashes of all exports are committed (tests/conformance/hashes.txt): after adding an
// export or a recipe, or changing a bit on purpose, run tools/compare_hashes --accept and commit
// the changed lines.
//
//   {"ReOXFFTH80", [](Call &c) {
//        return ReOXFFTH80(c.in<DBL>(0), c.out<CDB>(0), c.slot(0), 1, c.n, 0);
//    }},
//   {"Mean_head", [](Call &c) { return Mean_head(c.in<DBL>(0), c.scalar(0), c.err()); }},
//
// An export whose selectors, matrix types or methods matter has several recipes: the name of the
// export, ": " and the variant. A loop may add them.
//
//   {"Norm_head: of infinity", [](Call &c) { ... }},
//   for (int32_t type = 0; type < 4; ++type)
//       recipes.push_back({"Det_head: type " + std::to_string(type), [type](Call &c) { ... }});
//
// Each argument has a number, which determines its content, because C++ leaves the order of
// evaluation of arguments unspecified. Inputs (including those that are also outputs) and outputs
// are numbered separately:
//
//   {"SolveInPlace", [](Call &c) {
//        return SolveInPlace(c.in2D<DBL>(0, c.n, c.n, Dominant), c.inOut<DBL>(1), c.integer(0));
//    }},
//
// The content is noise in [-1, 1), for integers noise in [-9, 9], for masks 0 and 1; or the values
// of a function of the index, for a matrix of row and column, that returns double or CDB.

namespace qx::test {

// A pseudo-random stream that is the same on every target: exact integer arithmetic and exact
// scaling only.
class Noise {
public:
    explicit Noise(uint64_t seed) : state_(seed * 0x9E3779B97F4A7C15U + 0x632BE59BD9B4E019U) {}
    uint32_t bits() { // splitmix64 (Steele, Lea, Flood: Fast splittable generators, 2014)
        uint64_t z = state_ += 0x9E3779B97F4A7C15U;
        z = (z ^ (z >> 30)) * 0xBF58476D1CE4E5B9U;
        z = (z ^ (z >> 27)) * 0x94D049BB133111EBU;
        return static_cast<uint32_t>((z ^ (z >> 31)) >> 32);
    }
    // In [-1, 1), a multiple of 2^-31.
    double symmetric() { return static_cast<int32_t>(bits()) * 0x1p-31; }
    // In (0, 1).
    double positive() { return (bits() + 0.5) * 0x1p-32; }

private:
    uint64_t state_;
};

// The content of an array for which no function is given.
struct FromNoise {};

// The content of one output after a call.
struct OutputValue {
    std::string name;
    std::string element;        // a host type; empty if unknown
    std::vector<int32_t> sizes; // empty for a number or a record
    const unsigned char *elements;
    std::size_t bytes;
};

// The words that a node keeps from call to call; their contents are released with the node.
class NodeWords {
public:
    NodeWords() = default;
    ~NodeWords() { release(nullptr); }
    NodeWords(const NodeWords &) = delete;
    NodeWords &operator=(const NodeWords &) = delete;
    // Releases all contents except `anothers`.
    void release(const void *anothers);

    std::map<int, void *> slots; // by their number in the recipe
    void *instance = nullptr;
    int32_t (*releaseInstance)(void **) = nullptr;
};

// One call of one export: makes the arguments, keeps the outputs.
class Call {
public:
    explicit Call(int32_t size) : n(size) {}
    Call(const Call &) = delete;
    Call &operator=(const Call &) = delete;

    const int32_t n; // the size that the recipe builds its arguments from

    // Input arrays, read only.
    template <ElementType Code>
    Handle1D<Code> in(int number) {
        return in<Code>(number, n);
    }
    template <ElementType Code, class Values = FromNoise>
    Handle1D<Code> in(int number, int32_t count, const Values &values = {}) {
        return make<Code>(Role::Input, number, count, values);
    }
    template <ElementType Code, class Values = FromNoise>
    Handle2D<Code> in2D(int number, int32_t rows, int32_t cols, const Values &values = {}) {
        return make<Code>(Role::Input, number, rows, cols, values);
    }
    // A 1-D block of records of `bytes` bytes in all, but at least `least` bytes.
    // Named by the handle type: c.inRecords<HistInterval1D>(1, 3, intervals, sizeof intervals).
    template <class Handle>
    Handle inRecords(int number, int32_t count, const void *records, std::size_t bytes,
                     std::size_t least = 0) {
        return static_cast<Handle>(makeRecords(number, count, records, bytes, least));
    }

    // Output arrays. Before the call they hold a few elements of rubbish.
    template <ElementType Code>
    Handle1D<Code> out(int number);
    template <ElementType Code>
    Handle2D<Code> out2D(int number);

    // Arrays that are both input and output; a failure empties them as well.
    template <ElementType Code>
    Handle1D<Code> inOut(int number) {
        return inOut<Code>(number, n);
    }
    template <ElementType Code, class Values = FromNoise>
    Handle1D<Code> inOut(int number, int32_t count, const Values &values = {}) {
        return make<Code>(Role::InOut, number, count, values);
    }
    template <ElementType Code, class Values = FromNoise>
    Handle2D<Code> inOut2D(int number, int32_t rows, int32_t cols, const Values &values = {}) {
        return make<Code>(Role::InOut, number, rows, cols, values);
    }
    // The same, but a failure leaves them unchanged: the state of a stream.
    template <ElementType Code, class Values = FromNoise>
    Handle1D<Code> kept(int number, int32_t count, const Values &values = {}) {
        return make<Code>(Role::Kept, number, count, values);
    }
    // The same without a rule on failure: an input that the export is known to overwrite.
    template <ElementType Code>
    Handle1D<Code> spoiled(int number) {
        return spoiled<Code>(number, n);
    }
    template <ElementType Code, class Values = FromNoise>
    Handle1D<Code> spoiled(int number, int32_t count, const Values &values = {}) {
        return make<Code>(Role::Spoiled, number, count, values);
    }

    // An input that may be empty without a failure (quirk TakesEmptyInput: all inputs).
    void mayBeEmpty(int number) {
        const HeapProbe::Pause pause;
        mayBeEmpty_.push_back(number);
    }

    // An input that the recipe passes to more than one call, so it cannot also be an output.
    void isReadAgain(int number) {
        const HeapProbe::Pause pause;
        readAgain_.push_back(number);
    }

    // Scalar outputs: a failure sets them to a quiet NaN, in both parts of a complex number, or to
    // 0 for integers.
    double *scalar(int number);
    CDB *complexScalar(int number);
    int32_t *integer(int number);
    // A record or a pair that is an output without a rule on failure.
    template <class Record>
    Record *record(int number) {
        const HeapProbe::Pause pause;
        if constexpr (std::is_same_v<Record, double> || std::is_same_v<Record, WindowConstants>)
            elementOfRecord_[number] = "DBL";
        else if constexpr (std::is_same_v<Record, ::CDB>)
            elementOfRecord_[number] = "CDB";
        auto &bytes = records_[number];
        bytes.assign(sizeof(Record), 0);
        return reinterpret_cast<Record *>(bytes.data());
    }
    // A record that contains handles, whose layout depends on the platform. It is not part of the
    // result; the recipe copies its numbers into a separate record.
    template <class Record>
    Record *recordWithHandles(int number) {
        const HeapProbe::Pause pause;
        auto &bytes = recordsWithHandles_[number];
        bytes.assign(sizeof(Record), 0);
        return reinterpret_cast<Record *>(bytes.data());
    }

    // By-reference inputs.
    const int32_t *byReference(int32_t value);
    const double *byReference(double value);

    // The trailing error out-parameter; if it is used, it holds the status of the call.
    ErrorCode *err();

    // Words that a node keeps, initially null. The call releases their contents.
    void **slot(int number);
    void **instance(int32_t (*release)(void **));

    // Used by the test engine. `alter` changes one size of one input before the call.
    ErrorCode status(int32_t functionResult) const;
    bool hasErr() const { return hasError_; }
    struct Size {
        int input;
        int dimension;
        int32_t value;
        bool mayBeZero;
    };
    std::vector<Size> inputSizes() const;
    void alter(int input, int dimension, int32_t size) { altered_ = {input, dimension, size}; }
    // Makes the block of an input claim a size that it does not have.
    static constexpr int all = -1;
    void claim(int input, int dimension, int32_t size) { claimed_ = {input, dimension, size}; }
    // Gives every word an initial content, which only the caller may free.
    void preset(void *word) { preset_ = word; }
    // Uses the words of a node, which keeps them after the call.
    void use(NodeWords &node) { node_ = &node; }
    // What the words hold after the call.
    std::vector<void *> words() const;
    // Called with each array that the recipe has filled, and may change it before the export
    // receives it.
    typedef std::function<void(unsigned char *elements, ElementType, int32_t rows, int32_t cols)>
        Spoil;
    void spoil(Spoil spoil) { spoil_ = std::move(spoil); }
    // One array in two places of the call. Its content is that of the place that is read, or, if
    // both are read, of the one that the recipe fills last.
    struct Place {
        bool isOutput; // the number counts outputs
        int number;
        bool operator==(const Place &) const = default;
    };
    struct Pair {
        Place first, second;
    };
    enum class Meeting {
        ReadTwice,      // two inputs
        ReadAndWritten, // an input and an output
        WrittenTwice,   // two outputs
        Unknown         // one of them is written as a side effect
    };
    std::vector<std::pair<Pair, Meeting>> pairsOfOneType() const;
    void share(const Pair &pair) { shared_ = pair, sharing_ = Sharing::OneArray; }
    // Two arrays of that content instead of the shared one; the second one counts in the result.
    void keepApart(const Pair &pair) { shared_ = pair, sharing_ = Sharing::TwoArrays; }
    bool sharesArray() const { return sharing_ == Sharing::OneArray; }
    // Ignores a claimed negative size that is still there.
    bool sizesFitBlocks() const;
    bool inputsAreUnchanged() const;
    // After a failure: arrays without elements, scalars NaN or 0, kept arrays as they were.
    bool outputsAreSettled() const;
    uint64_t outputHash(ErrorCode status) const;
    // An array whose sizes exceed its block is shown without elements.
    std::vector<OutputValue> outputs() const;
    std::string describeOutputs() const;
    void releaseNodes() { own_.release(preset_); }
    ~Call() { releaseNodes(); }

private:
    enum class Role { Input, Spoiled, Kept, InOut, Output };
    struct Array {
        virtual ~Array() = default;
        virtual const unsigned char *block() const = 0; // sizes and elements
        virtual std::size_t room() const = 0;           // the capacity of the block
        virtual std::size_t blockSize() const = 0;
        virtual std::vector<int32_t> sizes() const = 0;
        virtual ElementType element() const = 0;
        void remember(); // stores the initial content
        bool isUnchanged() const;
        bool isEmpty() const; // all its sizes are 0
        std::size_t headerSize() const { return 4 * sizes().size(); }

        // Of two arrays instead of a shared one, the one with the higher rank counts.
        int rank() const { return role == Role::Output ? 3 : static_cast<int>(role); }

        Role role = Role::Output;
        bool isRecords = false;
        bool isCounted = true;             // in the result
        std::vector<unsigned char> before; // initial content, for inputs
    };
    template <ElementType Code>
    struct Array1;
    template <ElementType Code>
    struct Array2;
    typedef std::map<int, std::unique_ptr<Array>> Arrays;
    struct Alteration {
        int input;
        int dimension;
        int32_t size;
    };

    template <class Made>
    void spoilIfAsked(Made &array, int32_t rows, int32_t cols);
    template <ElementType Code, class Values>
    Handle1D<Code> make(Role role, int number, int32_t count, const Values &values);
    template <ElementType Code, class Values>
    Handle2D<Code> make(Role role, int number, int32_t rows, int32_t cols, const Values &values);
    void *makeRecords(int number, int32_t count, const void *records, std::size_t bytes,
                      std::size_t least);
    int32_t sizeOf(int number, int dimension, int32_t asked) const;
    static Meeting meetingOf(const Array &first, const Array &second);
    Array &add(Role role, const Place &place, std::unique_ptr<Array> array);
    template <class Made>
    Made &addOrShare(Role role, const Place &place, std::unique_ptr<Made> array);
    template <class Made, class... Sizes>
    Made &addOutput(int number, Sizes... sizes);
    std::unique_ptr<Array> *find(const Place &place);
    std::unique_ptr<Array> *partnerOf(const Place &place);

    Arrays inputs_, outputs_;
    std::map<int, double> scalars_;
    std::map<int, CDB> complexScalars_;
    std::map<int, int32_t> integers_;
    std::map<int, std::vector<unsigned char>> records_, recordsWithHandles_;
    std::map<int, const char *> elementOfRecord_; // of records of nothing else
    NodeWords own_, *node_ = &own_;
    void *preset_ = nullptr;
    std::vector<std::unique_ptr<int32_t>> int32Values_;
    std::vector<std::unique_ptr<double>> doubleValues_;
    std::vector<int> mayBeEmpty_, readAgain_;
    ErrorCode error_ = 0;
    bool hasError_ = false;
    Alteration altered_ = {-1, 0, 0}, claimed_ = {-1, 0, 0};
    enum class Sharing { None, OneArray, TwoArrays };
    Sharing sharing_ = Sharing::None;
    Pair shared_ = {};
    Spoil spoil_;
};

// Known deviations of an export; everything else is checked.
enum Quirk : unsigned {
    None = 0,
    // Empty input arrays are not a failure; for single inputs see Call::mayBeEmpty.
    TakesEmptyInput = 1,
    // A refused resize returns the host's own status, untranslated.
    HostStatusPassesThrough = 2,
    // Calls the heap directly (plans, work blocks, instance data), not only through the scratch
    // functions.
    UsesHeap = 4,
    // A failed allocation is not, or not always, reported.
    MemoryFailureMayPass = 8,
    // A failure may leave the array unchanged.
    MayKeepArrayOnFailure = 16,
    // The function has no status: NaN or infinity is its only sign.
    NoStatus = 32,
    // The code is in *err, and the function result is the host's own status if the host refused a
    // resize (otherwise 0, as for all other exports with an error out-parameter).
    HostStatusInResult = 128,
    // The code is both in *err and the function result; with HostStatusInResult the host's own
    // status replaces it in the function result.
    CodeInBoth = 256,
    // A refused resize is a success.
    RefusalPasses = 512,
};

struct Recipe {
    std::string name; // of the export, or "export: variant"
    std::function<int32_t(Call &)> run;
    unsigned quirks = None;
    std::vector<int32_t> sizes = {1, 2, 3, 8, 50, 1000};

    std::string exportName() const { return name.substr(0, name.find(':')); }
};

inline void PrintTo(const Recipe &recipe, std::ostream *stream) { *stream << recipe.name; }

// Exports that have tests of their own instead of a recipe, with the reason.
struct Exempt {
    const char *name;
    const char *reason;
};

// A file registers its recipes by one object at its end:
//
//     const RecipeFile file(SpectraRecipes);
class RecipeFile {
public:
    typedef std::vector<Recipe> (*Make)();
    explicit RecipeFile(Make make);
    RecipeFile(std::initializer_list<Exempt> exempt);
};

// All registered recipes, sorted by name.
const std::vector<Recipe> &AllRecipes();
const std::vector<Exempt> &ExemptExports();

// The accepted hashes, by export (tests/conformance/hashes.txt), and the text form of a hash.
std::map<std::string, std::string> AcceptedHashes(const char *file);
std::string HashText(uint64_t hash);
// One hash per export over all its outputs at all the sizes of its recipes.
typedef std::function<int32_t(const Recipe &, Call &)> Caller;
std::map<std::string, uint64_t> HashEveryExport(const Caller &caller = [](const Recipe &recipe,
                                                                          Call &call) {
    return recipe.run(call);
});

} // namespace qx::test

#include "tests/support/recipe_arrays.h"

#endif
