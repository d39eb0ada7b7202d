#include "windows/constants.h"

#include "frame/scratch.h"
#include "windows/selection.h"

namespace qx {

ErrorCode WindowConstantsFromTable(int32_t selector, WindowConstants *constants) {
    struct Row {
        int32_t selector;
        double cg, enbw;
    };
    // Stored values, not derived from the coefficients of the windows.
    static constexpr Row table[] = {
        {0, 1.0, 1.0},
        {1, 0.5, 1.5},
        {2, 0.54, 1.362826},
        {3, 0.42323, 1.708538},
        {4, 0.42659071367, 1.693699},
        {5, 0.42, 1.726757},
        {6, 0.215578948, 3.770246506303},
        {7, 0.35875, 2.004353},
        {8, 0.27105140069342415, 2.631905},
        {9, 0.323215218, 2.215350782519},
        {11, 0.3635819, 1.9761117},
        // No export reads these: the windows are measured, so that the value depends on n.
        {31, 0.5, 1.45584787},
        {32, 0.40528473457, 1.78574087544},
        {33, 0.375, 1.91746031746},
        {34, 0.66666667, 1.2},
    };
    for (const Row &row : table)
        if (row.selector == selector) {
            *constants = {row.enbw, row.cg};
            return 0;
        }
    return ErrInvalidSelector;
}

ErrorCode MeasureWindowConstants(ConstRealVector w, WindowConstants *constants) {
    if (w.isEmpty())
        return ErrEmptyInput;
    double sum = 0.0;
    double squares = 0.0;
    for (const double value : w) {
        sum += value;
        squares += value * value;
    }
    const auto n = static_cast<double>(w.size());
    *constants = {n * squares / (sum * sum), sum / n};
    return 0;
}

ErrorCode WindowConstantsByName(int32_t n, int32_t selector, double param,
                                WindowConstants *constants) {
    if (n < 1)
        return ErrEmptyInput;
    if (CosineWindowCoefs(selector).count > 0)
        return WindowConstantsFromTable(selector, constants);

    RealVector window;
    ScratchParts memory;
    if (const ErrorCode status = memory.take(Sized(window, n)))
        return status;
    ErrorCode status = GenerateForMeasurement(window, selector, param);
    if (status == 0)
        status = MeasureWindowConstants(window, constants);
    return Merge(status, memory.release());
}

} // namespace qx
