// module/constants/handlers.cpp: the operations that expose the named constants.
#include "constants/handlers.hpp"

#include "call/catalogue.hpp"
#include "call/name_index.hpp"
#include "constants/constant_table.hpp"
#include "convert/scalar.hpp"
#include "tessel/create.h"

#include <array>
#include <cctype>
#include <string>

namespace tessel::netcdf {
namespace {

constexpr NameIndex constants(constantTable);

double constantValue(const tsArray *array) {
    std::string name = unpackName(array, "parameter");
    for (char &c : name) {
        c = static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
    }
    if (const ConstantEntry *const row = constants.find(name.c_str())) {
        return row->value;
    }
    raise(catalogue::unrecognizedCharParameter, name.c_str());
}

} // namespace

void parameterHandler(int /*nlhs*/, tsArray *plhs[], int nrhs, const tsArray *prhs[],
                      const OperationEntry *entry) {
    checkCount(catalogue::parameter, nrhs, entry);
    plhs[0] = tsCreateDoubleScalar(constantValue(prhs[1]));
}

void constantNamesHandler(int /*nlhs*/, tsArray *plhs[], int /*nrhs*/, const tsArray * /*prhs*/[],
                          const OperationEntry * /*entry*/) {
    constexpr std::array<std::size_t, 2> dims = {constantTable.size(), 1};
    plhs[0] = tsCreateCellArray(dims.size(), dims.data());
    for (std::size_t row = 0; row < constantTable.size(); ++row) {
        tsSetCell(plhs[0], row, tsCreateString(constantTable[row].longName));
    }
}

} // namespace tessel::netcdf
