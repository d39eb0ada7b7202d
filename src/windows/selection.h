#ifndef QX_WINDOWS_SELECTION_H
#define QX_WINDOWS_SELECTION_H

#include "frame/scratch.h"
#include "qx/windows.h"
#include "windows/cosine_sum.h"

namespace qx {

// A window by its selector, see qx/windows.h for the table.

// The parameter, or the window's own default where it is NaN (for selectors 61 and 62 also where
// it is negative); 0 for windows without a parameter.
double WindowDefaultParam(int32_t selector, double param);

// The parameter as the window's routine takes it: the default filled in, and decibels turned
// into a ratio for Dolph-Chebyshev.
double PreparedWindowParam(int32_t selector, double param);

// The symmetric form: the mirror of sample i is n - 1 - i. ErrEmptyInput, ErrInvalidSelector.
template <class Signal>
ErrorCode ApplySymmetricWindow(int32_t selector, Signal x, int32_t n, double param);

// The periodic form divided by its coherent gain. `constants` are those of the window before
// the division. ErrNegativeDimension, ErrInvalidSelector.
template <class Signal>
ErrorCode ApplyScaledWindow(Signal x, int32_t n, int32_t selector, double param,
                            WindowConstants *constants);

// Any window in any form. ErrInvalidSelector for a form that does not exist, then the codes of
// the window.
template <class Signal>
ErrorCode ApplyWindowBySelector(Signal x, int32_t n, int32_t selector, double param, int32_t scaled,
                                int32_t symmetric);

// The periodic, unscaled window of selectors 30 to 34 and 60 to 62 in scratch memory, for
// measuring it. ErrInvalidSelector.
ErrorCode GenerateForMeasurement(int32_t n, int32_t selector, double param,
                                 Scratch<ElementType::DBL> &window);

} // namespace qx

#endif
