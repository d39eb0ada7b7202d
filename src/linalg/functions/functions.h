#ifndef QX_LINALG_FUNCTIONS_FUNCTIONS_H
#define QX_LINALG_FUNCTIONS_FUNCTIONS_H

#include "qx/types.h"

namespace qx {

// Functions of a square row-major matrix of order n. n below 1 is ErrEmptyInput for all of them,
// and each may end with ErrOutOfMemory.

// a becomes exp(a), by scaling, a Pade approximant and squaring (C. Moler and C. Van Loan,
// "Nineteen dubious ways to compute the exponential of a matrix", 1978). ErrNonFiniteInput, also
// where the largest row sum overflows, but not for a diagonal matrix.
ErrorCode MatrixExponential(DBL *a, int32_t n);
ErrorCode MatrixExponential(CDB *a, int32_t n);

// The smallest degree q, at least 1, with e(q) exp(e(q)) <= tolerance / (exp(norm) norm), where
// e(q) = 2^(3 - 2q) q!^2 / ((2q)! (2q + 1)!) bounds the error of the approximant.
int32_t PadeDegree(double tolerance, double norm);

// a becomes its principal square root, through the Schur form with eigenvalues of falling modulus.
// ErrNonFiniteInput, also where an eigenvalue overflows; the codes of the Schur form;
// WarnLowAccuracy where two eigenvalues or more are below 1e-12, for which there may be no root.
ErrorCode MatrixSquareRoot(CDB *a, int32_t n);
// Of a real matrix.
ErrorCode MatrixSquareRoot(const DBL *a, int32_t n, CDB *root);
// r r = t for upper triangular t: the columns from left to right, each from the diagonal up (A.
// Bjorck and S. Hammarling, "A Schur method for the square root of a matrix", 1983).
void TriangularSquareRoot(const CDB *t, int32_t n, CDB *r);

// a becomes its principal logarithm: of the eigenvalues, where the eigenvectors' condition number
// is up to 1e14, else by repeated square roots; then refined until exp gives a back to 1e-12.
// ErrNonFiniteInput; ErrDegenerateValue (no logarithm was found); WarnSingular (a has a zero
// eigenvalue, and repeated roots gave a result all the same); WarnLowAccuracy (1e-12 was not
// reached: the best that was found); the codes of the eigenproblem.
ErrorCode MatrixLogarithm(CDB *a, int32_t n);
// The two ways to it. ByEigen: ErrConditionTooHigh, ErrDegenerateValue (an eigenvalue is 0),
// ErrSingularMatrix. ByRoots: -2^k times `terms` terms of the series of log(1 - y), after as many
// (k) roots as bring the norm of y under `radius`; ErrIterationLimit after 100 of them.
ErrorCode LogByEigen(const CDB *a, int32_t n, CDB *log);
ErrorCode LogByRoots(const CDB *a, int32_t n, CDB *log, int32_t terms, double radius);

// The largest modulus of a - b, relative to the largest of a plus the largest of b.
// ErrNonFiniteInput, with *error NaN.
ErrorCode MatrixRelativeError(const CDB *a, const CDB *b, int32_t n, double *error);

// out = a^power by repeated squaring; a negative power is one of the pseudo-inverse. out is not a.
ErrorCode MatrixPowerInteger(const DBL *a, int32_t n, int32_t power, DBL *out);
ErrorCode MatrixPowerInteger(const CDB *a, int32_t n, int32_t power, CDB *out);

} // namespace qx

#endif
