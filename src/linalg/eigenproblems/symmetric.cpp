#include "linalg/eigenproblems/symmetric.h"

#include "frame/scratch.h"
#include "linalg/eigenproblems/general.h"
#include "linalg/factorisations/bidiagonal.h"
#include "linalg/factorisations/range.h"
#include "linalg/factorisations/reflector.h"
#include "linalg/matrix.h"
#include "linalg/transpose.h"

#include <algorithm>
#include <cmath>

namespace qx {
namespace {

// The implicit QL iteration on the real symmetric tridiagonal matrix with diagonal d and e[i]
// beside d[i] and d[i + 1]. The rotations go to `rows`, which holds the transposed vectors.
class ImplicitQL {
public:
    ImplicitQL(DBL *d, DBL *e, int32_t n, RotationQueue &rows) : d_(d), e_(e), n_(n), rows_(rows) {}

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
            if (r == 0.0) { // the block falls apart here
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

    DBL *d_, *e_;
    int32_t n_;
    RotationQueue &rows_;
};

template <ElementType E>
class SymmetricProblem {
    typedef ElementOf<E> T;
    typedef Reflector<E> Reflection;

public:
    explicit SymmetricProblem(int32_t n) : n_(n), stride_(PaddedStride(n)) {}

    ErrorCode solve(const T *a, bool withVectors, DBL *values, T *vectors) {
        const int64_t square = n_ * int64_t{stride_};
        if (const ErrorCode failed = matrix_.allocate(square))
            return failed;
        if (const ErrorCode failed = basis_.allocate(withVectors ? square : 0))
            return failed;
        if (const ErrorCode failed = vectors_.allocate(6 * int64_t{n_}))
            return failed;
        if (const ErrorCode failed = beside_.allocate(n_))
            return failed;
        Scratch<ElementType::I32> order;
        if (const ErrorCode failed = order.allocate(n_))
            return failed;

        for (int32_t i = 0; i < n_; ++i)
            for (int32_t j = 0; j <= i; ++j) {
                at(j)[i] = Conj(a[i * n_ + j]);
                at(i)[j] = i == j ? T(ScalarOf<E>::Of(RealPart(a[i * n_ + j]))) : a[i * n_ + j];
            }
        const int exponent = BringIntoRange<E>(matrix_.data(), stride_, n_, n_, 0x1p-400);
        reduce(values);
        if (withVectors)
            accumulate();
        constexpr int32_t parts = partsOf<E>;
        RotationQueue rotations(withVectors ? reinterpret_cast<DBL *>(matrix_.data()) : nullptr,
                                stride_ * parts, n_ * parts);
        if (const ErrorCode failed = ImplicitQL(values, beside_.data(), n_, rotations).run())
            return failed;

        sort(values, order.data());
        for (int32_t i = 0; withVectors && i < n_; ++i)
            CopyTransposed<E>(at(order[i]), 0, 1, n_, vectors + i, n_);
        for (int32_t i = 0; exponent != 0 && i < n_; ++i)
            values[i] = std::ldexp(values[i], exponent);
        return 0;
    }

private:
    T *at(int32_t row) const { return matrix_.data() + row * stride_; }
    T *kappa() const { return vectors_.data(); }
    T *product() const { return vectors_.data() + n_; }
    T *work() const { return vectors_.data() + 2 * n_; }

    // From the last row up: the reflection that clears row i but for the element beside the
    // diagonal acts on the leading block of order i. Row i keeps its vector.
    void reduce(DBL *diagonal) {
        for (int32_t i = n_ - 1; i > 0; --i) {
            T *const v = at(i);
            diagonal[i] = RealPart(v[i]);
            for (int32_t j = 0; j < i; ++j)
                v[j] = Conj(v[j]);
            const Reflection reflection(v + i - 1, -1, i, Reflection::Leave::Reduced);
            kappa()[i] = reflection.kappa;
            beside_[i - 1] = reflection.beta;
            if (AbsSum(reflection.kappa) != 0.0)
                reflectBlock(i, v, reflection.kappa);
        }
        diagonal[0] = RealPart(at(0)[0]);
        beside_[n_ - 1] = 0.0;
    }

    // The leading block a of order n becomes h a h^H = a - v w^H - w v^H with w = a v / conj(kappa)
    // - v (v^H a v) / (2 |kappa|^2).
    void reflectBlock(int32_t n, const T *v, typename ScalarOf<E>::type k) {
        T *const w = product(), *const minusW = work(), *const minusV = work() + n;
        T *const vConjugate = work() + 2 * n, *const wConjugate = work() + 3 * n;
        RowProducts(matrix_.data(), stride_, n, n, v, w);
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
        constexpr int32_t together = 4; // rows stay in the cache for the second update
        for (int32_t i = 0; i < n; i += together) {
            const int32_t rows = std::min(together, n - i);
            AddOuterProduct(at(i), stride_, rows, n, minusV + i, wConjugate);
            AddOuterProduct(at(i), stride_, rows, n, minusW + i, vConjugate);
        }
    }

    // The matrix becomes the transposed product of the reflections.
    void accumulate() {
        T *const q = basis_.data();
        for (int32_t i = 0; i < n_; ++i)
            for (int32_t j = 0; j < n_; ++j)
                q[i * stride_ + j] = ScalarOf<E>::Of(i == j ? 1.0 : 0.0);
        for (int32_t i = 1; i < n_; ++i)
            ReflectFromLeft<E>(q, stride_, i, i, at(i), Conj(kappa()[i]), work());
        CopyTransposed<E>(q, stride_, n_, n_, matrix_.data(), stride_);
    }

    // Exchange sort, ascending.
    void sort(DBL *values, I32 *order) const {
        for (int32_t i = 0; i < n_; ++i)
            order[i] = i;
        for (int32_t i = 0; i < n_; ++i)
            for (int32_t j = i + 1; j < n_; ++j)
                if (values[j] < values[i]) {
                    Swap(&values[i], &values[j]);
                    Swap(&order[i], &order[j]);
                }
    }

    int32_t n_;
    std::ptrdiff_t stride_;
    Scratch<E> matrix_, basis_, vectors_;
    Scratch<ElementType::DBL> beside_;
};

template <ElementType E>
ErrorCode Solve(const ElementOf<E> *a, int32_t n, int32_t output, DBL *values,
                ElementOf<E> *vectors) {
    if (n < 1)
        return ErrEmptyInput;
    if (output != eigenValuesOnly && output != eigenValuesAndVectors)
        return ErrInvalidSelector;
    if (CheckFinite(a, int64_t{n} * n) != 0)
        return ErrNonFiniteInput;
    return SymmetricProblem<E>(n).solve(a, output == eigenValuesAndVectors, values, vectors);
}

} // namespace

ErrorCode SymmetricEigen(const DBL *a, int32_t n, int32_t output, DBL *values, DBL *vectors) {
    return Solve<ElementType::DBL>(a, n, output, values, vectors);
}
ErrorCode SymmetricEigen(const CDB *a, int32_t n, int32_t output, DBL *values, CDB *vectors) {
    return Solve<ElementType::CDB>(a, n, output, values, vectors);
}

} // namespace qx
