#include "linalg/eigenproblems/general.h"

#include "frame/scratch.h"
#include "linalg/factorisations/balance.h"
#include "linalg/factorisations/hessenberg.h"
#include "linalg/factorisations/range.h"
#include "linalg/kernels.h"
#include "linalg/matrix.h"
#include "linalg/transpose.h"

#include <algorithm>
#include <cmath>

namespace qx {
namespace {

// Reflections of the rows of the transposed Schur vectors, collected and applied many at a time.
class ReflectionQueue {
public:
    void direct(DBL *a, std::ptrdiff_t stride, int32_t width) {
        a_ = a;
        stride_ = stride;
        width_ = width;
    }
    void add(const SmallReflection &reflection) {
        if (a_ == nullptr)
            return;
        queue_[count_++] = reflection;
        if (count_ == capacity)
            flush();
    }
    void rotate(const Rotation &rotation) {
        flush();
        if (a_ != nullptr)
            RotateRows(a_, stride_, width_, &rotation, 1);
    }
    void flush() {
        if (count_ > 0)
            ReflectRows(a_, stride_, width_, queue_, count_);
        count_ = 0;
    }

private:
    static constexpr int32_t capacity = 256;
    DBL *a_ = nullptr;
    std::ptrdiff_t stride_ = 0;
    int32_t width_ = 0, count_ = 0;
    SmallReflection queue_[capacity];
};

// The double-shift QR iteration on a real Hessenberg matrix (J. G. F. Francis, "The QR
// transformation", The Computer Journal 4, 1962, pages 332 to 345). With Schur vectors the whole
// matrix becomes quasi-triangular, without them only the part that the eigenvalues need is kept up.
class RealQR {
public:
    RealQR(DBL *h, std::ptrdiff_t stride, int32_t n, Balanced range, CDB *values)
        : h_(h), stride_(stride), n_(n), range_(range), values_(values) {}

    void keepVectors(DBL *transposed, std::ptrdiff_t stride) {
        wantsVectors_ = true;
        vectors_.direct(transposed, stride, n_);
    }

    ErrorCode run() {
        for (int32_t i = 0; i < n_; ++i) {
            for (int32_t j = std::max(i - 1, 0); j < n_; ++j)
                norm_ += std::fabs(at(i, j));
            if (i < range_.low || i > range_.high)
                values_[i] = {at(i, i), 0.0};
        }
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
    double norm() const { return norm_; }

private:
    static constexpr int32_t limit = 40;

    DBL &at(int32_t i, int32_t j) const { return h_[i * stride_ + j]; }

    int32_t startOfBlock(int32_t last) const {
        int32_t l = last;
        for (; l > range_.low; --l) {
            double size = std::fabs(at(l - 1, l - 1)) + std::fabs(at(l, l));
            if (size == 0.0)
                size = norm_;
            if (!(std::fabs(at(l, l - 1)) > epsilon * size))
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
        RotateRows(&at(first, first), stride_, n_ - first, &rotation, 1);
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

    // The row at which the bulge may start, because two elements in a row beside the diagonal are
    // small, and the first column of the shifted product there.
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
        for (int32_t k = m; k < last; ++k)
            chase(l, m, k, last, p);
    }

    // Moves the bulge on from row k.
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

        const int32_t from = k, to = wantsVectors_ ? n_ : last + 1;
        const SmallReflection rows{0, size, {1.0, q, r}, {x, y, z}};
        ReflectRows(&at(k, from), stride_, to - from, &rows, 1);
        SmallReflection columns{k, size, {x, y, z}, {1.0, q, r}};
        vectors_.add(columns);
        const int32_t top = wantsVectors_ ? 0 : l;
        ReflectColumns(&at(top, 0), stride_, std::min(last, k + 3) + 1 - top, &columns);
    }

    DBL *h_;
    std::ptrdiff_t stride_;
    int32_t n_;
    Balanced range_;
    CDB *values_;
    bool wantsVectors_ = false;
    double norm_ = 0.0;
    double shift_ = 0.0; // what has been taken from the diagonal
    ReflectionQueue vectors_;
};

// Eigenvectors of the quasi-triangular matrix that RealQR leaves, by back substitution. x and y are
// the real and the imaginary part of a vector, of which elements 0 to `last` are not 0.
class QuasiTriangular {
public:
    QuasiTriangular(const DBL *t, std::ptrdiff_t stride, double norm, const CDB *values, DBL *x,
                    DBL *y)
        : t_(t), stride_(stride), norm_(norm > 0.0 ? norm : 1.0), values_(values), x_(x), y_(y) {}

