#include "multirate/decimation.h"

#include "multirate/samples.h"

#include <algorithm>

namespace qx {

namespace {

// start + x[0] + x[1] + ..., in this order, so that a sum continues across the end of a block.
template <ElementType Code>
typename Element<Code>::type Summed(typename Element<Code>::type start,
                                    const typename Element<Code>::type *x, int64_t count) {
    constexpr int parts = SampleParts<Code>::count;
    double sum[parts];
    for (int part = 0; part < parts; ++part)
        sum[part] = Reals<Code>(&start)[part];
    for (int64_t i = 0; i < count; ++i)
        for (int part = 0; part < parts; ++part)
            sum[part] += Reals<Code>(x + i)[part];
    for (int part = 0; part < parts; ++part)
        Reals<Code>(&start)[part] = sum[part];
    return start;
}

template <ElementType Code>
typename Element<Code>::type Divided(typename Element<Code>::type sum, int32_t count) {
    for (int part = 0; part < SampleParts<Code>::count; ++part)
        Reals<Code>(&sum)[part] /= count;
    return sum;
}

} // namespace

template <ElementType Code>
int32_t DecimateBlock(typename Element<Code>::type *x, int32_t n, int32_t factor, bool average) {
    int32_t start = 0, partialCount = 0;
    typename Element<Code>::type partialSum{};
    if (average)
        return AverageStream<Code>(x, n, factor, &start, &partialCount, &partialSum);
    return PickFromStream<Code>(x, n - n % factor, factor, &start);
}

template <ElementType Code>
int32_t PickFromStream(typename Element<Code>::type *x, int32_t n, int32_t factor, int32_t *start) {
    const int32_t count = *start < n ? (n - *start - 1) / factor + 1 : 0;
    for (int64_t j = 0; j < count; ++j)
        x[j] = x[*start + j * factor];
    *start = static_cast<int32_t>(*start + int64_t{count} * factor - n);
    return count;
}

template <ElementType Code>
int32_t AverageStream(typename Element<Code>::type *x, int32_t n, int32_t factor, int32_t *start,
                      int32_t *partialCount, typename Element<Code>::type *partialSum) {
    typedef typename Element<Code>::type T;
    if (n < 1) // there is neither input nor output, whatever partial count the caller has
        return 0;
    int32_t outputs = 0;
    int32_t used = std::min(*start, n);
    if (*partialCount > 0) {
        if (int64_t{*partialCount} + n < factor) {
            *partialSum = Summed<Code>(*partialSum, x, n);
            *partialCount += n;
            *start -= used;
            return 0;
        }
        x[outputs++] = Divided<Code>(Summed<Code>(*partialSum, x, used), factor);
    } else if (*start >= n) {
        *start -= n;
        return 0;
    }
    // The bound on outputs matters only if the caller's count does not fit its start.
    for (; n - used >= factor && outputs < n; used += factor)
        x[outputs++] = Divided<Code>(Summed<Code>(T{}, x + used, factor), factor);
    *partialCount = n - used;
    *partialSum = Summed<Code>(T{}, x + used, *partialCount);
    *start = *partialCount > 0 ? factor - *partialCount : 0;
    return outputs;
}

template <ElementType Code>
int32_t SumGroups(typename Element<Code>::type *x, int32_t n, int32_t factor,
                  typename Element<Code>::type *sum, int32_t *count) {
    int32_t outputs = 0;
    int32_t used = 0;
    // The first group lacks the samples that earlier blocks have added to the sum.
    int64_t missing = factor - Modulo(*count, factor);
    for (; n - used >= missing; missing = factor) {
        x[outputs++] = Summed<Code>(*sum, x + used, missing);
        used += static_cast<int32_t>(missing);
        *sum = {};
    }
    *sum = Summed<Code>(*sum, x + used, n - used);
    *count = static_cast<int32_t>(factor - missing + (n - used));
    return outputs;
}

#define QX_DECIMATION(Code)                                                                        \
    template int32_t DecimateBlock<Code>(Element<Code>::type *, int32_t, int32_t, bool);           \
    template int32_t PickFromStream<Code>(Element<Code>::type *, int32_t, int32_t, int32_t *);     \
    template int32_t AverageStream<Code>(Element<Code>::type *, int32_t, int32_t, int32_t *,       \
                                         int32_t *, Element<Code>::type *);                        \
    template int32_t SumGroups<Code>(Element<Code>::type *, int32_t, int32_t,                      \
                                     Element<Code>::type *, int32_t *);
QX_DECIMATION(ElementType::DBL)
QX_DECIMATION(ElementType::CDB)
#undef QX_DECIMATION

} // namespace qx
