#ifndef QX_FIT_EXPORTS_FIT_ARGUMENTS_H
#define QX_FIT_EXPORTS_FIT_ARGUMENTS_H

#include "fit/nonlinear.h"
#include "fit/weights.h"
#include "frame/export.h"

#include <cstddef>

namespace qx {

// Weights are empty or as many as the samples; some exports have no such argument.
inline bool WeightsFit(In<DBL1D> w, int32_t n) { return w.isEmpty() || w.size() == n; }
inline bool WeightsFit(std::nullptr_t, int32_t) { return true; }
inline ConstRealVector WeightsOf(In<DBL1D> w) { return w.view(); }
inline ConstRealVector WeightsOf(std::nullptr_t) { return {}; }

template <class Y, class Weights>
bool SizesFit(Y y, In<DBL1D> x, Weights w) {
    return x.size() == y.size() && WeightsFit(w, y.size());
}
template <class Y, class Weights>
FitSamples SamplesOf(Y y, In<DBL1D> x, Weights w) {
    return {x.view(), y.view(), WeightsOf(w)};
}

// kept: the oldest exports take standard deviations instead of weights
enum class Given { Weights, Deviations };

// The weights of a fit, from a checked argument.
class SampleWeights {
public:
    ErrorCode make(std::nullptr_t, Given) { return 0; }
    ErrorCode make(In<DBL1D> argument, Given given) {
        view_ = argument.view();
        if (view_.isEmpty() || given == Given::Weights)
            return 0;
        if (const ErrorCode failed = memory_.allocate(argument.size()))
            return failed;
        const RealVector weights(memory_.data(), argument.size());
        WeightsOfDeviations(view_, weights);
        view_ = weights;
        return 0;
    }
    ConstRealVector view() const { return view_; } // empty for none

private:
    ConstRealVector view_;
    Scratch<ElementType::DBL> memory_;
};

// The outputs of a fit beside its coefficients: its values, which replace y, and the MSE; or none.
struct ValuesInPlace {
    typedef InOut<DBL1D> Y;
    typedef OutDBL MSE;
    static FitOutput output(Y y, MSE mse) { return {y.view(), mse.address()}; }
};
struct CoefficientsOnly {
    typedef In<DBL1D> Y;
    typedef std::nullptr_t MSE;
    static FitOutput output(Y, MSE) { return {}; }
};

// A guess of `count` values. A shorter array counts as no guess; of a longer one the first values
// count.
class Guess {
public:
    Guess(In<DBL1D> guess, int32_t count)
        : data_(guess.size() >= count ? guess.data() : nullptr),
          isOdd_(!guess.isEmpty() && guess.size() != count) {}
    const DBL *data() const { return data_; }
    // The code of a fit, or a warning if the fit succeeded and the guess has another size.
    ErrorCode merge(ErrorCode status) const {
        return status == 0 && isOdd_ ? WarnFitIncomplete : status;
    }

private:
    const DBL *data_;
    bool isOdd_;
};

// The code for the end of an iteration; the results are kept when the limit is reached.
inline Outcome OutcomeOf(FitEnd end) {
    switch (end) {
    case FitEnd::Limit:
        return Outcome::WithResults(ErrIterationLimit);
    case FitEnd::Undetermined:
        return WarnRankDeficient;
    case FitEnd::NoLowerCost:
        return WarnLowAccuracy;
    default:
        return 0;
    }
}

} // namespace qx

#endif
