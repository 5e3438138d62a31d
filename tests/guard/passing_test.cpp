// tests/guard/passing_test.cpp: what looks like a refused call and is none, and addresses.
#include "support.hpp"

#include <cstddef>
#include <functional>
#include <ostream>
#include <utility>
#include <vector>

namespace tessel::test {
namespace {

using namespace std::string_literals;

struct Passing {
    const char *name;
    const char *identifier; // what the module itself says; "" if the call succeeds
    std::function<void(const Module &netcdf, const Folder &folder)> call;
};

void PrintTo(const Passing &row, std::ostream *out) {
    *out << row.name;
}

/// Defines a variable of this name.
void definingName(const Module &netcdf, const Folder &folder, const std::string &name,
                  int flags = 0) {
    const int ncid = intOf(netcdf("create", folder.file("a.nc"), flags));
    netcdf("def_dim", ncid, "x", 3);
    netcdf("def_var", ncid, name, ncDouble, 0);
    netcdf("close", ncid);
}

const Passing rows[] = {
    {"AlignmentBeforeAnyVariable", "",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("_enddef", intOf(netcdf("create", folder.file("a.nc"), 0)), 0, 0, 0, 0);
     }},
    {"AlignmentOutsideOfDefineMode", "TESSEL:netcdf:pEndDef:operationNotAllowedInDataMode",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("_enddef", newDataset(netcdf, folder.file("a.nc")), 0, 0, 0, 0);
     }},
    {"AlignmentOfAnHdf5File", "",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"), 4096);
         netcdf("redef", ncid);
         netcdf("_enddef", ncid, 0, 0, 0, 0);
     }},
    {"AlignmentOfAnHdf5FileByDefault", "",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = datasetWithDefault(netcdf, folder, 3, 0);
         netcdf("redef", ncid);
         netcdf("_enddef", ncid, 0, 0, 0, 0);
     }},
    {"MappedMemoryThatThereIsToReadBy", "",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("close", newDataset(netcdf, folder.file("a.nc")));
         netcdf("close", netcdf("_open", folder.file("a.nc"), 16, 0x1p40)[1]);
         netcdf("close", netcdf("_open", folder.file("a.nc"), 16, 0x1p63)[1]);
     }},
    {"RecordsInMappedMemory", "",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = unfilledVariable(netcdf, folder, ncDouble, {0}, mapped);
         netcdf("put_var1_double", ncid, 0, 0x1p20, 1);
         const LittleMemory little;
         netcdf("put_var1_double", ncid, 0, 0x1p21, 1);
         netcdf("close", ncid);
     }},
    {"NoRecordsInMappedMemory", "", // of which one would be a GiB
     [](const Module &netcdf, const Folder &folder) {
         const LittleMemory little;
         netcdf("close", unfilledVariable(netcdf, folder, ncDouble, {0, 0x1p27}, mapped));
     }},
    {"RecordsOfSingleBytes", "", // the records of a single variable are not rounded up
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = unfilledVariable(netcdf, folder, ncChar, {0}, mapped);
         const LittleMemory little;
         netcdf("put_var1_text", ncid, 0, 0x1p27, "a");
         netcdf("close", ncid);
     }},
    {"AMappedFileThatIsRead", "",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("close", newDataset(netcdf, folder.file("a.nc")));
         const int ncid = intOf(netcdf("_open", folder.file("a.nc"), mapped, 1e6));
         netcdf("get_var_double", ncid, 0);
         netcdf("close", ncid);
     }},
    {"AMappedFileWhoseRecordsAreNotRoundedUp", "",
     [](const Module &netcdf, const Folder &folder) {
         const int made = unfilledVariable(netcdf, folder, ncChar, {0});
         netcdf("put_vara_text", made, 0, 0, 10, "abcdefghij");
         netcdf("close", made);
         const int ncid = intOf(netcdf("_open", folder.file("a.nc"), mapped, 8192));
         netcdf("get_var_text", ncid, 0);
         netcdf("close", ncid);
     }},
    {"AMappedFileThatIsNotThere", "TESSEL:netcdf:pOpen:noSuchFileOrDirectory",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("_open", folder.file("none.nc"), mapped, 1e15);
     }},
    {"AnHdf5FileThatIsNotMapped", "TESSEL:netcdf:open:invalidArgument",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("close", newDataset(netcdf, folder.file("a.nc"), hdf5));
         netcdf("close", intOf(netcdf("open", folder.file("a.nc"), mapped + 1)));
     }},
    {"AFarRecordOfADatasetForReading", "TESSEL:netcdf:putVar1:writeToReadOnly",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("close", newDataset(netcdf, folder.file("a.nc")));
         netcdf("put_var1_double", intOf(netcdf("open", folder.file("a.nc"), 0)), 1,
                Array::row({0, 0x1p31}), 1);
     }},
    {"AMappedFileIsNoMemoryOfTheProcess", "",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("close", newDataset(netcdf, folder.file("a.nc")));
         std::filesystem::resize_file(folder.file("a.nc"), std::uintmax_t{1} << 30U);
         const LittleMemory little;
         netcdf("close", intOf(netcdf("open", folder.file("a.nc"), mapped)));
     }},
    {"ANewFileWithBothFlags", "TESSEL:netcdf:create:unknownErrorStatus",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("create", folder.file("a.nc"), 8 + mapped + persistent);
     }},
    {"AFileWithBothFlags", "TESSEL:netcdf:open:unknownErrorStatus",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("close", newDataset(netcdf, folder.file("a.nc")));
         netcdf("close", intOf(netcdf("open", folder.file("a.nc"), 8 + mapped + 1)));
     }},
    {"MemoryThatIsNotMapped", "",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("close", newDataset(netcdf, folder.file("a.nc")));
         netcdf("close", netcdf("_open", folder.file("a.nc"), 8, 1e15)[1]);
         netcdf("close", netcdf("_open", folder.file("a.nc"), 0, 1e15)[1]);
     }},
    {"AlignmentOfAnHdf5FileByDefaultWithOtherFlags", "",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = datasetWithDefault(netcdf, folder, 4, 8192);
         netcdf("redef", ncid);
         netcdf("_enddef", ncid, 0, 0, 0, 0);
     }},
    {"AlignmentOfAnHdf5FileOfTheClassicModel", "",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"), 4096 + 256);
         netcdf("redef", ncid);
         netcdf("_enddef", ncid, 0, 0, 0, 0);
     }},
    {"AlignmentToChunks", "",
     [](const Module &netcdf, const Folder &folder) {
         const Array chunks = Array::numeric(tsUINT64, std::array<std::size_t, 2>{1, 1});
         chunks.elements<std::uint64_t>()[0] = UINT64_MAX;
         const int ncid = newDataset(netcdf, folder.file("a.nc"), 512);
         netcdf("redef", ncid);
         netcdf("_enddef", ncid, 0, chunks, 0, chunks);
         netcdf("put_var1_double", ncid, 0, 9, 7);
         netcdf("close", ncid);
         const int again = intOf(netcdf("open", folder.file("a.nc"), "NOWRITE"));
         EXPECT_EQ(netcdf("get_var1_double", again, 0, 9)[0].number(), 7);
     }},
    {"AlignmentOf2To62", "TESSEL:netcdf:pEndDef:invalidArgument",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"), 512);
         netcdf("redef", ncid);
         netcdf("_enddef", ncid, 0, 0x1p62, 0, 4);
     }},
    {"AlignmentOf2To63BeforeAnyVariable", "",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("_enddef", intOf(netcdf("create", folder.file("a.nc"), 0)), 0, 0x1p63, 0, 0x1p63);
     }},
    {"LengthsThatAreTooLargeForTheLibraryByDefault",
     "TESSEL:netcdf:endDef:formatSizeConstraintsViolated",
     [](const Module &netcdf, const Folder &folder) {
         const int former = intOf(netcdf("set_default_format", 5));
         const int ncid = definingVariable(netcdf, folder, ncDouble, {0x1p62, 2});
         netcdf("set_default_format", former);
         netcdf("enddef", ncid);
     }},
    {"RedefinitionOfASharedFileThatIsNotFilled", "",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = definingVariable(netcdf, folder, ncDouble, {0x1p30}, 2048 + data64);
         netcdf("set_fill", ncid, noFill);
         netcdf("_enddef", ncid, 4096, 4, 0, 4);
         netcdf("redef", ncid);
         netcdf("put_att_text", ncid, global, "a", "b");
         netcdf("close", ncid);
     }},
    {"RedefinitionOfAFileWithoutItsLastFilling", "",
     [](const Module &netcdf, const Folder &folder) {
         const int made = definingVariable(netcdf, folder, ncChar, {0}, data64);
         netcdf("enddef", made);
         netcdf("put_var1_text", made, 0, 0, "a");
         netcdf("close", made);
         const int ncid = intOf(netcdf("open", folder.file("a.nc"), 1));
         netcdf("set_fill", ncid, noFill);
         netcdf("redef", ncid);
         const double x = netcdf("def_dim", ncid, "x", 0x1p31)[0].number();
         netcdf("def_var", ncid, "w", ncDouble, Array::row({x, 0}));
         netcdf("close", ncid);
     }},
    {"LengthsThatAreTooLargeForTheLibrary", "TESSEL:netcdf:endDef:formatSizeConstraintsViolated",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("enddef", definingVariable(netcdf, folder, ncDouble, {2, 0x1p62, 2}, data64));
     }},
    {"ALengthOfWhichNoVariableIs", "",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = definingVariable(netcdf, folder, ncDouble, {2}, data64);
         netcdf("def_dim", ncid, "z", 0x1p63);
         netcdf("enddef", ncid);
     }},
    {"AVariableOverADimensionThatThereIsNot", "TESSEL:netcdf:defVar:invalidDimensionIdOrName",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = definingVariable(netcdf, folder, ncDouble, {2});
         netcdf("def_var", ncid, "w", ncDouble, 99);
     }},
    {"AlignmentThatIsNegative", "TESSEL:netcdf:negativeSize",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         netcdf("redef", ncid);
         netcdf("_enddef", ncid, 0, -1, 0, 4);
     }},
    {"TooFewInputs", "TESSEL:netcdf:pEndDef:badParameterCount",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         netcdf("redef", ncid);
         netcdf("_enddef", ncid, 0, 0, 0);
     }},
    {"OpenOfAUserFormat", "TESSEL:netcdf:open:unknownErrorStatus",
     [](const Module &netcdf, const Folder &folder) {
         newDataset(netcdf, folder.file("a.nc"));
         netcdf("open", folder.file("a.nc"), 64);
     }},
    {"CreateInMemoryFlag", "",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("close", intOf(netcdf("create", folder.file("a.nc"), 32768)));
     }},
    {"SecondCloseOfADatasetThatWasClosed", "TESSEL:netcdf:close:notNetcdfID",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         netcdf("close", ncid);
         netcdf("close", ncid);
     }},
    {"CountsThatWrapToAnotherNumber", "TESSEL:netcdf:putVara:dataSizeMismatch",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         netcdf("put_vara_double", ncid, 1, Array::row({0, 0}), Array::row({-1, -1}),
                Array::row({1, 2}));
     }},
    {"CountsWithoutData", "TESSEL:netcdf:emptyVariableData",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         netcdf("put_vara_double", ncid, 1, Array::row({0, 0}), Array::row({2, 0x1p63}),
                Array::numeric(tsDOUBLE, std::array<std::size_t, 2>{0, 0}));
     }},
    {"AStepBackwardsFromARecordFarBeyond", "TESSEL:netcdf:putVars:illegalStride",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         netcdf("put_vars_double", ncid, 1, Array::row({0, 4e9}), Array::row({1, 2}),
                Array::row({1, -1}), Array::row({1, 2}));
     }},
    {"AnElementFarBeyondTheRecordsWithoutFilling", "",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"), 512); // 64-bit offsets
         netcdf("set_fill", ncid, 256);
         netcdf("put_var1_double", ncid, 1, Array::row({0, 2e8}), 1);
     }},
    {"AnElementFarBeyondAFixedDimension", "TESSEL:netcdf:putVar1:indexExceedsDimensionBound",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         netcdf("put_var1_double", ncid, 0, 4e9, 1);
         netcdf("put_var1_double", ncid, 0, 4e9, 1);
     }},
    {"AnElementOfNoVariable", "TESSEL:netcdf:putVar1:inqVarNDimsFailure",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         netcdf("put_var1_double", ncid, 7, Array::row({0, 4e9}), 1);
     }},
    {"AnElementOfNoDataset", "TESSEL:netcdf:putVar1:inqVarNDimsFailure",
     [](const Module &netcdf, const Folder & /*folder*/) {
         netcdf("put_var1_double", 0x7FFF0000, 1, Array::row({0, 4e9}), 1);
     }},
    {"AnElementWhileDefining", "TESSEL:netcdf:putVar1:operationNotAllowedInDefineMode",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         netcdf("redef", ncid);
         netcdf("put_var1_double", ncid, 1, Array::row({0, 4e9}), 1);
     }},
    {"AnElementFarBeyondTheRecordsOfAnHdf5File", "",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"), 4096);
         netcdf("put_var1_double", ncid, 1, Array::row({0, 4e9}), 1);
     }},
    {"ALongNameThatGrowsLittle", "",
     [](const Module &netcdf, const Folder &folder) {
         definingName(netcdf, folder, repeated("x", 130) + repeated(growing, 21));
     }},
    {"ALongNameOfJapanese", "",
     [](const Module &netcdf, const Folder &folder) {
         definingName(netcdf, folder, repeated("\u6C34\u6E29\u304C\u30C7", 21));
     }},
    {"ALongNameOfJapaneseInParts", "",
     [](const Module &netcdf, const Folder &folder) {
         definingName(netcdf, folder, repeated("\u304B\u3099\u30C6\u3099", 21));
     }},
    {"ALongNameOfKorean", "",
     [](const Module &netcdf, const Folder &folder) {
         definingName(netcdf, folder, repeated("\uD55C\uAE00\uAC01", 28));
     }},
    {"ALongNameOfKoreanInParts", "",
     [](const Module &netcdf, const Folder &folder) {
         definingName(netcdf, folder, repeated("\u1112\u1161\u11AB\u1100", 21));
     }},
    {"ALongNameOfAncientGreek", "",
     [](const Module &netcdf, const Folder &folder) {
         definingName(netcdf, folder, repeated("\u1F82\u0390\u1FB7\u1F00", 22));
     }},
    {"ALongNameOfRussianInParts", "",
     [](const Module &netcdf, const Folder &folder) {
         definingName(netcdf, folder, repeated("\u0441\u0438\u0306\u0442\u043E\u0432", 21));
     }},
    {"ALongNameOfVietnameseInParts", "",
     [](const Module &netcdf, const Folder &folder) {
         definingName(netcdf, folder, repeated("a\u0323\u0302u\u031B\u0301n", 23));
     }},
    {"ALongNameOfVietnamese", "",
     [](const Module &netcdf, const Folder &folder) {
         definingName(netcdf, folder, repeated("\u1EAD\u1EE9n", 36));
     }},
    {"ANameThatIsTooLongAndGrows", "TESSEL:netcdf:defVar:maximumNameLengthExceeded",
     [](const Module &netcdf, const Folder &folder) {
         definingName(netcdf, folder, repeated(growing, 129));
     }},
    {"ANameThatGrowsInAnHdf5File", "TESSEL:netcdf:defVar:maximumNameLengthExceeded",
     [](const Module &netcdf, const Folder &folder) {
         definingName(netcdf, folder, repeated(growing, 128), 4096);
     }},
    {"ANewNameThatGrowsOutsideOfDefineMode",
     "TESSEL:netcdf:renameVar:operationNotAllowedInDataMode",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         netcdf("rename_var", ncid, 0, repeated(growing, 128));
     }},
    {"ANameThatGrowsInNoDataset", "TESSEL:netcdf:defDim:notNetcdfID",
     [](const Module &netcdf, const Folder & /*folder*/) {
         netcdf("def_dim", 0x7FFF0000, repeated(growing, 128), 3);
     }},
    {"ANameThatGrowsOfWhichNothingIs", "TESSEL:netcdf:inqVarID:variableNotFound",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         netcdf("inq_varid", ncid, repeated(growing, 128));
     }},
    {"AWordInsteadOfADataset", "TESSEL:netcdf:badIDDatatype",
     [](const Module &netcdf, const Folder & /*folder*/) { netcdf("close", "all"); }},
};

