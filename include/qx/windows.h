#ifndef QX_WINDOWS_H
#define QX_WINDOWS_H

/* Windows. Every export multiplies the array x by a window in place; pass an array of ones to
   obtain the window itself. In a complex array the same real value multiplies both parts of a
   sample.

   Unless stated otherwise the form is periodic: the denominator in the formula is n, the number of
   samples, the first sample is the edge of the window, and sample i mirrors sample n - i. In the
   symmetric form sample i mirrors sample n - 1 - i.

   Windows and their parameters by selector:

       0 rectangle                       30 triangle
       1 Hanning                         31 Bartlett-Hanning
       2 Hamming                         32 Bohman
       3 Blackman-Harris, three terms    33 Parzen
       4 exact Blackman                  34 Welch
       5 Blackman                        60 Kaiser: beta, default 0
       6 flat top, five terms            61 Dolph-Chebyshev: main lobe to side lobes, default 60 dB
       7 Blackman-Harris, four terms     62 Gaussian: sigma, default 0.2
       8 Blackman-Harris, seven terms    64 force: per cent, default 50
       9 low sidelobe, five terms        65 exponential: final value, default 0.1
      11 Blackman-Nuttall, four terms    12 cosine tapered: taper ratio, default 0.2

   F. J. Harris, "On the use of windows for harmonic analysis with the discrete Fourier
   transform", 1978, defines most of them.

   If a parameter is so extreme that a step of the formula leaves the range of double, the result is
   NaN with code 0, in every export that computes the window. The limits are stated with each window
   below.

   Any failure empties the array. */

#include "qx/types.h"

QX_BEGIN_DECLS

#pragma pack(push, 1)
/* The constants of a window w of n values. */
typedef struct WindowConstants {
    DBL enbw; /* equivalent noise bandwidth in bins, n sum(w^2) / sum(w)^2 */
    DBL cg;   /* coherent gain, sum(w) / n */
} WindowConstants;
#pragma pack(pop)

/** Kaiser window: I0(beta sqrt(1 - u^2)) / I0(beta) with u = 1 - 2i/n. The Bessel series is
    truncated after 25 terms, which is inaccurate for large beta: the error of the window is 6e-10
    at beta 20, 4e-7 at 25, 3e-5 at 30 and 0.03 at 50. If |beta| is about 3e7 or more (1e7 is still
    safe), the sum is infinite and values are NaN. J. F. Kaiser, "Nonrecursive digital filter design
    using the I0-sinh window function", 1974.
    Codes: ErrEmptyInput (x is empty).
    NaN: x, beta in some results. */
QX_API ErrorCode KaiserH(QX_INOUT DBL1D x, double beta);
/** As KaiserH, for complex samples. */
QX_API ErrorCode CxKaiserH(QX_INOUT CDB1D x, double beta);

/** Dolph-Chebyshev window with side lobes `ratio` (linear) below the main lobe and a peak of 1;
    symmetric if `symmetric` is non-zero, otherwise periodic. C. L. Dolph, "A current distribution
    for broadside arrays which optimizes the relationship between beam width and side-lobe level",
    1946.
    Codes: ErrEmptyInput (x is empty), ErrOutOfMemory (no scratch memory or no plan). A ratio below
    1, or one above 1.3e154 (3082 dB), whose square overflows, gives NaN.
    NaN: x in some results; ratio in all results. */
QX_API ErrorCode DolChebyWinH(QX_INOUT DBL1D x, double ratio, int32_t symmetric);
/** As DolChebyWinH, for complex samples. */
QX_API ErrorCode CxDolChebyWinH(QX_INOUT CDB1D x, double ratio, int32_t symmetric);

/** Gaussian window exp(-t^2 / (2 sigma^2)): t = (i - n/2) / (n + 1), or (i - (n-1)/2) / n if
    `symmetric` is non-zero. A sigma of 0 or less counts as 0.2. A sigma so small that sigma^2 n^2
    is below about 3e-309 gives zeros, and NaN at a middle sample.
    Codes: ErrEmptyInput (x is empty).
    NaN: x in some results; sigma in all results. */
QX_API ErrorCode GaussWinH(QX_INOUT DBL1D x, double sigma, int32_t symmetric);
/** As GaussWinH, for complex samples. */
QX_API ErrorCode CxGaussWinH(QX_INOUT CDB1D x, double sigma, int32_t symmetric);

/** Force window: keeps the first `percent` per cent of the samples and sets the rest to 0.
    Codes: ErrFewerThanTwo (x has fewer than 2 samples).
    NaN: x in some results or in no result; percent in no result. */
