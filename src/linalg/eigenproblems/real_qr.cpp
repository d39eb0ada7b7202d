#include "linalg/eigenproblems/real_qr.h"

#include "linalg/kernels.h"
#include "linalg/scalar.h"

#include <algorithm>
#include <cmath>

namespace qx {
namespace {

// Reflections of the rows of the transposed Schur vectors, collected and applied many at a time.
class ReflectionQueue {
public:
    explicit ReflectionQueue(const RealMatrix &a) : a_(a) {}
    void add(const SmallReflection &reflection) {
        if (a_.isEmpty())
            return;
        queue_[count_++] = reflection;
        if (count_ == capacity)
            flush();
    }
    void rotate(const Rotation &rotation) {
        flush();
        if (!a_.isEmpty())
            RotateRows(a_.data(), a_.stride(), a_.cols(), &rotation, 1);
    }
    void flush() {
        if (count_ > 0)
            ReflectRows(a_.data(), a_.stride(), a_.cols(), queue_, count_);
        count_ = 0;
    }

private:
    static constexpr int32_t capacity = 256;
    RealMatrix a_;
    int32_t count_ = 0;
    SmallReflection queue_[capacity];
};

// The double-shift QR iteration on a real Hessenberg matrix (J. G. F. Francis, "The QR
// transformation", The Computer Journal 4, 1962, pages 332 to 345). With Schur vectors the whole
// matrix becomes quasi-triangular; without them only the part that the eigenvalues need is updated.
class RealQR {
public:
    RealQR(const RealMatrix &h, Balanced range, double negligible, ComplexVector values,
           const RealMatrix &transposed)
        : h_(h), n_(h.rows()), range_(range), negligible_(negligible), values_(values),
          wantsVectors_(!transposed.isEmpty()), norm_(SumOfHessenberg(h)), vectors_(transposed) {}

    ErrorCode run() {
        for (int32_t i = 0; i < n_; ++i)
            if (i < range_.low || i > range_.high)
                values_[i] = {at(i, i), 0.0};
        int32_t last = range_.high;
        int32_t turn = 0;
        while (last >= range_.low) {
            const int32_t l = startOfBlock(last);
            if (l == last) {
                splitOne(last--);
                turn = 0;
            } else if (l == last - 1) {
                splitTwo(last);
                last -= 2;
                turn = 0;
            } else if (turn == limit) {
                return ErrIterationLimit;
            } else {
                step(l, last, turn++);
            }
        }
        vectors_.flush();
        return 0;
    }

private:
    static constexpr int32_t limit = 40;

    DBL &at(int32_t i, int32_t j) const { return h_(i, j); }

    int32_t startOfBlock(int32_t last) const {
        int32_t l = last;
        for (; l > range_.low; --l) {
            double size = std::fabs(at(l - 1, l - 1)) + std::fabs(at(l, l));
            if (size == 0.0)
                size = norm_;
            if (!(std::fabs(at(l, l - 1)) > std::max(epsilon * size, negligible_)))
                break;
        }
        return l;
    }

    void splitOne(int32_t last) {
        at(last, last) += shift_;
        values_[last] = {at(last, last), 0.0};
    }

    void splitTwo(int32_t last) {
        const int32_t first = last - 1;
        const double w = at(last, first) * at(first, last);
        const double p = (at(first, first) - at(last, last)) / 2.0;
        const double q = p * p + w;
        const double root = std::sqrt(std::fabs(q));
        at(last, last) += shift_;
        at(first, first) += shift_;
        const double x = at(last, last);
        if (q < 0.0) {
            values_[first] = {x + p, root};
            values_[last] = {x + p, -root};
            return;
        }
        const double z = p + std::copysign(root, p);
        values_[first] = values_[last] = {x + z, 0.0};
        if (z != 0.0)
            values_[last].re = x - w / z;
        if (wantsVectors_)
            makeTriangular(first, z);
    }

    // A rotation clears the element below the diagonal of a block with real eigenvalues.
    void makeTriangular(int32_t first, double z) {
        const int32_t last = first + 1;
        const double x = at(last, first);
        const double scale = std::fabs(x) + std::fabs(z);
        const double length = std::sqrt((x / scale) * (x / scale) + (z / scale) * (z / scale));
        const double s = x / scale / length, c = z / scale / length;
        const Rotation rotation{0, 1, c, s};
        RotateRows(&at(first, first), h_.stride(), n_ - first, &rotation, 1);
        for (int32_t i = 0; i <= last; ++i) {
            const double left = at(i, first), right = at(i, last);
            at(i, first) = c * left + s * right;
            at(i, last) = c * right - s * left;
        }
        at(last, first) = 0.0;
        vectors_.rotate({first, last, c, s});
    }

