#ifndef QX_FIT_SMOOTHING_SPLINE_H
#define QX_FIT_SMOOTHING_SPLINE_H

#include "fit/banded_triangle.h"

namespace qx {

enum class Smoothing : int32_t { CrossValidated = 0, Given = 1, WithinSquares = 2 };

// The natural cubic spline that minimises sum ((y - s) / d)^2 + lambda integral s''^2, n > 2.
//
// With C. H. Reinsch's matrices (Smoothing by spline functions, 1967), Q of second divided
// differences and R = L L' of the integral, D = diag(d) and v = lambda s'', the residuals are
// y - s = D^2 Q v, and v minimises |D Q v - D^-1 y|^2 + |L' v|^2 / lambda: a banded least-squares
// problem, solved by rotations, so the condition of the normal equations is not squared. The trace
// of I - A, where s = A y, comes from the central diagonals of the inverse (M. F. Hutchinson,
// F. R. de Hoog, Smoothing noisy data with spline functions, 1985). x is in units of its mean
// spacing and d in units of its largest inside.
class SmoothingSpline {
public:
    // d may be null. The arrays must outlive this. ErrOutOfMemory.
    ErrorCode make(const DBL *x, const DBL *y, const DBL *d, int32_t n);
    // values: n elements, also work until the end.
    void fit(Smoothing method, double parameter, DBL *values, DBL *second, DBL *lambda,
             DBL *effective);

private:
    double spacing(int32_t i) const { return (x_[i + 1] - x_[i]) / unitOfX_; }
    double deviation(int32_t i) const { return d_ == nullptr ? 1.0 : d_[i] / unitOfD_; }
    void differences(int32_t i, DBL *q) const;
    void factor(double lambda);
    double residuals(DBL *values);
    double traceOfRest() const;
    double solve(double lambda, DBL *values);
    double score(double logLambda, DBL *values);
    void line(DBL *values, double *squares) const;
    void interpolate(DBL *second);
    double crossValidated(DBL *values);
    double within(double squares, DBL *values);

    const DBL *x_ = nullptr, *y_ = nullptr, *d_ = nullptr;
    int32_t n_ = 0;
    double unitOfX_ = 1.0, unitOfD_ = 1.0, alpha_ = 1.0;
    BandedTriangle triangle_;
    Scratch<ElementType::DBL> v_; // n - 2
};

} // namespace qx

#endif
