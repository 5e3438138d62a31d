// module/call/status.hpp: the word for a library status.
#pragma once

#include <string>

namespace tessel::netcdf {

/// The StatusIdentifier: one camel-case word that names a status of the library, its own (negative)
/// or the system's (positive). "unknownErrorStatus" for a status that has no word.
std::string statusIdentifier(int status);

} // namespace tessel::netcdf
