#ifndef QX_BENCH_HOST_MEMORY_H
#define QX_BENCH_HOST_MEMORY_H

#include "qx/types.h"

#include <cstddef>
#include <memory>

namespace qx::bench {

// Values at the address of a host's 1-D array: 4 modulo 8.
class HostMemory {
public:
    explicit HostMemory(std::size_t count) : bytes_(new char[8 * count + 16]) {
        for (std::size_t i = 0; i < count; ++i)
            data()[i] = static_cast<double>(i * 7919 % 1024) / 512 - 1;
    }
    DBL *data() const { return reinterpret_cast<DBL *>(bytes_.get() + 4); }
    CDB *complexData() const { return reinterpret_cast<CDB *>(bytes_.get() + 4); }

private:
    std::unique_ptr<char[]> bytes_;
};

} // namespace qx::bench

#endif
