// tests/conformance/library_failures.cpp: what becomes of a status, for every call of the library
// that an operation makes and for every status.
#include "support/conformance.hpp"
#include "support/members.hpp"
#include "support/probe.hpp"
#include "support/text.hpp"

#include <netcdf.h>

#include <algorithm>
#include <array>
#include <limits>
#include <map>
#include <numeric>
#include <ostream>

namespace tessel::test {
namespace {

/// The word for a status; a status without a word is "unknownErrorStatus".
std::string wordOf(int status) {
    static const std::map<int, std::string> words = {
        {-64, "corruptedFile"},
        {-63, "invalidDimensionSize"},
        {-62, "formatSizeConstraintsViolated"},
        {-61, "memoryAllocationFailure"},
        {-60, "mathResultNotRepresentable"},
        {-59, "nameContainsIllegalCharacters"},
        {-58, "illegalStride"},
        {-57, "startPlusCountExceedsDimensionBound"},
        {-56, "attemptToConvertBetweenTextAndNumbers"},
        {-55, "recordOperationWithoutRecordVars"},
        {-54, "onlyOneUnlimitedDimensionAllowed"},
        {-53, "maximumNameLengthExceeded"},
        {-52, "inFortranStringTooShort"},
        {-51, "notANetcdfFile"},
        {-50, "actionProhibitedOnGlobalVarid"},
        {-49, "variableNotFound"},
        {-48, "maximumNumberOfVariablesExceeded"},
        {-47, "unlimitedDimensionInTheWrongIndex"},
        {-46, "invalidDimensionIdOrName"},
        {-45, "invalidDataType"},
        {-44, "maximumNumberOfAttributesExceeded"},
        {-43, "attributeNotFound"},
        {-42, "nameIsAlreadyInUse"},
        {-41, "libraryMaxDimsExceeded"},
        {-40, "indexExceedsDimensionBound"},
        {-39, "operationNotAllowedInDefineMode"},
        {-38, "operationNotAllowedInDataMode"},
        {-37, "writeToReadOnly"},
        {-36, "invalidArgument"},
        {-35, "netcdfFileExistsAndNoClobber"},
        {-34, "tooManyNetcdfFilesOpen"},
        {-33, "notNetcdfID"},
        {-1, "v2ApiError"},
        {1, "operationNotPermitted"},
        {2, "noSuchFileOrDirectory"},
        {3, "noSuchProcess"},
        {4, "interruptedSystemCall"},
        {5, "IOError"},
        {6, "noSuchDeviceOrAddress"},
        {7, "argumentListTooLong"},
        {8, "execFormatError"},
        {9, "badFileNumber"},
        {10, "noChildProcess"},
        {12, "outOfMemory"},
        {13, "permissionDenied"},
        {14, "badAddress"},
        {16, "deviceOrResourceBusy"},
        {17, "fileExists"},
        {18, "crossDeviceLink"},
        {19, "noSuchDevice"},
        {20, "notADirectory"},
        {21, "isDirectory"},
        {22, "invalidArgument"},
        {23, "fileTableOverflow"},
        {24, "tooManyOpenFiles"},
        {25, "notATypewriter"},
        {27, "fileTooLarge"},
        {28, "noSpaceLeftOnDevice"},
        {29, "illegalSeek"},
        {30, "readOnlyFileSystem"},
        {31, "tooManyLinks"},
        {32, "brokenPipe"},
        {33, "mathArgumentOutOfDomainOfFunc"},
        {34, "mathResultNotRepresentable"},
        {35, "tryAgain"},
    };
    const auto found = words.find(status);
    return found == words.end() ? "unknownErrorStatus" : found->second;
}

/// All that are near the words, and the ends of the range.
std::vector<int> statuses() {
    std::vector<int> list(281);
    std::iota(list.begin(), list.end(), -140);
    using Limits = std::numeric_limits<int>;
    list.insert(list.end(), {Limits::min(), Limits::min() + 1, Limits::max() - 1, Limits::max(),
                             Limits::min() + 64, Limits::max() - 64, -1000, 1000, 65536, -65536});
    return list;
}

/// One call of the library in an operation.
struct Failure {
    On on;
    Values call;
    std::string function;   ///< the library's
    std::string identifier; ///< behind "TESSEL:netcdf:"; with a colon at its end, the word follows
    std::string message;    ///< with %s for the library's text
    int n = 1;              ///< which of the calls of that function
};

std::string operationOf(const Failure &failure) {
    return failure.call[0].make(Scene(On::nothing)).utf8();
}

// clang-format off
std::vector<Failure> operationFailures() {
    return {
        {On::nothing, {"open", "f", 0},                 "nc_open",     "open:",    R"(Unable to open netCDF file, library error message "%s")"},
        {On::nothing, {"_open", "f", 0, 0},             "nc__open",    "pOpen:",   R"(Unable to open file in enhanced performance mode, library error message "%s")"},
        {On::nothing, {"create", "f", 0},               "nc_create",   "create:",  R"(Create operation failed, library error message "%s")"},
        {On::nothing, {"_create", "f", 0, 0, 0},        "nc__create",  "pCreate:", R"(Performance create operation failed, library error message "%s")"},
        {On::nothing, {"close", 1},                     "nc_close",    "close:",   R"(Close operation failed, library error message "%s")"},
        {On::nothing, {"abort", 1},                     "nc_abort",    "abort:",   R"(Abort operation failed, library error message "%s")"},
        {On::nothing, {"sync", 1},                      "nc_sync",     "sync:",    R"(Unable to sync netCDF file, library error message "%s")"},
        {On::nothing, {"redef", 1},                     "nc_redef",    "redef:",   R"(Unable to place netCDF file in define mode, library error message "%s")"},
        {On::nothing, {"enddef", 1},                    "nc_enddef",   "endDef:",  R"(Enddef operation failed, library error message "%s")"},
        {On::nothing, {"end_def", 1},                   "nc_enddef",   "endDef:",  R"(Enddef operation failed, library error message "%s")"},
        {On::nothing, {"_enddef", 1, 2, 3, 4, 5},       "nc__enddef",  "pEndDef:", R"(Performance Enddef operation failed, library error message "%s")"},
        {On::nothing, {"set_fill", 1, 0},               "nc_set_fill", "setFill:", R"(Unable to set fill mode, library error message "%s")"},
        {On::nothing, {"set_default_format", 1}, "nc_set_default_format", "setDefaultFormat:", R"(Unable to set the default formate, library error message "%s")"},
        {On::nothing, {"inq", 1},                       "nc_inq",      "inq:",     R"(File inquiry failed, library error message "%s")"},

        {On::nothing, {"def_dim", 1, "d", 2},           "nc_def_dim",    "defDim:",    R"(Dimension definition operation failed, library error message "%s")"},
        {On::nothing, {"inq_dim", 1, 2},                "nc_inq_dim",    "inqDim:",    R"(Dimension inquiry failed, library error message "%s")"},
        {On::nothing, {"inq_dimid", 1, "d"},            "nc_inq_dimid",  "inqDimID:",  R"(Dimension ID inquiry failed, library error message "%s")"},
        {On::nothing, {"rename_dim", 1, 2, "d"},        "nc_rename_dim", "renameDim:", R"(Unable to rename dimension, library error message "%s")"},

        {On::nothing, {"def_var", 1, "v", 6, doubles({1, 0})}, "nc_def_var", "defVar:", R"(Variable definition operation failed, library error message "%s")"},
        {On::nothing, {"inq_var", 1, 2},                "nc_inq_var",    "inqVar:",    R"(Variable inquiry failed, library error message "%s")"},
        {On::nothing, {"inq_varid", 1, "v"},            "nc_inq_varid",  "inqVarID:",  R"(Variable ID retrieval failed, library error message "%s")"},
        {On::nothing, {"rename_var", 1, 2, "v"},        "nc_rename_var", "renameVar:", R"(Unable to rename variable, library error message "%s")"},

        {On::nothing, {"inq_att", 1, 2, "a"},           "nc_inq_att",     "inqAtt:",     R"(Attribute inquiry failed, library error message "%s")"},
        {On::nothing, {"inq_attid", 1, 2, "a"},         "nc_inq_attid",   "inqAttID:",   R"(Attribute ID retrieval failed, library error message "%s")"},
        {On::nothing, {"inq_attname", 1, 2, 3},         "nc_inq_attname", "inqAttName:", R"(Attribute name retrieval failed, library error message "%s")"},
        {On::nothing, {"rename_att", 1, 2, "a", "b"},   "nc_rename_att",  "renameAtt:",  R"(Unable to rename attribute, library error message "%s")"},
        {On::nothing, {"del_att", 1, 2, "a"},           "nc_del_att",     "delAtt:",     R"(Attribute deletion operation failed, library error message "%s")"},
        {On::nothing, {"copy_att", 1, 2, "a", 3, 4},    "nc_copy_att",    "copyAtt:",    R"(Attribute copy operation failed, library error message "%s")"},
    };
}

std::vector<Failure> memberFailures(const Member &member) {
    const auto call = [&](const std::string &family, Values arguments) {
        arguments.insert(arguments.begin(), (family + member.suffix).c_str());
        return arguments;
    };
    const auto function = [&](const std::string &family) { return "nc_" + family + member.suffix; };
    const Value three = doubles({0, 0, 0});
    const Value ones = doubles({1, 1, 1});
    const Value one = wholes(member.hostClass, {1});
    const Value all = wholes(member.hostClass, std::vector<int>(24, 1));

    const Values getAtt = call("get_att_", {ncid, varid("temp"), "fives"});
    const Values getVar = call("get_var_", {ncid, varid("temp")});
    const Values getVar1 = call("get_var1_", {ncid, varid("temp"), three});
    const Values getVara = call("get_vara_", {ncid, varid("temp"), three, ones});
    const Values getVars = call("get_vars_", {ncid, varid("temp"), three, ones, ones});
    const Values putVar = call("put_var_", {ncid, varid("temp"), all});
    const Values putVar1 = call("put_var1_", {ncid, varid("temp"), three, one});
    const Values putVara = call("put_vara_", {ncid, varid("temp"), three, ones, one});
    const Values putVars = call("put_vars_", {ncid, varid("temp"), three, ones, ones, one});

    const std::string numberInquiry = R"(Unable to retrieve number of variable's dimensions, library error message "%s")";
    const std::string lengthInquiry = R"(Dimension length inquiry failed, library error message "%s")";
    const std::string writtenLength = R"(Retrieval of dimension length failed, library error message "%s")";
    const std::string writtenInquiry = R"(Unable to read the number of dimensions, "%s".)";

    std::vector<Failure> list = {
        {On::sample, getAtt,  "nc_inq_att",           "getAtt:",                R"(Attribute inquiry failed, library error message "%s")"},
        {On::sample, getAtt,  function("get_att_"),   "getAtt:",                R"(Attribute retrieval operation failed, library error message "%s")"},

        {On::sample, getVar,  "nc_inq_varndims",      "getVar:numDimsInquiry:", numberInquiry},
        {On::sample, getVar,  "nc_inq_vardimid",      "getVar:dimidsInquiry:",  R"(Unable to retrieve a netCDF variable's dimension IDs, library error message "%s")"},
        {On::sample, getVar,  "nc_inq_dimlen",        "getVar:dimLenInquiry:",  lengthInquiry},
        {On::sample, getVar,  "nc_inq_dimlen",        "getVar:dimLenInquiry:",  lengthInquiry, 2},
        {On::sample, getVar,  "nc_inq_dimlen",        "getVar:dimLenInquiry:",  lengthInquiry, 3},
        {On::sample, getVar,  function("get_var_"),   "getVar:",                R"(Variable data retrieval failed, library error message "%s")"},

        {On::sample, getVar1, "nc_inq_varndims",      "getVar1:",               numberInquiry},
        {On::sample, getVar1, function("get_var1_"),  "getVar1:",               R"(Single datum retrieval failed, library error message "%s")"},

        {On::sample, getVara, "nc_inq_varndims",      "getVara:numDimsInquiry:", R"(Unable to retrieve number of netCDF variable's dimensions, library error message "%s")"},
        {On::sample, getVara, function("get_vara_"),  "getVara:",               R"(Contiguous data retrieval failed, library error message "%s")"},

        {On::sample, getVars, "nc_inq_varndims",      "getVars:numVarsInquiryFailure",   R"(Retrieval of number of variable dimensions failed, library error message "%s")"},
        {On::sample, getVars, "nc_inq_vardimid",      "getVars:varDimIDsInquiryFailure", R"(Retrieval of variable dimensions failed, library error message "%s")"},
        {On::sample, getVars, function("get_vars_"),  "getVars:",               R"(Strided data retrieval failed, library error message "%s")"},

        {On::sample, putVar,  "nc_inq_var",           "putVar:",                R"(Variable inquiry failed, library error message "%s")"},
        {On::sample, putVar,  "nc_inq_dimlen",        "putVar:",                writtenLength},
        {On::sample, putVar,  "nc_inq_dimlen",        "putVar:",                writtenLength, 2},
        {On::sample, putVar,  "nc_inq_dimlen",        "putVar:",                writtenLength, 3},
        {On::sample, putVar,  function("put_var_"),   "putVar:",                R"(Variable write operation failed, library error message "%s")"},

        {On::sample, putVar1, "nc_inq_var",           "putVar1:inqVarNDimsFailure", writtenInquiry},
        {On::sample, putVar1, function("put_var1_"),  "putVar1:",               R"(Single datum write operation failed, library error message "%s")"},

        {On::sample, putVara, "nc_inq_var",           "putVara:inqVarNDimsFailure", writtenInquiry},
        {On::sample, putVara, function("put_vara_"),  "putVara:",               R"(Contiguous data write failed, library error message "%s")"},

        {On::sample, putVars, "nc_inq_var",           "putVars:inqVarNDimsFailure", writtenInquiry},
        {On::sample, putVars, function("put_vars_"),  "putVars:",               R"(Strided data write operation failed, library error message "%s")"},
    };
    if (member.hostClass == tsCHAR) {
        list.push_back({On::sample, {"put_att_text", ncid, -1, "a", "x"}, "nc_put_att_text", "putAttText:",
                        R"(Char attribute write operation failed, library error message "%s")"});
    } else {
        list.push_back({On::sample, call("put_att_", {ncid, -1, "a", 6, one}), function("put_att_"), "putAtt:",
                        R"(Attribute write operation failed, library error message "%s")"});
    }
    return list;
}
// clang-format on

std::vector<Failure> failures() {
    std::vector<Failure> list = operationFailures();
    for (const Member &member : members) {
        const std::vector<Failure> more = memberFailures(member);
        list.insert(list.end(), more.begin(), more.end());
    }
    return list;
}

/// What came of a call: the error, or nothing when it succeeded; and what was asked.
struct Seen {
    std::string error;
    Lines asks;
};

std::string errorText(const std::string &identifier, const std::string &message) {
    return identifier + "\n" + message;
}

/// One call whose library function answers the status, with a text of ours where one is given.
Seen call(const Scene &scene, const Failure &failure, int status, const std::string *text) {
    std::vector<Array> arguments;
    std::vector<const tsArray *> inputs;
    for (const Value &value : failure.call) {
        arguments.push_back(value.make(scene));
        inputs.push_back(arguments.back().get());
    }
    Seen seen;
    Probe probe;
    probe.answer(failure.function, status, failure.n);
    if (text != nullptr) {
        probe.explain(*text);
    }
    try {
        netcdf().call(inputs);
    } catch (const Error &error) {
        seen.error = errorText(error.identifier(), error.message());
    }
    seen.asks = probe.trace();
    return seen;
}

std::string expectedError(const Failure &failure, int status, const std::string &text) {
    const std::string word = failure.identifier.ends_with(':') ? wordOf(status) : "";
    std::string message = failure.message;
    message.replace(message.find("%s"), 2, text);
    return errorText("TESSEL:netcdf:" + failure.identifier + word, message);
}

/// The library's calls but for its explanation, which is asked for once, of the status.
std::string lastAsk(const Seen &seen, int status) {
    Lines asks;
    std::copy_if(seen.asks.begin(), seen.asks.end(), std::back_inserter(asks),
                 [](const std::string &ask) { return ask.starts_with("nc_"); });
    if (asks.size() < 2 || asks.back() != "nc_strerror(" + shown(status) + ")") {
        return "no explanation in\n" + joined(asks);
    }
    const std::string &last = asks[asks.size() - 2];
    return last.substr(0, last.find('('));
}

std::string nameOf(const Failure &failure) {
    return operationOf(failure) + "_" + failure.function + "_" + shown(failure.n);
}

void PrintTo(const Failure &failure, std::ostream *out) {
    *out << nameOf(failure);
}

class LibraryFailures : public testing::TestWithParam<Failure> {};

TEST_P(LibraryFailures, EveryStatus) {
    const Failure &failure = GetParam();
    const Scene scene(failure.on);
    for (const int status : statuses()) {
        SCOPED_TRACE(status);
        if (status != NC_NOERR) {
            const Seen seen = call(scene, failure, status, nullptr);
            EXPECT_EQ(seen.error, expectedError(failure, status, nc_strerror(status)));
            EXPECT_EQ(lastAsk(seen, status), failure.function)
                << "after the failure, or never asked";
        }
    }
    EXPECT_EQ(joined(scene.describe()), joined(Scene(failure.on).describe()));
}

/// The library's text is an argument of the message and not a format, and of any length.
TEST_P(LibraryFailures, AnyText) {
    const Failure &failure = GetParam();
    const Scene scene(failure.on);
    const std::array<std::string, 4> texts = {"", "100%s %n %d %5$s %%", std::string(100000, 'x'),
                                              "Größe 日本"};
    for (const std::string &text : texts) {
        const Seen seen = call(scene, failure, -33, &text);
        EXPECT_EQ(seen.error, expectedError(failure, -33, text));
    }
}

/// Where the call is the operation's own and not an inquiry on the way to it.
TEST_P(LibraryFailures, SuccessIsNone) {
    const Failure &failure = GetParam();
    if (failure.function == "nc_" + operationOf(failure)) {
        EXPECT_EQ(call(Scene(failure.on), failure, NC_NOERR, nullptr).error, "");
    }
}

INSTANTIATE_TEST_SUITE_P(All, LibraryFailures, testing::ValuesIn(failures()),
                         [](const auto &one) { return nameOf(one.param); });

} // namespace
} // namespace tessel::test
