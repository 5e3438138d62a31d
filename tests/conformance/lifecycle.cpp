// tests/conformance/lifecycle.cpp: define mode and data mode, fill, flushing, and the end.
#include "support/conformance.hpp"

namespace tessel::test {
namespace {

constexpr const char *badID = "NetCDF: Not a valid ID";

// clang-format off
Rows rows() {
    return {
        {"sync", On::sample, {"sync", ncid}, givesNothing(), {}, {"nc_sync(ncid)"}},
        {"sync in capitals", On::sample, {"NC_SYNC", ncid}, givesNothing(), {}, {"nc_sync(ncid)"}},
        {"sync with an int32 id", On::nothing, {"sync", int32s({65536})},
         fails("TESSEL:netcdf:sync:notNetcdfID", libraryFailed("Unable to sync netCDF file", badID)), {},
         {"nc_sync(65536)", "nc_strerror(-33)"}},
        {"sync in define mode", On::sampleDefine, {"sync", ncid},
         fails("TESSEL:netcdf:sync:operationNotAllowedInDefineMode", libraryFailed("Unable to sync netCDF file", "NetCDF: Operation not allowed in define mode"))},
        {"sync of no dataset", On::nothing, {"sync", 5},
         fails("TESSEL:netcdf:sync:notNetcdfID", libraryFailed("Unable to sync netCDF file", badID))},

        {"redef", On::sample, {"redef", ncid}, givesNothing(),
         {"- classic, data mode, fill", "+ classic, define mode, fill"}, {"nc_redef(ncid)"}},
        {"redef in define mode", On::sampleDefine, {"nc_redef", ncid},
         fails("TESSEL:netcdf:redef:operationNotAllowedInDefineMode", libraryFailed("Unable to place netCDF file in define mode", "NetCDF: Operation not allowed in define mode"))},
        {"redef of a read-only dataset", On::sampleRead, {"redef", ncid},
         fails("TESSEL:netcdf:redef:writeToReadOnly", libraryFailed("Unable to place netCDF file in define mode", "NetCDF: Write to read only"))},
        {"redef of no dataset", On::nothing, {"redef", 5},
         fails("TESSEL:netcdf:redef:notNetcdfID", libraryFailed("Unable to place netCDF file in define mode", badID))},

        {"enddef", On::sampleDefine, {"enddef", ncid}, givesNothing(),
         {"- classic, define mode, fill", "+ classic, data mode, fill"}, {"nc_enddef(ncid)"}},
        {"enddef by its long name", On::newDataset, {"nc_enddef", ncid}, givesNothing(),
         {"- classic, define mode, fill", "+ classic, data mode, fill"}, {"nc_enddef(ncid)"}},
        {"end_def is the same", On::sampleDefine, {"end_def", ncid}, givesNothing(),
         {"- classic, define mode, fill", "+ classic, data mode, fill"}, {"nc_enddef(ncid)"}},
        {"end_def by its long name", On::sampleDefine, {"nc_end_def", ncid}, givesNothing(),
         {"- classic, define mode, fill", "+ classic, data mode, fill"}, {"nc_enddef(ncid)"}},
        {"enddef in data mode", On::sample, {"enddef", ncid},
         fails("TESSEL:netcdf:endDef:operationNotAllowedInDataMode", libraryFailed("Enddef operation failed", "NetCDF: Operation not allowed in data mode"))},
        {"end_def in data mode", On::sample, {"end_def", ncid},
         fails("TESSEL:netcdf:endDef:operationNotAllowedInDataMode", libraryFailed("Enddef operation failed", "NetCDF: Operation not allowed in data mode"))},
        {"end_def without a dataset", On::nothing, {"end_def"},
         refuses("TESSEL:netcdf:enddef:badInputArgumentCount", "Must supply two input parameters for ENDDEF operation.")},

        {"_enddef passes each size in its place", On::newDataset, {"_enddef", ncid, 1, uint8s({2}), int16s({3}), 4}, givesNothing(),
         {"- classic, define mode, fill", "+ classic, data mode, fill"}, {"nc__enddef(ncid, 1, 2, 3, 4)"}},
        {"_enddef by its long name", On::sampleDefine, {"nc__enddef", ncid, 1024, 4, 0, 8}, givesNothing(),
         {"- classic, define mode, fill", "+ classic, data mode, fill"}, {"nc__enddef(ncid, 1024, 4, 0, 8)"}},
        {"_enddef in data mode", On::sample, {"_enddef", ncid, 0, 4, 0, 4},
         fails("TESSEL:netcdf:pEndDef:operationNotAllowedInDataMode", libraryFailed("Performance Enddef operation failed", "NetCDF: Operation not allowed in data mode"))},
        {"_enddef with a negative h_minfree", On::newDataset, {"_enddef", ncid, -1, 4, 0, 4},
         refuses("TESSEL:netcdf:negativeSize", "h_minfree argument must be positive")},
        {"_enddef with a negative v_align", On::newDataset, {"_enddef", ncid, 0, -4, 0, 4},
         refuses("TESSEL:netcdf:negativeSize", "v_align argument must be positive")},
        {"_enddef with a negative v_minfree", On::newDataset, {"_enddef", ncid, 0, 4, -1, 4},
         refuses("TESSEL:netcdf:negativeSize", "v_minfree argument must be positive")},
        {"_enddef with a negative r_align", On::newDataset, {"_enddef", ncid, 0, 4, 0, -4},
         refuses("TESSEL:netcdf:negativeSize", "r_align argument must be positive")},

        {"fill is switched off", On::sample, {"set_fill", ncid, 256}, gives({0}),
         {"- classic, data mode, fill", "+ classic, data mode, no fill"},
         {"nc_set_fill(ncid, 256, out)", "tsCreateUninitNumericArray({1, 1}, double)"}},
        {"fill is left on", On::newDataset, {"nc_set_fill", ncid, 0}, gives({0}), {},
         {"nc_set_fill(ncid, 0, out)", "tsCreateUninitNumericArray({1, 1}, double)"}},
        {"no such fill mode", On::sample, {"set_fill", ncid, 5},
         fails("TESSEL:netcdf:setFill:invalidArgument", libraryFailed("Unable to set fill mode", "NetCDF: Invalid argument"))},
        {"fill modes have no names", On::sample, {"set_fill", ncid, "NOFILL"},
         refuses("TESSEL:netcdf:unpackIntSingleton:badNumericType", "argument must be either double precision or int32")},
        {"fill of a read-only dataset", On::sampleRead, {"set_fill", ncid, 256},
         fails("TESSEL:netcdf:setFill:writeToReadOnly", libraryFailed("Unable to set fill mode", "NetCDF: Write to read only"))},

        {"the default format is set", On::nothing, {"set_default_format", 2}, gives({1}), {"+ default format: 2"},
         {"nc_set_default_format(2, out)", "tsCreateUninitNumericArray({1, 1}, double)"}},
        {"the default format stays", On::nothing, {"nc_set_default_format", 1}, gives({1})},
        {"no such default format", On::nothing, {"set_default_format", 99},
         fails("TESSEL:netcdf:setDefaultFormat:invalidArgument", libraryFailed("Unable to set the default formate", "NetCDF: Invalid argument"))},

        {"close", On::sample, {"close", ncid}, givesNothing(), {"- classic, data mode, fill", "+ closed"}, {"nc_close(ncid)"}},
        {"close in define mode", On::sampleDefine, {"nc_close", ncid}, givesNothing(), {"- classic, define mode, fill", "+ closed"}},
        {"close of a read-only dataset", On::sampleRead, {"close", ncid}, givesNothing(), {"- classic, read only", "+ closed"}},
        {"close of no dataset", On::nothing, {"close", 5},
         fails("TESSEL:netcdf:close:notNetcdfID", libraryFailed("Close operation failed", badID)), {}, {"nc_close(5)", "nc_strerror(-33)"}},

        {"abort in data mode", On::sample, {"abort", ncid}, givesNothing(), {"- classic, data mode, fill", "+ closed"}, {"nc_abort(ncid)"}},
        {"abort of a new dataset takes the file with it", On::newDataset, {"nc_abort", ncid}, givesNothing(),
         {"- classic, define mode, fill", "+ closed", "+ No such file or directory"}, {"nc_abort(ncid)"}},
        {"abort of no dataset", On::nothing, {"abort", 5},
         fails("TESSEL:netcdf:abort:notNetcdfID", libraryFailed("Abort operation failed", badID))},
    };
}
// clang-format on

/// Closing twice: the second time there is no such dataset any more.
TEST(Lifecycle, ClosedTwice) {
    const Scene scene(On::sample);
    const int id = scene.ncid();
    EXPECT_EQ(netcdf()("close", id).size(), 0U);
    try {
        netcdf()("close", id);
        FAIL() << "closed twice";
    } catch (const Error &error) {
        EXPECT_EQ(error.identifier(), "TESSEL:netcdf:close:notNetcdfID");
        EXPECT_EQ(error.message(), libraryFailed("Close operation failed", badID));
    }
}

/// The format that was set is the one that was there before, next time.
TEST(Lifecycle, DefaultFormatIsRemembered) {
    const Scene scene(On::nothing);
    EXPECT_EQ(netcdf()("set_default_format", 2)[0].number(), 1.0);
    EXPECT_EQ(netcdf()("set_default_format", 1)[0].number(), 2.0);
}

/// The fill mode that was set is the one that was there before, next time.
TEST(Lifecycle, FillModeIsRemembered) {
    const Scene scene(On::sample);
    EXPECT_EQ(netcdf()("set_fill", scene.ncid(), 256)[0].number(), 0.0);
    EXPECT_EQ(netcdf()("set_fill", scene.ncid(), 0)[0].number(), 256.0);
}

INSTANTIATE_TEST_SUITE_P(Lifecycle, Conformance, testing::ValuesIn(rows()), titleOf);

} // namespace
} // namespace tessel::test
