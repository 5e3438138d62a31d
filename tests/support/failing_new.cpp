// tests/support/failing_new.cpp: `operator new` and `delete` of a test program, which count and
// fail.
#include "support/failing_new.hpp"

#include <algorithm>
#include <cstdlib>
#include <new>

namespace {

/// What `operator new` does on this thread.
struct Allocations {
    bool counting = false;
    std::size_t made = 0;    ///< since counting began
    std::size_t failing = 0; ///< the one that fails; 0: none
    bool met = false;        ///< it was made
    long alive = 0;          ///< made, and not given back, counting or not
};
constinit thread_local Allocations allocations;

} // namespace

void *operator new(std::size_t bytes) {
    if (tessel::test::Failing::next()) {
        throw std::bad_alloc();
    }
    void *const memory = std::malloc(std::max<std::size_t>(bytes, 1));
    if (memory == nullptr) {
        throw std::bad_alloc();
    }
    ++allocations.alive;
    return memory;
}

void *operator new(std::size_t bytes, const std::nothrow_t & /*none*/) noexcept {
    try {
        return operator new(bytes);
    } catch (const std::bad_alloc &) {
        return nullptr;
    }
}

void operator delete(void *memory) noexcept {
    if (memory != nullptr) {
        --allocations.alive;
        std::free(memory);
    }
}

void operator delete(void *memory, std::size_t /*bytes*/) noexcept {
    operator delete(memory);
}

namespace tessel::test {

Failing::Failing(std::size_t n, bool counting) {
    allocations.made = 0;
    allocations.failing = n;
    allocations.met = false;
    allocations.counting = counting;
}

Failing::~Failing() {
    allocations.counting = false;
    allocations.failing = 0;
}

void Failing::count(bool on) {
    allocations.counting = on;
}

bool Failing::next() {
    if (allocations.counting && ++allocations.made == allocations.failing) {
        allocations.met = true;
        return true;
    }
    return false;
}

bool Failing::met() {
    return allocations.met;
}

long allocationsAlive() {
    return allocations.alive;
}

} // namespace tessel::test
