#include "frame/tests/binding/system.h"

#define WIN32_LEAN_AND_MEAN
#include <windows.h>

#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>

namespace {

int WINAPI PrintMessageBox(HWND owner, LPCSTR text, LPCSTR caption, UINT style) {
    std::fprintf(stderr, "%s: %s\n", caption, text);
    if (owner != nullptr || style != 8208)
        std::fprintf(stderr, "owner %p style %u\n", static_cast<void *>(owner), style);
    return IDOK;
}

template <class T>
T *At(unsigned char *image, ULONG_PTR offset) {
    return reinterpret_cast<T *>(image + offset);
}

// The address of the import table entry through which the module calls the function.
void **ImportSlot(unsigned char *image, const char *function) {
    const auto *dos = At<IMAGE_DOS_HEADER>(image, 0);
    const auto *headers = At<IMAGE_NT_HEADERS>(image, static_cast<DWORD>(dos->e_lfanew));
    const DWORD table =
        headers->OptionalHeader.DataDirectory[IMAGE_DIRECTORY_ENTRY_IMPORT].VirtualAddress;
    for (auto *dll = At<IMAGE_IMPORT_DESCRIPTOR>(image, table); dll->Name != 0; ++dll) {
        const auto *name = At<IMAGE_THUNK_DATA>(image, dll->OriginalFirstThunk);
        auto *slot = At<void *>(image, dll->FirstThunk);
        for (; name->u1.AddressOfData != 0; ++name, ++slot) {
            const auto *byName = At<IMAGE_IMPORT_BY_NAME>(image, name->u1.AddressOfData);
            if ((name->u1.Ordinal & IMAGE_ORDINAL_FLAG) == 0 &&
                std::strcmp(reinterpret_cast<const char *>(byName->Name), function) == 0)
                return slot;
        }
    }
    return nullptr;
}

} // namespace

void *LoadModule(const char *path) { return LoadLibraryA(path); }

void PrintFatalMessages() {
    auto *image = reinterpret_cast<unsigned char *>(GetModuleHandleA("qxanalysis.dll"));
    void **slot = ImportSlot(image, "MessageBoxA");
    DWORD protection;
    if (slot == nullptr || !VirtualProtect(slot, sizeof *slot, PAGE_READWRITE, &protection))
        std::abort();
    *slot = reinterpret_cast<void *>(PrintMessageBox);
}
