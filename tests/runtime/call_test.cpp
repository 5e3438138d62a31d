// tests/runtime/call_test.cpp: calls, their inputs and outputs, and the ways in which they end.
#include "support.hpp"
#include "tessel/host.h"

#include <algorithm>
#include <cstdint>
#include <thread>

namespace tessel::test {
namespace {

/// In both modes, with all the modules at hand.
class Calls : public testing::TestWithParam<bool> {
  protected:
    void SetUp() override { setChecked(GetParam()); }
    void TearDown() override { setChecked(false); }

    Module good{testModule("good")};
    Module raising{testModule("raising")};
};
INSTANTIATE_TEST_SUITE_P(Mode, Calls, testing::Bool(),
                         [](const auto &mode) { return mode.param ? "checked" : "unchecked"; });

TEST_P(Calls, SlotsAreNullAtEntry) {
    for (const int outputs : {0, 1, 8}) {
        EXPECT_EQ(callWith(good, {.outputs = outputs}, "empty_slots")[0].number(), 8);
    }
}

TEST_P(Calls, OutputCounts) {
    for (const int outputs :
         {-1, 9, std::numeric_limits<int>::min(), std::numeric_limits<int>::max()}) {
        const std::optional<Error> error =
            raisedBy([&] { callWith(good, {.outputs = outputs}, "nothing"); });
        EXPECT_EQ(error->identifier(), "TESSEL:host:badOutputCount");
        EXPECT_EQ(error->message(), "A call has 0 to 8 outputs.");
    }
}

TEST_P(Calls, OutputsAreWhatTheModuleFilled) {
    EXPECT_EQ(good("nothing").size(), 0U);
    const Results all = callWith(good, {.outputs = 0}, "every_slot");
    EXPECT_EQ(all.size(), 8U);
    EXPECT_EQ(all[7].number(), 7);

    const Results gaps = good("gaps");
    ASSERT_EQ(gaps.size(), 8U);
    for (std::size_t i = 0; i < gaps.size(); ++i) {
        EXPECT_EQ(static_cast<bool>(gaps[i]), i == 0 || i == 2 || i == 7) << i;
    }
    EXPECT_EQ(gaps[7].number(), 7);
}

TEST_P(Calls, ResultsMove) {
    Results first = good("gaps");
    Results second = std::move(first);
    EXPECT_EQ(second[2].number(), 2);
    first = good("add", 1, 2);
    second = std::move(first);
    EXPECT_EQ(second.size(), 1U);
    EXPECT_FALSE(second[2]);
    const Array kept = std::move(second[0]);
    EXPECT_EQ(kept.number(), 3);
}

TEST_P(Calls, ManyInputs) {
    const Array name = Array::text("count_inputs");
    std::vector<const tsArray *> inputs(1'000'000, name.get());
    EXPECT_EQ(good.call(inputs)[0].number(), 1'000'000);
}

TEST_P(Calls, InputsThatAreNotThere) {
    const Array name = Array::text("count_inputs");
    for (std::vector<const tsArray *> inputs :
         {std::vector<const tsArray *>{nullptr}, {name.get(), nullptr}, {nullptr, name.get()}}) {
        const std::optional<Error> error = raisedBy([&] { good.call(inputs); });
        EXPECT_EQ(error->identifier(), "TESSEL:host:missingInput");
        EXPECT_EQ(error->message(), "An input of the call is not there.");
    }
    EXPECT_EQ(identifierOf([&] { good("describe", Array()); }), "TESSEL:host:missingInput");
}

TEST_P(Calls, MoreInputsThanCanBeCounted) {
    const tsArray *none = nullptr;
    const std::span<const tsArray *> inputs(&none, std::size_t{1} << 31U);
    EXPECT_EQ(identifierOf([&] { good.call(inputs); }), "TESSEL:host:tooManyInputs");
}

TEST_P(Calls, NoInputs) {
    const Module netcdf(TESSEL_NETCDF_MODULE);
    EXPECT_EQ(identifierOf([&] { netcdf(); }).substr(0, 14), "TESSEL:netcdf:");
}

TEST_P(Calls, CreatesEachClassInEachShape) {
    for (const tsClassID classID : {tsCHAR, tsCELL, tsDOUBLE, tsSINGLE, tsINT8, tsUINT8, tsINT16,
                                    tsUINT16, tsINT32, tsUINT32, tsINT64, tsUINT64}) {
        const Array column = std::move(good("make", Array::row({6}), static_cast<int>(classID))[0]);
        EXPECT_EQ(column.classID(), classID);
        EXPECT_EQ(std::vector(column.dims().begin(), column.dims().end()),
                  (std::vector<std::size_t>{6, 1}));
        const Array empty =
            std::move(good("make", Array::row({0, 3, 2}), static_cast<int>(classID))[0]);
        EXPECT_EQ(empty.size(), 0U);
        EXPECT_EQ(empty.dims().size(), 3U);
        const auto make = [&](const Array &dims) {
            return identifierOf([&] { good("make", dims, static_cast<int>(classID)); });
        };
        EXPECT_EQ(make(Array::row({})), "TESSEL:host:badDimensions");
        EXPECT_EQ(make(Array::row({0x1p40, 0x1p40})), "TESSEL:host:dimensionsTooLarge");
        if (classID != tsCELL) {
            EXPECT_EQ(make(Array::row({0x1p56})), "TESSEL:host:outOfMemory");
        }
    }
    for (const tsClassID classID : {tsUNKNOWN, tsSTRUCT, tsLOGICAL, tsFUNCTION}) {
        EXPECT_EQ(identifierOf([&] { good("make", Array::row({6}), static_cast<int>(classID)); }),
                  "TESSEL:host:badClass");
    }
}

TEST_P(Calls, Calloc) {
    struct Row {
        std::uint64_t count;
        std::uint64_t size;
        bool given;
    };
    constexpr std::uint64_t most = std::numeric_limits<std::uint64_t>::max();
    constexpr Row rows[] = {
        {1, 1, true},
        {3, 7, true},
        {1000, 1000, true},
        {5'000'000, 1, true},
        {most, 1, false},
        {most, 2, false},
        {std::uint64_t{1} << 32U, std::uint64_t{1} << 32U, false},
        {std::uint64_t{1} << 60U, 1, false},
        {most / 2, 1, false},
    };
    constexpr std::array<std::size_t, 2> one = {1, 1};
    for (const Row &row : rows) {
        const Array count = Array::numeric(tsUINT64, one);
        const Array size = Array::numeric(tsUINT64, one);
        count.elements<std::uint64_t>()[0] = row.count;
        size.elements<std::uint64_t>()[0] = row.size;
        EXPECT_EQ(good("calloc", count, size)[0].number(), row.given ? 1 : 0)
            << row.count << " times " << row.size;
    }
}

TEST_P(Calls, Raises) {
    struct Row {
        const char *action;
        const char *identifier;
        const char *message;
        int destroyed;
    };
    constexpr Row rows[] = {
        {"int", "TESSEL:host:foreignException",
         "An exception that is not the host's left the module.", 1},
        {"runtime_error", "TESSEL:host:foreignException",
         "An exception that is not the host's left the module: the library is unhappy", 1},
        {"bad_alloc", "TESSEL:host:outOfMemory", "Out of memory.", 1},
        {"local", "TESSEL:host:foreignException",
         "An exception that is not the host's left the module: bytes \xc3\xbf and \xc3\xa9", 1},
        {"plain", "test:plain", "Plain.", 1},
        {"latin1", "test:\xc3\xa9", "caf\xc3\xa9 and caf\xc3\xa9", 0},
        {"format", "test:format", "-3 of 16, 12.35% \"100% %s\" x", 0},
        {"no such action", "test:noSuchAction", "There is no action \"no such action\".", 0},
    };
    raising("take_destroyed");
    for (const Row &row : rows) {
        SCOPED_TRACE(row.action);
        const std::optional<Error> error = raisedBy([&] { raising(row.action); });
        EXPECT_EQ(error->identifier(), row.identifier);
        EXPECT_EQ(error->message(), row.message);
        EXPECT_EQ(raising("take_destroyed")[0].number(), row.destroyed);
    }
    EXPECT_EQ(identifierOf([&] { raising("length_error"); }), "TESSEL:host:foreignException");
    EXPECT_EQ(raising("take_destroyed")[0].number(), 1);
}

TEST_P(Calls, RaisesWhatAUserTyped) {
    struct Row {
        const char *identifier;
        const char *text;
    };
    constexpr Row rows[] = {
        {"a:b", "100% %s %n %d"}, {"", "no identifier"}, {"%s:%d", "%"},
        {"über:水", "größe 🌊"},   {"a:b", ""},
    };
    for (const Row &row : rows) {
        const std::optional<Error> error =
            raisedBy([&] { raising("text", row.identifier, row.text); });
        EXPECT_EQ(error->identifier(), row.identifier);
        EXPECT_EQ(error->message(), std::string("<").append(row.text).append(">"));
    }
}

TEST_P(Calls, RaisesLongMessages) {
    for (const int length : {511, 512, 513, 1024, 4096, 1'000'000}) {
        EXPECT_EQ(messageOf([&] { raising("long", length); }),
                  std::string(static_cast<std::size_t>(length) - 1, ' ') + "7");
    }
}

TEST_P(Calls, OutputsBeforeARaiseAreDiscarded) {
    CallReport report;
    EXPECT_EQ(identifierOf([&] { callWith(good, {.report = &report}, "outputs_then_raise"); }),
              "test:late");
    EXPECT_EQ(report.allocations, 3U); // the action's name, too
    EXPECT_EQ(report.arraysLeft, GetParam() ? 2U : 0U);
    EXPECT_EQ(report.blocksLeft, 0U);
}

TEST_P(Calls, FailsTheAllocationThatItIsToldTo) {
    CallReport report;
    EXPECT_EQ(callWith(good, {.report = &report}, "one_of_each").size(), 1U);
    EXPECT_EQ(report.allocations, 7U); // the action's name, and six
    for (std::size_t n = 1; n <= report.allocations; ++n) {
        SCOPED_TRACE(n);
        CallReport failed;
        EXPECT_EQ(identifierOf([&] {
                      callWith(good, {.failAllocation = n, .report = &failed}, "one_of_each");
                  }),
                  n == 6 ? "test:noBlock" : "TESSEL:host:outOfMemory");
        EXPECT_EQ(failed.allocations, n);
    }
    EXPECT_EQ(callWith(good, {.failAllocation = report.allocations + 1}, "one_of_each").size(), 1U);
}

TEST_P(Calls, AReportIsOfItsCallOnly) {
    CallReport report{.allocations = 99, .blocksLeft = 99, .arraysLeft = 99};
    callWith(good, {.report = &report}, "nothing");
    EXPECT_EQ(report.allocations, 1U);
    EXPECT_EQ(report.blocksLeft, 0U);
    EXPECT_EQ(report.arraysLeft, 0U);
}

TEST_P(Calls, CellsAreFilledFromOutsideInwards) {
    const Results results = good("nest", 300);
    const Array *cell = &results[0];
    int depth = 0;
    while (cell->classID() == tsCELL) {
        cell = &cell->cellAt(0);
        ++depth;
    }
    EXPECT_EQ(depth, 301);
    EXPECT_EQ(cell->utf8(), "innermost");
}

TEST_P(Calls, CellValuesAreReplaced) {
    const Results results = good("replace");
    EXPECT_EQ(results[0].cellAt(0).utf8(), "second");
    EXPECT_FALSE(results[1].cellAt(0));
}

/// What the function of a nested call raised.
std::optional<Error> nestedError;
const Module *nestedModule = nullptr;

void callNested() {
    nestedError = raisedBy([] { (*nestedModule)("nothing"); });
}

TEST_P(Calls, Nested) {
    nestedModule = &raising;
    good("call_back", pointerArray(callNested));
    EXPECT_EQ(nestedError->identifier(), "TESSEL:host:nestedCall");
    EXPECT_EQ(nestedError->message(), "A module cannot be called from within a call.");
    EXPECT_EQ(good("add", 1, 2)[0].number(), 3);
}

void loadNested() {
    const Module faulty(testModule("faulty"));
}

TEST_P(Calls, LoadingAndUnloadingWithinACallDoesNotWaitForItself) {
    good("call_back", pointerArray(loadNested));
    EXPECT_EQ(good("add", 1, 2)[0].number(), 3);
}

TEST_P(Calls, TheHostsFunctionsOutsideOfACall) {
    constexpr std::array<std::size_t, 2> dims = {1, 1};
    const Array text = Array::text("x");
    Array cell = Array::cell(dims);
    EXPECT_EQ(identifierOf([] { tsCreateDoubleScalar(1); }), "TESSEL:host:noCall");
    EXPECT_EQ(identifierOf([] { tsCreateString(""); }), "TESSEL:host:noCall");
    EXPECT_EQ(identifierOf([&] { tsCreateUninitNumericArray(2, dims.data(), tsDOUBLE); }),
              "TESSEL:host:noCall");
    EXPECT_EQ(identifierOf([&] { tsCreateCharArray(2, dims.data()); }), "TESSEL:host:noCall");
    EXPECT_EQ(identifierOf([&] { tsCreateCellArray(2, dims.data()); }), "TESSEL:host:noCall");
    EXPECT_EQ(identifierOf([&] { tsSetCell(cell.get(), 0, nullptr); }), "TESSEL:host:noCall");
    EXPECT_EQ(identifierOf([&] { tsArrayToString(text.get()); }), "TESSEL:host:noCall");
    EXPECT_EQ(tsCalloc(1, 1), nullptr);
    tsFree(nullptr);
    EXPECT_TRUE(tsIsInf(-std::numeric_limits<double>::infinity()));
    EXPECT_FALSE(tsIsInf(std::numeric_limits<double>::quiet_NaN()));
    EXPECT_FALSE(tsIsInf(std::numeric_limits<double>::max()));
    EXPECT_TRUE(tsIsNaN(std::numeric_limits<double>::quiet_NaN()));
    EXPECT_FALSE(tsIsNaN(std::numeric_limits<double>::infinity()));
}

TEST_P(Calls, TheHostsFunctionsOnAnotherThread) {
    EXPECT_EQ(raising("other_thread")[0].number(), 1);
}

TEST_P(Calls, AThreadThatEndsWithinACallIsUnwound) {
    if (sanitized) {
        GTEST_SKIP() << "the sanitizer takes the exception of an ending thread for a fault";
    }
    raising("take_destroyed");
    std::thread([&] {
        raising("exit_thread");
        ADD_FAILURE() << "the thread went on";
    }).join();
    EXPECT_EQ(raising("take_destroyed")[0].number(), 1); // and the lock is free
}

} // namespace
} // namespace tessel::test
