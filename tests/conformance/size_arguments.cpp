// tests/conformance/size_arguments.cpp: sizes, small numbers and lists of dimensions, as the
// library gets them.
//
// Each converter is seen through an operation that hands its result on; the library is not asked.
#include "support/classes.hpp"
#include "support/conformance.hpp"

#include <cmath>
#include <cstdint>
#include <limits>

namespace tessel::test {
namespace {

constexpr double infinity = std::numeric_limits<double>::infinity();
const double nan = std::nan("");
constexpr float singleInfinity = std::numeric_limits<float>::infinity();

// clang-format off

Row size(std::string title, Value value, const std::string &number) {
    return {std::move(title), On::nothing, {"def_dim", 5, "d", std::move(value)},
            fails("TESSEL:netcdf:defDim:invalidDimensionSize",
                  "Dimension definition operation failed, library error message \"NetCDF: Invalid dimension size\""),
            {}, {"nc_def_dim(5, \"d\", " + number + ", out)", "nc_strerror(-63)"}, answering("nc_def_dim", -63)};
}

Row refusedSize(std::string title, Value value, const std::string &identifier, const std::string &message) {
    return {std::move(title), On::nothing, {"def_dim", 5, "d", std::move(value)},
            refuses("TESSEL:netcdf:" + identifier, message)};
}

Rows sizes() {
    const auto negative = [](std::string title, Value value) {
        return refusedSize(std::move(title), std::move(value), "negativeSize", "dim_length argument must be positive");
    };
    const auto notFinite = [](std::string title, Value value) {
        return refusedSize(std::move(title), std::move(value), "sizeArgumentIsInfOrNaN", "dim_length argument must not be Inf or NaN");
    };
    const auto noSize = [](std::string title, Value value) {
        return refusedSize(std::move(title), std::move(value), "emptySetSizeParameter", "dim_length argument cannot be []");
    };
    return together({
        {
            size("a double",                             4,                     "4"),
            size("zero",                                 0,                     "0"),
            size("minus zero is zero",                   -0.0,                  "0"),
            size("a fraction is cut off",                3.9,                   "3"),
            size("less than one",                        0.9,                   "0"),
            size("2 to the 31st",                        2147483648.0,          "2147483648"),
            size("2 to the 32nd and 5",                  4294967301.0,          "4294967301"),
            size("2 to the 53rd",                        0x1p53,                "9007199254740992"),
            size("just below 2 to the 63rd",             0x1p63 - 1024,         "9223372036854774784"),
            size("2 to the 63rd",                        0x1p63,                "9223372036854775808"),
            size("just above 2 to the 63rd",             0x1p63 + 2048,         "9223372036854777856"),
            size("just below 2 to the 64th",             0x1p64 - 2048,         "18446744073709549568"),
            size("2 to the 64th",                        0x1p64,                "9223372036854775808"),
            size("a huge double",                        1e300,                 "9223372036854775808"),
            size("the first of several",                 doubles({4, -1}),      "4"),
            size("the real part",                        complexDouble(4),      "4"),
            size("a single",                             singles({3.9F}),       "3"),
            size("minus zero, a single",                 singles({-0.0F}),      "0"),
            size("2 to the 63rd, a single",              singles({0x1p63F}),    "9223372036854775808"),
            size("above 2 to the 63rd, a single",        singles({0x1.8p63F}),  "13835058055282163712"),
            size("a huge single",                        singles({3e38F}),      "9223372036854775808"),
            size("an int8",                              int8s({127}),          "127"),
            size("a uint8",                              uint8s({255}),         "255"),
            size("an int16",                             int16s({32767}),       "32767"),
            size("a uint16",                             uint16s({65535}),      "65535"),
            size("an int32",                             int32s({2147483647}),  "2147483647"),
            size("a uint32",                             uint32s({4294967295U}), "4294967295"),
            size("an int64",                             int64s({9223372036854775807}), "9223372036854775807"),
            size("a uint64",                             uint64s({18446744073709551615U}), "18446744073709551615"),
            size("zero, an int8",                        int8s({0}),            "0"),
            size("the first of several int16",           int16s({7, -7}),       "7"),

            negative("a negative double",                -1),
            negative("a small negative fraction",        -0.5),
            negative("the smallest negative double",     -5e-324),
            negative("a huge negative double",           -1e300),
            negative("a negative single",                singles({-1})),
            negative("a small negative single",          singles({-0.5F})),
            negative("a negative int8",                  int8s({-1})),
            negative("a negative int16",                 int16s({-1})),
            negative("a negative int32",                 int32s({-1})),
            negative("a negative int64",                 int64s({-1})),
            negative("the smallest int64",               int64s({std::numeric_limits<std::int64_t>::min()})),
            notFinite("infinity",                        infinity),
            notFinite("minus infinity is infinite before it is negative", -infinity),
            notFinite("not a number",                    nan),
            notFinite("a single infinity",               singles({singleInfinity})),
            notFinite("a single minus infinity",         singles({-singleInfinity})),
            notFinite("a single not a number",           singles({std::nanf("")})),
            size("only the first is looked at",          doubles({4, nan}),     "4"),
            noSize("an empty double",                    empty(tsDOUBLE)),
            noSize("an empty uint8",                     empty(tsUINT8)),
            noSize("an empty char, for it is empty before it is of a class", ""),
            noSize("an empty cell",                      empty(tsCELL)),

            {"a number of no class that is handled", On::nothing, {"def_dim", 5, "d", cell()},
             refuses("TESSEL:netcdf:unpackGenericSizeParameter:unhandledNumericType", "type of dim_length argument was not handled"),
             {}, {}, {.function = {}, .isNumeric = true}},
        },
        withOtherClasses({"a size of another class", On::nothing, {"def_dim", 5, "d", 1},
                          refuses("TESSEL:netcdf:badSizeArgumentDatatype", "dim_length argument must be either double precision or an unsigned integer datatype")},
                         {"double", "single", "int8", "uint8", "int16", "uint16", "int32", "uint32", "int64", "uint64"}),
    });
}

Row smallNumber(std::string title, Value value, const std::string &number) {
    return {std::move(title), On::nothing, {"set_default_format", std::move(value)},
            fails("TESSEL:netcdf:setDefaultFormat:invalidArgument",
                  "Unable to set the default formate, library error message \"NetCDF: Invalid argument\""),
            {}, {"nc_set_default_format(" + number + ", out)", "nc_strerror(-36)"}, answering("nc_set_default_format", -36)};
}

/// An int32 array is read as a double, eight bytes at a time.
Rows smallNumbers() {
    const std::string emptyID = "TESSEL:netcdf:unpackIntSingleton:argumentIsEmptySet";
    const std::string emptyText = "new_default_format argument cannot be []";
    return together({
        {
            smallNumber("a double",                              2,                        "2"),
            smallNumber("a negative double",                     -33,                      "-33"),
            smallNumber("a fraction is cut off",                 2.9,                      "2"),
            smallNumber("a negative fraction is cut off",        -33.9,                    "-33"),
            smallNumber("a small negative fraction",             -0.5,                     "0"),
            smallNumber("the largest int",                       2147483647.0,             "2147483647"),
            smallNumber("too large",                             2147483648.0,             "-2147483648"),
            smallNumber("too small",                             -3e9,                     "-2147483648"),
            smallNumber("infinity",                              infinity,                 "-2147483648"),
            smallNumber("not a number",                          nan,                      "-2147483648"),
            smallNumber("the first of several",                  doubles({1, 2}),          "1"),
            smallNumber("a lone int32 is half of a tiny double", int32s({-33}),            "0"),
            smallNumber("a lone int32 with the bits of a float", int32s({0x40080000}),     "0"),
            smallNumber("two int32 are a double",                int32s({0, 0x40080000}),  "3"),
            smallNumber("two int32 are a negative double",       int32s({0, -0x3FC00000}), "-32"),
            smallNumber("two int32 are not a number",            int32s({1, 0x7FF80000}),  "-2147483648"),
            smallNumber("of three int32 the first two",          int32s({0, 0x40080000, 1}), "3"),

            {"an empty double",           On::nothing, {"set_default_format", empty(tsDOUBLE)}, refuses(emptyID, emptyText)},
            {"an empty int32",            On::nothing, {"set_default_format", empty(tsINT32)},  refuses(emptyID, emptyText)},
            {"an empty char, for it is empty before it is of a class", On::nothing, {"set_default_format", ""}, refuses(emptyID, emptyText)},
        },
        withOtherClasses({"another class", On::nothing, {"set_default_format", 1},
                          refuses("TESSEL:netcdf:unpackIntSingleton:badNumericType", "argument must be either double precision or int32")},
                         {"double", "int32"}),
    });
}

Row dimensions(std::string title, Value value, const std::string &ids) {
    return {std::move(title), On::nothing, {"def_var", 5, "v", 6, std::move(value)},
            fails("TESSEL:netcdf:defVar:invalidDimensionIdOrName",
                  "Variable definition operation failed, library error message \"NetCDF: Invalid dimension ID or name\""),
            {}, {"nc_def_var(5, \"v\", 6, " + ids + ", out)", "nc_strerror(-46)"}, answering("nc_def_var", -46)};
}

std::string repeated(const std::string &text, int times) {
    std::string all;
    for (int i = 0; i < times; ++i) {
        all += (i == 0 ? "" : ", ") + text;
    }
    return all;
}

Rows dimensionLists() {
    const auto tooMany = refuses("TESSEL:netcdf:ndimsLargerThanNetcdfLimits", "Cannot specify more than 1024 dimensions.");
    return together({
        {
            dimensions("three ids are reversed",      doubles({0, 1, 2}),                "3, {2, 1, 0}"),
            dimensions("one id",                      7,                                 "1, {7}"),
            dimensions("a column",                    shaped({3, 1}, doubles({0, 1, 2})), "3, {2, 1, 0}"),
            dimensions("a square, column by column",  shaped({2, 2}, doubles({0, 1, 2, 3})), "4, {3, 2, 1, 0}"),
            dimensions("none",                        empty(tsDOUBLE),                   "0, {}"),
            dimensions("none in a row",               empty(tsDOUBLE, {1, 0}),           "0, {}"),
            dimensions("fractions are cut off",       doubles({1.9, -0.5}),              "2, {0, 1}"),
            dimensions("ids that are no ids",         doubles({nan, infinity, -1}),      "3, {-1, -2147483648, -2147483648}"),
            dimensions("the real parts",              complexDoubles({0, 1}),            "2, {1, 0}"),
            dimensions("as many as there may be",     wholes(tsDOUBLE, std::vector<int>(1024, 3)), "1024, {" + repeated("3", 1024) + "}"),

            {"one more than there may be", On::nothing, {"def_var", 5, "v", 6, wholes(tsDOUBLE, std::vector<int>(1025, 3))}, tooMany},
            {"one more than there may be, in a page", On::nothing,
             {"def_var", 5, "v", 6, shaped({25, 41}, wholes(tsDOUBLE, std::vector<int>(1025, 3)))}, tooMany},
            {"too many, and of another class", On::nothing, {"def_var", 5, "v", 6, wholes(tsINT32, std::vector<int>(1025, 3))},
             refuses("TESSEL:netcdf:unpackDimids:badDimidsType", "Dimids argument must be double precision.")},
            {"none, of another class", On::nothing, {"def_var", 5, "v", 6, empty(tsINT32)},
             refuses("TESSEL:netcdf:unpackDimids:badDimidsType", "Dimids argument must be double precision.")},
            {"none, of char", On::nothing, {"def_var", 5, "v", 6, ""},
             refuses("TESSEL:netcdf:unpackDimids:badDimidsType", "Dimids argument must be double precision.")},
        },
        withOtherClasses({"another class", On::nothing, {"def_var", 5, "v", 6, 1},
                          refuses("TESSEL:netcdf:unpackDimids:badDimidsType", "Dimids argument must be double precision.")},
                         {"double"}),
    });
}

// clang-format on

INSTANTIATE_TEST_SUITE_P(Sizes, Conformance, testing::ValuesIn(sizes()), titleOf);
INSTANTIATE_TEST_SUITE_P(SmallNumbers, Conformance, testing::ValuesIn(smallNumbers()), titleOf);
INSTANTIATE_TEST_SUITE_P(DimensionLists, Conformance, testing::ValuesIn(dimensionLists()), titleOf);

} // namespace
} // namespace tessel::test
