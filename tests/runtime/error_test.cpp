// tests/runtime/error_test.cpp: the exception that a host error is.
#include "support.hpp"

#include <type_traits>

namespace tessel::test {
namespace {

static_assert(std::is_nothrow_copy_constructible_v<Error>);
static_assert(std::is_nothrow_copy_assignable_v<Error>);
static_assert(std::is_base_of_v<std::exception, Error>);

TEST(Error, CarriesIdentifierAndMessage) {
    const Error error("a:b", "text");
    EXPECT_EQ(error.identifier(), "a:b");
    EXPECT_EQ(error.message(), "text");
    EXPECT_STREQ(error.what(), "text");
}

TEST(Error, CopiesShareTheTexts) {
    std::optional<Error> first(std::in_place, "a:b", "text");
    const Error copy = *first;
    EXPECT_EQ(copy.what(), first->what());
    first.reset();
    EXPECT_EQ(copy.message(), "text");
    Error other("c:d", "other");
    other = copy;
    EXPECT_EQ(other.identifier(), "a:b");
}

TEST(Error, HasItsTextsAfterAMove) {
    Error from("a:b", "text");
    const Error to = std::move(from); // NOLINT: that a move is a copy is what is tested
    EXPECT_EQ(to.message(), "text");
    EXPECT_EQ(from.message(), "text"); // NOLINT
}

TEST(Error, TextsAreValidUtf8) {
    const Error error("a:\xe9", "caf\xe9 caf\xc3\xa9");
    EXPECT_EQ(error.identifier(), "a:\xc3\xa9");
    EXPECT_EQ(error.message(), "caf\xc3\xa9 caf\xc3\xa9");
}

} // namespace
} // namespace tessel::test
