#ifndef QX_LINALG_BLAS_MEMORY_H
#define QX_LINALG_BLAS_MEMORY_H

namespace qx {

// Work memory for the calls of BLAS that a thread makes while this stands. BLAS takes its memory by
// functions that cannot fail; ours hand out what has been made sure of here. Blocks are kept for
// the next call, of any thread, and given back with the module.
class BlasMemory {
public:
    BlasMemory();
    ~BlasMemory();
    BlasMemory(const BlasMemory &) = delete;
    BlasMemory &operator=(const BlasMemory &) = delete;

    // Whether there is memory; without it BLAS must not be called.
    explicit operator bool() const { return holds_; }

private:
    bool holds_;
};

} // namespace qx

#endif
