#include "fit/sequential_qr.h"

#include "linalg/kernels.h"
#include "linalg/matrix.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

// Squares are summed without scaling if neither they nor their sum can overflow or underflow.
constexpr double smallSquare = 0x1p-900, largeSquare = 0x1p900;

double SumOfSquares(const DBL *v, int32_t n) {
    DBL squares;
    RowProducts<ElementType::DBL>({v, 1, n}, {v, n}, {&squares, 1});
    return squares;
}

double LargestModulus(const DBL *v, int32_t n) {
    double largest = 0.0;
    for (int32_t i = 0; i < n; ++i)
        largest = std::max(largest, std::fabs(v[i]));
    return largest;
}

void Weigh(const LinearModel &model, const RowBlock &block) {
    if (model.w == nullptr)
        return;
    constexpr int32_t chunk = 64;
    double root[chunk];
    for (int32_t from = 0; from < block.count; from += chunk) {
        const int32_t count = std::min(chunk, block.count - from);
        for (int32_t i = 0; i < count; ++i)
            root[i] = std::sqrt(std::fabs(model.w[block.first + from + i]));
        for (int32_t j = 0; j <= model.k; ++j) {
            DBL *const column = block.column(j) + from;
            for (int32_t i = 0; i < count; ++i)
                column[i] *= root[i];
        }
    }
}

} // namespace

ErrorCode RowStream::open(const LinearModel &model) {
    constexpr int32_t blockElements = 3072, fewestRows = 64;
    model_ = &model;
    const int32_t rows = std::max(fewestRows, blockElements / (model.k + 1) / 8 * 8);
    capacity_ = std::min(rows, model.n);
    return memory_.allocate(int64_t{capacity_} * (int64_t{model.k} + 1));
}

bool RowStream::next(RowBlock *block) {
    if (done_ >= model_->n)
        return false;
    *block = {done_, std::min(capacity_, model_->n - done_), memory_.data()};
    done_ += block->count;
    model_->rows.write(*block);
    return true;
}

ErrorCode SequentialQR::reduce(const LinearModel &model) {
    k_ = model.k;
    const int64_t triangle = int64_t{k_} * stride();
    if (const ErrorCode failed = memory_.allocate(triangle + stride()))
        return failed;
    Fill(memory_.data(), static_cast<std::ptrdiff_t>(triangle), 0.0);
    RowStream stream;
    if (const ErrorCode failed = stream.open(model))
        return failed;
    RowBlock block;
    while (stream.next(&block)) {
        Weigh(model, block);
        if (CheckFinite(block.start, int64_t{k_} * block.count) != 0)
            return ErrNonFiniteInput;
        for (int32_t j = 0; j < k_; ++j)
            reflect(j, block);
    }
    return 0;
}

// H = I - tau u u^T with u = (1, v / (alpha - beta)) maps (alpha, v) to (beta, 0), where alpha is
// the diagonal element of R and v the column in the block. The sign of beta is chosen so that
// nothing cancels.
void SequentialQR::reflect(int32_t j, const RowBlock &block) {
    DBL *const v = block.column(j), *const r = row(j);
    const int32_t n = block.count, rest = k_ - j;
    double alpha = r[j];
    double squares = alpha * alpha + SumOfSquares(v, n);
    int exponent = 0;
    if (!(squares > smallSquare && squares < largeSquare)) {
        const double largest = std::max(std::fabs(alpha), LargestModulus(v, n));
        if (largest == 0.0)
            return;
        std::frexp(largest, &exponent);
        alpha = std::ldexp(alpha, -exponent);
        for (int32_t i = 0; i < n; ++i)
            v[i] = std::ldexp(v[i], -exponent);
        squares = alpha * alpha + SumOfSquares(v, n);
    }
    const double beta = -std::copysign(std::sqrt(squares), alpha);
    const double tau = (beta - alpha) / beta;
    const double factor = 1.0 / (alpha - beta);
    for (int32_t i = 0; i < n; ++i)
        v[i] *= factor;
    r[j] = std::ldexp(beta, exponent);

    DBL *const products = row(k_);
    const RealMatrix others(block.column(j + 1), rest, n);
    RowProducts<ElementType::DBL>(others, {v, n}, {products, rest});
    for (int32_t i = 0; i < rest; ++i) {
        products[i] = -(tau * (r[j + 1 + i] + products[i]));
        r[j + 1 + i] += products[i];
    }
    AddOuterProduct<ElementType::DBL>(others, {products, rest}, {v, n});
}

} // namespace qx
