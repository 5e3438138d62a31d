// tests/threads/loading.cpp: modules that come and go, and two at once.
// Usage: threads_loading [TIMES [small]]
//
// The netCDF module is loaded and unloaded by threads that end afterwards, which is when functions
// run that the library has left behind. Memory and descriptors must not grow with the number of
// times.
#include "support/process.hpp"
#include "tessel/runtime.hpp"

#include <unistd.h>

#include <array>
#include <atomic>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <stdexcept>
#include <string>
#include <string_view>
#include <thread>
#include <vector>

namespace {

using tessel::Module;
using tessel::test::openDescriptors;
using tessel::test::residentMegabytes;

/// True where a sanitizer remembers what was allocated, which is memory too.
#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
constexpr bool sanitized = true;
#else
constexpr bool sanitized = false;
#endif

void want(bool holds, const char *what) {
    if (!holds) {
        throw std::runtime_error(what);
    }
}

/// A new dataset with one dimension of the given length; open.
double create(const Module &netcdf, const std::string &file, double length) {
    const double ncid = netcdf("create", file, "CLOBBER")[0].number();
    netcdf("def_dim", ncid, "x", length);
    netcdf("enddef", ncid);
    return ncid;
}

double lengthIn(const Module &netcdf, double ncid) {
    return netcdf("inq_dim", ncid, 0)[1].number();
}

void loadUseAndUnload(const std::string &file) {
    const Module netcdf{TESSEL_NETCDF_MODULE};
    const double ncid = create(netcdf, file, 7);
    want(lengthIn(netcdf, ncid) == 7, "another length");
    netcdf("close", ncid);
}

/// A module that leaves nothing behind, and so leaves the process: each time it counts from 1 on.
void loadUseAndUnloadSmall(const std::string &file) {
    if (!std::filesystem::exists(file)) {
        std::filesystem::copy_file(TESSEL_COUNTER_MODULE, file);
    }
    const Module small{std::filesystem::path(file)};
    want(small("count")[0].number() == 1, "it was not loaded anew");
    want(small("count")[0].number() == 2, "a call was lost");
}

/// What is loaded, and how much memory that may take: once, and each time, where it would be a
/// leak.
struct Kind {
    void (*loadUseAndUnload)(const std::string &file);
    double keptMegabytes; // what the heaps of other threads keep
    double leakMegabytes;
};
constexpr Kind netcdfModule = {loadUseAndUnload, 8, 0.01};
constexpr Kind smallModule = {loadUseAndUnloadSmall, 1, 0.0001};

/// Loads and unloads, in one thread and then in several, while others call another module.
void comeAndGo(const std::filesystem::path &folder, std::size_t times, const Kind &kind) {
    for (std::size_t i = 0; i < 20; ++i) { // what is allocated once is there afterwards
        kind.loadUseAndUnload(folder / "warm");
    }
    const std::size_t descriptors = openDescriptors();
    const double before = residentMegabytes();
    const Module counter{TESSEL_COUNTER_MODULE};
    std::atomic<bool> done = false;
    std::atomic<std::size_t> counted = 0;
    std::atomic<std::size_t> faults = 0;
    std::thread calling([&] {
        while (!done) {
            counter("count");
            ++counted;
        }
    });
    std::vector<std::thread> loading;
    for (std::size_t thread = 0; thread < 2; ++thread) {
        loading.emplace_back([&, thread] {
            try {
                for (std::size_t i = 0; i < times / 2; ++i) {
                    kind.loadUseAndUnload(folder / std::to_string(thread));
                }
            } catch (const std::exception &error) {
                std::fprintf(stderr, "%s\n", error.what());
                ++faults;
            }
        });
    }
    for (std::thread &thread : loading) {
        thread.join();
    }
    done = true;
    calling.join();
    const double grown = residentMegabytes() - before;
    std::printf("loaded and unloaded %zu times beside %zu calls of another module: %.1f MB more\n",
                times, counted.load(), grown);
    want(faults == 0, "a thread has met a fault");
    want(counted > 0, "the other module was never called");
    want(counter("count")[0].number() == static_cast<double>(counted + 1), "a call was lost");
    want(openDescriptors() == descriptors, "descriptors are open that were not");
    want(sanitized || grown < kind.keptMegabytes + kind.leakMegabytes * static_cast<double>(times),
         "memory grows with each loading");
}

/// Two files with the same module are two modules over one library: an id belongs to the process,
/// and either may close what the other has opened.
void twoAtOnce(const std::filesystem::path &folder) {
    const std::filesystem::path copy = folder / "copy.tsx";
    std::filesystem::copy_file(TESSEL_NETCDF_MODULE, copy);
    auto second = std::make_unique<const Module>(copy);
    const Module first{TESSEL_NETCDF_MODULE};
    std::atomic<std::size_t> faults = 0;
    const auto work = [&](const Module &one, const Module &other, const std::string &file,
                          double length) {
        for (std::size_t i = 0; i < 200; ++i) {
            const double ncid = create(one, file, length);
            faults += lengthIn(other, ncid) == length ? 0 : 1;
            other("close", ncid);
        }
    };
    std::thread ahead([&] { work(first, *second, folder / "ahead.nc", 3); });
    std::thread back([&] { work(*second, first, folder / "back.nc", 5); });
    ahead.join();
    back.join();
    want(faults == 0, "a module does not see the other's dataset");
    const double ncid = create(*second, folder / "left.nc", 4);
    second.reset();
    want(lengthIn(first, ncid) == 4, "a dataset went with the module that had opened it");
    first("close", ncid);
    std::printf("two modules at once: 400 datasets of one closed by the other\n");
}

} // namespace

int main(int argc, char **argv) try {
    const std::size_t times = argc > 1 ? std::stoul(argv[1]) : 200;
    const tessel::test::Folder folder;
    if (argc > 2 && std::string_view(argv[2]) == "small") {
        comeAndGo(folder.folder(), times, smallModule);
        return EXIT_SUCCESS;
    }
    comeAndGo(folder.folder(), times, netcdfModule);
    twoAtOnce(folder.folder());
    return EXIT_SUCCESS;
} catch (const std::exception &error) {
    std::fprintf(stderr, "%s\n", error.what());
    return EXIT_FAILURE;
}
