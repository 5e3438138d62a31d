// tests/difference/model.cpp: what the module says about arguments before it reaches the library.
#include "model.hpp"

#include "text.hpp"

#include <algorithm>
#include <cctype>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <limits>
#include <map>

namespace difference {
namespace {

const std::string prefix = "TESSEL:netcdf:";

struct StatusWord {
    int status;
    const char *word;
};

constexpr std::array statusWords = {
    StatusWord{NC_ETRUNC, "corruptedFile"},
    StatusWord{NC_EDIMSIZE, "invalidDimensionSize"},
    StatusWord{NC_EVARSIZE, "formatSizeConstraintsViolated"},
    StatusWord{NC_ENOMEM, "memoryAllocationFailure"},
    StatusWord{NC_ERANGE, "mathResultNotRepresentable"},
    StatusWord{NC_EBADNAME, "nameContainsIllegalCharacters"},
    StatusWord{NC_ESTRIDE, "illegalStride"},
    StatusWord{NC_EEDGE, "startPlusCountExceedsDimensionBound"},
    StatusWord{NC_ECHAR, "attemptToConvertBetweenTextAndNumbers"},
    StatusWord{NC_ENORECVARS, "recordOperationWithoutRecordVars"},
    StatusWord{NC_EUNLIMIT, "onlyOneUnlimitedDimensionAllowed"},
    StatusWord{NC_EMAXNAME, "maximumNameLengthExceeded"},
    StatusWord{NC_ESTS, "inFortranStringTooShort"},
    StatusWord{NC_ENOTNC, "notANetcdfFile"},
    StatusWord{NC_EGLOBAL, "actionProhibitedOnGlobalVarid"},
    StatusWord{NC_ENOTVAR, "variableNotFound"},
    StatusWord{NC_EMAXVARS, "maximumNumberOfVariablesExceeded"},
    StatusWord{NC_EUNLIMPOS, "unlimitedDimensionInTheWrongIndex"},
    StatusWord{NC_EBADDIM, "invalidDimensionIdOrName"},
    StatusWord{NC_EBADTYPE, "invalidDataType"},
    StatusWord{NC_EMAXATTS, "maximumNumberOfAttributesExceeded"},
    StatusWord{NC_ENOTATT, "attributeNotFound"},
    StatusWord{NC_ENAMEINUSE, "nameIsAlreadyInUse"},
    StatusWord{NC_EMAXDIMS, "libraryMaxDimsExceeded"},
    StatusWord{NC_EINVALCOORDS, "indexExceedsDimensionBound"},
    StatusWord{NC_EINDEFINE, "operationNotAllowedInDefineMode"},
    StatusWord{NC_ENOTINDEFINE, "operationNotAllowedInDataMode"},
    StatusWord{NC_EPERM, "writeToReadOnly"},
    StatusWord{NC_EINVAL, "invalidArgument"},
    StatusWord{NC_EEXIST, "netcdfFileExistsAndNoClobber"},
    StatusWord{NC_ENFILE, "tooManyNetcdfFilesOpen"},
    StatusWord{NC_EBADID, "notNetcdfID"},
    // What the system says, under the numbers that programs know.
    StatusWord{1, "operationNotPermitted"},
    StatusWord{2, "noSuchFileOrDirectory"},
    StatusWord{13, "permissionDenied"},
    StatusWord{17, "fileExists"},
    StatusWord{20, "notADirectory"},
    StatusWord{21, "isDirectory"},
    StatusWord{22, "invalidArgument"},
};

double first(const Value &value) {
    return value.elements[0];
}

bool isEmpty(const Value &value) {
    return std::find(value.dims.begin(), value.dims.end(), 0U) != value.dims.end();
}

bool isNumeric(tsClassID classID) {
    return classID >= tsDOUBLE && classID <= tsUINT64;
}

int asInt(double number) {
    return number > -2147483649.0 && number < 2147483648.0 ? static_cast<int>(number)
                                                           : std::numeric_limits<int>::min();
}

std::int64_t asSigned(double number) {
    return number >= -0x1p63 && number < 0x1p63 ? static_cast<std::int64_t>(number)
                                                : std::numeric_limits<std::int64_t>::min();
}

std::uint64_t asUnsigned(double number) {
    return number >= 0x1p63 && number < 0x1p64 ? static_cast<std::uint64_t>(number)
                                               : static_cast<std::uint64_t>(asSigned(number));
}

std::string untilNul(std::string bytes) {
    bytes.resize(std::strlen(bytes.c_str()));
    return bytes;
}

/// What is said of vectors of positions before they are converted.
void wantVector(const Value &value, const std::string &label) {
    if (isEmpty(value)) {
        throw Refusal{prefix + label + "ArgumentIsEmpty"};
    }
    if (!isNumeric(value.classID)) {
        throw Refusal{prefix + label + "ArgumentHasBadDatatype"};
    }
    if (value.classID == tsDOUBLE) {
        const auto bad = std::find_if_not(value.elements.begin(), value.elements.end(),
                                          [](double x) { return std::isfinite(x); });
        if (bad != value.elements.end()) {
            throw Refusal{prefix +
                          (std::isinf(*bad) ? "indexArgumentHasInf" : "indexArgumentHasNaN")};
        }
    }
}

/// The elements from the last to the first, converted.
template <class T, class Convert>
std::vector<T> turnedAround(const Value &value, const Convert &convert) {
    std::vector<T> list;
    std::transform(value.elements.rbegin(), value.elements.rend(), std::back_inserter(list),
                   [&](double element) { return static_cast<T>(convert(element)); });
    return list;
}

} // namespace

std::string wordOf(int status) {
    const auto *const found =
        std::find_if(statusWords.begin(), statusWords.end(),
                     [&](const StatusWord &row) { return row.status == status; });
    return found == statusWords.end() ? "unknownErrorStatus" : found->word;
}

int readID(const Value &value, const std::string &label) {
    if (isEmpty(value)) {
        throw Refusal{prefix + "emptySetID", NC_NOERR, label};
    }
    if (value.classID != tsDOUBLE && value.classID != tsINT32) {
        throw Refusal{prefix + "badIDDatatype", NC_NOERR, label};
    }
    return asInt(first(value));
}

std::string readName(const Value &value, const std::string &label) {
    if (value.classID != tsCHAR) {
        throw Refusal{prefix + "argumentWasNotChar", NC_NOERR, label};
    }
    return untilNul(toUtf8(value.elements));
}

int readMode(const Value &value) {
    if (isEmpty(value)) {
        throw Refusal{prefix + "emptySetMode"};
    }
    if (value.classID == tsDOUBLE || value.classID == tsINT32) {
        return asInt(first(value));
    }
    if (value.classID != tsCHAR) {
        throw Refusal{prefix + "badModeDatatype"};
    }
    std::string name = untilNul(toUtf8(value.elements));
    for (char &c : name) {
        c = static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
    }
    static const std::map<std::string, int> modes = {{"CLOBBER", NC_CLOBBER},
                                                     {"NOCLOBBER", NC_NOCLOBBER},
                                                     {"WRITE", NC_WRITE},
                                                     {"NOWRITE", NC_NOWRITE}};
    const auto found = modes.find(name.rfind("NC_", 0) == 0 ? name.substr(3) : name);
    if (found == modes.end()) {
        throw Refusal{prefix + "unrecognizedFileMode", NC_NOERR, "\"" + name + "\""};
    }
    return found->second;
}

nc_type readType(const Value &value) {
    if (isEmpty(value)) {
        throw Refusal{prefix + "unpack_xtype:emptySetDatatype"};
    }
    if (value.classID != tsDOUBLE) {
        throw Refusal{prefix + "unpack_xtype:badDatatype"};
    }
    const double code = first(value);
    if (code < NC_NAT || code > NC_DOUBLE) {
        throw Refusal{prefix + "invalidNetcdfDatatype"};
    }
    return code == std::floor(code) ? static_cast<nc_type>(code) : NC_NAT;
}

std::size_t readSize(const Value &value, const std::string &label) {
    if (isEmpty(value)) {
        throw Refusal{prefix + "emptySetSizeParameter", NC_NOERR, label};
    }
    if (!isNumeric(value.classID)) {
        throw Refusal{prefix + "badSizeArgumentDatatype", NC_NOERR, label};
    }
    if (!std::isfinite(first(value))) {
        throw Refusal{prefix + "sizeArgumentIsInfOrNaN", NC_NOERR, label};
    }
    if (first(value) < 0) {
        throw Refusal{prefix + "negativeSize", NC_NOERR, label};
    }
    return asUnsigned(first(value));
}

int readInt(const Value &value, const std::string &label) {
    if (isEmpty(value)) {
        throw Refusal{prefix + "unpackIntSingleton:argumentIsEmptySet", NC_NOERR, label};
    }
    if (value.classID == tsDOUBLE) {
        return asInt(first(value));
    }
    if (value.classID != tsINT32) {
        throw Refusal{prefix + "unpackIntSingleton:badNumericType"};
    }
    // Two integers, the second of which may be missing, are the halves of a double.
    std::array<std::int32_t, 2> halves{};
    for (std::size_t i = 0; i < std::min(halves.size(), value.elements.size()); ++i) {
        halves.at(i) = static_cast<std::int32_t>(value.elements[i]);
    }
    double whole = 0.0;
    std::memcpy(&whole, halves.data(), sizeof(whole));
    return asInt(whole);
}

std::vector<int> readDimids(const Value &value) {
    if (value.classID != tsDOUBLE) {
        throw Refusal{prefix + "unpackDimids:badDimidsType"};
    }
    if (value.elements.size() > NC_MAX_VAR_DIMS) {
        throw Refusal{prefix + "ndimsLargerThanNetcdfLimits"};
    }
    return turnedAround<int>(value, asInt);
}

std::vector<std::size_t> readPositions(const Value &value, const std::string &label) {
    wantVector(value, label);
    return turnedAround<std::size_t>(value, asUnsigned);
}

std::vector<std::ptrdiff_t> readStrides(const Value &value) {
    wantVector(value, "stride");
    if (value.classID == tsUINT64) { // the bits are kept
        return turnedAround<std::ptrdiff_t>(value, asUnsigned);
    }
    return turnedAround<std::ptrdiff_t>(value, asSigned);
}

void wantData(const Value &value, const Operation &operation) {
    if (isEmpty(value) && operation.verb != Verb::putAtt) {
        throw Refusal{prefix + "emptyVariableData"};
    }
    if (value.classID != members.at(operation.member).classID) {
        throw Refusal{prefix + operation.shortName + ":badDatatype", NC_NOERR, operation.shortName};
    }
}

std::size_t wantRoom(const std::vector<std::size_t> &lengths, std::size_t elementSize) {
    std::size_t bytes = elementSize;
    for (const std::size_t length : lengths) {
        if (__builtin_mul_overflow(bytes, length, &bytes) ||
            bytes > static_cast<std::size_t>(std::numeric_limits<std::ptrdiff_t>::max())) {
            throw Refusal{"TESSEL:host:dimensionsTooLarge"};
        }
    }
    return bytes / elementSize;
}

} // namespace difference
