// tests/conformance/names_in_full.cpp: names as long as they may be, and names that look like a
// format, where the module hands them out or shows them.
#include "support/conformance.hpp"

#include <netcdf.h>

namespace tessel::test {
namespace {

/// A dataset whose one dimension, variable and attribute have a name each.
class Named {
  public:
    explicit Named(const std::string &name) {
        int dimid = 0;
        want(nc_def_dim(id(), name.c_str(), 4, &dimid));
        want(nc_def_var(id(), name.c_str(), NC_INT, 1, &dimid, nullptr));
        want(nc_put_att_text(id(), 0, name.c_str(), 1, "a"));
        want(nc_enddef(id()));
    }
    [[nodiscard]] int id() const { return scene.ncid(); }

  private:
    Scene scene{On::newDataset};
};

const std::string longest(NC_MAX_NAME, 'n');
const std::string format = "100%s %n %d %5$s";

void expectHandedOut(const std::string &name) {
    const Named dataset(name);
    EXPECT_EQ(netcdf()("inq_dim", dataset.id(), 0)[0].utf8(), name);
    EXPECT_EQ(netcdf()("inq_var", dataset.id(), 0)[0].utf8(), name);
    EXPECT_EQ(netcdf()("inq_attname", dataset.id(), 0, 0)[0].utf8(), name);
    EXPECT_EQ(netcdf()("inq_dimid", dataset.id(), name)[0].number(), 0.0);
    EXPECT_EQ(netcdf()("inq_varid", dataset.id(), name)[0].number(), 0.0);
    EXPECT_EQ(netcdf()("inq_attid", dataset.id(), 0, name)[0].number(), 0.0);
}

TEST(NamesInFull, AreHandedOut) {
    expectHandedOut(longest);
    expectHandedOut(format);
}

template <class... Arguments>
std::string messageOf(const Arguments &...arguments) {
    try {
        netcdf()(arguments...);
    } catch (const Error &error) {
        return error.message();
    }
    return "no error";
}

void expectShown(const std::string &name) {
    const Named dataset(name);
    const int id = dataset.id();
    const Array two = Array::row({0, 0});
    const std::string start =
        "The length of the start argument for " + name + " must be 1 instead of 2.";
    const std::string count =
        "The length of the count argument for " + name + " must be 1 instead of 2.";
    const std::string stride =
        "The length of the stride argument for " + name + " must be 1 instead of 2.";
    EXPECT_EQ(messageOf("put_var1_double", id, 0, two, 1), start);
    EXPECT_EQ(messageOf("put_vara_double", id, 0, two, 1, 1), start);
    EXPECT_EQ(messageOf("put_vara_double", id, 0, 0, two, 1), count);
    EXPECT_EQ(messageOf("put_vars_double", id, 0, two, 1, 1, 1), start);
    EXPECT_EQ(messageOf("put_vars_double", id, 0, 0, two, 1, 1), count);
    EXPECT_EQ(messageOf("put_vars_double", id, 0, 0, 1, two, 1), stride);
}

TEST(NamesInFull, AreShownInMessages) {
    expectShown(longest);
    expectShown(format);
}

/// One character more is the library's to refuse.
TEST(NamesInFull, AreNotCutShort) {
    const Scene scene(On::newDataset);
    EXPECT_EQ(
        messageOf("def_dim", scene.ncid(), longest + "n", 4),
        R"(Dimension definition operation failed, library error message "NetCDF: NC_MAX_NAME exceeded")");
    EXPECT_EQ(messageOf(longest + longest),
              "Unrecognized operation:  \"" + longest + longest + "\"");
    EXPECT_EQ(messageOf("param", longest + longest),
              "Unrecognized operation:  \"" + std::string(2 * longest.size(), 'N') + "\"");
}

} // namespace
} // namespace tessel::test
