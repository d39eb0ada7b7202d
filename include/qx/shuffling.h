#ifndef QX_SHUFFLING_H
#define QX_SHUFFLING_H

/* Random orders. The generator and its state are those of noise.h; here a seed of 0 goes on with
   the stream, too.

   Unbiased, the shuffle is that of R. Durstenfeld, "Algorithm 235: Random permutation", 1964, after
   Fisher and Yates: element i, from the last down, changes places with one of the elements 0 to i.
   Otherwise element i, from the first up, changes places with any: not all orders are equally
   likely then. `indices` gives the order: element i was element indices[i] before.

   The shuffles of 2026 have no bias. Their numbers come from the counter-based generator of
   noise.h, and the order is a function of key, stream, position and the number of elements. Orders
   at positions that differ by less than that number share numbers and are related: go on by it, or
   take another stream. */

#include "qx/noise.h"
#include "qx/types.h"

QX_BEGIN_DECLS

/** Shuffles x; without bias if `unbiased` is non-zero. A failure empties both arrays. The
    generator has a period of 7e12 and related seeds; RiffleArrayDBL2026_head has 2^117 places to
    begin at.
    Codes: ErrEmptyInput (x is empty), ErrOutOfMemory (the host refused the resize).
    NaN: x in some results. */
QX_API ErrorCode RiffleArrayDBL2012_head(QX_INOUT DBL1D x, QX_OUT I32_1D indices, int32_t seed,
                                         QX_INOUT RandomState *state, int32_t unbiased);
/** As RiffleArrayDBL2012_head, biased. */
QX_API ErrorCode RiffleArrayDBL_head(QX_INOUT DBL1D x, QX_OUT I32_1D indices, int32_t seed,
                                     QX_INOUT RandomState *state);
/** As RiffleArrayDBL2012_head, for complex elements. */
QX_API ErrorCode RiffleArrayCDB2012_head(QX_INOUT CDB1D x, QX_OUT I32_1D indices, int32_t seed,
                                         QX_INOUT RandomState *state, int32_t unbiased);
/** As RiffleArrayCDB2012_head, biased. */
QX_API ErrorCode RiffleArrayCDB_head(QX_INOUT CDB1D x, QX_OUT I32_1D indices, int32_t seed,
                                     QX_INOUT RandomState *state);
/** As RiffleArrayDBL2012_head, for integers. */
QX_API ErrorCode RiffleArrayInt2012_head(QX_INOUT I32_1D x, QX_OUT I32_1D indices, int32_t seed,
                                         QX_INOUT RandomState *state, int32_t unbiased);
/** As RiffleArrayInt2012_head, biased. */
QX_API ErrorCode RiffleArrayInt_head(QX_INOUT I32_1D x, QX_OUT I32_1D indices, int32_t seed,
                                     QX_INOUT RandomState *state);

/** A random order of 0 to count - 1; without bias if `unbiased` is non-zero.
    Codes: ErrEmptyInput (count is below 1), ErrOutOfMemory (the host refused the resize). */
QX_API ErrorCode RiffleIntNum2012_head(QX_OUT I32_1D indices, int32_t count, int32_t seed,
                                       QX_INOUT RandomState *state, int32_t unbiased);
/** As RiffleIntNum2012_head, biased. */
QX_API ErrorCode RiffleIntNum_head(QX_OUT I32_1D indices, int32_t count, int32_t seed,
                                   QX_INOUT RandomState *state);

/** Shuffles x without bias; the numbers by D. Lemire, "Fast random integer generation in an
    interval", 2019, from 64 bits each. A failure empties both arrays.
    Codes: ErrEmptyInput (x is empty), ErrIndexOutOfRange (the position is negative, no whole
    number, or above 2^53 less the number of elements), ErrOutOfMemory (the host refused the
    resize).
    NaN: x in some results; position refused with ErrIndexOutOfRange. */
QX_API ErrorCode RiffleArrayDBL2026_head(QX_INOUT DBL1D x, QX_OUT I32_1D indices, int32_t key,
                                         int32_t stream, double position);
/** As RiffleArrayDBL2026_head, for complex elements.
    NaN: x in some results; position refused with ErrIndexOutOfRange. */
QX_API ErrorCode RiffleArrayCDB2026_head(QX_INOUT CDB1D x, QX_OUT I32_1D indices, int32_t key,
                                         int32_t stream, double position);
/** As RiffleArrayDBL2026_head, for integers.
    NaN: position refused with ErrIndexOutOfRange. */
QX_API ErrorCode RiffleArrayInt2026_head(QX_INOUT I32_1D x, QX_OUT I32_1D indices, int32_t key,
                                         int32_t stream, double position);
/** A random order of 0 to count - 1, as RiffleArrayDBL2026_head makes it.
    Codes: ErrEmptyInput (count is below 1), ErrIndexOutOfRange (the position is negative, no whole
    number, or above 2^53 - count), ErrOutOfMemory (the host refused the resize).
    NaN: position refused with ErrIndexOutOfRange. */
QX_API ErrorCode RiffleIntNum2026_head(QX_OUT I32_1D indices, int32_t count, int32_t key,
                                       int32_t stream, double position);

QX_END_DECLS

#endif