class PassingCall : public testing::TestWithParam<Passing> {};

TEST_P(PassingCall, IsAnsweredByTheModule) {
    const Folder folder;
    EXPECT_EQ(identifierOf([&] { GetParam().call(guardedModule(), folder); }),
              GetParam().identifier);
    const Folder other;
    EXPECT_EQ(identifierOf([&] { GetParam().call(plainModule(), other); }), GetParam().identifier);
}

INSTANTIATE_TEST_SUITE_P(Rows, PassingCall, testing::ValuesIn(rows),
                         [](const auto &row) { return row.param.name; });

/// One value is written to a variable with these alignments; those of the library instead of what
/// is refused. The identifier of what refuses them.
std::string writtenWithAlignments(const Module &netcdf, const std::string &file, int flags,
                                  bool records, double alignment) {
    const int ncid = intOf(netcdf("create", file, flags));
    netcdf("def_dim", ncid, "x", records ? 0 : 3);
    netcdf("def_var", ncid, "v", ncDouble, 0);
    std::string refused = identifierOf(
        [&] { netcdf("_enddef", ncid, 0, records ? 4 : alignment, 0, records ? alignment : 4); });
    if (!refused.empty()) {
        netcdf("enddef", ncid);
    }
    netcdf("put_var1_double", ncid, 0, 0, 7);
    netcdf("close", ncid);
    return refused;
}

