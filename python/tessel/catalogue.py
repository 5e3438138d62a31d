# python/tessel/catalogue.py: written by tools/make_catalogue.py; change the sources.
"""The errors of the module, with the words of statuses and who raises what; and those of
the host, the guard and this package."""

ROWS: dict[str, tuple[str, str]] = {
    "abort": (
        "TESSEL:netcdf:abort:badInputArgumentCount",
        "Must supply two input parameters for ABORT operation."),
    "abort.failure": (
        "TESSEL:netcdf:abort:",
        'Abort operation failed, library error message "%s"'),
    "close": (
        "TESSEL:netcdf:close:badInputParameterCount",
        "Must supply two input parameters for CLOSE operation."),
    "close.failure": (
        "TESSEL:netcdf:close:",
        'Close operation failed, library error message "%s"'),
    "copyAtt": (
        "TESSEL:netcdf:copyAtt:badInputParameterCount",
        "Must supply six input parameters for COPY_ATT operation."),
    "copyAtt.failure": (
        "TESSEL:netcdf:copyAtt:",
        'Attribute copy operation failed, library error message "%s"'),
    "create": (
        "TESSEL:netcdf:create:badParameterCount",
        "Must supply three input parameters for CREATE operation."),
    "create.failure": (
        "TESSEL:netcdf:create:",
        'Create operation failed, library error message "%s"'),
    "createTuned": (
        "TESSEL:netcdf:pCreate:badInputParameterCount",
        "Must supply five input parameters for performance create operation."),
    "createTuned.failure": (
        "TESSEL:netcdf:pCreate:",
        'Performance create operation failed, library error message "%s"'),
    "defDim": (
        "TESSEL:netcdf:defDim:badInputParameterCount",
        "Must supply four input parameters for DEF_DIM operation."),
    "defDim.failure": (
        "TESSEL:netcdf:defDim:",
        'Dimension definition operation failed, library error message "%s"'),
    "defVar": (
        "TESSEL:netcdf:defVar:badInputParameterCount",
        "Must supply five input parameters for DEF_VAR operation."),
    "defVar.failure": (
        "TESSEL:netcdf:defVar:",
        'Variable definition operation failed, library error message "%s"'),
    "delAtt": (
        "TESSEL:netcdf:delAtt:badInputParameterCount",
        "Must supply four input parameters for DEL_ATT operation."),
    "delAtt.failure": (
        "TESSEL:netcdf:delAtt:",
        'Attribute deletion operation failed, library error message "%s"'),
    "enddef": (
        "TESSEL:netcdf:enddef:badInputArgumentCount",
        "Must supply two input parameters for ENDDEF operation."),
    "enddef.failure": (
        "TESSEL:netcdf:endDef:",
        'Enddef operation failed, library error message "%s"'),
    "enddefTuned": (
        "TESSEL:netcdf:pEndDef:badParameterCount",
        "Must supply six input parameters for _ENDDEF operation."),
    "enddefTuned.failure": (
        "TESSEL:netcdf:pEndDef:",
        'Performance Enddef operation failed, library error message "%s"'),
    "inq": (
        "TESSEL:netcdf:inq:badInputParameterCount",
        "Must supply two input parameters for the INQ operation."),
    "inq.failure": (
        "TESSEL:netcdf:inq:",
        'File inquiry failed, library error message "%s"'),
    "inqAtt": (
        "TESSEL:netcdf:inqAtt:badInputParameterCount",
        "Must supply four input parameters for the INQ_ATT operation."),
    "inqAtt.failure": (
        "TESSEL:netcdf:inqAtt:",
        'Attribute inquiry failed, library error message "%s"'),
    "inqAttid": (
        "TESSEL:netcdf:inqAttID:badInputParameterCount",
        "Must supply four input parameters for the INQ_ATTID operation."),
    "inqAttid.failure": (
        "TESSEL:netcdf:inqAttID:",
        'Attribute ID retrieval failed, library error message "%s"'),
    "inqAttname": (
        "TESSEL:netcdf:inqAttName:badInputParameterCount",
        "Must supply four input parameters for the INQ_ATTNAME operation."),
    "inqAttname.failure": (
        "TESSEL:netcdf:inqAttName:",
        'Attribute name retrieval failed, library error message "%s"'),
    "inqDim": (
        "TESSEL:netcdf:inqDim:badInputParameterCount",
        "Must supply three input parameters for the INQ_DIM operation."),
    "inqDim.failure": (
        "TESSEL:netcdf:inqDim:",
        'Dimension inquiry failed, library error message "%s"'),
    "inqDimid": (
        "TESSEL:netcdf:inqDimID:badInputParameterCount",
        "Must supply three input parameters for the INQ_DIMID operation."),
    "inqDimid.failure": (
        "TESSEL:netcdf:inqDimID:",
        'Dimension ID inquiry failed, library error message "%s"'),
    "inqVar": (
        "TESSEL:netcdf:inqVar:badInputParameterCount",
        "Must supply three input parameters for the INQ_VAR operation."),
    "inqVar.failure": (
        "TESSEL:netcdf:inqVar:",
        'Variable inquiry failed, library error message "%s"'),
    "inqVarid": (
        "TESSEL:netcdf:inqVarID:badInputParameterCount",
        "Must supply three input parameters for the INQ_VARID operation."),
    "inqVarid.failure": (
        "TESSEL:netcdf:inqVarID:",
        'Variable ID retrieval failed, library error message "%s"'),
    "open": (
        "TESSEL:netcdf:open:badInputParameterCount",
        "Must supply three input parameters for the OPEN operation."),
    "open.failure": (
        "TESSEL:netcdf:open:",
        'Unable to open netCDF file, library error message "%s"'),
    "openTuned": (
        "TESSEL:netcdf:pOpen:badInputParameterCount",
        "Must supply four input parameters for the _OPEN operation."),
    "openTuned.failure": (
        "TESSEL:netcdf:pOpen:",
        'Unable to open file in enhanced performance mode, library error message "%s"'),
    "redef": (
        "TESSEL:netcdf:redef:badInputParameterCount",
        "Must supply two input parameters for the REDEF operation."),
    "redef.failure": (
        "TESSEL:netcdf:redef:",
        'Unable to place netCDF file in define mode, library error message "%s"'),
    "renameAtt": (
        "TESSEL:netcdf:renameAtt:badInputParameterCount",
        "Must supply five input parameters for the RENAME_ATT operation."),
    "renameAtt.failure": (
        "TESSEL:netcdf:renameAtt:",
        'Unable to rename attribute, library error message "%s"'),
    "renameDim": (
        "TESSEL:netcdf:renameDim:badInputParameterCount",
        "Must supply four input parameters for the RENAME_DIM operation."),
    "renameDim.failure": (
        "TESSEL:netcdf:renameDim:",
        'Unable to rename dimension, library error message "%s"'),
    "renameVar": (
        "TESSEL:netcdf:renameVar:badInputParameterCount",
        "Must supply four input parameters for the RENAME_VAR operation."),
    "renameVar.failure": (
        "TESSEL:netcdf:renameVar:",
        'Unable to rename variable, library error message "%s"'),
    "setDefaultFormat": (
        "TESSEL:netcdf:setDefaultFormat:badInputParameterCount",
        "Must supply two input parameters for the SET_DEFAULT_FORMAT operation."),
    "setDefaultFormat.failure": (
        "TESSEL:netcdf:setDefaultFormat:",
        'Unable to set the default formate, library error message "%s"'),
    "setFill": (
        "TESSEL:netcdf:setFill:badInputParameterCount",
        "Must supply three input parameters for the SET_FILL operation."),
    "setFill.failure": (
        "TESSEL:netcdf:setFill:",
        'Unable to set fill mode, library error message "%s"'),
    "sync": (
        "TESSEL:netcdf:sync:badInputArgumentCount",
        "Must supply two input parameters for the SYNC operation."),
    "sync.failure": (
        "TESSEL:netcdf:sync:",
        'Unable to sync netCDF file, library error message "%s"'),
    "inqLibvers": (
        "TESSEL:netcdf:inqLibVers:badInputParameterCount",
        "INQ_LIBVERS requires just one input parameter."),
    "parameter": (
        "TESSEL:netcdf_tq:tqParameter:badInputParameterCount",
        "INQ_LIBVERS requires just one input parameter."),
    "strerror": (
        "TESSEL:netcdf:strerror:badInputArgumentCount",
        "Must supply two input parameters for the STRERROR operation."),
    "getAtt": (
        "TESSEL:netcdf:getAtt:badInputParameterCount",
        "Must supply four input parameters for the %s function."),
    "getAtt.failure": (
        "TESSEL:netcdf:getAtt:",
        'Attribute retrieval operation failed, library error message "%s"'),
    "getVar": (
        "TESSEL:netcdf:getVar:badInputParameterCount",
        "Must supply three input parameters for %s."),
    "getVar.failure": (
        "TESSEL:netcdf:getVar:",
        'Variable data retrieval failed, library error message "%s"'),
    "getVar1": (
        "TESSEL:netcdf:getVar1:badInputParameterCount",
        "Must supply four input parameters for %s function."),
    "getVar1.failure": (
        "TESSEL:netcdf:getVar1:",
        'Single datum retrieval failed, library error message "%s"'),
    "getVara": (
        "TESSEL:netcdf:getVara:badInputParameterCount",
        "Must supply five input parameters for %s operation."),
    "getVara.failure": (
        "TESSEL:netcdf:getVara:",
        'Contiguous data retrieval failed, library error message "%s"'),
    "getVars": (
        "TESSEL:netcdf:getVars:badInputParameterCount",
        "Must supply six input parameters for %s operation."),
    "getVars.failure": (
        "TESSEL:netcdf:getVars:",
        'Strided data retrieval failed, library error message "%s"'),
    "putAtt": (
        "TESSEL:netcdf:putAtt:badInputParameterCount",
        "Must supply six input parameters for %s operation."),
    "putAtt.failure": (
        "TESSEL:netcdf:putAtt:",
        'Attribute write operation failed, library error message "%s"'),
    "putAttText": (
        "TESSEL:netcdf:putAttText:badInputParameterCount",
        "Must supply five input parameters to PUT_ATT_TEXT."),
    "putAttText.failure": (
        "TESSEL:netcdf:putAttText:",
        'Char attribute write operation failed, library error message "%s"'),
    "putVar": (
        "TESSEL:netcdf:putVar:badInputParameterCount",
        "Must supply four input parameters for %s"),
    "putVar.failure": (
        "TESSEL:netcdf:putVar:",
        'Variable write operation failed, library error message "%s"'),
    "putVar1": (
        "TESSEL:netcdf:putVar1:badInputParameterCount",
        "Must supply five input parameters for PUT_VAR1_(X) family of operations."),
    "putVar1.failure": (
        "TESSEL:netcdf:putVar1:",
        'Single datum write operation failed, library error message "%s"'),
    "putVara": (
        "TESSEL:netcdf:putVara:badInputParameterCount",
        "Must supply six input parameters for %s operation."),
    "putVara.failure": (
        "TESSEL:netcdf:putVara:",
        'Contiguous data write failed, library error message "%s"'),
    "putVars": (
        "TESSEL:netcdf:putVars:badInputParameterCount",
        "Must supply seven input parameters for %s"),
    "putVars.failure": (
        "TESSEL:netcdf:putVars:",
        'Strided data write operation failed, library error message "%s"'),
    "getAttInquiry.failure": (
        "TESSEL:netcdf:getAtt:",
        'Attribute inquiry failed, library error message "%s"'),
    "getVarNumDims.failure": (
        "TESSEL:netcdf:getVar:numDimsInquiry:",
        'Unable to retrieve number of variable\'s dimensions, library error message "%s"'),
    "getVarDimids.failure": (
        "TESSEL:netcdf:getVar:dimidsInquiry:",
        'Unable to retrieve a netCDF variable\'s dimension IDs, library error message "%s"'),
    "getVarDimLen.failure": (
        "TESSEL:netcdf:getVar:dimLenInquiry:",
        'Dimension length inquiry failed, library error message "%s"'),
    "getVar1NumDims.failure": (
        "TESSEL:netcdf:getVar1:",
        'Unable to retrieve number of variable\'s dimensions, library error message "%s"'),
    "getVaraNumDims.failure": (
        "TESSEL:netcdf:getVara:numDimsInquiry:",
        'Unable to retrieve number of netCDF variable\'s dimensions, library error message "%s"'),
    "putVarInquiry.failure": (
        "TESSEL:netcdf:putVar:",
        'Variable inquiry failed, library error message "%s"'),
    "putVarDimLen.failure": (
        "TESSEL:netcdf:putVar:",
        'Retrieval of dimension length failed, library error message "%s"'),
    "getVarsNumDims": (
        "TESSEL:netcdf:getVars:numVarsInquiryFailure",
        'Retrieval of number of variable dimensions failed, library error message "%s"'),
    "getVarsDimids": (
        "TESSEL:netcdf:getVars:varDimIDsInquiryFailure",
        'Retrieval of variable dimensions failed, library error message "%s"'),
    "putVar1Inquiry": (
        "TESSEL:netcdf:putVar1:inqVarNDimsFailure",
        'Unable to read the number of dimensions, "%s".'),
    "putVaraInquiry": (
        "TESSEL:netcdf:putVara:inqVarNDimsFailure",
        'Unable to read the number of dimensions, "%s".'),
    "putVarsInquiry": (
        "TESSEL:netcdf:putVars:inqVarNDimsFailure",
        'Unable to read the number of dimensions, "%s".'),
    "getAttForeign": (
        "TESSEL:netcdf:getAtt:unhandledOperation",
        '"%s" is not a recognized operation.'),
    "getVarForeign": (
        "TESSEL:netcdf:getVar:unhandledOperation",
        'Unhandled operation:  "%s"'),
    "getVar1Foreign": (
        "TESSEL:netcdf:getVar1:unrecognizedOperation",
        'Unrecognized operation:  "%s"'),
    "getVaraForeign": (
        "TESSEL:netcdf:getVara:unhandledOperation",
        'Unhandled operation:  "%s"'),
    "getVarsForeign": (
        "TESSEL:netcdf:getVars:unhandledOperation",
        'Unhandled operation:  "%s"'),
    "putAttForeign": (
        "TESSEL:netcdf:putAtt:unhandledOperation",
        'Unrecognized operation:  "%s"'),
    "putVarForeign": (
        "TESSEL:netcdf:putVar:unhandledOperation",
        'Unhandled operation:  "%s"'),
    "putVar1Foreign": (
        "TESSEL:netcdf:putVar1:unhandledOperation",
        'Unhandled operation:  "%s"'),
    "putVaraForeign": (
        "TESSEL:netcdf:putVara:unhandledOperation",
        'Unhandled operation:  "%s"'),
    "putVarsForeign": (
        "TESSEL:netcdf:putVars:unhandledOperation",
        'Unhandled operation:  "%s"'),
    "getVar1IndexLength": (
        "TESSEL:netcdf:getVar1:indexVectorLengthMismatch",
        "The length of the start index does not match up with the number of variable dimensions."),
    "getVaraStartLength": (
        "TESSEL:netcdf:getVara:startVectorLengthMismatch",
        "The length of the start index does not match up with the number of variable dimensions."),
    "getVaraCountLength": (
        "TESSEL:netcdf:getVara:countVectorLengthMismatch",
        "The length of the count index does not match up with the number of variable dimensions."),
    "getVarsStartLength": (
        "TESSEL:netcdf:getVars:startVectorLengthMismatch",
        "The length of the start index does not match up with the number of variable dimensions."),
    "getVarsCountLength": (
        "TESSEL:netcdf:getVars:countVectorLengthMismatch",
        "The length of the count index does not match up with the number of variable dimensions."),
    "getVarsStrideLength": (
        "TESSEL:netcdf:getVars:strideVectorLengthMismatch",
        "The length of the count index does not match up with the number of variable dimensions."),
    "putVar1StartLength": (
        "TESSEL:netcdf:putVar1:badStartLength",
        "The length of the start argument for %s must be %d instead of %u."),
    "putVaraStartLength": (
        "TESSEL:netcdf:putVara:badStartLength",
        "The length of the start argument for %s must be %d instead of %u."),
    "putVaraCountLength": (
        "TESSEL:netcdf:putVara:badCountLength",
        "The length of the count argument for %s must be %d instead of %u."),
    "putVarsStartLength": (
        "TESSEL:netcdf:putVars:badStartLength",
        "The length of the start argument for %s must be %d instead of %u."),
    "putVarsCountLength": (
        "TESSEL:netcdf:putVars:badCountLength",
        "The length of the count argument for %s must be %d instead of %u."),
    "putVarsStrideLength": (
        "TESSEL:netcdf:putVars:badStrideLength",
        "The length of the stride argument for %s must be %d instead of %u."),
    "emptyVariableData": (
        "TESSEL:netcdf:emptyVariableData",
        "Variable data must not be empty."),
    "putVarDataSize": (
        "TESSEL:netcdf:putVar:dataSizeMismatch",
        "The number of input elements does not match the variable size."),
    "putVar1DataSize": (
        "TESSEL:netcdf:putVar1:dataSizeMismatch",
        "Specifying a single index argument implies that only one data element be provided."),
    "putVaraDataSize": (
        "TESSEL:netcdf:putVara:dataSizeMismatch",
        "The number of elements implied by the count argument (%u) does not equal the "
        "number of data elements (%u)."),
    "putVarsDataSize": (
        "TESSEL:netcdf:putVars:dataSizeMismatch",
        "The number of elements implied by the count argument (%u) does not equal the "
        "number of data elements (%u)."),
    "unhandledFuncstr": (
        "TESSEL:netcdf:validate_write_op_datatype:unhandledFuncstr",
        'Unhandled operation:  "%s"'),
    "tooFewArguments": (
        "TESSEL:netcdf:tooFewArguments",
        "Must provide at least one input argument."),
    "firstArgNotChar": (
        "TESSEL:netcdf:firstArgNotChar",
        "First argument must be a function string."),
    "invalidOperation": (
        "TESSEL:netcdf:InvalidOperation",
        'Unrecognized operation:  "%s"'),
    "unrecognizedCharParameter": (
        "TESSEL:netcdf:unrecognizedCharParameter",
        'Unrecognized operation:  "%s"'),
    "emptySetID": (
        "TESSEL:netcdf:emptySetID",
        "%s argument cannot be []"),
    "argumentWasNotChar": (
        "TESSEL:netcdf:argumentWasNotChar",
        "%s name argument must be character"),
    "emptySetSizeParameter": (
        "TESSEL:netcdf:emptySetSizeParameter",
        "%s argument cannot be []"),
    "badSizeArgumentDatatype": (
        "TESSEL:netcdf:badSizeArgumentDatatype",
        "%s argument must be either double precision or an unsigned integer datatype"),
    "sizeArgumentIsInfOrNaN": (
        "TESSEL:netcdf:sizeArgumentIsInfOrNaN",
        "%s argument must not be Inf or NaN"),
    "unhandledNumericType": (
        "TESSEL:netcdf:unpackGenericSizeParameter:unhandledNumericType",
        "type of %s argument was not handled"),
    "negativeSize": (
        "TESSEL:netcdf:negativeSize",
        "%s argument must be positive"),
    "emptySingleton": (
        "TESSEL:netcdf:unpackIntSingleton:argumentIsEmptySet",
        "%s argument cannot be []"),
    "badIDDatatype": (
        "TESSEL:netcdf:badIDDatatype",
        "%s argument must be either double precision or int32, not %s"),
    "nameExtractionFailure": (
        "TESSEL:netcdf:tsArrayToStringFailureForUnpackingName",
        "tsArrayToString failed to extract the character parameter."),
    "emptySetMode": (
        "TESSEL:netcdf:emptySetMode",
        "mode argument cannot be []"),
    "modeExtractionFailure": (
        "TESSEL:netcdf:tsArrayToStringFailureForMode",
        "tsArrayToString failed to extract the mode"),
    "badModeDatatype": (
        "TESSEL:netcdf:badModeDatatype",
        "mode argument must be either double precision, int32, or character"),
    "emptySetDatatype": (
        "TESSEL:netcdf:unpack_xtype:emptySetDatatype",
        "datatype argument cannot be []"),
    "badDatatype": (
        "TESSEL:netcdf:unpack_xtype:badDatatype",
        "datatype argument must be double precision"),
    "badSingletonType": (
        "TESSEL:netcdf:unpackIntSingleton:badNumericType",
        "argument must be either double precision or int32"),
    "badDimidsType": (
        "TESSEL:netcdf:unpackDimids:badDimidsType",
        "Dimids argument must be double precision."),
    "numberOfDimensionsOutOfBounds": (
        "TESSEL:netcdf:unpackDimids:numberOfDimensionsOutOfBounds",
        "The number of dimensions is out of bounds."),
    "unrecognizedFileMode": (
        "TESSEL:netcdf:unrecognizedFileMode",
        'Unknown parameter "%s".'),
    "invalidNetcdfDatatype": (
        "TESSEL:netcdf:invalidNetcdfDatatype",
        "The datatype argument %f is out of range."),
    "tooManyDimensions": (
        "TESSEL:netcdf:ndimsLargerThanNetcdfLimits",
        "Cannot specify more than %d dimensions."),
    "sizeNotRepresentable": (
        "TESSEL:netcdf:packUpSizetScalar",
        "Unable to create double scalar out of %u."),
    "ndimsOutOfRange": (
        "TESSEL:netcdf:defVar",
        "The number of dimensions is out of range for %s."),
    "indexArgumentHasInf": (
        "TESSEL:netcdf:indexArgumentHasInf",
        "Index parameter cannot contain Inf."),
    "indexArgumentHasNaN": (
        "TESSEL:netcdf:indexArgumentHasNaN",
        "Index parameter cannot contain NaN."),
    "argumentIsEmpty": (
        "TESSEL:netcdf:{label}ArgumentIsEmpty",
        "%s argument cannot be empty."),
    "argumentHasBadDatatype": (
        "TESSEL:netcdf:{label}ArgumentHasBadDatatype",
        "%s argument must consist of discrete values between 0 and 2^31-1."),
    "readBufferFailure": (
        "TESSEL:netcdf:{short}:memoryAllocationFailure",
        "Failed to allocate memory for %s read operation."),
    "writeBufferFailure": (
        "TESSEL:netcdf:{short}:memoryAllocationFailure",
        "Failed to allocate memory for %s write operation."),
    "badWriteDatatype": (
        "TESSEL:netcdf:{short}:badDatatype",
        "The input datatype for %s must be %s, not %s."),
}
"""Identifier and message; after a ":" at the end comes the word of a status."""

