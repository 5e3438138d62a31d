// tests/guard/header_test.cpp: headers that claim what is not to be trusted, what comes of them
// without the guard and with it, and those that are merely wrong, which the library says itself.
#include "ending.hpp"
#include "support.hpp"
#include "support/library.hpp"

#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cstdint>
#include <fstream>
#include <initializer_list>
#include <iterator>
#include <ostream>
#include <string>
#include <string_view>
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

/// A name as the formats store it: behind its length, and filled up to whole words.
std::string stored(const std::string &name) {
    return words({static_cast<std::uint32_t>(name.size())}) + name +
           std::string((4 - name.size() % 4) % 4, '\0');
}

/// An attribute of the dataset, with its name, and its type and number of values.
std::string attributeNamed(const std::string &name, std::uint32_t type, std::uint32_t values) {
    return classic + nothing + words({12, 1}) + stored(name) + words({type, values}) + room +
           nothing;
}

std::string dimensionNamed(const std::string &name) {
    return classic + words({10, 1}) + stored(name) + words({1}) + nothing + nothing;
}

std::string variableNamed(const std::string &name) {
    return classic + oneDimension + nothing + words({11, 1}) + stored(name) + words({1, 0}) +
           nothing + words({4, 4, 20000}) + room;
}

/// Variables behind an attribute with so many bytes, more than are looked at at once.
std::string variablesBehind(std::uint32_t bytes, std::uint32_t variables) {
    return classic + nothing + words({12, 1, 4}) + "long" + words({1, bytes}) +
           std::string(bytes, 'a') + words({11, variables}) + room;
}

/// A file of 64-bit offsets with variables of 100 integers that begin at these places.
std::string beginningAt(std::initializer_list<std::uint64_t> places) {
    std::string bytes = "CDF\2"s + words({0}) + words({10, 1}) + stored("x") + words({100}) +
                        nothing + words({11, static_cast<std::uint32_t>(places.size())});
    std::string name = "a";
    for (const std::uint64_t place : places) {
        bytes += stored(name) + words({1, 0}) + nothing +
                 words({4, 400, static_cast<std::uint32_t>(place >> 32U),
                        static_cast<std::uint32_t>(place)});
        ++name[0];
    }
    return bytes + room;
}

/// A classic file with a variable of 2^21 times 2^21 times so many bytes.
std::string bytesInSquares(std::uint32_t number) {
    constexpr std::uint32_t side = 1U << 21U;
    return classic + words({10, 2}) + stored("x") + words({side}) + stored("y") + words({number}) +
           nothing + words({11, 1}) + stored("v") + words({3, 0, 0, 1}) + nothing +
           words({1, 0xFFFFFFFF, 200}) + room;
}

/// A file of 64-bit data with so many records of 2^31 doubles.
std::string longRecords(std::uint32_t records) {
    return "CDF\5"s + words({0, records, 10, 0, 2, 0}) + stored("t") + words({0, 0, 0}) +
           stored("x") + words({0, 1U << 31U}) + words({0, 0, 0}) + words({11, 0, 1, 0}) +
           stored("v") + words({0, 2, 0, 0, 0, 1}) + words({0, 0, 0}) + words({6, 4, 0, 0, 200}) +
           room;
}

struct Claim {
    const char *name;
    std::string bytes;
    const char *identifier;
    const char *says = "";

    // Of a claim that the guard refuses, what comes of it without the guard:
    std::string without = {}; ///< what the module says of the file, and how the process ends
    long megabytes = 0;       ///< of memory that are taken for it at least, of 1024 that there are
};

void PrintTo(const Claim &claim, std::ostream *out) {
    *out << claim.name;
}

constexpr const char *refused = "TESSEL:guard:header";
constexpr const char *opens = "";
const std::string noMemory = "TESSEL:netcdf:open:memoryAllocationFailure";
const std::string invalid = "TESSEL:netcdf:open:invalidArgument";
const std::string crashes = "Segmentation fault";
const std::string divides = "Floating point exception";
const std::string anything = "anything";
constexpr std::uint32_t million = 1U << 20U;

