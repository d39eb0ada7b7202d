#ifndef QX_SHUFFLING_H
#define QX_SHUFFLING_H

/* Random permutations. The generator and its state are those of noise.h; here, too, a seed of 0
   continues the stream.

   The unbiased shuffle is that of R. Durstenfeld, "Algorithm 235: Random permutation", 1964, after
   Fisher and Yates: element i, from the last one down, is exchanged with one of the elements 0 to
   i. The biased shuffle exchanges element i, from the first one up, with any element, so that not
   all orders are equally likely. `indices` receives the permutation: element i was element
   indices[i] before.

   The 2026 revisions are unbiased. Their random numbers come from the counter-based generator of
   noise.h, and the permutation is a function of key, stream, position and the number of elements.
   Permutations at positions that differ by less than the number of elements share random numbers
   and are related: advance the position by at least that number, or use another stream. */

#include "qx/noise.h"
#include "qx/types.h"

QX_BEGIN_DECLS

/** Shuffles x; without bias if `unbiased` is non-zero. A failure empties both arrays. The generator
    has a period of 7e12, and sequences of different seeds may be related; RiffleArrayDBL2026_head
    has 2^117 starting points.
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

/** A random permutation of 0 to count - 1; without bias if `unbiased` is non-zero. The generator is
    that of RiffleArrayDBL2012_head, with a period of 7e12; RiffleIntNum2026_head has 2^117 starting
    points.
    Codes: ErrEmptyInput (count is below 1), ErrOutOfMemory (the host refused the resize). */
QX_API ErrorCode RiffleIntNum2012_head(QX_OUT I32_1D indices, int32_t count, int32_t seed,
                                       QX_INOUT RandomState *state, int32_t unbiased);
/** As RiffleIntNum2012_head, biased. */
QX_API ErrorCode RiffleIntNum_head(QX_OUT I32_1D indices, int32_t count, int32_t seed,
                                   QX_INOUT RandomState *state);

/** Shuffles x without bias. Each random index is derived from 64 random bits by the method of D.
    Lemire, "Fast random integer generation in an interval", 2019. A failure empties both arrays.
    Codes: ErrEmptyInput (x is empty), ErrIndexOutOfRange (the position is negative, not a whole
    number, or above 2^53 minus the number of elements), ErrOutOfMemory (the host refused the
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
/** A random permutation of 0 to count - 1, as RiffleArrayDBL2026_head makes it.
    Codes: ErrEmptyInput (count is below 1), ErrIndexOutOfRange (the position is negative, not a
    whole number, or above 2^53 - count), ErrOutOfMemory (the host refused the resize).
    NaN: position refused with ErrIndexOutOfRange. */
QX_API ErrorCode RiffleIntNum2026_head(QX_OUT I32_1D indices, int32_t count, int32_t key,
                                       int32_t stream, double position);

QX_END_DECLS

#endif
