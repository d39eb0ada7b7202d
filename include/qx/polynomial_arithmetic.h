#ifndef QX_POLYNOMIAL_ARITHMETIC_H
#define QX_POLYNOMIAL_ARITHMETIC_H

/* Arithmetic of polynomials. Coefficients are in ascending powers: element 0 is the constant term,
   and n coefficients form a polynomial of degree n - 1 or, with leading zeros (the last elements),
   of a lower degree. Where an empty array is accepted, it is the polynomial 0. Outputs are separate
   arrays. NaN and infinities among the coefficients are refused. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** The sum r = p + q, as long as the longer of the two. Leading zeros are kept.
    Codes: ErrNonFiniteInput (a coefficient), ErrOverflow (a sum is not finite), ErrOutOfMemory
    (the host refuses r).
    NaN: p, q refused with ErrNonFiniteInput. */
QX_API ErrorCode AddPolyH(QX_IN DBL1D p, QX_IN DBL1D q, QX_OUT DBL1D r);
/** As AddPolyH, for complex coefficients. */
QX_API ErrorCode CxAddPolyH(QX_IN CDB1D p, QX_IN CDB1D q, QX_OUT CDB1D r);

/** The difference r = p - q, as long as the longer of the two. Leading zeros are kept.
    Codes: ErrNonFiniteInput (a coefficient), ErrOverflow (a difference is not finite),
    ErrOutOfMemory (the host refuses r).
    NaN: p, q refused with ErrNonFiniteInput. */
QX_API ErrorCode SubtractPolyH(QX_IN DBL1D p, QX_IN DBL1D q, QX_OUT DBL1D r);
/** As SubtractPolyH, for complex coefficients. */
QX_API ErrorCode CxSubtractPolyH(QX_IN CDB1D p, QX_IN CDB1D q, QX_OUT CDB1D r);

/** The product r = p q of m + n - 1 coefficients, or a single 0 if p or q is empty: r[k] = sum over
    i of p[i] q[k - i], the terms added to 0 in ascending order of i. Leading zeros are kept. The
    time grows with m n; for thousands of coefficients of similar size Convolution by transforms is
    faster, though its errors are relative to the largest coefficient.
    Codes: ErrNonFiniteInput (a coefficient), ErrLengthTooLarge (m + n - 1 is above 2^31 - 1),
    ErrOverflow (a coefficient of r is not finite), ErrOutOfMemory (the host refuses r).
    NaN: p, q refused with ErrNonFiniteInput. */
QX_API ErrorCode MultiplyPolyH(QX_IN DBL1D p, QX_IN DBL1D q, QX_OUT DBL1D r);
/** As MultiplyPolyH, for complex coefficients. */
QX_API ErrorCode CxMultiplyPolyH(QX_IN CDB1D p, QX_IN CDB1D q, QX_OUT CDB1D r);

/** Quotient and remainder of polynomial division, p = quotient q + remainder. Leading zeros of p
    and q are ignored, so degrees are those of the polynomials. The quotient has degree of p -
    degree of q + 1 coefficients; if the degree of p is below that of q, or p is empty or 0, it is a
    single 0. The remainder has max(1, degree of q) coefficients. With integer coefficients and a
    monic divisor, the division is exact as long as all intermediate numbers are below 2^53.
    Codes: ErrEmptyInput (q is empty), ErrNonFiniteInput (a coefficient), ErrAllCoefficientsZero
    (q is 0), ErrOverflow (a coefficient of a result is not finite), ErrOutOfMemory (no memory,
    or the host refuses an output).
    NaN: p, q refused with ErrNonFiniteInput. */
QX_API ErrorCode DividePolyH(QX_IN DBL1D p, QX_IN DBL1D q, QX_OUT DBL1D quotient,
                             QX_OUT DBL1D remainder);
/** As DividePolyH, for complex coefficients. */
QX_API ErrorCode CxDividePolyH(QX_IN CDB1D p, QX_IN CDB1D q, QX_OUT CDB1D quotient,
                               QX_OUT CDB1D remainder);

/** The approximate greatest common divisor of p and q. Among all pairs of polynomials whose
    coefficients are within `tolerance` of those of p and q, in the relative 2-norm, it is the
    divisor of the highest degree that is found, and for that degree that of the pair nearest to p
    and q. Its leading coefficient is exactly 1. `distance` is the distance of that pair from p and
    q, the larger of the two relative 2-norms. A tolerance that is NaN or not above 0 selects 1e-10.
    If one operand is 0, the result is the other, made monic. The degree is that of the first
    Sylvester matrix, by descending degree, that is nearly singular and for which Gauss-Newton steps
    on divisor and cofactors reach the tolerance (Z. Zeng, "Computing multiple roots of inexact
    polynomials", 2005, where q is the derivative of p). Coefficients are not scaled: if roots
    differ greatly in magnitude, a common factor is hard to detect, and scaling x may help. Memory
    grows with the square and time with the cube of the sum of the degrees, which cannot exceed
    about 11500.
    Codes: ErrEmptyInput (p or q is empty), ErrNonFiniteInput (a coefficient; an infinite
    tolerance), ErrAllCoefficientsZero (p and q are 0), ErrOverflow (a coefficient of the monic
    divisor is not finite), ErrOutOfMemory (no memory, or the host refuses gcd).
    NaN: p, q refused with ErrNonFiniteInput; tolerance in no result. */
