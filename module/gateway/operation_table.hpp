// module/gateway/operation_table.hpp: the operations of the module, a row each.
#pragma once

#include "call/operation.hpp"
#include "constants/handlers.hpp"
#include "ops/attribute/handlers.hpp"
#include "ops/data/handlers.hpp"
#include "ops/dataset/handlers.hpp"
#include "ops/schema/handlers.hpp"

#include <array>

namespace tessel::netcdf {

/// The rows in stored order, which is neither that of the names nor that of the ids.
inline constexpr auto operationTable = std::to_array<OperationEntry>({
  // clang-format off
    {  0, "nc_abort",              "abort",              abortHandler},
    {  1, "nc_close",              "close",              closeHandler},
    {  2, "nc_copy_att",           "copy_att",           copyAttHandler},
    {  3, "nc__create",            "_create",            createTunedHandler},
    {  4, "nc_create",             "create",             createHandler},
    {  5, "nc_def_dim",            "def_dim",            defDimHandler},
    {  6, "nc_def_var",            "def_var",            defVarHandler},
    {  7, "nc_del_att",            "del_att",            delAttHandler},
    {  8, "nc__enddef",            "_enddef",            enddefTunedHandler},
    {  9, "nc_end_def",            "end_def",            enddefHandler},
    { 10, "nc_enddef",             "enddef",             enddefHandler},
    { 11, "nc_get_att_double",     "get_att_double",     readAttHandler},
    { 12, "nc_get_att_float",      "get_att_float",      readAttHandler},
    { 13, "nc_get_att_int",        "get_att_int",        readAttHandler},
    { 14, "nc_get_att_short",      "get_att_short",      readAttHandler},
    { 15, "nc_get_att_schar",      "get_att_schar",      readAttHandler},
    { 16, "nc_get_att_uchar",      "get_att_uchar",      readAttHandler},
    { 17, "nc_get_att_text",       "get_att_text",       readAttHandler},
    {102, "get_constant_names",    "get_constant_names", constantNamesHandler},
    { 18, "nc_get_var_double",     "get_var_double",     readVarHandler},
    { 19, "nc_get_var_float",      "get_var_float",      readVarHandler},
    { 20, "nc_get_var_int",        "get_var_int",        readVarHandler},
    { 21, "nc_get_var_short",      "get_var_short",      readVarHandler},
    { 22, "nc_get_var_schar",      "get_var_schar",      readVarHandler},
    { 23, "nc_get_var_uchar",      "get_var_uchar",      readVarHandler},
    { 24, "nc_get_var_text",       "get_var_text",       readVarHandler},
    { 46, "nc_inq",                "inq",                inqHandler},
    { 47, "nc_inq_att",            "inq_att",            inqAttHandler},
    { 48, "nc_inq_attid",          "inq_attid",          inqAttidHandler},
    { 49, "nc_inq_attname",        "inq_attname",        inqAttnameHandler},
    { 50, "nc_inq_dim",            "inq_dim",            inqDimHandler},
    { 51, "nc_inq_dimid",          "inq_dimid",          inqDimidHandler},
    { 54, "nc_inq_libvers",        "inq_libvers",        inqLibversHandler},
    { 55, "nc_inq_varid",          "inq_varid",          inqVaridHandler},
    { 56, "nc_inq_var",            "inq_var",            inqVarHandler},
    {103, "parameter",             "param",              parameterHandler},
    { 57, "nc__open",              "_open",              openTunedHandler},
    { 58, "nc_open",               "open",               openHandler},
    { 94, "nc_redef",              "redef",              redefHandler},
    { 95, "nc_rename_att",         "rename_att",         renameAttHandler},
    { 96, "nc_rename_dim",         "rename_dim",         renameDimHandler},
    { 97, "nc_rename_var",         "rename_var",         renameVarHandler},
    { 98, "nc_set_default_format", "set_default_format", setDefaultFormatHandler},
    { 99, "nc_set_fill",           "set_fill",           setFillHandler},
    {100, "nc_strerror",           "strerror",           strerrorHandler},
    {101, "nc_sync",               "sync",               syncHandler},
  // clang-format on
});

} // namespace tessel::netcdf
