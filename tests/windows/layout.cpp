#include "fft/plan.h"
#include "fft/plan_slot.h"
#include "qx/histogram.h"
#include "qx/types.h"

#include <cstddef>

// The layout of the records that the host, or a program built by another compiler, shares with the
// module, if words and addresses have 32 bits. It is checked at compile time; there is nothing to
// run.

static_assert(sizeof(Array1DHandle) == 4 && sizeof(Array1DBlock) == 4);
static_assert(sizeof(Array2DHandle) == 4 && sizeof(Array2DBlock) == 8);
static_assert(sizeof(DBL) == 8 && alignof(DBL) == 1);
static_assert(sizeof(CDB) == 16 && alignof(CDB) == 1 && offsetof(CDB, im) == 8);
static_assert(sizeof(CSG) == 8 && offsetof(CSG, im) == 4);
static_assert(sizeof(WorkspaceStatus) == 5 && offsetof(WorkspaceStatus, code) == 1);

static_assert(sizeof(PlanSlot) == 4 && sizeof(InstanceWord) == 4);
static_assert(sizeof(qx::PlanCell) == 4);
static_assert(sizeof(qx::TransformInstance) == 8);
static_assert(offsetof(qx::TransformInstance, second) == 4);

static_assert(offsetof(FFTPlan, length) == 0);
static_assert(offsetof(FFTPlan, refCount) == 4);
static_assert(offsetof(FFTPlan, factors) == 8);
static_assert(offsetof(FFTPlan, kinds) == 88);
static_assert(offsetof(FFTPlan, factorCount) == 168);
static_assert(offsetof(FFTPlan, stages) == 172);
static_assert(offsetof(FFTPlan, realLeaf) == 252);
static_assert(offsetof(FFTPlan, realTwiddle) == 332);
static_assert(offsetof(FFTPlan, complexLeaf) == 412);
static_assert(offsetof(FFTPlan, complexTwiddle) == 492);
static_assert(offsetof(FFTPlan, prev) == 572);
static_assert(offsetof(FFTPlan, next) == 576);

static_assert(offsetof(FFTStage, rootCos) == 0 && offsetof(FFTStage, rootSin) == 4);
static_assert(offsetof(FFTStage, twiddleCos) == 8 && offsetof(FFTStage, twiddleSin) == 12);
static_assert(offsetof(FFTStage, raderPlan) == 16);
static_assert(offsetof(FFTStage, raderCos) == 20 && offsetof(FFTStage, raderSin) == 24);
static_assert(offsetof(FFTStage, raderGather) == 28 && offsetof(FFTStage, raderScatter) == 32);

// A double in a record is aligned to 8 bytes on this platform, so four bytes of padding follow the
// last word.
static_assert(offsetof(HistInterval, upper) == 8 && offsetof(HistInterval, closure) == 16);
static_assert(sizeof(HistInterval) == 24);
static_assert(sizeof(HistSummary) == 12);
