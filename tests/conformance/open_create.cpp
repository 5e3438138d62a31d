// tests/conformance/open_create.cpp: opening and creating datasets.
#include "support/conformance.hpp"

#include <netcdf.h>

#include <limits>

namespace tessel::test {
namespace {

constexpr const char *notFound =
    R"(Unable to open netCDF file, library error message "No such file or directory")";

/// The hint that the library chooses when it is asked directly.
Value chosenForOpen() {
    return {[](const Scene &scene) {
        std::size_t hint = 0;
        int id = 0;
        want(nc__open(scene.path("sample.nc").c_str(), NC_WRITE, &hint, &id));
        want(nc_close(id));
        return Array::scalar(static_cast<double>(hint));
    }};
}
Value chosenForCreate() {
    return {[](const Scene &scene) {
        std::size_t hint = 0;
        int id = 0;
        want(nc__create(scene.path("direct.nc").c_str(), NC_CLOBBER, 0, &hint, &id));
        want(nc_close(id));
        return Array::scalar(static_cast<double>(hint));
    }};
}

// clang-format off
Rows opening() {
    return {
        {"a file is opened for reading", On::sampleFile,
         {"open", file("sample.nc"), "NOWRITE"}, gives({opened}),
         {"+ opened sample.nc: classic, read only"},
         {"nc_open(\"sample.nc\", 0, out)", "tsCreateDoubleScalar(65536)"}},
        {"a file is opened for writing", On::sampleFile,
         {"open", file("sample.nc"), "write"}, gives({opened}),
         {"+ opened sample.nc: classic, data mode, fill"},
         {"nc_open(\"sample.nc\", 1, out)", "tsCreateDoubleScalar(65536)"}},
        {"by the long name, with flags as a number", On::sampleFile,
         {"nc_open", file("sample.nc"), int32s({2049})}, gives({opened}),
         {"+ opened sample.nc: classic, data mode, fill"},
         {"nc_open(\"sample.nc\", 2049, out)", "tsCreateDoubleScalar(65536)"}},
        {"a second time", On::sampleRead,
         {"open", file("sample.nc"), "nowrite"}, gives({opened}),
         {"+ opened sample.nc: classic, read only"}},
        {"a missing file", On::nothing,
         {"open", file("missing.nc"), "nowrite"},
         fails("TESSEL:netcdf:open:noSuchFileOrDirectory", notFound), {},
         {"nc_open(\"missing.nc\", 0, out)", "nc_strerror(2)"}},
        {"a missing file with a name beyond ASCII", On::nothing,
         {"open", file("Größe 日本.nc"), "nowrite"},
         fails("TESSEL:netcdf:open:noSuchFileOrDirectory", notFound), {},
         {R"(nc_open("Gr\xC3\xB6\xC3\x9Fe \xE6\x97\xA5\xE6\x9C\xAC.nc", 0, out))", "nc_strerror(2)"}},
        {"a folder that is missing", On::nothing,
         {"open", file("missing/sample.nc"), "nowrite"},
         fails("TESSEL:netcdf:open:noSuchFileOrDirectory", notFound)},
        {"a file that is no dataset", On::textFile,
         {"open", file("text.nc"), "nowrite"},
         fails("TESSEL:netcdf:open:notANetcdfFile",
               R"(Unable to open netCDF file, library error message "NetCDF: Unknown file format")")},

        {"the hint comes first, and then the dataset", On::sampleFile,
         {"_open", file("sample.nc"), "nowrite", 4096}, gives({4096, opened}),
         {"+ opened sample.nc: classic, read only"},
         {"nc__open(\"sample.nc\", 0, &4096, out)", "tsCreateDoubleScalar(4096)", "tsCreateDoubleScalar(65536)"}},
        {"a hint of zero lets the library choose", On::sampleFile,
         {"nc__open", file("sample.nc"), "WRITE", uint8s({0})}, gives({chosenForOpen(), opened}),
         {"+ opened sample.nc: classic, data mode, fill"}},
        {"a hint that the library does not touch", On::nothing,
         {"_open", file("f.nc"), 0, uint64s({18446744073709551615U})}, gives({18446744073709551616.0, 0}), {},
         {"nc__open(\"f.nc\", 0, &18446744073709551615, out)", "tsCreateDoubleScalar(18446744073709551616)", "tsCreateDoubleScalar(0)"},
         answering("nc__open", 0)},
        {"a missing file, tuned", On::nothing,
         {"_open", file("missing.nc"), "nowrite", 4096},
         fails("TESSEL:netcdf:pOpen:noSuchFileOrDirectory",
               R"(Unable to open file in enhanced performance mode, library error message "No such file or directory")")},
        {"a file that is no dataset, tuned", On::textFile,
         {"_open", file("text.nc"), "nowrite", 0},
         fails("TESSEL:netcdf:pOpen:notANetcdfFile",
               R"(Unable to open file in enhanced performance mode, library error message "NetCDF: Unknown file format")")},
        {"an infinite hint", On::sampleFile,
         {"_open", file("sample.nc"), "nowrite", std::numeric_limits<double>::infinity()},
         refuses("TESSEL:netcdf:sizeArgumentIsInfOrNaN", "chunksizehint argument must not be Inf or NaN")},
        {"a negative hint", On::sampleFile,
         {"_open", file("sample.nc"), "nowrite", -1},
         refuses("TESSEL:netcdf:negativeSize", "chunksizehint argument must be positive")},
        {"the file is looked at before the mode", On::nothing,
         {"open", 1, "share"},
         refuses("TESSEL:netcdf:argumentWasNotChar", "file name argument must be character")},
        {"the mode is looked at before the hint", On::nothing,
         {"_open", "f.nc", "share", -1},
         refuses("TESSEL:netcdf:unrecognizedFileMode", "Unknown parameter \"SHARE\".")},
    };
}

Rows creating() {
    return {
        {"a file is created", On::nothing,
         {"create", file("new.nc"), "CLOBBER"}, gives({opened}),
         {"+ opened new.nc: classic, define mode, fill"},
         {"nc_create(\"new.nc\", 0, out)", "tsCreateDoubleScalar(65536)"}},
        {"in the 64-bit-offset format", On::nothing,
         {"nc_create", file("new.nc"), 516}, gives({opened}),
         {"+ opened new.nc: 64-bit offset, define mode, fill"},
         {"nc_create(\"new.nc\", 516, out)", "tsCreateDoubleScalar(65536)"}},
        {"in a file with a name beyond ASCII", On::nothing,
         {"create", file("Größe 日本.nc"), "noclobber"}, gives({opened}),
         {"+ opened Größe 日本.nc: classic, define mode, fill"}},
        {"over a file that is there", On::textFile,
         {"create", file("text.nc"), "clobber"}, gives({opened}),
         {"+ opened text.nc: classic, define mode, fill"}},
        {"not over a file that is there", On::sampleFile,
         {"create", file("sample.nc"), "noclobber"},
         fails("TESSEL:netcdf:create:netcdfFileExistsAndNoClobber",
               R"(Create operation failed, library error message "NetCDF: File exists && NC_NOCLOBBER")"), {},
         {"nc_create(\"sample.nc\", 4, out)", "nc_strerror(-35)"}},
        {"in a folder that is missing", On::nothing,
         {"create", file("missing/new.nc"), "clobber"},
         fails("TESSEL:netcdf:create:noSuchFileOrDirectory",
               R"(Create operation failed, library error message "No such file or directory")")},

        {"the hint comes first, and then the new dataset", On::nothing,
         {"_create", file("new.nc"), "clobber", 1024, 99}, gives({1024, opened}),
         {"+ opened new.nc: classic, define mode, fill"},
         {"nc__create(\"new.nc\", 0, 1024, &1024, out)", "tsCreateDoubleScalar(1024)", "tsCreateDoubleScalar(65536)"}},
        {"the last argument is never read", On::nothing,
         {"nc__create", file("new.nc"), 512, uint16s({2048}), cell()}, gives({2048, opened}),
         {"+ opened new.nc: 64-bit offset, define mode, fill"},
         {"nc__create(\"new.nc\", 512, 2048, &2048, out)", "tsCreateDoubleScalar(2048)", "tsCreateDoubleScalar(65536)"}},
        {"nor is an empty one", On::nothing,
         {"_create", file("new.nc"), "noclobber", 8192, empty(tsDOUBLE)}, gives({8192, opened}),
         {"+ opened new.nc: classic, define mode, fill"}},
        {"a hint of zero lets the library choose", On::nothing,
         {"_create", file("new.nc"), "clobber", 0, 4096}, gives({chosenForCreate(), opened}),
         {"+ opened new.nc: classic, define mode, fill"}},
        {"not over a file that is there, tuned", On::sampleFile,
         {"_create", file("sample.nc"), 4, 0, 0},
         fails("TESSEL:netcdf:pCreate:netcdfFileExistsAndNoClobber",
               R"(Performance create operation failed, library error message "NetCDF: File exists && NC_NOCLOBBER")")},
        {"a negative size", On::nothing,
         {"_create", file("new.nc"), "clobber", int8s({-1}), 0},
         refuses("TESSEL:netcdf:negativeSize", "initialsize argument must be positive")},
    };
}
// clang-format on

INSTANTIATE_TEST_SUITE_P(Open, Conformance, testing::ValuesIn(opening()), titleOf);
INSTANTIATE_TEST_SUITE_P(Create, Conformance, testing::ValuesIn(creating()), titleOf);

} // namespace
} // namespace tessel::test
