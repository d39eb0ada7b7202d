#include <cstdint>
#include <cstdio>

// A host with one function, which reports where it was found. QX_FAKE_NAME identifies this host;
// QX_FAKE_MARK is the name that marks a main program as a host.

#ifdef _WIN32
#define QX_FAKE_EXPORT extern "C" __declspec(dllexport)
#else
#define QX_FAKE_EXPORT extern "C" __attribute__((visibility("default")))
#endif

#ifdef QX_FAKE_MARK
QX_FAKE_EXPORT int32_t QX_FAKE_MARK() { return 0; }
#endif

#ifdef QX_FAKE_NAME
QX_FAKE_EXPORT int32_t HostRegisterSweep(int32_t (*)(void *), void *, int32_t mode) {
    std::printf("%s %d\n", QX_FAKE_NAME, mode);
    return 0;
}
#endif
