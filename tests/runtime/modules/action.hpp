// tests/runtime/modules/action.hpp: a module whose first input names one of its actions.
#pragma once

#include "tessel/host.h"

#include <cstddef>
#include <cstring>
#include <span>

/// The arguments of the entry point.
struct Call {
    tsArray **plhs;
    int nrhs;
    const tsArray **prhs;

    /// The first element of a double input.
    [[nodiscard]] double number(int input) const {
        return *static_cast<const double *>(tsGetData(prhs[input]));
    }
};

struct Action {
    const char *name;
    void (*run)(const Call &);
};

inline void runAction(std::span<const Action> actions, const Call &call) {
    char *const name = tsArrayToString(call.prhs[0]);
    for (const Action &action : actions) {
        if (std::strcmp(action.name, name) == 0) {
            tsFree(name);
            action.run(call);
            return;
        }
    }
    tsxErrMsgIdAndTxt("test:noSuchAction", "There is no action \"%s\".", name);
}

inline constexpr std::size_t oneByOne[] = {1, 1};
