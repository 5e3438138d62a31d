// tests/guard/header_test.cpp: headers that claim what is not to be trusted, and those that are
// merely wrong, which the library says itself.
#include "support.hpp"

#include <sys/stat.h>
#include <unistd.h>

#include <cstdint>
#include <initializer_list>
#include <ostream>
#include <vector>

namespace tessel::test {
namespace {

using namespace std::string_literals;

const std::string classic = "CDF\1"s + words({0}); // no records
const std::string nothing = words({0, 0});
const std::string oneDimension = words({10, 1, 1}) + "x\0\0\0"s + words({1});
const std::string room(600, '\0');

/// A variable of n dimensions, all of them the one of length 1.
std::string variableOf(std::uint32_t n, std::uint32_t type = 4) {
    std::string ids;
    for (std::uint32_t i = 0; i < n; ++i) {
        ids += words({0});
    }
    return classic + oneDimension + nothing + words({11, 1, 1}) + "v\0\0\0"s + words({n}) + ids +
           nothing + words({type, 4, 20000}) + room;
}

/// An attribute of the dataset, with its name, and its type and number of values.
std::string attributeNamed(const std::string &name, std::uint32_t type, std::uint32_t values) {
    const std::string padding((4 - name.size() % 4) % 4, '\0');
    return classic + nothing + words({12, 1, static_cast<std::uint32_t>(name.size())}) + name +
           padding + words({type, values}) + room + nothing;
}

/// Variables behind an attribute with so many bytes, more than are looked at at once.
std::string variablesBehind(std::uint32_t bytes, std::uint32_t variables) {
    return classic + nothing + words({12, 1, 4}) + "long" + words({1, bytes}) +
           std::string(bytes, 'a') + words({11, variables}) + room;
}

struct Claim {
    const char *name;
    std::string bytes;
    const char *identifier;
    const char *says = "";
};

void PrintTo(const Claim &claim, std::ostream *out) {
    *out << claim.name;
}

constexpr const char *refused = "TESSEL:guard:header";
constexpr const char *opens = "";

const std::vector<Claim> claims = {
    {"Empty", "", "TESSEL:netcdf:open:notANetcdfFile"},
    {"Nothing", classic + nothing + nothing + nothing, opens},
    {"MoreDimensionsThanBytes", classic + words({10, 0x40000000}) + room, refused,
     "has 1073741824 dimensions, where the file has 600 bytes left"},
    {"OneDimensionMoreThanBytes", classic + words({10, 601}) + room, refused,
     "has 601 dimensions, where the file has 600"},
    {"AsManyDimensionsAsBytes", classic + words({10, 600}) + room, opens}, // padded with zeros
    {"MoreAttributesThanBytes", classic + nothing + words({12, 0x7FFFFFFF}) + room, refused,
     "has 2147483647 attributes"},
    {"MoreVariablesThanBytes", classic + nothing + nothing + words({11, 0x7FFFFFFF}) + room,
     refused, "has 2147483647 variables"},
    {"OneVariableMoreThanBytesFarBehind", variablesBehind(10000, 601), refused,
     "has 601 variables, where the file has 600 bytes left"},
    {"AsManyVariablesAsBytesFarBehind", variablesBehind(10000, 600),
     "TESSEL:netcdf:open:invalidArgument"}, // the variables are zeros, of no type
    {"OneVariableMoreThanBytesBehindTheBuffer", variablesBehind(4056, 601), refused,
     "has 601 variables, where the file has 600 bytes left"},
    {"MoreValuesThanBytes", attributeNamed("long", 6, 0x10000000), refused,
     "has 268435456 values in an attribute"},
    {"NameOf256", attributeNamed(std::string(256, 'n'), 1, 4), opens},
    {"NameOf257", attributeNamed(std::string(257, 'n'), 1, 4), refused,
     "a name of 257 characters, where 256 are the most"},
    {"NameLongerThanTheFile", classic + words({10, 1, 0x7FFFFFFF}), refused,
     "has 2147483647 characters in a name, where the file has 0 bytes left"},
    {"VariableOf1024Dimensions", variableOf(1024), opens},
    {"VariableOf1025Dimensions", variableOf(1025), refused,
     "has a variable of 1025 dimensions, where 1024 are the most"},
    {"VariableOfATypeWithoutSize", variableOf(1, 12), refused, "has a variable of the type 12"},
    {"VariableOfNoType", variableOf(1, 13), "TESSEL:netcdf:open:invalidArgument"},
    {"AttributeOfATypeWithoutSize", attributeNamed("long", 12, 1), opens},
    {"EmptyListWithAnotherTag", classic + nothing + words({7, 0}) + words({11, 0x10000000}) + room,
     refused, "has 268435456 variables"},
    {"CountThatTheFileEndsIn", classic + words({10}) + "\0\x20"s, refused,
     "has 2097152 dimensions, where the file has 0 bytes left"},
    {"LargeOffsets", "CDF\2"s + words({0}) + words({10, 0x40000000}) + room, refused, "dimensions"},
    {"LargeCounts", "CDF\5"s + words({0, 0, 10, 1, 0}) + room, refused,
     "has 4294967296 dimensions"},
    {"OtherFormat", "CDF\7"s + words({10, 0x40000000}) + room, "TESSEL:netcdf:open:notANetcdfFile"},
};

class Header : public testing::TestWithParam<Claim> {};

TEST_P(Header, IsLookedAt) {
    const Claim &claim = GetParam();
    const Folder folder;
    const std::string file = written(folder, "a.nc", claim.bytes);
    const Module netcdf = guardedModule();
    std::string message;
    const std::string identifier = identifierOf([&] {
        try {
            netcdf("close", intOf(netcdf("open", file, "NOWRITE")));
        } catch (const Error &error) {
            message = error.message();
            throw;
        }
    });
    EXPECT_EQ(identifier, claim.identifier) << message;
    EXPECT_NE(message.find(claim.says), std::string::npos) << message;
    if (identifier == refused) {
        EXPECT_NE(message.find(file), std::string::npos) << message;
        EXPECT_EQ(identifierOf([&] { netcdf("_open", file, 0, 4096); }), refused);
    }
}

INSTANTIATE_TEST_SUITE_P(Claims, Header, testing::ValuesIn(claims),
                         [](const auto &row) { return row.param.name; });

/// The module refuses the mode before the library sees the pipe.
TEST(Pipe, IsNotOpened) {
    const Folder folder;
    ASSERT_EQ(mkfifo(folder.file("pipe").c_str(), 0600), 0);
    alarm(20); // to open it would wait for whoever writes to it
    EXPECT_EQ(identifierOf([&] { guardedModule()("open", folder.file("pipe"), "BAD"); }),
              "TESSEL:netcdf:unrecognizedFileMode");
    alarm(0);
}

} // namespace
} // namespace tessel::test
