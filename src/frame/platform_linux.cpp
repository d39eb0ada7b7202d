#include "frame/platform.h"

#include <dlfcn.h>
#include <link.h>
#include <pthread.h>
#include <sched.h>
#include <sys/mman.h>
#include <sys/uio.h>
#include <unistd.h>

#include <cstdlib>
#include <cstring>

namespace qx::platform {

const char *const hostModuleNames[2] = {"libqxrt.so", "libqxffrt.so"};

namespace {

pthread_mutex_t *AsMutex(void *section) { return static_cast<pthread_mutex_t *>(section); }

iovec Piece(const char *text) { return {const_cast<char *>(text), std::strlen(text)}; }

} // namespace

Mutex::Mutex() : handle_(std::malloc(sizeof(pthread_mutex_t))) {
    if (handle_ != nullptr)
        pthread_mutex_init(AsMutex(handle_), nullptr);
}
Mutex::~Mutex() {
    if (handle_ != nullptr)
        pthread_mutex_destroy(AsMutex(handle_));
    std::free(handle_);
}
void Mutex::lock() { pthread_mutex_lock(AsMutex(handle_)); }
void Mutex::unlock() { pthread_mutex_unlock(AsMutex(handle_)); }

uintptr_t CurrentThread() { return static_cast<uintptr_t>(pthread_self()); }

void Yield() { sched_yield(); }

void *MapPages(std::size_t bytes) {
    void *const pages = mmap(nullptr, bytes, PROT_READ | PROT_WRITE,
                             MAP_PRIVATE | MAP_ANONYMOUS | MAP_NORESERVE, -1, 0);
    return pages == MAP_FAILED ? nullptr : pages;
}
void UnmapPages(void *pages, std::size_t bytes) { munmap(pages, bytes); }

void *MainModule() { return dlopen(nullptr, RTLD_NOW | RTLD_NOLOAD); }

void *LoadedModule(const char *name) { return dlopen(name, RTLD_NOW | RTLD_NOLOAD); }

void *ModuleSymbol(void *module, const char *name) {
    void *address = dlsym(module, name);
    if (address == nullptr)
        return nullptr;
    // dlsym also searches the module's dependencies; only the module itself counts.
    Dl_info found;
    link_map *owner = nullptr;
    link_map *asked = nullptr;
    const bool known =
        dladdr1(address, &found, reinterpret_cast<void **>(&owner), RTLD_DL_LINKMAP) != 0 &&
        dlinfo(module, RTLD_DI_LINKMAP, &asked) == 0;
    return known && owner == asked ? address : nullptr;
}

void FatalExit(const char *caption, const char *text) {
    const iovec pieces[] = {Piece(caption), Piece(": "), Piece(text), Piece("\n")};
    const ssize_t written = writev(STDERR_FILENO, pieces, 4);
    static_cast<void>(written); // there is no one left to report a failure to
    _exit(1);
}

} // namespace qx::platform