STATUSES: dict[int, str] = {
    -1: "v2ApiError",
    -33: "notNetcdfID",
    -34: "tooManyNetcdfFilesOpen",
    -35: "netcdfFileExistsAndNoClobber",
    -36: "invalidArgument",
    -37: "writeToReadOnly",
    -38: "operationNotAllowedInDataMode",
    -39: "operationNotAllowedInDefineMode",
    -40: "indexExceedsDimensionBound",
    -41: "libraryMaxDimsExceeded",
    -42: "nameIsAlreadyInUse",
    -43: "attributeNotFound",
    -44: "maximumNumberOfAttributesExceeded",
    -45: "invalidDataType",
    -46: "invalidDimensionIdOrName",
    -47: "unlimitedDimensionInTheWrongIndex",
    -48: "maximumNumberOfVariablesExceeded",
    -49: "variableNotFound",
    -50: "actionProhibitedOnGlobalVarid",
    -51: "notANetcdfFile",
    -52: "inFortranStringTooShort",
    -53: "maximumNameLengthExceeded",
    -54: "onlyOneUnlimitedDimensionAllowed",
    -55: "recordOperationWithoutRecordVars",
    -56: "attemptToConvertBetweenTextAndNumbers",
    -57: "startPlusCountExceedsDimensionBound",
    -58: "illegalStride",
    -59: "nameContainsIllegalCharacters",
    -60: "mathResultNotRepresentable",
    -61: "memoryAllocationFailure",
    -62: "formatSizeConstraintsViolated",
    -63: "invalidDimensionSize",
    -64: "corruptedFile",
    1: "operationNotPermitted",
    2: "noSuchFileOrDirectory",
    3: "noSuchProcess",
    4: "interruptedSystemCall",
    5: "IOError",
    6: "noSuchDeviceOrAddress",
    7: "argumentListTooLong",
    8: "execFormatError",
    9: "badFileNumber",
    10: "noChildProcess",
    12: "outOfMemory",
    13: "permissionDenied",
    14: "badAddress",
    16: "deviceOrResourceBusy",
    17: "fileExists",
    18: "crossDeviceLink",
    19: "noSuchDevice",
    20: "notADirectory",
    21: "isDirectory",
    22: "invalidArgument",
    23: "fileTableOverflow",
    24: "tooManyOpenFiles",
    25: "notATypewriter",
    27: "fileTooLarge",
    28: "noSpaceLeftOnDevice",
    29: "illegalSeek",
    30: "readOnlyFileSystem",
    31: "tooManyLinks",
    32: "brokenPipe",
    33: "mathArgumentOutOfDomainOfFunc",
    34: "mathResultNotRepresentable",
    35: "tryAgain",
}
"""The words by status; every other status is "unknownErrorStatus"."""

