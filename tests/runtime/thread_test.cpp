// tests/runtime/thread_test.cpp: calls from many threads.
#include "support.hpp"

#include <atomic>
#include <chrono>
#include <thread>

namespace tessel::test {
namespace {

TEST(Threads, CallTwoModulesOneAfterTheOther) {
    const Module good(testModule("good"));
    const Module raising(testModule("raising"));
    std::atomic<int> inside = 0;
    const Array shared = pointerArray(&inside);
    std::atomic<int> wrong = 0;
    std::atomic<int> rounds = 0;
    const auto until = std::chrono::steady_clock::now() + std::chrono::milliseconds(500);
    const auto work = [&](int number) {
        while (std::chrono::steady_clock::now() < until) {
            ++rounds;
            const bool right =
                good("add", number, 0.5)[0].number() == number + 0.5 &&
                raising("exclusive", shared, number)[0].number() == 2 * number &&
                good("text", std::to_string(number))[0].utf8() == std::to_string(number) &&
                identifierOf([&] { raising("plain"); }) == "test:plain";
            wrong += right ? 0 : 1;
        }
    };
    std::vector<std::thread> threads;
    threads.reserve(8);
    for (int i = 0; i < 8; ++i) {
        threads.emplace_back(work, i);
    }
    for (std::thread &thread : threads) {
        thread.join();
    }
    EXPECT_EQ(wrong, 0);
    EXPECT_GE(rounds, 8);
}

TEST(Threads, LoadAndUnloadWhileOthersCall) {
    const Module good(testModule("good"));
    std::atomic<bool> stop = false;
    std::atomic<int> wrong = 0;
    std::thread caller([&] {
        while (!stop) {
            wrong += good("add", 1, 2)[0].number() == 3 ? 0 : 1;
        }
    });
    for (int i = 0; i < 100; ++i) {
        const Module raising(testModule("raising"));
        wrong += raising("count_calls")[0].number() == 1 ? 0 : 1;
        setChecked(i % 2 == 0); // at any time
    }
    setChecked(false);
    stop = true;
    caller.join();
    EXPECT_EQ(wrong, 0);
}

TEST(Threads, ArraysGoFromThreadToThread) {
    const Module good(testModule("good"));
    Results made;
    std::thread([&] { made = good("text", "from another thread"); }).join();
    EXPECT_EQ(made[0].utf8(), "from another thread");
    std::thread([&] { made = Results(); }).join();
    EXPECT_EQ(made.size(), 0U);
}

} // namespace
} // namespace tessel::test
