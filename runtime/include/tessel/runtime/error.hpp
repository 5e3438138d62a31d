// tessel/runtime/error.hpp: the exception that a host error is.
#pragma once

#include <exception>
#include <memory>
#include <string>
#include <string_view>

namespace tessel {

/// A host error: what a module raised, or what the host itself refused. The host's own identifiers
/// begin with "TESSEL:host:". Both texts are valid UTF-8: a byte that is not becomes the character
/// of the same code. Cheap to copy, and neither making nor copying one throws: where there is no
/// memory for the texts, the error is "TESSEL:host:outOfMemory".
class Error : public std::exception {
  public:
    /// An error with copies of both texts.
    Error(std::string_view identifier, std::string_view message) noexcept;

    /// Shares the texts. There is no move, which would leave one without texts.
    Error(const Error &) noexcept = default;

    /// The same.
    Error &operator=(const Error &) noexcept = default;

    ~Error() override;

    /// Colon-separated, made for programs ("TESSEL:netcdf:open:noSuchFileOrDirectory").
    [[nodiscard]] const std::string &identifier() const noexcept { return texts->identifier; }

    /// Made for people.
    [[nodiscard]] const std::string &message() const noexcept { return texts->message; }

    /// The message.
    [[nodiscard]] const char *what() const noexcept override { return texts->message.c_str(); }

  private:
    struct Texts {
        std::string identifier;
        std::string message;
    };
    static const std::shared_ptr<const Texts> &spareTexts;
    std::shared_ptr<const Texts> texts;
};

} // namespace tessel