    void realVector(int32_t last) {
        const double value = values_[last].re;
        int32_t known = last;
        x_[last] = 1.0;
        double lowerDiagonal = 0.0, lowerSum = 0.0;
        for (int32_t i = last - 1; i >= 0; --i) {
            const double diagonal = at(i, i) - value;
            const double sum = product(i, known, last, x_);
            if (values_[i].im < 0.0) { // the lower row of a pair waits for the upper one
                lowerDiagonal = diagonal;
                lowerSum = sum;
                continue;
            }
            known = i;
            if (values_[i].im == 0.0)
                x_[i] = -sum / (diagonal != 0.0 ? diagonal : epsilon * norm_);
            else
                solveRealPair(i, value, diagonal, sum, lowerDiagonal, lowerSum);
            shrink(i, last, std::fabs(x_[i]), false);
        }
    }

    // The vector of the value with positive imaginary part, at last - 1.
    void complexVector(int32_t last) {
        const double value = values_[last].re, q = values_[last].im;
        startComplex(last, value, q);
        int32_t known = last - 1;
        CDB lower = {0.0, 0.0};
        double lowerDiagonal = 0.0;
        for (int32_t i = last - 2; i >= 0; --i) {
            const double diagonal = at(i, i) - value;
            const CDB sum = {product(i, known, last, x_), product(i, known, last, y_)};
            if (values_[i].im < 0.0) {
                lowerDiagonal = diagonal;
                lower = sum;
                continue;
            }
            known = i;
            if (values_[i].im == 0.0)
                set(i, -sum / CDB{diagonal, q});
            else
                solveComplexPair(i, {value, q}, diagonal, sum, lowerDiagonal, lower);
            shrink(i, last, std::max(std::fabs(x_[i]), std::fabs(y_[i])), true);
        }
    }

private:
    double at(int32_t i, int32_t j) const { return t_[i * stride_ + j]; }
    void set(int32_t i, CDB value) {
        x_[i] = value.re;
        y_[i] = value.im;
    }
    double product(int32_t i, int32_t from, int32_t to, const DBL *v) const {
        DBL sum;
        RowProductsReal(t_ + i * stride_ + from, stride_, 1, to + 1 - from, v + from, &sum);
        return sum;
    }

    void solveRealPair(int32_t i, double value, double diagonal, double sum, double lowerDiagonal,
                       double lowerSum) {
        const double right = at(i, i + 1), below = at(i + 1, i);
        const double distance = values_[i].re - value;
        const double determinant = distance * distance + values_[i].im * values_[i].im;
        const double upper = (right * lowerSum - lowerDiagonal * sum) / determinant;
        x_[i] = upper;
        x_[i + 1] = std::fabs(right) > std::fabs(lowerDiagonal)
                        ? (-sum - diagonal * upper) / right
                        : (-lowerSum - below * upper) / lowerDiagonal;
    }

    void startComplex(int32_t last, double value, double q) {
        const int32_t first = last - 1;
        if (std::fabs(at(last, first)) > std::fabs(at(first, last)))
            set(first, {q / at(last, first), -(at(last, last) - value) / at(last, first)});
        else
            set(first, CDB{0.0, -at(first, last)} / CDB{at(first, first) - value, q});
        set(last, {0.0, 1.0});
    }

    void solveComplexPair(int32_t i, CDB value, double diagonal, CDB sum, double lowerDiagonal,
                          CDB lower) {
        const double right = at(i, i + 1), below = at(i + 1, i), q = value.im;
        const double distance = values_[i].re - value.re;
        CDB determinant = {distance * distance + values_[i].im * values_[i].im - q * q,
                           distance * 2.0 * q};
        if (determinant.re == 0.0 && determinant.im == 0.0)
            determinant.re = epsilon * norm_ *
                             (std::fabs(diagonal) + std::fabs(q) + std::fabs(right) +
                              std::fabs(below) + std::fabs(lowerDiagonal));
        const CDB numerator = {right * lower.re - lowerDiagonal * sum.re + q * sum.im,
                               right * lower.im - lowerDiagonal * sum.im - q * sum.re};
        const CDB upper = numerator / determinant;
        set(i, upper);
        if (std::fabs(right) > std::fabs(lowerDiagonal) + std::fabs(q))
            set(i + 1, {(-sum.re - diagonal * upper.re + q * upper.im) / right,
                        (-sum.im - diagonal * upper.im - q * upper.re) / right});
        else
            set(i + 1, (-lower - upper * below) / CDB{lowerDiagonal, q});
    }

    // Keeps what has been found so small that its products do not overflow.
    void shrink(int32_t from, int32_t to, double size, bool isComplex) {
        if (!(epsilon * size * size > 1.0))
            return;
        for (int32_t j = from; j <= to; ++j) {
            x_[j] /= size;
            if (isComplex)
                y_[j] /= size;
        }
    }

