// tests/faults/system_call_test.cpp: each system call of an act fails in turn. A row says for an
// act and a kind of call which operation reports it, and whether the last one is passed over in
// silence.
#include "support.hpp"
#include "support/library.hpp"
#include "system_calls.hpp"
#include "tessel/netcdf_guard.hpp"

#include <gtest/gtest.h>

#include <cerrno>
#include <ostream>

namespace tessel::test {
namespace {

using Act = void (*)(const std::string &file);

/// A log of three synchronised records, open to be written.
int opened(const std::string &file) {
    return idOf(netcdf()("open", file, "WRITE"));
}

void open(const std::string &file) {
    opened(file);
}

void create(const std::string &file) {
    netcdf()("create", file + ".new", "NOCLOBBER");
}

/// A new file up to its first synchronised record.
void make(const std::string &file) {
    const int ncid = log::create(file + ".new");
    log::append(ncid, 0);
    netcdf()("sync", ncid);
}

void read(const std::string &file) {
    netcdf()("get_var_double", opened(file), 0);
}

void appendAndSync(const std::string &file) {
    const int ncid = opened(file);
    log::append(ncid, 3);
    netcdf()("sync", ncid);
}

void appendAndClose(const std::string &file) {
    const int ncid = opened(file);
    log::append(ncid, 3);
    netcdf()("close", ncid);
}

/// The same behind the guard, which synchronises before the dataset is closed.
void appendAndCloseGuarded(const std::string &file) {
    const Module guarded = netcdf().watchedBy(netcdfGuard());
    const int ncid = idOf(guarded("open", file, "WRITE"));
    log::append(ncid, 3);
    guarded("close", ncid);
}

void appendAndAbort(const std::string &file) {
    const int ncid = opened(file);
    log::append(ncid, 3);
    netcdf()("abort", ncid);
}

/// Makes the header longer. Without room for it, all data have to move.
void redefine(const std::string &file) {
    const int ncid = opened(file);
    netcdf()("redef", ncid);
    netcdf()("put_att_text", ncid, -1, "title", std::string(2000, 't'));
    netcdf()("enddef", ncid);
}

/// Closed while it is being defined: the guard ends the definitions first.
void redefineAndCloseGuarded(const std::string &file) {
    const Module guarded = netcdf().watchedBy(netcdfGuard());
    const int ncid = idOf(guarded("open", file, "WRITE"));
    guarded("redef", ncid);
    guarded("put_att_text", ncid, -1, "title", std::string(2000, 't'));
    guarded("close", ncid);
}

enum class Silent { none, look, last, all };

/// Newer libraries look at the file before they open or make it, and go on if they cannot.
constexpr std::size_t looks = libraryRelease < 41001 ? 0 : 1;

struct Row {
    const char *name;
    Act act;
    SystemCall call;
    std::vector<std::string> reportedBy; ///< the tags, in the order in which they come
    Silent silent = Silent::none;        ///< which failures the library passes over
    bool keeps = true;                   ///< what was synchronised is there afterwards
    std::size_t headerRoom = 0;          ///< reserved when the file was made
};

void PrintTo(const Row &row, std::ostream *out) {
    *out << row.name;
}

// clang-format off
const Row rows[] = {
    {"OpenOpen",      open,           SystemCall::open,  {"open"}, Silent::look},
    {"OpenStat",      open,           SystemCall::stat,  {"open"}, Silent::look},
    {"OpenSeek",      open,           SystemCall::seek,  {"open"}},
    {"OpenRead",      open,           SystemCall::read,  {"open"}},
    {"CreateOpen",    create,         SystemCall::open,  {"create"}, Silent::look},
    {"CreateStat",    create,         SystemCall::stat,  {"create"}},
    {"CreateSeek",    create,         SystemCall::seek,  {"create"}},
    {"CreateWrite",   create,         SystemCall::write, {"create"}},
    {"MakeSeek",      make,           SystemCall::seek,  {"create", "putVara", "sync"}},
    {"MakeRead",      make,           SystemCall::read,  {"putVara", "sync"}},
    {"MakeWrite",     make,           SystemCall::write, {"create", "pEndDef", "putVara", "sync"}},
    {"ReadSeek",      read,           SystemCall::seek,  {"open", "getVar"}},
    {"ReadRead",      read,           SystemCall::read,  {"open", "getVar"}},
    {"SyncSeek",      appendAndSync,  SystemCall::seek,  {"open", "putVara", "sync"}},
    {"SyncRead",      appendAndSync,  SystemCall::read,  {"open", "putVara", "sync"}},
    {"SyncWrite",     appendAndSync,  SystemCall::write, {"putVara", "sync"}},
    // The last buffer is written while the dataset is put away, when the library no longer listens.
    // Who wants to know synchronises first.
    {"CloseSeek",     appendAndClose, SystemCall::seek,  {"open", "putVara", "close"}, Silent::last},
    {"CloseWrite",    appendAndClose, SystemCall::write, {"putVara", "close"}, Silent::last},
    {"CloseRead",     appendAndClose, SystemCall::read,  {"open", "putVara", "close"}},
    {"CloseStat",     appendAndClose, SystemCall::stat,  {"open", "close"}, Silent::look},
    {"CloseClose",    appendAndClose, SystemCall::close, {}, Silent::all},
    {"GuardedSeek",   appendAndCloseGuarded, SystemCall::seek,  {"open", "putVara", "close"}},
    {"GuardedWrite",  appendAndCloseGuarded, SystemCall::write, {"putVara", "close"}},
    {"AbortSeek",     appendAndAbort, SystemCall::seek,  {"open", "putVara", "abort"}, Silent::last},
    {"AbortWrite",    appendAndAbort, SystemCall::write, {"putVara", "abort"}, Silent::last},
    {"AbortClose",    appendAndAbort, SystemCall::close, {}, Silent::all},
    // Data that are being moved are neither where they were nor where they will be.
    {"RedefineSeek",  redefine,       SystemCall::seek,  {"open", "endDef"}, Silent::none, false},
    {"RedefineRead",  redefine,       SystemCall::read,  {"open", "endDef"}, Silent::none, false},
    {"RedefineWrite", redefine,       SystemCall::write, {"endDef"}, Silent::none, false},
    // With room for the header, no data move.
    {"RoomySeek",     redefine,       SystemCall::seek,  {"open", "endDef"}, Silent::none, true, 4000},
    {"RoomyRead",     redefine,       SystemCall::read,  {"open"}, Silent::none, true, 4000},
    {"RoomyWrite",    redefine,       SystemCall::write, {"endDef"}, Silent::none, true, 4000},
    {"RoomyGuarded",  redefineAndCloseGuarded, SystemCall::write, {"close"}, Silent::none, true, 4000},
};
// clang-format on

struct Error {
    int number;
    const char *word;
};
// Of a quota that is used up only the message says it. Reads that a signal interrupts are another
// test's.
constexpr Error errors[] = {
    {EIO, "IOError"},
    {ENOSPC, "noSpaceLeftOnDevice"},
    {EROFS, "readOnlyFileSystem"},
    {EACCES, "permissionDenied"},
    {EINTR, "interruptedSystemCall"},
    {EDQUOT, "unknownErrorStatus"},
};

/// What an act raises while a fault is there. Everything is done in a child: open datasets with
/// faults are left behind.
struct Attempt {
    std::string raised;
    std::string fault; ///< in the records that were synchronised before
};

void makeLog(const std::string &file, std::size_t headerRoom = 0) {
    const int ncid = log::create(file, headerRoom);
    log::appendSynchronised(ncid, 0, 3);
    netcdf()("close", ncid);
}

Attempt attempt(const Row &row, std::size_t n, const Fault &fault) {
    const Folder folder;
    const std::string file = folder.file("log.nc");
    const std::string said = inChild([&] {
        makeLog(file, row.headerRoom);
        plant(row.call, n, fault);
        const std::string raised = raisedBy([&] { row.act(file); });
        const bool met = faultMet();
        noFault();
        return met ? raised : "the fault was not met";
    });
    return {said, log::faultIn(file, 3)};
}

/// How many calls of the kind the act makes.
std::size_t callsOf(Act act, SystemCall call, std::size_t headerRoom = 0) {
    const Folder folder;
    const std::string file = folder.file("log.nc");
    return std::stoul(inChild([&] {
        makeLog(file, headerRoom);
        noFault();
        act(file);
        return std::to_string(countOf(call));
    }));
}

/// The place of what was raised in the row's order of tags; their number for silence.
std::size_t placeOf(const std::string &raised, const Row &row, const char *word) {
    for (std::size_t i = 0; i < row.reportedBy.size(); ++i) {
        if (raised == "TESSEL:netcdf:" + row.reportedBy[i] + ":" + word) {
            return i;
        }
    }
    EXPECT_EQ(raised, "nothing") << "is not what the row says";
    return row.reportedBy.size();
}

class SystemCalls : public testing::TestWithParam<Row> {};

TEST_P(SystemCalls, FailInTurn) {
    const Row &row = GetParam();
    const std::size_t calls = callsOf(row.act, row.call, row.headerRoom);
    ASSERT_GT(calls, 0U) << "the act makes no call to " << nameOf(row.call);
    for (const Error &error : errors) {
        if (error.number == EINTR && row.call == SystemCall::read) {
            continue;
        }
        std::vector<bool> seen(row.reportedBy.size() + 1);
        std::size_t place = 0;
        for (std::size_t n = 1; n <= calls; ++n) {
            SCOPED_TRACE(std::string(nameOf(row.call)) + " " + std::to_string(n) + " of " +
                         std::to_string(calls) + " fails: " + error.word);
            const Attempt came = attempt(row, n, {error.number});
            const std::size_t now = placeOf(came.raised, row, error.word);
            const bool look = row.silent == Silent::look && n <= looks;
            const bool maySilent =
                look || row.silent == Silent::all || (row.silent == Silent::last && n == calls);
            EXPECT_EQ(now == row.reportedBy.size(), maySilent) << came.raised;
            if (!look) {
                EXPECT_GE(now, place) << came.raised << " after a later operation";
                place = now;
                seen[now] = true;
            }
            if (row.keeps) {
                EXPECT_EQ(came.fault, "");
            }
        }
        for (std::size_t i = 0; i < row.reportedBy.size(); ++i) {
            EXPECT_TRUE(seen[i]) << row.reportedBy[i] << " never reported " << error.word;
        }
    }
}

INSTANTIATE_TEST_SUITE_P(Rows, SystemCalls, testing::ValuesIn(rows),
                         [](const auto &row) { return row.param.name; });

/// Appends a record with each write moving half of its bytes, or one of them.
TEST(ShortWrites, AreGoneOnWith) {
    const std::size_t calls = callsOf(appendAndSync, SystemCall::write);
    for (std::size_t n = 1; n <= calls; ++n) {
        for (const bool all : {false, true}) {
            const Folder folder;
            const std::string file = folder.file("log.nc");
            EXPECT_EQ(inChild([&] {
                          makeLog(file);
                          plant(SystemCall::write, n, {0, true, all});
                          appendAndSync(file);
                          return std::string(faultMet() ? "met" : "not met");
                      }),
                      "met");
            EXPECT_EQ(log::faultIn(file, 4), "") << "write " << n << " of " << calls;
        }
    }
}

/// What a read of the whole log gives while a read of the system's has a fault.
std::string readWith(std::size_t n, const Fault &fault) {
    const Folder folder;
    const std::string file = folder.file("log.nc");
    return inChild([&] {
        makeLog(file);
        plant(SystemCall::read, n, fault);
        const std::string said = log::faultIn(file, 3);
        const bool met = faultMet();
        noFault();
        return !met ? "not met" : said.empty() ? "right" : said;
    });
}

TEST(Reads, ThatAreInterruptedAreMadeAgain) {
    for (std::size_t n = 1; n <= callsOf(read, SystemCall::read); ++n) {
        EXPECT_EQ(readWith(n, {EINTR}), "right") << "read " << n;
    }
}

/// The library takes a read that ends early for the end of the file, and shows what is in its
/// buffer: other values, and no error. Files on a disk are not read like that, but for their end.
/// If this test fails, the library has learnt it, and docs/reliability.md is to say so.
TEST(Reads, ThatEndEarlyGiveOtherValues) {
    std::size_t wrong = 0;
    const std::size_t calls = callsOf(read, SystemCall::read);
    for (std::size_t n = 1; n <= calls; ++n) { // the first is the header's
        const std::string said = readWith(n, {0, true});
        EXPECT_TRUE(said == "right" || said.starts_with("another value")) << said;
        wrong += said == "right" ? 0U : 1U;
    }
    EXPECT_GT(wrong, 0U);
}

/// A write that failed can be made again when the cause is gone.
TEST(Writes, ThatFailedCanBeMadeAgain) {
    const std::size_t calls = callsOf(appendAndSync, SystemCall::write);
    for (std::size_t n = 1; n <= calls; ++n) {
        const Folder folder;
        const std::string file = folder.file("log.nc");
        EXPECT_EQ(inChild([&] {
                      makeLog(file);
                      const int ncid = opened(file);
                      plant(SystemCall::write, n, {EIO, false, true});
                      const std::string raised = raisedBy([&] {
                          log::append(ncid, 3);
                          netcdf()("sync", ncid);
                      });
                      noFault();
                      log::append(ncid, 3);
                      netcdf()("sync", ncid);
                      netcdf()("close", ncid);
                      return raised == "nothing" ? raised : "raised";
                  }),
                  "raised");
        EXPECT_EQ(log::faultIn(file, 4), "") << "write " << n << " of " << calls;
    }
}

} // namespace
} // namespace tessel::test
