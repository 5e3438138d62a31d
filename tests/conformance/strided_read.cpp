// tests/conformance/strided_read.cpp: reading strided blocks.
#include "support/conformance.hpp"
#include "support/members.hpp"

namespace tessel::test {
namespace {

std::string failed(const std::string &why) {
    return libraryFailed("Strided data retrieval failed", why);
}

// What is wrong with the stride is told in the words for the count.
constexpr const char *startText =
    "The length of the start index does not match up with the number of variable dimensions.";
constexpr const char *countText =
    "The length of the count index does not match up with the number of variable dimensions.";
const Outcome startLength = fails("TESSEL:netcdf:getVars:startVectorLengthMismatch", startText);
const Outcome countLength = fails("TESSEL:netcdf:getVars:countVectorLengthMismatch", countText);
const Outcome strideLength = fails("TESSEL:netcdf:getVars:strideVectorLengthMismatch", countText);

// clang-format off
Rows rows() {
    return {
        {"every fourth and every second", On::sample, {"get_vars_double", ncid, varid("grid"), doubles({0, 1}), doubles({5, 3}), doubles({4, 2})},
         gives({shaped({5, 3}, doubles({100, 104, 108, 112, 116, 300, 304, 308, 312, 316, 500, 504, 508, 512, 516}))}), {},
         {"nc_inq_varndims(ncid, 6, out)", "nc_inq_vardimid(ncid, 6, out)", "tsCreateUninitNumericArray({5, 3}, double)",
          "nc_get_vars_double(ncid, 6, {1, 0}, {3, 5}, {2, 4}, result)"}},
        {"of three dimensions", On::sample, {"nc_get_vars_float", ncid, varid("temp"), doubles({1, 0, 0}), doubles({2, 2, 2}), doubles({2, 2, 1})},
         gives({shaped({2, 2, 2}, singles({1, 3, 201, 203, 10001, 10003, 10201, 10203}))})},
        {"of one dimension, a column", On::sample, {"get_vars_short", ncid, varid("level"), 0, 3, 2}, gives({shaped({3, 1}, int16s({0, 2, 4}))})},
        {"each one", On::sample, {"get_vars_short", ncid, varid("level"), 1, 3, 1}, gives({shaped({3, 1}, int16s({1, 2, 3}))})},
        {"a large stride for one element", On::sample, {"get_vars_short", ncid, varid("level"), 4, 1, 100}, gives({int16s({4})})},
        {"text, its bytes widened with their signs", On::sample, {"get_vars_text", ncid, varid("name"), doubles({1, 1}), doubles({4, 2}), doubles({2, 1})},
         gives({shaped({4, 2}, codes({'a', 0xFFE9, 0xFFFF, 0, 'h', 'r', ' ', 'e'}))}), {},
         {"nc_inq_varndims(ncid, 3, out)", "nc_inq_vardimid(ncid, 3, out)", "tsCreateCharArray({4, 2})", "tsCalloc(9, 2)",
          "nc_get_vars_text(ncid, 3, {1, 1}, {2, 4}, {1, 2}, block)", "tsFree(block)"}},
        {"nothing, for which the library is asked all the same", On::sample, {"get_vars_int", ncid, varid("count"), doubles({0, 0}), doubles({0, 2}), doubles({1, 1})},
         gives({empty(tsINT32, {0, 2})}), {},
         {"nc_inq_varndims(ncid, 5, out)", "nc_inq_vardimid(ncid, 5, out)", "tsCreateUninitNumericArray({0, 2}, int32)",
          "nc_get_vars_int(ncid, 5, {0, 0}, {2, 0}, {1, 1}, result)"}},
        {"no text", On::sample, {"nc_get_vars_text", ncid, varid("label"), 0, 0, 1}, gives({empty(tsCHAR, {0, 1})}), {},
         {"nc_inq_varndims(ncid, 8, out)", "nc_inq_vardimid(ncid, 8, out)", "tsCreateCharArray({0, 1})", "tsCalloc(1, 2)",
          "nc_get_vars_text(ncid, 8, {0}, {0}, {1}, block)", "tsFree(block)"}},

        {"a stride of zero", On::sample, {"get_vars_short", ncid, varid("level"), 0, 2, 0},
         fails("TESSEL:netcdf:getVars:illegalStride", failed("NetCDF: Illegal stride")), {},
         {"nc_inq_varndims(ncid, 4, out)", "nc_inq_vardimid(ncid, 4, out)", "tsCreateUninitNumericArray({2, 1}, int16)",
          "nc_get_vars_short(ncid, 4, {0}, {2}, {0}, array)", "nc_strerror(-58)"}},
        {"a negative stride", On::sample, {"get_vars_short", ncid, varid("level"), 1, 2, int8s({-1})},
         fails("TESSEL:netcdf:getVars:illegalStride", failed("NetCDF: Illegal stride")), {},
         {"nc_inq_varndims(ncid, 4, out)", "nc_inq_vardimid(ncid, 4, out)", "tsCreateUninitNumericArray({2, 1}, int16)",
          "nc_get_vars_short(ncid, 4, {1}, {2}, {-1}, array)", "nc_strerror(-58)"}},
        {"beyond the end", On::sample, {"get_vars_short", ncid, varid("level"), 0, 3, 3},
         fails("TESSEL:netcdf:getVars:indexExceedsDimensionBound", failed("NetCDF: Index exceeds dimension bound"))},
        {"more than there are", On::sample, {"get_vars_short", ncid, varid("level"), 2, 4, 1},
         fails("TESSEL:netcdf:getVars:startPlusCountExceedsDimensionBound", failed("NetCDF: Start+count exceeds dimension bound"))},
        {"from beyond the end", On::sample, {"get_vars_short", ncid, varid("level"), 6, 1, 1},
         fails("TESSEL:netcdf:getVars:indexExceedsDimensionBound", failed("NetCDF: Index exceeds dimension bound"))},
        {"numbers that do not fit", On::sample, {"get_vars_int", ncid, varid("extremes"), 0, 2, 2},
         fails("TESSEL:netcdf:getVars:mathResultNotRepresentable", failed("NetCDF: Numeric conversion not representable"))},
        {"numbers are no text, and all is given back before that is told", On::sample, {"get_vars_text", ncid, varid("level"), 0, 2, 2},
         fails("TESSEL:netcdf:getVars:attemptToConvertBetweenTextAndNumbers", failed("NetCDF: Attempt to convert between text & numbers")), {},
         {"nc_inq_varndims(ncid, 4, out)", "nc_inq_vardimid(ncid, 4, out)", "tsCreateCharArray({2, 1})", "tsCalloc(3, 2)",
          "nc_get_vars_text(ncid, 4, {0}, {2}, {2}, block)", "tsFree(block)", "nc_strerror(-56)"}},
        {"more than there can be memory for", On::sample, {"get_vars_double", ncid, varid("grid"), doubles({0, 0}), doubles({0x1p40, 0x1p40}), doubles({1, 1})},
         fails("TESSEL:host:dimensionsTooLarge", "The dimensions of the array are too large."), {},
         {"nc_inq_varndims(ncid, 6, out)", "nc_inq_vardimid(ncid, 6, out)"}},

        {"too short a start", On::sample, {"get_vars_double", ncid, varid("grid"), 0, doubles({1, 1}), doubles({1, 1})}, startLength, {}, {"nc_inq_varndims(ncid, 6, out)"}},
        {"too long a count", On::sample, {"get_vars_double", ncid, varid("grid"), doubles({0, 0}), doubles({1, 1, 1}), doubles({1, 1})}, countLength, {}, {"nc_inq_varndims(ncid, 6, out)"}},
        {"too short a stride", On::sample, {"get_vars_double", ncid, varid("grid"), doubles({0, 0}), doubles({1, 1}), 1}, strideLength, {}, {"nc_inq_varndims(ncid, 6, out)"}},
        {"too long a stride", On::sample, {"get_vars_text", ncid, varid("label"), 0, 1, doubles({1, 1})}, strideLength},
        {"start and count both wrong", On::sample, {"get_vars_double", ncid, varid("grid"), 0, 1, doubles({1, 1})}, startLength},
        {"start and stride both wrong", On::sample, {"get_vars_double", ncid, varid("grid"), 0, doubles({1, 1}), 1}, startLength},
        {"count and stride both wrong", On::sample, {"get_vars_double", ncid, varid("grid"), doubles({0, 0}), 1, 1}, countLength},
        {"a variable without dimensions has no blocks", On::sample, {"get_vars_double", ncid, varid("height"), 0, 1, 1}, startLength},
        {"not even empty ones", On::sample, {"get_vars_double", ncid, varid("height"), empty(tsDOUBLE), empty(tsDOUBLE), empty(tsDOUBLE)},
         refuses("TESSEL:netcdf:startArgumentIsEmpty", "start argument cannot be empty.")},
        {"a variable that there is not, whatever the vectors are", On::sample, {"get_vars_double", ncid, 99, doubles({0, 0, 0, 0}), 1, 1},
         fails("TESSEL:netcdf:getVars:numVarsInquiryFailure",
               "Retrieval of number of variable dimensions failed, library error message \"NetCDF: Variable not found\""), {},
         {"nc_inq_varndims(ncid, 99, out)", "nc_strerror(-49)"}},
        {"a dataset that there is not", On::nothing, {"get_vars_text", 5, 0, 0, 1, 1},
         fails("TESSEL:netcdf:getVars:numVarsInquiryFailure",
               "Retrieval of number of variable dimensions failed, library error message \"NetCDF: Not a valid ID\"")},
        {"in define mode", On::sampleDefine, {"get_vars_double", ncid, varid("grid"), doubles({0, 0}), doubles({1, 1}), doubles({1, 1})},
         fails("TESSEL:netcdf:getVars:operationNotAllowedInDefineMode", failed("NetCDF: Operation not allowed in define mode"))},
    };
}

/// Each numeric member, straight into the result.
Rows eachMember() {
    Rows list;
    for (const Member &member : numericMembers()) {
        const std::string operation = "get_vars_" + member.suffix;
        list.insert(list.end(), {
            {operation + " of numbers", On::sample, {operation.c_str(), ncid, varid("count"), doubles({1, 0}), doubles({2, 2}), doubles({3, 1})},
             gives({shaped({2, 2}, wholes(member.hostClass, {1, 4, 101, 104}))}), {},
             {"nc_inq_varndims(ncid, 5, out)", "nc_inq_vardimid(ncid, 5, out)", "tsCreateUninitNumericArray({2, 2}, " + member.className + ")",
              "nc_" + operation + "(ncid, 5, {0, 1}, {2, 2}, {1, 3}, result)"}},
            {operation + " of text", On::sample, {("nc_" + operation).c_str(), ncid, varid("label"), 0, 5, 1},
             fails("TESSEL:netcdf:getVars:attemptToConvertBetweenTextAndNumbers", failed("NetCDF: Attempt to convert between text & numbers"))},
        });
    }
    return list;
}
// clang-format on

INSTANTIATE_TEST_SUITE_P(StridedRead, Conformance, testing::ValuesIn(rows()), titleOf);
INSTANTIATE_TEST_SUITE_P(StridedReadMembers, Conformance, testing::ValuesIn(eachMember()), titleOf);

} // namespace
} // namespace tessel::test
