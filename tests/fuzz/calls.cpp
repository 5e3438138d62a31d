// tests/fuzz/calls.cpp: sequences of calls with any arguments, which keep datasets open in between.
// Whatever they ask for, only errors of the host's may come of it; afterwards nothing is left open.
#include "guarded.hpp"
#include "sequence.hpp"

#include "tessel/array.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <cstdint>
#include <cstdlib>
#include <iostream>
#include <limits>
#include <string>
#include <string_view>
#include <vector>

namespace fuzz {
namespace {

using tessel::Array;

/// The nearest value of a type.
template <class T>
T nearest(double value) {
    using Limits = std::numeric_limits<T>;
    if constexpr (Limits::is_integer) {
        if (std::isnan(value)) {
            return 0;
        }
        if (value <= static_cast<double>(Limits::lowest())) {
            return Limits::lowest();
        }
        if (value >= static_cast<double>(Limits::max())) {
            return Limits::max();
        }
    } else if (std::isfinite(value)) {
        value = std::clamp(value, static_cast<double>(Limits::lowest()),
                           static_cast<double>(Limits::max()));
    }
    return static_cast<T>(value);
}

template <class T>
void fill(Array &array, const std::vector<double> &elements) {
    std::size_t i = 0;
    for (T &element : array.elements<T>()) {
        element = elements.empty() ? T{} : nearest<T>(elements[i++ % elements.size()]);
    }
    if (array.imaginary() != nullptr) {
        std::fill_n(static_cast<T *>(array.imaginary()), array.size(), T{});
    }
}

Array numericOf(const Value &value) {
    return Array::numeric(value.classID, value.dims, value.complex);
}

struct ClassRow {
    tsClassID classID;
    Array (*make)(const Value &value);
    void (*fill)(Array &array, const std::vector<double> &elements);
};

const std::array classRows = {
    ClassRow{tsDOUBLE, numericOf, fill<double>},
    ClassRow{tsSINGLE, numericOf, fill<float>},
    ClassRow{tsINT8, numericOf, fill<std::int8_t>},
    ClassRow{tsUINT8, numericOf, fill<std::uint8_t>},
    ClassRow{tsINT16, numericOf, fill<std::int16_t>},
    ClassRow{tsUINT16, numericOf, fill<std::uint16_t>},
    ClassRow{tsINT32, numericOf, fill<std::int32_t>},
    ClassRow{tsUINT32, numericOf, fill<std::uint32_t>},
    ClassRow{tsINT64, numericOf, fill<std::int64_t>},
    ClassRow{tsUINT64, numericOf, fill<std::uint64_t>},
    ClassRow{tsCHAR, [](const Value &value) { return Array::characters(value.dims); },
             fill<tsChar>},
    ClassRow{tsLOGICAL, [](const Value &value) { return Array::logical(value.dims); }, fill<bool>},
    ClassRow{tsCELL, [](const Value &value) { return Array::cell(value.dims); }, nullptr},
    ClassRow{tsSTRUCT,
             [](const Value &value) {
                 return Array::structure(value.dims, {"a", "b"});
             },
             nullptr},
    ClassRow{tsFUNCTION, [](const Value & /*value*/) { return Array::function("sin"); }, nullptr},
    ClassRow{tsUNKNOWN, [](const Value &value) { return Array::unknown(value.dims); }, nullptr},
};

Array arrayOf(const Value &value) {
    const auto &known = *std::find_if(classRows.begin(), classRows.end(), [&](const ClassRow &one) {
        return one.classID == value.classID;
    });
    Array array = known.make(value);
    if (known.fill != nullptr) {
        known.fill(array, value.elements);
    }
    return array;
}

/// What a file's name must not have, since it would lead out of the folder or be an address, also
/// where only the lower half of a character counts.
void keepInFolder(const Array &name) {
    if (name.classID() != tsCHAR) {
        return;
    }
    constexpr unsigned low = 0xFF;
    for (tsChar &unit : name.elements<tsChar>()) {
        const unsigned byte = unit & low;
        if (byte == '/' || byte == '\\' || byte == ':') {
            unit = '_';
        }
    }
}

/// Whether a call asks for a file that is based on HDF5. One whose closing fails stays open within
/// HDF5, which needs its descriptor until the process ends, and the next run would find it open.
bool asksForHdf5(std::string_view operation, const std::vector<Array> &inputs) {
    const bool creates = operation.ends_with("create") && inputs.size() > 2;
    const bool chooses = operation.ends_with("set_default_format") && inputs.size() > 1;
    if (!creates && !chooses) {
        return false;
    }
    const Array &input = inputs[creates ? 2 : 1];
    if ((input.classID() != tsDOUBLE && input.classID() != tsINT32) || input.size() == 0) {
        return false;
    }
    const double value = input.number();
    constexpr unsigned hdf5 = 0x1000;
    return creates ? (static_cast<unsigned>(nearest<std::int32_t>(value)) & hdf5) != 0
                   : value >= 3 && value < 5;
}

/// One run: what it opened, so that calls can name it, and that all of it is ended.
class Session {
  public:
    explicit Session(const tessel::Module &module) : netcdf(module) {}

