// tests/support/in_call.cpp: running a piece of code as the body of a call of a module.
#include "support/in_call.hpp"

namespace tessel::test {
namespace {

const Body *current = nullptr;

} // namespace

Results inCall(const Body &body, const CallOptions &options) {
    static const Module module(TESSEL_CALLBACK_FILE);
    current = &body;
    return module.call({}, options);
}

} // namespace tessel::test

/// What the module in callback_module.cpp calls.
extern "C" void tesselTestBody(tsArray *plhs[]) {
    (*tessel::test::current)(plhs);
}
