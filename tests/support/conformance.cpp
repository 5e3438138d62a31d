// tests/support/conformance.cpp: rows as tests of GoogleTest.
#include "support/conformance.hpp"

#include <cctype>
#include <ostream>

namespace tessel::test {

const Module &netcdf() {
    static const Module module(TESSEL_MODULE_FILE);
    return module;
}

void PrintTo(const Row &row, std::ostream *out) {
    *out << row.title;
}

std::string titleOf(const testing::TestParamInfo<Row> &info) {
    std::string name;
    for (const char c : info.param.title) {
        const bool plain = std::isalnum(static_cast<unsigned char>(c)) != 0;
        name += plain ? c : '_';
    }
    return name;
}

} // namespace tessel::test

int main(int argc, char **argv) {
    testing::InitGoogleTest(&argc, argv);
    tessel::setChecked(true);
    return RUN_ALL_TESTS();
}
