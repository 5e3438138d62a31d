// tests/guard/fatal_test.cpp: calls that the library does not survive, a row each: in a process of
// its own without the guard, where it ends badly, and with the guard, where it is refused.
#include "support.hpp"

#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <cstdio>
#include <cstring>
#include <functional>
#include <ostream>

namespace tessel::test {
namespace {

using namespace std::string_literals;

constexpr double wraps = -1; // as a count: 2^64-1

struct Fatal {
    const char *name;
    int signal;             // that ends the process without the guard
    const char *identifier; // of the guard's error
    const char *why;        // what the message says
    std::function<void(const Module &netcdf, const Folder &folder)> call;
};

void PrintTo(const Fatal &fatal, std::ostream *out) {
    *out << fatal.name;
}

/// A variable of another variable's length whose fill value has two values instead of one: the
/// dataset cannot leave define mode, and not be closed.
int unclosable(const Module &netcdf, const Folder &folder) {
    const int ncid = intOf(netcdf("create", folder.file("a.nc"), 0));
    const int x = intOf(netcdf("def_dim", ncid, "x", 3));
    netcdf("def_var", ncid, "v", ncInt, x);
    netcdf("put_att_double", ncid, 0, "_FillValue", ncInt, Array::row({1, 2}));
    EXPECT_EQ(identifierOf([&] { netcdf("close", ncid); }), "TESSEL:netcdf:close:invalidDataType");
    return ncid;
}

void writeStrided(const Module &netcdf, const Folder &folder, const char *operation, int varid,
                  const Array &start, const Array &count, const Array &stride) {
    const int ncid = newDataset(netcdf, folder.file("a.nc"));
    netcdf("set_fill", ncid, noFill);
    const Array one = Array::scalar(1);
    if (stride) {
        netcdf(operation, ncid, varid, start, count, stride, one);
    } else {
        netcdf(operation, ncid, varid, start, count, one);
    }
}

int open(const Module &netcdf, const Folder &folder, const std::string &bytes) {
    return intOf(netcdf("open", written(folder, "a.nc", bytes), "NOWRITE"));
}

std::string variableOfType(std::uint32_t type) {
    return "CDF\1" + words({0, 10, 1, 1}) + "x\0\0\0"s + words({4, 0, 0, 11, 1, 1}) + "v\0\0\0"s +
           words({1, 0, 0, 0, type, 4, 100}) + std::string(16, '\0');
}

/// In define mode, with a variable.
int definingDataset(const Module &netcdf, const Folder &folder) {
    const int ncid = newDataset(netcdf, folder.file("a.nc"));
    netcdf("redef", ncid);
    return ncid;
}

const Fatal rows[] = {
    {"AlignmentOfTheData", SIGFPE, "TESSEL:guard:alignment",
     "an alignment is 0, and the library divides",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("_enddef", definingDataset(netcdf, folder), 0, 0, 0, 4);
     }},
    {"AlignmentOfTheRecords", SIGFPE, "TESSEL:guard:alignment", "an alignment is 0",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("nc__enddef", definingDataset(netcdf, folder), 0, 4, 0, 0.5);
     }},
    {"CreateWithAUserFormat", SIGSEGV, "TESSEL:guard:mode",
     "the flag 64 (a user-defined format) is set",
     [](const Module &netcdf, const Folder &folder) { netcdf("create", folder.file("a.nc"), 64); }},
    {"CreateWithTheOtherUserFormat", SIGSEGV, "TESSEL:guard:mode", "the flag 128",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("NC_CREATE", folder.file("a.nc"), 128 + 1);
     }},
    {"TunedCreateWithAUserFormat", SIGSEGV, "TESSEL:guard:mode", "the flag 64",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("_create", folder.file("a.nc"), 64, 1024, 1024);
     }},
    {"OpenInMemory", SIGSEGV, "TESSEL:guard:mode", "the flag 32768 (NC_INMEMORY) is set",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("open", folder.file("a.nc"), 32768);
     }},
    {"TunedOpenInMemory", SIGSEGV, "TESSEL:guard:mode", "the flag 32768",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("nc__open", folder.file("a.nc"), 32768 + 1, 1024);
     }},
    {"CreateInMoreMemoryThanThereIs", SIGSEGV, "TESSEL:guard:mode",
     "the flag 16 (NC_MMAP) is set, and there is no memory for 1000000000000000 bytes",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("_create", folder.file("a.nc"), 16, 1e15, 4096);
     }},
    {"OpenOfATypeWithoutSize", SIGFPE, "TESSEL:guard:header", "has a variable of the type 12",
     [](const Module &netcdf, const Folder &folder) { open(netcdf, folder, variableOfType(12)); }},
    {"NameOf300Letters", SIGSEGV, "TESSEL:guard:header", "has a name of 300 characters",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("inq_dim",
                open(netcdf, folder,
                     "CDF\1" + words({0, 10, 1, 300}) + std::string(300, 'n') +
                         words({1, 0, 0, 0, 0})),
                0);
     }},
    {"VariableOfTooManyDimensions", SIGSEGV, "TESSEL:guard:header", "a variable of 3000 dimensions",
     [](const Module &netcdf, const Folder &folder) {
         // A few too many may go unnoticed.
         std::string ids;
         for (int i = 0; i < 3000; ++i) {
             ids += words({0});
         }
         netcdf("inq_var",
                open(netcdf, folder,
                     "CDF\1" + words({0, 10, 1, 1}) + "x\0\0\0"s + words({1, 0, 0, 11, 1, 1}) +
                         "v\0\0\0"s + words({3000}) + ids + words({0, 0, 4, 4, 20000}) +
                         std::string(16, '\0')),
                0);
     }},
    {"NameWhoseLengthTheFileEndsIn", SIGSEGV, "TESSEL:guard:header", "characters in a name",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("inq_dim", open(netcdf, folder, "CDF\5" + words({0, 0, 10, 0, 1, 0}) + "\0\0\x02"s),
                0);
     }},
    {"CloseAfterACloseThatFailed", SIGSEGV, "TESSEL:guard:closed", "a.nc\"",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("close", unclosable(netcdf, folder));
     }},
    {"AbortAfterACloseThatFailed", SIGSEGV, "TESSEL:guard:closed", "a.nc\"",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("abort", unclosable(netcdf, folder));
     }},
    {"CloseAgainAfterAChangeOnAFullDisk", SIGSEGV, "TESSEL:netcdf:close:fileTooLarge",
     "Unable to close netCDF file, library error message \"File too large\"",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = intOf(netcdf("create", folder.file("a.nc"), 0));
         const int x = intOf(netcdf("def_dim", ncid, "x", 20000));
         netcdf("def_var", ncid, "v", ncDouble, x);
         netcdf("set_fill", ncid, noFill);
         netcdf("enddef", ncid);
         netcdf("rename_var", ncid, 0, "w");
         netcdf("put_var1_double", ncid, 0, 19999, 1);
         const FullDisk full;
         EXPECT_EQ(identifierOf([&] { netcdf("close", ncid); }),
                   "TESSEL:netcdf:close:fileTooLarge");
         netcdf("close", ncid);
     }},
    {"SynchronisingAHeaderThatWasOverwritten", SIGFPE, "TESSEL:guard:header",
     "has a variable of the type 12",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = open(netcdf, folder, variableOfType(4));
         written(folder, "a.nc", variableOfType(12));
         netcdf("sync", ncid);
     }},
    {"CountsThatWrapInRecords", SIGALRM, "TESSEL:guard:counts",
     "multiply to more than 64 bits hold",
     [](const Module &netcdf, const Folder &folder) {
         writeStrided(netcdf, folder, "put_vars_double", 1, Array::row({1, 0}),
                      Array::row({wraps, wraps}), Array::row({2, 1}));
     }},
    {"CountsThatWrapInABlock", SIGXFSZ, "TESSEL:guard:counts", "or for ever",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         netcdf("put_vara_double", ncid, 1, Array::row({0, 0}), Array::row({2, 0x1p63 + 2048}),
                Array::numeric(tsDOUBLE, std::array<std::size_t, 2>{2, 2048}));
     }},
    {"AnElementFarBeyondTheRecords", SIGXFSZ, "TESSEL:guard:records",
     "ends at record 4000000000, and 4000000000 records of 80 bytes",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         netcdf("put_var1_double", ncid, 1, Array::row({0, 4e9}), 1);
     }},
    {"ABlockFarBeyondTheRecords", SIGXFSZ, "TESSEL:guard:records", "NC_NOFILL",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         netcdf("put_vara_double", ncid, 1, Array::row({0, 4e9}), Array::row({1, 1}), 1);
     }},
    {"AStepFarBeyondTheRecords", SIGXFSZ, "TESSEL:guard:records", "ends at record 2000000000",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         netcdf("put_vars_double", ncid, 1, Array::row({0, 0}), Array::row({1, 2}),
                Array::row({1, 2e9}), Array::row({1, 2}));
     }},
};

