# python/tessel/meanings.py: the words of errors: what each means, and what to do.
"""The table behind the index of errors in the reference.

A word means the same whichever operation raises it, so it is explained once. Words of the module,
of the host, of the guard and of this package are all here; a test compares the table with them.
"""

from __future__ import annotations

_COUNT = ("The operation was given too many arguments or too few.",
          "Give exactly the arguments that its page lists; none has a default.")
_FOREIGN = ("A row of the module's table leads to a family that does not serve it.",
            "Nothing: the table has no such row. If it appears, the module was changed wrongly.")
_INQUIRY = "Look whether the dataset is still open and the variable's id is right."
_NO_DIMENSIONS = ("a variable without dimensions is read by get_var_* and written by put_var_*, "
                  "and by no other family.")
_GUARD_OF_HOST = ("Nothing: a host gives the characters of every text, and raises outOfMemory "
                  "where it cannot. If it appears, the host breaks this promise.")
_LOOK = "Look at the message."


def _length(vector: str) -> tuple[str, str]:
    return (f"The {vector} has not one element for each dimension of the variable.",
            "Ask inq_var for the dimensions, and give as many elements, the fastest dimension "
            f"first; {_NO_DIMENSIONS}")


# The call itself, and what the arguments are.
_ARGUMENTS = {
    "tooFewArguments": (
        "The call has no argument at all, not even the name of an operation.",
        "Give the operation's name first."),
    "firstArgNotChar": (
        "The first argument is not the name of an operation.",
        "Give the operation's name first, as text."),
    "InvalidOperation": (
        "There is no operation of that name.",
        "Look the name up with `tessel ops`; it may be written in any case, with or without nc_."),
    "badInputParameterCount": _COUNT,
    "badInputArgumentCount": _COUNT,
    "badParameterCount": _COUNT,
    "argumentWasNotChar": (
        "A name or a path is not text.",
        "Give it as a row of characters; in Python, as a str."),
    "badIDDatatype": (
        "An id is of another class than double and int32.",
        "Give an id as double or int32; in Python, as any integer."),
    "emptySetID": (
        "An id is an empty array.",
        "Look whether what gave the id found anything."),
    "badModeDatatype": (
        "A mode is of another class than char, double and int32.",
        "Give one of the names on the operation's page, or constants joined bit by bit, as double "
        "or int32."),
    "emptySetMode": (
        "A mode is empty.", "Give one of the names on the operation's page, or a number."),
    "unrecognizedFileMode": (
        "A mode is no name of one.",
        'Use "NOWRITE" or "WRITE" to open and "CLOBBER" or "NOCLOBBER" to create.'),
    "badDatatype": (
        "Data or a type are of another class than the operation works on.",
        "Call the member of the family that fits the data's class, or convert the data; an "
        "external type is a double."),
    "emptySetDatatype": (
        "An external type is an empty array.", "Give the value of a constant such as NC_DOUBLE."),
    "invalidNetcdfDatatype": (
        "A number for an external type is not from 0 to 6.",
        "Give the value of NC_BYTE, NC_CHAR, NC_SHORT, NC_INT, NC_FLOAT or NC_DOUBLE."),
    "badSizeArgumentDatatype": (
        "A size is of no numeric class.", "Give it as a number of any class."),
    "emptySetSizeParameter": ("A size is an empty array.", "Give one number."),
    "sizeArgumentIsInfOrNaN": (
        "A size is infinite or no number.", "Look at the computation that it comes from."),
    "negativeSize": ("A size is negative.", "Give a size from 0 on."),
    "unhandledNumericType": (
        "A size is of a numeric class that the module does not know.",
        "Nothing: the host has no such class. If it appears, host and module are not of one kind."),
    "argumentIsEmptySet": ("A code is an empty array.", "Give one number."),
    "badNumericType": (
        "A code is of another class than double and int32.",
        "Give it as a double: an int32 is no error, but its bytes are read as a double's, so that "
        "a single one counts as 0."),
    "badDimidsType": (
        "A list of dimension ids is not of doubles.",
        "Give the ids as doubles, whatever ids of other kinds may be."),
    "ndimsLargerThanNetcdfLimits": (
        "A variable is to have more than 1024 dimensions.", "Use fewer dimensions."),
    "numberOfDimensionsOutOfBounds": (
        "A list of dimension ids is longer than an int counts.", "Use fewer dimensions."),
    "defVar": (
        "A list of dimension ids is longer than an int counts.", "Use fewer dimensions."),
    "startArgumentIsEmpty": (
        "The position is an empty array.",
        f"Give a position for each dimension; {_NO_DIMENSIONS}"),
    "countArgumentIsEmpty": (
        "The count is an empty array.", f"Give a count for each dimension; {_NO_DIMENSIONS}"),
    "strideArgumentIsEmpty": (
        "The stride is an empty array.",
        f"Give a stride for each dimension, 1 for every element; {_NO_DIMENSIONS}"),
    "startArgumentHasBadDatatype": (
        "The position is no array of numbers.", "Give whole numbers from 0."),
    "countArgumentHasBadDatatype": (
        "The count is no array of numbers.", "Give whole numbers from 0."),
    "strideArgumentHasBadDatatype": (
        "The stride is no array of numbers.", "Give whole numbers from 1."),
    "indexArgumentHasInf": (
        "A position, count or stride has an infinite element.",
        "Give whole numbers; a whole dimension is its length, from inq_dim."),
    "indexArgumentHasNaN": (
        "A position, count or stride has an element that is no number.",
        "Look at the computation that it comes from."),
    "indexVectorLengthMismatch": _length("position"),
    "startVectorLengthMismatch": _length("position"),
    "countVectorLengthMismatch": _length("count"),
    "strideVectorLengthMismatch": _length("stride"),
    "badStartLength": _length("position"),
    "badCountLength": _length("count"),
    "badStrideLength": _length("stride"),
    "emptyVariableData": (
        "There are no data to write.",
        "Write nothing where there is nothing to write; attributes may be empty, variables not."),
    "dataSizeMismatch": (
        "There are more data, or fewer, than are to be written.",
        "Give as many elements as the product of the count; for a whole variable, of its lengths; "
        "with put_var1_*, one."),
    "unrecognizedCharParameter": (
        "There is no constant of that name.",
        "Look the name up with get_constant_names; it may be without NC_, in any case."),
    "unhandledOperation": _FOREIGN,
    "unrecognizedOperation": _FOREIGN,
    "unhandledFuncstr": (
        "A row of the module's table that does not write leads to a function that does.",
        _FOREIGN[1]),
    "inqVarNDimsFailure": (
        "The library could not say what the variable's dimensions are; the message has its text.",
        _INQUIRY),
    "numVarsInquiryFailure": (
        "The library could not say how many dimensions the variable has; the message has its text.",
        _INQUIRY),
    "varDimIDsInquiryFailure": (
        "The library could not say what the variable's dimensions are; the message has its text.",
        "Look whether the file has been changed by another program."),
    "packUpSizetScalar": (
        "A size cannot be given back as a double.",
        "Nothing: every size of 64 bits has a double near it. It is a guard."),
    "tsArrayToStringFailureForUnpackingName": (
        "The host gave no characters for a name or path.",
        _GUARD_OF_HOST),
    "tsArrayToStringFailureForMode": (
        "The host gave no characters for a mode.",
        _GUARD_OF_HOST),
}

