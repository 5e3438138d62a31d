// module/ops/data/write_variable.cpp: what the block writes ask about a variable and then check.
#include "ops/data/write_variable.hpp"

#include "call/failure.hpp"

#include <functional>
#include <numeric>

namespace tessel::netcdf {

WrittenVariable inquireWritten(int ncid, int varid, const Error<const char *> &failure) {
    WrittenVariable variable; // filled by the inquiry
    check(nc_inq_var(ncid, varid, variable.name.data(), nullptr, &variable.ndims, nullptr, nullptr),
          failure);
    return variable;
}

void checkLength(std::size_t length, const WrittenVariable &variable,
                 const Error<const char *, int, unsigned> &mismatch) {
    if (length != static_cast<std::size_t>(variable.ndims)) {
        raise(mismatch, variable.name.data(), variable.ndims, static_cast<unsigned>(length));
    }
}

void checkSize(const IndexVector &count, const tsArray *data,
               const Error<unsigned, unsigned> &mismatch) {
    const std::size_t implied =
        std::accumulate(count.begin(), count.end(), std::size_t{1}, std::multiplies<>());
    const std::size_t given = tsGetNumberOfElements(data);
    if (implied != given) {
        raise(mismatch, static_cast<unsigned>(implied), static_cast<unsigned>(given));
    }
}

} // namespace tessel::netcdf
