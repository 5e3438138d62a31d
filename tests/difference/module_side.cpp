// tests/difference/module_side.cpp: the side that calls the module.
#include "side.hpp"

#include "tessel/runtime.hpp"

#include <algorithm>
#include <cstdint>

namespace difference {
namespace {

using tessel::Array;

template <class T>
void fill(Array &array, const std::vector<double> &elements) {
    std::transform(elements.begin(), elements.end(), array.elements<T>().begin(),
                   [](double element) { return static_cast<T>(element); });
}

struct ClassRow {
    tsClassID classID;
    void (*fill)(Array &array, const std::vector<double> &elements);
};

constexpr std::array classRows = {
    ClassRow{tsDOUBLE, fill<double>},      ClassRow{tsSINGLE, fill<float>},
    ClassRow{tsINT8, fill<std::int8_t>},   ClassRow{tsUINT8, fill<std::uint8_t>},
    ClassRow{tsINT16, fill<std::int16_t>}, ClassRow{tsUINT16, fill<std::uint16_t>},
    ClassRow{tsINT32, fill<std::int32_t>}, ClassRow{tsUINT32, fill<std::uint32_t>},
    ClassRow{tsINT64, fill<std::int64_t>}, ClassRow{tsUINT64, fill<std::uint64_t>},
    ClassRow{tsCHAR, fill<tsChar>},        ClassRow{tsLOGICAL, fill<bool>},
};

Array emptyArray(const Value &value) {
    switch (value.classID) {
    case tsCHAR:
        return Array::characters(value.dims);
    case tsLOGICAL:
        return Array::logical(value.dims);
    case tsCELL:
        return Array::cell(value.dims);
    default:
        return Array::numeric(value.classID, value.dims);
    }
}

Array arrayOf(const Value &value) {
    Array array = emptyArray(value);
    for (const ClassRow &known : classRows) {
        if (known.classID == value.classID) {
            known.fill(array, value.elements);
        }
    }
    return array;
}

Result resultOf(const Array &array) {
    Result result{};
    result.classID = array.classID();
    result.dims.assign(array.dims().begin(), array.dims().end());
    if (array.classID() == tsCELL) {
        for (std::size_t i = 0; i < array.size(); ++i) {
            result.cells.push_back(resultOf(array.cellAt(i)));
        }
    } else {
        const auto *const from = static_cast<const unsigned char *>(array.data());
        result.bytes.assign(from, from + array.size() * tessel::elementSize(array.classID()));
    }
    return result;
}

Outcome callModule(const tessel::Module &module, const Step &step) {
    std::vector<Array> held;
    held.push_back(Array::text(step.operation));
    std::transform(step.inputs.begin(), step.inputs.end(), std::back_inserter(held), arrayOf);
    std::vector<const tsArray *> inputs(held.size());
    std::transform(held.begin(), held.end(), inputs.begin(),
                   [](const Array &array) { return array.get(); });
    Outcome outcome;
    try {
        const tessel::Results results = module.call(inputs);
        for (std::size_t i = 0; i < results.size(); ++i) {
            outcome.results.push_back(results[i] ? resultOf(results[i])
                                                 : Result{tsUNKNOWN, {}, {}, {}});
        }
    } catch (const tessel::Error &error) {
        outcome.identifier = error.identifier();
        outcome.message = error.message();
    }
    return outcome;
}

} // namespace

Side moduleSide(const std::filesystem::path &module) {
    tessel::setChecked(true); // a broken promise of the module's is an outcome that differs
    return [loaded = tessel::Module(module)](const Step &step) { return callModule(loaded, step); };
}

} // namespace difference
