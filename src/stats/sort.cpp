#include "stats/sort.h"

#include "frame/elements.h"

#include <algorithm>
#include <bit>
#include <cstdint>
#include <utility>

namespace qx {

namespace {

constexpr std::ptrdiff_t insertionLimit = 20;

void InsertionSort(DBL *a, std::ptrdiff_t n) {
    for (std::ptrdiff_t i = 1; i < n; ++i) {
        const double value = a[i];
        std::ptrdiff_t j = i;
        for (; j > 0 && value < a[j - 1]; --j)
            a[j] = a[j - 1];
        a[j] = value;
    }
}

void SiftDown(DBL *a, std::ptrdiff_t root, std::ptrdiff_t n) {
    const double value = a[root];
    for (std::ptrdiff_t child = 2 * root + 1; child < n; child = 2 * root + 1) {
        if (child + 1 < n && a[child] < a[child + 1])
            ++child;
        if (!(value < a[child]))
            break;
        a[root] = a[child];
        root = child;
    }
    a[root] = value;
}

// Moves the pivot to a[0]: the median of three or, for a long range, of three medians of three,
// evenly spaced over the range, so that neither rising and falling data nor long runs mislead it.
void ChoosePivot(DBL *a, std::ptrdiff_t n) {
    const auto median = [a](std::ptrdiff_t i, std::ptrdiff_t j, std::ptrdiff_t k) {
        OrderPair(&a[i], &a[j]);
        OrderPair(&a[j], &a[k]);
        OrderPair(&a[i], &a[j]);
    };
    if (n > 128) {
        const std::ptrdiff_t step = n / 10;
        median(step, 2 * step, 3 * step);
        median(4 * step, 5 * step, 6 * step);
        median(7 * step, 8 * step, 9 * step);
        median(2 * step, 5 * step, 8 * step);
        Swap(&a[0], &a[5 * step]);
    } else {
        median(n / 2, 0, n - 1);
    }
}

// Partitions a[1..n-1] by the pivot in a[0] and puts the pivot between the parts; returns its
// index. Elements on the wrong side are recorded block by block, without a branch that depends on
// the data, and exchanged in bulk.
std::ptrdiff_t Partition(DBL *a, std::ptrdiff_t n) {
    constexpr std::ptrdiff_t block = 64;
    const double pivot = a[0];
    unsigned char leftPlaces[block];
    unsigned char rightPlaces[block];
    std::ptrdiff_t leftCount = 0, rightCount = 0, leftUsed = 0, rightUsed = 0;
    DBL *left = a + 1;  // all elements before it are smaller than the pivot
    DBL *right = a + n; // no element from it on is smaller

    while (right - left > 2 * block) {
        if (leftCount == 0) {
            leftUsed = 0;
            for (std::ptrdiff_t i = 0; i < block; ++i) {
                leftPlaces[leftCount] = static_cast<unsigned char>(i);
                leftCount += !(left[i] < pivot);
            }
        }
        if (rightCount == 0) {
            rightUsed = 0;
            for (std::ptrdiff_t i = 0; i < block; ++i) {
                rightPlaces[rightCount] = static_cast<unsigned char>(i);
                rightCount += !(pivot < right[-1 - i]);
            }
        }
        const std::ptrdiff_t exchanges = std::min(leftCount, rightCount);
        for (std::ptrdiff_t i = 0; i < exchanges; ++i)
            Swap(&left[leftPlaces[leftUsed + i]], &right[-1 - rightPlaces[rightUsed + i]]);
        leftCount -= exchanges;
        rightCount -= exchanges;
        leftUsed += exchanges;
        rightUsed += exchanges;
        if (leftCount == 0)
            left += block;
        if (rightCount == 0)
            right -= block;
    }

    // At most two blocks are left, one of which may be half done: use the plain scheme.
    while (true) {
        while (left < right && *left < pivot)
            ++left;
        while (left < right && pivot < right[-1])
            --right;
        if (right - left < 2)
            break;
        Swap(left++, --right);
    }
    if (left < right && !(pivot < *left))
        ++left; // equal to the pivot, which may be on either side
    Swap(a, left - 1);
    return left - 1 - a;
}

void Sort(DBL *a, std::ptrdiff_t n, int badPivotsAllowed) {
    while (n > insertionLimit) {
        if (badPivotsAllowed == 0) {
            HeapSort({a, n});
            return;
        }
        ChoosePivot(a, n);
        const std::ptrdiff_t place = Partition(a, n);
        const std::ptrdiff_t behind = n - place - 1;
        if (std::min(place, behind) < n / 8)
            --badPivotsAllowed;
        // Recursion for the shorter part, so that the stack stays small.
        if (place < behind) {
            Sort(a, place, badPivotsAllowed);
            a += place + 1;
            n = behind;
        } else {
            Sort(a + place + 1, behind, badPivotsAllowed);
            n = place;
        }
    }
    InsertionSort(a, n);
}

} // namespace

void HeapSort(RealVector elements) {
    DBL *const a = elements.data();
    const std::ptrdiff_t n = elements.size();
    for (std::ptrdiff_t root = n / 2; root-- > 0;)
        SiftDown(a, root, n);
    for (std::ptrdiff_t last = n; --last > 0;) {
        Swap(&a[0], &a[last]);
        SiftDown(a, 0, last);
    }
}

void SortRange(RealVector a) {
    Sort(a.data(), a.size(), std::bit_width(static_cast<uint64_t>(a.size())));
}

bool IsAscending(ConstRealVector a) {
    for (std::ptrdiff_t i = 1; i < a.size(); ++i)
        if (!(a[i - 1] <= a[i]))
            return false;
    return a.size() > 1 || a[0] == a[0];
}

bool IsDescending(ConstRealVector a) {
    for (std::ptrdiff_t i = 1; i < a.size(); ++i)
        if (!(a[i - 1] >= a[i]))
            return false;
    return a.size() > 1 || a[0] == a[0];
}

std::ptrdiff_t StartOfFall(ConstRealVector a) {
    constexpr std::ptrdiff_t shortest = 4; // a rise that random data hardly ever have
    std::ptrdiff_t start = 1;
    while (start < a.size() && a[start - 1] <= a[start])
        ++start;
    if (start < shortest)
        return 0;
    std::ptrdiff_t i = start;
    while (i < a.size() && a[i - 1] >= a[i])
        ++i;
    return i == a.size() ? start : 0;
}

// From the ends inward and from the peak outward in the same loop, because each choice waits for
// the previous one.
void MergeRiseAndFall(ConstRealVector a, std::ptrdiff_t fall, RealVector out) {
    QX_EXPECTS(out.size() == a.size());
    const std::ptrdiff_t n = a.size();
    std::ptrdiff_t first = 0, last = n - 1; // bounds of the elements not taken yet
    // The largest remaining elements on either side of the peak; -1 or n if there is none.
    std::ptrdiff_t rising = fall - 1, falling = fall;
    for (std::ptrdiff_t i = 0; i < n / 2; ++i) {
        const double small = a[first], other = a[last];
        const bool isFirst = small <= other;
        out[i] = isFirst ? small : other;
        first += isFirst;
        last -= !isFirst;
        const bool isRising = falling == n || (rising >= 0 && a[rising] > a[falling]);
        out[n - 1 - i] = a[isRising ? rising : falling];
        rising -= isRising;
        falling += !isRising;
    }
    if (n % 2 != 0)
        out[n / 2] = a[first] <= a[last] ? a[first] : a[last];
}

} // namespace qx
