// bench/families.cpp: every typed family through the module, beside the library's own functions.
//
// One element a call, and blocks of 64 MiB. A block is read into new memory on both sides, of the
// kind that the host gives out; text is read by the library into bytes. Where an operation is more
// than the one function, because it asks the library first or copies text, a second reference does
// all of its steps.
#include "pairs.hpp"
#include "tessel/runtime.hpp"

#include <netcdf.h>

#include <algorithm>
#include <array>
#include <cstdio>
#include <string>
#include <string_view>
#include <vector>

namespace {

using namespace tessel;
using bench::check;
using bench::Pair;
using bench::Work;

constexpr std::size_t columns = 1024;
constexpr std::ptrdiff_t step = 2; // of the strided blocks, along the fastest dimension

/// A memory type: what the module calls it, and the library's functions for it.
template <class T>
struct Library {
    const char *suffix;
    nc_type external;
    tsClassID hostClass;
    int (*getVar)(int, int, T *);
    int (*getVar1)(int, int, const std::size_t *, T *);
    int (*getVara)(int, int, const std::size_t *, const std::size_t *, T *);
    int (*getVars)(int, int, const std::size_t *, const std::size_t *, const std::ptrdiff_t *, T *);
    int (*getAtt)(int, int, const char *, T *);
    int (*putVar)(int, int, const T *);
    int (*putVar1)(int, int, const std::size_t *, const T *);
    int (*putVara)(int, int, const std::size_t *, const std::size_t *, const T *);
    int (*putVars)(int, int, const std::size_t *, const std::size_t *, const std::ptrdiff_t *,
                   const T *);
    int (*putAtt)(int, int, const char *, nc_type, std::size_t, const T *);
};

/// Text takes no external type.
int putTextAttribute(int ncid, int varid, const char *name, nc_type /*type*/, std::size_t count,
                     const char *values) {
    return nc_put_att_text(ncid, varid, name, count, values);
}

// clang-format off
constexpr Library<double>        doubles = {"double", NC_DOUBLE, tsDOUBLE, nc_get_var_double, nc_get_var1_double, nc_get_vara_double, nc_get_vars_double, nc_get_att_double, nc_put_var_double, nc_put_var1_double, nc_put_vara_double, nc_put_vars_double, nc_put_att_double};
constexpr Library<float>         floats  = {"float",  NC_FLOAT,  tsSINGLE, nc_get_var_float,  nc_get_var1_float,  nc_get_vara_float,  nc_get_vars_float,  nc_get_att_float,  nc_put_var_float,  nc_put_var1_float,  nc_put_vara_float,  nc_put_vars_float,  nc_put_att_float};
constexpr Library<int>           ints    = {"int",    NC_INT,    tsINT32,  nc_get_var_int,    nc_get_var1_int,    nc_get_vara_int,    nc_get_vars_int,    nc_get_att_int,    nc_put_var_int,    nc_put_var1_int,    nc_put_vara_int,    nc_put_vars_int,    nc_put_att_int};
constexpr Library<short>         shorts  = {"short",  NC_SHORT,  tsINT16,  nc_get_var_short,  nc_get_var1_short,  nc_get_vara_short,  nc_get_vars_short,  nc_get_att_short,  nc_put_var_short,  nc_put_var1_short,  nc_put_vara_short,  nc_put_vars_short,  nc_put_att_short};
constexpr Library<signed char>   schars  = {"schar",  NC_BYTE,   tsINT8,   nc_get_var_schar,  nc_get_var1_schar,  nc_get_vara_schar,  nc_get_vars_schar,  nc_get_att_schar,  nc_put_var_schar,  nc_put_var1_schar,  nc_put_vara_schar,  nc_put_vars_schar,  nc_put_att_schar};
constexpr Library<unsigned char> uchars  = {"uchar",  NC_BYTE,   tsUINT8,  nc_get_var_uchar,  nc_get_var1_uchar,  nc_get_vara_uchar,  nc_get_vars_uchar,  nc_get_att_uchar,  nc_put_var_uchar,  nc_put_var1_uchar,  nc_put_vara_uchar,  nc_put_vars_uchar,  nc_put_att_uchar};
constexpr Library<char>          text    = {"text",   NC_CHAR,   tsCHAR,   nc_get_var_text,   nc_get_var1_text,   nc_get_vara_text,   nc_get_vars_text,   nc_get_att_text,   nc_put_var_text,   nc_put_var1_text,   nc_put_vara_text,   nc_put_vars_text,   putTextAttribute};
// clang-format on

/// The datasets that everything is measured on: one in data mode, and for the attributes, of which
/// the blocks are large, one that stays in define mode and in memory.
class Datasets {
  public:
    Datasets() {
        check(nc_create(folder.file("data.nc").c_str(), NC_64BIT_OFFSET, &data));
        check(nc_set_fill(data, NC_NOFILL, nullptr));
        check(nc_create(folder.file("attributes.nc").c_str(), NC_64BIT_OFFSET, &attributes));
    }
    ~Datasets() {
        nc_abort(attributes);
        nc_close(data);
    }
    Datasets(const Datasets &) = delete;
    Datasets &operator=(const Datasets &) = delete;

