#include "memory.h"

#include <fcntl.h>
#include <unistd.h>

#include <algorithm>
#include <cstddef>
#include <cstdlib>
#include <cstring>

namespace qx::host {
namespace {

// The text of a small file of the kernel, empty if there is no such file. Does not use stdio, which
// allocates memory.
struct Text {
    explicit Text(const char *path) {
        const int file = open(path, O_RDONLY | O_CLOEXEC);
        const ssize_t length = file >= 0 ? read(file, bytes, sizeof bytes - 1) : 0;
        if (file >= 0)
            close(file);
        bytes[length > 0 ? length : 0] = '\0';
    }
    char bytes[4096];
};

// The number after a label, or `unknown`.
uint64_t NumberAfter(const char *text, const char *label, uint64_t unit, uint64_t unknown) {
    const char *const found = std::strstr(text, label);
    if (found == nullptr)
        return unknown;
    char *end;
    const uint64_t number = std::strtoull(found + std::strlen(label), &end, 10);
    return end == found + std::strlen(label) ? unknown : number * unit;
}

} // namespace

Memory PhysicalMemory() {
    const Text machine("/proc/meminfo");
    Memory memory = {NumberAfter(machine.bytes, "MemTotal:", 1024, UINT64_MAX),
                     NumberAfter(machine.bytes, "MemAvailable:", 1024, UINT64_MAX)};
    const uint64_t limit = NumberAfter(Text("/sys/fs/cgroup/memory.max").bytes, "", 1, UINT64_MAX);
    if (limit == UINT64_MAX)
        return memory;
    const uint64_t used = NumberAfter(Text("/sys/fs/cgroup/memory.current").bytes, "", 1, 0);
    // Cached copies of files, which the kernel drops when it needs the memory.
    const uint64_t files = NumberAfter(Text("/sys/fs/cgroup/memory.stat").bytes, "\nfile ", 1, 0);
    memory.total = std::min(memory.total, limit);
    memory.available =
        std::min(memory.available, limit - std::min(limit, used - std::min(used, files)));
    return memory;
}

} // namespace qx::host
