#include "linalg/factorisations/bidiagonal.h"

#include "linalg/scalar.h"

#include <cmath>

namespace qx {
namespace {

// sqrt(f^2 + g^2) with the larger of the two factored out.
double ScaledHypot(double f, double g) {
    const double a = std::fabs(f), b = std::fabs(g);
    if (a > b) {
        const double ratio = b / a;
        return a * std::sqrt(1.0 + ratio * ratio);
    }
    if (b == 0.0)
        return 0.0;
    const double ratio = a / b;
    return b * std::sqrt(1.0 + ratio * ratio);
}

class Bidiagonal {
public:
    Bidiagonal(RealVector d, RealVector e, RotationQueue &left, RotationQueue &right)
        : d_(d), e_(e), n_(static_cast<int32_t>(d.size())), left_(left), right_(right) {
        for (int32_t i = 0; i < n_; ++i) {
            const double sum = std::fabs(d[i]) + std::fabs(e[i]);
            if (sum > norm_)
                norm_ = sum;
        }
    }

    ErrorCode diagonalise() {
        for (int32_t k = n_ - 1; k >= 0; --k)
            for (int32_t turn = 0;; ++turn) {
                const int32_t l = startOfBlock(k);
                if (l == k)
                    break;
                if (turn >= SVDIterationLimit - 1)
                    return ErrIterationLimit;
                step(l, k);
            }
        return 0;
    }

private:
    // kept: compared with the machine epsilon itself, not with a multiple of the norm
    bool isNegligible(double x) const { return (std::fabs(x) + norm_) - norm_ < epsilon; }

    // The first row of the block that ends with row k and has no zero on its superdiagonal.
    int32_t startOfBlock(int32_t k) {
        for (int32_t l = k; l > 0; --l) {
            if (isNegligible(e_[l]))
                return l;
            if (isNegligible(d_[l - 1])) {
                cancel(l, k);
                return l;
            }
        }
        return 0;
    }

    // d[l - 1] is 0, so rotations of rows can also remove e[l].
    void cancel(int32_t l, int32_t k) {
        double c = 0.0, s = 1.0;
        for (int32_t i = l; i <= k; ++i) {
            const double f = s * e_[i];
            e_[i] = c * e_[i];
            if (isNegligible(f))
                return;
            const double g = d_[i];
            const double h = ScaledHypot(f, g);
            d_[i] = h;
            c = g / h;
            s = -f / h;
            left_.add(l - 1, i, c, s);
        }
    }

    // One implicit QR step on rows l to k with the shift of J. H. Wilkinson.
    void step(int32_t l, int32_t k) {
        double x = d_[l];
        const double last = d_[k];
        double f = shifted(x, d_[k - 1], last, e_[k - 1], e_[k]);
        double c = 1.0, s = 1.0;
        for (int32_t j = l; j < k; ++j) {
            const int32_t i = j + 1;
            double g = e_[i], y = d_[i], h = s * g;
            g = c * g;
            double z = ScaledHypot(f, h);
            e_[j] = z;
            if (z != 0.0) {
                c = f / z;
                s = h / z;
            }
            f = x * c + g * s;
            g = g * c - x * s;
            h = y * s;
            y = y * c;
            right_.add(j, i, c, s);
            z = ScaledHypot(f, h);
            d_[j] = z;
            if (z != 0.0) {
                c = f / z;
                s = h / z;
            }
            f = c * g + s * y;
            x = c * y - s * g;
            left_.add(j, i, c, s);
        }
        e_[l] = 0.0;
        e_[k] = f;
        d_[k] = x;
    }

    // The first element of the shifted normal matrix, divided by x.
    static double shifted(double x, double y, double z, double g, double h) {
        double f = ((y - z) * (y + z) + (g - h) * (g + h)) / (2.0 * h * y);
        const double root = std::copysign(std::sqrt(f * f + 1.0), f);
        f = ((x - z) * (x + z) + h * (y / (f + root) - h)) / x;
        return f;
    }

    RealVector d_, e_;
    int32_t n_;
    double norm_ = 0.0;
    RotationQueue &left_, &right_;
};

} // namespace

ErrorCode DiagonaliseBidiagonal(RealVector d, RealVector e, RotationQueue &left,
                                RotationQueue &right) {
    const ErrorCode status = Bidiagonal(d, e, left, right).diagonalise();
    left.flush();
    right.flush();
    return status;
}

} // namespace qx
