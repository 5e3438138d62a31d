// tests/conformance/many_dimensions.cpp: variables of more dimensions than most have.
//
// What is written through the module is read by the library, and what the library has written is
// read through the module.
#include "support/conformance.hpp"
#include "support/text.hpp"

#include <netcdf.h>

#include <numeric>

namespace tessel::test {
namespace {

/// A dataset with one variable "v" of so many dimensions: the fastest has 3 elements, the slowest
/// 2, and those between 1.
class ManyDimensions : public testing::TestWithParam<std::size_t> {
  protected:
    ManyDimensions() : lengths(GetParam(), 1) {
        lengths.front() = 2;
        lengths.back() = 3;
        std::vector<int> dimids;
        for (std::size_t i = 0; i < lengths.size(); ++i) {
            want(nc_def_dim(scene.ncid(), ("d" + shown(i)).c_str(), lengths[i],
                            &dimids.emplace_back()));
        }
        want(nc_def_var(scene.ncid(), "v", NC_INT, static_cast<int>(dimids.size()), dimids.data(),
                        nullptr));
        want(nc_enddef(scene.ncid()));
        want(nc_put_var_int(scene.ncid(), 0, std::vector{1, 2, 3, 4, 5, 6}.data()));
    }

    /// As many numbers as there are dimensions, for the host: the fastest dimension's, those
    /// between, and the slowest one's.
    [[nodiscard]] Array vector(double fastest, double between, double slowest) const {
        const std::array<std::size_t, 2> dims = {1, lengths.size()};
        Array array = Array::numeric(tsDOUBLE, dims);
        const auto values = array.elements<double>();
        std::fill(values.begin(), values.end(), between);
        values.front() = fastest;
        values.back() = slowest;
        return array;
    }

    [[nodiscard]] std::string stored() const {
        std::vector<int> values(6);
        want(nc_get_var_int(scene.ncid(), 0, values.data()));
        std::string text;
        for (const int value : values) {
            text += shown(value) + " ";
        }
        return text;
    }

    /// An array of int32.
    [[nodiscard]] Array data(const Value &value) const { return value.make(scene); }

    /// What an array says of itself that has these lengths, fastest first.
    [[nodiscard]] std::string block(std::size_t fastest, std::size_t slowest,
                                    const std::string &values) const {
        std::string text = shown(fastest);
        for (std::size_t i = 2; i < lengths.size(); ++i) {
            text += "x1";
        }
        return text + "x" + shown(slowest) + " int32 [" + values + "]";
    }

    Scene scene{On::newDataset};
    std::vector<std::size_t> lengths;
};

TEST_P(ManyDimensions, Read) {
    const int id = scene.ncid();
    EXPECT_EQ(shown(netcdf()("get_var_int", id, 0)[0]), block(3, 2, "1 2 3 4 5 6"));
    EXPECT_EQ(shown(netcdf()("get_vara_int", id, 0, vector(1, 0, 1), vector(2, 1, 1))[0]),
              block(2, 1, "5 6"));
    EXPECT_EQ(shown(netcdf()("get_vars_int", id, 0, vector(0, 0, 0), vector(2, 1, 2),
                             vector(2, 1, 1))[0]),
              block(2, 2, "1 3 4 6"));
    EXPECT_EQ(shown(netcdf()("get_var1_int", id, 0, vector(2, 0, 0))[0]), "1x1 int32 [3]");
}

TEST_P(ManyDimensions, Write) {
    const int id = scene.ncid();
    netcdf()("put_var_int", id, 0, data(int32s({10, 20, 30, 40, 50, 60})));
    EXPECT_EQ(stored(), "10 20 30 40 50 60 ");
    netcdf()("put_vara_int", id, 0, vector(1, 0, 0), vector(2, 1, 1), data(int32s({7, 8})));
    EXPECT_EQ(stored(), "10 7 8 40 50 60 ");
    netcdf()("put_vars_int", id, 0, vector(0, 0, 0), vector(2, 1, 2), vector(2, 1, 1),
             data(int32s({-1, -2, -3, -4})));
    EXPECT_EQ(stored(), "-1 7 -2 -3 50 -4 ");
    netcdf()("put_var1_int", id, 0, vector(1, 0, 1), data(int32s({99})));
    EXPECT_EQ(stored(), "-1 7 -2 -3 99 -4 ");
}

TEST_P(ManyDimensions, Inquired) {
    std::vector<double> ids(lengths.size());
    std::iota(ids.rbegin(), ids.rend(), 0.0);
    const Results results = netcdf()("inq_var", scene.ncid(), 0);
    const auto found = results[2].elements<double>();
    EXPECT_EQ(std::vector<double>(found.begin(), found.end()), ids);
}

/// Beyond the dimensions that most variables have, and beyond those that few have.
INSTANTIATE_TEST_SUITE_P(All, ManyDimensions, testing::Values(2, 7, 8, 9, 16, 17, 40, 1024));

} // namespace
} // namespace tessel::test
