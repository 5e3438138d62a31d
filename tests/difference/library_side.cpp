// tests/difference/library_side.cpp: the side that calls the library directly.
#include "library_side.hpp"

#include "text.hpp"

#include <algorithm>
#include <array>
#include <cstdint>

namespace difference {
namespace {

using NameRoom = std::array<char, NC_MAX_NAME + 1>;

/// The operations that take a path and a mode and give the dataset's id.
template <int (*function)(const char *path, int mode, int *ncid)>
Results onPath(const Call &call) {
    const std::string path = readName(call[0], "file");
    const int mode = readMode(call[1]);
    int ncid = 0;
    call.check(function(path.c_str(), mode, &ncid));
    return {number(ncid)};
}

Results createTuned(const Call &call) {
    const std::string path = readName(call[0], "file");
    const int mode = readMode(call[1]);
    const std::size_t initial = readSize(call[2], "initialsize");
    std::size_t hint = initial;
    int ncid = 0;
    call.check(nc__create(path.c_str(), mode, initial, &hint, &ncid));
    return {number(static_cast<double>(hint)), number(ncid)};
}

Results openTuned(const Call &call) {
    const std::string path = readName(call[0], "file");
    const int mode = readMode(call[1]);
    std::size_t hint = readSize(call[2], "chunksizehint");
    int ncid = 0;
    call.check(nc__open(path.c_str(), mode, &hint, &ncid));
    return {number(static_cast<double>(hint)), number(ncid)};
}

/// The operations that take a dataset and give nothing back.
template <int (*function)(int ncid)>
Results onDataset(const Call &call) {
    call.check(function(call.id(0, "ncid")));
    return {};
}

Results enddefTuned(const Call &call) {
    const int ncid = call.id(0, "ncid");
    const std::size_t headerFree = readSize(call[1], "h_minfree");
    const std::size_t align = readSize(call[2], "v_align");
    const std::size_t dataFree = readSize(call[3], "v_minfree");
    const std::size_t recordAlign = readSize(call[4], "r_align");
    call.check(nc__enddef(ncid, headerFree, align, dataFree, recordAlign));
    return {};
}

Results setFill(const Call &call) {
    const int ncid = call.id(0, "ncid");
    int old = 0;
    call.check(nc_set_fill(ncid, readInt(call[1], "new_fill_mode"), &old));
    return {number(old)};
}

Results setDefaultFormat(const Call &call) {
    int old = 0;
    call.check(nc_set_default_format(readInt(call[0], "new_default_format"), &old));
    return {number(old)};
}

Results inq(const Call &call) {
    std::array<int, 4> counts{};
    call.check(nc_inq(call.id(0, "ncid"), &counts[0], &counts[1], &counts[2], &counts[3]));
    Results results;
    std::transform(counts.begin(), counts.end(), std::back_inserter(results), number);
    return results;
}

Results inqLibvers(const Call & /*call*/) {
    return {string(nc_inq_libvers())};
}

Results errorText(const Call &call) {
    return {string(nc_strerror(readInt(call[0], "status")))};
}

Results defDim(const Call &call) {
    const int ncid = call.id(0, "ncid");
    const std::string name = readName(call[1], "dimension");
    int dimid = 0;
    call.check(nc_def_dim(ncid, name.c_str(), readSize(call[2], "dim_length"), &dimid));
    return {number(dimid)};
}

Results inqDim(const Call &call) {
    const int ncid = call.id(0, "ncid");
    NameRoom name{};
    std::size_t length = 0;
    call.check(nc_inq_dim(ncid, call.id(1, "dimid"), name.data(), &length));
    return {string(name.data()), number(static_cast<double>(length))};
}

/// The operations that look for a name in a dataset.
template <int (*function)(int ncid, const char *name, int *id)>
Results lookUp(const Call &call, const char *label) {
    const int ncid = call.id(0, "ncid");
    int found = 0;
    call.check(function(ncid, readName(call[1], label).c_str(), &found));
    return {number(found)};
}
Results inqDimid(const Call &call) {
    return lookUp<nc_inq_dimid>(call, "dimension");
}
Results inqVarid(const Call &call) {
    return lookUp<nc_inq_varid>(call, "variable");
}

/// The operations that give a thing of a dataset another name.
template <int (*function)(int ncid, int id, const char *name)>
Results rename(const Call &call, const char *idLabel, const char *nameLabel) {
    const int ncid = call.id(0, "ncid");
    const int id = call.id(1, idLabel);
    call.check(function(ncid, id, readName(call[2], nameLabel).c_str()));
    return {};
}
Results renameDim(const Call &call) {
    return rename<nc_rename_dim>(call, "dimid", "dimension");
}
Results renameVar(const Call &call) {
    return rename<nc_rename_var>(call, "varid", "variable");
}

Results defVar(const Call &call) {
    const int ncid = call.id(0, "ncid");
    const std::string name = readName(call[1], "variable");
    const nc_type type = readType(call[2]);
    std::vector<int> dimids = readDimids(call[3]);
    if (call.deviation == Deviation::dimensionsAsIs) {
        std::reverse(dimids.begin(), dimids.end());
    }
    int varid = 0;
    call.check(nc_def_var(ncid, name.c_str(), type, static_cast<int>(dimids.size()), dimids.data(),
                          &varid));
    return {number(varid)};
}

Results inqVar(const Call &call) {
    const int ncid = call.id(0, "ncid");
    NameRoom name{};
    nc_type type = NC_NAT;
    int ndims = 0;
    int natts = 0;
    std::array<int, NC_MAX_VAR_DIMS> dimids{};
    call.check(
        nc_inq_var(ncid, call.id(1, "varid"), name.data(), &type, &ndims, dimids.data(), &natts));
    std::vector<double> turned(dimids.begin(), dimids.begin() + ndims);
    std::reverse(turned.begin(), turned.end());
    const std::size_t n = turned.size();
    return {string(name.data()), number(type), numbers(turned, {n == 0 ? 0U : 1U, n}),
            number(natts)};
}

/// A dataset, a variable or none, and an attribute of it.
struct Attribute {
    explicit Attribute(const Call &call)
        : ncid(call.id(0, "ncid")), varid(call.id(1, "varid")),
          name(readName(call[2], "attribute")) {}
    int ncid;
    int varid;
    std::string name;
};

Results inqAtt(const Call &call) {
    const Attribute at(call);
    nc_type type = NC_NAT;
    std::size_t length = 0;
    call.check(nc_inq_att(at.ncid, at.varid, at.name.c_str(), &type, &length));
    return {number(type), number(static_cast<double>(length))};
}

Results inqAttid(const Call &call) {
    const Attribute at(call);
    int id = 0;
    call.check(nc_inq_attid(at.ncid, at.varid, at.name.c_str(), &id));
    return {number(id)};
}

Results inqAttname(const Call &call) {
    const int ncid = call.id(0, "ncid");
    const int varid = call.id(1, "varid");
    NameRoom name{};
    call.check(nc_inq_attname(ncid, varid, call.id(2, "attid"), name.data()));
    return {string(name.data())};
}

Results renameAtt(const Call &call) {
    const Attribute at(call);
    const std::string next = readName(call[3], "attribute");
    call.check(nc_rename_att(at.ncid, at.varid, at.name.c_str(), next.c_str()));
    return {};
}

Results delAtt(const Call &call) {
    const Attribute at(call);
    call.check(nc_del_att(at.ncid, at.varid, at.name.c_str()));
    return {};
}

Results copyAtt(const Call &call) {
    const Attribute at(call);
    const int ncid = call.id(3, "ncid");
    call.check(nc_copy_att(at.ncid, at.varid, at.name.c_str(), ncid, call.id(4, "varid")));
    return {};
}

// clang-format off
constexpr std::array frames = {
    Frame{Verb::abort,            1, "abort:badInputArgumentCount",             "abort",            onDataset<nc_abort>},
    Frame{Verb::close,            1, "close:badInputParameterCount",            "close",            onDataset<nc_close>},
    Frame{Verb::copyAtt,          5, "copyAtt:badInputParameterCount",          "copyAtt",          copyAtt},
    Frame{Verb::create,           2, "create:badParameterCount",                "create",           onPath<nc_create>},
    Frame{Verb::createTuned,      4, "pCreate:badInputParameterCount",          "pCreate",          createTuned},
    Frame{Verb::defDim,           3, "defDim:badInputParameterCount",           "defDim",           defDim},
    Frame{Verb::defVar,           4, "defVar:badInputParameterCount",           "defVar",           defVar},
    Frame{Verb::delAtt,           3, "delAtt:badInputParameterCount",           "delAtt",           delAtt},
    Frame{Verb::enddef,           1, "enddef:badInputArgumentCount",            "endDef",           onDataset<nc_enddef>},
    Frame{Verb::enddefTuned,      5, "pEndDef:badParameterCount",               "pEndDef",          enddefTuned},
    Frame{Verb::getAtt,           3, "getAtt:badInputParameterCount",           "getAtt",           getAtt},
    Frame{Verb::getVar,           2, "getVar:badInputParameterCount",           "getVar",           getVar},
    Frame{Verb::getVar1,          3, "getVar1:badInputParameterCount",          "getVar1",          getVar1},
    Frame{Verb::getVara,          4, "getVara:badInputParameterCount",          "getVara",          getVara},
    Frame{Verb::getVars,          5, "getVars:badInputParameterCount",          "getVars",          getVars},
    Frame{Verb::inq,              1, "inq:badInputParameterCount",              "inq",              inq},
    Frame{Verb::inqAtt,           3, "inqAtt:badInputParameterCount",           "inqAtt",           inqAtt},
    Frame{Verb::inqAttid,         3, "inqAttID:badInputParameterCount",         "inqAttID",         inqAttid},
    Frame{Verb::inqAttname,       3, "inqAttName:badInputParameterCount",       "inqAttName",       inqAttname},
    Frame{Verb::inqDim,           2, "inqDim:badInputParameterCount",           "inqDim",           inqDim},
    Frame{Verb::inqDimid,         2, "inqDimID:badInputParameterCount",         "inqDimID",         inqDimid},
    Frame{Verb::inqLibvers,       0, "inqLibVers:badInputParameterCount",       "inqLibVers",       inqLibvers},
    Frame{Verb::inqVar,           2, "inqVar:badInputParameterCount",           "inqVar",           inqVar},
    Frame{Verb::inqVarid,         2, "inqVarID:badInputParameterCount",         "inqVarID",         inqVarid},
    Frame{Verb::open,             2, "open:badInputParameterCount",             "open",             onPath<nc_open>},
    Frame{Verb::openTuned,        3, "pOpen:badInputParameterCount",            "pOpen",            openTuned},
    Frame{Verb::putAtt,           5, "putAtt:badInputParameterCount",           "putAtt",           putAtt},
    Frame{Verb::putVar,           3, "putVar:badInputParameterCount",           "putVar",           putVar},
    Frame{Verb::putVar1,          4, "putVar1:badInputParameterCount",          "putVar1",          putVar1},
    Frame{Verb::putVara,          5, "putVara:badInputParameterCount",          "putVara",          putVara},
    Frame{Verb::putVars,          6, "putVars:badInputParameterCount",          "putVars",          putVars},
    Frame{Verb::redef,            1, "redef:badInputParameterCount",            "redef",            onDataset<nc_redef>},
    Frame{Verb::renameAtt,        4, "renameAtt:badInputParameterCount",        "renameAtt",        renameAtt},
    Frame{Verb::renameDim,        3, "renameDim:badInputParameterCount",        "renameDim",        renameDim},
    Frame{Verb::renameVar,        3, "renameVar:badInputParameterCount",        "renameVar",        renameVar},
    Frame{Verb::setDefaultFormat, 1, "setDefaultFormat:badInputParameterCount", "setDefaultFormat", setDefaultFormat},
    Frame{Verb::setFill,          2, "setFill:badInputParameterCount",          "setFill",          setFill},
    Frame{Verb::strerror,         1, "strerror:badInputArgumentCount",          "strerror",         errorText},
    Frame{Verb::sync,             1, "sync:badInputArgumentCount",              "sync",             onDataset<nc_sync>},
};
constexpr Frame textAttribute = {Verb::putAtt, 4, "putAttText:badInputParameterCount", "putAttText", putAttText};
// clang-format on

const Frame &frameOf(const Operation &operation) {
    if (operation.verb == Verb::putAtt && operation.member == textMember) {
        return textAttribute;
    }
    return *std::find_if(frames.begin(), frames.end(),
                         [&](const Frame &frame) { return frame.verb == operation.verb; });
}

Results runStep(const Step &step, Deviation deviation) {
    const Operation *const operation = findOperation(step.operation);
    if (operation == nullptr) {
        throw Refusal{"TESSEL:netcdf:InvalidOperation", NC_NOERR, "Unrecognized operation:  \""};
    }
    const std::string anyTag;
    // The two that are not the library's have frames of their own.
    if (operation->verb == Verb::constantNames) {
        return constantNames({*operation, step.inputs, anyTag, deviation});
    }
    if (operation->verb == Verb::parameter) {
        return parameter({*operation, step.inputs, anyTag, deviation});
    }
    const Frame &frame = frameOf(*operation);
    if (step.inputs.size() != frame.inputs) {
        throw Refusal{std::string("TESSEL:netcdf:") + frame.countIdentifier};
    }
    return frame.run({*operation, step.inputs, frame.tag, deviation});
}

Outcome outcomeOf(const Step &step, Deviation deviation) {
    Outcome outcome;
    try {
        outcome.results = runStep(step, deviation);
    } catch (const Refusal &refusal) {
        outcome.identifier = refusal.identifier;
        outcome.message = refusal.text;
        outcome.status = refusal.status;
    }
    return outcome;
}

} // namespace

void Call::check(int status, const std::string &inquiry) const {
    if (status != NC_NOERR) {
        const bool other = deviation == Deviation::otherWord && status == NC_ERANGE;
        throw Refusal{"TESSEL:netcdf:" + tag + ":" + inquiry +
                          (other ? "rangeError" : wordOf(status)),
                      status, nc_strerror(status)};
    }
}

void Call::want(bool holds, const char *word, int status) const {
    if (!holds) {
        throw Refusal{"TESSEL:netcdf:" + tag + ":" + word, status,
                      status == NC_NOERR ? "" : nc_strerror(status)};
    }
}

Result number(double value) {
    return numbers({value}, {1, 1});
}

Result numbers(const std::vector<double> &values, std::vector<std::size_t> dims) {
    return {tsDOUBLE, std::move(dims), bytesOf(values), {}};
}

Result string(std::string_view bytes) {
    const std::vector<std::uint16_t> units = toUtf16(bytes);
    return {tsCHAR, {1, units.size()}, bytesOf(units), {}};
}

Side librarySide(Deviation deviation) {
    return [deviation](const Step &step) { return outcomeOf(step, deviation); };
}

} // namespace difference
