#include "frame/scratch.h"
#include "linalg/functions/functions.h"
#include "linalg/matrix.h"
#include "linalg/products/products.h"
#include "linalg/systems/least_squares.h"

#include <algorithm>
#include <cstdlib>

namespace qx {
namespace {

template <ElementType E>
class IntegerPower {
    typedef ElementOf<E> T;

public:
    explicit IntegerPower(int32_t n) : n_(n), count_(std::ptrdiff_t{n} * n) {}

    ErrorCode compute(const T *a, int64_t power, T *out) {
        if (const ErrorCode failed = blocks_.allocate(3 * int64_t{count_}))
            return failed;
        T *base = blocks_.data(), *result = base + count_, *spare = result + count_;
        copy(a, base);
        if (power < 0) {
            if (const ErrorCode failed = PseudoInverseMatrix(a, n_, n_, -1.0, base))
                return failed;
            power = -power;
        }
        // Bit by bit from the lowest; the identity is never multiplied with.
        bool isIdentity = true;
        for (; power > 0; power >>= 1) {
            if ((power & 1) != 0 && isIdentity) {
                copy(base, result);
                isIdentity = false;
            } else if ((power & 1) != 0) {
                if (const ErrorCode failed = multiplyInto(base, result, spare))
                    return failed;
                std::swap(result, spare);
            }
            if (power == 1)
                break;
            if (const ErrorCode failed = multiplyInto(base, base, spare))
                return failed;
            std::swap(base, spare);
        }
        if (isIdentity)
            for (std::ptrdiff_t i = 0; i < count_; ++i)
                result[i] = ScalarOf<E>::Of(i % (n_ + 1) == 0 ? 1.0 : 0.0);
        copy(result, out);
        return 0;
    }

private:
    void copy(const T *from, T *to) const {
        for (std::ptrdiff_t i = 0; i < count_; ++i)
            to[i] = from[i];
    }
    ErrorCode multiplyInto(const T *a, const T *b, T *c) const {
        return MatrixProductPlain(a, b, n_, n_, n_, c);
    }

    int32_t n_;
    std::ptrdiff_t count_;
    Scratch<E> blocks_;
};

} // namespace

ErrorCode MatrixPowerInteger(const DBL *a, int32_t n, int32_t power, DBL *out) {
    return n < 1 ? ErrEmptyInput : IntegerPower<ElementType::DBL>(n).compute(a, power, out);
}
ErrorCode MatrixPowerInteger(const CDB *a, int32_t n, int32_t power, CDB *out) {
    return n < 1 ? ErrEmptyInput : IntegerPower<ElementType::CDB>(n).compute(a, power, out);
}

} // namespace qx