# The library's own statuses.
_LIBRARY = {
    "notNetcdfID": (
        "The id belongs to no open dataset.",
        "Look whether the dataset was closed or aborted before, perhaps by another thread."),
    "tooManyNetcdfFilesOpen": (
        "The library has as many datasets open as it can have.",
        "Close datasets that are done with."),
    "netcdfFileExistsAndNoClobber": (
        'The file exists, and the mode "NOCLOBBER" keeps it.',
        'Choose another name, or create with "CLOBBER" to replace the file.'),
    "invalidArgument": (
        "The library takes no such value.",
        "Look at the operation's page for the values that the argument may have."),
    "writeToReadOnly": (
        "The dataset is open for reading only.", 'Open it with "WRITE".'),
    "operationNotAllowedInDataMode": (
        "What is to be done changes the header, and the dataset is in data mode.",
        "Call redef first, and enddef afterwards."),
    "operationNotAllowedInDefineMode": (
        "Data are to be read or written, and the dataset is in define mode.",
        "Call enddef first."),
    "indexExceedsDimensionBound": (
        "A position is beyond the length of its dimension.",
        "Positions begin with 0, and the first is that of the fastest dimension. Only a write may "
        "go beyond the last record."),
    "libraryMaxDimsExceeded": (
        "The dataset has as many dimensions as the library allows.", "Use fewer dimensions."),
    "nameIsAlreadyInUse": (
        "There is a dimension, variable or attribute of that name already.",
        "Choose another name, or use what is there: inq_dimid, inq_varid, inq_att."),
    "attributeNotFound": (
        "There is no attribute of that name or number.",
        "Look at the names with inq_attname; -1 as the variable means the dataset's own."),
    "maximumNumberOfAttributesExceeded": (
        "There are as many attributes as the library allows.", "Use fewer attributes."),
    "invalidDataType": (
        "The external type is none that this format has.",
        "Use NC_BYTE, NC_CHAR, NC_SHORT, NC_INT, NC_FLOAT or NC_DOUBLE."),
    "invalidDimensionIdOrName": (
        "The dataset has no dimension of that id or name.",
        "Look at the dimensions with inq and inq_dim; names differ by case."),
    "unlimitedDimensionInTheWrongIndex": (
        "The unlimited dimension is not the slowest of the variable.",
        "Put it last in the list of dimensions."),
    "maximumNumberOfVariablesExceeded": (
        "The dataset has as many variables as the library allows.", "Use fewer variables."),
    "variableNotFound": (
        "The dataset has no variable of that id or name.",
        "Look at the variables with inq and inq_var; names differ by case."),
    "actionProhibitedOnGlobalVarid": (
        "The id -1, the dataset itself, was given where a variable is meant.",
        "Give a variable's id; only attributes belong to the dataset itself."),
    "notANetcdfFile": (
        "The file is of no format that the library reads.",
        "Look at its first bytes, or at `tessel info`, which says what the file is instead."),
    "inFortranStringTooShort": (
        "A text is longer than the place that it was to go to.",
        "Nothing: the module gives the library the places. It is the library's for others."),
    "maximumNameLengthExceeded": (
        "A name is longer than 256 bytes.", "Use a shorter name."),
    "onlyOneUnlimitedDimensionAllowed": (
        "There is an unlimited dimension already.",
        "Give this one a length; the classic formats have one unlimited dimension."),
    "recordOperationWithoutRecordVars": (
        "Records are to be read or written, and no variable has any.",
        "Define a variable over the unlimited dimension."),
    "attemptToConvertBetweenTextAndNumbers": (
        "Text is asked of numbers, or numbers of text.",
        "Use the member of the family that fits the external type: *_text for NC_CHAR, any other "
        "for the rest."),
    "startPlusCountExceedsDimensionBound": (
        "The block ends beyond the length of a dimension.",
        "Keep start + count within the lengths; with strides, start + (count - 1) * stride."),
    "illegalStride": (
        "A stride is not positive.", "Give strides from 1 on; turn the result around afterwards."),
    "nameContainsIllegalCharacters": (
        "The name is empty, or has characters that names must not have.",
        "Begin with a letter, digit or _, and use no / and no control characters."),
    "mathResultNotRepresentable": (
        "A value does not fit the type that it is converted to; the others were converted.",
        "Use a wider member of the family, or a wider external type, or leave the fill value out."),
    "memoryAllocationFailure": (
        "There is no memory for the values of this call.",
        "Read or write by smaller blocks."),
    "formatSizeConstraintsViolated": (
        "A variable is larger than the dataset's format can hold.",
        "Create with the 64-bit offset format, put the large variable last, or give it records."),
    "invalidDimensionSize": (
        "The length of a dimension is more than the format can hold.",
        "Create with the 64-bit offset format, or split the dimension."),
    "corruptedFile": (
        "The header says what cannot be, or the file ends too early.",
        "Get the file again; `tessel check` says how many bytes it should have."),
    "v2ApiError": (
        "A function of the library's oldest interface failed.",
        "Look at the message; the module itself calls none of these functions."),
    "unknownErrorStatus": (
        "The library gave a status that has no word here; as a rule, one of its HDF5 layer.",
        "Look at the message, which has the library's text."),
}

