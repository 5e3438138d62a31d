// tests/guard/passing_test.cpp: what looks like a refused call and is none, and addresses.
#include "support.hpp"

#include <cstddef>
#include <functional>
#include <ostream>
#include <utility>
#include <vector>

namespace tessel::test {
namespace {

using namespace std::string_literals;

struct Passing {
    const char *name;
    const char *identifier; // what the module itself says; "" if the call succeeds
    std::function<void(const Module &netcdf, const Folder &folder)> call;
};

void PrintTo(const Passing &row, std::ostream *out) {
    *out << row.name;
}

const Passing rows[] = {
    {"AlignmentBeforeAnyVariable", "",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("_enddef", intOf(netcdf("create", folder.file("a.nc"), 0)), 0, 0, 0, 0);
     }},
    {"AlignmentOutsideOfDefineMode", "TESSEL:netcdf:pEndDef:operationNotAllowedInDataMode",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("_enddef", newDataset(netcdf, folder.file("a.nc")), 0, 0, 0, 0);
     }},
    {"AlignmentOfAnHdf5File", "",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"), 4096);
         netcdf("redef", ncid);
         netcdf("_enddef", ncid, 0, 0, 0, 0);
     }},
    {"AlignmentOfAnHdf5FileByDefault", "",
     [](const Module &netcdf, const Folder &folder) {
         const int former = intOf(netcdf("set_default_format", 3));
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         netcdf("set_default_format", former);
         netcdf("redef", ncid);
         netcdf("_enddef", ncid, 0, 0, 0, 0);
     }},
    {"MappedMemoryThatThereIsToReadBy", "",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("close", newDataset(netcdf, folder.file("a.nc")));
         netcdf("close", netcdf("_open", folder.file("a.nc"), 16, 0x1p40)[1]);
         netcdf("close", netcdf("_open", folder.file("a.nc"), 16, 0x1p63)[1]);
     }},
    {"MemoryThatIsNotMapped", "",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("close", newDataset(netcdf, folder.file("a.nc")));
         netcdf("close", netcdf("_open", folder.file("a.nc"), 8, 1e15)[1]);
         netcdf("close", netcdf("_open", folder.file("a.nc"), 0, 1e15)[1]);
     }},
    {"LengthsThatAreTooLargeForTheLibrary", "TESSEL:netcdf:endDef:formatSizeConstraintsViolated",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("enddef", definingVariable(netcdf, folder, ncDouble, {2, 0x1p62, 2}, data64));
     }},
    {"ALengthOfWhichNoVariableIs", "",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = definingVariable(netcdf, folder, ncDouble, {2}, data64);
         netcdf("def_dim", ncid, "z", 0x1p63);
         netcdf("enddef", ncid);
     }},
    {"AVariableOverADimensionThatThereIsNot", "TESSEL:netcdf:defVar:invalidDimensionIdOrName",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = definingVariable(netcdf, folder, ncDouble, {2});
         netcdf("def_var", ncid, "w", ncDouble, 99);
     }},
    {"AlignmentThatIsNegative", "TESSEL:netcdf:negativeSize",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         netcdf("redef", ncid);
         netcdf("_enddef", ncid, 0, -1, 0, 4);
     }},
    {"TooFewInputs", "TESSEL:netcdf:pEndDef:badParameterCount",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         netcdf("redef", ncid);
         netcdf("_enddef", ncid, 0, 0, 0);
     }},
    {"OpenOfAUserFormat", "TESSEL:netcdf:open:unknownErrorStatus",
     [](const Module &netcdf, const Folder &folder) {
         newDataset(netcdf, folder.file("a.nc"));
         netcdf("open", folder.file("a.nc"), 64);
     }},
    {"CreateInMemoryFlag", "",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("close", intOf(netcdf("create", folder.file("a.nc"), 32768)));
     }},
    {"SecondCloseOfADatasetThatWasClosed", "TESSEL:netcdf:close:notNetcdfID",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         netcdf("close", ncid);
         netcdf("close", ncid);
     }},
    {"CountsThatWrapToAnotherNumber", "TESSEL:netcdf:putVara:dataSizeMismatch",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         netcdf("put_vara_double", ncid, 1, Array::row({0, 0}), Array::row({-1, -1}),
                Array::row({1, 2}));
     }},
    {"CountsWithoutData", "TESSEL:netcdf:emptyVariableData",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         netcdf("put_vara_double", ncid, 1, Array::row({0, 0}), Array::row({2, 0x1p63}),
                Array::numeric(tsDOUBLE, std::array<std::size_t, 2>{0, 0}));
     }},
    {"AStepBackwardsFromARecordFarBeyond", "TESSEL:netcdf:putVars:illegalStride",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         netcdf("put_vars_double", ncid, 1, Array::row({0, 4e9}), Array::row({1, 2}),
                Array::row({1, -1}), Array::row({1, 2}));
     }},
    {"AnElementFarBeyondTheRecordsWithoutFilling", "",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"), 512); // 64-bit offsets
         netcdf("set_fill", ncid, 256);
         netcdf("put_var1_double", ncid, 1, Array::row({0, 2e8}), 1);
     }},
    {"AnElementFarBeyondAFixedDimension", "TESSEL:netcdf:putVar1:indexExceedsDimensionBound",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         netcdf("put_var1_double", ncid, 0, 4e9, 1);
         netcdf("put_var1_double", ncid, 0, 4e9, 1);
     }},
    {"AnElementOfNoVariable", "TESSEL:netcdf:putVar1:inqVarNDimsFailure",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         netcdf("put_var1_double", ncid, 7, Array::row({0, 4e9}), 1);
     }},
    {"AnElementOfNoDataset", "TESSEL:netcdf:putVar1:inqVarNDimsFailure",
     [](const Module &netcdf, const Folder & /*folder*/) {
         netcdf("put_var1_double", 0x7FFF0000, 1, Array::row({0, 4e9}), 1);
     }},
    {"AnElementWhileDefining", "TESSEL:netcdf:putVar1:operationNotAllowedInDefineMode",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         netcdf("redef", ncid);
         netcdf("put_var1_double", ncid, 1, Array::row({0, 4e9}), 1);
     }},
    {"AnElementFarBeyondTheRecordsOfAnHdf5File", "",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"), 4096);
         netcdf("put_var1_double", ncid, 1, Array::row({0, 4e9}), 1);
     }},
    {"AWordInsteadOfADataset", "TESSEL:netcdf:badIDDatatype",
     [](const Module &netcdf, const Folder & /*folder*/) { netcdf("close", "all"); }},
};

