#include "stats/order.h"

#include "frame/constants.h"
#include "frame/elements.h"
#include "stats/sort.h"

#include <cmath>
#include <cstring>

namespace qx {

// Median-of-three partition selection. The two scans need no bounds check: the downward scan is
// stopped by the pivot itself, the upward scan by the element at r, which is not smaller than the
// pivot, or is NaN.
void SelectKth(RealVector elements, int32_t k) {
    DBL *const a = elements.data();
    const auto n = static_cast<int32_t>(elements.size());
    int32_t l = 0;
    int32_t r = n - 1;
    // Pivots that hardly shorten the range would make the work quadratic, and data that cause this
    // can be constructed. After a few times n steps the rest is sorted instead; the element of rank
    // k is the same.
    int64_t workLeft = int64_t{16} * n + 64;
    while (r > l + 1) {
        workLeft -= r - l;
        if (workLeft < 0) {
            HeapSort(elements.part(l, std::ptrdiff_t{r} - l + 1));
            return;
        }
        const int32_t mid = l + (r - l) / 2;
        Swap(&a[mid], &a[l + 1]);
        OrderPair(&a[l], &a[r]);
        OrderPair(&a[l + 1], &a[r]);
        OrderPair(&a[l], &a[l + 1]);
        const double pivot = a[l + 1];
        int32_t i = l + 1;
        int32_t j = r;
        while (true) {
            while (a[++i] < pivot) {
            }
            while (a[--j] > pivot) {
            }
            if (j < i)
                break;
            Swap(&a[i], &a[j]);
        }
        a[l + 1] = a[j];
        a[j] = pivot;
        if (j >= k)
            r = j - 1;
        if (j <= k)
            l = i;
    }
    if (r == l + 1 && a[r] < a[l])
        Swap(&a[l], &a[r]);
}

ErrorCode ArrayMaxMin(ConstRealVector x, Extremes *found) {
    const auto n = static_cast<int32_t>(x.size());
    if (n < 1)
        return ErrEmptyInput;
    int32_t first = 0;
    while (first < n && std::isnan(x[first]))
        ++first;
    if (first == n) {
        *found = {kNaN, kNaN, -1, -1};
        return 0;
    }
    int32_t highest = first;
    int32_t lowest = first;
    for (int32_t i = first + 1; i < n; ++i) {
        if (x[i] > x[highest])
            highest = i;
        else if (x[i] < x[lowest])
            lowest = i;
    }
    *found = {x[highest], x[lowest], highest, lowest};
    return 0;
}

namespace {
// Zeros of different signs are equal, and the sort determines their order.
bool HasNegativeZero(ConstRealVector ascending) {
    std::ptrdiff_t i = 0, end = ascending.size();
    while (i < end) { // up to the first element that is not below 0
        const std::ptrdiff_t middle = i + (end - i) / 2;
        if (ascending[middle] < 0.0)
            i = middle + 1;
        else
            end = middle;
    }
    for (; i < ascending.size() && ascending[i] == 0.0; ++i)
        if (std::signbit(ascending[i]))
            return true;
    return false;
}
} // namespace

void SortNaNsFirst(ConstRealVector x, SortOrder order, RealVector out) {
    const std::ptrdiff_t n = x.size();
    QX_EXPECTS(out.size() == n);
    if (n < 1)
        return;
    const bool isAscending = IsAscending(x);
    const bool isDescending = !isAscending && IsDescending(x);
    DBL *const a = out.data();
    constexpr std::ptrdiff_t worthALook = 24; // shorter arrays are sorted as fast
    const bool looks = n >= worthALook && a != x.data() && !isAscending && !isDescending;
    if (const std::ptrdiff_t fall = looks ? StartOfFall(x) : 0) {
        MergeRiseAndFall(x, fall, out);
        if (!HasNegativeZero(out)) {
            if (order == SortOrder::Descending)
                Reverse(a, n);
            return;
        }
    }
    if (a != x.data())
        std::memcpy(a, x.data(), static_cast<std::size_t>(n) * sizeof(DBL));
    std::ptrdiff_t first = 0; // index of the first element that is not NaN
    if (!isAscending && !isDescending) {
        for (std::ptrdiff_t i = 0; i < n; ++i)
            if (std::isnan(a[i]))
                Swap(&a[i], &a[first++]);
        SortRange(out.part(first, n - first));
    }
    if (isDescending != (order == SortOrder::Descending))
        Reverse(a + first, n - first);
}

} // namespace qx
