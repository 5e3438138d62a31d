// tests/support/value.cpp: arguments and expected results, as a row writes them down.
#include "support/value.hpp"

#include "support/scene.hpp"

#include <netcdf.h>

#include <algorithm>
#include <cstdint>
#include <cstring>

namespace tessel::test {
namespace {

template <class T>
Array filled(tsClassID classID, const std::vector<T> &values, bool complex = false) {
    const std::array<std::size_t, 2> dims = {1, values.size()};
    Array array = classID == tsCHAR      ? Array::characters(dims)
                  : classID == tsLOGICAL ? Array::logical(dims)
                                         : Array::numeric(classID, dims, complex);
    std::copy(values.begin(), values.end(), array.elements<T>().begin());
    return array;
}

template <class T>
Value row(tsClassID classID, std::vector<T> values) {
    return {[=](const Scene &) { return filled<T>(classID, values); }};
}

template <class T>
Array wholesAs(tsClassID classID, const std::vector<int> &values) {
    std::vector<T> converted;
    std::transform(values.begin(), values.end(), std::back_inserter(converted),
                   [](int value) { return static_cast<T>(value); });
    return filled(classID, converted);
}

Array wholesOf(tsClassID classID, const std::vector<int> &values) {
    switch (classID) {
    case tsDOUBLE:
        return wholesAs<double>(classID, values);
    case tsSINGLE:
        return wholesAs<float>(classID, values);
    case tsINT8:
    case tsUINT8:
        return wholesAs<std::int8_t>(classID, values);
    case tsINT16:
    case tsUINT16:
    case tsCHAR:
        return wholesAs<std::uint16_t>(classID, values);
    case tsINT32:
    case tsUINT32:
        return wholesAs<std::int32_t>(classID, values);
    default:
        return wholesAs<std::int64_t>(classID, values);
    }
}

Array emptyArray(tsClassID classID, Dims dims) {
    switch (classID) {
    case tsCHAR:
        return Array::characters(dims);
    case tsLOGICAL:
        return Array::logical(dims);
    case tsCELL:
        return Array::cell(dims);
    case tsSTRUCT:
        return Array::structure(dims, {"field"});
    case tsUNKNOWN:
        return Array::unknown(dims);
    default:
        return Array::numeric(classID, dims);
    }
}

constexpr std::array<std::size_t, 2> one = {1, 1};

} // namespace

Value::Value(double number) : recipe([=](const Scene &) { return Array::scalar(number); }) {}
Value::Value(const char *utf8) : Value(chars(utf8)) {}

Value doubles(std::initializer_list<double> values) {
    return row<double>(tsDOUBLE, values);
}
Value singles(std::initializer_list<float> values) {
    return row<float>(tsSINGLE, values);
}
Value int8s(std::initializer_list<std::int8_t> values) {
    return row<std::int8_t>(tsINT8, values);
}
Value uint8s(std::initializer_list<std::uint8_t> values) {
    return row<std::uint8_t>(tsUINT8, values);
}
Value int16s(std::initializer_list<std::int16_t> values) {
    return row<std::int16_t>(tsINT16, values);
}
Value uint16s(std::initializer_list<std::uint16_t> values) {
    return row<std::uint16_t>(tsUINT16, values);
}
Value int32s(std::initializer_list<std::int32_t> values) {
    return row<std::int32_t>(tsINT32, values);
}
Value uint32s(std::initializer_list<std::uint32_t> values) {
    return row<std::uint32_t>(tsUINT32, values);
}
Value int64s(std::initializer_list<std::int64_t> values) {
    return row<std::int64_t>(tsINT64, values);
}
Value uint64s(std::initializer_list<std::uint64_t> values) {
    return row<std::uint64_t>(tsUINT64, values);
}
Value logicals(std::initializer_list<bool> values) {
    return row<std::uint8_t>(tsLOGICAL, {values.begin(), values.end()});
}

Value codes(std::initializer_list<tsChar> values) {
    return row<tsChar>(tsCHAR, values);
}
Value chars(std::string_view utf8) {
    return {[text = std::string(utf8)](const Scene &) { return Array::text(text); }};
}

Value wholes(tsClassID classID, const std::vector<int> &values) {
    return {[=](const Scene &) { return wholesOf(classID, values); }};
}

Value shaped(const std::vector<std::size_t> &dims, const Value &value) {
    return {[=](const Scene &scene) {
        const Array from = value.make(scene);
        Array to = emptyArray(from.classID(), dims);
        std::memcpy(to.data(), from.data(), from.size() * elementSize(from.classID()));
        return to;
    }};
}

Value empty(tsClassID classID, const std::vector<std::size_t> &dims) {
    return {[=](const Scene &) { return emptyArray(classID, dims); }};
}

Value complexDoubles(std::initializer_list<double> reals) {
    return {[values = std::vector(reals)](const Scene &) {
        Array array = filled<double>(tsDOUBLE, values, true);
        std::fill_n(static_cast<double *>(array.imaginary()), values.size(), 7.0);
        return array;
    }};
}
Value complexDouble(double real) {
    return complexDoubles({real});
}

Value cell(const Values &values) {
    return {[=](const Scene &scene) {
        const std::array<std::size_t, 2> dims = {std::max<std::size_t>(values.size(), 1), 1};
        Array array = Array::cell(dims);
        for (std::size_t i = 0; i < values.size(); ++i) {
            array.setCell(i, values[i].make(scene));
        }
        return array;
    }};
}
Value structure() {
    return {[](const Scene &) { return Array::structure(one, {"field"}); }};
}
Value function() {
    return {[](const Scene &) { return Array::function("sin"); }};
}
Value unknown() {
    return {[](const Scene &) { return Array::unknown(one); }};
}

const Value ncid = {[](const Scene &scene) { return Array::scalar(scene.ncid()); }};
const Value other = {[](const Scene &scene) { return Array::scalar(scene.otherNcid()); }};
const Value opened = {[](const Scene &scene) { return Array::scalar(scene.openedByCall()); }};

Value varid(const std::string &name) {
    return {[=](const Scene &scene) {
        int id = 0;
        want(nc_inq_varid(scene.ncid(), name.c_str(), &id));
        return Array::scalar(id);
    }};
}
Value dimid(const std::string &name) {
    return {[=](const Scene &scene) {
        int id = 0;
        want(nc_inq_dimid(scene.ncid(), name.c_str(), &id));
        return Array::scalar(id);
    }};
}
Value file(const std::string &name) {
    return {[=](const Scene &scene) { return Array::text(scene.path(name)); }};
}

const Value libraryVersion = {[](const Scene &) { return Array::text(nc_inq_libvers()); }};

} // namespace tessel::test