# The system's statuses. None of them is the module's doing.
_SYSTEM = {
    "operationNotPermitted": (
        "The system does not permit it.", "Look at the file's owner and mode."),
    "noSuchFileOrDirectory": (
        "There is no such file, or no such folder to create it in.",
        "Look at the path; a relative one begins in the current folder."),
    "noSuchProcess": ("The system knows no such process.", _LOOK),
    "interruptedSystemCall": ("A signal came in between.", "Call again."),
    "IOError": (
        "The device failed to read or write.", "Look at the disk, and at the system's log."),
    "noSuchDeviceOrAddress": (
        "There is no such device, or nobody at its other end.", "Look at the path."),
    "argumentListTooLong": ("A list for the system is too long.", _LOOK),
    "execFormatError": ("A file is no program.", _LOOK),
    "badFileNumber": (
        "The file beneath the dataset was closed by somebody else.",
        "Look for code that closes file descriptors that are not its own."),
    "noChildProcess": ("There is no such child process.", _LOOK),
    "outOfMemory": ("There is no memory left.", "Read or write by smaller blocks."),
    "permissionDenied": (
        "The file's or the folder's mode does not allow it.", "Look at `ls -l` of both."),
    "badAddress": ("The system was given an address that is none.", _LOOK),
    "deviceOrResourceBusy": ("Somebody else is using it.", "Try again later."),
    "fileExists": ("The file exists already.", "Choose another name, or allow replacing it."),
    "crossDeviceLink": ("Two paths are on different file systems.", _LOOK),
    "noSuchDevice": ("There is no such device.", "Look at the path."),
    "notADirectory": ("A part of the path is a file and no folder.", "Look at the path."),
    "isDirectory": ("The path is that of a folder.", "Give the path of a file."),
    "fileTableOverflow": ("The whole system has too many files open.", "Try again later."),
    "tooManyOpenFiles": (
        "This process has as many files open as it may have.",
        "Close datasets, or raise the limit (`ulimit -n`)."),
    "notATypewriter": ("A file is no terminal.", _LOOK),
    "fileTooLarge": (
        "The file would be larger than the file system or a limit allows.",
        "Look at `ulimit -f` and at the file system."),
    "noSpaceLeftOnDevice": ("The disk is full.", "Make room, and write again."),
    "illegalSeek": ("The file has no positions, as pipes have none.", "Copy it to a plain file."),
    "readOnlyFileSystem": ("The file system can only be read.", "Choose another place."),
    "tooManyLinks": ("A file has too many names.", _LOOK),
    "brokenPipe": ("Nobody reads the pipe any more.", "Look at the program at its other end."),
    "mathArgumentOutOfDomainOfFunc": (
        "A function was given a value that it has no result for.", "Look at the values."),
    "tryAgain": ("The resource is not there just now.", "Call again."),
}