/// What is written goes over the header, and nothing says so.
TEST(Alignment, Of2To63OrMoreIsRefused) {
    const Folder folder;
    const std::string file = folder.file("a.nc");
    const auto open = [&] { plainModule()("open", file, "NOWRITE"); };
    for (const double alignment : {0x1p63, 0x1p64 - 2048, 1e300}) {
        for (const int flags : {0, 512, data64}) {
            for (const bool records : {false, true}) {
                const auto write = [&](const Module &netcdf) {
                    return writtenWithAlignments(netcdf, file, flags, records, alignment);
                };
                EXPECT_EQ(write(plainModule()), "");
                EXPECT_TRUE(identifierOf(open).starts_with("TESSEL:netcdf:open:"))
                    << alignment << " " << flags << " " << records;
                EXPECT_EQ(write(guardedModule()), "TESSEL:guard:alignment");
                EXPECT_EQ(identifierOf(open), "");
            }
        }
    }
}

/// Without the guard, what is written to a mapped file is lost, and nobody says so.
TEST(Mapping, OfAFileThatIsWritten) {
    const Folder folder;
    const auto write = [&](const Module &netcdf) {
        netcdf("close", newDataset(netcdf, folder.file("a.nc")));
        const int ncid = intOf(netcdf("open", folder.file("a.nc"), mapped + 1));
        netcdf("put_var1_double", ncid, 1, Array::row({3, 0}), 21);
        netcdf("close", ncid);
    };
    const auto read = [&] {
        const Module netcdf = plainModule();
        const int ncid = intOf(netcdf("open", folder.file("a.nc"), "NOWRITE"));
        const double found = netcdf("get_var1_double", ncid, 1, Array::row({3, 0}))[0].number();
        netcdf("close", ncid);
        return found;
    };
    EXPECT_EQ(identifierOf([&] { write(plainModule()); }), "");
    EXPECT_NE(read(), 21);
    EXPECT_EQ(identifierOf([&] { write(guardedModule()); }), "TESSEL:guard:mapping");
}

