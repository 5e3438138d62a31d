// tests/guard/fatal_calls.cpp: calls that the library does not survive, a row each.
#include "fatal_calls.hpp"

#include <cmath>
#include <csignal>

namespace tessel::test {
namespace {

using namespace std::string_literals;

constexpr double wraps = -1; // as a count: 2^64-1
constexpr int share = 2048;
constexpr double longest = 0x1p60 - 0x1p7; // of doubles, in a file of 64-bit data

/// Closed once, which failed.
int closedInVain(const Module &netcdf, const Folder &folder) {
    const int ncid = unclosable(netcdf, folder);
    wantError("TESSEL:netcdf:close:invalidDataType", [&] { netcdf("close", ncid); });
    return ncid;
}

void writeStrided(const Module &netcdf, const Folder &folder, const char *operation, int varid,
                  const Array &start, const Array &count, const Array &stride) {
    const int ncid = newDataset(netcdf, folder.file("a.nc"));
    netcdf("set_fill", ncid, noFill);
    const Array one = Array::scalar(1);
    if (stride) {
        netcdf(operation, ncid, varid, start, count, stride, one);
    } else {
        netcdf(operation, ncid, varid, start, count, one);
    }
}

int open(const Module &netcdf, const Folder &folder, const std::string &bytes) {
    return intOf(netcdf("open", written(folder, "a.nc", bytes), "NOWRITE"));
}

std::string variableOfType(std::uint32_t type) {
    return "CDF\1" + words({0, 10, 1, 1}) + "x\0\0\0"s + words({4, 0, 0, 11, 1, 1}) + "v\0\0\0"s +
           words({1, 0, 0, 0, type, 4, 100}) + std::string(16, '\0');
}

/// In mapped memory, without filling: records of 2^34 bytes. Where a position wraps in a file, it
/// depends on the position what comes of it; here no memory is.
int longRecords(const Module &netcdf, const Folder &folder) {
    return unfilledVariable(netcdf, folder, ncDouble, {0, 0x1p31}, data64 + mapped);
}

/// A file of 64-bit data with records of 2^31 doubles, and so many of them.
std::string manyLongRecords(std::uint32_t records) {
    const auto dimension = [](char name, std::uint32_t length) {
        return words({0, 1}) + name + "\0\0\0"s + words({0, length});
    };
    return "CDF\5" + words({0, records, 10, 0, 2}) + dimension('t', 0) + dimension('x', 1U << 31U) +
           words({0, 0, 0, 11, 0, 1, 0, 1}) + "v\0\0\0"s + words({0, 2, 0, 0, 0, 1, 0, 0, 0, 6}) +
           words({4, 0, 0, 200}) + std::string(64, '\0');
}

/// A file of 64-bit offsets with nine variables of records of 2^29-1 doubles each, and as many
/// records as there can be.
std::string manyRecordsOfNine() {
    constexpr std::uint32_t x = (1U << 29U) - 1;
    const auto variable = [](char name, std::uint32_t high, std::uint32_t low) {
        return words({1}) + name + "\0\0\0"s + words({2, 0, 1, 0, 0, 6, x * 8, high, low});
    };
    std::string bytes = "CDF\2" + words({0xFFFFFFFE, 10, 2, 1}) + "t\0\0\0"s + words({0, 1}) +
                        "x\0\0\0"s + words({x, 0, 0, 11, 9});
    std::uint64_t begin = 600;
    for (char name = 'a'; name < 'a' + 9; ++name) {
        bytes += variable(name, static_cast<std::uint32_t>(begin >> 32U),
                          static_cast<std::uint32_t>(begin));
        begin += std::uint64_t{x} * 8;
    }
    return bytes + std::string(200, '\0');
}

/// Opened for writing: a file that claims so many records of so many bytes, and has none.
int openForWriting(const Module &netcdf, const Folder &folder, std::uint32_t records,
                   std::uint32_t bytes) {
    return intOf(netcdf("open", written(folder, "a.nc", claimedRecords(records, bytes)), 1));
}

/// In define mode, without filling: two variables that each fit, and not one behind the other.
int beyondAllFiles(const Module &netcdf, const Folder &folder) {
    const int ncid = intOf(netcdf("create", folder.file("a.nc"), data64 + mapped));
    const int x = intOf(netcdf("def_dim", ncid, "x", longest));
    netcdf("def_var", ncid, "v", ncDouble, x);
    netcdf("def_var", ncid, "w", ncDouble, x);
    netcdf("set_fill", ncid, noFill);
    return ncid;
}

/// In define mode, with a variable.
int definingDataset(const Module &netcdf, const Folder &folder) {
    const int ncid = newDataset(netcdf, folder.file("a.nc"));
    netcdf("redef", ncid);
    return ncid;
}

void alignWithDefault(const Module &netcdf, const Folder &folder, int format, int flags) {
    const int ncid = datasetWithDefault(netcdf, folder, format, flags);
    netcdf("redef", ncid);
    netcdf("_enddef", ncid, 0, 0, 0, 4);
}

const Fatal rows[] = {
    {"AlignmentOfTheData", SIGFPE, "TESSEL:guard:alignment",
     "an alignment is 0, and the library divides",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("_enddef", definingDataset(netcdf, folder), 0, 0, 0, 4);
     }},
    {"AlignmentOfTheRecords", SIGFPE, "TESSEL:guard:alignment", "an alignment is 0",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("nc__enddef", definingDataset(netcdf, folder), 0, 4, 0, 0.5);
     }},
    {"AlignmentOfA64BitFileWhenHdf5IsTheDefault", SIGFPE, "TESSEL:guard:alignment",
     "an alignment is 0",
     [](const Module &netcdf, const Folder &folder) { alignWithDefault(netcdf, folder, 3, 512); }},
    {"AlignmentOfAFileOf64BitDataWhenHdf5IsTheDefault", SIGFPE, "TESSEL:guard:alignment",
     "an alignment is 0",
     [](const Module &netcdf, const Folder &folder) {
         alignWithDefault(netcdf, folder, 4, data64);
     }},
    {"AlignmentOfAClassicFileWhenHdf5IsTheDefault", SIGFPE, "TESSEL:guard:alignment",
     "an alignment is 0",
     [](const Module &netcdf, const Folder &folder) {
         alignWithDefault(netcdf, folder, 3, 256 + share);
     }},
    {"AnElementFarBeyondTheRecordsWhenHdf5IsTheDefault", SIGXFSZ, "TESSEL:guard:records",
     "ends at record 4000000000",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = datasetWithDefault(netcdf, folder, 3, 512);
         netcdf("put_var1_double", ncid, 1, Array::row({0, 4e9}), 1);
     }},
    {"CloseAfterACloseThatFailedWhenHdf5IsTheDefault", SIGSEGV,
     "TESSEL:netcdf:close:invalidDataType", "Close operation failed",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("set_default_format", 4);
         const int ncid = unclosable(netcdf, folder, 256);
         netcdf("set_default_format", 1);
         wantError("TESSEL:netcdf:close:invalidDataType", [&] { netcdf("close", ncid); });
         netcdf("close", ncid);
     }},
    {"CreateWithAUserFormat", SIGSEGV, "TESSEL:guard:mode",
     "the flag 64 (a user-defined format) is set",
     [](const Module &netcdf, const Folder &folder) { netcdf("create", folder.file("a.nc"), 64); },
     41001},
    {"CreateWithTheOtherUserFormat", SIGSEGV, "TESSEL:guard:mode", "the flag 128",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("NC_CREATE", folder.file("a.nc"), 128 + 1);
     },
     41001},
    {"TunedCreateWithAUserFormat", SIGSEGV, "TESSEL:guard:mode", "the flag 64",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("_create", folder.file("a.nc"), 64, 1024, 1024);
     },
     41001},
    {"OpenInMemory", SIGSEGV, "TESSEL:guard:mode", "the flag 32768 (NC_INMEMORY) is set",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("open", folder.file("a.nc"), 32768);
     }},
    {"TunedOpenInMemory", SIGSEGV, "TESSEL:guard:mode", "the flag 32768",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("nc__open", folder.file("a.nc"), 32768 + 1, 1024);
     }},
    {"CreateInMoreMemoryThanThereIs", SIGSEGV, "TESSEL:guard:mapping",
     "the flag 16 (NC_MMAP) is set, and there is no memory for 1000000000000000 bytes",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("_create", folder.file("a.nc"), 16, 1e15, 4096);
     }},
    {"CreateInMemoryOfANegativeSize", SIGSEGV, "TESSEL:guard:mapping",
     "there is no memory for 9223372036854775808 bytes",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("_create", folder.file("a.nc"), 16, 0x1p63, 4096);
     }},
    {"ReadOfMappedMemoryThatTheFileLacks", SIGSEGV, "TESSEL:guard:mapping",
     "the flag 16 (NC_MMAP) is set, and the file is to be written",
     [](const Module &netcdf, const Folder &folder) {
         const std::string file = written(
             folder, "a.nc",
             "CDF\5" + words({0, 0}) + words({0, 0, 0}) + words({0, 0, 0}) + words({11, 0, 1}) +
                 words({0, 1}) + "v\0\0\0"s + words({0, 0}) + words({0, 0, 0}) +
                 words({6, 0, 8, 0x10000, 0}) + std::string(8000, '\0'));
         netcdf("get_var_double", netcdf("open", file, 17)[0], 0);
     }},
    {"OpenByMoreMemoryThanThereIs", SIGSEGV, "TESSEL:guard:mapping",
     "the flag 16 (NC_MMAP) is set, and there is no memory for 1000000000000000 bytes",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("close", newDataset(netcdf, folder.file("a.nc")));
         netcdf("_open", folder.file("a.nc"), 16, 1e15);
     }},
    {"ARecordBehindTheEndOfAMappedFile", SIGBUS, "TESSEL:guard:mapping",
     "the flag 16 (NC_MMAP) is set, and the file is to be written",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("close", newDataset(netcdf, folder.file("a.nc")));
         const int ncid = intOf(netcdf("_open", folder.file("a.nc"), mapped + 1, 1e6));
         netcdf("set_fill", ncid, noFill);
         netcdf("put_var1_double", ncid, 1, Array::row({0, 1000}), 1);
     }},
    {"AMappedFileOnAFullDisk", SIGBUS, "TESSEL:guard:mapping",
     "the flag 16 (NC_MMAP) is set, and the file is to be written",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = unfilledVariable(netcdf, folder, ncDouble, {0}, mapped + persistent);
         const FullDisk full;
         netcdf("put_var1_double", ncid, 0, 100'000, 1);
     }},
    {"AReadOfWhatIsMappedAndNotThere", SIGBUS, "TESSEL:guard:mapping",
     "of a file of 200 bytes, which is to have more, 1000000 are to be mapped",
     [](const Module &netcdf, const Folder &folder) {
         const int made = definingVariable(netcdf, folder, ncDouble, {100'000});
         netcdf("close", made);
         std::filesystem::resize_file(folder.file("a.nc"), 200);
         netcdf("get_var_double", intOf(netcdf("_open", folder.file("a.nc"), mapped, 1e6)), 0);
     }},
    {"AHeaderThatIsMappedAndNotThere", SIGBUS, "TESSEL:guard:mapping",
     "of a file of 4096 bytes, which is to have more, 8192 are to be mapped",
     [](const Module &netcdf, const Folder &folder) {
         std::string header = "CDF\1" + words({0, 10, 400}); // of which 340 fill the page
         for (int i = 1000; header.size() < 4096; ++i) {
             header += words({4}) + std::to_string(i) + words({5});
         }
         netcdf("_open", written(folder, "a.nc", header), mapped, 8192);
     }},
    {"SyncOfAMappedFileThatClaimsMoreByNow", SIGBUS, "TESSEL:guard:mapping",
     "which is to have more, 1000000 are to be mapped",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("close", newDataset(netcdf, folder.file("a.nc")));
         const int ncid = intOf(netcdf("_open", folder.file("a.nc"), mapped, 1e6));
         std::fstream(folder.file("a.nc")).seekp(4) << words({1000}); // records
         netcdf("sync", ncid);
         netcdf("get_var1_double", ncid, 1, Array::row({0, 999}));
     }},
    {"AFileThatIsLongerThanWhatCanBeMapped", SIGSEGV, "TESSEL:guard:mapping",
     "there is no memory for 50331648 bytes",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("close", newDataset(netcdf, folder.file("a.nc")));
         std::filesystem::resize_file(folder.file("a.nc"), std::uintmax_t{48} << 20U);
         const FewAddresses few;
         netcdf("open", folder.file("a.nc"), mapped);
     }},
    {"AlignmentsOfWhichTheFirstCounts", SIGFPE, "TESSEL:guard:alignment", "an alignment is 0",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         netcdf("redef", ncid);
         netcdf("_enddef", ncid, 0, Array::row({0, std::nan("")}), 0, 4);
     }},
    {"SizesOfWhichTheFirstCounts", SIGSEGV, "TESSEL:guard:mapping", "no memory for 10000000000000",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("_create", folder.file("a.nc"), mapped, Array::row({1e15, HUGE_VAL}), 4096);
     }},
    {"ARecordBehindWhatCanBeMapped", SIGSEGV, "TESSEL:guard:mapping",
     "the flag 16 (NC_MMAP) is set, and there is no memory for 180144",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("put_var1_double", longRecords(netcdf, folder), 0, Array::row({0, 0x1p20}), 1);
     }},
    {"ARecordBehindThePromisedMemory", SIGSEGV, "TESSEL:guard:mapping", "no memory for 10737418",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = unfilledVariable(netcdf, folder, ncDouble, {0}, mapped);
         const LittleMemory little;
         netcdf("put_var1_double", ncid, 0, 0x1p27, 1);
     }},
    {"ABlockOfRecordsBehindWhatCanBeMapped", SIGSEGV, "TESSEL:guard:mapping", "no memory for 180144",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("put_vara_double", longRecords(netcdf, folder), 0, Array::row({0, 0x1p20 - 1}),
                Array::row({1, 2}), Array::row({1, 2}));
     }},
    {"DefinitionsThatCannotBeMapped", SIGSEGV, "TESSEL:guard:mapping", "no memory for 900719925474",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid =
             unfilledVariable(netcdf, folder, ncDouble, {0x1p25, 0x1p25}, data64 + mapped);
         netcdf("get_var1_double", ncid, 0, Array::row({0x1p25 - 1, 0x1p25 - 1}));
     }},
    {"DefinitionsBehindWhatCanBeMapped", SIGSEGV, "TESSEL:guard:mapping", "no memory for 1000000000",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = definingVariable(netcdf, folder, ncInt, {3}, mapped + offset64);
         netcdf("_enddef", ncid, 1e15, 4, 0, 4);
     }},
    {"OpenOfATypeWithoutSize", SIGFPE, "TESSEL:guard:header", "has a variable of the type 12",
     [](const Module &netcdf, const Folder &folder) { open(netcdf, folder, variableOfType(12)); },
     41001},
    {"NameOf300Letters", SIGSEGV, "TESSEL:guard:header", "has a name of 300 characters",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("inq_dim",
                open(netcdf, folder,
                     "CDF\1" + words({0, 10, 1, 300}) + std::string(300, 'n') +
                         words({1, 0, 0, 0, 0})),
                0);
     },
     41001},
    {"VariableOfTooManyDimensions", SIGSEGV, "TESSEL:guard:header", "a variable of 3000 dimensions",
     [](const Module &netcdf, const Folder &folder) {
         // A few too many may go unnoticed.
         std::string ids;
         for (int i = 0; i < 3000; ++i) {
             ids += words({0});
         }
         netcdf("inq_var",
                open(netcdf, folder,
                     "CDF\1" + words({0, 10, 1, 1}) + "x\0\0\0"s + words({1, 0, 0, 11, 1, 1}) +
                         "v\0\0\0"s + words({3000}) + ids + words({0, 0, 4, 4, 20000}) +
                         std::string(16, '\0')),
                0);
     },
     41001},
    {"ADimensionsNameThatGrows", SIGSEGV, "TESSEL:guard:name",
     "a name of 256 bytes may become one of 768",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = intOf(netcdf("create", folder.file("a.nc"), 0));
         netcdf("def_dim", ncid, repeated(growing, 128), 3);
         netcdf("inq_dim", ncid, 0);
     },
     41001},
    {"ADimensionsNewNameThatGrows", SIGSEGV, "TESSEL:guard:name", "over the end of buffers",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = definingDataset(netcdf, folder);
         netcdf("rename_dim", ncid, 0, repeated(growing, 128));
         netcdf("inq_dim", ncid, 0);
     },
     41001},
    {"AnAttributesNameThatGrows", SIGSEGV, "TESSEL:guard:name", "may become one of 768",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = definingDataset(netcdf, folder);
         netcdf("put_att_double", ncid, 0, repeated(growing, 128), ncDouble, 1);
         netcdf("inq_attname", ncid, 0, 0);
     },
     41001},
    {"ATextAttributesNameThatGrows", SIGSEGV, "TESSEL:guard:name", "may become one of 768",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = definingDataset(netcdf, folder);
         netcdf("nc_put_att_text", ncid, global, repeated(growing, 128), "text");
         netcdf("inq_attname", ncid, global, 0);
     },
     41001},
    {"AnAttributesNewNameThatGrows", SIGSEGV, "TESSEL:guard:name", "may become one of 768",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = definingDataset(netcdf, folder);
         netcdf("put_att_text", ncid, global, "a", "text");
         netcdf("rename_att", ncid, global, "a", repeated(growing, 128));
         netcdf("inq_attname", ncid, global, 0);
     },
     41001},
    {"ACopiedAttributesNameThatGrew", SIGSEGV, "TESSEL:guard:name", "may become one of 768",
     [](const Module &netcdf, const Folder &folder) {
         const Module plain = plainModule();
         const int source = intOf(plain("create", folder.file("b.nc"), 0));
         plain("put_att_text", source, global, repeated(growing, 128), "text");
         const int ncid = definingDataset(netcdf, folder);
         netcdf("copy_att", source, global, repeated(growing, 128), ncid, global);
         netcdf("inq_attname", ncid, global, 0);
     },
     41001},
    {"NameWhoseLengthTheFileEndsIn", SIGSEGV, "TESSEL:guard:header", "characters in a name",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("inq_dim", open(netcdf, folder, "CDF\5" + words({0, 0, 10, 0, 1, 0}) + "\0\0\x02"s),
                0);
     },
     41001},
    {"CloseAfterACloseThatFailed", SIGSEGV, "TESSEL:netcdf:close:invalidDataType",
     "Close operation failed, library error message \"NetCDF: Not a valid data type",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("close", closedInVain(netcdf, folder));
     }},
    {"AbortAfterACloseThatFailed", SIGSEGV, "", "",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("abort", closedInVain(netcdf, folder));
     }},
    {"CloseAgainAfterAChangeOnAFullDisk", SIGSEGV, "TESSEL:netcdf:close:fileTooLarge",
     "Close operation failed, library error message \"File too large\"",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = unfilledVariable(netcdf, folder, ncDouble, {20000});
         netcdf("rename_var", ncid, 0, "w");
         netcdf("put_var1_double", ncid, 0, 19999, 1);
         const FullDisk full;
         wantError("TESSEL:netcdf:close:fileTooLarge", [&] { netcdf("close", ncid); });
         netcdf("close", ncid);
     }},
    {"SynchronisingAHeaderThatWasOverwritten", SIGFPE, "TESSEL:guard:header",
     "has a variable of the type 12",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = open(netcdf, folder, variableOfType(4));
         written(folder, "a.nc", variableOfType(12));
         netcdf("sync", ncid);
     },
     41001},
    {"ALengthThatMultipliesToZero", SIGFPE, "TESSEL:guard:lengths", R"("b" is 2^63 or longer)",
     [](const Module &netcdf, const Folder &folder) {
         definingVariable(netcdf, folder, ncChar, {2, 0x1p63, 2}, data64);
     },
     41001},
    {"ALengthThatMultipliesToZeroWhenDefinitionsEnd", SIGFPE, "TESSEL:guard:lengths",
     "take the length for a negative number",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("enddef", definingVariable(netcdf, folder, ncDouble, {0, 0x1p63, 2}, data64));
     },
     41001},
    {"OpenOfALengthThatMultipliesToZero", SIGFPE, "TESSEL:guard:header",
     "has a variable over a dimension of 9223372036854775808 elements",
     [](const Module &netcdf, const Folder &folder) {
         const std::string dimensions = words({0, 1}) + "x\0\0\0"s + words({0, 2}) + words({0, 1}) +
                                        "y\0\0\0"s + words({0x80000000, 0});
         const std::string variable = words({0, 1}) + "v\0\0\0"s + words({0, 3}) +
                                      words({0, 0, 0, 1, 0, 0}) + words({0, 0, 0}) +
                                      words({2, 0, 0, 0, 200});
         open(netcdf, folder,
              "CDF\5" + words({0, 0}) + words({10, 0, 2}) + dimensions + words({0, 0, 0}) +
                  words({11, 0, 1}) + variable + std::string(16, '\0'));
     },
     41001},
    {"RedefiningASharedHeaderThatWasOverwritten", SIGFPE, "TESSEL:guard:header",
     "has a variable of the type 12",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("close", newDataset(netcdf, folder.file("a.nc")));
         const int ncid = intOf(netcdf("open", folder.file("a.nc"), share + 1));
         written(folder, "a.nc", variableOfType(12));
         netcdf("redef", ncid);
     },
     41001},
    {"RedefiningANewSharedHeaderThatWasOverwritten", SIGFPE, "TESSEL:guard:header",
     "has a variable of the type 12",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"), share);
         written(folder, "a.nc", variableOfType(12));
         netcdf("redef", ncid);
     },
     41001},
    {"AnElementFarBeyondTheRecordsAfterACodeThatIsOneInteger", SIGXFSZ, "TESSEL:guard:records",
     "ends at record 4000000000",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         const Array code = Array::numeric(tsINT32, std::array<std::size_t, 1>{1});
         code.elements<std::int32_t>()[0] = 256; // the module reads a double: 0, which is to fill
         netcdf("set_fill", ncid, code);
         netcdf("put_var1_double", ncid, 1, Array::row({0, 4e9}), 1);
     }},
    {"CountsThatWrapInRecords", SIGPROF, "TESSEL:guard:counts",
     "multiply to more than 64 bits hold",
     [](const Module &netcdf, const Folder &folder) {
         writeStrided(netcdf, folder, "put_vars_double", 1, Array::row({1, 0}),
                      Array::row({wraps, wraps}), Array::row({2, 1}));
     }},
    {"CountsThatWrapInABlock", SIGXFSZ, "TESSEL:guard:counts", "or for ever",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         netcdf("put_vara_double", ncid, 1, Array::row({0, 0}), Array::row({2, 0x1p63 + 2048}),
                Array::numeric(tsDOUBLE, std::array<std::size_t, 2>{2, 2048}));
     }},
    {"AnElementFarBeyondTheRecords", SIGXFSZ, "TESSEL:guard:records",
     "ends at record 4000000000, and 4000000000 records of 80 bytes",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         netcdf("put_var1_double", ncid, 1, Array::row({0, 4e9}), 1);
     }},
    {"ABlockFarBeyondTheRecords", SIGXFSZ, "TESSEL:guard:records", "NC_NOFILL",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         netcdf("put_vara_double", ncid, 1, Array::row({0, 4e9}), Array::row({1, 1}), 1);
     }},
    {"AStepFarBeyondTheRecords", SIGXFSZ, "TESSEL:guard:records", "ends at record 2000000000",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         netcdf("put_vars_double", ncid, 1, Array::row({0, 0}), Array::row({1, 2}),
                Array::row({1, 2e9}), Array::row({1, 2}));
     }},
    {"ABlockWhosePositionWraps", SIGSEGV, "TESSEL:guard:position", "ends at record 1073741823",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = longRecords(netcdf, folder);
         netcdf("put_vara_double", ncid, 0, Array::row({0x1p30, 0x1p30 - 1}), Array::row({900, 1}),
                Array::numeric(tsDOUBLE, std::array<std::size_t, 2>{900, 1}));
         netcdf("close", ncid);
     }},
    {"StepsToAPositionThatWraps", SIGSEGV, "TESSEL:guard:position", "ends at record 1073741823",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = longRecords(netcdf, folder);
         netcdf("put_vars_double", ncid, 0, Array::row({0x1p30, 0x1p30 - 1}), Array::row({2, 1}),
                Array::row({3, 1}), Array::row({1, 2}));
     }},
    {"AnElementWhosePositionWraps", SIGSEGV, "TESSEL:guard:position",
     "records of 17179869184 bytes that is behind 2^63 bytes",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = longRecords(netcdf, folder);
         netcdf("put_var1_double", ncid, 0, Array::row({0x1p30, 0x1p30 - 1}), 1);
     }},
    {"AnEndOfDefinitionsBehindWhichPositionsWrap", SIGSEGV, "TESSEL:guard:position",
     "the variables end behind 2^63 bytes",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = beyondAllFiles(netcdf, folder);
         netcdf("enddef", ncid);
         netcdf("put_var1_double", ncid, 1, longest / 2, 1);
     }},
    {"ATunedEndOfDefinitionsBehindWhichPositionsWrap", SIGSEGV, "TESSEL:guard:position",
     "the variables end behind 2^63 bytes",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = beyondAllFiles(netcdf, folder);
         netcdf("nc__enddef", ncid, 0, 4, 0, 4);
         netcdf("put_var1_double", ncid, 1, longest / 2, 1);
     }},
    {"OpenOfManyLongRecords", SIGSEGV, "TESSEL:guard:header",
     "claims data that end behind 2^63 bytes",
     [](const Module &netcdf, const Folder &folder) {
         const std::string file = written(folder, "a.nc", manyLongRecords(1U << 30U));
         const int ncid = intOf(netcdf("open", file, mapped));
         netcdf("get_var1_double", ncid, 0, Array::row({0x1p30, 0x1p30 - 1}));
     },
     41001},
    {"OpenOfManyRecordsOfNineVariables", SIGSEGV, "TESSEL:guard:header",
     "claims data that end behind 2^63 bytes",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid =
             intOf(netcdf("open", written(folder, "a.nc", manyRecordsOfNine()), mapped));
         constexpr double record = 9 * 8 * ((1U << 29U) - 1.0);
         netcdf("get_var1_double", ncid, 0,
                Array::row({0, std::floor((0x1p64 - 0x1p36) / record)}));
     },
     41001},
    {"AnEndOfDefinitionsOfALargeClassicVariable", SIGSEGV, "TESSEL:guard:position",
     "the variables end behind 2^63 bytes",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = unfilledVariable(netcdf, folder, ncChar, {0x1p21, 0x1p21, 0x1p22}, mapped);
         netcdf("put_var1_text", ncid, 0, Array::row({0, 0, 0x1p20}), "a");
     }},
    {"RedefiningWhatTheFileLacks", SIGXFSZ, "TESSEL:guard:header", "the file lacks 17179869",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = openForWriting(netcdf, folder, 1U << 30U, 16);
         netcdf("redef", ncid);
         netcdf("put_att_text", ncid, global, "a", std::string(1000, 'a'));
         netcdf("enddef", ncid);
     }},
    {"LongerRecordsThatTheFileLacks", SIGXFSZ, "TESSEL:guard:header", "the file lacks 268435",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = openForWriting(netcdf, folder, 1U << 28U, 1);
         netcdf("redef", ncid);
         const int x = intOf(netcdf("def_dim", ncid, "y", 2));
         netcdf("def_var", ncid, "w", ncDouble, Array::row({static_cast<double>(x), 0}));
         netcdf("enddef", ncid);
     }},
};

} // namespace

std::span<const Fatal> fatalCalls() {
    return rows;
}

} // namespace tessel::test
