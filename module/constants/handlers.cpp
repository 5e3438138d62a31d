// module/constants/handlers.cpp: the operations that expose the named constants.
#include "constants/handlers.hpp"

#include "call/catalogue.hpp"
#include "constants/constant_table.hpp"
#include "convert/scalar.hpp"
#include "tessel/create.h"

#include <algorithm>
#include <array>
#include <cctype>
#include <string>

namespace tessel::netcdf {
namespace {

double constantValue(const tsArray *array) {
    std::string name = unpackName(array, "parameter");
    for (char &c : name) {
        c = static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
    }
    const auto *const row =
        std::find_if(constantTable.begin(), constantTable.end(), [&](const ConstantEntry &entry) {
            return name == entry.longName || name == entry.shortName;
        });
    if (row == constantTable.end()) {
        raise(catalogue::unrecognizedCharParameter, name.c_str());
    }
    return row->value;
}

} // namespace

void parameterHandler(int /*nlhs*/, tsArray *plhs[], int nrhs, const tsArray *prhs[],
                      const OperationEntry *entry) {
    checkCount(catalogue::parameter, nrhs, entry);
    plhs[0] = tsCreateDoubleScalar(constantValue(prhs[1]));
}

void constantNamesHandler(int /*nlhs*/, tsArray *plhs[], int /*nrhs*/, const tsArray * /*prhs*/[],
                          const OperationEntry * /*entry*/) {
    constexpr std::array<std::size_t, 2> dims = {constantCount, 1};
    plhs[0] = tsCreateCellArray(dims.size(), dims.data());
    for (std::size_t row = 0; row < constantCount; ++row) {
        tsSetCell(plhs[0], row, tsCreateString(constantTable[row].longName));
    }
}

} // namespace tessel::netcdf
