// tests/runtime/violation_test.cpp: modules that break their promises.
#include "support.hpp"

#include <cstdint>

namespace tessel::test {
namespace {

constexpr const char *wroteOutside =
    "The module broke a promise: it wrote outside of a block or an array";
constexpr const char *changedInput = "The module broke a promise: it changed an input";
constexpr const char *freedWrongly =
    "The module broke a promise: it freed memory that was not the call's, or freed it twice";

/// What checked mode finds, and what it says.
struct FaultRow {
    const char *action;
    const char *message;
};
constexpr FaultRow faults[] = {
    {"overrun_block", wroteOutside},      {"underrun_block", wroteOutside},
    {"overrun_block_left", wroteOutside}, {"overrun_array", wroteOutside},
    {"underrun_array", wroteOutside},     {"overrun_array_left", wroteOutside},
    {"overrun_then_raise", wroteOutside}, {"change_input", changedInput},
    {"overrun_input", wroteOutside},      {"free_twice", freedWrongly},
    {"free_foreign", freedWrongly},       {"free_data", freedWrongly},
};

TEST(Violation, IsFoundInCheckedMode) {
    const Checked checked;
    const Module faulty(testModule("faulty"));
    for (const FaultRow &row : faults) {
        SCOPED_TRACE(row.action);
        const Array input = Array::row({1, 2, 3});
        const std::optional<Error> error = raisedBy([&] { faulty(row.action, input); });
        EXPECT_EQ(error->identifier(), "TESSEL:host:violation");
        EXPECT_EQ(error->message(), row.message);
    }
}

TEST(Violation, EveryClassOfInputIsWatched) {
    const Checked checked;
    const Module faulty(testModule("faulty"));
    constexpr std::array<std::size_t, 1> dims = {3};
    std::vector<double> lent(3);
    const Array inputs[] = {Array::scalar(1),
                            Array::text("x"),
                            Array::logical(dims),
                            Array::numeric(tsINT8, dims),
                            Array::numeric(tsINT64, dims, true),
                            Array::borrowed(tsDOUBLE, dims, lent.data(), nullptr)};
    for (const Array &input : inputs) {
        EXPECT_EQ(messageOf([&] { faulty("change_input", input); }), changedInput);
    }
}

TEST(Violation, IsNotFoundWhereThereIsNone) {
    const Checked checked;
    const Module good(testModule("good"));
    const Array input = Array::row({1, 2, 3});
    EXPECT_EQ(good("describe", input)[0].elements<double>()[3], 3);
    EXPECT_EQ(good("one_of_each").size(), 1U);
    EXPECT_EQ(good("text", "größe")[0].utf8(), "größe");
}

TEST(Violation, InputsOfUncheckedTimesAreWatchedToo) {
    const Array input = Array::row({1, 2, 3});
    const Checked checked;
    const Module faulty(testModule("faulty"));
    EXPECT_EQ(messageOf([&] { faulty("change_input", input); }), changedInput);
}

TEST(Violation, LeftBehindIsCounted) {
    const Checked checked;
    const Module faulty(testModule("faulty"));
    const Module good(testModule("good"));
    CallReport report;
    callWith(faulty, {.report = &report}, "leave");
    EXPECT_EQ(report.blocksLeft, 2U);
    EXPECT_EQ(report.arraysLeft, 3U);
    EXPECT_EQ(report.allocations, 6U);
    callWith(good, {.report = &report}, "one_of_each");
    EXPECT_EQ(report.blocksLeft, 1U);
    EXPECT_EQ(report.arraysLeft, 2U);
    callWith(good, {.report = &report}, "text", "nothing is left");
    EXPECT_EQ(report.blocksLeft, 0U);
    EXPECT_EQ(report.arraysLeft, 0U);
}

TEST(Violation, DataWithoutValuesHaveAPattern) {
    const Checked checked;
    const Module good(testModule("good"));
    const Results made = good("make", Array::row({100}), tsUINT8);
    for (const std::uint8_t byte : made[0].elements<std::uint8_t>()) {
        ASSERT_EQ(byte, 0xC5);
    }
}

/// What the host refuses in either mode.
struct RefusalRow {
    const char *action;
    const char *identifier;
};
constexpr RefusalRow refusals[] = {
    {"give_input", "TESSEL:host:badOwner"},     {"give_twice", "TESSEL:host:badOwner"},
    {"give_cells_own", "TESSEL:host:badOwner"}, {"cell_out_of_range", "TESSEL:host:badIndex"},
    {"cell_of_number", "TESSEL:host:badClass"}, {"cell_value_twice", "TESSEL:host:badOwner"},
    {"cell_of_input", "TESSEL:host:badOwner"},  {"cell_into_input", "TESSEL:host:badOwner"},
    {"cell_itself", "TESSEL:host:badOwner"},    {"cell_cycle", "TESSEL:host:badOwner"},
};

void expectRefusals() {
    const Module faulty(testModule("faulty"));
    constexpr std::array<std::size_t, 1> dims = {1};
    Array input = Array::cell(dims);
    input.setCell(0, Array::text("untouched"));
    for (const RefusalRow &row : refusals) {
        SCOPED_TRACE(row.action);
        EXPECT_EQ(identifierOf([&] { faulty(row.action, input); }), row.identifier);
        EXPECT_EQ(input.cellAt(0).utf8(), "untouched");
    }
}

TEST(Refusal, Unchecked) {
    expectRefusals();
}

TEST(Refusal, Checked) {
    const Checked checked;
    expectRefusals();
    const Module faulty(testModule("faulty"));
    EXPECT_EQ(identifierOf([&] { faulty("give_replaced"); }), "TESSEL:host:badOwner");
}

} // namespace
} // namespace tessel::test
