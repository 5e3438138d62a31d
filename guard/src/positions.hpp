// guard/src/positions.hpp: whether data lie where the library finds them. It computes positions in
// a file with 64 bits and a sign, and does not see when they are too few.
#pragma once

#include "bytes.hpp"
#include "datasets.hpp"
#include "operations.hpp"
#include "tessel/runtime/watcher.hpp"

#include <cstdint>
#include <string>

namespace tessel::guard {

/// The alignment that is none, but a name for a block of the disk (NC_ALIGN_CHUNK).
inline constexpr std::uint64_t alignToChunks = UINT64_MAX;

/// A dataset of less room than this has all positions within 64 bits: the library writes to no
/// record beyond 2^32 but those of one block, which has fewer elements than there is memory for.
inline constexpr std::uint64_t modestRoom = std::uint64_t{1} << 28U;

/// Whether so many records are known to lie well within 64 bits, whatever the header takes.
inline bool liesWithin(const Dataset &dataset, std::uint64_t records) noexcept {
    return product(dataset.room, records) < std::uint64_t{1} << 62U;
}

/// A number of bytes, for a message.
std::string inWords(double bytes);

/// Refuses a write that makes the dataset this many records long, where they do not fit into a
/// file, or into the memory that is mapped in its place.
void lookAtEnd(std::uint64_t number, const Layout &layout, const Dataset *dataset);

/// Refuses an end of definitions that lays variables where no file reaches, or no memory can be
/// mapped, or that would write more than the limit to records that the file claims and does not
/// have.
void lookAtLayout(std::uint64_t tuned, int ncid, const Dataset *dataset, const Ask &ask,
                  std::uint64_t limit);

/// What a tuned end of definitions puts between the variables, at most.
std::uint64_t tunedRoom(Inputs inputs);

/// Notes how much room a file has by its header.
void take(const Header &found, Dataset &dataset);

/// What a file that is being opened lacks of what its header claims.
Shortfall shortfallOf(const Header &found) noexcept;

/// Refuses a redefinition that may have to move, or to fill, more than the limit of what the file
/// claims and does not have.
void lookAtShortfall(const Dataset &dataset, std::uint64_t limit);

} // namespace tessel::guard