QX_API ErrorCode PolyGCD_H(QX_IN DBL1D p, QX_IN DBL1D q, double tolerance, QX_OUT DBL1D gcd,
                           QX_OUT double *distance);
/** As PolyGCD_H, for complex coefficients. */
QX_API ErrorCode CxPolyGCD_H(QX_IN CDB1D p, QX_IN CDB1D q, double tolerance, QX_OUT CDB1D gcd,
                             QX_OUT double *distance);

/** The least common multiple of polynomials near p and q, monic: p times the cofactor that
    PolyGCD_H finds for q. There is no complex twin; combine CxPolyGCD_H, CxDividePolyH and
    CxMultiplyPolyH instead.
    Codes: ErrEmptyInput (p or q is empty), ErrNonFiniteInput (a coefficient; an infinite
    tolerance), ErrAllCoefficientsZero (p or q is 0), ErrOverflow (a coefficient of lcm is not
    finite), ErrOutOfMemory (no memory, or the host refuses lcm).
    NaN: p, q refused with ErrNonFiniteInput; tolerance in no result. */
QX_API ErrorCode PolyLCM_H(QX_IN DBL1D p, QX_IN DBL1D q, double tolerance, QX_OUT DBL1D lcm);

/** Values y[i] = p(x[i]) by Horner's rule with compensation, as accurate as if computed in twice
    the working precision and rounded: the relative error is at most eps + gamma(2n)^2 times the
    condition number, with n the degree, eps = 2^-53, gamma(k) = k eps / (1 - k eps) and the
    condition number sum |p[k]| |x|^k / |p(x)|, as long as no product underflows (S. Graillat, P.
    Langlois and N. Louvet, "Compensated Horner scheme", 2005). If the compensation overflows, which
    may happen from about 2^996 on, the value is that of the plain rule. x is not checked: NaN gives
    NaN, and so may an infinity (0 times infinity); a constant polynomial has its value everywhere.
    Values that overflow are infinite.
    Codes: ErrEmptyInput (p is empty), ErrNonFiniteInput (a coefficient), ErrOutOfMemory (the
    host refuses y).
    NaN: p refused with ErrNonFiniteInput; x in some results. */
QX_API ErrorCode PolyEv(QX_IN DBL1D p, QX_IN DBL1D x, QX_OUT DBL1D y);
/** As PolyEv, for complex coefficients and points (S. Graillat and V. Menissier-Morain,
    "Accurate summation, dot product and polynomial evaluation in complex floating point
    arithmetic", 2012), with a small multiple of that bound. */
QX_API ErrorCode CxPolyEv(QX_IN CDB1D p, QX_IN CDB1D x, QX_OUT CDB1D y);

/** A polynomial of a matrix; y has the size of a. mode: 0 y[i][j] = p(a[i][j]), with the values of
    PolyEv; 1 y = p[0] I + p[1] a + p[2] a a + ... of a square matrix. Mode 1 takes about 2
    sqrt(degree) matrix products (M. S. Paterson and L. J. Stockmeyer, "On the number of nonscalar
    multiplications necessary to evaluate polynomials", 1973), without compensation. An empty matrix
    gives an empty y.
    Codes: ErrEmptyInput (p is empty), ErrInvalidSelector (mode), ErrNotSquare (mode 1),
    ErrNonFiniteInput (a coefficient or an element), ErrOverflow (mode 1: an element of y is not
    finite; values of mode 0 become infinite), ErrOutOfMemory (no memory, or the host refuses y).
    NaN: p, a refused with ErrNonFiniteInput. */
QX_API ErrorCode EvPoly2D(QX_IN DBL1D p, QX_IN DBL2D a, int32_t mode, QX_OUT DBL2D y);
/** As EvPoly2D, for complex coefficients and elements, with the values of CxPolyEv. */
QX_API ErrorCode CxEvPoly2D(QX_IN CDB1D p, QX_IN CDB2D a, int32_t mode, QX_OUT CDB2D y);

/** The derivative q of the given order, q[k] = p[k + order] (k + 1) (k + 2) ... (k + order),
    each within an ulp. Order 0 copies p; an order not below the length of p gives a single 0.
    Codes: ErrEmptyInput (p is empty), ErrNegativeCount (order), ErrNonFiniteInput (a
    coefficient), ErrOverflow (a coefficient of q is not finite), ErrOutOfMemory (the host
    refuses q).
    NaN: p refused with ErrNonFiniteInput. */
QX_API ErrorCode PolyDerivativeH(QX_IN DBL1D p, int32_t order, QX_OUT DBL1D q);
/** As PolyDerivativeH, for complex coefficients. */
QX_API ErrorCode CxPolyDerivativeH(QX_IN CDB1D p, int32_t order, QX_OUT CDB1D q);

