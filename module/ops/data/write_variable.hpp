// module/ops/data/write_variable.hpp: what the block writes ask about a variable and then check.
#pragma once

#include "call/error.hpp"
#include "convert/index_vector.hpp"
#include "tessel/array.h"

#include <netcdf.h>

#include <array>
#include <cstddef>

namespace tessel::netcdf {

/// A variable that is to be written: its name, which only messages show, and how many dimensions
/// it has.
struct WrittenVariable {
    std::array<char, NC_MAX_NAME + 1> name;
    int ndims;
};

WrittenVariable inquireWritten(int ncid, int varid, const Error<const char *> &failure);

/// Returns if an index vector of that length fits the variable. The error's arguments are the
/// variable's name, its number of dimensions and the length.
void checkLength(std::size_t length, const WrittenVariable &variable,
                 const Error<const char *, int, unsigned> &mismatch);

/// Returns if the data have as many elements as the counts multiply to (in 64 bits, wrapping
/// around). The error's arguments are both numbers, the product first, in 32 bits.
void checkSize(const IndexVector &count, const tsArray *data,
               const Error<unsigned, unsigned> &mismatch);

} // namespace tessel::netcdf
