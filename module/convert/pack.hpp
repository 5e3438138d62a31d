// module/convert/pack.hpp: library results into new host arrays.
#pragma once

#include "tessel/create.h"

#include <cstddef>
#include <span>

namespace tessel::netcdf {

/// A number as a 1-by-1 double.
tsArray *packIntScalar(int value);
tsArray *packUintScalar(unsigned value);

/// A size as a 1-by-1 double, over the full range (rounded above 2^53).
tsArray *packUpSizetScalar(std::size_t value);

/// `count` numbers as a 1-by-count double row; 1-by-0 for none.
tsArray *packIntVector(const int *values, std::size_t count);

/// Dimension ids as a double row, in the order given; 0-by-0 for none.
tsArray *packDimidVector(std::span<const int> values);

} // namespace tessel::netcdf