/** The integral q with q[0] = constant and q[k + 1] = p[k] / (k + 1).
    Codes: ErrEmptyInput (p is empty), ErrNonFiniteInput (a coefficient or the constant),
    ErrLengthTooLarge (p has 2^31 - 1 coefficients), ErrOutOfMemory (the host refuses q).
    NaN: p, constant refused with ErrNonFiniteInput. */
QX_API ErrorCode PolyIntegralH(QX_IN DBL1D p, double constant, QX_OUT DBL1D q);
/** As PolyIntegralH, for complex coefficients and constant.
    NaN: p, constant.im, constant.re refused with ErrNonFiniteInput. */
QX_API ErrorCode CxPolyIntegralH(QX_IN CDB1D p, QX_IN const CDB *constant, QX_OUT CDB1D q);

/** The composition r(x) = p(q(x)) of (m - 1) (n - 1) + 1 coefficients by Horner's rule; leading
    zeros are kept. If p is empty, r is a single 0; if q is empty, r is p[0]. The time grows with
    m^2 n^2.
    Codes: ErrNonFiniteInput (a coefficient), ErrLengthTooLarge (a result of more than 2^31 - 1
    coefficients), ErrOverflow (a coefficient of r is not finite), ErrOutOfMemory (no memory, or the
    host refuses r).
    NaN: p, q refused with ErrNonFiniteInput. */
QX_API ErrorCode PolyComposeH(QX_IN DBL1D p, QX_IN DBL1D q, QX_OUT DBL1D r);
/** As PolyComposeH, for complex coefficients. */
QX_API ErrorCode CxPolyComposeH(QX_IN CDB1D p, QX_IN CDB1D q, QX_OUT CDB1D r);

/** The monic real polynomial with the given roots, each as often as it occurs in `roots`; no roots
    give [1]. Roots that are not real must be given with their conjugates, to within 1e-10 of their
    modulus, and the mean of both is used; a root that is this close to its own conjugate is taken
    as real. The factors are multiplied in Leja's order, each root as far as possible from those
    before it, which keeps the coefficients of the partial products small. The time grows with the
    square of the number of roots.
    Codes: ErrNonFiniteInput (a root), ErrBadCoefficients (a root lacks its conjugate),
    ErrLengthTooLarge (2^31 - 1 roots), ErrOverflow (a coefficient is not finite), ErrOutOfMemory
    (no memory, or the host refuses p).
    NaN: roots refused with ErrNonFiniteInput. */
QX_API ErrorCode PolyFromRootsH(QX_IN CDB1D roots, QX_OUT DBL1D p);
/** The monic complex polynomial with the given roots, each as often as it occurs in `roots`; no
    roots give [1]. Factors are multiplied as in PolyFromRootsH.
    Codes: ErrNonFiniteInput (a root), ErrLengthTooLarge (2^31 - 1 roots), ErrOverflow (a
    coefficient is not finite), ErrOutOfMemory (no memory, or the host refuses p).
    NaN: roots refused with ErrNonFiniteInput. */
QX_API ErrorCode CxPolyFromRootsH(QX_IN CDB1D roots, QX_OUT CDB1D p);

/** The partial fractions of a rational function,

        numerator / denominator = polynomial + sum over the poles z, of multiplicity m, of
            r[1] / (x - z) + r[2] / (x - z)^2 + ... + r[m] / (x - z)^m.

    `poles` holds each pole repeated according to its multiplicity, in adjacent elements that are
    equal to the bit, and `residues` holds r[1] to r[m] in the same elements. `polynomial` is the
    quotient of the division, a single 0 if there is none. Poles that are not real, and their
    residues, are exact conjugate pairs. Leading zeros are ignored. A constant denominator has no
    poles. Common factors are not cancelled: their residues are about 0. Poles and multiplicities
    are those of MultPolyRoots_head with refinement. `tolerance` has the same meaning as there: the
    amount by which coefficients of the denominator may be changed to make poles multiple; a
    tolerance that is NaN or not above 0 selects 1e-10. A double root of a quadratic, which
    MultPolyRoots_head counts as two roots, is a double pole here. Residues are the coefficients of
    power series at the poles, divided by one factor after another.
    Codes: ErrEmptyInput (numerator or denominator is empty), ErrNonFiniteInput (a coefficient;
    an infinite tolerance), ErrAllCoefficientsZero (the denominator is 0), ErrOverflow (a result,
    or the monic denominator, is not finite), ErrIterationLimit (eigenvalues do not converge),
    ErrOutOfMemory (no memory, or the host refuses an output).
    NaN: numerator, denominator refused with ErrNonFiniteInput; tolerance in no result. */
QX_API ErrorCode PartialFractionsH(QX_IN DBL1D numerator, QX_IN DBL1D denominator, double tolerance,
                                   QX_OUT DBL1D polynomial, QX_OUT CDB1D poles,
                                   QX_OUT CDB1D residues);

QX_END_DECLS

#endif
