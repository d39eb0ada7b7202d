#ifndef QX_FRAME_H
#define QX_FRAME_H

/* The analysis workspace and the binding to the host. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Reserves the analysis workspace: one region of `size` bytes from which scratch memory can be
    served without a heap call. It serves nothing until it is enabled. Size 0 gives the region back,
    as UninitializeAnalysisWorkspaceH does. A scratch request of s bytes takes s + 17 bytes of the
    region.

    Does nothing when status->status is non-zero. Otherwise status->code receives the result, and
    status->status becomes 1 if that is negative. The function result is 0.

    Codes: ErrWorkspaceAlreadyInitialized (a region exists), ErrOutOfMemory (no memory), those of
    UninitializeAnalysisWorkspaceH (with size 0). */
QX_API int32_t InitializeAnalysisWorkspaceH(uint32_t size, QX_INOUT WorkspaceStatus *status);

/** From now on scratch requests are served from the region. Blocks taken earlier go back to where
    they came from. The status record is used as in InitializeAnalysisWorkspaceH.

    Codes: ErrWorkspaceNotInitialized (no region is reserved). */
QX_API int32_t EnableAnalysisWorkspaceH(QX_INOUT WorkspaceStatus *status);

/** From now on scratch requests are served from the heap again. The status record is used as in
    InitializeAnalysisWorkspaceH.

    Codes: ErrWorkspaceNotInitialized (no region is reserved). */
QX_API int32_t DisableAnalysisWorkspaceH(QX_INOUT WorkspaceStatus *status);

/** Gives the region back to the heap; without a region nothing happens. The status record is used
    as in InitializeAnalysisWorkspaceH.

    Codes: ErrWorkspaceStillInUse (blocks in the region are live), ErrWorkspaceStillEnabled (it is
    enabled). */
QX_API int32_t UninitializeAnalysisWorkspaceH(QX_INOUT WorkspaceStatus *status);

/** Names the module of the process that holds the host's run-time functions, ahead of every
    place that is searched otherwise: the main program, then the two run-time libraries of the
    host. Takes a module handle of the platform and returns it; `reserved` is not used. To have
    an effect it is called before the first export that needs the host. */
QX_API void *SetQXRTModule(QX_IN void *module, int32_t reserved);

QX_END_DECLS

#endif
