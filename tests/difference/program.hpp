// tests/difference/program.hpp: the programs that are run twice, as values.
//
// A program is a list of calls. What it prints as can be pasted into a source file that includes
// this header (see pinned.cpp).
#pragma once

#include "tessel/class_id.h"

#include <cstddef>
#include <iosfwd>
#include <string>
#include <string_view>
#include <vector>

namespace difference {

/// One input of a call: an array, or the name or the id of a dataset, which are not the same on
/// both sides.
struct Value {
    enum class Kind { array, file, dataset };

    Kind kind = Kind::array;
    tsClassID classID = tsDOUBLE;
    std::vector<std::size_t> dims;
    std::vector<double> elements; ///< exact for every class: wide integers are chosen to fit
    std::size_t slot = 0;         ///< which file; of a dataset, the file that it was opened from

    [[nodiscard]] bool isArray() const { return kind == Kind::array; }
};

/// One call: the name of an operation as a user types it, and the inputs after it.
struct Step {
    std::string operation;
    std::vector<Value> inputs;
};

using Program = std::vector<Step>;

/// The files that programs use, by slot. The last one is there from the start, and no dataset.
constexpr std::size_t fileCount = 4;
constexpr std::size_t foreignFile = 3;
constexpr const char *foreignContent = "not a dataset";

// The values, as they are written in programs.
Value num(double value);
Value row(std::vector<double> values);
Value of(tsClassID classID, std::vector<double> values);
Value of(tsClassID classID, std::vector<std::size_t> dims, std::vector<double> values);
Value text(std::string_view ascii);
Value characters(std::u16string_view units);
Value file(std::size_t slot);
Value dataset(std::size_t slot);

std::ostream &operator<<(std::ostream &out, const Value &value);
std::ostream &operator<<(std::ostream &out, const Step &step);
std::ostream &operator<<(std::ostream &out, const Program &program);

/// For the library that makes and shrinks the programs.
inline void showValue(const Program &program, std::ostream &out) {
    out << program;
}

} // namespace difference
