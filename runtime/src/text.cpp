// runtime/src/text.cpp: between UTF-16, which host characters are, and UTF-8.
#include "text.hpp"

#include <algorithm>
#include <array>
#include <vector>

namespace tessel {
namespace {

constexpr char32_t firstSurrogate = 0xD800;
constexpr char32_t firstLowSurrogate = 0xDC00;
constexpr char32_t lastSurrogate = 0xDFFF;
constexpr char32_t firstSupplementary = 0x10000;
constexpr char32_t lastCharacter = 0x10FFFF;
constexpr char32_t replacement = 0xFFFD;

/// A character and the number of units it was read from.
struct Read {
    char32_t character;
    std::size_t units;
};

/// The forms of UTF-8, by number of bytes: what the first byte looks like under a mask, and the
/// smallest character that is written so.
struct Form {
    std::size_t bytes;
    unsigned mask;
    unsigned lead;
    char32_t smallest;
};
constexpr std::array forms = {
    Form{1, 0x80, 0x00, 0},
    Form{2, 0xE0, 0xC0, 0x80},
    Form{3, 0xF0, 0xE0, 0x800},
    Form{4, 0xF8, 0xF0, 0x10000},
};

bool isSurrogate(char32_t c) noexcept {
    return c >= firstSurrogate && c <= lastSurrogate;
}

/// The first character of a text that is not empty.
Read readUtf8(std::string_view text) noexcept {
    const auto byte = [&](std::size_t i) { return static_cast<unsigned char>(text[i]); };
    const Read single = {byte(0), 1};
    for (const Form &form : forms) {
        if ((byte(0) & form.mask) != form.lead) {
            continue;
        }
        if (form.bytes > text.size()) {
            return single;
        }
        char32_t character = byte(0) & ~form.mask & 0xFFU;
        for (std::size_t i = 1; i < form.bytes; ++i) {
            if ((byte(i) & 0xC0U) != 0x80U) {
                return single;
            }
            character = character << 6U | (byte(i) & 0x3FU);
        }
        const bool valid =
            character >= form.smallest && character <= lastCharacter && !isSurrogate(character);
        return valid ? Read{character, form.bytes} : single;
    }
    return single;
}

/// The first character of host characters that are not empty.
Read readUtf16(std::span<const tsChar> text) noexcept {
    const char32_t first = text[0];
    if (!isSurrogate(first)) {
        return {first, 1};
    }
    if (first < firstLowSurrogate && text.size() > 1) {
        const char32_t second = text[1];
        if (second >= firstLowSurrogate && second <= lastSurrogate) {
            return {firstSupplementary + ((first - firstSurrogate) << 10U) +
                        (second - firstLowSurrogate),
                    2};
        }
    }
    return {replacement, 1};
}

const Form &formOf(char32_t character) noexcept {
    std::size_t i = forms.size() - 1;
    while (character < forms[i].smallest) {
        --i;
    }
    return forms[i];
}

/// How many ASCII characters a text begins with. They are the same in both forms, and most texts
/// have no others.
template <class Text>
std::size_t asciiLength(const Text &text) noexcept {
    const auto isAscii = [](auto unit) { return (unit & ~0x7F) == 0; };
    const auto end = std::find_if_not(text.begin(), text.end(), isAscii);
    return static_cast<std::size_t>(end - text.begin());
}

} // namespace

std::size_t utf16Length(std::string_view utf8) noexcept {
    std::size_t length = asciiLength(utf8);
    utf8.remove_prefix(length);
    while (!utf8.empty()) {
        const Read read = readUtf8(utf8);
        length += read.character >= firstSupplementary ? 2 : 1;
        utf8.remove_prefix(read.units);
    }
    return length;
}

void writeUtf16(std::string_view utf8, tsChar *out) noexcept {
    const std::size_t ascii = asciiLength(utf8);
    out = std::copy_n(utf8.begin(), ascii, out);
    utf8.remove_prefix(ascii);
    while (!utf8.empty()) {
        const Read read = readUtf8(utf8);
        if (read.character >= firstSupplementary) {
            const char32_t offset = read.character - firstSupplementary;
            *out++ = static_cast<tsChar>(firstSurrogate + (offset >> 10U));
            *out++ = static_cast<tsChar>(firstLowSurrogate + (offset & 0x3FFU));
        } else {
            *out++ = static_cast<tsChar>(read.character);
        }
        utf8.remove_prefix(read.units);
    }
}

std::size_t utf8Length(std::span<const tsChar> utf16) noexcept {
    std::size_t length = asciiLength(utf16);
    utf16 = utf16.subspan(length);
    while (!utf16.empty()) {
        const Read read = readUtf16(utf16);
        length += formOf(read.character).bytes;
        utf16 = utf16.subspan(read.units);
    }
    return length;
}

void writeUtf8(std::span<const tsChar> utf16, char *out) noexcept {
    const std::size_t ascii = asciiLength(utf16);
    out = std::transform(utf16.begin(), utf16.begin() + static_cast<std::ptrdiff_t>(ascii), out,
                         [](tsChar unit) { return static_cast<char>(unit); });
    utf16 = utf16.subspan(ascii);
    while (!utf16.empty()) {
        const Read read = readUtf16(utf16);
        const Form &form = formOf(read.character);
        for (std::size_t i = form.bytes; i-- > 0;) {
            const auto shift = static_cast<unsigned>(6 * (form.bytes - 1 - i));
            const auto bits = static_cast<unsigned>(read.character >> shift);
            out[i] = static_cast<char>(i == 0 ? form.lead | bits : 0x80U | (bits & 0x3FU));
        }
        out += form.bytes;
        utf16 = utf16.subspan(read.units);
    }
}

std::string validUtf8(std::string_view text) {
    std::vector<tsChar> characters(utf16Length(text));
    writeUtf16(text, characters.data());
    std::string valid(utf8Length(characters), '\0');
    writeUtf8(characters, valid.data());
    return valid;
}

} // namespace tessel