RAISES: dict[str, tuple[str, ...]] = {
    "abort": (
        "abort", "abort.failure", "emptySetID", "badIDDatatype",
    ),
    "close": (
        "close", "close.failure", "emptySetID", "badIDDatatype",
    ),
    "copy_att": (
        "copyAtt", "copyAtt.failure", "emptySetID", "argumentWasNotChar", "badIDDatatype",
        "nameExtractionFailure",
    ),
    "_create": (
        "createTuned", "createTuned.failure", "argumentWasNotChar", "emptySetSizeParameter",
        "badSizeArgumentDatatype", "sizeArgumentIsInfOrNaN", "unhandledNumericType", "negativeSize",
        "nameExtractionFailure", "emptySetMode", "modeExtractionFailure", "badModeDatatype",
        "unrecognizedFileMode", "sizeNotRepresentable",
    ),
    "create": (
        "create", "create.failure", "argumentWasNotChar", "nameExtractionFailure", "emptySetMode",
        "modeExtractionFailure", "badModeDatatype", "unrecognizedFileMode",
    ),
    "def_dim": (
        "defDim", "defDim.failure", "emptySetID", "argumentWasNotChar", "emptySetSizeParameter",
        "badSizeArgumentDatatype", "sizeArgumentIsInfOrNaN", "unhandledNumericType", "negativeSize",
        "badIDDatatype", "nameExtractionFailure",
    ),
    "def_var": (
        "defVar", "defVar.failure", "emptySetID", "argumentWasNotChar", "badIDDatatype",
        "nameExtractionFailure", "emptySetDatatype", "badDatatype", "badDimidsType",
        "numberOfDimensionsOutOfBounds", "invalidNetcdfDatatype", "tooManyDimensions",
        "ndimsOutOfRange",
    ),
    "del_att": (
        "delAtt", "delAtt.failure", "emptySetID", "argumentWasNotChar", "badIDDatatype",
        "nameExtractionFailure",
    ),
    "_enddef": (
        "enddefTuned", "enddefTuned.failure", "emptySetID", "emptySetSizeParameter",
        "badSizeArgumentDatatype", "sizeArgumentIsInfOrNaN", "unhandledNumericType", "negativeSize",
        "badIDDatatype",
    ),
    "end_def": (
        "enddef", "enddef.failure", "emptySetID", "badIDDatatype",
    ),
    "enddef": (
        "enddef", "enddef.failure", "emptySetID", "badIDDatatype",
    ),
    "get_att": (
        "getAtt", "getAtt.failure", "getAttInquiry.failure", "getAttForeign", "emptySetID",
        "argumentWasNotChar", "badIDDatatype", "nameExtractionFailure",
    ),
    "get_att_text": (
        "getAtt", "getAtt.failure", "getAttInquiry.failure", "getAttForeign", "emptySetID",
        "argumentWasNotChar", "badIDDatatype", "nameExtractionFailure", "readBufferFailure",
    ),
    "get_constant_names": (),
    "get_var": (
        "getVar", "getVar.failure", "getVarNumDims.failure", "getVarDimids.failure",
        "getVarDimLen.failure", "getVarForeign", "emptySetID", "badIDDatatype",
    ),
    "get_var_text": (
        "getVar", "getVar.failure", "getVarNumDims.failure", "getVarDimids.failure",
        "getVarDimLen.failure", "getVarForeign", "emptySetID", "badIDDatatype", "readBufferFailure",
    ),
    "get_var1": (
        "getVar1", "getVar1.failure", "getVar1NumDims.failure", "getVar1Foreign",
        "getVar1IndexLength", "emptySetID", "badIDDatatype", "indexArgumentHasInf",
        "indexArgumentHasNaN", "argumentIsEmpty", "argumentHasBadDatatype",
    ),
    "get_var1_text": (
        "getVar1", "getVar1.failure", "getVar1NumDims.failure", "getVar1Foreign",
        "getVar1IndexLength", "emptySetID", "badIDDatatype", "indexArgumentHasInf",
        "indexArgumentHasNaN", "argumentIsEmpty", "argumentHasBadDatatype", "readBufferFailure",
    ),
    "get_vara": (
        "getVara", "getVara.failure", "getVaraNumDims.failure", "getVaraForeign",
        "getVaraStartLength", "getVaraCountLength", "emptySetID", "badIDDatatype",
        "indexArgumentHasInf", "indexArgumentHasNaN", "argumentIsEmpty", "argumentHasBadDatatype",
    ),
    "get_vara_text": (
        "getVara", "getVara.failure", "getVaraNumDims.failure", "getVaraForeign",
        "getVaraStartLength", "getVaraCountLength", "emptySetID", "badIDDatatype",
        "indexArgumentHasInf", "indexArgumentHasNaN", "argumentIsEmpty", "argumentHasBadDatatype",
        "readBufferFailure",
    ),
    "get_vars": (
        "getVars", "getVars.failure", "getVarsNumDims", "getVarsDimids", "getVarsForeign",
        "getVarsStartLength", "getVarsCountLength", "getVarsStrideLength", "emptySetID",
        "badIDDatatype", "indexArgumentHasInf", "indexArgumentHasNaN", "argumentIsEmpty",
        "argumentHasBadDatatype",
    ),
    "get_vars_text": (
        "getVars", "getVars.failure", "getVarsNumDims", "getVarsDimids", "getVarsForeign",
        "getVarsStartLength", "getVarsCountLength", "getVarsStrideLength", "emptySetID",
        "badIDDatatype", "indexArgumentHasInf", "indexArgumentHasNaN", "argumentIsEmpty",
        "argumentHasBadDatatype", "readBufferFailure",
    ),
    "inq": (
        "inq", "inq.failure", "emptySetID", "badIDDatatype",
    ),
    "inq_att": (
        "inqAtt", "inqAtt.failure", "emptySetID", "argumentWasNotChar", "badIDDatatype",
        "nameExtractionFailure", "sizeNotRepresentable",
    ),
    "inq_attid": (
        "inqAttid", "inqAttid.failure", "emptySetID", "argumentWasNotChar", "badIDDatatype",
        "nameExtractionFailure",
    ),
    "inq_attname": (
        "inqAttname", "inqAttname.failure", "emptySetID", "badIDDatatype",
    ),
    "inq_dim": (
        "inqDim", "inqDim.failure", "emptySetID", "badIDDatatype", "sizeNotRepresentable",
    ),
    "inq_dimid": (
        "inqDimid", "inqDimid.failure", "emptySetID", "argumentWasNotChar", "badIDDatatype",
        "nameExtractionFailure",
    ),
    "inq_libvers": (
        "inqLibvers",
    ),
    "inq_varid": (
        "inqVarid", "inqVarid.failure", "emptySetID", "argumentWasNotChar", "badIDDatatype",
        "nameExtractionFailure",
    ),
    "inq_var": (
        "inqVar", "inqVar.failure", "emptySetID", "badIDDatatype",
    ),
    "param": (
        "parameter", "unrecognizedCharParameter", "argumentWasNotChar", "nameExtractionFailure",
    ),
    "_open": (
        "openTuned", "openTuned.failure", "argumentWasNotChar", "emptySetSizeParameter",
        "badSizeArgumentDatatype", "sizeArgumentIsInfOrNaN", "unhandledNumericType", "negativeSize",
        "nameExtractionFailure", "emptySetMode", "modeExtractionFailure", "badModeDatatype",
        "unrecognizedFileMode", "sizeNotRepresentable",
    ),
    "open": (
        "open", "open.failure", "argumentWasNotChar", "nameExtractionFailure", "emptySetMode",
        "modeExtractionFailure", "badModeDatatype", "unrecognizedFileMode",
    ),
    "put_att": (
        "putAtt", "putAtt.failure", "putAttForeign", "emptyVariableData", "unhandledFuncstr",
        "emptySetID", "argumentWasNotChar", "badIDDatatype", "nameExtractionFailure",
        "emptySetDatatype", "badDatatype", "invalidNetcdfDatatype", "badWriteDatatype",
    ),
    "put_att_text": (
        "putAttText", "putAttText.failure", "emptyVariableData", "unhandledFuncstr", "emptySetID",
        "argumentWasNotChar", "badIDDatatype", "nameExtractionFailure", "writeBufferFailure",
        "badWriteDatatype",
    ),
    "put_var": (
        "putVar", "putVar.failure", "putVarInquiry.failure", "putVarDimLen.failure",
        "putVarForeign", "emptyVariableData", "putVarDataSize", "unhandledFuncstr", "emptySetID",
        "badIDDatatype", "badWriteDatatype",
    ),
    "put_var_text": (
        "putVar", "putVar.failure", "putVarInquiry.failure", "putVarDimLen.failure",
        "putVarForeign", "emptyVariableData", "putVarDataSize", "unhandledFuncstr", "emptySetID",
        "badIDDatatype", "writeBufferFailure", "badWriteDatatype",
    ),
    "put_vara": (
        "putVara", "putVara.failure", "putVaraInquiry", "putVaraForeign", "putVaraStartLength",
        "putVaraCountLength", "emptyVariableData", "putVaraDataSize", "unhandledFuncstr",
        "emptySetID", "badIDDatatype", "indexArgumentHasInf", "indexArgumentHasNaN",
        "argumentIsEmpty", "argumentHasBadDatatype", "badWriteDatatype",
    ),
    "put_vara_text": (
        "putVara", "putVara.failure", "putVaraInquiry", "putVaraForeign", "putVaraStartLength",
        "putVaraCountLength", "emptyVariableData", "putVaraDataSize", "unhandledFuncstr",
        "emptySetID", "badIDDatatype", "indexArgumentHasInf", "indexArgumentHasNaN",
        "argumentIsEmpty", "argumentHasBadDatatype", "writeBufferFailure", "badWriteDatatype",
    ),
    "put_vars": (
        "putVars", "putVars.failure", "putVarsInquiry", "putVarsForeign", "putVarsStartLength",
        "putVarsCountLength", "putVarsStrideLength", "emptyVariableData", "putVarsDataSize",
        "unhandledFuncstr", "emptySetID", "badIDDatatype", "indexArgumentHasInf",
        "indexArgumentHasNaN", "argumentIsEmpty", "argumentHasBadDatatype", "badWriteDatatype",
    ),
    "put_vars_text": (
        "putVars", "putVars.failure", "putVarsInquiry", "putVarsForeign", "putVarsStartLength",
        "putVarsCountLength", "putVarsStrideLength", "emptyVariableData", "putVarsDataSize",
        "unhandledFuncstr", "emptySetID", "badIDDatatype", "indexArgumentHasInf",
        "indexArgumentHasNaN", "argumentIsEmpty", "argumentHasBadDatatype", "writeBufferFailure",
        "badWriteDatatype",
    ),
    "put_var1": (
        "putVar1", "putVar1.failure", "putVar1Inquiry", "putVar1Foreign", "putVar1StartLength",
        "emptyVariableData", "putVar1DataSize", "unhandledFuncstr", "emptySetID", "badIDDatatype",
        "indexArgumentHasInf", "indexArgumentHasNaN", "argumentIsEmpty", "argumentHasBadDatatype",
        "badWriteDatatype",
    ),
    "put_var1_text": (
        "putVar1", "putVar1.failure", "putVar1Inquiry", "putVar1Foreign", "putVar1StartLength",
        "emptyVariableData", "putVar1DataSize", "unhandledFuncstr", "emptySetID", "badIDDatatype",
        "indexArgumentHasInf", "indexArgumentHasNaN", "argumentIsEmpty", "argumentHasBadDatatype",
        "writeBufferFailure", "badWriteDatatype",
    ),
    "redef": (
        "redef", "redef.failure", "emptySetID", "badIDDatatype",
    ),
    "rename_att": (
        "renameAtt", "renameAtt.failure", "emptySetID", "argumentWasNotChar", "badIDDatatype",
        "nameExtractionFailure",
    ),
    "rename_dim": (
        "renameDim", "renameDim.failure", "emptySetID", "argumentWasNotChar", "badIDDatatype",
        "nameExtractionFailure",
    ),
    "rename_var": (
        "renameVar", "renameVar.failure", "emptySetID", "argumentWasNotChar", "badIDDatatype",
        "nameExtractionFailure",
    ),
    "set_default_format": (
        "setDefaultFormat", "setDefaultFormat.failure", "emptySingleton", "badSingletonType",
    ),
    "set_fill": (
        "setFill", "setFill.failure", "emptySetID", "emptySingleton", "badIDDatatype",
        "badSingletonType",
    ),
    "strerror": (
        "strerror", "emptySingleton", "badSingletonType",
    ),
    "sync": (
        "sync", "sync.failure", "emptySetID", "badIDDatatype",
    ),
}
"""The rows of an operation, or of the numeric members of a family."""

