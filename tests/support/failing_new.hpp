// tests/support/failing_new.hpp: `operator new` and `delete` of a test program, which count and
// fail. They are defined in failing_new.cpp and take the place of the standard library's.
#pragma once

#include <cstddef>

namespace tessel::test {

/// Counts the allocations of this thread within its life, and fails the n-th; none if n is 0. Those
/// that a module asks the host for are among them in programs with failing_host.cpp.
class Failing {
  public:
    explicit Failing(std::size_t n, bool counting = true);
    ~Failing();
    Failing(const Failing &) = delete;
    Failing &operator=(const Failing &) = delete;

    /// Goes on with counting, or stops.
    static void count(bool on);

    /// Counts an allocation that is to be made; true if it is the one that fails.
    static bool next();

    /// Whether the n-th was made, also when the counting is over.
    static bool met();
};

/// Those of this thread that were made and not given back.
long allocationsAlive();

} // namespace tessel::test
