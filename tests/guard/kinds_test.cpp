// tests/guard/kinds_test.cpp: the guard knows each operation that is told where to write, and what
// it knows has as many inputs as the module wants.
#include "operations.hpp"
#include "support.hpp"

#include <algorithm>
#include <array>
#include <fstream>
#include <initializer_list>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace tessel::test {
namespace {

using guard::Kind;

constexpr std::size_t mostInputs = 12;

/// The short names of the module's operations, from the listing of its table.
std::vector<std::string> operations() {
    std::ifstream listing(TESSEL_OPERATIONS);
    std::vector<std::string> names;
    for (std::string id, longName, shortName; listing >> id >> longName >> shortName;) {
        names.push_back(shortName);
    }
    return names;
}

/// A call with an operation's name and as many empty arrays as there are other inputs.
class Call {
  public:
    Call(const std::string &operation, std::size_t inputs) : name(Array::text(operation)) {
        pointers.assign(inputs, empty.get());
        pointers[0] = name.get();
    }

    [[nodiscard]] Kind kind() const { return guard::kindOf(pointers); }

    /// Whether the module has nothing against the number of inputs.
    [[nodiscard]] bool isTaken(const Module &netcdf) {
        const std::string identifier = identifierOf([&] { netcdf.call(pointers); });
        return !identifier.ends_with("ParameterCount") && !identifier.ends_with("ArgumentCount");
    }

  private:
    Array name;
    Array empty = Array::numeric(tsDOUBLE, std::array<std::size_t, 2>{0, 0});
    std::vector<const tsArray *> pointers;
};

/// The number of inputs with which the guard knows an operation.
std::optional<std::size_t> knownWith(const std::string &operation) {
    for (std::size_t inputs = 1; inputs <= mostInputs; ++inputs) {
        if (Call(operation, inputs).kind() != Kind::other) {
            return inputs;
        }
    }
    return std::nullopt;
}

bool beginsWithAny(std::string_view operation, std::initializer_list<std::string_view> prefixes) {
    return std::any_of(prefixes.begin(), prefixes.end(),
                       [&](std::string_view prefix) { return operation.starts_with(prefix); });
}

/// What writes is told where, but for attributes and whole variables.
bool isToldWhere(std::string_view operation) {
    return beginsWithAny(operation, {"put_"}) &&
           !beginsWithAny(operation, {"put_att_", "put_var_"});
}

bool givesName(std::string_view operation) {
    return beginsWithAny(operation, {"def_", "rename_", "put_att_", "copy_att"});
}

TEST(Kinds, EveryOperationThatIsToldWhereToWriteIsKnown) {
    int writing = 0;
    for (const std::string &operation : operations()) {
        if (isToldWhere(operation)) {
            EXPECT_TRUE(knownWith(operation)) << operation;
            ++writing;
        } else if (operation.starts_with("put_var_")) {
            EXPECT_FALSE(knownWith(operation)) << operation;
        }
    }
    EXPECT_GE(writing, 21);
}

TEST(Kinds, EveryOperationThatGivesANameIsKnown) {
    int giving = 0;
    for (const std::string &operation : operations()) {
        const auto inputs = knownWith(operation);
        const auto place =
            guard::placeOfNewName(inputs ? Call(operation, *inputs).kind() : Kind::other);
        EXPECT_EQ(place.has_value(), givesName(operation)) << operation;
        EXPECT_LT(place.value_or(0), inputs.value_or(1)) << operation;
        giving += givesName(operation) ? 1 : 0;
    }
    EXPECT_GE(giving, 13);
}

TEST(Kinds, WhatIsKnownHasTheInputsThatTheModuleWants) {
    const Module netcdf = plainModule();
    int known = 0;
    for (const std::string &operation : operations()) {
        if (const auto inputs = knownWith(operation)) {
            EXPECT_TRUE(Call(operation, *inputs).isTaken(netcdf)) << operation;
            EXPECT_FALSE(Call(operation, *inputs - 1).isTaken(netcdf)) << operation;
            EXPECT_FALSE(Call(operation, *inputs + 1).isTaken(netcdf)) << operation;
            ++known;
        }
    }
    EXPECT_GE(known, 46);
}

} // namespace
} // namespace tessel::test
