// guard/src/operations.cpp: what a call asks for, as far as the guard wants to know.
#include "operations.hpp"

#include "tessel/array.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <limits>
#include <span>
#include <string_view>
#include <type_traits>

namespace tessel::guard {
namespace {

struct Row {
    std::string_view name;
    Kind kind;
    std::size_t inputs; // with the name of the operation
};

constexpr std::array rows = {
    Row{"open", Kind::open, 3},
    Row{"_open", Kind::open, 4},
    Row{"create", Kind::create, 3},
    Row{"_create", Kind::create, 5},
    Row{"close", Kind::close, 2},
    Row{"abort", Kind::abort, 2},
    Row{"sync", Kind::sync, 2},
    Row{"redef", Kind::redefine, 2},
    Row{"enddef", Kind::endDefinition, 2},
    Row{"end_def", Kind::endDefinition, 2},
    Row{"_enddef", Kind::tunedEndDefinition, 6},
    Row{"def_dim", Kind::defineDimension, 4},
    Row{"def_var", Kind::defineVariable, 5},
    Row{"rename_dim", Kind::rename, 4},
    Row{"rename_var", Kind::rename, 4},
    Row{"rename_att", Kind::renameAttribute, 5},
    Row{"set_fill", Kind::setFill, 3},
    Row{"set_default_format", Kind::setDefaultFormat, 2},
    Row{"copy_att", Kind::copyAttribute, 6},
};

/// The typed families, whose names end with a type; those that do least per call come first.
constexpr std::array families = {
    Row{"put_var1_", Kind::writeElement, 5},  Row{"put_vara_", Kind::writeBlock, 6},
    Row{"put_vars_", Kind::writeStrided, 7},  Row{"put_att_text", Kind::writeAttribute, 5},
    Row{"put_att_", Kind::writeAttribute, 6},
};

struct NamePlace {
    Kind kind;
    std::size_t input;
};

constexpr std::array namePlaces = {
    NamePlace{Kind::defineDimension, 2}, NamePlace{Kind::defineVariable, 2},
    NamePlace{Kind::rename, 3},          NamePlace{Kind::writeAttribute, 3},
    NamePlace{Kind::copyAttribute, 3},   NamePlace{Kind::renameAttribute, 4},
};

constexpr std::string_view longPrefix = "nc_";

using Units = std::span<const tsChar>;

constexpr tsChar lowered(tsChar unit) {
    return unit >= 'A' && unit <= 'Z' ? static_cast<tsChar>(unit + ('a' - 'A')) : unit;
}

constexpr bool startsWith(Units units, std::string_view lower) {
    return units.size() >= lower.size() &&
           std::equal(lower.begin(), lower.end(), units.begin(),
                      [](char letter, tsChar unit) { return lowered(unit) == letter; });
}

/// A name of an operation, lower-cased, up to the first zero. No operation has a longer one.
class Name {
  public:
    explicit Name(Units units) noexcept {
        for (const tsChar unit : units) {
            if (unit == 0) {
                return;
            }
            if (length == text.size() || unit > 0x7F) {
                length = 0;
                return;
            }
            text[length++] = static_cast<char>(lowered(unit));
        }
    }

    [[nodiscard]] std::string_view view() const noexcept { return {text.data(), length}; }

