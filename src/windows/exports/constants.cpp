#include "qx/windows.h"

#include "frame/views.h"
#include "windows/constants.h"
#include "windows/selection.h"

ErrorCode NumWinConstH(DBL1D window, WindowConstants *constants) {
    const qx::In1D<qx::ElementType::DBL> w(window);
    const ErrorCode status = qx::MeasureWindowConstants(w.data(), w.size(), constants);
    if (status != 0)
        qx::SetConstantsNaN(constants);
    return status;
}

ErrorCode WinConstByNameH(int32_t n, int32_t selector, double param, WindowConstants *constants) {
    return qx::WindowConstantsByName(n, selector, param, constants);
}

ErrorCode WinConstByNameH_2016(int32_t n, int32_t selector, double param,
                               WindowConstants *constants) {
    return qx::WindowConstantsByName(n, selector, qx::PreparedWindowParam(selector, param),
                                     constants);
}
