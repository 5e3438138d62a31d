/* tests/host/contract.c: the binary contract as C sees it. Not run: it compiles, or the contract
 * was broken, and with it every module and host that was built before. */
#include "tessel/host.h"

_Static_assert(tsUNKNOWN == 0, "tsUNKNOWN");
_Static_assert(tsCELL == 1, "tsCELL");
_Static_assert(tsSTRUCT == 2, "tsSTRUCT");
_Static_assert(tsLOGICAL == 3, "tsLOGICAL");
_Static_assert(tsCHAR == 4, "tsCHAR");
_Static_assert(tsDOUBLE == 5, "tsDOUBLE");
_Static_assert(tsSINGLE == 6, "tsSINGLE");
_Static_assert(tsINT8 == 7, "tsINT8");
_Static_assert(tsUINT8 == 8, "tsUINT8");
_Static_assert(tsINT16 == 9, "tsINT16");
_Static_assert(tsUINT16 == 10, "tsUINT16");
_Static_assert(tsINT32 == 11, "tsINT32");
_Static_assert(tsUINT32 == 12, "tsUINT32");
_Static_assert(tsINT64 == 13, "tsINT64");
_Static_assert(tsUINT64 == 14, "tsUINT64");
_Static_assert(tsFUNCTION == 15, "tsFUNCTION");
_Static_assert(sizeof(tsClassID) == sizeof(int), "a class id is as large as an int");
_Static_assert(sizeof(tsChar) == 2, "a character has 16 bits");
_Static_assert((tsChar)-1 > 0, "a character has no sign");

/* Each function has this type. No two rows can change places where their types differ, since
 * pointers to functions of different types are not compatible. */
tsClassID (*const type_tsGetClassID)(const tsArray *) = tsGetClassID;
const char *(*const type_tsGetClassName)(const tsArray *) = tsGetClassName;
bool (*const type_tsIsNumeric)(const tsArray *) = tsIsNumeric;
bool (*const type_tsIsEmpty)(const tsArray *) = tsIsEmpty;
size_t (*const type_tsGetNumberOfElements)(const tsArray *) = tsGetNumberOfElements;
size_t (*const type_tsGetNumberOfDimensions)(const tsArray *) = tsGetNumberOfDimensions;
const size_t *(*const type_tsGetDimensions)(const tsArray *) = tsGetDimensions;
void *(*const type_tsGetData)(const tsArray *) = tsGetData;
bool (*const type_tsIsInf)(double) = tsIsInf;
bool (*const type_tsIsNaN)(double) = tsIsNaN;
char *(*const type_tsArrayToString)(const tsArray *) = tsArrayToString;
tsArray *(*const type_tsCreateDoubleScalar)(double) = tsCreateDoubleScalar;
tsArray *(*const type_tsCreateString)(const char *) = tsCreateString;
tsArray *(*const type_tsCreateUninitNumericArray)(size_t, const size_t *,
                                                  tsClassID) = tsCreateUninitNumericArray;
tsArray *(*const type_tsCreateCharArray)(size_t, const size_t *) = tsCreateCharArray;
tsArray *(*const type_tsCreateCellArray)(size_t, const size_t *) = tsCreateCellArray;
void (*const type_tsSetCell)(tsArray *, size_t, tsArray *) = tsSetCell;
void *(*const type_tsCalloc)(size_t, size_t) = tsCalloc;
void (*const type_tsFree)(void *) = tsFree;
void (*const type_tsxFunction)(int, tsArray **, int, const tsArray **) = tsxFunction;
void (*const type_tsxErrMsgIdAndTxt)(const char *, const char *, ...) = tsxErrMsgIdAndTxt;
