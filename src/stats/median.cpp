#include "frame/scratch.h"
#include "stats/order.h"
#include "stats/sort.h"

#include <algorithm>
#include <cmath>
#include <cstring>

namespace qx {

namespace {

// The elements of rank n / 2 - 1 and n / 2; the lower one counts for even n only.
struct Middle {
    double lower, upper;
};

bool HasNaN(const DBL *x, int32_t n) {
    constexpr int32_t block = 256; // whole blocks take no branch per element
    int32_t i = 0;
    for (; n - i >= block; i += block) {
        int64_t count = 0;
        for (int32_t j = 0; j < block; ++j)
            count += x[i + j] != x[i + j];
        if (count != 0)
            return true;
    }
    for (; i < n; ++i)
        if (x[i] != x[i])
            return true;
    return false;
}

// Ranks k - 1 and k of a[0..n-1], k at least 1 unless n is 1.
Middle SelectPair(DBL *a, int32_t n, int32_t k) {
    SelectKth({a, n}, k);
    double lower = a[0];
    for (int32_t i = 1; i < k; ++i)
        lower = a[i] > lower ? a[i] : lower;
    return {lower, a[k]};
}

// Puts `count` elements of x at random places into the sample.
void TakeSample(const DBL *x, int32_t n, DBL *sample, int32_t count) {
    uint32_t random = 1; // linear congruences (D. Knuth, The Art of Computer Programming 2, 1981)
    for (int32_t i = 0; i < count; ++i) {
        random = random * 1664525U + 1013904223U;
        sample[i] = x[uint64_t{random} * static_cast<uint64_t>(n) >> 32];
    }
}

// Brackets the middle between two elements of a sample, so that one pass over x leaves a few
// elements to select from (R. Floyd, R. Rivest: Expected time bounds for selection, 1975). False
// where the middle lies outside the bracket, or is a zero whose sign the order decides.
bool FindByBracket(const DBL *x, int32_t n, DBL *work, Middle *middle) {
    const int32_t k = n / 2;
    int32_t sampleSize = 64;
    while (std::sqrt(double{1} * sampleSize) * sampleSize < n) // n to the power of 2/3
        sampleSize *= 2;
    TakeSample(x, n, work, sampleSize);
    // The middle is this near to that of the sample in 99 of 100 random arrays.
    const auto gap = static_cast<int32_t>(1.3 * std::sqrt(double{1} * sampleSize)) + 1;
    SelectKth({work, sampleSize}, sampleSize / 2 + gap);
    const double high = work[sampleSize / 2 + gap];
    SelectKth({work, sampleSize / 2 + gap}, sampleSize / 2 - gap);
    const double low = work[sampleSize / 2 - gap];

    int32_t below = 0;
    int32_t inside = 0;
    int32_t negativeZeros = 0;
    for (int32_t i = 0; i < n; ++i) {
        const double value = x[i];
        // Always stored and only sometimes kept: no branch. All n are inside at most, so the last
        // place is written by the last element at the latest.
        work[inside] = value;
        below += value < low;
        inside += (value >= low) & (value <= high);
    }
    if (below >= k || k - below >= inside)
        return false;
    if (low <= 0.0 && 0.0 <= high)
        for (int32_t i = 0; i < inside; ++i)
            negativeZeros += work[i] == 0.0 && std::signbit(work[i]);
    *middle = low == high ? Middle{low, low} : SelectPair(work, inside, k - below);
    return middle->upper != 0.0 || negativeZeros == 0;
}

// Monotone data need no selection; false for others, and for a zero as above.
bool ReadOff(const DBL *x, int32_t n, Middle *middle) {
    const int32_t k = n / 2;
    if (n < 2)
        return false;
    if (IsAscending({x, n}))
        *middle = {x[k - 1], x[k]};
    else if (IsDescending({x, n}))
        *middle = {x[n - k], x[n - 1 - k]};
    else
        return false;
    return middle->upper != 0.0;
}

Middle FindMiddle(const DBL *x, int32_t n, DBL *work) {
    constexpr int32_t worthASample = 600;
    Middle middle;
    if (ReadOff(x, n, &middle))
        return middle;
    if (n >= worthASample && FindByBracket(x, n, work, &middle))
        return middle;
    std::memcpy(work, x, static_cast<std::size_t>(n) * sizeof(DBL));
    return SelectPair(work, n, n / 2);
}

double MedianOf(const Middle &middle, int32_t n) {
    return n % 2 != 0 ? middle.upper : (middle.lower + middle.upper) * 0.5;
}

} // namespace

ErrorCode ArrayMedian(ConstRealVector elements, DBL *median) {
    const DBL *const x = elements.data();
    const auto n = static_cast<int32_t>(elements.size());
    if (n < 1)
        return ErrEmptyInput;
    if (HasNaN(x, n))
        return ErrNaNInData;
    Scratch<ElementType::DBL> work;
    if (const ErrorCode status = work.allocate(n))
        return status;
    *median = MedianOf(FindMiddle(x, n, work.data()), n);
    return work.release();
}

} // namespace qx
