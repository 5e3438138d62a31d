// runtime/src/large_room.cpp: the memory of large blocks, which the kernel can back with huge
// pages.
#include "large_room.hpp"

#include "tessel/runtime/module.hpp"

#include <sys/mman.h>
#include <sys/resource.h>

#include <array>
#include <atomic>
#include <cstdint>
#include <cstring>
#include <new>

#ifdef __SSE2__
#include <emmintrin.h>
#endif

namespace tessel {
namespace {

/// A room that waits; this stands at its start.
struct Spare {
    std::size_t size;
};

/// The last two that were given back: what a text needs while it is read, a buffer and a result.
std::array<std::atomic<Spare *>, 2> spares;

constexpr std::size_t largestSpare = std::size_t{256} << 20U;

/// Where a sanitizer looks for those who use what they gave back, nothing waits.
constexpr bool anyMayWait = TESSEL_KEEPS_MEMORY != 0;

/// Outside of the object that sets it, which is no more when it is read.
std::atomic<bool> ended = false;

/// Whether the process may not have all the addresses that there are. Then what waits here would be
/// missing elsewhere: in the library's heap, which cannot ask for it.
bool isLimited() noexcept {
    const auto limits = [](auto resource) {
        rlimit limit{};
        return getrlimit(resource, &limit) == 0 && limit.rlim_cur != RLIM_INFINITY;
    };
    return limits(RLIMIT_AS) || limits(RLIMIT_DATA);
}

std::size_t inWholePages(std::size_t bytes) noexcept {
    return (bytes + hugePage - 1) / hugePage * hugePage;
}

/// Zeros, past the caches where the processor can: a room is larger than they are, and a line that
/// is overwritten as a whole need not be read first. That takes less than half of the time.
void clear(void *start, std::size_t bytes) noexcept {
#ifdef __SSE2__
    auto *const lines = static_cast<__m128i *>(start);
    const std::size_t count = (bytes + sizeof(__m128i) - 1) / sizeof(__m128i);
    for (std::size_t i = 0; i < count; ++i) {
        _mm_stream_si128(lines + i, _mm_setzero_si128());
    }
    _mm_sfence();
#else
    std::memset(start, 0, bytes);
#endif
}

/// New memory. What is mapped before the first huge page and behind the last goes back at once.
LargeRoom mapRoom(std::size_t size) noexcept {
    void *const mapping =
        mmap(nullptr, size + hugePage, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
    if (mapping == MAP_FAILED) {
        return {};
    }
    auto *const first = static_cast<unsigned char *>(mapping);
    const std::size_t before = hugePage - reinterpret_cast<std::uintptr_t>(first) % hugePage;
    munmap(first, before);
    unsigned char *const start = first + before;
    if (before != hugePage) {
        munmap(start + size, hugePage - before);
    }
    madvise(start, size, MADV_HUGEPAGE); // advice: without it the room is as good, and slower
    return {start, size};
}

void unmap(LargeRoom room) noexcept {
    munmap(room.start, room.size);
}

/// Has a room wait as the latest, and one wait no longer where there are more than places.
void keep(LargeRoom room) noexcept {
    auto *waits = new (room.start) Spare{room.size};
    for (std::atomic<Spare *> &place : spares) {
        waits = place.exchange(waits);
        if (waits == nullptr) {
            return;
        }
    }
    unmap({waits, waits->size});
}

/// A room that waits and is large enough, and at most twice as large: what is not used of it stays
/// the kernel's to take.
LargeRoom takeSpare(std::size_t bytes) noexcept {
    if (isChecked()) {
        return {};
    }
    for (std::atomic<Spare *> &place : spares) {
        if (Spare *const spare = place.exchange(nullptr)) {
            const LargeRoom room = {spare, spare->size};
            if (room.size >= bytes && room.size <= 2 * inWholePages(bytes)) {
                return room;
            }
            keep(room);
        }
    }
    return {};
}

/// The end of this library: blocks that go later go to the kernel.
class End {
  public:
    End() = default;
    ~End() {
        ended = true;
        dropSpares();
    }
    End(const End &) = delete;
    End &operator=(const End &) = delete;
};
const End end;

} // namespace

bool dropSpares() noexcept {
    bool any = false;
    for (std::atomic<Spare *> &place : spares) {
        if (Spare *const spare = place.exchange(nullptr)) {
            unmap({spare, spare->size});
            any = true;
        }
    }
    return any;
}

LargeRoom takeLargeRoom(std::size_t bytes, Fill fill) noexcept {
    if (const LargeRoom spare = takeSpare(bytes); spare.start != nullptr) {
        if (fill == Fill::zero) {
            clear(spare.start, bytes);
        }
        return spare;
    }
    const std::size_t size = inWholePages(bytes);
    const LargeRoom room = mapRoom(size); // zero-filled by the kernel, page by page as it is used
    return room.start == nullptr && dropSpares() ? mapRoom(size) : room;
}

void giveBack(LargeRoom room) noexcept {
    if (!anyMayWait || room.size > largestSpare || isChecked() || ended || isLimited()) {
        unmap(room);
        return;
    }
    // All but the first page, which has the room's size: whoever is given the room writes to it
    // anew, and until then the kernel may have the memory.
    madvise(static_cast<unsigned char *>(room.start) + hugePage, room.size - hugePage, MADV_FREE);
    keep(room);
    if (ended) { // meanwhile
        dropSpares();
    }
}

} // namespace tessel
