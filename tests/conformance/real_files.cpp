// tests/conformance/real_files.cpp: real files, and the sample, read through the module and by
// direct calls of the library.
//
// Every variable and every attribute is read by every member of every family that reads. The values
// are the same to the last bit, or the library's refusal is.
#include "support/conformance.hpp"
#include "support/text.hpp"

#include <netcdf.h>

#include <array>
#include <cstdio>
#include <cstring>
#include <fstream>
#include <numeric>
#include <tuple>

namespace tessel::test {
namespace {

/// The direct functions of a memory type.
template <class T>
struct Direct {
    std::string suffix;
    tsClassID hostClass;
    int (*getAtt)(int, int, const char *, T *);
    int (*getVar)(int, int, T *);
    int (*getVar1)(int, int, const std::size_t *, T *);
    int (*getVara)(int, int, const std::size_t *, const std::size_t *, T *);
    int (*getVars)(int, int, const std::size_t *, const std::size_t *, const std::ptrdiff_t *, T *);
};

// clang-format off
const std::tuple directs = {
    Direct<double>       {"double", tsDOUBLE, nc_get_att_double, nc_get_var_double, nc_get_var1_double, nc_get_vara_double, nc_get_vars_double},
    Direct<float>        {"float",  tsSINGLE, nc_get_att_float,  nc_get_var_float,  nc_get_var1_float,  nc_get_vara_float,  nc_get_vars_float},
    Direct<int>          {"int",    tsINT32,  nc_get_att_int,    nc_get_var_int,    nc_get_var1_int,    nc_get_vara_int,    nc_get_vars_int},
    Direct<short>        {"short",  tsINT16,  nc_get_att_short,  nc_get_var_short,  nc_get_var1_short,  nc_get_vara_short,  nc_get_vars_short},
    Direct<signed char>  {"schar",  tsINT8,   nc_get_att_schar,  nc_get_var_schar,  nc_get_var1_schar,  nc_get_vara_schar,  nc_get_vars_schar},
    Direct<unsigned char>{"uchar",  tsUINT8,  nc_get_att_uchar,  nc_get_var_uchar,  nc_get_var1_uchar,  nc_get_vara_uchar,  nc_get_vars_uchar},
    Direct<char>         {"text",   tsCHAR,   nc_get_att_text,   nc_get_var_text,   nc_get_var1_text,   nc_get_vara_text,   nc_get_vars_text},
};
// clang-format on

/// A position or a length along each dimension: slowest first for the library, and the other way
/// round for the host.
using Vector = std::vector<std::size_t>;

Array hostVector(const Vector &vector) {
    const std::array<std::size_t, 2> dims = {1, vector.size()};
    Array array = Array::numeric(tsDOUBLE, dims);
    std::copy(vector.rbegin(), vector.rend(), array.elements<double>().begin());
    return array;
}

std::size_t product(const Vector &lengths) {
    return std::accumulate(lengths.begin(), lengths.end(), std::size_t{1}, std::multiplies<>());
}

Vector hostShape(const Vector &lengths) {
    Vector shape(lengths.rbegin(), lengths.rend());
    shape.resize(std::max<std::size_t>(shape.size(), 2), 1);
    return shape;
}

/// True if the array holds the values, text each byte widened with its sign.
template <class T>
bool holds(const Array &array, const std::vector<T> &values) {
    if (array.size() != values.size()) {
        return false;
    }
    if constexpr (std::is_same_v<T, char>) {
        const auto characters = array.elements<tsChar>();
        return std::equal(values.begin(), values.end(), characters.begin(),
                          [](char byte, tsChar c) {
                              return static_cast<tsChar>(static_cast<signed char>(byte)) == c;
                          });
    } else {
        return values.empty() ||
               std::memcmp(array.data(), values.data(), values.size() * sizeof(T)) == 0;
    }
}

/// One read through the module, and what the library gave.
template <class T>
struct Compared {
    const Direct<T> &direct;
    int status;
    std::vector<T> values;
    Vector shape; ///< host order
    std::string failure;

