// tests/faults/system_calls.hpp: the system calls that the library makes on files, counted, and
// made to fail.
//
// The functions are defined in the test program (system_calls.cpp); being in the program, they come
// before the C library's.
#pragma once

#include <cstddef>
#include <string>
#include <vector>

namespace tessel::test {

enum class SystemCall { open, stat, seek, read, write, close };

constexpr std::size_t systemCallCount = 6;

const char *nameOf(SystemCall call);

/// What a call does instead.
struct Fault {
    int error = 0;     ///< it fails with this errno,
    bool half = false; ///< or moves half of the bytes,
    bool all = false;  ///< and every later call of the kind fails as well
};

/// From now on, the n-th call of the kind on files is the one with the fault. Counting starts anew.
void plant(SystemCall call, std::size_t n, const Fault &fault);

/// The calls of the kind since the last `plant` or `noFault`.
std::size_t countOf(SystemCall call);

/// No call fails. Counting starts anew.
void noFault();

/// True if the planted fault was met.
bool faultMet();

} // namespace tessel::test