# The host, TESSEL:host:*.
_HOST = {
    "moduleNotFound": (
        "No folder that is searched has the module.",
        "Look at the folders in the message; set TESSEL_MODULE_PATH to add one."),
    "notAModule": (
        "The file cannot be loaded.", "Look at the loader's text in the message."),
    "noEntryPoint": (
        "The file is a library, and has no function tsxFunction.",
        "Load a module; a module of your own exports that function."),
    "badClass": (
        "An array is of another class than is asked of it.", "Look at its class first."),
    "badDimensions": (
        "The dimensions given are none that an array, or data, can have.",
        "Look at the message, which says what is wrong with them."),
    "badIndex": ("A position is beyond the end.", "Positions begin with 0."),
    "badOutputCount": (
        "More outputs are asked for than a call can have, or fewer than none.",
        "Ask for 0 to 8."),
    "badOwner": (
        "Memory was handed over that is not the call's own.",
        "In a module: free and hand over only what this call has allocated."),
    "dimensionsTooLarge": (
        "An array would have more bytes than 64 bits count.", "Use smaller blocks."),
    "foreignException": (
        "An exception of another type left the module.",
        "Look at its text in the message; as a rule, memory was short."),
    "missingInput": ("An input of a call is a null pointer.", "Give every input an array."),
    "nestedCall": (
        "A module was called from within a call.",
        "Return first: calls into modules do not overlap."),
    "noCall": (
        "A function of the host for modules was used outside of a call.",
        "In a module: use the host's functions only while tsxFunction runs."),
    "tooManyInputs": ("A call has more inputs than an int counts.", "Give fewer."),
    "violation": (
        "In checked mode: the module broke a promise; the message says which.",
        "Mend the module."),
}

