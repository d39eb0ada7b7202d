#include "memory.h"

#define WIN32_LEAN_AND_MEAN
#include <windows.h>

#include <algorithm>

namespace qx::host {

Memory PhysicalMemory() {
    MEMORYSTATUSEX status = {};
    status.dwLength = sizeof status;
    if (!GlobalMemoryStatusEx(&status))
        return {UINT64_MAX, UINT64_MAX};
    return {status.ullTotalPhys, std::min(status.ullAvailPhys, status.ullAvailVirtual)};
}

} // namespace qx::host
