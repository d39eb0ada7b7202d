#ifndef QX_WINDOW_CONSTANTS_H
#define QX_WINDOW_CONSTANTS_H

/* The constants of windows: equivalent noise bandwidth and coherent gain. Selectors and their
   parameters are those of qx/windows.h. */

#include "qx/windows.h"

QX_BEGIN_DECLS

/** The constants of the window held in an array, measured in one pass. A window whose sum is 0 has
    an enbw that is infinite, or NaN where all of it is 0; so has one whose sums leave the range of
    double.
    Codes: ErrEmptyInput (window is empty). Both constants are then NaN.
    NaN: window in no result. */
QX_API ErrorCode NumWinConstH(QX_IN DBL1D window, QX_OUT WindowConstants *constants);
/** The constants of a named window of n samples. selector: as SymmWinH. For selectors up to 11 they
    are stored values, for the others measured ones, over the whole window in 8 n bytes of scratch
    memory: in time that grows with n, for selector 61 with n log n. The parameter is used as it
    stands; that of selector 61 is a linear ratio. With code 0 constants are NaN where the window is
    (a parameter out of its range), and enbw for the triangle of a single sample, which is 0.
    Codes: ErrEmptyInput (n is below 1), ErrOutOfMemory (no scratch memory or no plan),
    ErrInvalidSelector (another selector). Both constants are then NaN.
    NaN: param in no result. */
QX_API ErrorCode WinConstByNameH(int32_t n, int32_t selector, double param,
                                 QX_OUT WindowConstants *constants);
/** As WinConstByNameH, with the parameter taken as AllWinH takes it: a NaN, for selectors 61 and 62
    also a negative value, means the default, and that of selector 61 is in decibels.
    Codes: ErrEmptyInput (n is below 1), ErrOutOfMemory (no scratch memory or no plan),
    ErrInvalidSelector (another selector). Both constants are then NaN. */
QX_API ErrorCode WinConstByNameH_2016(int32_t n, int32_t selector, double param,
                                      QX_OUT WindowConstants *constants);

QX_END_DECLS

#endif
