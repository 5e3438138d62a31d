// tests/guard/positions_test.cpp: how far data may reach, and what a file may lack of what its
// header claims, on either side of both limits.
#include "support.hpp"
#include "support/library.hpp"

#include <cstddef>
#include <cstdint>
#include <filesystem>
#include <string>

namespace tessel::test {
namespace {

constexpr const char *position = "TESSEL:guard:position";
constexpr const char *header = "TESSEL:guard:header";

/// No file system holds what the guard just lets through; what the system says of it is its own
/// affair.
bool isLetThrough(const std::string &identifier) {
    return !identifier.starts_with("TESSEL:guard:");
}

TEST(Positions, OfRecords) {
    const Folder folder;
    const Module netcdf = guardedModule();
    const int ncid = unfilledVariable(netcdf, folder, ncDouble, {0, 0x1p31}, data64);
    const auto element = [&](double record) {
        return identifierOf([&] {
            netcdf("put_var1_double", ncid, 0, Array::row({0, record}), 1);
        });
    };
    const auto block = [&](double record) {
        return identifierOf([&] {
            netcdf("put_vara_double", ncid, 0, Array::row({0, record}), Array::row({1, 2}),
                   Array::row({1, 2}));
        });
    };
    EXPECT_EQ(element(3), "");
    EXPECT_EQ(block(3), "");
    EXPECT_EQ(element(0x1p29 - 1), position) << "2^29 records of 2^34 bytes";
    EXPECT_EQ(block(0x1p29 - 2), position);
    EXPECT_EQ(netcdf("inq_dim", ncid, 0)[1].number(), 5) << "nothing came of it";
    EXPECT_TRUE(isLetThrough(element(0x1p29 - 2)));
    EXPECT_TRUE(isLetThrough(block(0x1p29 - 3)));
    EXPECT_EQ(identifierOf([&] {
                  netcdf("put_vara_double", ncid, 0, Array::row({0, 0x1p29}), Array::row({1, 2}),
                         Array::row({1, 2, 3}));
              }),
              "TESSEL:netcdf:putVara:dataSizeMismatch")
        << "which the module refuses itself";
    netcdf("abort", ncid);
}

/// What becomes of the position where nobody looks: ten elements before the data, the header is.
TEST(Positions, WrapIntoTheHeaderWithoutTheGuard) {
    const Folder folder;
    const Module netcdf = plainModule();
    const int ncid = unfilledVariable(netcdf, folder, ncDouble, {0, 0x1p31}, data64);
    for (int i = 1; i < 18; ++i) {
        netcdf("put_var1_double", ncid, 0, Array::row({0x1p31 - i, 0x1p30 - 1}), 1);
    }
    netcdf("abort", ncid);
    EXPECT_EQ(identifierOf([&] { guardedModule()("open", folder.file("a.nc"), 0); }), header);
}

/// Variables that are added make the records longer, of which there are many already.
TEST(Positions, OfRecordsThatGrow) {
    const Folder folder;
    const Module netcdf = guardedModule();
    const int ncid = unfilledVariable(netcdf, folder, ncChar, {0, 0x1p20}, data64);
    netcdf("put_var1_text", ncid, 0, Array::row({0, 0x1p20}),
           "a"); // a TiB, of which there is a byte
    netcdf("redef", ncid);
    const double y = netcdf("def_dim", ncid, "y", 0x1p41)[0].number();
    netcdf("def_var", ncid, "w", ncDouble, Array::row({y, 0}));
    EXPECT_EQ(identifierOf([&] { netcdf("enddef", ncid); }), position);
    netcdf("abort", ncid);
}

TEST(Positions, OfVariables) {
    struct Row {
        double first;
        double second;
        bool fits;
    };
    for (const Row &row :
         {Row{0x1p59, 0x1p58, true}, Row{0x1p59, 0x1p59, false},
          Row{0x1p59, 0x1p59 - 0x1p28, false}, Row{0x1p59, 0x1p59 - 0x1p29, true}}) {
        const Folder folder;
        const Module netcdf = guardedModule();
        const int ncid = definingVariable(netcdf, folder, ncDouble, {row.first}, data64);
        netcdf("def_var", ncid, "w", ncDouble,
               netcdf("def_dim", ncid, "z", row.second)[0].number());
        netcdf("set_fill", ncid, noFill);
        for (const char *operation : {"close", "end_def"}) {
            if (!row.fits) {
                EXPECT_EQ(identifierOf([&] { netcdf(operation, ncid); }), position) << row.second;
            }
        }
        EXPECT_EQ(identifierOf([&] { netcdf("_enddef", ncid, 0x1p62, 4, 0, 4); }), position);
        if (row.fits) {
            EXPECT_EQ(identifierOf([&] { netcdf("enddef", ncid); }), "") << row.second;
        }
        netcdf("abort", ncid);
    }
}

/// Opened for writing, which makes nothing longer yet.
std::string redefined(const Module &netcdf, const std::string &file) {
    const int ncid = intOf(netcdf("open", file, 1));
    std::string identifier = identifierOf([&] { netcdf("redef", ncid); });
    netcdf("abort", ncid);
    return identifier;
}

TEST(Shortfall, IsRefusedAboveTheLimit) {
    const Folder folder;
    const std::string bytes = claimedRecords(100, 8);
    const std::uint64_t missing = 200 + 800 - bytes.size();
    const std::string file = written(folder, "a.nc", bytes);
    EXPECT_EQ(redefined(guardedModule({.fillLimit = missing - 1}), file), header);
    EXPECT_EQ(redefined(guardedModule({.fillLimit = missing}), file), "");
    const Module netcdf = guardedModule({.fillLimit = 1});
    netcdf("close", intOf(netcdf("open", file, 0)));
    EXPECT_EQ(redefined(netcdf, file), header);
    netcdf("close", intOf(netcdf("open", file, 1)));
    EXPECT_EQ(std::filesystem::file_size(file), 1000U) << "closing makes it as long as it claims";
    EXPECT_EQ(redefined(netcdf, file), "");
}

/// What was written, and is not in the file yet, is there.
TEST(Shortfall, EndsWhereTheFileGrows) {
    const Folder folder;
    const Module netcdf = guardedModule({.fillLimit = 7});
    const int ncid = intOf(netcdf("open", written(folder, "a.nc", claimedRecords(1000, 8)), 1));
    EXPECT_EQ(identifierOf([&] { netcdf("redef", ncid); }), header);
    netcdf("set_fill", ncid, noFill);
    netcdf("put_var1_text", ncid, 0, Array::row({0, 999}), "a");
    EXPECT_EQ(identifierOf([&] { netcdf("redef", ncid); }), "");
    netcdf("abort", ncid);
}

/// The records that are missing are written as long as they have become.
TEST(Shortfall, IsOfTheRecordsThatWillBe) {
    const Folder folder;
    const std::string bytes = claimedRecords(100, 8);
    const std::uint64_t missing = 200 + 800 - bytes.size();
    const std::string file = written(folder, "a.nc", bytes);
    for (const std::uint64_t limit : {missing * 3, missing * 3 - 1}) {
        const Module netcdf = guardedModule({.fillLimit = limit});
        const int ncid = intOf(netcdf("open", file, 1));
        netcdf("redef", ncid);
        const double y = netcdf("def_dim", ncid, "y", 2)[0].number();
        netcdf("def_var", ncid, "w", ncDouble, Array::row({y, 0}));
        if (limit < missing * 3) {
            EXPECT_EQ(identifierOf([&] { netcdf("enddef", ncid); }), header);
            EXPECT_EQ(identifierOf([&] { netcdf("close", ncid); }), header);
            netcdf("abort", ncid);
        } else {
            netcdf("enddef", ncid);
            netcdf("abort", ncid);
            written(folder, "a.nc", bytes);
        }
    }
}

/// A file that is a hole between its first record and its last, which are a byte each.
int withRecords(const Module &netcdf, const Folder &folder, double number) {
    const int made = unfilledVariable(netcdf, folder, ncChar, {0});
    netcdf("put_var1_text", made, 0, 0, "a");
    netcdf("put_var1_text", made, 0, number - 1, "z");
    netcdf("close", made);
    return intOf(netcdf("open", folder.file("a.nc"), 1));
}

TEST(Redefinition, OfMoreRecordsThanTheLibraryMoves) {
    const Module netcdf = guardedModule();
    for (const auto &[number, identifier] :
         {std::pair(0x1p31 - 1, ""), std::pair(0x1p31, "TESSEL:guard:redefinition")}) {
        const Folder folder;
        const int ncid = withRecords(netcdf, folder, number);
        EXPECT_EQ(identifierOf([&] { netcdf("redef", ncid); }), identifier) << number;
        netcdf("abort", ncid);
    }
}

/// What becomes of the records: they stay where they were, and are looked for elsewhere.
TEST(Redefinition, LosesTheRecordsWithoutTheGuard) {
    if (libraryRelease != 40900) {
        GTEST_SKIP() << "what is said here is said of 4.9.0";
    }
    const Module netcdf = plainModule();
    const Folder folder;
    const int ncid = withRecords(netcdf, folder, 0x1p31 + 10);
    netcdf("set_fill", ncid, noFill);
    netcdf("redef", ncid);
    netcdf("put_att_text", ncid, global, "a", std::string(5000, 'x'));
    netcdf("enddef", ncid);
    EXPECT_EQ(netcdf("get_var1_text", ncid, 0, 0)[0].utf8(), "") << "a zero, where an a was";
    netcdf("abort", ncid);
}

} // namespace
} // namespace tessel::test