HOST: dict[str, str] = {
    "TESSEL:host:outOfMemory":
        "Out of memory.",
    "TESSEL:host:dimensionsTooLarge":
        "The dimensions of the array are too large.",
    "TESSEL:host:badDimensions":
        "An array needs at least one dimension.",
    "TESSEL:host:badClass":
        "The class of the array is not one that this works with.",
    "TESSEL:host:badIndex":
        "The index is beyond the end of the array.",
    "TESSEL:host:badOwner":
        "The array is not the call's own: it is an input, or has been given away before.",
    "TESSEL:host:noCall":
        "The function is for a module that is being called.",
    "TESSEL:host:nestedCall":
        "A module cannot be called from within a call.",
    "TESSEL:host:badOutputCount":
        "A call has 0 to 8 outputs.",
    "TESSEL:host:tooManyInputs":
        "The call has too many inputs.",
    "TESSEL:host:missingInput":
        "An input of the call is not there.",
    "TESSEL:host:foreignException":
        "An exception that is not the host's left the module",
    "TESSEL:host:violation":
        "The module broke a promise",
    "TESSEL:host:moduleNotFound":
        "there is no such file; looked for a shared object that exports tsxFunction",
    "TESSEL:host:notAModule":
        "it is not a shared object that can be loaded; looked for one that exports tsxFunction",
    "TESSEL:host:noEntryPoint":
        "it does not export the entry point tsxFunction",
}
"""The host's errors, each with the beginning of its message."""

