// tests/conformance/var_write.cpp: writing whole variables.
#include "support/conformance.hpp"
#include "support/library.hpp"
#include "support/members.hpp"

namespace tessel::test {
namespace {

std::string failed(const std::string &why) {
    return libraryFailed("Variable write operation failed", why);
}

const Outcome wrongSize = fails("TESSEL:netcdf:putVar:dataSizeMismatch",
                                "The number of input elements does not match the variable size.");

/// 1, 2, 3 and so on, so many.
Value counted(tsClassID classID, int size) {
    std::vector<int> values;
    for (int i = 1; i <= size; ++i) {
        values.push_back(i);
    }
    return wholes(classID, values);
}

// clang-format off
Rows rows() {
    const Lines countWritten = {"- count = 0 1 2 3 4 100 101 102 103 104 200 201 202 203 204", "+ count = 1 2 3 4 5 6 7 8 9 10 11 12 13 14 15"};
    const Lines countAsks = {"nc_inq_var(ncid, 5, NULL, NULL, out, out, NULL)", "nc_inq_dimlen(ncid, 1, out)", "nc_inq_dimlen(ncid, 3, out)",
                             "nc_put_var_int(ncid, 5, input 3)"};
    return {
        {"a variable in its own shape", On::sample, {"put_var_int", ncid, varid("count"), shaped({5, 3}, counted(tsINT32, 15))}, givesNothing(), countWritten, countAsks},
        {"in the shape turned around",  On::sample, {"nc_put_var_int", ncid, varid("count"), shaped({3, 5}, counted(tsINT32, 15))}, givesNothing(), countWritten, countAsks},
        {"in a row",                    On::sample, {"put_var_int", ncid, varid("count"), counted(tsINT32, 15)}, givesNothing(), countWritten, countAsks},
        {"in a column",                 On::sample, {"put_var_int", ncid, varid("count"), shaped({15, 1}, counted(tsINT32, 15))}, givesNothing(), countWritten, countAsks},
        {"in pages",                    On::sample, {"put_var_int", ncid, varid("count"), shaped({1, 3, 1, 5}, counted(tsINT32, 15))}, givesNothing(), countWritten, countAsks},
        {"one element too few",         On::sample, {"put_var_int", ncid, varid("count"), counted(tsINT32, 14)}, wrongSize, {},
         {"nc_inq_var(ncid, 5, NULL, NULL, out, out, NULL)", "nc_inq_dimlen(ncid, 1, out)", "nc_inq_dimlen(ncid, 3, out)"}},
        {"one element too many",        On::sample, {"put_var_int", ncid, varid("count"), counted(tsINT32, 16)}, wrongSize},
        {"one element",                 On::sample, {"put_var_int", ncid, varid("count"), counted(tsINT32, 1)}, wrongSize},

        {"without dimensions", On::sample, {"put_var_double", ncid, varid("height"), 2.5}, givesNothing(), {"- height = 1.5", "+ height = 2.5"},
         {"nc_inq_var(ncid, 0, NULL, NULL, out, out, NULL)", "nc_put_var_double(ncid, 0, input 3)"}},
        {"without dimensions, two elements", On::sample, {"put_var_double", ncid, varid("height"), doubles({1, 2})}, wrongSize},
        {"the real parts", On::sample, {"put_var_double", ncid, varid("time"), complexDoubles({5, 6})}, givesNothing(), {"- time = 0 1", "+ time = 5 6"}},
        {"all records that there are", On::sample, {"put_var_float", ncid, varid("temp"), counted(tsSINGLE, 24)}, givesNothing(),
         {"- temp = 0 1 2 3 100 101 102 103 200 201 202 203 10000 10001 10002 10003 10100 10101 10102 10103 10200 10201 10202 10203",
          "+ temp = 1 2 3 4 5 6 7 8 9 10 11 12 13 14 15 16 17 18 19 20 21 22 23 24"},
         {"nc_inq_var(ncid, 1, NULL, NULL, out, out, NULL)", "nc_inq_dimlen(ncid, 0, out)", "nc_inq_dimlen(ncid, 1, out)", "nc_inq_dimlen(ncid, 2, out)",
          "nc_put_var_float(ncid, 1, input 3)"}},
        {"one record of two", On::sample, {"put_var_float", ncid, varid("temp"), counted(tsSINGLE, 12)}, wrongSize},
        {"a record that is not there yet", On::sample, {"put_var_double", ncid, varid("time"), doubles({1, 2, 3})}, wrongSize},
        {"where there are no records, there is nothing to write", On::noRecords, {"put_var_double", ncid, varid("time"), 1}, wrongSize},
        {"and nothing is not written", On::noRecords, {"put_var_double", ncid, varid("time"), empty(tsDOUBLE, {0, 1})},
         refuses("TESSEL:netcdf:emptyVariableData", "Variable data must not be empty.")},

        {"text", On::sample, {"put_var_text", ncid, varid("label"), "abcde"}, givesNothing(),
         {R"(- label = "a\x00\xE9z!")", "+ label = \"abcde\""},
         {"nc_inq_var(ncid, 8, NULL, NULL, out, out, NULL)", "nc_inq_dimlen(ncid, 3, out)", "tsCalloc(5, 1)", "nc_put_var_text(ncid, 8, block)", "tsFree(block)"}},
        {"of each character the low byte", On::sample, {"nc_put_var_text", ncid, varid("label"), codes({0x20AC, 0x1F41, 0, 0xFFE9, 0xE9})}, givesNothing(),
         {R"(- label = "a\x00\xE9z!")", R"(+ label = "\xACA\x00\xE9\xE9")"}},
        {"text in a matrix, column by column", On::sample, {"put_var_text", ncid, varid("flag"), shaped({1, 2}, "ab")}, givesNothing(),
         {"- flag = \"NY\"", "+ flag = \"ab\""}},
        {"one character", On::sample, {"put_var_text", ncid, varid("letter"), "Z"}, givesNothing(), {"- letter = \"Q\"", "+ letter = \"Z\""}},
        {"too short a text", On::sample, {"put_var_text", ncid, varid("label"), "abc"}, wrongSize},
        {"text in define mode; the buffer is given back before that is told", On::sampleDefine, {"put_var_text", ncid, varid("label"), "abcde"},
         fails("TESSEL:netcdf:putVar:operationNotAllowedInDefineMode", failed("NetCDF: Operation not allowed in define mode")), {},
         {"nc_inq_var(ncid, 8, NULL, NULL, out, out, NULL)", "nc_inq_dimlen(ncid, 3, out)", "tsCalloc(5, 1)", "nc_put_var_text(ncid, 8, block)", "tsFree(block)", "nc_strerror(-39)"}},
        {"text into numbers", On::sample, {"put_var_text", ncid, varid("level"), "abcde"},
         fails("TESSEL:netcdf:putVar:attemptToConvertBetweenTextAndNumbers", failed("NetCDF: Attempt to convert between text & numbers"))},

        {"numbers that do not fit", On::sample, {"put_var_double", ncid, varid("mask"), doubles({1, 2, 300, 4})},
         fails("TESSEL:netcdf:putVar:mathResultNotRepresentable", failed("NetCDF: Numeric conversion not representable")),
         {"- mask = -128 -1 0 127", std::string("+ mask = 1 2 ").append(byteOf300).append(" 4")},
         {"nc_inq_var(ncid, 2, NULL, NULL, out, out, NULL)", "nc_inq_dimlen(ncid, 2, out)", "nc_put_var_double(ncid, 2, input 3)", "nc_strerror(-60)"}},
        {"into a read-only dataset", On::sampleRead, {"put_var_double", ncid, varid("height"), 1},
         fails("TESSEL:netcdf:putVar:writeToReadOnly", failed("NetCDF: Write to read only"))},
        {"a variable that there is not", On::sample, {"put_var_double", ncid, 99, 1},
         fails("TESSEL:netcdf:putVar:variableNotFound", "Variable inquiry failed, library error message \"NetCDF: Variable not found\""), {},
         {"nc_inq_var(ncid, 99, NULL, NULL, out, out, NULL)", "nc_strerror(-49)"}},
        {"a variable that there is not, and data of the wrong class", On::sample, {"put_var_double", ncid, 99, int32s({1})},
         refuses("TESSEL:netcdf:put_var_double:badDatatype", "The input datatype for put_var_double must be double precision, not int32.")},
        {"a variable that there is not, and no data", On::sample, {"put_var_double", ncid, 99, empty(tsINT32)},
         refuses("TESSEL:netcdf:emptyVariableData", "Variable data must not be empty.")},
        {"data of the wrong class and the wrong size", On::sample, {"put_var_short", ncid, varid("level"), int32s({1})},
         refuses("TESSEL:netcdf:put_var_short:badDatatype", "The input datatype for put_var_short must be int16, not int32.")},
        {"a dataset that there is not", On::nothing, {"put_var_text", 5, 0, "a"},
         fails("TESSEL:netcdf:putVar:notNetcdfID", "Variable inquiry failed, library error message \"NetCDF: Not a valid ID\"")},
    };
}

/// Each numeric member, straight from the input; and into text.
Rows eachMember() {
    Rows list;
    for (const Member &member : numericMembers()) {
        const std::string operation = "put_var_" + member.suffix;
        list.insert(list.end(), {
            {operation + " of numbers", On::sample, {operation.c_str(), ncid, varid("level"), wholes(member.hostClass, {5, 6, 7, 8, 9})}, givesNothing(),
             {"- level = 0 1 2 3 4", "+ level = 5 6 7 8 9"},
             {"nc_inq_var(ncid, 4, NULL, NULL, out, out, NULL)", "nc_inq_dimlen(ncid, 3, out)", "nc_" + operation + "(ncid, 4, input 3)"}},
            {operation + " into text", On::sample, {("nc_" + operation).c_str(), ncid, varid("label"), wholes(member.hostClass, {5, 6, 7, 8, 9})},
             fails("TESSEL:netcdf:putVar:attemptToConvertBetweenTextAndNumbers", failed("NetCDF: Attempt to convert between text & numbers"))},
        });
    }
    return list;
}
// clang-format on

INSTANTIATE_TEST_SUITE_P(VarWrite, Conformance, testing::ValuesIn(rows()), titleOf);
INSTANTIATE_TEST_SUITE_P(VarWriteMembers, Conformance, testing::ValuesIn(eachMember()), titleOf);

} // namespace
} // namespace tessel::test
