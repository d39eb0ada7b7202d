#include "linalg/eigenproblems/generalised.h"

#include "frame/scratch.h"
#include "linalg/aligned.h"
#include "linalg/factorisations/block_order.h"
#include "linalg/lapack.h"
#include "linalg/matrix.h"
#include "linalg/transpose.h"

#include <algorithm>
#include <cmath>

namespace qx {
namespace {

template <ElementType E>
class OrderedPencil {
    typedef ElementOf<E> T;

public:
    explicit OrderedPencil(int32_t n) : n_(n) {}

    ErrorCode compute(const T *a, const T *b, int32_t order, CDB *alpha, T *beta) {
        for (AlignedScratch<E> *block : {&s_, &t_, &q_, &z_})
            if (const ErrorCode failed = block->allocate(int64_t{n_} * n_))
                return failed;
        CopyTransposed<E>(a, n_, n_, n_, s_.data(), n_);
        CopyTransposed<E>(b, n_, n_, n_, t_.data(), n_);
        const int32_t info =
            lapack::GeneralisedSchur(n_, s_.data(), t_.data(), alpha, beta, q_.data(), z_.data());
        if (const ErrorCode failed = CodeOfSchur(info, n_))
            return failed;
        return order == schurUnordered ? 0 : sort(order, alpha, beta);
    }

    void write(T *s, T *t, T *q, T *z) const {
        const std::pair<const AlignedScratch<E> *, T *> pairs[] = {
            {&s_, s}, {&t_, t}, {&q_, q}, {&z_, z}};
        for (const auto &[from, to] : pairs)
            if (to != nullptr)
                CopyTransposed<E>(from->data(), n_, n_, n_, to, n_);
    }

    // Right eigenvectors of unit length, in columns. The Schur vectors z are lost.
    ErrorCode writeVectors(const CDB *alpha, CDB *vectors) {
        const int32_t info = lapack::GeneralisedVectors(n_, s_.data(), t_.data(), z_.data());
        // A form of numbers that overflowed: NaN on the diagonal of t is no real number to LAPACK.
        if (info < 0)
            return info == lapack::noMemory ? ErrOutOfMemory : ErrConditionTooHigh;
        if (info > 0)
            return ErrIterationLimit;
        for (int32_t j = 0; j < n_; ++j) {
            const bool isPair = E == ElementType::DBL && alpha[j].im != 0.0 && j + 1 < n_;
            writeVector(j, isPair ? 1.0 : 0.0, vectors + j);
            if (isPair) {
                writeVector(j, -1.0, vectors + j + 1);
                ++j;
            }
        }
        return 0;
    }

private:
    // Column j, plus i times `sign` times the next one.
    void writeVector(int32_t j, double sign, CDB *vector) const {
        const T *const re = z_.data() + std::ptrdiff_t{j} * n_;
        double squares = 0.0;
        const auto element = [&](int32_t i) {
            const double im = sign == 0.0 ? ImagPart(re[i]) : sign * RealPart(re[i + n_]);
            return CDB{RealPart(re[i]), im};
        };
        for (int32_t i = 0; i < n_; ++i)
            squares += SquaredModulus(element(i));
        const double length = squares > 0.0 ? std::sqrt(squares) : 1.0;
        for (int32_t i = 0; i < n_; ++i)
            vector[std::ptrdiff_t{i} * n_] = element(i) / length;
    }

    ErrorCode sort(int32_t order, CDB *alpha, T *beta) {
        BlockOrder blocks;
        if (const ErrorCode failed = blocks.allocate(n_))
            return failed;
        for (int32_t i = 0; i < n_;) {
            const int32_t size = E == ElementType::DBL && alpha[i].im != 0.0 && i + 1 < n_ ? 2 : 1;
            const double divisor = RealPart(beta[i]);
            blocks.add(alpha[i].re / divisor, Modulus(alpha[i]) / divisor, size, order);
            i += size;
        }
        const auto move = [&](int32_t from, int32_t to) {
            const int32_t info = lapack::MoveInGeneralisedSchur(n_, s_.data(), t_.data(), q_.data(),
                                                                z_.data(), from, to);
            if (info == 0)
                moveValues(from, to, alpha, beta);
            return info;
        };
        if (const ErrorCode failed = blocks.sort(move))
            return failed;
        for (int32_t i = 0; i < n_; ++i)
            if (alpha[i].im == 0.0 || E == ElementType::CDB)
                readValue(i, &alpha[i], &beta[i]);
        return 0;
    }
    // An exchange leaves numbers of any phase on the diagonal of t. LAPACK wants them real and not
    // negative, so column i of s, t and z is turned.
    void readValue(int32_t i, CDB *alpha, T *beta) const {
        const std::ptrdiff_t column = std::ptrdiff_t{i} * n_;
        const double size = Modulus(t_[column + i]);
        if (size != 0.0) {
            const auto phase = Conj(t_[column + i]) / size;
            for (int32_t k = 0; k < n_; ++k) {
                s_[column + k] = s_[column + k] * phase;
                t_[column + k] = t_[column + k] * phase;
                z_[column + k] = z_[column + k] * phase;
            }
            t_[column + i] = ScalarOf<E>::Of(size);
        }
        *alpha = {RealPart(s_[column + i]), ImagPart(s_[column + i])};
        *beta = t_[column + i];
    }
    // As the blocks were moved.
    void moveValues(int32_t from, int32_t to, CDB *alpha, T *beta) const {
        const int32_t size = E == ElementType::DBL && alpha[from].im != 0.0 ? 2 : 1;
        for (int32_t step = 0; step < size; ++step)
            for (int32_t i = from + step; i > to + step; --i) {
                Swap(&alpha[i], &alpha[i - 1]);
                Swap(&beta[i], &beta[i - 1]);
            }
    }

