// tests/conformance/block_write.cpp: writing single elements and contiguous blocks.
#include "support/conformance.hpp"
#include "support/library.hpp"
#include "support/members.hpp"

namespace tessel::test {
namespace {

std::string elementFailed(const std::string &why) {
    return libraryFailed("Single datum write operation failed", why);
}
std::string blockFailed(const std::string &why) {
    return libraryFailed("Contiguous data write failed", why);
}

Outcome wrongLength(const std::string &identifier, const std::string &which,
                    const std::string &rest) {
    return fails("TESSEL:netcdf:" + identifier,
                 "The length of the " + which + " argument for " + rest + ".");
}

Outcome wrongSize(const std::string &implied, const std::string &given) {
    return fails("TESSEL:netcdf:putVara:dataSizeMismatch",
                 "The number of elements implied by the count argument (" + implied +
                     ") does not equal the number of data elements (" + given + ").");
}

/// The sample's temperatures, and a record of them that nobody wrote.
const std::string temperatures =
    "0 1 2 3 100 101 102 103 200 201 202 203 "
    "10000 10001 10002 10003 10100 10101 10102 10103 10200 10201 10202 10203";
const std::string filledRecord =
    "9.96921e+36 9.96921e+36 9.96921e+36 9.96921e+36 9.96921e+36 9.96921e+36 "
    "9.96921e+36 9.96921e+36 9.96921e+36 9.96921e+36 9.96921e+36 9.96921e+36";

const Lines levelInquiry = {"nc_inq_var(ncid, 4, out, NULL, out, NULL, NULL)"};

// clang-format off
Rows elements() {
    const Outcome notOne = refuses("TESSEL:netcdf:putVar1:dataSizeMismatch", "Specifying a single index argument implies that only one data element be provided.");
    return {
        {"one of a row", On::sample, {"put_var1_short", ncid, varid("level"), 3, int16s({-7})}, givesNothing(),
         {"- level = 0 1 2 3 4", "+ level = 0 1 2 -7 4"},
         {"nc_inq_var(ncid, 4, out, NULL, out, NULL, NULL)", "nc_put_var1_short(ncid, 4, {3}, input 4)"}},
        {"the fastest position comes first", On::sample, {"nc_put_var1_int", ncid, varid("count"), doubles({3, 1}), int32s({-7})}, givesNothing(),
         {"- count = 0 1 2 3 4 100 101 102 103 104 200 201 202 203 204", "+ count = 0 1 2 3 4 100 101 102 -7 104 200 201 202 203 204"},
         {"nc_inq_var(ncid, 5, out, NULL, out, NULL, NULL)", "nc_put_var1_int(ncid, 5, {1, 3}, input 4)"}},
        {"a new record", On::sample, {"put_var1_double", ncid, varid("time"), uint8s({2}), 9}, givesNothing(),
         {"- dimension 0: t = 2, unlimited",
          "- temp = " + temperatures,
          "- time = 0 1", "- flag = \"NY\"", "+ dimension 0: t = 3, unlimited",
          "+ temp = " + temperatures + " " + filledRecord,
          "+ time = 0 1 9", R"(+ flag = "NY\x00")"}},
        {"a character", On::sample, {"put_var1_text", ncid, varid("label"), 1, "x"}, givesNothing(),
         {R"(- label = "a\x00\xE9z!")", R"(+ label = "ax\xE9z!")"},
         {"nc_inq_var(ncid, 8, out, NULL, out, NULL, NULL)", "tsCalloc(1, 1)", "nc_put_var1_text(ncid, 8, {1}, block)", "tsFree(block)"}},
        {"of a character the low byte", On::sample, {"nc_put_var1_text", ncid, varid("label"), 1, codes({0x20AC})}, givesNothing(),
         {R"(- label = "a\x00\xE9z!")", R"(+ label = "a\xAC\xE9z!")"}},

        {"beyond the end", On::sample, {"put_var1_short", ncid, varid("level"), 5, int16s({1})},
         fails("TESSEL:netcdf:putVar1:indexExceedsDimensionBound", elementFailed("NetCDF: Index exceeds dimension bound")), {},
         {"nc_inq_var(ncid, 4, out, NULL, out, NULL, NULL)", "nc_put_var1_short(ncid, 4, {5}, input 4)", "nc_strerror(-40)"}},
        {"a number that does not fit", On::sample, {"put_var1_double", ncid, varid("mask"), 0, 300},
         fails("TESSEL:netcdf:putVar1:mathResultNotRepresentable", elementFailed("NetCDF: Numeric conversion not representable")),
         {"- mask = -128 -1 0 127", std::string("+ mask = ").append(byteOf300).append(" -1 0 127")}},
        {"a character into numbers; the buffer is given back before that is told", On::sample, {"put_var1_text", ncid, varid("level"), 0, "a"},
         fails("TESSEL:netcdf:putVar1:attemptToConvertBetweenTextAndNumbers", elementFailed("NetCDF: Attempt to convert between text & numbers")), {},
         {"nc_inq_var(ncid, 4, out, NULL, out, NULL, NULL)", "tsCalloc(1, 1)", "nc_put_var1_text(ncid, 4, {0}, block)", "tsFree(block)", "nc_strerror(-56)"}},
        {"two elements", On::sample, {"put_var1_double", ncid, varid("level"), 0, doubles({1, 2})}, notOne},
        {"two elements and a variable that there is not", On::sample, {"put_var1_double", ncid, 99, 0, doubles({1, 2})}, notOne},
        {"two characters", On::sample, {"put_var1_text", ncid, varid("label"), 0, "ab"}, notOne},
        {"two elements of the wrong class", On::sample, {"put_var1_double", ncid, varid("level"), 0, int32s({1, 2})},
         refuses("TESSEL:netcdf:put_var1_double:badDatatype", "The input datatype for put_var1_double must be double precision, not int32.")},
        {"the wrong class, by the long name", On::sample, {"nc_put_var1_float", ncid, varid("level"), 0, 1},
         refuses("TESSEL:netcdf:put_var1_float:badDatatype", "The input datatype for put_var1_float must be single precision, not double.")},
        {"no element", On::sample, {"put_var1_double", ncid, varid("level"), 0, empty(tsDOUBLE)},
         refuses("TESSEL:netcdf:emptyVariableData", "Variable data must not be empty.")},
        {"too long an index", On::sample, {"put_var1_double", ncid, varid("level"), doubles({0, 0}), 1},
         wrongLength("putVar1:badStartLength", "start", "level must be 1 instead of 2"), {}, levelInquiry},
        {"too short an index", On::sample, {"put_var1_double", ncid, varid("temp"), 0, 1},
         wrongLength("putVar1:badStartLength", "start", "temp must be 3 instead of 1")},
        {"a variable without dimensions has no index", On::sample, {"put_var1_double", ncid, varid("height"), 0, 1},
         wrongLength("putVar1:badStartLength", "start", "height must be 0 instead of 1")},
        {"not even an empty one", On::sample, {"put_var1_double", ncid, varid("height"), empty(tsDOUBLE), 1},
         refuses("TESSEL:netcdf:startArgumentIsEmpty", "start argument cannot be empty.")},
        {"a variable that there is not, and a wrong index", On::sample, {"put_var1_double", ncid, 99, doubles({0, 0, 0, 0}), 1},
         fails("TESSEL:netcdf:putVar1:inqVarNDimsFailure", "Unable to read the number of dimensions, \"NetCDF: Variable not found\"."), {},
         {"nc_inq_var(ncid, 99, out, NULL, out, NULL, NULL)", "nc_strerror(-49)"}},
        {"into a read-only dataset", On::sampleRead, {"put_var1_double", ncid, varid("level"), 0, 1},
         fails("TESSEL:netcdf:putVar1:writeToReadOnly", elementFailed("NetCDF: Write to read only"))},
    };
}

Rows blocks() {
    return {
        {"a block of two dimensions", On::sample, {"put_vara_int", ncid, varid("count"), doubles({3, 1}), doubles({2, 2}), shaped({2, 2}, int32s({-1, -2, -3, -4}))},
         givesNothing(),
         {"- count = 0 1 2 3 4 100 101 102 103 104 200 201 202 203 204", "+ count = 0 1 2 3 4 100 101 102 -1 -2 200 201 202 -3 -4"},
         {"nc_inq_var(ncid, 5, out, NULL, out, NULL, NULL)", "nc_put_vara_int(ncid, 5, {1, 3}, {2, 2}, input 5)"}},
        {"in any shape", On::sample, {"nc_put_vara_int", ncid, varid("count"), doubles({0, 0}), doubles({2, 3}), int32s({-1, -2, -3, -4, -5, -6})},
         givesNothing(),
         {"- count = 0 1 2 3 4 100 101 102 103 104 200 201 202 203 204", "+ count = -1 -2 2 3 4 -3 -4 102 103 104 -5 -6 202 203 204"},
         {"nc_inq_var(ncid, 5, out, NULL, out, NULL, NULL)", "nc_put_vara_int(ncid, 5, {0, 0}, {3, 2}, input 5)"}},
        {"a new record of one number", On::noRecords, {"put_vara_double", ncid, varid("time"), 0, 1, 9}, givesNothing(),
         {"- dimension 0: t = 0, unlimited", "- temp = ", "- time = ", "- flag = \"\"", "+ dimension 0: t = 1, unlimited",
          "+ temp = " + filledRecord,
          "+ time = 9", R"(+ flag = "\x00")"}},
        {"text", On::sample, {"put_vara_text", ncid, varid("name"), doubles({3, 0}), doubles({2, 3}), "abcdef"}, givesNothing(),
         {R"(- name = "first     caf\xE9\x80\xFF\x7F\x00\x00\x00third  end")", R"(+ name = "firab     cafcd\xFF\x7F\x00\x00\x00thief  end")"},
         {"nc_inq_var(ncid, 3, out, NULL, out, NULL, NULL)", "tsCalloc(6, 1)", "nc_put_vara_text(ncid, 3, {0, 3}, {3, 2}, block)", "tsFree(block)"}},
        {"text into numbers; the buffer is given back before that is told", On::sample, {"put_vara_text", ncid, varid("level"), 0, 2, "ab"},
         fails("TESSEL:netcdf:putVara:attemptToConvertBetweenTextAndNumbers", blockFailed("NetCDF: Attempt to convert between text & numbers")), {},
         {"nc_inq_var(ncid, 4, out, NULL, out, NULL, NULL)", "tsCalloc(2, 1)", "nc_put_vara_text(ncid, 4, {0}, {2}, block)", "tsFree(block)", "nc_strerror(-56)"}},

        {"fewer elements than counted", On::sample, {"put_vara_double", ncid, varid("grid"), doubles({0, 0}), doubles({2, 3}), doubles({1, 2, 3, 4, 5})}, wrongSize("6", "5"), {},
         {"nc_inq_var(ncid, 6, out, NULL, out, NULL, NULL)"}},
        {"more elements than counted", On::sample, {"put_vara_text", ncid, varid("label"), 0, 2, "abc"}, wrongSize("2", "3")},
        {"a count of zero", On::sample, {"put_vara_double", ncid, varid("grid"), doubles({0, 0}), doubles({2, 0}), 1}, wrongSize("0", "1")},
        {"a count of zero and no data", On::sample, {"put_vara_double", ncid, varid("grid"), doubles({0, 0}), doubles({2, 0}), empty(tsDOUBLE)},
         refuses("TESSEL:netcdf:emptyVariableData", "Variable data must not be empty.")},
        {"a count of minus one shows its low half", On::sample, {"put_vara_double", ncid, varid("level"), 0, -1, 1}, wrongSize("4294967295", "1")},
        {"a count of 2 to the 32nd shows as zero", On::sample, {"put_vara_double", ncid, varid("level"), 0, 0x1p32, 1}, wrongSize("0", "1")},
        {"a product of 2 to the 32nd and 6 shows as 6", On::sample, {"put_vara_double", ncid, varid("level"), 0, 0x1p32 + 6, doubles({1, 2})}, wrongSize("6", "2")},
        {"counts whose product wraps around to the right number go to the library", On::sample,
         {"put_vara_double", ncid, varid("grid"), doubles({0, 0}), doubles({-1, -1}), 1},
         fails("TESSEL:netcdf:putVara:startPlusCountExceedsDimensionBound", blockFailed("NetCDF: Start+count exceeds dimension bound")), {},
         {"nc_inq_var(ncid, 6, out, NULL, out, NULL, NULL)",
          "nc_put_vara_double(ncid, 6, {0, 0}, {18446744073709551615, 18446744073709551615}, input 5)", "nc_strerror(-57)"},
         answering("nc_put_vara_double", -57)},

        {"beyond the end", On::sample, {"put_vara_short", ncid, varid("level"), 4, 2, int16s({1, 2})},
         fails("TESSEL:netcdf:putVara:startPlusCountExceedsDimensionBound", blockFailed("NetCDF: Start+count exceeds dimension bound")), {},
         {"nc_inq_var(ncid, 4, out, NULL, out, NULL, NULL)", "nc_put_vara_short(ncid, 4, {4}, {2}, input 5)", "nc_strerror(-57)"}},
        {"numbers that do not fit", On::sample, {"put_vara_double", ncid, varid("mask"), 1, 2, doubles({300, 2})},
         fails("TESSEL:netcdf:putVara:mathResultNotRepresentable", blockFailed("NetCDF: Numeric conversion not representable")),
         {"- mask = -128 -1 0 127", std::string("+ mask = -128 ").append(byteOf300).append(" 2 127")}},
        {"too short a start", On::sample, {"put_vara_double", ncid, varid("temp"), doubles({0, 0}), doubles({1, 1, 1}), 1},
         wrongLength("putVara:badStartLength", "start", "temp must be 3 instead of 2"), {}, {"nc_inq_var(ncid, 1, out, NULL, out, NULL, NULL)"}},
        {"too long a count", On::sample, {"put_vara_double", ncid, varid("level"), 0, doubles({1, 1}), 1},
         wrongLength("putVara:badCountLength", "count", "level must be 1 instead of 2"), {}, levelInquiry},
        {"start and count both wrong", On::sample, {"put_vara_double", ncid, varid("temp"), 0, 1, 1},
         wrongLength("putVara:badStartLength", "start", "temp must be 3 instead of 1")},
        {"count and size both wrong", On::sample, {"put_vara_double", ncid, varid("temp"), doubles({0, 0, 0}), doubles({5, 5}), 1},
         wrongLength("putVara:badCountLength", "count", "temp must be 3 instead of 2")},
        {"a variable without dimensions has no blocks", On::sample, {"put_vara_double", ncid, varid("height"), 0, 1, 1},
         wrongLength("putVara:badStartLength", "start", "height must be 0 instead of 1")},
        {"not even empty ones", On::sample, {"put_vara_double", ncid, varid("height"), empty(tsDOUBLE), empty(tsDOUBLE), 1},
         refuses("TESSEL:netcdf:startArgumentIsEmpty", "start argument cannot be empty.")},
        {"a variable that there is not, and a wrong count", On::sample, {"put_vara_double", ncid, 99, 0, 5, 1},
         fails("TESSEL:netcdf:putVara:inqVarNDimsFailure", "Unable to read the number of dimensions, \"NetCDF: Variable not found\"."), {},
         {"nc_inq_var(ncid, 99, out, NULL, out, NULL, NULL)", "nc_strerror(-49)"}},
        {"a variable that there is not, and data of the wrong class", On::sample, {"put_vara_int", ncid, 99, 0, 1, 1},
         refuses("TESSEL:netcdf:put_vara_int:badDatatype", "The input datatype for put_vara_int must be int32, not double.")},
        {"in define mode", On::sampleDefine, {"put_vara_double", ncid, varid("level"), 0, 1, 1},
         fails("TESSEL:netcdf:putVara:operationNotAllowedInDefineMode", blockFailed("NetCDF: Operation not allowed in define mode"))},
    };
}

/// Each numeric member of both families, straight from the input.
Rows eachMember() {
    Rows list;
    for (const Member &member : numericMembers()) {
        const std::string element = "put_var1_" + member.suffix;
        const std::string block = "put_vara_" + member.suffix;
        list.insert(list.end(), {
            {element + " of a number", On::sample, {element.c_str(), ncid, varid("level"), 2, wholes(member.hostClass, {9})}, givesNothing(),
             {"- level = 0 1 2 3 4", "+ level = 0 1 9 3 4"},
             {"nc_inq_var(ncid, 4, out, NULL, out, NULL, NULL)", "nc_" + element + "(ncid, 4, {2}, input 4)"}},
            {element + " into text", On::sample, {("nc_" + element).c_str(), ncid, varid("label"), 2, wholes(member.hostClass, {9})},
             fails("TESSEL:netcdf:putVar1:attemptToConvertBetweenTextAndNumbers", elementFailed("NetCDF: Attempt to convert between text & numbers"))},
            {block + " of numbers", On::sample, {block.c_str(), ncid, varid("level"), 1, 3, wholes(member.hostClass, {7, 8, 9})}, givesNothing(),
             {"- level = 0 1 2 3 4", "+ level = 0 7 8 9 4"},
             {"nc_inq_var(ncid, 4, out, NULL, out, NULL, NULL)", "nc_" + block + "(ncid, 4, {1}, {3}, input 5)"}},
            {block + " into text", On::sample, {("nc_" + block).c_str(), ncid, varid("label"), 1, 3, wholes(member.hostClass, {7, 8, 9})},
             fails("TESSEL:netcdf:putVara:attemptToConvertBetweenTextAndNumbers", blockFailed("NetCDF: Attempt to convert between text & numbers"))},
        });
    }
    return list;
}
// clang-format on

INSTANTIATE_TEST_SUITE_P(ElementWrite, Conformance, testing::ValuesIn(elements()), titleOf);
INSTANTIATE_TEST_SUITE_P(BlockWrite, Conformance, testing::ValuesIn(blocks()), titleOf);
INSTANTIATE_TEST_SUITE_P(BlockWriteMembers, Conformance, testing::ValuesIn(eachMember()), titleOf);

} // namespace
} // namespace tessel::test
