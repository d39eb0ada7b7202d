#include "fft/plan.h"

#include "fft/execute.h"
#include "fft/factorise.h"
#include "fft/kernels/kernels.h"
#include "fft/prime_stages.h"
#include "frame/constants.h"
#include "frame/elements.h"
#include "frame/platform.h"

#include <algorithm>
#include <cmath>
#include <cstddef>
#include <cstdlib>
#include <limits>
#include <mutex>
#include <new>

namespace qx {
namespace {

using std::ptrdiff_t;

// The cache: every plan in use, the newest first. The mutex lives as long as the process and is never
// destroyed, because the host may release plans from its last exit handler.
alignas(platform::Mutex) unsigned char cacheMutexMemory[sizeof(platform::Mutex)];
platform::Mutex &cacheMutex = *new (cacheMutexMemory) platform::Mutex;
FFTPlan *cacheHead = nullptr;

// A table from the heap, because a plan outlives the workspace. Sizes beyond int32 are refused on every
// target; an empty table takes no memory and stays null.
template <class T>
bool Allocate(T *&table, int64_t count) {
    if (count == 0)
        return true;
    if (count * int64_t{sizeof(T)} > std::numeric_limits<int32_t>::max())
        return false;
    table = static_cast<T *>(std::malloc(static_cast<std::size_t>(count) * sizeof(T)));
    return table != nullptr;
}

// A temporary table, released with the scope.
struct TemporaryTable {
    explicit TemporaryTable(int64_t count) : isThere(Allocate(data, count)) {}
    ~TemporaryTable() { std::free(data); }
    TemporaryTable(const TemporaryTable &) = delete;
    TemporaryTable &operator=(const TemporaryTable &) = delete;

    void release() {
        std::free(data);
        data = nullptr;
    }

    DBL *data = nullptr;
    bool isThere;
};

// The powers of exp(-i theta) from the first up: each follows from the previous one by a recurrence whose
// error stays small because 1 - cos(theta), formed without cancellation, is small. The rounding error of
// each power is carried to the next, as in Kahan's summation (1965); without that, the errors of a
// hundred thousand steps add up to a hundred times the error of one.
class Roots {
public:
    Roots() = default;
    explicit Roots(double theta) : s_(-std::sin(theta)) {
        const double half = std::sin(theta * 0.5);
        c_ = 2.0 * half * half;
        re = 1.0 - c_;
        im = s_;
        reRest_ = (1.0 - re) - c_;
    }
    void advance() {
        const double reStep = reRest_ - (re * c_ + im * s_);
        const double imStep = imRest_ - (im * c_ - re * s_);
        const double newRe = re + reStep;
        const double newIm = im + imStep;
        reRest_ = reStep - (newRe - re);
        imRest_ = imStep - (newIm - im);
        re = newRe;
        im = newIm;
    }

