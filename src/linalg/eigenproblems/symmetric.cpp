#include "linalg/eigenproblems/symmetric.h"

#include "linalg/factorisations/bidiagonal.h"
#include "linalg/factorisations/range.h"
#include "linalg/factorisations/reflector.h"

#include <algorithm>
#include <cmath>

namespace qx {
namespace {

// The implicit QL iteration on the real symmetric tridiagonal matrix with diagonal d and e[i]
// between d[i] and d[i + 1]. The rotations are applied to `rows`, which holds the transposed
// vectors.
class ImplicitQL {
public:
    ImplicitQL(RealVector d, RealVector e, RotationQueue &rows)
        : d_(d), e_(e), n_(static_cast<int32_t>(d.size())), rows_(rows) {}

    ErrorCode run() {
        for (int32_t l = 0; l < n_; ++l)
            for (int32_t turn = 0;; ++turn) {
                const int32_t m = endOfBlock(l);
                if (m == l)
                    break;
                if (turn == SVDIterationLimit)
                    return ErrIterationLimit;
                step(l, m);
            }
        rows_.flush();
        return 0;
    }

private:
    int32_t endOfBlock(int32_t l) const {
        int32_t m = l;
        while (m < n_ - 1 && std::fabs(e_[m]) > epsilon * (std::fabs(d_[m]) + std::fabs(d_[m + 1])))
            ++m;
        return m;
    }

    void step(int32_t l, int32_t m) {
        double g = (d_[l + 1] - d_[l]) / (2.0 * e_[l]);
        double r = std::hypot(g, 1.0);
        g = d_[m] - d_[l] + e_[l] / (g + std::copysign(r, g));
        double s = 1.0, c = 1.0, p = 0.0;
        for (int32_t i = m - 1; i >= l; --i) {
            const double f = s * e_[i], b = c * e_[i];
            r = std::hypot(f, g);
            e_[i + 1] = r;
            if (r == 0.0) { // the block splits here
                d_[i + 1] -= p;
                e_[m] = 0.0;
                return;
            }
            s = f / r;
            c = g / r;
            g = d_[i + 1] - p;
            r = (d_[i] - g) * s + 2.0 * c * b;
            p = s * r;
            d_[i + 1] = g + p;
            g = c * r - b;
            rows_.add(i, i + 1, c, -s);
        }
        d_[l] -= p;
        e_[l] = g;
        e_[m] = 0.0;
    }

    RealVector d_, e_;
    int32_t n_;
    RotationQueue &rows_;
};

template <ElementType E>
class SymmetricProblem {
    typedef ElementOf<E> T;
    typedef Reflector<E> Reflection;

public:
    ErrorCode solve(const ConstMatrixView<E> &a, RealVector values, const MatrixView<E> &vectors) {
        const bool withVectors = !vectors.isEmpty();
        IndexVector order;
        n_ = a.rows();
        if (const ErrorCode failed = memory_.take(
                SizedPadded(matrix_, n_, n_), SizedPadded(basis_, withVectors ? n_ : 0, n_),
                Sized(kappa_, n_), Sized(product_, n_), Sized(work_, 4 * int64_t{n_}),
                Sized(beside_, n_), Sized(order, n_)))
            return failed;

        for (int32_t i = 0; i < n_; ++i)
            for (int32_t j = 0; j <= i; ++j) {
                matrix_(j, i) = Conj(a(i, j));
                matrix_(i, j) = i == j ? T(ScalarOf<E>::Of(RealPart(a(i, j)))) : a(i, j);
            }
        const int exponent = BringIntoRange<E>(matrix_, 0x1p-400);
        reduce(values);
        if (withVectors)
            accumulate();
        RotationQueue rotations(withVectors ? PartsOf(matrix_) : RealMatrix());
        if (const ErrorCode failed = ImplicitQL(values, beside_, rotations).run())
            return failed;

        sort(values, order);
        for (int32_t i = 0; withVectors && i < n_; ++i)
            CopyTransposed<E>(matrix_.block(order[i], 0, 1, n_), vectors.block(0, i, n_, 1));
        for (int32_t i = 0; exponent != 0 && i < n_; ++i)
            values[i] = std::ldexp(values[i], exponent);
        return 0;
    }

private:
    // From the last row up: the reflection that clears row i, except for the element next to the
    // diagonal, acts on the leading block of order i. Row i stores the vector of the reflection.
    void reduce(RealVector diagonal) {
        for (int32_t i = n_ - 1; i > 0; --i) {
            T *const v = matrix_.row(i);
            diagonal[i] = RealPart(v[i]);
            for (int32_t j = 0; j < i; ++j)
                v[j] = Conj(v[j]);
            const Reflection reflection(v + i - 1, -1, i, Reflection::Leave::Reduced);
            kappa_[i] = reflection.kappa;
            beside_[i - 1] = reflection.beta;
            if (AbsSum(reflection.kappa) != 0.0)
                reflectBlock({v, i}, reflection.kappa);
        }
        diagonal[0] = RealPart(matrix_(0, 0));
        beside_[n_ - 1] = 0.0;
    }

