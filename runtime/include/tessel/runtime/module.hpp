// tessel/runtime/module.hpp: loading modules and calling them.
#pragma once

#include "tessel/runtime/array.hpp"
#include "tessel/runtime/error.hpp"

#include <array>
#include <cstddef>
#include <filesystem>
#include <memory>
#include <optional>
#include <span>
#include <string_view>

/// The embedded host: arrays, modules and calls, and watchers such as the guard.
namespace tessel {

/// The outputs of one call: the slots that the module filled. Moves, does not copy.
class Results {
  public:
    /// How many slots a module is given, whatever the caller asked for: as many as it may count on.
    static constexpr std::size_t slots = 8;

    /// The number of outputs: one more than the last slot that was filled.
    [[nodiscard]] std::size_t size() const noexcept { return count; }

    /// Output i; an Array that owns nothing for a slot that was not filled.
    [[nodiscard]] Array &operator[](std::size_t i) noexcept { return arrays[i]; }

    /// The same, to be read.
    [[nodiscard]] const Array &operator[](std::size_t i) const noexcept { return arrays[i]; }

  private:
    friend class Module;
    std::array<Array, slots> arrays;
    std::size_t count = 0;
};

/// What a call did with the host's memory. Counted in checked mode only, but for `allocations`.
struct CallReport {
    std::size_t allocations = 0; ///< arrays, strings and blocks that the call asked the host for
    std::size_t blocksLeft = 0;  ///< blocks and strings that it neither freed nor handed out
    std::size_t arraysLeft = 0;  ///< arrays that it did not hand out
};

/// What a call may be given beside its inputs.
struct CallOptions {
    int outputs = 1;                ///< the number of outputs that are asked for (nlhs)
    std::size_t failAllocation = 0; ///< makes the n-th allocation of the call fail; 0: none
    CallReport *report = nullptr;   ///< filled when the call ends, also when it ends by an error
};

/// An argument of the comfortable form of a call: an array, a number or a text.
class Argument {
  public:
    /// An array that is there already, and outlives the argument. Not copied.
    Argument(const Array &array) : input(array.get()) {}

    /// A 1-by-1 double. Error "TESSEL:host:outOfMemory", as with all that follow.
    Argument(double value) : made(Array::scalar(value)), input(made.get()) {}

    /// A 1-by-1 double as well.
    Argument(int value) : Argument(static_cast<double>(value)) {}

    /// A 1-by-n row of characters made from UTF-8, as Array::text makes it.
    Argument(std::string_view utf8) : made(Array::text(utf8)), input(made.get()) {}

    /// The same of NUL-terminated text.
    Argument(const char *utf8) : Argument(std::string_view(utf8)) {}

    /// The same.
    Argument(const std::string &utf8) : Argument(std::string_view(utf8)) {}

    /// The array that the call is given; alive as long as the argument.
    [[nodiscard]] const tsArray *get() const noexcept { return input; }

  private:
    Array made;
    const tsArray *input;
};

class Watcher;

/// What `call` answers to inputs made of arguments as they are at hand.
template <class Call, class... Arguments>
auto withInputs(const Call &call, const Arguments &...arguments) {
    const std::array<Argument, sizeof...(Arguments)> held{Argument(arguments)...};
    std::array<const tsArray *, sizeof...(Arguments)> inputs{};
    for (std::size_t i = 0; i < held.size(); ++i) {
        inputs[i] = held[i].get();
    }
    return call(std::span<const tsArray *>(inputs));
}

/// A loaded module. Copies share it; it is unloaded with the last one.
///
/// Any thread may load, call and unload any module at any time: all of it happens one after the
/// other in a process, because modules may share a library that is not thread-safe.
class Module {
  public:
    /// Loads a module file. Error "TESSEL:host:moduleNotFound" when there is no such file,
    /// "TESSEL:host:notAModule" when it cannot be loaded as a shared object, and
    /// "TESSEL:host:noEntryPoint" when it lacks tsxFunction.
    explicit Module(const std::filesystem::path &file);

    /// Loads a module by name ("netcdf"): NAME.tsx in the first folder that has it of those in the
    /// variable TESSEL_MODULE_PATH (colon-separated, absolute) and of the folder "tessel" beside
    /// the library or program that this host is part of. The current folder is not searched. Error
    /// "TESSEL:host:moduleNotFound" names the folders. A name has no "/" in it.
    static Module find(std::string_view name);

    /// The file that the module was loaded from.
    [[nodiscard]] const std::filesystem::path &file() const noexcept;

    /// The same module, with someone who looks at each call first (tessel/runtime/watcher.hpp). The
    /// watcher replaces the one that was there; none if it is empty.
    [[nodiscard]] Module watchedBy(std::shared_ptr<Watcher> next) const;

    /// One call. The inputs are alive until it returns; their data are not copied. Raises Error
    /// with what the module raised, or with the host's own "TESSEL:host:outOfMemory",
    /// "TESSEL:host:foreignException" (an exception of another type left the module),
    /// "TESSEL:host:nestedCall" (called from within a call), "TESSEL:host:badOutputCount",
    /// "TESSEL:host:tooManyInputs", "TESSEL:host:missingInput" (an input is nullptr), and in
    /// checked mode "TESSEL:host:violation" (the module broke a promise; the message says which).
    Results call(std::span<const tsArray *> inputs, const CallOptions &options = {}) const;

    /// One call with arguments as they are at hand: netcdf("open", path, "NOWRITE").
    template <class... Arguments>
    Results operator()(const Arguments &...arguments) const {
        return withInputs([&](std::span<const tsArray *> inputs) { return call(inputs); },
                          arguments...);
    }

  private:
    friend class Ask;
    class Told;
    [[nodiscard]] std::optional<Error> run(std::span<const tsArray *> inputs,
                                           const CallOptions &options, Results &results) const;

    struct Loaded;
    std::shared_ptr<const Loaded> loaded;
    std::shared_ptr<Watcher> watcher;
};

/// Checked mode, for the tests of modules: from now on, each block has guard bytes around it, data
/// that have no defined values are filled with a pattern, and each call is searched for guard bytes
/// that were overwritten, inputs that were changed, memory that was not the call's to free, and
/// memory left behind.
void setChecked(bool on) noexcept;

/// Whether checked mode is on.
[[nodiscard]] bool isChecked() noexcept;

} // namespace tessel
