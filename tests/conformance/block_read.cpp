// tests/conformance/block_read.cpp: reading single elements and contiguous blocks.
#include "support/conformance.hpp"
#include "support/members.hpp"

namespace tessel::test {
namespace {

std::string elementFailed(const std::string &why) {
    return libraryFailed("Single datum retrieval failed", why);
}
std::string blockFailed(const std::string &why) {
    return libraryFailed("Contiguous data retrieval failed", why);
}

const Outcome indexLength = fails(
    "TESSEL:netcdf:getVar1:indexVectorLengthMismatch",
    "The length of the start index does not match up with the number of variable dimensions.");
const Outcome startLength = fails(
    "TESSEL:netcdf:getVara:startVectorLengthMismatch",
    "The length of the start index does not match up with the number of variable dimensions.");
const Outcome countLength = fails(
    "TESSEL:netcdf:getVara:countVectorLengthMismatch",
    "The length of the count index does not match up with the number of variable dimensions.");

// clang-format off
Rows elements() {
    return {
        {"one of a row", On::sample, {"get_var1_short", ncid, varid("level"), 3}, gives({int16s({3})}), {},
         {"nc_inq_varndims(ncid, 4, out)", "tsCreateUninitNumericArray({1}, int16)", "nc_get_var1_short(ncid, 4, {3}, result)"}},
        {"the fastest position comes first", On::sample, {"get_var1_int", ncid, varid("count"), doubles({2, 0})}, gives({int32s({2})}), {},
         {"nc_inq_varndims(ncid, 5, out)", "tsCreateUninitNumericArray({1}, int32)", "nc_get_var1_int(ncid, 5, {0, 2}, result)"}},
        {"of three dimensions", On::sample, {"nc_get_var1_float", ncid, varid("temp"), int8s({3, 2, 1})}, gives({singles({10203})})},
        {"a character", On::sample, {"get_var1_text", ncid, varid("name"), doubles({2, 1})}, gives({"f"}), {},
         {"nc_inq_varndims(ncid, 3, out)", "tsCalloc(1, 2)", "nc_get_var1_text(ncid, 3, {1, 2}, block)", "tsCreateString(\"f\")", "tsFree(block)"}},
        {"the character NUL gives no text", On::sample, {"get_var1_text", ncid, varid("label"), 1}, gives({""}), {},
         {"nc_inq_varndims(ncid, 8, out)", "tsCalloc(1, 2)", "nc_get_var1_text(ncid, 8, {1}, block)", "tsCreateString(\"\")", "tsFree(block)"}},
        {"a byte that is no ASCII is a character of its code", On::sample, {"nc_get_var1_text", ncid, varid("label"), 2}, gives({codes({0xE9})}), {},
         {"nc_inq_varndims(ncid, 8, out)", "tsCalloc(1, 2)", "nc_get_var1_text(ncid, 8, {2}, block)", R"(tsCreateString("\xE9"))", "tsFree(block)"}},
        {"beyond the end", On::sample, {"get_var1_double", ncid, varid("level"), 5},
         fails("TESSEL:netcdf:getVar1:indexExceedsDimensionBound", elementFailed("NetCDF: Index exceeds dimension bound")), {},
         {"nc_inq_varndims(ncid, 4, out)", "tsCreateUninitNumericArray({1}, double)", "nc_get_var1_double(ncid, 4, {5}, array)", "nc_strerror(-40)"}},
        {"before the beginning", On::sample, {"get_var1_double", ncid, varid("level"), -1},
         fails("TESSEL:netcdf:getVar1:indexExceedsDimensionBound", elementFailed("NetCDF: Index exceeds dimension bound"))},
        {"a record that is not there", On::sample, {"get_var1_double", ncid, varid("time"), 2},
         fails("TESSEL:netcdf:getVar1:startPlusCountExceedsDimensionBound", elementFailed("NetCDF: Start+count exceeds dimension bound"))},
        {"a number that does not fit", On::sample, {"get_var1_float", ncid, varid("extremes"), 2},
         fails("TESSEL:netcdf:getVar1:mathResultNotRepresentable", elementFailed("NetCDF: Numeric conversion not representable"))},
        {"a number is no character, and all is given back before that is told", On::sample, {"get_var1_text", ncid, varid("level"), 0},
         fails("TESSEL:netcdf:getVar1:attemptToConvertBetweenTextAndNumbers", elementFailed("NetCDF: Attempt to convert between text & numbers")), {},
         {"nc_inq_varndims(ncid, 4, out)", "tsCalloc(1, 2)", "nc_get_var1_text(ncid, 4, {0}, block)", "tsCreateString(\"\")", "tsFree(block)", "nc_strerror(-56)"}},
        {"too short an index", On::sample, {"get_var1_double", ncid, varid("temp"), doubles({0, 0})}, indexLength, {}, {"nc_inq_varndims(ncid, 1, out)"}},
        {"too long an index", On::sample, {"get_var1_text", ncid, varid("label"), doubles({0, 0})}, indexLength, {}, {"nc_inq_varndims(ncid, 8, out)"}},
        {"a variable without dimensions has no index", On::sample, {"get_var1_double", ncid, varid("height"), 0}, indexLength},
        {"not even an empty one", On::sample, {"get_var1_double", ncid, varid("height"), empty(tsDOUBLE)},
         refuses("TESSEL:netcdf:startArgumentIsEmpty", "start argument cannot be empty.")},
        {"a variable that there is not", On::sample, {"get_var1_double", ncid, 99, 0},
         fails("TESSEL:netcdf:getVar1:variableNotFound",
               "Unable to retrieve number of variable's dimensions, library error message \"NetCDF: Variable not found\""), {},
         {"nc_inq_varndims(ncid, 99, out)", "nc_strerror(-49)"}},
    };
}

Rows blocks() {
    return {
        {"a block of three dimensions", On::sample, {"get_vara_float", ncid, varid("temp"), doubles({1, 0, 1}), doubles({2, 3, 1})},
         gives({shaped({2, 3, 1}, singles({10001, 10002, 10101, 10102, 10201, 10202}))}), {},
         {"nc_inq_varndims(ncid, 1, out)", "tsCreateUninitNumericArray({2, 3, 1}, single)", "nc_get_vara_float(ncid, 1, {1, 0, 1}, {1, 3, 2}, result)"}},
        {"a block of two dimensions", On::sample, {"nc_get_vara_int", ncid, varid("count"), doubles({3, 1}), int32s({2, 2})},
         gives({shaped({2, 2}, int32s({103, 104, 203, 204}))}), {},
         {"nc_inq_varndims(ncid, 5, out)", "tsCreateUninitNumericArray({2, 2}, int32)", "nc_get_vara_int(ncid, 5, {1, 3}, {2, 2}, result)"}},
        {"of one dimension, a column", On::sample, {"get_vara_double", ncid, varid("level"), 1, 4}, gives({shaped({4, 1}, doubles({1, 2, 3, 4}))})},
        {"counts in a column", On::sample, {"get_vara_double", ncid, varid("grid"), shaped({2, 1}, doubles({18, 9})), shaped({2, 1}, doubles({2, 1}))},
         gives({shaped({2, 1}, doubles({918, 919}))})},
        {"a fraction of a count is cut off", On::sample, {"get_vara_double", ncid, varid("level"), 1.9, 2.9}, gives({shaped({2, 1}, doubles({1, 2}))})},
        {"nothing, for which the library is asked all the same", On::sample, {"get_vara_double", ncid, varid("level"), 0, 0}, gives({empty(tsDOUBLE, {0, 1})}), {},
         {"nc_inq_varndims(ncid, 4, out)", "tsCreateUninitNumericArray({0, 1}, double)", "nc_get_vara_double(ncid, 4, {0}, {0}, result)"}},
        {"nothing in one dimension of three", On::sample, {"get_vara_short", ncid, varid("temp"), doubles({0, 0, 0}), doubles({2, 0, 2})},
         gives({empty(tsINT16, {2, 0, 2})}), {},
         {"nc_inq_varndims(ncid, 1, out)", "tsCreateUninitNumericArray({2, 0, 2}, int16)", "nc_get_vara_short(ncid, 1, {0, 0, 0}, {2, 0, 2}, result)"}},
        {"no text", On::sample, {"get_vara_text", ncid, varid("name"), doubles({0, 0}), doubles({0, 2})}, gives({empty(tsCHAR, {0, 2})}), {},
         {"nc_inq_varndims(ncid, 3, out)", "tsCreateCharArray({0, 2})", "tsCalloc(1, 2)", "nc_get_vara_text(ncid, 3, {0, 0}, {2, 0}, block)", "tsFree(block)"}},
        {"text, its bytes widened with their signs", On::sample, {"get_vara_text", ncid, varid("name"), doubles({2, 1}), doubles({6, 2})},
         gives({shaped({6, 2}, codes({'f', 0xFFE9, 0xFF80, 0xFFFF, 0x7F, 0, 'i', 'r', 'd', ' ', ' ', 'e'}))}), {},
         {"nc_inq_varndims(ncid, 3, out)", "tsCreateCharArray({6, 2})", "tsCalloc(13, 2)", "nc_get_vara_text(ncid, 3, {1, 2}, {2, 6}, block)", "tsFree(block)"}},
        {"records that are there", On::sample, {"get_vara_double", ncid, varid("time"), 0, 2}, gives({shaped({2, 1}, doubles({0, 1}))})},

        {"beyond the end", On::sample, {"get_vara_double", ncid, varid("level"), 3, 3},
         fails("TESSEL:netcdf:getVara:startPlusCountExceedsDimensionBound", blockFailed("NetCDF: Start+count exceeds dimension bound")), {},
         {"nc_inq_varndims(ncid, 4, out)", "tsCreateUninitNumericArray({3, 1}, double)", "nc_get_vara_double(ncid, 4, {3}, {3}, array)", "nc_strerror(-57)"}},
        {"from beyond the end", On::sample, {"get_vara_double", ncid, varid("level"), 6, 1},
         fails("TESSEL:netcdf:getVara:indexExceedsDimensionBound", blockFailed("NetCDF: Index exceeds dimension bound"))},
        {"a record that is not there", On::sample, {"get_vara_double", ncid, varid("time"), 1, 2},
         fails("TESSEL:netcdf:getVara:startPlusCountExceedsDimensionBound", blockFailed("NetCDF: Start+count exceeds dimension bound"))},
        {"numbers that do not fit", On::sample, {"get_vara_schar", ncid, varid("count"), doubles({0, 2}), doubles({5, 1})},
         fails("TESSEL:netcdf:getVara:mathResultNotRepresentable", blockFailed("NetCDF: Numeric conversion not representable"))},
        {"numbers are no text, and all is given back before that is told", On::sample, {"get_vara_text", ncid, varid("level"), 0, 2},
         fails("TESSEL:netcdf:getVara:attemptToConvertBetweenTextAndNumbers", blockFailed("NetCDF: Attempt to convert between text & numbers")), {},
         {"nc_inq_varndims(ncid, 4, out)", "tsCreateCharArray({2, 1})", "tsCalloc(3, 2)", "nc_get_vara_text(ncid, 4, {0}, {2}, block)", "tsFree(block)", "nc_strerror(-56)"}},
        {"more than there can be memory for", On::sample, {"get_vara_double", ncid, varid("grid"), doubles({0, 0}), doubles({0x1p40, 0x1p40})},
         fails("TESSEL:host:dimensionsTooLarge", "The dimensions of the array are too large."), {}, {"nc_inq_varndims(ncid, 6, out)"}},
        {"a count that wraps around", On::sample, {"get_vara_text", ncid, varid("label"), 0, -1},
         fails("TESSEL:host:dimensionsTooLarge", "The dimensions of the array are too large.")},

        {"too short a start", On::sample, {"get_vara_double", ncid, varid("grid"), 0, doubles({1, 1})}, startLength, {}, {"nc_inq_varndims(ncid, 6, out)"}},
        {"too long a start", On::sample, {"get_vara_double", ncid, varid("grid"), doubles({0, 0, 0}), doubles({1, 1})}, startLength},
        {"too short a count", On::sample, {"get_vara_double", ncid, varid("grid"), doubles({0, 0}), 1}, countLength, {}, {"nc_inq_varndims(ncid, 6, out)"}},
        {"too long a count", On::sample, {"get_vara_text", ncid, varid("label"), 0, doubles({1, 1})}, countLength},
        {"start and count both wrong", On::sample, {"get_vara_double", ncid, varid("grid"), 0, 1}, startLength},
        {"a variable without dimensions has no blocks", On::sample, {"get_vara_double", ncid, varid("height"), 0, 1}, startLength},
        {"not even empty ones", On::sample, {"get_vara_double", ncid, varid("height"), empty(tsDOUBLE), empty(tsDOUBLE)},
         refuses("TESSEL:netcdf:startArgumentIsEmpty", "start argument cannot be empty.")},
        {"a variable that there is not, and a start that is wrong", On::sample, {"get_vara_double", ncid, 99, doubles({0, 0, 0, 0}), 1},
         fails("TESSEL:netcdf:getVara:numDimsInquiry:variableNotFound",
               "Unable to retrieve number of netCDF variable's dimensions, library error message \"NetCDF: Variable not found\""), {},
         {"nc_inq_varndims(ncid, 99, out)", "nc_strerror(-49)"}},
        {"in define mode", On::sampleDefine, {"get_vara_double", ncid, varid("grid"), doubles({0, 0}), doubles({1, 1})},
         fails("TESSEL:netcdf:getVara:operationNotAllowedInDefineMode", blockFailed("NetCDF: Operation not allowed in define mode"))},
    };
}

/// Each numeric member of both families, straight into the result.
Rows eachMember() {
    Rows list;
    for (const Member &member : numericMembers()) {
        const std::string element = "get_var1_" + member.suffix;
        const std::string block = "get_vara_" + member.suffix;
        list.insert(list.end(), {
            {element + " of a number", On::sample, {element.c_str(), ncid, varid("level"), 4}, gives({wholes(member.hostClass, {4})}), {},
             {"nc_inq_varndims(ncid, 4, out)", "tsCreateUninitNumericArray({1}, " + member.className + ")", "nc_" + element + "(ncid, 4, {4}, result)"}},
            {element + " of a character", On::sample, {("nc_" + element).c_str(), ncid, varid("label"), 0},
             fails("TESSEL:netcdf:getVar1:attemptToConvertBetweenTextAndNumbers", elementFailed("NetCDF: Attempt to convert between text & numbers"))},
            {block + " of numbers", On::sample, {block.c_str(), ncid, varid("count"), doubles({1, 0}), doubles({3, 2})},
             gives({shaped({3, 2}, wholes(member.hostClass, {1, 2, 3, 101, 102, 103}))}), {},
             {"nc_inq_varndims(ncid, 5, out)", "tsCreateUninitNumericArray({3, 2}, " + member.className + ")", "nc_" + block + "(ncid, 5, {0, 1}, {2, 3}, result)"}},
            {block + " of text", On::sample, {("nc_" + block).c_str(), ncid, varid("label"), 0, 5},
             fails("TESSEL:netcdf:getVara:attemptToConvertBetweenTextAndNumbers", blockFailed("NetCDF: Attempt to convert between text & numbers"))},
        });
    }
    return list;
}
// clang-format on

INSTANTIATE_TEST_SUITE_P(ElementRead, Conformance, testing::ValuesIn(elements()), titleOf);
INSTANTIATE_TEST_SUITE_P(BlockRead, Conformance, testing::ValuesIn(blocks()), titleOf);
INSTANTIATE_TEST_SUITE_P(BlockReadMembers, Conformance, testing::ValuesIn(eachMember()), titleOf);

} // namespace
} // namespace tessel::test
