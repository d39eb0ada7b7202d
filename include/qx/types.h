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

/* What the compiler has to know about the types: elements may start at any byte, the elements of a
   block have a different type from the block, and records have no padding. The pragma around each
   record states the last point for all compilers. Compilers without attributes read and write
   elements at any address anyway. */
#if defined(__GNUC__)
#define QX_ANY_ALIGNMENT __attribute__((aligned(1)))
#define QX_MAY_ALIAS __attribute__((may_alias))
#define QX_PACKED __attribute__((packed))
#else
#define QX_ANY_ALIGNMENT
#define QX_MAY_ALIAS
#define QX_PACKED
#endif

/* The direction of an argument, read by tools/catalogue.py. An unmarked argument is an input
   scalar. */
#define QX_IN
#define QX_OUT
#define QX_INOUT
/* Follows the direction of a pointer to elements and names the argument with their number. */
#define QX_LENGTH(count)

QX_BEGIN_DECLS

/* 0 success, negative failure (outputs empty or NaN), positive warning (outputs valid). */
typedef int32_t ErrorCode;

/* Elements. Those of a one-dimensional block start at byte 4, so the address of a DBL is 4 modulo
   8, and scratch blocks may start at any byte. The types declare this to the compiler. */
typedef int32_t I32 QX_ANY_ALIGNMENT;
typedef uint8_t U8;
typedef uint32_t U32 QX_ANY_ALIGNMENT;
typedef float SGL QX_ANY_ALIGNMENT;
typedef double DBL QX_ANY_ALIGNMENT;
#pragma pack(push, 1)
typedef struct CSG {
    SGL re, im;
} CSG;
typedef struct CDB {
    DBL re, im;
} CDB;
#pragma pack(pop)

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
typedef struct QX_MAY_ALIAS Array1DBlock {
    int32_t dimSize;
} Array1DBlock;

/* A host block of two dimensions: rows, columns, then the elements from byte 8, row by row. */
typedef struct QX_MAY_ALIAS Array2DBlock {
    int32_t dimSizes[2];
} Array2DBlock;

/* The host owns the blocks and may move a block at any resize, so blocks are passed by handle: a
   pointer to the pointer to the block. Each element type has its own handle type, so that the
   compiler rejects an array of the wrong element type.

   The same array may be an input and an output of a call, also within records that carry arrays;
   the result is that of two separate arrays. Two outputs must not be the same array: every export
   checks this first and returns ErrInternal. A block whose size field is negative is an empty
   array. */
#define QX_ARRAY_1D(element)                                                                       \
    struct QX_MAY_ALIAS QXArray1D_##element {                                                      \
        int32_t dimSize;                                                                           \
    } * *
#define QX_ARRAY_2D(element)                                                                       \
    struct QX_MAY_ALIAS QXArray2D_##element {                                                      \
        int32_t dimSizes[2];                                                                       \
    } * *
typedef QX_ARRAY_1D(I32) I32_1D;
typedef QX_ARRAY_1D(U8) U8_1D;
typedef QX_ARRAY_1D(U32) U32_1D;
typedef QX_ARRAY_1D(SGL) SGL1D;
typedef QX_ARRAY_1D(DBL) DBL1D;
typedef QX_ARRAY_1D(CSG) CSG1D;
typedef QX_ARRAY_1D(CDB) CDB1D;
typedef QX_ARRAY_2D(I32) I32_2D;
typedef QX_ARRAY_2D(DBL) DBL2D;
typedef QX_ARRAY_2D(CDB) CDB2D;

/* A handle of any element, for hosts. */
typedef Array1DBlock **Array1DHandle;
typedef Array2DBlock **Array2DHandle;

#pragma pack(push, 1)
/* The status record of the four workspace exports; packed by the host. */
typedef struct QX_PACKED WorkspaceStatus {
    uint8_t status; /* non-zero when an earlier step failed: the export then does nothing */
    int32_t code;   /* the ErrorCode of the last step that ran */
} WorkspaceStatus;
#pragma pack(pop)

QX_END_DECLS

#endif
