#ifndef QX_FRAME_HOST_BINDING_H
#define QX_FRAME_HOST_BINDING_H

#include <cstdint>

namespace qx {

// The two functions of the host's run-time. The module cannot know at build time which module of
// the process has them, so each is bound by name at its first call. If they cannot be found, the
// process ends with a message.

// Resizes a block to `count` elements and may move it. Returns 0 or a host status. A frame writes
// the dimension fields itself on success.
int32_t HostBlockReshape(int32_t typeCode, int32_t numDims, void *handleAddress, int32_t count);

typedef int32_t (*SweepProcedure)(void *argument);
enum SweepMode : int32_t { SweepWithdraw = 0, SweepForProcess = 1, SweepForObject = 2 };

// Registers or withdraws a procedure that the host calls as procedure(argument) when it cleans
// up after an aborted run.
int32_t HostRegisterSweep(SweepProcedure procedure, void *argument, int32_t mode);

// Sets the module in which the host's functions are looked for first.
void *SetHostModule(void *module);

} // namespace qx

#endif
