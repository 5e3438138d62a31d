// tests/support/constants.hpp: every named constant, as the tests know it.
#pragma once

#include "support/value.hpp"

#include <array>

namespace tessel::test {

struct ListedConstant {
    const char *longName;
    const char *shortName;
    double value;
};

/// In stored order.
constexpr auto constants = std::to_array<ListedConstant>({
    // clang-format off
    {"NC_BYTE",                "BYTE",              1},
    {"NC_CHAR",                "CHAR",              2},
    {"NC_DOUBLE",              "DOUBLE",            6},
    {"NC_FLOAT",               "FLOAT",             5},
    {"NC_INT",                 "INT",               4},
    {"NC_LONG",                "LONG",              4},
    {"NC_NAT",                 "NAT",               0},
    {"NC_SHORT",               "SHORT",             3},
    {"NC_FILL_BYTE",           "FILL_BYTE",         -127},
    {"NC_FILL_CHAR",           "FILL_CHAR",         0},
    {"NC_FILL_SHORT",          "FILL_SHORT",        -32767},
    {"NC_FILL_INT",            "FILL_INT",          -2147483647},
    {"NC_FILL_FLOAT",          "FILL_FLOAT",        15 * 0x1p119},
    {"NC_FILL_DOUBLE",         "FILL_DOUBLE",       15 * 0x1p119},
    {"NC_FILL",                "FILL",              0},
    {"NC_NOFILL",              "NOFILL",            256},
    {"NC_NOWRITE",             "NOWRITE",           0},
    {"NC_WRITE",               "WRITE",             1},
    {"NC_CLOBBER",             "CLOBBER",           0},
    {"NC_NOCLOBBER",           "NOCLOBBER",         4},
    {"NC_64BIT_OFFSET",        "64BIT_OFFSET",      512},
    {"NC_SHARE",               "SHARE",             2048},
    {"NC_LOCK",                "LOCK",              1024},
    {"NC_FORMAT_CLASSIC",      "FORMAT_CLASSIC",    1},
    {"NC_FORMAT_64BIT",        "FORMAT_64BIT",      2},
    {"NC_MAX_DIMS",            "MAX_DIMS",          1024},
    {"NC_MAX_ATTRS",           "MAX_ATTRS",         8192},
    {"NC_MAX_VARS",            "MAX_VARS",          8192},
    {"NC_MAX_NAME",            "MAX_NAME",          256},
    {"NC_MAX_VAR_DIMS",        "MAX_VAR_DIMS",      1024},
    {"NC2_ERR",                "NC2_ERR",           -1},
    {"NC_NOERR",               "NOERR",             0},
    {"NC_EBADID",              "EBADID",            -33},
    {"NC_ENFILE",              "ENFILE",            -34},
    {"NC_EEXIST",              "EEXIST",            -35},
    {"NC_EINVAL",              "EINVAL",            -36},
    {"NC_EPERM",               "EPERM",             -37},
    {"NC_ENOTINDEFINE",        "ENOTINDEFINE",      -38},
    {"NC_EINDEFINE",           "EINDEFINE",         -39},
    {"NC_EINVALCOORDS",        "EINVALCOORDS",      -40},
    {"NC_EMAXDIMS",            "EMAXDIMS",          -41},
    {"NC_ENAMEINUSE",          "ENAMEINUSE",        -42},
    {"NC_ENOTATT",             "ENOTATT",           -43},
    {"NC_EMAXATTS",            "EMAXATTS",          -44},
    {"NC_EBADTYPE",            "EBADTYPE",          -45},
    {"NC_EBADDIM",             "EBADDIM",           -46},
    {"NC_EUNLIMPOS",           "EUNLIMPOS",         -47},
    {"NC_EMAXVARS",            "EMAXVARS",          -48},
    {"NC_ENOTVAR",             "ENOTVAR",           -49},
    {"NC_EGLOBAL",             "EGLOBAL",           -50},
    {"NC_ENOTNC",              "ENOTNC",            -51},
    {"NC_ESTS",                "ESTS",              -52},
    {"NC_EMAXNAME",            "EMAXNAME",          -53},
    {"NC_EUNLIMIT",            "EUNLIMIT",          -54},
    {"NC_ENORECVARS",          "ENORECVARS",        -55},
    {"NC_ECHAR",               "ECHAR",             -56},
    {"NC_EEDGE",               "EEDGE",             -57},
    {"NC_ESTRIDE",             "ESTRIDE",           -58},
    {"NC_EBADNAME",            "EBADNAME",          -59},
    {"NC_ERANGE",              "ERANGE",            -60},
    {"NC_ENOMEM",              "ENOMEM",            -61},
    {"NC_EVARSIZE",            "EVARSIZE",          -62},
    {"NC_EDIMSIZE",            "EDIMSIZE",          -63},
    {"NC_ETRUNC",              "ETRUNC",            -64},
    {"NC_FATAL",               "FATAL",             1},
    {"NC_GLOBAL",              "GLOBAL",            -1},
    {"NC_UNLIMITED",           "UNLIMITED",         0},
    {"NC_SIZEHINT_DEFAULT",    "SIZEHINT_DEFAULT",  0},
    {"NC_VERBOSE",             "VERBOSE",           2},
    // clang-format on
});

/// What the operation "get_constant_names" gives.
inline Value constantNames() {
    Values names;
    for (const ListedConstant &constant : constants) {
        names.emplace_back(constant.longName);
    }
    return cell(names);
}

} // namespace tessel::test
