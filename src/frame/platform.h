#ifndef QX_FRAME_PLATFORM_H
#define QX_FRAME_PLATFORM_H

#include <cstddef>
#include <cstdint>

namespace qx::platform {

// Everything that differs between the operating systems; one .cpp per platform and no other
// file that includes a platform header.

// A lock with a blocking wait, created unowned. A failure to create it is not reported.
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

// Never 0.
uintptr_t CurrentThread();

// Lets other threads run.
void Yield();

// Module look-up; nothing is ever loaded. A module is an opaque handle, null for none.
void *MainModule();
void *LoadedModule(const char *name);
// What the module itself exports under the name, or null.
void *ModuleSymbol(void *module, const char *name);
// File names of the host's run-time, in the order in which they are looked for.
extern const char *const hostModuleNames[2];

// Memory by the page, not from the heap: zeros, taken from the system as they are touched. Null
// where there is none.
void *MapPages(std::size_t bytes);
void UnmapPages(void *pages, std::size_t bytes);

// Shows the message to the user and ends the process with code 1.
[[noreturn]] void FatalExit(const char *caption, const char *text);

} // namespace qx::platform

#endif
