#include "frame/scratch.h"

#define WIN32_LEAN_AND_MEAN
#include <windows.h>

// Process attach; the static initialisers have already run. Other notifications do nothing.
extern "C" BOOL WINAPI DllMain(HINSTANCE, DWORD reason, LPVOID) {
    if (reason == DLL_PROCESS_ATTACH)
        qx::AttachScratchHeap();
    return TRUE;
}
