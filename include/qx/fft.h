#ifndef QX_FFT_H
#define QX_FFT_H

/* Fourier transforms of any length. */

#include "qx/types.h"

QX_BEGIN_DECLS

/* The table of one transform length, shared by everybody who works with that length. */
typedef struct FFTPlan FFTPlan;

/* A word of the caller's in which an export keeps its plan from call to call; null at first. */
typedef void *PlanSlot;
/* The word that the host keeps for a call node, for the _IDP exports; null at first. */
typedef void *InstanceWord;

/** The plan for transforms of `length` values, built at the first request and shared after it.
    Every plan is given back with destroy_oxfft_table. Null if length is below 1 or memory ran
    out. */
QX_API FFTPlan *create_oxfft_table(int32_t length);

/** Gives a plan back; the last of its holders releases it. Null is allowed. */
QX_API void destroy_oxfft_table(QX_IN FFTPlan *plan);

QX_END_DECLS

#endif
