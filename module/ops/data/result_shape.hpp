// module/ops/data/result_shape.hpp: library-order lengths as host dimensions.
#pragma once

#include <algorithm>
#include <cstddef>
#include <vector>

namespace tessel::netcdf {

/// The dimensions of the host array that holds a block of the given lengths (library order, slowest
/// first): the lengths reversed, and as many ones as make them two. No lengths give 1-by-1, one
/// length L gives an L-by-1 column, (T, Y, X) gives X-by-Y-by-T. Read in the order in which the
/// library fills it, such an array holds the block without any element being moved.
inline std::vector<std::size_t> resultShape(const std::vector<std::size_t> &lengths) {
    std::vector<std::size_t> dims(std::max<std::size_t>(lengths.size(), 2), 1);
    std::reverse_copy(lengths.begin(), lengths.end(), dims.begin());
    return dims;
}

} // namespace tessel::netcdf
