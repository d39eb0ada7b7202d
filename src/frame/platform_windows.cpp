#include "frame/platform.h"

#define WIN32_LEAN_AND_MEAN
#include <windows.h>
#undef Yield // a macro left over from 16-bit Windows

namespace qx::platform {

const char *const hostModuleNames[2] = {"qxrt.dll", "qxffrt.dll"};

namespace {

constexpr UINT stopIconTaskModal = 8208;
static_assert(stopIconTaskModal == (MB_ICONHAND | MB_TASKMODAL));

} // namespace

Mutex::Mutex() : handle_(CreateMutexA(nullptr, FALSE, nullptr)) {}
Mutex::~Mutex() { CloseHandle(handle_); }
void Mutex::lock() { WaitForSingleObject(handle_, INFINITE); }
void Mutex::unlock() { ReleaseMutex(handle_); }

uintptr_t CurrentThread() { return GetCurrentThreadId(); }

void Yield() { Sleep(0); }

void *MapPages(std::size_t bytes) {
    return VirtualAlloc(nullptr, bytes, MEM_RESERVE | MEM_COMMIT, PAGE_READWRITE);
}
void UnmapPages(void *pages, std::size_t) { VirtualFree(pages, 0, MEM_RELEASE); }

void *MainModule() { return GetModuleHandleA(nullptr); }

void *LoadedModule(const char *name) { return GetModuleHandleA(name); }

void *ModuleSymbol(void *module, const char *name) {
    return reinterpret_cast<void *>(GetProcAddress(static_cast<HMODULE>(module), name));
}

void FatalExit(const char *caption, const char *text) {
    MessageBoxA(nullptr, text, caption, stopIconTaskModal);
    ExitProcess(1);
}

} // namespace qx::platform
