// tests/difference/pinned.hpp: programs that are run every time.
#pragma once

#include "program.hpp"

#include <cstddef>
#include <vector>

namespace difference {

struct Pinned {
    const char *name;
    std::size_t succeeding; ///< the number of steps that succeed
    Program program;
};

const std::vector<Pinned> &pinnedPrograms();

} // namespace difference
