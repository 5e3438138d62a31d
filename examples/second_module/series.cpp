// examples/second_module/series.cpp: a module of ten operations on series of numbers, to start
// from.
//
// A module is one function, which gets the name of an operation and its arguments as host arrays.
// Here every operation takes a double array; some take a second one.
#include "tessel/host.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <functional>
#include <numeric>
#include <span>
#include <string_view>

namespace {

using Values = std::span<const double>;

/// An input of doubles; raises for any other class.
Values values(const tsArray *array) {
    if (tsGetClassID(array) != tsDOUBLE) {
        tsxErrMsgIdAndTxt("series:badClass", "A series is double, and not %s.",
                          tsGetClassName(array));
    }
    return {static_cast<const double *>(tsGetData(array)), tsGetNumberOfElements(array)};
}

/// A new column of n doubles, and its elements.
std::span<double> column(tsArray *&slot, std::size_t n) {
    slot = tsCreateUninitNumericArray(1, &n, tsDOUBLE);
    return {static_cast<double *>(tsGetData(slot)), n};
}

void wantSome(Values series) {
    if (series.empty()) {
        tsxErrMsgIdAndTxt("series:empty", "An empty series has no such value.");
    }
}

void wantEqualLengths(Values first, Values second) {
    if (first.size() != second.size()) {
        tsxErrMsgIdAndTxt("series:lengths", "The series have %zu and %zu values.", first.size(),
                          second.size());
    }
}

double sum(Values series) {
    return std::accumulate(series.begin(), series.end(), 0.0);
}

double mean(Values series) {
    wantSome(series);
    return sum(series) / static_cast<double>(series.size());
}

double least(Values series) {
    wantSome(series);
    return *std::min_element(series.begin(), series.end());
}

double greatest(Values series) {
    wantSome(series);
    return *std::max_element(series.begin(), series.end());
}

double count(Values series) {
    return static_cast<double>(series.size());
}

void running(Values from, std::span<double> to) {
    std::partial_sum(from.begin(), from.end(), to.begin());
}

void backwards(Values from, std::span<double> to) {
    std::reverse_copy(from.begin(), from.end(), to.begin());
}

void sorted(Values from, std::span<double> to) {
    std::partial_sort_copy(from.begin(), from.end(), to.begin(), to.end());
}

template <double (*function)(Values)>
void toNumber(tsArray *plhs[], const tsArray *prhs[]) {
    plhs[0] = tsCreateDoubleScalar(function(values(prhs[1])));
}

template <void (*function)(Values, std::span<double>)>
void toSeries(tsArray *plhs[], const tsArray *prhs[]) {
    const Values from = values(prhs[1]);
    function(from, column(plhs[0], from.size()));
}

/// What each value is more than the one before: one fewer than the values, and none for none.
void differences(tsArray *plhs[], const tsArray *prhs[]) {
    const Values from = values(prhs[1]);
    const std::size_t n = from.empty() ? 0 : from.size() - 1;
    const Values later = from.last(n);
    std::transform(later.begin(), later.end(), from.begin(), column(plhs[0], n).begin(),
                   std::minus<>());
}

void product(tsArray *plhs[], const tsArray *prhs[]) {
    const Values first = values(prhs[1]);
    const Values second = values(prhs[2]);
    wantEqualLengths(first, second);
    plhs[0] =
        tsCreateDoubleScalar(std::inner_product(first.begin(), first.end(), second.begin(), 0.0));
}

struct Operation {
    std::string_view name;
    int inputs; // with the name
    void (*run)(tsArray *plhs[], const tsArray *prhs[]);
};

constexpr std::array operations = {
    Operation{"sum", 2, toNumber<sum>},
    Operation{"mean", 2, toNumber<mean>},
    Operation{"least", 2, toNumber<least>},
    Operation{"greatest", 2, toNumber<greatest>},
    Operation{"count", 2, toNumber<count>},
    Operation{"running", 2, toSeries<running>},
    Operation{"backwards", 2, toSeries<backwards>},
    Operation{"sorted", 2, toSeries<sorted>},
    Operation{"differences", 2, differences},
    Operation{"product", 3, product},
};

} // namespace

#ifdef __GNUC__
__attribute__((visibility("default")))
#endif
void tsxFunction(int /*nlhs*/, tsArray *plhs[], int nrhs, const tsArray *prhs[]) {
    char *const name = nrhs > 0 ? tsArrayToString(prhs[0]) : nullptr;
    if (name == nullptr) {
        tsxErrMsgIdAndTxt("series:noName", "The first input is the name of an operation.");
    }
    const auto *const found =
        std::find_if(operations.begin(), operations.end(),
                     [&](const Operation &operation) { return operation.name == name; });
    if (found == operations.end()) {
        tsxErrMsgIdAndTxt("series:noOperation", "There is no operation \"%s\".", name);
    }
    tsFree(name);
    if (nrhs != found->inputs) {
        tsxErrMsgIdAndTxt("series:inputs", "The operation takes %d inputs, and got %d.",
                          found->inputs, nrhs);
    }
    found->run(plhs, prhs);
}