GUARD: dict[str, str] = {
    "TESSEL:guard:alignment":
        "The call was not made: <particulars>, and the library divides by the alignment "
        "of the data and of the records and multiplies by it again, so that it must be "
        "at least 1 and below 2^63 (4 is the usual one).",
    "TESSEL:guard:mode":
        "The call was not made: <particulars>, and the library follows an invalid "
        "pointer when it is given this mode flag without what belongs to it.",
    "TESSEL:guard:mapping":
        "The call was not made: <particulars>, and the library does not look whether "
        "what it maps is there: what is not ends the process, or is lost when it is written.",
    "TESSEL:guard:closed":
        "The call was not made: <particulars>, and an earlier closing of the dataset "
        "failed, and the library may have freed its memory but not its id.",
    "TESSEL:guard:name":
        "The call was not made: <particulars>, and the library stores a name as it is "
        "composed, and copies it over the end of buffers of the size that its "
        "documentation gives.",
    "TESSEL:guard:redefinition":
        "The call was not made: <particulars>, and the library counts records with 31 "
        "bits when it moves them: of more it moves none, and does not say so.",
    "TESSEL:guard:lengths":
        "The call was not made: <particulars>, and the library would take the length for "
        "a negative number, divide by zero, or lay variables over one another.",
    "TESSEL:guard:counts":
        "The call was not made: <particulars>, and the library would write what is "
        "beyond the data, or for ever.",
    "TESSEL:guard:records":
        "The call was not made: <particulars>, and every record before it would be "
        "filled first; with set_fill(ncid, NC_NOFILL) they are left as they are.",
    "TESSEL:guard:position":
        "The call was not made: <particulars>, and the library would take the position "
        "for a negative number, and read or write memory in its stead.",
    "TESSEL:guard:header":
        "The call was not made: <particulars>, and the library would trust the header.",
    "TESSEL:guard:remote":
        "The call was not made: <particulars>, and the library would fetch it; addresses "
        "are to be allowed first.",
}
"""What the guard refuses."""

