// tests/difference/text.cpp: host characters to UTF-8 and back.
#include "text.hpp"

#include <cstddef>
#include <cstdint>

namespace difference {
namespace {

void append(std::string &out, std::uint32_t code) {
    const auto put = [&](std::uint32_t byte) { out += static_cast<char>(byte); };
    const auto tail = [&](unsigned shift) { put(0x80U | ((code >> shift) & 0x3FU)); };
    if (code < 0x80) {
        put(code);
    } else if (code < 0x800) {
        put(0xC0U | (code >> 6U));
        tail(0);
    } else if (code < 0x10000) {
        put(0xE0U | (code >> 12U));
        tail(6);
        tail(0);
    } else {
        put(0xF0U | (code >> 18U));
        tail(12);
        tail(6);
        tail(0);
    }
}

/// The number of bytes of the sequence that begins a text, and its character; 0 for no valid one.
std::size_t sequence(std::string_view text, std::uint32_t &code) {
    const auto at = [&](std::size_t i) {
        return i < text.size() ? static_cast<unsigned char>(text[i]) : 0U;
    };
    const std::size_t length = at(0) < 0x80U   ? 1
                               : at(0) < 0xC2U ? 0
                               : at(0) < 0xE0U ? 2
                               : at(0) < 0xF0U ? 3
                               : at(0) < 0xF5U ? 4
                                               : 0;
    code = length < 2 ? at(0) : at(0) & (0x7FU >> length);
    for (std::size_t i = 1; i < length; ++i) {
        if ((at(i) & 0xC0U) != 0x80U) {
            return 0;
        }
        code = (code << 6U) | (at(i) & 0x3FU);
    }
    const bool tooLong = (length == 3 && code < 0x800U) || (length == 4 && code < 0x10000U);
    const bool noCharacter = (code >= 0xD800U && code < 0xE000U) || code > 0x10FFFFU;
    return tooLong || noCharacter ? 0 : length;
}

} // namespace

std::string toUtf8(const std::vector<double> &units) {
    std::string out;
    for (std::size_t i = 0; i < units.size(); ++i) {
        auto code = static_cast<std::uint32_t>(units[i]);
        if (code >= 0xD800U && code < 0xE000U) {
            const auto next = i + 1 < units.size() ? static_cast<std::uint32_t>(units[i + 1]) : 0U;
            if (code < 0xDC00U && next >= 0xDC00U && next < 0xE000U) {
                code = 0x10000U + ((code - 0xD800U) << 10U) + (next - 0xDC00U);
                ++i;
            } else {
                code = 0xFFFDU;
            }
        }
        append(out, code);
    }
    return out;
}

std::vector<std::uint16_t> toUtf16(std::string_view bytes) {
    std::vector<std::uint16_t> out;
    while (!bytes.empty()) {
        std::uint32_t code = 0;
        std::size_t length = sequence(bytes, code);
        if (length == 0) {
            code = static_cast<unsigned char>(bytes[0]);
            length = 1;
        }
        if (code >= 0x10000U) {
            out.push_back(static_cast<std::uint16_t>(0xD800U + ((code - 0x10000U) >> 10U)));
            out.push_back(static_cast<std::uint16_t>(0xDC00U + (code & 0x3FFU)));
        } else {
            out.push_back(static_cast<std::uint16_t>(code));
        }
        bytes.remove_prefix(length);
    }
    return out;
}

} // namespace difference
