#ifndef QX_WINDOWS_SELECTION_H
#define QX_WINDOWS_SELECTION_H

#include "qx/windows.h"
#include "windows/cosine_sum.h"

namespace qx {

// Windows by selector; qx/windows.h has the table.

// The parameter, or the window's default if it is NaN (for selectors 61 and 62 also if it is
// negative); 0 for windows without a parameter.
double WindowDefaultParam(int32_t selector, double param);

// The parameter as the window's routine takes it: the default filled in, and decibels converted to
// a ratio for Dolph-Chebyshev.
double PreparedWindowParam(int32_t selector, double param);

// The symmetric form: the mirror of sample i is n - 1 - i. ErrEmptyInput, ErrInvalidSelector.
template <ElementType E>
ErrorCode ApplySymmetricWindow(int32_t selector, VectorView<E> x, double param);

// The periodic form divided by its coherent gain. `constants` are those of the window before
// the division. ErrInvalidSelector.
template <ElementType E>
ErrorCode ApplyScaledWindow(VectorView<E> x, int32_t selector, double param,
                            WindowConstants *constants);

// Any window in any form. ErrInvalidSelector for a form that does not exist, then the codes of
// the window.
template <ElementType E>
ErrorCode ApplyWindowBySelector(VectorView<E> x, int32_t selector, double param, bool scaled,
                                bool symmetric);

// The values of the periodic, unscaled window of selectors 30 to 34 and 60 to 62, for measuring it.
// ErrInvalidSelector.
ErrorCode GenerateForMeasurement(RealVector w, int32_t selector, double param);

} // namespace qx

#endif
