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
                        Sized(kappas_, columns), Sized(diagonal_, columns),
                        Sized(pairs_, 2 * rows));
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
        for (int32_t shift = 0; shift < gap; ++shift) {
            fillColumn(column(columns_), q_, n_, shift);
            finishColumn(0, rows);
        }
    const std::ptrdiff_t before = columns_;
    fillColumn(column(before), q_, n_, gap + step_);
    fillColumn(column(before + 1), p_, m_, step_);
    reflectPair(rows);
    finishColumn(before, rows);
    finishColumn(before, rows);
    ++step_;
}

void SylvesterMatrices::fillColumn(CDB *added, const CDB *a, int32_t degree, int32_t shift) const {
    for (std::ptrdiff_t i = 0; i < rowCapacity_; ++i)
        added[i] = i >= shift && i <= shift + degree ? a[i - shift] : CDB{};
}

void SylvesterMatrices::finishColumn(std::ptrdiff_t j, int32_t rows) {
    CDB *const added = column(columns_);
    for (; j < columns_; ++j) {
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

// The two columns are interleaved, and the products with the next reflector are summed in the pass
// that applies the current one: most of the time is latency of sums, so four of them are formed at
// once.
void SylvesterMatrices::reflectPair(int32_t rows) {
    CDB *const first = column(columns_), *const second = column(columns_ + 1);
    for (std::ptrdiff_t i = 0; i < rows; ++i) {
        pairs_[2 * i] = first[i];
        pairs_[2 * i + 1] = second[i];
    }
    const auto nextFrom = [this](std::ptrdiff_t j) {
        while (j < columns_ && IsZero(kappas_[j]))
            ++j;
        return j;
    };
    std::ptrdiff_t j = nextFrom(0);
    CDB sums[2] = {};
    if (j < columns_)
        AddAdjointProducts(column(j) + j, rows - j, &pairs_[2 * j], sums);
    while (j < columns_) {
        const CDB factors[2] = {Quotient(sums[0], kappas_[j]), Quotient(sums[1], kappas_[j])};
        const std::ptrdiff_t next = nextFrom(j + 1);
        const std::ptrdiff_t alone = next < columns_ ? next : rows;
        for (std::ptrdiff_t i = j; i < alone; ++i)
            for (std::ptrdiff_t k = 0; k < 2; ++k)
                pairs_[2 * i + k] -= column(j)[i] * factors[k];
        sums[0] = sums[1] = CDB{};
        if (next < columns_)
            ReflectPairs(column(j) + next, factors, column(next) + next, rows - next,
                         &pairs_[2 * next], sums);
        j = next;
    }
    for (std::ptrdiff_t i = 0; i < rows; ++i) {
        first[i] = pairs_[2 * i];
        second[i] = pairs_[2 * i + 1];
    }
}

// Inverse iteration with R^H R.
double SylvesterMatrices::smallestSingularValue() {
    CDB *const x = vectors_.data(), *const y = x + columns_;
    for (int32_t i = 0; i < columns_; ++i) // irregular: orthogonal to no structure
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

// Diagonal elements that vanish are replaced by this limit.
double SylvesterMatrices::pivot(std::ptrdiff_t i) const {
    const double least = 1e-30 * std::fabs(diagonal_[0]);
    return std::fabs(diagonal_[i]) > least ? double(diagonal_[i]) : least;
}

void SylvesterMatrices::solveAdjoint(const CDB *x, CDB *y) const {
    constexpr std::ptrdiff_t together = 4;
    for (std::ptrdiff_t first = 0; first < columns_; first += together) {
        const std::ptrdiff_t end = std::min<std::ptrdiff_t>(columns_, first + together);
        std::ptrdiff_t done = 0; // terms of each sum
        for (std::ptrdiff_t i = first; i < end; ++i)
            y[i] = x[i];
        if (end - first == together) {
            SubtractAdjointProducts(column(first), rowCapacity_, y, first, y + first);
            done = first;
        }
        for (std::ptrdiff_t i = first; i < end; ++i) {
            CDB sum = y[i];
            for (std::ptrdiff_t j = done; j < i; ++j)
                sum -= Conj(column(i)[j]) * y[j];
            y[i] = sum / pivot(i);
        }
    }
}

void SylvesterMatrices::solveTriangle(CDB *x) const {
    constexpr std::ptrdiff_t together = 4;
    for (std::ptrdiff_t last = columns_ - 1; last >= 0; last -= together) {
        const bool areFour = last + 1 >= together;
        const std::ptrdiff_t first = areFour ? last + 1 - together : 0;
        CDB factors[together];
        for (std::ptrdiff_t i = last; i >= first; --i) {
            const CDB factor = factors[last - i] = x[i] = x[i] / pivot(i);
            for (std::ptrdiff_t j = first; j < i; ++j)
                x[j] -= column(i)[j] * factor;
        }
        if (areFour)
            SubtractFourColumns(column(last), rowCapacity_, factors, first, x);
    }
}

} // namespace qx
