// tests/guard/closing_test.cpp: closing and synchronising behind the guard.
#include "ending.hpp"
#include "support.hpp"

#include <fcntl.h>
#ifdef __SANITIZE_ADDRESS__
#include <sanitizer/lsan_interface.h>
#endif
#include <unistd.h>

#include <array>
#include <cerrno>
#include <cstddef>
#include <fstream>
#include <utility>
#include <vector>

namespace tessel::test {
namespace {

using namespace std::string_literals;

TEST(Closing, ThatFailsWhileDefiningLeavesTheDatasetAsItWas) {
    const Folder folder;
    const Module netcdf = guardedModule();
    const int ncid = unclosable(netcdf, folder);
    const auto close = [&] { netcdf("close", ncid); };
    EXPECT_EQ(identifierOf(close), "TESSEL:netcdf:close:invalidDataType");
    EXPECT_EQ(identifierOf(close), "TESSEL:netcdf:close:invalidDataType");
    netcdf("del_att", ncid, 0, "_FillValue");
    EXPECT_EQ(identifierOf(close), "");
    const int again = intOf(netcdf("open", folder.file("a.nc"), "NOWRITE"));
    EXPECT_EQ(netcdf("inq_var", again, 0)[0].utf8(), "v");
    netcdf("close", again);
}

TEST(Closing, WhileDefiningCanBeRepeatedWhenTheDiskWasFull) {
    const Folder folder;
    const Module netcdf = guardedModule();
    const int ncid = definingVariable(netcdf, folder, ncDouble, {20000});
    const auto close = [&] { netcdf("close", ncid); };
    {
        const FullDisk full;
        EXPECT_EQ(identifierOf(close), "TESSEL:netcdf:close:fileTooLarge");
        EXPECT_EQ(identifierOf(close), "TESSEL:netcdf:close:fileTooLarge");
    }
    EXPECT_EQ(netcdf("inq_varid", ncid, "v")[0].number(), 0) << "it is open still";
    EXPECT_EQ(identifierOf(close), "");
    EXPECT_EQ(std::filesystem::file_size(folder.file("a.nc")) / 1000, 160U) << "it is filled";
}

/// A dataset whose definitions were ended without room: the library has left define mode, and says
/// that it failed.
int endedWithoutRoom(const Module &netcdf, const Folder &folder) {
    const int ncid = intOf(netcdf("create", folder.file("a.nc"), 0));
    const int t = intOf(netcdf("def_dim", ncid, "t", 0));
    netcdf("def_var", ncid, "v", ncDouble, t);
    netcdf("def_var", ncid, "filled", ncInt, Array::numeric(tsDOUBLE, std::array{std::size_t{0}}));
    constexpr double beyondTheDisk = 1 << 17;
    EXPECT_EQ(identifierOf([&] { netcdf("_enddef", ncid, 0, beyondTheDisk, 2, 4); }),
              "TESSEL:netcdf:pEndDef:fileTooLarge");
    return ncid;
}

TEST(EndOfDefinitions, ThatFailedMayHaveLeftDefineMode) {
    const Folder folder;
    const Module netcdf = guardedModule();
    int ncid = 0;
    {
        const FullDisk full;
        ncid = endedWithoutRoom(netcdf, folder);
        EXPECT_EQ(identifierOf([&] { netcdf("put_var1_double", ncid, 0, 4e9, 1); }),
                  "TESSEL:guard:records");
    }
    EXPECT_EQ(identifierOf([&] { netcdf("_enddef", ncid, 0, 0, 0, 0); }),
              "TESSEL:netcdf:pEndDef:operationNotAllowedInDataMode");
    EXPECT_EQ(identifierOf([&] { netcdf("put_var1_double", ncid, 0, 1, 7); }), "");
    EXPECT_EQ(netcdf("get_var1_double", ncid, 0, 1)[0].number(), 7);
    netcdf("close", ncid);
}

TEST(EndOfDefinitions, ThatFailedMayNotHaveLeftDefineMode) {
    const Folder folder;
    const Module netcdf = guardedModule();
    const int ncid = unclosable(netcdf, folder);
    const int t = intOf(netcdf("def_dim", ncid, "t", 0));
    netcdf("def_var", ncid, "w", ncInt, t);
    for (const char *operation : {"enddef", "close"}) {
        EXPECT_EQ(identifierOf([&] { netcdf(operation, ncid); }),
                  std::string("TESSEL:netcdf:") + (operation == "close"s ? "close" : "endDef") +
                      ":invalidDataType");
        EXPECT_EQ(identifierOf([&] { netcdf("put_var1_double", ncid, 1, 4e9, 1); }),
                  "TESSEL:netcdf:putVar1:operationNotAllowedInDefineMode");
        EXPECT_EQ(identifierOf([&] { netcdf("_enddef", ncid, 0, 0, 0, 0); }),
                  "TESSEL:guard:alignment");
    }
    netcdf("del_att", ncid, 0, "_FillValue");
    netcdf("close", ncid);
}

/// The library forgets the dataset, but keeps its memory and its file.
TEST(Abort, ThatFailedHasEndedTheDataset) {
#ifdef __SANITIZE_ADDRESS__
    const __lsan::ScopedDisabler kept;
#endif
    for (const Module &netcdf : {plainModule(), guardedModule()}) {
        const Folder folder;
        const FullDisk full;
        const int ncid = endedWithoutRoom(netcdf, folder);
        netcdf("put_var1_double", ncid, 0, 1, 7);
        EXPECT_EQ(identifierOf([&] { netcdf("abort", ncid); }), "TESSEL:netcdf:abort:fileTooLarge");
        EXPECT_EQ(identifierOf([&] { netcdf("inq", ncid); }), "TESSEL:netcdf:inq:notNetcdfID");
    }
}

/// Closing a file based on HDF5 is not divided into steps. In a process of its own, because the
/// library keeps the file and meets it again at the end of the process.
TEST(ClosedDatasets, MayBeBasedOnHdf5) {
    EXPECT_EQ(endOf([](const Folder &folder) {
                  const Module netcdf = guardedModule();
                  const int ncid = intOf(netcdf("create", folder.file("a.nc"), hdf5));
                  const int x = intOf(netcdf("def_dim", ncid, "x", 20000));
                  netcdf("def_var", ncid, "v", ncDouble, x);
                  netcdf("enddef", ncid);
                  {
                      const FullDisk full;
                      identifierOf([&] { netcdf("put_var1_double", ncid, 0, 19999, 1); });
                      if (identifierOf([&] { netcdf("close", ncid); }).empty()) {
                          return;
                      }
                  }
                  if (identifierOf([&] { netcdf("inq", ncid); }) == "TESSEL:guard:closed") {
                      throw Error("refused", "as it should be");
                  }
              }),
              raised);
}

TEST(ClosedDatasets, AreRefusedToEveryOperation) {
    const Folder folder;
    const Module netcdf = guardedModule();
    const int ncid = unclosable(plainModule(), folder);
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
    const int ncid = definingVariable(netcdf, folder, ncDouble, {20000});
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
    const int ncid = definingVariable(netcdf, folder, ncDouble, {20000});
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
    const Array modes[] = {Array::text("WRITE"), Array::text("nc_Write"),
                           Array::text("WRITE\0 and more"s), Array::scalar(1)};
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

/// What a write raises that follows a closing without room, and an error of something else.
std::string writtenAfterAnError(const Module &netcdf, const Folder &folder) {
    const int ncid = intOf(netcdf("create", folder.file("a.nc"), 0));
    const int t = intOf(netcdf("def_dim", ncid, "t", 0));
    const int varid = intOf(netcdf("def_var", ncid, "v", ncDouble, t));
    constexpr double beyondTheDisk = 1 << 17;
    netcdf("_enddef", ncid, 0, 4, 0, beyondTheDisk);
    std::string raised;
    {
        const FullDisk full;
        EXPECT_EQ(identifierOf([&] { netcdf("close", ncid); }), "TESSEL:netcdf:close:fileTooLarge");
        errno = ENOENT;
        raised = identifierOf([&] { netcdf("put_var1_double", ncid, varid, 2, 1); });
    }
    errno = 0;
    netcdf("close", ncid);
    return raised;
}

TEST(Writing, AfterAnErrorIsNotTakenForIt) {
    const Folder folder;
    EXPECT_EQ(writtenAfterAnError(plainModule(), folder),
              "TESSEL:netcdf:putVar1:noSuchFileOrDirectory");
    EXPECT_EQ(writtenAfterAnError(guardedModule(), folder), "");
}

/// As long as it lives, no file can be opened.
class NoDescriptors {
  public:
    NoDescriptors() {
        getrlimit(RLIMIT_NOFILE, &before);
        const rlimit few = {64, before.rlim_max};
        setrlimit(RLIMIT_NOFILE, &few);
        for (int next = openNothing(); next >= 0; next = openNothing()) {
            taken.push_back(next);
        }
    }
    ~NoDescriptors() {
        for (const int each : taken) {
            ::close(each);
        }
        setrlimit(RLIMIT_NOFILE, &before);
    }
    NoDescriptors(const NoDescriptors &) = delete;
    NoDescriptors &operator=(const NoDescriptors &) = delete;

  private:
    static int openNothing() { return ::open("/dev/null", O_RDONLY | O_CLOEXEC); }

    rlimit before{};
    std::vector<int> taken;
};

TEST(Synchronising, LooksAtTheFileAlsoWhenNoDescriptorIsLeft) {
#ifdef __SANITIZE_ADDRESS__
    GTEST_SKIP() << "the sanitizers need descriptors to see which memory there is";
#endif
    const Module netcdf = guardedModule();
    const Folder folder;
    const std::string path = folder.file("a.nc");
    netcdf("close", newDataset(netcdf, path));
    const int good = intOf(netcdf("open", path, "NOWRITE"));
    netcdf("close", newDataset(netcdf, folder.file("b.nc")));
    const int bad = intOf(netcdf("open", folder.file("b.nc"), "NOWRITE"));
    written(folder, "b.nc", "CDF\1"s + words({0, 10, 0x7FFFFFFF}));
    std::string ofGood;
    std::string ofBad;
    {
        const NoDescriptors none;
        ofGood = identifierOf([&] { netcdf("sync", good); });
        ofBad = identifierOf([&] { netcdf("sync", bad); });
    }
    EXPECT_EQ(ofGood, "");
    EXPECT_EQ(ofBad, "TESSEL:guard:header");
    netcdf("close", good);
    netcdf("close", bad);
}

} // namespace
} // namespace tessel::test
