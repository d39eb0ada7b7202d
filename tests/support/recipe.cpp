#include "tests/support/recipe.h"

#include "tests/support/heap_probe.h"

#include <cstring>

namespace qx::test {

namespace {

// Fowler, Noll, Vo: 64-bit FNV-1a.
class Hash {
public:
    void add(const void *bytes, std::size_t count) {
        for (std::size_t i = 0; i < count; ++i)
            value_ = (value_ ^ static_cast<const unsigned char *>(bytes)[i]) * 0x100000001B3U;
    }
    // A NaN counts as a NaN: its sign and payload are the processor's.
    void add(double value) {
        if (value != value)
            add("NaN", 3);
        else
            add(&value, sizeof value);
    }
    uint64_t value() const { return value_; }

private:
    uint64_t value_ = 0xCBF29CE484222325U;
};

void AddBytes(Hash &hash, const unsigned char *bytes, std::size_t count) {
    // Every word that could be a double is taken as one, which only serves the NaN.
    std::size_t i = 0;
    for (; i + sizeof(double) <= count; i += sizeof(double)) {
        double word;
        std::memcpy(&word, bytes + i, sizeof word);
        hash.add(word);
    }
    hash.add(bytes + i, count - i);
}

} // namespace

void Call::remember(Array &array) {
    array.before.assign(array.block(), array.block() + array.blockSize());
}

void *Call::makeRecords(int number, int32_t count, const void *records, std::size_t bytes) {
    const HeapProbe::Pause pause;
    const int32_t stored = countOf(number, count);
    auto array = std::make_unique<Array1<ElementType::U8>>(static_cast<int32_t>(bytes));
    std::memcpy(array->array.data(), records, bytes);
    const U8_1D handle = array->array.handle();
    (*handle)->dimSize = stored; // of records; the block is as long as their bytes
    remember(*array);
    inputs_[number] = std::move(array);
    return handle;
}

double *Call::scalar(int number) {
    const HeapProbe::Pause pause;
    return &(scalars_[number] = 12345.0);
}

int32_t *Call::integer(int number) {
    const HeapProbe::Pause pause;
    return &(integers_[number] = 12345);
}

void **Call::slot(int number) {
    const HeapProbe::Pause pause;
    return &slots_[number];
}

const int32_t *Call::byReference(int32_t value) {
    const HeapProbe::Pause pause;
    int32Values_.push_back(std::make_unique<int32_t>(value));
    return int32Values_.back().get();
}
const double *Call::byReference(double value) {
    const HeapProbe::Pause pause;
    doubleValues_.push_back(std::make_unique<double>(value));
    return doubleValues_.back().get();
}

ErrorCode *Call::err() {
    hasError_ = true;
    error_ = 12345;
    return &error_;
}

ErrorCode Call::status(int32_t functionResult) const { return hasError_ ? error_ : functionResult; }

bool Call::inputsAreUnchanged() const {
    for (const auto &[number, array] : inputs_)
        if (array->blockSize() != array->before.size() ||
            std::memcmp(array->block(), array->before.data(), array->before.size()) != 0)
            return false;
    return true;
}

bool Call::outputsAreEmpty() const {
    for (const Arrays *arrays : {&inOuts_, &outputs_})
        for (const auto &[number, array] : *arrays)
            if (array->elementCount() != 0)
                return false;
    for (const auto &[number, value] : scalars_) {
        constexpr uint64_t quietNaN = 0x7FF8000000000000;
        if (std::memcmp(&value, &quietNaN, sizeof value) != 0)
            return false;
    }
    return true;
}

uint64_t Call::outputHash(ErrorCode status) const {
    Hash hash;
    hash.add(&status, sizeof status);
    for (const Arrays *arrays : {&spoiled_, &inOuts_, &outputs_})
        for (const auto &[number, array] : *arrays) {
            const std::size_t header = array->blockSize() % 8 == 4 ? 4 : 8;
            hash.add(array->block(), header);
            AddBytes(hash, array->block() + header, array->blockSize() - header);
        }
    for (const auto &[number, value] : scalars_)
        hash.add(value);
    for (const auto &[number, value] : integers_)
        hash.add(&value, sizeof value);
    for (const auto &[number, bytes] : records_)
        AddBytes(hash, bytes.data(), bytes.size());
    return hash.value();
}

std::string Call::describeOutputs() const {
    std::string text;
    for (const Arrays *arrays : {&inOuts_, &outputs_})
        for (const auto &[number, array] : *arrays)
            text +=
                " array " + std::to_string(number) + " of " + std::to_string(array->elementCount());
    for (const auto &[number, value] : scalars_)
        text += " scalar " + std::to_string(number) + " = " + std::to_string(value);
    return text;
}

void Call::releaseNodes() {
    for (auto &[number, slot] : slots_)
        RunSweepOf(std::exchange(slot, nullptr));
    if (instance_ != nullptr)
        releaseInstance_(&instance_);
}

} // namespace qx::test
