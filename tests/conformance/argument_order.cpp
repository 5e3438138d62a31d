// tests/conformance/argument_order.cpp: each argument of each operation is checked, under its own
// name and in its turn.
//
// Every operation is called with one argument of no use, in each place; with two, where the first
// is the one to be named; and with one that is empty. Nothing reaches the library.
#include "support/conformance.hpp"
#include "support/members.hpp"

namespace tessel::test {
namespace {

/// An argument: one that will do, and what is said of a cell and of an empty double in its place.
struct Place {
    Value good;
    Outcome cellError;
    Outcome emptyError;
    bool emptyWillDo = false;
};

struct Signature {
    std::string operation;
    std::vector<Place> places;
};

Place id(const std::string &label) {
    return {0,
            refuses("TESSEL:netcdf:badIDDatatype",
                    label + " argument must be either double precision or int32, not cell"),
            refuses("TESSEL:netcdf:emptySetID", label + " argument cannot be []")};
}

Place name(const std::string &label) {
    const Outcome error =
        refuses("TESSEL:netcdf:argumentWasNotChar", label + " name argument must be character");
    return {"x", error, error};
}

Place size(const std::string &label) {
    return {0,
            refuses("TESSEL:netcdf:badSizeArgumentDatatype",
                    label + " argument must be either double precision or an unsigned integer "
                            "datatype"),
            refuses("TESSEL:netcdf:emptySetSizeParameter", label + " argument cannot be []")};
}

Place smallNumber(const std::string &label) {
    return {0,
            refuses("TESSEL:netcdf:unpackIntSingleton:badNumericType",
                    "argument must be either double precision or int32"),
            refuses("TESSEL:netcdf:unpackIntSingleton:argumentIsEmptySet",
                    label + " argument cannot be []")};
}

Place vector(const std::string &label) {
    return {0,
            refuses("TESSEL:netcdf:" + label + "ArgumentHasBadDatatype",
                    label + " argument must consist of discrete values between 0 and 2^31-1."),
            refuses("TESSEL:netcdf:" + label + "ArgumentIsEmpty",
                    label + " argument cannot be empty.")};
}

Place mode() {
    return {0,
            refuses("TESSEL:netcdf:badModeDatatype",
                    "mode argument must be either double precision, int32, or character"),
            refuses("TESSEL:netcdf:emptySetMode", "mode argument cannot be []")};
}

Place type() {
    return {
        6,
        refuses("TESSEL:netcdf:unpack_xtype:badDatatype",
                "datatype argument must be double precision"),
        refuses("TESSEL:netcdf:unpack_xtype:emptySetDatatype", "datatype argument cannot be []")};
}

Place dimids() {
    const Outcome error = refuses("TESSEL:netcdf:unpackDimids:badDimidsType",
                                  "Dimids argument must be double precision.");
    return {0, error, error, true};
}

Place variableData(const std::string &operation, const Member &member) {
    return {wholes(member.hostClass, {1}), wrongClass(operation, member, "cell"),
            refuses("TESSEL:netcdf:emptyVariableData", "Variable data must not be empty.")};
}

Place attributeData(const std::string &operation, const Member &member) {
    return {wholes(member.hostClass, {1}), wrongClass(operation, member, "cell"),
            wrongClass(operation, member, "double"), member.hostClass == tsDOUBLE};
}

// clang-format off
std::vector<Signature> signatures() {
    std::vector<Signature> list = {
        {"open",     {name("file"), mode()}},
        {"_open",    {name("file"), mode(), size("chunksizehint")}},
        {"create",   {name("file"), mode()}},
        {"_create",  {name("file"), mode(), size("initialsize")}},
        {"close",    {id("ncid")}},
        {"abort",    {id("ncid")}},
        {"sync",     {id("ncid")}},
        {"redef",    {id("ncid")}},
        {"enddef",   {id("ncid")}},
        {"end_def",  {id("ncid")}},
        {"_enddef",  {id("ncid"), size("h_minfree"), size("v_align"), size("v_minfree"), size("r_align")}},
        {"set_fill", {id("ncid"), smallNumber("new_fill_mode")}},
        {"set_default_format", {smallNumber("new_default_format")}},
        {"inq",      {id("ncid")}},
        {"strerror", {smallNumber("status")}},

        {"def_dim",    {id("ncid"), name("dimension"), size("dim_length")}},
        {"inq_dim",    {id("ncid"), id("dimid")}},
        {"inq_dimid",  {id("ncid"), name("dimension")}},
        {"rename_dim", {id("ncid"), id("dimid"), name("dimension")}},

        {"def_var",    {id("ncid"), name("variable"), type(), dimids()}},
        {"inq_var",    {id("ncid"), id("varid")}},
        {"inq_varid",  {id("ncid"), name("variable")}},
        {"rename_var", {id("ncid"), id("varid"), name("variable")}},

        {"inq_att",     {id("ncid"), id("varid"), name("attribute")}},
        {"inq_attid",   {id("ncid"), id("varid"), name("attribute")}},
        {"inq_attname", {id("ncid"), id("varid"), id("attid")}},
        {"rename_att",  {id("ncid"), id("varid"), name("attribute"), name("attribute")}},
        {"del_att",     {id("ncid"), id("varid"), name("attribute")}},
        {"copy_att",    {id("ncid"), id("varid"), name("attribute"), id("ncid"), id("varid")}},

        {"parameter",   {name("parameter")}},
    };
    for (const Member &member : members) {
        const auto data = [&](const std::string &family) { return variableData(family + member.suffix, member); };
        const auto values = [&](const std::string &family) { return attributeData(family + member.suffix, member); };
        const std::string &suffix = member.suffix;
        list.insert(list.end(), {
            {"get_att_" + suffix,  {id("ncid"), id("varid"), name("attribute")}},
            {"get_var_" + suffix,  {id("ncid"), id("varid")}},
            {"get_var1_" + suffix, {id("ncid"), id("varid"), vector("start")}},
            {"get_vara_" + suffix, {id("ncid"), id("varid"), vector("start"), vector("count")}},
            {"get_vars_" + suffix, {id("ncid"), id("varid"), vector("start"), vector("count"), vector("stride")}},
            {"put_var_" + suffix,  {id("ncid"), id("varid"), data("put_var_")}},
            {"put_var1_" + suffix, {id("ncid"), id("varid"), vector("start"), data("put_var1_")}},
            {"put_vara_" + suffix, {id("ncid"), id("varid"), vector("start"), vector("count"), data("put_vara_")}},
            {"put_vars_" + suffix, {id("ncid"), id("varid"), vector("start"), vector("count"), vector("stride"), data("put_vars_")}},
        });
        if (suffix == "text") {
            list.push_back({"put_att_text", {id("ncid"), id("varid"), name("attribute"), values("put_att_")}});
        } else {
            list.push_back({"put_att_" + suffix, {id("ncid"), id("varid"), name("attribute"), type(), values("put_att_")}});
        }
    }
    return list;
}
// clang-format on

/// "_create" has one argument more, which is not looked at.
Values callOf(const Signature &signature) {
    Values call = {signature.operation.c_str()};
    for (const Place &place : signature.places) {
        call.push_back(place.good);
    }
    if (signature.operation == "_create") {
        call.push_back(cell());
    }
    return call;
}

Rows rows() {
    Rows list;
    for (const Signature &signature : signatures()) {
        const Values good = callOf(signature);
        const std::vector<Place> &places = signature.places;
        for (std::size_t first = 0; first < places.size(); ++first) {
            const std::string title =
                signature.operation + ", argument " + std::to_string(first + 1);
            Values call = good;
            call[first + 1] = cell();
            list.push_back({title + " a cell", On::nothing, call, places[first].cellError});
            for (std::size_t second = first + 1; second < places.size(); ++second) {
                Values both = call;
                both[second + 1] = cell();
                list.push_back({title + " a cell and " + std::to_string(second + 1) + " too",
                                On::nothing, both, places[first].cellError});
            }
            if (!places[first].emptyWillDo) {
                call[first + 1] = empty(tsDOUBLE);
                list.push_back({title + " empty", On::nothing, call, places[first].emptyError});
            }
        }
    }
    return list;
}

INSTANTIATE_TEST_SUITE_P(ArgumentOrder, Conformance, testing::ValuesIn(rows()), titleOf);

} // namespace
} // namespace tessel::test