// clang-format off
const std::vector<Claim> claims = {
    {"Empty", "", "TESSEL:netcdf:open:notANetcdfFile"},
    {"Nothing", classic + nothing + nothing + nothing, opens},

    // Dimensions that are not there are read as zeros behind the end of the file.
    {"AsManyDimensionsAsBytes", classic + words({10, 600}) + room, opens}, // padded with zeros
    {"OneDimensionMoreThanBytes", classic + words({10, 601}) + room, refused,
     "has 601 dimensions, where the file has 600",
     "601 dimensions, the last with 0 letters"},
    {"AMillionDimensions", classic + words({10, million}) + room, refused,
     "has 1048576 dimensions, where the file has 600 bytes left",
     "1048576 dimensions, the last with 0 letters", 100},
    {"MoreDimensionsThanMemory", classic + words({10, 0x40000000}) + room, refused,
     "has 1073741824 dimensions, where the file has 600 bytes left", noMemory},
    {"CountThatTheFileEndsIn", classic + words({10}) + "\0\x20"s, refused,
     "has 2097152 dimensions, where the file has 0 bytes left",
     "2097152 dimensions, the last with 0 letters", 200},
    {"LargeOffsets", "CDF\2"s + words({0}) + words({10, 0x40000000}) + room, refused,
     "has 1073741824 dimensions", noMemory},
    {"LargeCounts", "CDF\5"s + words({0, 0, 10, 1, 0}) + room, refused,
     "has 4294967296 dimensions", noMemory},

    // Attributes and variables that are not there are zeros, of no type; memory is taken before.
    {"AMillionAttributes", classic + nothing + words({12, million}) + room, refused,
     "has 1048576 attributes", invalid, 8},
    {"MoreAttributesThanMemory", classic + nothing + words({12, 0x7FFFFFFF}) + room, refused,
     "has 2147483647 attributes", noMemory},
    {"AsManyVariablesAsBytesFarBehind", variablesBehind(10000, 600), invalid.c_str()},
    {"OneVariableMoreThanBytesFarBehind", variablesBehind(10000, 601), refused,
     "has 601 variables, where the file has 600 bytes left", invalid},
    {"OneVariableMoreThanBytesBehindTheBuffer", variablesBehind(4056, 601), refused,
     "has 601 variables, where the file has 600 bytes left", invalid},
    {"AMillionVariables", classic + nothing + nothing + words({11, million}) + room, refused,
     "has 1048576 variables", invalid, 50},
    {"MoreVariablesThanMemory", classic + nothing + nothing + words({11, 0x7FFFFFFF}) + room,
     refused, "has 2147483647 variables", noMemory},
    {"EmptyListWithAnotherTag", classic + nothing + words({7, 0}) + words({11, 0x10000000}) + room,
     refused, "has 268435456 variables", noMemory},

    // Values that are not there are zeros.
    {"AMillionValues", attributeNamed("long", 6, million), refused,
     "has 1048576 values in an attribute",
     "1 attributes, the last with 4 letters, 1048576 values, the last of them 0", 8},
    {"MoreValuesThanMemory", attributeNamed("long", 6, 0x10000000), refused,
     "has 268435456 values in an attribute", noMemory},

    // Names are copied over the end of the buffers that they are asked for in.
    {"NameOf256", attributeNamed(std::string(256, 'n'), 1, 4), opens},
    {"NameOf257", attributeNamed(std::string(257, 'n'), 1, 4), refused,
     "a name of 257 characters, where 256 are the most",
     "1 attributes, the last with 257 letters, 4 values, the last of them 0"},
    {"DimensionNameOf300", dimensionNamed(std::string(300, 'n')), refused,
     "has a name of 300 characters", "1 dimensions, " + crashes},
    {"AttributeNameOf300", attributeNamed(std::string(300, 'n'), 1, 4), refused,
     "has a name of 300 characters", "1 attributes, " + crashes},
    {"VariableNameOf300", variableNamed(std::string(300, 'n')), refused,
     "has a name of 300 characters",
     "1 dimensions, the last with 1 letters, 1 variables, the last with another name, 1 dimensions"},
    {"NameLengthThatTheFileEndsIn", classic + words({10, 1}) + "\0\0\x02"s, refused,
     "has 512 characters in a name, where the file has 0 bytes left", "1 dimensions, " + crashes},
    {"AMillionLetters", classic + words({10, 1, million}), refused,
     "has 1048576 characters in a name, where the file has 0 bytes left",
     "TESSEL:netcdf:open:argumentListTooLong", 1},
    {"MoreLettersThanMemory", classic + words({10, 1, 0x7FFFFFFF}), refused,
     "has 2147483647 characters in a name, where the file has 0 bytes left", noMemory},

    // And so are the dimensions of a variable.
    {"VariableOf1024Dimensions", variableOf(1024), opens},
    {"VariableOf1025Dimensions", variableOf(1025), refused,
     "has a variable of 1025 dimensions, where 1024 are the most",
     anything}, // one number is overwritten: whose, the compiler knows
    {"VariableOf3000Dimensions", variableOf(3000), refused,
     "has a variable of 3000 dimensions, where 1024 are the most",
     "1 dimensions, the last with 1 letters, 1 variables, " + crashes},
    {"VariableOfAMillionDimensions",
     classic + oneDimension + nothing + words({11, 1}) + stored("v") + words({million}), refused,
     "has 1048576 dimensions in a variable, where the file has 0 bytes left",
     "TESSEL:netcdf:open:argumentListTooLong", 16},

    // The size of a variable is divided by that of its type.
    {"VariableOfATypeWithoutSize", variableOf(1, 12), refused, "has a variable of the type 12",
     divides},
    {"ATypeWithoutSizeBehindAnotherTag",
     classic + oneDimension + words({7, 0}) + words({11, 1}) + stored("v") + words({1, 0}) +
         nothing + words({12, 4, 20000}) + room,
     refused, "has a variable of the type 12", divides},
    {"VariableOfNoType", variableOf(1, 13), invalid.c_str()},
    {"AttributeOfATypeWithoutSize", attributeNamed("long", 12, 1), opens},

    // Positions are numbers of 64 bits with a sign; where data end is computed, and not looked at.
    {"DataUpToTheLastByteOfAll", beginningAt({(std::uint64_t{1} << 63U) - 404}), opens},
    {"DataBehindTheLastByteOfAll", beginningAt({300, (std::uint64_t{1} << 63U) - 400, 1000}),
     refused, "claims data that end behind 2^63 bytes",
     "1 dimensions, the last with 1 letters, 3 variables, the last with 1 letters, 1 dimensions"},
    {"ALargeClassicVariable", bytesInSquares(1U << 20U), opens},
    {"AClassicVariableTooLarge", bytesInSquares(1U << 21U), refused, "behind 2^63 bytes",
     "TESSEL:netcdf:open:notANetcdfFile"},
    {"RecordsUpToTheLastByteOfAll", longRecords((1U << 29U) - 1), opens},
    {"RecordsBehindTheLastByteOfAll", longRecords(1U << 29U), refused, "behind 2^63 bytes",
     "2 dimensions, the last with 1 letters, 1 variables, the last with 1 letters, 2 dimensions"},
    {"AsManyRecordsAsThereCanBe", claimedRecords(0xFFFFFFFF, 8), opens},

    {"OtherFormat", "CDF\7"s + words({10, 0x40000000}) + room, "TESSEL:netcdf:open:notANetcdfFile"},
};
// clang-format on

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

