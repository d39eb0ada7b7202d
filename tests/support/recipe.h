#ifndef QX_TESTS_RECIPE_H
#define QX_TESTS_RECIPE_H

#include "tests/support/heap_probe.h"
#include "tests/support/hostile_host.h"

#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <ostream>
#include <string>
#include <vector>

// One line per export that says how it is called with valid arguments. From these lines the
// conformance tests drive every export through failing resizes and allocations, empty inputs,
// the workspace, moving blocks and several threads, and the bit hashes are made.
//
//   {"ReOXFFTH80", [](Call &c) {
//        return ReOXFFTH80(c.in<DBL>(0), c.out<CDB>(0), c.slot(0), 1, c.n, 0);
//    }},
//   {"Mean_head", [](Call &c) { return Mean_head(c.in<DBL>(0), c.scalar(0), c.err()); }},
//
// Arguments carry a number each, inputs and outputs counted apart, because C++ leaves open in
// which order arguments are evaluated, and the content follows the number.

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

// One call of one export: makes the arguments, keeps the outputs.
class Call {
public:
    explicit Call(int32_t size) : n(size) {}
    Call(const Call &) = delete;
    Call &operator=(const Call &) = delete;

    const int32_t n; // the size that the recipe builds its arguments from

    // Input arrays, read only: noise in [-1, 1), or what `value(i)` gives.
    template <ElementType Code>
    Handle1D<Code> in(int number) {
        return in<Code>(number, n);
    }
    template <ElementType Code>
    Handle1D<Code> in(int number, int32_t count, double (*value)(int32_t) = nullptr);
    template <ElementType Code>
    Handle2D<Code> in2D(int number, int32_t rows, int32_t cols, double (*value)(int32_t) = nullptr);
    // A 1-D block of records, `bytes` in all.
    // Named by the handle type: c.inRecords<HistInterval1D>(1, 3, intervals, sizeof intervals).
    template <class Handle>
    Handle inRecords(int number, int32_t count, const void *records, std::size_t bytes) {
        return static_cast<Handle>(makeRecords(number, count, records, bytes));
    }

    // Output arrays. They hold rubbish of a few elements before the call.
    template <ElementType Code>
    Handle1D<Code> out(int number);
    template <ElementType Code>
    Handle2D<Code> out2D(int number);
    // Arrays that are input and output at once: a failure empties them, too, unless the export
    // promises otherwise.
    template <ElementType Code>
    Handle1D<Code> inOut(int number) {
        return inOut<Code>(number, n);
    }
    template <ElementType Code>
    Handle1D<Code> inOut(int number, int32_t count, double (*value)(int32_t) = nullptr);
    // An input that the export is known to write into; its content afterwards is an output.
    template <ElementType Code>
    Handle1D<Code> spoiled(int number) {
        return spoiled<Code>(number, n);
    }
    template <ElementType Code>
    Handle1D<Code> spoiled(int number, int32_t count, double (*value)(int32_t) = nullptr);

    // Scalar outputs: a failure leaves the quiet NaN, or for integers 0.
    double *scalar(int number);
    int32_t *integer(int number);
    // A record or a pair that is an output but follows no rule on failure.
    template <class Record>
    Record *record(int number) {
        const HeapProbe::Pause pause;
        auto &bytes = records_[number];
        bytes.assign(sizeof(Record), 0);
        return reinterpret_cast<Record *>(bytes.data());
    }

    // By-reference inputs.
    const int32_t *byReference(int32_t value);
    const double *byReference(double value);

    // The trailing error out-parameter: then the status of the call is what stands there.
    ErrorCode *err();

    // Words that a node keeps: null at first. The call gives back what they hold.
    void **slot(int number);
    void **instance(int32_t (*release)(void **)) {
        releaseInstance_ = release;
        return &instance_;
    }

