// bench/calls.cpp: what a call through the module costs more than the library's own function.
//
// The file is made in a temporary folder: a variable of 256 MiB in the 64-bit-offset format.
#include "pairs.hpp"
#include "tessel/netcdf_guard.hpp"
#include "tessel/runtime.hpp"

#include <netcdf.h>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <bit>
#include <cstdint>
#include <cstdio>
#include <span>
#include <stdexcept>
#include <utility>
#include <vector>

namespace {

using namespace tessel;
using bench::called;
using bench::check;
using bench::Pair;
using bench::Work;

constexpr std::size_t largeBytes = std::size_t{256} << 20U;
constexpr std::size_t largeElements = largeBytes / sizeof(double);
constexpr std::array<std::size_t, 3> hostDims = {1024, 512, largeElements / 1024 / 512};
constexpr std::array<std::size_t, 3> place = {1, 0, 0}; // of an element
constexpr const char *dimension = "time";
constexpr const char *variable = "large";
constexpr const char *attribute = "units";

/// The dataset, open for reading.
class Dataset {
  public:
    Dataset() {
        const std::string file = folder.file(fileName);
        int writing = 0;
        check(nc_create(file.c_str(), NC_64BIT_OFFSET, &writing));
        std::array<int, 3> dims{};
        check(nc_def_dim(writing, "lon", hostDims[0], &dims[2]));
        check(nc_def_dim(writing, "lat", hostDims[1], &dims[1]));
        check(nc_def_dim(writing, dimension, hostDims[2], dims.data()));
        check(nc_def_var(writing, variable, NC_DOUBLE, 3, dims.data(), &varid));
        check(nc_put_att_text(writing, varid, attribute, 1, "K"));
        check(nc_enddef(writing));
        std::vector<double> values(largeElements);
        for (std::size_t i = 0; i < values.size(); ++i) {
            values[i] = static_cast<double>(i);
        }
        check(nc_put_var_double(writing, varid, values.data()));
        check(nc_close(writing));
        check(nc_open(file.c_str(), NC_NOWRITE, &ncid));
        descriptor = open(file.c_str(), O_RDONLY | O_CLOEXEC);
        struct stat facts = {};
        if (descriptor < 0 || fstat(descriptor, &facts) != 0) {
            throw std::runtime_error("cannot open " + file);
        }
        begin = facts.st_size - static_cast<off_t>(largeBytes);
    }

    /// The file, opened once more through a module, for writing.
    [[nodiscard]] int openedBy(const Module &module) const {
        return static_cast<int>(module("open", folder.file(fileName), "WRITE")[0].number());
    }

    ~Dataset() {
        nc_close(ncid);
        close(descriptor);
    }
    Dataset(const Dataset &) = delete;
    Dataset &operator=(const Dataset &) = delete;

    int ncid = -1;
    int varid = -1;
    int descriptor = -1; ///< the same file
    off_t begin = 0;     ///< of the numbers in it

