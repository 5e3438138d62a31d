# python/tessel/errors.py: the error that a call raises, and which of Python's own it also is.
"""What a module, the host or this package refuses, as exceptions.

Every error is a `tessel.Error`. Where Python has a built-in exception for what happened, the error
is an instance of that as well, so that both of these handlers see a missing file:

    >>> import tessel
    >>> nc = tessel.load("netcdf")
    >>> try:
    ...     nc.open("missing.nc", "NOWRITE")
    ... except FileNotFoundError as error:
    ...     print(error.identifier)
    TESSEL:netcdf:open:noSuchFileOrDirectory
    >>> try:
    ...     nc.open("missing.nc", "NOWRITE")
    ... except tessel.Error as error:
    ...     print(error.word, error.operation, error.filename)
    noSuchFileOrDirectory open missing.nc

The last word of the identifier decides; the table is below. The classes that are both have the
names of the built-ins and are in this module (`tessel.errors.FileNotFoundError`). None is derived
from another of them: catch `tessel.Error`, or the built-in.
"""

from __future__ import annotations

import builtins
import errno
import os
from typing import Any

# The words by the built-in that says the same. Every word that the module, the guard, the host and
# this package can raise is here, in SYSTEM_ERRORS, or in WITHOUT_BUILT_IN.
BUILT_INS: dict[type[Exception], str] = {
    TypeError: """
        badInputParameterCount badInputArgumentCount badParameterCount tooFewArguments tooManyInputs
        firstArgNotChar argumentWasNotChar badIDDatatype badSizeArgumentDatatype badModeDatatype
        badDatatype badNumericType badDimidsType unhandledNumericType
        startArgumentHasBadDatatype countArgumentHasBadDatatype strideArgumentHasBadDatatype
        attemptToConvertBetweenTextAndNumbers
        badClass badFieldName badFunctionName maskedArray namedArgument unsupportedDtype
        unsupportedResult unsupportedType
        """,
    ValueError: """
        emptySetID emptySetMode emptySetDatatype emptySetSizeParameter argumentIsEmptySet
        startArgumentIsEmpty countArgumentIsEmpty strideArgumentIsEmpty emptyVariableData
        sizeArgumentIsInfOrNaN negativeSize indexArgumentHasInf indexArgumentHasNaN
        unrecognizedFileMode invalidNetcdfDatatype invalidDataType
        ndimsLargerThanNetcdfLimits numberOfDimensionsOutOfBounds defVar
        indexVectorLengthMismatch startVectorLengthMismatch countVectorLengthMismatch
        strideVectorLengthMismatch badStartLength badCountLength badStrideLength dataSizeMismatch
        inqVarNDimsFailure numVarsInquiryFailure varDimIDsInquiryFailure
        notNetcdfID invalidArgument nameIsAlreadyInUse nameContainsIllegalCharacters
        maximumNameLengthExceeded invalidDimensionSize formatSizeConstraintsViolated illegalStride
        unlimitedDimensionInTheWrongIndex onlyOneUnlimitedDimensionAllowed libraryMaxDimsExceeded
        maximumNumberOfAttributesExceeded maximumNumberOfVariablesExceeded
        actionProhibitedOnGlobalVarid mathArgumentOutOfDomainOfFunc
        alignment closed counts lengths mapping mode name position records redefinition
        badBlockSize badDimensions badEncoding badFormat badMode badModuleName badOutputCount
        badShape badGuard badPath characterTooLarge differentFields dimensionsTooLarge missingInput
        nestedTooDeeply notExact nothingToDraw notOneByte notText readOnlyArray
        recordsWithoutVariables shapeTooLarge tooManyDimensions valueDoesNotFit
        """,
    OverflowError: """
        mathResultNotRepresentable packUpSizetScalar integerTooLarge notRepresentable
        """,
    IndexError: "indexExceedsDimensionBound startPlusCountExceedsDimensionBound badIndex",
    KeyError: "variableNotFound attributeNotFound invalidDimensionIdOrName",
    LookupError: "InvalidOperation unrecognizedCharParameter unknownOperation",
    MemoryError: "outOfMemory memoryAllocationFailure",
    RuntimeError: """
        operationNotAllowedInDefineMode operationNotAllowedInDataMode
        badOwner foreignException nestedCall noCall
        """,
    NotImplementedError: "unhandledOperation unrecognizedOperation unhandledFuncstr",
    # An unknown status is one that the module's table of statuses leaves out: those of the HDF5
    # layer, which all come from what is in a file or from reading and writing it.
    OSError: """
        notANetcdfFile notAClassicFile notARegularFile corruptedFile fileChanged fileTooShort
        header sameFile unknownErrorStatus
        """,
    PermissionError: "remote",
    ModuleNotFoundError: "moduleNotFound",
    ImportError: "notAModule noEntryPoint",
}

