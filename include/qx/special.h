#ifndef QX_SPECIAL_H
#define QX_SPECIAL_H

/* The real special functions: one value at a time, no status; NaN or an infinity is their only
   sign of a fault. */

#include "qx/special_bessel.h"
#include "qx/special_gamma.h"
#include "qx/special_hypergeometric.h"
#include "qx/special_integrals.h"

#endif
