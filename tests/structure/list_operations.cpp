// tests/structure/list_operations.cpp: prints the operation table, a row a line.
#include "gateway/operation_table.hpp"

#include <cstdio>

int main() {
    for (const tessel::netcdf::OperationEntry &entry : tessel::netcdf::operationTable) {
        std::printf("%3d %-22s %s\n", entry.id, entry.longName, entry.shortName);
    }
}
