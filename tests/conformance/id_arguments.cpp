// tests/conformance/id_arguments.cpp: ids, names, modes and types, as the library gets them.
//
// Each converter is seen through an operation that hands its result on; where the library would not
// take the value, the library is not asked.
#include "support/classes.hpp"
#include "support/conformance.hpp"

#include <cmath>
#include <limits>

namespace tessel::test {
namespace {

constexpr double infinity = std::numeric_limits<double>::infinity();
const double nan = std::nan("");

// clang-format off

/// No dataset has the ids of these rows.
Outcome syncFails() {
    return fails("TESSEL:netcdf:sync:notNetcdfID",
                 "Unable to sync netCDF file, library error message \"NetCDF: Not a valid ID\"");
}

Row id(std::string title, Value value, const std::string &number) {
    return {std::move(title), On::nothing, {"sync", std::move(value)}, syncFails(), {},
            {"nc_sync(" + number + ")", "nc_strerror(-33)"}, answering("nc_sync", -33)};
}

Rows ids() {
    const std::string emptyID = "TESSEL:netcdf:emptySetID";
    const std::string emptyText = "ncid argument cannot be []";
    return together({
        {
            id("a whole double",                      3,                              "3"),
            id("a fraction is cut off",               3.9,                            "3"),
            id("a fraction is cut off, 3 point 5",    3.5,                            "3"),
            id("a small negative fraction",           -0.5,                           "0"),
            id("nearly minus one",                    -0.999,                         "0"),
            id("a negative double",                   -3.9,                           "-3"),
            id("minus zero",                          -0.0,                           "0"),
            id("the largest int",                     2147483647.0,                   "2147483647"),
            id("the largest int and a half",          2147483647.5,                   "2147483647"),
            id("one more than the largest int",       2147483648.0,                   "-2147483648"),
            id("the smallest int",                    -2147483648.0,                  "-2147483648"),
            id("the smallest int and a half",         -2147483648.5,                  "-2147483648"),
            id("one less than the smallest int",      -2147483649.0,                  "-2147483648"),
            id("2 to the 32nd and 5",                 4294967301.0,                   "-2147483648"),
            id("a huge double",                       1e300,                          "-2147483648"),
            id("a huge negative double",              -1e300,                         "-2147483648"),
            id("infinity",                            infinity,                       "-2147483648"),
            id("minus infinity",                      -infinity,                      "-2147483648"),
            id("not a number",                        nan,                            "-2147483648"),
            id("an int32",                            int32s({7}),                    "7"),
            id("a negative int32",                    int32s({-7}),                   "-7"),
            id("the largest int32",                   int32s({2147483647}),           "2147483647"),
            id("the smallest int32",                  int32s({-2147483647 - 1}),      "-2147483648"),
            id("the first of several doubles",        doubles({8, 9}),                "8"),
            id("the first of several int32",          int32s({8, 9}),                 "8"),
            id("the first of a page of doubles",      shaped({1, 1, 2}, doubles({8, 9})), "8"),
            id("the real part of a complex double",   complexDouble(8),               "8"),

            {"an empty double",     On::nothing, {"sync", empty(tsDOUBLE)},         refuses(emptyID, emptyText)},
            {"an empty double row", On::nothing, {"sync", empty(tsDOUBLE, {1, 0})}, refuses(emptyID, emptyText)},
            {"an empty int32",      On::nothing, {"sync", empty(tsINT32)},          refuses(emptyID, emptyText)},
            {"an empty char, for it is empty before it is of a class", On::nothing, {"sync", ""}, refuses(emptyID, emptyText)},
            {"an empty cell",       On::nothing, {"sync", empty(tsCELL)},           refuses(emptyID, emptyText)},
            {"an empty structure",  On::nothing, {"sync", empty(tsSTRUCT)},         refuses(emptyID, emptyText)},
        },
        withOtherClasses({"another class", On::nothing, {"sync", 1},
                          refuses("TESSEL:netcdf:badIDDatatype", "ncid argument must be either double precision or int32, not CLASS")},
                         {"double", "int32"}),
    });
}

/// The name goes to an inquiry that does not find it.
Row name(std::string title, Value value, const std::string &bytes) {
    return {std::move(title), On::nothing, {"inq_dimid", 5, std::move(value)},
            fails("TESSEL:netcdf:inqDimID:invalidDimensionIdOrName",
                  "Dimension ID inquiry failed, library error message \"NetCDF: Invalid dimension ID or name\""),
            {}, {"nc_inq_dimid(5, " + bytes + ", out)", "nc_strerror(-46)"}, answering("nc_inq_dimid", -46)};
}

Rows names() {
    return together({
        {
            name("a name",                        "lon",                                    R"("lon")"),
            name("case and blanks are kept",      " Lon ",                                  R"(" Lon ")"),
            name("the empty name",                "",                                       R"("")"),
            name("the empty name of 0x0",         empty(tsCHAR),                            R"("")"),
            name("a column",                      shaped({3, 1}, "lon"),                    R"("lon")"),
            name("two rows, column by column",    shaped({2, 2}, "abcd"),                   R"("abcd")"),
            name("a name ends before a NUL",      chars(std::string_view("lon\0x", 5)),     R"("lon")"),
            name("beyond ASCII",                  "Größe",                                  R"("Gr\xC3\xB6\xC3\x9Fe")"),
            name("beyond the basic plane",        codes({0xD83C, 0xDF0D}),                  R"("\xF0\x9F\x8C\x8D")"),
            name("half of a surrogate pair",      codes({0x61, 0xD83C, 0x62}),              R"("a\xEF\xBF\xBDb")"),
            name("a percent sign",                "100%s",                                  R"("100%s")"),

            {"the host yields no text", On::nothing, {"inq_dimid", 5, "lon"},
             refuses("TESSEL:netcdf:tsArrayToStringFailureForUnpackingName", "tsArrayToString failed to extract the character parameter."),
             {}, {}, {.function = {}, .textDenied = 2}},
        },
        withOtherClasses({"a name of another class", On::nothing, {"inq_dimid", 5, 1},
                          refuses("TESSEL:netcdf:argumentWasNotChar", "dimension name argument must be character")},
                         {"char"}),
        {
            {"an empty name of another class", On::nothing, {"inq_dimid", 5, empty(tsDOUBLE)},
             refuses("TESSEL:netcdf:argumentWasNotChar", "dimension name argument must be character")},
            {"an empty name in a cell", On::nothing, {"inq_dimid", 5, empty(tsCELL)},
             refuses("TESSEL:netcdf:argumentWasNotChar", "dimension name argument must be character")},
        },
    });
}

Row mode(std::string title, Value value, const std::string &flags) {
    return {std::move(title), On::nothing, {"open", "f.nc", std::move(value)},
            fails("TESSEL:netcdf:open:invalidArgument",
                  "Unable to open netCDF file, library error message \"NetCDF: Invalid argument\""),
            {}, {"nc_open(\"f.nc\", " + flags + ", out)", "nc_strerror(-36)"}, answering("nc_open", -36)};
}

Row unknownMode(std::string title, Value value, const std::string &shown) {
    return {std::move(title), On::nothing, {"open", "f.nc", std::move(value)},
            refuses("TESSEL:netcdf:unrecognizedFileMode", "Unknown parameter \"" + shown + "\".")};
}

Rows modes() {
    const std::string emptyMode = "TESSEL:netcdf:emptySetMode";
    const std::string emptyText = "mode argument cannot be []";
    return together({
        {
            mode("clobber",                       "CLOBBER",                "0"),
            mode("noclobber",                     "NOCLOBBER",              "4"),
            mode("write in upper case",           "WRITE",                  "1"),
            mode("nowrite",                       "NOWRITE",                "0"),
            mode("write in lower case",           "write",                  "1"),
            mode("write with a capital",          "Write",                  "1"),
            mode("write with prefix",             "nc_write",               "1"),
            mode("write with prefix in capitals", "NC_WRITE",               "1"),
            mode("write in mixed case",           "Nc_wRiTe",               "1"),
            mode("noclobber in mixed case",       "nc_NoClobber",           "4"),
            mode("a column",                      shaped({5, 1}, "write"),  "1"),
            mode("a mode name ends before a NUL", chars(std::string_view("write\0x", 7)), "1"),

            unknownMode("share has no name",         "nc_share",      "NC_SHARE"),
            unknownMode("nor has 64 bit offset",     "64BIT_OFFSET",  "64BIT_OFFSET"),
            unknownMode("nor has lock",              "lock",          "LOCK"),
            unknownMode("names do not combine",      "WRITE|SHARE",   "WRITE|SHARE"),
            unknownMode("the prefix twice",          "nc_nc_write",   "NC_NC_WRITE"),
            unknownMode("the prefix alone",          "nc_",           "NC_"),
            unknownMode("half of the prefix",        "nc",            "NC"),
            unknownMode("a blank behind",            "write ",        "WRITE "),
            unknownMode("a blank before",            " write",        " WRITE"),
            unknownMode("the beginning of a name",   "writ",          "WRIT"),
            unknownMode("more than a name",          "writes",        "WRITES"),
            unknownMode("one character",             "w",             "W"),
            unknownMode("a NUL alone",               codes({0}),      ""),
            unknownMode("a mode name is no format",  "%s%n",          "%S%N"),
            unknownMode("a mode name beyond ASCII",  "größe",         "GRößE"),

            mode("no flags",                      0,                        "0"),
            mode("a flag",                        1,                        "1"),
            mode("flags added up",                2049,                     "2049"),
            mode("a fraction",                    1.9,                      "1"),
            mode("a negative fraction",           -0.9,                     "0"),
            mode("a negative number",             -1,                       "-1"),
            mode("too large",                     3e9,                      "-2147483648"),
            mode("not a number",                  nan,                      "-2147483648"),
            mode("infinity",                      infinity,                 "-2147483648"),
            mode("an int32",                      int32s({516}),            "516"),
            mode("the smallest int32",            int32s({-2147483647 - 1}), "-2147483648"),
            mode("the first of several",          doubles({4, 1}),          "4"),
            mode("the first of several int32",    int32s({4, 1}),           "4"),

            {"an empty mode name",   On::nothing, {"open", "f.nc", ""},              refuses(emptyMode, emptyText)},
            {"an empty double",      On::nothing, {"open", "f.nc", empty(tsDOUBLE)}, refuses(emptyMode, emptyText)},
            {"an empty int32",       On::nothing, {"open", "f.nc", empty(tsINT32)},  refuses(emptyMode, emptyText)},
            {"an empty cell",        On::nothing, {"open", "f.nc", empty(tsCELL)},   refuses(emptyMode, emptyText)},

            {"the host yields no text", On::nothing, {"open", "f.nc", "WRITE"},
             refuses("TESSEL:netcdf:tsArrayToStringFailureForMode", "tsArrayToString failed to extract the mode"),
             {}, {}, {.function = {}, .textDenied = 3}},
        },
        withOtherClasses({"a mode of another class", On::nothing, {"open", "f.nc", 1},
                          refuses("TESSEL:netcdf:badModeDatatype", "mode argument must be either double precision, int32, or character")},
                         {"double", "int32", "char"}),
    });
}

Row type(std::string title, Value value, const std::string &code) {
    return {std::move(title), On::nothing, {"def_var", 5, "v", std::move(value), empty(tsDOUBLE)},
            fails("TESSEL:netcdf:defVar:invalidDataType",
                  "Variable definition operation failed, library error message \"NetCDF: Not a valid data type or _FillValue type mismatch\""),
            {}, {"nc_def_var(5, \"v\", " + code + ", 0, {}, out)", "nc_strerror(-45)"}, answering("nc_def_var", -45)};
}

Row typeOutOfRange(std::string title, Value value, const std::string &shown) {
    return {std::move(title), On::nothing, {"def_var", 5, "v", std::move(value), empty(tsDOUBLE)},
            refuses("TESSEL:netcdf:invalidNetcdfDatatype", "The datatype argument " + shown + " is out of range.")};
}

Rows types() {
    const auto badClass = [](std::string title, Value value) {
        return Row{std::move(title), On::nothing, {"def_var", 5, "v", std::move(value), 0},
                   refuses("TESSEL:netcdf:unpack_xtype:badDatatype", "datatype argument must be double precision")};
    };
    const auto noType = [](std::string title, Value value) {
        return Row{std::move(title), On::nothing, {"def_var", 5, "v", std::move(value), 0},
                   refuses("TESSEL:netcdf:unpack_xtype:emptySetDatatype", "datatype argument cannot be []")};
    };
    return {
        type("not a type", 0, "0"),
        type("byte",       1, "1"),
        type("char",       2, "2"),
        type("short",      3, "3"),
        type("int",        4, "4"),
        type("float",      5, "5"),
        type("double",     6, "6"),
        type("minus zero", -0.0, "0"),
        type("a fraction is no type",            2.5,   "0"),
        type("nor is one just below a type",     5.999, "0"),
        type("nor is one just above",            1e-300, "0"),
        type("not a number is no type",          nan,   "0"),
        type("the first of several",             doubles({3, 99}), "3"),
        type("the real part",                    complexDouble(3), "3"),

        typeOutOfRange("above the range",        7,     "7.000000"),
        typeOutOfRange("just above the range",   6.5,   "6.500000"),
        typeOutOfRange("below the range",        -1,    "-1.000000"),
        typeOutOfRange("just below the range",   -0.5,  "-0.500000"),
        typeOutOfRange("so little below that it does not show", -1e-9, "-0.000000"),
        typeOutOfRange("infinity",               infinity,  "inf"),
        typeOutOfRange("minus infinity",         -infinity, "-inf"),
        typeOutOfRange("a large number in full", 1e20,  "100000000000000000000.000000"),

        noType("an empty double",      empty(tsDOUBLE)),
        noType("an empty int32, for it is empty before it is of a class", empty(tsINT32)),
        noType("an empty char",        ""),
        noType("an empty cell",        empty(tsCELL)),
        badClass("a single",           singles({6})),
        badClass("an int8",            int8s({6})),
        badClass("a uint8",            uint8s({6})),
        badClass("an int16",           int16s({6})),
        badClass("a uint16",           uint16s({6})),
        badClass("an int32",           int32s({6})),
        badClass("a uint32",           uint32s({6})),
        badClass("an int64",           int64s({6})),
        badClass("a uint64",           uint64s({6})),
        badClass("a char",             "NC_DOUBLE"),
        badClass("a logical",          logicals({true})),
        badClass("a cell",             cell({6})),
        badClass("a structure",        structure()),
        badClass("a function",         function()),
        badClass("an unknown class",   unknown()),
    };
}

// clang-format on

INSTANTIATE_TEST_SUITE_P(IDs, Conformance, testing::ValuesIn(ids()), titleOf);
INSTANTIATE_TEST_SUITE_P(Names, Conformance, testing::ValuesIn(names()), titleOf);
INSTANTIATE_TEST_SUITE_P(Modes, Conformance, testing::ValuesIn(modes()), titleOf);
INSTANTIATE_TEST_SUITE_P(Types, Conformance, testing::ValuesIn(types()), titleOf);

} // namespace
} // namespace tessel::test
