// tests/cost/calls.cpp: a fixed set of calls, each of them marked for callgrind (cost.py counts).
#include "gateway/lookup.hpp"
#include "gateway/operation_table.hpp"
#include "support/process.hpp"
#include "tessel/netcdf_guard.hpp"
#include "tessel/runtime.hpp"

#include <netcdf.h>

#include <algorithm>
#include <array>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <functional>
#include <stdexcept>
#include <string>
#include <utility>

extern "C" {
void costBegins();
void costEnds(const char *name);
}

namespace {

using namespace tessel;

/// So that the heap has its size, and every function of the library is found.
constexpr int unmeasured = 10;

/// The same calls over and over cost the same; what they differ by at first is lost in so many.
constexpr int measured = 50;

void measure(const char *name, const std::function<void()> &work) {
    for (int i = 0; i < unmeasured; ++i) {
        work();
    }
    costBegins();
    for (int i = 0; i < measured; ++i) {
        work();
    }
    costEnds(name);
}

Array arrayOf(Array array) {
    return array;
}
Array arrayOf(double number) {
    return Array::scalar(number);
}
Array arrayOf(const char *text) {
    return Array::text(text);
}

enum class Ends { well, withError };

/// A call with inputs that are made once, as a program's loop would have them.
template <class... Arguments>
void measureCall(const char *name, Ends ends, const Module &module, Arguments &&...arguments) {
    const std::array<Array, sizeof...(Arguments)> held{
        arrayOf(std::forward<Arguments>(arguments))...};
    std::array<const tsArray *, sizeof...(Arguments)> inputs{};
    std::transform(held.begin(), held.end(), inputs.begin(),
                   [](const Array &array) { return array.get(); });
    measure(name, [&] {
        bool raised = false;
        try {
            module.call(inputs);
        } catch (const Error &) {
            raised = true;
        }
        if (raised != (ends == Ends::withError)) {
            throw std::runtime_error(std::string(name).append(" ends in another way"));
        }
    });
}

Array ten() {
    return Array::row({1, 2, 3, 4, 5, 6, 7, 8, 9, 10});
}

/// A dataset in data mode: numbers and text of ten records of ten, and attributes.
struct Dataset {
    explicit Dataset(const Module &netcdf, const std::string &file)
        : ncid(netcdf("create", file, "CLOBBER")[0].number()) {
        const double x = netcdf("def_dim", ncid, "x", 10)[0].number();
        const double y = netcdf("def_dim", ncid, "y", 10)[0].number();
        const Array dims = Array::row({x, y});
        numbers = netcdf("def_var", ncid, "numbers", NC_DOUBLE, dims)[0].number();
        text = netcdf("def_var", ncid, "text", NC_CHAR, dims)[0].number();
        row = netcdf("def_var", ncid, "row", NC_DOUBLE, Array::row({x}))[0].number();
        netcdf("put_att_text", ncid, numbers, "units", "metres per second");
        netcdf("put_att_double", ncid, numbers, "range", NC_DOUBLE, ten());
        netcdf("enddef", ncid);
        netcdf("put_var_double", ncid, row, ten());
    }

