#ifndef QX_LINALG_EQUATIONS_SCHUR_FACTORS_H
#define QX_LINALG_EQUATIONS_SCHUR_FACTORS_H

#include "linalg/factorisations/balance.h"

namespace qx {

// a = z t z^H with unitary z and (quasi-)triangular t, by our own iteration and so with the same
// bits on every processor. What is below the norm's eps does not count, so the form is backward
// stable for the norm of a and not for small parts of a graded matrix; strongly graded ones
// converge for it. t has exact zeros below its diagonal, blocks of two aside.
template <ElementType E>
class SchurFactors {
public:
    // t() is a matrix of order n whose largest element is about 1, and becomes its Schur form.
    // ErrOutOfMemory from either, ErrIterationLimit from compute().
    ErrorCode allocate(int32_t n);
    ErrorCode compute(double norm);
    // The factors of a^H from those of a, with the rows and columns of t in reverse order, which
    // keeps it upper triangular.
    void setAdjoint(const SchurFactors &a);

    MatrixView<E> t() const { return t_; }
    ConstMatrixView<E> adjoint() const { return adjoint_; } // z^H
    ComplexVector values() const { return values_; }

private:
    ErrorCode iterate(Balanced range, double negligible);
    void clearBelowDiagonal();

    int32_t n_ = 0;
    ScratchParts memory_;
    MatrixView<E> t_, adjoint_;
    ComplexVector values_;
};

// to = from^H.
template <ElementType E>
void CopyAdjoint(const ConstMatrixView<E> &from, const MatrixView<E> &to);

} // namespace qx

#endif
