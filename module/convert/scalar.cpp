// module/convert/scalar.cpp: one input array into one library argument.
#include "convert/scalar.hpp"

#include "call/catalogue.hpp"
#include "convert/number.hpp"
#include "tessel/memory.h"

#include <netcdf.h>

#include <algorithm>
#include <array>
#include <cctype>
#include <cstdint>
#include <cstring>
#include <string_view>

namespace tessel::netcdf {
namespace {

struct ModeName {
    std::string_view name;
    int flags;
};

constexpr std::array modeNames = {
    ModeName{"CLOBBER", NC_CLOBBER},
    ModeName{"NOCLOBBER", NC_NOCLOBBER},
    ModeName{"WRITE", NC_WRITE},
    ModeName{"NOWRITE", NC_NOWRITE},
};

/// The first element of an array of the given class, double or int32, as an int.
int firstAsInt(const tsArray *array, tsClassID found) {
    return found == tsDOUBLE ? truncated<int>(*elements<double>(array))
                             : *elements<std::int32_t>(array);
}

bool isDoubleOrInt32(tsClassID found) {
    return found == tsDOUBLE || found == tsINT32;
}

} // namespace

int unpackID(const tsArray *array, const char *label) {
    if (tsIsEmpty(array)) {
        raise(catalogue::emptySetID, label);
    }
    const tsClassID found = tsGetClassID(array);
    if (!isDoubleOrInt32(found)) {
        raise(catalogue::badIDDatatype, label, tsGetClassName(array));
    }
    return firstAsInt(array, found);
}

std::string unpackName(const tsArray *array, const char *label) {
    if (tsGetClassID(array) != tsCHAR) {
        raise(catalogue::argumentWasNotChar, label);
    }
    char *text = tsArrayToString(array);
    if (text == nullptr) {
        raise(catalogue::nameExtractionFailure);
    }
    std::string name = text;
    tsFree(text);
    return name;
}

int unpackMode(const tsArray *array) {
    if (tsIsEmpty(array)) {
        raise(catalogue::emptySetMode);
    }
    const tsClassID found = tsGetClassID(array);
    if (found == tsCHAR) {
        char *text = tsArrayToString(array);
        if (text == nullptr) {
            raise(catalogue::modeExtractionFailure);
        }
        const int mode = parseModeName(text);
        tsFree(text);
        return mode;
    }
    if (!isDoubleOrInt32(found)) {
        raise(catalogue::badModeDatatype);
    }
    return firstAsInt(array, found);
}

int parseModeName(char *text) {
    for (char *at = text; *at != '\0'; ++at) {
        *at = static_cast<char>(std::toupper(static_cast<unsigned char>(*at)));
    }
    constexpr std::string_view prefix = "NC_";
    std::string_view name = text;
    if (name.starts_with(prefix)) {
        name.remove_prefix(prefix.size());
    }
    const auto *const row = std::find_if(modeNames.begin(), modeNames.end(),
                                         [&](const ModeName &mode) { return mode.name == name; });
    if (row == modeNames.end()) {
        raise(catalogue::unrecognizedFileMode, text);
    }
    return row->flags;
}

int unpack_xtype(const tsArray *array) {
    if (tsIsEmpty(array)) {
        raise(catalogue::emptySetDatatype);
    }
    if (tsGetClassID(array) != tsDOUBLE) {
        raise(catalogue::badDatatype);
    }
    const double value = *elements<double>(array);
    if (value < NC_NAT || value > NC_DOUBLE) {
        raise(catalogue::invalidNetcdfDatatype, value);
    }
    const int type = truncated<int>(value);
    return static_cast<double>(type) == value ? type : NC_NAT;
}

std::size_t unpackGenericSizeParameter(const tsArray *array, const char *label) {
    if (tsIsEmpty(array)) {
        raise(catalogue::emptySetSizeParameter, label);
    }
    if (!tsIsNumeric(array)) {
        raise(catalogue::badSizeArgumentDatatype, label);
    }
    std::size_t size = 0;
    const bool handled = visitNumeric(array, [&]<class T>(const T *first) {
        if constexpr (std::is_floating_point_v<T>) {
            const auto value = static_cast<double>(*first);
            if (tsIsInf(value) || tsIsNaN(value)) {
                raise(catalogue::sizeArgumentIsInfOrNaN, label);
            }
        }
        if constexpr (std::is_signed_v<T>) {
            if (*first < 0) {
                raise(catalogue::negativeSize, label);
            }
        }
        size = widened<std::size_t>(*first);
    });
    if (!handled) {
        raise(catalogue::unhandledNumericType, label);
    }
    return size;
}

int unpackIntSingleton(const tsArray *array, const char *label) {
    if (tsIsEmpty(array)) {
        raise(catalogue::emptySingleton, label);
    }
    const tsClassID found = tsGetClassID(array);
    if (!isDoubleOrInt32(found)) {
        raise(catalogue::badSingletonType);
    }
    // The storage is read as a double whatever the class is; a lone int32 has only half of the
    // bytes, and the other half reads as zero.
    const std::size_t width = found == tsDOUBLE ? sizeof(double) : sizeof(std::int32_t);
    double value = 0.0;
    std::memcpy(&value, tsGetData(array),
                std::min(sizeof(value), width * tsGetNumberOfElements(array)));
    return truncated<int>(value);
}

void unpackDimids(const tsArray *array, std::vector<int> &out) {
    if (tsGetClassID(array) != tsDOUBLE) {
        raise(catalogue::badDimidsType);
    }
    const auto count = checkedCast<int>(tsGetNumberOfElements(array));
    if (!count) {
        raise(catalogue::numberOfDimensionsOutOfBounds);
    }
    if (*count > NC_MAX_VAR_DIMS) {
        raise(catalogue::tooManyDimensions, NC_MAX_VAR_DIMS);
    }
    const auto *const ids = elements<double>(array);
    out.resize(static_cast<std::size_t>(*count));
    std::transform(ids, ids + *count, out.rbegin(), truncated<int>);
}

} // namespace tessel::netcdf
