#ifndef QX_LINALG_FUNCTIONS_FUNCTIONS_H
#define QX_LINALG_FUNCTIONS_FUNCTIONS_H

#include "linalg/matrix.h"

namespace qx {

// Functions of a square matrix that is not empty and has no gaps between its rows. Each may return
// ErrOutOfMemory.

// a becomes exp(a), by scaling, a Pade approximant and squaring (C. Moler and C. Van Loan,
// "Nineteen dubious ways to compute the exponential of a matrix", 1978). ErrNonFiniteInput, which
// is also returned if the largest row sum overflows, except for a diagonal matrix.
template <ElementType E>
ErrorCode MatrixExponential(const MatrixView<E> &a);

// out = exp(a) by the method of A. H. Al-Mohy and N. J. Higham, "A new scaling and squaring algorithm
// for the matrix exponential", 2009, for norms of any size. out shares no element with a.
// ErrNonFiniteInput.
template <ElementType E>
ErrorCode ScaledExponential(const ConstMatrixView<E> &a, const MatrixView<E> &out);

// The smallest degree q, at least 1, with e(q) exp(e(q)) <= tolerance / (exp(norm) norm), where
// e(q) = 2^(3 - 2q) q!^2 / ((2q)! (2q + 1)!) bounds the error of the approximant.
int32_t PadeDegree(double tolerance, double norm);

// The principal square root, through the Schur form with eigenvalues of descending modulus; root
// may be a. ErrNonFiniteInput, also if an eigenvalue overflows; the codes of the Schur form;
// WarnLowAccuracy if two or more eigenvalues are below 1e-12, in which case there may be no root.
ErrorCode MatrixSquareRoot(const ConstComplexMatrix &a, const ComplexMatrix &root);

// a becomes its principal logarithm: from the eigenvalues if the condition number of the
// eigenvectors is at most 1e14, otherwise by repeated square roots; then refined until exp
// reproduces a to 1e-12. ErrNonFiniteInput; ErrDegenerateValue (no logarithm was found);
// WarnSingular (a has a zero eigenvalue, but repeated roots gave a result); WarnLowAccuracy (1e-12
// was not reached; a becomes the best logarithm found); the codes of the eigenproblem.
ErrorCode MatrixLogarithm(const ComplexMatrix &a);

// The principal logarithm and square root of a real or complex matrix with elements of any
// magnitude, through the Schur form (triangular_functions.h). Negative real eigenvalues of a real
// matrix, and eigenvalues of a complex matrix that are negative within rounding errors, lie on the
// cut and have the logarithm with +i pi and the root with +i; a real matrix without negative
// eigenvalues has a real result. ErrNonFiniteInput; ErrIterationLimit; ErrDegenerateValue (a has no
// such function, or it overflows). WarnLowAccuracy: for a logarithm if an eigenvalue is no larger
// than the rounding errors, for a root if |root|^2 / |a|, the factor by which errors grow, is above
// 1e8; never for triangular matrices.
template <ElementType E>
ErrorCode PrincipalMatrixLogarithm(const ConstMatrixView<E> &a, const ComplexMatrix &out);
template <ElementType E>
ErrorCode PrincipalMatrixSquareRoot(const ConstMatrixView<E> &a, const ComplexMatrix &out);

// out = a^power by repeated squaring; a negative power is a power of the pseudo-inverse. out may be
// a.
template <ElementType E>
ErrorCode MatrixPower(const ConstMatrixView<E> &a, int32_t power, const MatrixView<E> &out);

// The same, but a negative power is a power of the inverse by LU, scaled by powers of two.
// ErrNonFiniteInput, whatever the power; ErrSingularMatrix; WarnLowAccuracy if a is inverted and its
// reciprocal condition number is below eps.
template <ElementType E>
ErrorCode ScaledMatrixPower(const ConstMatrixView<E> &a, int32_t power, const MatrixView<E> &out);

} // namespace qx

#endif
