#ifndef QX_LINALG_PRODUCTS_PANEL_MEMORY_H
#define QX_LINALG_PRODUCTS_PANEL_MEMORY_H

#include "qx/types.h"

#include <cstddef>

namespace qx {

// Memory into which a product packs its operands: pages from the system, not from the heap,
// borrowed for one product. Blocks are kept for the next product, in any thread, and released when
// the module is unloaded. Their number is the largest number of products that have run at the same
// time, at most 64 (16 with 32-bit addresses).
class PanelMemory {
public:
    // In doubles; physical memory is allocated as it is touched.
    static constexpr std::ptrdiff_t size = 640 << 10;

    PanelMemory();
    ~PanelMemory();
    PanelMemory(const PanelMemory &) = delete;
    PanelMemory &operator=(const PanelMemory &) = delete;

    // Begins at a page boundary; null if there is no memory.
    DBL *data() const;

private:
    DBL *data_;
    int slot_;
};

} // namespace qx

#endif
