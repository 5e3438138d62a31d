// tests/threads/rooms.cpp: arrays that are made in one thread, go to others and end there, beside
// each other. Usage: threads_rooms [STEPS]
//
// The host keeps the rooms of arrays and of large blocks for the next ones. If two threads were
// given the same, one would find the other's values, and the thread sanitizer a race; there, the
// program is linked with a host that keeps rooms as without a sanitizer.
#include "tessel/runtime.hpp"

#include <algorithm>
#include <array>
#include <atomic>
#include <cstdio>
#include <cstdlib>
#include <mutex>
#include <random>
#include <string>
#include <thread>
#include <utility>
#include <vector>

namespace {

using tessel::Array;

constexpr std::size_t threadCount = 8;

/// Characters, of two bytes: small blocks, and large ones of one, two and three huge pages.
constexpr std::array<std::size_t, 6> sizes = {1, 7, 500, 1U << 20U, 1'600'000, 2'800'000};

/// Arrays on their way to any thread.
class Exchange {
  public:
    Array swap(std::size_t place, Array array) {
        const std::lock_guard lock(mutex);
        std::swap(places[place % places.size()], array);
        return array;
    }

  private:
    std::mutex mutex;
    std::array<Array, threadCount> places;
};

/// Calls with an element of each page, and the last one.
template <class Use>
bool allOf(const Array &array, const Use &use) {
    constexpr std::size_t step = 2048;
    const std::span<tsChar> values = array.elements<tsChar>();
    for (std::size_t i = 0; i < values.size(); i += step) {
        if (!use(values[i])) {
            return false;
        }
    }
    return use(values.back());
}

/// How many arrays had other values than they were given.
std::size_t work(Exchange &exchange, std::size_t number, std::size_t steps) {
    std::mt19937 lot(static_cast<std::mt19937::result_type>(number));
    std::size_t wrong = 0;
    for (std::size_t step = 0; step < steps; ++step) {
        const std::array<std::size_t, 1> dims = {sizes[lot() % sizes.size()]};
        Array made = Array::characters(dims); // which are zero
        wrong += allOf(made, [](tsChar value) { return value == 0; }) ? 0U : 1U;
        const auto mark = static_cast<tsChar>(step * threadCount + number + 1);
        allOf(made, [&](tsChar &value) {
            value = mark;
            return true;
        });
        const Array came = exchange.swap(lot(), std::move(made));
        if (came) {
            const tsChar first = came.elements<tsChar>()[0];
            wrong += allOf(came, [&](tsChar value) { return value == first; }) ? 0U : 1U;
        }
    }
    return wrong;
}

} // namespace

int main(int argc, char **argv) try {
    const std::size_t steps = argc > 1 ? std::stoul(argv[1]) : 2000;
    Exchange exchange;
    std::atomic<std::size_t> wrong = 0;
    std::vector<std::thread> threads;
    threads.reserve(threadCount);
    for (std::size_t number = 0; number < threadCount; ++number) {
        threads.emplace_back([&, number] { wrong += work(exchange, number, steps); });
    }
    for (std::thread &thread : threads) {
        thread.join();
    }
    std::printf("%zu arrays, %zu with values of another\n", threadCount * steps, wrong.load());
    return wrong == 0 ? EXIT_SUCCESS : EXIT_FAILURE;
} catch (const std::exception &error) {
    std::fprintf(stderr, "%s\n", error.what());
    return EXIT_FAILURE;
}
