#ifndef QX_HOST_MEMORY_H
#define QX_HOST_MEMORY_H

#include <cstdint>

namespace qx::host {

// The machine's memory, or that of the container in which the process runs.
struct Memory {
    uint64_t total;
    uint64_t available; // without memory that other programs use
};

// The largest possible numbers if nothing is known.
Memory PhysicalMemory();

} // namespace qx::host

#endif