class PassingCall : public testing::TestWithParam<Passing> {};

TEST_P(PassingCall, IsAnsweredByTheModule) {
    const Folder folder;
    EXPECT_EQ(identifierOf([&] { GetParam().call(guardedModule(), folder); }),
              GetParam().identifier);
    const Folder other;
    EXPECT_EQ(identifierOf([&] { GetParam().call(plainModule(), other); }), GetParam().identifier);
}

INSTANTIATE_TEST_SUITE_P(Rows, PassingCall, testing::ValuesIn(rows),
                         [](const auto &row) { return row.param.name; });

TEST(Records, FillUpToTheLimit) {
    const Folder folder;
    const Module netcdf = guardedModule({.fillLimit = 800}); // ten records
    const int ncid = newDataset(netcdf, folder.file("a.nc"));
    const auto write = [&](double record) {
        return identifierOf([&] {
            netcdf("put_var1_double", ncid, 1, Array::row({0, record}), 1);
        });
    };
    EXPECT_EQ(write(11), "TESSEL:guard:records");
    EXPECT_EQ(write(10), "") << "ten records are filled";
    EXPECT_EQ(write(3), "");
    EXPECT_EQ(write(22), "TESSEL:guard:records") << "the records end at 11";
    EXPECT_EQ(write(21), "");
    for (int record = 22; record < 100; ++record) {
        EXPECT_EQ(write(record), "") << "records one after the other fill nothing";
    }
    netcdf("put_vara_double", ncid, 1, Array::row({0, 100}), Array::row({1, 40}),
           Array::numeric(tsDOUBLE, std::array<std::size_t, 2>{1, 40}));
    EXPECT_EQ(netcdf("inq_dim", ncid, 0)[1].number(), 140);
    // A variable that is defined later makes the records longer.
    netcdf("redef", ncid);
    netcdf("def_var", ncid, "more", ncDouble, Array::row({1, 0}));
    netcdf("enddef", ncid);
    EXPECT_EQ(write(146), "TESSEL:guard:records") << "six records of 160 bytes";
    EXPECT_EQ(write(145), "");
    netcdf("close", ncid);
}

TEST(Records, OfADatasetThatWasOpenedWithoutTheGuard) {
    const Folder folder;
    const Module netcdf = plainModule();
    const int ncid = newDataset(netcdf, folder.file("a.nc"));
    const auto write = [&] {
        guardedModule()("put_var1_double", ncid, 1, Array::row({0, 4e9}), 1);
    };
    EXPECT_EQ(identifierOf(write), "TESSEL:guard:records");
    netcdf("close", ncid);
}

struct Name {
    const char *name;
    bool address;
};

TEST(Addresses, AreRefusedUnlessAllowed) {
    constexpr Name names[] = {
        {"https://127.0.0.1:1/a.nc", true},
        {"http://127.0.0.1:1/a.nc", true},
        {"file:///a.nc", true},
        {"  dods://127.0.0.1:1/a", true},
        {"[mode=x] http://127.0.0.1:1/a", true},
        {"s3://bucket/a", true},
        {"https\n://127.0.0.1:1/a.nc", true}, // what the library drops before it looks
        {"http:/\t/127.0.0.1:1/a.nc", true},
        {"h\x01ttp://127.0.0.1:1/a.nc", true},
        {"\u00A0http://127.0.0.1:1/a.nc", true},
        {"http\u00E9://127.0.0.1:1/a.nc", true},
        {"[x]\u00E9http://127.0.0.1:1/a.nc", true},
        {"\u00E9[x]http://127.0.0.1:1/a.nc", true},
        {R"([a\]b]http://127.0.0.1:1/a.nc)", true},
        {"missing/a.nc", false},
        {"[missing/a.nc", false},
        {"missing/a:b.nc", false},
        {"://missing/a.nc", false},
        {"folder/http://a.nc", false},
    };
    const Module guarded = guardedModule();
    for (const Name &row : names) {
        for (const char *operation : {"open", "create"}) {
            const std::string identifier = identifierOf([&] { guarded(operation, row.name, 4); });
            EXPECT_EQ(identifier == "TESSEL:guard:remote", row.address)
                << operation << " " << row.name << ": " << identifier;
        }
    }
    const std::string identifier = identifierOf(
        [&] { guardedModule({.remote = true})("open", "https://127.0.0.1:1/a.nc", 0); });
    EXPECT_TRUE(identifier.starts_with("TESSEL:netcdf:open:")) << identifier;
}

} // namespace
} // namespace tessel::test
