// runtime/src/text.hpp: between UTF-16, which host characters are, and UTF-8.
#pragma once

#include "tessel/class_id.h"

#include <cstddef>
#include <span>
#include <string>
#include <string_view>

namespace tessel {

/// How many host characters a text makes. A byte that is not part of valid UTF-8 becomes the
/// character of the same code.
std::size_t utf16Length(std::string_view utf8) noexcept;

/// Writes them.
void writeUtf16(std::string_view utf8, tsChar *out) noexcept;

/// How many bytes host characters make as UTF-8. Half of a surrogate pair becomes U+FFFD, so that
/// what comes out is always valid.
std::size_t utf8Length(std::span<const tsChar> utf16) noexcept;

/// Writes them, without a terminator.
void writeUtf8(std::span<const tsChar> utf16, char *out) noexcept;

/// Copies a text of nothing but ASCII characters, which are the same in both forms; `out` has room
/// for as many, and is aligned as blocks are. False, and something or other in `out`, when the text
/// has a character besides.
bool copyIfAscii(std::string_view utf8, tsChar *out) noexcept;
bool copyIfAscii(std::span<const tsChar> utf16, char *out) noexcept;

/// The text, with every byte that is not part of valid UTF-8 made the character of the same code.
std::string validUtf8(std::string_view text);

} // namespace tessel
