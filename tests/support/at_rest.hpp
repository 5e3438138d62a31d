// tests/support/at_rest.hpp: what is left when no dataset is open.
#pragma once

#include "support/failing_new.hpp"
#include "tessel/runtime.hpp"

#include <gtest/gtest.h>

namespace tessel::test {

/// Ends what is open. How many allocations are then there, behind a call that works.
inline long aliveAtRest(const Module &netcdf) {
    for (int number = 1; number < 16; ++number) { // as the library numbers them
        try {
            netcdf("abort", number << 16);
        } catch (const Error &) {
            continue; // there is none
        }
    }
    EXPECT_GT(netcdf("inq_libvers")[0].size(), 0U);
    return allocationsAlive();
}

} // namespace tessel::test
