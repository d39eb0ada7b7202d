#ifndef QX_FIT_SMOOTHING_SPLINE_H
#define QX_FIT_SMOOTHING_SPLINE_H

#include "frame/scratch.h"

namespace qx {

enum class Smoothing : int32_t { CrossValidated = 0, Given = 1, WithinSquares = 2 };

// The natural cubic spline that minimises sum ((y - s) / d)^2 + lambda integral s''^2, n > 2.
//
// Value and slope at a sample are the state of an integrated random walk, x[i + 1] = F x[i] + G u
// with independent u of variance 1 / lambda, whose smoothed path is the spline (G. Wahba, Improper
// priors, spline smoothing and the problem of guarding against model errors in regression, 1978). A
// forward pass reduces the rows of samples and steps to triangles of order 2 by rotations (G. J.
// Bierman, Factorization Methods for Discrete Sequential Estimation, 1977). A backward pass gives
// the states, the second derivatives, which follow from the u, and the variances of the values. The
// sum of these variances, each divided by d^2, is the trace of the matrix from y to the values (the
// same in O(n) as M. F. Hutchinson and F. R. de Hoog's, 1985, but a sum of positive terms, which
// keeps its digits where samples lie close together). x is in units of its mean spacing, d in units of its
// largest element, and the weighted line is subtracted from y, which changes neither the trace nor the second
// derivatives.
class SmoothingSpline {
public:
    // d may be empty. The arrays must outlive this. ErrOutOfMemory.
    ErrorCode make(ConstRealVector x, ConstRealVector y, ConstRealVector d);
    // values and second, n elements each, also serve as work memory until the end.
    void fit(Smoothing method, double parameter, RealVector values, RealVector second, DBL *lambda,
             DBL *effective);

private:
    // The sum of ((y - s) / d)^2 and the trace of the matrix from y to s.
    struct Quality {
        double squares, effective;
    };
    struct Step;
    struct Triangle;
    struct Covariance;

    double spacing(int32_t i) const { return (x_[i + 1] - x_[i]) / unitOfX_; }
    double deviation(int32_t i) const { return d_.isEmpty() ? 1.0 : d_[i] / unitOfD_; }
    double onLine(int32_t i) const {
        return meanY_ + slope_ * ((x_[i] - x_[0]) / unitOfX_ - meanX_);
    }
    void takeOffLine();
    Triangle forwards(double lambda);
    Quality backwards(const Triangle &last, RealVector values, RealVector second) const;
    Quality solve(double lambda, RealVector values, RealVector second);
    double score(double logLambda, RealVector values, RealVector second);
    void interpolate(RealVector second);
    double crossValidated(RealVector values, RealVector second);
    double leastScore(double low, double high, RealVector values, RealVector second, double *at,
                      double least);
    double within(double squares, RealVector values, RealVector second);

    ConstRealVector x_, y_, d_;
    int32_t n_ = 0;
    double unitOfX_ = 1.0, unitOfD_ = 1.0;
    double meanX_ = 0.0, meanY_ = 0.0, slope_ = 0.0, lineSquares_ = 0.0;
    RealVector rest_; // y minus the line
    Step *steps_ = nullptr;
    ScratchParts memory_;
};

} // namespace qx

#endif
