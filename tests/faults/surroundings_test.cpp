// tests/faults/surroundings_test.cpp: disks that are full or not to be written to, files that
// change under an open dataset, and limits of the process. A row each: what is done, and what comes
// of it.
#include "support.hpp"

#include <gtest/gtest.h>
#include <sched.h>
#include <sys/mount.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <csignal>
#include <cstdint>
#include <fstream>
#include <ostream>
#include <span>
#include <vector>

namespace tessel::test {
namespace {

using Lines = std::vector<std::string>;

/// What was done, and the identifiers that it raised.
class Story {
  public:
    explicit Story(const Folder &place) : folder(place) {}

    /// Does something and notes how it went; true if it raised nothing.
    template <class Call>
    bool tell(const std::string &what, const Call &call) {
        const std::string raised = raisedBy(call);
        note(what, raised == "nothing" ? "done" : raised);
        return raised == "nothing";
    }

    void note(const std::string &what, const std::string &came) {
        said += what + ": " + came + '\n';
    }

    /// Notes whether the first records of a file are as they were written.
    void look(const std::string &name, std::size_t records) {
        const std::string fault = log::faultIn(file(name), records);
        note(std::to_string(records) + " records of " + name, fault.empty() ? "intact" : fault);
    }

    /// A closed log of three records.
    void makeLog(const std::string &name) const { netcdf()("close", openLog(name)); }

    /// An open log of three records, synchronised.
    [[nodiscard]] int openLog(const std::string &name) const {
        const int ncid = log::create(file(name));
        log::appendSynchronised(ncid, 0, 3);
        return ncid;
    }

    void appendAndClose(int ncid) {
        tell("append", [&] { log::append(ncid, 3); });
        tell("sync", [&] { netcdf()("sync", ncid); });
        tell("close", [&] { netcdf()("close", ncid); });
    }

    [[nodiscard]] std::string file(const std::string &name) const { return folder.file(name); }
    [[nodiscard]] const std::string &text() const { return said; }

    const Folder &folder;

