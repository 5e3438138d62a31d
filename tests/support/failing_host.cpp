// tests/support/failing_host.cpp: the host's functions that allocate, as a module under test sees
// them. They count and fail with the `operator new` of failing_new.cpp.
#include "support/failing_new.hpp"
#include "support/probe.hpp"
#include "tessel/host.h"

#include <new>

namespace tessel::test {
namespace {

/// What the host makes; where this one fails, an exception that the host takes for its own error.
template <class Made, class... P>
Made *allocated(const char *function, P... arguments) {
    if (Failing::next()) {
        throw std::bad_alloc();
    }
    return hidden<Made *, P...>(function)(arguments...);
}

} // namespace
} // namespace tessel::test

using namespace tessel::test;

void *tsCalloc(size_t count, size_t size) {
    return Failing::next() ? nullptr : hidden<void *, size_t, size_t>("tsCalloc")(count, size);
}

char *tsArrayToString(const tsArray *array) {
    return allocated<char>("tsArrayToString", array);
}

tsArray *tsCreateDoubleScalar(double value) {
    return allocated<tsArray>("tsCreateDoubleScalar", value);
}

tsArray *tsCreateString(const char *text) {
    return allocated<tsArray>("tsCreateString", text);
}

tsArray *tsCreateUninitNumericArray(size_t ndim, const size_t *dims, tsClassID classID) {
    return allocated<tsArray>("tsCreateUninitNumericArray", ndim, dims, classID);
}

tsArray *tsCreateCharArray(size_t ndim, const size_t *dims) {
    return allocated<tsArray>("tsCreateCharArray", ndim, dims);
}

tsArray *tsCreateCellArray(size_t ndim, const size_t *dims) {
    return allocated<tsArray>("tsCreateCellArray", ndim, dims);
}
