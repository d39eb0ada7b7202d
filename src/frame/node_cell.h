#ifndef QX_FRAME_NODE_CELL_H
#define QX_FRAME_NODE_CELL_H

#include "qx/errors.h"
#include "qx/types.h"

#include <cstddef>
#include <cstdint>
#include <cstdlib>

namespace qx {

// What an export keeps from call to call is in a cell, whose address is in a word of the caller's
// or in the host's instance data. The kind of the cell is stored before it, so that a word with the
// address of another kind of cell is refused and not followed. An address that does not belong to a
// cell cannot be recognised.
//
// The numbers are arbitrary; they are not small and not plausible addresses.
enum class CellKind : uint64_t {
    Plan = 0xC31D9A5E40B7F261,              // a PlanCell that the host sweeps
    PlanOfInstance = 0xC31D9A5E40B7F262,    // a PlanCell in a TransformInstance
    TransformInstance = 0xC31D9A5E40B7F263, // freed by TransformUnreserveProc
    Histogram = 0xC31D9A5E40B7F264,         // a MeasurementHistogram that the host sweeps
    HistogramInstance = 0xC31D9A5E40B7F265, // one that MeasurementUnreserveProc frees
};

// A cell with its contents set to zero bits, or null.
template <class Contents>
Contents *NewCell(CellKind kind) {
    static_assert(alignof(Contents) <= sizeof kind);
    void *const block = std::calloc(1, sizeof kind + sizeof(Contents));
    if (block == nullptr)
        return nullptr;
    auto *const header = static_cast<CellKind *>(block);
    *header = kind;
    return reinterpret_cast<Contents *>(header + 1);
}

inline void FreeCell(void *cell) { std::free(static_cast<CellKind *>(cell) - 1); }

inline bool IsCell(const void *word, CellKind kind) {
    return static_cast<const CellKind *>(word)[-1] == kind;
}

// Gives a null word a new cell. Returns ErrInternal if the word holds a cell of another kind, or
// ErrOutOfMemory.
template <class Contents>
ErrorCode ReserveCell(void **word, CellKind kind) {
    if (*word == nullptr)
        *word = NewCell<Contents>(kind);
    else if (!IsCell(*word, kind))
        return ErrInternal;
    return *word == nullptr ? ErrOutOfMemory : 0;
}

} // namespace qx

#endif
