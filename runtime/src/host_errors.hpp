// runtime/src/host_errors.hpp: the errors of the host's own.
#pragma once

#include "tessel/runtime/error.hpp"

#include <initializer_list>
#include <new>
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
    badOwner           = {"TESSEL:host:badOwner",           "The array is not the call's own: it is an input, or has been given away before."},
    noCall             = {"TESSEL:host:noCall",             "The function is for a module that is being called."},
    nestedCall         = {"TESSEL:host:nestedCall",         "A module cannot be called from within a call."},
    badOutputCount     = {"TESSEL:host:badOutputCount",     "A call has 0 to 8 outputs."},
    tooManyInputs      = {"TESSEL:host:tooManyInputs",      "The call has too many inputs."},
    missingInput       = {"TESSEL:host:missingInput",       "An input of the call is not there."},
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

/// What `make` makes, or the host's error instead of the standard library's exception.
template <class Make>
auto orOutOfMemory(const Make &make) {
    try {
        return make();
    } catch (const std::bad_alloc &) {
        raise(host_errors::outOfMemory);
    }
}

/// An error whose message goes on with what is given.
inline Error completed(const HostError &error,
                       std::initializer_list<std::string_view> texts) noexcept {
    try {
        std::string message = error.message;
        for (const std::string_view text : texts) {
            message += text;
        }
        return {error.identifier, message};
    } catch (const std::bad_alloc &) {
        return {host_errors::outOfMemory.identifier, host_errors::outOfMemory.message};
    }
}

} // namespace tessel
