#include "windows/constants.h"

#include "frame/export.h"
#include "qx/window_constants.h"
#include "windows/selection.h"

namespace qx {
namespace {

ErrorCode Measured(In<DBL1D> window, OutValue<WindowConstants> constants) {
    return MeasureWindowConstants(window.view(), constants.address());
}

ErrorCode ByName(int32_t n, int32_t selector, double param, OutValue<WindowConstants> constants) {
    return WindowConstantsByName(n, selector, param, constants.address());
}

} // namespace
} // namespace qx

using qx::Returned;

ErrorCode NumWinConstH(DBL1D window, WindowConstants *constants) {
    return Returned(qx::Measured, window, constants);
}

ErrorCode WinConstByNameH(int32_t n, int32_t selector, double param, WindowConstants *constants) {
    return Returned(qx::ByName, n, selector, param, constants);
}

ErrorCode WinConstByNameH_2016(int32_t n, int32_t selector, double param,
                               WindowConstants *constants) {
    const qx::DefaultArithmetic arithmetic; // for the argument, too
    return Returned(qx::ByName, n, selector, qx::PreparedWindowParam(selector, param), constants);
}
