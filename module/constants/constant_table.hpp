// module/constants/constant_table.hpp: the library's named constants.
#pragma once

#include <array>
#include <string_view>

namespace tessel::netcdf {

/// One named constant.
struct ConstantEntry {
    double value;
    const char *longName;  ///< in upper case, with the library's prefix ("NC_BYTE")
    const char *shortName; ///< without it ("BYTE")
};

inline constexpr std::size_t constantCount = 69;

/// The constants, in the order of the list of names, which is also the order of the search.
extern const std::array<ConstantEntry, constantCount> constantTable;

} // namespace tessel::netcdf
