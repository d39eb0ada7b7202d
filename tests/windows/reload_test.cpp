#include "qx/types.h"

#include <gtest/gtest.h>

#define WIN32_LEAN_AND_MEAN
#include <windows.h>

// Loads, uses and unloads the module repeatedly in one process, as a host does that opens and
// closes projects. This program is not linked with the module.

namespace {

typedef int32_t (*Reserve)(uint32_t size, WorkspaceStatus *status);
typedef int32_t (*Step)(WorkspaceStatus *status);
typedef void *(*CreatePlan)(int32_t n);
typedef void (*DestroyPlan)(void *plan);

template <class Function>
Function Export(HMODULE module, const char *name) {
    const FARPROC address = GetProcAddress(module, name);
    EXPECT_NE(address, nullptr) << name;
    return reinterpret_cast<Function>(reinterpret_cast<void *>(address));
}

void UseAndUnload() {
    HMODULE module = LoadLibraryA("qxanalysis.dll");
    ASSERT_NE(module, nullptr) << GetLastError();
    WorkspaceStatus status = {0, 1};
    Export<Reserve>(module, "InitializeAnalysisWorkspaceH")(1000, &status);
    EXPECT_EQ(status.code, 0) << "a fresh copy of the module has no region";
    Export<Step>(module, "EnableAnalysisWorkspaceH")(&status);
    Export<Step>(module, "DisableAnalysisWorkspaceH")(&status);
    Export<Step>(module, "UninitializeAnalysisWorkspaceH")(&status);
    EXPECT_EQ(status.code, 0);

    void *plan = Export<CreatePlan>(module, "create_oxfft_table")(107);
    EXPECT_NE(plan, nullptr);
    Export<DestroyPlan>(module, "destroy_oxfft_table")(plan);

    EXPECT_TRUE(FreeLibrary(module));
    EXPECT_EQ(GetModuleHandleA("qxanalysis.dll"), nullptr) << "something keeps the module";
}

TEST(Reload, LeavesNoHandleBehind) {
    UseAndUnload(); // includes what the system itself opens at a first load
    DWORD before = 0, after = 0;
    ASSERT_TRUE(GetProcessHandleCount(GetCurrentProcess(), &before));
    for (int i = 0; i < 20; ++i)
        UseAndUnload();
    ASSERT_TRUE(GetProcessHandleCount(GetCurrentProcess(), &after));
    EXPECT_EQ(after, before);
}

} // namespace
