// guard/src/mapping.hpp: files in mapped memory (the flag 16, NC_MMAP), and whether there is enough
// of it.
#pragma once

#include "header.hpp"

#include <cstdint>

namespace tessel::guard {

/// What the library maps.
enum class Mapping {
    none,
    ofMemory, // nothing of it becomes a file
    ofFile,
};

/// What it maps by the flags of creating a file of a classic format.
Mapping mappingOfNew(int flags) noexcept;

/// Refuses what makes the library map so much, where that cannot be: it writes to an address that
/// there is not.
void lookAtMapping(Mapping kind, std::uint64_t bytes);

/// Refuses to open a file of a classic format in mapped memory for writing, because the library
/// does not make it longer up to the end of what it has mapped; to read it by so many bytes that
/// some of what its header claims is mapped and not there; and where it cannot be mapped.
void lookAtMappedFile(int flags, bool writable, std::uint64_t readBy, const Header &found);

} // namespace tessel::guard
