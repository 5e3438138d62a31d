// module/convert/pack.cpp: library results into new host arrays.
#include "convert/pack.hpp"

#include "call/catalogue.hpp"
#include "convert/number.hpp"

#include <algorithm>
#include <array>

namespace tessel::netcdf {
namespace {

template <class T>
tsArray *packRow(std::size_t rows, const T *values, std::size_t count) {
    const std::array dims = {rows, count};
    tsArray *row = tsCreateUninitNumericArray(dims.size(), dims.data(), tsDOUBLE);
    std::copy_n(values, count, static_cast<double *>(tsGetData(row)));
    return row;
}

} // namespace

tsArray *packIntScalar(int value) {
    return tsCreateDoubleScalar(value);
}

tsArray *packUintScalar(unsigned value) {
    return packRow(1, &value, 1);
}

tsArray *packUpSizetScalar(std::size_t value) {
    const auto number = checkedCast<double>(value);
    if (!number) {
        raise(catalogue::sizeNotRepresentable, static_cast<unsigned>(value));
    }
    return tsCreateDoubleScalar(*number);
}

tsArray *packIntVector(const int *values, std::size_t count) {
    return packRow(1, values, count);
}

tsArray *packDimidVector(std::span<const int> values) {
    return packRow(values.empty() ? 0 : 1, values.data(), values.size());
}

} // namespace tessel::netcdf
