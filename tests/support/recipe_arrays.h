#ifndef QX_TESTS_RECIPE_ARRAYS_H
#define QX_TESTS_RECIPE_ARRAYS_H

#include "tests/support/heap_probe.h"
#include "tests/support/host_arithmetic.h"

#include <algorithm>
#include <type_traits>

// The templates of Call; included by recipe.h.

namespace qx::test {

namespace detail {

inline void Set(DBL *element, double value) { *element = value; }
inline void Set(SGL *element, double value) { *element = static_cast<float>(value); }
inline void Set(I32 *element, double value) { *element = static_cast<int32_t>(value); }
inline void Set(U32 *element, double value) { *element = static_cast<uint32_t>(value); }
inline void Set(U8 *element, double value) { *element = static_cast<uint8_t>(value); }

// The noise of each element type; whole numbers need a wider range to be useful.
inline double NoiseFor(const SGL *, Noise &noise) { return noise.symmetric(); }
inline double NoiseFor(const DBL *, Noise &noise) { return noise.symmetric(); }
inline double NoiseFor(const I32 *, Noise &noise) { return noise.symmetric() * 10; }
inline double NoiseFor(const U32 *, Noise &noise) { return noise.bits(); }
inline double NoiseFor(const U8 *, Noise &noise) { return noise.bits() % 2; }

template <class Values>
auto ValueAt(const Values &values, int32_t index, int32_t cols) {
    if constexpr (std::is_invocable_v<Values, int32_t, int32_t>)
        return values(index / cols, index % cols);
    else
        return values(index);
}

template <class T, class Values>
void Fill(T *elements, int32_t count, int32_t cols, int seed, const Values &values) {
    const InArithmetic usual(usualArithmetic);
    constexpr bool isComplex = requires { elements->re; };
    constexpr bool isNoise = std::is_same_v<Values, FromNoise>;
    Noise noise(static_cast<uint64_t>(seed));
    for (int32_t i = 0; i < count; ++i) {
        if constexpr (isNoise && isComplex) {
            Set(&elements[i].re, noise.symmetric());
            Set(&elements[i].im, noise.symmetric());
        } else if constexpr (isNoise) {
            Set(&elements[i], NoiseFor(&elements[i], noise));
        } else {
            const auto value = ValueAt(values, i, cols);
            if constexpr (!isComplex) {
                Set(&elements[i], value);
            } else if constexpr (requires { value.re; }) {
                Set(&elements[i].re, value.re);
                Set(&elements[i].im, value.im);
            } else {
                Set(&elements[i].re, value);
                Set(&elements[i].im, noise.symmetric());
            }
        }
    }
}

} // namespace detail

// While one exists, resizes belong to the test: the host neither refuses nor records them.
class TestsOwnResizes {
public:
    TestsOwnResizes() : record_(Host()) { ResetHost(); }
    ~TestsOwnResizes() { Host() = std::move(record_); }
    TestsOwnResizes(const TestsOwnResizes &) = delete;
    TestsOwnResizes &operator=(const TestsOwnResizes &) = delete;

private:
    HostRecord record_;
};

template <ElementType Code>
struct Call::Array1 : Call::Array {
    explicit Array1(int32_t count) : array(count) {}
    Array1D<Code> array;
    const unsigned char *block() const override {
        return reinterpret_cast<const unsigned char *>(*array.handle());
    }
    std::size_t room() const override { return detail::BlockSize(array.handle()); }
    std::size_t blockSize() const override {
        return 4 + static_cast<std::size_t>(std::max(array.size(), 0)) *
                       sizeof(typename Element<Code>::type);
    }
    std::vector<int32_t> sizes() const override { return {array.size()}; }
    ElementType element() const override { return Code; }
    void take(const Array1 &other) {
        const TestsOwnResizes own;
        array.resize(other.array.size());
        std::copy_n(other.array.data(), other.array.size(), array.data());
    }
};

template <ElementType Code>
struct Call::Array2 : Call::Array {
    Array2(int32_t rows, int32_t cols) : array(rows, cols) {}
    Array2D<Code> array;
    const unsigned char *block() const override {
        return reinterpret_cast<const unsigned char *>(*array.handle());
    }
    std::size_t room() const override { return detail::BlockSize(array.handle()); }
    std::size_t blockSize() const override {
        return 8 + static_cast<std::size_t>(std::max(array.rows(), 0)) *
                       static_cast<std::size_t>(std::max(array.cols(), 0)) *
                       sizeof(typename Element<Code>::type);
    }
    std::vector<int32_t> sizes() const override { return {array.rows(), array.cols()}; }
    ElementType element() const override { return Code; }
    void take(const Array2 &other) {
        const TestsOwnResizes own;
        array.resize(other.array.rows(), other.array.cols());
        std::copy_n(other.array.data(), other.array.size(), array.data());
    }
};

// Adds an array, or merges it with its existing partner, which receives its content.
template <class Made>
Made &Call::addOrShare(Role role, const Place &place, std::unique_ptr<Made> made) {
    std::unique_ptr<Array> *const held = partnerOf(place);
    if (held == nullptr)
        return static_cast<Made &>(add(role, place, std::move(made)));
    auto &partner = dynamic_cast<Made &>(**held);
    if (role != Role::Output) {
        partner.take(*made);
        partner.remember();
    }
    made->role = role;
    const bool isMore = made->rank() > partner.rank();
    if (sharing_ == Sharing::TwoArrays) {
        (isMore ? partner.isCounted : made->isCounted) = false;
        return static_cast<Made &>(add(role, place, std::move(made)));
    }
    if (!isMore)
        return partner;
    // The shared array is kept in the place with the higher rank.
    std::unique_ptr<Array> moved = std::move(*held);
    const Place &from = place == shared_.first ? shared_.second : shared_.first;
    (from.isOutput ? outputs_ : inputs_).erase(from.number);
    return static_cast<Made &>(add(role, place, std::move(moved)));
}

template <class Made, class... Sizes>
Made &Call::addOutput(int number, Sizes... sizes) {
    return addOrShare(Role::Output, {true, number}, std::make_unique<Made>(sizes...));
}

template <class Made>
void Call::spoilIfAsked(Made &made, int32_t rows, int32_t cols) {
    if (spoil_)
        spoil_(reinterpret_cast<unsigned char *>(made.array.data()), made.element(), rows, cols);
}

template <ElementType Code, class Values>
Handle1D<Code> Call::make(Role role, int number, int32_t count, const Values &values) {
    const HeapProbe::Pause pause;
    const int32_t size = sizeOf(number, 0, count);
    auto made = std::make_unique<Array1<Code>>(size);
    detail::Fill(made->array.data(), size, 1, number, values);
    spoilIfAsked(*made, 1, size);
    return addOrShare(role, {false, number}, std::move(made)).array.handle();
}

template <ElementType Code, class Values>
Handle2D<Code> Call::make(Role role, int number, int32_t rows, int32_t cols, const Values &values) {
    const HeapProbe::Pause pause;
    const int32_t first = sizeOf(number, 0, rows);
    const int32_t second = sizeOf(number, 1, cols);
    auto made = std::make_unique<Array2<Code>>(first, second);
    detail::Fill(made->array.data(), made->array.size(), second, number, values);
    spoilIfAsked(*made, first, second);
    return addOrShare(role, {false, number}, std::move(made)).array.handle();
}

template <ElementType Code>
Handle1D<Code> Call::out(int number) {
    const HeapProbe::Pause pause;
    return addOutput<Array1<Code>>(number, 3).array.handle();
}

template <ElementType Code>
Handle2D<Code> Call::out2D(int number) {
    const HeapProbe::Pause pause;
    return addOutput<Array2<Code>>(number, 1, 2).array.handle();
}

} // namespace qx::test

#endif
