// tests/support/sample.hpp: the sample dataset.
#pragma once

#include <cstddef>

namespace tessel::test {

/// Defines the sample's dimensions, variables and attributes in a dataset in define mode.
void defineSample(int ncid);

/// Writes the sample's data, with so many records, into a dataset in data mode.
void writeSample(int ncid, std::size_t records);

} // namespace tessel::test