    struct Shift {
        double x, y, w;
    };
    Shift chooseShift(int32_t last, int32_t turn) {
        const int32_t first = last - 1;
        if (turn != 10 && turn != 20 && turn != 30)
            return {at(last, last), at(first, first), at(last, first) * at(first, last)};
        const double x = at(last, last);
        shift_ += x;
        for (int32_t i = range_.low; i <= last; ++i)
            at(i, i) -= x;
        const double size = std::fabs(at(last, first)) + std::fabs(at(first, last - 2));
        return {0.75 * size, 0.75 * size, -0.4375 * size * size};
    }

    // The row at which the bulge may start, because two consecutive subdiagonal elements are small,
    // and the first column of the shifted product there.
    int32_t startOfBulge(int32_t l, int32_t last, const Shift &shift, double column[3]) const {
        int32_t m = last - 2;
        for (;; --m) {
            const double z = at(m, m), r = shift.x - z, s = shift.y - z;
            column[0] = (r * s - shift.w) / at(m + 1, m) + at(m, m + 1);
            column[1] = at(m + 1, m + 1) - z - r - s;
            column[2] = at(m + 2, m + 1);
            const double size = std::fabs(column[0]) + std::fabs(column[1]) + std::fabs(column[2]);
            for (int i = 0; i < 3; ++i)
                column[i] /= size;
            if (m == l)
                return m;
            const double beside =
                std::fabs(at(m - 1, m - 1)) + std::fabs(z) + std::fabs(at(m + 1, m + 1));
            const double below =
                std::fabs(at(m, m - 1)) * (std::fabs(column[1]) + std::fabs(column[2]));
            if (!(below > epsilon * (std::fabs(column[0]) * beside)))
                return m;
        }
    }

    void step(int32_t l, int32_t last, int32_t turn) {
        const Shift shift = chooseShift(last, turn);
        double p[3];
        const int32_t m = startOfBulge(l, last, shift, p);
        for (int32_t i = m + 2; i <= last; ++i) {
            at(i, i - 2) = 0.0;
            if (i > m + 2)
                at(i, i - 3) = 0.0;
        }
        if (!wantsVectors_) {
            ChaseBulge(h_.data(), h_.stride(), l, m, last, p);
            return;
        }
        for (int32_t k = m; k < last; ++k)
            chase(l, m, k, last, p);
    }

    // Moves the bulge on from row k, in the whole matrix.
    void chase(int32_t l, int32_t m, int32_t k, int32_t last, double p[3]) {
        const int32_t size = k == last - 1 ? 2 : 3;
        double scale = 1.0;
        if (k != m) {
            p[0] = at(k, k - 1);
            p[1] = at(k + 1, k - 1);
            p[2] = size == 3 ? at(k + 2, k - 1) : 0.0;
            scale = std::fabs(p[0]) + std::fabs(p[1]) + std::fabs(p[2]);
            if (scale == 0.0)
                return;
            for (int i = 0; i < 3; ++i)
                p[i] /= scale;
        }
        const double s = std::copysign(std::sqrt(p[0] * p[0] + p[1] * p[1] + p[2] * p[2]), p[0]);
        if (k != m)
            at(k, k - 1) = -s * scale;
        else if (l != m)
            at(k, k - 1) = -at(k, k - 1);
        if (s == 0.0)
            return;
        p[0] += s;
        const double x = p[0] / s, y = p[1] / s, z = p[2] / s;
        const double q = p[1] / p[0], r = p[2] / p[0];

        const SmallReflection rows{0, size, {1.0, q, r}, {x, y, z}};
        ReflectRows(&at(k, k), h_.stride(), n_ - k, &rows, 1);
        SmallReflection columns{k, size, {x, y, z}, {1.0, q, r}};
        vectors_.add(columns);
        ReflectColumns(&at(0, 0), h_.stride(), std::min(last, k + 3) + 1, &columns);
    }

    RealMatrix h_;
    int32_t n_;
    Balanced range_;
    double negligible_;
    ComplexVector values_;
    bool wantsVectors_;
    double norm_;
    double shift_ = 0.0; // what has been subtracted from the diagonal
    ReflectionQueue vectors_;
};

} // namespace

double SumOfHessenberg(const ConstRealMatrix &h) {
    double sum = 0.0;
    for (int32_t i = 0; i < h.rows(); ++i)
        for (int32_t j = std::max(i - 1, 0); j < h.cols(); ++j)
            sum += std::fabs(h(i, j));
    return sum;
}

ErrorCode RealSchurIteration(const RealMatrix &h, Balanced range, double negligible,
                             ComplexVector values, const RealMatrix &transposed) {
    return RealQR(h, range, negligible, values, transposed).run();
}

} // namespace qx