CALLED: dict[str, str] = {
    "TESSEL:python:namedArgument":
        "In this form, operations take their arguments by position, not as <the names>.",
}
"""What Python makes no call of."""

GIVEN: dict[str, str] = {
    "TESSEL:python:integerTooLarge":
        "An integer is beyond 64 bits and no double holds it exactly.",
    "TESSEL:python:characterTooLarge":
        "An element of a character array is beyond the 16 bits of a host character.",
    "TESSEL:python:notRepresentable":
        "An integer in a list of numbers is not exact as a double; use a NumPy array of "
        "a 64-bit integer type.",
    "TESSEL:python:badShape":
        "The lengths of a shape are whole numbers from 0.",
    "TESSEL:python:nestedTooDeeply":
        "A value contains itself or is nested more than <the most> levels deep.",
    "TESSEL:python:unsupportedType":
        'A value of type "<the type>" has no counterpart in the host.',
    "TESSEL:python:maskedArray":
        'A masked array has no counterpart in the host; pass what its method "filled" gives.',
    "TESSEL:python:unsupportedDtype":
        'A NumPy array of dtype "<the dtype>" has no counterpart in the host.',
    "TESSEL:python:badFieldName":
        'A field of a structure is named by a value of type "<the type>" instead of a str.',
    "TESSEL:python:differentFields":
        "The dicts of a structure array have different keys.",
    "TESSEL:python:notText":
        "A name contains half of a surrogate pair.",
}
"""What Python makes no argument of."""

