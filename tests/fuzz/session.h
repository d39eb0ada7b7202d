#ifndef QX_TESTS_FUZZ_SESSION_H
#define QX_TESTS_FUZZ_SESSION_H

#include "tests/fuzz/attack.h"
#include "tests/fuzz/scenario.h"

#include <array>
#include <string>
#include <vector>

namespace qx::test {

// Calls of several exports on the same slots, instance words and arrays. Words are exchanged
// between calls and, while the host resizes an array, during them. Arrays are reused as other
// arguments, also in several places of one call. Each undisturbed call must have the outcome that
// it has with null words and separate arrays.
class Session {
public:
    Session() = default;
    ~Session();
    Session(const Session &) = delete;
    Session &operator=(const Session &) = delete;

    // The outcome of the call.
    Outcome step(Random &random, const Thunk &thunk);

private:
    struct Words {
        std::array<void *, 4> slots = {};
        void *instance = nullptr;
        int32_t (*releaseInstance)(void **) = nullptr;
        Words() = default;
        ~Words();
        Words(const Words &) = delete;
        Words &operator=(const Words &) = delete;
        std::vector<void *> all() const;
    };
    struct Array {
        Parameter parameter; // for which it was made
        void *handle;
    };
    // Which array or slot each parameter gets.
    typedef std::vector<std::size_t> Places;

    std::size_t someArray(Random &random, const Parameter &parameter, const Argument &argument);
    void dropArrays(Random &random);
    static void *copyOf(const Array &array);
    static Outcome call(const Scenario &scenario, const Places &places, Words &words,
                        const std::vector<Array> &arrays);

    Words words_;
    std::vector<Array> arrays_;
};

Outcome RunSession(Random &random, const Subject &subject);

} // namespace qx::test

#endif
