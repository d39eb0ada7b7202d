#ifndef QX_FRAME_H
#define QX_FRAME_H

/* The analysis workspace and the binding to the host. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Reserves the analysis workspace: one region of `size` bytes from which scratch memory can be
    taken without a heap call. It is not used until it is enabled. Size 0 releases the region, as
    UninitializeAnalysisWorkspaceH does. A scratch request of s bytes takes s + 17 bytes of the
    region.

    Does nothing when status->status is non-zero. Otherwise status->code receives the result, and
    status->status becomes 1 if the result is negative. The function result is 0.

    Codes: ErrWorkspaceAlreadyInitialized (a region exists), ErrOutOfMemory (no memory), those of
    UninitializeAnalysisWorkspaceH (with size 0). */
QX_API int32_t InitializeAnalysisWorkspaceH(uint32_t size, QX_INOUT WorkspaceStatus *status);

/** Enables the workspace: from now on scratch memory is taken from the region. Blocks taken earlier
    are released to where they came from. The status record is used as in
    InitializeAnalysisWorkspaceH.

    Codes: ErrWorkspaceNotInitialized (no region is reserved). */
QX_API int32_t EnableAnalysisWorkspaceH(QX_INOUT WorkspaceStatus *status);

/** Disables the workspace: from now on scratch memory is taken from the heap again. The status
    record is used as in InitializeAnalysisWorkspaceH.

    Codes: ErrWorkspaceNotInitialized (no region is reserved). */
QX_API int32_t DisableAnalysisWorkspaceH(QX_INOUT WorkspaceStatus *status);

/** Releases the region to the heap; a no-op without a region. The status record is used as in
    InitializeAnalysisWorkspaceH.

    Codes: ErrWorkspaceStillInUse (blocks in the region are in use), ErrWorkspaceStillEnabled (it is
    enabled). */
QX_API int32_t UninitializeAnalysisWorkspaceH(QX_INOUT WorkspaceStatus *status);

/** Sets the module of the process in which the host's run-time functions are looked up first; then
    come the main program and the two run-time libraries of the host. Takes a module handle of the
    platform and returns it; `reserved` is not used. It has an effect only before the first call of
    an export that needs the host. */
QX_API void *SetQXRTModule(QX_IN void *module, int32_t reserved);

QX_END_DECLS

#endif