    int32_t n_;
    AlignedScratch<E> s_, t_, q_, z_;
};

template <ElementType E>
ErrorCode Pencil(ElementOf<E> *a, ElementOf<E> *b, int32_t n, int32_t order, ElementOf<E> *q,
                 ElementOf<E> *z, CDB *alpha, ElementOf<E> *beta, CDB *vectors) {
    if (order < schurUnordered || order > schurModulusDescending)
        return ErrInvalidSelector;
    if (n < 1)
        return ErrEmptyInput;
    const int64_t count = int64_t{n} * n;
    if (CheckFinite(a, count) != 0 || CheckFinite(b, count) != 0)
        return ErrNonFiniteInput;
    OrderedPencil<E> pencil(n);
    if (const ErrorCode failed = pencil.compute(a, b, order, alpha, beta))
        return failed;
    pencil.write(a, b, q, z);
    return vectors != nullptr ? pencil.writeVectors(alpha, vectors) : 0;
}

template <ElementType E>
ErrorCode Singular(ElementOf<E> *a, ElementOf<E> *b, int32_t m, int32_t n, int32_t p, int32_t *k,
                   int32_t *l, DBL *alpha, DBL *beta, ElementOf<E> *u, ElementOf<E> *v,
                   ElementOf<E> *q) {
    typedef ElementOf<E> T;
    if (m < 1 || n < 1 || p < 1)
        return ErrEmptyInput;
    if (CheckFinite(a, int64_t{m} * n) != 0 || CheckFinite(b, int64_t{p} * n) != 0)
        return ErrNonFiniteInput;
    struct Copy {
        T *rowMajor;
        int32_t rows, cols;
        AlignedScratch<E> block;
    };
    Copy copies[] = {{a, m, n, {}}, {b, p, n, {}}, {u, m, m, {}}, {v, p, p, {}}, {q, n, n, {}}};
    for (Copy &copy : copies)
        if (const ErrorCode failed = copy.block.allocate(int64_t{copy.rows} * copy.cols))
            return failed;
    AlignedScratch<ElementType::DBL> values;
    if (const ErrorCode failed = values.allocate(2 * int64_t{n}))
        return failed;
    CopyTransposed<E>(a, n, m, n, copies[0].block.data(), m);
    CopyTransposed<E>(b, n, p, n, copies[1].block.data(), p);
    lapack::SingularRanks ranks;
    const int32_t info = lapack::GeneralisedSingular(
        m, n, p, copies[0].block.data(), copies[1].block.data(), &ranks, values.data(),
        values.data() + n, copies[2].block.data(), copies[3].block.data(), copies[4].block.data());
    if (info != 0)
        return info < 0 ? lapack::CodeOf(info) : ErrIterationLimit;
    for (const Copy &copy : copies)
        CopyTransposed<E>(copy.block.data(), copy.rows, copy.cols, copy.rows, copy.rowMajor,
                          copy.cols);
    for (int32_t i = 0; i < n; ++i) {
        alpha[i] = values[i];
        beta[i] = values[n + i];
    }
    *k = ranks.k;
    *l = ranks.l;
    return 0;
}

} // namespace

ErrorCode GeneralisedSchur(DBL *a, DBL *b, int32_t n, int32_t order, DBL *q, DBL *z, CDB *alpha,
                           DBL *beta, CDB *vectors) {
    return Pencil<ElementType::DBL>(a, b, n, order, q, z, alpha, beta, vectors);
}
ErrorCode GeneralisedSchur(CDB *a, CDB *b, int32_t n, int32_t order, CDB *q, CDB *z, CDB *alpha,
                           CDB *beta, CDB *vectors) {
    return Pencil<ElementType::CDB>(a, b, n, order, q, z, alpha, beta, vectors);
}
ErrorCode GeneralisedSingular(DBL *a, DBL *b, int32_t m, int32_t n, int32_t p, int32_t *k,
                              int32_t *l, DBL *alpha, DBL *beta, DBL *u, DBL *v, DBL *q) {
    return Singular<ElementType::DBL>(a, b, m, n, p, k, l, alpha, beta, u, v, q);
}
ErrorCode GeneralisedSingular(CDB *a, CDB *b, int32_t m, int32_t n, int32_t p, int32_t *k,
                              int32_t *l, DBL *alpha, DBL *beta, CDB *u, CDB *v, CDB *q) {
    return Singular<ElementType::CDB>(a, b, m, n, p, k, l, alpha, beta, u, v, q);
}

} // namespace qx
