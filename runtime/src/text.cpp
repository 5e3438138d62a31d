// runtime/src/text.cpp: between UTF-16, which host characters are, and UTF-8.
#include "text.hpp"

#include <algorithm>
#include <array>
#include <cstdint>
#include <cstring>
#include <limits>
#include <type_traits>
#include <vector>

#ifdef __SSE2__
#include <emmintrin.h>
#endif

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

/// The first character of UTF-8 that is not empty; a byte that begins none stands for itself.
Read readFirst(std::span<const char> text) noexcept {
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
Read readFirst(std::span<const tsChar> text) noexcept {
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
template <class Unit>
bool isAscii(Unit unit) noexcept {
    return static_cast<std::make_unsigned_t<Unit>>(unit) < 0x80;
}

/// How many ASCII characters a text begins with, or fewer where they are very many: what is done
/// with them next finds them in the nearest cache. They are looked at a word at a time, and so it
/// takes hardly longer than they are many, however often others stand between them.
template <class Unit>
std::size_t asciiRun(std::span<const Unit> text) noexcept {
    constexpr std::uint64_t largest = std::numeric_limits<std::make_unsigned_t<Unit>>::max();
    constexpr std::uint64_t notAscii = ~std::uint64_t{0} / largest * (largest - 0x7F);
    constexpr std::size_t units = sizeof(notAscii) / sizeof(Unit);
    constexpr std::size_t most = 4096;
    const std::size_t end = std::min(most, text.size());
    std::size_t ascii = 0;
    for (; ascii + units <= end; ascii += units) {
        std::uint64_t word = 0;
        std::memcpy(&word, text.data() + ascii, sizeof(word));
        if ((word & notAscii) != 0) {
            break;
        }
    }
    while (ascii < end && isAscii(text[ascii])) {
        ++ascii;
    }
    return ascii;
}

/// Goes through a text with a result so far, which `ofRun` takes further with characters that are
/// ASCII, many at once, and `ofCharacter` with each other one. Gives back what has become of it.
template <class Unit, class Result, class OfRun, class OfCharacter>
Result fold(std::span<const Unit> text, Result result, OfRun ofRun,
            OfCharacter ofCharacter) noexcept {
    while (!text.empty()) {
        if (isAscii(text.front())) {
            const std::size_t ascii = asciiRun(text);
            result = ofRun(result, text.first(ascii));
            text = text.subspan(ascii);
        } else {
            const Read read = readFirst(text);
            result = ofCharacter(result, read.character);
            text = text.subspan(read.units);
        }
    }
    return result;
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

/// How many characters of a large text were copied, in whole vectors, before one that is not ASCII.
/// What is written past the caches is not read before, and that is a third of what the copy costs
/// in memory; what fits into the caches is used next from there, and none of it is copied here.
std::size_t copyPastCaches([[maybe_unused]] std::string_view text,
                           [[maybe_unused]] tsChar *out) noexcept {
    std::size_t copied = 0;
#ifdef __SSE2__
    constexpr std::size_t large = std::size_t{1} << 20U;
    constexpr std::size_t step = sizeof(__m128i);
    if (text.size() < large) {
        return 0;
    }
    const __m128i zeros = _mm_setzero_si128();
    for (; copied + step <= text.size(); copied += step) {
        const __m128i bytes =
            _mm_loadu_si128(reinterpret_cast<const __m128i *>(text.data() + copied));
        if (_mm_movemask_epi8(bytes) != 0) { // a byte's first bit is set
            break;
        }
        auto *const to = reinterpret_cast<__m128i *>(out + copied);
        _mm_stream_si128(to, _mm_unpacklo_epi8(bytes, zeros));
        _mm_stream_si128(to + 1, _mm_unpackhi_epi8(bytes, zeros));
    }
    _mm_sfence();
#endif
    return copied;
}

} // namespace

bool copyIfAscii(std::string_view utf8, tsChar *out) noexcept {
    const std::size_t copied = copyPastCaches(utf8, out);
    return copyWhileAscii(utf8.substr(copied), out + copied);
}
bool copyIfAscii(std::span<const tsChar> utf16, char *out) noexcept {
    return copyWhileAscii(utf16, out);
}

std::size_t utf16Length(std::string_view utf8) noexcept {
    return fold(
        std::span(utf8), std::size_t{0},
        [](std::size_t length, std::span<const char> ascii) { return length + ascii.size(); },
        [](std::size_t length, char32_t character) {
            return length + (character >= firstSupplementary ? 2 : 1);
        });
}

void writeUtf16(std::string_view utf8, tsChar *out) noexcept {
    fold(
        std::span(utf8), out,
        [](tsChar *to, std::span<const char> ascii) {
            return std::copy(ascii.begin(), ascii.end(), to);
        },
        [](tsChar *to, char32_t character) {
            if (character >= firstSupplementary) {
                const char32_t offset = character - firstSupplementary;
                *to++ = static_cast<tsChar>(firstSurrogate + (offset >> 10U));
                *to++ = static_cast<tsChar>(firstLowSurrogate + (offset & 0x3FFU));
            } else {
                *to++ = static_cast<tsChar>(character);
            }
            return to;
        });
}

std::size_t utf8Length(std::span<const tsChar> utf16) noexcept {
    return fold(
        utf16, std::size_t{0},
        [](std::size_t length, std::span<const tsChar> ascii) { return length + ascii.size(); },
        [](std::size_t length, char32_t character) { return length + formOf(character).bytes; });
}

void writeUtf8(std::span<const tsChar> utf16, char *out) noexcept {
    fold(
        utf16, out,
        [](char *to, std::span<const tsChar> ascii) {
            return std::transform(ascii.begin(), ascii.end(), to,
                                  [](tsChar unit) { return static_cast<char>(unit); });
        },
        [](char *to, char32_t character) {
            const Form &form = formOf(character);
            for (std::size_t i = form.bytes; i-- > 0;) {
                const auto shift = static_cast<unsigned>(6 * (form.bytes - 1 - i));
                const auto bits = static_cast<unsigned>(character >> shift);
                to[i] = static_cast<char>(i == 0 ? form.lead | bits : 0x80U | (bits & 0x3FU));
            }
            return to + form.bytes;
        });
}

std::string validUtf8(std::string_view text) {
    if (asciiRun(std::span(text)) == text.size()) {
        return std::string(text);
    }
    std::vector<tsChar> characters(utf16Length(text));
    writeUtf16(text, characters.data());
    std::string valid(utf8Length(characters), '\0');
    writeUtf8(characters, valid.data());
    return valid;
}

} // namespace tessel
