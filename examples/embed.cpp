// examples/embed.cpp: reads a variable of a file through the module: embed FILE VARIABLE
#include "tessel/runtime.hpp"

#include <iostream>

int main(int argc, char **argv) try {
    if (argc != 3) {
        std::cerr << "usage: embed FILE VARIABLE\n";
        return 2;
    }
    const tessel::Module netcdf = tessel::Module::find("netcdf");
    const tessel::Results file = netcdf("open", argv[1], "NOWRITE");
    const tessel::Results variable = netcdf("inq_varid", file[0], argv[2]);
    const tessel::Results read = netcdf("get_var_double", file[0], variable[0]);
    const std::span<double> values = read[0].elements<double>();
    std::cout << values.size() << " values, from " << values.front() << " to " << values.back()
              << '\n';
    netcdf("close", file[0]);
} catch (const tessel::Error &error) {
    std::cerr << error.what() << '\n';
    return 1;
}
