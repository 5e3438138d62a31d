// tests/support/sample.cpp: the sample dataset.
#include "support/sample.hpp"

#include "support/scene.hpp"

#include <netcdf.h>

#include <array>
#include <cmath>
#include <limits>
#include <string_view>
#include <vector>

namespace tessel::test {
namespace {

struct Dimension {
    const char *name;
    std::size_t length;
};

constexpr auto dimensions = std::to_array<Dimension>({
    {"t", NC_UNLIMITED},
    {"y", 3},
    {"x", 4},
    {"five", 5},
    {"ten", 10},
    {"twenty", 20},
});

struct Variable {
    const char *name;
    nc_type type;
    std::vector<const char *> dimensions; ///< slowest first
};

const std::vector<Variable> &variables() {
    // clang-format off
    static const std::vector<Variable> rows = {
        {"height",   NC_DOUBLE, {}},
        {"temp",     NC_FLOAT,  {"t", "y", "x"}},
        {"mask",     NC_BYTE,   {"x"}},
        {"name",     NC_CHAR,   {"y", "ten"}},
        {"level",    NC_SHORT,  {"five"}},
        {"count",    NC_INT,    {"y", "five"}},
        {"grid",     NC_DOUBLE, {"ten", "twenty"}},
        {"time",     NC_DOUBLE, {"t"}},
        {"label",    NC_CHAR,   {"five"}},
        {"letter",   NC_CHAR,   {}},
        {"extremes", NC_DOUBLE, {"five"}},
        {"flag",     NC_CHAR,   {"t"}},
    };
    // clang-format on
    return rows;
}

int variableID(int ncid, const char *name) {
    int id = 0;
    want(nc_inq_varid(ncid, name, &id));
    return id;
}

void putText(int ncid, int varid, const char *name, std::string_view text) {
    want(nc_put_att_text(ncid, varid, name, text.size(), text.data()));
}

void defineAttributes(int ncid) {
    putText(ncid, NC_GLOBAL, "title", "Sample");
    const int version = 3;
    want(nc_put_att_int(ncid, NC_GLOBAL, "version", NC_INT, 1, &version));

    const int temp = variableID(ncid, "temp");
    using namespace std::string_view_literals;
    putText(ncid, temp, "units", "kelvin");
    putText(ncid, temp, "cut", "ab\0cd"sv);
    putText(ncid, temp, "blank", "");
    putText(ncid, temp, "accents", "Gr\xC3\xBC\xC3\x9F \xE9"); // UTF-8, and a byte that is not
    const std::array<int, 5> small = {-128, -1, 0, 1, 127};
    want(nc_put_att_int(ncid, temp, "bytes", NC_BYTE, small.size(), small.data()));
    const std::array<int, 5> middle = {-32768, -1, 0, 1, 32767};
    want(nc_put_att_int(ncid, temp, "shorts", NC_SHORT, middle.size(), middle.data()));
    const std::array<int, 5> large = {std::numeric_limits<int>::min(), -1, 0, 1,
                                      std::numeric_limits<int>::max()};
    want(nc_put_att_int(ncid, temp, "ints", NC_INT, large.size(), large.data()));
    const std::array<float, 5> floats = {-1.5F, -0.0F, 0.1F, 1e30F, 2.0F};
    want(nc_put_att_float(ncid, temp, "floats", NC_FLOAT, floats.size(), floats.data()));
    const std::array<double, 5> doubles = {-1.5, -0.0, 0.1, 1e300, 2.0};
    want(nc_put_att_double(ncid, temp, "doubles", NC_DOUBLE, doubles.size(), doubles.data()));
    want(nc_put_att_int(ncid, temp, "fives", NC_SHORT, 5, std::array{1, 2, 3, 4, 5}.data()));
    want(nc_put_att_int(ncid, temp, "none", NC_INT, 0, nullptr));
}

/// Writes a variable whose numbers are their own coordinates, two decimal digits each: 10203 is the
/// element (1, 2, 3).
void writeCoordinates(int ncid, const char *name, const std::vector<std::size_t> &lengths) {
    std::size_t size = 1;
    for (const std::size_t length : lengths) {
        size *= length;
    }
    std::vector<double> values(size);
    for (std::size_t i = 0; i < size; ++i) {
        std::size_t rest = i;
        std::size_t block = size;
        std::size_t number = 0;
        for (const std::size_t length : lengths) {
            block /= length;
            number = number * 100 + rest / block;
            rest %= block;
        }
        values[i] = static_cast<double>(number);
    }
    const std::vector<std::size_t> start(lengths.size());
    want(nc_put_vara_double(ncid, variableID(ncid, name), start.data(), lengths.data(),
                            values.data()));
}

} // namespace

void defineSample(int ncid) {
    for (const Dimension &dimension : dimensions) {
        want(nc_def_dim(ncid, dimension.name, dimension.length, nullptr));
    }
    for (const Variable &variable : variables()) {
        std::vector<int> dimids;
        for (const char *name : variable.dimensions) {
            want(nc_inq_dimid(ncid, name, &dimids.emplace_back()));
        }
        want(nc_def_var(ncid, variable.name, variable.type, static_cast<int>(dimids.size()),
                        dimids.data(), nullptr));
    }
    defineAttributes(ncid);
}

void writeSample(int ncid, std::size_t records) {
    const double height = 1.5;
    want(nc_put_var_double(ncid, variableID(ncid, "height"), &height));
    want(nc_put_var_schar(ncid, variableID(ncid, "mask"),
                          std::array<signed char, 4>{-128, -1, 0, 127}.data()));
    using namespace std::string_view_literals;
    want(nc_put_var_text(ncid, variableID(ncid, "name"),
                         "first     caf\xE9\x80\xFF\x7F\0\0\0third  end"sv.data()));
    want(nc_put_var_text(ncid, variableID(ncid, "label"), "a\0\xE9z!"sv.data()));
    want(nc_put_var_text(ncid, variableID(ncid, "letter"), "Q"));
    constexpr double infinity = std::numeric_limits<double>::infinity();
    want(nc_put_var_double(ncid, variableID(ncid, "extremes"),
                           std::array{std::nan(""), -infinity, 1e300, -0.0, 2.5}.data()));
    writeCoordinates(ncid, "level", {5});
    writeCoordinates(ncid, "count", {3, 5});
    writeCoordinates(ncid, "grid", {10, 20});
    if (records > 0) {
        writeCoordinates(ncid, "temp", {records, 3, 4});
        writeCoordinates(ncid, "time", {records});
        const std::size_t start = 0;
        want(nc_put_vara_text(ncid, variableID(ncid, "flag"), &start, &records, "NY"));
    }
}

} // namespace tessel::test
