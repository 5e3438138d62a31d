// tests/conformance/rows.cpp: what is done with a row. The rows are in the files beside this one.
#include "support/conformance.hpp"

namespace tessel::test {

TEST_P(Conformance, Row) {
    check(GetParam());
}

} // namespace tessel::test