    double ncid;
    double numbers = 0;
    double text = 0;
    double row = 0; ///< ten numbers
};

void measureLookup() {
    std::array<char, 64> name{};
    measure("lookup of every name", [&] {
        for (const netcdf::OperationEntry &entry : netcdf::operationTable) {
            for (const char *each : {entry.longName, entry.shortName}) {
                std::memcpy(name.data(), each, std::strlen(each) + 1);
                netcdf::findOperation(name.data());
            }
        }
    });
}

void measureInquiries(const Module &netcdf, const Dataset &data) {
    const double ncid = data.ncid;
    measureCall("inq_libvers", Ends::well, netcdf, "inq_libvers");
    measureCall("parameter", Ends::well, netcdf, "parameter", "NC_GLOBAL");
    measureCall("inq", Ends::well, netcdf, "inq", ncid);
    measureCall("inq_dim", Ends::well, netcdf, "inq_dim", ncid, 0);
    measureCall("inq_varid", Ends::well, netcdf, "inq_varid", ncid, "numbers");
    measureCall("inq_var", Ends::well, netcdf, "inq_var", ncid, data.numbers);
    measureCall("inq_att", Ends::well, netcdf, "inq_att", ncid, data.numbers, "units");
    measureCall("inq_attname", Ends::well, netcdf, "inq_attname", ncid, data.numbers, 0);
    measure("inq_varid, inputs made", [&] { netcdf("inq_varid", ncid, "numbers"); });
}

void measureReads(const Module &netcdf, const Dataset &data) {
    const double ncid = data.ncid;
    const auto start = [] { return Array::row({0, 3}); };
    const auto count = [] { return Array::row({10, 1}); };
    measureCall("get_var_double of 10", Ends::well, netcdf, "get_var_double", ncid, data.row);
    measureCall("get_var1_double", Ends::well, netcdf, "get_var1_double", ncid, data.numbers,
                start());
    measureCall("get_vara_double of 10", Ends::well, netcdf, "get_vara_double", ncid, data.numbers,
                start(), count());
    measureCall("get_vars_double of 10", Ends::well, netcdf, "get_vars_double", ncid, data.numbers,
                start(), count(), Array::row({1, 1}));
    measureCall("get_vara_text of 10", Ends::well, netcdf, "get_vara_text", ncid, data.text,
                start(), count());
    measureCall("get_vars_text of 10", Ends::well, netcdf, "get_vars_text", ncid, data.text,
                start(), count(), Array::row({1, 1}));
    measureCall("get_att_double of 10", Ends::well, netcdf, "get_att_double", ncid, data.numbers,
                "range");
    measureCall("get_att_text", Ends::well, netcdf, "get_att_text", ncid, data.numbers, "units");
}

void measureWrites(const Module &netcdf, const Dataset &data) {
    const double ncid = data.ncid;
    const auto start = [] { return Array::row({0, 3}); };
    const auto count = [] { return Array::row({10, 1}); };
    measureCall("put_var_double of 10", Ends::well, netcdf, "put_var_double", ncid, data.row,
                ten());
    measureCall("put_var1_double", Ends::well, netcdf, "put_var1_double", ncid, data.numbers,
                start(), 1.5);
    measureCall("put_vara_double of 10", Ends::well, netcdf, "put_vara_double", ncid, data.numbers,
                start(), count(), ten());
    measureCall("put_vars_double of 10", Ends::well, netcdf, "put_vars_double", ncid, data.numbers,
                start(), count(), Array::row({1, 1}), ten());
    measureCall("put_vara_text of 10", Ends::well, netcdf, "put_vara_text", ncid, data.text,
                start(), count(), "ten letter");
    measureCall("put_att_double of 10", Ends::well, netcdf, "put_att_double", ncid, data.numbers,
                "range", NC_DOUBLE, ten());
    measureCall("put_att_text", Ends::well, netcdf, "put_att_text", ncid, data.numbers, "units",
                "miles per an hour");
}

/// Long texts are copied as wide as the compiler's vectors are, and from a mebibyte on past the
/// caches. These end within a vector.
void measureLongTexts(const Module &netcdf, const std::string &file) {
    struct Length {
        const char *name;
        std::size_t characters;
    };
    constexpr std::size_t odd = 11;
    for (const auto &[name, length] : {Length{" of 64 KiB", (std::size_t{1} << 16U) + odd},
                                       Length{" of 1 MiB", (std::size_t{1} << 20U) + odd}}) {
        const double ncid = netcdf("create", file, "CLOBBER")[0].number();
        const auto count = static_cast<double>(length);
        const double x = netcdf("def_dim", ncid, "x", count)[0].number();
        const double text = netcdf("def_var", ncid, "text", NC_CHAR, x)[0].number();
        const Array characters = Array::text(std::string(length, 'x'));
        netcdf("put_att_text", ncid, text, "note", characters);
        netcdf("enddef", ncid);
        const auto measureText = [&, of = name](const char *what, const auto &...arguments) {
            measure(std::string(what).append(of).c_str(),
                    [&] { netcdf(what, ncid, text, arguments...); });
        };
        measureText("put_vara_text", 0, count, characters);
        measureText("get_vara_text", 0, count);
        measureText("put_att_text", "note", characters);
        measureText("get_att_text", "note");
        netcdf("close", ncid);
    }
}

/// Calls that cannot be made over and over with the same inputs.
void measureDefinitions(const Module &netcdf, const std::string &file) {
    const double ncid = netcdf("create", file, "CLOBBER")[0].number();
    const double x = netcdf("def_dim", ncid, "x", 10)[0].number();
    std::string name = "vA";
    measure("def_var, inputs made", [&] {
        netcdf("def_var", ncid, name, NC_DOUBLE, x);
        ++name.back(); // none of the characters that follow is refused in a name
    });
    netcdf("close", ncid);
    measure("open and close, inputs made",
            [&] { netcdf("close", netcdf("open", file, "NOWRITE")[0]); });
}

void measureErrors(const Module &netcdf, const Dataset &data) {
    measureCall("error of the module: no such operation", Ends::withError, netcdf, "get_nothing");
    measureCall("error of the library: no such variable", Ends::withError, netcdf, "inq_varid",
                data.ncid, "nothing");
}

/// The guard knows the dataset, which was made through it.
void measureGuarded(const Module &guarded, const Dataset &data) {
    measureCall("get_var1_double, guarded", Ends::well, guarded, "get_var1_double", data.ncid,
                data.numbers, Array::row({0, 3}));
    measureCall("put_vara_double of 10, guarded", Ends::well, guarded, "put_vara_double", data.ncid,
                data.numbers, Array::row({0, 3}), Array::row({10, 1}), ten());
}

/// How many variables there are besides does not count: not for the module, and not for the guard.
void measureAmongMany(const Module &netcdf, const Module &guarded, const std::string &file) {
    const double ncid = guarded("create", file, "CLOBBER")[0].number();
    const double x = guarded("def_dim", ncid, "x", 10)[0].number();
    double last = 0;
    for (int i = 0; i < 8000; ++i) {
        last = guarded("def_var", ncid, std::string("v").append(std::to_string(i)), NC_DOUBLE, x)[0]
                   .number();
    }
    guarded("enddef", ncid);
    measureCall("inq_varid, of 8000", Ends::well, netcdf, "inq_varid", ncid, "v7999");
    measureCall("put_var1_double, of 8000", Ends::well, netcdf, "put_var1_double", ncid, last, 3,
                1.5);
    measureCall("put_var1_double, of 8000, guarded", Ends::well, guarded, "put_var1_double", ncid,
                last, 3, 1.5);
    guarded("close", ncid);
}

} // namespace

int main() try {
    const test::Folder folder;
    std::filesystem::current_path(folder.folder()); // a file's name is as long everywhere
    const Module netcdf(TESSEL_NETCDF_MODULE);
    const Dataset data(netcdf, "calls.nc");
    measureLookup();
    measureInquiries(netcdf, data);
    measureReads(netcdf, data);
    measureWrites(netcdf, data);
    measureLongTexts(netcdf, "long.nc");
    measureDefinitions(netcdf, "definitions.nc");
    measureErrors(netcdf, data);
    const Module guarded = netcdf.watchedBy(netcdfGuard({}));
    const Dataset known(guarded, "guarded.nc");
    measureGuarded(guarded, known);
    measureAmongMany(netcdf, guarded, "many.nc");
    netcdf("close", data.ncid);
    guarded("close", known.ncid);
    std::printf("times=%d\n", measured);
    return 0;
} catch (const std::exception &error) {
    std::fprintf(stderr, "cost_calls: %s\n", error.what());
    return 1;
}
