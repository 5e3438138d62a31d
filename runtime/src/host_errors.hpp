// runtime/src/host_errors.hpp: the errors of the host's own.
#pragma once

#include "tessel/runtime/error.hpp"

#include <string>
#include <string_view>

namespace tessel {

/// One row: an identifier and its message, which some raises complete.
struct HostError {
    const char *identifier;
    const char *message;
};

namespace host_errors {

// clang-format off
inline constexpr HostError
    outOfMemory        = {"TESSEL:host:outOfMemory",        "Out of memory."},
    dimensionsTooLarge = {"TESSEL:host:dimensionsTooLarge", "The dimensions of the array are too large."},
    badDimensions      = {"TESSEL:host:badDimensions",      "An array needs at least one dimension."},
    badClass           = {"TESSEL:host:badClass",           "The class of the array is not one that this works with."},
    badIndex           = {"TESSEL:host:badIndex",           "The index is beyond the end of the array."},
    badOwner           = {"TESSEL:host:badOwner",           "The array is not the call's to give: it is an input, or has been given before."},
    noCall             = {"TESSEL:host:noCall",             "The function is for a module that is being called."},
    nestedCall         = {"TESSEL:host:nestedCall",         "A module cannot be called from within a call."},
    tooManyOutputs     = {"TESSEL:host:tooManyOutputs",     "A call has at most 16 outputs."},
    foreignException   = {"TESSEL:host:foreignException",   "An exception that is not the host's left the module"},
    violation          = {"TESSEL:host:violation",          "The module broke a promise"},
    moduleNotFound     = {"TESSEL:host:moduleNotFound",     "there is no such file; looked for a shared object that exports tsxFunction"},
    notAModule         = {"TESSEL:host:notAModule",         "it is not a shared object that can be loaded; looked for one that exports tsxFunction"},
    noEntryPoint       = {"TESSEL:host:noEntryPoint",       "it does not export the entry point tsxFunction"};
// clang-format on

} // namespace host_errors

[[noreturn]] inline void raise(const HostError &error) {
    throw Error(error.identifier, error.message);
}

[[noreturn]] inline void raise(const HostError &error, std::string_view detail) {
    throw Error(error.identifier, std::string(error.message) + ": " + std::string(detail));
}

} // namespace tessel
