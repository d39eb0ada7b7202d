#include "frame/host_binding.h"

#include <dlfcn.h>

namespace qx {

int32_t HostBlockReshape(int32_t typeCode, int32_t numDims, void *handleAddress, int32_t count) {
    auto *f = reinterpret_cast<int32_t (*)(int32_t, int32_t, void *, int32_t)>(
        dlsym(RTLD_DEFAULT, "HostBlockReshape"));
    return f(typeCode, numDims, handleAddress, count);
}

int32_t HostRegisterSweep(SweepProcedure procedure, void *argument, int32_t mode) {
    auto *f = reinterpret_cast<int32_t (*)(SweepProcedure, void *, int32_t)>(
        dlsym(RTLD_DEFAULT, "HostRegisterSweep"));
    return f(procedure, argument, mode);
}

} // namespace qx
