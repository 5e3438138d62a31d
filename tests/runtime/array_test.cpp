// tests/runtime/array_test.cpp: arrays as an embedding program makes and reads them.
#include "support.hpp"

#include <algorithm>
#include <array>
#include <cstdint>
#include <limits>
#include <memory>
#include <numeric>
#include <string>
#include <vector>

namespace tessel::test {
namespace {

using DimsVector = std::vector<std::size_t>;

Array numericOf(tsClassID classID, Dims dims) {
    return Array::numeric(classID, dims);
}
Array logicalOf(tsClassID /*classID*/, Dims dims) {
    return Array::logical(dims);
}
Array charactersOf(tsClassID /*classID*/, Dims dims) {
    return Array::characters(dims);
}
Array cellOf(tsClassID /*classID*/, Dims dims) {
    return Array::cell(dims);
}
Array structureOf(tsClassID /*classID*/, Dims dims) {
    return Array::structure(dims, {"a", "b"});
}
Array unknownOf(tsClassID /*classID*/, Dims dims) {
    return Array::unknown(dims);
}

/// The classes: how each is made, and what the host says of it. A function handle has no
/// dimensions to choose and is tested by itself.
struct ClassRow {
    const char *name;
    std::size_t elementSize;
    Array (*make)(tsClassID, Dims);
    tsClassID classID;
    bool numeric;
};
constexpr ClassRow classRows[] = {
    {"unknown", 0, unknownOf, tsUNKNOWN, false}, {"cell", 0, cellOf, tsCELL, false},
    {"struct", 0, structureOf, tsSTRUCT, false}, {"logical", 1, logicalOf, tsLOGICAL, false},
    {"char", 2, charactersOf, tsCHAR, false},    {"double", 8, numericOf, tsDOUBLE, true},
    {"single", 4, numericOf, tsSINGLE, true},    {"int8", 1, numericOf, tsINT8, true},
    {"uint8", 1, numericOf, tsUINT8, true},      {"int16", 2, numericOf, tsINT16, true},
    {"uint16", 2, numericOf, tsUINT16, true},    {"int32", 4, numericOf, tsINT32, true},
    {"uint32", 4, numericOf, tsUINT32, true},    {"int64", 8, numericOf, tsINT64, true},
    {"uint64", 8, numericOf, tsUINT64, true},
};

/// Dimensions asked for, and those that the array has.
struct ShapeRow {
    DimsVector asked;
    DimsVector had;
};
const ShapeRow shapes[] = {
    {{0}, {0, 1}},
    {{1}, {1, 1}},
    {{5}, {5, 1}},
    {{1, 1}, {1, 1}},
    {{3, 4}, {3, 4}},
    {{0, 7}, {0, 7}},
    {{2, 3, 4}, {2, 3, 4}},
    {{3, 1, 1, 1}, {3, 1, 1, 1}}, // ones at the end stay
    {{2, 1, 2, 1, 2}, {2, 1, 2, 1, 2}},
    {DimsVector(40, 1), DimsVector(40, 1)},
    {{1UL << 40U, 1UL << 40U, 0}, {1UL << 40U, 1UL << 40U, 0}},
};

class ArrayModes : public testing::TestWithParam<bool> {
  protected:
    void SetUp() override { setChecked(GetParam()); }
    void TearDown() override { setChecked(false); }
};
INSTANTIATE_TEST_SUITE_P(Mode, ArrayModes, testing::Bool(),
                         [](const auto &mode) { return mode.param ? "checked" : "unchecked"; });

TEST_P(ArrayModes, EveryClassInEveryShape) {
    const Module good(testModule("good"));
    for (const ClassRow &row : classRows) {
        for (const ShapeRow &shape : shapes) {
            SCOPED_TRACE(std::string(row.name) + " of " + testing::PrintToString(shape.asked));
            const Array array = row.make(row.classID, shape.asked);
            const std::size_t elements = std::accumulate(shape.had.begin(), shape.had.end(),
                                                         std::size_t{1}, std::multiplies<>());
            EXPECT_EQ(array.classID(), row.classID);
            EXPECT_STREQ(array.className(), row.name);
            EXPECT_EQ(elementSize(row.classID), row.elementSize);
            EXPECT_EQ(DimsVector(array.dims().begin(), array.dims().end()), shape.had);
            EXPECT_EQ(array.size(), elements);
            EXPECT_EQ(array.imaginary(), nullptr);
            if (row.elementSize != 0 && elements != 0) {
                ASSERT_NE(array.data(), nullptr);
                EXPECT_EQ(reinterpret_cast<std::uintptr_t>(array.data()) % row.elementSize, 0U);
                auto *const bytes = static_cast<unsigned char *>(array.data());
                if (!row.numeric) {
                    EXPECT_EQ(std::count(bytes, bytes + elements * row.elementSize, 0),
                              elements * row.elementSize);
                }
                std::fill_n(bytes, elements * row.elementSize, static_cast<unsigned char>(0x5A));
            }

            std::vector<double> described = {static_cast<double>(row.classID),
                                             row.numeric ? 1.0 : 0.0, elements == 0 ? 1.0 : 0.0,
                                             static_cast<double>(elements)};
            described.insert(described.end(), shape.had.begin(), shape.had.end());
            const Results told = good("describe", array);
            const std::span<double> numbers = told[0].elements<double>();
            EXPECT_EQ(std::vector<double>(numbers.begin(), numbers.end()), described);
            EXPECT_EQ(told[1].utf8(), row.name);
            EXPECT_EQ(told[2].number(), row.classID == tsCHAR ? 1 : 0);
        }
    }
}

TEST_P(ArrayModes, DimensionsThatCannotBe) {
    constexpr std::size_t most = std::numeric_limits<std::size_t>::max();
    constexpr std::size_t half = std::size_t{1} << 32U;
    for (const ClassRow &row : classRows) {
        SCOPED_TRACE(row.name);
        EXPECT_EQ(identifierOf([&] { row.make(row.classID, {}); }), "TESSEL:host:badDimensions");
        const DimsVector tooMany[] = {{most},          {most, most}, {half, half},
                                      {3, half, half}, {most, 2},    {most / 2 + 1, 1}};
        for (const DimsVector &dims : tooMany) {
            EXPECT_EQ(identifierOf([&] { row.make(row.classID, dims); }),
                      "TESSEL:host:dimensionsTooLarge");
        }
        if (row.elementSize > 1) { // the elements can be counted, their bytes cannot
            const DimsVector dims = {(std::size_t{1} << 63U) / row.elementSize};
            EXPECT_EQ(identifierOf([&] { row.make(row.classID, dims); }),
                      "TESSEL:host:dimensionsTooLarge");
        }
    }
}

TEST_P(ArrayModes, MemoryThatIsNotThere) {
    for (const ClassRow &row : classRows) {
        if (row.elementSize != 0) {
            SCOPED_TRACE(row.name);
            const DimsVector dims = {(std::size_t{1} << 60U) / row.elementSize};
            EXPECT_EQ(identifierOf([&] { row.make(row.classID, dims); }),
                      "TESSEL:host:outOfMemory");
        }
    }
    constexpr std::array<std::size_t, 1> many = {std::size_t{1} << 59U};
    if (!sanitized) { // whose operator new ends the process
        EXPECT_EQ(identifierOf([&] { Array::cell(many); }), "TESSEL:host:outOfMemory");
        EXPECT_EQ(identifierOf([&] { Array::structure(many, {"a"}); }), "TESSEL:host:outOfMemory");
    }
    const std::vector<std::string> fields(16, "f");
    EXPECT_EQ(identifierOf([&] { Array::structure(many, fields); }),
              "TESSEL:host:dimensionsTooLarge");
}

TEST_P(ArrayModes, Complex) {
    constexpr std::array<std::size_t, 2> sizes[] = {{1, 1}, {0, 3}, {500, 700}};
    for (const auto &dims : sizes) {
        const Array array = Array::numeric(tsDOUBLE, dims, true);
        ASSERT_NE(array.imaginary(), nullptr);
        EXPECT_NE(array.imaginary(), array.data());
        EXPECT_EQ(reinterpret_cast<std::uintptr_t>(array.imaginary()) % alignof(double), 0U);
        std::fill_n(static_cast<double *>(array.imaginary()), array.size(), 2.0);
        std::fill_n(static_cast<double *>(array.data()), array.size(), 1.0);
        if (array.size() != 0) {
            EXPECT_EQ(static_cast<double *>(array.imaginary())[array.size() - 1], 2.0);
            EXPECT_EQ(array.number(), 1.0);
        }
    }
}

TEST(Array, ClassesThatAMakerDoesNotMake) {
    constexpr std::array<std::size_t, 2> dims = {1, 1};
    for (const tsClassID classID : {tsUNKNOWN, tsCELL, tsSTRUCT, tsLOGICAL, tsCHAR, tsFUNCTION}) {
        EXPECT_EQ(identifierOf([&] { Array::numeric(classID, dims); }), "TESSEL:host:badClass");
    }
    double value = 0;
    for (const tsClassID classID : {tsUNKNOWN, tsCELL, tsSTRUCT, tsFUNCTION}) {
        EXPECT_EQ(identifierOf([&] { Array::borrowed(classID, dims, &value, nullptr); }),
                  "TESSEL:host:badClass");
    }
}

TEST(Array, Function) {
    const Array array = Array::function("nåme");
    EXPECT_EQ(array.classID(), tsFUNCTION);
    EXPECT_STREQ(array.className(), "function_handle");
    EXPECT_EQ(array.size(), 1U);
    EXPECT_EQ(array.utf8(), "nåme");
    EXPECT_EQ(array.data(), nullptr);
    const Module good(testModule("good"));
    EXPECT_EQ(good("describe", array)[1].utf8(), "function_handle");
}

TEST(Array, ScalarsRowsAndNumbers) {
    EXPECT_EQ(Array::scalar(2.5).number(), 2.5);
    const Array row = Array::row({1, 2, 3});
    EXPECT_EQ(row.dims()[0], 1U);
    EXPECT_EQ(row.dims()[1], 3U);
    EXPECT_EQ(row.elements<double>()[2], 3);
    EXPECT_EQ(Array::row({}).size(), 0U);
    EXPECT_EQ(identifierOf([] { (void)Array::row({}).number(); }), "TESSEL:host:badClass");
    EXPECT_EQ(identifierOf([] { (void)Array::text("1").number(); }), "TESSEL:host:badClass");
    EXPECT_EQ(identifierOf([] { (void)Array::scalar(1).elements<float>(); }),
              "TESSEL:host:badClass");
    EXPECT_EQ(identifierOf([] { (void)Array::scalar(1).utf8(); }), "TESSEL:host:badClass");
}

template <class T>
double numberOfMost(tsClassID classID) {
    constexpr std::array<std::size_t, 2> dims = {1, 1};
    const Array array = Array::numeric(classID, dims);
    array.elements<T>()[0] = std::numeric_limits<T>::lowest();
    return array.number() == static_cast<double>(std::numeric_limits<T>::lowest()) ? 1 : 0;
}

TEST(Array, NumberOfEveryNumericClass) {
    EXPECT_EQ(numberOfMost<double>(tsDOUBLE), 1);
    EXPECT_EQ(numberOfMost<float>(tsSINGLE), 1);
    EXPECT_EQ(numberOfMost<std::int8_t>(tsINT8), 1);
    EXPECT_EQ(numberOfMost<std::uint8_t>(tsUINT8), 1);
    EXPECT_EQ(numberOfMost<std::int16_t>(tsINT16), 1);
    EXPECT_EQ(numberOfMost<std::uint16_t>(tsUINT16), 1);
    EXPECT_EQ(numberOfMost<std::int32_t>(tsINT32), 1);
    EXPECT_EQ(numberOfMost<std::uint32_t>(tsUINT32), 1);
    EXPECT_EQ(numberOfMost<std::int64_t>(tsINT64), 1);
    EXPECT_EQ(numberOfMost<std::uint64_t>(tsUINT64), 1);
}

TEST(Array, BorrowsWithoutACopyAndKeepsTheLender) {
    auto lender = std::make_shared<std::vector<double>>(1000, 3.5);
    const std::weak_ptr<std::vector<double>> watch = lender;
    double *const data = lender->data();
    constexpr std::array<std::size_t, 1> dims = {1000};
    {
        Array array = Array::borrowed(tsDOUBLE, dims, data, std::move(lender));
        EXPECT_EQ(array.data(), data);
        EXPECT_EQ(array.number(), 3.5);
        Array cell = Array::cell(std::array<std::size_t, 1>{1});
        cell.setCell(0, std::move(array));
        EXPECT_FALSE(watch.expired());
    }
    EXPECT_TRUE(watch.expired());

    auto second = std::make_shared<std::vector<double>>(1);
    const std::weak_ptr<std::vector<double>> watchSecond = second;
    double *const secondData = second->data();
    EXPECT_EQ(identifierOf([&] { Array::borrowed(tsDOUBLE, {}, secondData, std::move(second)); }),
              "TESSEL:host:badDimensions");
    EXPECT_TRUE(watchSecond.expired());
}

TEST(Array, Cells) {
    constexpr std::array<std::size_t, 2> dims = {2, 2};
    Array outer = Array::cell(dims);
    EXPECT_FALSE(outer.cellAt(3));
    Array inner = Array::cell(dims);
    inner.setCell(0, Array::text("deep"));
    outer.setCell(3, std::move(inner));
    EXPECT_EQ(outer.cellAt(3).cellAt(0).utf8(), "deep");
    outer.setCell(3, Array::scalar(1)); // the old value goes
    EXPECT_EQ(outer.cellAt(3).number(), 1);
    outer.setCell(3, Array());
    EXPECT_FALSE(outer.cellAt(3));
    EXPECT_EQ(identifierOf([&] { (void)outer.cellAt(4); }), "TESSEL:host:badIndex");
    EXPECT_EQ(identifierOf([&] { outer.setCell(4, Array::scalar(1)); }), "TESSEL:host:badIndex");
    EXPECT_EQ(identifierOf([] { (void)Array::scalar(1).cellAt(0); }), "TESSEL:host:badClass");
    EXPECT_EQ(identifierOf([] { Array::scalar(1).setCell(0, Array()); }), "TESSEL:host:badClass");
    EXPECT_EQ(identifierOf([&] { (void)outer.fields(); }), "TESSEL:host:badClass");
}

TEST(Array, Structures) {
    constexpr std::array<std::size_t, 2> dims = {1, 2};
    Array array = Array::structure(dims, {"name", "value"});
    EXPECT_EQ(array.fields(), (std::vector<std::string>{"name", "value"}));
    EXPECT_EQ(array.size(), 2U);
    array.setCell(1 * 2 + 0, Array::text("second"));
    array.setCell(1 * 2 + 1, Array::structure(dims, {"inner"}));
    EXPECT_EQ(array.cellAt(2).utf8(), "second");
    EXPECT_EQ(array.cellAt(3).fields().front(), "inner");
    EXPECT_FALSE(array.cellAt(0));
    EXPECT_EQ(identifierOf([&] { (void)array.cellAt(4); }), "TESSEL:host:badIndex");
    const Array bare = Array::structure(dims, {});
    EXPECT_EQ(identifierOf([&] { (void)bare.cellAt(0); }), "TESSEL:host:badIndex");
}

TEST(Array, CellsNestedDeeperThanTheStack) {
    constexpr std::array<std::size_t, 2> dims = {1, 1};
    Array array = Array::text("innermost");
    for (int depth = 0; depth < 1'000'000; ++depth) {
        Array outer = Array::cell(dims);
        outer.setCell(0, std::move(array));
        array = std::move(outer);
    }
    EXPECT_EQ(array.classID(), tsCELL);
}

TEST(Array, MovesAndIsEmptyThen) {
    Array first = Array::scalar(1);
    const tsArray *const owned = first.get();
    Array second = std::move(first);
    EXPECT_FALSE(first); // NOLINT: that is what is tested
    EXPECT_EQ(second.get(), owned);
    EXPECT_EQ(Array::adopt(second.release()).get(), owned);
    EXPECT_FALSE(second);
}

} // namespace
} // namespace tessel::test
