// tests/runtime/modules/good.cpp: a module that keeps its promises.
#include "action.hpp"

#include <array>
#include <cstdint>
#include <vector>

namespace {

void nothing(const Call &) {}

/// How many of the 8 output slots are NULL at entry.
void emptySlots(const Call &call) {
    int empty = 0;
    for (int i = 0; i < 8; ++i) {
        empty += call.plhs[i] == nullptr ? 1 : 0;
    }
    call.plhs[0] = tsCreateDoubleScalar(empty);
}

void countInputs(const Call &call) {
    call.plhs[0] = tsCreateDoubleScalar(call.nrhs);
}

void add(const Call &call) {
    call.plhs[0] = tsCreateDoubleScalar(call.number(1) + call.number(2));
}

/// Slots 0, 2 and 7, and no others.
void gaps(const Call &call) {
    for (const int slot : {7, 0, 2}) {
        call.plhs[slot] = tsCreateDoubleScalar(slot);
    }
}

/// All slots that there are.
void everySlot(const Call &call) {
    for (int slot = 0; slot < 8; ++slot) {
        call.plhs[slot] = tsCreateDoubleScalar(slot);
    }
}

void text(const Call &call) {
    char *const bytes = tsArrayToString(call.prhs[1]);
    call.plhs[0] = tsCreateString(bytes);
    tsFree(bytes);
}

/// One of each thing that a call can ask the host for: six allocations, of which two are handed
/// out, one is freed and three are left behind.
void oneOfEach(const Call &call) {
    constexpr std::array<std::size_t, 2> dims = {3, 40};
    tsCreateUninitNumericArray(dims.size(), dims.data(), tsINT16);
    tsCreateCharArray(dims.size(), dims.data());
    call.plhs[0] = tsCreateCellArray(dims.size(), dims.data());
    tsSetCell(call.plhs[0], 119, tsCreateString("last"));
    void *const block = tsCalloc(10, 10);
    if (block == nullptr) {
        tsxErrMsgIdAndTxt("test:noBlock", "tsCalloc gave NULL");
    }
    tsArrayToString(call.prhs[0]);
    tsFree(block);
}

/// The given number of scalars, all left behind.
void scalars(const Call &call) {
    const int count = static_cast<int>(call.number(1));
    for (int i = 0; i < count; ++i) {
        tsCreateDoubleScalar(i);
    }
}

/// An array of the class and dimensions that the inputs give: kind, dimensions, class id.
void make(const Call &call) {
    const auto *const numbers = static_cast<const double *>(tsGetData(call.prhs[1]));
    std::vector<std::size_t> dims;
    for (std::size_t i = 0; i < tsGetNumberOfElements(call.prhs[1]); ++i) {
        dims.push_back(static_cast<std::size_t>(numbers[i]));
    }
    const auto classID = static_cast<tsClassID>(static_cast<int>(call.number(2)));
    call.plhs[0] = classID == tsCHAR ? tsCreateCharArray(dims.size(), dims.data())
                   : classID == tsCELL
                       ? tsCreateCellArray(dims.size(), dims.data())
                       : tsCreateUninitNumericArray(dims.size(), dims.data(), classID);
}

/// Whether tsCalloc gives `count` times `size` bytes, all zero and aligned for every type.
void calloc(const Call &call) {
    const auto count = *static_cast<const std::uint64_t *>(tsGetData(call.prhs[1]));
    const auto size = *static_cast<const std::uint64_t *>(tsGetData(call.prhs[2]));
    const auto *const bytes = static_cast<const unsigned char *>(tsCalloc(count, size));
    bool good = bytes != nullptr;
    if (good) {
        good = reinterpret_cast<std::uintptr_t>(bytes) % alignof(std::max_align_t) == 0;
        for (std::size_t i = 0; i < count * size; ++i) {
            good = good && bytes[i] == 0;
        }
    }
    call.plhs[0] = tsCreateDoubleScalar(good ? 1 : 0);
}

/// What the host says of an input, as a row: class id, numeric, empty, elements, dimensions.
void describe(const Call &call) {
    const tsArray *const input = call.prhs[1];
    const std::size_t ndim = tsGetNumberOfDimensions(input);
    const std::array<std::size_t, 2> dims = {1, 4 + ndim};
    call.plhs[0] = tsCreateUninitNumericArray(dims.size(), dims.data(), tsDOUBLE);
    auto *out = static_cast<double *>(tsGetData(call.plhs[0]));
    *out++ = tsGetClassID(input);
    *out++ = tsIsNumeric(input) ? 1 : 0;
    *out++ = tsIsEmpty(input) ? 1 : 0;
    *out++ = static_cast<double>(tsGetNumberOfElements(input));
    for (std::size_t i = 0; i < ndim; ++i) {
        *out++ = static_cast<double>(tsGetDimensions(input)[i]);
    }
    call.plhs[1] = tsCreateString(tsGetClassName(input));
    call.plhs[2] = tsCreateDoubleScalar(tsArrayToString(input) == nullptr ? 0 : 1);
}

/// Two outputs, and then a raise.
void outputsThenRaise(const Call &call) {
    call.plhs[0] = tsCreateString("lost");
    constexpr std::array<std::size_t, 2> dims = {1000, 1};
    call.plhs[1] = tsCreateUninitNumericArray(dims.size(), dims.data(), tsDOUBLE);
    tsxErrMsgIdAndTxt("test:late", "Too late.");
}

/// A cell in a cell in a cell, as deep as the input says, made from the outside inwards.
void nest(const Call &call) {
    tsArray *cell = call.plhs[0] = tsCreateCellArray(2, oneByOne);
    const int depth = static_cast<int>(call.number(1));
    for (int i = 0; i < depth; ++i) {
        tsArray *const inner = tsCreateCellArray(2, oneByOne);
        tsSetCell(cell, 0, inner);
        cell = inner;
    }
    tsSetCell(cell, 0, tsCreateString("innermost"));
}

/// A cell whose value is replaced, and then taken out.
void replace(const Call &call) {
    call.plhs[0] = tsCreateCellArray(2, oneByOne);
    tsSetCell(call.plhs[0], 0, tsCreateString("first"));
    tsSetCell(call.plhs[0], 0, tsCreateString("second"));
    call.plhs[1] = tsCreateCellArray(2, oneByOne);
    tsSetCell(call.plhs[1], 0, tsCreateString("gone"));
    tsSetCell(call.plhs[1], 0, nullptr);
}

/// Runs a function of the test's from within the call.
void callBack(const Call &call) {
    (*static_cast<void (**)()>(tsGetData(call.prhs[1])))();
}

constexpr Action actions[] = {
    {"nothing", nothing},
    {"empty_slots", emptySlots},
    {"count_inputs", countInputs},
    {"add", add},
    {"gaps", gaps},
    {"every_slot", everySlot},
    {"text", text},
    {"one_of_each", oneOfEach},
    {"scalars", scalars},
    {"make", make},
    {"calloc", calloc},
    {"describe", describe},
    {"outputs_then_raise", outputsThenRaise},
    {"nest", nest},
    {"replace", replace},
    {"call_back", callBack},
};

} // namespace

void tsxFunction(int /*nlhs*/, tsArray *plhs[], int nrhs, const tsArray *prhs[]) {
    runAction(actions, {plhs, nrhs, prhs});
}