    void call(const Step &step) {
        std::vector<Array> held;
        held.push_back(arrayOf(characters(step.operation)));
        for (const Value &value : step.inputs) {
            held.push_back(value.kind == Value::Kind::dataset ? Array::scalar(idOf(value.slot))
                                                              : arrayOf(value));
        }
        const std::string name = lowered(step.operation);
        const bool opens = name.ends_with("open") || name.ends_with("create");
        if (opens && held.size() > 1) {
            keepInFolder(held[1]);
        }
        if (asksForHdf5(name, held)) {
            return;
        }
        std::vector<const tsArray *> inputs(held.size());
        std::transform(held.begin(), held.end(), inputs.begin(),
                       [](const Array &array) { return array.get(); });
        const Outcome outcome = calledWith(netcdf, inputs, step.outputs);
        note(outcome.identifier.empty() ? name + std::to_string(outcome.results.size())
                                        : outcome.identifier);
        if (opens && outcome.identifier.empty()) {
            opened.push_back(lastNumber(outcome.results));
        }
    }

    /// Ends all datasets, the ones that the disk is too full for once there is room again. What is
    /// left are the files of those that a failed close has ended half, which the library forgets.
    Scratch::Left end() {
        Scratch::Left left = Scratch::Left::nothing;
        for (const int ncid : opened) {
            std::string identifier = called(netcdf, "abort", ncid).identifier;
            if (identifier == ended) {
                left = Scratch::Left::files;
            } else if (!isGone(identifier)) {
                note("end" + identifier);
                Scratch::setFull(false);
                identifier.append(1, ' ').append(called(netcdf, "close", ncid).identifier);
                Scratch::setFull(true);
            }
            const std::string after = called(netcdf, "inq", ncid).identifier;
            if (after.empty() || !isGone(after)) {
                die("a dataset is still there after its end: " +
                    identifier.append(" ").append(after));
            }
        }
        called(netcdf, "set_default_format", 1);
        return left;
    }

  private:
    static constexpr std::string_view ended = "TESSEL:guard:closed";

    static bool isGone(std::string_view identifier) {
        return identifier.empty() || identifier.ends_with(":notNetcdfID") || identifier == ended;
    }

    [[nodiscard]] int idOf(std::size_t slot) const {
        constexpr int noDataset = 7;
        return opened.empty() ? noDataset : opened[slot % opened.size()];
    }

    /// The operation as the module reads it.
    static std::string lowered(std::string text) {
        text.resize(std::min(text.size(), text.find('\0')));
        for (char &c : text) {
            c = c >= 'A' && c <= 'Z' ? static_cast<char>(c + ('a' - 'A')) : c;
        }
        return text;
    }

    const tessel::Module &netcdf;
    std::vector<int> opened;
};

} // namespace
} // namespace fuzz

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size) {
    static const fuzz::Scratch scratch;
    static const tessel::Module netcdf = fuzz::guardedModule();
    static const bool shows = std::getenv("TESSEL_FUZZ_SHOW") != nullptr;
    const fuzz::Sequence sequence =
        fuzz::parsed(std::string_view(reinterpret_cast<const char *>(data), size));
    fuzz::Scratch::setFull(true);
    fuzz::Session session(netcdf);
    for (const fuzz::Step &step : sequence) {
        if (shows) {
            std::cerr << fuzz::printed({step}) << std::flush;
        }
        session.call(step);
    }
    const fuzz::Scratch::Left left = session.end();
    fuzz::Scratch::setFull(false);
    scratch.clean(left);
    return 0;
}
