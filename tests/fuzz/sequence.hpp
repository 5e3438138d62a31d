// tests/fuzz/sequence.hpp: sequences of calls as values, and as text.
//
// As text, a call is a line: the operation, its inputs, and ">n" if n outputs are asked for
// instead of one. Inputs are
//
//   3.5  -1  nan                  a double
//   'x%0020y'                     a row of characters; others than letters by their codes
//   int16[2,3]{1,2,3,4,5,6}       an array of a class and shape; values are repeated as needed
//   double*[1,1]{0}               with imaginary parts
//   cell[1,2]  struct[1,1]  function[1,1]  unknown[1,1]
//   @2                            the id of the third dataset that the sequence opened
//
// What cannot be read is left out, so that any text is a sequence.
#pragma once

#include "tessel/class_id.h"

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace fuzz {

struct Value {
    enum class Kind { array, dataset };

    Kind kind = Kind::array;
    std::size_t slot = 0; ///< which dataset
    tsClassID classID = tsDOUBLE;
    bool complex = false;
    std::vector<std::size_t> dims = {1, 1};
    std::vector<double> elements = {}; ///< repeated as needed; none are zeros
};

struct Step {
    std::string operation;
    std::vector<Value> inputs;
    int outputs = 1;
};

using Sequence = std::vector<Step>;

// How large a sequence and its parts may be, so that an execution stays short.
constexpr std::size_t mostSteps = 24;
constexpr std::size_t mostInputs = 10;
constexpr std::size_t mostDims = 5;
constexpr std::size_t mostElements = 300; // more than a name may have

Value number(double value);
Value row(std::vector<double> values);
Value characters(std::string_view bytes);

std::size_t sizeOf(const Value &value);

Sequence parsed(std::string_view text);
std::string printed(const Sequence &sequence);

} // namespace fuzz
