// examples/embedding/guarded.cpp: calls are looked at before the module sees them: guarded FILE
//
// The guard refuses what the netCDF library does not survive, and addresses as file names.
#include "tessel/netcdf_guard.hpp"
#include "tessel/runtime.hpp"

#include <iostream>

int main(int argc, char **argv) try {
    if (argc != 2) {
        std::cerr << "usage: guarded FILE\n";
        return 2;
    }
    const tessel::Module netcdf = tessel::Module::find("netcdf").watchedBy(tessel::netcdfGuard());
    const tessel::Results file = netcdf("open", argv[1], "NOWRITE");
    std::cout << "opened\n";
    netcdf("close", file[0]);
} catch (const tessel::Error &error) {
    std::cout << "refused: " << error.identifier() << '\n';
    return 1;
}
