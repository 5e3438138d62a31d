// tests/guard/fatal_test.cpp: each call that the library does not survive, in a process of its own
// without the guard, where it ends badly, and with the guard, where it is an error or succeeds.
#include "ending.hpp"
#include "fatal_calls.hpp"

#include <csignal>
#include <cstring>

namespace tessel::test {
namespace {

class FatalCall : public testing::TestWithParam<Fatal> {};

TEST_P(FatalCall, IsFatalWithoutTheGuard) {
    const auto call = [](const Folder &folder) { GetParam().call(plainModule(), folder); };
    const std::string end = endOf(call);
    if (libraryRelease >= GetParam().mended) {
        EXPECT_TRUE(end == survived || end == raised) << end;
        return;
    }
    const std::string expected = strsignal(GetParam().signal);
    EXPECT_TRUE(end == expected || (sanitized && end == "exit with 1")) << end;
}

TEST_P(FatalCall, IsHarmlessWithTheGuard) {
    const Folder folder;
    const Module netcdf = guardedModule();
    try {
        GetParam().call(netcdf, folder);
        EXPECT_STREQ(GetParam().identifier, "") << "it was not refused";
    } catch (const Error &error) {
        EXPECT_EQ(error.identifier(), GetParam().identifier);
        EXPECT_NE(error.message().find(GetParam().why), std::string::npos) << error.message();
    }
    EXPECT_GT(netcdf("inq_libvers")[0].size(), 0U) << "the next call works";
}

/// Which signal it is depends on what the freed memory holds by then.
TEST(NotFenced, Hdf5FileOnAFullDisk) {
    for (const Module &netcdf : {plainModule(), guardedModule()}) {
        const std::string end = endOf([&](const Folder &folder) {
            const int ncid = intOf(netcdf("create", folder.file("a.nc"), 4096));
            const int x = intOf(netcdf("def_dim", ncid, "x", 20000));
            netcdf("def_var", ncid, "v", ncDouble, x);
            netcdf("enddef", ncid);
            const FullDisk full;
            identifierOf([&] { netcdf("put_var1_double", ncid, 0, 19999, 1); });
            netcdf("abort", ncid);
        });
        EXPECT_TRUE(end == strsignal(SIGSEGV) || end == strsignal(SIGABRT)) << end;
    }
}

TEST(NotFenced, MappedMemoryWhoseFileIsCutOff) {
    for (const Module &netcdf : {plainModule(), guardedModule()}) {
        EXPECT_EQ(endOf([&](const Folder &folder) {
                      const int made = intOf(netcdf("create", folder.file("a.nc"), 512));
                      const int x = intOf(netcdf("def_dim", made, "x", 100'000));
                      netcdf("def_var", made, "v", ncInt, x);
                      netcdf("close", made);
                      const int ncid = intOf(netcdf("open", folder.file("a.nc"), 16));
                      std::filesystem::resize_file(folder.file("a.nc"), 200);
                      netcdf("get_var_double", ncid, 0);
                  }),
                  strsignal(SIGBUS));
    }
}

INSTANTIATE_TEST_SUITE_P(Rows, FatalCall, testing::ValuesIn(fatalCalls()),
                         [](const auto &row) { return row.param.name; });

} // namespace
} // namespace tessel::test