QX_API ErrorCode ForceWinH(QX_INOUT DBL1D x, double percent);
/** As ForceWinH, for complex samples. */
QX_API ErrorCode CxForceWinH(QX_INOUT CDB1D x, double percent);

/** Exponential window, from 1 at the first to `finalValue` at the last sample.
    Codes: ErrFewerThanTwo (x has fewer than 2 samples), ErrFinalValueNotPositive (the final value
    is not above 0).
    NaN: x, finalValue in some results. */
QX_API ErrorCode ExpWinH(QX_INOUT DBL1D x, double finalValue);
/** As ExpWinH, for complex samples. */
QX_API ErrorCode CxExpWinH(QX_INOUT CDB1D x, double finalValue);

/** Cosine tapered window: sin^2 tapers over `taperRatio` of the samples, half at each end, in
    symmetric form. A ratio of 1 or more gives the Hanning window, in periodic form; a ratio of 0 or
    less leaves x unchanged.
    Codes: ErrEmptyInput (x is empty), ErrOutOfMemory (no scratch memory for the Hanning window).
    NaN: x in some results or in no result; taperRatio in no result. */
QX_API ErrorCode CosTaperedH(QX_INOUT DBL1D x, double taperRatio);
/** As CosTaperedH, for complex samples. */
QX_API ErrorCode CxCosTaperedH(QX_INOUT CDB1D x, double taperRatio);

/** Triangle window 2i/n up to the middle. A single sample becomes 0.
    Codes: ErrEmptyInput (x is empty).
    NaN: x in some results or in no result. */
QX_API ErrorCode TriangleWinH(QX_INOUT DBL1D x);
/** As TriangleWinH, for complex samples. */
QX_API ErrorCode CxTriangleWinH(QX_INOUT CDB1D x);

/** Welch window 1 - ((i - n/2) / (n/2))^2.
    Codes: ErrEmptyInput (x is empty).
    NaN: x in some results. */
QX_API ErrorCode WelchWinH(QX_INOUT DBL1D x);
/** As WelchWinH, for complex samples. */
QX_API ErrorCode CxWelchWinH(QX_INOUT CDB1D x);

/** Bartlett-Hanning window 0.62 - 0.48 |i/n - 1/2| - 0.38 cos(2 pi i / n).
    Codes: ErrEmptyInput (x is empty).
    NaN: x in some results. */
QX_API ErrorCode BartHannWinH(QX_INOUT DBL1D x);
/** As BartHannWinH, for complex samples. */
QX_API ErrorCode CxBartHannWinH(QX_INOUT CDB1D x);

/** Bohman window sin(theta)/pi - (2i/n) cos(theta), theta = 2 pi i / n, up to the middle.
    Codes: ErrEmptyInput (x is empty).
    NaN: x in some results. */
QX_API ErrorCode BohmanWinH(QX_INOUT DBL1D x);
/** As BohmanWinH, for complex samples. */
QX_API ErrorCode CxBohmanWinH(QX_INOUT CDB1D x);

/** Parzen window: with t = |i - n/2| / (n/2), 1 - 6 t^2 + 6 t^3 for t up to 1/2, and 2 (1 - t)^3
    above.
    Codes: ErrEmptyInput (x is empty).
    NaN: x in some results. */
QX_API ErrorCode ParzenWinH(QX_INOUT DBL1D x);
/** As ParzenWinH, for complex samples. */
QX_API ErrorCode CxParzenWinH(QX_INOUT CDB1D x);

/** Cosine sum with the coefficients a = `coefs`: sum over k of (-1)^k a[k] cos(2 pi k i / n).
    Codes: ErrEmptyInput (x is empty, or coefs is empty and x has more than one sample),
    ErrOutOfMemory (no scratch memory).
    NaN: x in some results; coefs in all results. */
QX_API ErrorCode GenCosWinH(QX_INOUT DBL1D x, QX_IN DBL1D coefs);
/** As GenCosWinH, for complex samples. */
QX_API ErrorCode CxGenCosWinH(QX_INOUT CDB1D x, QX_IN DBL1D coefs);

/** The cosine sum of GenCosWinH divided by its coherent gain, coefs[0].
    Codes: ErrEmptyInput (x is empty, or coefs is empty and x has more than one sample),
    ErrOutOfMemory (no scratch memory).
    NaN: x in some results; coefs in all results. */
