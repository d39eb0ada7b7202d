#include "poly/sylvester_matrices.h"

#include "frame/constants.h"
#include "linalg/factorisations/reflector.h"
#include "poly/complex_arithmetic.h"

#include <algorithm>
#include <cmath>

namespace qx {

double CoefficientNorm(const CDB *a, std::ptrdiff_t count) {
    double sum = 0.0;
    for (std::ptrdiff_t i = 0; i < count; ++i)
        sum += SquaredModulus(a[i]);
    return std::sqrt(sum);
}

CDB ProductAt(std::ptrdiff_t i, const CDB *a, std::ptrdiff_t degreeA, const CDB *b,
              std::ptrdiff_t degreeB) {
    CDB sum = {};
    for (std::ptrdiff_t j = std::max<std::ptrdiff_t>(0, i - degreeB); j <= std::min(i, degreeA);
         ++j)
        sum += a[j] * b[i - j];
    return sum;
}

ErrorCode SylvesterMatrices::allocate(int64_t rows, int64_t columns) {
    rowCapacity_ = static_cast<std::ptrdiff_t>(rows);
    return memory_.take(Sized(matrix_, rows * columns), Sized(vectors_, 2 * columns),
                        Sized(kappas_, columns), Sized(diagonal_, columns));
}

void SylvesterMatrices::begin(const CDB *p, int32_t m, const CDB *q, int32_t n) {
    p_ = p;
    m_ = m;
    q_ = q;
    n_ = n;
    step_ = columns_ = 0;
}

void SylvesterMatrices::advance() {
    const int32_t gap = m_ - n_, rows = m_ + step_ + 1;
    if (step_ == 0)
        for (int32_t shift = 0; shift < gap; ++shift)
            appendColumn(q_, n_, shift, rows);
    appendColumn(q_, n_, gap + step_, rows);
    appendColumn(p_, m_, step_, rows);
    ++step_;
}

void SylvesterMatrices::appendColumn(const CDB *a, int32_t degree, int32_t shift, int32_t rows) {
    CDB *const added = column(columns_);
    for (std::ptrdiff_t i = 0; i < rowCapacity_; ++i)
        added[i] = i >= shift && i <= shift + degree ? a[i - shift] : CDB{};
    for (std::ptrdiff_t j = 0; j < columns_; ++j) {
        const CDB *const reflector = column(j);
        if (IsZero(kappas_[j]))
            continue;
        CDB product = {};
        for (std::ptrdiff_t i = j; i < rows; ++i)
            product += Conj(reflector[i]) * added[i];
        product = Quotient(product, kappas_[j]);
        for (std::ptrdiff_t i = j; i < rows; ++i)
            added[i] -= reflector[i] * product;
    }
    typedef Reflector<ElementType::CDB> ComplexReflector;
    const ComplexReflector reflector(added + columns_, 1, rows - columns_,
                                     ComplexReflector::Leave::Reduced);
    kappas_[columns_] = reflector.kappa;
    diagonal_[columns_] = reflector.beta;
    ++columns_;
}

// Inverse iteration with R^H R.
double SylvesterMatrices::smallestSingularValue() {
    CDB *const x = vectors_.data(), *const y = x + columns_;
    for (int32_t i = 0; i < columns_; ++i) // nothing that a structure could be orthogonal to
        x[i] = {1.0 + i * 7 % 5 * 0.25, 0.0};
    double value = kInfinity;
    for (int32_t turn = 0; turn < 4; ++turn) {
        solveAdjoint(x, y);
        const double before = CoefficientNorm(y, columns_);
        for (int32_t i = 0; i < columns_; ++i)
            x[i] = y[i];
        solveTriangle(x);
        const double after = CoefficientNorm(x, columns_);
        value = before / after;
        for (int32_t i = 0; i < columns_; ++i)
            x[i] = x[i] / after;
    }
    return value;
}

// Diagonal elements that vanish are as good as these.
double SylvesterMatrices::pivot(std::ptrdiff_t i) const {
    const double least = 1e-30 * std::fabs(diagonal_[0]);
    return std::fabs(diagonal_[i]) > least ? double(diagonal_[i]) : least;
}

void SylvesterMatrices::solveAdjoint(const CDB *x, CDB *y) const {
    for (std::ptrdiff_t i = 0; i < columns_; ++i) {
        CDB sum = x[i];
        for (std::ptrdiff_t j = 0; j < i; ++j)
            sum -= Conj(column(i)[j]) * y[j];
        y[i] = sum / pivot(i);
    }
}

void SylvesterMatrices::solveTriangle(CDB *x) const {
    for (std::ptrdiff_t i = columns_ - 1; i >= 0; --i) {
        x[i] = x[i] / pivot(i);
        for (std::ptrdiff_t j = 0; j < i; ++j)
            x[j] -= column(i)[j] * x[i];
    }
}

} // namespace qx
