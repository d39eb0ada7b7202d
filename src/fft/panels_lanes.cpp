#include "fft/panels.h"

#include "fft/kernels/columns.h"

#include <cstddef>

namespace qx::QX_WIDTH {
namespace {

// The results of the first sweep: rows of `columns` values, `inner` rows in each of `outer` blocks.
struct PanelSizes {
    explicit PanelSizes(const FFTPlan &plan)
        : outer(plan.factors[0]), inner(plan.factors[1]), rows(outer * inner),
          columns(plan.length / rows) {}
    ptrdiff_t outer, inner, rows, columns;
};

// Asks for the lines of `rows` runs of `width` values before they are read, or written if Written is 1: the
// rows are pages apart, where the processor does not foresee them.
template <int Written>
QX_INLINE void Foretell(const DBL *at, ptrdiff_t pitch, int width, ptrdiff_t rows) {
    for (ptrdiff_t row = 0; row < rows; ++row)
        for (int i = 0; i < width; i += lineValues)
            __builtin_prefetch(at + row * pitch + i, Written, 2);
}

// Column 0 holds real values in the blocks of both levels.
void RealFirstColumn(const FFTPlan &plan, DBL *out, DBL *values) {
    const PanelSizes sizes(plan);
    for (ptrdiff_t block = 0; block < sizes.outer; ++block)
        plan.realLeaf[1](out + block * sizes.inner * sizes.columns, values + block * sizes.inner,
                         sizes.columns, 1, 1);
    // Its rows are the columns of a stage with some of the twiddles.
    const ptrdiff_t pitch = sizes.outer - 1;
    DBL *const cosines = values + sizes.rows;
    DBL *const sines = cosines + sizes.rows;
    const FFTStage &stage = *plan.stages[0];
    for (ptrdiff_t row = 1; 2 * row < sizes.inner; ++row) {
        const ptrdiff_t from = (row * sizes.columns - 1) * pitch;
        for (ptrdiff_t j = 0; j < pitch; ++j) {
            cosines[(row - 1) * pitch + j] = stage.twiddleCos[from + j];
            sines[(row - 1) * pitch + j] = stage.twiddleSin[from + j];
        }
    }
    plan.realTwiddle[0](values, cosines, sines, 1, static_cast<int32_t>(sizes.inner));
    for (ptrdiff_t row = 0; row < sizes.rows; ++row)
        out[row * sizes.columns] = values[row];
}

// The middle column of the second level in one block, which holds real values too.
class RealMiddleColumn {
public:
    RealMiddleColumn(const FFTPlan &plan, const DBL *column) {
        for (ptrdiff_t row = 0; row < plan.factors[1]; ++row) {
            values_[2 * row] = 0.0; // stands for the first column of two
            values_[2 * row + 1] = column[row * panelRow];
        }
        plan.realTwiddle[1](values_, nullptr, nullptr, 1, 2);
    }
    void copyTo(ptrdiff_t rows, DBL *column) const {
        for (ptrdiff_t row = 0; row < rows; ++row)
            column[row * panelRow] = values_[2 * row + 1];
    }

private:
    double values_[2 * 32];
};

} // namespace

void ComplexPanels(const FFTPlan &plan, DBL *out, DBL *panel) {
    constexpr ptrdiff_t columns = panelRow / 2;
    const PanelSizes sizes(plan);
    const ptrdiff_t block = plan.panelBlock;
    const FFTStage &outer = *plan.stages[0];
    const FFTStage &inner = *plan.stages[1];
    for (ptrdiff_t k = 0; k < sizes.columns; k += columns) {
        for (ptrdiff_t j = 0; j < sizes.outer; ++j) {
            DBL *const rows = panel + j * block;
            CopyRows<panelRow>(out + 2 * (j * sizes.inner * sizes.columns + k), 2 * sizes.columns,
                               rows, panelRow, plan.factors[1]);
            if (j + 1 < sizes.outer)
                Foretell<0>(out + 2 * ((j + 1) * sizes.inner * sizes.columns + k),
                            2 * sizes.columns, panelRow, sizes.inner);
            inner.passes.complexColumns(rows, panelRow, rows, panelRow, columns,
                                        inner.complexLanes + 2 * k * (sizes.inner - 1));
        }
        for (ptrdiff_t row = 0; row < sizes.inner; ++row) {
            const ptrdiff_t column = row * sizes.columns + k;
            DBL *const rows = panel + row * panelRow;
            Foretell<1>(out + 2 * column, 2 * sizes.inner * sizes.columns, panelRow, sizes.outer);
            outer.passes.complexColumns(rows, block, rows, block, columns,
                                        outer.complexLanes + 2 * column * (sizes.outer - 1));
            CopyRows<panelRow>(rows, block, out + 2 * column, 2 * sizes.inner * sizes.columns,
                               plan.factors[0]);
        }
    }
}

void RealPanels(const FFTPlan &plan, DBL *out, DBL *panel) {
    constexpr ptrdiff_t pairs = panelRow / 2;
    const PanelSizes sizes(plan);
    const ptrdiff_t block = plan.panelBlock;
    const FFTStage &outer = *plan.stages[0];
    const FFTStage &inner = *plan.stages[1];
    RealFirstColumn(plan, out, panel);
    // A row holds the columns from k upward, then those from `mirrored` upward. The middle column is the
    // last of the former and the first of the latter of the last panel.
    for (ptrdiff_t k = 1; k < sizes.columns / 2; k += pairs) {
        const ptrdiff_t mirrored = sizes.columns - (k + pairs - 1);
        for (ptrdiff_t j = 0; j < sizes.outer; ++j) {
            DBL *const rows = panel + j * block;
            const DBL *const from = out + j * sizes.inner * sizes.columns;
            CopyRows<pairs>(from + k, sizes.columns, rows, panelRow, plan.factors[1]);
            CopyRows<pairs>(from + mirrored, sizes.columns, rows + pairs, panelRow,
                            plan.factors[1]);
            const DBL *const lanes = inner.realLanes + 2 * (k - 1) * (sizes.inner - 1);
            if (mirrored != sizes.columns / 2) {
                inner.passes.realPairs(rows, rows + panelRow, panelRow, pairs, lanes);
            } else {
                const RealMiddleColumn middle(plan, rows + pairs);
                inner.passes.realPairs(rows, rows + panelRow, panelRow, pairs, lanes);
                middle.copyTo(sizes.inner, rows + pairs - 1);
                middle.copyTo(sizes.inner, rows + pairs);
            }
        }
        // In a block of the first level the mirror image of a row is the opposite row, and vice versa.
        for (ptrdiff_t row = 0; row < sizes.inner / 2; ++row) {
            const ptrdiff_t opposite = sizes.inner - 1 - row;
            DBL *const rows = panel + row * panelRow;
            DBL *const opposites = panel + opposite * panelRow;
            const DBL *const lanes = outer.realLanes + 2 * row * sizes.columns * (sizes.outer - 1);
            outer.passes.realPairs(rows, opposites + panelRow, block, pairs,
                                   lanes + 2 * (k - 1) * (sizes.outer - 1));
            outer.passes.realPairsBefore(rows + pairs, opposites + pairs, block, pairs,
                                         lanes + 2 * mirrored * (sizes.outer - 1));
            for (const ptrdiff_t r : {row, opposite}) {
                const DBL *const results = panel + r * panelRow;
                DBL *const to = out + r * sizes.columns;
                const ptrdiff_t leg = sizes.inner * sizes.columns;
                CopyRows<pairs>(results, block, to + k, leg, plan.factors[0]);
                CopyRows<pairs>(results + pairs, block, to + mirrored, leg, plan.factors[0]);
            }
        }
    }
}

} // namespace qx::QX_WIDTH
