// module/call/error.hpp: what an error is, and the one place where a call is ended by one.
#pragma once

#include "tessel/extension.h"

#include <cstddef>
#include <string>
#include <string_view>
#include <type_traits>

namespace tessel::netcdf {

/// The conversion that a message needs for an argument of type T.
template <class T>
inline constexpr char conversion = '\0';
template <>
inline constexpr char conversion<const char *> = 's';
template <>
inline constexpr char conversion<int> = 'd';
template <>
inline constexpr char conversion<unsigned> = 'u';
template <>
inline constexpr char conversion<double> = 'f';

/// True if the conversions of `format`, in order, are those of the leading Arguments. Arguments
/// that are left over are allowed: a message need not mention all that is known.
template <class... Arguments>
consteval bool conversionsMatch(std::string_view format) {
    constexpr char expected[] = {conversion<Arguments>..., '\0'};
    std::size_t next = 0;
    for (std::size_t at = 0; at < format.size(); ++at) {
        if (format[at] == '%' && (++at == format.size() || format[at] != expected[next++])) {
            return false;
        }
    }
    return next <= sizeof...(Arguments);
}

/// A message in the manner of printf whose arguments have the given types, checked when compiled.
template <class... Arguments>
struct Message {
    const char *format;

    consteval Message(const char *text) : format(text) {
        if (!conversionsMatch<Arguments...>(text)) {
            throw "the conversions of the message do not match its argument types";
        }
    }
};

/// One row of the error catalogue: an identifier and its message.
template <class... Arguments>
struct Error {
    const char *identifier;
    Message<Arguments...> message;
};

/// Ends the call with a host error; nothing after it runs. Every error of the module goes through
/// here. The identifier is given by itself where a part of it is known only now.
template <class... Arguments>
[[noreturn]] void raise(const char *identifier, const Message<Arguments...> &message,
                        std::type_identity_t<Arguments>... arguments) {
    if constexpr (sizeof...(Arguments) == 0) {
        tsxErrMsgIdAndTxt(identifier, "%s", message.format);
    } else {
        tsxErrMsgIdAndTxt(identifier, message.format, arguments...);
    }
}

template <class... Arguments>
[[noreturn]] void raise(const Error<Arguments...> &error,
                        std::type_identity_t<Arguments>... arguments) {
    raise(error.identifier, error.message, arguments...);
}

/// The same where the identifier embeds a name that is known only now: "TESSEL:netcdf:", the name,
/// and the row's identifier, which here is only the rest.
template <class... Arguments>
[[noreturn]] void raiseNamed(const char *name, const Error<Arguments...> &error,
                             std::type_identity_t<Arguments>... arguments) {
    const std::string identifier = std::string("TESSEL:netcdf:") + name + error.identifier;
    raise(identifier.c_str(), error.message, arguments...);
}

} // namespace tessel::netcdf
