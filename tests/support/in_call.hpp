// tests/support/in_call.hpp: running a piece of code as the body of a call of a module.
#pragma once

#include "tessel/runtime.hpp"

#include <functional>

namespace tessel::test {

/// What runs in the call: it may create host arrays, raise, and fill output slots.
using Body = std::function<void(tsArray *plhs[])>;

/// Runs the body in a call of the embedded host, which reclaims what it leaves behind.
Results inCall(const Body &body, const CallOptions &options = {});

} // namespace tessel::test
