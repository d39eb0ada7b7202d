#ifndef QX_CALCULUS_H
#define QX_CALCULUS_H

/* Integrals and derivatives of samples at a constant step dt.

   A definite integral is one number. For 0 to 3, panels of 2, 3, 4 and 5 samples are integrated by
   a composite Newton-Cotes rule:

       0  trapezoid
       1  Simpson
       2  Simpson 3/8
       3  Bode (Boole)
       4  left rectangles, only where stated
       5  right rectangles, only where stated

   Running integrals and derivatives replace the samples in place. Where a formula needs samples
   beyond the ends of the data, they are taken from the first elements of `initial` and `final`: if
   one initial value is needed, initial[0] is x[-1]; if two are, initial[0] is x[-2] and initial[1]
   is x[-1]; final[0] is x[n] and final[1] is x[n+1]. The rules are in M. Abramowitz and I. A.
   Stegun, "Handbook of mathematical functions", 1964, chapter 25.

   Overflow is not checked for: sums of samples near the largest double, and quotients by a step
   near 0, become infinite or NaN, with the code 0. */

#include "qx/types.h"

QX_BEGIN_DECLS

/* A host block of three dimensions: the three sizes, then the elements from byte 12. */
typedef struct QX_MAY_ALIAS Array3DBlock {
    int32_t dimSizes[3];
} Array3DBlock;
typedef Array3DBlock **Array3DHandle;

#define QX_ARRAY_3D(element)                                                                       \
    struct QX_MAY_ALIAS QXArray3D_##element {                                                      \
        int32_t dimSizes[3];                                                                       \
    } * *
typedef QX_ARRAY_3D(DBL) DBL3D;

/** Definite integral of x. rule: 0 to 3. The sign of *dt is ignored. Samples left over after the
    last whole panel are integrated by a rule of lower order, so that the result is exact only for
    polynomials of that lower order. The code is in *err, and a failure sets the result to NaN.
    Codes: ErrEmptyInput (x is empty), ErrInvalidSelector (any other rule), ErrSizesDisagree (x has
    fewer samples than a panel).
    NaN: x, dt in all results. */
QX_API int32_t NumerIntegration_head(QX_IN DBL1D x, QX_IN const double *dt,
                                     QX_IN const int32_t *rule, QX_OUT double *result,
                                     QX_OUT ErrorCode *err);

/** As NumerIntegration_head. rule: 0 to 5. Samples left over are those at the start of the data and
    are integrated by a one-sided formula of the same order as the rule. The code is the function
    result.
    Codes: ErrEmptyInput (x is empty), ErrSizesDisagree (x has fewer than rule + 2 samples, or than
    2 for rules 4 and 5), ErrInvalidSelector (any other rule).
    NaN: x in all results or in no result; dt in all results. */
QX_API ErrorCode NumerIntegration_2017_head(QX_IN DBL1D x, QX_IN const double *dt,
                                            QX_IN const int32_t *rule, QX_OUT double *result);

/** Definite integral of x over both dimensions. rule: as NumerIntegration_head. dts[0] is the step
    within a row, and dts[1] the step between rows. A failure sets the result to NaN.
    Codes: ErrSizesDisagree (a dimension is below 3 or shorter than a panel), ErrFewerThanTwo (fewer
    than two steps), ErrInvalidSelector (any other rule), ErrOutOfMemory (no scratch memory).
    NaN: x in all results; dts in all results or in no result. */
QX_API ErrorCode NumerIntegration2D_head(QX_IN DBL2D x, QX_IN DBL1D dts, uint16_t rule,
                                         QX_OUT double *result);
/** As NumerIntegration2D_head, by the formulas of NumerIntegration_2017_head; rules 4 and 5 are
    refused here. */
QX_API ErrorCode NumerIntegration2D_2017_head(QX_IN DBL2D x, QX_IN DBL1D dts, uint16_t rule,
                                              QX_OUT double *result);

/** Definite integral of x over three dimensions d0, d1, d2. The elements of the block, in their
    order in memory, are taken as d2 planes of d0 rows of d1 elements. Each plane is integrated as
    by NumerIntegration2D_head with dts[0] and dts[1], and the integrals of the planes with dts[2].
    rule: as NumerIntegration_head.
    Codes: ErrSizesDisagree (a dimension is below 3 or shorter than a panel), ErrFewerThanThree
    (fewer than three steps), ErrInvalidSelector (any other rule), ErrOutOfMemory (no scratch
    memory).
    NaN: dts in all results or in no result. */
