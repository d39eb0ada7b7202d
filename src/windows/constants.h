#ifndef QX_WINDOWS_CONSTANTS_H
#define QX_WINDOWS_CONSTANTS_H

#include "frame/views.h"
#include "qx/errors.h"
#include "qx/windows.h"

namespace qx {

// The stored constants of a cosine sum and of selectors 31 to 34. ErrInvalidSelector for others.
ErrorCode WindowConstantsFromTable(int32_t selector, WindowConstants *constants);

// cg = sum(w) / n and enbw = n sum(w^2) / sum(w)^2, NaN for a window of zeros. ErrEmptyInput.
ErrorCode MeasureWindowConstants(ConstRealVector w, WindowConstants *constants);

// The constants of a named window of n samples: stored values for selectors 0 to 9 and 11,
// otherwise measured ones. `param` is as the window's own routine takes it. ErrEmptyInput,
// ErrInvalidSelector.
ErrorCode WindowConstantsByName(int32_t n, int32_t selector, double param,
                                WindowConstants *constants);

} // namespace qx

#endif
