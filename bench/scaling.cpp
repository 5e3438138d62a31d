// bench/scaling.cpp: how the cost of a call grows with what there is to do, and with what there is:
// with the size of the data, the number of dimensions, variables, attributes and open datasets.
// What grows for the library's own function as well is the library's.
#include "pairs.hpp"
#include "tessel/netcdf_guard.hpp"
#include "tessel/runtime.hpp"

#include <netcdf.h>

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdio>
#include <list>
#include <memory>
#include <span>
#include <string>
#include <tuple>
#include <type_traits>
#include <utility>
#include <vector>

namespace {

using namespace tessel;
using bench::called;
using bench::check;
using bench::Pair;
using bench::Work;
using Numbers = std::vector<std::size_t>;

/// From so many elements on, one iteration is a measurement, and with more, few of them have to do.
constexpr std::size_t blockElements = 100'000'000;
constexpr int fewRepetitions = 5;

const Numbers sizes = {1,       10,        100,        1'000,       10'000,
                       100'000, 1'000'000, 10'000'000, 100'000'000, 1'000'000'000};
const Numbers textSizes = {1, 10, 100, 1'000, 10'000, 100'000, 1'000'000, 10'000'000};
const Numbers attributeSizes = {1, 10, 100, 1'000, 10'000, 100'000, 1'000'000};
const Numbers dimensionsOfData = {1, 2, 4, 8, 16, 32};
const Numbers dimensionsDefined = {1, 4, 16, 64, 256, 1'024};
const Numbers variables = {1, 10, 100, 1'000, 8'000};
const Numbers attributes = {1, 10, 100, 1'000, 8'000};
const Numbers openDatasets = {1, 10, 100, 500};

/// The measurements, a series at a time.
class Series {
  public:
    void add(const char *what, const char *counted, std::size_t count, Work library, Work module) {
        pairs.push_back({std::string(what) + ", " + counted + ": " + std::to_string(count),
                         std::move(library), std::move(module)});
    }

    /// A read or a write of so many elements.
    void addTransfer(const char *what, std::size_t size, Work library, Work module) {
        add(what, "elements", size, std::move(library), std::move(module));
        Pair &added = pairs.back();
        added.block = size >= blockElements;
        added.repetitions = size > blockElements ? fewRepetitions : bench::usualRepetitions;
        added.group = added.name;
    }

    std::vector<Pair> pairs;
};

std::string numbered(const char *what, std::size_t number) {
    return std::string(what).append(std::to_string(number));
}

/// A dataset that is made for the measurements, and never closed in order.
class Dataset {
  public:
    explicit Dataset(const std::string &file, int mode = 0) {
        check(nc_create(file.c_str(), NC_64BIT_OFFSET | mode, &ncid));
        check(nc_set_fill(ncid, NC_NOFILL, nullptr));
    }
    ~Dataset() { nc_abort(ncid); }
    Dataset(const Dataset &) = delete;
    Dataset &operator=(const Dataset &) = delete;

    [[nodiscard]] int dimension(const std::string &name, std::size_t length) const {
        int dimid = 0;
        check(nc_def_dim(ncid, name.c_str(), length, &dimid));
        return dimid;
    }

    [[nodiscard]] int variable(const std::string &name, nc_type type,
                               const std::vector<int> &dims) const {
        int varid = 0;
        check(nc_def_var(ncid, name.c_str(), type, static_cast<int>(dims.size()), dims.data(),
                         &varid));
        return varid;
    }

    /// An attribute of the dataset, of so many numbers.
    void attribute(const std::string &name, std::size_t size) const {
        check(nc_put_att_double(ncid, NC_GLOBAL, name.c_str(), NC_DOUBLE, size,
                                std::vector<double>(size, 1).data()));
    }

    void endDefinition() const {
        check(nc_enddef(ncid));
        check(nc_sync(ncid));
    }

    int ncid = -1;
};

/// The numbers of a row that are all the same.
Array row(std::size_t length, double value) {
    Array array = Array::numeric(tsDOUBLE, std::array<std::size_t, 2>{1, length});
    const auto numbers = array.elements<double>();
    std::fill(numbers.begin(), numbers.end(), value);
    return array;
}

/// Datasets that stay open until everything is measured. Those with data are files, of which what
/// was never written is a hole.
struct Datasets {
    bench::TemporaryFolder folder;
    std::list<Dataset> all;

    Dataset &file(const std::string &name) { return all.emplace_back(folder.file(name.c_str())); }
    Dataset &inMemory() { return all.emplace_back("in memory", NC_DISKLESS); }
};

// ---- the size of the data -----------------------------------------------------------------------

/// Reads of bytes or of characters, by the library's function for them. The work of a read of text
/// is more than that.
template <class T>
void addReads(Series &series, const Module &netcdf, const Dataset &data, const Numbers &wanted,
              const char *operation, nc_type type, int (*function)(int, int, T *)) {
    for (const std::size_t size : wanted) {
        const int varid =
            data.variable(numbered("v", size), type, {data.dimension(numbered("x", size), size)});
        const auto fill = [&data, varid, function](T *to) {
            return function(data.ncid, varid, to);
        };
        Work library;
        if constexpr (std::is_same_v<T, char>) {
            library = bench::widening({size, 1}, 1, fill);
        } else {
            library = [size, fill] {
                const Array memory = Array::numeric(tsUINT8, std::array<std::size_t, 2>{size, 1});
                check(fill(static_cast<T *>(memory.data())));
            };
        }
        series.addTransfer(
            operation, size, std::move(library),
            called(netcdf, Array::text(operation), Array::scalar(data.ncid), Array::scalar(varid)));
    }
    data.endDefinition();
}

/// Writes likewise, from the host's memory, which for numbers is the library's as well.
template <class T, class Host>
void addWrites(Series &series, const Module &netcdf, const Dataset &data, const Numbers &wanted,
               const char *operation, nc_type type, int (*function)(int, int, const T *),
               tsClassID hostClass) {
    const auto values = std::make_shared<std::vector<Host>>(wanted.back(), 'x');
    for (const std::size_t size : wanted) {
        const int varid =
            data.variable(numbered("v", size), type, {data.dimension(numbered("x", size), size)});
        const auto write = [&data, varid, function](const T *from) {
            return function(data.ncid, varid, from);
        };
        Work library;
        if constexpr (std::is_same_v<T, Host>) {
            library = [values, write] { check(write(values->data())); };
        } else {
            library = bench::narrowing(std::span(*values).first(size), write);
        }
        series.addTransfer(operation, size, std::move(library),
                           called(netcdf, Array::text(operation), Array::scalar(data.ncid),
                                  Array::scalar(varid),
                                  Array::borrowed(hostClass, std::array<std::size_t, 2>{size, 1},
                                                  values->data(), values)));
    }
    data.endDefinition();
}

void addAttributesBySize(Series &series, const Module &netcdf, const Dataset &data) {
    for (const std::size_t size : attributeSizes) {
        const std::string name = numbered("a", size);
        data.attribute(name, size);
        const auto read = [&data, name, size] {
            const Array memory = Array::numeric(tsDOUBLE, std::array<std::size_t, 2>{1, size});
            check(nc_get_att_double(data.ncid, NC_GLOBAL, name.c_str(),
                                    static_cast<double *>(memory.data())));
        };
        series.add("get_att_double", "elements", size, read,
                   called(netcdf, Array::text("get_att_double"), Array::scalar(data.ncid),
                          Array::scalar(NC_GLOBAL), Array::text(name)));
        const auto write = [&data, name, values = std::vector<double>(size, 1)] {
            check(nc_put_att_double(data.ncid, NC_GLOBAL, name.c_str(), NC_DOUBLE, values.size(),
                                    values.data()));
        };
        series.add("put_att_double", "elements", size, write,
                   called(netcdf, Array::text("put_att_double"), Array::scalar(data.ncid),
                          Array::scalar(NC_GLOBAL), Array::text(name), Array::scalar(NC_DOUBLE),
                          row(size, 1)));
    }
}

// ---- the number of dimensions -------------------------------------------------------------------

/// One element, in more and more dimensions of length 1.
void addElements(Series &series, const Module &netcdf, const Dataset &data) {
    const int dimid = data.dimension("x", 1);
    for (const std::size_t ndims : dimensionsOfData) {
        const int varid =
            data.variable(numbered("v", ndims), NC_DOUBLE, std::vector<int>(ndims, dimid));
        const Numbers start(ndims, 0);
        const Numbers count(ndims, 1);
        const std::vector<std::ptrdiff_t> stride(ndims, 1);
        const auto element = [&data, varid](const auto &function) {
            return [&data, varid, function] {
                double value = 1;
                check(function(data.ncid, varid, &value));
                benchmark::DoNotOptimize(value);
            };
        };
        const auto block = [&](auto *function) {
            return element([=](int ncid, int id, double *value) {
                return function(ncid, id, start.data(), count.data(), value);
            });
        };
        const auto steps = [&](auto *function) {
            return element([=](int ncid, int id, double *value) {
                return function(ncid, id, start.data(), count.data(), stride.data(), value);
            });
        };
        const auto add = [&](const char *what, const Work &library, auto... inputs) {
            series.add(what, "dimensions", ndims, library,
                       called(netcdf, Array::text(what), Array::scalar(data.ncid),
                              Array::scalar(varid), std::move(inputs)...));
        };
        const auto zeros = [=] { return row(ndims, 0); };
        const auto ones = [=] { return row(ndims, 1); };
        add("get_var_double", element(nc_get_var_double));
        add("get_vara_double", block(nc_get_vara_double), zeros(), ones());
        add("get_vars_double", steps(nc_get_vars_double), zeros(), ones(), ones());
        add("put_vara_double", block(nc_put_vara_double), zeros(), ones(), Array::scalar(1));
        add("put_vars_double", steps(nc_put_vars_double), zeros(), ones(), ones(),
            Array::scalar(1));
    }
    data.endDefinition();
}

/// What defines something in a new dataset in memory, which then is given up: the library knows no
/// other way to take a definition back.
template <class Define>
Work byLibrary(const Define &define) {
    return [define] {
        const Dataset data("in memory", NC_DISKLESS);
        define(data);
    };
}
template <class Define>
Work byModule(const Module &netcdf, const Define &define) {
    return [&netcdf, define] {
        const Results made = netcdf("create", "in memory", NC_64BIT_OFFSET | NC_DISKLESS);
        const Array &ncid = made[0];
        netcdf("set_fill", ncid, NC_NOFILL);
        define(ncid);
        netcdf("abort", ncid);
    };
}

void addDefinitions(Series &series, const Module &netcdf, const Dataset &data) {
    const int dimid = data.dimension("x", 1);
    for (const std::size_t ndims : dimensionsDefined) {
        series.add("def_var", "dimensions", ndims, byLibrary([ndims](const Dataset &made) {
                       const std::vector<int> dims(ndims, made.dimension("x", 1));
                       static_cast<void>(made.variable("v", NC_DOUBLE, dims));
                   }),
                   byModule(netcdf, [&netcdf, ndims](const Array &ncid) {
                       const Results x = netcdf("def_dim", ncid, "x", 1);
                       netcdf("def_var", ncid, "v", NC_DOUBLE, row(ndims, x[0].number()));
                   }));
        const int varid =
            data.variable(numbered("v", ndims), NC_DOUBLE, std::vector<int>(ndims, dimid));
        const auto library = [&data, varid] {
            std::array<char, NC_MAX_NAME + 1> name;
            nc_type type = NC_NAT;
            int count = 0;
            std::array<int, NC_MAX_VAR_DIMS> dimids;
            int natts = 0;
            check(nc_inq_var(data.ncid, varid, name.data(), &type, &count, dimids.data(), &natts));
            benchmark::DoNotOptimize(dimids);
        };
        series.add(
            "inq_var", "dimensions", ndims, library,
            called(netcdf, Array::text("inq_var"), Array::scalar(data.ncid), Array::scalar(varid)));
    }
}

// ---- the number of variables and of attributes --------------------------------------------------

/// Opening and closing a file, of which the guard reads the header before the library does.
void addOpening(Series &series, const Module &netcdf, const Module &guarded,
                const std::string &file, const char *counted, std::size_t count) {
    for (const auto &[what, module] :
         {std::pair("open, close", &netcdf), std::pair("open, close, guarded", &guarded)}) {
        series.add(
            what, counted, count,
            [file] {
                int ncid = 0;
                check(nc_open(file.c_str(), NC_NOWRITE, &ncid));
                check(nc_close(ncid));
            },
            [file, &netcdf = *module] {
                const Results ncid = netcdf("open", file, "NOWRITE");
                netcdf("close", ncid[0]);
            });
    }
}

void addVariables(Series &series, const Module &netcdf, const Module &guarded, Datasets &datasets) {
    for (const std::size_t count : variables) {
        series.add("def_var, each once", "variables", count,
                   byLibrary([count](const Dataset &data) {
                       for (std::size_t i = 0; i < count; ++i) {
                           static_cast<void>(data.variable(numbered("v", i), NC_DOUBLE, {}));
                       }
                   }),
                   byModule(netcdf, [&netcdf, count](const Array &ncid) {
                       const Array none = row(0, 0);
                       for (std::size_t i = 0; i < count; ++i) {
                           netcdf("def_var", ncid, numbered("v", i), NC_DOUBLE, none);
                       }
                   }));
        const std::string name = numbered("variables", count);
        const Dataset &data = datasets.file(name);
        const int dimid = data.dimension("x", 10);
        for (std::size_t i = 0; i < count; ++i) {
            static_cast<void>(data.variable(numbered("v", i), NC_DOUBLE, {dimid}));
        }
        data.endDefinition();
        const std::string last = numbered("v", count - 1);
        const int varid = static_cast<int>(count) - 1;
        series.add(
            "inq_varid", "variables", count,
            [&data, last] {
                int found = 0;
                check(nc_inq_varid(data.ncid, last.c_str(), &found));
                benchmark::DoNotOptimize(found);
            },
            called(netcdf, Array::text("inq_varid"), Array::scalar(data.ncid), Array::text(last)));
        addOpening(series, netcdf, guarded, datasets.folder.file(name.c_str()), "variables", count);
        const auto write = [varid](int ncid) {
            const std::size_t index = 3;
            const double value = 1;
            check(nc_put_var1_double(ncid, varid, &index, &value));
        };
        // The guard knows the datasets that were opened through it.
        const Results opened = guarded("open", datasets.folder.file(name.c_str()), "WRITE");
        for (const auto &[what, module, ncid] :
             {std::tuple("put_var1_double", &netcdf, data.ncid),
              std::tuple("put_var1_double, guarded", &guarded,
                         static_cast<int>(opened[0].number()))}) {
            series.add(
                what, "variables", count, [write, ncid = ncid] { write(ncid); },
                called(*module, Array::text("put_var1_double"), Array::scalar(ncid),
                       Array::scalar(varid), Array::scalar(3), Array::scalar(1)));
        }
    }
}

void addAttributes(Series &series, const Module &netcdf, const Module &guarded,
                   Datasets &datasets) {
    for (const std::size_t count : attributes) {
        series.add("put_att_double, each once", "attributes", count,
                   byLibrary([count](const Dataset &data) {
                       for (std::size_t i = 0; i < count; ++i) {
                           data.attribute(numbered("a", i), 1);
                       }
                   }),
                   byModule(netcdf, [&netcdf, count](const Array &ncid) {
                       for (std::size_t i = 0; i < count; ++i) {
                           netcdf("put_att_double", ncid, NC_GLOBAL, numbered("a", i), NC_DOUBLE,
                                  1);
                       }
                   }));
        const std::string file = numbered("attributes", count);
        const Dataset &data = datasets.file(file);
        for (std::size_t i = 0; i < count; ++i) {
            data.attribute(numbered("a", i), 1);
        }
        data.endDefinition();
        addOpening(series, netcdf, guarded, datasets.folder.file(file.c_str()), "attributes",
                   count);
        const std::string last = numbered("a", count - 1);
        series.add(
            "get_att_double", "attributes", count,
            [&data, last] {
                double value = 0;
                check(nc_get_att_double(data.ncid, NC_GLOBAL, last.c_str(), &value));
                benchmark::DoNotOptimize(value);
            },
            called(netcdf, Array::text("get_att_double"), Array::scalar(data.ncid),
                   Array::scalar(NC_GLOBAL), Array::text(last)));
    }
}

// ---- the number of open datasets ----------------------------------------------------------------

/// Others that are open while something is measured with one more.
class Others {
  public:
    explicit Others(std::string path) : file(std::move(path)) {
        const Dataset data(file);
        static_cast<void>(data.variable("v", NC_DOUBLE, {}));
        data.endDefinition();
    }
    ~Others() { become(0); }
    Others(const Others &) = delete;
    Others &operator=(const Others &) = delete;

    void become(std::size_t count) {
        for (; open.size() > count; open.pop_back()) {
            nc_close(open.back());
        }
        while (open.size() < count) {
            int ncid = 0;
            check(nc_open(file.c_str(), NC_NOWRITE, &ncid));
            open.push_back(ncid);
        }
    }

    std::string file;
    std::vector<int> open;
};

void addOpen(Series &series, const Module &netcdf, const Module &guarded, Others &others) {
    for (const std::size_t count : openDatasets) {
        for (const auto &[what, module] :
             {std::pair("open, get_var_double, close", &netcdf),
              std::pair("open, get_var_double, close, guarded", &guarded)}) {
            series.add(
                what, "others open", count,
                [&others] {
                    int ncid = 0;
                    double value = 0;
                    check(nc_open(others.file.c_str(), NC_NOWRITE, &ncid));
                    check(nc_get_var_double(ncid, 0, &value));
                    check(nc_close(ncid));
                },
                [&others, &netcdf = *module] {
                    const Results ncid = netcdf("open", others.file, "NOWRITE");
                    netcdf("get_var_double", ncid[0], 0);
                    netcdf("close", ncid[0]);
                });
            series.pairs.back().before = [&others, count] { others.become(count); };
        }
    }
}

} // namespace

int main(int argc, char **argv) try {
    const Module netcdf(TESSEL_NETCDF_MODULE);
    const Module guarded = netcdf.watchedBy(netcdfGuard({}));
    Datasets datasets;
    Others others(datasets.folder.file("others"));
    Series series;
    Numbers wanted = sizes;
    if (bench::isQuick(argc, argv)) {
        wanted.pop_back();
    }
    addReads(series, netcdf, datasets.file("read"), wanted, "get_var_schar", NC_BYTE,
             nc_get_var_schar);
    addReads(series, netcdf, datasets.file("text read"), textSizes, "get_var_text", NC_CHAR,
             nc_get_var_text);
    addWrites<signed char, signed char>(series, netcdf, datasets.file("written"), wanted,
                                        "put_var_schar", NC_BYTE, nc_put_var_schar, tsINT8);
    addWrites<char, tsChar>(series, netcdf, datasets.file("text written"), textSizes,
                            "put_var_text", NC_CHAR, nc_put_var_text, tsCHAR);
    addAttributesBySize(series, netcdf, datasets.inMemory());
    addElements(series, netcdf, datasets.file("dimensions"));
    addDefinitions(series, netcdf, datasets.inMemory());
    addVariables(series, netcdf, guarded, datasets);
    addAttributes(series, netcdf, guarded, datasets);
    addOpen(series, netcdf, guarded, others);
    return bench::measure(argc, argv, "bench_scaling", series.pairs);
} catch (const std::exception &error) {
    std::fprintf(stderr, "bench_scaling: %s\n", error.what());
    return 1;
}