RETURNED: dict[str, str] = {
    "TESSEL:python:tooManyDimensions":
        "A result has <the number> dimensions; a NumPy array can have <the most>.",
    "TESSEL:python:shapeTooLarge":
        "NumPy cannot represent the dimensions of a result.",
    "TESSEL:python:unsupportedResult":
        'A complex result of class "<the class>" has no counterpart in NumPy.',
    "TESSEL:python:nestedTooDeeply":
        "A result is nested more than <the most> levels deep.",
}
"""What Python makes nothing of that a call gives."""

PACKAGE: tuple[str, ...] = (
    "TESSEL:python:badBlockSize",
    "TESSEL:python:badCountLength",
    "TESSEL:python:badDimensions",
    "TESSEL:python:badEncoding",
    "TESSEL:python:badFieldName",
    "TESSEL:python:badFormat",
    "TESSEL:python:badFunctionName",
    "TESSEL:python:badGuard",
    "TESSEL:python:badIndex",
    "TESSEL:python:badMode",
    "TESSEL:python:badModuleName",
    "TESSEL:python:badPath",
    "TESSEL:python:badShape",
    "TESSEL:python:badStartLength",
    "TESSEL:python:characterTooLarge",
    "TESSEL:python:differentFields",
    "TESSEL:python:fileChanged",
    "TESSEL:python:fileExists",
    "TESSEL:python:fileTooShort",
    "TESSEL:python:indexExceedsDimensionBound",
    "TESSEL:python:integerTooLarge",
    "TESSEL:python:maskedArray",
    "TESSEL:python:namedArgument",
    "TESSEL:python:nestedTooDeeply",
    "TESSEL:python:notAClassicFile",
    "TESSEL:python:notARegularFile",
    "TESSEL:python:notExact",
    "TESSEL:python:notOneByte",
    "TESSEL:python:notRepresentable",
    "TESSEL:python:notText",
    "TESSEL:python:nothingToDraw",
    "TESSEL:python:readOnlyArray",
    "TESSEL:python:recordsWithoutVariables",
    "TESSEL:python:sameFile",
    "TESSEL:python:shapeTooLarge",
    "TESSEL:python:tooManyDimensions",
    "TESSEL:python:unknownOperation",
    "TESSEL:python:unsupportedDtype",
    "TESSEL:python:unsupportedResult",
    "TESSEL:python:unsupportedType",
    "TESSEL:python:valueDoesNotFit",
    "TESSEL:python:variableNotFound",
)
"""Every identifier of the Python package."""
