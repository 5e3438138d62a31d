// guard/src/mapping.hpp: files in mapped memory (the flag 16, NC_MMAP), and whether there is enough
// of it.
#pragma once

#include <cstdint>

namespace tessel::guard {

/// What the library maps.
enum class Mapping {
    none,
    ofMemory, // nothing of it becomes a file
    ofFile,
};

/// What it maps by the flags of creating a file, or of opening one.
Mapping mappingOf(int flags, bool creates) noexcept;

/// Refuses what makes the library map so much, where that cannot be: it writes to an address that
/// there is not.
void lookAtMapping(Mapping mapping, std::uint64_t bytes);

} // namespace tessel::guard