QX_API ErrorCode NumerIntegration3D_head(QX_IN DBL3D x, QX_IN DBL1D dts, uint16_t rule,
                                         QX_OUT double *result);
/** As NumerIntegration3D_head, by the formulas of NumerIntegration_2017_head; rules 4 and 5 are
    refused here. */
QX_API ErrorCode NumerIntegration3D_2017_head(QX_IN DBL3D x, QX_IN DBL1D dts, uint16_t rule,
                                              QX_OUT double *result);

/** Running integral by Simpson's rule around each sample,
    y[i] = y[i-1] + (x[i-1] + 4 x[i] + x[i+1]) dt/6, with *initial before and *final after the data.
    Codes: ErrEmptyInput (x is empty), ErrSamplingNotPositive (*dt is 0 or below).
    NaN: x in all results or in some results; initial, dt in all results; final in some results. */
QX_API int32_t Integral(QX_INOUT DBL1D x, QX_IN const double *initial, QX_IN const double *final,
                        QX_IN const double *dt, QX_OUT ErrorCode *err);

/** Running integral y[i] = y[i-1] + p, y[-1] = 0, with p by rule:

        0  (x[i-1] + x[i]) dt/2                                        one initial value
        1  (x[i-1] + 4 x[i] + x[i+1]) dt/6                             one initial, one final
        2  (x[i-2] + 3 x[i-1] + 3 x[i] + x[i+1]) dt/8                  two initial, one final
        3  (7 x[i-2] + 32 x[i-1] + 12 x[i] + 32 x[i+1] + 7 x[i+2]) dt/90      two of each
        4  x[i-1] dt, from y[0] = 0                                    none
        5  x[i] dt, from y[0] = 0                                      none

    Codes: ErrSamplingNotPositive (dt is 0 or below), ErrEmptyInput (x is empty),
    ErrInvalidSelector (any other rule), ErrEmptyInput (one value is missing), ErrFewerThanTwo (one
    of two values is missing).
    NaN: x in all results or in some results or in no result; initial in all results or in no
    result; final in some results or in no result; dt in all results or in some results. */
QX_API ErrorCode Integral90(QX_INOUT DBL1D x, QX_IN DBL1D initial, QX_IN DBL1D final, double dt,
                            int32_t rule);

/** Running integral from y[0] = 0 without values beyond the data: the first values by one-sided
    formulas, each later value by a whole panel from the value one panel before. rule: 0 to 5.
    Codes: ErrSamplingNotPositive (dt is 0 or below), ErrEmptyInput (x is empty), ErrSizesDisagree
    (x has fewer than rule + 2 samples, or than 2 for rules 4 and 5), ErrInvalidSelector (any other
    rule).
    NaN: x in some results or in no result; dt in some results. */
QX_API ErrorCode Integral_2017(QX_INOUT DBL1D x, double dt, int32_t rule);

/** Central derivative (x[i+1] - x[i-1]) / (2 dt), with *initial before and *final after the data.
    Codes: ErrSamplingNotPositive (*dt is not above 0), ErrEmptyInput (x is empty).
    NaN: x, initial, final in some results; dt refused with ErrSamplingNotPositive. */
QX_API int32_t Derivative(QX_INOUT DBL1D x, QX_IN const double *initial, QX_IN const double *final,
                          QX_IN const double *dt, QX_OUT ErrorCode *err);

/** Derivative by rule:

        0  (x[i+1] - x[i-1]) / (2 dt)                                  one initial, one final
        1  (x[i-2] - 8 x[i-1] + 8 x[i+1] - x[i+2]) / (12 dt)           two of each
        2  (x[i+1] - x[i]) / dt                                        one final
        3  (x[i] - x[i-1]) / dt                                        one initial

    Codes: ErrEmptyInput (x is empty), ErrSamplingNotPositive (*dt is 0 or below),
    ErrInvalidSelector (any other rule), ErrEmptyInput (rules 0, 2 and 3: a value is missing),
    ErrFewerThanTwo (rule 1: one of two values is missing).
    NaN: x in some results; initial, final in some results or in no result; dt in all results. */
QX_API ErrorCode Derivative85(QX_INOUT DBL1D x, QX_IN DBL1D initial, QX_IN DBL1D final,
                              QX_IN const double *dt, int32_t rule);

QX_END_DECLS

#endif
