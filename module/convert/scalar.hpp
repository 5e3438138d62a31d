// module/convert/scalar.hpp: one input array into one library argument.
//
// Each converter checks its argument completely and raises its own error when it is unusable. The
// label is the library's parameter name ("ncid", "h_minfree"); it is what the message calls the
// argument. Only the first element of an array is looked at, unless said otherwise.
#pragma once

#include "tessel/array.h"

#include <cstddef>
#include <string>
#include <vector>

namespace tessel::netcdf {

/// A dataset, dimension, variable or attribute id: double (truncated toward zero) or int32.
int unpackID(const tsArray *array, const char *label);

/// A name: char. An empty array gives the empty name.
std::string unpackName(const tsArray *array, const char *label);

/// The mode of an open or create: a name (see parseModeName), or flags as double or int32, which go
/// to the library unchecked.
int unpackMode(const tsArray *array);

/// The flags of a mode name, which is "CLOBBER", "NOCLOBBER", "WRITE" or "NOWRITE" in any case,
/// with or without "NC_". Upper-cases the text in place.
int parseModeName(char *text);

/// An external data type: double, 0 to 6. A fraction or a NaN in that range gives 0, not a type,
/// which the library then refuses.
int unpack_xtype(const tsArray *array);

/// A size: any numeric class, not negative, neither infinite nor NaN.
std::size_t unpackGenericSizeParameter(const tsArray *array, const char *label);

/// A small number such as a format or a status: double or int32. The storage is read as a double in
/// both cases: pass double.
int unpackIntSingleton(const tsArray *array, const char *label);

/// A list of dimension ids: double, at most 1024, any shape, empty for a scalar variable. The host
/// lists the fastest-varying dimension first and the library the slowest, so `out` is reversed.
void unpackDimids(const tsArray *array, std::vector<int> &out);

} // namespace tessel::netcdf
