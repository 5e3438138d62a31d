// tests/fuzz/files.cpp: any bytes as a file, which is opened and read to the last value by every
// family. What it claims may be refused, but does no harm.
#include "guarded.hpp"

#include <unistd.h>

#include <algorithm>
#include <array>
#include <cmath>
#include <cstdint>
#include <string>
#include <vector>

namespace fuzz {
namespace {

using tessel::Array;

constexpr std::array families = {"double", "float", "int", "short", "schar", "uchar", "text"};

/// More than this is not read at once, so that an execution stays short.
constexpr double mostElements = 1U << 14U;
constexpr int mostEntries = 40;
constexpr std::size_t mostDimensions = 16;

constexpr int global = -1;

std::vector<double> numbersOf(const Array &array) {
    const auto elements = array.elements<double>();
    return {elements.begin(), elements.end()};
}

Array rowOf(const std::vector<double> &values) {
    Array array = Array::numeric(tsDOUBLE, std::array<std::size_t, 2>{1, values.size()});
    std::copy(values.begin(), values.end(), array.elements<double>().begin());
    return array;
}

class Reader {
  public:
    Reader(const tessel::Module &module, int opened) : netcdf(module), ncid(opened) {}

    void read() {
        const Outcome all = call("inq");
        if (!all.identifier.empty()) {
            die("an open dataset says nothing of itself: " + all.identifier);
        }
        const int dimensions = std::min(numberOf(all, 0), mostEntries);
        const int variables = std::min(numberOf(all, 1), mostEntries);
        for (int dimid = 0; dimid < dimensions; ++dimid) {
            dimension(dimid);
        }
        attributes(global, numberOf(all, 2));
        for (int varid = 0; varid < variables; ++varid) {
            variable(varid);
        }
    }

  private:
    template <class... Arguments>
    Outcome call(const std::string &operation, const Arguments &...arguments) const {
        Outcome outcome = called(netcdf, operation, ncid, arguments...);
        note(outcome.identifier.empty() ? operation : outcome.identifier);
        return outcome;
    }

    static int numberOf(const Outcome &outcome, std::size_t place) {
        return static_cast<int>(outcome.results[place].number());
    }

    void dimension(int dimid) {
        const Outcome found = call("inq_dim", dimid);
        lengths.push_back(found.identifier.empty() ? found.results[1].number() : 0);
        if (found.identifier.empty()) {
            call("inq_dimid", found.results[0]);
        }
    }

    void attributes(int varid, int count) const {
        for (int i = 0; i < std::min(count, mostEntries); ++i) {
            const Outcome found = call("inq_attname", varid, i);
            if (!found.identifier.empty()) {
                continue;
            }
            const Array &name = found.results[0];
            call("inq_att", varid, name);
            call("inq_attid", varid, name);
            for (const char *family : families) {
                call(std::string("get_att_") + family, varid, name);
            }
        }
    }

    void variable(int varid) const {
        const Outcome found = call("inq_var", varid);
        if (!found.identifier.empty()) {
            return;
        }
        call("inq_varid", found.results[0]);
        attributes(varid, numberOf(found, found.results.size() - 1));
        std::vector<double> shape;
        double elements = 1;
        for (const double dimid : numbersOf(found.results[2])) {
            const auto place = static_cast<std::size_t>(dimid);
            shape.push_back(dimid >= 0 && place < lengths.size() ? lengths[place] : 1);
            elements *= shape.back();
        }
        if (shape.size() <= mostDimensions) {
            data(varid, shape, elements);
        }
    }

    void data(int varid, const std::vector<double> &shape, double elements) const {
        std::vector<double> last = shape;
        std::vector<double> halves = shape;
        std::for_each(last.begin(), last.end(), [](double &n) { n = std::max(n - 1, 0.0); });
        std::for_each(halves.begin(), halves.end(), [](double &n) { n = std::floor((n + 1) / 2); });
        std::vector<double> middle = shape;
        std::for_each(middle.begin(), middle.end(), [](double &n) { n = std::floor(n / 2); });
        const std::vector<double> zeros(shape.size(), 0);
        const std::vector<double> ones(shape.size(), 1);
        const std::vector<double> twos(shape.size(), 2);
        for (const char *family : families) {
            const auto get = [&](const char *part) { return std::string(part) + family; };
            call(get("get_var1_"), varid, rowOf(zeros));
            call(get("get_var1_"), varid, rowOf(last));
            call(get("get_var1_"), varid, rowOf(middle));
            call(get("get_vara_"), varid, rowOf(last), rowOf(ones));
            if (elements <= mostElements) {
                call(get("get_var_"), varid);
                call(get("get_vara_"), varid, rowOf(zeros), rowOf(shape));
                call(get("get_vars_"), varid, rowOf(zeros), rowOf(halves), rowOf(twos));
            }
        }
    }

    const tessel::Module &netcdf;
    int ncid;
    std::vector<double> lengths; // of the dimensions
};

/// The module, with a dataset that stays open, outside of the folder. Without one the library gives
/// up the table of its ids, 512 KiB, when a file is closed, and takes it anew for the next: an
/// eighth of the time.
tessel::Module moduleInUse() {
    tessel::Module netcdf = guardedModule();
    constexpr const char *file = "../stays.nc";
    if (const Outcome made = called(netcdf, "create", file, "CLOBBER"); !made.identifier.empty()) {
        die("cannot make a file: " + made.identifier);
    }
    unlink(file);
    return netcdf;
}

} // namespace
} // namespace fuzz

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size) {
    static const fuzz::Scratch scratch;
    static const tessel::Module netcdf = fuzz::moduleInUse();
    constexpr const char *file = "a.nc";
    fuzz::Scratch::write(file, {data, size});
    const fuzz::Outcome opened = fuzz::called(netcdf, "open", file, "NOWRITE");
    fuzz::note(opened.identifier);
    if (opened.identifier.empty()) {
        const int ncid = fuzz::lastNumber(opened.results);
        fuzz::Reader(netcdf, ncid).read();
        if (const auto closed = fuzz::called(netcdf, "close", ncid); !closed.identifier.empty()) {
            fuzz::die("a dataset that was only read cannot be closed: " + closed.identifier);
        }
    }
    scratch.clean();
    return 0;
}
