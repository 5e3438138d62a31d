// tests/support/host_functions.cpp: the host's functions that give and take back memory, as a
// module under test sees them.
#include "support/probe.hpp"
#include "support/text.hpp"
#include "tessel/host.h"

#include <string>
#include <type_traits>

namespace tessel::test {
namespace {

std::string shownDims(std::size_t ndim, const std::size_t *dims) {
    std::string text = "{";
    for (std::size_t i = 0; i < ndim; ++i) {
        text += (i == 0 ? "" : ", ") + shown(dims[i]);
    }
    return text + "}";
}

/// Notes the making of an array, whose data are called "array" until a better name is known.
tsArray *noted(std::string call, tsArray *array) {
    if (Probe *const probe = Probe::watching()) {
        probe->note(std::move(call));
        if (const void *data = tsGetData(array)) {
            probe->name(data, "array");
        }
    }
    return array;
}

} // namespace
} // namespace tessel::test

using namespace tessel::test;

void *tsCalloc(size_t count, size_t size) {
    void *block = hidden<void *, size_t, size_t>("tsCalloc")(count, size);
    if (Probe *const probe = Probe::watching()) {
        if (probe->refusesNoBytes() && (count == 0 || size == 0)) {
            hidden<void, void *>("tsFree")(block);
            block = nullptr;
        }
        probe->noteBlock("tsCalloc(" + shown(count) + ", " + shown(size) + ")", block);
    }
    return block;
}

void tsFree(void *memory) {
    if (Probe *const probe = Probe::watching()) {
        probe->noteFree(memory);
    }
    hidden<void, void *>("tsFree")(memory);
}

char *tsArrayToString(const tsArray *array) {
    Probe *const probe = Probe::watching();
    if (probe != nullptr && probe->deniesText()) {
        return nullptr;
    }
    return hidden<char *, const tsArray *>("tsArrayToString")(array);
}

bool tsIsNumeric(const tsArray *array) {
    const Probe *const probe = Probe::watching();
    return (probe != nullptr && probe->claimsNumeric()) ||
           hidden<bool, const tsArray *>("tsIsNumeric")(array);
}

void *tsGetData(const tsArray *array) {
    const Probe *const probe = Probe::watching();
    return probe != nullptr && probe->hidesNoData() && tsIsEmpty(array)
               ? nullptr
               : hidden<void *, const tsArray *>("tsGetData")(array);
}

tsArray *tsCreateDoubleScalar(double value) {
    return noted("tsCreateDoubleScalar(" + shown(value) + ")",
                 hidden<tsArray *, double>("tsCreateDoubleScalar")(value));
}

tsArray *tsCreateString(const char *text) {
    return noted("tsCreateString(" + quoted(std::span<const char>(std::string_view(text))) + ")",
                 hidden<tsArray *, const char *>("tsCreateString")(text));
}

tsArray *tsCreateUninitNumericArray(size_t ndim, const size_t *dims, tsClassID classID) {
    tsArray *const array = hidden<tsArray *, size_t, const size_t *, tsClassID>(
        "tsCreateUninitNumericArray")(ndim, dims, classID);
    return noted("tsCreateUninitNumericArray(" + shownDims(ndim, dims) + ", " +
                     tsGetClassName(array) + ")",
                 array);
}

tsArray *tsCreateCharArray(size_t ndim, const size_t *dims) {
    return noted("tsCreateCharArray(" + shownDims(ndim, dims) + ")",
                 hidden<tsArray *, size_t, const size_t *>("tsCreateCharArray")(ndim, dims));
}

tsArray *tsCreateCellArray(size_t ndim, const size_t *dims) {
    return noted("tsCreateCellArray(" + shownDims(ndim, dims) + ")",
                 hidden<tsArray *, size_t, const size_t *>("tsCreateCellArray")(ndim, dims));
}
