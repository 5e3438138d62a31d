// tests/guard/fatal_calls.hpp: calls that the library does not survive, a row each.
#pragma once

#include "support.hpp"
#include "support/library.hpp"

#include <functional>
#include <limits>
#include <ostream>
#include <span>

namespace tessel::test {

struct Fatal {
    const char *name;
    int signal;             // that ends the process without the guard
    const char *identifier; // of the error with it; "" if the call succeeds then
    const char *why;        // what the message says
    std::function<void(const Module &netcdf, const Folder &folder)> call;
    int mended = std::numeric_limits<int>::max(); // the first release tried that survives it
};

inline void PrintTo(const Fatal &fatal, std::ostream *out) {
    *out << fatal.name;
}

std::span<const Fatal> fatalCalls();

} // namespace tessel::test
