#ifndef QX_LINALG_TESTS_EXACT_H
#define QX_LINALG_TESTS_EXACT_H

#include "frame/elements.h"

#include <algorithm>
#include <cmath>
#include <complex>
#include <vector>

namespace qx::test {

// Matrices in long double, with which results of the library are compared. Real matrices are
// complex ones without imaginary parts.
class Exact {
public:
    typedef std::complex<long double> Number;

    Exact(int rows, int cols)
        : rows_(rows), cols_(cols), a_(static_cast<std::size_t>(rows * cols)) {}
    Exact(int rows, int cols, const DBL *a) : Exact(rows, cols) {
        for (int i = 0; i < rows * cols; ++i)
            a_[static_cast<std::size_t>(i)] = static_cast<long double>(a[i]);
    }
    Exact(int rows, int cols, const CDB *a) : Exact(rows, cols) {
        for (int i = 0; i < rows * cols; ++i)
            a_[static_cast<std::size_t>(i)] = {a[i].re, a[i].im};
    }
    static Exact Identity(int n) { return Diagonal(n, std::vector<double>(n, 1.0).data()); }
    static Exact Diagonal(int n, const DBL *d) {
        Exact result(n, n);
        for (int i = 0; i < n; ++i)
            result(i, i) = d[i];
        return result;
    }
    static Exact Diagonal(int n, const CDB *d) {
        Exact result(n, n);
        for (int i = 0; i < n; ++i)
            result(i, i) = {d[i].re, d[i].im};
        return result;
    }

    int rows() const { return rows_; }
    int cols() const { return cols_; }
    Number &operator()(int i, int j) { return a_[static_cast<std::size_t>(i * cols_ + j)]; }
    Number operator()(int i, int j) const { return a_[static_cast<std::size_t>(i * cols_ + j)]; }

    friend Exact operator*(const Exact &a, const Exact &b) {
        Exact product(a.rows_, b.cols_);
        for (int i = 0; i < a.rows_; ++i)
            for (int k = 0; k < a.cols_; ++k) {
                const long double re = a(i, k).real(), im = a(i, k).imag();
                for (int j = 0; j < b.cols_; ++j) {
                    const Number y = b(k, j);
                    product(i, j) +=
                        Number(re * y.real() - im * y.imag(), re * y.imag() + im * y.real());
                }
            }
        return product;
    }
    friend Exact operator-(const Exact &a, const Exact &b) {
        Exact difference(a.rows_, a.cols_);
        for (std::size_t i = 0; i < a.a_.size(); ++i)
            difference.a_[i] = a.a_[i] - b.a_[i];
        return difference;
    }
    Exact adjoint() const {
        Exact result(cols_, rows_);
        for (int i = 0; i < rows_; ++i)
            for (int j = 0; j < cols_; ++j)
                result(j, i) = std::conj((*this)(i, j));
        return result;
    }
    // Frobenius norm.
    long double norm() const {
        long double squares = 0;
        for (const Number &x : a_)
            squares += x.real() * x.real() + x.imag() * x.imag();
        return std::sqrt(squares);
    }
    // The largest element strictly below diagonal `offset` (-1: the one below the main diagonal).
    double below(int offset = 0) const {
        long double largest = 0;
        for (int i = 0; i < rows_; ++i)
            for (int j = 0; j < std::min(cols_, i + offset); ++j)
                largest = std::max(largest, std::abs((*this)(i, j)));
        return static_cast<double>(largest);
    }

private:
    int rows_, cols_;
    std::vector<Number> a_;
};

} // namespace qx::test

#endif
