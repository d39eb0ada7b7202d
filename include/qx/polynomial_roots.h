#ifndef QX_POLYNOMIAL_ROOTS_H
#define QX_POLYNOMIAL_ROOTS_H

/* Roots of polynomials. Coefficients are in ascending powers: element 0 is the constant term, and n
   coefficients form a polynomial of degree n - 1. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Improves approximate roots: each real guess by Newton steps, keeping the point with the smallest
    residual, and each pair of complex guesses by Bairstow's method, which finds the two roots of a
    real quadratic factor. `roots` holds one root per guess: first those of the real guesses in
    their order, then, from the complex guesses, the pairs of real roots and the conjugate pairs.
    Complex guesses are unchanged if the polynomial has fewer than 4 coefficients, and so is a guess
    without a partner. Iterations end when a relative change is below the tolerance, or at their
    limit, with the best values so far, and Bairstow's as soon as a step is not shorter than the last
    one: for 1000 polynomials of degree 10 with normal random coefficients and guesses up to 1.4 %
    off, 283 had pairs that were not found to 6 digits, with the code 0. PolyRoots2026_head needs no
    guesses. A null array of guesses counts as empty. If coef is empty, `roots` is emptied.
    Codes: WarnEmptyResult (coef is empty), ErrOutOfMemory (no memory, or the host refuses
    `roots`).
    NaN: coef, newtonTolerance, bairstowTolerance in no result; realGuesses, complexGuesses in some
    results. */
QX_API ErrorCode PolyRootsNtBst_head(QX_IN DBL1D coef, QX_IN DBL1D realGuesses,
                                     int32_t newtonMaxIterations, double newtonTolerance,
                                     QX_IN CDB1D complexGuesses, int32_t bairstowMaxIterations,
                                     double bairstowTolerance, QX_OUT CDB1D roots);

/** Replaces the coefficients of a complex polynomial by all of its roots, in the order in which
    they are found, by Newton's method with a line search, and deflation. The number of roots is the
    degree; leading coefficients of 0 do not count. *maxIterations limits how often a search may
    change direction before it takes a step. Multiple and clustered roots are found only as
    accurately as the coefficients determine them; CxMultPolyRoots_head is made for these. A search
    can stagnate where the polynomial is constant to the last bit, as x^43 - 1 is around 0.

    Roots are neither refined on nor checked against the whole polynomial. If a search finds a root
    much larger than the remaining ones, deflation multiplies rounding errors by powers of it, and
    the remaining roots may lose all digits, with the code 0. Of 10000 polynomials of degree 25 with
    normal random coefficients, the polynomial rebuilt from the roots had errors of more than 1e-12
    of the coefficients in 55 cases, 1e-8 in 9, and 0.1 in 2; of 5000 of degree 50 in 63, 17 and 7;
    up to degree 10 errors were within 1e-11. CxPolyRoots2026_head has no deflation and no such
    losses. If squares or quotients of coefficients overflow, roots may be infinite or NaN. The code
    is in *err.
    Codes: ErrEmptyInput (coef is empty), ErrBadCoefficients (a coefficient is NaN, or the
    polynomial is constant), ErrOutOfMemory (no memory, or the host refuses the resize),
    ErrNonFiniteFunction (a search arrived at NaN), ErrIterationLimit (a search does not converge).
    NaN: coef refused with ErrBadCoefficients. */
QX_API int32_t CxPolyRoots_head(QX_INOUT CDB1D coef, QX_IN const int32_t *maxIterations,
                                QX_OUT ErrorCode *err);

