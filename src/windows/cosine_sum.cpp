#include "windows/cosine_sum.h"

#include "frame/constants.h"
#include "frame/scratch.h"

#include <cmath>

namespace qx {

namespace {

// The terms of a sum as they rotate: cosine and sine parts of b[k] exp(2 pi i j k / n) for the
// present sample j, and the rotation by one sample.
struct Terms {
    RealVector cosine = {}, sine = {}, alpha = {}, beta = {};
    int32_t count;
    double constant;

    double next() {
        double sum = constant;
        for (int32_t k = 0; k < count; ++k) {
            const double c = cosine[k];
            const double s = sine[k];
            cosine[k] = c - (c * alpha[k] + s * beta[k]);
            sine[k] = s - (s * alpha[k] - c * beta[k]);
            sum += cosine[k];
        }
        return sum;
    }
};

// The same, with the state in registers.
template <int Count>
struct FixedTerms {
    explicit FixedTerms(const Terms &terms) : constant(terms.constant) {
        for (int k = 0; k < Count; ++k) {
            cosine[k] = terms.cosine[k];
            sine[k] = terms.sine[k];
            alpha[k] = terms.alpha[k];
            beta[k] = terms.beta[k];
        }
    }
    double next() {
        double sum = constant;
        for (int k = 0; k < Count; ++k) {
            const double c = cosine[k];
            const double s = sine[k];
            cosine[k] = c - (c * alpha[k] + s * beta[k]);
            sine[k] = s - (s * alpha[k] - c * beta[k]);
        }
        for (int k = 0; k < Count; ++k)
            sum += cosine[k];
        return sum;
    }
    double cosine[Count], sine[Count], alpha[Count], beta[Count];
    double constant;
};

// Samples 1 to n-1; the second half mirrors the first.
template <ElementType E, class Sum>
void Run(VectorView<E> x, Sum sum) {
    const int32_t n = Count(x);
    for (int32_t i = 1; i <= (n - 1) / 2; ++i) {
        const double w = sum.next();
        Scale(x[i], w);
        Scale(x[n - i], w);
    }
    if (n % 2 == 0)
        Scale(x[n / 2], sum.next());
}

} // namespace

const CosineCoefficients &CosineWindowCoefs(int32_t selector) {
    static constexpr CosineCoefficients table[] = {
        {1, {1.0}},
        {2, {0.5, 0.5}},
        {2, {0.54, 0.46}},
        {3, {0.42323, 0.49755, 0.07922}},
        {3, {0.4265907136715391, 0.4965606190885641, 0.07684866723989682}},
        {3, {0.42, 0.5, 0.08}},
        {5, {0.215578948, 0.41663158, 0.277263158, 0.083578947, 0.006947368}},
        {4, {0.35875, 0.48829, 0.14128, 0.01168}},
        {7,
         {0.27105140069342415, 0.43329793923448606, 0.21812299954311062, 0.0659254463880309,
          0.010811742098372268, 0.0007765848252250934, 1.3887217350903198e-05}},
        {5, {0.323215218, 0.471492057, 0.17553428, 0.028497078, 0.001261367}},
        {0, {}},
        {4, {0.3635819, 0.4891775, 0.1365995, 0.0106411}},
    };
    constexpr int32_t none = 10;
    constexpr int32_t last = 11;
    return table[selector < 0 || selector > last ? none : selector];
}

template <ElementType E>
ErrorCode ApplyCosineSumWindow(VectorView<E> x, ConstRealVector a, bool scaled) {
    const int32_t n = Count(x), m = static_cast<int32_t>(a.size());
    if (n < 1)
        return ErrEmptyInput;
    if (n == 1)
        return 0;
    if (m < 1)
        return ErrEmptyInput;
    if (m == 1 && a[0] == 1.0)
        return 0;

    const double divisor = scaled ? a[0] : 1.0;
    const int32_t count = m - 1;
    Terms terms{.count = count, .constant = a[0] / divisor};
    ScratchParts memory;
    if (const ErrorCode status = memory.take(Sized(terms.cosine, count), Sized(terms.sine, count),
                                             Sized(terms.alpha, count), Sized(terms.beta, count)))
        return status;
    double first = terms.constant;
    for (int32_t k = 1; k <= count; ++k) {
        const double half = std::sin(kPi * k / n);
        terms.alpha[k - 1] = 2.0 * (half * half);
        terms.beta[k - 1] = std::sin(2.0 * kPi * k / n);
        terms.cosine[k - 1] = (k % 2 == 0 ? a[k] : -a[k]) / divisor;
        terms.sine[k - 1] = 0.0;
        first += terms.cosine[k - 1];
    }
    Scale(x[0], first);

    switch (count) {
    case 1:
        Run(x, FixedTerms<1>(terms));
        break;
    case 2:
        Run(x, FixedTerms<2>(terms));
        break;
    case 3:
        Run(x, FixedTerms<3>(terms));
        break;
    case 4:
        Run(x, FixedTerms<4>(terms));
        break;
    case 6:
        Run(x, FixedTerms<6>(terms));
        break;
    default:
        Run(x, terms);
    }
    return memory.release();
}

template <ElementType E>
ErrorCode ApplyCosineWindowBySelector(VectorView<E> x, int32_t selector, bool scaled) {
    const int32_t n = Count(x);
    if (n < 1)
        return ErrEmptyInput;
    const CosineCoefficients &coefs = CosineWindowCoefs(selector);
    if (coefs.count == 0)
        return ErrInvalidSelector;
    return ApplyCosineSumWindow(x, {coefs.a, coefs.count}, scaled);
}

template ErrorCode ApplyCosineSumWindow(RealVector, ConstRealVector, bool);
template ErrorCode ApplyCosineSumWindow(ComplexVector, ConstRealVector, bool);
template ErrorCode ApplyCosineWindowBySelector(RealVector, int32_t, bool);
template ErrorCode ApplyCosineWindowBySelector(ComplexVector, int32_t, bool);

} // namespace qx
