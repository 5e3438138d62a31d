// tests/conformance/nothing.cpp: what is empty, by a host that has no memory for it. Such a host
// answers NULL for the data of an empty array, given or made, and for a request of no bytes.
#include "support/conformance.hpp"
#include "support/members.hpp"

namespace tessel::test {
namespace {

const Outcome noVariableData =
    refuses("TESSEL:netcdf:emptyVariableData", "Variable data must not be empty.");

// clang-format off
Rows rows() {
    return {
        {"an empty block of text still has room for its end", On::sample, {"get_vara_text", ncid, varid("name"), doubles({0, 0}), doubles({0, 2})},
         gives({empty(tsCHAR, {0, 2})}), {},
         {"nc_inq_varndims(ncid, 3, out)", "tsCreateCharArray({0, 2})", "tsCalloc(1, 2)",
          "nc_get_vara_text(ncid, 3, {0, 0}, {2, 0}, block)", "tsFree(block)"}, nullForNothing()},
        {"an empty strided block of text", On::sample, {"get_vars_text", ncid, varid("label"), 0, 0, 1}, gives({empty(tsCHAR, {0, 1})}), {},
         {"nc_inq_varndims(ncid, 8, out)", "nc_inq_vardimid(ncid, 8, out)", "tsCreateCharArray({0, 1})", "tsCalloc(1, 2)",
          "nc_get_vars_text(ncid, 8, {0}, {0}, {1}, block)", "tsFree(block)"}, nullForNothing()},
        {"text without records", On::noRecords, {"get_var_text", ncid, varid("flag")}, gives({empty(tsCHAR, {0, 1})}), {},
         {"nc_inq_varndims(ncid, 11, out)", "nc_inq_vardimid(ncid, 11, out)", "nc_inq_dimlen(ncid, 0, out)", "tsCreateCharArray({0, 1})",
          "tsCalloc(1, 1)", "nc_get_var_text(ncid, 11, block)", "tsFree(block)"}, nullForNothing()},
        {"an attribute without text: no buffer, and yet memory for the library", On::sample, {"get_att_text", ncid, varid("temp"), "blank"}, gives({""}), {},
         {"nc_inq_att(ncid, 1, \"blank\", out, out)", "tsCalloc(0, 2)", "nc_get_att_text(ncid, 1, \"blank\", memory of its own)",
          "tsCreateString(\"\")"}, nullForNothing()},
        {"an attribute without numbers, as text", On::sample, {"get_att_text", ncid, varid("temp"), "none"}, gives({""}), {},
         {"nc_inq_att(ncid, 1, \"none\", out, out)", "tsCalloc(0, 2)", "nc_get_att_text(ncid, 1, \"none\", memory of its own)",
          "tsCreateString(\"\")"}, nullForNothing()},
        {"writing an attribute without text", On::sampleDefine, {"put_att_text", ncid, varid("grid"), "a", ""}, givesNothing(), {"+ grid:a = char \"\""},
         {"nc_put_att_text(ncid, 6, \"a\", 0, NULL)"}, nullForNothing()},

        {"a variable without dimensions is defined", On::sampleDefine, {"def_var", ncid, "v", 6, empty(tsDOUBLE)}, gives({12}),
         {"+ variable 12: double v()", "+ v = 9.969209968386869e+36"}, {R"(nc_def_var(ncid, "v", 6, 0, {}, out))", "tsCreateDoubleScalar(12)"}, nullForNothing()},
        {"and its list of dimensions given", On::sample, {"inq_var", ncid, varid("height")}, gives({"height", 6, empty(tsDOUBLE), 0}), {},
         {}, nullForNothing()},
        {"a name without characters", On::sampleDefine, {"def_dim", ncid, "", 3},
         fails("TESSEL:netcdf:defDim:nameContainsIllegalCharacters",
               libraryFailed("Dimension definition operation failed", "NetCDF: Name contains illegal characters")), {},
         {R"(nc_def_dim(ncid, "", 3, out))", "nc_strerror(-59)"}, nullForNothing()},

        {"no operation", On::nothing, {""}, refuses("TESSEL:netcdf:InvalidOperation", "Unrecognized operation:  \"\""), {}, {}, nullForNothing()},
        {"no id", On::nothing, {"sync", empty(tsDOUBLE)}, refuses("TESSEL:netcdf:emptySetID", "ncid argument cannot be []"), {}, {}, nullForNothing()},
        {"no mode", On::nothing, {"open", file("a.nc"), ""}, refuses("TESSEL:netcdf:emptySetMode", "mode argument cannot be []"), {}, {}, nullForNothing()},
        {"no start", On::sample, {"get_vara_double", ncid, varid("level"), empty(tsINT8), 1},
         refuses("TESSEL:netcdf:startArgumentIsEmpty", "start argument cannot be empty."), {}, {}, nullForNothing()},
        {"no stride", On::sample, {"get_vars_double", ncid, varid("level"), 0, 1, ""},
         refuses("TESSEL:netcdf:strideArgumentIsEmpty", "stride argument cannot be empty."), {}, {}, nullForNothing()},
    };
}

/// Each numeric member of the families that take or give nothing: the library is called all the
/// same, and told that there is no memory.
Rows numbers() {
    Rows list;
    for (const Member &member : numericMembers()) {
        const std::string getAtt = "get_att_" + member.suffix;
        const std::string putAtt = "put_att_" + member.suffix;
        const std::string getVar = "get_var_" + member.suffix;
        const std::string getVara = "get_vara_" + member.suffix;
        const std::string getVars = "get_vars_" + member.suffix;
        list.insert(list.end(), {
            {getAtt, On::sample, {getAtt.c_str(), ncid, varid("temp"), "none"}, gives({empty(member.hostClass)}), {},
             {"nc_inq_att(ncid, 1, \"none\", out, out)", "tsCreateUninitNumericArray({0, 0}, " + member.className + ")",
              "nc_" + getAtt + "(ncid, 1, \"none\", NULL)"}, nullForNothing()},
            {putAtt, On::sampleDefine, {putAtt.c_str(), ncid, varid("grid"), "a", 3, empty(member.hostClass)}, givesNothing(), {"+ grid:a = short "},
             {"nc_" + putAtt + "(ncid, 6, \"a\", 3, 0, NULL)"}, nullForNothing()},
            {getVar, On::noRecords, {getVar.c_str(), ncid, varid("time")}, gives({empty(member.hostClass, {0, 1})}), {},
             {"nc_inq_varndims(ncid, 7, out)", "nc_inq_vardimid(ncid, 7, out)", "nc_inq_dimlen(ncid, 0, out)",
              "tsCreateUninitNumericArray({0, 1}, " + member.className + ")", "nc_" + getVar + "(ncid, 7, NULL)"}, nullForNothing()},
            {getVara, On::sample, {getVara.c_str(), ncid, varid("count"), doubles({0, 0}), doubles({2, 0})}, gives({empty(member.hostClass, {2, 0})}), {},
             {"nc_inq_varndims(ncid, 5, out)", "tsCreateUninitNumericArray({2, 0}, " + member.className + ")",
              "nc_" + getVara + "(ncid, 5, {0, 0}, {0, 2}, NULL)"}, nullForNothing()},
            {getVars, On::sample, {getVars.c_str(), ncid, varid("count"), doubles({0, 0}), doubles({0, 2}), doubles({1, 1})},
             gives({empty(member.hostClass, {0, 2})}), {},
             {"nc_inq_varndims(ncid, 5, out)", "nc_inq_vardimid(ncid, 5, out)", "tsCreateUninitNumericArray({0, 2}, " + member.className + ")",
              "nc_" + getVars + "(ncid, 5, {0, 0}, {2, 0}, {1, 1}, NULL)"}, nullForNothing()},
        });
    }
    return list;
}

/// Each member that writes a variable refuses to be given nothing.
Rows unwritten() {
    Rows list;
    for (const Member &member : members) {
        const Value none = empty(member.hostClass);
        const std::string putVar = "put_var_" + member.suffix;
        const std::string putVar1 = "put_var1_" + member.suffix;
        const std::string putVara = "put_vara_" + member.suffix;
        const std::string putVars = "put_vars_" + member.suffix;
        list.insert(list.end(), {
            {putVar,  On::noRecords, {putVar.c_str(), ncid, varid("time"), none},           noVariableData, {}, {}, nullForNothing()},
            {putVar1, On::sample,    {putVar1.c_str(), ncid, varid("level"), 0, none},      noVariableData, {}, {}, nullForNothing()},
            {putVara, On::sample,    {putVara.c_str(), ncid, varid("level"), 0, 0, none},   noVariableData, {}, {}, nullForNothing()},
            {putVars, On::sample,    {putVars.c_str(), ncid, varid("level"), 0, 0, 1, none}, noVariableData, {}, {}, nullForNothing()},
        });
    }
    return list;
}
// clang-format on

INSTANTIATE_TEST_SUITE_P(Nothing, Conformance, testing::ValuesIn(rows()), titleOf);
INSTANTIATE_TEST_SUITE_P(NothingNumbers, Conformance, testing::ValuesIn(numbers()), titleOf);
INSTANTIATE_TEST_SUITE_P(NothingUnwritten, Conformance, testing::ValuesIn(unwritten()), titleOf);

} // namespace
} // namespace tessel::test
