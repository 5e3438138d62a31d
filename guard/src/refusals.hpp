// guard/src/refusals.hpp: why a call is refused, a row each.
#pragma once

#include "tessel/runtime/error.hpp"

#include <string>

namespace tessel::guard {

/// An identifier, and what its message says after the particulars of the call.
struct Refusal {
    const char *identifier;
    const char *reason;
};

// clang-format off
inline constexpr Refusal
    alignment = {"TESSEL:guard:alignment", "the library divides by the alignment of the data and of the records and multiplies by it again, so that it must be at least 1 and below 2^63 (4 is the usual one)"},
    mode      = {"TESSEL:guard:mode",      "the library follows an invalid pointer when it is given this mode flag without what belongs to it"},
    mapping   = {"TESSEL:guard:mapping",   "the library does not look whether what it maps is there: what is not ends the process, or is lost when it is written"},
    closed    = {"TESSEL:guard:closed",    "an earlier closing of the dataset failed, and the library may have freed its memory but not its id"},
    name      = {"TESSEL:guard:name",      "the library stores a name as it is composed, and copies it over the end of buffers of the size that its documentation gives"},
    redefinition = {"TESSEL:guard:redefinition", "the library counts records with 31 bits when it moves them: of more it moves none, and does not say so"},
    lengths   = {"TESSEL:guard:lengths",   "the library would take the length for a negative number, divide by zero, or lay variables over one another"},
    counts    = {"TESSEL:guard:counts",    "the library would write what is beyond the data, or for ever"},
    records   = {"TESSEL:guard:records",   "every record before it would be filled first; with set_fill(ncid, NC_NOFILL) they are left as they are"},
    position  = {"TESSEL:guard:position",  "the library would take the position for a negative number, and read or write memory in its stead"},
    header    = {"TESSEL:guard:header",    "the library would trust the header"},
    remote    = {"TESSEL:guard:remote",    "the library would fetch it; addresses are to be allowed first"};
// clang-format on

[[noreturn]] inline void refuse(const Refusal &refusal, const std::string &particulars) {
    throw Error(refusal.identifier,
                "The call was not made: " + particulars + ", and " + refusal.reason + ".");
}

} // namespace tessel::guard