    int data = -1;
    int attributes = -1;

  private:
    bench::TemporaryFolder folder;
};

/// The pairs of one memory type.
template <class T>
class Type {
  public:
    Type(const Module &module, const Datasets &sets, const Library<T> &functions,
         std::size_t sizeOfBlocks)
        : netcdf(module), datasets(sets), library(functions), blockBytes(sizeOfBlocks) {
        std::array<int, 2> dims{};
        define("rows", rows, dims[0]);
        define("columns", columns, dims[1]);
        check(nc_def_var(data(), named("block").c_str(), library.external, 2, dims.data(), &block));
        define("wide", columns * step, dims[1]);
        check(nc_def_var(data(), named("wide").c_str(), library.external, 2, dims.data(), &wide));
        check(nc_def_var(data(), named("one").c_str(), library.external, 0, nullptr, &one));
        std::fill_n(values.begin(), values.size(), static_cast<T>('x'));
        if constexpr (std::is_same_v<T, char>) {
            hostBlock = Array::text(std::string(values.begin(), values.end()));
            hostOne = Array::text("x");
        } else {
            hostBlock = Array::borrowed(library.hostClass, std::array{columns, rows}, values.data(),
                                        nullptr);
            hostOne = Array::borrowed(library.hostClass, std::array<std::size_t, 2>{1, 1},
                                      values.data(), nullptr);
        }
    }

    /// Writes what is going to be read; in data mode.
    void fill() {
        check(library.putVar(data(), block, values.data()));
        check(library.putVar(data(), one, values.data()));
        for (std::size_t first = 0; first < columns * step; first += columns) {
            const std::array<std::size_t, 2> start = {0, first};
            check(library.putVara(data(), wide, start.data(), count.data(), values.data()));
        }
        putAttributes();
    }

    void addTo(std::vector<Pair> &pairs) {
        addElements(pairs);
        addBlocks(pairs);
    }

    /// The library's functions for an element when a call of the module has come before, beside
    /// nothing but themselves in a loop: what the same call costs before different functions
    /// differs by what they take longer after it.
    void addAfterACall(std::vector<Pair> &pairs) {
        const auto add = [&](const char *family, const auto &function) {
            pairs.push_back({"inq_libvers, then nc_" + operation(family) + "/one", function,
                             [before = callOf("inq_libvers"), function] {
                                 before();
                                 function();
                             }});
        };
        add("get_vara", [this] {
            T value{};
            check(library.getVara(data(), block, origin.data(), single.data(), &value));
            benchmark::DoNotOptimize(value);
        });
        add("get_vars", [this] {
            T value{};
            check(
                library.getVars(data(), wide, origin.data(), single.data(), stride.data(), &value));
            benchmark::DoNotOptimize(value);
        });
    }

  private:
    static constexpr std::array<std::size_t, 2> origin = {0, 0};
    static constexpr std::array<std::size_t, 2> single = {1, 1};
    static constexpr std::array<std::ptrdiff_t, 2> stride = {1, step};

