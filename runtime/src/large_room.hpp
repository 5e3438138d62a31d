// runtime/src/large_room.hpp: the memory of large blocks, which the kernel can back with huge
// pages.
//
// New memory is expensive: the kernel looks for huge pages, clears them, and takes them back when
// the block goes. A program that reads a variable piece by piece would pay that for each piece, so
// two rooms that were given back wait for the next blocks of about their size. The kernel may take
// their pages whenever it is short of memory. None waits where the process has a limit on its
// addresses or data, nor in checked mode, nor when this library is unloaded.
#pragma once

#include "block.hpp"

#include <cstddef>

namespace tessel {

/// The size of the kernel's huge pages on the systems we know, and the size from which on a block
/// has a room of its own.
inline constexpr std::size_t hugePage = std::size_t{2} << 20U;

/// Memory that begins where a huge page does and is made of whole ones.
struct LargeRoom {
    void *start = nullptr; ///< nullptr: there is none
    std::size_t size = 0;
};

/// A room for so many bytes. With Fill::zero, these are zero.
LargeRoom takeLargeRoom(std::size_t bytes, Fill fill) noexcept;

/// Gives a room back, to wait or to the kernel.
void giveBack(LargeRoom room) noexcept;

/// Gives the kernel all rooms that wait. True if there were any.
bool dropSpares() noexcept;

/// What `allocate` gives; where that is nullptr, what it gives once no rooms wait.
template <class Allocate>
void *orWithoutSpares(const Allocate &allocate) noexcept {
    void *memory = allocate();
    while (memory == nullptr && dropSpares()) {
        memory = allocate();
    }
    return memory;
}

} // namespace tessel
