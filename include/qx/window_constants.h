#ifndef QX_WINDOW_CONSTANTS_H
#define QX_WINDOW_CONSTANTS_H

/* The constants of windows: equivalent noise bandwidth and coherent gain. Selectors and their
   parameters are those of qx/windows.h. */

#include "qx/windows.h"

QX_BEGIN_DECLS

/** The constants of a window given as an array, computed in one pass. If the sum of the window is
    0, enbw is infinite, or NaN if all values are 0. It is also infinite or NaN if a sum leaves the
    range of double.
    Codes: ErrEmptyInput (window is empty). Both constants are then NaN.
    NaN: window in all results. */
QX_API ErrorCode NumWinConstH(QX_IN DBL1D window, QX_OUT WindowConstants *constants);
/** The constants of a named window of n samples. selector: as SymmWinH. For selectors up to 11 they
    are stored values. For the others they are computed from the whole window, in 8 n bytes of
    scratch memory and time proportional to n or, for selector 61, to n log n. The parameter is used
    as is; that of selector 61 is a linear ratio. With code 0 the constants are NaN if the window is
    NaN (a parameter out of its range), and enbw is NaN for the triangle of a single sample, which
    is 0.
    Codes: ErrEmptyInput (n is below 1), ErrOutOfMemory (no scratch memory or no plan),
    ErrInvalidSelector (any other selector). Both constants are then NaN.
    NaN: param in all results or in no result. */
QX_API ErrorCode WinConstByNameH(int32_t n, int32_t selector, double param,
                                 QX_OUT WindowConstants *constants);
/** As WinConstByNameH, with the parameter as in AllWinH: NaN, or a negative value for selectors 61
    and 62, selects the default, and that of selector 61 is in decibels.
    Codes: ErrEmptyInput (n is below 1), ErrOutOfMemory (no scratch memory or no plan),
    ErrInvalidSelector (any other selector). Both constants are then NaN.
    NaN: param in no result. */
QX_API ErrorCode WinConstByNameH_2016(int32_t n, int32_t selector, double param,
                                      QX_OUT WindowConstants *constants);

QX_END_DECLS

#endif
