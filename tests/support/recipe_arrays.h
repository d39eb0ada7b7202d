#ifndef QX_TESTS_RECIPE_ARRAYS_H
#define QX_TESTS_RECIPE_ARRAYS_H

#include "tests/support/heap_probe.h"

// The templates of Call; included by recipe.h.

namespace qx::test {

namespace detail {

inline void Set(DBL *element, double value) { *element = value; }
inline void Set(SGL *element, double value) { *element = static_cast<float>(value); }
inline void Set(I32 *element, double value) { *element = static_cast<int32_t>(value); }
inline void Set(U32 *element, double value) { *element = static_cast<uint32_t>(value); }
inline void Set(U8 *element, double value) { *element = static_cast<uint8_t>(value); }

template <class T>
void Fill(T *elements, std::ptrdiff_t count, int seed, double (*value)(int32_t)) {
    constexpr bool isComplex = requires { elements->re; };
    Noise noise(static_cast<uint64_t>(seed));
    for (std::ptrdiff_t i = 0; i < count; ++i) {
        const double first = value != nullptr ? value(static_cast<int32_t>(i)) : noise.symmetric();
        if constexpr (isComplex) {
            Set(&elements[i].re, first);
            Set(&elements[i].im, noise.symmetric());
        } else {
            Set(&elements[i], first);
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
    int32_t elementCount() const override { return array.size(); }
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
    int32_t elementCount() const override {
        return array.rows() == 0 && array.cols() == 0 ? 0 : array.size() + 1;
    }
};

template <ElementType Code>
Handle1D<Code> Call::make(Arrays &arrays, int number, int32_t count, double (*value)(int32_t)) {
    const HeapProbe::Pause pause;
    auto array = std::make_unique<Array1<Code>>(countOf(number, count));
    detail::Fill(array->array.data(), array->array.size(), number, value);
    remember(*array);
    const Handle1D<Code> handle = array->array.handle();
    arrays[number] = std::move(array);
    return handle;
}

template <ElementType Code>
Handle1D<Code> Call::in(int number, int32_t count, double (*value)(int32_t)) {
    return make<Code>(inputs_, number, count, value);
}

template <ElementType Code>
Handle2D<Code> Call::in2D(int number, int32_t rows, int32_t cols, double (*value)(int32_t)) {
    const HeapProbe::Pause pause;
    auto array = std::make_unique<Array2<Code>>(countOf(number, rows), countOf(number, cols));
    detail::Fill(array->array.data(), array->array.size(), number, value);
    remember(*array);
    const Handle2D<Code> handle = array->array.handle();
    inputs_[number] = std::move(array);
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

template <ElementType Code>
Handle1D<Code> Call::inOut(int number, int32_t count, double (*value)(int32_t)) {
    return make<Code>(inOuts_, number, count, value);
}

template <ElementType Code>
Handle1D<Code> Call::spoiled(int number, int32_t count, double (*value)(int32_t)) {
    return make<Code>(spoiled_, number, count, value);
}

} // namespace qx::test

#endif
