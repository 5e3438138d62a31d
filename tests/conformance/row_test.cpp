// tests/conformance/row_test.cpp: a row that is wrong in one thing fails.
#include "support/conformance.hpp"

#include <gtest/gtest-spi.h>

namespace tessel::test {
namespace {

/// True if running the row reports anything.
bool complains(const Row &row) {
    testing::TestPartResultArray results;
    const testing::ScopedFakeTestPartResultReporter reporter(
        testing::ScopedFakeTestPartResultReporter::INTERCEPT_ONLY_CURRENT_THREAD, &results);
    check(row);
    return results.size() > 0;
}

constexpr const char *identifier = "TESSEL:netcdf:sync:notNetcdfID";
constexpr const char *message =
    R"(Unable to sync netCDF file, library error message "NetCDF: Not a valid ID")";

Row defining() {
    return {"a dimension is defined",
            On::sampleDefine,
            {"def_dim", ncid, "lon", 360},
            gives({6}),
            {"+ dimension 6: lon = 360"},
            {"nc_def_dim(ncid, \"lon\", 360, out)", "tsCreateDoubleScalar(6)"}};
}
Row failing() {
    return {"no dataset", On::nothing, {"sync", 5}, fails(identifier, message)};
}
Row refusing() {
    return {"no id",
            On::nothing,
            {"sync", empty(tsDOUBLE)},
            refuses("TESSEL:netcdf:emptySetID", "ncid argument cannot be []")};
}

Row with(Row row, Outcome outcome) {
    row.outcome = std::move(outcome);
    return row;
}

TEST(Row, ThatIsRightPasses) {
    EXPECT_FALSE(complains(defining()));
    EXPECT_FALSE(complains(failing()));
    EXPECT_FALSE(complains(refusing()));
}

TEST(Row, OfOtherResultsFails) {
    EXPECT_TRUE(complains(with(defining(), gives({7}))));
    EXPECT_TRUE(complains(with(defining(), gives({singles({6})}))));
    EXPECT_TRUE(complains(with(defining(), gives({shaped({1, 1, 1}, 6)}))));
    EXPECT_TRUE(complains(with(defining(), gives({complexDouble(6)}))));
    EXPECT_TRUE(complains(with(defining(), gives({6, 6}))));
    EXPECT_TRUE(complains(with(defining(), givesNothing())));
    EXPECT_TRUE(complains(with(defining(), fails(identifier, message))));
}

TEST(Row, OfAnotherErrorFails) {
    EXPECT_TRUE(complains(with(failing(), fails("TESSEL:netcdf:sync:invalidArgument", message))));
    EXPECT_TRUE(complains(with(failing(), fails(identifier, "Unable to sync netCDF file"))));
    EXPECT_TRUE(complains(with(failing(), givesNothing())));
}

TEST(Row, ThatIsWrongAboutWhetherTheLibraryWasAskedFails) {
    EXPECT_TRUE(complains(with(failing(), refuses(identifier, message))));
    EXPECT_TRUE(complains(
        with(refusing(), fails("TESSEL:netcdf:emptySetID", "ncid argument cannot be []"))));
}

TEST(Row, OfOtherChangesFails) {
    Row row = defining();
    row.changes = {};
    EXPECT_TRUE(complains(row));
    row.changes = {"+ dimension 6: lon = 361"};
    EXPECT_TRUE(complains(row));
    row.changes = {"+ dimension 6: lon = 360", "- temp:units = char \"kelvin\""};
    EXPECT_TRUE(complains(row));
}

TEST(Row, OfOtherAsksFails) {
    Row row = defining();
    row.asks = {"nc_def_dim(ncid, \"lon\", 361, out)", "tsCreateDoubleScalar(6)"};
    EXPECT_TRUE(complains(row));
    row.asks = {"nc_def_dim(ncid, \"lon\", 360, out)"};
    EXPECT_TRUE(complains(row));
}

} // namespace
} // namespace tessel::test
