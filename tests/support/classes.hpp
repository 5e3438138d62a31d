// tests/support/classes.hpp: a value of every host class.
#pragma once

#include "support/row.hpp"

#include <string>
#include <vector>

namespace tessel::test {

struct OfClass {
    std::string className;
    Value value;
};

/// One element of each class.
std::vector<OfClass> oneOfEachClass();

/// No element of each class that can be without.
std::vector<OfClass> noneOfEachClass();

/// The row with its last argument of every class but those that are taken. "CLASS" in the message
/// stands for the class's name.
Rows withOtherClasses(const Row &row, const std::vector<std::string> &taken);

} // namespace tessel::test