    [[nodiscard]] int data() const { return datasets.data; }
    [[nodiscard]] std::string named(const char *what) const {
        return std::string(what) + "_" + library.suffix;
    }
    [[nodiscard]] std::string operation(const char *family) const {
        return std::string(family) + "_" + library.suffix;
    }

    void define(const char *what, std::size_t length, int &dimid) const {
        check(nc_def_dim(data(), named(what).c_str(), length, &dimid));
    }

    void putAttributes() const {
        check(library.putAtt(datasets.attributes, NC_GLOBAL, named("block").c_str(),
                             library.external, elements, values.data()));
        check(library.putAtt(datasets.attributes, NC_GLOBAL, named("one").c_str(), library.external,
                             1, values.data()));
    }

    /// A call of the module with arguments that are made once, as a program's loop would have them.
    template <class... Arguments>
    Work call(const char *family, const Arguments &...arguments) const {
        return callOf(operation(family), arguments...);
    }
    template <class... Arguments>
    Work callOf(const std::string &name, const Arguments &...arguments) const {
        auto held = std::make_shared<std::vector<Array>>();
        held->push_back(Array::text(name));
        (held->push_back(made(arguments)), ...);
        auto inputs = std::make_shared<std::vector<const tsArray *>>();
        for (const Array &array : *held) {
            inputs->push_back(array.get());
        }
        return [this, held, inputs] {
            const Results results = netcdf.call(*inputs);
            benchmark::DoNotOptimize(&results);
        };
    }

    static Array made(int value) { return Array::scalar(value); }
    static Array made(const std::string &value) { return Array::text(value); }
    static Array made(const Array &lent) {
        return Array::borrowed(lent.classID(), lent.dims(), lent.data(), nullptr);
    }
    /// A vector of the library's order in the host's.
    template <class Integer>
    static Array made(const std::array<Integer, 2> &vector) {
        return Array::row({static_cast<double>(vector[1]), static_cast<double>(vector[0])});
    }

    /// New memory of the kind that results have, for the library to fill.
    template <class Fill>
    Work intoNew(const Fill &fill) const {
        return [fill, this] {
            const Array memory = Array::numeric(tsUINT8, std::array<std::size_t, 2>{blockBytes, 1});
            check(fill(static_cast<T *>(memory.data())));
        };
    }

