// runtime/src/error.cpp: the exception that a host error is.
#include "tessel/runtime/error.hpp"

#include "host_errors.hpp"
#include "text.hpp"

namespace tessel {

/// Made when the library is loaded, for the time when there is no memory for anything else, and
/// never destroyed, because threads may still raise while the process ends.
const std::shared_ptr<const Error::Texts> &Error::spareTexts =
    *new const std::shared_ptr<const Texts>(
        new const Texts{host_errors::outOfMemory.identifier, host_errors::outOfMemory.message});

Error::Error(std::string_view identifier, std::string_view message) noexcept : texts(spareTexts) {
    try {
        texts = std::make_shared<const Texts>(Texts{validUtf8(identifier), validUtf8(message)});
    } catch (const std::exception &) { // and so the error says that memory is short
        return;
    }
}

Error::~Error() = default;

} // namespace tessel