/// Dimensions and attributes of such names end a process; a variable of one only makes a file that
/// the guard itself refuses.
TEST(Names, OfVariablesThatGrow) {
    const Folder folder;
    definingName(plainModule(), folder, repeated(growing, 128));
    const Module netcdf = guardedModule();
    EXPECT_EQ(identifierOf([&] { netcdf("open", folder.file("a.nc"), "NOWRITE"); }),
              "TESSEL:guard:header");
    EXPECT_EQ(identifierOf([&] { definingName(netcdf, folder, repeated(growing, 128)); }),
              "TESSEL:guard:name");
    const int ncid = definingVariable(netcdf, folder, ncDouble, {3});
    EXPECT_EQ(identifierOf([&] { netcdf("rename_var", ncid, 0, repeated(growing, 128)); }),
              "TESSEL:guard:name");
    netcdf("close", ncid);
}

TEST(Names, GrowUpToTheLimit) {
    const Folder folder;
    const Module netcdf = guardedModule();
    const int ncid = definingVariable(netcdf, folder, ncDouble, {3});
    const auto rename = [&](std::string_view letter, std::size_t times, std::size_t others) {
        const std::string name = repeated("x", others) + repeated(letter, times);
        return identifierOf([&] { netcdf("rename_dim", ncid, 0, name); });
    };
    // Three times as long at most, and twice as long in truth, but for the last.
    EXPECT_EQ(rename(growing, 42, 4), "");
    EXPECT_EQ(rename(growing, 42, 5), "TESSEL:guard:name");
    EXPECT_EQ(rename("\u0958", 28, 4), "");
    EXPECT_EQ(rename("\u0958", 28, 5), "TESSEL:guard:name");
    EXPECT_EQ(rename("\U0001D160", 21, 4), "");
    EXPECT_EQ(rename("\U0001D160", 21, 5), "TESSEL:guard:name");
    // A mark that takes the place of the letter's own.
    EXPECT_EQ(rename("\u01D5\u0323", 36, 4), "");
    EXPECT_EQ(netcdf("inq_dim", ncid, 0)[0].utf8().size(), 4 + 36 * 7U) << "from 2 and 2 bytes";
    EXPECT_EQ(rename("\u01D5\u0323", 36, 5), "TESSEL:guard:name");
    EXPECT_EQ(rename("U\u0323\u0308\u0304", 36, 3), "") << "in parts from the beginning";
    netcdf("close", ncid);
}

