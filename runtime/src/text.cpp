// runtime/src/text.cpp: between UTF-16, which host characters are, and UTF-8.
#include "text.hpp"

#include <algorithm>
#include <array>
#include <type_traits>
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

/// ASCII characters are the same in both forms, and most texts have no others.
bool isAscii(unsigned unit) noexcept {
    return unit < 0x80;
}

/// How many ASCII characters a text begins with, of as many as are looked at together. Without a
/// way out of its middle, the loop over them is one that the compiler can make of vectors; what is
/// done with them next finds them in the nearest cache.
template <class Text>
std::size_t asciiAtOnce(const Text &text) noexcept {
    constexpr std::size_t most = 256;
    using Unit = std::make_unsigned_t<std::remove_const_t<typename Text::value_type>>;
    const std::size_t length = std::min(most, text.size());
    Unit all = 0;
    for (std::size_t i = 0; i < length; ++i) {
        all = static_cast<Unit>(all | static_cast<Unit>(text.data()[i]));
    }
    if (isAscii(all)) {
        return length;
    }
    std::size_t ascii = 0;
    while (isAscii(static_cast<Unit>(text.data()[ascii]))) {
        ++ascii;
    }
    return ascii;
}

/// One pass over the text, as wide as the compiler's vectors are; it ends within a page or so of
/// the first character that is not ASCII.
template <class Text, class Out>
bool copyWhileAscii(const Text &text, Out *__restrict out) noexcept {
    constexpr std::size_t most = 4096;
    using Unit = std::make_unsigned_t<std::remove_const_t<typename Text::value_type>>;
    Unit all = 0;
    for (std::size_t from = 0; from < text.size() && isAscii(all); from += most) {
        const std::size_t end = from + std::min(most, text.size() - from);
        for (std::size_t i = from; i < end; ++i) {
            const auto unit = static_cast<Unit>(text.data()[i]);
            all = static_cast<Unit>(all | unit);
            out[i] = static_cast<Out>(unit);
        }
    }
    return isAscii(all);
}

} // namespace

bool copyIfAscii(std::string_view utf8, tsChar *out) noexcept {
    return copyWhileAscii(utf8, out);
}
bool copyIfAscii(std::span<const tsChar> utf16, char *out) noexcept {
    return copyWhileAscii(utf16, out);
}

std::size_t utf16Length(std::string_view utf8) noexcept {
    std::size_t length = 0;
    while (!utf8.empty()) {
        if (isAscii(static_cast<unsigned char>(utf8.front()))) {
            const std::size_t ascii = asciiAtOnce(utf8);
            length += ascii;
            utf8.remove_prefix(ascii);
            continue;
        }
        const Read read = readUtf8(utf8);
        length += read.character >= firstSupplementary ? 2 : 1;
        utf8.remove_prefix(read.units);
    }
    return length;
}

void writeUtf16(std::string_view utf8, tsChar *out) noexcept {
    while (!utf8.empty()) {
        if (isAscii(static_cast<unsigned char>(utf8.front()))) {
            const std::size_t ascii = asciiAtOnce(utf8);
            out = std::copy_n(utf8.begin(), ascii, out);
            utf8.remove_prefix(ascii);
            continue;
        }
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
    std::size_t length = 0;
    while (!utf16.empty()) {
        if (isAscii(utf16.front())) {
            const std::size_t ascii = asciiAtOnce(utf16);
            length += ascii;
            utf16 = utf16.subspan(ascii);
            continue;
        }
        const Read read = readUtf16(utf16);
        length += formOf(read.character).bytes;
        utf16 = utf16.subspan(read.units);
    }
    return length;
}

void writeUtf8(std::span<const tsChar> utf16, char *out) noexcept {
    while (!utf16.empty()) {
        if (isAscii(utf16.front())) {
            const auto ascii = utf16.first(asciiAtOnce(utf16));
            out = std::transform(ascii.begin(), ascii.end(), out,
                                 [](tsChar unit) { return static_cast<char>(unit); });
            utf16 = utf16.subspan(ascii.size());
            continue;
        }
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
