// tests/support/value.hpp: arguments and expected results, as a row writes them down.
#pragma once

#include "tessel/runtime.hpp"

#include <cstdint>
#include <functional>
#include <initializer_list>
#include <string>
#include <string_view>
#include <vector>

namespace tessel::test {

class Scene;

/// A recipe for a host array, which may name something of the scene that a row plays in. A plain
/// number is a 1x1 double, a text in quotes a row of characters.
class Value {
  public:
    using Recipe = std::function<Array(const Scene &)>;

    Value(Recipe how) : recipe(std::move(how)) {}
    Value(double number);
    Value(int number) : Value(static_cast<double>(number)) {}
    Value(const char *utf8);

    [[nodiscard]] Array make(const Scene &scene) const { return recipe(scene); }

  private:
    Recipe recipe;
};

using Values = std::vector<Value>;

// Rows of values, 1xn.
Value doubles(std::initializer_list<double> values);
Value singles(std::initializer_list<float> values);
Value int8s(std::initializer_list<std::int8_t> values);
Value uint8s(std::initializer_list<std::uint8_t> values);
Value int16s(std::initializer_list<std::int16_t> values);
Value uint16s(std::initializer_list<std::uint16_t> values);
Value int32s(std::initializer_list<std::int32_t> values);
Value uint32s(std::initializer_list<std::uint32_t> values);
Value int64s(std::initializer_list<std::int64_t> values);
Value uint64s(std::initializer_list<std::uint64_t> values);
Value logicals(std::initializer_list<bool> values);

/// Characters by their codes, and from UTF-8, which may hold a NUL.
Value codes(std::initializer_list<tsChar> values);
Value chars(std::string_view utf8);

/// Small whole numbers in an array of a numeric class or char, 1xn.
Value wholes(tsClassID classID, const std::vector<int> &values);

/// The same elements, or the same class without any, in other dimensions.
Value shaped(const std::vector<std::size_t> &dims, const Value &value);
Value empty(tsClassID classID, const std::vector<std::size_t> &dims = {0, 0});

/// The same array with an imaginary part that is 7 everywhere.
Value complexDouble(double real);
Value complexDoubles(std::initializer_list<double> reals);

// Classes without numbers. A cell holds the given values in a column.
Value cell(const Values &values = {});
Value structure();
Value function();
Value unknown();

// What the scene has: its dataset and its second one, ids of named things in the dataset, the path
// of a file in the scene's folder, and the dataset that the call itself opened.
extern const Value ncid;
extern const Value other;
extern const Value opened;
Value varid(const std::string &name);
Value dimid(const std::string &name);
Value file(const std::string &name);

/// The text of the library's version.
extern const Value libraryVersion;

} // namespace tessel::test
