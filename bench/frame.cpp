// The choice of width: a routine for the width in use against a direct call of the baseline's routine.
// Scratch memory from the enabled workspace against malloc and free for the same sizes: request
// and release in turn, and runs of eight requests released newest first, by one thread and by four.

#include "bench/own_host.h"
#include "bench/timing.h"
#include "fft/kernels/kernels.h"
#include "frame/scratch.h"
#include "frame/workspace.h"

#include <atomic>
#include <barrier>
#include <cstdint>
#include <cstdlib>
#include <string>
#include <thread>

namespace {

using qx::bench::Keep;
using qx::bench::LeastTimes;
using qx::bench::Median;
using qx::bench::Ratios;
using qx::bench::SecondsOf;

constexpr int pairs = 20000;

// A block that is not the last one keeps its bytes until the blocks above it are released, so threads that
// are never all idle at the same time can fill the region.
std::atomic<int64_t> refused = 0;

struct Workspace {
    static void *request(int32_t size) {
        void *block;
        if (qx::ScratchAlloc(&block, size) != 0)
            ++refused;
        return block;
    }
    static void release(void *block) { qx::ScratchFree(block); }
};

struct Heap {
    static void *request(int32_t size) { return std::malloc(static_cast<std::size_t>(size)); }
    static void release(void *block) { std::free(block); }
};

template <class Source, int Depth>
void RequestAndRelease(int32_t size) {
    void *blocks[Depth];
    for (int i = 0; i < pairs; i += Depth) {
        for (void *&block : blocks) {
            block = Source::request(size);
            if (block != nullptr)
                *static_cast<volatile char *>(block) = 1;
        }
        for (int j = Depth; j-- > 0;)
            Source::release(blocks[j]);
    }
}

// Seconds for one pair in each of the threads.
template <class Source, int Depth>
double SecondsPerPair(int threads, int32_t size) {
    std::vector<double> seconds(static_cast<std::size_t>(threads));
    std::barrier start(threads);
    std::vector<std::thread> crew;
    for (double &taken : seconds)
        crew.emplace_back([&] {
            RequestAndRelease<Source, Depth>(size);
            start.arrive_and_wait();
            taken = SecondsOf(1, [&] { RequestAndRelease<Source, Depth>(size); });
        });
    for (std::thread &thread : crew)
        thread.join();
    return Median(seconds) / pairs;
}

template <int Depth>
void Compare(int threads, Ratios &all) {
    constexpr int rounds = 15;
    for (int32_t size = 16; size <= 65536; size *= 4) {
        std::vector<double> ours, peers;
        for (int round = 0; round < rounds; ++round) {
            ours.push_back(SecondsPerPair<Workspace, Depth>(threads, size));
            peers.push_back(SecondsPerPair<Heap, Depth>(threads, size));
        }
        const double ratio = Median(ours) / Median(peers);
        std::printf("scratch, %d thread%s, runs of %d, %5d bytes %8.1f ns  ratio %5.2f\n", threads,
                    threads > 1 ? "s" : " ", Depth, size, Median(ours) * 1e9, ratio);
        all.add(ratio, "runs of " + std::to_string(Depth) + ", " + std::to_string(size) + " bytes");
    }
}

// Both calls run the same routine, so the difference is the cost of the choice.
void CompareCalls() {
    constexpr int calls = 1000;
    static volatile int32_t length = 5;
    const auto times = LeastTimes(
        [] {
            for (int i = 0; i < calls; ++i)
                Keep(qx::WholeOf(length));
        },
        [] {
            for (int i = 0; i < calls; ++i)
                Keep(qx::baseline::WholeOf(length));
        });
    std::printf("call by width %.2f ns, direct call %.2f ns\n", times[0] / calls * 1e9,
                times[1] / calls * 1e9);
}

} // namespace

int main() {
    CompareCalls();
    if (qx::analysisWorkspace.reserve(1U << 30) != 0 || qx::analysisWorkspace.setEnabled(true) != 0)
        return 1;
    if (!qx::analysisWorkspace.isEnabled())
        return 1;
    for (const int threads : {1, 4}) {
        Ratios all("scratch, " + std::to_string(threads) + " threads");
        Compare<1>(threads, all);
        Compare<8>(threads, all);
        all.summary("malloc and free");
    }
    std::printf("requests refused by the full region: %lld\n",
                static_cast<long long>(refused.load()));
    return 0;
}
