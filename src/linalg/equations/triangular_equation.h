#ifndef QX_LINALG_EQUATIONS_TRIANGULAR_EQUATION_H
#define QX_LINALG_EQUATIONS_TRIANGULAR_EQUATION_H

#include "linalg/matrix.h"

namespace qx {

// s y + y t = f, or with `products` s y t - tau y = f, for upper triangular s and t; real ones may
// have blocks of two on the diagonal, where the element below it is not 0. The elements of s and t
// are at most about 1.
template <ElementType E>
struct TriangularEquation {
    ConstMatrixView<E> s, t;
    bool products;
    double tau;
    // In the smallest systems, a pivot below this value is replaced by it.
    double leastPivot;
};

// y replaces f, divided by the power of two whose exponent is returned: 0, unless elements grow
// beyond 2^500. Back substitution by blocks, which halves the longer side until one element or one
// block of two by two is left (R. H. Bartels and G. W. Stewart, "Solution of the matrix equation AX
// + XB = C", 1972; the halving after I. Jonsson and B. Kagstrom, "Recursive blocked algorithms for
// solving triangular systems", 2002). `work` is as large as f.
template <ElementType E>
int SolveTriangularEquation(const TriangularEquation<E> &equation, const MatrixView<E> &f,
                            const MatrixView<E> &work);

} // namespace qx

#endif
