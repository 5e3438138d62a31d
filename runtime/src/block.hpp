// runtime/src/block.hpp: the memory that array data and a module's buffers are made of.
#pragma once

#include <cstddef>

namespace tessel {

enum class Fill { none, zero };

/// Memory for `bytes` bytes, aligned for every type; nullptr where there is none. Large blocks are
/// mapped so that the kernel can back them with huge pages. In checked mode the block has guard
/// bytes before and behind it, and a block without fill holds a pattern.
void *allocateBlock(std::size_t bytes, Fill fill) noexcept;

/// Gives a block back.
void freeBlock(void *block) noexcept;

/// The size of a block, as it was asked for.
std::size_t sizeOf(const void *block) noexcept;

/// True if no guard byte of the block was overwritten, or it has none.
bool guardsAreIntact(const void *block) noexcept;

/// A place in a ring of blocks or arrays, so that an owner can find all that it has.
struct Link {
    Link *previous = this;
    Link *next = this;

    Link() = default;
    ~Link() = default;
    Link(const Link &) = delete; // its neighbours know its place
    Link &operator=(const Link &) = delete;

    [[nodiscard]] bool alone() const noexcept { return next == this; }
    void insertBefore(Link &other) noexcept;
    void remove() noexcept;
};

/// The link of a block, and the block of a link.
Link &linkOf(void *block) noexcept;
void *blockOf(Link &link) noexcept;

} // namespace tessel