/** All roots of a real polynomial, found simultaneously: each repeated according to its
    multiplicity, by ascending modulus, real or in exact conjugate pairs, of which the root with
    positive imaginary part comes first. Leading coefficients of 0 do not count. The method is the
    iteration of L. W. Ehrlich and O. Aberth with the start values of D. A. Bini, "Numerical
    computation of polynomial zeros by means of Aberth's method", 1996, and, at the end, with
    polynomial values in twice the precision (S. Graillat, P. Langlois and N. Louvet, "Compensated
    Horner scheme", 2005), so that simple roots are those of the given coefficients to about 2 eps
    as long as their condition number is below 1e15. Coefficients may have any magnitude. For each
    root z, |p(z)| is at most 4 n eps (|a[0]| + |a[1] z| + ... + |a[n] z^n|), tested up to degree
    200 and more. radii[i] is the radius of a disc around roots[i] that contains a root of the
    polynomial; it is large for clusters and multiple roots. The time grows with the square of the
    degree: 0.4 ms at degree 50, 6 ms at degree 200.
    Codes: ErrEmptyInput (coef is empty), ErrBadCoefficients (a coefficient is not finite, or the
    polynomial is constant), ErrOutOfMemory (no memory, or the host refuses an output), ErrOverflow
    (a root is beyond the range of double), ErrIterationLimit (600 sweeps were not enough).
    NaN: coef refused with ErrBadCoefficients. */
QX_API ErrorCode PolyRoots2026_head(QX_IN DBL1D coef, QX_OUT CDB1D roots, QX_OUT DBL1D radii);
/** As PolyRoots2026_head, for complex coefficients, without pairs.
    NaN: coef refused with ErrBadCoefficients. */
QX_API ErrorCode CxPolyRoots2026_head(QX_IN CDB1D coef, QX_OUT CDB1D roots, QX_OUT DBL1D radii);

/** Distinct roots of a real polynomial and their multiplicities. The structure of multiplicities is
    found by repeated greatest common divisors of the polynomial and its derivative; if `refine` is
    not 0, the roots for that structure are then refined by least squares (Z. Zeng, "Computing
    multiple roots of inexact polynomials", 2005). A multiple root is thus found as accurately as a
    simple one, whereas roots found by deflation or as eigenvalues scatter around it. The tolerance
    is the amount by which coefficients may be changed to make roots multiple (a relative amount for
    coefficients above 1), after the polynomial is made monic and its roots are scaled to around 1.
    A tolerance that is not above 0 selects 1e-10.

    `simple` holds the roots before refinement, `refined` the refined ones, and `multiplicities`
    their multiplicities; all have one entry per distinct root. Without refinement `refined` equals
    `simple`; with it the roots are sorted by ascending multiplicity and descending modulus. A root
    at 0 comes last. If no structure fits or the refinement does not converge, the roots are
    eigenvalues of the companion matrix. Up to degree 2, not counting roots at 0, each root counts
    once; there, squares of coefficients or quotients that overflow make roots infinite or NaN. coef
    is unchanged, except that a failure empties it as well.

    The time grows with the cube of the degree, and up to its fourth power if many divisors are
    tried in vain. The memory is about 10 complex numbers times the square of the degree. Measured
    with random coefficients, whose roots are soon proved to be simple: 0.02 s at degree 200, 4 s
    and about 75 MB at degree 700; 21 s at degree 700 with coefficients that decrease like exp(-k^2
    / 7000).
    Codes: ErrEmptyInput (coef is empty), ErrOutOfMemory (no memory, or the host refuses an output),
    ErrBadCoefficients (a coefficient is not finite), ErrAllCoefficientsZero (all coefficients are
    0), ErrOrderNotPositive (the polynomial is constant), ErrNonFiniteInput (the polynomial
    overflows when it is made monic), ErrIterationLimit (eigenvalues do not converge).
    NaN: coef refused with ErrBadCoefficients; tolerance in no result. */
QX_API ErrorCode MultPolyRoots_head(QX_INOUT DBL1D coef, int32_t refine, double tolerance,
                                    QX_OUT CDB1D refined, QX_OUT CDB1D simple,
                                    QX_OUT I32_1D multiplicities);
/** As MultPolyRoots_head, for complex coefficients. */
QX_API ErrorCode CxMultPolyRoots_head(QX_INOUT CDB1D coef, int32_t refine, double tolerance,
                                      QX_OUT CDB1D refined, QX_OUT CDB1D simple,
                                      QX_OUT I32_1D multiplicities);

QX_END_DECLS

#endif
