#ifndef QX_TESTS_RECIPE_ARRAYS_H
#define QX_TESTS_RECIPE_ARRAYS_H

#include "tests/support/heap_probe.h"

#include <type_traits>

// The templates of Call; included by recipe.h.

namespace qx::test {

namespace detail {

inline void Set(DBL *element, double value) { *element = value; }
inline void Set(SGL *element, double value) { *element = static_cast<float>(value); }
inline void Set(I32 *element, double value) { *element = static_cast<int32_t>(value); }
inline void Set(U32 *element, double value) { *element = static_cast<uint32_t>(value); }
inline void Set(U8 *element, double value) { *element = static_cast<uint8_t>(value); }

// What noise is to each element: whole numbers need a wider range to say anything.
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

template <ElementType Code>
struct Call::Array1 : Call::Array {
    explicit Array1(int32_t count) : array(count) {}
    Array1D<Code> array;
    const unsigned char *block() const override {
        return reinterpret_cast<const unsigned char *>(*array.handle());
    }
    std::size_t blockSize() const override {
        return 4 + static_cast<std::size_t>(array.size()) * sizeof(typename Element<Code>::type);
    }
    std::vector<int32_t> sizes() const override { return {array.size()}; }
};

template <ElementType Code>
struct Call::Array2 : Call::Array {
    Array2(int32_t rows, int32_t cols) : array(rows, cols) {}
    Array2D<Code> array;
    const unsigned char *block() const override {
        return reinterpret_cast<const unsigned char *>(*array.handle());
    }
    std::size_t blockSize() const override {
        return 8 + static_cast<std::size_t>(array.size()) * sizeof(typename Element<Code>::type);
    }
    std::vector<int32_t> sizes() const override { return {array.rows(), array.cols()}; }
};

template <ElementType Code, class Values>
Handle1D<Code> Call::make(Role role, int number, int32_t count, const Values &values) {
    const HeapProbe::Pause pause;
    auto array = std::make_unique<Array1<Code>>(sizeOf(number, 0, count));
    detail::Fill(array->array.data(), array->array.size(), 1, number, values);
    const Handle1D<Code> handle = array->array.handle();
    addInput(role, number, std::move(array));
    return handle;
}

template <ElementType Code, class Values>
Handle2D<Code> Call::make(Role role, int number, int32_t rows, int32_t cols, const Values &values) {
    const HeapProbe::Pause pause;
    auto array = std::make_unique<Array2<Code>>(sizeOf(number, 0, rows), sizeOf(number, 1, cols));
    detail::Fill(array->array.data(), array->array.size(), array->array.cols(), number, values);
    const Handle2D<Code> handle = array->array.handle();
    addInput(role, number, std::move(array));
    return handle;
}

template <ElementType Code>
Handle1D<Code> Call::out(int number) {
    const HeapProbe::Pause pause;
    auto array = std::make_unique<Array1<Code>>(3);
    const Handle1D<Code> handle = array->array.handle();
    outputs_[number] = std::move(array);
    return handle;
}

template <ElementType Code>
Handle2D<Code> Call::out2D(int number) {
    const HeapProbe::Pause pause;
    auto array = std::make_unique<Array2<Code>>(1, 2);
    const Handle2D<Code> handle = array->array.handle();
    outputs_[number] = std::move(array);
    return handle;
}

} // namespace qx::test

#endif
