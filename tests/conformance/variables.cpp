// tests/conformance/variables.cpp: defining, finding, inquiring about and renaming variables.
#include "support/conformance.hpp"
#include "support/text.hpp"

namespace tessel::test {
namespace {

// clang-format off
Rows rows() {
    return {
        {"the fastest dimension comes first", On::sampleDefine,
         {"def_var", ncid, "wind", 5, doubles({2, 0})}, gives({12}),
         {"+ variable 12: float wind(t, x)", "+ wind = 9.96921e+36 9.96921e+36 9.96921e+36 9.96921e+36 9.96921e+36 9.96921e+36 9.96921e+36 9.96921e+36"},
         {"nc_def_var(ncid, \"wind\", 5, 2, {0, 2}, out)", "tsCreateDoubleScalar(12)"}},
        {"three dimensions", On::sampleDefine,
         {"nc_def_var", ncid, "wind", 1, doubles({3, 1, 0})}, gives({12}),
         {"+ variable 12: byte wind(t, y, five)",
          "+ wind = -127 -127 -127 -127 -127 -127 -127 -127 -127 -127 -127 -127 -127 -127 -127 -127 -127 -127 -127 -127 -127 -127 -127 -127 -127 -127 -127 -127 -127 -127"}},
        {"a variable without dimensions", On::newDataset,
         {"def_var", ncid, "pressure", 6, empty(tsDOUBLE)}, gives({0}),
         {"+ variable 0: double pressure()", "+ pressure = 9.969209968386869e+36"},
         {"nc_def_var(ncid, \"pressure\", 6, 0, {}, out)", "tsCreateDoubleScalar(0)"}},
        {"of char", On::sampleDefine, {"def_var", ncid, "v", 2, empty(tsDOUBLE, {1, 0})}, gives({12}),
         {"+ variable 12: char v()", R"(+ v = "\x00")"}},
        {"of short", On::sampleDefine, {"def_var", ncid, "v", 3, empty(tsDOUBLE)}, gives({12}),
         {"+ variable 12: short v()", "+ v = -32767"}},
        {"of int", On::sampleDefine, {"def_var", ncid, "v", 4, empty(tsDOUBLE)}, gives({12}),
         {"+ variable 12: int v()", "+ v = -2147483647"}},
        {"of no type", On::sampleDefine, {"def_var", ncid, "v", 0, 1},
         fails("TESSEL:netcdf:defVar:invalidDataType",
               R"(Variable definition operation failed, library error message "NetCDF: Not a valid data type or _FillValue type mismatch")"), {},
         {"nc_def_var(ncid, \"v\", 0, 1, {1}, out)", "nc_strerror(-45)"}},
        {"of a fraction of a type", On::sampleDefine, {"def_var", ncid, "v", 2.5, 1},
         fails("TESSEL:netcdf:defVar:invalidDataType",
               R"(Variable definition operation failed, library error message "NetCDF: Not a valid data type or _FillValue type mismatch")")},
        {"of type 7", On::sampleDefine, {"def_var", ncid, "v", 7, 1},
         refuses("TESSEL:netcdf:invalidNetcdfDatatype", "The datatype argument 7.000000 is out of range.")},
        {"of type minus 1", On::sampleDefine, {"def_var", ncid, "v", -1, 1},
         refuses("TESSEL:netcdf:invalidNetcdfDatatype", "The datatype argument -1.000000 is out of range.")},
        {"the unlimited dimension not last", On::sampleDefine, {"def_var", ncid, "v", 4, doubles({0, 1})},
         fails("TESSEL:netcdf:defVar:unlimitedDimensionInTheWrongIndex",
               R"(Variable definition operation failed, library error message "NetCDF: NC_UNLIMITED in the wrong index")")},
        {"a dimension that there is not", On::sampleDefine, {"def_var", ncid, "v", 4, 9},
         fails("TESSEL:netcdf:defVar:invalidDimensionIdOrName",
               R"(Variable definition operation failed, library error message "NetCDF: Invalid dimension ID or name")")},
        {"a name that is in use", On::sampleDefine, {"def_var", ncid, "temp", 4, 1},
         fails("TESSEL:netcdf:defVar:nameIsAlreadyInUse",
               R"(Variable definition operation failed, library error message "NetCDF: String match to name in use")")},
        {"in data mode", On::sample, {"def_var", ncid, "v", 4, 1},
         fails("TESSEL:netcdf:defVar:operationNotAllowedInDataMode",
               R"(Variable definition operation failed, library error message "NetCDF: Operation not allowed in data mode")")},
        {"too many dimensions", On::sampleDefine, {"def_var", ncid, "v", 4, wholes(tsDOUBLE, std::vector<int>(1025, 1))},
         refuses("TESSEL:netcdf:ndimsLargerThanNetcdfLimits", "Cannot specify more than 1024 dimensions.")},

        {"name, type, dimensions and number of attributes", On::sample,
         {"inq_var", ncid, varid("temp")}, gives({"temp", 5, doubles({2, 1, 0}), 11}), {},
         {"nc_inq_var(ncid, 1, out, out, out, out, out)", "tsCreateString(\"temp\")", "tsCreateDoubleScalar(5)",
          "tsCreateUninitNumericArray({1, 3}, double)", "tsCreateDoubleScalar(11)"}},
        {"two dimensions and no attribute", On::sample,
         {"nc_inq_var", ncid, varid("name")}, gives({"name", 2, doubles({4, 1}), 0})},
        {"one dimension", On::sample,
         {"inq_var", ncid, varid("mask")}, gives({"mask", 1, 2, 0})},
        {"no dimension", On::sample,
         {"inq_var", ncid, varid("height")}, gives({"height", 6, empty(tsDOUBLE), 0}), {},
         {"nc_inq_var(ncid, 0, out, out, out, out, out)", "tsCreateString(\"height\")", "tsCreateDoubleScalar(6)",
          "tsCreateUninitNumericArray({0, 0}, double)", "tsCreateDoubleScalar(0)"}},
        {"no such variable", On::sample,
         {"inq_var", ncid, 12},
         fails("TESSEL:netcdf:inqVar:variableNotFound", R"(Variable inquiry failed, library error message "NetCDF: Variable not found")"), {},
         {"nc_inq_var(ncid, 12, out, out, out, out, out)", "nc_strerror(-49)"}},

        {"a variable is found", On::sample,
         {"inq_varid", ncid, "grid"}, gives({6}), {}, {"nc_inq_varid(ncid, \"grid\", out)", "tsCreateDoubleScalar(6)"}},
        {"the first has the id zero", On::sample, {"nc_inq_varid", ncid, "height"}, gives({0})},
        {"a name that there is not", On::sample,
         {"inq_varid", ncid, "Grid"},
         fails("TESSEL:netcdf:inqVarID:variableNotFound", R"(Variable ID retrieval failed, library error message "NetCDF: Variable not found")"), {},
         {"nc_inq_varid(ncid, \"Grid\", out)", "nc_strerror(-49)"}},

        {"a variable is renamed", On::sampleDefine,
         {"rename_var", ncid, varid("time"), "seconds"}, givesNothing(),
         {"- variable 7: double time(t)", "- time = 0 1", "+ variable 7: double seconds(t)", "+ seconds = 0 1"},
         {"nc_rename_var(ncid, 7, \"seconds\")"}},
        {"to a shorter name in data mode", On::sample,
         {"nc_rename_var", ncid, varid("time"), "s"}, givesNothing(),
         {"- variable 7: double time(t)", "- time = 0 1", "+ variable 7: double s(t)", "+ s = 0 1"}},
        {"to the name of another one", On::sampleDefine,
         {"rename_var", ncid, varid("time"), "temp"},
         fails("TESSEL:netcdf:renameVar:nameIsAlreadyInUse", R"(Unable to rename variable, library error message "NetCDF: String match to name in use")"), {},
         {"nc_rename_var(ncid, 7, \"temp\")", "nc_strerror(-42)"}},
        {"a variable that there is not", On::sampleDefine,
         {"rename_var", ncid, 99, "v"},
         fails("TESSEL:netcdf:renameVar:variableNotFound", R"(Unable to rename variable, library error message "NetCDF: Variable not found")")},
    };
}
// clang-format on

/// What was given when a variable was defined comes back when it is inquired about.
TEST(Variables, DimensionsComeBackAsGiven) {
    const Scene scene(On::sampleDefine);
    const Array given = Array::row({2, 0});
    const double id = netcdf()("def_var", scene.ncid(), "v", 6, given)[0].number();
    const Results results = netcdf()("inq_var", scene.ncid(), id);
    EXPECT_EQ(shown(results[2]), shown(given));
}

INSTANTIATE_TEST_SUITE_P(Variables, Conformance, testing::ValuesIn(rows()), titleOf);

} // namespace
} // namespace tessel::test
