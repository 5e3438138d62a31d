// guard/src/positions.cpp: whether data lie where the library finds them.
#include "positions.hpp"

#include "bytes.hpp"
#include "header.hpp"
#include "mapping.hpp"
#include "refusals.hpp"

#include <sys/stat.h>

#include <algorithm>
#include <string>

namespace tessel::guard {
namespace {

/// As far as data may reach. What is between this and 2^63 is left for the header, whose length
/// nobody says, and for the blocks that are read and written at once.
constexpr double mostBytes = 0x1p63 - 0x1p32;

constexpr double tooLarge = 0x1p63; // which the library says itself, of 64-bit data

double bytesOf(const Layout &layout, std::uint64_t number) {
    return layout.fixed + static_cast<double>(number) * layout.record;
}

/// How much the file lacks, where it has grown since it was opened or has not.
std::uint64_t missingOf(const Dataset &dataset) {
    std::uint64_t size = dataset.shortfall.size;
    for (const int descriptor : descriptorsOf(dataset.file)) {
        struct stat status {};
        if (fstat(descriptor, &status) == 0) {
            size = std::max(size, static_cast<std::uint64_t>(status.st_size));
        }
    }
    return dataset.shortfall.end - std::min(size, dataset.shortfall.end);
}

/// What is missing is counted in records as they will be.
void lookAtMissing(const Dataset &dataset, double record, std::uint64_t limit) {
    const auto missing = static_cast<double>(missingOf(dataset));
    const auto former = static_cast<double>(dataset.shortfall.record);
    const double bytes = former > 0 ? missing * std::max(record / former, 1.0) : missing;
    if (bytes > static_cast<double>(limit)) {
        refuse(header, "of what the header of \"" + dataset.path + "\" claims, the file lacks " +
                           inWords(missing) + ", for which " + inWords(bytes) +
                           " may have to be written (it is made as long as it claims when it is "
                           "opened for writing and closed)");
    }
}

} // namespace

std::string inWords(double bytes) {
    return bytes < 0x1p64 ? std::to_string(static_cast<std::uint64_t>(bytes)) + " bytes"
                          : "more than 2^64 bytes";
}

void lookAtEnd(std::uint64_t number, const Layout &layout, const Dataset *dataset) {
    const double gaps = dataset == nullptr ? 0 : static_cast<double>(dataset->gaps);
    if (gaps + bytesOf(layout, number) > mostBytes) {
        refuse(position, "the write ends at record " + std::to_string(number - 1) + ", and with " +
                             "records of " + inWords(layout.record) +
                             " that is behind 2^63 bytes, where no file reaches");
    }
    if (dataset != nullptr && dataset->mapped) {
        lookAtMappedMemory(static_cast<std::uint64_t>(gaps + bytesOf(layout, number)));
    }
}

void lookAtLayout(std::uint64_t tuned, int ncid, const Dataset *dataset, const Ask &ask,
                  std::uint64_t limit) {
    const bool lacks = dataset != nullptr && dataset->shortfall.end > 0;
    const bool isMapped = dataset != nullptr && dataset->mapped;
    if (dataset != nullptr && sum(dataset->room, tuned) < modestRoom && !lacks && !isMapped) {
        return;
    }
    const Layout layout = layoutOf(ncid, ask);
    if (layout.largest == 0) { // the library lays nothing out
        return;
    }
    const auto gaps = static_cast<double>(sum(dataset == nullptr ? 0 : dataset->gaps, tuned));
    const double bytes = bytesOf(layout, std::max<std::uint64_t>(layout.records, 1));
    const bool answered = dataset != nullptr && dataset->data64 && layout.largest > tooLarge;
    if (gaps + bytes > mostBytes && !answered) {
        refuse(position, "the variables end behind 2^63 bytes, where no file reaches");
    }
    if (const double all = gaps + bytesOf(layout, layout.records); isMapped && all <= mostBytes) {
        // Mapped no later than the first read or write at its end.
        lookAtMappedMemory(static_cast<std::uint64_t>(all));
    }
    if (lacks) {
        lookAtMissing(*dataset, layout.record, limit);
    }
}

std::uint64_t tunedRoom(Inputs inputs) {
    std::uint64_t room = 0;
    for (const tsArray *const input : inputs.subspan(2)) {
        const std::uint64_t bytes = size(input).value_or(0);
        room = sum(room, bytes == alignToChunks ? 0 : bytes);
    }
    return room;
}

void take(const Header &found, Dataset &dataset) {
    dataset.room = found.extent.room;
    dataset.gaps = found.extent.gaps;
}

Shortfall shortfallOf(const Header &found) noexcept {
    const Extent &extent = found.extent;
    return claimsMore(found) ? Shortfall{extent.end, found.size, extent.record} : Shortfall{};
}

void lookAtShortfall(const Dataset &dataset, std::uint64_t limit) {
    lookAtMissing(dataset, 0, limit);
}

} // namespace tessel::guard