# The words for what the system refuses, by its number for it. The built-in is the one that Python
# itself raises for that number.
SYSTEM_ERRORS: dict[str, int] = {
    "operationNotPermitted": errno.EPERM,
    "noSuchFileOrDirectory": errno.ENOENT,
    "noSuchProcess": errno.ESRCH,
    "interruptedSystemCall": errno.EINTR,
    "IOError": errno.EIO,
    "noSuchDeviceOrAddress": errno.ENXIO,
    "argumentListTooLong": errno.E2BIG,
    "execFormatError": errno.ENOEXEC,
    "badFileNumber": errno.EBADF,
    "noChildProcess": errno.ECHILD,
    "permissionDenied": errno.EACCES,
    "badAddress": errno.EFAULT,
    "deviceOrResourceBusy": errno.EBUSY,
    "fileExists": errno.EEXIST,
    "crossDeviceLink": errno.EXDEV,
    "noSuchDevice": errno.ENODEV,
    "notADirectory": errno.ENOTDIR,
    "isDirectory": errno.EISDIR,
    "fileTableOverflow": errno.ENFILE,
    "tooManyOpenFiles": errno.EMFILE,
    "notATypewriter": errno.ENOTTY,
    "fileTooLarge": errno.EFBIG,
    "noSpaceLeftOnDevice": errno.ENOSPC,
    "illegalSeek": errno.ESPIPE,
    "readOnlyFileSystem": errno.EROFS,
    "tooManyLinks": errno.EMLINK,
    "brokenPipe": errno.EPIPE,
    "tryAgain": 35,  # the number that the library passed on, whatever this system calls it
    # The library's own numbers for what the system has a number for as well.
    "netcdfFileExistsAndNoClobber": errno.EEXIST,
    "writeToReadOnly": errno.EPERM,
    "tooManyNetcdfFilesOpen": errno.ENFILE,
}

# What no built-in says.
WITHOUT_BUILT_IN = """
    v2ApiError inFortranStringTooShort recordOperationWithoutRecordVars
    tsArrayToStringFailureForUnpackingName tsArrayToStringFailureForMode violation
    """.split()


class Error(Exception):
    """What a module raised, or what the host or this package refused.

    `str()` gives the message. `Error(identifier, message)` makes the class that the identifier's
    last word asks for; errors can be copied and pickled.
    """

    identifier: str
    """Colon-separated, made for programs: "TESSEL:netcdf:open:noSuchFileOrDirectory"."""

    message: str
    """Made for people."""

    operation: str | None
    """The operation that was called, by its short name, or the function of this package that
    refused ("read", "copy", "check"); None where none was."""

    path: str | None
    """The file that it is about, from the root on; None where none is known."""

    def __new__(cls, identifier: str, message: str, operation: str | None = None, *,
                path: str | None = None) -> Error:
        kind = CLASSES.get(word_of(identifier), cls) if cls is Error else cls
        made = _base(kind).__new__(kind, identifier, message)
        made.identifier = identifier
        made.message = message
        made.operation = operation
        if isinstance(made, builtins.OSError):  # which took the two texts for its own
            number = SYSTEM_ERRORS.get(made.word)
            made.errno = number
            made.strerror = message if number is None else os.strerror(number)
        return made

    def __init__(self, identifier: str, message: str, operation: str | None = None, *,
                 path: str | None = None) -> None:
        super().__init__(identifier, message)
        self.path = path  # not earlier, because import errors have one of their own, and clear it

    @property
    def word(self) -> str:
        """The last component of the identifier: what went wrong, whichever operation it was."""
        return word_of(self.identifier)

    def __str__(self) -> str:
        return self.message

    def __reduce__(self) -> tuple[Any, ...]:
        state = {**self.__dict__, "path": self.path}  # which import errors keep elsewhere
        if isinstance(self, builtins.OSError) and self.filename is not None:
            state["filename"] = self.filename
        return type(self), (self.identifier, self.message), state


def _base(kind: type[Any]) -> type[Any]:
    """The one class of Python's own that may make instances of this one."""
    while issubclass(kind, Error):
        kind = kind.__base__
    return kind


def word_of(identifier: str) -> str:
    """The last component of an identifier."""
    return identifier.rpartition(":")[2]


def built_in_of(word: str) -> type[Exception] | None:
    """The built-in exception that errors of this word also are."""
    made = CLASSES.get(word)
    return made.__mro__[2] if made else None  # after the class itself and Error


def _classes() -> dict[str, type[Error]]:
    """The class of every word that has a built-in, made once for each built-in."""
    made: dict[type[Exception], type[Error]] = {}

    def class_for(built_in: type[Exception]) -> type[Error]:
        if built_in not in made:
            text = f"A tessel.Error that is a {built_in.__name__} as well."
            made[built_in] = type(built_in.__name__, (Error, built_in),
                                  {"__doc__": text, "__module__": __name__})
            globals()[built_in.__name__] = made[built_in]
        return made[built_in]

    classes = {word: class_for(built_in) for built_in, words in BUILT_INS.items()
               for word in words.split()}
    for word, number in SYSTEM_ERRORS.items():
        classes[word] = class_for(type(builtins.OSError(number, "")))
    return classes


CLASSES: dict[str, type[Error]] = _classes()
"""The class of an error by its word; without an entry, Error itself."""


def raised(module: object, arguments: tuple[object, ...], identifier: str, message: str) -> Error:
    """The exception for a call that failed: the error, with a note on what was called."""
    return explained(Error(identifier, message), module, arguments)


def explained(error: Error, module: object, arguments: tuple[object, ...]) -> Error:
    """An error of a call, with the note on what was called if it has none yet."""
    from tessel import notes  # not earlier: it needs this module

    if error.operation is None:
        notes.explain(error, module, arguments)
    return error