constexpr int survivedCode = 100;
constexpr int raisedCode = 101;

class FatalCall : public testing::TestWithParam<Fatal> {};

/// How a process ends that makes the call without the guard: it is given two seconds, and little
/// room on the disk.
std::string endWithoutGuard(const Fatal &fatal) {
    const Folder folder;
    const pid_t child = fork();
    if (child == 0) {
        std::freopen("/dev/null", "w", stderr);
        for (const int signal : {SIGSEGV, SIGBUS, SIGFPE, SIGABRT}) {
            std::signal(signal, SIG_DFL); // a sanitizer would exit
        }
        const rlimit room = {std::size_t{64} << 20U, std::size_t{64} << 20U};
        const rlimit none = {0, 0};
        setrlimit(RLIMIT_FSIZE, &room);
        setrlimit(RLIMIT_CORE, &none);
        alarm(2);
        const std::string identifier = identifierOf([&] { fatal.call(plainModule(), folder); });
        _exit(identifier.empty() ? survivedCode : raisedCode);
    }
    int status = 0;
    waitpid(child, &status, 0);
    if (WIFSIGNALED(status)) {
        return strsignal(WTERMSIG(status));
    }
    return "exit with " + std::to_string(WEXITSTATUS(status));
}

/// True where a sanitizer sees what overflows before it does harm, and ends the process with 1.
#ifdef __SANITIZE_ADDRESS__
constexpr bool sanitized = true;
#else
constexpr bool sanitized = false;
#endif

TEST_P(FatalCall, IsFatalWithoutTheGuard) {
    const std::string end = endWithoutGuard(GetParam());
    const std::string expected = strsignal(GetParam().signal);
    EXPECT_TRUE(end == expected || (sanitized && end == "exit with 1")) << end;
}

TEST_P(FatalCall, IsRefusedByTheGuard) {
    const Folder folder;
    const Module netcdf = guardedModule();
    try {
        GetParam().call(netcdf, folder);
        ADD_FAILURE() << "it was not refused";
    } catch (const Error &error) {
        EXPECT_EQ(error.identifier(), GetParam().identifier);
        EXPECT_NE(error.message().find(GetParam().why), std::string::npos) << error.message();
    }
    EXPECT_GT(netcdf("inq_libvers")[0].size(), 0U) << "the next call works";
}

INSTANTIATE_TEST_SUITE_P(Rows, FatalCall, testing::ValuesIn(rows),
                         [](const auto &row) { return row.param.name; });

} // namespace
} // namespace tessel::test
