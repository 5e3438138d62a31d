// runtime/src/block.cpp: the memory that array data and a module's buffers are made of.
#include "block.hpp"

#include "tessel/runtime/module.hpp"

#include <sys/mman.h>

#include <algorithm>
#include <atomic>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <limits>
#include <new>

namespace tessel {
namespace {

std::atomic<bool> checkedMode = false;

constexpr std::size_t guardSize = 64;
constexpr unsigned char guardByte = 0xA7;
constexpr unsigned char undefinedByte = 0xC5;

/// The size of the kernel's huge pages on the systems we know, and the size from which on a block
/// is mapped for them by itself.
constexpr std::size_t hugePage = std::size_t{2} << 20U;

/// What stands before the data of each block. The front guard is next to the data.
struct Header : Link {
    std::size_t bytes;
    void *mapping;           ///< the start of the block's own mapping; nullptr for the heap's
    std::size_t mappingSize; ///< its size
    bool guarded;
    alignas(std::max_align_t) unsigned char frontGuard[guardSize];
};
static_assert(sizeof(Header) % alignof(std::max_align_t) == 0);

constexpr std::size_t overhead = sizeof(Header) + guardSize;

Header *headerOf(void *block) noexcept {
    return static_cast<Header *>(block) - 1;
}
const Header *headerOf(const void *block) noexcept {
    return static_cast<const Header *>(block) - 1;
}

/// Mapped memory in which the huge pages can be used from the start on; zero-filled by the kernel.
Header *mapBlock(std::size_t total) noexcept {
    const std::size_t size = total + hugePage;
    void *const mapping =
        mmap(nullptr, size, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
    if (mapping == MAP_FAILED) {
        return nullptr;
    }
    const auto start = reinterpret_cast<std::uintptr_t>(mapping);
    const std::size_t skip = (hugePage - start % hugePage) % hugePage;
    unsigned char *const aligned = static_cast<unsigned char *>(mapping) + skip;
    madvise(aligned, total, MADV_HUGEPAGE); // advice: without it the block is as good, and slower
    auto *const header = new (aligned) Header;
    header->mapping = mapping;
    header->mappingSize = size;
    return header;
}

Header *heapBlock(std::size_t total, Fill fill) noexcept {
    void *const memory = std::malloc(total);
    if (memory == nullptr) {
        return nullptr;
    }
    auto *const header = new (memory) Header;
    header->mapping = nullptr;
    if (fill == Fill::zero) {
        std::memset(static_cast<void *>(header + 1), 0, total - sizeof(Header));
    }
    return header;
}

bool isGuard(const unsigned char *guard) noexcept {
    return std::all_of(guard, guard + guardSize,
                       [](unsigned char byte) { return byte == guardByte; });
}

} // namespace

void setChecked(bool on) noexcept {
    checkedMode.store(on, std::memory_order_relaxed);
}
bool isChecked() noexcept {
    return checkedMode.load(std::memory_order_relaxed);
}

void Link::insertBefore(Link &other) noexcept {
    previous = other.previous;
    next = &other;
    previous->next = this;
    other.previous = this;
}

void Link::remove() noexcept {
    previous->next = next;
    next->previous = previous;
    previous = this;
    next = this;
}

void *allocateBlock(std::size_t bytes, Fill fill) noexcept {
    if (bytes > std::numeric_limits<std::ptrdiff_t>::max() - overhead - hugePage) {
        return nullptr;
    }
    const std::size_t total = bytes + overhead;
    Header *const header = total >= hugePage ? mapBlock(total) : heapBlock(total, fill);
    if (header == nullptr) {
        return nullptr;
    }
    header->bytes = bytes;
    header->guarded = isChecked();
    auto *const data = reinterpret_cast<unsigned char *>(header + 1);
    if (header->guarded) {
        std::memset(header->frontGuard, guardByte, guardSize);
        std::memset(data + bytes, guardByte, guardSize);
        if (fill == Fill::none) {
            std::memset(data, undefinedByte, bytes);
        }
    }
    return data;
}

void freeBlock(void *block) noexcept {
    if (block == nullptr) {
        return;
    }
    Header *const header = headerOf(block);
    if (header->mapping != nullptr) {
        munmap(header->mapping, header->mappingSize);
    } else {
        std::free(header);
    }
}

std::size_t sizeOf(const void *block) noexcept {
    return headerOf(block)->bytes;
}

bool guardsAreIntact(const void *block) noexcept {
    if (block == nullptr) {
        return true;
    }
    const Header *const header = headerOf(block);
    return !header->guarded || (isGuard(header->frontGuard) &&
                                isGuard(static_cast<const unsigned char *>(block) + header->bytes));
}

Link &linkOf(void *block) noexcept {
    return *headerOf(block);
}

void *blockOf(Link &link) noexcept {
    return static_cast<Header *>(&link) + 1;
}

} // namespace tessel
