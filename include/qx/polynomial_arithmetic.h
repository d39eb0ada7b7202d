#ifndef QX_POLYNOMIAL_ARITHMETIC_H
#define QX_POLYNOMIAL_ARITHMETIC_H

/* Arithmetic of polynomials. Coefficients ascend: element 0 is the constant term, and n
   coefficients make a polynomial of degree n - 1 or, with zeros at the top, below. An empty array
   is the polynomial 0 where an export takes one. Outputs are arrays of their own. NaN and
   infinities among the coefficients are refused. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** The sum r = p + q, as long as the longer of the two. Zeros at the top stay.
    Codes: ErrNonFiniteInput (a coefficient), ErrOverflow (a sum is not finite), ErrOutOfMemory
    (the host refuses r).
    NaN: p, q refused with ErrNonFiniteInput. */
QX_API ErrorCode AddPolyH(QX_IN DBL1D p, QX_IN DBL1D q, QX_OUT DBL1D r);
/** As AddPolyH, for complex coefficients. */
QX_API ErrorCode CxAddPolyH(QX_IN CDB1D p, QX_IN CDB1D q, QX_OUT CDB1D r);

/** The difference r = p - q, as long as the longer of the two. Zeros at the top stay.
    Codes: ErrNonFiniteInput (a coefficient), ErrOverflow (a difference is not finite),
    ErrOutOfMemory (the host refuses r).
    NaN: p, q refused with ErrNonFiniteInput. */
QX_API ErrorCode SubtractPolyH(QX_IN DBL1D p, QX_IN DBL1D q, QX_OUT DBL1D r);
/** As SubtractPolyH, for complex coefficients. */
QX_API ErrorCode CxSubtractPolyH(QX_IN CDB1D p, QX_IN CDB1D q, QX_OUT CDB1D r);

/** The product r = p q of m + n - 1 coefficients, or one 0 where p or q is empty: r[k] = sum
    over i of p[i] q[k - i], the terms added to 0 in ascending order of i. Zeros at the top stay.
    The time grows with m n; for thousands of coefficients of similar size Convolution by
    transforms is faster, though its errors are relative to the largest coefficient.
    Codes: ErrNonFiniteInput (a coefficient), ErrLengthTooLarge (m + n - 1 above 2^31 - 1),
    ErrOverflow (a coefficient of r is not finite), ErrOutOfMemory (the host refuses r).
    NaN: p, q refused with ErrNonFiniteInput. */
QX_API ErrorCode MultiplyPolyH(QX_IN DBL1D p, QX_IN DBL1D q, QX_OUT DBL1D r);
/** As MultiplyPolyH, for complex coefficients. */
QX_API ErrorCode CxMultiplyPolyH(QX_IN CDB1D p, QX_IN CDB1D q, QX_OUT CDB1D r);

/** Quotient and remainder of the long division, p = quotient q + remainder. Zeros at the top of
    p and q do not count, so that degrees are those of the polynomials. The quotient has degree p
    - degree q + 1 coefficients; where the degree of p is below that of q, or p is empty or 0, it
    is one 0. The remainder has max(1, degree of q) coefficients. A monic divisor of integers
    divides exactly as long as all intermediate numbers are below 2^53.
    Codes: ErrEmptyInput (q is empty), ErrNonFiniteInput (a coefficient), ErrAllCoefficientsZero
    (q is 0), ErrOverflow (a coefficient of a result is not finite), ErrOutOfMemory (no memory,
    or the host refuses an output).
    NaN: p, q refused with ErrNonFiniteInput. */
QX_API ErrorCode DividePolyH(QX_IN DBL1D p, QX_IN DBL1D q, QX_OUT DBL1D quotient,
                             QX_OUT DBL1D remainder);
/** As DividePolyH, for complex coefficients. */
QX_API ErrorCode CxDividePolyH(QX_IN CDB1D p, QX_IN CDB1D q, QX_OUT CDB1D quotient,
                               QX_OUT CDB1D remainder);