# The guard, TESSEL:guard:*.
_GUARD = {
    "alignment": (
        "_enddef has an alignment of 0, by which the library divides, or of 2^63 or more.",
        "Give an alignment of at least 1 and below 2^63; 4 is the usual one."),
    "mode": (
        "The mode has a flag that makes the library follow an invalid pointer.",
        "Leave the flags for files in memory and for user-defined formats out."),
    "mapping": (
        "In mapped memory (flag 16), the file would be written, which may lose it, be mapped where "
        "it does not reach, or need more memory than there is.",
        "Leave the flag 16 out."),
    "closed": (
        "An earlier closing of the dataset failed; the library may have freed it, but not its id.",
        "Do not use the id again; open the file anew."),
    "name": (
        "The name may become longer than the library's limit when its letters are composed.",
        "Shorten the name, or give it composed (Unicode's form NFC)."),
    "lengths": (
        "A dimension of the variable is longer than the library counts.",
        "Look at where the length comes from: a file has room for fewer elements."),
    "redefinition": (
        "The dataset has 2^31 records or more, which the library loses when they have to move.",
        "Copy the data to a new file that is defined as it is to be."),
    "counts": (
        "The counts multiply to more than 64 bits hold.", "Look at where the counts come from."),
    "records": (
        "The write would first fill a great many records before it.",
        "Look at the position; if it is meant, switch filling off with set_fill."),
    "position": (
        "What is to be written, or a variable that is defined, would end behind 2^63 bytes.",
        "Look at where the position, or the lengths of the dimensions, come from."),
    "header": (
        "The file's header claims what the file cannot hold, or does not.",
        "Get the file again; do not open such files in programs without the guard."),
    "remote": (
        "The file name is an address, which the library would fetch.",
        'Load the module with guard="remote" if addresses are to be allowed.'),
}

