// tests/difference/library_side.hpp: what the parts of the direct side share.
#pragma once

#include "model.hpp"
#include "operations.hpp"
#include "program.hpp"
#include "side.hpp"

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace difference {

/// A call in progress: its inputs, and how its failures are named.
struct Call {
    const Operation &operation;
    const std::vector<Value> &inputs;
    std::string tag; ///< the operation's place in identifiers
    Deviation deviation;

    /// An input by its place after the operation's name.
    [[nodiscard]] const Value &operator[](std::size_t i) const { return inputs[i]; }

    [[nodiscard]] int id(std::size_t i, const char *label) const {
        return readID(inputs[i], label);
    }

    /// Throws unless the status is that of success. The identifier ends in the status's word.
    void check(int status, const std::string &inquiry = "") const;

    /// Throws the operation's error of that name unless the condition holds.
    void want(bool holds, const char *word, int status = NC_NOERR) const;
};

using Results = std::vector<Result>;

/// The memory of some numbers.
template <class T>
std::vector<unsigned char> bytesOf(const std::vector<T> &list) {
    const auto *const from = reinterpret_cast<const unsigned char *>(list.data());
    return {from, from + list.size() * sizeof(T)};
}

// Arrays as the host makes them.
Result number(double value);
Result numbers(const std::vector<double> &values, std::vector<std::size_t> dims);
Result string(std::string_view bytes);

/// One way of doing things, with the frame that is around it.
struct Frame {
    Verb verb;
    std::size_t inputs;          ///< without the operation's name
    const char *countIdentifier; ///< for any other number
    const char *tag;
    Results (*run)(const Call &call);
};

// The typed families.
Results getAtt(const Call &call);
Results getVar(const Call &call);
Results getVar1(const Call &call);
Results getVara(const Call &call);
Results getVars(const Call &call);
Results putAtt(const Call &call);
Results putAttText(const Call &call);
Results putVar(const Call &call);
Results putVar1(const Call &call);
Results putVara(const Call &call);
Results putVars(const Call &call);

// The named constants.
Results constantNames(const Call &call);
Results parameter(const Call &call);

} // namespace difference
