// module/constants/constant_table.hpp: the library's named constants.
//
// The values are written out, so that they do not move with the header that the module is built
// with.
#pragma once

#include <array>

namespace tessel::netcdf {

/// One named constant.
struct ConstantEntry {
    double value;
    const char *longName;  ///< in upper case, with the library's prefix ("NC_BYTE")
    const char *shortName; ///< without it ("BYTE")
};

/// The constants, in the order of the list of names, which is also the order of the search.
inline constexpr auto constantTable = std::to_array<ConstantEntry>({
    // clang-format off
    {          1, "NC_BYTE",             "BYTE"},
    {          2, "NC_CHAR",             "CHAR"},
    {          6, "NC_DOUBLE",           "DOUBLE"},
    {          5, "NC_FLOAT",            "FLOAT"},
    {          4, "NC_INT",              "INT"},
    {          4, "NC_LONG",             "LONG"},
    {          0, "NC_NAT",              "NAT"},
    {          3, "NC_SHORT",            "SHORT"},
    {       -127, "NC_FILL_BYTE",        "FILL_BYTE"},
    {          0, "NC_FILL_CHAR",        "FILL_CHAR"},
    {     -32767, "NC_FILL_SHORT",       "FILL_SHORT"},
    {-2147483647, "NC_FILL_INT",         "FILL_INT"},
    { 0x1.ep+122, "NC_FILL_FLOAT",       "FILL_FLOAT"},
    { 0x1.ep+122, "NC_FILL_DOUBLE",      "FILL_DOUBLE"},
    {          0, "NC_FILL",             "FILL"},
    {        256, "NC_NOFILL",           "NOFILL"},
    {          0, "NC_NOWRITE",          "NOWRITE"},
    {          1, "NC_WRITE",            "WRITE"},
    {          0, "NC_CLOBBER",          "CLOBBER"},
    {          4, "NC_NOCLOBBER",        "NOCLOBBER"},
    {        512, "NC_64BIT_OFFSET",     "64BIT_OFFSET"},
    {       2048, "NC_SHARE",            "SHARE"},
    {       1024, "NC_LOCK",             "LOCK"},
    {          1, "NC_FORMAT_CLASSIC",   "FORMAT_CLASSIC"},
    {          2, "NC_FORMAT_64BIT",     "FORMAT_64BIT"},
    {       1024, "NC_MAX_DIMS",         "MAX_DIMS"},
    {       8192, "NC_MAX_ATTRS",        "MAX_ATTRS"},
    {       8192, "NC_MAX_VARS",         "MAX_VARS"},
    {        256, "NC_MAX_NAME",         "MAX_NAME"},
    {       1024, "NC_MAX_VAR_DIMS",     "MAX_VAR_DIMS"},
    {         -1, "NC2_ERR",             "NC2_ERR"},
    {          0, "NC_NOERR",            "NOERR"},
    {        -33, "NC_EBADID",           "EBADID"},
    {        -34, "NC_ENFILE",           "ENFILE"},
    {        -35, "NC_EEXIST",           "EEXIST"},
    {        -36, "NC_EINVAL",           "EINVAL"},
    {        -37, "NC_EPERM",            "EPERM"},
    {        -38, "NC_ENOTINDEFINE",     "ENOTINDEFINE"},
    {        -39, "NC_EINDEFINE",        "EINDEFINE"},
    {        -40, "NC_EINVALCOORDS",     "EINVALCOORDS"},
    {        -41, "NC_EMAXDIMS",         "EMAXDIMS"},
    {        -42, "NC_ENAMEINUSE",       "ENAMEINUSE"},
    {        -43, "NC_ENOTATT",          "ENOTATT"},
    {        -44, "NC_EMAXATTS",         "EMAXATTS"},
    {        -45, "NC_EBADTYPE",         "EBADTYPE"},
    {        -46, "NC_EBADDIM",          "EBADDIM"},
    {        -47, "NC_EUNLIMPOS",        "EUNLIMPOS"},
    {        -48, "NC_EMAXVARS",         "EMAXVARS"},
    {        -49, "NC_ENOTVAR",          "ENOTVAR"},
    {        -50, "NC_EGLOBAL",          "EGLOBAL"},
    {        -51, "NC_ENOTNC",           "ENOTNC"},
    {        -52, "NC_ESTS",             "ESTS"},
    {        -53, "NC_EMAXNAME",         "EMAXNAME"},
    {        -54, "NC_EUNLIMIT",         "EUNLIMIT"},
    {        -55, "NC_ENORECVARS",       "ENORECVARS"},
    {        -56, "NC_ECHAR",            "ECHAR"},
    {        -57, "NC_EEDGE",            "EEDGE"},
    {        -58, "NC_ESTRIDE",          "ESTRIDE"},
    {        -59, "NC_EBADNAME",         "EBADNAME"},
    {        -60, "NC_ERANGE",           "ERANGE"},
    {        -61, "NC_ENOMEM",           "ENOMEM"},
    {        -62, "NC_EVARSIZE",         "EVARSIZE"},
    {        -63, "NC_EDIMSIZE",         "EDIMSIZE"},
    {        -64, "NC_ETRUNC",           "ETRUNC"},
    {          1, "NC_FATAL",            "FATAL"},
    {         -1, "NC_GLOBAL",           "GLOBAL"},
    {          0, "NC_UNLIMITED",        "UNLIMITED"},
    {          0, "NC_SIZEHINT_DEFAULT", "SIZEHINT_DEFAULT"},
    {          2, "NC_VERBOSE",          "VERBOSE"},
    // clang-format on
});
static_assert(constantTable.size() == 69);

} // namespace tessel::netcdf
