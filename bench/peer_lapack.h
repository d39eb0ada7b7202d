#ifndef QX_BENCH_PEER_LAPACK_H
#define QX_BENCH_PEER_LAPACK_H

#include <cstdio>
#include <cstdlib>
#include <dlfcn.h>

namespace qx::bench {

// OpenBLAS, with its LAPACK, as a peer: loaded and not linked, so that its names do not clash with
// those of the module. It uses one thread; OPENBLAS_CORETYPE=Haswell and the like select its kernels, and
// QX_OPENBLAS can name another file than the one that Debian's packages install
// (tools/setup/native bench installs them).
inline void *PeerLibrary() {
    static void *const library = [] {
        setenv("OPENBLAS_NUM_THREADS", "1", 1);
        const char *const file = std::getenv("QX_OPENBLAS");
        const char *const usual = "/usr/lib/x86_64-linux-gnu/openblas-serial/libopenblas.so.0";
        void *found = dlopen(file != nullptr ? file : usual, RTLD_NOW | RTLD_LOCAL);
        return found != nullptr ? found : dlopen("libopenblas.so.0", RTLD_NOW | RTLD_LOCAL);
    }();
    return library;
}

// A function of the peer by its Fortran name; ends the program if there is no such function.
template <class Function>
Function *PeerRoutine(const char *name) {
    void *const library = PeerLibrary();
    void *const routine = library != nullptr ? dlsym(library, name) : nullptr;
    if (routine == nullptr) {
        std::printf("missing peer: OpenBLAS's %s (apt-get install libopenblas0-serial)\n", name);
        std::exit(0);
    }
    return reinterpret_cast<Function *>(routine);
}

} // namespace qx::bench

#endif
