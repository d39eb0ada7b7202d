#ifndef QX_LINALG_FACTORISATIONS_BALANCE_H
#define QX_LINALG_FACTORISATIONS_BALANCE_H

#include "linalg/matrix.h"

namespace qx {

// Balancing of a square matrix (B. N. Parlett and C. Reinsch, "Balancing a matrix for calculation
// of eigenvalues and eigenvectors", 1969): a similarity with a permutation, which isolates
// eigenvalues in the corners, and with powers of two, which give the rows and columns of the block
// in between similar norms. The elements must be finite.
//
// Rows and columns low to high (from 0) are the block. scale[i] is the factor of row and column i
// inside the block, and the index with which i was exchanged outside it.
struct Balanced {
    int32_t low, high;
};
template <ElementType E>
Balanced Balance(const MatrixView<E> &a, bool permute, bool scaleToo, RealVector scale);

// Eigenvectors of the balanced matrix, in the columns of v, become those of the original one:
// first the scaling is undone, then the exchanges. Left eigenvectors use the inverse factors.
enum class EigenvectorSide { Right, Left };
template <ElementType E>
void UndoScaling(ConstRealVector scale, Balanced range, EigenvectorSide side,
                 const MatrixView<E> &v);
template <ElementType E>
void UndoPermutation(ConstRealVector scale, Balanced range, const MatrixView<E> &v);

} // namespace qx

#endif
