// guard/src/header.hpp: what a file of the classic formats claims about itself.
#pragma once

#include <sys/types.h>

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace tessel::guard {

/// Which file it is, whatever its name is or becomes.
struct FileIdentity {
    dev_t device = 0;
    ino_t number = 0;

    bool operator==(const FileIdentity &) const = default;
};

/// Where a header says that data are, in bytes; UINT64_MAX stands for more than that.
struct Extent {
    std::uint64_t end = 0;           ///< of all records that it claims
    std::uint64_t record = 0;        ///< of one record
    std::uint64_t room = UINT64_MAX; ///< to the end of the first record
    std::uint64_t gaps = 0;          ///< what of the room is no variable's
};

/// What the header of a file is like.
struct Header {
    FileIdentity file;                ///< of nothing, if it could not be opened
    std::uint64_t size = 0;           ///< of the file
    bool classic = false;             ///< whether it is one of the classic formats'
    bool data64 = false;              ///< whether that is the one of 64-bit data
    bool whole = false;               ///< whether the file has all of the header
    std::optional<std::string> claim; ///< what is not to be trusted in it, as part of a sentence
    Extent extent;                    ///< where there is no claim
};

/// Whether the header of a file claims more than the file has.
bool claimsMore(const Header &found) noexcept;

/// Whether a file lacks some of its header, or of what that claims.
bool isShort(const Header &found) noexcept;

/// Looks at the header of a file and at nothing else of it. What is not of the classic formats, and
/// what the library says itself, is no claim.
///
/// Refused are counts above the number of bytes that are left of the file, names longer than
/// NC_MAX_NAME and variables of more than NC_MAX_VAR_DIMS dimensions (both overflow the buffers
/// that the library's documentation tells programs to use), and data that would end where no file
/// reaches, behind 2^63 bytes (of which the library notices only some).
Header headerOf(const std::string &path);

/// The header of a file that is open.
Header headerOf(int descriptor);

/// Which file has this name now; of nothing, if none has.
FileIdentity identityOf(const std::string &path) noexcept;

/// The descriptors that the process has of this file, whatever became of its name. Other files of
/// the process are none of a dataset's business.
std::vector<int> descriptorsOf(const FileIdentity &file);

} // namespace tessel::guard