    double re, im;

private:
    double c_, s_;
    double reRest_;
    double imRest_ = 0.0;
};

constexpr ptrdiff_t columnsOfRoots = 32;

bool BuildTwiddles(FFTStage *stage, int32_t p, int32_t n) {
    const ptrdiff_t m = n / p;
    const ptrdiff_t pitch = p - 1;
    if (!Allocate(stage->twiddleCos, (m - 1) * int64_t{pitch}) ||
        !Allocate(stage->twiddleSin, (m - 1) * int64_t{pitch}))
        return false;
    // Several columns at a time, so that whole cache lines are written.
    const double step = kTwoPi / n;
    for (ptrdiff_t first = 0; first < pitch; first += columnsOfRoots) {
        const ptrdiff_t count = std::min(columnsOfRoots, pitch - first);
        Roots columns[columnsOfRoots];
        for (ptrdiff_t i = 0; i < count; ++i)
            columns[i] = Roots(static_cast<double>(first + i + 1) * step);
        for (ptrdiff_t k = 0; k < m - 1; ++k) {
            DBL *const cosines = stage->twiddleCos + k * pitch + first;
            DBL *const sines = stage->twiddleSin + k * pitch + first;
            for (ptrdiff_t i = 0; i < count; ++i) {
                cosines[i] = columns[i].re;
                sines[i] = columns[i].im;
                columns[i].advance();
            }
        }
    }
    return true;
}

bool BuildLanes(FFTStage *stage, int32_t p, int32_t m) {
    if (!Allocate(stage->complexLanes, ComplexLanesSize(stage->passes, p, m)) ||
        !Allocate(stage->realLanes, RealLanesSize(stage->passes, p, m)))
        return false;
    FillComplexLanes(*stage, p, m, stage->complexLanes);
    FillRealLanes(*stage, p, m, stage->realLanes);
    return true;
}

bool BuildRoots(FFTStage *stage, int32_t p) {
    if (!Allocate(stage->rootCos, p) || !Allocate(stage->rootSin, p))
        return false;
    stage->rootCos[0] = 1.0;
    stage->rootSin[0] = 0.0;
    Roots roots(kTwoPi / p);
    for (int32_t k = 1; k < p; ++k) {
        stage->rootCos[k] = roots.re;
        stage->rootSin[k] = roots.im;
        roots.advance();
    }
    return true;
}

int32_t PowerModulo(int32_t base, int32_t exponent, int32_t p) {
    int64_t result = 1;
    for (int64_t square = base; exponent > 0; exponent >>= 1, square = square * square % p)
        if (exponent & 1)
            result = result * square % p;
    return static_cast<int32_t>(result);
}

// The smallest g whose powers reach 1 modulo the prime p only after p - 1 steps: no power to
// (p - 1) / q with a prime q is 1.
int32_t Generator(int32_t p) {
    int32_t primes[9]; // the product of the first ten primes exceeds int32
    int32_t count = 0;
    int32_t rest = p - 1;
    for (int32_t q = 2; int64_t{q} * q <= rest; ++q) {
        if (rest % q != 0)
            continue;
        primes[count++] = q;
        while (rest % q == 0)
            rest /= q;
    }
    if (rest > 1)
        primes[count++] = rest;
    for (int32_t g = 2;; ++g) {
        int32_t i = 0;
        while (i < count && PowerModulo(g, (p - 1) / primes[i], p) != 1)
            ++i;
        if (i == count)
            return g;
    }
}

void BuildRaderOrders(FFTStage *stage, int32_t p) {
    stage->raderGather[0] = stage->raderScatter[0] = 0;
    stage->raderGather[1] = stage->raderScatter[1] = 1;
    const int32_t g = Generator(p);
    int64_t power = g;
    for (int32_t i = 2; i < p; ++i) {
        stage->raderScatter[i] = static_cast<int32_t>(power);
        stage->raderGather[p + 1 - i] = static_cast<int32_t>(power);
        power = power * g % p;
    }
}

// The spectrum of the roots in the order of the powers of the generator. A padded convolution of
// n values begins with those p - 1 values and ends with the last p - 2 of them, so that every sum over
// the orders wraps around as it does without padding.
bool BuildRaderSpectrum(FFTStage *stage, int32_t p, int32_t n) {
    TemporaryTable ordered(2 * int64_t{n});
    TemporaryTable spectrum(2 * int64_t{n}); // holds the roots first
    TemporaryTable work(stage->raderPlan->complexWork);
    if (!ordered.isThere || !spectrum.isThere || !work.isThere)
        return false;
    Roots roots(kTwoPi / p);
    for (ptrdiff_t t = 0; t < p - 1; ++t) {
        spectrum.data[2 * t] = roots.re;
        spectrum.data[2 * t + 1] = roots.im;
        roots.advance();
    }
    Fill(ordered.data, 2 * ptrdiff_t{n}, 0.0);
    const double scale = 1.0 / n;
    for (ptrdiff_t i = 0; i < p - 1; ++i) {
        const ptrdiff_t root = stage->raderScatter[i + 1] - 1;
        const ptrdiff_t wrapped = i == 0 ? 0 : n - (p - 1) + i;
        for (ptrdiff_t part = 0; part < 2; ++part)
            ordered.data[2 * i + part] = ordered.data[2 * wrapped + part] =
                spectrum.data[2 * root + part] * scale;
    }
    ExecuteComplex(*stage->raderPlan, ordered.data, ordered.data + 1, spectrum.data,
                   spectrum.data + 1, 2, 2, work.data);
    ordered.release(); // before more memory is allocated
    if (!Allocate(stage->raderCos, n) || !Allocate(stage->raderSin, n))
        return false;
    for (ptrdiff_t k = 0; k < n; ++k) {
        stage->raderCos[k] = spectrum.data[2 * k];
        stage->raderSin[k] = spectrum.data[2 * k + 1];
    }
    return true;
}

bool BuildRader(FFTStage *stage, int32_t p) {
    const int32_t n = RaderLength(p);
    if (!Allocate(stage->raderGather, p) || !Allocate(stage->raderScatter, p))
        return false;
    stage->raderPlan = qx::create_oxfft_table(n);
    if (stage->raderPlan == nullptr)
        return false;
    BuildRaderOrders(stage, p);
    return BuildRaderSpectrum(stage, p, n);
}

bool BuildStage(FFTStage *stage, int32_t p, int32_t kind, int32_t n) {
    const bool isLeaf = n == p;
    if (kind == KernelFactor)
        stage->passes = PassesOf(p, isLeaf ? 0 : n / p);
    return (isLeaf || BuildTwiddles(stage, p, n)) &&
           (isLeaf || kind != KernelFactor || BuildLanes(stage, p, n / p)) &&
           (kind != DirectPrime || BuildRoots(stage, p)) &&
           (kind != RaderPrime || BuildRader(stage, p));
}

bool BuildStages(FFTPlan *plan) {
    int32_t n = plan->length;
    for (int32_t s = 0; s < plan->factorCount; ++s) {
        const int32_t p = plan->factors[s];
        plan->stages[s] = static_cast<FFTStage *>(std::calloc(1, sizeof(FFTStage)));
        if (plan->stages[s] == nullptr || !BuildStage(plan->stages[s], p, plan->kinds[s], n))
            return false;
        n /= p;
    }
    return true;
}

void MeasureWork(FFTPlan *plan) {
    for (int32_t s = 0; s < plan->factorCount; ++s) {
        if (plan->kinds[s] == KernelFactor)
            continue;
        const bool isLeaf = s == plan->factorCount - 1;
        const PrimeFactor factor = {plan->factors[s], plan->kinds[s], plan->stages[s]};
        plan->complexWork = std::max(plan->complexWork, PrimeComplexWork(factor, isLeaf));
        plan->realWork = std::max(plan->realWork, PrimeRealWork(factor, isLeaf));
    }
}

// The buffer serves the first level, or the second if the first factor is so small that the blocks of the
// second would otherwise share cache sets.
bool BuildBuffer(FFTPlan *plan) {
    constexpr int32_t longestBuffered = 1
                                        << 17; // beyond, the extra memory costs as much as it gains
    const int32_t level = plan->factorCount > 3 && plan->factors[0] <= 4 ? 1 : 0;
    plan->bufferLevel = -1;
    if (plan->factorCount < 2 || plan->length > longestBuffered ||
        plan->kinds[level] != KernelFactor || plan->kinds[plan->factorCount - 1] != KernelFactor)
        return true;
    plan->bufferLevel = level;
    plan->bufferBlocks = plan->factors[0] * (level == 0 ? 1 : plan->factors[1]);
    if (!GainsByBuffer(*plan, 2) || IsBufferOnStack(*plan, 2))
        return true;
    DBL *memory = nullptr;
    const bool built = Allocate(memory, BufferValues(*plan, 2) + lineValues);
    plan->buffer.store(memory, std::memory_order_relaxed);
    return built;
}

void FillKernels(FFTPlan *plan) {
    for (int32_t s = 0; s < plan->factorCount; ++s) {
        if (plan->kinds[s] != KernelFactor)
            continue;
        const KernelSet *const kernels = KernelsOf(plan->factors[s]);
        plan->realLeaf[s] = kernels->realLeaf;
        plan->realTwiddle[s] = kernels->realTwiddle;
        plan->complexLeaf[s] = kernels->complexLeaf;
        plan->complexTwiddle[s] = kernels->complexTwiddle;
    }
    plan->whole = WholeOf(plan->length);
}

// Releases a plan that is complete or partly built.
void Dismantle(FFTPlan *plan) {
    for (FFTStage *stage : plan->stages) {
        if (stage == nullptr)
            continue;
        for (DBL *table : {stage->rootCos, stage->rootSin, stage->twiddleCos, stage->twiddleSin,
                           stage->raderCos, stage->raderSin, stage->complexLanes, stage->realLanes})
            std::free(table);
        std::free(stage->raderGather);
        std::free(stage->raderScatter);
        qx::destroy_oxfft_table(stage->raderPlan);
        std::free(stage);
    }
    std::free(plan->buffer.load(std::memory_order_relaxed));
    std::free(const_cast<double *>(plan->quarterWave.load(std::memory_order_relaxed)));
    std::free(plan);
}

FFTPlan *Build(int32_t length) {
    auto *const plan = static_cast<FFTPlan *>(std::calloc(1, sizeof(FFTPlan)));
    if (plan == nullptr)
        return nullptr;
    plan->length = length;
    Factorise(plan);
    FillKernels(plan);
    if (!BuildStages(plan) || !BuildBuffer(plan)) {
        Dismantle(plan);
        return nullptr;
    }
    MeasureWork(plan);
    return plan;
}

// The next three functions run under the mutex.

FFTPlan *Find(int32_t length) {
    for (FFTPlan *plan = cacheHead; plan != nullptr; plan = plan->next) {
        if (plan->length == length) {
            ++plan->refCount;
            return plan;
        }
    }
    return nullptr;
}

void Insert(FFTPlan *plan) {
    plan->refCount = 1;
    plan->next = cacheHead;
    if (cacheHead != nullptr)
        cacheHead->prev = plan;
    cacheHead = plan;
}

// Returns whether that was the last reference and the plan has left the cache.
bool LeaveCache(FFTPlan *plan) {
    if (--plan->refCount > 0)
        return false;
    (plan->prev != nullptr ? plan->prev->next : cacheHead) = plan->next;
    if (plan->next != nullptr)
        plan->next->prev = plan->prev;
    return true;
}

} // namespace

// A plan is built and dismantled outside the mutex, so that no thread waits for a long one. If two threads
// build the same length at the same time, one keeps its plan and the other takes that plan.
FFTPlan *create_oxfft_table(int32_t length) {
    if (length < 1)
        return nullptr;
    {
        const std::lock_guard<platform::Mutex> lock(cacheMutex);
        if (FFTPlan *const found = Find(length))
            return found;
    }
    FFTPlan *const built = Build(length);
    if (built == nullptr)
        return nullptr;
    FFTPlan *found;
    {
        const std::lock_guard<platform::Mutex> lock(cacheMutex);
        found = Find(length);
        if (found == nullptr) {
            Insert(built);
            return built;
        }
    }
    Dismantle(built);
    return found;
}

void destroy_oxfft_table(FFTPlan *plan) {
    if (plan == nullptr)
        return;
    {
        const std::lock_guard<platform::Mutex> lock(cacheMutex);
        if (!LeaveCache(plan))
            return;
    }
    Dismantle(plan);
}

} // namespace qx
