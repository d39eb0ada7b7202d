#include "qx/frame.h"

#include "frame/host_binding.h"
#include "frame/workspace.h"

namespace {

using qx::analysisWorkspace;

// What the four exports share: an earlier failure in the record stops the chain of calls.
template <class Operation>
int32_t RunStep(WorkspaceStatus *status, Operation operation) {
    if (status->status != 0)
        return 0;
    const ErrorCode result = operation();
    status->code = result;
    if (result < 0)
        status->status = 1;
    return 0;
}

ErrorCode SetEnabled(bool enable) {
    const ErrorCode result = analysisWorkspace.setEnabled(enable);
    // kept: this failure means that there is no region, so this call gives nothing back
    if (result < 0)
        analysisWorkspace.giveBack();
    return result;
}

} // namespace

int32_t InitializeAnalysisWorkspaceH(uint32_t size, WorkspaceStatus *status) {
    return RunStep(status, [&] {
        return size > 0 ? analysisWorkspace.reserve(size) : analysisWorkspace.giveBack();
    });
}

int32_t EnableAnalysisWorkspaceH(WorkspaceStatus *status) {
    return RunStep(status, [] { return SetEnabled(true); });
}

int32_t DisableAnalysisWorkspaceH(WorkspaceStatus *status) {
    return RunStep(status, [] { return SetEnabled(false); });
}

int32_t UninitializeAnalysisWorkspaceH(WorkspaceStatus *status) {
    return RunStep(status, [] { return analysisWorkspace.giveBack(); });
}

void *SetQXRTModule(void *module, int32_t) { return qx::SetHostModule(module); }
