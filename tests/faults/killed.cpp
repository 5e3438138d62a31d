// tests/faults/killed.cpp: a writer is killed at random moments, and nothing is lost that it had
// synchronised. Usage: faults_killed [--kills N] [--seed S] [--early 1]
//
// A child appends records to a log and synchronises, and says through a pipe how many records are
// synchronised. It is killed while it does so. Then the file is opened and every record that the
// child had said to be synchronised must be there with its values. What the file has beyond them is
// counted: records that were being written when the end came, which are promised to nobody.
//
// With --early 1 the writer speaks of a record before it is synchronised. That must be noticed.
#include "support.hpp"

#include <sys/wait.h>
#include <unistd.h>

#include <array>
#include <chrono>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <random>
#include <stdexcept>
#include <string_view>
#include <thread>

namespace tessel::test {
namespace {

struct Options {
    std::size_t kills = 20;
    unsigned seed = 1;
    bool early = false;
};

Options optionsOf(int argc, char **argv) {
    Options options;
    for (int i = 1; i + 1 < argc; i += 2) {
        const std::string_view name = argv[i];
        const unsigned long value = std::stoul(argv[i + 1]);
        if (name == "--kills") {
            options.kills = value;
        } else if (name == "--seed") {
            options.seed = static_cast<unsigned>(value);
        } else if (name == "--early") {
            options.early = value != 0;
        } else {
            throw std::invalid_argument("unknown option " + std::string(name));
        }
    }
    return options;
}

/// How a writer came to its end.
struct Killed {
    std::size_t synchronised = 0; ///< records that it had reported
    bool byUs = false;            ///< it was killed, and did not end by itself
};

/// Appends for ever. Every third synchronisation comes after several records.
[[noreturn]] void writeForEver(const std::string &file, int report, bool early) {
    try {
        const int ncid = log::create(file);
        netcdf()("sync", ncid);
        for (std::size_t record = 0;; ++record) {
            log::append(ncid, record);
            if (record % 3 == 1) {
                continue;
            }
            const std::size_t synchronised = record + 1;
            if (!early) {
                netcdf()("sync", ncid);
            }
            if (write(report, &synchronised, sizeof synchronised) != sizeof synchronised) {
                _exit(2);
            }
            if (early) {
                netcdf()("sync", ncid);
            }
        }
    } catch (const std::exception &error) {
        std::fprintf(stderr, "%s\n", error.what());
        _exit(1);
    }
}

/// Starts a writer and kills it some time after its first report.
Killed kill(const std::string &file, std::chrono::microseconds after, bool early) {
    std::array<int, 2> ends{};
    if (pipe(ends.data()) != 0) {
        throw std::runtime_error("no pipe");
    }
    const pid_t child = fork();
    if (child == 0) {
        close(ends[0]);
        writeForEver(file, ends[1], early);
    }
    close(ends[1]);
    Killed killed;
    const auto report = [&] {
        return read(ends[0], &killed.synchronised, sizeof killed.synchronised) ==
               sizeof killed.synchronised;
    };
    if (report()) {
        std::this_thread::sleep_for(after);
        ::kill(child, SIGKILL);
        while (report()) {
        }
    }
    close(ends[0]);
    int status = 0;
    waitpid(child, &status, 0);
    killed.byUs = WIFSIGNALED(status) && WTERMSIG(status) == SIGKILL;
    return killed;
}

/// Records that the file has beyond those that were reported, and whether they are complete.
struct Beyond {
    std::size_t there = 0;
    bool complete = true;
};

Beyond beyond(const std::string &file, std::size_t synchronised) {
    const int ncid = idOf(netcdf()("open", file, "NOWRITE"));
    const std::size_t all = log::recordsOf(ncid);
    netcdf()("close", ncid);
    return {all - synchronised, log::faultIn(file, all).empty()};
}

int run(const Options &options) {
    netcdf(); // loaded once, and not by every child
    std::mt19937 lot(options.seed);
    std::uniform_int_distribution<int> microseconds(0, 5000);
    std::size_t records = 0;
    std::size_t more = 0;
    std::size_t incomplete = 0;
    std::size_t faults = 0;
    for (std::size_t n = 0; n < options.kills; ++n) {
        const Folder folder;
        const std::string file = folder.file("log.nc");
        const auto after = std::chrono::microseconds(microseconds(lot));
        const Killed killed = kill(file, after, options.early);
        if (!killed.byUs || killed.synchronised == 0) {
            std::printf("kill %zu: the writer ended by itself\n", n);
            ++faults;
            continue;
        }
        const std::string fault = log::faultIn(file, killed.synchronised);
        if (!fault.empty()) {
            std::printf("kill %zu, %zu records synchronised: %s\n", n, killed.synchronised,
                        fault.c_str());
            ++faults;
            continue;
        }
        records += killed.synchronised;
        const Beyond extra = beyond(file, killed.synchronised);
        more += extra.there > 0 ? 1 : 0;
        incomplete += extra.complete ? 0 : 1;
    }
    std::printf("%zu writers killed, %zu synchronised records, %zu files with a fault\n"
                "%zu files have records beyond, in %zu of them one is not complete\n",
                options.kills, records, faults, more, incomplete);
    return faults == 0 ? EXIT_SUCCESS : EXIT_FAILURE;
}

} // namespace
} // namespace tessel::test

int main(int argc, char **argv) try {
    return tessel::test::run(tessel::test::optionsOf(argc, argv));
} catch (const std::exception &error) {
    std::fprintf(stderr, "%s\n", error.what());
    return EXIT_FAILURE;
}
