#include "tests/support/recipe.h"

#include "tests/support/heap_probe.h"

#include <algorithm>
#include <cstring>
#include <sstream>
#include <stdexcept>

namespace qx::test {

namespace {

// Fowler, Noll, Vo: 64-bit FNV-1a.
class Hash {
public:
    void add(const void *bytes, std::size_t count) {
        for (std::size_t i = 0; i < count; ++i)
            value_ = (value_ ^ static_cast<const unsigned char *>(bytes)[i]) * 0x100000001B3U;
    }
    // All NaNs are equal: their sign and payload depend on the processor.
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
    // Every word that could be a double is treated as one; this matters only for NaNs.
    std::size_t i = 0;
    for (; i + sizeof(double) <= count; i += sizeof(double)) {
        double word;
        std::memcpy(&word, bytes + i, sizeof word);
        hash.add(word);
    }
    hash.add(bytes + i, count - i);
}

const char *ElementName(ElementType element) {
    switch (element) {
    case ElementType::I32:
        return "I32";
    case ElementType::U8:
        return "U8";
    case ElementType::U32:
        return "U32";
    case ElementType::SGL:
        return "SGL";
    case ElementType::CSG:
        return "CSG";
    case ElementType::DBL:
        return "DBL";
    case ElementType::CDB:
        return "CDB";
    }
    return "";
}

} // namespace

void Call::Array::remember() { before.assign(block(), block() + blockSize()); }

bool Call::Array::isUnchanged() const {
    return blockSize() == before.size() && std::memcmp(block(), before.data(), before.size()) == 0;
}

bool Call::Array::isEmpty() const {
    const std::vector<int32_t> all = sizes();
    return std::all_of(all.begin(), all.end(), [](int32_t size) { return size == 0; });
}

int32_t Call::sizeOf(int number, int dimension, int32_t asked) const {
    const bool isAltered = number == altered_.input && dimension == altered_.dimension;
    return isAltered ? altered_.size : asked;
}

std::unique_ptr<Call::Array> *Call::find(const Place &place) {
    Arrays &arrays = place.isOutput ? outputs_ : inputs_;
    const auto found = arrays.find(place.number);
    return found == arrays.end() ? nullptr : &found->second;
}

std::unique_ptr<Call::Array> *Call::partnerOf(const Place &place) {
    if (sharing_ == Sharing::None || !(place == shared_.first || place == shared_.second))
        return nullptr;
    return find(place == shared_.first ? shared_.second : shared_.first);
}

Call::Array &Call::add(Role role, const Place &place, std::unique_ptr<Array> array) {
    array->role = role;
    if (!place.isOutput) {
        if (place.number == claimed_.input)
            for (std::size_t i = 0; i < array->sizes().size(); ++i)
                if (claimed_.dimension == all || claimed_.dimension == static_cast<int>(i))
                    std::memcpy(const_cast<unsigned char *>(array->block()) + 4 * i, &claimed_.size,
                                sizeof claimed_.size);
        array->remember();
        if (find(place) != nullptr)
            throw std::logic_error("a recipe with two inputs of number " +
                                   std::to_string(place.number));
    }
    std::unique_ptr<Array> &held = (place.isOutput ? outputs_ : inputs_)[place.number];
    held = std::move(array);
    return *held;
}

void *Call::makeRecords(int number, int32_t count, const void *records, std::size_t bytes,
                        std::size_t least) {
    const HeapProbe::Pause pause;
    // The block is as long as the bytes of its records; its size field counts the records.
    const int32_t stored = sizeOf(number, 0, count);
    const std::size_t each = bytes / static_cast<std::size_t>(count);
    auto array = std::make_unique<Array1<ElementType::U8>>(
        static_cast<int32_t>(std::max(each * static_cast<std::size_t>(stored), least)));
    for (int32_t i = 0; i < stored; ++i)
        std::memcpy(array->array.data() + each * static_cast<std::size_t>(i),
                    static_cast<const char *>(records) + each * static_cast<std::size_t>(i % count),
                    each);
    const U8_1D handle = array->array.handle();
    (*handle)->dimSize = stored;
    array->isRecords = true;
    add(Role::Input, {false, number}, std::move(array));
    return handle;
}

double *Call::scalar(int number) {
    const HeapProbe::Pause pause;
    if (CurrentArithmetic() != usualArithmetic)
        SetArithmetic(usualArithmetic); // for computations of the recipe between two calls
    return &(scalars_[number] = 12345.0);
}

CDB *Call::complexScalar(int number) {
    const HeapProbe::Pause pause;
    return &(complexScalars_[number] = {12345.0, -12345.0});
}

int32_t *Call::integer(int number) {
    const HeapProbe::Pause pause;
    return &(integers_[number] = 12345);
}

void **Call::slot(int number) {
    const HeapProbe::Pause pause;
    return &node_->slots.emplace(number, preset_).first->second;
}

void **Call::instance(int32_t (*release)(void **)) {
    if (node_->instance == nullptr) { // otherwise its first user has set how it is released
        node_->instance = node_ == &own_ ? preset_ : nullptr;
        node_->releaseInstance = release;
    }
    return &node_->instance;
}

std::vector<void *> Call::words() const {
    std::vector<void *> found;
    for (const auto &[number, slot] : node_->slots)
        found.push_back(slot);
    if (node_->releaseInstance != nullptr)
        found.push_back(node_->instance);
    return found;
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

std::vector<Call::Size> Call::inputSizes() const {
    std::vector<Size> found;
    for (const auto &[number, array] : inputs_) {
        const bool mayBeZero =
            std::find(mayBeEmpty_.begin(), mayBeEmpty_.end(), number) != mayBeEmpty_.end();
        // The original sizes; an export may have changed them since.
        for (std::size_t i = 0; i < array->sizes().size(); ++i) {
            int32_t size;
            std::memcpy(&size, array->before.data() + 4 * i, sizeof size);
            found.push_back({number, static_cast<int>(i), size, mayBeZero});
        }
    }
    return found;
}

Call::Meeting Call::meetingOf(const Array &first, const Array &second) {
    const auto is = [&](Role role) { return first.role == role || second.role == role; };
    if (first.role == Role::Input && second.role == Role::Input)
        return Meeting::ReadTwice;
    if (is(Role::Input))
        return Meeting::ReadAndWritten;
    return is(Role::Spoiled) ? Meeting::Unknown : Meeting::WrittenTwice;
}

std::vector<std::pair<Call::Pair, Call::Meeting>> Call::pairsOfOneType() const {
    std::vector<std::pair<Place, const Array *>> places;
    for (const auto &[number, array] : inputs_)
        if (!array->isRecords &&
            std::find(readAgain_.begin(), readAgain_.end(), number) == readAgain_.end())
            places.push_back({{false, number}, array.get()});
    for (const auto &[number, array] : outputs_)
        places.push_back({{true, number}, array.get()});
    std::vector<std::pair<Pair, Meeting>> found;
    for (std::size_t i = 0; i < places.size(); ++i)
        for (std::size_t j = 0; j < i; ++j) {
            const Array &first = *places[j].second, &second = *places[i].second;
            if (first.element() == second.element() &&
                first.sizes().size() == second.sizes().size())
                found.push_back({{places[j].first, places[i].first}, meetingOf(first, second)});
        }
    return found;
}

bool Call::sizesFitBlocks() const {
    for (const Arrays *arrays : {&inputs_, &outputs_})
        for (const auto &[number, array] : *arrays) {
            const std::vector<int32_t> sizes = array->sizes();
            const bool isNegative =
                std::any_of(sizes.begin(), sizes.end(), [](int32_t size) { return size < 0; });
            if ((isNegative && !array->isUnchanged()) ||
                (!array->isRecords && array->blockSize() > array->room()))
                return false;
        }
    return true;
}

bool Call::inputsAreUnchanged() const {
    return std::all_of(inputs_.begin(), inputs_.end(), [](const auto &input) {
        return input.second->role != Role::Input || input.second->isUnchanged();
    });
}

bool Call::outputsAreSettled() const {
    for (const Arrays *arrays : {&inputs_, &outputs_})
        for (const auto &[number, array] : *arrays) {
            const bool mustBeEmpty = array->role == Role::InOut || array->role == Role::Output;
            if ((mustBeEmpty && !array->isEmpty()) ||
                (array->role == Role::Kept && !array->isUnchanged()))
                return false;
        }
    constexpr uint64_t quietNaN[2] = {0x7FF8000000000000, 0x7FF8000000000000};
    for (const auto &[number, value] : scalars_)
        if (std::memcmp(&value, quietNaN, sizeof value) != 0)
            return false;
    for (const auto &[number, value] : complexScalars_)
        if (std::memcmp(&value, quietNaN, sizeof value) != 0)
            return false;
    return std::all_of(integers_.begin(), integers_.end(),
                       [](const auto &integer) { return integer.second == 0; });
}

uint64_t Call::outputHash(ErrorCode status) const {
    Hash hash;
    hash.add(&status, sizeof status);
    for (const Arrays *arrays : {&inputs_, &outputs_})
        for (const auto &[number, array] : *arrays) {
            if (array->role == Role::Input || !array->isCounted)
                continue;
            const std::size_t header = array->headerSize();
            std::vector<int32_t> sizes = array->sizes();
            for (int32_t &size : sizes)
                size = std::max(size, 0);
            hash.add(sizes.data(), header);
            AddBytes(hash, array->block() + header, array->blockSize() - header);
        }
    for (const auto &[number, value] : scalars_)
        hash.add(value);
    for (const auto &[number, value] : complexScalars_) {
        hash.add(value.re);
        hash.add(value.im);
    }
    for (const auto &[number, value] : integers_)
        hash.add(&value, sizeof value);
    for (const auto &[number, bytes] : records_)
        AddBytes(hash, bytes.data(), bytes.size());
    return hash.value();
}

std::vector<OutputValue> Call::outputs() const {
    std::vector<OutputValue> found;
    const auto add = [&found](const char *kind, int number, const char *element, const void *value,
                              std::size_t bytes) {
        found.push_back({kind + std::to_string(number),
                         element,
                         {},
                         static_cast<const unsigned char *>(value),
                         bytes});
    };
    for (const Arrays *arrays : {&inputs_, &outputs_})
        for (const auto &[number, array] : *arrays) {
            if (array->role == Role::Input)
                continue;
            const std::vector<int32_t> sizes = array->sizes();
            const bool fits =
                std::all_of(sizes.begin(), sizes.end(), [](int32_t size) { return size >= 0; }) &&
                array->blockSize() <= array->room();
            found.push_back({(arrays == &inputs_ ? "input " : "output ") + std::to_string(number),
                             ElementName(array->element()), sizes,
                             array->block() + array->headerSize(),
                             fits ? array->blockSize() - array->headerSize() : 0});
        }
    for (const auto &[number, value] : scalars_)
        add("scalar ", number, "DBL", &value, sizeof value);
    for (const auto &[number, value] : complexScalars_)
        add("complex scalar ", number, "CDB", &value, sizeof value);
    for (const auto &[number, value] : integers_)
        add("integer ", number, "I32", &value, sizeof value);
    for (const auto &[number, bytes] : records_) {
        const auto element = elementOfRecord_.find(number);
        add("record ", number, element == elementOfRecord_.end() ? "" : element->second,
            bytes.data(), bytes.size());
    }
    return found;
}

std::string Call::describeOutputs() const {
    std::ostringstream text;
    for (const Arrays *arrays : {&inputs_, &outputs_})
        for (const auto &[number, array] : *arrays) {
            text << (arrays == &inputs_ ? " input " : " output ") << number
                 << (array->isUnchanged() ? " (unchanged) of" : " of");
            for (const int32_t size : array->sizes())
                text << ' ' << size;
        }
    for (const auto &[number, value] : scalars_)
        text << " scalar " << number << " = " << value;
    for (const auto &[number, value] : complexScalars_)
        text << " complex scalar " << number << " = " << value.re << ", " << value.im;
    for (const auto &[number, value] : integers_)
        text << " integer " << number << " = " << value;
    return text.str();
}

void NodeWords::release(const void *anothers) {
    for (auto &[number, slot] : slots)
        if (slot != anothers)
            RunSweepOf(std::exchange(slot, nullptr));
    if (instance != nullptr && instance != anothers)
        releaseInstance(&instance);
}

} // namespace qx::test