/** The greatest common divisor of polynomials near p and q: of all pairs whose coefficients are
    within `tolerance` of those of p and q, by the 2-norm relative to that of p and of q, the
    divisor of the highest degree that is found, and for that degree the one nearest to p and q.
    Its leading coefficient is exactly 1. `distance` is how far p and q had to move, the larger
    relative 2-norm of the two. A tolerance not above 0 or NaN is 1e-10. If one operand is 0 the
    result is the other, monic. The degree follows from the first Sylvester matrix, by falling
    degree, that is nearly singular and for which Gauss-Newton steps on divisor and cofactors
    reach the tolerance (Z. Zeng, "Computing multiple roots of inexact polynomials", 2005, where
    q is the derivative of p). Coefficients are taken as they are: roots of very different size
    make a common factor hard to see, which scaling x may cure. Memory grows with the square and
    time with the cube of the sum of the degrees, which cannot exceed about 11500.
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
    PolyGCD_H finds for q. There is no complex twin; CxPolyGCD_H, CxDividePolyH and
    CxMultiplyPolyH give it.
    Codes: ErrEmptyInput (p or q is empty), ErrNonFiniteInput (a coefficient; an infinite
    tolerance), ErrAllCoefficientsZero (p or q is 0), ErrOverflow (a coefficient of lcm is not
    finite), ErrOutOfMemory (no memory, or the host refuses lcm).
    NaN: p, q refused with ErrNonFiniteInput; tolerance in no result. */
QX_API ErrorCode PolyLCM_H(QX_IN DBL1D p, QX_IN DBL1D q, double tolerance, QX_OUT DBL1D lcm);

/** Values y[i] = p(x[i]) by Horner's rule with compensation, as accurate as if computed in twice
    the working precision and rounded: the relative error is at most eps + gamma(2n)^2 times the
    condition number, with n the degree, eps 2^-53, gamma(k) = k eps / (1 - k eps) and the
    condition number sum |p[k]| |x|^k / |p(x)|, as long as no product underflows (S. Graillat, P.
    Langlois and N. Louvet, "Compensated Horner scheme", 2005). Where the compensation overflows,
    which it may from about 2^996 on, the value is that of the plain rule. x may hold anything:
    NaN gives NaN, and so may an infinity (0 times infinity); a constant has its value
    everywhere. Values overflow to infinities.
    Codes: ErrEmptyInput (p is empty), ErrNonFiniteInput (a coefficient), ErrOutOfMemory (the
    host refuses y).
    NaN: p refused with ErrNonFiniteInput; x in some results. */
QX_API ErrorCode PolyEv(QX_IN DBL1D p, QX_IN DBL1D x, QX_OUT DBL1D y);
/** As PolyEv, for complex coefficients and points (S. Graillat and V. Menissier-Morain,
    "Accurate summation, dot product and polynomial evaluation in complex floating point
    arithmetic", 2012), with a small multiple of the bound. */
QX_API ErrorCode CxPolyEv(QX_IN CDB1D p, QX_IN CDB1D x, QX_OUT CDB1D y);

/** A polynomial of a matrix, y as large as a. mode: 0 y[i][j] = p(a[i][j]), with values as of
    PolyEv; 1 y = p[0] I + p[1] a + p[2] a a + ... of a square matrix. Mode 1 takes about 2
    sqrt(degree) products of matrices (M. S. Paterson and L. J. Stockmeyer, "On the number of
    nonscalar multiplications necessary to evaluate polynomials", 1973), uncompensated. An empty
    matrix gives an empty one.
    Codes: ErrEmptyInput (p is empty), ErrInvalidSelector (mode), ErrNotSquare (mode 1),
    ErrNonFiniteInput (a coefficient or an element), ErrOverflow (mode 1: an element of y is not
    finite; values of mode 0 become infinite), ErrOutOfMemory (no memory, or the host refuses y).
    NaN: p, a refused with ErrNonFiniteInput. */
