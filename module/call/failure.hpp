// module/call/failure.hpp: from a status of the library to a host error.
#pragma once

#include "call/error.hpp"

#include <netcdf.h>

namespace tessel::netcdf {

/// What an operation says when a library call of its fails. The identifier is "TESSEL:netcdf:", the
/// tag, ":" and the status's word; the message is the text and the library's own explanation.
struct LibraryFailure {
    const char *tag;
    const char *text;
};

/// Raises the failure for a status that is not zero.
[[noreturn]] void raiseLibraryFailure(const LibraryFailure &failure, int status);

/// Returns if the library call succeeded, and raises the failure otherwise.
inline void check(int status, const LibraryFailure &failure) {
    if (status != NC_NOERR) {
        raiseLibraryFailure(failure, status);
    }
}

/// The same for the few inquiries whose identifier does not tell the status.
inline void check(int status, const Error<const char *> &failure) {
    if (status != NC_NOERR) {
        raise(failure, nc_strerror(status));
    }
}

} // namespace tessel::netcdf
