// tests/threads/fork.cpp: children that are forked while other threads are within calls can make
// calls themselves. Usage: threads_fork [FORKS]
//
// A child that cannot go on is ended by its alarm, and then the program fails.
#include "support/process.hpp"
#include "tessel/runtime.hpp"

#include <sys/wait.h>
#include <unistd.h>

#include <array>
#include <atomic>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

namespace {

using tessel::Array;
using tessel::Module;

constexpr std::size_t callers = 4;
constexpr std::size_t forkers = 2;
constexpr std::size_t elements = 1000;
constexpr unsigned patience = 30; // seconds

/// Makes a file and reads it back; false if it is not what was written.
bool writeAndRead(const Module &netcdf, const std::string &file, double value) {
    const std::array<std::size_t, 2> dims = {elements, 1};
    const Array data = Array::numeric(tsDOUBLE, dims);
    for (double &element : data.elements<double>()) {
        element = value;
    }
    const double made = netcdf("create", file, "CLOBBER")[0].number();
    netcdf("def_dim", made, "x", static_cast<double>(elements));
    netcdf("def_var", made, "v", netcdf("parameter", "DOUBLE")[0], 0);
    netcdf("enddef", made);
    netcdf("put_var_double", made, 0, data);
    netcdf("close", made);
    const double opened = netcdf("open", file, "NOWRITE")[0].number();
    const tessel::Results read = netcdf("get_var_double", opened, 0);
    netcdf("close", opened);
    return read[0].size() == elements && read[0].elements<double>().back() == value;
}

/// The end of a child: true if it did all that it was to do.
bool endedWell(pid_t child) {
    int status = 0;
    return waitpid(child, &status, 0) == child && WIFEXITED(status) && WEXITSTATUS(status) == 0;
}

/// Runs something in a child forked by this thread.
template <class Run>
bool inChild(const Run &run) {
    const pid_t child = fork();
    if (child == 0) {
        alarm(patience);
        bool good = false;
        try {
            good = run();
        } catch (const std::exception &error) {
            std::fprintf(stderr, "%s\n", error.what());
        }
        _exit(good ? 0 : 1);
    }
    return endedWell(child);
}

/// Threads that are always within calls, and threads that fork meanwhile.
std::size_t forkWhileOthersCall(const tessel::test::Folder &folder, std::size_t forks) {
    const Module netcdf{TESSEL_NETCDF_MODULE};
    std::atomic<bool> done = false;
    std::atomic<std::size_t> faults = 0;
    const auto fileOf = [&](const std::string &name) { return folder.file(name + ".nc"); };
    std::vector<std::thread> calling;
    for (std::size_t i = 0; i < callers; ++i) {
        calling.emplace_back([&, i] {
            while (!done) {
                faults += writeAndRead(netcdf, fileOf(std::to_string(i)), 1) ? 0 : 1;
            }
        });
    }
    std::vector<std::thread> forking;
    for (std::size_t i = 0; i < forkers; ++i) {
        forking.emplace_back([&, i] {
            for (std::size_t n = 0; n < forks / forkers; ++n) {
                const std::string file = fileOf("child-" + std::to_string(i));
                faults += inChild([&] { return writeAndRead(netcdf, file, 2); }) ? 0 : 1;
            }
        });
    }
    for (std::thread &thread : forking) {
        thread.join();
    }
    done = true;
    for (std::thread &thread : calling) {
        thread.join();
    }
    return faults;
}

/// Both the parent and the child come out of the call that forked, and make another one.
std::size_t forkWithinACall() {
    const Module forking{TESSEL_FORKING_MODULE};
    const Module counter{TESSEL_COUNTER_MODULE};
    const double child = forking("fork")[0].number();
    if (child == 0) {
        alarm(patience);
        _exit(counter("count")[0].number() == 1 ? 0 : 1);
    }
    const bool good = counter("count")[0].number() == 1;
    return endedWell(static_cast<pid_t>(child)) && good ? 0 : 1;
}

} // namespace

int main(int argc, char **argv) try {
    const std::size_t forks = argc > 1 ? std::stoul(argv[1]) : 100;
    const tessel::test::Folder folder;
    const std::size_t within = forkWithinACall();
    const std::size_t beside = forkWhileOthersCall(folder, forks);
    std::printf("%zu forks beside calls, %zu faults; 1 within a call, %zu faults\n", forks, beside,
                within);
    return within + beside == 0 ? EXIT_SUCCESS : EXIT_FAILURE;
} catch (const std::exception &error) {
    std::fprintf(stderr, "%s\n", error.what());
    return EXIT_FAILURE;
}
