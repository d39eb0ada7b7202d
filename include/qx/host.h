#ifndef QX_HOST_H
#define QX_HOST_H

/* The stand-in host: what a program needs that calls the exports without the host environment.
   It makes and frees arrays, resizes them for the exports, runs the clean-up procedures that the
   exports register, and holds the message texts of all codes. C11 and C++20; a C++ program may
   prefer qx/host.hpp.

   All functions may be called from any thread. One array belongs to one call at a time, unless
   all calls only read it. */

#include "qx/errors.h"
#include "qx/types.h"

#if defined(_WIN32) && defined(QX_BUILDING_HOST)
#define QX_HOST_API __declspec(dllexport)
#elif defined(_WIN32)
#define QX_HOST_API __declspec(dllimport)
#else
#define QX_HOST_API __attribute__((visibility("default")))
#endif

QX_BEGIN_DECLS

/* The host's own statuses. The transform exports pass them on. */
enum QXHostStatus {
    QXHostDone = 0,
    QXHostBadArgument = 1, /* a count below 0, an unknown type code, a number of dimensions that is
                              neither 1 nor 2, a null handle */
    QXHostNoMemory = 2     /* the memory cannot be had, or its size cannot be expressed */
};

/* Arrays. The functions give null where a size is below 0, the type code is unknown or the memory
   cannot be had. Elements start at an address that is a multiple of 64. Every array is given back
   with QXHostFree; null is allowed there. */

/* Elements of one of the codes of QXTypeCode, all zero. */
QX_HOST_API void *QXHostNew1D(int32_t typeCode, int32_t count);
QX_HOST_API void *QXHostNew2D(int32_t typeCode, int32_t rows, int32_t cols);
/* The same with the elements copied from memory of the caller's. */
QX_HOST_API void *QXHostCopy1D(int32_t typeCode, int32_t count, const void *elements);
QX_HOST_API void *QXHostCopy2D(int32_t typeCode, int32_t rows, int32_t cols, const void *elements);
/* In three dimensions, for inputs; such an array cannot be resized. */
QX_HOST_API void *QXHostCopy3D(int32_t typeCode, int32_t first, int32_t second, int32_t third,
                               const void *elements);
/* Records of the caller's, for the exports that take an array of them. Such an array cannot be
   resized. */
QX_HOST_API void *QXHostCopyRecords(int32_t recordSize, int32_t count, const void *records);
QX_HOST_API void QXHostFree(void *handle);
/* Room for `count` elements of an array of one dimension, whose size stays: no resize up to that many
   moves its block or asks for memory from now on. 0 or a status. */
QX_HOST_API int32_t QXHostReserve1D(void *array, int32_t typeCode, int32_t count);

/* The first element. It moves with every resize, so with every call that has the array as an
   output. */
static inline void *QXHostElements1D(const void *array) {
    return *(Array1DBlock *const *)array + 1;
}
static inline void *QXHostElements2D(const void *array) {
    return *(Array2DBlock *const *)array + 1;
}

/* Called by the exports. Makes room for `count` elements, 0 or a status. The block may move; its
   old elements, as many as the dimension fields say, are kept as far as they fit, new ones are 0,
   and the dimension fields are left to the caller. A refusal leaves the array as it is. */
QX_HOST_API int32_t HostBlockReshape(int32_t typeCode, int32_t numDims, void *handleAddress,
                                     int32_t count);

/* Called by the exports. Mode 1 registers a clean-up procedure for the process, mode 2 one for an
   object, which is `argument`; mode 0 withdraws. A second registration of the same procedure and
   argument replaces the first. */
typedef int32_t (*QXHostSweep)(void *argument);
QX_HOST_API int32_t HostRegisterSweep(QXHostSweep procedure, void *argument, int32_t mode);

/* What the host does after a run was aborted: calls every registered procedure in the order of
   registration and forgets those for objects. No export may be running. Slots then hold words
   that are no longer valid: set them to null. Gives the number of procedures called. */
QX_HOST_API int32_t QXHostRunSweeps(void);
/* The same for one object, such as the word that a plan slot holds. */
QX_HOST_API int32_t QXHostReleaseObject(void *object);

/* A sentence for the user, and the name in errors.h; never null. Host statuses have theirs too. */
QX_HOST_API const char *QXHostErrorText(ErrorCode code);
QX_HOST_API const char *QXHostErrorName(ErrorCode code);

/* Calls an export of numbers for each of `count` elements, for interpreters, in which a call takes
   longer than such a function. `form` has a letter for what the export returns, v nothing, e an
   int32_t, and one for each argument: d a double and i an int32_t, given by value; D, I and Z
   pointers to a double, an int32_t and a complex number. columns[k] points to the `count` elements
   of argument k, given or written; codes[i] is what call i returned, and stays as it is with v.
   QXHostDone, or QXHostBadArgument for a form that no export has, without a call. */
typedef void (*QXHostFunction)(void);
QX_HOST_API int32_t QXHostCalls(QXHostFunction function, const char *form, int64_t count,
                                void *const *columns, ErrorCode *codes);

/* By this name a module is known as a host. */
extern QX_HOST_API int32_t gQXRTVersion;

QX_END_DECLS

#endif