# This package, TESSEL:python:*.
_PYTHON = {
    "badBlockSize": ("A block has less than one byte.", "Give a positive number of bytes."),
    "badEncoding": (
        "An encoding has a key that these formats know nothing of.",
        "Look at the message; leave the key out."),
    "badFieldName": ("A field of a structure is not named by a str.", "Use str for the keys."),
    "badFormat": (
        "There is no such format of files or pictures.", "Use one of those in the message."),
    "badFunctionName": ("The name of a function is no str.", "Give a str."),
    "badGuard": ("There is no such guard.", 'Use "on", "remote" or "off".'),
    "badMode": ("There is no such mode for writing.", "Use one of those in the message."),
    "badModuleName": (
        "A module is named by nothing that can be a name or a path.",
        "Give a name such as netcdf, or a pathlib.Path for a file."),
    "badPath": (
        "A path has a NUL, or bytes that are no UTF-8, or a new file's is empty or an address.",
        "Rename the file, or link to it."),
    "badShape": (
        "A shape does not fit what it is for.", "Look at the message, which has both shapes."),
    "characterTooLarge": (
        "A character does not fit the 16 bits of the host's.",
        "Use characters up to U+FFFF in arrays of characters."),
    "differentFields": (
        "The dicts of a structure array have different keys.", "Give all the same keys."),
    "fileChanged": (
        "The file is not the one that the array was made from any more.", "Open it anew."),
    "fileTooShort": (
        "The file is shorter than what its header describes: it was cut off, or nobody has put the "
        "number of records into its header.",
        "Get the file again, from a writer that has closed it; check=False reads what there is."),
    "integerTooLarge": (
        "An integer is beyond 64 bits and no double holds it.", "Use a smaller one."),
    "maskedArray": (
        "A masked array has no counterpart in the host.", "Pass what its method filled gives."),
    "namedArgument": (
        "The call form was given an argument by name.",
        "Use the operation's method, or give the arguments by position."),
    "nestedTooDeeply": (
        "A value contains itself, or is nested too deeply.", "Use a flatter value."),
    "notAClassicFile": (
        "The file is of no classic format.",
        "Convert it, for example with `nccopy -k classic`."),
    "notARegularFile": ("The target is no regular file.", "Give the path of a file."),
    "notExact": (
        "A number would lose digits in the class that it is for.",
        "Pass a NumPy array of that dtype to have it rounded on purpose."),
    "notOneByte": (
        "A character is none that a variable holds as one byte and gives back.",
        "Give bytes; which ones, only you know: text.encode(\"latin-1\"), or another encoding."),
    "notRepresentable": (
        "An integer in a list is not exact as a double.", "Use a NumPy array of 64-bit integers."),
    "notText": ("Text has half of a surrogate pair.", "Look at how the text was decoded."),
    "nothingToDraw": (
        "The variable has nothing that a picture could show.",
        "Look at the reason in the message."),
    "readOnlyArray": (
        "The array to read into cannot be written.", "Give a writable array."),
    "recordsWithoutVariables": (
        "The file has records, and no variable uses them, so a copy could not have them.",
        "Copy it as a file."),
    "sameFile": ("The target is the same file as the source.", "Choose another target."),
    "shapeTooLarge": ("NumPy has no arrays of that shape.", "Read a smaller block."),
    "tooManyDimensions": (
        "NumPy has no arrays of so many dimensions.", "Read by blocks of fewer dimensions."),
    "unknownOperation": (
        "There is no operation of that name.", "Look it up with `tessel ops`."),
    "unsupportedDtype": (
        "An array is of a dtype that has no counterpart.",
        "Convert it with astype to one that the message or the page names."),
    "unsupportedResult": (
        "A result is of a class that has no counterpart in NumPy.",
        "Use the C++ interface for that operation."),
    "unsupportedType": (
        "A value is of a type that has no counterpart.",
        "Give numbers, text, lists, tuples or NumPy arrays."),
    "valueDoesNotFit": (
        "A value does not fit the type that it is to be stored as.",
        "Choose a wider dtype in the encoding."),
}

GROUPS: dict[str, dict[str, tuple[str, str]]] = {
    "The call and its arguments": _ARGUMENTS,
    "What the netCDF library refuses": _LIBRARY,
    "What the system refuses": _SYSTEM,
    "The host": _HOST,
    "The guard": _GUARD,
    "The Python package": _PYTHON,
}
"""What each word means, and what to do about it, by who raises it first."""

MEANINGS: dict[str, tuple[str, str]] = {
    word: each for group in GROUPS.values() for word, each in group.items()}
"""The same in one."""
