// tests/guard/fatal_test.cpp: each call that the library does not survive, in a process of its own
// without the guard, where it ends badly, and with the guard, where it is an error or succeeds.
#include "fatal_calls.hpp"

#include <sys/resource.h>
#include <sys/time.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <functional>

namespace tessel::test {
namespace {

constexpr int survivedCode = 100;
constexpr int raisedCode = 101;

class FatalCall : public testing::TestWithParam<Fatal> {};

std::string exitWith(int status) {
    return "exit with " + std::to_string(status);
}

/// How a process ends that makes calls: it is given two seconds, and little room on the disk.
std::string endOf(const std::function<void(const Folder &)> &calls) {
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
        const itimerval twoSeconds = {{}, {2, 0}}; // of the processor, whatever else it does
        setitimer(ITIMER_PROF, &twoSeconds, nullptr);
        const std::string identifier = identifierOf([&] { calls(folder); });
        _exit(identifier.empty() ? survivedCode : raisedCode);
    }
    int status = 0;
    waitpid(child, &status, 0);
    if (WIFSIGNALED(status)) {
        return strsignal(WTERMSIG(status));
    }
    return exitWith(WEXITSTATUS(status));
}

/// True where a sanitizer sees what overflows before it does harm, and ends the process with 1.
#ifdef __SANITIZE_ADDRESS__
constexpr bool sanitized = true;
#else
constexpr bool sanitized = false;
#endif

TEST_P(FatalCall, IsFatalWithoutTheGuard) {
    const auto call = [](const Folder &folder) { GetParam().call(plainModule(), folder); };
    const std::string end = endOf(call);
    if (libraryRelease >= GetParam().mended) {
        EXPECT_TRUE(end == exitWith(survivedCode) || end == exitWith(raisedCode)) << end;
        return;
    }
    const std::string expected = strsignal(GetParam().signal);
    EXPECT_TRUE(end == expected || (sanitized && end == exitWith(1))) << end;
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

/// A file in mapped memory that grows beyond what can be mapped, in any call that writes. How long
/// it would become is the library's to know. If this fails, docs/reliability.md is to say so.
TEST(NotFenced, MappedMemoryThatCannotGrow) {
    for (const Module &netcdf : {plainModule(), guardedModule()}) {
        EXPECT_EQ(endOf([&](const Folder &folder) {
                      const int ncid = intOf(netcdf("create", folder.file("a.nc"), 16 + 512));
                      const int x = intOf(netcdf("def_dim", ncid, "x", 3));
                      netcdf("def_var", ncid, "v", ncInt, x);
                      netcdf("_enddef", ncid, 1e15, 4, 0, 4);
                  }),
                  strsignal(SIGSEGV));
    }
}

TEST(NotFenced, Hdf5FileOnAFullDisk) {
    for (const Module &netcdf : {plainModule(), guardedModule()}) {
        EXPECT_EQ(endOf([&](const Folder &folder) {
                      const int ncid = intOf(netcdf("create", folder.file("a.nc"), 4096));
                      const int x = intOf(netcdf("def_dim", ncid, "x", 20000));
                      netcdf("def_var", ncid, "v", ncDouble, x);
                      netcdf("enddef", ncid);
                      const FullDisk full;
                      identifierOf([&] { netcdf("put_var1_double", ncid, 0, 19999, 1); });
                      netcdf("abort", ncid);
                  }),
                  strsignal(SIGSEGV));
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
