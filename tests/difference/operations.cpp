// tests/difference/operations.cpp: the operations by name.
#include "operations.hpp"

#include <cctype>
#include <map>

namespace difference {
namespace {

struct Named {
    Verb verb;
    const char *name;
};

constexpr std::array single = {
    Named{Verb::abort, "abort"},
    Named{Verb::close, "close"},
    Named{Verb::copyAtt, "copy_att"},
    Named{Verb::createTuned, "_create"},
    Named{Verb::create, "create"},
    Named{Verb::defDim, "def_dim"},
    Named{Verb::defVar, "def_var"},
    Named{Verb::delAtt, "del_att"},
    Named{Verb::enddefTuned, "_enddef"},
    Named{Verb::enddef, "end_def"},
    Named{Verb::enddef, "enddef"},
    Named{Verb::inq, "inq"},
    Named{Verb::inqAtt, "inq_att"},
    Named{Verb::inqAttid, "inq_attid"},
    Named{Verb::inqAttname, "inq_attname"},
    Named{Verb::inqDim, "inq_dim"},
    Named{Verb::inqDimid, "inq_dimid"},
    Named{Verb::inqLibvers, "inq_libvers"},
    Named{Verb::inqVarid, "inq_varid"},
    Named{Verb::inqVar, "inq_var"},
    Named{Verb::openTuned, "_open"},
    Named{Verb::open, "open"},
    Named{Verb::redef, "redef"},
    Named{Verb::renameAtt, "rename_att"},
    Named{Verb::renameDim, "rename_dim"},
    Named{Verb::renameVar, "rename_var"},
    Named{Verb::setDefaultFormat, "set_default_format"},
    Named{Verb::setFill, "set_fill"},
    Named{Verb::strerror, "strerror"},
    Named{Verb::sync, "sync"},
};

constexpr std::array families = {
    Named{Verb::getAtt, "get_att_"},   Named{Verb::getVar, "get_var_"},
    Named{Verb::getVar1, "get_var1_"}, Named{Verb::getVara, "get_vara_"},
    Named{Verb::getVars, "get_vars_"}, Named{Verb::putAtt, "put_att_"},
    Named{Verb::putVar, "put_var_"},   Named{Verb::putVar1, "put_var1_"},
    Named{Verb::putVara, "put_vara_"}, Named{Verb::putVars, "put_vars_"},
};

std::vector<Operation> listed() {
    std::vector<Operation> list = {
        {Verb::constantNames, 0, "get_constant_names", "get_constant_names"},
        {Verb::parameter, 0, "param", "parameter"},
    };
    const auto add = [&](Verb verb, std::size_t member, const std::string &name) {
        list.push_back({verb, member, name, "nc_" + name});
    };
    for (const Named &one : single) {
        add(one.verb, 0, one.name);
    }
    for (const Named &family : families) {
        for (std::size_t i = 0; i < members.size(); ++i) {
            add(family.verb, i, std::string(family.name) + members.at(i).suffix);
        }
    }
    return list;
}

} // namespace

const std::vector<Operation> &operations() {
    static const std::vector<Operation> list = listed();
    return list;
}

const std::vector<std::size_t> &operationsOf(Verb verb) {
    static const auto byVerb = [] {
        std::map<Verb, std::vector<std::size_t>> grouped;
        for (std::size_t i = 0; i < operations().size(); ++i) {
            grouped[operations()[i].verb].push_back(i);
        }
        return grouped;
    }();
    return byVerb.at(verb);
}

const Operation *findOperation(std::string_view typed) {
    static const auto byName = [] {
        std::map<std::string, const Operation *> names;
        for (const Operation &operation : operations()) {
            names.emplace(operation.longName, &operation);
            names.emplace(operation.shortName, &operation);
        }
        return names;
    }();
    std::string folded(typed);
    for (char &c : folded) {
        c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    }
    const auto found = byName.find(folded);
    return found == byName.end() ? nullptr : found->second;
}

} // namespace difference
