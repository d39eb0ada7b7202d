// Lets the libraries run with a C library older than the one they are linked with. Only in builds
// that are distributed (cmake/QxPortable.cmake).

#include <dlfcn.h>
#include <link.h>
#include <pthread.h>

#include <cstdint>

// Since 2.34 the C library has these under one version, and before that under an older version in a
// library of its own. The linker redirects every call of NAME to __wrap_NAME.
#if defined(__x86_64__)
#define QX_ELDER(name) __asm__(".symver " #name "," #name "@GLIBC_2.2.5")
#define QX_ELDER_3_3(name) __asm__(".symver " #name "," #name "@GLIBC_2.3.3")
#elif defined(__aarch64__)
#define QX_ELDER(name) __asm__(".symver " #name "," #name "@GLIBC_2.17")
#define QX_ELDER_3_3(name) QX_ELDER(name)
#else
#define QX_ELDER(name) static_assert(true)
#define QX_ELDER_3_3(name) static_assert(true)
#endif

extern "C" int __pthread_key_create(pthread_key_t *key, void (*destructor)(void *));
QX_ELDER(__pthread_key_create);
QX_ELDER(pthread_once);
QX_ELDER(dlopen);
QX_ELDER(dlsym);
QX_ELDER_3_3(dladdr1);
QX_ELDER_3_3(dlinfo);

extern "C" {

void *__wrap_dlopen(const char *name, int flags) { return dlopen(name, flags); }
void *__wrap_dlsym(void *module, const char *name) { return dlsym(module, name); }
int __wrap_dladdr1(const void *address, Dl_info *info, void **extra, int flags) {
    return dladdr1(address, info, extra, flags);
}
int __wrap_dlinfo(void *module, int request, void *answer) {
    return dlinfo(module, request, answer);
}
int __wrap_pthread_once(pthread_once_t *once, void (*procedure)()) {
    return pthread_once(once, procedure);
}
int __wrap___pthread_key_create(pthread_key_t *key, void (*destructor)(void *)) {
    return __pthread_key_create(key, destructor);
}

// The C library provides this since 2.32. To assume that there are other threads is always correct.
extern char __libc_single_threaded;
char __libc_single_threaded = 0;

} // extern "C"

namespace {

struct Search {
    uintptr_t address;
    dl_find_object *result;
};

int LookIn(dl_phdr_info *object, std::size_t, void *data) {
    const auto &search = *static_cast<Search *>(data);
    uintptr_t first = UINTPTR_MAX, last = 0, frames = 0;
    bool inside = false;
    for (int i = 0; i < object->dlpi_phnum; ++i) {
        const ElfW(Phdr) &header = object->dlpi_phdr[i];
        const uintptr_t start = object->dlpi_addr + header.p_vaddr;
        if (header.p_type == PT_LOAD) {
            first = start < first ? start : first;
            last = start + header.p_memsz > last ? start + header.p_memsz : last;
            inside = inside || (search.address >= start && search.address < start + header.p_memsz);
        } else if (header.p_type == PT_GNU_EH_FRAME) {
            frames = start;
        }
    }
    if (!inside || frames == 0)
        return 0;
    *search.result = {};
    search.result->dlfo_map_start = reinterpret_cast<void *>(first);
    search.result->dlfo_map_end = reinterpret_cast<void *>(last);
    search.result->dlfo_eh_frame = reinterpret_cast<void *>(frames);
    return 1;
}

} // namespace

// The compiler's run-time library uses this to find the object of an exception's caller. The C
// library has it since 2.35; this copy is not exported.
extern "C" int _dl_find_object(void *address, dl_find_object *result) noexcept {
    Search search = {reinterpret_cast<uintptr_t>(address), result};
    return dl_iterate_phdr(LookIn, &search) == 1 ? 0 : -1;
}
