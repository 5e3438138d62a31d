// tests/runtime/memory_test.cpp: where the memory comes from, and that it goes back.
#include "support.hpp"

#include <dlfcn.h>
#ifdef __SANITIZE_ADDRESS__
#include <sanitizer/lsan_interface.h>
#endif
#include <linux/seccomp.h>
#include <malloc.h>
#include <sys/prctl.h>
#include <sys/resource.h>
#include <sys/syscall.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <fstream>
#include <sstream>
#include <thread>

namespace tessel::test {
namespace {

constexpr std::size_t hugePage = std::size_t{2} << 20U;

/// Runs something in a child process; its exit status, or minus the signal that ended it.
template <class Run>
int inChild(const Run &run) {
    const pid_t child = fork();
    if (child == 0) {
        syscall(SYS_exit, run()); // the one way out that is allowed where nearly nothing is
    }
    int status = 0;
    waitpid(child, &status, 0);
    return WIFEXITED(status) ? WEXITSTATUS(status) : -WTERMSIG(status);
}

/// A line about the mapping that an address is in, "VmFlags:" for example; "" where there is none.
std::string mappingLine(const void *address, const char *which) {
    std::ifstream smaps("/proc/self/smaps");
    const auto wanted = reinterpret_cast<std::uintptr_t>(address);
    bool found = false;
    for (std::string line; std::getline(smaps, line);) {
        std::istringstream fields(line);
        std::uintptr_t start = 0;
        std::uintptr_t end = 0;
        char dash = 0;
        if (fields >> std::hex >> start >> dash >> end && dash == '-') {
            found = start <= wanted && wanted < end;
        } else if (found && line.starts_with(which)) {
            return line.substr(std::string_view(which).size()) + " ";
        }
    }
    return "";
}

std::string mappingFlags(const void *address) {
    return mappingLine(address, "VmFlags:");
}

TEST(Memory, LargeArraysAreForHugePages) {
    if (!std::filesystem::exists("/sys/kernel/mm/transparent_hugepage")) {
        GTEST_SKIP() << "the kernel has no transparent huge pages";
    }
    for (const bool mode : {false, true}) {
        setChecked(mode);
        const std::array<std::size_t, 1> large = {8 * hugePage / sizeof(double)};
        const Array array = Array::numeric(tsDOUBLE, large);
        const Array small = Array::scalar(1);
        setChecked(false);
        EXPECT_NE(mappingFlags(array.data()).find(" hg "), std::string::npos);
        EXPECT_EQ(mappingFlags(small.data()).find(" hg "), std::string::npos);
        // The huge pages begin where the block does, not up to one page later.
        EXPECT_LT(reinterpret_cast<std::uintptr_t>(array.data()) % hugePage, 4096U);
    }
}

/// An array of so many huge pages without their overhead, all of it written to.
Array writtenArray(std::size_t pages) {
    const std::array<std::size_t, 1> dims = {pages * hugePage - 4096};
    Array array = Array::numeric(tsUINT8, dims);
    std::memset(array.data(), 'x', array.size());
    return array;
}

TEST(Memory, LargeBlocksAreGivenBack) {
    const auto afterwards = [](std::size_t pages) {
        const void *const where = writtenArray(pages).data();
        return mappingFlags(where);
    };
    EXPECT_EQ(afterwards(129), "") << "more than what may wait";
    setChecked(true);
    EXPECT_EQ(afterwards(8), "") << "in checked mode";
    setChecked(false);
    if (!sanitized) {
        EXPECT_NE(afterwards(8), "") << "it waits for the next one";
    }
}

TEST(Memory, NoMoreThanTwoLargeBlocksWait) {
    if (sanitized) {
        GTEST_SKIP() << "none waits";
    }
    std::vector<const void *> where;
    {
        std::array arrays = {writtenArray(8), writtenArray(12), writtenArray(24)};
        for (Array &array : arrays) {
            where.push_back(array.data());
        }
        for (Array &array : arrays) {
            array = Array();
        }
    }
    EXPECT_EQ(mappingFlags(where[0]), "");
    EXPECT_NE(mappingFlags(where[1]), "");
    EXPECT_NE(mappingFlags(where[2]), "");
    EXPECT_EQ(writtenArray(10).data(), where[1]) << "the other one is much too large";
}

TEST(Memory, WhatWaitsIsTheKernelsToTake) {
    if (sanitized) {
        GTEST_SKIP() << "none waits";
    }
    const void *const where = writtenArray(8).data();
    EXPECT_GE(std::stoul(mappingLine(where, "LazyFree:")), 7 * hugePage / 1024);
}

TEST(Memory, WhatWaitedIsZeroWhereItHasToBe) {
    for (const std::size_t pages :
         std::array<std::size_t, 2>{7, 8}) { // smaller than the one that waits, and as large
        const void *const where = writtenArray(8).data();
        const Array zeros = Array::logical(std::array{pages * hugePage - 4096});
        if (!sanitized) { // where nothing waits, the same place is chance
            EXPECT_EQ(zeros.data(), where);
        }
        const auto all = zeros.elements<std::uint8_t>();
        EXPECT_EQ(std::count(all.begin(), all.end(), 0), static_cast<std::ptrdiff_t>(all.size()));
    }
}

TEST(Memory, NothingWaitsForLittle) {
    if (sanitized) {
        GTEST_SKIP() << "none waits";
    }
    const void *const where = writtenArray(16).data();
    EXPECT_NE(writtenArray(7).data(), where) << "most of it would be of no use";
}

TEST(Memory, SizesAroundTheThresholdAreWhole) {
    for (const bool mode : {false, true}) {
        setChecked(mode);
        for (std::size_t bytes = hugePage - 512; bytes <= hugePage + 512; bytes += 8) {
            const std::array<std::size_t, 1> dims = {bytes};
            const Array array = Array::logical(dims);
            const auto all = array.elements<std::uint8_t>();
            ASSERT_EQ(all.front(), 0);
            ASSERT_EQ(all.back(), 0);
            all.front() = 1;
            all.back() = 1;
        }
        setChecked(false);
    }
}

/// In a child that may read, write and exit, and is killed by every other system call.
TEST(Memory, SmallArraysCostNoSystemCall) {
    if (sanitized) {
        GTEST_SKIP() << "the sanitizer's allocator is not ours";
    }
    const Module good(testModule("good"));
    const Array scalars = Array::text("scalars");
    const Array count = Array::scalar(100);
    const Array text = Array::text("text");
    std::array<const tsArray *, 2> many = {scalars.get(), count.get()};
    std::array<const tsArray *, 2> one = {text.get(), text.get()};
    constexpr int cannotTell = 77;
    const auto work = [&] {
        for (int i = 0; i < 1000; ++i) {
            good.call(many);
        }
        for (int i = 0; i < 100'000; ++i) {
            if (good.call(one).size() != 1) {
                return 1;
            }
        }
        return 0;
    };
    const int ended = inChild([&] {
        if (work() != 0) { // so that the heap has its size
            return 1;
        }
        return prctl(PR_SET_SECCOMP, SECCOMP_MODE_STRICT) == 0 ? work() : cannotTell;
    });
    if (ended == cannotTell) {
        GTEST_SKIP() << "the kernel cannot forbid system calls";
    }
    EXPECT_EQ(ended, 0);

    // And that the test would notice: a large array does call the system.
    EXPECT_EQ(inChild([] {
                  prctl(PR_SET_SECCOMP, SECCOMP_MODE_STRICT);
                  Array::numeric(tsDOUBLE, std::array<std::size_t, 1>{hugePage});
                  return 0;
              }),
              -SIGKILL);
}

void limitAddresses() {
    std::size_t pages = 0;
    std::ifstream("/proc/self/statm") >> pages;
    const rlim_t limit = pages * static_cast<std::size_t>(sysconf(_SC_PAGESIZE)) + 32 * hugePage;
    const rlimit both = {limit, limit};
    setrlimit(RLIMIT_AS, &both);
}

TEST(Memory, ThatRunsOutIsAnError) {
    if (sanitized) {
        GTEST_SKIP() << "the sanitizer needs more addresses than there would be";
    }
    const Module good(testModule("good"));
    struct Row {
        const char *what;
        void (*run)(const Module &);
    };
    constexpr Row rows[] = {
        {"large",
         [](const Module &) {
             Array::numeric(tsDOUBLE, std::array<std::size_t, 1>{16 * hugePage});
         }},
        {"cells", [](const Module &) { Array::cell(std::array<std::size_t, 1>{16 * hugePage}); }},
        {"small, without end",
         [](const Module &) {
             std::vector<Array> kept(1'000'000);
             for (Array &array : kept) {
                 array = Array::scalar(1);
             }
         }},
        {"texts, without end",
         [](const Module &) {
             std::vector<Array> kept(100'000);
             for (Array &array : kept) {
                 array = Array::text(std::string(1000, 'x'));
             }
         }},
        {"large, by a module",
         [](const Module &module) { module("make", Array::row({0x1p27}), tsUINT8); }},
        {"cells, by a module",
         [](const Module &module) { module("make", Array::row({0x1p27}), tsCELL); }},
        {"small, by a module", [](const Module &module) { module("scalars", 1e9); }},
    };
    for (const Row &row : rows) {
        SCOPED_TRACE(row.what);
        EXPECT_EQ(inChild([&] {
                      limitAddresses();
                      for (int round = 0; round < 2; ++round) {
                          try {
                              row.run(good);
                              return 1;
                          } catch (const Error &error) {
                              if (error.identifier() != "TESSEL:host:outOfMemory") {
                                  return 2;
                              }
                          } catch (...) {
                              return 3;
                          }
                          if (good("add", 1, 2)[0].number() != 3) {
                              return 4;
                          }
                      }
                      return 0;
                  }),
                  0);
    }
}

TEST(Memory, WhatWaitsGoesWhenAddressesRunOut) {
    if (sanitized) {
        GTEST_SKIP() << "none waits";
    }
    struct Row {
        const char *what;
        void (*run)();
    };
    // More than the limit leaves, and less than that and what waits.
    constexpr Row rows[] = {
        {"a large one", [] { writtenArray(80); }},
        {"blocks of the heap",
         [] {
             std::vector<Array> kept(96);
             for (Array &array : kept) {
                 array = Array::logical(std::array<std::size_t, 1>{std::size_t{1} << 20U});
             }
         }},
        {"arrays",
         [] {
             std::vector<Array> kept(500'000);
             for (Array &array : kept) {
                 array = Array::scalar(1);
             }
         }},
    };
    for (const Row &row : rows) {
        SCOPED_TRACE(row.what);
        EXPECT_EQ(inChild([&] {
                      writtenArray(64);
                      limitAddresses();
                      try {
                          row.run();
                      } catch (const Error &) {
                          return 1;
                      }
                      return 0;
                  }),
                  0);
    }
}

TEST(Memory, NothingWaitsWhereThereIsALimit) {
    if (sanitized) {
        GTEST_SKIP() << "none waits";
    }
    for (const auto resource : {RLIMIT_AS, RLIMIT_DATA}) {
        EXPECT_EQ(inChild([&] {
                      const rlimit limit = {std::size_t{1} << 40U, std::size_t{1} << 40U};
                      setrlimit(resource, &limit);
                      const void *const where = writtenArray(8).data();
                      return mappingFlags(where).empty() ? 0 : 1;
                  }),
                  0);
    }
}

TEST(Memory, CheckedModeTakesNothingThatWaits) {
    if (sanitized) {
        GTEST_SKIP() << "none waits";
    }
    const void *const block = writtenArray(8).data();
    const void *const room = Array::scalar(1).get();
    setChecked(true);
    const Array large = writtenArray(8);
    const Array small = Array::scalar(1);
    setChecked(false);
    EXPECT_NE(large.data(), block);
    EXPECT_NE(small.get(), room);
}

/// Loads a library with a host of its own. The texts that this keeps for errors until the process
/// ends are nobody's once it is unloaded.
void *ownHost() {
#ifdef __SANITIZE_ADDRESS__
    const __lsan::ScopedDisabler kept;
#endif
    return dlopen(TESSEL_OWN_HOST, RTLD_NOW | RTLD_LOCAL);
}

TEST(Memory, WhatWaitsGoesWithTheHost) {
    void *const library = ownHost();
    ASSERT_NE(library, nullptr) << dlerror();
    const auto letGo = reinterpret_cast<const void *(*)()>(dlsym(library, "letGoOfLargeArray"));
    ASSERT_NE(letGo, nullptr);
    const void *const where = letGo();
    if (!sanitized) {
        EXPECT_NE(mappingFlags(where), "");
    }
    dlclose(library);
    EXPECT_EQ(mappingFlags(where), "");
    EXPECT_EQ(dlopen(TESSEL_OWN_HOST, RTLD_NOW | RTLD_NOLOAD), nullptr);
}

TEST(Memory, ThreadsThatOutliveTheHostKeepNothing) {
    static std::optional<bool> usedAnothersKey;
    void *const library = ownHost();
    ASSERT_NE(library, nullptr) << dlerror();
    const auto tellAfterwards =
        reinterpret_cast<void (*)(void (*)(bool))>(dlsym(library, "tellAfterwards"));
    ASSERT_NE(tellAfterwards, nullptr);
    tellAfterwards([](bool used) { usedAnothersKey = used; });
    dlclose(library);
    EXPECT_EQ(usedAnothersKey, false);
}

/// Nothing under the sanitizers, which look for what is left by themselves.
std::size_t heapInUse() {
    return mallinfo2().uordblks + mallinfo2().hblkhd;
}

TEST(Memory, ThreadsGiveBackTheRoomsOfTheirArrays) {
    const auto arrays = [] {
        std::array<Array, 20> held;
        std::generate(held.begin(), held.end(), [] { return Array::scalar(1); });
    };
    const auto threads = [&](int count) {
        for (int i = 0; i < count; ++i) {
            std::thread(arrays).join();
        }
    };
    threads(50);
    const std::size_t before = heapInUse();
    threads(500);
    EXPECT_LE(heapInUse(), before + 1024);
}

TEST(Memory, IsFlatOverManyCallsWithErrors) {
    const Module good(testModule("good"));
    const Module raising(testModule("raising"));
    const auto work = [&](int calls) {
        for (int i = 0; i < calls; i += 5) {
            good("one_of_each");
            for (const char *action : {"plain", "local", "bad_alloc"}) {
                EXPECT_NE(identifierOf([&] { raising(action); }), "none");
            }
            EXPECT_EQ(identifierOf([&] { good("outputs_then_raise"); }), "test:late");
        }
    };
    work(5000);
    const std::size_t before = heapInUse();
    work(100'000);
    EXPECT_LE(heapInUse(), before + 1024);
}

} // namespace
} // namespace tessel::test