    const DBL *t_;
    std::ptrdiff_t stride_;
    double norm_;
    const CDB *values_;
    DBL *x_, *y_;
};

class RealEigenproblem {
public:
    explicit RealEigenproblem(int32_t n) : n_(n), stride_(PaddedStride(n)) {}

    ErrorCode solve(const DBL *a, bool withVectors, CDB *values, CDB *vectors) {
        const int64_t square = n_ * int64_t{stride_};
        if (const ErrorCode failed = matrix_.allocate(square))
            return failed;
        if (const ErrorCode failed = schur_.allocate(withVectors ? 2 * square : 0))
            return failed;
        if (const ErrorCode failed = vectors_.allocate(5 * int64_t{n_}))
            return failed;

        DBL *const h = matrix_.data(), *const scale = vectors_.data();
        CopyMatrix<ElementType::DBL>(a, n_, n_, n_, h, stride_);
        const int exponent = BringIntoRange<ElementType::DBL>(h, stride_, n_, n_, 0x1p-400);
        const Balanced range = Balance<ElementType::DBL>(h, stride_, n_, true, true, scale);
        DBL *const q = withVectors ? schur_.data() + square : nullptr;
        if (const ErrorCode failed = ReduceToHessenberg<ElementType::DBL>(h, stride_, n_, range.low,
                                                                          range.high, q, stride_))
            return failed;

        RealQR iteration(h, stride_, n_, range, values);
        if (withVectors) {
            CopyTransposed<ElementType::DBL>(q, stride_, n_, n_, schur_.data(), stride_);
            iteration.keepVectors(schur_.data(), stride_);
        }
        if (const ErrorCode failed = iteration.run())
            return failed;
        if (withVectors)
            writeVectors(iteration.norm(), range, values, vectors);
        for (int32_t i = 0; exponent != 0 && i < n_; ++i)
            values[i] = {std::ldexp(values[i].re, exponent), std::ldexp(values[i].im, exponent)};
        return 0;
    }

private:
    void writeVectors(double norm, Balanced range, const CDB *values, CDB *vectors) {
        DBL *const x = vectors_.data() + n_, *const y = x + n_;
        DBL *const re = y + n_, *const im = re + n_;
        QuasiTriangular triangle(matrix_.data(), stride_, norm, values, x, y);
        for (int32_t j = n_ - 1; j >= 0; --j) {
            const bool isPair = values[j].im < 0.0;
            Fill(y, n_, 0.0);
            Fill(im, n_, 0.0);
            if (isPair) {
                triangle.complexVector(j);
                transformBack(y, j, range, im);
            } else {
                triangle.realVector(j);
            }
            transformBack(x, j, range, re);
            normalise(re, im);
            for (int32_t i = 0; i < n_; ++i) {
                vectors[i * n_ + j] = {re[i], isPair ? -im[i] : im[i]};
                if (isPair)
                    vectors[i * n_ + j - 1] = {re[i], im[i]};
            }
            j -= isPair;
        }
    }
    void transformBack(const DBL *x, int32_t last, Balanced range, DBL *v) {
        Fill(v, n_, 0.0);
        AddTransposedProductReal(schur_.data(), stride_, last + 1, n_, x, v);
        constexpr auto side = EigenvectorSide::Right;
        UndoScaling<ElementType::DBL>(vectors_.data(), range, side, v, 1, 1);
        UndoPermutation<ElementType::DBL>(vectors_.data(), range, n_, v, 1, 1);
    }
    void normalise(DBL *re, DBL *im) const {
        double squares = 0.0;
        for (int32_t i = 0; i < n_; ++i)
            squares += re[i] * re[i] + im[i] * im[i];
        if (!(squares > 0.0))
            return;
        const double length = std::sqrt(squares);
        for (int32_t i = 0; i < n_; ++i) {
            re[i] /= length;
            im[i] /= length;
        }
    }

    int32_t n_;
    std::ptrdiff_t stride_;
    Scratch<ElementType::DBL> matrix_, schur_, vectors_; // scale, x, y and the finished vector
};

} // namespace

ErrorCode EigenGeneral(const DBL *a, int32_t n, int32_t output, CDB *values, CDB *vectors) {
    if (n < 1)
        return ErrEmptyInput;
    if (output != eigenValuesOnly && output != eigenValuesAndVectors)
        return ErrInvalidSelector;
    if (CheckFinite(a, int64_t{n} * n) != 0)
        return ErrNonFiniteInput;
    return RealEigenproblem(n).solve(a, output == eigenValuesAndVectors, values, vectors);
}

} // namespace qx
