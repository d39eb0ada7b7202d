#include "tests/support/hostile_host.h"

#include "frame/host_binding.h"
#include "frame/platform.h"
#include "tests/support/heap_probe.h"

#include <cstdlib>
#include <cstring>
#include <deque>
#include <map>
#include <mutex>
#include <stdexcept>

#if defined(__SANITIZE_ADDRESS__)
#define QX_TEST_POISONS 1
#elif defined(__has_feature)
#if __has_feature(address_sanitizer)
#define QX_TEST_POISONS 1
#endif
#endif
#ifdef QX_TEST_POISONS
#include <sanitizer/asan_interface.h>
#endif

namespace qx::test {

namespace {

constexpr std::size_t guardSize = 64;
constexpr unsigned char deadByte = 0xDE;
constexpr std::size_t quarantineLimit = 64;

struct Block {
    unsigned char *memory; // guard, header and elements, guard
    std::size_t size;      // header and elements
    int32_t numDims;
    int32_t typeCode; // of its elements
    unsigned char guard;
    unsigned char *payload() const { return memory + guardSize; }
    unsigned char *end() const { return payload() + size; }
};

// The guard byte depends on the fill byte of new blocks, so that a call that reads beyond a block
// gives another result when that byte changes.
unsigned char GuardByte() { return Host().freshByte ^ 0x58; }

#ifdef QX_TEST_POISONS
void Forbid(const unsigned char *bytes, std::size_t count) {
    ASAN_POISON_MEMORY_REGION(bytes, count);
}
void Allow(const unsigned char *bytes, std::size_t count) {
    ASAN_UNPOISON_MEMORY_REGION(bytes, count);
}
#else
void Forbid(const unsigned char *, std::size_t) {}
void Allow(const unsigned char *, std::size_t) {}
#endif

struct Registry {
    std::recursive_mutex lock;
    std::deque<HostRecord> records; // of all threads so far
    std::vector<HostRecord *> left; // of threads that have ended, for reuse
    std::map<void *, Block> live;   // by handle
    std::deque<Block> quarantine;   // blocks that have moved, poisoned
    std::map<std::pair<SweepProcedure, void *>, int32_t> sweeps;
};

Registry &Blocks() {
    static auto *registry = new Registry;
    return *registry;
}

Block Allocate(std::size_t size, int32_t numDims, int32_t typeCode) {
    // 16-byte alignment of the payload puts elements of a 1-D block at 4 modulo 16.
    const std::size_t whole = (guardSize + size + guardSize + 15) / 16 * 16;
    auto *memory = static_cast<unsigned char *>(std::malloc(whole + 16));
    if (memory == nullptr)
        throw std::bad_alloc();
    const Block block = {memory, size, numDims, typeCode, GuardByte()};
    std::memset(memory, block.guard, guardSize);
    std::memset(block.payload(), Host().freshByte, size);
    std::memset(block.end(), block.guard, guardSize);
    Forbid(memory, guardSize);
    Forbid(block.end(), guardSize);
    return block;
}

void Expect(const unsigned char *bytes, std::size_t count, unsigned char value, const char *what) {
    Allow(bytes, count);
    // All bytes equal the first if each equals the next.
    if (count > 0 && (bytes[0] != value || std::memcmp(bytes, bytes + 1, count - 1) != 0))
        throw std::logic_error(what);
    Forbid(bytes, count);
}

void CheckGuards(const Block &block) {
    Expect(block.memory, guardSize, block.guard, "a write before the start of a host block");
    Expect(block.end(), guardSize, block.guard, "a write past the end of a host block");
}

void Quarantine(Registry &registry, Block block) {
    CheckGuards(block);
    std::memset(block.payload(), deadByte, block.size);
    Forbid(block.payload(), block.size);
    registry.quarantine.push_back(block);
    if (registry.quarantine.size() > quarantineLimit) {
        const Block oldest = registry.quarantine.front();
        registry.quarantine.pop_front();
        Expect(oldest.payload(), oldest.size, deadByte, "a write to a block that has moved");
        std::free(oldest.memory);
    }
}

std::size_t ElementSize(int32_t typeCode) {
    switch (static_cast<ElementType>(typeCode)) {
    case ElementType::U8:
        return 1;
    case ElementType::I32:
    case ElementType::U32:
    case ElementType::SGL:
        return 4;
    case ElementType::DBL:
    case ElementType::CSG:
        return 8;
    case ElementType::CDB:
        return 16;
    }
    throw std::logic_error("a reshape with an unknown type code");
}

// An array of DBL may be emptied, but not resized, with the type code of CDB, as some transforms
// do.
bool IsCodeOf(const Block &block, int32_t typeCode, int32_t count) {
    return typeCode == block.typeCode ||
           (count == 0 && block.typeCode == QXTypeDBL && typeCode == QXTypeCDB);
}

} // namespace

// No thread_local object may have a destructor: on 32-bit Windows the compiler's run-time frees the
// memory of such objects before it destroys them, so a destructor would act on reused memory. The
// records are therefore kept until the process ends.
namespace {
thread_local HostRecord *threadsRecord = nullptr;
}

HostRecord &Host() {
    if (threadsRecord == nullptr) {
        const HeapProbe::Pause pause;
        Registry &registry = Blocks();
        const std::lock_guard hold(registry.lock);
        if (registry.left.empty())
            registry.left.push_back(&registry.records.emplace_back());
        threadsRecord = registry.left.back();
        registry.left.pop_back();
    }
    return *threadsRecord;
}

void LeaveHost() {
    ResetHost();
    const std::lock_guard hold(Blocks().lock);
    Blocks().left.push_back(std::exchange(threadsRecord, nullptr));
}

void ResetHost(int32_t failAt, int32_t failStatus) {
    HostRecord fresh;
    fresh.failAt = failAt;
    fresh.failStatus = failStatus;
    Host() = fresh;
}

void RunSweeps() {
    Registry &registry = Blocks();
    const auto registered = registry.sweeps;
    for (const auto &[sweep, mode] : registered) {
        if (mode == SweepForObject)
            registry.sweeps.erase(sweep);
        sweep.first(sweep.second);
    }
}

void RunSweepOf(void *argument) {
    if (argument == nullptr) // not an object's sweep, but that of the workspace
        return;
    SweepProcedure sweep = nullptr;
    {
        const HeapProbe::Pause pause;
        const std::lock_guard hold(Blocks().lock);
        for (auto entry = Blocks().sweeps.begin(); entry != Blocks().sweeps.end(); ++entry)
            if (entry->first.second == argument) {
                sweep = entry->first.first;
                Blocks().sweeps.erase(entry);
                break;
            }
    }
    if (sweep != nullptr)
        sweep(argument);
}

int RegisteredSweeps() { return static_cast<int>(Blocks().sweeps.size()); }

void CheckBlocks() {
    const std::lock_guard hold(Blocks().lock);
    for (const auto &[handle, block] : Blocks().live)
        CheckGuards(block);
    for (const Block &block : Blocks().quarantine)
        Expect(block.payload(), block.size, deadByte, "a write to a block that has moved");
}

void ForgetMovedBlocks() {
    const std::lock_guard hold(Blocks().lock);
    CheckBlocks();
    for (const Block &block : Blocks().quarantine)
        std::free(block.memory);
    Blocks().quarantine.clear();
    Blocks().quarantine.shrink_to_fit();
}

int LiveBlocks() {
    const std::lock_guard hold(Blocks().lock);
    return static_cast<int>(Blocks().live.size());
}

namespace detail {

void *NewBlock(int32_t numDims, int32_t typeCode, std::size_t elementSize, int32_t rows,
               int32_t cols) {
    const HeapProbe::Pause pause;
    const std::lock_guard hold(Blocks().lock);
    const std::size_t count =
        static_cast<std::size_t>(rows) * (numDims == 2 ? static_cast<std::size_t>(cols) : 1);
    const Block block =
        Allocate(4 * static_cast<std::size_t>(numDims) + count * elementSize, numDims, typeCode);
    const int32_t sizes[2] = {rows, cols};
    std::memcpy(block.payload(), sizes, 4 * static_cast<std::size_t>(numDims));
    auto *handle = new void *(block.payload());
    Blocks().live.emplace(handle, block);
    return handle;
}

void FreeBlock(void *handle) {
    const HeapProbe::Pause pause;
    const std::lock_guard hold(Blocks().lock);
    Quarantine(Blocks(), Blocks().live.at(handle));
    Blocks().live.erase(handle);
    delete static_cast<void **>(handle);
}

std::size_t BlockSize(void *handle) {
    const std::lock_guard hold(Blocks().lock);
    return Blocks().live.at(handle).size;
}

int32_t ReshapeBlock(int32_t typeCode, int32_t numDims, void *handleAddress, int32_t count) {
    const HeapProbe::Pause pause;
    HostRecord &record = Host();
    record.reshapes.push_back({typeCode, numDims, count});
    if (record.atReshape)
        record.atReshape();
    if (record.failAt != 0 && static_cast<int32_t>(record.reshapes.size()) == record.failAt)
        return record.failStatus;

    const std::lock_guard hold(Blocks().lock);
    void **handle = *static_cast<void ***>(handleAddress);
    const auto found = Blocks().live.find(handle);
    if (found == Blocks().live.end())
        throw std::logic_error("a reshape of something that is not a handle");
    if (numDims != found->second.numDims)
        throw std::logic_error("a reshape with another number of dimensions");
    if (count < 0)
        throw std::logic_error("a reshape to a negative count");
    if (!IsCodeOf(found->second, typeCode, count))
        throw std::logic_error("a reshape with the type code of another element");
    const uint64_t size =
        4 * static_cast<uint64_t>(numDims) + static_cast<uint64_t>(count) * ElementSize(typeCode);
    if (size > record.largestBlock)
        return statusNoMemory;

    const Block old = found->second;
    const Block moved = Allocate(static_cast<std::size_t>(size), numDims, found->second.typeCode);
    std::memcpy(moved.payload(), old.payload(), old.size < moved.size ? old.size : moved.size);
    Quarantine(Blocks(), old);
    found->second = moved;
    *handle = moved.payload();
    return 0;
}

int32_t RegisterSweep(SweepProcedure procedure, void *argument, int32_t mode) {
    const HeapProbe::Pause pause;
    if (mode != SweepWithdraw && Host().sweepStatus != 0)
        return Host().sweepStatus;
    const std::lock_guard hold(Blocks().lock);
    if (mode == SweepWithdraw)
        Blocks().sweeps.erase({procedure, argument});
    else
        Blocks().sweeps[{procedure, argument}] = mode;
    return 0;
}

} // namespace detail

} // namespace qx::test

// The names that the module looks up in the main program.
#ifdef _WIN32
#define QX_TEST_EXPORT __declspec(dllexport)
#else
#define QX_TEST_EXPORT __attribute__((visibility("default")))
#endif

extern "C" {
extern QX_TEST_EXPORT int32_t gQXRTVersion;
int32_t gQXRTVersion = 1;

QX_TEST_EXPORT int32_t HostBlockReshape(int32_t typeCode, int32_t numDims, void *handleAddress,
                                        int32_t count) {
    return qx::test::detail::ReshapeBlock(typeCode, numDims, handleAddress, count);
}

QX_TEST_EXPORT int32_t HostRegisterSweep(qx::SweepProcedure procedure, void *argument,
                                         int32_t mode) {
    return qx::test::detail::RegisterSweep(procedure, argument, mode);
}
}
