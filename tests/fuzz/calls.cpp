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
bool asksForHdf5(std::string_view operation, const std::vector<Array> &inputs, bool byDefault) {
    if (!operation.ends_with("create") || inputs.size() <= 2) {
        return false;
    }
    const Array &mode = inputs[2];
    const bool numeric = mode.classID() == tsDOUBLE || mode.classID() == tsINT32;
    const auto flags = static_cast<unsigned>(
        numeric && mode.size() > 0 ? nearest<std::int32_t>(mode.number()) : 0);
    constexpr unsigned hdf5 = 0x1000;
    constexpr unsigned outweighingTheDefault = 0x20 | 0x100 | 0x200;
    return (flags & hdf5) != 0 || (byDefault && (flags & outweighingTheDefault) == 0);
}

/// Whether files are based on HDF5 unless their flags say otherwise.
bool isHdf5TheDefault(const tessel::Module &netcdf) {
    const int format = lastNumber(called(netcdf, "set_default_format", 1).results);
    called(netcdf, "set_default_format", format);
    return format == 3 || format == 4;
}

/// An operation's name as the module reads it.
std::string lowered(std::string text) {
    text.resize(std::min(text.size(), text.find('\0')));
    for (char &c : text) {
        c = c >= 'A' && c <= 'Z' ? static_cast<char>(c + ('a' - 'A')) : c;
    }
    return text;
}

bool opensFile(std::string_view operation) {
    return operation.ends_with("open") || operation.ends_with("create");
}

/// Whether a step keeps a file in memory. There is no full disk, and the library fills variables
/// there a block at a time, each of which moves all that is there: minutes for some MiB. Where it
/// maps the memory, it does not look whether there is more.
bool keepsInMemory(const Step &step) {
    constexpr unsigned flags = 0x8 | 0x10 | 0x8000;
    return opensFile(lowered(step.operation)) && step.inputs.size() > 1 &&
           !step.inputs[1].elements.empty() &&
           (static_cast<unsigned>(nearest<std::int32_t>(step.inputs[1].elements[0])) & flags) != 0;
}

bool isAbove(const Array &size, double most) {
    return size.size() > 0 && (size.classID() != tsDOUBLE || size.number() > most);
}

/// Whether a call may make a file longer than some thousand values.
bool needsMuch(std::string_view operation, const std::vector<Array> &inputs) {
    constexpr std::size_t mostDimensions = 4;
    constexpr double mostLength = 8;
    constexpr double mostRoom = 4096;
    if (operation.ends_with("def_var")) {
        return inputs.size() > 4 && inputs[4].size() > mostDimensions;
    }
    if (operation.ends_with("_enddef")) {
        return inputs.size() > 2 && // behind the dataset
               std::any_of(inputs.begin() + 2, inputs.end(),
                           [](const Array &size) { return isAbove(size, mostRoom); });
    }
    return operation.ends_with("def_dim") && inputs.size() > 3 && isAbove(inputs[3], mostLength);
}

/// One run: what it opened, so that calls can name it, and that all of it is ended.
class Session {
  public:
    Session(const tessel::Module &module, const Sequence &sequence)
        : netcdf(module), inMemory(std::any_of(sequence.begin(), sequence.end(), keepsInMemory)) {}

    /// Makes a call, and says what came of it.
    std::string call(const Step &step) {
        std::vector<Array> held;
        held.push_back(arrayOf(characters(step.operation)));
        for (const Value &value : step.inputs) {
            held.push_back(value.kind == Value::Kind::dataset ? Array::scalar(idOf(value.slot))
                                                              : arrayOf(value));
        }
        const std::string name = lowered(step.operation);
        const bool opens = opensFile(name);
        if (opens && held.size() > 1) {
            keepInFolder(held[1]);
        }
        if (asksForHdf5(name, held, hdf5ByDefault) || (inMemory && needsMuch(name, held))) {
            return "left out";
        }
        std::vector<const tsArray *> inputs(held.size());
        std::transform(held.begin(), held.end(), inputs.begin(),
                       [](const Array &array) { return array.get(); });
        const Outcome outcome = calledWith(netcdf, inputs, step.outputs);
        std::string came = outcome.identifier.empty()
                               ? name + std::to_string(outcome.results.size())
                               : outcome.identifier;
        note(came);
        noteEnd(name, came);
        if (name.ends_with("set_default_format")) {
            changesFormat = true;
            hdf5ByDefault = isHdf5TheDefault(netcdf);
        }
        if (opens && outcome.identifier.empty()) {
            opened.push_back(lastNumber(outcome.results));
        }
        return came;
    }

    /// Ends all datasets, the ones that the disk is too full for once there is room again. What is
    /// left are the files of those that a failed abort has ended half, which the library forgets.
    Scratch::Left end() {
        for (const int ncid : opened) {
            std::string identifier = called(netcdf, "abort", ncid).identifier;
            if (isGone(identifier)) {
                continue;
            }
            note("end" + identifier);
            noteEnd("abort", identifier);
            Scratch::setFull(false);
            identifier.append(1, ' ').append(called(netcdf, "close", ncid).identifier);
            Scratch::setFull(true);
            const std::string after = called(netcdf, "inq", ncid).identifier;
            if (after.empty() || !isGone(after)) {
                die("a dataset is still there after its end: " +
                    identifier.append(" ").append(after));
            }
        }
        if (changesFormat) {
            called(netcdf, "set_default_format", 1);
        }
        return left;
    }

  private:
    static bool isGone(std::string_view identifier) {
        return identifier.empty() || identifier.ends_with(":notNetcdfID");
    }

    /// An abort in data mode forgets the dataset and not its file, when there is no room for the
    /// header.
    void noteEnd(std::string_view operation, std::string_view identifier) {
        if (operation.ends_with("abort") && identifier.ends_with(":fileTooLarge")) {
            left = Scratch::Left::files;
        }
    }

    [[nodiscard]] int idOf(std::size_t slot) const {
        constexpr int noDataset = 7;
        return opened.empty() ? noDataset : opened[slot % opened.size()];
    }

    const tessel::Module &netcdf;
    bool inMemory; // one of the files
    std::vector<int> opened;
    Scratch::Left left = Scratch::Left::nothing;
    bool changesFormat = false;
    bool hdf5ByDefault = false;
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
    fuzz::Session session(netcdf, sequence);
    for (const fuzz::Step &step : sequence) {
        if (shows) {
            std::cerr << fuzz::printed({step}) << std::flush;
        }
        const std::string came = session.call(step);
        if (shows) {
            std::cerr << "  " << came << std::endl;
        }
    }
    const fuzz::Scratch::Left left = session.end();
    fuzz::Scratch::setFull(false);
    scratch.clean(left);
    return 0;
}
