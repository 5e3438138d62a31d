// tests/support/library.hpp: which netCDF library this is, where its answer depends on that.
#pragma once

#include <netcdf_meta.h>

namespace tessel::test {

/// 4.9.0 as 40900.
constexpr int libraryRelease = NC_VERSION_MAJOR * 10000 + NC_VERSION_MINOR * 100 + NC_VERSION_PATCH;

/// What it leaves in a byte that was to be 300: the lowest eight bits, and in newer releases the
/// value that stands for nothing.
constexpr const char *byteOf300 = libraryRelease < 40903 ? "44" : "-127";

} // namespace tessel::test
