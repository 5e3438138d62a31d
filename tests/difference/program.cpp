// tests/difference/program.cpp: making values, and writing programs down.
#include "program.hpp"

#include <algorithm>
#include <array>
#include <cmath>
#include <cstdio>
#include <ostream>

namespace difference {
namespace {

constexpr std::array<const char *, 16> enumerators = {
    "tsUNKNOWN", "tsCELL",  "tsSTRUCT", "tsLOGICAL", "tsCHAR",   "tsDOUBLE",
    "tsSINGLE",  "tsINT8",  "tsUINT8",  "tsINT16",   "tsUINT16", "tsINT32",
    "tsUINT32",  "tsINT64", "tsUINT64", "tsFUNCTION"};

std::string literal(double value) {
    if (std::isnan(value)) {
        return "NAN";
    }
    if (std::isinf(value)) {
        return value > 0 ? "INFINITY" : "-INFINITY";
    }
    if (value == 0.0 && std::signbit(value)) {
        return "-0.0";
    }
    std::array<char, 32> room{};
    std::snprintf(room.data(), room.size(), "%.17g", value);
    return room.data();
}

bool isPlain(double unit) {
    return unit >= ' ' && unit <= '~';
}

std::string quoted(std::string_view ascii) {
    std::string out = "\"";
    for (const char c : ascii) {
        if (c == '"' || c == '\\') {
            out += '\\';
        }
        out += c;
    }
    return out + '"';
}

template <class T, class Write>
std::string braced(const std::vector<T> &list, const Write &write) {
    std::string out = "{";
    for (std::size_t i = 0; i < list.size(); ++i) {
        out += (i == 0 ? "" : ", ") + write(list[i]);
    }
    return out + "}";
}

bool isRow(const Value &value) {
    return value.dims.size() == 2 && value.dims[0] == 1;
}

} // namespace

Value num(double value) {
    return of(tsDOUBLE, {value});
}

Value row(std::vector<double> values) {
    return of(tsDOUBLE, std::move(values));
}

Value of(tsClassID classID, std::vector<double> values) {
    std::vector<std::size_t> dims = {1, values.size()};
    return of(classID, std::move(dims), std::move(values));
}

Value of(tsClassID classID, std::vector<std::size_t> dims, std::vector<double> values) {
    return {Value::Kind::array, classID, std::move(dims), std::move(values), 0};
}

Value text(std::string_view ascii) {
    return of(tsCHAR, std::vector<double>(ascii.begin(), ascii.end()));
}

Value characters(std::u16string_view units) {
    return of(tsCHAR, std::vector<double>(units.begin(), units.end()));
}

Value file(std::size_t slot) {
    return {Value::Kind::file, tsCHAR, {}, {}, slot};
}

Value dataset(std::size_t slot) {
    return {Value::Kind::dataset, tsDOUBLE, {}, {}, slot};
}

std::ostream &operator<<(std::ostream &out, const Value &value) {
    if (!value.isArray()) {
        return out << (value.kind == Value::Kind::file ? "file(" : "dataset(") << value.slot << ')';
    }
    if (isRow(value) && value.classID == tsCHAR &&
        std::all_of(value.elements.begin(), value.elements.end(), isPlain)) {
        std::string ascii(value.elements.size(), ' ');
        std::transform(value.elements.begin(), value.elements.end(), ascii.begin(),
                       [](double unit) { return static_cast<char>(unit); });
        return out << "text(" << quoted(ascii) << ')';
    }
    if (isRow(value) && value.classID == tsDOUBLE && value.elements.size() == 1) {
        return out << "num(" << literal(value.elements[0]) << ')';
    }
    out << "of(" << enumerators.at(value.classID) << ", ";
    if (!isRow(value)) {
        out << braced(value.dims, [](std::size_t n) { return std::to_string(n); }) << ", ";
    }
    return out << braced(value.elements, literal) << ')';
}

std::ostream &operator<<(std::ostream &out, const Step &step) {
    out << '{' << quoted(step.operation) << ", {";
    for (std::size_t i = 0; i < step.inputs.size(); ++i) {
        out << (i == 0 ? "" : ", ") << step.inputs[i];
    }
    return out << "}}";
}

std::ostream &operator<<(std::ostream &out, const Program &program) {
    out << "{\n";
    for (const Step &step : program) {
        out << "    " << step << ",\n";
    }
    return out << "}";
}

} // namespace difference