/// The addresses that this process has taken at most, in megabytes.
long peakMegabytes() {
    return static_cast<long>(bytesInStatus("VmPeak:") >> 20U);
}

/// From now on there is a gigabyte more than what the process has.
void limitMemory() {
    const rlim_t most = (static_cast<rlim_t>(peakMegabytes()) + 1024) << 20U;
    const rlimit limit = {most, most};
    setrlimit(RLIMIT_AS, &limit);
}

/// What the module says of a file, line by line: how many of each there are, and the last of them.
/// A process that ends here has said the rest before.
class Tale {
  public:
    Tale(const Module &module, const std::string &aside) : netcdf(module), out(aside) {}

    void tell(const std::string &file) {
        std::ifstream in(file, std::ios::binary);
        bytes.assign(std::istreambuf_iterator<char>(in), {});
        const long before = peakMegabytes();
        int ncid = -1;
        const std::string failed =
            identifierOf([&] { ncid = intOf(netcdf("open", file, "NOWRITE")); });
        say(std::to_string(peakMegabytes() - before));
        if (!failed.empty()) {
            say(failed);
            return;
        }
        const Results counts = netcdf("inq", ncid);
        if (const double last = lastOf(counts[0], "dimensions"); last >= 0) {
            say(lettersOf(netcdf("inq_dim", ncid, last)[0]));
        }
        if (const double last = lastOf(counts[2], "attributes"); last >= 0) {
            const Results name = netcdf("inq_attname", ncid, -1, last);
            say(lettersOf(name[0]));
            const Results values = netcdf("get_att_double", ncid, -1, name[0]);
            say(std::to_string(values[0].size()) + " values");
            const auto value = static_cast<int>(values[0].elements<double>().back());
            say("the last of them " + std::to_string(value));
        }
        if (const double last = lastOf(counts[1], "variables"); last >= 0) {
            const Results variable = netcdf("inq_var", ncid, last);
            say(lettersOf(variable[0]));
            say(std::to_string(variable[2].size()) + " dimensions");
        }
    }

