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

/// Whether so much can be mapped. Only what belongs to no file counts as memory of the process, and
/// is promised by the system.
bool isMappable(Mapping kind, std::uint64_t bytes) {
    const bool promised = kind == Mapping::ofMemory;
    void *const memory = mmap(nullptr, bytes, PROT_READ | (promised ? PROT_WRITE : 0),
                              MAP_PRIVATE | MAP_ANONYMOUS | (promised ? 0 : MAP_NORESERVE), -1, 0);
    return memory != MAP_FAILED && munmap(memory, bytes) == 0;
}

bool isMapped(int flags) noexcept {
    return (flags & (mapped | diskless)) == mapped;
}

} // namespace

Mapping mappingOfNew(int flags) noexcept {
    if (!isMapped(flags)) {
        return Mapping::none;
    }
    return (flags & persistent) == 0 ? Mapping::ofMemory : Mapping::ofFile;
}

void lookAtMapping(Mapping kind, std::uint64_t bytes) {
    if (kind != Mapping::none && bytes > 0 && !isMappable(kind, bytes)) {
        refuse(mapping, "the flag 16 (NC_MMAP) is set, and there is no memory for " +
                            std::to_string(bytes) + " bytes");
    }
}

void lookAtMappedFile(int flags, bool writable, std::uint64_t readBy, const Header &found) {
    if (!isMapped(flags) || !found.classic) {
        return;
    }
    if (writable) {
        refuse(mapping, "the flag 16 (NC_MMAP) is set, and the file is to be written");
    }
    if (readBy > found.size && found.extent.end > found.size) {
        refuse(mapping, "the flag 16 (NC_MMAP) is set, and of a file of " +
                            std::to_string(found.size) + " bytes, which claims more, " +
                            std::to_string(readBy) + " are to be mapped");
    }
    lookAtMapping(Mapping::ofFile, std::max(readBy, found.size));
}

} // namespace tessel::guard