  private:
    std::array<char, 24> text{};
    std::size_t length = 0;
};

template <class Rows, class Matches>
Kind kindIn(const Rows &table, std::size_t inputs, const Matches &matches) {
    const auto *const row = std::find_if(table.begin(), table.end(), matches);
    return row != table.end() && row->inputs == inputs ? row->kind : Kind::other;
}

/// A number as 64 bits, a negative one wrapped around; what does not fit is 2^63, as it is for the
/// module. Nothing for an infinite or NaN double, which the module refuses.
template <class T>
std::optional<std::uint64_t> wrapped(const tsArray *array, std::size_t i) {
    const T value = static_cast<const T *>(tsGetData(array))[i];
    if constexpr (std::is_floating_point_v<T>) {
        constexpr T half = 0x1p63;
        if (std::is_same_v<T, double> && !std::isfinite(value)) {
            return std::nullopt;
        }
        if (value >= 0 && value < 2 * half) {
            return static_cast<std::uint64_t>(value);
        }
        return static_cast<std::uint64_t>(value < 0 && value >= -half
                                              ? static_cast<std::int64_t>(value)
                                              : std::numeric_limits<std::int64_t>::min());
    } else {
        return static_cast<std::uint64_t>(value);
    }
}

/// Nothing for what no int holds.
std::optional<int> truncated(double value) noexcept {
    constexpr double end = 0x1p31;
    return value > -end - 1 && value < end ? std::optional(static_cast<int>(value)) : std::nullopt;
}

struct Reader {
    tsClassID classID;
    std::optional<std::uint64_t> (*read)(const tsArray *, std::size_t);
};

constexpr std::array readers = {
    Reader{tsDOUBLE, wrapped<double>},      Reader{tsSINGLE, wrapped<float>},
    Reader{tsINT8, wrapped<std::int8_t>},   Reader{tsUINT8, wrapped<std::uint8_t>},
    Reader{tsINT16, wrapped<std::int16_t>}, Reader{tsUINT16, wrapped<std::uint16_t>},
    Reader{tsINT32, wrapped<std::int32_t>}, Reader{tsUINT32, wrapped<std::uint32_t>},
    Reader{tsINT64, wrapped<std::int64_t>}, Reader{tsUINT64, wrapped<std::uint64_t>},
};

/// nullptr for what is no number, or none at all.
const Reader *readerOf(const tsArray *input) {
    const tsClassID found = tsGetClassID(input);
    const auto *const reader = std::find_if(
        readers.begin(), readers.end(), [&](const Reader &row) { return row.classID == found; });
    return reader == readers.end() || tsIsEmpty(input) ? nullptr : &*reader;
}

} // namespace

Kind kindOf(Inputs inputs) {
    if (inputs.empty() || tsGetClassID(inputs[0]) != tsCHAR) {
        return Kind::other;
    }
    Units units(static_cast<const tsChar *>(tsGetData(inputs[0])),
                tsGetNumberOfElements(inputs[0]));
    if (startsWith(units, longPrefix)) {
        units = units.subspan(longPrefix.size());
    }
    // Nearly all calls read or inquire.
    if (startsWith(units, "get_") || startsWith(units, "inq")) {
        return Kind::other;
    }
    if (startsWith(units, "put_")) {
        return kindIn(families, inputs.size(),
                      [&](const Row &row) { return startsWith(units, row.name); });
    }
    const Name name(units);
    return kindIn(rows, inputs.size(), [&](const Row &row) { return row.name == name.view(); });
}

std::optional<std::size_t> placeOfNewName(Kind kind) noexcept {
    const auto *const found =
        std::find_if(namePlaces.begin(), namePlaces.end(),
                     [&](const NamePlace &place) { return place.kind == kind; });
    return found == namePlaces.end() ? std::nullopt : std::optional(found->input);
}

std::optional<int> integer(const tsArray *input) {
    const tsClassID found = tsGetClassID(input);
    if (tsIsEmpty(input) || (found != tsDOUBLE && found != tsINT32)) {
        return std::nullopt;
    }
    if (found == tsINT32) {
        return *static_cast<const std::int32_t *>(tsGetData(input));
    }
    return truncated(*static_cast<const double *>(tsGetData(input)));
}

std::optional<int> code(const tsArray *input) {
    const tsClassID found = tsGetClassID(input);
    if (tsIsEmpty(input) || (found != tsDOUBLE && found != tsINT32)) {
        return std::nullopt;
    }
    const std::size_t width = found == tsDOUBLE ? sizeof(double) : sizeof(std::int32_t);
    double value = 0;
    std::memcpy(&value, tsGetData(input),
                std::min(sizeof(value), width * tsGetNumberOfElements(input)));
    return truncated(value);
}

std::optional<std::uint64_t> size(const tsArray *input) {
    const Reader *const reader = readerOf(input);
    return reader != nullptr ? reader->read(input, 0) : std::nullopt;
}

std::optional<Indices> indices(const tsArray *input) {
    const Reader *const reader = readerOf(input);
    if (reader == nullptr) {
        return std::nullopt;
    }
    const std::size_t n = tsGetNumberOfElements(input);
    Indices values(n);
    for (std::size_t i = 0; i < n; ++i) {
        const auto value = reader->read(input, i);
        if (!value) {
            return std::nullopt;
        }
        values[n - 1 - i] = *value;
    }
    return values;
}

std::optional<std::string> text(const tsArray *input) {
    if (tsGetClassID(input) != tsCHAR) {
        return std::nullopt;
    }
    std::string name = utf8Of(input);
    name.resize(std::min(name.size(), name.find('\0')));
    return name;
}

} // namespace tessel::guard
