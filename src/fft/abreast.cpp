#include "fft/abreast.h"

#include <algorithm>

namespace qx {

using std::ptrdiff_t;

namespace {

// Blocks up to this size are for as many columns as possible; longer columns, for half as many.
constexpr int32_t longestWide = 512;

AbreastLeaf WholeLeaf(const FFTPlan &plan) {
    if (plan.factorCount == 1 && plan.kinds[0] == KernelFactor)
        return plan.stages[0]->passes.abreastLeaf;
    return plan.whole.abreast;
}

} // namespace

bool ColumnsAbreast::suit(const FFTPlan &plan) {
    return plan.factorCount > 0 && std::all_of(plan.kinds, plan.kinds + plan.factorCount,
                                               [](int32_t kind) { return kind == KernelFactor; });
}

ErrorCode ColumnsAbreast::prepare(const FFTPlan &plan, int32_t cols) {
    constexpr int32_t filled = 4; // columns fill the lanes of every width
    plan_ = &plan;
    whole_ = WholeLeaf(plan);
    atOnce_ = plan.length <= longestWide ? mostAbreast : mostAbreast / 2;
    m_ = whole_ != nullptr ? plan.length : plan.length / plan.factors[0];
    rows_.pitch = 2 * atOnce_;
    // The spare line keeps the rows that a stage combines from mapping to one set of the cache.
    rows_.leg = m_ * rows_.pitch + lineValues;
    const int64_t values = plan.length / m_ * rows_.leg + lineValues;
    const bool hasSpareLanes = cols % filled != 0; // never written, but calculated with
    if (const ErrorCode failed =
            hasSpareLanes ? memory_.allocateCleared(values) : memory_.allocate(values))
        return failed;
    const auto address = reinterpret_cast<std::uintptr_t>(memory_.data());
    blocks_ = reinterpret_cast<DBL *>((address + 63) / 64 * 64);
    return 0;
}

// Transforms of n rows from `level` on, with the results in neighbouring rows from `out` on.
void ColumnsAbreast::blocksOf(int32_t level, int32_t n, const DBL *in, ptrdiff_t inPitch, DBL *out,
                              int32_t columns) const {
    const FFTStage &stage = *plan_->stages[level];
    if (level == plan_->factorCount - 1)
        return stage.passes.abreastLeaf(in, inPitch, out, rows_.pitch, columns);
    const int32_t p = plan_->factors[level];
    const int32_t m = n / p;
    const BlockRows rows{rows_.pitch, m * rows_.pitch};
    for (ptrdiff_t j = 0; j < p; ++j)
        blocksOf(level + 1, m, in + j * inPitch, p * inPitch, out + j * rows.leg, columns);
    stage.passes.abreastTwiddle(out, rows, out, rows, stage, m, columns);
}

void ColumnsAbreast::topBlocks(const DBL *in, ptrdiff_t inPitch, int32_t columns) const {
    const int32_t p = plan_->factors[0];
    for (ptrdiff_t j = 0; j < p; ++j)
        blocksOf(1, m_, in + j * inPitch, p * inPitch, blocks_ + j * rows_.leg, columns);
}

void ColumnsAbreast::transform(const DBL *in, ptrdiff_t inPitch, DBL *out, ptrdiff_t outPitch,
                               int32_t columns) const {
    if (whole_ != nullptr)
        return whole_(in, inPitch, out, outPitch, columns);
    topBlocks(in, inPitch, columns);
    const FFTStage &stage = *plan_->stages[0];
    stage.passes.abreastTwiddle(blocks_, rows_, out, {outPitch, m_ * outPitch}, stage, m_, columns);
}

void ColumnsAbreast::transform(const DBL *in, ptrdiff_t inPitch, int32_t columns) const {
    if (whole_ != nullptr)
        return whole_(in, inPitch, blocks_, rows_.pitch, columns);
    topBlocks(in, inPitch, columns);
    const FFTStage &stage = *plan_->stages[0];
    stage.passes.abreastTwiddle(blocks_, rows_, blocks_, rows_, stage, m_, columns);
}

} // namespace qx
