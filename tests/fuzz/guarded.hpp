// tests/fuzz/guarded.hpp: the module as the fuzzers call it.
#pragma once

#include "scratch.hpp"

#include "tessel/netcdf_guard.hpp"

#include <cstdint>
#include <cstdlib>
#include <span>
#include <string>

namespace fuzz {

/// Loads the module, puts the guard before it and turns the checked mode on. Without the guard,
/// which the environment may ask for, there is something to be found soon.
inline tessel::Module guardedModule() {
    tessel::setChecked(true);
    constexpr std::uint64_t mostFilled = std::uint64_t{1} << 18U;
    const tessel::Module netcdf(TESSEL_NETCDF_MODULE);
    return std::getenv("TESSEL_FUZZ_UNGUARDED") != nullptr
               ? netcdf
               : netcdf.watchedBy(tessel::netcdfGuard({.fillLimit = mostFilled}));
}

/// What came of a call: results, or the identifier of an error.
struct Outcome {
    tessel::Results results;
    std::string identifier;
};

/// One call. Dies of what no call may do: break a promise to the host, raise what is no error of
/// the host's, or leave memory when it succeeds.
inline Outcome calledWith(const tessel::Module &netcdf, std::span<const tsArray *> inputs,
                          int outputs = 1) {
    Outcome outcome;
    tessel::CallReport report;
    try {
        outcome.results = netcdf.call(inputs, {.outputs = outputs, .report = &report});
    } catch (const tessel::Error &error) {
        outcome.identifier = error.identifier();
        if (outcome.identifier == "TESSEL:host:violation" ||
            outcome.identifier == "TESSEL:host:foreignException") {
            die(error.message());
        }
        return outcome;
    } catch (const std::exception &error) {
        die(std::string("an exception that is no Error: ") + error.what());
    }
    if (report.blocksLeft != 0 || report.arraysLeft != 0) {
        die("a call left memory of the host's");
    }
    return outcome;
}

/// One call with arguments as they are at hand.
template <class... Arguments>
Outcome called(const tessel::Module &netcdf, const Arguments &...arguments) {
    return tessel::withInputs(
        [&](std::span<const tsArray *> inputs) { return calledWith(netcdf, inputs); },
        arguments...);
}

inline int lastNumber(const tessel::Results &results) {
    return static_cast<int>(results[results.size() - 1].number());
}

} // namespace fuzz
