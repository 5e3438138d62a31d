// module/call/status.cpp: the words for library statuses.
#include "call/status.hpp"

#include <array>
#include <cstddef>

namespace tessel::netcdf {
namespace {

constexpr const char *unknown = "unknownErrorStatus";

/// The library's own statuses, from -33 downwards.
constexpr std::array libraryWords = {
    "notNetcdfID",                           // -33
    "tooManyNetcdfFilesOpen",                // -34
    "netcdfFileExistsAndNoClobber",          // -35
    "invalidArgument",                       // -36
    "writeToReadOnly",                       // -37
    "operationNotAllowedInDataMode",         // -38
    "operationNotAllowedInDefineMode",       // -39
    "indexExceedsDimensionBound",            // -40
    "libraryMaxDimsExceeded",                // -41
    "nameIsAlreadyInUse",                    // -42
    "attributeNotFound",                     // -43
    "maximumNumberOfAttributesExceeded",     // -44
    "invalidDataType",                       // -45
    "invalidDimensionIdOrName",              // -46
    "unlimitedDimensionInTheWrongIndex",     // -47
    "maximumNumberOfVariablesExceeded",      // -48
    "variableNotFound",                      // -49
    "actionProhibitedOnGlobalVarid",         // -50
    "notANetcdfFile",                        // -51
    "inFortranStringTooShort",               // -52
    "maximumNameLengthExceeded",             // -53
    "onlyOneUnlimitedDimensionAllowed",      // -54
    "recordOperationWithoutRecordVars",      // -55
    "attemptToConvertBetweenTextAndNumbers", // -56
    "startPlusCountExceedsDimensionBound",   // -57
    "illegalStride",                         // -58
    "nameContainsIllegalCharacters",         // -59
    "mathResultNotRepresentable",            // -60
    "memoryAllocationFailure",               // -61
    "formatSizeConstraintsViolated",         // -62
    "invalidDimensionSize",                  // -63
    "corruptedFile",                         // -64
};
constexpr int firstLibraryStatus = -33;
static_assert(libraryWords.size() == 32, "one word for each of -33 to -64");

/// The system's statuses, from 1 upwards, as BSD numbers them. Linux has other meanings for two of
/// the numbers, "try again" for 11 and a deadlock for 35; the words stay, as programs match on
/// them.
constexpr std::array systemWords = {
    "operationNotPermitted",         // 1
    "noSuchFileOrDirectory",         // 2
    "noSuchProcess",                 // 3
    "interruptedSystemCall",         // 4
    "IOError",                       // 5
    "noSuchDeviceOrAddress",         // 6
    "argumentListTooLong",           // 7
    "execFormatError",               // 8
    "badFileNumber",                 // 9
    "noChildProcess",                // 10
    unknown,                         // 11
    "outOfMemory",                   // 12
    "permissionDenied",              // 13
    "badAddress",                    // 14
    unknown,                         // 15
    "deviceOrResourceBusy",          // 16
    "fileExists",                    // 17
    "crossDeviceLink",               // 18
    "noSuchDevice",                  // 19
    "notADirectory",                 // 20
    "isDirectory",                   // 21
    "invalidArgument",               // 22
    "fileTableOverflow",             // 23
    "tooManyOpenFiles",              // 24
    "notATypewriter",                // 25
    unknown,                         // 26
    "fileTooLarge",                  // 27
    "noSpaceLeftOnDevice",           // 28
    "illegalSeek",                   // 29
    "readOnlyFileSystem",            // 30
    "tooManyLinks",                  // 31
    "brokenPipe",                    // 32
    "mathArgumentOutOfDomainOfFunc", // 33
    "mathResultNotRepresentable",    // 34
    "tryAgain",                      // 35
};
constexpr int firstSystemStatus = 1;
static_assert(systemWords.size() == 35, "one word for each of 1 to 35");

constexpr int versionTwoStatus = -1;

/// The word at `index`, or nullptr where the table does not reach.
template <std::size_t n>
const char *wordAt(const std::array<const char *, n> &words, long long index) {
    return index >= 0 && index < static_cast<long long>(n) ? words[static_cast<std::size_t>(index)]
                                                           : nullptr;
}

} // namespace

std::string statusIdentifier(int status) {
    if (status == versionTwoStatus) {
        return "v2ApiError";
    }
    if (const char *word =
            wordAt(libraryWords, static_cast<long long>(firstLibraryStatus) - status)) {
        return word;
    }
    if (const char *word =
            wordAt(systemWords, static_cast<long long>(status) - firstSystemStatus)) {
        return word;
    }
    return unknown;
}

} // namespace tessel::netcdf
