#ifndef QX_LINALG_EQUATIONS_SCHUR_FACTORS_H
#define QX_LINALG_EQUATIONS_SCHUR_FACTORS_H

#include "linalg/factorisations/balance.h"

namespace qx {

// a = z t z^H with unitary z and (quasi-)triangular t, by our own iteration and therefore with the
// same bits on every processor. t has exact zeros below its diagonal, except in blocks of two.
template <ElementType E>
class SchurFactors {
public:
    // t() holds a matrix of order n whose largest element is about 1; compute() replaces it by its
    // Schur form.
    // A subdiagonal element counts as 0 where it is within eps of its neighbours or at most
    // `negligible`. With NegligibleIn(norm of a) the form is backward stable for the norm of a and
    // not for small parts of a graded matrix, and strongly graded matrices converge; with 0 some of
    // them do not. ErrOutOfMemory from either, ErrIterationLimit from compute().
    ErrorCode allocate(int32_t n);
    ErrorCode compute(double negligible);
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

template <ElementType E>
double FrobeniusNorm(const ConstMatrixView<E> &a) {
    double squares = 0.0;
    for (int32_t i = 0; i < a.rows(); ++i)
        for (int32_t j = 0; j < a.cols(); ++j)
            squares += SquaredModulus(a(i, j));
    return std::sqrt(squares);
}

// Each dropped element adds to the error; together they stay within eps times the norm.
inline double NegligibleIn(double norm) { return epsilon / 16.0 * norm; }

// to = from^H.
template <ElementType E>
void CopyAdjoint(const ConstMatrixView<E> &from, const MatrixView<E> &to);

} // namespace qx

#endif
