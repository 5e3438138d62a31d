// examples/embedding/means.cpp: two modules in one host: means SERIES-MODULE FILE VARIABLE...
//
// Reads variables of a netCDF file with the module "netcdf", and gives them to the module "series",
// which knows nothing of netCDF: a host array is a host array. So fill values are values like any
// other here: for the mean of what was measured, leave out what equals the variable's attribute
// "_FillValue" or "missing_value".
#include "tessel/runtime.hpp"

#include <iostream>

int main(int argc, char **argv) try {
    if (argc < 4) {
        std::cerr << "usage: means SERIES-MODULE FILE VARIABLE...\n";
        return 2;
    }
    const tessel::Module netcdf = tessel::Module::find("netcdf");
    const tessel::Module series{std::filesystem::path(argv[1])};
    const tessel::Results file = netcdf("open", argv[2], "NOWRITE");
    for (int i = 3; i < argc; ++i) {
        const tessel::Results variable = netcdf("inq_varid", file[0], argv[i]);
        const tessel::Results read = netcdf("get_var_double", file[0], variable[0]);
        std::cout << argv[i] << ": " << series("count", read[0])[0].number() << " values from "
                  << series("least", read[0])[0].number() << " to "
                  << series("greatest", read[0])[0].number() << ", mean "
                  << series("mean", read[0])[0].number() << '\n';
    }
    netcdf("close", file[0]);
} catch (const tessel::Error &error) {
    std::cerr << error.identifier() << ": " << error.what() << '\n';
    return 1;
}