QX_API ErrorCode ScaledGenCosWinH(QX_INOUT DBL1D x, QX_IN DBL1D coefs);
/** As ScaledGenCosWinH, for complex samples. */
QX_API ErrorCode ScaledCxGenCosWinH(QX_INOUT CDB1D x, QX_IN DBL1D coefs);

/** The windows that are cosine sums; divided by the coherent gain if `scaled` is non-zero.
    selector: 0 to 9; 11.
    Codes: ErrEmptyInput (x is empty), ErrInvalidSelector (any other selector), ErrOutOfMemory (no
    scratch memory).
    NaN: x in some results. */
QX_API ErrorCode AllCosWinH(QX_INOUT DBL1D x, int32_t selector, int32_t scaled);
/** As AllCosWinH, for complex samples. */
QX_API ErrorCode CxAllCosWinH(QX_INOUT CDB1D x, int32_t selector, int32_t scaled);

/** Any window that has a symmetric form. selector: 0 to 9; 11; 30 to 34; 60 to 62. The parameter is
    used as is; that of selector 61 is a linear ratio.
    Codes: ErrEmptyInput (x is empty), ErrOutOfMemory (no scratch memory or no plan),
    ErrInvalidSelector (any other selector (unless x has a single sample)).
    NaN: x in some results; param in all results or in no result. */
QX_API ErrorCode SymmWinH(QX_INOUT DBL1D x, int32_t selector, double param);
/** As SymmWinH, for complex samples. */
QX_API ErrorCode CxSymmWinH(QX_INOUT CDB1D x, int32_t selector, double param);

/** A window divided by its coherent gain. selector: as SymmWinH. `constants` are those of the
    window before the division, NaN after a failure. For cosine sums they are stored values, and x
    may be empty. The parameter is used as is; that of selector 61 is a linear ratio.
    Codes: ErrNegativeDimension (x has a negative size; `constants` are unchanged), ErrOutOfMemory
    (no scratch memory or no plan), ErrInvalidSelector (any other selector), ErrEmptyInput (x is
    empty and the window is not a cosine sum).
    NaN: x in some results; param in all results or in no result. */
QX_API ErrorCode ScaledWinH(QX_INOUT DBL1D x, int32_t selector, double param,
                            QX_OUT WindowConstants *constants);
/** As ScaledWinH, for complex samples. */
QX_API ErrorCode CxScaledWinH(QX_INOUT CDB1D x, int32_t selector, double param,
                              QX_OUT WindowConstants *constants);

/** Any window in any form: divided by its coherent gain if `scaled` is non-zero, symmetric if
    `symmetric` is non-zero. A parameter of NaN, or a negative one for selectors 61 and 62, selects
    the default; that of selector 61 is in decibels.
    Codes: ErrInvalidSelector (both forms at the same time, or an unknown selector),
    ErrNegativeDimension (x has a negative size and `scaled` is non-zero), ErrEmptyInput (x is
    empty), ErrFewerThanTwo (force or exponential with fewer than 2 samples),
    ErrFinalValueNotPositive (exponential with a final value that is not above 0), ErrOutOfMemory
    (no scratch memory or no plan).
    NaN: x in some results; param in no result. */
QX_API ErrorCode AllWinH(QX_INOUT DBL1D x, int32_t selector, double param, int32_t scaled,
                         int32_t symmetric);
/** As AllWinH, for complex samples. */
QX_API ErrorCode CxAllWinH(QX_INOUT CDB1D x, int32_t selector, double param, int32_t scaled,
                           int32_t symmetric);

/** As KaiserH, with its code in *err; the function result is 0. */
QX_API int32_t Kaiser_Bessel(QX_INOUT DBL1D x, QX_IN const DBL *beta, QX_OUT ErrorCode *err);
/** As ForceWinH, with its code in *err; the function result is 0. */
QX_API int32_t ForceWindCIN(QX_INOUT DBL1D x, QX_IN const DBL *percent, QX_OUT ErrorCode *err);
/** As ExpWinH, with its code in *err; the function result is 0. */
QX_API int32_t ExpWindCIN(QX_INOUT DBL1D x, QX_IN const DBL *finalValue, QX_OUT ErrorCode *err);
/** As TriangleWinH, with its code in *err; the function result is 0. */
QX_API int32_t TriangleWin(QX_INOUT DBL1D x, QX_OUT ErrorCode *err);
/** As CosTaperedH, with a taper ratio of 0.2 and its code in *err; the function result is 0.
    NaN: x in some results or in no result. */
QX_API int32_t CosTapered(QX_INOUT DBL1D x, QX_OUT ErrorCode *err);

QX_END_DECLS

#endif
