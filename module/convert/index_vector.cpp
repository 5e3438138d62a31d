// module/convert/index_vector.cpp: start, count, index and stride arguments.
#include "convert/index_vector.hpp"

#include "call/catalogue.hpp"
#include "convert/number.hpp"

#include <cmath>

namespace tessel::netcdf {
namespace {

template <class Wide>
void unpackVector(const tsArray *array, const char *argName, DimensionVector<Wide> &out) {
    if (tsIsEmpty(array)) {
        raiseNamed(argName, catalogue::argumentIsEmpty, argName);
    }
    const std::size_t n = tsGetNumberOfElements(array);
    out.resize(n, unfilled);
    const bool numeric = visitNumeric(array, [&]<class T>(const T *from) {
        for (std::size_t i = 0; i < n; ++i) {
            if constexpr (std::is_same_v<T, double>) {
                if (!std::isfinite(from[i])) { // as a rule, the host need not be asked
                    raise(tsIsInf(from[i]) ? catalogue::indexArgumentHasInf
                                           : catalogue::indexArgumentHasNaN);
                }
            }
            out[n - 1 - i] = widened<Wide>(from[i]);
        }
    });
    if (!numeric) {
        raiseNamed(argName, catalogue::argumentHasBadDatatype, argName);
    }
}

} // namespace

void unpackIndexVector(const tsArray *array, const char *argName, IndexVector &out) {
    unpackVector(array, argName, out);
}

void unpackStrideVector(const tsArray *array, const char *argName, StrideVector &out) {
    unpackVector(array, argName, out);
}

} // namespace tessel::netcdf
