// runtime/src/error.cpp: the exception that a host error is.
#include "tessel/runtime/error.hpp"

namespace tessel {

Error::Error(std::string_view identifier, std::string_view message)
    : texts(std::make_shared<const Texts>(Texts{std::string(identifier), std::string(message)})) {}

} // namespace tessel
