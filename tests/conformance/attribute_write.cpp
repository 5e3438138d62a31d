// tests/conformance/attribute_write.cpp: writing attribute values.
#include "support/conformance.hpp"
#include "support/library.hpp"
#include "support/members.hpp"

#include <limits>

namespace tessel::test {
namespace {

std::string failed(const std::string &why) {
    return libraryFailed("Attribute write operation failed", why);
}
std::string textFailed(const std::string &why) {
    return libraryFailed("Char attribute write operation failed", why);
}

// clang-format off
Rows rows() {
    return {
        {"doubles, stored as short", On::sampleDefine, {"put_att_double", ncid, varid("grid"), "a", 3, doubles({1, 2, 3})}, givesNothing(),
         {"+ grid:a = short 1 2 3"}, {"nc_put_att_double(ncid, 6, \"a\", 3, 3, input 5)"}},
        {"doubles, stored as byte",  On::sampleDefine, {"put_att_double", ncid, 6, "a", 1, doubles({-128, 127})},      givesNothing(), {"+ grid:a = byte -128 127"}},
        {"doubles, stored as int",   On::sampleDefine, {"put_att_double", ncid, 6, "a", 4, doubles({-2.9, 2.9})},      givesNothing(), {"+ grid:a = int -2 2"}},
        {"doubles, stored as float", On::sampleDefine, {"put_att_double", ncid, 6, "a", 5, doubles({0.1, -0.0})},      givesNothing(), {"+ grid:a = float 0.1 -0"}},
        {"doubles, stored as they are", On::sampleDefine, {"put_att_double", ncid, 6, "a", 6, doubles({0.1, 1e300})},  givesNothing(), {"+ grid:a = double 0.1 1e+300"}},
        {"floats",                   On::sampleDefine, {"put_att_float", ncid, 6, "a", 5, singles({0.1F, 3e38F})},     givesNothing(), {"+ grid:a = float 0.1 3e+38"}},
        {"ints",                     On::sampleDefine, {"put_att_int", ncid, 6, "a", 4, int32s({-2147483647 - 1, 2147483647})}, givesNothing(), {"+ grid:a = int -2147483648 2147483647"}},
        {"shorts",                   On::sampleDefine, {"put_att_short", ncid, 6, "a", 3, int16s({-32768, 32767})},    givesNothing(), {"+ grid:a = short -32768 32767"}},
        {"bytes",                    On::sampleDefine, {"put_att_schar", ncid, 6, "a", 1, int8s({-128, 127})},         givesNothing(), {"+ grid:a = byte -128 127"}},
        {"unsigned bytes",           On::sampleDefine, {"put_att_uchar", ncid, 6, "a", 1, uint8s({128, 255, 1})},      givesNothing(), {"+ grid:a = byte -128 -1 1"}},
        {"unsigned bytes, stored as int", On::sampleDefine, {"put_att_uchar", ncid, 6, "a", 4, uint8s({255})},         givesNothing(), {"+ grid:a = int 255"}},
        {"of the dataset, by the long name", On::sampleDefine, {"nc_put_att_int", ncid, -1, "a", 4, int32s({7})},      givesNothing(), {"+ :a = int 7"}},
        {"a matrix, column by column", On::sampleDefine, {"put_att_double", ncid, 6, "a", 3, shaped({2, 3}, doubles({1, 2, 3, 4, 5, 6}))}, givesNothing(),
         {"+ grid:a = short 1 2 3 4 5 6"}, {"nc_put_att_double(ncid, 6, \"a\", 3, 6, input 5)"}},
        {"the real parts",           On::sampleDefine, {"put_att_double", ncid, 6, "a", 3, complexDoubles({1, 2})},    givesNothing(), {"+ grid:a = short 1 2"}},
        {"over an attribute that is there", On::sampleDefine, {"put_att_int", ncid, -1, "version", 6, int32s({4, 5})}, givesNothing(),
         {"- :version = int 3", "+ :version = double 4 5"}},
        {"the same size in data mode", On::sample, {"put_att_int", ncid, -1, "version", 4, int32s({4})}, givesNothing(),
         {"- :version = int 3", "+ :version = int 4"}},
        {"a new one in data mode",   On::sample, {"put_att_int", ncid, -1, "a", 4, int32s({4})},
         fails("TESSEL:netcdf:putAtt:operationNotAllowedInDataMode", failed("NetCDF: Operation not allowed in data mode"))},
        {"a value that does not fit", On::sampleDefine, {"put_att_double", ncid, 6, "a", 1, 300},
         fails("TESSEL:netcdf:putAtt:mathResultNotRepresentable", failed("NetCDF: Numeric conversion not representable")),
         {std::string("+ grid:a = byte ").append(byteOf300)}, {"nc_put_att_double(ncid, 6, \"a\", 1, 1, input 5)", "nc_strerror(-60)"}},
        {"numbers, stored as char",  On::sampleDefine, {"put_att_double", ncid, 6, "a", 2, 65},
         fails("TESSEL:netcdf:putAtt:attemptToConvertBetweenTextAndNumbers", failed("NetCDF: Attempt to convert between text & numbers"))},
        {"of no type",               On::sampleDefine, {"put_att_double", ncid, 6, "a", 0, 65},
         fails("TESSEL:netcdf:putAtt:invalidDataType", failed("NetCDF: Not a valid data type or _FillValue type mismatch"))},
        {"to a variable that there is not", On::sampleDefine, {"put_att_double", ncid, 99, "a", 6, 65},
         fails("TESSEL:netcdf:putAtt:variableNotFound", failed("NetCDF: Variable not found"))},
        {"a type out of range",      On::sampleDefine, {"put_att_double", ncid, 6, "a", 7, 65},
         refuses("TESSEL:netcdf:invalidNetcdfDatatype", "The datatype argument 7.000000 is out of range.")},
        {"a type out of range and values of the wrong class", On::sampleDefine, {"put_att_double", ncid, 6, "a", 7, int32s({1})},
         refuses("TESSEL:netcdf:invalidNetcdfDatatype", "The datatype argument 7.000000 is out of range.")},
        {"values of the wrong class", On::sampleDefine, {"nc_put_att_int", ncid, 6, "a", 4, doubles({1, 2})},
         refuses("TESSEL:netcdf:put_att_int:badDatatype", "The input datatype for put_att_int must be int32, not double.")},

        {"text", On::sampleDefine, {"put_att_text", ncid, varid("grid"), "a", "abc"}, givesNothing(), {"+ grid:a = char \"abc\""},
         {"tsCalloc(3, 1)", "nc_put_att_text(ncid, 6, \"a\", 3, block)", "tsFree(block)"}},
        {"text of the dataset, by the long name", On::sampleDefine, {"nc_put_att_text", ncid, -1, "a", "x"}, givesNothing(), {"+ :a = char \"x\""}},
        {"text with a NUL", On::sampleDefine, {"put_att_text", ncid, -1, "a", codes({'a', 0, 'b', 0})}, givesNothing(), {R"(+ :a = char "a\x00b\x00")"},
         {"tsCalloc(4, 1)", "nc_put_att_text(ncid, -1, \"a\", 4, block)", "tsFree(block)"}},
        {"text in a matrix, column by column", On::sampleDefine, {"put_att_text", ncid, -1, "a", shaped({2, 2}, "abcd")}, givesNothing(), {"+ :a = char \"abcd\""}},
        {"of each character the low byte", On::sampleDefine, {"put_att_text", ncid, -1, "a", codes({0x20AC, 0x1F41, 0x00E9, 0xFFFF, 0x0100})}, givesNothing(),
         {R"(+ :a = char "\xACA\xE9\xFF\x00")"}},
        {"no text", On::sampleDefine, {"put_att_text", ncid, -1, "a", ""}, givesNothing(), {"+ :a = char \"\""},
         {"nc_put_att_text(ncid, -1, \"a\", 0, NULL)"}},
        {"no text of 0x0", On::sampleDefine, {"put_att_text", ncid, -1, "a", empty(tsCHAR)}, givesNothing(), {"+ :a = char \"\""}},
        {"text in data mode; the buffer is left to the host", On::sample, {"put_att_text", ncid, -1, "a", "abc"},
         fails("TESSEL:netcdf:putAttText:operationNotAllowedInDataMode", textFailed("NetCDF: Operation not allowed in data mode")), {},
         {"tsCalloc(3, 1)", "nc_put_att_text(ncid, -1, \"a\", 3, block)", "nc_strerror(-38)"}},
        {"text to no dataset", On::nothing, {"put_att_text", 5, -1, "a", "abc"},
         fails("TESSEL:netcdf:putAttText:notNetcdfID", textFailed("NetCDF: Not a valid ID"))},
        {"text with a type, as the numbers have it", On::sampleDefine, {"put_att_text", ncid, -1, "a", 2, "abc"},
         refuses("TESSEL:netcdf:putAttText:badInputParameterCount", "Must supply five input parameters to PUT_ATT_TEXT.")},
        {"no text, of another class", On::sampleDefine, {"put_att_text", ncid, -1, "a", empty(tsDOUBLE)},
         refuses("TESSEL:netcdf:put_att_text:badDatatype", "The input datatype for put_att_text must be char, not double.")},
    };
}
// clang-format on

/// Each numeric member: three numbers, and none.
Rows eachMember() {
    Rows list;
    for (const Member &member : numericMembers()) {
        const std::string operation = "put_att_" + member.suffix;
        // clang-format off
        list.insert(list.end(), {
            {operation + " of three numbers", On::sampleDefine,
             {operation.c_str(), ncid, varid("grid"), "a", 4, wholes(member.hostClass, {1, 2, 3})}, givesNothing(),
             {"+ grid:a = int 1 2 3"}, {"nc_" + operation + "(ncid, 6, \"a\", 4, 3, input 5)"}},
            {operation + " of no number", On::sampleDefine,
             {("nc_" + operation).c_str(), ncid, varid("grid"), "a", 5, empty(member.hostClass, {1, 0})}, givesNothing(),
             {"+ grid:a = float "}},
        });
        // clang-format on
    }
    return list;
}

INSTANTIATE_TEST_SUITE_P(AttributeWrite, Conformance, testing::ValuesIn(rows()), titleOf);
INSTANTIATE_TEST_SUITE_P(AttributeWriteMembers, Conformance, testing::ValuesIn(eachMember()),
                         titleOf);

} // namespace
} // namespace tessel::test