TEST(Records, FillUpToTheLimit) {
    const Folder folder;
    const Module netcdf = guardedModule({.fillLimit = 800}); // ten records
    const int ncid = newDataset(netcdf, folder.file("a.nc"));
    const auto write = [&](double record) {
        return identifierOf([&] {
            netcdf("put_var1_double", ncid, 1, Array::row({0, record}), 1);
        });
    };
    EXPECT_EQ(write(11), "TESSEL:guard:records");
    EXPECT_EQ(write(10), "") << "ten records are filled";
    EXPECT_EQ(write(3), "");
    EXPECT_EQ(write(22), "TESSEL:guard:records") << "the records end at 11";
    EXPECT_EQ(write(21), "");
    for (int record = 22; record < 100; ++record) {
        EXPECT_EQ(write(record), "") << "records one after the other fill nothing";
    }
    netcdf("put_vara_double", ncid, 1, Array::row({0, 100}), Array::row({1, 40}),
           Array::numeric(tsDOUBLE, std::array<std::size_t, 2>{1, 40}));
    EXPECT_EQ(netcdf("inq_dim", ncid, 0)[1].number(), 140);
    // A variable that is defined later makes the records longer.
    netcdf("redef", ncid);
    netcdf("def_var", ncid, "more", ncDouble, Array::row({1, 0}));
    netcdf("enddef", ncid);
    EXPECT_EQ(write(146), "TESSEL:guard:records") << "six records of 160 bytes";
    EXPECT_EQ(write(145), "");
    netcdf("close", ncid);
}