  private:
    /// Says how many there are; the number of the last one, -1 if there are none.
    double lastOf(const Array &count, const char *what) {
        const auto there = static_cast<long>(count.number());
        if (there > 0) {
            say(std::to_string(there) + " " + what);
        }
        return static_cast<double>(there - 1);
    }

    /// The length of a name; that it is another one, where the file has none like it.
    [[nodiscard]] std::string lettersOf(const Array &name) const {
        const std::string text = name.utf8();
        const bool found = text.empty() || bytes.find(stored(text)) != std::string::npos;
        return found ? "the last with " + std::to_string(text.size()) + " letters"
                     : "the last with another name";
    }

    void say(const std::string &what) { out << what << std::endl; }

    const Module &netcdf;
    std::ofstream out;
    std::string bytes;
};

/// What the guard keeps away. Where the library does something else, docs/reliability.md is to say
/// so.
TEST_P(Header, WithoutTheGuard) {
    const Claim &claim = GetParam();
    if (claim.identifier != std::string(refused)) {
        const Folder folder;
        const std::string file = written(folder, "a.nc", claim.bytes);
        const Module netcdf = plainModule();
        EXPECT_EQ(identifierOf([&] { netcdf("close", intOf(netcdf("open", file, "NOWRITE"))); }),
                  claim.identifier)
            << "it is not the guard's doing";
        return;
    }
    if (claim.without == anything) {
        GTEST_SKIP() << "what comes of it cannot be told";
    }
    if (sanitized) {
        GTEST_SKIP() << "the sanitizer would meet the limit of memory, and sees what overflows";
    }
    if (libraryRelease >= 40901) {
        GTEST_SKIP() << "what is said here is said of 4.9.0";
    }
    const Folder folder;
    const std::string aside = folder.file("told");
    const std::string end = endOf([&](const Folder &own) {
        const Module netcdf = plainModule();
        netcdf("inq_libvers"); // the library is there before the limit
        Tale tale(netcdf, aside);
        const std::string file = written(own, "a.nc", claim.bytes);
        limitMemory();
        tale.tell(file);
    });
    long megabytes = 0;
    std::string came;
    std::ifstream told(aside);
    told >> megabytes >> std::ws;
    for (std::string line; std::getline(told, line);) {
        came += (came.empty() ? "" : ", ") + line;
    }
    if (end != survived) {
        came += (came.empty() ? "" : ", ") + end;
    }
    EXPECT_EQ(came, claim.without);
    EXPECT_GE(megabytes, claim.megabytes);
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
