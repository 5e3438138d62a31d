// module/call/catalogue.hpp: every error of the module, a row each.
//
// Identifiers and texts are an interface that programs match on: they stay as they are, and where
// the rows differ in wording ("badParameterCount" beside "badInputParameterCount", "formate") they
// do so for good.
#pragma once

#include "call/error.hpp"
#include "call/failure.hpp"
#include "call/operation.hpp"

namespace tessel::netcdf {

/// The frame of an operation: its exact number of inputs (the operation name included), the error
/// for any other number (whose argument is the entry's short name), and the failure of its library
/// call.
struct Operation {
    int inputs;
    Error<const char *> badCount;
    LibraryFailure failure;
};

/// Returns if the operation got the inputs it wants.
inline void checkCount(const Operation &operation, int nrhs, const OperationEntry *entry) {
    if (nrhs != operation.inputs) {
        raise(operation.badCount, entry->shortName);
    }
}

namespace catalogue {

// clang-format off

// The operations, one library call each.
inline constexpr Operation
    abort            = {2, {"TESSEL:netcdf:abort:badInputArgumentCount",             "Must supply two input parameters for ABORT operation."},                {"abort",            "Abort operation failed"}},
    close            = {2, {"TESSEL:netcdf:close:badInputParameterCount",            "Must supply two input parameters for CLOSE operation."},                {"close",            "Close operation failed"}},
    copyAtt          = {6, {"TESSEL:netcdf:copyAtt:badInputParameterCount",          "Must supply six input parameters for COPY_ATT operation."},             {"copyAtt",          "Attribute copy operation failed"}},
    create           = {3, {"TESSEL:netcdf:create:badParameterCount",                "Must supply three input parameters for CREATE operation."},             {"create",           "Create operation failed"}},
    createTuned      = {5, {"TESSEL:netcdf:pCreate:badInputParameterCount",          "Must supply five input parameters for performance create operation."},  {"pCreate",          "Performance create operation failed"}},
    defDim           = {4, {"TESSEL:netcdf:defDim:badInputParameterCount",           "Must supply four input parameters for DEF_DIM operation."},             {"defDim",           "Dimension definition operation failed"}},
    defVar           = {5, {"TESSEL:netcdf:defVar:badInputParameterCount",           "Must supply five input parameters for DEF_VAR operation."},             {"defVar",           "Variable definition operation failed"}},
    delAtt           = {4, {"TESSEL:netcdf:delAtt:badInputParameterCount",           "Must supply four input parameters for DEL_ATT operation."},             {"delAtt",           "Attribute deletion operation failed"}},
    enddef           = {2, {"TESSEL:netcdf:enddef:badInputArgumentCount",            "Must supply two input parameters for ENDDEF operation."},               {"endDef",           "Enddef operation failed"}},
    enddefTuned      = {6, {"TESSEL:netcdf:pEndDef:badParameterCount",               "Must supply six input parameters for _ENDDEF operation."},              {"pEndDef",          "Performance Enddef operation failed"}},
    inq              = {2, {"TESSEL:netcdf:inq:badInputParameterCount",              "Must supply two input parameters for the INQ operation."},              {"inq",              "File inquiry failed"}},
    inqAtt           = {4, {"TESSEL:netcdf:inqAtt:badInputParameterCount",           "Must supply four input parameters for the INQ_ATT operation."},         {"inqAtt",           "Attribute inquiry failed"}},
    inqAttid         = {4, {"TESSEL:netcdf:inqAttID:badInputParameterCount",         "Must supply four input parameters for the INQ_ATTID operation."},       {"inqAttID",         "Attribute ID retrieval failed"}},
    inqAttname       = {4, {"TESSEL:netcdf:inqAttName:badInputParameterCount",       "Must supply four input parameters for the INQ_ATTNAME operation."},     {"inqAttName",       "Attribute name retrieval failed"}},
    inqDim           = {3, {"TESSEL:netcdf:inqDim:badInputParameterCount",           "Must supply three input parameters for the INQ_DIM operation."},        {"inqDim",           "Dimension inquiry failed"}},
    inqDimid         = {3, {"TESSEL:netcdf:inqDimID:badInputParameterCount",         "Must supply three input parameters for the INQ_DIMID operation."},      {"inqDimID",         "Dimension ID inquiry failed"}},
    inqVar           = {3, {"TESSEL:netcdf:inqVar:badInputParameterCount",           "Must supply three input parameters for the INQ_VAR operation."},        {"inqVar",           "Variable inquiry failed"}},
    inqVarid         = {3, {"TESSEL:netcdf:inqVarID:badInputParameterCount",         "Must supply three input parameters for the INQ_VARID operation."},      {"inqVarID",         "Variable ID retrieval failed"}},
    open             = {3, {"TESSEL:netcdf:open:badInputParameterCount",             "Must supply three input parameters for the OPEN operation."},           {"open",             "Unable to open netCDF file"}},
    openTuned        = {4, {"TESSEL:netcdf:pOpen:badInputParameterCount",            "Must supply four input parameters for the _OPEN operation."},           {"pOpen",            "Unable to open file in enhanced performance mode"}},
    redef            = {2, {"TESSEL:netcdf:redef:badInputParameterCount",            "Must supply two input parameters for the REDEF operation."},            {"redef",            "Unable to place netCDF file in define mode"}},
    renameAtt        = {5, {"TESSEL:netcdf:renameAtt:badInputParameterCount",        "Must supply five input parameters for the RENAME_ATT operation."},      {"renameAtt",        "Unable to rename attribute"}},
    renameDim        = {4, {"TESSEL:netcdf:renameDim:badInputParameterCount",        "Must supply four input parameters for the RENAME_DIM operation."},      {"renameDim",        "Unable to rename dimension"}},
    renameVar        = {4, {"TESSEL:netcdf:renameVar:badInputParameterCount",        "Must supply four input parameters for the RENAME_VAR operation."},      {"renameVar",        "Unable to rename variable"}},
    setDefaultFormat = {2, {"TESSEL:netcdf:setDefaultFormat:badInputParameterCount", "Must supply two input parameters for the SET_DEFAULT_FORMAT operation."}, {"setDefaultFormat", "Unable to set the default formate"}},
    setFill          = {3, {"TESSEL:netcdf:setFill:badInputParameterCount",          "Must supply three input parameters for the SET_FILL operation."},       {"setFill",          "Unable to set fill mode"}},
    sync             = {2, {"TESSEL:netcdf:sync:badInputArgumentCount",              "Must supply two input parameters for the SYNC operation."},             {"sync",             "Unable to sync netCDF file"}};

// The operations that have no status to check. "parameter" shares the text of "inq_libvers".
inline constexpr Operation
    inqLibvers = {1, {"TESSEL:netcdf:inqLibVers:badInputParameterCount",             "INQ_LIBVERS requires just one input parameter."},            {}},
    parameter  = {2, {"TESSEL:netcdf_tq:tqParameter:badInputParameterCount",         "INQ_LIBVERS requires just one input parameter."},            {}},
    strerror   = {2, {"TESSEL:netcdf:strerror:badInputArgumentCount",                "Must supply two input parameters for the STRERROR operation."}, {}};

// The typed families.
inline constexpr Operation
    getAtt     = {4, {"TESSEL:netcdf:getAtt:badInputParameterCount",     "Must supply four input parameters for the %s function."},                  {"getAtt",     "Attribute retrieval operation failed"}},
    getVar     = {3, {"TESSEL:netcdf:getVar:badInputParameterCount",     "Must supply three input parameters for %s."},                              {"getVar",     "Variable data retrieval failed"}},
    getVar1    = {4, {"TESSEL:netcdf:getVar1:badInputParameterCount",    "Must supply four input parameters for %s function."},                      {"getVar1",    "Single datum retrieval failed"}},
    getVara    = {5, {"TESSEL:netcdf:getVara:badInputParameterCount",    "Must supply five input parameters for %s operation."},                     {"getVara",    "Contiguous data retrieval failed"}},
    getVars    = {6, {"TESSEL:netcdf:getVars:badInputParameterCount",    "Must supply six input parameters for %s operation."},                      {"getVars",    "Strided data retrieval failed"}},
    putAtt     = {6, {"TESSEL:netcdf:putAtt:badInputParameterCount",     "Must supply six input parameters for %s operation."},                      {"putAtt",     "Attribute write operation failed"}},
    putAttText = {5, {"TESSEL:netcdf:putAttText:badInputParameterCount", "Must supply five input parameters to PUT_ATT_TEXT."},                      {"putAttText", "Char attribute write operation failed"}},
    putVar     = {4, {"TESSEL:netcdf:putVar:badInputParameterCount",     "Must supply four input parameters for %s"},                                {"putVar",     "Variable write operation failed"}},
    putVar1    = {5, {"TESSEL:netcdf:putVar1:badInputParameterCount",    "Must supply five input parameters for PUT_VAR1_(X) family of operations."}, {"putVar1",    "Single datum write operation failed"}},
    putVara    = {6, {"TESSEL:netcdf:putVara:badInputParameterCount",    "Must supply six input parameters for %s operation."},                      {"putVara",    "Contiguous data write failed"}},
    putVars    = {7, {"TESSEL:netcdf:putVars:badInputParameterCount",    "Must supply seven input parameters for %s"},                               {"putVars",    "Strided data write operation failed"}};

// The inquiries that come before a family's own call; some have an identifier that does not tell the
// status.
inline constexpr LibraryFailure
    getAttInquiry  = {"getAtt",                 "Attribute inquiry failed"},
    getVarNumDims  = {"getVar:numDimsInquiry",  "Unable to retrieve number of variable's dimensions"},
    getVarDimids   = {"getVar:dimidsInquiry",   "Unable to retrieve a netCDF variable's dimension IDs"},
    getVarDimLen   = {"getVar:dimLenInquiry",   "Dimension length inquiry failed"},
    getVar1NumDims = {"getVar1",                "Unable to retrieve number of variable's dimensions"},
    getVaraNumDims = {"getVara:numDimsInquiry", "Unable to retrieve number of netCDF variable's dimensions"},
    putVarInquiry  = {"putVar",                 "Variable inquiry failed"},
    putVarDimLen   = {"putVar",                 "Retrieval of dimension length failed"};
inline constexpr Error<const char *> // the library's text
    getVarsNumDims = {"TESSEL:netcdf:getVars:numVarsInquiryFailure",   "Retrieval of number of variable dimensions failed, library error message \"%s\""},
    getVarsDimids  = {"TESSEL:netcdf:getVars:varDimIDsInquiryFailure", "Retrieval of variable dimensions failed, library error message \"%s\""},
    putVar1Inquiry = {"TESSEL:netcdf:putVar1:inqVarNDimsFailure",      "Unable to read the number of dimensions, \"%s\"."},
    putVaraInquiry = {"TESSEL:netcdf:putVara:inqVarNDimsFailure",      "Unable to read the number of dimensions, \"%s\"."},
    putVarsInquiry = {"TESSEL:netcdf:putVars:inqVarNDimsFailure",      "Unable to read the number of dimensions, \"%s\"."};

// An entry whose id a family does not serve; the argument is the entry's short name.
inline constexpr Error<const char *>
    getAttForeign  = {"TESSEL:netcdf:getAtt:unhandledOperation",     "\"%s\" is not a recognized operation."},
    getVarForeign  = {"TESSEL:netcdf:getVar:unhandledOperation",     "Unhandled operation:  \"%s\""},
    getVar1Foreign = {"TESSEL:netcdf:getVar1:unrecognizedOperation", "Unrecognized operation:  \"%s\""},
    getVaraForeign = {"TESSEL:netcdf:getVara:unhandledOperation",    "Unhandled operation:  \"%s\""},
    getVarsForeign = {"TESSEL:netcdf:getVars:unhandledOperation",    "Unhandled operation:  \"%s\""},
    putAttForeign  = {"TESSEL:netcdf:putAtt:unhandledOperation",     "Unrecognized operation:  \"%s\""},
    putVarForeign  = {"TESSEL:netcdf:putVar:unhandledOperation",     "Unhandled operation:  \"%s\""},
    putVar1Foreign = {"TESSEL:netcdf:putVar1:unhandledOperation",    "Unhandled operation:  \"%s\""},
    putVaraForeign = {"TESSEL:netcdf:putVara:unhandledOperation",    "Unhandled operation:  \"%s\""},
    putVarsForeign = {"TESSEL:netcdf:putVars:unhandledOperation",    "Unhandled operation:  \"%s\""};

// Index vectors that do not fit the variable. The stride's text speaks of the count.
inline constexpr Error<>
    getVar1IndexLength  = {"TESSEL:netcdf:getVar1:indexVectorLengthMismatch",  "The length of the start index does not match up with the number of variable dimensions."},
    getVaraStartLength  = {"TESSEL:netcdf:getVara:startVectorLengthMismatch",  "The length of the start index does not match up with the number of variable dimensions."},
    getVaraCountLength  = {"TESSEL:netcdf:getVara:countVectorLengthMismatch",  "The length of the count index does not match up with the number of variable dimensions."},
    getVarsStartLength  = {"TESSEL:netcdf:getVars:startVectorLengthMismatch",  "The length of the start index does not match up with the number of variable dimensions."},
    getVarsCountLength  = {"TESSEL:netcdf:getVars:countVectorLengthMismatch",  "The length of the count index does not match up with the number of variable dimensions."},
    getVarsStrideLength = {"TESSEL:netcdf:getVars:strideVectorLengthMismatch", "The length of the count index does not match up with the number of variable dimensions."};
inline constexpr Error<const char *, int, unsigned> // the variable's name, its number of dimensions, the vector's length
    putVar1StartLength  = {"TESSEL:netcdf:putVar1:badStartLength",  "The length of the start argument for %s must be %d instead of %u."},
    putVaraStartLength  = {"TESSEL:netcdf:putVara:badStartLength",  "The length of the start argument for %s must be %d instead of %u."},
    putVaraCountLength  = {"TESSEL:netcdf:putVara:badCountLength",  "The length of the count argument for %s must be %d instead of %u."},
    putVarsStartLength  = {"TESSEL:netcdf:putVars:badStartLength",  "The length of the start argument for %s must be %d instead of %u."},
    putVarsCountLength  = {"TESSEL:netcdf:putVars:badCountLength",  "The length of the count argument for %s must be %d instead of %u."},
    putVarsStrideLength = {"TESSEL:netcdf:putVars:badStrideLength", "The length of the stride argument for %s must be %d instead of %u."};

// Data that do not fit what is to be written.
inline constexpr Error<>
    emptyVariableData = {"TESSEL:netcdf:emptyVariableData",        "Variable data must not be empty."},
    putVarDataSize    = {"TESSEL:netcdf:putVar:dataSizeMismatch",  "The number of input elements does not match the variable size."},
    putVar1DataSize   = {"TESSEL:netcdf:putVar1:dataSizeMismatch", "Specifying a single index argument implies that only one data element be provided."};
inline constexpr Error<unsigned, unsigned> // the product of the counts, the number of elements
    putVaraDataSize   = {"TESSEL:netcdf:putVara:dataSizeMismatch", "The number of elements implied by the count argument (%u) does not equal the number of data elements (%u)."},
    putVarsDataSize   = {"TESSEL:netcdf:putVars:dataSizeMismatch", "The number of elements implied by the count argument (%u) does not equal the number of data elements (%u)."};
inline constexpr Error<const char *> // the short name
    unhandledFuncstr  = {"TESSEL:netcdf:validate_write_op_datatype:unhandledFuncstr", "Unhandled operation:  \"%s\""};

// The gateway. The two blanks after the colon are meant.
inline constexpr Error<>
    tooFewArguments = {"TESSEL:netcdf:tooFewArguments", "Must provide at least one input argument."},
    firstArgNotChar = {"TESSEL:netcdf:firstArgNotChar", "First argument must be a function string."};
inline constexpr Error<const char *>
    invalidOperation          = {"TESSEL:netcdf:InvalidOperation",          "Unrecognized operation:  \"%s\""},
    unrecognizedCharParameter = {"TESSEL:netcdf:unrecognizedCharParameter", "Unrecognized operation:  \"%s\""};

// The converters. Where there is an argument, it is the label: the library's parameter name.
inline constexpr Error<const char *>
    emptySetID              = {"TESSEL:netcdf:emptySetID",                                         "%s argument cannot be []"},
    argumentWasNotChar      = {"TESSEL:netcdf:argumentWasNotChar",                                 "%s name argument must be character"},
    emptySetSizeParameter   = {"TESSEL:netcdf:emptySetSizeParameter",                              "%s argument cannot be []"},
    badSizeArgumentDatatype = {"TESSEL:netcdf:badSizeArgumentDatatype",                            "%s argument must be either double precision or an unsigned integer datatype"},
    sizeArgumentIsInfOrNaN  = {"TESSEL:netcdf:sizeArgumentIsInfOrNaN",                             "%s argument must not be Inf or NaN"},
    unhandledNumericType    = {"TESSEL:netcdf:unpackGenericSizeParameter:unhandledNumericType",    "type of %s argument was not handled"},
    negativeSize            = {"TESSEL:netcdf:negativeSize",                                       "%s argument must be positive"},
    emptySingleton          = {"TESSEL:netcdf:unpackIntSingleton:argumentIsEmptySet",              "%s argument cannot be []"};
inline constexpr Error<const char *, const char *> // the label, the class found
    badIDDatatype           = {"TESSEL:netcdf:badIDDatatype",                                      "%s argument must be either double precision or int32, not %s"};
inline constexpr Error<>
    nameExtractionFailure   = {"TESSEL:netcdf:tsArrayToStringFailureForUnpackingName",             "tsArrayToString failed to extract the character parameter."},
    emptySetMode            = {"TESSEL:netcdf:emptySetMode",                                       "mode argument cannot be []"},
    modeExtractionFailure   = {"TESSEL:netcdf:tsArrayToStringFailureForMode",                      "tsArrayToString failed to extract the mode"},
    badModeDatatype         = {"TESSEL:netcdf:badModeDatatype",                                    "mode argument must be either double precision, int32, or character"},
    emptySetDatatype        = {"TESSEL:netcdf:unpack_xtype:emptySetDatatype",                      "datatype argument cannot be []"},
    badDatatype             = {"TESSEL:netcdf:unpack_xtype:badDatatype",                           "datatype argument must be double precision"},
    badSingletonType        = {"TESSEL:netcdf:unpackIntSingleton:badNumericType",                  "argument must be either double precision or int32"},
    badDimidsType           = {"TESSEL:netcdf:unpackDimids:badDimidsType",                         "Dimids argument must be double precision."},
    numberOfDimensionsOutOfBounds = {"TESSEL:netcdf:unpackDimids:numberOfDimensionsOutOfBounds",   "The number of dimensions is out of bounds."};
inline constexpr Error<const char *> // the mode as it was read
    unrecognizedFileMode    = {"TESSEL:netcdf:unrecognizedFileMode",                               "Unknown parameter \"%s\"."};
inline constexpr Error<double>
    invalidNetcdfDatatype   = {"TESSEL:netcdf:invalidNetcdfDatatype",                              "The datatype argument %f is out of range."};
inline constexpr Error<int>
    tooManyDimensions       = {"TESSEL:netcdf:ndimsLargerThanNetcdfLimits",                        "Cannot specify more than %d dimensions."};
inline constexpr Error<unsigned>
    sizeNotRepresentable    = {"TESSEL:netcdf:packUpSizetScalar",                                  "Unable to create double scalar out of %u."};
inline constexpr Error<const char *> // the variable's name
    ndimsOutOfRange         = {"TESSEL:netcdf:defVar",                                             "The number of dimensions is out of range for %s."};

// Index vectors, whatever the argument is called.
inline constexpr Error<>
    indexArgumentHasInf = {"TESSEL:netcdf:indexArgumentHasInf", "Index parameter cannot contain Inf."},
    indexArgumentHasNaN = {"TESSEL:netcdf:indexArgumentHasNaN", "Index parameter cannot contain NaN."};

// Rows of which the identifier is the rest that follows a name (see raiseNamed).
inline constexpr Error<const char *> // the argument's name, twice
    argumentIsEmpty        = {"ArgumentIsEmpty",          "%s argument cannot be empty."},
    argumentHasBadDatatype = {"ArgumentHasBadDatatype",   "%s argument must consist of discrete values between 0 and 2^31-1."};
inline constexpr Error<const char *> // the entry's short name, twice
    readBufferFailure      = {":memoryAllocationFailure", "Failed to allocate memory for %s read operation."},
    writeBufferFailure     = {":memoryAllocationFailure", "Failed to allocate memory for %s write operation."};
inline constexpr Error<const char *, const char *, const char *> // the short name twice, the class wanted, the class found
    badWriteDatatype       = {":badDatatype",             "The input datatype for %s must be %s, not %s."};

// clang-format on

} // namespace catalogue
} // namespace tessel::netcdf