QX_API ErrorCode EvPoly2D(QX_IN DBL1D p, QX_IN DBL2D a, int32_t mode, QX_OUT DBL2D y);
/** As EvPoly2D, for complex coefficients and elements, with values as of CxPolyEv. */
QX_API ErrorCode CxEvPoly2D(QX_IN CDB1D p, QX_IN CDB2D a, int32_t mode, QX_OUT CDB2D y);

/** The derivative q of the given order, q[k] = p[k + order] (k + 1) (k + 2) ... (k + order),
    each within an ulp. Order 0 copies; an order of p's length or above gives one 0.
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

/** The composition r(x) = p(q(x)) of (m - 1) (n - 1) + 1 coefficients by Horner's rule; zeros at
    the top stay. If p is empty, r is one 0; if q is empty, r is p[0]. The time grows with m^2
    n^2.
    Codes: ErrNonFiniteInput (a coefficient), ErrLengthTooLarge (a result above 2^31 - 1),
    ErrOverflow (a coefficient of r is not finite), ErrOutOfMemory (no memory, or the host
    refuses r).
    NaN: p, q refused with ErrNonFiniteInput. */
QX_API ErrorCode PolyComposeH(QX_IN DBL1D p, QX_IN DBL1D q, QX_OUT DBL1D r);
/** As PolyComposeH, for complex coefficients. */
QX_API ErrorCode CxPolyComposeH(QX_IN CDB1D p, QX_IN CDB1D q, QX_OUT CDB1D r);

/** The monic real polynomial with these roots, each as often as it is there; no roots give [1].
    Roots that are not real come with their conjugates, to within 1e-10 of their modulus, and the
    mean of both is used; a root that is that near to its own conjugate is taken as real. The
    factors are multiplied in Leja's order, each root as far as possible from those before it,
    which keeps the coefficients of the partial products small. The time grows with the square of
    the number of roots.
    Codes: ErrNonFiniteInput (a root), ErrBadCoefficients (a root lacks its conjugate),
    ErrLengthTooLarge (2^31 - 1 roots), ErrOverflow (a coefficient is not finite), ErrOutOfMemory
    (no memory, or the host refuses p).
    NaN: roots refused with ErrNonFiniteInput. */
QX_API ErrorCode PolyFromRootsH(QX_IN CDB1D roots, QX_OUT DBL1D p);
/** The monic complex polynomial with these roots, each as often as it is there; no roots give
    [1]. Factors are multiplied as in PolyFromRootsH.
    Codes: ErrNonFiniteInput (a root), ErrLengthTooLarge (2^31 - 1 roots), ErrOverflow (a
    coefficient is not finite), ErrOutOfMemory (no memory, or the host refuses p).
    NaN: roots refused with ErrNonFiniteInput. */
QX_API ErrorCode CxPolyFromRootsH(QX_IN CDB1D roots, QX_OUT CDB1D p);

/** The partial fractions of a rational function,

        numerator / denominator = polynomial + sum over the poles z, of multiplicity m, of
            r[1] / (x - z) + r[2] / (x - z)^2 + ... + r[m] / (x - z)^m.

    `poles` holds each pole as often as its multiplicity, equal to the bit and together, and
    `residues` beside these r[1] to r[m]. `polynomial` is the quotient of the division, one 0
    where there is none. Poles that are not real, and their residues, come as exact conjugates.
    Zeros at the top do not count. A constant denominator has no poles. Common factors are not
    cancelled: their residues are about 0. Poles and multiplicities are those of
    MultPolyRoots_head, refined, and `tolerance` is its: by how much the denominator's
    coefficients may be changed to make poles multiple; not above 0 or NaN: 1e-10. A double root
    of a quadratic, which it counts as two, is one here. Residues are the coefficients of power
    series at the poles, divided by one factor after another.
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
