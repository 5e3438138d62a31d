// tests/threads/serialised.cpp: calls into a module do not overlap. Usage: threads_serialised
// [--without-host]
//
// Threads call a module that counts its calls in an ordinary variable. Through the host each call
// is counted, and the thread sanitizer has nothing to say. With --without-host the threads call the
// entry point itself, without the lock: that is the race that the sanitizer must report, which
// shows that it watches the module at all.
#include "tessel/extension.h"
#include "tessel/runtime.hpp"

#include <dlfcn.h>

#include <cstdio>
#include <string_view>
#include <thread>
#include <vector>

namespace {

constexpr int threadCount = 8;
constexpr int callsPerThread = 20000;

template <class Call>
void fromAllThreads(const Call &call) {
    std::vector<std::thread> threads;
    threads.reserve(threadCount);
    for (int i = 0; i < threadCount; ++i) {
        threads.emplace_back([&call] {
            for (int n = 0; n < callsPerThread; ++n) {
                call();
            }
        });
    }
    for (std::thread &thread : threads) {
        thread.join();
    }
}

int throughHost() {
    const tessel::Module counter{TESSEL_COUNTER_MODULE};
    fromAllThreads([&] { counter("count"); });
    const double counted = counter("count")[0].number();
    const double made = (threadCount * callsPerThread) + 1;
    std::printf("%.0f of %.0f calls were counted\n", counted, made);
    return counted == made ? 0 : 1;
}

int withoutHost() {
    void *const handle = dlopen(TESSEL_COUNTER_MODULE, RTLD_NOW | RTLD_LOCAL);
    if (handle == nullptr) {
        std::printf("%s\n", dlerror());
        return 1;
    }
    auto *const entry = reinterpret_cast<decltype(tsxFunction) *>(dlsym(handle, "tsxFunction"));
    fromAllThreads([&] { entry(0, nullptr, 0, nullptr); });
    return 0;
}

} // namespace

int main(int argc, char **argv) try {
    return argc > 1 && std::string_view(argv[1]) == "--without-host" ? withoutHost()
                                                                     : throughHost();
} catch (const std::exception &error) {
    std::printf("%s\n", error.what());
    return 1;
}
