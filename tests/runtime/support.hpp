// tests/runtime/support.hpp: what the tests of the embedded host share.
#pragma once

#include "tessel/runtime.hpp"

#include <gtest/gtest.h>

#include <cstdint>
#include <filesystem>
#include <optional>
#include <string>
#include <vector>

namespace tessel::test {

/// True where the sanitizers replace the allocator, so that limits on memory mean nothing.
#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
inline constexpr bool sanitized = true;
#else
inline constexpr bool sanitized = false;
#endif

inline std::filesystem::path testModule(const std::string &name) {
    return std::filesystem::path(TESSEL_TEST_MODULES) / (name + ".tsx");
}

/// Runs something that must raise, and gives back the host error. Anything else fails the test.
template <class Run>
std::optional<Error> raisedBy(const Run &run) {
    try {
        run();
    } catch (const Error &error) {
        return error;
    } catch (const std::exception &error) {
        ADD_FAILURE() << "raised something else: " << error.what();
        return std::nullopt;
    }
    ADD_FAILURE() << "raised nothing";
    return std::nullopt;
}

/// The identifier of the host error that `run` raises.
template <class Run>
std::string identifierOf(const Run &run) {
    const std::optional<Error> error = raisedBy(run);
    return error ? error->identifier() : "none";
}

/// Its message.
template <class Run>
std::string messageOf(const Run &run) {
    const std::optional<Error> error = raisedBy(run);
    return error ? error->message() : "none";
}

/// Checked mode, as long as this lives.
class Checked {
  public:
    Checked() noexcept { setChecked(true); }
    ~Checked() { setChecked(false); }
    Checked(const Checked &) = delete;
    Checked &operator=(const Checked &) = delete;
};

/// A pointer as an input: the bytes of one uint64.
template <class T>
Array pointerArray(T *pointer) {
    constexpr std::array<std::size_t, 2> dims = {1, 1};
    Array made = Array::numeric(tsUINT64, dims);
    made.elements<std::uint64_t>()[0] = reinterpret_cast<std::uintptr_t>(pointer);
    return made;
}

/// One call by the name of an action, with options.
template <class... Arguments>
Results callWith(const Module &module, const CallOptions &options, const Arguments &...arguments) {
    const std::array<Argument, sizeof...(Arguments)> held{Argument(arguments)...};
    std::array<const tsArray *, sizeof...(Arguments)> inputs{};
    for (std::size_t i = 0; i < held.size(); ++i) {
        inputs[i] = held[i].get();
    }
    return module.call(inputs, options);
}

} // namespace tessel::test
