// tests/faults/support.cpp: a folder, a log of records, and a child process.
#include "support.hpp"

#include <sys/wait.h>
#include <unistd.h>

#include <array>
#include <cstdlib>
#include <stdexcept>

namespace tessel::test {

const Module &netcdf() {
    static const Module module(TESSEL_NETCDF_MODULE);
    return module;
}

int idOf(const Results &opened) {
    return static_cast<int>(opened[opened.size() - 1].number());
}

namespace log {
namespace {

constexpr int variable = 0;
constexpr double ncDouble = 6;

double valueAt(std::size_t column, std::size_t record) {
    return static_cast<double>((1000 * column) + record + 1);
}

Array pair(std::size_t first, std::size_t second) {
    return Array::row({static_cast<double>(first), static_cast<double>(second)});
}

} // namespace

int create(const std::string &file, std::size_t headerRoom) {
    const int ncid = idOf(netcdf()("create", file, "CLOBBER"));
    const Results time = netcdf()("def_dim", ncid, "time", 0);
    const Results x = netcdf()("def_dim", ncid, "x", static_cast<double>(width));
    netcdf()("def_var", ncid, "log", ncDouble, Array::row({x[0].number(), time[0].number()}));
    constexpr int alignment = 4; // of the data, as the format wants it
    netcdf()("_enddef", ncid, static_cast<double>(headerRoom), alignment, 0, alignment);
    return ncid;
}

void append(int ncid, std::size_t record) {
    const std::array<std::size_t, 2> dims = {width, 1};
    const Array data = Array::numeric(tsDOUBLE, dims);
    for (std::size_t column = 0; column < width; ++column) {
        data.elements<double>()[column] = valueAt(column, record);
    }
    netcdf()("put_vara_double", ncid, variable, pair(0, record), pair(width, 1), data);
}

void appendSynchronised(int ncid, std::size_t from, std::size_t to) {
    for (std::size_t record = from; record < to; ++record) {
        append(ncid, record);
        netcdf()("sync", ncid);
    }
}

std::size_t recordsOf(int ncid) {
    return static_cast<std::size_t>(netcdf()("inq_dim", ncid, 0)[1].number());
}

std::string faultIn(const std::string &file, std::size_t records) {
    try {
        const int ncid = idOf(netcdf()("open", file, "NOWRITE"));
        const std::size_t there = recordsOf(ncid);
        std::string fault;
        if (there < records) {
            fault = std::to_string(there) + " records instead of " + std::to_string(records);
        }
        for (std::size_t record = 0; record < records && fault.empty(); ++record) {
            const Results read =
                netcdf()("get_vara_double", ncid, variable, pair(0, record), pair(width, 1));
            for (std::size_t column = 0; column < width; ++column) {
                if (read[0].elements<double>()[column] != valueAt(column, record)) {
                    fault = "another value in record " + std::to_string(record) + ", column " +
                            std::to_string(column);
                }
            }
        }
        netcdf()("close", ncid);
        return fault;
    } catch (const Error &error) {
        return error.identifier();
    }
}

} // namespace log

std::string inChild(const std::function<std::string()> &run) {
    std::array<int, 2> ends{};
    if (pipe(ends.data()) != 0) {
        throw std::runtime_error("no pipe");
    }
    const pid_t child = fork();
    if (child < 0) {
        throw std::runtime_error("no child");
    }
    if (child == 0) {
        alarm(20);
        std::string said;
        try {
            said = run();
        } catch (const std::exception &error) {
            said = std::string("unexpected: ") + error.what();
        }
        const bool all = write(ends[1], said.data(), said.size()) == std::ssize(said);
        _exit(all ? 0 : 1); // the child's copies of what the parent has are not to be put away
    }
    close(ends[1]);
    std::string said;
    std::array<char, 4096> piece{};
    for (ssize_t n = 0; (n = read(ends[0], piece.data(), piece.size())) > 0;) {
        said.append(piece.data(), static_cast<std::size_t>(n));
    }
    close(ends[0]);
    int status = 0;
    waitpid(child, &status, 0);
    if (WIFSIGNALED(status)) {
        return said + "ended by signal " + std::to_string(WTERMSIG(status));
    }
    return WEXITSTATUS(status) == 0
               ? said
               : said + "ended with status " + std::to_string(WEXITSTATUS(status));
}

} // namespace tessel::test
