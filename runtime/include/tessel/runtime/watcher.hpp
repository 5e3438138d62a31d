// tessel/runtime/watcher.hpp: looking at the calls of a module before the module does.
//
// A module passes on what it is asked for, and what it stands on may not survive every request. A
// program that knows better gives the module a watcher (Module::watchedBy), which sees each call
// first, may refuse it with an error of its own, and is told how the call ended.
#pragma once

#include "tessel/runtime/array.hpp"
#include "tessel/runtime/error.hpp"
#include "tessel/runtime/module.hpp"

#include <span>

namespace tessel {

/// The inputs of a call; the first is the name of an operation.
using Inputs = std::span<const tsArray *const>;

/// Asks the module itself, within the call that is being watched. What is asked is not watched, and
/// raises what the module raises. Module::call cannot be used there: it waits for the call to end.
class Ask {
  public:
    /// One call with arguments as they are at hand: ask("inq", ncid).
    template <class... Arguments>
    Results operator()(const Arguments &...arguments) const {
        return withInputs([&](std::span<const tsArray *> inputs) { return call(inputs); },
                          arguments...);
    }

  private:
    friend class Module;
    explicit Ask(const Module &watched) noexcept : module(watched) {}
    [[nodiscard]] Results call(std::span<const tsArray *> inputs) const;

    const Module &module;
};

/// Both functions run while no other call of the process does.
class Watcher {
  public:
    Watcher() = default;
    virtual ~Watcher() = default;
    Watcher(const Watcher &) = delete;
    Watcher &operator=(const Watcher &) = delete;

    /// Before the module sees the call. To raise an Error is to refuse it: the module is not
    /// called, nor is `after`, and the program gets that error. std::bad_alloc becomes the error
    /// "TESSEL:host:outOfMemory"; any other exception is a mistake of the watcher's, which refuses
    /// the call too and reaches the program as it is.
    virtual void before(Inputs inputs, const Ask &ask) = 0;

    /// After the module has answered with results, or with an error (then there are none). Called
    /// once for every call that `before` let through, whatever ended it: what is no Error when it
    /// leaves the module is given as the Error that the program gets, and a thread that ends within
    /// the call, because it is cancelled, as "TESSEL:host:foreignException". It cannot refuse
    /// anything any more, and an exception that left it would end the program.
    virtual void after(Inputs inputs, const Results &results, const Error *error) noexcept = 0;
};

} // namespace tessel
