// tests/difference/run.hpp: running a program on one side, and comparing the two.
#pragma once

#include "program.hpp"
#include "side.hpp"

#include <array>
#include <filesystem>
#include <optional>
#include <stdexcept>
#include <string>
#include <vector>

namespace difference {

/// What a run leaves: the outcome of each step, and the files.
struct Trace {
    std::vector<Outcome> outcomes;
    std::array<std::optional<std::string>, fileCount> files;
};

/// Thrown when a dataset cannot be closed. The library then keeps its id, and gives others to later
/// runs, which therefore tell nothing any more.
struct LeftOpen : std::runtime_error {
    using std::runtime_error::runtime_error;
};

/// Runs a program in a folder of its own, which is emptied first, and closes what it leaves open.
Trace run(const Program &program, const Side &side, const std::filesystem::path &folder);

/// The first thing in which the traces differ, in words; nothing when they agree.
std::optional<std::string> firstDifference(const Program &program, const Trace &module,
                                           const Trace &library);

/// Whether a step is one that the library does not survive, or that is the host's business alone.
/// Programs are made without such steps.
bool isLeftOut(const Step &step);

} // namespace difference
