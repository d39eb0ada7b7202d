#ifndef QX_PEAKS_H
#define QX_PEAKS_H

/* Peaks and valleys of sampled data.

   PeakD and its revisions fit a parabola to every window of `width` samples, by least squares.
   Where the slope changes sign, the vertex of the parabola gives a location between the samples,
   the amplitude there and the second derivative. They work on a stream that is passed in blocks.
   The caller keeps a record and an array from call to call, so that a peak on the boundary of two
   blocks is found. Locations are counted from the start of the stream. */

#include "qx/types.h"

QX_BEGIN_DECLS

/* The bits of PeakDRequest.flags. */
enum QXPeakFlags {
    QXPeakFirstBlock = 1, /* starts a new stream, whatever came before */
    QXPeakLastBlock = 4   /* scans the last window too, and releases the state */
};

/* A block of a stream, what to search for in it, and the results. */
typedef struct PeakDRequest {
    DBL1D data;        /* at least `width` samples */
    double threshold;  /* peaks lie above it, valleys below */
    int32_t width;     /* samples of a window, from 3 */
    int32_t polarity;  /* 0 peaks, 1 valleys */
    DBL1D locations;   /* found: the sample numbers, with fractions */
    DBL1D amplitudes;  /* found: the values of the parabolas there */
    DBL1D derivatives; /* found: the second derivatives, per sample squared */
    int32_t count;     /* found: how many */
    uint32_t flags;    /* of QXPeakFlags */
} PeakDRequest;

/* The state of a stream; zeros at first and after its end. The pointers point into the state buffer
   as it was in the latest call; every call sets them again. */
typedef struct PeakDState {
    int32_t width;
    int32_t position;     /* windows so far: the sample number of the next window */
    int32_t historyCount; /* samples in the history, which is as long as a window */
    int32_t tailCount;    /* samples of the latest block after the history */
    int32_t slopeSign;    /* 1 if the data rose in the last window, else 0 */
    int32_t reserved;
    DBL *fitMatrix; /* 3 rows of `width`: from a window to its parabola */
    DBL *window;    /* `width` elements of working memory */
    DBL *history;   /* the last `width` samples of the stream */
    DBL *previous;  /* the 3 coefficients of the last window's parabola */
    DBL *incoming;  /* the samples of the latest block after the history */
} PeakDState;

/** Finds the runs of samples at or above *threshold that are at least *width samples long: indices
    receives the index of the first sample of each run, *count their number. NaN ends a run. The
    function result is the code, or the status of the host if it refused a resize.
    Codes: ErrWidthOutOfRange (*width is below 1, or not below the size of x, as for an empty x),
    ErrOutOfMemory (the host refused a resize).
    NaN: x by position (kept); threshold in no result. */
QX_API int32_t PeakDetector(QX_IN DBL1D x, QX_IN const double *threshold,
                            QX_IN const int32_t *width, QX_OUT I32_1D indices,
                            QX_OUT int32_t *count, QX_OUT ErrorCode *err);

/** As PeakD2014, with mode 0. A threshold of NaN gives no peaks, but may leave NaN in the working
    memory.
    NaN: request.data in some results or by position (kept); request.threshold in some results or in
    no result. */
QX_API ErrorCode PeakD(QX_INOUT PeakDRequest *request, QX_INOUT PeakDState *state,
                       QX_INOUT DBL1D *buffer, QX_OUT ErrorCode *err);
/** As PeakD2014, without a source, so that mode 2 has no data.
    NaN: request.data in some results; request.threshold in no result. */
QX_API ErrorCode PeakD2010(QX_INOUT PeakDRequest *request, QX_INOUT PeakDState *state,
                           QX_INOUT DBL1D *buffer, QX_OUT ErrorCode *err, int32_t mode);

/** The peaks or valleys of the next block of a stream. With t counted from the centre of a window
    of w samples, the parabola c0 + c1 t + c2 t^2 of every window is computed. Its vertex -c1 / (2
    c2) is taken where c1 changes sign from one window to the next; for w below 5, in every window
    whose c2 has the sign of a peak or a valley. A vertex counts if, in one of the two windows, it
    is within a quarter of the window from the centre and its amplitude is beyond the threshold. Of
    two vertices less than a sample apart, the more extreme one is kept. The division of a stream
    into blocks changes the results in one case only: if the second of two such vertices is more
    extreme and lies after a block boundary, both are reported. The last w samples of a block are
    scanned with the next block, or with the last-block flag.

    mode: 0 to 1 request->data is scanned; 2 `source` is scanned, and request->data is not used.
    Modes 1 and 2 treat flat blocks separately: if the values of the block and its history span less
    than 1e-8, their mean is subtracted (in mode 1 in the array of the caller, which remains
    changed), and every window is scaled to 1 before its parabola is fitted. Overflow is not
    checked: amplitudes and second derivatives beyond the range of double are infinite.

    *buffer is resized to 5 w + 3 elements with the first block, which needs at least w samples. The
    last block and every failure empty it and clear the state, so that the next call must start a
    new stream. The code is in *err as well.
    Codes: ErrOutOfMemory (no memory, or the host refused a resize), ErrInvalidSelector (w below 3
    or above 1073741824, or no such mode or polarity), ErrStateSizeMismatch (not the first block,
    and the state belongs to another width), ErrWidthOutOfRange (a block of fewer than w samples),
    ErrNoUsableFit (buffer is null), ErrOverflow (2^31 windows in one stream), ErrIterationLimit
    (the matrix that fits the parabolas cannot be computed).
    NaN: source by position (kept); request.threshold in no result; request.data in some results or
    by position (kept). */
QX_API ErrorCode PeakD2014(QX_IN DBL1D source, QX_INOUT PeakDRequest *request,
                           QX_INOUT PeakDState *state, QX_INOUT DBL1D *buffer,
                           QX_OUT ErrorCode *err, int32_t mode);

QX_END_DECLS

#endif
