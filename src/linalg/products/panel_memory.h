#ifndef QX_LINALG_PRODUCTS_PANEL_MEMORY_H
#define QX_LINALG_PRODUCTS_PANEL_MEMORY_H

#include "qx/types.h"

#include <cstddef>

namespace qx {

// Where a product packs its operands: pages of the system, not of the heap, borrowed for one
// product. Blocks are kept for the next one, of any thread, and given back with the module; there
// are as many as products have ever run at the same time, at most 64 (16 with 32-bit addresses).
class PanelMemory {
public:
    // In doubles; physical memory is taken as it is touched.
    static constexpr std::ptrdiff_t size = 640 << 10;

    PanelMemory();
    ~PanelMemory();
    PanelMemory(const PanelMemory &) = delete;
    PanelMemory &operator=(const PanelMemory &) = delete;

    // At the start of a page, or null where there is none.
    DBL *data() const;

private:
    DBL *data_;
    int slot_;
};

} // namespace qx

#endif
