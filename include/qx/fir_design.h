#ifndef QX_FIR_DESIGN_H
#define QX_FIR_DESIGN_H

/* Design of FIR filters with linear phase: truncated ideal responses, equiripple filters, and
   two-stage filters for narrow bands. Frequencies are in the unit of the sampling rate fs. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** The ideal lowpass (*type 0) or highpass (1) with the cut-off fl, or bandpass (2) or bandstop (3)
    between fl and fh, truncated to *taps taps without a window. For the lowpass, h[i] = sin(w (i -
    c)) / (pi (i - c)) with w = 2 pi fl / fs and c = (taps - 1) / 2. Lowpass and highpass ignore fh.
    A type below 0 is taken as 0, a type above 3 as 3, and *type receives the type used.
    Codes: ErrOrderNotPositive (taps is below 1), ErrOutOfMemory (the host refuses h; its status is
    the function result), ErrAboveNyquist (fl or fh is above half the sampling rate), ErrBadCutoff
    (a frequency is not above 0, or fl is not below fh), ErrBadTapCount (an even number of taps for
    a highpass or a bandstop, whose gain at half the sampling rate is then 0).
    NaN: fs, fl in all results; fh in all results or in no result. */
QX_API int32_t FIRCoefs(QX_IN const double *fs, QX_IN const double *fl, QX_IN const double *fh,
                        QX_IN const int32_t *taps, QX_OUT DBL1D h, QX_INOUT int32_t *type,
                        QX_OUT ErrorCode *err);

#pragma pack(push, 1)
/* One band of Parks: the desired value between two edges, and the weight of a deviation from it. */
typedef struct RemezBand {
    DBL desired; /* a gain, or the slope of a differentiator: gain by cycles per sample */
    DBL fLow;
    DBL fHigh;
    DBL weight; /* in a differentiator divided by the frequency if the slope is not 0 */
} RemezBand;
#pragma pack(pop)

/* An array of RemezBand: a one-dimensional block of records. */
typedef QX_ARRAY_1D(RemezBand) RemezBand1D;

/** Designs an equiripple filter of n taps: the one with the smallest maximum of the weighted
    deviation on a grid over the bands; *ripple is that maximum. The grid has 16 points for each
    extremum. Between grid points the deviation is larger: in 4549 random designs of up to 99 taps,
    by less than 4 % in 99 of 100 lowpass and bandpass filters, 12 % in 99 of 100 differentiators
    and 15 % in 9 of 10 Hilbert transformers; the maximum was 30 %, with 9 taps. Over a band
    narrower than 1 / (16 n) of the sampling rate, of which only the edges are on the grid, it may
    be many times larger. If the bands leave much of the frequency axis free, above all in a Hilbert
    transformer that ends far below fs / 2, taps may be large and cancel: in one of 100 designs they
    were (up to 1e20), and the response was lost in their rounding errors although *ripple was
    small. Therefore check the largest tap. type: 0 a filter with symmetric taps and bands from 0 to
    fs / 2; 1 a differentiator; 2 a Hilbert transformer, both with antisymmetric taps, h[n - 1 - i]
    = -h[i]. The bands of a differentiator begin at 0, those of a Hilbert transformer above 0; both
    end at fs / 2 for even n and below fs / 2 for odd n. A *maxIterations not above 0 means 100; the
    time of an iteration is proportional to n^2. If the iteration limit is reached, *ripple is the
    last deviation; after any other failure it is NaN. After McClellan, Parks and Rabiner, "A
    computer program for designing optimum FIR linear phase digital filters", 1973.
    Codes: ErrBadDesignField (a number that is not finite, n below 3, no such type, a first or last
    edge that does not suit the type, a weight that vanishes in double when it is multiplied for the
    symmetry of the taps, or an exchange in which two extrema coincide, the deviation decreases or
    the limit of the iterations is reached), ErrOrderNotPositive (n is below 1), ErrBadCutoff (no
    band, fs or a weight is not above 0, an edge or a desired value is negative, or the edges do not
    ascend), ErrOutOfMemory (the host refuses h, whose status is then the function result; or no
    memory or more than about 4090 taps, in which case the function result is 2), ErrAboveNyquist
    (the last edge is above fs / 2), ErrBadTapCount (an even n with a gain at fs / 2).
    NaN: fs refused with ErrBadDesignField. */
