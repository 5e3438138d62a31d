// tests/guard/passing_test.cpp: what looks like a refused call and is none, addresses, and closing.
#include "support.hpp"

#include <cstddef>
#include <fstream>
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

/// In define mode, which it cannot leave: the fill value has two values instead of one.
int unclosable(const Module &netcdf, const std::string &file) {
    const int ncid = intOf(netcdf("create", file, 0));
    const int x = intOf(netcdf("def_dim", ncid, "x", 3));
    netcdf("def_var", ncid, "v", ncInt, x);
    netcdf("put_att_double", ncid, 0, "_FillValue", ncInt, Array::row({1, 2}));
    return ncid;
}

TEST(Closing, ThatFailsWhileDefiningLeavesTheDatasetAsItWas) {
    const Folder folder;
    const Module netcdf = guardedModule();
    const int ncid = unclosable(netcdf, folder.file("a.nc"));
    const auto close = [&] { netcdf("close", ncid); };
    EXPECT_EQ(identifierOf(close), "TESSEL:netcdf:close:invalidDataType");
    EXPECT_EQ(identifierOf(close), "TESSEL:netcdf:close:invalidDataType");
    netcdf("del_att", ncid, 0, "_FillValue");
    EXPECT_EQ(identifierOf(close), "");
    const int again = intOf(netcdf("open", folder.file("a.nc"), "NOWRITE"));
    EXPECT_EQ(netcdf("inq_var", again, 0)[0].utf8(), "v");
    netcdf("close", again);
}

TEST(ClosedDatasets, AreRefusedToEveryOperation) {
    const Folder folder;
    const Module netcdf = guardedModule();
    const int ncid = unclosable(plainModule(), folder.file("a.nc"));
    EXPECT_EQ(identifierOf([&] { netcdf("close", ncid); }), "TESSEL:netcdf:close:invalidDataType");

    const int other = newDataset(netcdf, folder.file("b.nc"));
    EXPECT_EQ(identifierOf([&] { netcdf("inq", ncid); }), "TESSEL:guard:closed");
    EXPECT_EQ(identifierOf([&] { netcdf("close", ncid); }), "TESSEL:guard:closed");
    EXPECT_EQ(identifierOf([&] { netcdf("get_var1_double", ncid, 0, 0); }), "TESSEL:guard:closed");
    EXPECT_EQ(identifierOf([&] { netcdf("copy_att", other, 0, "a", ncid, 0); }),
              "TESSEL:guard:closed");
    EXPECT_EQ(identifierOf([&] { netcdf("inq", other); }), "");

    // A count that is the same number as the id is no id.
    const auto length = static_cast<std::size_t>(ncid);
    netcdf("redef", other);
    const int longDimension = intOf(netcdf("def_dim", other, "long", ncid));
    const int varid = intOf(netcdf("def_var", other, "w", ncDouble, longDimension));
    netcdf("enddef", other);
    const Array data = Array::numeric(tsDOUBLE, std::array<std::size_t, 1>{length});
    EXPECT_EQ(identifierOf([&] { netcdf("put_vara_double", other, varid, 0, ncid, data); }), "");
    EXPECT_EQ(identifierOf([&] { netcdf("get_vars_double", other, varid, 0, ncid, 1); }), "");
    netcdf("close", other);
}

TEST(Closing, CanBeRepeatedWhenTheDiskWasFull) {
    const Folder folder;
    const Module netcdf = guardedModule();
    const int ncid = intOf(netcdf("create", folder.file("a.nc"), 0));
    const int x = intOf(netcdf("def_dim", ncid, "x", 20000));
    netcdf("def_var", ncid, "v", ncDouble, x);
    netcdf("set_fill", ncid, 256);
    netcdf("enddef", ncid);
    netcdf("put_var1_double", ncid, 0, 0, 7);
    const auto close = [&] { netcdf("close", ncid); };
    {
        const FullDisk full;
        EXPECT_EQ(identifierOf(close), "TESSEL:netcdf:close:fileTooLarge");
    }
    EXPECT_EQ(netcdf("inq_dim", ncid, 0)[1].number(), 20000) << "it is open still";
    EXPECT_EQ(identifierOf(close), "");
    const int again = intOf(netcdf("open", folder.file("a.nc"), "NOWRITE"));
    EXPECT_EQ(netcdf("get_var1_double", again, 0, 0)[0].number(), 7);
    netcdf("close", again);
}

