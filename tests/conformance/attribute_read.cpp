// tests/conformance/attribute_read.cpp: reading attribute values.
#include "support/conformance.hpp"
#include "support/members.hpp"

namespace tessel::test {
namespace {

std::string inquiryFailed(const std::string &why) {
    return libraryFailed("Attribute inquiry failed", why);
}
std::string retrievalFailed(const std::string &why) {
    return libraryFailed("Attribute retrieval operation failed", why);
}

const Outcome outOfRange = fails("TESSEL:netcdf:getAtt:mathResultNotRepresentable",
                                 retrievalFailed("NetCDF: Numeric conversion not representable"));
const Outcome textAndNumbers =
    fails("TESSEL:netcdf:getAtt:attemptToConvertBetweenTextAndNumbers",
          retrievalFailed("NetCDF: Attempt to convert between text & numbers"));

// clang-format off
Rows rows() {
    return {
        {"doubles as they are", On::sample, {"get_att_double", ncid, varid("temp"), "doubles"},
         gives({doubles({-1.5, -0.0, 0.1, 1e300, 2})}), {},
         {"nc_inq_att(ncid, 1, \"doubles\", out, out)", "tsCreateUninitNumericArray({1, 5}, double)", "nc_get_att_double(ncid, 1, \"doubles\", result)"}},
        {"floats as they are",       On::sample, {"get_att_float", ncid, 1, "floats"}, gives({singles({-1.5F, -0.0F, 0.1F, 1e30F, 2})})},
        {"floats as doubles",        On::sample, {"get_att_double", ncid, 1, "floats"}, gives({doubles({-1.5, -0.0, 0.1F, 1e30F, 2})})},
        {"ints as they are",         On::sample, {"get_att_int", ncid, 1, "ints"},      gives({int32s({-2147483647 - 1, -1, 0, 1, 2147483647})})},
        {"ints as doubles",          On::sample, {"get_att_double", ncid, 1, "ints"},   gives({doubles({-2147483648.0, -1, 0, 1, 2147483647.0})})},
        {"shorts as they are",       On::sample, {"get_att_short", ncid, 1, "shorts"},  gives({int16s({-32768, -1, 0, 1, 32767})})},
        {"shorts as ints",           On::sample, {"get_att_int", ncid, 1, "shorts"},    gives({int32s({-32768, -1, 0, 1, 32767})})},
        {"bytes as they are",        On::sample, {"get_att_schar", ncid, 1, "bytes"},   gives({int8s({-128, -1, 0, 1, 127})})},
        {"bytes as unsigned ones",   On::sample, {"get_att_uchar", ncid, 1, "bytes"},   gives({uint8s({128, 255, 0, 1, 127})})},
        {"bytes as shorts",          On::sample, {"get_att_short", ncid, 1, "bytes"},   gives({int16s({-128, -1, 0, 1, 127})})},
        {"one number of the dataset", On::sample, {"nc_get_att_int", ncid, -1, "version"}, gives({int32s({3})}), {},
         {"nc_inq_att(ncid, -1, \"version\", out, out)", "tsCreateUninitNumericArray({1, 1}, int32)", "nc_get_att_int(ncid, -1, \"version\", result)"}},

        {"doubles do not fit floats",         On::sample, {"get_att_float", ncid, 1, "doubles"}, outOfRange, {},
         {"nc_inq_att(ncid, 1, \"doubles\", out, out)", "tsCreateUninitNumericArray({1, 5}, single)", "nc_get_att_float(ncid, 1, \"doubles\", array)", "nc_strerror(-60)"}},
        {"floats do not fit ints",            On::sample, {"get_att_int", ncid, 1, "floats"},    outOfRange},
        {"ints do not fit shorts",            On::sample, {"get_att_short", ncid, 1, "ints"},    outOfRange},
        {"shorts do not fit bytes",           On::sample, {"get_att_schar", ncid, 1, "shorts"},  outOfRange},
        {"shorts do not fit unsigned bytes",  On::sample, {"get_att_uchar", ncid, 1, "shorts"},  outOfRange},

        {"text", On::sample, {"get_att_text", ncid, varid("temp"), "units"}, gives({"kelvin"}), {},
         {"nc_inq_att(ncid, 1, \"units\", out, out)", "tsCalloc(6, 2)", "nc_get_att_text(ncid, 1, \"units\", block)",
          "tsCreateString(\"kelvin\")", "tsFree(block)"}},
        {"text of the dataset, by the long name", On::sample, {"nc_get_att_text", ncid, -1, "title"}, gives({"Sample"})},
        {"text ends before a zero byte", On::sample, {"get_att_text", ncid, 1, "cut"}, gives({"ab"}), {},
         {"nc_inq_att(ncid, 1, \"cut\", out, out)", "tsCalloc(5, 2)", "nc_get_att_text(ncid, 1, \"cut\", block)",
          "tsCreateString(\"ab\")", "tsFree(block)"}},
        {"text is UTF-8, and a byte that is not is a character", On::sample, {"get_att_text", ncid, 1, "accents"}, gives({"Grüß é"})},
        {"no text", On::sample, {"get_att_text", ncid, 1, "blank"}, gives({""}), {},
         {"nc_inq_att(ncid, 1, \"blank\", out, out)", "tsCalloc(0, 2)", "nc_get_att_text(ncid, 1, \"blank\", memory of its own)",
          "tsCreateString(\"\")", "tsFree(block)"}},
        {"no numbers are no text", On::sample, {"get_att_text", ncid, 1, "none"}, gives({""})},
        {"numbers are no text, and all is given back before that is told", On::sample, {"get_att_text", ncid, 1, "fives"}, textAndNumbers, {},
         {"nc_inq_att(ncid, 1, \"fives\", out, out)", "tsCalloc(5, 2)", "nc_get_att_text(ncid, 1, \"fives\", block)",
          "tsCreateString(\"\")", "tsFree(block)", "nc_strerror(-56)"}},

        {"an attribute that there is not", On::sample, {"get_att_double", ncid, 1, "Units"},
         fails("TESSEL:netcdf:getAtt:attributeNotFound", inquiryFailed("NetCDF: Attribute not found")), {},
         {"nc_inq_att(ncid, 1, \"Units\", out, out)", "nc_strerror(-43)"}},
        {"nor as text", On::sample, {"get_att_text", ncid, 1, "Units"},
         fails("TESSEL:netcdf:getAtt:attributeNotFound", inquiryFailed("NetCDF: Attribute not found")), {},
         {"nc_inq_att(ncid, 1, \"Units\", out, out)", "nc_strerror(-43)"}},
        {"a variable that there is not", On::sample, {"get_att_int", ncid, 99, "units"},
         fails("TESSEL:netcdf:getAtt:variableNotFound", inquiryFailed("NetCDF: Variable not found"))},
        {"a dataset that there is not", On::nothing, {"get_att_int", 5, 0, "units"},
         fails("TESSEL:netcdf:getAtt:notNetcdfID", inquiryFailed("NetCDF: Not a valid ID"))},
        {"in define mode as well", On::sampleDefine, {"get_att_int", ncid, -1, "version"}, gives({int32s({3})})},
    };
}
// clang-format on

/// Each numeric member: numbers as they are, no numbers, and text.
Rows eachMember() {
    Rows list;
    for (const Member &member : numericMembers()) {
        const std::string operation = "get_att_" + member.suffix;
        // clang-format off
        list.insert(list.end(), {
            {operation + " of five numbers", On::sample, {operation.c_str(), ncid, varid("temp"), "fives"},
             gives({wholes(member.hostClass, {1, 2, 3, 4, 5})}), {},
             {"nc_inq_att(ncid, 1, \"fives\", out, out)", "tsCreateUninitNumericArray({1, 5}, " + member.className + ")",
              "nc_" + operation + "(ncid, 1, \"fives\", result)"}},
            {operation + " of no number", On::sample, {("nc_" + operation).c_str(), ncid, varid("temp"), "none"},
             gives({empty(member.hostClass)}), {},
             {"nc_inq_att(ncid, 1, \"none\", out, out)", "tsCreateUninitNumericArray({0, 0}, " + member.className + ")",
              "nc_" + operation + "(ncid, 1, \"none\", result)"}},
            {operation + " of no text", On::sample, {operation.c_str(), ncid, varid("temp"), "blank"}, gives({empty(member.hostClass)})},
            {operation + " of text", On::sample, {operation.c_str(), ncid, varid("temp"), "units"}, textAndNumbers},
        });
        // clang-format on
    }
    return list;
}

INSTANTIATE_TEST_SUITE_P(AttributeRead, Conformance, testing::ValuesIn(rows()), titleOf);
INSTANTIATE_TEST_SUITE_P(AttributeReadMembers, Conformance, testing::ValuesIn(eachMember()),
                         titleOf);

} // namespace
} // namespace tessel::test
