#include "frame/constants.h"
#include "frame/scratch.h"
#include "stats/order.h"
#include "stats/sort.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

// The elements of rank n / 2 - 1 and n / 2; the lower one is used only for even n.
struct Middle {
    double lower, upper;
};

bool HasNaN(ConstRealVector x) {
    constexpr std::ptrdiff_t block = 256; // whole blocks need no branch per element
    const std::ptrdiff_t n = x.size();
    std::ptrdiff_t i = 0;
    for (; n - i >= block; i += block) {
        int64_t count = 0;
        for (std::ptrdiff_t j = 0; j < block; ++j)
            count += x[i + j] != x[i + j];
        if (count != 0)
            return true;
    }
    for (; i < n; ++i)
        if (x[i] != x[i])
            return true;
    return false;
}

// The elements of ranks k - 1 and k; k is at least 1 unless there is only one element.
Middle SelectPair(RealVector a, int32_t k) {
    SelectKth(a, k);
    double lower = a[0];
    for (int32_t i = 1; i < k; ++i)
        lower = a[i] > lower ? a[i] : lower;
    return {lower, a[k]};
}

// Fills the sample with elements of x from random places.
void TakeSample(ConstRealVector x, RealVector sample) {
    uint32_t random = 1; // linear congruential (D. Knuth, The Art of Computer Programming 2, 1981)
    const auto n = static_cast<uint64_t>(x.size());
    for (std::ptrdiff_t i = 0; i < sample.size(); ++i) {
        random = random * 1664525U + 1013904223U;
        sample[i] = x[static_cast<std::ptrdiff_t>(uint64_t{random} * n >> 32)];
    }
}

// Brackets the middle between two elements of a sample, so that one pass over x leaves only a few
// elements to select from (R. Floyd, R. Rivest: Expected time bounds for selection, 1975). Returns
// false if the middle is outside the bracket, or is a zero whose sign depends on the order.
bool FindByBracket(ConstRealVector x, RealVector work, Middle *middle) {
    const auto n = static_cast<int32_t>(x.size());
    const int32_t k = n / 2;
    int32_t sampleSize = 64;
    while (std::sqrt(double{1} * sampleSize) * sampleSize < n) // n to the power of 2/3
        sampleSize *= 2;
    TakeSample(x, work.part(0, sampleSize));
    // In 99 of 100 random arrays the middle is within this distance of the middle of the sample.
    const auto gap = static_cast<int32_t>(1.3 * std::sqrt(double{1} * sampleSize)) + 1;
    SelectKth(work.part(0, sampleSize), sampleSize / 2 + gap);
    const double high = work[sampleSize / 2 + gap];
    SelectKth(work.part(0, sampleSize / 2 + gap), sampleSize / 2 - gap);
    const double low = work[sampleSize / 2 - gap];

    int32_t below = 0;
    int32_t inside = 0;
    int32_t negativeZeros = 0;
    for (int32_t i = 0; i < n; ++i) {
        const double value = x[i];
        // Always stored and only sometimes kept, to avoid a branch. At most all n are inside, so
        // the last place is written by the last element at the latest.
        work[inside] = value;
        below += value < low;
        inside += (value >= low) & (value <= high);
    }
    if (below >= k || k - below >= inside)
        return false;
    if (low <= 0.0 && 0.0 <= high)
        for (int32_t i = 0; i < inside; ++i)
            negativeZeros += work[i] == 0.0 && std::signbit(work[i]);
    *middle = low == high ? Middle{low, low} : SelectPair(work.part(0, inside), k - below);
    return middle->upper != 0.0 || negativeZeros == 0;
}

// For elements that rise up to index `fall` and fall from there on: binary search for how many of
// the k smallest are at the left end; the others are at the right end.
Middle MiddleOfRiseAndFall(ConstRealVector x, std::ptrdiff_t fall) {
    const std::ptrdiff_t n = x.size(), k = n / 2;
    std::ptrdiff_t left = std::max<std::ptrdiff_t>(0, k - (n - fall));
    for (std::ptrdiff_t end = std::min(k, fall); left < end;) {
        const std::ptrdiff_t i = left + (end - left) / 2;
        if (x[i] < x[n - (k - i)])
            left = i + 1;
        else
            end = i;
    }
    const std::ptrdiff_t right = n - (k - left); // index of the first one at the right end
    Middle middle = {-kInfinity, kInfinity};
    if (left > 0)
        middle.lower = x[left - 1];
    if (right < n && x[right] > middle.lower)
        middle.lower = x[right];
    if (left < fall)
        middle.upper = x[left];
    if (right > fall && x[right - 1] < middle.upper)
        middle.upper = x[right - 1];
    return middle;
}

// Monotone data, and data that rise and then fall, need no selection. Returns false for other data,
// and for a zero as above.
bool ReadOff(ConstRealVector x, Middle *middle) {
    const std::ptrdiff_t n = x.size(), k = n / 2;
    if (n < 2)
        return false;
    if (IsAscending(x))
        *middle = {x[k - 1], x[k]};
    else if (IsDescending(x))
        *middle = {x[n - k], x[n - 1 - k]};
    else if (const std::ptrdiff_t fall = StartOfFall(x))
        *middle = MiddleOfRiseAndFall(x, fall);
    else
        return false;
    return middle->upper != 0.0;
}

Middle FindMiddle(ConstRealVector x, RealVector work) {
    constexpr std::ptrdiff_t worthASample = 600;
    Middle middle;
    if (ReadOff(x, &middle))
        return middle;
    if (x.size() >= worthASample && FindByBracket(x, work, &middle))
        return middle;
    Copy<ElementType::DBL>(x, work);
    return SelectPair(work, static_cast<int32_t>(x.size() / 2));
}

double MedianOf(const Middle &middle, std::ptrdiff_t n) {
    return n % 2 != 0 ? middle.upper : (middle.lower + middle.upper) * 0.5;
}

} // namespace

ErrorCode ArrayMedian(ConstRealVector x, DBL *median) {
    if (x.isEmpty())
        return ErrEmptyInput;
    if (HasNaN(x))
        return ErrNaNInData;
    RealVector work;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(work, x.size())))
        return failed;
    *median = MedianOf(FindMiddle(x, work), x.size());
    return memory.release();
}

} // namespace qx
