// module/ops/data/read_variable.hpp: what the read families ask about a variable, and how they
// shape what they read.
#pragma once

#include "call/failure.hpp"
#include "convert/index_vector.hpp"
#include "convert/read_buffer.hpp"

#include <algorithm>
#include <cstddef>

namespace tessel::netcdf {

/// The variable's number of dimensions. `failure` is what the family says when the inquiry fails.
template <class Failure>
std::size_t numberOfDimensions(int ncid, int varid, const Failure &failure) {
    int ndims = 0;
    check(nc_inq_varndims(ncid, varid, &ndims), failure);
    return static_cast<std::size_t>(ndims);
}

/// The variable's dimension ids, in library order.
template <class Failure>
DimensionVector<int> dimensionIDs(int ncid, int varid, std::size_t ndims, const Failure &failure) {
    DimensionVector<int> dimids(ndims, unfilled);
    check(nc_inq_vardimid(ncid, varid, dimids.data()), failure);
    return dimids;
}

/// Returns if an index vector has as many elements as the variable has dimensions.
template <class Vector>
void checkLength(const Vector &vector, std::size_t ndims, const Error<> &mismatch) {
    if (vector.size() != ndims) {
        raise(mismatch);
    }
}

/// The dimensions of the host array that holds a block of the given lengths (library order, slowest
/// first): the lengths reversed, and as many ones as make them two. No lengths give 1-by-1, one
/// length L gives an L-by-1 column, (T, Y, X) gives X-by-Y-by-T. Read in the order in which the
/// library fills it, such an array holds the block without any element being moved.
inline IndexVector resultShape(const IndexVector &lengths) {
    IndexVector dims(std::max<std::size_t>(lengths.size(), 2), 1);
    std::reverse_copy(lengths.begin(), lengths.end(), dims.begin());
    return dims;
}

/// How the families that read blocks read text: all characters of the block are handed over.
inline constexpr TextBlock blockText = {2, [](std::size_t n) { return n; }};

} // namespace tessel::netcdf
