#ifndef QX_POLYNOMIAL_ROOTS_H
#define QX_POLYNOMIAL_ROOTS_H

/* Roots of polynomials. Coefficients stand in ascending powers: element 0 is the constant term, and
   n coefficients make a polynomial of degree n - 1. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Improves roots that are known roughly: each real guess by Newton steps, of which the point with
    the smallest residual stands, and each pair of complex guesses by Bairstow's method, which finds
    the two roots of a real quadratic factor. `roots` holds one root per guess: the real ones in
    their order, then the real and then the conjugate pairs of the second kind. Complex guesses stay
    as they are if the polynomial has fewer than 4 coefficients, and so does one without a partner.
    PolyRoots2026_head needs no guesses.
    Iterations end when a relative change is below the tolerance, or at their limit, with the best
    values so far. A null array of guesses is an empty one. Where coef is empty, `roots` is emptied.
    Codes: WarnEmptyResult (coef is empty), ErrOutOfMemory (no memory, or the host refuses
    `roots`).
    NaN: coef, newtonTolerance, bairstowTolerance in no result; realGuesses, complexGuesses in some
    results. */
QX_API ErrorCode PolyRootsNtBst_head(QX_IN DBL1D coef, QX_IN DBL1D realGuesses,
                                     int32_t newtonMaxIterations, double newtonTolerance,
                                     QX_IN CDB1D complexGuesses, int32_t bairstowMaxIterations,
                                     double bairstowTolerance, QX_OUT CDB1D roots);

/** All roots of a complex polynomial in place of its coefficients, in the order in which they are
    found: Newton's method with a line search, and deflation. As many roots come out as the degree
    says; coefficients of 0 at the top do not count. *maxIterations is how often a search may turn
    to another direction before it takes a step. Multiple and clustered roots are found as well as
    the coefficients tell them; CxMultPolyRoots_head is made for these. A search can be stuck where
    the polynomial is flat to the last bit, as x^43 - 1 is around 0.

    Roots are not improved on the whole polynomial, and nothing compares them with it. Where a
    search comes upon a root much larger than those that are left, deflation multiplies rounding
    errors by powers of it, and the others may lose all digits, with the code 0. Of 10000
    polynomials of degree 25 with normal random coefficients, the product of the roots was off by
    more than 1e-12 of the coefficients for 55, 1e-8 for 9, and 0.1 for 2; of 5000 of degree 50 for
    63, 17 and 7; up to degree 10 it was within 1e-11. CxPolyRoots2026_head has no deflation and no
    such losses. Where squares of coefficients or quotients of them overflow, roots may be infinite or
    NaN. The code is in *err.
    Codes: ErrEmptyInput (coef is empty), ErrBadCoefficients (a coefficient is NaN, or the
    polynomial is constant), ErrOutOfMemory (no memory, or the host refuses the resize),
    ErrNonFiniteFunction (a search came to NaN), ErrIterationLimit (a search does not converge).
    NaN: coef refused with ErrBadCoefficients. */
QX_API int32_t CxPolyRoots_head(QX_INOUT CDB1D coef, QX_IN const int32_t *maxIterations,
                                QX_OUT ErrorCode *err);

/** All roots of a real polynomial at once, each as often as its multiplicity, by rising modulus; real
    or exact conjugate pairs, of which the upper root comes first. Coefficients of 0 at the top do
    not count. The iteration of L. W. Ehrlich and O. Aberth from the start of D. A. Bini, "Numerical
    computation of polynomial zeros by means of Aberth's method", 1996; at the end with values of
    twice the precision (S. Graillat, P. Langlois and N. Louvet, "Compensated Horner scheme", 2005),
    so that simple roots are those of the given coefficients to about 2 eps as long as their
    condition number is below 1e15. Coefficients may be of any size. For each root z |p(z)| is at
    most 4 n eps (|a[0]| + |a[1] z| + ... + |a[n] z^n|), to degree 200 and more, and radii[i] is the
    radius of a disc around roots[i] in which the polynomial has a root; for clusters and multiple
    roots it is wide. The time grows with the square of the degree: 0.4 ms at degree 50, 6 ms at
    degree 200.
    Codes: ErrEmptyInput (coef is empty), ErrBadCoefficients (a coefficient is not finite, or the
    polynomial is constant), ErrOutOfMemory (no memory, or the host refuses an output), ErrOverflow
    (a root is beyond the range of double), ErrIterationLimit (600 sweeps were not enough).
    NaN: coef refused with ErrBadCoefficients. */
QX_API ErrorCode PolyRoots2026_head(QX_IN DBL1D coef, QX_OUT CDB1D roots, QX_OUT DBL1D radii);
/** As PolyRoots2026_head, for complex coefficients, without pairs.
    NaN: coef refused with ErrBadCoefficients. */
QX_API ErrorCode CxPolyRoots2026_head(QX_IN CDB1D coef, QX_OUT CDB1D roots, QX_OUT DBL1D radii);

/** Distinct roots of a real polynomial and their multiplicities: the structure by repeated greatest
    common divisors of the polynomial and its derivative, and with refine other than 0 the roots for
    that structure by least squares (Z. Zeng, "Computing multiple roots of inexact polynomials",
    2005). So a multiple root comes out as accurately as a simple one, where roots by deflation or
    eigenvalues scatter around it. The tolerance says by how much the coefficients, those above 1
    relative to their size, may be changed to make roots multiple, after the polynomial is made
    monic and its roots are scaled around 1; one not above 0 is 1e-10.

    `simple` holds the roots as the structure gives them, `refined` the refined ones, and
    `multiplicities` one number for each; all have one entry per distinct root. Without refinement
    `refined` is `simple`; with it the roots come by rising multiplicity and falling modulus. A root
    0 comes last. Where no structure fits or the refinement does not converge, the roots are
    eigenvalues of the companion matrix. Up to degree 2, roots at 0 apart, each root counts once;
    there squares of coefficients or quotients that overflow make roots infinite or NaN. coef stays
    as it is, but a failure empties it as well.

    The time grows with the cube of the degree, and up to its fourth power where many divisors are
    tried in vain; the memory is that of some 10 complex numbers times the square of the degree.
    Measured with random coefficients: 0.3 s at degree 200, 12 s and some 75 MB at degree 700; with
    coefficients that fall like exp(-k^2 / 7000) there 94 s.
    Codes: ErrEmptyInput (coef is empty), ErrOutOfMemory (no memory, or the host refuses an output),
    ErrBadCoefficients (a coefficient is not finite), ErrAllCoefficientsZero (all coefficients are
    0), ErrOrderNotPositive (the polynomial is constant), ErrNonFiniteInput (it overflows when it is
    made monic), ErrIterationLimit (eigenvalues do not converge).
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
