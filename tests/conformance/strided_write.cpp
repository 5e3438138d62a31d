// tests/conformance/strided_write.cpp: writing strided blocks.
#include "support/conformance.hpp"
#include "support/library.hpp"
#include "support/members.hpp"

namespace tessel::test {
namespace {

std::string failed(const std::string &why) {
    return libraryFailed("Strided data write operation failed", why);
}

Outcome wrongLength(const std::string &identifier, const std::string &which,
                    const std::string &rest) {
    return fails("TESSEL:netcdf:putVars:" + identifier,
                 "The length of the " + which + " argument for " + rest + ".");
}

Outcome wrongSize(const std::string &implied, const std::string &given) {
    return fails("TESSEL:netcdf:putVars:dataSizeMismatch",
                 "The number of elements implied by the count argument (" + implied +
                     ") does not equal the number of data elements (" + given + ").");
}

// clang-format off
Rows rows() {
    const Value six = int32s({-1, -2, -3, -4, -5, -6});
    const Value two = doubles({2, 2});
    return {
        {"every second of both dimensions", On::sample, {"put_vars_int", ncid, varid("count"), doubles({0, 0}), doubles({3, 2}), two, six}, givesNothing(),
         {"- count = 0 1 2 3 4 100 101 102 103 104 200 201 202 203 204", "+ count = -1 1 -2 3 -3 100 101 102 103 104 -4 201 -5 203 -6"},
         {"nc_inq_var(ncid, 5, out, NULL, out, NULL, NULL)", "nc_put_vars_int(ncid, 5, {0, 0}, {2, 3}, {2, 2}, input 6)"}},
        {"each vector its own", On::sample, {"nc_put_vars_int", ncid, varid("count"), doubles({1, 0}), doubles({2, 3}), int8s({3, 1}), shaped({3, 2}, six)}, givesNothing(),
         {"- count = 0 1 2 3 4 100 101 102 103 104 200 201 202 203 204", "+ count = 0 -1 2 3 -2 100 -3 102 103 -4 200 -5 202 203 -6"},
         {"nc_inq_var(ncid, 5, out, NULL, out, NULL, NULL)", "nc_put_vars_int(ncid, 5, {0, 1}, {3, 2}, {1, 3}, input 6)"}},
        {"a stride of one writes a block", On::sample, {"put_vars_short", ncid, varid("level"), 1, 3, 1, int16s({7, 8, 9})}, givesNothing(),
         {"- level = 0 1 2 3 4", "+ level = 0 7 8 9 4"}},
        {"text", On::sample, {"put_vars_text", ncid, varid("label"), 0, 3, 2, "xyz"}, givesNothing(),
         {R"(- label = "a\x00\xE9z!")", R"(+ label = "x\x00yzz")"},
         {"nc_inq_var(ncid, 8, out, NULL, out, NULL, NULL)", "tsCalloc(3, 1)", "nc_put_vars_text(ncid, 8, {0}, {3}, {2}, block)", "tsFree(block)"}},
        {"of each character the low byte", On::sample, {"nc_put_vars_text", ncid, varid("label"), 0, 2, 3, codes({0x20AC, 0xFFE9})}, givesNothing(),
         {R"(- label = "a\x00\xE9z!")", R"(+ label = "\xAC\x00\xE9\xE9!")"}},
        {"text into numbers; the buffer is given back before that is told", On::sample, {"put_vars_text", ncid, varid("level"), 0, 2, 2, "ab"},
         fails("TESSEL:netcdf:putVars:attemptToConvertBetweenTextAndNumbers", failed("NetCDF: Attempt to convert between text & numbers")), {},
         {"nc_inq_var(ncid, 4, out, NULL, out, NULL, NULL)", "tsCalloc(2, 1)", "nc_put_vars_text(ncid, 4, {0}, {2}, {2}, block)", "tsFree(block)", "nc_strerror(-56)"}},

        {"a stride of zero", On::sample, {"put_vars_short", ncid, varid("level"), 0, 2, 0, int16s({1, 2})},
         fails("TESSEL:netcdf:putVars:illegalStride", failed("NetCDF: Illegal stride")), {},
         {"nc_inq_var(ncid, 4, out, NULL, out, NULL, NULL)", "nc_put_vars_short(ncid, 4, {0}, {2}, {0}, input 6)", "nc_strerror(-58)"}},
        {"a negative stride", On::sample, {"put_vars_short", ncid, varid("level"), 1, 2, -1, int16s({1, 2})},
         fails("TESSEL:netcdf:putVars:illegalStride", failed("NetCDF: Illegal stride")), {},
         {"nc_inq_var(ncid, 4, out, NULL, out, NULL, NULL)", "nc_put_vars_short(ncid, 4, {1}, {2}, {-1}, input 6)", "nc_strerror(-58)"}},
        {"beyond the end; the library writes what it can", On::sample, {"put_vars_short", ncid, varid("level"), 0, 3, 3, int16s({7, 8, 9})},
         fails("TESSEL:netcdf:putVars:indexExceedsDimensionBound", failed("NetCDF: Index exceeds dimension bound")),
         {"- level = 0 1 2 3 4", "+ level = 7 1 2 8 4"}},
        {"more than there are", On::sample, {"put_vars_short", ncid, varid("level"), 2, 4, 1, int16s({6, 7, 8, 9})},
         fails("TESSEL:netcdf:putVars:startPlusCountExceedsDimensionBound", failed("NetCDF: Start+count exceeds dimension bound"))},
        {"a number that does not fit", On::sample, {"put_vars_double", ncid, varid("mask"), 0, 1, 2, 300},
         fails("TESSEL:netcdf:putVars:mathResultNotRepresentable", failed("NetCDF: Numeric conversion not representable")),
         {"- mask = -128 -1 0 127", std::string("+ mask = ").append(byteOf300).append(" -1 0 127")}},

        {"fewer elements than counted", On::sample, {"put_vars_int", ncid, varid("count"), doubles({0, 0}), doubles({2, 2}), two, int32s({1, 2, 3})}, wrongSize("4", "3"), {},
         {"nc_inq_var(ncid, 5, out, NULL, out, NULL, NULL)"}},
        {"more elements than counted", On::sample, {"put_vars_text", ncid, varid("label"), 0, 2, 2, "abc"}, wrongSize("2", "3")},
        {"a count of zero", On::sample, {"put_vars_int", ncid, varid("count"), doubles({0, 0}), doubles({2, 0}), two, int32s({1})}, wrongSize("0", "1")},
        {"a count of zero and no data", On::sample, {"put_vars_int", ncid, varid("count"), doubles({0, 0}), doubles({2, 0}), two, empty(tsINT32)},
         refuses("TESSEL:netcdf:emptyVariableData", "Variable data must not be empty.")},
        {"a count of minus one shows its low half", On::sample, {"put_vars_double", ncid, varid("level"), 0, -1, 1, 1}, wrongSize("4294967295", "1")},
        {"a product of 2 to the 32nd and 6 shows as 6", On::sample, {"put_vars_double", ncid, varid("level"), 0, 0x1p32 + 6, 1, doubles({1, 2})}, wrongSize("6", "2")},

        {"too short a start", On::sample, {"put_vars_double", ncid, varid("temp"), doubles({0, 0}), doubles({1, 1, 1}), doubles({1, 1, 1}), 1},
         wrongLength("badStartLength", "start", "temp must be 3 instead of 2"), {}, {"nc_inq_var(ncid, 1, out, NULL, out, NULL, NULL)"}},
        {"too long a count", On::sample, {"put_vars_double", ncid, varid("level"), 0, doubles({1, 1}), 1, 1},
         wrongLength("badCountLength", "count", "level must be 1 instead of 2"), {}, {"nc_inq_var(ncid, 4, out, NULL, out, NULL, NULL)"}},
        {"too long a stride", On::sample, {"put_vars_double", ncid, varid("level"), 0, 1, doubles({1, 1}), 1},
         wrongLength("badStrideLength", "stride", "level must be 1 instead of 2"), {}, {"nc_inq_var(ncid, 4, out, NULL, out, NULL, NULL)"}},
        {"start and stride both wrong", On::sample, {"put_vars_double", ncid, varid("temp"), 0, doubles({1, 1, 1}), 1, 1},
         wrongLength("badStartLength", "start", "temp must be 3 instead of 1")},
        {"start and count both wrong", On::sample, {"put_vars_double", ncid, varid("temp"), 0, 1, doubles({1, 1, 1}), 1},
         wrongLength("badStartLength", "start", "temp must be 3 instead of 1")},
        {"count and stride both wrong", On::sample, {"put_vars_double", ncid, varid("temp"), doubles({0, 0, 0}), doubles({1, 1}), 1, 1},
         wrongLength("badCountLength", "count", "temp must be 3 instead of 2")},
        {"stride and size both wrong", On::sample, {"put_vars_double", ncid, varid("level"), 0, 3, doubles({1, 1}), 1},
         wrongLength("badStrideLength", "stride", "level must be 1 instead of 2")},
        {"a variable without dimensions has no blocks", On::sample, {"put_vars_double", ncid, varid("height"), 0, 1, 1, 1},
         wrongLength("badStartLength", "start", "height must be 0 instead of 1")},
        {"not even empty ones", On::sample, {"put_vars_double", ncid, varid("height"), empty(tsDOUBLE), empty(tsDOUBLE), empty(tsDOUBLE), 1},
         refuses("TESSEL:netcdf:startArgumentIsEmpty", "start argument cannot be empty.")},
        {"a variable that there is not, and a wrong start", On::sample, {"put_vars_double", ncid, 99, doubles({0, 0, 0, 0}), 5, 1, 1},
         fails("TESSEL:netcdf:putVars:inqVarNDimsFailure", "Unable to read the number of dimensions, \"NetCDF: Variable not found\"."), {},
         {"nc_inq_var(ncid, 99, out, NULL, out, NULL, NULL)", "nc_strerror(-49)"}},
        {"a variable that there is not, and data of the wrong class", On::sample, {"put_vars_int", ncid, 99, 0, 1, 1, 1},
         refuses("TESSEL:netcdf:put_vars_int:badDatatype", "The input datatype for put_vars_int must be int32, not double.")},
        {"one argument too few", On::sample, {"put_vars_int", ncid, varid("level"), 0, 1, int32s({1})},
         refuses("TESSEL:netcdf:putVars:badInputParameterCount", "Must supply seven input parameters for put_vars_int")},
        {"in define mode", On::sampleDefine, {"put_vars_double", ncid, varid("level"), 0, 1, 1, 1},
         fails("TESSEL:netcdf:putVars:operationNotAllowedInDefineMode", failed("NetCDF: Operation not allowed in define mode"))},
        {"into a read-only dataset", On::sampleRead, {"put_vars_double", ncid, varid("level"), 0, 1, 1, 1},
         fails("TESSEL:netcdf:putVars:writeToReadOnly", failed("NetCDF: Write to read only"))},
    };
}

/// Each numeric member, straight from the input.
Rows eachMember() {
    Rows list;
    for (const Member &member : numericMembers()) {
        const std::string operation = "put_vars_" + member.suffix;
        list.insert(list.end(), {
            {operation + " of numbers", On::sample, {operation.c_str(), ncid, varid("level"), 0, 3, 2, wholes(member.hostClass, {7, 8, 9})}, givesNothing(),
             {"- level = 0 1 2 3 4", "+ level = 7 1 8 3 9"},
             {"nc_inq_var(ncid, 4, out, NULL, out, NULL, NULL)", "nc_" + operation + "(ncid, 4, {0}, {3}, {2}, input 6)"}},
            {operation + " into text", On::sample, {("nc_" + operation).c_str(), ncid, varid("label"), 0, 3, 2, wholes(member.hostClass, {7, 8, 9})},
             fails("TESSEL:netcdf:putVars:attemptToConvertBetweenTextAndNumbers", failed("NetCDF: Attempt to convert between text & numbers"))},
        });
    }
    return list;
}
// clang-format on

INSTANTIATE_TEST_SUITE_P(StridedWrite, Conformance, testing::ValuesIn(rows()), titleOf);
INSTANTIATE_TEST_SUITE_P(StridedWriteMembers, Conformance, testing::ValuesIn(eachMember()),
                         titleOf);

} // namespace
} // namespace tessel::test
