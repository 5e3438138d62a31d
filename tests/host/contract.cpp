// tests/host/contract.cpp: the binary contract as C++ sees it. Not run: it compiles, or the
// contract was broken, and with it every module and host that was built before.
#include "tessel/host.h"

#include <type_traits>

static_assert(tsUNKNOWN == 0, "tsUNKNOWN");
static_assert(tsCELL == 1, "tsCELL");
static_assert(tsSTRUCT == 2, "tsSTRUCT");
static_assert(tsLOGICAL == 3, "tsLOGICAL");
static_assert(tsCHAR == 4, "tsCHAR");
static_assert(tsDOUBLE == 5, "tsDOUBLE");
static_assert(tsSINGLE == 6, "tsSINGLE");
static_assert(tsINT8 == 7, "tsINT8");
static_assert(tsUINT8 == 8, "tsUINT8");
static_assert(tsINT16 == 9, "tsINT16");
static_assert(tsUINT16 == 10, "tsUINT16");
static_assert(tsINT32 == 11, "tsINT32");
static_assert(tsUINT32 == 12, "tsUINT32");
static_assert(tsINT64 == 13, "tsINT64");
static_assert(tsUINT64 == 14, "tsUINT64");
static_assert(tsFUNCTION == 15, "tsFUNCTION");
static_assert(sizeof(tsClassID) == sizeof(int), "a class id is as large as an int");
static_assert(sizeof(tsChar) == 2, "a character has 16 bits");
static_assert(std::is_unsigned_v<tsChar>, "a character has no sign");

// Each function has this type.
template <class Found, class Promised>
constexpr bool same = std::is_same_v<Found, Promised>;

static_assert(same<decltype(tsGetClassID), tsClassID(const tsArray *)>);
static_assert(same<decltype(tsGetClassName), const char *(const tsArray *)>);
static_assert(same<decltype(tsIsNumeric), bool(const tsArray *)>);
static_assert(same<decltype(tsIsEmpty), bool(const tsArray *)>);
static_assert(same<decltype(tsGetNumberOfElements), size_t(const tsArray *)>);
static_assert(same<decltype(tsGetNumberOfDimensions), size_t(const tsArray *)>);
static_assert(same<decltype(tsGetDimensions), const size_t *(const tsArray *)>);
static_assert(same<decltype(tsGetData), void *(const tsArray *)>);
static_assert(same<decltype(tsIsInf), bool(double)>);
static_assert(same<decltype(tsIsNaN), bool(double)>);
static_assert(same<decltype(tsArrayToString), char *(const tsArray *)>);
static_assert(same<decltype(tsCreateDoubleScalar), tsArray *(double)>);
static_assert(same<decltype(tsCreateString), tsArray *(const char *)>);
static_assert(
    same<decltype(tsCreateUninitNumericArray), tsArray *(size_t, const size_t *, tsClassID)>);
static_assert(same<decltype(tsCreateCharArray), tsArray *(size_t, const size_t *)>);
static_assert(same<decltype(tsCreateCellArray), tsArray *(size_t, const size_t *)>);
static_assert(same<decltype(tsSetCell), void(tsArray *, size_t, tsArray *)>);
static_assert(same<decltype(tsCalloc), void *(size_t, size_t)>);
static_assert(same<decltype(tsFree), void(void *)>);
static_assert(same<decltype(tsxFunction), void(int, tsArray **, int, const tsArray **)>);

// A template would drop the attributes of this one.
[[maybe_unused]] constexpr void (*raises)(const char *, const char *, ...) = tsxErrMsgIdAndTxt;
