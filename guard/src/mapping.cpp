// guard/src/mapping.cpp: files in mapped memory, and whether there is enough of it.
#include "mapping.hpp"

#include "refusals.hpp"

#include <sys/mman.h>

#include <string>

namespace tessel::guard {
namespace {

constexpr int diskless = 0x8; // the file is kept in memory
constexpr int mapped = 0x10;  // and is that memory
constexpr int persistent = 0x4000;

/// Whether so much can be mapped. Only what belongs to no file counts as memory of the process, and
/// is promised by the system.
bool isMappable(Mapping mapping, std::uint64_t bytes) {
    const bool promised = mapping == Mapping::ofMemory;
    void *const memory = mmap(nullptr, bytes, PROT_READ | (promised ? PROT_WRITE : 0),
                              MAP_PRIVATE | MAP_ANONYMOUS | (promised ? 0 : MAP_NORESERVE), -1, 0);
    return memory != MAP_FAILED && munmap(memory, bytes) == 0;
}

} // namespace

Mapping mappingOf(int flags, bool creates) noexcept {
    if ((flags & (mapped | diskless)) != mapped) {
        return Mapping::none;
    }
    return creates && (flags & persistent) == 0 ? Mapping::ofMemory : Mapping::ofFile;
}

void lookAtMapping(Mapping mapping, std::uint64_t bytes) {
    if (mapping != Mapping::none && bytes > 0 && !isMappable(mapping, bytes)) {
        refuse(mode, "the flag 16 (NC_MMAP) is set, and there is no memory for " +
                         std::to_string(bytes) + " bytes");
    }
}

} // namespace tessel::guard