  private:
    std::string said;
};

/// Thrown where the system does not allow what a row needs.
struct NotAllowed : std::runtime_error {
    using std::runtime_error::runtime_error;
};

void allowed(bool holds, const std::string &what) {
    if (!holds) {
        throw NotAllowed(what);
    }
}

void limit(int resource, rlim_t most) {
    const rlimit wanted = {most, most};
    allowed(setrlimit(static_cast<decltype(RLIMIT_AS)>(resource), &wanted) == 0, "no limit");
}

/// A user that permissions hold for, as they do not for the superuser.
void becomeOrdinary() {
    constexpr uid_t nobody = 65534;
    allowed(geteuid() != 0 || setuid(nobody) == 0, "cannot become another user");
}

void write(const std::string &file, const std::string &text) {
    std::ofstream(file) << text;
}

/// A mount namespace of the child's own, in which it may mount what it likes.
void ownMounts() {
    const uid_t user = geteuid();
    allowed(unshare(user == 0 ? CLONE_NEWNS : CLONE_NEWUSER | CLONE_NEWNS) == 0,
            "no mount namespace of one's own");
    if (user != 0) {
        write("/proc/self/uid_map", "0 " + std::to_string(user) + " 1");
    }
    allowed(mount("none", "/", nullptr, MS_REC | MS_PRIVATE, nullptr) == 0, "no private mounts");
}

/// A file system that has room for three records and some of the next, beside what is on it.
void smallDisk(const Folder &folder, std::size_t ballast = 0) {
    ownMounts();
    const std::string size = "size=" + std::to_string(65536 + ballast);
    allowed(mount("tmpfs", folder.folder().c_str(), "tmpfs", 0, size.c_str()) == 0, "no mount");
    write(folder.file("ballast"), std::string(ballast, 'b'));
}

constexpr rlim_t roomForThree = 3 * log::recordBytes + 4096;

/// Reads that want more than the limit of memory: four members, since each has memory of its own.
void readTooMuch(Story &story) {
    constexpr double elements = 300e6;
    constexpr int noFill = 256;
    const int ncid = idOf(netcdf()("create", story.file("large.nc"), "CLOBBER"));
    netcdf()("set_fill", ncid, noFill);
    const Results x = netcdf()("def_dim", ncid, "x", elements);
    const Results chars = netcdf()("def_var", ncid, "text", 2, x[0]);
    const Results bytes = netcdf()("def_var", ncid, "bytes", 1, x[0]);
    netcdf()("enddef", ncid);
    limit(RLIMIT_AS, rlim_t{400} << 20U);
    story.tell("get_var_double", [&] { netcdf()("get_var_double", ncid, bytes[0]); });
    story.tell("get_vara_float", [&] { netcdf()("get_vara_float", ncid, bytes[0], 0, elements); });
    story.tell("get_vars_int",
               [&] { netcdf()("get_vars_int", ncid, bytes[0], 0, elements / 2, 2); });
    story.tell("get_var_text", [&] { netcdf()("get_var_text", ncid, chars[0]); });
    story.tell("get_var1_double", [&] { netcdf()("get_var1_double", ncid, bytes[0], 7); });
    story.tell("close", [&] { netcdf()("close", ncid); });
}

/// The addresses that the process has taken, in bytes.
rlim_t addressesTaken() {
    rlim_t pages = 0;
    std::ifstream("/proc/self/statm") >> pages;
    return pages * static_cast<rlim_t>(sysconf(_SC_PAGESIZE));
}

std::string shown(double whole) {
    return std::to_string(static_cast<long>(whole));
}

/// Writes with less memory than a second copy of the values takes. Numbers are handed to the
/// library as they are, text goes through bytes of the module's, attributes and what is kept in
/// memory through the library's.
void writeTooMuch(Story &story) {
    constexpr std::size_t elements = 40'000'000;
    constexpr rlim_t little = rlim_t{16} << 20U;
    constexpr double keptInMemory = 8;
    constexpr double ncByte = 1;
    constexpr double ncChar = 2;
    constexpr double ncDouble = 6;
    const Array text = Array::text(std::string(elements, 'a'));
    const Array numbers = Array::numeric(tsINT8, std::array{elements, std::size_t{1}});
    std::fill_n(numbers.elements<std::int8_t>().data(), elements, std::int8_t{7});
    const Array doubles = Array::numeric(tsDOUBLE, std::array{elements / 8, std::size_t{1}});
    const auto count = static_cast<double>(elements);

    const auto make = [&](const std::string &name, double flags) {
        const int ncid = idOf(netcdf()("create", story.file(name), flags));
        netcdf()("set_fill", ncid, 256);
        const Results x = netcdf()("def_dim", ncid, "x", count);
        netcdf()("def_var", ncid, "text", ncChar, x[0]);
        netcdf()("def_var", ncid, "bytes", ncByte, x[0]);
        return ncid;
    };
    const int ncid = make("large.nc", 0);
    netcdf()("put_att_text", ncid, -1, "small", "a");
    netcdf()("enddef", ncid);
    const int kept = make("kept.nc", keptInMemory);
    netcdf()("enddef", kept);

    const rlim_t before = addressesTaken();
    const auto leave = [&](rlim_t most) {
        const rlimit few = {most, RLIM_INFINITY};
        setrlimit(RLIMIT_AS, &few);
    };
    const auto noteMemory = [&] {
        story.note("memory", addressesTaken() < before + little ? "as before" : "more");
    };
    leave(before + little);
    story.tell("put_var_text", [&] { netcdf()("put_var_text", ncid, 0, text); });
    story.tell("put_vara_text", [&] { netcdf()("put_vara_text", ncid, 0, 0, count, text); });
    story.tell("put_vars_text", [&] { netcdf()("put_vars_text", ncid, 0, 0, count, 1, text); });
    story.tell("put_var1_text", [&] { netcdf()("put_var1_text", ncid, 0, 7, "b"); });
    story.tell("put_var_schar", [&] { netcdf()("put_var_schar", ncid, 1, numbers); });
    story.tell("put_var_schar in memory", [&] { netcdf()("put_var_schar", kept, 1, numbers); });
    netcdf()("redef", ncid);
    story.tell("put_att_text", [&] { netcdf()("put_att_text", ncid, -1, "large", text); });
    story.tell("put_att_double",
               [&] { netcdf()("put_att_double", ncid, -1, "large", ncDouble, doubles); });
    leave(before + little + elements); // for the module's bytes, and not for the library's
    story.tell("put_att_text with more",
               [&] { netcdf()("put_att_text", ncid, -1, "large", text); });
    noteMemory();
    leave(before + little);
    story.tell("put_att_text again", [&] { netcdf()("put_att_text", ncid, -1, "small", "b"); });
    story.tell("enddef", [&] { netcdf()("enddef", ncid); });
    noteMemory();
    leave(RLIM_INFINITY);
    story.tell("put_var_text again", [&] { netcdf()("put_var_text", ncid, 0, text); });
    story.tell("close", [&] { netcdf()("close", ncid); });
    story.tell("put_var_schar in memory again",
               [&] { netcdf()("put_var_schar", kept, 1, numbers); });
    story.tell("close in memory", [&] { netcdf()("close", kept); });
    story.tell("abort in memory", [&] { netcdf()("abort", kept); });

    const int read = idOf(netcdf()("open", story.file("large.nc"), "NOWRITE"));
    story.note("attributes", shown(netcdf()("inq", read)[2].number()));
    story.note("the attribute", netcdf()("get_att_text", read, -1, "small")[0].utf8());
    story.note("the last letter", netcdf()("get_var1_text", read, 0, count - 1)[0].utf8());
    story.note("the last number",
               shown(netcdf()("get_var1_double", read, 1, count - 1)[0].number()));
}

struct Row {
    const char *name;
    Lines expected;
    void (*run)(Story &story);
    bool limits = false; ///< of the process, for memory or descriptors
};

void PrintTo(const Row &row, std::ostream *out) {
    *out << row.name;
}

// clang-format off
const Row rows[] = {
    {"TheDiskIsFull",
     {"append: TESSEL:netcdf:putVara:noSpaceLeftOnDevice",
      "sync: TESSEL:netcdf:sync:noSpaceLeftOnDevice",
      "close: TESSEL:netcdf:close:noSpaceLeftOnDevice",
      "3 records of log.nc: intact",
      "create: TESSEL:netcdf:create:noSpaceLeftOnDevice"},
     [](Story &story) {
         smallDisk(story.folder);
         story.appendAndClose(story.openLog("log.nc"));
         story.look("log.nc", 3);
         story.tell("create", [&] { log::create(story.file("other.nc")); });
     }},
    {"ThereIsRoomAgain",
     {"append: TESSEL:netcdf:putVara:noSpaceLeftOnDevice",
      "append again: done",
      "sync: done",
      "4 records of log.nc: intact"},
     [](Story &story) {
         smallDisk(story.folder, 65536);
         const int ncid = story.openLog("log.nc");
         story.tell("append", [&] { log::append(ncid, 3); });
         unlink(story.file("ballast").c_str());
         story.tell("append again", [&] { log::append(ncid, 3); });
         story.tell("sync", [&] { netcdf()("sync", ncid); });
         story.look("log.nc", 4);
     }},
    {"TheFileMayNotGrow",
     {"append: TESSEL:netcdf:putVara:fileTooLarge",
      "sync: TESSEL:netcdf:sync:fileTooLarge",
      "close: TESSEL:netcdf:close:fileTooLarge",
      "3 records of log.nc: intact"},
     [](Story &story) {
         const int ncid = story.openLog("log.nc");
         std::signal(SIGXFSZ, SIG_IGN); // it would end the process, and the call with it
         limit(RLIMIT_FSIZE, roomForThree);
         story.appendAndClose(ncid);
         story.look("log.nc", 3);
     }},
    {"TheFileSystemIsReadOnly",
     {"create: TESSEL:netcdf:create:readOnlyFileSystem",
      "open to write: TESSEL:netcdf:open:readOnlyFileSystem",
      "3 records of log.nc: intact"},
     [](Story &story) {
         ownMounts();
         const char *const place = story.folder.folder().c_str();
         allowed(mount("tmpfs", place, "tmpfs", 0, "size=1m") == 0, "no mount");
         story.makeLog("log.nc");
         allowed(mount(nullptr, place, nullptr, MS_REMOUNT | MS_RDONLY, nullptr) == 0, "no remount");
         story.tell("create", [&] { log::create(story.file("other.nc")); });
         story.tell("open to write", [&] { netcdf()("open", story.file("log.nc"), "WRITE"); });
         story.look("log.nc", 3);
     }},
    {"TheFolderIsReadOnly",
     {"create: TESSEL:netcdf:create:permissionDenied",
      "create over: TESSEL:netcdf:create:permissionDenied",
      "open to write: TESSEL:netcdf:open:permissionDenied",
      "3 records of log.nc: intact"},
     [](Story &story) {
         story.makeLog("log.nc");
         chmod(story.file("log.nc").c_str(), 0444);
         chmod(story.folder.folder().c_str(), 0555);
         becomeOrdinary();
         story.tell("create", [&] { log::create(story.file("other.nc")); });
         story.tell("create over", [&] { log::create(story.file("log.nc")); });
         story.tell("open to write", [&] { netcdf()("open", story.file("log.nc"), "WRITE"); });
         story.look("log.nc", 3);
     }},
    {"TheFileMayNotBeRead",
     {"open: TESSEL:netcdf:open:permissionDenied"},
     [](Story &story) {
         story.makeLog("log.nc");
         chmod(story.file("log.nc").c_str(), 0);
         becomeOrdinary();
         story.tell("open", [&] { netcdf()("open", story.file("log.nc"), "NOWRITE"); });
     }},
    {"AFolderAndAFileChangePlaces",
     {"create: TESSEL:netcdf:create:isDirectory",
      "open below a file: TESSEL:netcdf:open:notADirectory"},
     [](Story &story) {
         story.makeLog("log.nc");
         story.tell("create", [&] { log::create(story.folder.folder()); });
         story.tell("open below a file", [&] { netcdf()("open", story.file("log.nc") + "/a.nc", "NOWRITE"); });
     }},
    {"TooManyFilesAreOpen",
     {"open: TESSEL:netcdf:open:tooManyOpenFiles",
      "create: TESSEL:netcdf:create:tooManyOpenFiles",
      "open after a close: done",
      "3 records of log.nc: intact"},
     [](Story &story) {
         story.makeLog("log.nc");
         limit(RLIMIT_NOFILE, 40);
         std::vector<int> ids;
         const auto open = [&] { ids.push_back(idOf(netcdf()("open", story.file("log.nc"), "NOWRITE"))); };
         std::string raised = "nothing";
         while (raised == "nothing" && ids.size() < 100) {
             raised = raisedBy(open);
         }
         story.note("open", raised);
         story.tell("create", [&] { log::create(story.file("other.nc")); });
         netcdf()("close", ids.back());
         ids.pop_back();
         story.tell("open after a close", open);
         for (const int ncid : ids) {
             netcdf()("close", ncid);
         }
         story.look("log.nc", 3);
     }, true},
    {"TheFileIsDeleted", // it lives on as long as it is open, as files do here
     {"append: done", "sync: done", "close: done", "open: TESSEL:netcdf:open:noSuchFileOrDirectory"},
     [](Story &story) {
         const int ncid = story.openLog("log.nc");
         unlink(story.file("log.nc").c_str());
         story.appendAndClose(ncid);
         story.tell("open", [&] { netcdf()("open", story.file("log.nc"), "NOWRITE"); });
     }},
    {"TheFileIsReplaced", // who has it open goes on with the old one
     {"sync: done", "open before: 3 records", "open anew: 5 records", "read: done", "5 records of log.nc: intact"},
     [](Story &story) {
         story.makeLog("log.nc");
         const int before = idOf(netcdf()("open", story.file("log.nc"), "NOWRITE"));
         const int ncid = story.openLog("aside.nc");
         log::appendSynchronised(ncid, 3, 5);
         netcdf()("close", ncid);
         std::filesystem::rename(story.file("aside.nc"), story.file("log.nc"));
         story.tell("sync", [&] { netcdf()("sync", before); });
         const int anew = idOf(netcdf()("open", story.file("log.nc"), "NOWRITE"));
         story.note("open before", std::to_string(log::recordsOf(before)) + " records");
         story.note("open anew", std::to_string(log::recordsOf(anew)) + " records");
         story.tell("read", [&] { netcdf()("get_var_double", before, 0); });
         story.look("log.nc", 5);
     }},
    {"TheFileIsOverwritten",
     {"sync: TESSEL:netcdf:sync:notANetcdfFile", "close: done", "open: TESSEL:netcdf:open:notANetcdfFile"},
     [](Story &story) {
         story.makeLog("log.nc");
         const int ncid = idOf(netcdf()("open", story.file("log.nc"), "NOWRITE"));
         write(story.file("log.nc"), std::string(3 * log::recordBytes, 'z'));
         story.tell("sync", [&] { netcdf()("sync", ncid); });
         story.tell("close", [&] { netcdf()("close", ncid); });
         story.tell("open", [&] { netcdf()("open", story.file("log.nc"), "NOWRITE"); });
     }},
    {"TheFileIsCutOff", // what is gone reads as 0: the library sees the end of the file and goes on
     {"read: done", "the last value: 0", "2 records of log.nc: intact", "close: done"},
     [](Story &story) {
         story.makeLog("log.nc");
         const int ncid = idOf(netcdf()("open", story.file("log.nc"), "NOWRITE"));
         std::filesystem::resize_file(story.file("log.nc"), roomForThree - log::recordBytes);
         Results read;
         story.tell("read", [&] { read = netcdf()("get_var_double", ncid, 0); });
         story.note("the last value", read[0].elements<double>().back() == 0 ? "0" : "another");
         story.look("log.nc", 2);
         story.tell("close", [&] { netcdf()("close", ncid); });
     }},
    {"TheFileIsEmptied",
     {"read: done", "close: done", "open: TESSEL:netcdf:open:notANetcdfFile"},
     [](Story &story) {
         story.makeLog("log.nc");
         const int ncid = idOf(netcdf()("open", story.file("log.nc"), "NOWRITE"));
         std::filesystem::resize_file(story.file("log.nc"), 0);
         story.tell("read", [&] { netcdf()("get_var_double", ncid, 0); });
         story.tell("close", [&] { netcdf()("close", ncid); });
         story.tell("open", [&] { netcdf()("open", story.file("log.nc"), "NOWRITE"); });
     }},
    {"TheFileOfAWriterIsReplaced", // what it writes goes to the old one, of which nobody has the name
     {"append: done", "sync: done", "close: done", "3 records of log.nc: intact"},
     [](Story &story) {
         const int ncid = story.openLog("log.nc");
         story.makeLog("aside.nc");
         std::filesystem::rename(story.file("aside.nc"), story.file("log.nc"));
         story.appendAndClose(ncid);
         story.look("log.nc", 3);
     }},
    {"TheFileOfAWriterIsCutOff", // nobody tells the writer: what its buffer has not is gone
     {"append: done", "sync: done", "close: done", "2 records of log.nc: intact", "4 records of log.nc: another value in record 2, column 2499"},
     [](Story &story) {
         const int ncid = story.openLog("log.nc");
         std::filesystem::resize_file(story.file("log.nc"), roomForThree - log::recordBytes);
         story.appendAndClose(ncid);
         story.look("log.nc", 2);
         story.look("log.nc", 4);
     }},
    {"TheMemoryIsLimited",
     {"get_var_double: TESSEL:host:outOfMemory",
      "get_vara_float: TESSEL:host:outOfMemory",
      "get_vars_int: TESSEL:host:outOfMemory",
      "get_var_text: TESSEL:host:outOfMemory",
      "get_var1_double: done",
      "close: done"},
     readTooMuch, true},
    {"TheMemoryIsLimitedForWrites",
     {"put_var_text: TESSEL:netcdf:put_var_text:memoryAllocationFailure",
      "put_vara_text: TESSEL:netcdf:put_vara_text:memoryAllocationFailure",
      "put_vars_text: TESSEL:netcdf:put_vars_text:memoryAllocationFailure",
      "put_var1_text: done",
      "put_var_schar: done",
      "put_var_schar in memory: TESSEL:netcdf:putVar:memoryAllocationFailure",
      "put_att_text: TESSEL:netcdf:put_att_text:memoryAllocationFailure",
      "put_att_double: TESSEL:netcdf:putAtt:memoryAllocationFailure",
      "put_att_text with more: TESSEL:netcdf:putAttText:memoryAllocationFailure",
      "memory: as before",
      "put_att_text again: done",
      "enddef: done",
      "memory: as before",
      "put_var_text again: done",
      "close: done",
      // The library does not go on with what it could not make longer.
      "put_var_schar in memory again: TESSEL:netcdf:putVar:unknownErrorStatus",
      "close in memory: TESSEL:netcdf:close:unknownErrorStatus",
      "abort in memory: done",
      "attributes: 1",
      "the attribute: b",
      "the last letter: a",
      "the last number: 7"},
     writeTooMuch, true},
};
// clang-format on

class Surroundings : public testing::TestWithParam<Row> {};

/// True where a sanitizer takes memory and descriptors as it needs them.
#ifdef __SANITIZE_ADDRESS__
constexpr bool sanitized = true;
#else
constexpr bool sanitized = false;
#endif

TEST_P(Surroundings, AreSurvived) {
    const Row &row = GetParam();
    if (sanitized && row.limits) {
        GTEST_SKIP() << "the sanitizer would meet the limit as well";
    }
    const Folder folder;
    std::string expected;
    for (const std::string &line : row.expected) {
        expected += line + '\n';
    }
    const std::string said = inChild([&] {
        Story story(folder);
        try {
            row.run(story);
        } catch (const NotAllowed &why) {
            return std::string("not allowed: ") + why.what();
        }
        return story.text();
    });
    if (said.starts_with("not allowed: ")) {
        GTEST_SKIP() << said;
    }
    EXPECT_EQ(said, expected);
}

INSTANTIATE_TEST_SUITE_P(Rows, Surroundings, testing::ValuesIn(rows),
                         [](const auto &row) { return row.param.name; });

} // namespace
} // namespace tessel::test