QX_API int32_t Parks(QX_IN const int32_t *n, QX_IN const double *fs, QX_IN RemezBand1D bands,
                     QX_IN const int32_t *type, QX_OUT DBL1D h, QX_OUT double *ripple,
                     QX_IN const int32_t *maxIterations, QX_OUT ErrorCode *err);

/* A filter for a narrow band: a model filter with M - 1 zeros between its taps, followed by an
   interpolator; if M is 1, the model alone. */
typedef struct NarrowFIRDesign {
    int32_t kind; /* 0 lowpass, 1 highpass, 2 bandpass, 3 bandstop; 4 and 5 lowpass and highpass as
                     the signal minus another filter, as for a bandstop */
    int32_t M;
    DBL1D model;
    DBL1D interpolator;
} NarrowFIRDesign;

/** Designs a filter for a narrow band, whose response stays within passRipple (linear) of 1 in the
    pass band and is attenuated by at least stopAttenuation (dB) in the stop band. type: 0 lowpass;
    1 highpass, both with the edges fPass and fStop; 2 bandpass; 3 bandstop, both with the widths
    fPass and fStop about fCenter. M is chosen for the smallest estimated number of taps; each stage
    is then lengthened until it has half the ripple. A failure empties the arrays and sets M to 0.
    Codes: ErrBadDesignField (no such type, edges out of order, a ripple not above 0, or one so
    large that fewer than 3 taps suffice), ErrBadCutoff (a band around fCenter that is not between 0
    and fs / 2), ErrAboveNyquist (fs is around 1e-322, so small that half of it is rounded up),
    ErrOutOfMemory (no memory, a stage of more than about 4090 taps, or the host refuses an array;
    its status is the function result).
    NaN: fs, fPass, fStop, passRipple, stopAttenuation refused with ErrBadDesignField; fCenter
    refused with ErrBadDesignField or in no result. */
QX_API int32_t FIRNarrowCoef_head(QX_IN const double *fs, QX_IN const double *fPass,
                                  QX_IN const double *fStop, QX_IN const double *fCenter,
                                  QX_IN const double *passRipple,
                                  QX_IN const double *stopAttenuation, QX_IN const int32_t *type,
                                  QX_INOUT NarrowFIRDesign *design, QX_OUT ErrorCode *err);

/** Filters x by a filter of FIRNarrowCoef_head. y is the full convolution, with size of x + (size
    of model - 1) M + size of interpolator - 1 values, or size of x + size of model - 1 for M below
    2; the delay is half of the number of added values. Memory and time grow with the size of y, and
    so with M, however short x is.
    Codes: ErrEmptyInput (x is empty, which leaves y unchanged; or the model or, for M above 1, the
    interpolator is empty), ErrOutOfMemory (the host refuses y; its status is the function result;
    or no memory).
    NaN: x, design.model in some results; design.interpolator in some results or in no result. */
QX_API int32_t FIRnarrowFilter_head(QX_IN DBL1D x, QX_IN const NarrowFIRDesign *design,
                                    QX_OUT DBL1D y, QX_OUT ErrorCode *err);
/** As FIRnarrowFilter_head, for a complex signal, whose real and imaginary parts are filtered
    separately. */
QX_API int32_t CxSigFIRnarrowFilter_head(QX_IN CDB1D x, QX_IN const NarrowFIRDesign *design,
                                         QX_OUT CDB1D y, QX_OUT ErrorCode *err);

QX_END_DECLS

#endif
