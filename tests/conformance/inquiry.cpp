// tests/conformance/inquiry.cpp: what is in a dataset, and which library this is.
#include "support/conformance.hpp"

#include <cmath>

namespace tessel::test {
namespace {

/// The text for a status that there is not: a library that is built with PnetCDF has the number in
/// it. Debian's headers do not say whether it is; the name that pkg-config knows it by does.
constexpr const char *ofNoStatus(const char *text, const char *withPnetcdf) {
    return TESSEL_PNETCDF ? withPnetcdf : text;
}

// clang-format off
Rows rows() {
    return {
        {"the counts of a dataset", On::sample, {"inq", ncid}, gives({6, 12, 2, 0}), {},
         {"nc_inq(ncid, out, out, out, out)", "tsCreateUninitNumericArray({1, 1}, double)", "tsCreateUninitNumericArray({1, 1}, double)",
          "tsCreateUninitNumericArray({1, 1}, double)", "tsCreateDoubleScalar(0)"}},
        {"a dataset without anything", On::newDataset, {"nc_inq", ncid}, gives({0, 0, 0, -1}), {},
         {"nc_inq(ncid, out, out, out, out)", "tsCreateUninitNumericArray({1, 1}, double)", "tsCreateUninitNumericArray({1, 1}, double)",
          "tsCreateUninitNumericArray({1, 1}, double)", "tsCreateDoubleScalar(-1)"}},
        {"a dataset without an unlimited dimension", On::twoDatasets, {"inq", other}, gives({1, 1, 0, -1})},
        {"no dataset", On::nothing, {"inq", -1},
         fails("TESSEL:netcdf:inq:notNetcdfID", R"(File inquiry failed, library error message "NetCDF: Not a valid ID")")},

        {"the version", On::nothing, {"inq_libvers"}, gives({libraryVersion})},
        {"the version by its long name", On::nothing, {"nc_inq_libvers"}, gives({libraryVersion})},

        {"the text of a status", On::nothing, {"strerror", -33}, gives({"NetCDF: Not a valid ID"}), {},
         {"nc_strerror(-33)", R"(tsCreateString("NetCDF: Not a valid ID"))"}},
        {"the text of a system error", On::nothing, {"nc_strerror", 2}, gives({"No such file or directory"})},
        {"the text of success", On::nothing, {"strerror", 0}, gives({"No error"})},
        {"the text of a status that there is not", On::nothing, {"strerror", -20},
         gives({ofNoStatus("Unknown Error", "Unknown Error: Unrecognized error code   -20\n")})},
        {"a fraction is cut off", On::nothing, {"strerror", -33.9}, gives({"NetCDF: Not a valid ID"})},
        {"not a number", On::nothing, {"strerror", std::nan("")},
         gives({ofNoStatus("Unknown Error", "Unknown Error: Unrecognized error code -2147483648\n")}), {},
         {"nc_strerror(-2147483648)", ofNoStatus(R"(tsCreateString("Unknown Error"))",
                                                 R"(tsCreateString("Unknown Error: Unrecognized error code -2147483648\x0A"))")}},
        {"an int32 is read as a double", On::nothing, {"strerror", int32s({-33})}, gives({"No error"}), {},
         {"nc_strerror(0)", R"(tsCreateString("No error"))"}},
        {"two int32 are a double", On::nothing, {"strerror", int32s({0, 0x40000000})}, gives({"No such file or directory"})},
    };
}
// clang-format on

INSTANTIATE_TEST_SUITE_P(Inquiry, Conformance, testing::ValuesIn(rows()), titleOf);

} // namespace
} // namespace tessel::test
