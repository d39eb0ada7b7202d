#include "qx/frame.h"

#include "frame/host_binding.h"

void *SetQXRTModule(void *module, int32_t) { return qx::SetHostModule(module); }
