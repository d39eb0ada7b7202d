#include "frame/host_binding.h"

#include "frame/platform.h"

#include <atomic>
#include <cstdio>

namespace qx {

namespace {

struct HostFunction {
    std::atomic<void *> slot;
    const char *name;
};

HostFunction blockReshape = {nullptr, "HostBlockReshape"};
HostFunction registerSweep = {nullptr, "HostRegisterSweep"};

std::atomic<void *> gRTModule = nullptr;

constexpr char fatalCaption[] = "Fatal Error";

// The first of the modules already in the process that has the host's run-time.
void *FindHostModule() {
    if (void *module = gRTModule.load(std::memory_order_relaxed))
        return module;
    void *main = platform::MainModule();
    if (platform::ModuleSymbol(main, "gQXRTVersion") != nullptr ||
        platform::ModuleSymbol(main, "HostFreshChunk") != nullptr)
        return main;
    for (const char *name : platform::hostModuleNames)
        if (void *module = platform::LoadedModule(name))
            return module;
    return nullptr;
}

// No lock is needed: two threads can only store the same address.
void *Resolve(HostFunction &function) {
    void *module = FindHostModule();
    if (module == nullptr)
        platform::FatalExit(fatalCaption, "dataloom.lib was not called from a Dataloom process.");
    if (void *bound = function.slot.load(std::memory_order_relaxed))
        return bound;
    void *address = platform::ModuleSymbol(module, function.name);
    if (address == nullptr) {
        char text[256];
        std::snprintf(text, sizeof text, "dataloom.lib could not locate \"%s\".", function.name);
        platform::FatalExit(fatalCaption, text);
    }
    function.slot.store(address, std::memory_order_relaxed);
    return address;
}

void *Bound(HostFunction &function) {
    void *address = function.slot.load(std::memory_order_relaxed);
    return address != nullptr ? address : Resolve(function);
}

} // namespace

int32_t HostBlockReshape(int32_t typeCode, int32_t numDims, void *handleAddress, int32_t count) {
    typedef int32_t (*Function)(int32_t, int32_t, void *, int32_t);
    return reinterpret_cast<Function>(Bound(blockReshape))(typeCode, numDims, handleAddress, count);
}

int32_t HostRegisterSweep(SweepProcedure procedure, void *argument, int32_t mode) {
    typedef int32_t (*Function)(SweepProcedure, void *, int32_t);
    return reinterpret_cast<Function>(Bound(registerSweep))(procedure, argument, mode);
}

void *SetHostModule(void *module) {
    gRTModule.store(module, std::memory_order_relaxed);
    return module;
}

} // namespace qx
