// tests/runtime/modules/own_host.cpp: a library with a host of its own in it, which goes with it.
#include "tessel/runtime.hpp"

#include <pthread.h>

#include <array>
#include <atomic>
#include <cstddef>
#include <thread>

namespace {

void (*told)(bool) = nullptr;
std::atomic<bool> wasUsed = false;

/// Made before the host within this library is, and destroyed after it.
class Outlives {
  public:
    Outlives() = default;
    ~Outlives() {
        if (told == nullptr) {
            return;
        }
        // The number of the key that the host has deleted.
        pthread_key_t key = 0;
        pthread_key_create(&key, [](void * /*unused*/) { wasUsed = true; });
        std::thread([] { tessel::Array::scalar(1); }).join();
        pthread_key_delete(key);
        told(wasUsed);
    }
    Outlives(const Outlives &) = delete;
    Outlives &operator=(const Outlives &) = delete;
};
[[gnu::init_priority(101)]] const Outlives outlives;

} // namespace

/// Makes a large array and lets go of it. Where it was.
extern "C" const void *letGoOfLargeArray() {
    const std::array<std::size_t, 1> dims = {std::size_t{16} << 20U};
    return tessel::Array::numeric(tsUINT8, dims).data();
}

/// Has a thread use the host when it has gone, and tells whether it used a key that is not its own.
extern "C" void tellAfterwards(void (*tell)(bool)) {
    tessel::Array::scalar(1);
    told = tell;
}
