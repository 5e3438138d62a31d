// module/call/failure.cpp: from a status of the library to a host error.
#include "call/failure.hpp"

#include "call/status.hpp"

#include <string>

namespace tessel::netcdf {
namespace {

constexpr Message<const char *, const char *> message = "%s, library error message \"%s\"";

} // namespace

void raiseLibraryFailure(const LibraryFailure &failure, int status) {
    const std::string identifier =
        std::string("TESSEL:netcdf:") + failure.tag + ":" + statusIdentifier(status);
    raise(identifier.c_str(), message, failure.text, nc_strerror(status));
}

} // namespace tessel::netcdf
