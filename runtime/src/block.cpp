// runtime/src/block.cpp: the memory that array data and a module's buffers are made of.
#include "block.hpp"

#include "large_room.hpp"
#include "tessel/runtime/module.hpp"

#include <algorithm>
#include <atomic>
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

/// What stands before the data of each block. The front guard is next to the data.
struct Header : Link {
    std::size_t bytes;
    std::size_t roomSize; ///< the size of its large room; 0 for the heap's
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

Header *largeBlock(std::size_t total, Fill fill) noexcept {
    const LargeRoom room = takeLargeRoom(total, fill);
    if (room.start == nullptr) {
        return nullptr;
    }
    auto *const header = new (room.start) Header;
    header->roomSize = room.size;
    return header;
}

Header *heapBlock(std::size_t total, Fill fill) noexcept {
    void *const memory = orWithoutSpares([total] { return std::malloc(total); });
    if (memory == nullptr) {
        return nullptr;
    }
    auto *const header = new (memory) Header;
    header->roomSize = 0;
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
    Header *const header = total >= hugePage ? largeBlock(total, fill) : heapBlock(total, fill);
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
    if (header->roomSize != 0) {
        giveBack({header, header->roomSize});
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
