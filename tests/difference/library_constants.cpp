// tests/difference/library_constants.cpp: the named constants, from the library's own header.
#include "library_side.hpp"

#include <algorithm>
#include <array>
#include <cctype>

namespace difference {
namespace {

struct Constant {
    const char *name;
    double value;
};

// clang-format off
constexpr std::array constants = {
    Constant{"NC_BYTE",             NC_BYTE},
    Constant{"NC_CHAR",             NC_CHAR},
    Constant{"NC_DOUBLE",           NC_DOUBLE},
    Constant{"NC_FLOAT",            NC_FLOAT},
    Constant{"NC_INT",              NC_INT},
    Constant{"NC_LONG",             NC_LONG},
    Constant{"NC_NAT",              NC_NAT},
    Constant{"NC_SHORT",            NC_SHORT},
    Constant{"NC_FILL_BYTE",        NC_FILL_BYTE},
    Constant{"NC_FILL_CHAR",        NC_FILL_CHAR},
    Constant{"NC_FILL_SHORT",       NC_FILL_SHORT},
    Constant{"NC_FILL_INT",         NC_FILL_INT},
    Constant{"NC_FILL_FLOAT",       NC_FILL_FLOAT},
    Constant{"NC_FILL_DOUBLE",      NC_FILL_DOUBLE},
    Constant{"NC_FILL",             NC_FILL},
    Constant{"NC_NOFILL",           NC_NOFILL},
    Constant{"NC_NOWRITE",          NC_NOWRITE},
    Constant{"NC_WRITE",            NC_WRITE},
    Constant{"NC_CLOBBER",          NC_CLOBBER},
    Constant{"NC_NOCLOBBER",        NC_NOCLOBBER},
    Constant{"NC_64BIT_OFFSET",     NC_64BIT_OFFSET},
    Constant{"NC_SHARE",            NC_SHARE},
    Constant{"NC_LOCK",             NC_LOCK},
    Constant{"NC_FORMAT_CLASSIC",   NC_FORMAT_CLASSIC},
    Constant{"NC_FORMAT_64BIT",     NC_FORMAT_64BIT},
    Constant{"NC_MAX_DIMS",         NC_MAX_DIMS},
    Constant{"NC_MAX_ATTRS",        NC_MAX_ATTRS},
    Constant{"NC_MAX_VARS",         NC_MAX_VARS},
    Constant{"NC_MAX_NAME",         NC_MAX_NAME},
    Constant{"NC_MAX_VAR_DIMS",     NC_MAX_VAR_DIMS},
    Constant{"NC2_ERR",             NC2_ERR},
    Constant{"NC_NOERR",            NC_NOERR},
    Constant{"NC_EBADID",           NC_EBADID},
    Constant{"NC_ENFILE",           NC_ENFILE},
    Constant{"NC_EEXIST",           NC_EEXIST},
    Constant{"NC_EINVAL",           NC_EINVAL},
    Constant{"NC_EPERM",            NC_EPERM},
    Constant{"NC_ENOTINDEFINE",     NC_ENOTINDEFINE},
    Constant{"NC_EINDEFINE",        NC_EINDEFINE},
    Constant{"NC_EINVALCOORDS",     NC_EINVALCOORDS},
    Constant{"NC_EMAXDIMS",         NC_EMAXDIMS},
    Constant{"NC_ENAMEINUSE",       NC_ENAMEINUSE},
    Constant{"NC_ENOTATT",          NC_ENOTATT},
    Constant{"NC_EMAXATTS",         NC_EMAXATTS},
    Constant{"NC_EBADTYPE",         NC_EBADTYPE},
    Constant{"NC_EBADDIM",          NC_EBADDIM},
    Constant{"NC_EUNLIMPOS",        NC_EUNLIMPOS},
    Constant{"NC_EMAXVARS",         NC_EMAXVARS},
    Constant{"NC_ENOTVAR",          NC_ENOTVAR},
    Constant{"NC_EGLOBAL",          NC_EGLOBAL},
    Constant{"NC_ENOTNC",           NC_ENOTNC},
    Constant{"NC_ESTS",             NC_ESTS},
    Constant{"NC_EMAXNAME",         NC_EMAXNAME},
    Constant{"NC_EUNLIMIT",         NC_EUNLIMIT},
    Constant{"NC_ENORECVARS",       NC_ENORECVARS},
    Constant{"NC_ECHAR",            NC_ECHAR},
    Constant{"NC_EEDGE",            NC_EEDGE},
    Constant{"NC_ESTRIDE",          NC_ESTRIDE},
    Constant{"NC_EBADNAME",         NC_EBADNAME},
    Constant{"NC_ERANGE",           NC_ERANGE},
    Constant{"NC_ENOMEM",           NC_ENOMEM},
    Constant{"NC_EVARSIZE",         NC_EVARSIZE},
    Constant{"NC_EDIMSIZE",         NC_EDIMSIZE},
    Constant{"NC_ETRUNC",           NC_ETRUNC},
    Constant{"NC_FATAL",            NC_FATAL},
    Constant{"NC_GLOBAL",           NC_GLOBAL},
    Constant{"NC_UNLIMITED",        NC_UNLIMITED},
    Constant{"NC_SIZEHINT_DEFAULT", NC_SIZEHINT_DEFAULT},
    Constant{"NC_VERBOSE",          NC_VERBOSE},
};
// clang-format on
static_assert(constants.size() == 69);

} // namespace

Results constantNames(const Call & /*call*/) {
    Result cell{tsCELL, {constants.size(), 1}, {}, {}};
    std::transform(constants.begin(), constants.end(), std::back_inserter(cell.cells),
                   [](const Constant &constant) { return string(constant.name); });
    return {cell};
}

Results parameter(const Call &call) {
    if (call.inputs.size() != 1) {
        throw Refusal{"TESSEL:netcdf_tq:tqParameter:badInputParameterCount"};
    }
    std::string name = readName(call[0], "parameter");
    for (char &c : name) {
        c = static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
    }
    const auto *const found =
        std::find_if(constants.begin(), constants.end(), [&](const Constant &constant) {
            return constant.name == name || (std::string("NC_") + name == constant.name);
        });
    if (found == constants.end()) {
        throw Refusal{"TESSEL:netcdf:unrecognizedCharParameter", NC_NOERR, "\"" + name + "\""};
    }
    return {number(found->value)};
}

} // namespace difference
