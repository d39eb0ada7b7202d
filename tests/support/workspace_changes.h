#ifndef QX_TESTS_SUPPORT_WORKSPACE_CHANGES_H
#define QX_TESTS_SUPPORT_WORKSPACE_CHANGES_H

#include "qx/errors.h"
#include "qx/frame.h"

#include <set>

namespace qx::test {

// Makes a change to the workspace that a host may make at any time, selected by `choice` from 0 to
// 7: reserve a region, release it, disable or enable it. Returns the code if it is unexpected for
// this call, otherwise 0.
inline ErrorCode ChangeWorkspace(uint32_t choice, uint32_t region, bool memoryMayEnd) {
    WorkspaceStatus status = {0, 0};
    std::set<ErrorCode> expected = {0};
    switch (choice) {
    case 0:
    case 1:
        InitializeAnalysisWorkspaceH(region, &status);
        expected.insert(ErrWorkspaceAlreadyInitialized);
        if (memoryMayEnd)
            expected.insert(ErrOutOfMemory);
        break;
    case 2:
    case 3:
        UninitializeAnalysisWorkspaceH(&status);
        expected.insert(ErrWorkspaceStillInUse);
        expected.insert(ErrWorkspaceStillEnabled);
        break;
    case 4:
        DisableAnalysisWorkspaceH(&status);
        expected.insert(ErrWorkspaceNotInitialized);
        break;
    default:
        EnableAnalysisWorkspaceH(&status);
        expected.insert(ErrWorkspaceNotInitialized);
    }
    return expected.count(status.code) == 0 ? status.code : 0;
}

} // namespace qx::test

#endif
