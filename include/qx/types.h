#ifndef QX_TYPES_H
#define QX_TYPES_H

/* The types that cross the boundary of the module. C11 and C++20. */

#include <stdint.h>

#ifdef __cplusplus
#define QX_BEGIN_DECLS extern "C" {
#define QX_END_DECLS }
#else
#define QX_BEGIN_DECLS
#define QX_END_DECLS
#endif

/* Marks an export. The module is built with QX_BUILDING_MODULE; everything else imports. */
#if defined(_WIN32) && defined(QX_BUILDING_MODULE)
#define QX_API __declspec(dllexport)
#elif defined(_WIN32)
#define QX_API
#else
#define QX_API __attribute__((visibility("default")))
#endif

/* The direction of an argument, read by tools/catalogue.py. An argument without a mark is an
   input scalar. */
#define QX_IN
#define QX_OUT
#define QX_INOUT

QX_BEGIN_DECLS

/* 0 success, negative failure (outputs empty or NaN), positive warning (outputs valid). */
typedef int32_t ErrorCode;

/* Elements. Those of a one-dimensional block start at byte 4, so a DBL stands at an address that
   is 4 modulo 8, and scratch blocks may start at any byte: the types say so to the compiler. */
typedef int32_t I32 __attribute__((aligned(1)));
typedef uint8_t U8;
typedef uint32_t U32 __attribute__((aligned(1)));
typedef float SGL __attribute__((aligned(1)));
typedef double DBL __attribute__((aligned(1)));
typedef struct CSG {
    SGL re, im;
} CSG;
typedef struct CDB {
    DBL re, im;
} CDB;

/* Element type codes, the first argument of HostBlockReshape. */
enum QXTypeCode {
    QXTypeI32 = 3,
    QXTypeU8 = 5,
    QXTypeU32 = 7,
    QXTypeSGL = 9,
    QXTypeDBL = 10,
    QXTypeCSG = 12,
    QXTypeCDB = 13
};

/* A host block of one dimension: the count, then the elements from byte 4. */
typedef struct Array1DBlock {
    int32_t dimSize;
} Array1DBlock;

/* A host block of two dimensions: rows, columns, then the elements from byte 8, row after row. */
typedef struct Array2DBlock {
    int32_t dimSizes[2];
} Array2DBlock;

/* The host owns the blocks and may move one in any resize, so they are passed by handle. */
typedef Array1DBlock **Array1DHandle;
typedef Array2DBlock **Array2DHandle;

/* Handles under the name of their element, which makes a declaration say what it takes. */
typedef Array1DHandle I32_1D, U8_1D, U32_1D, SGL1D, DBL1D, CSG1D, CDB1D;
typedef Array2DHandle I32_2D, DBL2D, CDB2D;

/* What the four workspace exports report into; packed by the host. */
typedef struct __attribute__((packed)) WorkspaceStatus {
    uint8_t status; /* non-zero when an earlier step failed: the export then does nothing */
    int32_t code;   /* the ErrorCode of the last step that ran */
} WorkspaceStatus;

QX_END_DECLS

#endif
