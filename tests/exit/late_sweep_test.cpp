#include "fft/plan_slot.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>

#ifdef __unix__
#include <unistd.h>
#endif

// A host that cleans up in its last exit handler, which was registered before the module's static
// objects were constructed and therefore runs after their destruction. The sweep must find the plan
// cache intact, and plans must still be available. The process ends with 0 only from inside the
// handler.

namespace {

PlanSlot kept[3];

// Reallocates the freed memory and fills it with bytes that make a mutex look locked: whoever locks
// such a mutex hangs, and the process is ended.
void MakeFreedMemoryUseless() {
    for (std::size_t size = 8; size <= 256; size += 8)
        for (int i = 0; i < 20; ++i)
            if (void *block = std::malloc(size))
                std::memset(block, 0x80, size);
#ifdef __unix__
    alarm(60);
#endif
}

void SweepLast() {
    MakeFreedMemoryUseless();
    FFTPlan *const before = qx::create_oxfft_table(106);
    const bool isShared = before == qx::HeldPlan(&kept[0]);
    qx::destroy_oxfft_table(before);
    for (PlanSlot slot : kept)
        qx::CellSweep(slot);
    FFTPlan *const after = qx::create_oxfft_table(1000);
    const bool isAlone = after != nullptr && after->refCount == 1 && after->next == nullptr;
    qx::destroy_oxfft_table(after);
    std::_Exit(isShared && isAlone ? 0 : 2);
}

[[gnu::constructor(101)]] void RegisterFirst() { std::atexit(SweepLast); }

} // namespace

int main() {
    const int32_t lengths[] = {106, 1000, 53};
    for (int i = 0; i < 3; ++i) {
        if (qx::PlanSlotAcquireIDP(&kept[i], lengths[i]) != 0) {
            std::fputs("no plan\n", stderr);
            std::_Exit(3);
        }
    }
    return 1; // unless the handler ends the process with 0
}
