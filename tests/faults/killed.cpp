// tests/faults/killed.cpp: a writer is killed at random moments, and nothing is lost that it had
// synchronised. Usage: faults_killed [--kills N] [--seed S] [--writer NAME]
//
// A child writes to a log and says through a pipe how many records are synchronised. It is killed
// while it does so. Then the file is opened, and every record that the child had said to be
// synchronised must be there with its values. What the file has beyond them is counted: records
// that were being written when the end came, which are promised to nobody. The writers:
//
//   append    appends records and synchronises
//   early     speaks of a record before it is synchronised, which must be noticed
//   redefine  changes the length of the header of a log all the time, so that its data move; that
//             loses records, which must be noticed too
//   roomy     does the same with a header that was given room to grow, which loses nothing
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

/// Where a writer says how many records are synchronised.
class Report {
  public:
    explicit Report(int pipeEnd) : end(pipeEnd) {}

    void operator()(std::size_t synchronised) const {
        if (write(end, &synchronised, sizeof synchronised) != sizeof synchronised) {
            throw std::runtime_error("nobody listens");
        }
    }

  private:
    int end;
};

/// Synchronises after two records, after one, after two, and so on.
void append(const std::string &file, const Report &report) {
    const int ncid = log::create(file);
    netcdf()("sync", ncid);
    for (std::size_t record = 0;; ++record) {
        log::append(ncid, record);
        if (record % 3 != 1) {
            netcdf()("sync", ncid);
            report(record + 1);
        }
    }
}

void early(const std::string &file, const Report &report) {
    const int ncid = log::create(file);
    netcdf()("sync", ncid);
    for (std::size_t record = 0;; ++record) {
        log::append(ncid, record);
        report(record + 1);
        netcdf()("sync", ncid);
    }
}

void redefineFor(const std::string &file, const Report &report, std::size_t headerRoom) {
    constexpr std::size_t records = 3;
    const int ncid = log::create(file, headerRoom);
    log::appendSynchronised(ncid, 0, records);
    for (std::size_t length = 500;; length += 10) {
        report(records);
        netcdf()("redef", ncid);
        netcdf()("put_att_text", ncid, -1, "title", std::string(length % 3000, 't'));
        netcdf()("enddef", ncid);
        netcdf()("sync", ncid);
    }
}

void redefine(const std::string &file, const Report &report) {
    redefineFor(file, report, 0);
}

void roomy(const std::string &file, const Report &report) {
    redefineFor(file, report, 4000);
}

struct Writer {
    std::string_view name;
    void (*write)(const std::string &file, const Report &report);
};
constexpr Writer writers[] = {
    {"append", append}, {"early", early}, {"redefine", redefine}, {"roomy", roomy}};

struct Options {
    std::size_t kills = 20;
    unsigned seed = 1;
    Writer writer = writers[0];
};

Writer writerOf(std::string_view name) {
    for (const Writer &writer : writers) {
        if (writer.name == name) {
            return writer;
        }
    }
    throw std::invalid_argument("unknown writer " + std::string(name));
}

Options optionsOf(int argc, char **argv) {
    Options options;
    for (int i = 1; i < argc; i += 2) {
        const std::string_view name = argv[i];
        if (i + 1 == argc) {
            throw std::invalid_argument(std::string(name).append(" is given no value"));
        }
        const char *const value = argv[i + 1];
        if (name == "--kills") {
            options.kills = std::stoul(value);
        } else if (name == "--seed") {
            options.seed = static_cast<unsigned>(std::stoul(value));
        } else if (name == "--writer") {
            options.writer = writerOf(value);
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

/// Starts a writer and kills it some time after its first report.
Killed kill(const Writer &writer, const std::string &file, std::chrono::microseconds after) {
    std::array<int, 2> ends{};
    if (pipe(ends.data()) != 0) {
        throw std::runtime_error("no pipe");
    }
    const pid_t child = fork();
    if (child == 0) {
        close(ends[0]);
        try {
            writer.write(file, Report(ends[1]));
        } catch (const std::exception &error) {
            std::fprintf(stderr, "%s\n", error.what());
        }
        _exit(1); // it was to go on until it is killed
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
        const Killed killed = kill(options.writer, file, after);
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
