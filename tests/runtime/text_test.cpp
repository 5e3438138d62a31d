// tests/runtime/text_test.cpp: host characters and UTF-8.
#include "support.hpp"

#include <algorithm>
#include <string_view>

namespace tessel::test {
namespace {

using namespace std::string_view_literals;

struct Utf8Row {
    const char *what;
    std::string_view utf8;
    std::u16string_view characters;
};

constexpr Utf8Row fromUtf8[] = {
    {"nothing", ""sv, u""sv},
    {"ASCII", "abc\x7f"sv, u"abc\x7f"sv},
    {"NUL", "a\0b"sv, u"a\0b"sv},
    {"two bytes, first", "\xc2\x80"sv, u"\u0080"sv},
    {"two bytes", "\xc3\xa9"sv, u"\u00e9"sv},
    {"two bytes, last", "\xdf\xbf"sv, u"\u07ff"sv},
    {"three bytes, first", "\xe0\xa0\x80"sv, u"\u0800"sv},
    {"three bytes", "\xe6\xb0\xb4"sv, u"\u6c34"sv},
    {"three bytes, before the surrogates", "\xed\x9f\xbf"sv, u"\ud7ff"sv},
    {"three bytes, after the surrogates", "\xee\x80\x80"sv, u"\ue000"sv},
    {"three bytes, last", "\xef\xbf\xbf"sv, u"\uffff"sv},
    {"four bytes, first", "\xf0\x90\x80\x80"sv, u"\U00010000"sv},
    {"four bytes", "\xf0\x9f\x8c\x8a"sv, u"\U0001f30a"sv},
    {"four bytes, last", "\xf4\x8f\xbf\xbf"sv, u"\U0010ffff"sv},
    {"after ASCII", "sea \xe6\xb0\xb4 end"sv, u"sea \u6c34 end"sv},
    // What is not valid: each byte becomes the character of its code.
    {"a byte alone", "\xe9"sv, u"\u00e9"sv},
    {"a byte among ASCII", "caf\xe9!"sv, u"caf\u00e9!"sv},
    {"a continuation alone", "\x80"sv, u"\u0080"sv},
    {"two bytes cut", "\xc3"sv, u"\u00c3"sv},
    {"three bytes cut", "\xe6\xb0"sv, u"\u00e6\u00b0"sv},
    {"four bytes cut", "\xf0\x9f\x8c"sv, u"\u00f0\u009f\u008c"sv},
    {"two bytes broken", "\xc3z"sv, u"\u00c3z"sv},
    {"three bytes broken", "\xe6\xb0z"sv, u"\u00e6\u00b0z"sv},
    {"broken by a good one", "\xe6\xc3\xa9"sv, u"\u00e6\u00e9"sv},
    {"overlong NUL", "\xc0\x80"sv, u"\u00c0\u0080"sv},
    {"overlong two bytes", "\xc1\xbf"sv, u"\u00c1\u00bf"sv},
    {"overlong three bytes", "\xe0\x9f\xbf"sv, u"\u00e0\u009f\u00bf"sv},
    {"overlong four bytes", "\xf0\x8f\xbf\xbf"sv, u"\u00f0\u008f\u00bf\u00bf"sv},
    {"first surrogate", "\xed\xa0\x80"sv, u"\u00ed\u00a0\u0080"sv},
    {"last surrogate", "\xed\xbf\xbf"sv, u"\u00ed\u00bf\u00bf"sv},
    {"beyond the last character", "\xf4\x90\x80\x80"sv, u"\u00f4\u0090\u0080\u0080"sv},
    {"lead beyond all", "\xf5\x80\x80\x80"sv, u"\u00f5\u0080\u0080\u0080"sv},
    {"five bytes", "\xf8\x88\x80\x80\x80"sv, u"\u00f8\u0088\u0080\u0080\u0080"sv},
    {"FE and FF", "\xfe\xff"sv, u"\u00fe\u00ff"sv},
};

constexpr char16_t high = 0xD83C;
constexpr char16_t low = 0xDF0A;
constexpr char16_t loneHigh[] = {'a', high};
constexpr char16_t highThenText[] = {high, 'b'};
constexpr char16_t loneLow[] = {low, 'c'};
constexpr char16_t wrongOrder[] = {low, high};
constexpr char16_t twoHighOneLow[] = {high, high, low};

struct Utf16Row {
    const char *what;
    std::u16string_view characters;
    std::string_view utf8;
};

constexpr Utf16Row fromUtf16[] = {
    {"nothing", u""sv, ""sv},
    {"ASCII and NUL", u"a\0b"sv, "a\0b"sv},
    {"one byte, last", u"\x7f"sv, "\x7f"sv},
    {"two bytes", u"\u0080\u07ff"sv, "\xc2\x80\xdf\xbf"sv},
    {"three bytes", u"\u0800\uffff"sv, "\xe0\xa0\x80\xef\xbf\xbf"sv},
    {"around the surrogates", u"\ud7ff\ue000"sv, "\xed\x9f\xbf\xee\x80\x80"sv},
    {"pairs", u"\U00010000\U0001f30a\U0010ffff"sv,
     "\xf0\x90\x80\x80\xf0\x9f\x8c\x8a\xf4\x8f\xbf\xbf"sv},
    {"high at the end", {loneHigh, 2}, "a\xef\xbf\xbd"sv},
    {"high without low",
     {highThenText, 2},
     "\xef\xbf\xbd"
     "b"sv},
    {"low alone",
     {loneLow, 2},
     "\xef\xbf\xbd"
     "c"sv},
    {"wrong order", {wrongOrder, 2}, "\xef\xbf\xbd\xef\xbf\xbd"sv},
    {"two high, one low", {twoHighOneLow, 3}, "\xef\xbf\xbd\xf0\x9f\x8c\x8a"sv},
};

Array characterRow(std::u16string_view characters) {
    const std::array<std::size_t, 2> dims = {1, characters.size()};
    Array made = Array::characters(dims);
    std::copy(characters.begin(), characters.end(), made.elements<tsChar>().begin());
    return made;
}

std::u16string charactersOf(const Array &array) {
    const std::span<tsChar> characters = array.elements<tsChar>();
    return {characters.begin(), characters.end()};
}

TEST(Text, Utf8BecomesHostCharacters) {
    for (const Utf8Row &row : fromUtf8) {
        SCOPED_TRACE(row.what);
        const Array array = Array::text(row.utf8);
        EXPECT_EQ(array.classID(), tsCHAR);
        EXPECT_EQ(array.dims().size(), 2U);
        EXPECT_EQ(array.dims()[0], 1U);
        EXPECT_EQ(charactersOf(array), row.characters);
    }
}

TEST(Text, HostCharactersBecomeUtf8) {
    for (const Utf16Row &row : fromUtf16) {
        SCOPED_TRACE(row.what);
        EXPECT_EQ(characterRow(row.characters).utf8(), row.utf8);
    }
}

TEST(Text, EveryCharacterComesBack) {
    for (char32_t c = 0; c <= 0x10FFFF; ++c) {
        if (c == 0xD800) {
            c = 0xE000;
        }
        std::u16string units;
        if (c < 0x10000) {
            units.push_back(static_cast<char16_t>(c));
        } else {
            units.push_back(static_cast<char16_t>(0xD7C0U + (c >> 10U)));
            units.push_back(static_cast<char16_t>(0xDC00U + (c & 0x3FFU)));
        }
        if (charactersOf(Array::text(characterRow(units).utf8())) != units) {
            FAIL() << "U+" << std::hex << static_cast<unsigned>(c);
        }
    }
}

TEST(Text, TheModulesFunctionsReadAndWriteTheSame) {
    const Module good(testModule("good"));
    for (const Utf8Row &row : fromUtf8) {
        SCOPED_TRACE(row.what);
        const std::u16string_view upToNul = row.characters.substr(0, row.characters.find(u'\0'));
        EXPECT_EQ(charactersOf(good("text", Array::text(row.utf8))[0]), upToNul);
    }
    for (const Utf16Row &row : fromUtf16) {
        SCOPED_TRACE(row.what);
        const std::string_view upToNul = row.utf8.substr(0, row.utf8.find('\0'));
        EXPECT_EQ(good("text", characterRow(row.characters))[0].utf8(), upToNul);
    }
}

/// ASCII is gone through by pieces, and something else may stand anywhere in them.
TEST(Text, OneCharacterAmongManyThatAreAscii) {
    const Module good(testModule("good"));
    std::vector<std::size_t> places = {4095, 4096, 4097, 8191, 8192, 9998, 9999};
    for (std::size_t place = 0; place < 600; ++place) {
        places.push_back(place);
    }
    for (const std::size_t place : places) {
        for (const std::size_t after : {std::size_t{0}, std::size_t{1}, 9999 - place}) {
            SCOPED_TRACE(testing::Message() << place << " before, " << after << " after");
            const std::string_view character = "\xe6\xb0\xb4";
            const std::string utf8 =
                std::string(place, 'a') + std::string(character) + std::string(after, 'z');
            std::u16string characters(place, u'a');
            characters.append(1, u'\u6c34').append(after, u'z');
            const Array text = Array::text(utf8);
            ASSERT_EQ(charactersOf(text), characters);
            ASSERT_EQ(text.utf8(), utf8);
            ASSERT_EQ(good("text", text)[0].utf8(), utf8);
        }
    }
}

/// Or often: between two of them there are none, one, and so on up to more than a word of a
/// processor holds.
TEST(Text, CharactersBetweenFewThatAreAscii) {
    const Module good(testModule("good"));
    const std::vector<std::pair<std::string, std::u16string>> others = {
        {"\xc3\xa9", u"\u00e9"}, {"\xe6\xb0\xb4", u"\u6c34"}, {"\xf0\x9f\x98\x80", u"\U0001f600"}};
    for (const auto &[bytes, units] : others) {
        for (std::size_t run = 0; run < 20; ++run) {
            SCOPED_TRACE(testing::Message() << run << " before each " << bytes);
            std::string utf8;
            std::u16string characters;
            for (std::size_t i = 0; i < 50; ++i) {
                utf8.append(run, static_cast<char>('a' + i % 26)).append(bytes);
                characters.append(run, static_cast<char16_t>(u'a' + i % 26)).append(units);
            }
            const Array text = Array::text(utf8);
            ASSERT_EQ(charactersOf(text), characters);
            ASSERT_EQ(text.utf8(), utf8);
            ASSERT_EQ(good("text", text)[0].utf8(), utf8);
        }
    }
}

/// From a mebibyte on, texts are copied by vectors, which end where the text ends or not; and a
/// character that is not ASCII may stand on either side of each end, or nowhere.
TEST(Text, Large) {
    constexpr std::size_t mebibyte = std::size_t{1} << 20U;
    const Module good(testModule("good"));
    for (const std::size_t size : {mebibyte - 1, mebibyte, mebibyte + 1, mebibyte + 15}) {
        for (const std::size_t place :
             {std::size_t{0}, std::size_t{15}, std::size_t{16}, size / 2, size - 1, size}) {
            SCOPED_TRACE(testing::Message() << size << ", other at " << place);
            std::string utf8(size, '\0');
            for (std::size_t i = 0; i < size; ++i) {
                utf8[i] = static_cast<char>(1 + i % 127);
            }
            std::u16string characters(utf8.begin(), utf8.end());
            if (place < size) {
                utf8[place] = '\xe9';
                characters[place] = u'\u00e9';
            }
            const Array text = Array::text(utf8);
            ASSERT_TRUE(charactersOf(text) == characters);
            ASSERT_TRUE(charactersOf(good("text", text)[0]) == characters);
        }
    }
}

TEST(Text, ShapeIsNotText) {
    constexpr std::array<std::size_t, 2> dims = {2, 2};
    const Array array = Array::characters(dims);
    std::copy_n(u"abcd", 4, array.elements<tsChar>().begin());
    EXPECT_EQ(array.utf8(), "abcd"); // in storage order
}

} // namespace
} // namespace tessel::test
