#include "qx/fft.h"
#include "qx/frame.h"
#include "qx/host.hpp"

#include <gtest/gtest.h>

#include <algorithm>
#include <atomic>
#include <cstring>
#include <thread>
#include <vector>

#ifdef __linux__
#include <unistd.h>
#endif

namespace {

using qx::host::Array1D;
using qx::host::Array2D;

constexpr int32_t allTypes[] = {QXTypeI32, QXTypeU8,  QXTypeU32, QXTypeSGL,
                                QXTypeDBL, QXTypeCSG, QXTypeCDB};
constexpr std::size_t sizes[] = {4, 1, 4, 4, 8, 8, 16};

TEST(Blocks, KeepTheirElementsThroughGrowthAndShrinking) {
    for (std::size_t type = 0; type < std::size(allTypes); ++type) {
        auto *array = static_cast<Array1DHandle>(QXHostNew1D(allTypes[type], 5));
        ASSERT_NE(array, nullptr);
        EXPECT_EQ((*array)->dimSize, 5);
        EXPECT_EQ(static_cast<char *>(QXHostElements1D(array)) - reinterpret_cast<char *>(*array),
                  4);
        const std::size_t bytes = 5 * sizes[type];
        EXPECT_EQ(std::vector<char>(bytes, 0),
                  std::vector<char>(static_cast<char *>(QXHostElements1D(array)),
                                    static_cast<char *>(QXHostElements1D(array)) + bytes));
        std::memset(QXHostElements1D(array), 0x5A, bytes);
        for (const int32_t count : {100000, 5, 0}) {
            ASSERT_EQ(HostBlockReshape(allTypes[type], 1, &array, count), 0);
            // Every byte that was asked for is there: the sanitizer looks on.
            std::memset(static_cast<char *>(QXHostElements1D(array)) +
                            (count > 5 ? bytes : count * sizes[type]),
                        0x11, count > 5 ? (count - 5) * sizes[type] : 0);
            if (count > 0) {
                EXPECT_EQ(std::vector<char>(bytes, 0x5A),
                          std::vector<char>(static_cast<char *>(QXHostElements1D(array)),
                                            static_cast<char *>(QXHostElements1D(array)) + bytes));
            }
        }
        QXHostFree(array);
    }
    QXHostFree(nullptr);
}

TEST(Blocks, GrowByZeros) {
    auto *array = static_cast<Array2DHandle>(QXHostNew2D(QXTypeI32, 0, 0));
    const auto resized = [&](int32_t rows, int32_t cols) {
        EXPECT_EQ(HostBlockReshape(QXTypeI32, 2, &array, rows * cols), 0);
        (*array)->dimSizes[0] = rows;
        (*array)->dimSizes[1] = cols;
        auto *elements = static_cast<int32_t *>(QXHostElements2D(array));
        std::vector<int32_t> found(elements, elements + rows * cols);
        std::fill(elements, elements + rows * cols, 7);
        return found;
    };
    EXPECT_EQ(resized(200, 100), std::vector<int32_t>(20000, 0)) << "another block";
    resized(0, 0);
    EXPECT_EQ(resized(20, 10), std::vector<int32_t>(200, 0)) << "what the block had before";
    std::vector<int32_t> expected(300, 0);
    std::fill(expected.begin(), expected.begin() + 200, 7);
    EXPECT_EQ(resized(30, 10), expected);
    QXHostFree(array);
}

#if defined(__linux__) && !defined(__SANITIZE_ADDRESS__) && !defined(__SANITIZE_THREAD__)
TEST(Blocks, PromiseNoMoreThanTheMachineHas) {
    const auto total = static_cast<uint64_t>(sysconf(_SC_PHYS_PAGES)) *
                       static_cast<uint64_t>(sysconf(_SC_PAGESIZE));
    std::vector<void *> taken; // and never touched
    while (void *array = QXHostNew1D(QXTypeU8, INT32_MAX))
        taken.push_back(array);
    EXPECT_LT(taken.size() * uint64_t{INT32_MAX}, total);
    auto *small = static_cast<Array1DHandle>(QXHostNew1D(QXTypeU8, 1000));
    ASSERT_NE(small, nullptr);
    const void *const before = *small;
    EXPECT_EQ(HostBlockReshape(QXTypeCDB, 1, &small, INT32_MAX), QXHostNoMemory);
    EXPECT_EQ(*small, before);
    for (void *array : taken)
        QXHostFree(array);
    if (!taken.empty()) {
        EXPECT_EQ(HostBlockReshape(QXTypeU8, 1, &small, INT32_MAX), QXHostDone);
        EXPECT_EQ(HostBlockReshape(QXTypeU8, 1, &small, 10), QXHostDone);
    }
    QXHostFree(small);
}
#endif

TEST(Blocks, GiveMemoryBackWhereItIsWorthAMove) {
    auto *array = static_cast<Array1DHandle>(QXHostNew1D(QXTypeDBL, 10000));
    const auto stays = [&](int32_t count) {
        const void *const before = *array;
        EXPECT_EQ(HostBlockReshape(QXTypeDBL, 1, &array, count), 0);
        return *array == before;
    };
    EXPECT_TRUE(stays(6000));
    EXPECT_TRUE(stays(10000)) << "the capacity was kept";
    EXPECT_FALSE(stays(4000)) << "less than half";
    EXPECT_FALSE(stays(400));
    EXPECT_TRUE(stays(4)) << "a small block is not moved";
    QXHostFree(array);
}

TEST(Blocks, StayWithinWhatIsReserved) {
    const double values[] = {1, 2};
    auto *array = static_cast<Array1DHandle>(QXHostCopy1D(QXTypeDBL, 2, values));
    ASSERT_EQ(QXHostReserve1D(array, QXTypeDBL, 10000), QXHostDone);
    EXPECT_EQ((*array)->dimSize, 2);
    const void *const before = *array;
    for (const int32_t count : {10000, 1, 10000}) {
        EXPECT_EQ(HostBlockReshape(QXTypeDBL, 1, &array, count), 0);
        EXPECT_EQ(*array, before) << count;
    }
    EXPECT_EQ(static_cast<DBL *>(QXHostElements1D(array))[0], 1);
    EXPECT_EQ(HostBlockReshape(QXTypeDBL, 1, &array, 20000), 0);
    const void *const grown = *array;
    EXPECT_EQ(HostBlockReshape(QXTypeDBL, 1, &array, 1), 0);
    EXPECT_EQ(*array, grown) << "what has grown stays reserved";
    EXPECT_EQ(QXHostReserve1D(array, QXTypeDBL, -1), QXHostBadArgument);
    EXPECT_EQ(QXHostReserve1D(array, 99, 1), QXHostBadArgument);
    EXPECT_EQ(QXHostReserve1D(nullptr, QXTypeDBL, 1), QXHostBadArgument);
    QXHostFree(array);
}

TEST(Calls, GoThroughTheElementsOfTheColumns) {
    double x[] = {0.5, -2, 3}, y[] = {2, 3, 4}, sum[3] = {}, product[3] = {};
    int32_t factor[] = {1, 2, 3};
    ErrorCode codes[] = {7, 7, 7};
    void *of_values[] = {x, factor, sum, product};
    const auto scaled = +[](double v, int32_t k, double *twice, double *times) {
        *twice = 2 * v;
        *times = k * v;
    };
    EXPECT_EQ(QXHostCalls(reinterpret_cast<QXHostFunction>(scaled), "vdiDD", 3, of_values, codes),
              QXHostDone);
    void *of_pointers[] = {x, y};
    const auto moved = +[](double *from, double *to) {
        *to += *from;
        return int32_t{*from < 0};
    };
    EXPECT_EQ(codes[1], 7);
    EXPECT_EQ(QXHostCalls(reinterpret_cast<QXHostFunction>(moved), "eDD", 3, of_pointers, codes),
              QXHostDone);
    for (int i = 0; i < 3; ++i) {
        EXPECT_EQ(sum[i], 2 * x[i]);
        EXPECT_EQ(product[i], (i + 1) * x[i]);
        EXPECT_EQ(y[i], 2 + i + x[i]);
        EXPECT_EQ(codes[i], i == 1);
    }
    EXPECT_EQ(QXHostCalls(reinterpret_cast<QXHostFunction>(moved), "eD", 3, of_pointers, codes),
              QXHostBadArgument);
}

TEST(Blocks, OfTwoDimensionsStartAtByteEight) {
    const double values[] = {1, 2, 3, 4, 5, 6};
    auto *array = static_cast<Array2DHandle>(QXHostCopy2D(QXTypeDBL, 2, 3, values));
    const char *block = reinterpret_cast<char *>(*array);
    double last;
    std::memcpy(&last, block + 8 + 5 * 8, sizeof last);
    EXPECT_EQ(last, 6);
    EXPECT_EQ((*array)->dimSizes[0], 2);
    EXPECT_EQ((*array)->dimSizes[1], 3);
    QXHostFree(array);
}

TEST(Blocks, RefuseWhatCannotBe) {
    auto *array = static_cast<Array1DHandle>(QXHostNew1D(QXTypeDBL, 2));
    Array1DHandle none = nullptr;
    static_cast<double *>(QXHostElements1D(array))[1] = 7;
    EXPECT_EQ(HostBlockReshape(QXTypeDBL, 1, &array, -1), QXHostBadArgument);
    EXPECT_EQ(HostBlockReshape(QXTypeDBL, 1, &array, INT32_MIN), QXHostBadArgument);
    for (const int32_t type : {0, 4, 6, 8, 11, 14, -1})
        EXPECT_EQ(HostBlockReshape(type, 1, &array, 3), QXHostBadArgument) << type;
    EXPECT_EQ(HostBlockReshape(QXTypeDBL, 0, &array, 3), QXHostBadArgument);
    EXPECT_EQ(HostBlockReshape(QXTypeDBL, 3, &array, 3), QXHostBadArgument);
    EXPECT_EQ(HostBlockReshape(QXTypeDBL, 1, nullptr, 3), QXHostBadArgument);
    EXPECT_EQ(HostBlockReshape(QXTypeDBL, 1, &none, 3), QXHostBadArgument);
    if (sizeof(void *) == 4) {
        EXPECT_EQ(HostBlockReshape(QXTypeCDB, 1, &array, INT32_MAX), QXHostNoMemory);
    }
    EXPECT_EQ((*array)->dimSize, 2);
    EXPECT_EQ(static_cast<double *>(QXHostElements1D(array))[1], 7)
        << "a refusal changed the array";
    QXHostFree(array);

    EXPECT_EQ(QXHostNew1D(QXTypeDBL, -1), nullptr);
    EXPECT_EQ(QXHostNew1D(2, 1), nullptr);
    EXPECT_EQ(QXHostNew2D(QXTypeDBL, -1, -1), nullptr);
    EXPECT_EQ(QXHostNew2D(QXTypeU8, 65536, 65536), nullptr) << "the product does not fit in int32";
    EXPECT_EQ(QXHostCopyRecords(0, 1, ""), nullptr);
}

TEST(Arrays, OfTheCppLayerOwnTheirBlocks) {
    Array1D<double> x{1.5, -2.5};
    const DBL1D handle = x.handle();
    Array1D<double> y(std::move(x));
    EXPECT_EQ(y.handle(), handle);
    x = std::move(y);
    EXPECT_EQ(x.size(), 2);
    EXPECT_EQ(x[1], -2.5);
    const std::vector<std::complex<double>> values = {{1, 2}, {3, 4}};
    Array1D<std::complex<double>> z{std::span<const std::complex<double>>(values)};
    EXPECT_EQ(z[1], values[1]);
    const float cells[] = {1, 2, 3, 4, 5, 6};
    Array2D<float> m(2, 3, cells);
    m.at(1, 0) += 10;
    EXPECT_EQ(m.row(1)[0], 14);
    EXPECT_THROW(Array2D<float>(2, 2, cells), std::invalid_argument);
    EXPECT_THROW(Array1D<double>(-1), std::bad_alloc);
    try {
        qx::host::check(WarnLengthsDiffer);
        qx::host::check(ErrNotSquare);
        FAIL() << "a failure did not throw";
    } catch (const qx::host::Error &error) {
        EXPECT_EQ(error.code(), ErrNotSquare);
        EXPECT_STREQ(error.name(), "ErrNotSquare");
        EXPECT_STREQ(error.what(), QXHostErrorText(ErrNotSquare));
    }
}

struct Counter {
    int calls = 0;
    Counter *withdraws = nullptr;
    bool registersAnew = false;
};

int32_t Count(void *argument) {
    auto *counter = static_cast<Counter *>(argument);
    ++counter->calls;
    if (counter->withdraws != nullptr)
        HostRegisterSweep(Count, counter->withdraws, 0);
    if (counter->registersAnew)
        HostRegisterSweep(Count, counter, 2);
    return 0;
}

TEST(Sweeps, RunOncePerRunAndObjectsAreForgotten) {
    Counter process, object, withdrawn, replaced, removedMeanwhile;
    object.withdraws = &removedMeanwhile;
    replaced.registersAnew = true;
    for (Counter *counter : {&object, &withdrawn, &removedMeanwhile, &replaced})
        EXPECT_EQ(HostRegisterSweep(Count, counter, 2), 0);
    EXPECT_EQ(HostRegisterSweep(Count, &process, 1), 0);
    EXPECT_EQ(HostRegisterSweep(Count, &process, 1), 0);
    EXPECT_EQ(HostRegisterSweep(Count, &withdrawn, 0), 0);
    EXPECT_EQ(HostRegisterSweep(Count, &withdrawn, 0), 0) << "withdrawing twice is no error";
    EXPECT_NE(HostRegisterSweep(nullptr, &object, 2), 0);
    EXPECT_NE(HostRegisterSweep(Count, &object, 3), 0);

    EXPECT_EQ(QXHostRunSweeps(), 3);
    replaced.registersAnew = false;
    EXPECT_EQ(QXHostRunSweeps(), 2);
    EXPECT_EQ(process.calls, 2);
    EXPECT_EQ(object.calls, 1);
    EXPECT_EQ(withdrawn.calls, 0);
    EXPECT_EQ(removedMeanwhile.calls, 0);
    EXPECT_EQ(replaced.calls, 2);

    EXPECT_EQ(HostRegisterSweep(Count, &object, 1), 0);
    EXPECT_EQ(QXHostReleaseObject(&object), 0);
    EXPECT_EQ(HostRegisterSweep(Count, &object, 2), 0) << "the latest mode counts";
    EXPECT_EQ(QXHostReleaseObject(&process), 0) << "a process's sweep is no object's";
    EXPECT_EQ(QXHostReleaseObject(&object), 1);
    EXPECT_EQ(QXHostReleaseObject(&object), 0);
    HostRegisterSweep(Count, &process, 0);
    EXPECT_EQ(QXHostRunSweeps(), 0);
}

std::vector<std::ptrdiff_t> sweptOrder;
const char *firstSwept = nullptr;
int32_t NoteOrder(void *argument) {
    sweptOrder.push_back(static_cast<const char *>(argument) - firstSwept);
    return 0;
}

// As many as a large program has slots; the order stays, whatever is withdrawn between.
TEST(Sweeps, OfManyObjectsAreCalledInTheirOrder) {
    constexpr std::ptrdiff_t count = 80000;
    const std::vector<char> objects(count);
    firstSwept = objects.data();
    const auto object = [&](std::ptrdiff_t i) {
        return const_cast<char *>(&objects[static_cast<std::size_t>(i)]);
    };
    sweptOrder.clear();
    for (std::ptrdiff_t i = 0; i < count; ++i)
        ASSERT_EQ(HostRegisterSweep(NoteOrder, object(i), 2), 0);
    for (std::ptrdiff_t i = 0; i < count; i += 4)
        ASSERT_EQ(HostRegisterSweep(NoteOrder, object(i), 0), 0);
    for (std::ptrdiff_t i = count - 1; i > 0; i -= 4) // 79999, 79995 ...
        ASSERT_EQ(QXHostReleaseObject(object(i)), 1);
    EXPECT_EQ(sweptOrder.size(), static_cast<std::size_t>(count / 4));
    EXPECT_EQ(sweptOrder.front(), count - 1);
    sweptOrder.clear();
    EXPECT_EQ(QXHostRunSweeps(), count / 2);
    EXPECT_TRUE(std::is_sorted(sweptOrder.begin(), sweptOrder.end()));
    EXPECT_EQ(QXHostReleaseObject(object(1)), 0);
}

TEST(Sweeps, FromManyThreadsAllArrive) {
    constexpr int perThread = 200;
    std::vector<Counter> counters(4 * perThread);
    std::vector<std::thread> threads;
    for (int t = 0; t < 4; ++t)
        threads.emplace_back([&, t] {
            for (int i = 0; i < perThread; ++i) {
                HostRegisterSweep(Count, &counters[t * perThread + i], 2);
                if (i % 2 == 1)
                    HostRegisterSweep(Count, &counters[t * perThread + i], 0);
            }
        });
    for (std::thread &thread : threads)
        thread.join();
    EXPECT_EQ(QXHostRunSweeps(), 4 * perThread / 2);
}

// The module finds this host by the name of its library and registers its sweep there.
TEST(Module, BindsToTheStandInHost) {
    WorkspaceStatus status = {0, 0};
    InitializeAnalysisWorkspaceH(1000, &status);
    EXPECT_EQ(status.code, 0);
    EXPECT_EQ(QXHostRunSweeps(), 1);
    UninitializeAnalysisWorkspaceH(&status);
    EXPECT_EQ(status.code, 0);
    EnableAnalysisWorkspaceH(&status);
    EXPECT_EQ(status.code, ErrWorkspaceNotInitialized);
}

// No export releases the plan behind a slot; the module's own clean-up procedure does.
TEST(Module, GivesBackThePlansOfSlotsAndInstances) {
    const Array1D<double> x{1, 2, 3, 4};
    const Array1D<std::complex<double>> spectrum;
    {
        qx::host::Slot plan;
        qx::host::Instance node(TransformUnreserveProc);
        for (int call = 0; call < 2; ++call) {
            qx::host::check(ReOXFFTH80(x.handle(), spectrum.handle(), plan.address(), 0, 4, 0));
            EXPECT_EQ(spectrum[0], 10.0);
            qx::host::check(ReOXFFTH80_IDP(x.handle(), spectrum.handle(), node.address(), 0, 4, 0));
            EXPECT_EQ(spectrum[1], std::complex<double>(-2, 2));
        }
        EXPECT_NE(*plan.address(), nullptr);
        EXPECT_NE(*node.address(), nullptr);
        plan.release();
        EXPECT_EQ(*plan.address(), nullptr);
        qx::host::check(ReOXFFTH80(x.handle(), spectrum.handle(), plan.address(), 0, 4, 0));
    }
    // Only the workspace's procedure, registered for the process, is left.
    EXPECT_LE(QXHostRunSweeps(), 1);
}

TEST(Texts, AreThereForUnknownCodesToo) {
    EXPECT_STREQ(QXHostErrorName(-20003), "ErrEmptyInput");
    EXPECT_STREQ(QXHostErrorName(20004), "WarnLengthsDiffer");
    EXPECT_STREQ(QXHostErrorName(QXHostNoMemory), "HostNoMemory");
    EXPECT_STREQ(QXHostErrorName(-20009), "Unknown");
    EXPECT_STRNE(QXHostErrorText(-20009), "");
}

} // namespace
