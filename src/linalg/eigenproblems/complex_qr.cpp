#include "linalg/eigenproblems/complex_qr.h"

#include "linalg/complex_functions.h"
#include "linalg/kernels.h"

#include <algorithm>
#include <cmath>

namespace qx {
namespace {

// The unitary matrix (c, s; -conj(s), c) that maps (x, y) to (r, 0).
struct ComplexRotation {
    ComplexRotation(CDB x, CDB y) {
        const double xSize = Modulus(x), ySize = Modulus(y);
        const double length = std::hypot(xSize, ySize);
        if (ySize == 0.0)
            return;
        if (xSize == 0.0) {
            c = 0.0;
            s = Conj(y) / ySize;
        } else {
            c = xSize / length;
            s = (x / xSize) * (Conj(y) / length);
        }
    }
    double c = 1.0;
    CDB s = {0.0, 0.0};
};

class ComplexQR {
public:
    ComplexQR(const ComplexMatrix &h, Balanced range, double negligible,
              const ComplexMatrix &transposed)
        : h_(h), n_(h.rows()), range_(range), negligible_(negligible), transposed_(transposed) {}

    ErrorCode run(ComplexVector values) {
        for (int32_t i = 0; i < n_; ++i)
            for (int32_t j = std::max(i - 1, 0); j < n_; ++j)
                norm_ += AbsSum(at(i, j));
        int32_t turn = 0;
        for (int32_t last = range_.high; last >= range_.low;) {
            const int32_t l = startOfBlock(last);
            if (l > range_.low)
                at(l, l - 1) = {0.0, 0.0};
            if (l == last) {
                --last;
                turn = 0;
            } else if (turn == limit) {
                return ErrIterationLimit;
            } else {
                step(l, last, turn++);
            }
        }
        for (int32_t i = 0; i < n_; ++i)
            values[i] = at(i, i);
        return 0;
    }

private:
    static constexpr int32_t limit = 40;

    CDB &at(int32_t i, int32_t j) const { return h_(i, j); }

    int32_t startOfBlock(int32_t last) const {
        int32_t l = last;
        for (; l > range_.low; --l) {
            double size = AbsSum(at(l - 1, l - 1)) + AbsSum(at(l, l));
            if (size == 0.0)
                size = norm_;
            if (!(AbsSum(at(l, l - 1)) > std::max(epsilon * size, negligible_)))
                break;
        }
        return l;
    }

    // The eigenvalue of the last 2 by 2 block that is nearer to its last element.
    CDB shift(int32_t last, int32_t turn) const {
        const CDB corner = at(last, last), below = at(last, last - 1);
        if (turn == 10 || turn == 20 || turn == 30)
            return corner + ScalarOf<ElementType::CDB>::Of(0.75 * AbsSum(below));
        const CDB product = SquareRoot(at(last - 1, last)) * SquareRoot(below);
        const double size = AbsSum(product);
        if (size == 0.0)
            return corner;
        const CDB half = (at(last - 1, last - 1) - corner) * 0.5;
        const double scale = std::max(size, AbsSum(half));
        const CDB a = half / scale, b = product / scale;
        CDB root = SquareRoot(a * a + b * b) * scale;
        if (half.re * root.re + half.im * root.im < 0.0)
            root = -root;
        return corner - product * (product / (half + root));
    }

    void step(int32_t l, int32_t last, int32_t turn) {
        CDB x = at(l, l) - shift(last, turn), y = at(l + 1, l);
        for (int32_t k = l; k < last; ++k) {
            const ComplexRotation rotation(x, y);
            const int32_t from = std::max(k - 1, l);
            const int32_t to = wantsVectors() ? n_ : last + 1;
            RotateComplexRows(&at(k, from), &at(k + 1, from), to - from, rotation.c, rotation.s);
            const int32_t top = wantsVectors() ? 0 : l;
            rotateColumns(top, std::min(k + 2, last), k, rotation);
            if (wantsVectors())
                RotateComplexRows(transposed_.row(k), transposed_.row(k + 1), n_, rotation.c,
                                  Conj(rotation.s));
            if (k > l)
                at(k + 1, k - 1) = {0.0, 0.0};
            x = at(k + 1, k);
            if (k + 2 <= last)
                y = at(k + 2, k);
        }
    }
    void rotateColumns(int32_t top, int32_t bottom, int32_t k, const ComplexRotation &r) const {
        for (int32_t i = top; i <= bottom; ++i) {
            const CDB left = at(i, k), right = at(i, k + 1);
            at(i, k) = left * r.c + Conj(r.s) * right;
            at(i, k + 1) = right * r.c - r.s * left;
        }
    }

    bool wantsVectors() const { return !transposed_.isEmpty(); }

    ComplexMatrix h_;
    int32_t n_;
    Balanced range_;
    double negligible_;
    ComplexMatrix transposed_;
    double norm_ = 0.0;
};

} // namespace

ErrorCode ComplexSchurIteration(const ComplexMatrix &h, Balanced range, double negligible,
                                ComplexVector values, const ComplexMatrix &transposed) {
    return ComplexQR(h, range, negligible, transposed).run(values);
}

} // namespace qx