/// A file of 160 kB, whose last value is changed, is closed on a full disk, and again when there is
/// room. What the first closing raised, and the value then.
std::pair<std::string, double> closedOnAFullDisk(const Module &netcdf, const Folder &folder) {
    const int ncid = intOf(netcdf("create", folder.file("a.nc"), 0));
    const int x = intOf(netcdf("def_dim", ncid, "x", 20000));
    netcdf("def_var", ncid, "v", ncDouble, x);
    netcdf("enddef", ncid);
    netcdf("sync", ncid);
    netcdf("put_var1_double", ncid, 0, 19999, 7);
    const auto close = [&] { netcdf("close", ncid); };
    std::string raised;
    {
        const FullDisk full;
        raised = identifierOf(close);
    }
    EXPECT_EQ(identifierOf(close), raised.empty() ? "TESSEL:netcdf:close:notNetcdfID" : "");
    const int again = intOf(netcdf("open", folder.file("a.nc"), "NOWRITE"));
    const double value = netcdf("get_var1_double", again, 0, 19999)[0].number();
    netcdf("close", again);
    return {raised, value};
}

TEST(Closing, SaysWithTheGuardThatTheLastBufferWasNotWritten) {
    const Folder folder;
    constexpr double filled = 9.9692099683868690e+36;
    EXPECT_EQ(closedOnAFullDisk(plainModule(), folder), std::pair(""s, filled)) << "7 is lost";
    EXPECT_EQ(closedOnAFullDisk(guardedModule(), folder),
              std::pair("TESSEL:netcdf:close:fileTooLarge"s, 7.0));
}

TEST(Closing, SynchronisesWhatIsOpenForWriting) {
    const Folder folder;
    const Module netcdf = guardedModule();
    netcdf("close", newDataset(netcdf, folder.file("a.nc")));
    const Array modes[] = {Array::text("WRITE"), Array::text("nc_Write"), Array::scalar(1),
                           Array::scalar(1)};
    for (const Array &mode : modes) {
        const int ncid = intOf(netcdf("open", folder.file("a.nc"), mode));
        netcdf("put_var1_double", ncid, 1, Array::row({0, 1000}), 7); // 80 kB
        netcdf("sync", ncid);
        netcdf("put_var1_double", ncid, 1, Array::row({0, 1000}), 8);
        const auto close = [&] { netcdf("close", ncid); };
        {
            const FullDisk full;
            EXPECT_EQ(identifierOf(close), "TESSEL:netcdf:close:fileTooLarge");
        }
        EXPECT_EQ(identifierOf(close), "");
    }
}

TEST(Closing, DoesNotReadTheHeaderAgain) {
    const Array modes[] = {Array::text("NOWRITE"), Array::text("nc_NoWrite"),
                           Array::text("NC_NOWRITE"), Array::scalar(0)};
    const Module netcdf = guardedModule();
    for (const Array &mode : modes) {
        const Folder folder;
        netcdf("close", newDataset(netcdf, folder.file("a.nc")));
        const int ncid = intOf(netcdf("open", folder.file("a.nc"), mode));
        written(folder, "a.nc", "no header");
        EXPECT_EQ(identifierOf([&] { netcdf("close", ncid); }), "");
    }
}

TEST(Synchronising, LooksAtTheFileThatIsOpenWhateverItsName) {
    const Module netcdf = guardedModule();
    const Folder folder;
    const std::string path = folder.file("a.nc");
    netcdf("close", newDataset(netcdf, path));
    const auto sync = [&](int ncid) { return identifierOf([&] { netcdf("sync", ncid); }); };
    const std::string bad = "CDF\1"s + words({0, 10, 0x7FFFFFFF});

    const int replaced = intOf(netcdf("open", path, "NOWRITE"));
    EXPECT_EQ(sync(replaced), "");
    std::filesystem::rename(path, folder.file("b.nc"));
    written(folder, "a.nc", bad);
    const std::ifstream other(path);
    EXPECT_EQ(sync(replaced), "") << "the bad file is open, and another one";
    written(folder, "b.nc", bad);
    EXPECT_EQ(sync(replaced), "TESSEL:guard:header");
    std::filesystem::remove(folder.file("b.nc"));
    EXPECT_EQ(sync(replaced), "TESSEL:guard:header");

    const int writing = newDataset(netcdf, path);
    EXPECT_EQ(sync(writing), "") << "what is open for writing is not read again";
    netcdf("close", writing);
    netcdf("close", replaced);
}

} // namespace
} // namespace tessel::test
