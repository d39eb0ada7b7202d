#include "linalg/factorisations/schur.h"

#include "frame/scratch.h"
#include "linalg/aligned.h"
#include "linalg/factorisations/block_order.h"
#include "linalg/lapack.h"
#include "linalg/matrix.h"
#include "linalg/transpose.h"

#include <cmath>

namespace qx {
namespace {

template <ElementType E>
class OrderedSchur {
    typedef ElementOf<E> T;

public:
    explicit OrderedSchur(int32_t n) : n_(n) {}

    ErrorCode compute(const T *a, int32_t order, bool withVectors, CDB *w) {
        const int64_t square = int64_t{n_} * n_;
        if (const ErrorCode failed = form_.allocate(square))
            return failed;
        if (const ErrorCode failed = vectors_.allocate(withVectors ? square : 0))
            return failed;
        withVectors_ = withVectors;
        CopyTransposed<E>(a, n_, n_, n_, form_.data(), n_);
        const int32_t info = lapack::Schur(n_, form_.data(), w, vectors());
        if (const ErrorCode failed = CodeOfSchur(info, n_))
            return failed;
        if (order == schurUnordered)
            return 0;
        if (const ErrorCode failed = blocks_.allocate(n_))
            return failed;
        classify(order, w);
        const auto move = [this](int32_t from, int32_t to) {
            return lapack::MoveInSchur(n_, form_.data(), vectors(), from, to);
        };
        if (const ErrorCode failed = blocks_.sort(move))
            return failed;
        readValues(w);
        return 0;
    }
    void write(T *t, T *z) const {
        CopyTransposed<E>(form_.data(), n_, n_, n_, t, n_);
        if (z != nullptr)
            CopyTransposed<E>(vectors_.data(), n_, n_, n_, z, n_);
    }

private:
    T *vectors() const { return withVectors_ ? vectors_.data() : nullptr; }
    // Column after column, as LAPACK has it.
    T &at(int32_t i, int32_t j) const { return form_[std::ptrdiff_t{j} * n_ + i]; }

    // The blocks along the diagonal, each with the key by which they ascend.
    void classify(int32_t order, CDB *w) {
        const double tiny = epsilon * sumOf(w);
        for (int32_t i = 0; i < n_;) {
            const bool isPair = E == ElementType::DBL && w[i].im != 0.0 && i + 1 < n_;
            if (isPair && std::fabs(w[i].im / w[i].re) <= n_ * epsilon &&
                std::fabs(w[i].im) <= tiny) {
                at(i + 1, i) = {};
                w[i].im = w[i + 1].im = 0.0;
                continue;
            }
            const int32_t size = isPair ? 2 : 1;
            blocks_.add(w[i].re, Modulus(w[i]), size, order);
            i += size;
        }
    }
    double sumOf(const CDB *w) const {
        double sum = 0.0;
        for (int32_t i = 0; i < n_; ++i)
            sum += AbsSum(w[i]);
        return sum;
    }

    void readValues(CDB *w) const {
        for (int32_t i = 0; i < n_; ++i) {
            w[i] = {RealPart(at(i, i)), ImagPart(at(i, i))};
            if (E == ElementType::CDB || i + 1 == n_ || RealPart(at(i + 1, i)) == 0.0)
                continue;
            const double im = std::sqrt(std::fabs(RealPart(at(i + 1, i)))) *
                              std::sqrt(std::fabs(RealPart(at(i, i + 1))));
            w[i].im = im;
            w[i + 1] = {RealPart(at(i + 1, i + 1)), -im};
            ++i;
        }
    }

    int32_t n_;
    bool withVectors_ = false;
    AlignedScratch<E> form_, vectors_;
    BlockOrder blocks_;
};

template <ElementType E>
ErrorCode Decompose(const ElementOf<E> *a, int32_t n, int32_t order, ElementOf<E> *z,
                    ElementOf<E> *t, CDB *w) {
    if (order < schurUnordered || order > schurModulusDescending)
        return ErrInvalidSelector;
    if (n < 1)
        return ErrEmptyInput;
    if (CheckFinite(a, int64_t{n} * n) != 0)
        return ErrNonFiniteInput;
    OrderedSchur<E> schur(n);
    if (const ErrorCode failed = schur.compute(a, order, z != nullptr, w))
        return failed;
    schur.write(t, z);
    return 0;
}

} // namespace

ErrorCode SchurDecompose(const DBL *a, int32_t n, int32_t order, DBL *z, DBL *t, CDB *w) {
    return Decompose<ElementType::DBL>(a, n, order, z, t, w);
}
ErrorCode SchurDecompose(const CDB *a, int32_t n, int32_t order, CDB *z, CDB *t, CDB *w) {
    return Decompose<ElementType::CDB>(a, n, order, z, t, w);
}

} // namespace qx
