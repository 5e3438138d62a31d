// tests/difference/operations.hpp: the operations by name, and what they have in common.
#pragma once

#include "tessel/class_id.h"

#include <array>
#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace difference {

/// What an operation does; the members of a typed family do the same.
enum class Verb {
    abort,
    close,
    constantNames,
    copyAtt,
    create,
    createTuned,
    defDim,
    defVar,
    delAtt,
    enddef,
    enddefTuned,
    getAtt,
    getVar,
    getVar1,
    getVara,
    getVars,
    inq,
    inqAtt,
    inqAttid,
    inqAttname,
    inqDim,
    inqDimid,
    inqLibvers,
    inqVar,
    inqVarid,
    open,
    openTuned,
    parameter,
    putAtt,
    putVar,
    putVar1,
    putVara,
    putVars,
    redef,
    renameAtt,
    renameDim,
    renameVar,
    setDefaultFormat,
    setFill,
    strerror,
    sync,
};

/// The members of a typed family, in the order in which we count them.
struct Member {
    const char *suffix;
    tsClassID classID;
};
inline constexpr std::array members = {
    Member{"double", tsDOUBLE}, Member{"float", tsSINGLE}, Member{"int", tsINT32},
    Member{"short", tsINT16},   Member{"schar", tsINT8},   Member{"uchar", tsUINT8},
    Member{"text", tsCHAR},
};
constexpr std::size_t textMember = 6;

struct Operation {
    Verb verb;
    std::size_t member; ///< 0 for an operation that is not of a typed family
    std::string shortName;
    std::string longName;
};

/// All 102 operations.
const std::vector<Operation> &operations();

/// The positions in operations() of those with that verb.
const std::vector<std::size_t> &operationsOf(Verb verb);

/// The operation that a user means by a name; nullptr when there is none.
const Operation *findOperation(std::string_view typed);

} // namespace difference