TEST(Records, OfADatasetThatWasOpenedWithoutTheGuard) {
    const Folder folder;
    const Module netcdf = plainModule();
    const int ncid = newDataset(netcdf, folder.file("a.nc"));
    const auto write = [&] {
        guardedModule()("put_var1_double", ncid, 1, Array::row({0, 4e9}), 1);
    };
    EXPECT_EQ(identifierOf(write), "TESSEL:guard:records");
    netcdf("close", ncid);
}

struct Name {
    const char *name;
    bool address;
};

TEST(Addresses, AreRefusedUnlessAllowed) {
    constexpr Name names[] = {
        {"https://127.0.0.1:1/a.nc", true},
        {"http://127.0.0.1:1/a.nc", true},
        {"file:///a.nc", true},
        {"  dods://127.0.0.1:1/a", true},
        {"[mode=x] http://127.0.0.1:1/a", true},
        {"s3://bucket/a", true},
        {"https\n://127.0.0.1:1/a.nc", true}, // what the library drops before it looks
        {"http:/\t/127.0.0.1:1/a.nc", true},
        {"h\x01ttp://127.0.0.1:1/a.nc", true},
        {"\u00A0http://127.0.0.1:1/a.nc", true},
        {"http\u00E9://127.0.0.1:1/a.nc", true},
        {"[x]\u00E9http://127.0.0.1:1/a.nc", true},
        {"\u00E9[x]http://127.0.0.1:1/a.nc", true},
        {R"([a\]b]http://127.0.0.1:1/a.nc)", true},
        {"missing/a.nc", false},
        {"[missing/a.nc", false},
        {"missing/a:b.nc", false},
        {"://missing/a.nc", false},
        {"folder/http://a.nc", false},
    };
    const Module guarded = guardedModule();
    for (const Name &row : names) {
        for (const char *operation : {"open", "create"}) {
            const std::string identifier = identifierOf([&] { guarded(operation, row.name, 4); });
            EXPECT_EQ(identifier == "TESSEL:guard:remote", row.address)
                << operation << " " << row.name << ": " << identifier;
        }
    }
    const std::string identifier = identifierOf(
        [&] { guardedModule({.remote = true})("open", "https://127.0.0.1:1/a.nc", 0); });
    EXPECT_TRUE(identifier.starts_with("TESSEL:netcdf:open:")) << identifier;
}

} // namespace
} // namespace tessel::test
