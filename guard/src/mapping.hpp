// guard/src/mapping.hpp: files in mapped memory (the flag 16, NC_MMAP), and whether there is enough
// of it.
#pragma once

#include "header.hpp"

#include <cstdint>

namespace tessel::guard {

/// Whether the flags of creating or of opening a file map it.
bool isMapped(int flags) noexcept;

/// Refuses to make so much mapped memory, or to make it so long, where there is not as much: the
/// library writes to an address that there is not.
void lookAtMappedMemory(std::uint64_t bytes);

/// Refuses to create a file in mapped memory that becomes one of the disk (the flag 16384,
/// NC_PERSIST), where an error of the disk ends the process; and to begin it with too much.
void lookAtMappedCreation(int flags, std::uint64_t initial);

/// Refuses to open a file of a classic format in mapped memory for writing, because the library
/// does not make it longer up to the end of what it has mapped; to read it by more bytes than it
/// has, if its header ends there or claims more, so that what is mapped and not there is read; and
/// where it cannot be mapped.
void lookAtMappedFile(bool writable, std::uint64_t readBy, const Header &found);

} // namespace tessel::guard