    template <class... Arguments>
    void with(const std::string &family, const Arguments &...arguments) const {
        const std::string operation = family + direct.suffix;
        try {
            const Results results = netcdf()(operation, arguments...);
            EXPECT_EQ(status, NC_NOERR) << operation;
            EXPECT_EQ(results.size(), 1U) << operation;
            EXPECT_EQ(results[0].classID(), direct.hostClass) << operation;
            EXPECT_EQ(Vector(results[0].dims().begin(), results[0].dims().end()), shape)
                << operation;
            EXPECT_TRUE(holds(results[0], values)) << operation << " reads other values";
        } catch (const Error &error) {
            EXPECT_NE(status, NC_NOERR) << operation;
            EXPECT_EQ(error.message(),
                      failure + ", library error message \"" + nc_strerror(status) + "\"");
        }
    }
};

template <class T>
void compareVariable(int ncid, int varid, const Vector &lengths, const Direct<T> &direct) {
    std::vector<T> values(product(lengths));
    int status = direct.getVar(ncid, varid, values.data());
    Compared<T>{direct, status, values, hostShape(lengths), "Variable data retrieval failed"}.with(
        "get_var_", ncid, varid);
    if (lengths.empty() || values.empty()) {
        return;
    }

    const Vector start(lengths.size());
    status = direct.getVara(ncid, varid, start.data(), lengths.data(), values.data());
    Compared<T>{direct, status, values, hostShape(lengths), "Contiguous data retrieval failed"}
        .with("get_vara_", ncid, varid, hostVector(start), hostVector(lengths));

    // From the end of the first third, every third.
    Vector third;
    Vector count;
    for (const std::size_t length : lengths) {
        third.push_back(length / 3);
        count.push_back((length - length / 3 + 2) / 3);
    }
    const std::vector<std::ptrdiff_t> stride(lengths.size(), 3);
    values.resize(product(count));
    status = direct.getVars(ncid, varid, third.data(), count.data(), stride.data(), values.data());
    Compared<T>{direct, status, values, hostShape(count), "Strided data retrieval failed"}.with(
        "get_vars_", ncid, varid, hostVector(third), hostVector(count),
        hostVector(Vector(stride.begin(), stride.end())));

    // One element; a character comes as text does.
    values.resize(1);
    status = direct.getVar1(ncid, varid, third.data(), values.data());
    if constexpr (std::is_same_v<T, char>) {
        if (status == NC_NOERR) {
            const Array expected = Array::text(std::string(1, values[0]).c_str());
            EXPECT_EQ(shown(netcdf()("get_var1_text", ncid, varid, hostVector(third))[0]),
                      shown(expected));
            return;
        }
    }
    Compared<T>{direct, status, values, {1, 1}, "Single datum retrieval failed"}.with(
        "get_var1_", ncid, varid, hostVector(third));
}

template <class T>
void compareAttribute(int ncid, int varid, const std::string &name, std::size_t length,
                      const Direct<T> &direct) {
    std::vector<T> values(length + 1);
    const int status = direct.getAtt(ncid, varid, name.c_str(), values.data());
    if constexpr (std::is_same_v<T, char>) {
        if (status == NC_NOERR) {
            EXPECT_EQ(shown(netcdf()("get_att_text", ncid, varid, name)[0]),
                      shown(Array::text(values.data())));
            return;
        }
    }
    values.resize(length);
    Compared<T>{direct,
                status,
                values,
                {length == 0 ? 0U : 1U, length},
                "Attribute retrieval operation failed"}
        .with("get_att_", ncid, varid, name);
}

template <class Compare>
void forEachMember(const Compare &compare) {
    std::apply([&](const auto &...direct) { (compare(direct), ...); }, directs);
}

void compareAttributes(int ncid, int varid, int count) {
    for (int number = 0; number < count; ++number) {
        const std::string name = netcdf()("inq_attname", ncid, varid, number)[0].utf8();
        SCOPED_TRACE(name);
        std::array<char, NC_MAX_NAME + 1> directName{};
        want(nc_inq_attname(ncid, varid, number, directName.data()));
        EXPECT_EQ(name, directName.data());
        nc_type type = NC_NAT;
        std::size_t length = 0;
        want(nc_inq_att(ncid, varid, name.c_str(), &type, &length));
        const Results inquired = netcdf()("inq_att", ncid, varid, name);
        EXPECT_EQ(inquired[0].number(), type);
        EXPECT_EQ(inquired[1].number(), static_cast<double>(length));
        forEachMember(
            [&](const auto &direct) { compareAttribute(ncid, varid, name, length, direct); });
    }
}

/// The variable's name and its lengths, library order, asked directly and through the module.
Vector inquireVariable(int ncid, int varid, std::string &name) {
    int ndims = 0;
    want(nc_inq_varndims(ncid, varid, &ndims));
    std::vector<int> dimids(static_cast<std::size_t>(ndims));
    want(nc_inq_vardimid(ncid, varid, dimids.data()));
    Vector lengths(dimids.size());
    Vector ids;
    for (std::size_t i = 0; i < dimids.size(); ++i) {
        want(nc_inq_dimlen(ncid, dimids[i], &lengths[i]));
        ids.push_back(static_cast<std::size_t>(dimids[i]));
        EXPECT_EQ(netcdf()("inq_dim", ncid, dimids[i])[1].number(),
                  static_cast<double>(lengths[i]));
    }
    std::array<char, NC_MAX_NAME + 1> directName{};
    want(nc_inq_varname(ncid, varid, directName.data()));
    name = directName.data();
    const Results inquired = netcdf()("inq_var", ncid, varid);
    EXPECT_EQ(inquired[0].utf8(), name);
    EXPECT_EQ(shown(inquired[2]), ids.empty() ? "0x0 double []" : shown(hostVector(ids)));
    return lengths;
}

void compareDataset(int ncid) {
    const Results counts = netcdf()("inq", ncid);
    int nvars = 0;
    int natts = 0;
    want(nc_inq(ncid, nullptr, &nvars, &natts, nullptr));
    ASSERT_EQ(counts[1].number(), nvars);
    ASSERT_EQ(counts[2].number(), natts);
    compareAttributes(ncid, NC_GLOBAL, natts);
    for (int varid = 0; varid < nvars; ++varid) {
        std::string name;
        const Vector lengths = inquireVariable(ncid, varid, name);
        SCOPED_TRACE(name);
        int count = 0;
        want(nc_inq_varnatts(ncid, varid, &count));
        compareAttributes(ncid, varid, count);
        forEachMember([&](const auto &direct) { compareVariable(ncid, varid, lengths, direct); });
    }
}

/// The classic and 64-bit-offset files of the Debian package of real climate data.
std::vector<std::string> realFiles() {
    std::vector<std::string> files;
    const std::unique_ptr<std::FILE, int (*)(std::FILE *)> listing(
        popen("dpkg -L ferret-datasets", "r"), pclose);
    std::array<char, 4096> line{};
    while (std::fgets(line.data(), line.size(), listing.get()) != nullptr) {
        std::string path = line.data();
        path.erase(path.find_last_not_of('\n') + 1);
        std::array<char, 4> magic{};
        std::ifstream(path, std::ios::binary).read(magic.data(), magic.size());
        const std::string_view begin(magic.data(), magic.size());
        if (begin == "CDF\x01" || begin == "CDF\x02") {
            files.push_back(path);
        }
    }
    return files;
}

TEST(RealFiles, ReadAsTheLibraryReadsThem) {
    const std::vector<std::string> files = realFiles();
    ASSERT_FALSE(files.empty()) << "the package ferret-datasets is not installed";
    for (const std::string &file : files) {
        SCOPED_TRACE(file);
        const Results opened = netcdf()("open", file, "NOWRITE");
        const int id = static_cast<int>(opened[0].number());
        compareDataset(id);
        netcdf()("close", id);
    }
}

TEST(Sample, ReadsAsTheLibraryReadsIt) {
    compareDataset(Scene(On::sample).ncid());
    compareDataset(Scene(On::noRecords).ncid());
}

} // namespace
} // namespace tessel::test
