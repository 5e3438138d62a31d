// guard/src/mapping.cpp: files in mapped memory, and whether there is enough of it.
#include "mapping.hpp"

#include "refusals.hpp"

#include <sys/mman.h>

#include <algorithm>
#include <string>

namespace tessel::guard {
namespace {

constexpr int diskless = 0x8; // the file is kept in memory
constexpr int mapped = 0x10;  // and is that memory
constexpr int persistent = 0x4000;

constexpr int memory = PROT_READ | PROT_WRITE; // which the system has to promise
constexpr int file = PROT_READ;

[[noreturn]] void refuseMapping(const std::string &why) {
    refuse(mapping, "the flag 16 (NC_MMAP) is set, and " + why);
}

void lookAtRoom(std::uint64_t bytes, int protection) {
    const int promise = protection == memory ? 0 : MAP_NORESERVE;
    void *const room =
        mmap(nullptr, bytes, protection, MAP_PRIVATE | MAP_ANONYMOUS | promise, -1, 0);
    if (room == MAP_FAILED) {
        refuseMapping("there is no memory for " + std::to_string(bytes) + " bytes");
    }
    munmap(room, bytes);
}

} // namespace

bool isMapped(int flags) noexcept {
    return (flags & (mapped | diskless)) == mapped;
}

void lookAtMappedMemory(std::uint64_t bytes) {
    if (bytes > 0) {
        lookAtRoom(bytes, memory);
    }
}

void lookAtMappedCreation(int flags, std::uint64_t initial) {
    if ((flags & persistent) != 0) {
        refuseMapping("the file is to be written");
    }
    lookAtMappedMemory(initial);
}

void lookAtMappedFile(bool writable, std::uint64_t readBy, const Header &found) {
    if (writable) {
        refuseMapping("the file is to be written");
    }
    if (readBy > found.size && isShort(found)) {
        refuseMapping("of a file of " + std::to_string(found.size) +
                      " bytes, which is to have more, " + std::to_string(readBy) +
                      " are to be mapped");
    }
    lookAtRoom(std::max(readBy, found.size), file);
}

} // namespace tessel::guard
