#ifndef QX_FRAME_PLATFORM_H
#define QX_FRAME_PLATFORM_H

#include <cstddef>
#include <cstdint>

namespace qx::platform {

// Everything that differs between operating systems. There is one .cpp per platform, and no other
// file includes a platform header.

// A lock with a blocking wait, initially unlocked. A failure to create it is not reported.
class Mutex {
public:
    Mutex();
    ~Mutex();
    Mutex(const Mutex &) = delete;
    Mutex &operator=(const Mutex &) = delete;
    void lock();
    void unlock();

private:
    void *handle_;
};

// Never returns 0.
uintptr_t CurrentThread();

// Lets other threads run.
void Yield();

// Module look-up; no module is ever loaded. A module is an opaque handle, null if there is no such
// module.
void *MainModule();
void *LoadedModule(const char *name);
// The address that the module itself exports under the name, or null.
void *ModuleSymbol(void *module, const char *name);
// File names of the host's run-time, in search order.
extern const char *const hostModuleNames[2];

// Zeroed pages from the system, not from the heap, committed as they are touched. Null on failure.
void *MapPages(std::size_t bytes);
void UnmapPages(void *pages, std::size_t bytes);

// Shows the message to the user and ends the process with code 1.
[[noreturn]] void FatalExit(const char *caption, const char *text);

} // namespace qx::platform

#endif