    // The leading block a of order n becomes h a h^H = a - v w^H - w v^H with w = a v / conj(kappa)
    // - v (v^H a v) / (2 |kappa|^2).
    void reflectBlock(ConstVectorView<E> v, typename ScalarOf<E>::type k) {
        const auto n = static_cast<int32_t>(v.size());
        const VectorView<E> w = product_.part(0, n), minusW = work_.part(0, n),
                            minusV = work_.part(n, n), vConjugate = work_.part(2 * n, n),
                            wConjugate = work_.part(3 * n, n);
        RowProducts<E>(matrix_.block(0, 0, n, n), v, w);
        double form = 0.0;
        for (int32_t j = 0; j < n; ++j)
            form += RealPart(Conj(v[j]) * w[j]);
        const double share = form / SquaredModulus(k) * 0.5;
        for (int32_t j = 0; j < n; ++j) {
            w[j] = w[j] / Conj(k) - v[j] * share;
            minusW[j] = -w[j];
            minusV[j] = -v[j];
            wConjugate[j] = Conj(w[j]);
            vConjugate[j] = Conj(v[j]);
        }
        constexpr int32_t together = 4; // the rows stay in the cache for the second update
        for (int32_t i = 0; i < n; i += together) {
            const int32_t rows = std::min(together, n - i);
            const MatrixView<E> block = matrix_.block(i, 0, rows, n);
            AddOuterProduct<E>(block, minusV.part(i, rows), wConjugate);
            AddOuterProduct<E>(block, minusW.part(i, rows), vConjugate);
        }
    }

    // The matrix becomes the transposed product of the reflections.
    void accumulate() {
        SetIdentity<E>(basis_);
        for (int32_t i = 1; i < n_; ++i)
            ReflectFromLeft<E>(basis_.block(0, 0, i, i), {matrix_.row(i), i}, Conj(kappa_[i]));
        CopyTransposed<E>(basis_, matrix_);
    }

    // Exchange sort, ascending.
    void sort(RealVector values, IndexVector order) const {
        for (int32_t i = 0; i < n_; ++i)
            order[i] = i;
        for (int32_t i = 0; i < n_; ++i)
            for (int32_t j = i + 1; j < n_; ++j)
                if (values[j] < values[i]) {
                    Swap(&values[i], &values[j]);
                    Swap(&order[i], &order[j]);
                }
    }

    int32_t n_ = 0;
    ScratchParts memory_;
    MatrixView<E> matrix_, basis_;
    VectorView<E> kappa_, product_, work_;
    RealVector beside_;
};

} // namespace

template <ElementType E>
ErrorCode SymmetricEigen(const ConstMatrixView<E> &a, RealVector values,
                         const MatrixView<E> &vectors) {
    QX_EXPECTS(a.isSquare() && !a.isEmpty() && values.size() == a.rows());
    if (!AllFinite<E>(a))
        return ErrNonFiniteInput;
    return SymmetricProblem<E>().solve(a, values, vectors);
}

template ErrorCode SymmetricEigen(const ConstRealMatrix &, RealVector, const RealMatrix &);
template ErrorCode SymmetricEigen(const ConstComplexMatrix &, RealVector, const ComplexMatrix &);

} // namespace qx
