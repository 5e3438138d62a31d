// tests/python/mirror.cpp: a module that tells what it was given, and gives it back.
//
// "describe" gives class and dimensions, "copy" a copy made through the host interface, "borrowed"
// the address of the data, "raise" an error with the text that it is given.
#include "tessel/host.h"

#include <array>
#include <cstdint>
#include <cstring>
#include <string>

namespace {

std::size_t widthOf(const tsArray *array) {
    switch (tsGetClassID(array)) {
    case tsDOUBLE:
    case tsINT64:
    case tsUINT64:
        return 8;
    case tsSINGLE:
    case tsINT32:
    case tsUINT32:
        return 4;
    case tsINT16:
    case tsUINT16:
    case tsCHAR:
        return 2;
    default:
        return 1;
    }
}

tsArray *copyOf(const tsArray *array) {
    const std::size_t ndim = tsGetNumberOfDimensions(array);
    const std::size_t *dims = tsGetDimensions(array);
    const std::size_t elements = tsGetNumberOfElements(array);
    tsArray *copy = nullptr;
    if (tsGetClassID(array) == tsCHAR) {
        copy = tsCreateCharArray(ndim, dims);
    } else if (tsIsNumeric(array)) {
        copy = tsCreateUninitNumericArray(ndim, dims, tsGetClassID(array));
    } else {
        tsxErrMsgIdAndTxt("TESTS:mirror:class", "no copy of a %s", tsGetClassName(array));
    }
    if (elements != 0) {
        std::memcpy(tsGetData(copy), tsGetData(array), elements * widthOf(array));
    }
    return copy;
}

tsArray *dimsOf(const tsArray *array) {
    const std::array<std::size_t, 2> shape = {1, tsGetNumberOfDimensions(array)};
    tsArray *row = tsCreateUninitNumericArray(shape.size(), shape.data(), tsDOUBLE);
    for (std::size_t i = 0; i < shape[1]; ++i) {
        static_cast<double *>(tsGetData(row))[i] = static_cast<double>(tsGetDimensions(array)[i]);
    }
    return row;
}

} // namespace

void tsxFunction(int /*nlhs*/, tsArray *plhs[], int nrhs, const tsArray *prhs[]) {
    char *const text = tsArrayToString(prhs[0]);
    const std::string operation = text;
    tsFree(text);
    const tsArray *const input = nrhs > 1 ? prhs[1] : nullptr;
    if (operation == "describe") {
        plhs[0] = tsCreateString(tsGetClassName(input));
        plhs[1] = dimsOf(input);
    } else if (operation == "copy") {
        plhs[0] = copyOf(input);
    } else if (operation == "borrowed") {
        // An address has fewer bits than a double counts exactly.
        plhs[0] = tsCreateDoubleScalar(
            static_cast<double>(reinterpret_cast<std::uintptr_t>(tsGetData(input))));
    } else if (operation == "raise") {
        tsxErrMsgIdAndTxt("TESTS:mirror:asked", "%s", tsArrayToString(input));
    } else if (operation == "third") {
        plhs[2] = tsCreateDoubleScalar(3);
    }
}
