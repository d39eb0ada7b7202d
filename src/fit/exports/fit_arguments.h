#ifndef QX_FIT_EXPORTS_FIT_ARGUMENTS_H
#define QX_FIT_EXPORTS_FIT_ARGUMENTS_H

#include "fit/weights.h"
#include "frame/export.h"

#include <cstddef>

namespace qx {

// Weights are empty or as many as the samples.
inline bool WeightsFit(In<DBL1D> w, int32_t n) { return w.isEmpty() || w.size() == n; }
inline const DBL *WeightsOf(In<DBL1D> w) { return w.isEmpty() ? nullptr : w.data(); }
// An export without the argument.
inline bool WeightsFit(std::nullptr_t, int32_t) { return true; }
inline const DBL *WeightsOf(std::nullptr_t) { return nullptr; }

// kept: the oldest exports take standard deviations in the place of weights
enum class Given { Weights, Deviations };

// What a fit is to count its samples with, from a checked argument.
class SampleWeights {
public:
    ErrorCode make(std::nullptr_t, Given) { return 0; }
    ErrorCode make(In<DBL1D> argument, Given given) {
        data_ = WeightsOf(argument);
        if (data_ == nullptr || given == Given::Weights)
            return 0;
        if (const ErrorCode failed = memory_.allocate(argument.size()))
            return failed;
        WeightsOfDeviations(data_, argument.size(), memory_.data());
        data_ = memory_.data();
        return 0;
    }
    const DBL *data() const { return data_; } // null for none

private:
    const DBL *data_ = nullptr;
    Scratch<ElementType::DBL> memory_;
};

// What a fit gives beside its coefficients: its values in the place of y, and the MSE; or nothing.
struct ValuesInPlace {
    typedef InOut<DBL1D> Y;
    typedef OutDBL MSE;
    static DBL *fit(Y y) { return y.data(); }
    static DBL *mse(MSE mse) { return mse.address(); }
};
struct CoefficientsOnly {
    typedef In<DBL1D> Y;
    typedef std::nullptr_t MSE;
    static DBL *fit(Y) { return nullptr; }
    static DBL *mse(MSE) { return nullptr; }
};

// A guess of `count` values. A shorter one counts as none, and of a longer one the first count.
class Guess {
public:
    Guess(In<DBL1D> guess, int32_t count)
        : data_(guess.size() >= count ? guess.data() : nullptr),
          isOdd_(!guess.isEmpty() && guess.size() != count) {}
    const DBL *data() const { return data_; }
    // The code of a fit, to which an odd guess adds a warning.
    ErrorCode merge(ErrorCode status) const {
        return status == 0 && isOdd_ ? WarnFitIncomplete : status;
    }

private:
    const DBL *data_;
    bool isOdd_;
};

} // namespace qx

#endif