    // What the engine asks.
    ErrorCode status(int32_t functionResult) const;
    int inputCount() const { return static_cast<int>(inputs_.size() + inOuts_.size()); }
    void makeEmpty(int input) { emptyInput_ = input; } // the n-th input array that is asked for
    bool inputsAreUnchanged() const;
    bool outputsAreEmpty() const; // arrays without elements, scalars NaN
    uint64_t outputHash(ErrorCode status) const;
    std::string describeOutputs() const;
    void releaseNodes();
    ~Call() { releaseNodes(); }

private:
    struct Array {
        virtual ~Array() = default;
        virtual const unsigned char *block() const = 0; // sizes and elements
        virtual std::size_t blockSize() const = 0;
        virtual int32_t elementCount() const = 0;
        std::vector<unsigned char> before; // content at the start, for inputs
    };
    template <ElementType Code>
    struct Array1;
    template <ElementType Code>
    struct Array2;
    typedef std::map<int, std::unique_ptr<Array>> Arrays;

    template <ElementType Code>
    Handle1D<Code> make(Arrays &arrays, int number, int32_t count, double (*value)(int32_t));
    void *makeRecords(int number, int32_t count, const void *records, std::size_t bytes);
    int32_t countOf(int number, int32_t count) { return number == emptyInput_ ? 0 : count; }
    static void remember(Array &array);

    Arrays inputs_, inOuts_, spoiled_, outputs_;
    std::map<int, double> scalars_;
    std::map<int, int32_t> integers_;
    std::map<int, std::vector<unsigned char>> records_;
    std::map<int, void *> slots_;
    void *instance_ = nullptr;
    int32_t (*releaseInstance_)(void **) = nullptr;
    std::vector<std::unique_ptr<int32_t>> int32Values_;
    std::vector<std::unique_ptr<double>> doubleValues_;
    ErrorCode error_ = 0;
    bool hasError_ = false;
    int emptyInput_ = -1;
};

// What an export is known to do differently; everything else is checked.
enum Quirk : unsigned {
    None = 0,
    // Codes other than failure for an empty input array.
    TakesEmptyInput = 1,
    // A refused resize comes back as the host's own status.
    HostStatusPassesThrough = 2,
    // Heap calls beside the scratch front (plans, work blocks, instance data).
    UsesHeap = 4,
    // A failed allocation is not, or not always, reported.
    MemoryFailureMayPass = 8,
    // A failure may leave the array as it is.
    MayKeepArrayOnFailure = 16,
    // The function has no status: NaN or infinity is its only sign.
    NoStatus = 32,
    // Goes through BLAS or LAPACK, whose kernels differ between processors.
    BitsMayDiffer = 64,
};

struct Recipe {
    const char *name;
    std::function<int32_t(Call &)> run;
    unsigned quirks = None;
    std::vector<int32_t> sizes = {1, 2, 3, 8, 50, 1000};
};

inline void PrintTo(const Recipe &recipe, std::ostream *stream) { *stream << recipe.name; }

// Exports that are tested by hand, with the reason.
struct Exempt {
    const char *name;
    const char *reason;
};

// A file hands over what it holds by one object at its end:
//
//     const RecipeFile file(SpectraRecipes);
class RecipeFile {
public:
    typedef std::vector<Recipe> (*Make)();
    explicit RecipeFile(Make make);
    RecipeFile(std::initializer_list<Exempt> exempt);
};

// All that the families have handed over, by name.
const std::vector<Recipe> &AllRecipes();
const std::vector<Exempt> &ExemptExports();

// One hash per export over all its outputs at all the sizes of its recipes.
struct ExportHash {
    uint64_t hash = 0;
    bool mayDiffer = false; // from processor to processor
};
typedef std::function<int32_t(const Recipe &, Call &)> Caller;
std::map<std::string, ExportHash> HashEveryExport(const Caller &caller = [](const Recipe &recipe,
                                                                            Call &call) {
    return recipe.run(call);
});

} // namespace qx::test

#include "tests/support/recipe_arrays.h"

#endif
