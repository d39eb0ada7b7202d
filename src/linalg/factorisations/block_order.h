#ifndef QX_LINALG_FACTORISATIONS_BLOCK_ORDER_H
#define QX_LINALG_FACTORISATIONS_BLOCK_ORDER_H

#include "linalg/factorisations/schur.h"
#include "linalg/lapack.h"

namespace qx {

// The code for LAPACK's info of a Schur form, plain or generalised.
inline ErrorCode CodeOfSchur(int32_t info, int32_t n) {
    if (info < 0)
        return lapack::CodeOf(info);
    if (info == 0)
        return 0;
    if (info <= n)
        return ErrIterationLimit;
    return info == n + 1 ? ErrConditionTooHigh : ErrSolverCount;
}

// The blocks along the diagonal of a Schur form, each with the number by which it is ordered.
class BlockOrder {
public:
    ErrorCode allocate(int32_t n) { return memory_.take(Sized(keys_, n), Sized(sizes_, n)); }

    void add(double real, double modulus, int32_t size, SchurOrder order) {
        const double key = order >= schurModulusAscending ? modulus : real;
        const bool descends = order == schurRealDescending || order == schurModulusDescending;
        keys_[count_] = descends ? -key : key;
        sizes_[count_++] = size;
    }

    // To be called before blocks are added again.
    void clear() { count_ = 0; }
    bool isInOrder() const {
        for (int32_t k = 1; k < count_; ++k)
            if (keys_[k] < keys_[k - 1])
                return false;
        return true;
    }

    // Bubble sort. move(from, to) brings the block at row `from` up to row `to` and returns
    // LAPACK's info; blocks that LAPACK finds too close to exchange are left as they are.
    template <class Move>
    ErrorCode sort(Move move) {
        for (int32_t pass = 1; pass < count_; ++pass) {
            int32_t row = 0;
            for (int32_t k = 0; k + 1 <= count_ - pass; ++k) {
                if (keys_[k + 1] < keys_[k]) {
                    const int32_t info = move(row + sizes_[k], row);
                    if (info < 0)
                        return lapack::CodeOf(info);
                    if (info == 0) {
                        Swap(&keys_[k], &keys_[k + 1]);
                        Swap(&sizes_[k], &sizes_[k + 1]);
                    }
                }
                row += sizes_[k];
            }
        }
        return 0;
    }

private:
    int32_t count_ = 0;
    ScratchParts memory_;
    RealVector keys_;
    IndexVector sizes_;
};

} // namespace qx

#endif
