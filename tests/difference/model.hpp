// tests/difference/model.hpp: what the module says about arguments before it reaches the library.
//
// Written from what the operations promise, and from nothing of the module's own code.
#pragma once

#include "operations.hpp"
#include "program.hpp"

#include <netcdf.h>

#include <cstddef>
#include <string>
#include <vector>

namespace difference {

/// Thrown where the module raises an error: for a bad argument, or with the status of the library.
struct Refusal {
    std::string identifier;
    int status = NC_NOERR;
    std::string text = {}; ///< what the message has in it, besides the library's text
};

/// The word for a status of the library.
std::string wordOf(int status);

// One argument each; `label` is the library's name of the parameter.
int readID(const Value &value, const std::string &label);
std::string readName(const Value &value, const std::string &label);
int readMode(const Value &value);
nc_type readType(const Value &value);
std::size_t readSize(const Value &value, const std::string &label);
int readInt(const Value &value, const std::string &label);
std::vector<int> readDimids(const Value &value);
std::vector<std::size_t> readPositions(const Value &value, const std::string &label);
std::vector<std::ptrdiff_t> readStrides(const Value &value);

/// Looks at the data of a write.
void wantData(const Value &value, const Operation &operation);

/// The number of elements of a block; Refusal when the host has no array of so many of a class.
std::size_t wantRoom(const std::vector<std::size_t> &lengths, std::size_t elementSize);

} // namespace difference