    void addElements(std::vector<Pair> &pairs) {
        const int put = datasets.attributes;
        const std::string name = named("one");
        // What the operation asks the library first is its second reference's.
        const auto add = [&](const char *family, const auto &asks, const auto &reference,
                             Work module) {
            pairs.push_back({operation(family) + "/one", reference, std::move(module), false,
                             [asks, reference] {
                                 asks();
                                 reference();
                             }});
        };
        const auto intoValue = [](const auto &fill) {
            return [fill] {
                T value{};
                check(fill(&value));
                benchmark::DoNotOptimize(value);
            };
        };
        const auto from = [](const auto &write) { return [write] { check(write()); }; };
        const auto number = [](int ncid, int varid) {
            return [ncid, varid] {
                int ndims = 0;
                check(nc_inq_varndims(ncid, varid, &ndims));
                benchmark::DoNotOptimize(ndims);
            };
        };
        const auto numberAndIDs = [number](int ncid, int varid) {
            return [ask = number(ncid, varid), ncid, varid] {
                ask();
                std::array<int, 2> dimids{};
                check(nc_inq_vardimid(ncid, varid, dimids.data()));
                benchmark::DoNotOptimize(dimids);
            };
        };
        const auto nameAndNumber = [](int ncid, int varid) {
            return [ncid, varid] {
                std::array<char, NC_MAX_NAME + 1> held;
                int ndims = 0;
                check(nc_inq_var(ncid, varid, held.data(), nullptr, &ndims, nullptr, nullptr));
                benchmark::DoNotOptimize(held);
            };
        };
        const auto numberAndAllIDs = [](int ncid, int varid) {
            return [ncid, varid] {
                int ndims = 0;
                std::array<int, NC_MAX_VAR_DIMS> dimids;
                check(nc_inq_var(ncid, varid, nullptr, nullptr, &ndims, dimids.data(), nullptr));
                benchmark::DoNotOptimize(dimids);
            };
        };
        const auto attribute = [put, name] {
            nc_type type = NC_NAT;
            std::size_t length = 0;
            check(nc_inq_att(put, NC_GLOBAL, name.c_str(), &type, &length));
            benchmark::DoNotOptimize(length);
        };
        const auto nothing = [] {};
        const Library<T> &f = library;
        const T *const value = values.data();
        const int ncid = data();
        add("get_var", numberAndIDs(ncid, one),
            intoValue([=, this](T *to) { return f.getVar(ncid, one, to); }),
            call("get_var", ncid, one));
        add("get_var1", number(ncid, block),
            intoValue([=, this](T *to) { return f.getVar1(ncid, block, origin.data(), to); }),
            call("get_var1", ncid, block, origin));
        add("get_vara", number(ncid, block), intoValue([=, this](T *to) {
                return f.getVara(ncid, block, origin.data(), single.data(), to);
            }),
            call("get_vara", ncid, block, origin, single));
        add("get_vars", numberAndIDs(ncid, wide), intoValue([=, this](T *to) {
                return f.getVars(ncid, wide, origin.data(), single.data(), stride.data(), to);
            }),
            call("get_vars", ncid, wide, origin, single, stride));
        add("get_att", attribute,
            intoValue([=](T *to) { return f.getAtt(put, NC_GLOBAL, name.c_str(), to); }),
            call("get_att", put, NC_GLOBAL, name));
        add("put_var", numberAndAllIDs(ncid, one),
            from([=, this] { return f.putVar(ncid, one, value); }),
            call("put_var", ncid, one, hostOne));
        add("put_var1", nameAndNumber(ncid, block),
            from([=, this] { return f.putVar1(ncid, block, origin.data(), value); }),
            call("put_var1", ncid, block, origin, hostOne));
        add("put_vara", nameAndNumber(ncid, block),
            from([=, this] { return f.putVara(ncid, block, origin.data(), single.data(), value); }),
            call("put_vara", ncid, block, origin, single, hostOne));
        add("put_vars", nameAndNumber(ncid, wide), from([=, this] {
                return f.putVars(ncid, wide, origin.data(), single.data(), stride.data(), value);
            }),
            call("put_vars", ncid, wide, origin, single, stride, hostOne));
        add("put_att", nothing, from([=, this] {
                return f.putAtt(put, NC_GLOBAL, name.c_str(), library.external, 1, value);
            }),
            putAtt(name, hostOne));
    }

    /// What is wanted of blocks is a difference of a hundredth. The library takes strided ones an
    /// element at a time, for seconds where elements are bytes.
    static int repetitionsOf(std::string_view family) {
        return family.ends_with("_vars") ? 9 : 3 * bench::usualRepetitions;
    }

    void addBlock(std::vector<Pair> &pairs, const char *family, Work reference, Work module,
                  Work steps) const {
        pairs.push_back({operation(family) + "/64MiB", std::move(reference), std::move(module),
                         true, std::move(steps), repetitionsOf(family), nullptr,
                         operation(family)});
    }

    /// A block read by `fill`; where it is text, the second reference has a buffer of so many bytes
    /// a character.
    template <class Fill>
    void addRead(std::vector<Pair> &pairs, const char *family, std::size_t unit, const Fill &fill,
                 Work module) const {
        Work steps;
        if constexpr (std::is_same_v<T, char>) {
            steps = bench::widening(count, unit, fill);
        }
        addBlock(pairs, family, intoNew(fill), std::move(module), std::move(steps));
    }

    /// A block written by `write`.
    template <class Write>
    void addWrite(std::vector<Pair> &pairs, const char *family, const Write &write,
                  Work module) const {
        Work steps;
        if constexpr (std::is_same_v<T, char>) {
            steps = bench::narrowing(hostBlock.template elements<const tsChar>(), write);
        }
        addBlock(
            pairs, family, [from = values.data(), write] { check(write(from)); }, std::move(module),
            std::move(steps));
    }

