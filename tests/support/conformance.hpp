// tests/support/conformance.hpp: rows as tests of GoogleTest.
//
// A file of rows ends in one line that names them:
//
//     INSTANTIATE_TEST_SUITE_P(Dimensions, Conformance, testing::ValuesIn(rows()), titleOf);
#pragma once

#include "support/row.hpp"

#include <gtest/gtest.h>

#include <iosfwd>
#include <string>

namespace tessel::test {

class Conformance : public testing::TestWithParam<Row> {};

/// What GoogleTest shows of a row.
void PrintTo(const Row &row, std::ostream *out);

/// The title as the name of a test.
std::string titleOf(const testing::TestParamInfo<Row> &info);

/// The module under test.
const Module &netcdf();

} // namespace tessel::test
