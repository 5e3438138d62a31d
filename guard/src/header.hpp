// guard/src/header.hpp: what a file of the classic formats claims about itself.
#pragma once

#include <optional>
#include <string>

namespace tessel::guard {

/// What in the header of a file is not to be trusted, as part of a sentence; nothing for a file
/// that may be opened, which any other kind of file is as well. Looks at the header only, and never
/// takes more memory than the file is long.
///
/// Refused are counts above the number of bytes that are left of the file, names longer than
/// NC_MAX_NAME and variables of more than NC_MAX_VAR_DIMS dimensions (both overflow the buffers
/// that the library's documentation tells programs to use).
std::optional<std::string> distrusted(const std::string &path);

} // namespace tessel::guard
