// tests/conformance/scalar_converters.cpp: ids, names, modes, types, sizes, small numbers and lists
// of dimensions, as the library gets them.
//
// Each converter is seen through an operation that hands its result on; where the library would not
// take the value, the library is not asked.
#include "support/conformance.hpp"

#include <algorithm>
#include <cmath>
#include <limits>

namespace tessel::test {
namespace {

constexpr double infinity = std::numeric_limits<double>::infinity();
const double nan = std::nan("");
constexpr float singleInfinity = std::numeric_limits<float>::infinity();

// clang-format off

Row withClass(Row row, const Value &value, const std::string &className) {
    row.title += ", " + className;
    row.call.back() = value;
    const std::string mark = "CLASS";
    const std::size_t at = row.outcome.message.find(mark);
    if (at != std::string::npos) {
        row.outcome.message.replace(at, mark.size(), className);
    }
    return row;
}

/// The row with its last argument of every class but those that the converter takes. "CLASS" in the
/// message stands for the class's name.
Rows withOtherClasses(const Row &row, const std::vector<std::string> &taken) {
    struct Other {
        std::string className;
        Value value;
    };
    const std::vector<Other> all = {
        {"double",          1               },
        {"single",          singles({1})    },
        {"int8",            int8s({1})      },
        {"uint8",           uint8s({1})     },
        {"int16",           int16s({1})     },
        {"uint16",          uint16s({1})    },
        {"int32",           int32s({1})     },
        {"uint32",          uint32s({1})    },
        {"int64",           int64s({1})     },
        {"uint64",          uint64s({1})    },
        {"char",            "1"             },
        {"logical",         logicals({true})},
        {"cell",            cell({1})       },
        {"struct",          structure()     },
        {"function_handle", function()      },
        {"unknown",         unknown()       },
    };
    Rows rows;
    for (const Other &one : all) {
        if (std::find(taken.begin(), taken.end(), one.className) == taken.end()) {
            rows.push_back(withClass(row, one.value, one.className));
        }
    }
    return rows;
}

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

Row size(std::string title, Value value, const std::string &number) {
    return {std::move(title), On::nothing, {"def_dim", 5, "d", std::move(value)},
            fails("TESSEL:netcdf:defDim:invalidDimensionSize",
                  "Dimension definition operation failed, library error message \"NetCDF: Invalid dimension size\""),
            {}, {"nc_def_dim(5, \"d\", " + number + ", out)", "nc_strerror(-63)"}, answering("nc_def_dim", -63)};
}

Row refusedSize(std::string title, Value value, const std::string &identifier, const std::string &message) {
    return {std::move(title), On::nothing, {"def_dim", 5, "d", std::move(value)},
            refuses("TESSEL:netcdf:" + identifier, message)};
}

Rows sizes() {
    const auto negative = [](std::string title, Value value) {
        return refusedSize(std::move(title), std::move(value), "negativeSize", "dim_length argument must be positive");
    };
    const auto notFinite = [](std::string title, Value value) {
        return refusedSize(std::move(title), std::move(value), "sizeArgumentIsInfOrNaN", "dim_length argument must not be Inf or NaN");
    };
    const auto noSize = [](std::string title, Value value) {
        return refusedSize(std::move(title), std::move(value), "emptySetSizeParameter", "dim_length argument cannot be []");
    };
    return together({
        {
            size("a double",                             4,                     "4"),
            size("zero",                                 0,                     "0"),
            size("minus zero is zero",                   -0.0,                  "0"),
            size("a fraction is cut off",                3.9,                   "3"),
            size("less than one",                        0.9,                   "0"),
            size("2 to the 31st",                        2147483648.0,          "2147483648"),
            size("2 to the 32nd and 5",                  4294967301.0,          "4294967301"),
            size("2 to the 53rd",                        0x1p53,                "9007199254740992"),
            size("just below 2 to the 63rd",             0x1p63 - 1024,         "9223372036854774784"),
            size("2 to the 63rd",                        0x1p63,                "9223372036854775808"),
            size("just above 2 to the 63rd",             0x1p63 + 2048,         "9223372036854777856"),
            size("just below 2 to the 64th",             0x1p64 - 2048,         "18446744073709549568"),
            size("2 to the 64th",                        0x1p64,                "9223372036854775808"),
            size("a huge double",                        1e300,                 "9223372036854775808"),
            size("the first of several",                 doubles({4, -1}),      "4"),
            size("the real part",                        complexDouble(4),      "4"),
            size("a single",                             singles({3.9F}),       "3"),
            size("minus zero, a single",                 singles({-0.0F}),      "0"),
            size("2 to the 63rd, a single",              singles({0x1p63F}),    "9223372036854775808"),
            size("above 2 to the 63rd, a single",        singles({0x1.8p63F}),  "13835058055282163712"),
            size("a huge single",                        singles({3e38F}),      "9223372036854775808"),
            size("an int8",                              int8s({127}),          "127"),
            size("a uint8",                              uint8s({255}),         "255"),
            size("an int16",                             int16s({32767}),       "32767"),
            size("a uint16",                             uint16s({65535}),      "65535"),
            size("an int32",                             int32s({2147483647}),  "2147483647"),
            size("a uint32",                             uint32s({4294967295U}), "4294967295"),
            size("an int64",                             int64s({9223372036854775807}), "9223372036854775807"),
            size("a uint64",                             uint64s({18446744073709551615U}), "18446744073709551615"),
            size("zero, an int8",                        int8s({0}),            "0"),
            size("the first of several int16",           int16s({7, -7}),       "7"),

            negative("a negative double",                -1),
            negative("a small negative fraction",        -0.5),
            negative("the smallest negative double",     -5e-324),
            negative("a huge negative double",           -1e300),
            negative("a negative single",                singles({-1})),
            negative("a small negative single",          singles({-0.5F})),
            negative("a negative int8",                  int8s({-1})),
            negative("a negative int16",                 int16s({-1})),
            negative("a negative int32",                 int32s({-1})),
            negative("a negative int64",                 int64s({-1})),
            negative("the smallest int64",               int64s({std::numeric_limits<std::int64_t>::min()})),
            notFinite("infinity",                        infinity),
            notFinite("minus infinity is infinite before it is negative", -infinity),
            notFinite("not a number",                    nan),
            notFinite("a single infinity",               singles({singleInfinity})),
            notFinite("a single minus infinity",         singles({-singleInfinity})),
            notFinite("a single not a number",           singles({std::nanf("")})),
            size("only the first is looked at",          doubles({4, nan}),     "4"),
            noSize("an empty double",                    empty(tsDOUBLE)),
            noSize("an empty uint8",                     empty(tsUINT8)),
            noSize("an empty char, for it is empty before it is of a class", ""),
            noSize("an empty cell",                      empty(tsCELL)),

            {"a number of no class that is handled", On::nothing, {"def_dim", 5, "d", cell()},
             refuses("TESSEL:netcdf:unpackGenericSizeParameter:unhandledNumericType", "type of dim_length argument was not handled"),
             {}, {}, {.function = {}, .isNumeric = true}},
        },
        withOtherClasses({"a size of another class", On::nothing, {"def_dim", 5, "d", 1},
                          refuses("TESSEL:netcdf:badSizeArgumentDatatype", "dim_length argument must be either double precision or an unsigned integer datatype")},
                         {"double", "single", "int8", "uint8", "int16", "uint16", "int32", "uint32", "int64", "uint64"}),
    });
}

Row smallNumber(std::string title, Value value, const std::string &number) {
    return {std::move(title), On::nothing, {"set_default_format", std::move(value)},
            fails("TESSEL:netcdf:setDefaultFormat:invalidArgument",
                  "Unable to set the default formate, library error message \"NetCDF: Invalid argument\""),
            {}, {"nc_set_default_format(" + number + ", out)", "nc_strerror(-36)"}, answering("nc_set_default_format", -36)};
}

/// An int32 array is read as a double, eight bytes at a time: that is how it has always been.
Rows smallNumbers() {
    const std::string emptyID = "TESSEL:netcdf:unpackIntSingleton:argumentIsEmptySet";
    const std::string emptyText = "new_default_format argument cannot be []";
    return together({
        {
            smallNumber("a double",                              2,                        "2"),
            smallNumber("a negative double",                     -33,                      "-33"),
            smallNumber("a fraction is cut off",                 2.9,                      "2"),
            smallNumber("a negative fraction is cut off",        -33.9,                    "-33"),
            smallNumber("a small negative fraction",             -0.5,                     "0"),
            smallNumber("the largest int",                       2147483647.0,             "2147483647"),
            smallNumber("too large",                             2147483648.0,             "-2147483648"),
            smallNumber("too small",                             -3e9,                     "-2147483648"),
            smallNumber("infinity",                              infinity,                 "-2147483648"),
            smallNumber("not a number",                          nan,                      "-2147483648"),
            smallNumber("the first of several",                  doubles({1, 2}),          "1"),
            smallNumber("a lone int32 is half of a tiny double", int32s({-33}),            "0"),
            smallNumber("a lone int32 with the bits of a float", int32s({0x40080000}),     "0"),
            smallNumber("two int32 are a double",                int32s({0, 0x40080000}),  "3"),
            smallNumber("two int32 are a negative double",       int32s({0, -0x3FC00000}), "-32"),
            smallNumber("two int32 are not a number",            int32s({1, 0x7FF80000}),  "-2147483648"),
            smallNumber("of three int32 the first two",          int32s({0, 0x40080000, 1}), "3"),

            {"an empty double",           On::nothing, {"set_default_format", empty(tsDOUBLE)}, refuses(emptyID, emptyText)},
            {"an empty int32",            On::nothing, {"set_default_format", empty(tsINT32)},  refuses(emptyID, emptyText)},
            {"an empty char, for it is empty before it is of a class", On::nothing, {"set_default_format", ""}, refuses(emptyID, emptyText)},
        },
        withOtherClasses({"another class", On::nothing, {"set_default_format", 1},
                          refuses("TESSEL:netcdf:unpackIntSingleton:badNumericType", "argument must be either double precision or int32")},
                         {"double", "int32"}),
    });
}

Row dimensions(std::string title, Value value, const std::string &ids) {
    return {std::move(title), On::nothing, {"def_var", 5, "v", 6, std::move(value)},
            fails("TESSEL:netcdf:defVar:invalidDimensionIdOrName",
                  "Variable definition operation failed, library error message \"NetCDF: Invalid dimension ID or name\""),
            {}, {"nc_def_var(5, \"v\", 6, " + ids + ", out)", "nc_strerror(-46)"}, answering("nc_def_var", -46)};
}

std::string repeated(const std::string &text, int times) {
    std::string all;
    for (int i = 0; i < times; ++i) {
        all += (i == 0 ? "" : ", ") + text;
    }
    return all;
}

Rows dimensionLists() {
    const auto tooMany = refuses("TESSEL:netcdf:ndimsLargerThanNetcdfLimits", "Cannot specify more than 1024 dimensions.");
    return together({
        {
            dimensions("three ids are reversed",      doubles({0, 1, 2}),                "3, {2, 1, 0}"),
            dimensions("one id",                      7,                                 "1, {7}"),
            dimensions("a column",                    shaped({3, 1}, doubles({0, 1, 2})), "3, {2, 1, 0}"),
            dimensions("a square, column by column",  shaped({2, 2}, doubles({0, 1, 2, 3})), "4, {3, 2, 1, 0}"),
            dimensions("none",                        empty(tsDOUBLE),                   "0, {}"),
            dimensions("none in a row",               empty(tsDOUBLE, {1, 0}),           "0, {}"),
            dimensions("fractions are cut off",       doubles({1.9, -0.5}),              "2, {0, 1}"),
            dimensions("ids that are no ids",         doubles({nan, infinity, -1}),      "3, {-1, -2147483648, -2147483648}"),
            dimensions("the real parts",              complexDoubles({0, 1}),            "2, {1, 0}"),
            dimensions("as many as there may be",     wholes(tsDOUBLE, std::vector<int>(1024, 3)), "1024, {" + repeated("3", 1024) + "}"),

            {"one more than there may be", On::nothing, {"def_var", 5, "v", 6, wholes(tsDOUBLE, std::vector<int>(1025, 3))}, tooMany},
            {"one more than there may be, in a page", On::nothing,
             {"def_var", 5, "v", 6, shaped({25, 41}, wholes(tsDOUBLE, std::vector<int>(1025, 3)))}, tooMany},
            {"too many, and of another class", On::nothing, {"def_var", 5, "v", 6, wholes(tsINT32, std::vector<int>(1025, 3))},
             refuses("TESSEL:netcdf:unpackDimids:badDimidsType", "Dimids argument must be double precision.")},
            {"none, of another class", On::nothing, {"def_var", 5, "v", 6, empty(tsINT32)},
             refuses("TESSEL:netcdf:unpackDimids:badDimidsType", "Dimids argument must be double precision.")},
            {"none, of char", On::nothing, {"def_var", 5, "v", 6, ""},
             refuses("TESSEL:netcdf:unpackDimids:badDimidsType", "Dimids argument must be double precision.")},
        },
        withOtherClasses({"another class", On::nothing, {"def_var", 5, "v", 6, 1},
                          refuses("TESSEL:netcdf:unpackDimids:badDimidsType", "Dimids argument must be double precision.")},
                         {"double"}),
    });
}

// clang-format on

INSTANTIATE_TEST_SUITE_P(IDs, Conformance, testing::ValuesIn(ids()), titleOf);
INSTANTIATE_TEST_SUITE_P(Names, Conformance, testing::ValuesIn(names()), titleOf);
INSTANTIATE_TEST_SUITE_P(Modes, Conformance, testing::ValuesIn(modes()), titleOf);
INSTANTIATE_TEST_SUITE_P(Types, Conformance, testing::ValuesIn(types()), titleOf);
INSTANTIATE_TEST_SUITE_P(Sizes, Conformance, testing::ValuesIn(sizes()), titleOf);
INSTANTIATE_TEST_SUITE_P(SmallNumbers, Conformance, testing::ValuesIn(smallNumbers()), titleOf);
INSTANTIATE_TEST_SUITE_P(DimensionLists, Conformance, testing::ValuesIn(dimensionLists()), titleOf);

} // namespace
} // namespace tessel::test
