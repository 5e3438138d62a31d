// tests/faults/support.hpp: a folder, a log of records, and a child process in which something may
// end badly.
#pragma once

#include "support/process.hpp"
#include "tessel/runtime.hpp"

#include <cstddef>
#include <filesystem>
#include <functional>
#include <string>
#include <string_view>

namespace tessel::test {

const Module &netcdf();

/// The identifier of the error that a call raises; "nothing" if it raises none.
template <class Call>
std::string raisedBy(const Call &call) {
    try {
        call();
    } catch (const Error &error) {
        return error.identifier();
    }
    return "nothing";
}

/// The id of the dataset that a call opened or created.
int idOf(const Results &opened);

/// A dataset that grows by records. Each value is a function of where it stands, so that a reader
/// knows what must be there.
namespace log {

/// A record is longer than the library's buffer, and no multiple of it, so that parts of it are in
/// the file before it is synchronised.
constexpr std::size_t width = 2500;
constexpr std::size_t recordBytes = width * sizeof(double);

/// A new file with a log without records; its id, out of define mode. The header may be given room
/// to grow, in bytes.
int create(const std::string &file, std::size_t headerRoom = 0);

void append(int ncid, std::size_t record);

/// Appends records up to a number and synchronises, again and again.
void appendSynchronised(int ncid, std::size_t from, std::size_t to);

/// The number of records in an open log.
std::size_t recordsOf(int ncid);

/// What is wrong with the first records of a file, in words; "" if all is as it was written.
std::string faultIn(const std::string &file, std::size_t records);

} // namespace log

/// Runs something in a child process that has twenty seconds. What it says; or, where it does not
/// come to its end, how it ended: "ended by signal 11".
std::string inChild(const std::function<std::string()> &run);

} // namespace tessel::test
