#ifndef QX_HOST_H
#define QX_HOST_H

/* The stand-in host: what a program needs to call the exports without the host environment. It
   makes and frees arrays, resizes them for the exports, runs the clean-up procedures that the
   exports register, and holds the message texts of all codes. C11 and C++20; a C++ program may
   prefer qx/host.hpp.

   All functions may be called from any thread. An array may be used by only one call at a time,
   unless all calls only read it. */

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
    QXHostNoMemory = 2     /* there is not enough memory, or the size overflows */
};

/* Arrays. The functions return null if a size is below 0, the type code is unknown or there is not
   enough memory. Elements start at an address that is a multiple of 64. Every array is freed with
   QXHostFree, which accepts null. */

/* New arrays of zeros; typeCode is one of QXTypeCode. */
QX_HOST_API void *QXHostNew1D(int32_t typeCode, int32_t count);
QX_HOST_API void *QXHostNew2D(int32_t typeCode, int32_t rows, int32_t cols);
/* New arrays with the elements copied from `elements`. */
QX_HOST_API void *QXHostCopy1D(int32_t typeCode, int32_t count, const void *elements);
QX_HOST_API void *QXHostCopy2D(int32_t typeCode, int32_t rows, int32_t cols, const void *elements);
/* The same in three dimensions, for inputs; such an array cannot be resized. */
QX_HOST_API void *QXHostCopy3D(int32_t typeCode, int32_t first, int32_t second, int32_t third,
                               const void *elements);
/* A new array with records copied from the caller, for exports that take an array of records. Such
   an array cannot be resized. */
QX_HOST_API void *QXHostCopyRecords(int32_t recordSize, int32_t count, const void *records);
QX_HOST_API void QXHostFree(void *handle);
/* Reserves room for `count` elements in a one-dimensional array and keeps its size: from now on no
   resize up to `count` elements moves the block or allocates memory. Returns 0 or a status. */
QX_HOST_API int32_t QXHostReserve1D(void *array, int32_t typeCode, int32_t count);

/* The address of the first element. It may change with every resize, and so with every call that
   has the array as an output. */
static inline void *QXHostElements1D(const void *array) {
    return *(Array1DBlock *const *)array + 1;
}
static inline void *QXHostElements2D(const void *array) {
    return *(Array2DBlock *const *)array + 1;
}

/* Called by the exports. Resizes a block to `count` elements and returns 0 or a status. The block
   may move. Its old elements, whose number is in the dimension fields, are kept as far as they fit;
   new ones are 0. The caller sets the dimension fields. If the call fails, the array is
   unchanged. */
QX_HOST_API int32_t HostBlockReshape(int32_t typeCode, int32_t numDims, void *handleAddress,
                                     int32_t count);

/* Called by the exports. Mode 1 registers a clean-up procedure for the process, mode 2 one for the
   object `argument`; mode 0 removes it. A second registration of the same procedure and argument
   replaces the first. */
typedef int32_t (*QXHostSweep)(void *argument);
QX_HOST_API int32_t HostRegisterSweep(QXHostSweep procedure, void *argument, int32_t mode);

/* What the host does after an aborted run: calls every registered procedure in the order of
   registration and removes those for objects. No export may be running. Afterwards the words in
   slots are no longer valid: set them to null. Returns the number of procedures called. */
QX_HOST_API int32_t QXHostRunSweeps(void);
/* The same for one object, such as the word that a plan slot holds. */
QX_HOST_API int32_t QXHostReleaseObject(void *object);

/* The message text for the user, and the name in errors.h; never null. Host statuses have texts and
   names, too. */
QX_HOST_API const char *QXHostErrorText(ErrorCode code);
QX_HOST_API const char *QXHostErrorName(ErrorCode code);

/* Calls an export that takes numbers once for each of `count` elements. It is meant for
   interpreters, in which a single call takes longer than such a function. `form` has one letter for
   the function result (v none, e an int32_t) and one for each argument: d a double and i an
   int32_t, passed by value; D, I and Z pointers to a double, an int32_t and a complex number.
   columns[k] points to the `count` elements of argument k, which are read or written; codes[i] is
   the result of call i, and is not written if the result is v. Returns QXHostDone, or
   QXHostBadArgument, without making any call, if no export has this form. */
typedef void (*QXHostFunction)(void);
QX_HOST_API int32_t QXHostCalls(QXHostFunction function, const char *form, int64_t count,
                                void *const *columns, ErrorCode *codes);

/* The symbol by which a module is recognised as a host. */
extern QX_HOST_API int32_t gQXRTVersion;

QX_END_DECLS

#endif
