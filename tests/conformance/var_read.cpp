// tests/conformance/var_read.cpp: reading whole variables.
#include "support/conformance.hpp"
#include "support/members.hpp"
#include "support/probe.hpp"

#include <netcdf.h>

#include <array>
#include <cmath>
#include <limits>
#include <string>

namespace tessel::test {
namespace {

using namespace std::string_literals;

std::string failed(const std::string &why) {
    return libraryFailed("Variable data retrieval failed", why);
}

const Outcome outOfRange = fails("TESSEL:netcdf:getVar:mathResultNotRepresentable",
                                 failed("NetCDF: Numeric conversion not representable"));
const Outcome textAndNumbers = fails("TESSEL:netcdf:getVar:attemptToConvertBetweenTextAndNumbers",
                                     failed("NetCDF: Attempt to convert between text & numbers"));

// clang-format off
Rows rows() {
    return {
        {"without dimensions", On::sample, {"get_var_double", ncid, varid("height")}, gives({1.5})},
        {"without dimensions, with its fraction cut off", On::sample, {"get_var_int", ncid, varid("height")}, gives({int32s({1})})},
        {"one dimension is a column", On::sample, {"get_var_short", ncid, varid("level")},
         gives({shaped({5, 1}, int16s({0, 1, 2, 3, 4}))}), {},
         {"nc_inq_varndims(ncid, 4, out)", "nc_inq_vardimid(ncid, 4, out)", "nc_inq_dimlen(ncid, 3, out)",
          "tsCreateUninitNumericArray({5, 1}, int16)", "nc_get_var_short(ncid, 4, result)"}},
        {"two dimensions", On::sample, {"nc_get_var_int", ncid, varid("count")},
         gives({shaped({5, 3}, int32s({0, 1, 2, 3, 4, 100, 101, 102, 103, 104, 200, 201, 202, 203, 204}))})},
        {"three dimensions, the unlimited one among them", On::sample, {"get_var_float", ncid, varid("temp")},
         gives({shaped({4, 3, 2}, singles({    0,     1,     2,     3,   100,   101,   102,   103,   200,   201,   202,   203,
                                           10000, 10001, 10002, 10003, 10100, 10101, 10102, 10103, 10200, 10201, 10202, 10203}))}), {},
         {"nc_inq_varndims(ncid, 1, out)", "nc_inq_vardimid(ncid, 1, out)", "nc_inq_dimlen(ncid, 0, out)", "nc_inq_dimlen(ncid, 1, out)",
          "nc_inq_dimlen(ncid, 2, out)", "tsCreateUninitNumericArray({4, 3, 2}, single)", "nc_get_var_float(ncid, 1, result)"}},
        {"with the ids as int32", On::sampleRead, {"get_var_double", ncid, int32s({7})}, gives({shaped({2, 1}, doubles({0, 1}))})},
        {"bytes as they are", On::sample, {"get_var_schar", ncid, varid("mask")}, gives({shaped({4, 1}, int8s({-128, -1, 0, 127}))})},
        {"bytes as unsigned ones", On::sample, {"get_var_uchar", ncid, varid("mask")}, gives({shaped({4, 1}, uint8s({128, 255, 0, 127}))})},
        {"bytes as shorts", On::sample, {"get_var_short", ncid, varid("mask")}, gives({shaped({4, 1}, int16s({-128, -1, 0, 127}))})},
        {"bytes as doubles", On::sample, {"get_var_double", ncid, varid("mask")}, gives({shaped({4, 1}, doubles({-128, -1, 0, 127}))})},
        {"what only a double can be", On::sample, {"get_var_double", ncid, varid("extremes")},
         gives({shaped({5, 1}, doubles({std::nan(""), -std::numeric_limits<double>::infinity(), 1e300, -0.0, 2.5}))})},

        {"no records", On::noRecords, {"get_var_float", ncid, varid("temp")}, gives({empty(tsSINGLE, {4, 3, 0})}), {},
         {"nc_inq_varndims(ncid, 1, out)", "nc_inq_vardimid(ncid, 1, out)", "nc_inq_dimlen(ncid, 0, out)", "nc_inq_dimlen(ncid, 1, out)",
          "nc_inq_dimlen(ncid, 2, out)", "tsCreateUninitNumericArray({4, 3, 0}, single)", "nc_get_var_float(ncid, 1, result)"}},
        {"no records of one number each", On::noRecords, {"get_var_double", ncid, varid("time")}, gives({empty(tsDOUBLE, {0, 1})})},
        {"no records of text", On::noRecords, {"get_var_text", ncid, varid("flag")}, gives({empty(tsCHAR, {0, 1})}), {},
         {"nc_inq_varndims(ncid, 11, out)", "nc_inq_vardimid(ncid, 11, out)", "nc_inq_dimlen(ncid, 0, out)", "tsCreateCharArray({0, 1})",
          "tsCalloc(1, 1)", "nc_get_var_text(ncid, 11, block)", "tsFree(block)"}},

        {"text, a string a column, its bytes widened with their signs", On::sample, {"get_var_text", ncid, varid("name")},
         gives({shaped({10, 3}, codes({'f', 'i', 'r', 's', 't', ' ', ' ', ' ', ' ', ' ',
                                       'c', 'a', 'f', 0xFFE9, 0xFF80, 0xFFFF, 0x7F, 0, 0, 0,
                                       't', 'h', 'i', 'r', 'd', ' ', ' ', 'e', 'n', 'd'}))}), {},
         {"nc_inq_varndims(ncid, 3, out)", "nc_inq_vardimid(ncid, 3, out)", "nc_inq_dimlen(ncid, 1, out)", "nc_inq_dimlen(ncid, 4, out)",
          "tsCreateCharArray({10, 3})", "tsCalloc(31, 1)", "nc_get_var_text(ncid, 3, block)", "tsFree(block)"}},
        {"text does not end before a zero byte", On::sample, {"nc_get_var_text", ncid, varid("label")},
         gives({shaped({5, 1}, codes({'a', 0, 0xFFE9, 'z', '!'}))})},
        {"one character", On::sample, {"get_var_text", ncid, varid("letter")}, gives({"Q"})},
        {"a character a record", On::sample, {"get_var_text", ncid, varid("flag")}, gives({shaped({2, 1}, "NY")})},

        {"numbers that do not fit float", On::sample, {"get_var_float", ncid, varid("extremes")}, outOfRange},
        {"numbers that do not fit int", On::sample, {"get_var_int", ncid, varid("extremes")}, outOfRange, {},
         {"nc_inq_varndims(ncid, 10, out)", "nc_inq_vardimid(ncid, 10, out)", "nc_inq_dimlen(ncid, 3, out)",
          "tsCreateUninitNumericArray({5, 1}, int32)", "nc_get_var_int(ncid, 10, array)", "nc_strerror(-60)"}},
        {"numbers that do not fit byte", On::sample, {"get_var_schar", ncid, varid("count")}, outOfRange},
        {"numbers that do not fit an unsigned byte", On::sample, {"get_var_uchar", ncid, varid("grid")}, outOfRange},
        {"numbers that do not fit short", On::sample, {"get_var_short", ncid, varid("extremes")}, outOfRange},
        {"numbers are no text, and all is given back before that is told", On::sample, {"get_var_text", ncid, varid("level")}, textAndNumbers, {},
         {"nc_inq_varndims(ncid, 4, out)", "nc_inq_vardimid(ncid, 4, out)", "nc_inq_dimlen(ncid, 3, out)", "tsCreateCharArray({5, 1})",
          "tsCalloc(6, 1)", "nc_get_var_text(ncid, 4, block)", "tsFree(block)", "nc_strerror(-56)"}},

        {"in define mode", On::sampleDefine, {"get_var_double", ncid, varid("grid")},
         fails("TESSEL:netcdf:getVar:operationNotAllowedInDefineMode", failed("NetCDF: Operation not allowed in define mode"))},
        {"a variable that there is not", On::sample, {"get_var_double", ncid, 99},
         fails("TESSEL:netcdf:getVar:numDimsInquiry:variableNotFound",
               "Unable to retrieve number of variable's dimensions, library error message \"NetCDF: Variable not found\""), {},
         {"nc_inq_varndims(ncid, 99, out)", "nc_strerror(-49)"}},
        {"the dataset is no variable", On::sample, {"get_var_double", ncid, -1},
         fails("TESSEL:netcdf:getVar:numDimsInquiry:variableNotFound",
               "Unable to retrieve number of variable's dimensions, library error message \"NetCDF: Variable not found\"")},
        {"a dataset that there is not", On::nothing, {"get_var_text", 5, 0},
         fails("TESSEL:netcdf:getVar:numDimsInquiry:notNetcdfID",
               "Unable to retrieve number of variable's dimensions, library error message \"NetCDF: Not a valid ID\"")},
    };
}

/// Each member: small numbers in its own class, straight into the result; and the wrong kind.
Rows eachMember() {
    Rows list;
    for (const Member &member : numericMembers()) {
        const std::string operation = "get_var_" + member.suffix;
        list.insert(list.end(), {
            {operation + " of numbers", On::sample, {operation.c_str(), ncid, varid("level")},
             gives({shaped({5, 1}, wholes(member.hostClass, {0, 1, 2, 3, 4}))}), {},
             {"nc_inq_varndims(ncid, 4, out)", "nc_inq_vardimid(ncid, 4, out)", "nc_inq_dimlen(ncid, 3, out)",
              "tsCreateUninitNumericArray({5, 1}, " + member.className + ")", "nc_" + operation + "(ncid, 4, result)"}},
            {operation + " of text", On::sample, {("nc_" + operation).c_str(), ncid, varid("label")}, textAndNumbers},
        });
    }
    return list;
}
// clang-format on

/// This family counts the characters that it hands over in 32 bits, with a sign: of 2 to the 31st
/// it hands over none, and of 2 to the 32nd and five, five. The library is not asked, so that no
/// memory is touched that need not be there.
TEST(VarRead, CharactersAreCountedIn32Bits) {
    struct Case {
        std::array<std::size_t, 2> shape; ///< in the library's order
        std::u16string characters;        ///< the first that are handed over, of "abcdefg"
    };
    for (const auto &[shape, characters] :
         {Case{{0x8000, 0x10000}, std::u16string(7, 0)}, Case{{3, 0x55555557}, u"abcde\0\0"s}}) {
        const Scene scene(On::nothing);
        int id = -1;
        want(nc_create(scene.path("huge.nc").c_str(), NC_64BIT_DATA, &id));
        int old = 0;
        want(nc_set_fill(id, NC_NOFILL, &old));
        std::array<int, 2> dimids{};
        want(nc_def_dim(id, "y", shape[0], &dimids[0]));
        want(nc_def_dim(id, "x", shape[1], &dimids[1]));
        int variable = -1;
        want(nc_def_var(id, "v", NC_CHAR, dimids.size(), dimids.data(), &variable));
        want(nc_enddef(id));
        {
            Probe probe;
            probe.answer("nc_get_var_text", NC_NOERR);
            probe.leave("abcdefg");
            const Results results = netcdf()("get_var_text", id, variable);
            ASSERT_EQ(results[0].size(), shape[0] * shape[1]);
            const auto found = results[0].elements<tsChar>();
            EXPECT_EQ(std::u16string(found.begin(), found.begin() + 7), characters);
        }
        want(nc_abort(id));
    }
}

INSTANTIATE_TEST_SUITE_P(VarRead, Conformance, testing::ValuesIn(rows()), titleOf);
INSTANTIATE_TEST_SUITE_P(VarReadMembers, Conformance, testing::ValuesIn(eachMember()), titleOf);

} // namespace
} // namespace tessel::test
