#ifndef QX_FIT_TRUST_REGION_STEP_H
#define QX_FIT_TRUST_REGION_STEP_H

#include "frame/scratch.h"

namespace qx {

// The linear model of a least-squares problem around a point: half of |z + R s|^2 for a step s,
// where R is the triangle of the derivatives and z the residuals in its coordinates.
struct LinearisedFit {
    RealMatrix r;      // upper triangular
    ConstRealVector z; // as many elements as R has rows
};

// R without some of its columns, the others divided by given lengths, as U diag(sigma) V^T by
// one-sided Jacobi rotations of its columns. If the columns have similar lengths, small singular
// values are as accurate as large ones (J. Demmel, K. Veselic, "Jacobi's method is more accurate
// than QR", 1992).
class ScaledColumns {
public:
    // ErrOutOfMemory.
    ErrorCode take(int32_t columns);
    // The columns j of R for which isFree[j] is not 0, divided by scale[j].
    void decompose(const RealMatrix &r, ConstVectorView<ElementType::I32> isFree,
                   ConstRealVector scale);

    int32_t count() const { return count_; } // of free columns
    int32_t column(int32_t i) const { return columns_[i]; }
    double sigma(int32_t i) const { return sigma_[i]; } // in no particular order
    double largest() const;
    // u_i^T z.
    double projection(int32_t i, ConstRealVector z) const;
    // Element `row` of v_i, in the order of the free columns.
    double v(int32_t row, int32_t i) const { return v_(i, row); }

private:
    bool rotate(int32_t p, int32_t q);

    int32_t count_ = 0;
    RealMatrix u_, v_; // a column in each row; those of u have the length sigma
    RealVector sigma_;
    VectorView<ElementType::I32> columns_;
    ScratchParts memory_;
};

// The step s that minimises |z + R s| with |diag(scale) s| at most radius and lowest <= s <=
// highest, which enclose 0. If no bound is in the way it is the exact minimiser (J. J. More, "The
// Levenberg-Marquardt algorithm: implementation and theory", 1978). A parameter at a bound beyond
// which the cost falls takes no part; a parameter that the step would carry over a bound is put on
// the bound, and the others are solved for again. If that does not lower the linear model, the step
// is cut at the first bound.
class TrustRegionStep {
public:
    // ErrOutOfMemory.
    ErrorCode take(int32_t count);
    // An infinite radius gives the Gauss-Newton step, along the directions that R determines.
    void find(const LinearisedFit &fit, ConstRealVector scale, ConstRealVector lowest,
              ConstRealVector highest, double radius);

    RealVector step;
    double predicted = 0.0;              // the decrease of half of |z + R s|^2
    double length = 0.0;                 // |diag(scale) step|
    bool isInside = false;               // neither the radius nor a bound limits the step
    VectorView<ElementType::I32> isFree; // 0 where a parameter does not take part from the start

private:
    void holdWhatIsAtABound(const LinearisedFit &fit, ConstRealVector lowest,
                            ConstRealVector highest);
    void solve(const LinearisedFit &fit, ConstRealVector scale, double radius);
    double damping(double radius) const;
    double lengthAt(double lambda, double *slope) const;
    bool putAtBounds(ConstRealVector lowest, ConstRealVector highest);
    void cutAtFirstBound(ConstRealVector lowest, ConstRealVector highest);
    double fallOf(const LinearisedFit &fit, ConstRealVector s) const;

    ScaledColumns columns_;
    RealVector first_, rest_, projections_;
    VectorView<ElementType::I32> isMoving_;
    ScratchParts memory_;
};

} // namespace qx

#endif
