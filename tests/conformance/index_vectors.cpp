// tests/conformance/index_vectors.cpp: start, count, index and stride, as the library gets them.
//
// Positions are seen through an element that is not read and strides through a block that is not
// read: the library is not asked.
#include "support/conformance.hpp"

#include <cmath>
#include <limits>

namespace tessel::test {
namespace {

constexpr double infinity = std::numeric_limits<double>::infinity();
const double nan = std::nan("");

Row index(std::string title, Value value, const std::string &expected) {
    return {std::move(title),
            On::sample,
            {"get_var1_double", ncid, varid("extremes"), std::move(value)},
            fails("TESSEL:netcdf:getVar1:indexExceedsDimensionBound",
                  libraryFailed("Single datum retrieval failed",
                                "NetCDF: Index exceeds dimension bound")),
            {},
            {"nc_inq_varndims(ncid, 10, out)", "tsCreateUninitNumericArray({1}, double)",
             "nc_get_var1_double(ncid, 10, {" + expected + "}, array)", "nc_strerror(-40)"},
            answering("nc_get_var1_double", -40)};
}

Row stride(std::string title, Value value, const std::string &expected) {
    return {std::move(title),
            On::sample,
            {"get_vars_double", ncid, varid("extremes"), 0, 1, std::move(value)},
            fails("TESSEL:netcdf:getVars:illegalStride",
                  libraryFailed("Strided data retrieval failed", "NetCDF: Illegal stride")),
            {},
            {"nc_inq_varndims(ncid, 10, out)", "nc_inq_vardimid(ncid, 10, out)",
             "tsCreateUninitNumericArray({1, 1}, double)",
             "nc_get_vars_double(ncid, 10, {0}, {1}, {" + expected + "}, array)",
             "nc_strerror(-58)"},
            answering("nc_get_vars_double", -58)};
}

// clang-format off
Rows positions() {
    return {
        index("a double",                           3,                                "3"),
        index("zero",                               0,                                "0"),
        index("minus zero",                         -0.0,                             "0"),
        index("a fraction is cut off",              2.7,                              "2"),
        index("a small negative fraction",          -0.9,                             "0"),
        index("minus one wraps around",             -1,                               "18446744073709551615"),
        index("a negative fraction is cut off",     -1.5,                             "18446744073709551615"),
        index("2 to the 31st",                      2147483648.0,                     "2147483648"),
        index("2 to the 40th",                      0x1p40,                           "1099511627776"),
        index("just below 2 to the 63rd",           0x1p63 - 1024,                    "9223372036854774784"),
        index("2 to the 63rd",                      0x1p63,                           "9223372036854775808"),
        index("just above 2 to the 63rd",           0x1p63 + 2048,                    "9223372036854777856"),
        index("just below 2 to the 64th",           0x1p64 - 2048,                    "18446744073709549568"),
        index("2 to the 64th",                      0x1p64,                           "9223372036854775808"),
        index("a huge double",                      1e300,                            "9223372036854775808"),
        index("minus 2 to the 63rd",                -0x1p63,                          "9223372036854775808"),
        index("a huge negative double",             -1e300,                           "9223372036854775808"),
        index("the real part",                      complexDouble(3),                 "3"),
        index("a single",                           singles({2.7F}),                  "2"),
        index("a negative single",                  singles({-1.5F}),                 "18446744073709551615"),
        index("2 to the 63rd, a single",            singles({0x1p63F}),               "9223372036854775808"),
        index("above 2 to the 63rd, a single",      singles({0x1.8p63F}),             "13835058055282163712"),
        index("a single is not asked for infinity", singles({HUGE_VALF}),             "9223372036854775808"),
        index("nor for minus infinity",             singles({-HUGE_VALF}),            "9223372036854775808"),
        index("nor for not a number",               singles({std::nanf("")}),         "9223372036854775808"),
        index("an int8",                            int8s({127}),                     "127"),
        index("a negative int8",                    int8s({-1}),                      "18446744073709551615"),
        index("a uint8",                            uint8s({255}),                    "255"),
        index("an int16",                           int16s({-2}),                     "18446744073709551614"),
        index("a uint16",                           uint16s({65535}),                 "65535"),
        index("an int32",                           int32s({-3}),                     "18446744073709551613"),
        index("a uint32",                           uint32s({4294967295U}),           "4294967295"),
        index("an int64",                           int64s({-4}),                     "18446744073709551612"),
        index("the largest int64",                  int64s({9223372036854775807}),    "9223372036854775807"),
        index("a uint64",                           uint64s({18446744073709551615U}), "18446744073709551615"),
    };
}

Rows strides() {
    return {
        stride("a double",                           3,                                "3"),
        stride("a fraction is cut off",              2.7,                              "2"),
        stride("a small negative fraction",          -0.9,                             "0"),
        stride("minus one stays",                    -1,                               "-1"),
        stride("a negative fraction is cut off",     -1.5,                             "-1"),
        stride("2 to the 40th",                      0x1p40,                           "1099511627776"),
        stride("just below 2 to the 63rd",           0x1p63 - 1024,                    "9223372036854774784"),
        stride("2 to the 63rd",                      0x1p63,                           "-9223372036854775808"),
        stride("a huge double",                      1e300,                            "-9223372036854775808"),
        stride("minus 2 to the 63rd",                -0x1p63,                          "-9223372036854775808"),
        stride("a huge negative double",             -1e300,                           "-9223372036854775808"),
        stride("the real part",                      complexDouble(3),                 "3"),
        stride("a single",                           singles({-2.7F}),                 "-2"),
        stride("2 to the 63rd, a single",            singles({0x1p63F}),               "-9223372036854775808"),
        stride("a single is not asked for infinity", singles({HUGE_VALF}),             "-9223372036854775808"),
        stride("nor for not a number",               singles({std::nanf("")}),         "-9223372036854775808"),
        stride("a negative int8",                    int8s({-1}),                      "-1"),
        stride("a uint8",                            uint8s({255}),                    "255"),
        stride("an int16",                           int16s({-2}),                     "-2"),
        stride("a uint16",                           uint16s({65535}),                 "65535"),
        stride("an int32",                           int32s({-3}),                     "-3"),
        stride("a uint32",                           uint32s({4294967295U}),           "4294967295"),
        stride("an int64",                           int64s({-4}),                     "-4"),
        stride("a uint64",                           uint64s({18446744073709551615U}), "-1"),
    };
}

/// The order is turned around, whatever the shape; each vector of a call is its own.
Rows orders() {
    const auto block = [](std::string title, const Value &start, const Value &count, const Value &step, const std::string &vectors) {
        return Row{std::move(title), On::sample, {"get_vars_schar", ncid, varid("temp"), start, count, step},
                   fails("TESSEL:netcdf:getVars:invalidArgument", R"(Strided data retrieval failed, library error message "NetCDF: Invalid argument")"), {},
                   {"nc_inq_varndims(ncid, 1, out)", "nc_inq_vardimid(ncid, 1, out)", "tsCreateUninitNumericArray({4, 5, 6}, int8)",
                    "nc_get_vars_schar(ncid, 1, " + vectors + ", array)", "nc_strerror(-36)"},
                   answering("nc_get_vars_schar", -36)};
    };
    const std::string vectors = "{3, 2, 1}, {6, 5, 4}, {9, 8, 7}";
    const Value start = doubles({1, 2, 3});
    const Value count = doubles({4, 5, 6});
    const Value step = doubles({7, 8, 9});
    return {
        block("rows",               start, count, step, vectors),
        block("columns",            shaped({3, 1}, start), shaped({3, 1}, count), shaped({3, 1}, step), vectors),
        block("pages",              shaped({1, 1, 3}, start), shaped({1, 1, 3}, count), shaped({1, 1, 3}, step), vectors),
        block("int8",               int8s({1, 2, 3}), int8s({4, 5, 6}), int8s({7, 8, 9}), vectors),
        block("uint8",              uint8s({1, 2, 3}), uint8s({4, 5, 6}), uint8s({7, 8, 9}), vectors),
        block("int16",              int16s({1, 2, 3}), int16s({4, 5, 6}), int16s({7, 8, 9}), vectors),
        block("uint16",             uint16s({1, 2, 3}), uint16s({4, 5, 6}), uint16s({7, 8, 9}), vectors),
        block("int32",              int32s({1, 2, 3}), int32s({4, 5, 6}), int32s({7, 8, 9}), vectors),
        block("uint32",             uint32s({1, 2, 3}), uint32s({4, 5, 6}), uint32s({7, 8, 9}), vectors),
        block("int64",              int64s({1, 2, 3}), int64s({4, 5, 6}), int64s({7, 8, 9}), vectors),
        block("uint64",             uint64s({1, 2, 3}), uint64s({4, 5, 6}), uint64s({7, 8, 9}), vectors),
        block("single",             singles({1, 2, 3}), singles({4, 5, 6}), singles({7, 8, 9}), vectors),
        block("a class for each",   int8s({1, 2, 3}), uint64s({4, 5, 6}), singles({7, 8, 9}), vectors),
    };
}

Rows refusals() {
    const auto infinite = refuses("TESSEL:netcdf:indexArgumentHasInf", "Index parameter cannot contain Inf.");
    const auto notANumber = refuses("TESSEL:netcdf:indexArgumentHasNaN", "Index parameter cannot contain NaN.");
    return {
        {"an infinite index",            On::sample, {"get_var1_double", ncid, 10, infinity},                 infinite},
        {"a minus infinite index",       On::sample, {"get_var1_double", ncid, 10, -infinity},                infinite},
        {"an index that is no number",   On::sample, {"get_var1_double", ncid, 10, nan},                      notANumber},
        {"infinity first",               On::sample, {"get_var1_double", ncid, 10, doubles({0, infinity, nan})}, infinite},
        {"not a number first",           On::sample, {"get_var1_double", ncid, 10, doubles({0, nan, infinity})}, notANumber},
        {"the last of many",             On::sample, {"get_var1_double", ncid, 10, doubles({0, 1, 2, 3, nan})},  notANumber},
        {"an infinite start",            On::sample, {"get_vara_int", ncid, 10, infinity, 1},                 infinite},
        {"an infinite count",            On::sample, {"get_vara_int", ncid, 10, 0, infinity},                 infinite},
        {"a count that is no number",    On::sample, {"put_vara_int", ncid, 10, 0, nan, int32s({1})},         notANumber},
        {"an infinite stride",           On::sample, {"get_vars_int", ncid, 10, 0, 1, infinity},              infinite},
        {"a stride that is no number",   On::sample, {"put_vars_int", ncid, 10, 0, 1, nan, int32s({1})},      notANumber},
        {"a stride with infinity first", On::sample, {"get_vars_int", ncid, 10, 0, 1, doubles({-infinity, nan})}, infinite},

        {"a logical count",       On::sample, {"get_vara_int", ncid, 10, 0, logicals({true})},
         refuses("TESSEL:netcdf:countArgumentHasBadDatatype", "count argument must consist of discrete values between 0 and 2^31-1.")},
        {"a count of text",       On::sample, {"get_vara_int", ncid, 10, 0, "12"},
         refuses("TESSEL:netcdf:countArgumentHasBadDatatype", "count argument must consist of discrete values between 0 and 2^31-1.")},
        {"a start of text",       On::sample, {"get_vara_int", ncid, 10, "12", 1},
         refuses("TESSEL:netcdf:startArgumentHasBadDatatype", "start argument must consist of discrete values between 0 and 2^31-1.")},
        {"a stride in a structure", On::sample, {"get_vars_int", ncid, 10, 0, 1, structure()},
         refuses("TESSEL:netcdf:strideArgumentHasBadDatatype", "stride argument must consist of discrete values between 0 and 2^31-1.")},
        {"a logical stride",      On::sample, {"get_vars_int", ncid, 10, 0, 1, logicals({true})},
         refuses("TESSEL:netcdf:strideArgumentHasBadDatatype", "stride argument must consist of discrete values between 0 and 2^31-1.")},
        {"a function for an index", On::sample, {"get_var1_int", ncid, 10, function()},
         refuses("TESSEL:netcdf:startArgumentHasBadDatatype", "start argument must consist of discrete values between 0 and 2^31-1.")},
        {"an index of no known class", On::sample, {"get_var1_int", ncid, 10, unknown()},
         refuses("TESSEL:netcdf:startArgumentHasBadDatatype", "start argument must consist of discrete values between 0 and 2^31-1.")},

        {"an empty start of text, for it is empty before it is of a class", On::sample, {"get_vara_int", ncid, 10, "", 1},
         refuses("TESSEL:netcdf:startArgumentIsEmpty", "start argument cannot be empty.")},
        {"an empty count in a cell",     On::sample, {"get_vara_int", ncid, 10, 0, empty(tsCELL)},
         refuses("TESSEL:netcdf:countArgumentIsEmpty", "count argument cannot be empty.")},
        {"an empty stride",              On::sample, {"get_vars_int", ncid, 10, 0, 1, empty(tsINT8, {3, 0})},
         refuses("TESSEL:netcdf:strideArgumentIsEmpty", "stride argument cannot be empty.")},
    };
}
// clang-format on

INSTANTIATE_TEST_SUITE_P(Positions, Conformance, testing::ValuesIn(positions()), titleOf);
INSTANTIATE_TEST_SUITE_P(Strides, Conformance, testing::ValuesIn(strides()), titleOf);
INSTANTIATE_TEST_SUITE_P(VectorOrders, Conformance, testing::ValuesIn(orders()), titleOf);
INSTANTIATE_TEST_SUITE_P(VectorRefusals, Conformance, testing::ValuesIn(refusals()), titleOf);

} // namespace
} // namespace tessel::test
