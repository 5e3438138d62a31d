// tessel/netcdf_guard.hpp: keeps calls from the netCDF library that it does not survive.
#pragma once

#include "tessel/runtime/watcher.hpp"

#include <cstdint>
#include <memory>

namespace tessel {

/// What the guard allows.
struct GuardOptions {
    /// Whether addresses ("https://...") may be given as file names.
    bool remote = false;

    /// How many bytes of fill values one call may write before the data that it was given, and how
    /// many a redefinition may write for what a file claims and does not have.
    std::uint64_t fillLimit = std::uint64_t{4} << 30U;
};

/// A guard for the module "netcdf", to be given to Module::watchedBy.
///
/// Version 4.9 of the library divides by zero, follows a null pointer, or goes on for ever when it
/// is given certain arguments that look valid, and it fetches what a file name that is an address
/// names. The guard is a watcher which refuses these calls, and no others, with an Error that says
/// why:
///
/// - "TESSEL:guard:alignment": a tuned enddef with an alignment of 0, which divides by zero, or
///   of 2^63 or more, which puts the data over the header
/// - "TESSEL:guard:mode": a mode flag that makes create or open follow an invalid pointer
/// - "TESSEL:guard:mapping": in mapped memory (the flag 16, NC_MMAP), a file of a classic format
///   that is to be written, because the disk's errors would end the process and what is written may
///   be lost; one that is too long to be mapped, or is mapped further than it reaches and claims
///   more; and what makes memory that is no file longer than what there is
/// - "TESSEL:guard:closed": anything with a dataset that is based on HDF5, or was opened without
///   the guard, and whose closing failed: its memory may be freed
/// - "TESSEL:guard:name": a name that may become longer than NC_MAX_NAME, 256 bytes, when its
///   letters are composed (Unicode's form NFC), in a classic file
/// - "TESSEL:guard:lengths": a variable over a dimension of 2^63 elements or more
/// - "TESSEL:guard:redefinition": a redefinition with 2^31 records or more, which would be lost if
///   they had to move; whether they will have to, nobody knows by then
/// - "TESSEL:guard:counts": a write of counts that multiply to more than 64 bits hold
/// - "TESSEL:guard:records": a write that would first fill more bytes than GuardOptions::fillLimit
/// - "TESSEL:guard:position": definitions or a write that would put data behind 2^63 bytes
/// - "TESSEL:guard:header": a file whose header claims what it cannot hold, or what would overflow
///   the buffers of programs that follow the library's limits, and the redefinition of one that
///   lacks more than GuardOptions::fillLimit of what its header claims
/// - "TESSEL:guard:remote": a file name that is an address, unless GuardOptions::remote is set
///
/// It closes in steps: definitions are ended and the dataset is synchronised before the library
/// closes it. When one of them fails, "close" raises why, and the dataset is open and whole.
///
/// What it knows of open datasets it has from the calls that it saw. Dataset ids belong to the
/// process, and so does this knowledge: all guards share it.
std::shared_ptr<Watcher> netcdfGuard(const GuardOptions &options = {});

} // namespace tessel