  private:
    static constexpr const char *fileName = "large.nc";
    bench::TemporaryFolder folder;
};

/// What the large read is in memory alone, without the library: the file's bytes into new memory of
/// the kind that results have, and the bytes of each number turned round while they are in a cache.
void readPlainly(const Dataset &data) {
    constexpr std::size_t piece = std::size_t{256} << 10U;
    const Array memory = Array::numeric(tsUINT64, hostDims);
    const std::span<std::uint64_t> all = memory.elements<std::uint64_t>();
    for (std::size_t done = 0; done < largeBytes; done += piece) {
        const auto part = all.subspan(done / sizeof(std::uint64_t), piece / sizeof(std::uint64_t));
        if (pread(data.descriptor, part.data(), piece, data.begin + static_cast<off_t>(done)) !=
            static_cast<ssize_t>(piece)) {
            throw std::runtime_error("the file is too short");
        }
        std::transform(part.begin(), part.end(), part.begin(),
                       [](std::uint64_t number) { return __builtin_bswap64(number); });
    }
    if (std::bit_cast<double>(all.back()) != static_cast<double>(largeElements - 1)) {
        throw std::runtime_error("these are not the numbers");
    }
}

/// The other inquiries, inputs at hand. Each result is a host array of its own, and "inq" and
/// "inq_var" have four.
void addInquiries(std::vector<Pair> &pairs, const Module &netcdf, const Dataset &data) {
    pairs.push_back({"inq_libvers", [] { benchmark::DoNotOptimize(nc_inq_libvers()); },
                     called(netcdf, Array::text("inq_libvers"))});
    pairs.push_back({"inq",
                     [&data] {
                         std::array<int, 4> all{};
                         check(nc_inq(data.ncid, &all[0], &all[1], &all[2], &all[3]));
                         benchmark::DoNotOptimize(all);
                     },
                     called(netcdf, Array::text("inq"), Array::scalar(data.ncid))});
    pairs.push_back(
        {"inq_dim",
         [&data] {
             std::array<char, NC_MAX_NAME + 1> name;
             std::size_t length = 0;
             check(nc_inq_dim(data.ncid, 0, name.data(), &length));
             benchmark::DoNotOptimize(name);
         },
         called(netcdf, Array::text("inq_dim"), Array::scalar(data.ncid), Array::scalar(0))});
    pairs.push_back({"inq_var",
                     [&data] {
                         std::array<char, NC_MAX_NAME + 1> name;
                         nc_type type = NC_NAT;
                         int ndims = 0;
                         std::array<int, NC_MAX_VAR_DIMS> dimids;
                         int natts = 0;
                         check(nc_inq_var(data.ncid, data.varid, name.data(), &type, &ndims,
                                          dimids.data(), &natts));
                         benchmark::DoNotOptimize(dimids);
                     },
                     called(netcdf, Array::text("inq_var"), Array::scalar(data.ncid),
                            Array::scalar(data.varid))});
}

/// The same for those of attributes.
void addAttributeInquiries(std::vector<Pair> &pairs, const Module &netcdf, const Dataset &data) {
    pairs.push_back({"inq_att",
                     [&data] {
                         nc_type type = NC_NAT;
                         std::size_t length = 0;
                         check(nc_inq_att(data.ncid, data.varid, attribute, &type, &length));
                         benchmark::DoNotOptimize(length);
                     },
                     called(netcdf, Array::text("inq_att"), Array::scalar(data.ncid),
                            Array::scalar(data.varid), Array::text(attribute))});
    pairs.push_back({"inq_attid",
                     [&data] {
                         int id = 0;
                         check(nc_inq_attid(data.ncid, data.varid, attribute, &id));
                         benchmark::DoNotOptimize(id);
                     },
                     called(netcdf, Array::text("inq_attid"), Array::scalar(data.ncid),
                            Array::scalar(data.varid), Array::text(attribute))});
    pairs.push_back({"inq_attname",
                     [&data] {
                         std::array<char, NC_MAX_NAME + 1> name;
                         check(nc_inq_attname(data.ncid, data.varid, 0, name.data()));
                         benchmark::DoNotOptimize(name);
                     },
                     called(netcdf, Array::text("inq_attname"), Array::scalar(data.ncid),
                            Array::scalar(data.varid), Array::scalar(0))});
}

/// An inquiry, and one element read and written, with and without the guard, in a dataset that was
/// opened through the module in question, so that the guard knows it. What the guard costs a call
/// is the difference.
void addGuarded(std::vector<Pair> &pairs, const Module &netcdf, const Module &guarded,
                const Dataset &data) {
    for (const auto &[suffix, module] :
         {std::pair("", &netcdf), std::pair(", guarded", &guarded)}) {
        const int ncid = data.openedBy(*module);
        const auto add = [&, &with = *module, suffix = suffix](
                             const std::string &operation, const auto &function, auto... inputs) {
            pairs.push_back(
                {operation + suffix, function,
                 called(with, Array::text(operation), Array::scalar(ncid), std::move(inputs)...)});
        };
        add(
            "inq_varid",
            [ncid] {
                int varid = 0;
                check(nc_inq_varid(ncid, variable, &varid));
                benchmark::DoNotOptimize(varid);
            },
            Array::text(variable));
        add(
            "get_var1_double",
            [ncid, varid = data.varid] {
                double value = 0;
                check(nc_get_var1_double(ncid, varid, place.data(), &value));
                benchmark::DoNotOptimize(value);
            },
            Array::scalar(data.varid), Array::row({0, 0, 1}));
        add(
            "put_var1_double",
            [ncid, varid = data.varid] {
                const double value = 0;
                check(nc_put_var1_double(ncid, varid, place.data(), &value));
            },
            Array::scalar(data.varid), Array::row({0, 0, 1}), Array::scalar(0));
    }
}

std::vector<Pair> pairsOf(const Module &netcdf, const Module &guarded, const Dataset &data) {
    const auto direct = [&data] {
        int dimid = 0;
        check(nc_inq_dimid(data.ncid, dimension, &dimid));
        benchmark::DoNotOptimize(dimid);
    };
    // The inputs are host arrays already, as they are for a program in the host.
    const auto arrays = [&netcdf, operation = std::make_shared<Array>(Array::text("inq_dimid")),
                         ncid = std::make_shared<Array>(Array::scalar(data.ncid)),
                         name = std::make_shared<Array>(Array::text(dimension))] {
        std::array<const tsArray *, 3> inputs = {operation->get(), ncid->get(), name->get()};
        const Results results = netcdf.call(inputs);
        benchmark::DoNotOptimize(results[0].number());
    };
    // The comfortable form, which makes the input arrays as well.
    const auto values = [&] {
        const Results results = netcdf("inq_dimid", data.ncid, dimension);
        benchmark::DoNotOptimize(results[0].number());
    };
    // Into an array of the host's, so that the memory is of the same kind.
    const auto readDirect = [&data] {
        const Array array = Array::numeric(tsDOUBLE, hostDims);
        check(nc_get_var_double(data.ncid, data.varid, static_cast<double *>(array.data())));
        benchmark::DoNotOptimize(array.data());
    };
    const auto read = [&] {
        const Results results = netcdf("get_var_double", data.ncid, data.varid);
        benchmark::DoNotOptimize(results[0].data());
    };
    std::vector<Pair> pairs = {
        {"inq_dimid, inputs at hand", direct, arrays},
        {"inq_dimid, inputs made", direct, values},
    };
    addInquiries(pairs, netcdf, data);
    addAttributeInquiries(pairs, netcdf, data);
    addGuarded(pairs, netcdf, guarded, data);
    for (const auto &[what, reference] :
         {std::pair<const char *, Work>("get_var_double of 256 MiB", readDirect),
          std::pair<const char *, Work>("get_var_double of 256 MiB, beside pread with byte swap",
                                        [&data] { readPlainly(data); })}) {
        pairs.push_back(
            {what, reference, read, true, nullptr, 3 * bench::usualRepetitions, nullptr, what});
    }
    return pairs;
}

} // namespace

int main(int argc, char **argv) try {
    const Module netcdf(TESSEL_NETCDF_MODULE);
    const Module guarded = netcdf.watchedBy(netcdfGuard());
    const Dataset data;
    return bench::measure(argc, argv, "bench_calls", pairsOf(netcdf, guarded, data));
} catch (const std::exception &error) {
    std::fprintf(stderr, "bench_calls: %s\n", error.what());
    return 1;
}
