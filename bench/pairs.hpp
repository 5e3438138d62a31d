// bench/pairs.hpp: measuring something beside its reference, in one run.
#pragma once

#include "tessel/runtime.hpp"

#include <benchmark/benchmark.h>

#include <algorithm>
#include <array>
#include <filesystem>
#include <functional>
#include <memory>
#include <span>
#include <string>
#include <utility>
#include <vector>

namespace tessel::bench {

constexpr int usualRepetitions = 25;

using Work = std::function<void()>;

/// Something done through the module, and the reference that does the same by the library alone.
struct Pair {
    std::string name;
    Work reference;
    Work module;
    bool block = false; ///< takes long enough that one iteration is a measurement

    /// A second reference, where the operation is more than its one function: all library calls
    /// that it has to make, and all memory that it has to fill, without the module.
    Work steps = nullptr;

    int repetitions = usualRepetitions; ///< fewer, where each takes long

    Work before = nullptr; ///< comes before each repetition, unmeasured

    /// Pairs of one group, which are neighbours, take turns with each other only. What a block
    /// finds in the caches depends on what came before it, so that the sides of a large one take
    /// turns with nothing but themselves.
    std::string group = {};
};

/// Measures the pairs, group by group, their repetitions in random order, and prints a table in
/// Markdown of how they compare. The median is what one run usually sees; the shortest repetition
/// is what a machine that does other work besides disturbs least; it is also compared with the
/// second references, where there are any. `--write FILE` puts the table into a document as well,
/// between the marks "<!-- TITLE: begin -->" and "<!-- TITLE: end -->"; `--quick` does everything
/// twice only, to show that it works; `--json FILE` keeps all repetitions, in the form of Google
/// Benchmark; `--perf FOLDER` is for profiles.py; the rest of the command line goes to Google
/// Benchmark. Gives back main's status.
int measure(int argc, char **argv, const std::string &title, const std::vector<Pair> &pairs);

/// Whether `--quick` is on the command line, so that a program can do with less.
bool isQuick(int argc, char **argv);

/// A call with inputs that are made once, as a program's loop would have them.
template <class... Inputs>
Work called(const Module &module, Inputs... made) {
    auto held =
        std::make_shared<std::array<Array, sizeof...(Inputs)>>(std::array{std::move(made)...});
    return [&module, held] {
        std::array<const tsArray *, sizeof...(Inputs)> inputs{};
        std::transform(held->begin(), held->end(), inputs.begin(),
                       [](const Array &array) { return array.get(); });
        const Results results = module.call(inputs);
        benchmark::DoNotOptimize(&results);
    };
}

/// Throws the library's text for a status that is not zero.
void check(int status);

/// A read of text of these dimensions, with all that it takes: a zero-filled buffer of so many
/// bytes a character for the library, and a zero-filled result of the host's characters.
template <class Fill>
Work widening(std::array<std::size_t, 2> dims, std::size_t unit, const Fill &fill) {
    return [dims, unit, fill] {
        const Array result = Array::characters(dims);
        const Array buffer = Array::logical(std::array{dims[0] * dims[1] + 1, unit});
        auto *const bytes = static_cast<char *>(buffer.data());
        check(fill(bytes));
        std::transform(bytes, bytes + dims[0] * dims[1], static_cast<tsChar *>(result.data()),
                       [](char byte) { return static_cast<tsChar>(byte); });
    };
}

/// A write of text likewise: a zero-filled buffer, and the characters made bytes.
template <class Write>
Work narrowing(std::span<const tsChar> characters, const Write &write) {
    return [characters, write] {
        const Array buffer = Array::logical(std::array{characters.size(), std::size_t{1}});
        auto *const bytes = static_cast<char *>(buffer.data());
        std::transform(characters.begin(), characters.end(), bytes,
                       [](tsChar character) { return static_cast<char>(character); });
        check(write(bytes));
    };
}

/// A folder that is gone at the end.
class TemporaryFolder {
  public:
    TemporaryFolder();
    ~TemporaryFolder();
    TemporaryFolder(const TemporaryFolder &) = delete;
    TemporaryFolder &operator=(const TemporaryFolder &) = delete;

    [[nodiscard]] std::string file(const char *name) const { return (path / name).string(); }

  private:
    std::filesystem::path path;
};

} // namespace tessel::bench
