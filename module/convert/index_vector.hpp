// module/convert/index_vector.hpp: start, count, index and stride arguments.
//
// The one place where the host's order of dimensions becomes the library's: element k of a vector
// is element n-1-k of the array, whatever the array's shape. Positions are zero-based on both sides
// and go through unchanged; what is out of range is the library's to refuse.
#pragma once

#include "tessel/array.h"

#include <boost/container/small_vector.hpp>

#include <cstddef>

namespace tessel::netcdf {

/// A vector with an element a dimension. Nearly all variables have eight or fewer, and then nothing
/// is allocated.
template <class T>
using DimensionVector = boost::container::small_vector<T, 8>;

/// For one whose elements are all written next.
inline constexpr boost::container::default_init_t unfilled{};

using IndexVector = DimensionVector<std::size_t>;
using StrideVector = DimensionVector<std::ptrdiff_t>;

/// Positions or counts of any numeric class. Fractions are truncated toward zero and negative
/// values wrap around; an infinite or NaN double is refused, a single is not looked at. `out` gets
/// exactly as many elements as the array has, at least one.
void unpackIndexVector(const tsArray *array, const char *argName, IndexVector &out);

/// The same for steps, which stay negative.
void unpackStrideVector(const tsArray *array, const char *argName, StrideVector &out);

} // namespace tessel::netcdf
