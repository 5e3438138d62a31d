// tests/conformance/attributes_metadata.cpp: attributes as named entries, without their values.
#include "support/conformance.hpp"

namespace tessel::test {
namespace {

constexpr const char *notThere = "NetCDF: Attribute not found";

// clang-format off
Rows rows() {
    return {
        {"type and length", On::sample,
         {"inq_att", ncid, varid("temp"), "doubles"}, gives({6, 5}), {},
         {"nc_inq_att(ncid, 1, \"doubles\", out, out)", "tsCreateDoubleScalar(6)", "tsCreateDoubleScalar(5)"}},
        {"of text the length is in characters", On::sample, {"nc_inq_att", ncid, varid("temp"), "units"}, gives({2, 6})},
        {"of an attribute of the dataset", On::sample, {"inq_att", ncid, -1, "version"}, gives({4, 1})},
        {"of an empty attribute", On::sample, {"inq_att", ncid, 1, "none"}, gives({4, 0})},
        {"of an attribute that there is not", On::sample, {"inq_att", ncid, 1, "Units"},
         fails("TESSEL:netcdf:inqAtt:attributeNotFound", libraryFailed("Attribute inquiry failed", notThere)), {},
         {"nc_inq_att(ncid, 1, \"Units\", out, out)", "nc_strerror(-43)"}},
        {"of a variable that there is not", On::sample, {"inq_att", ncid, 99, "units"},
         fails("TESSEL:netcdf:inqAtt:variableNotFound", libraryFailed("Attribute inquiry failed", "NetCDF: Variable not found"))},

        {"the number of an attribute", On::sample,
         {"inq_attid", ncid, varid("temp"), "accents"}, gives({3}), {},
         {"nc_inq_attid(ncid, 1, \"accents\", out)", "tsCreateDoubleScalar(3)"}},
        {"the first has the number zero", On::sample, {"nc_inq_attid", ncid, 1, "units"}, gives({0})},
        {"of the dataset", On::sample, {"inq_attid", ncid, -1, "version"}, gives({1})},
        {"the number of one that there is not", On::sample, {"inq_attid", ncid, -1, "units"},
         fails("TESSEL:netcdf:inqAttID:attributeNotFound", libraryFailed("Attribute ID retrieval failed", notThere)), {},
         {"nc_inq_attid(ncid, -1, \"units\", out)", "nc_strerror(-43)"}},

        {"the name of an attribute", On::sample,
         {"inq_attname", ncid, varid("temp"), 3}, gives({"accents"}), {},
         {"nc_inq_attname(ncid, 1, 3, out)", "tsCreateString(\"accents\")"}},
        {"its number an int32", On::sample, {"nc_inq_attname", ncid, 1, int32s({0})}, gives({"units"})},
        {"the name of one of the dataset", On::sample, {"inq_attname", ncid, -1, 0}, gives({"title"})},
        {"a number as large as there are attributes", On::sample, {"inq_attname", ncid, -1, 2},
         fails("TESSEL:netcdf:inqAttName:attributeNotFound", libraryFailed("Attribute name retrieval failed", notThere)), {},
         {"nc_inq_attname(ncid, -1, 2, out)", "nc_strerror(-43)"}},
        {"a number that is text", On::sample, {"inq_attname", ncid, -1, "0"},
         refuses("TESSEL:netcdf:badIDDatatype", "attid argument must be either double precision or int32, not char")},

        {"an attribute is renamed", On::sampleDefine,
         {"rename_att", ncid, varid("temp"), "units", "measured_in"}, givesNothing(),
         {"- temp:units = char \"kelvin\"", "+ temp:measured_in = char \"kelvin\""},
         {R"(nc_rename_att(ncid, 1, "units", "measured_in"))"}},
        {"one of the dataset, in data mode", On::sample,
         {"nc_rename_att", ncid, -1, "title", "t"}, givesNothing(),
         {"- :title = char \"Sample\"", "+ :t = char \"Sample\""}},
        {"to the name of another one", On::sampleDefine, {"rename_att", ncid, 1, "units", "cut"},
         fails("TESSEL:netcdf:renameAtt:nameIsAlreadyInUse", libraryFailed("Unable to rename attribute", "NetCDF: String match to name in use")), {},
         {R"(nc_rename_att(ncid, 1, "units", "cut"))", "nc_strerror(-42)"}},
        {"one that there is not", On::sampleDefine, {"rename_att", ncid, 1, "unit", "u"},
         fails("TESSEL:netcdf:renameAtt:attributeNotFound", libraryFailed("Unable to rename attribute", notThere))},
        {"a new name that is a number", On::sampleDefine, {"rename_att", ncid, 1, "units", 1},
         refuses("TESSEL:netcdf:argumentWasNotChar", "attribute name argument must be character")},

        {"an attribute is deleted", On::sampleDefine,
         {"del_att", ncid, varid("temp"), "units"}, givesNothing(), {"- temp:units = char \"kelvin\""}, {"nc_del_att(ncid, 1, \"units\")"}},
        {"one of the dataset is deleted", On::sampleDefine,
         {"nc_del_att", ncid, -1, "version"}, givesNothing(), {"- :version = int 3"}},
        {"one that there is not is not deleted", On::sampleDefine, {"del_att", ncid, -1, "units"},
         fails("TESSEL:netcdf:delAtt:attributeNotFound", libraryFailed("Attribute deletion operation failed", notThere)), {},
         {"nc_del_att(ncid, -1, \"units\")", "nc_strerror(-43)"}},
        {"nor one in data mode", On::sample, {"del_att", ncid, -1, "version"},
         fails("TESSEL:netcdf:delAtt:operationNotAllowedInDataMode", libraryFailed("Attribute deletion operation failed", "NetCDF: Operation not allowed in data mode"))},

        {"an attribute is copied to another variable", On::sampleDefine,
         {"copy_att", ncid, varid("temp"), "units", ncid, varid("grid")}, givesNothing(),
         {"+ grid:units = char \"kelvin\""}, {"nc_copy_att(ncid, 1, \"units\", ncid, 6)"}},
        {"to the dataset", On::sampleDefine,
         {"nc_copy_att", ncid, varid("temp"), "fives", ncid, -1}, givesNothing(), {"+ :fives = short 1 2 3 4 5"}},
        {"to another dataset", On::twoDatasets,
         {"copy_att", ncid, -1, "title", other, 0}, givesNothing(),
         {"+ other: v:title = char \"Sample\""}, {"nc_copy_att(ncid, -1, \"title\", other, 0)"}},
        {"from a dataset where it is not", On::twoDatasets,
         {"copy_att", other, -1, "title", ncid, -1},
         fails("TESSEL:netcdf:copyAtt:attributeNotFound", libraryFailed("Attribute copy operation failed", notThere)), {},
         {"nc_copy_att(other, -1, \"title\", ncid, -1)", "nc_strerror(-43)"}},
        {"to no dataset", On::sampleDefine,
         {"copy_att", ncid, -1, "title", 5, -1},
         fails("TESSEL:netcdf:copyAtt:notNetcdfID", libraryFailed("Attribute copy operation failed", "NetCDF: Not a valid ID"))},
        {"the destination is looked at last", On::sampleDefine,
         {"copy_att", ncid, -1, 3, "x", "y"},
         refuses("TESSEL:netcdf:argumentWasNotChar", "attribute name argument must be character")},
        {"a bad destination is named as the source would be", On::sampleDefine,
         {"copy_att", ncid, -1, "title", "x", "y"},
         refuses("TESSEL:netcdf:badIDDatatype", "ncid argument must be either double precision or int32, not char")},
        {"and so is its variable", On::sampleDefine,
         {"copy_att", ncid, -1, "title", ncid, singles({1})},
         refuses("TESSEL:netcdf:badIDDatatype", "varid argument must be either double precision or int32, not single")},
    };
}
// clang-format on

INSTANTIATE_TEST_SUITE_P(AttributesMetadata, Conformance, testing::ValuesIn(rows()), titleOf);

} // namespace
} // namespace tessel::test