    void addBlocks(std::vector<Pair> &pairs) {
        const int put = datasets.attributes;
        const std::string name = named("block");
        const Library<T> &f = library;
        const int ncid = data();
        addRead(
            pairs, "get_var", 1, [=, this](T *to) { return f.getVar(ncid, block, to); },
            call("get_var", ncid, block));
        addRead(
            pairs, "get_vara", 2,
            [=, this](T *to) { return f.getVara(ncid, block, origin.data(), count.data(), to); },
            call("get_vara", ncid, block, origin, count));
        addRead(
            pairs, "get_vars", 2,
            [=, this](T *to) {
                return f.getVars(ncid, wide, origin.data(), count.data(), stride.data(), to);
            },
            call("get_vars", ncid, wide, origin, count, stride));
        addRead(
            pairs, "get_att", 2, [=](T *to) { return f.getAtt(put, NC_GLOBAL, name.c_str(), to); },
            call("get_att", put, NC_GLOBAL, name));
        addWrite(
            pairs, "put_var", [=, this](const T *from) { return f.putVar(ncid, block, from); },
            call("put_var", ncid, block, hostBlock));
        addWrite(
            pairs, "put_vara",
            [=, this](const T *from) {
                return f.putVara(ncid, block, origin.data(), count.data(), from);
            },
            call("put_vara", ncid, block, origin, count, hostBlock));
        addWrite(
            pairs, "put_vars",
            [=, this](const T *from) {
                return f.putVars(ncid, wide, origin.data(), count.data(), stride.data(), from);
            },
            call("put_vars", ncid, wide, origin, count, stride, hostBlock));
        addWrite(
            pairs, "put_att",
            [=, this](const T *from) {
                return f.putAtt(put, NC_GLOBAL, name.c_str(), library.external, elements, from);
            },
            putAtt(name, hostBlock));
    }

    Work putAtt(const std::string &name, const Array &from) const {
        if constexpr (std::is_same_v<T, char>) {
            return call("put_att", datasets.attributes, NC_GLOBAL, name, from);
        } else {
            return call("put_att", datasets.attributes, NC_GLOBAL, name, library.external, from);
        }
    }

    const Module &netcdf;
    const Datasets &datasets;
    const Library<T> &library;
    std::size_t blockBytes;
    std::size_t elements = blockBytes / sizeof(T); ///< of a block
    std::size_t rows = elements / columns;
    std::array<std::size_t, 2> count = {rows, columns};
    int block = -1; ///< a block
    int wide = -1;  ///< `step` times as much
    int one = -1;   ///< without dimensions
    std::vector<T> values = std::vector<T>(elements);
    Array hostBlock;
    Array hostOne;
};

} // namespace

int main(int argc, char **argv) try {
    const std::size_t blockBytes = std::size_t{bench::isQuick(argc, argv) ? 1U : 64U} << 20U;
    const Module netcdf(TESSEL_NETCDF_MODULE);
    const Datasets datasets;
    Type ofDoubles(netcdf, datasets, doubles, blockBytes);
    Type ofFloats(netcdf, datasets, floats, blockBytes);
    Type ofInts(netcdf, datasets, ints, blockBytes);
    Type ofShorts(netcdf, datasets, shorts, blockBytes);
    Type ofSchars(netcdf, datasets, schars, blockBytes);
    Type ofUchars(netcdf, datasets, uchars, blockBytes);
    Type ofText(netcdf, datasets, text, blockBytes);
    check(nc_enddef(datasets.data));
    std::vector<Pair> pairs;
    const auto fillAndAdd = [&](auto &...types) {
        (types.fill(), ...);
        (types.addTo(pairs), ...);
    };
    fillAndAdd(ofDoubles, ofFloats, ofInts, ofShorts, ofSchars, ofUchars, ofText);
    ofDoubles.addAfterACall(pairs);
    return bench::measure(argc, argv, "bench_families", pairs);
} catch (const std::exception &error) {
    std::fprintf(stderr, "bench_families: %s\n", error.what());
    return 1;
}
