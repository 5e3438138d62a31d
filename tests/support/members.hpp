// tests/support/members.hpp: the seven members that every typed family has.
#pragma once

#include "support/row.hpp"

#include <array>
#include <span>
#include <string>

namespace tessel::test {

struct Member {
    std::string suffix;
    tsClassID hostClass;
    std::string className;
    std::string wanted; ///< what the refusal of another class calls the class it wants
};

/// In the order that every family has.
inline const std::array<Member, 7> members = {
    Member{"double", tsDOUBLE, "double", "double precision"},
    Member{"float", tsSINGLE, "single", "single precision"},
    Member{"int", tsINT32, "int32", "int32"},
    Member{"short", tsINT16, "int16", "int16"},
    Member{"schar", tsINT8, "int8", "int8"},
    Member{"uchar", tsUINT8, "uint8", "uint8"},
    Member{"text", tsCHAR, "char", "char"},
};

/// All but text.
inline std::span<const Member> numericMembers() {
    return std::span(members).first(members.size() - 1);
}

/// What a write says of data of another class than the member's.
inline Outcome wrongClass(const std::string &operation, const Member &member,
                          const std::string &found) {
    return refuses("TESSEL:netcdf:" + operation + ":badDatatype",
                   "The input datatype for " + operation + " must be " + member.wanted + ", not " +
                       found + ".");
}

} // namespace tessel::test
