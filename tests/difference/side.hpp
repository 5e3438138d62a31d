// tests/difference/side.hpp: what a call comes to, on either side.
#pragma once

#include "program.hpp"

#include <filesystem>
#include <functional>
#include <string>
#include <vector>

namespace difference {

/// An array that a call gives back, as its bytes.
struct Result {
    tsClassID classID = tsDOUBLE;
    std::vector<std::size_t> dims;
    std::vector<unsigned char> bytes;
    std::vector<Result> cells; ///< of a cell array, which has no bytes

    bool operator==(const Result &) const = default;
};

struct Outcome {
    std::string identifier; ///< of the error; empty for a call that succeeded
    std::string message;    ///< the module's words, or text that must be among them
    int status = 0;         ///< the library's; known only where it is called directly
    std::vector<Result> results;
};

/// Runs one step, all of whose inputs are arrays.
using Side = std::function<Outcome(const Step &)>;

/// The calls go through the module in the embedded host.
Side moduleSide(const std::filesystem::path &module);

/// What the direct side can be told to do wrong, to see that it is noticed.
enum class Deviation {
    none,
    swappedValues,    ///< the first two values of a write change places
    dimensionsAsIs,   ///< the dimensions of a new variable are not turned around
    unsignedText,     ///< text is read without sign extension
    otherWord,        ///< a range error has another word
    laterChecks,      ///< the class of written data is looked at after the variable
    forgottenPadding, ///< a file lacks its last byte
};

/// The calls go to the library directly; what the module says of its own comes from a model.
Side librarySide(Deviation deviation);

} // namespace difference
