// tests/guard/allocation_test.cpp: the calls that the library does not survive, those that come
// before each, and the lives of datasets that all goes well with. Each `operator new` of the guard,
// the host and the module fails in turn, and whatever the module asks the host for, also where the
// guard asks the module. Whatever fails, nothing gets through to the library that it does not
// survive, and no memory is left.
#include "fatal_calls.hpp"
#include "support/at_rest.hpp"
#include "support/failing_new.hpp"

namespace tessel::test {
namespace {

/// The guard, with allocations counted while it looks at a call, until it was told of its end.
class Counted : public Watcher {
  public:
    void before(Inputs inputs, const Ask &ask) override {
        Failing::count(true);
        try {
            guard->before(inputs, ask);
        } catch (...) {
            Failing::count(false);
            throw;
        }
    }
    void after(Inputs inputs, const Results &results, const Error *error) noexcept override {
        guard->after(inputs, results, error);
        Failing::count(false);
    }

  private:
    std::shared_ptr<Watcher> guard = netcdfGuard();
};

/// In the checked mode each array is an allocation of its own, and what a call leaves is an error.
class Checked : public testing::Environment {
  public:
    void SetUp() override { setChecked(true); }
};
const testing::Environment *const checked = testing::AddGlobalTestEnvironment(new Checked);

/// Lives of datasets. The guard asks for what it wants to know of variables, records and modes.
const Fatal lives[] = {
    {"MadeAndWritten", 0, "", "",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = newDataset(netcdf, folder.file("a.nc"));
         netcdf("put_var1_double", ncid, 1, Array::row({0, 5}), 1);
         netcdf("put_vara_double", ncid, 1, Array::row({0, 6}), Array::row({1, 2}),
                Array::row({1, 2}));
         netcdf("put_vars_double", ncid, 1, Array::row({0, 9}), Array::row({2, 1}),
                Array::row({3, 1}), Array::row({1, 2}));
         netcdf("sync", ncid);
         netcdf("redef", ncid);
         netcdf("def_var", ncid, "letters", ncChar, 1);
         netcdf("put_att_text", ncid, 2, "units", "none");
         netcdf("_enddef", ncid, 100, 4, 0, 4);
         netcdf("put_var_text", ncid, 2, "0123456789");
         netcdf("close", ncid);
     }},
    {"OpenedAndRead", 0, "", "",
     [](const Module &netcdf, const Folder &folder) {
         netcdf("close", newDataset(netcdf, folder.file("a.nc")));
         const int ncid = intOf(netcdf("open", folder.file("a.nc"), "WRITE"));
         netcdf("put_var1_double", ncid, 1, Array::row({3, 2}), 7);
         netcdf("close", ncid);
         const int again = intOf(netcdf("open", folder.file("a.nc"), "NOWRITE"));
         netcdf("sync", again);
         EXPECT_EQ(netcdf("get_var_double", again, 1)[0].size(), 30U);
         EXPECT_EQ(netcdf("get_var1_double", again, 1, Array::row({3, 2}))[0].number(), 7);
         netcdf("close", again);
     }},
    {"WithDefinitionsThatCannotBeEnded", 0, "", "",
     [](const Module &netcdf, const Folder &folder) {
         const int ncid = unclosable(netcdf, folder);
         wantError("TESSEL:netcdf:endDef:invalidDataType", [&] { netcdf("enddef", ncid); });
         wantError("TESSEL:netcdf:close:invalidDataType", [&] { netcdf("close", ncid); });
         netcdf("put_att_double", ncid, 0, "_FillValue", ncInt, 1);
         netcdf("close", ncid);
     }},
};

class FailingAllocations : public testing::TestWithParam<Fatal> {};

TEST_P(FailingAllocations, LetNothingThrough) {
    const Fatal &fatal = GetParam();
    const Module netcdf = plainModule().watchedBy(std::make_shared<Counted>());
    bool failed = true;
    std::size_t failures = 0;
    for (std::size_t n = 0; failed; ++n) {
        SCOPED_TRACE("allocation " + std::to_string(n) + " fails");
        const long alive = aliveAtRest(netcdf);
        {
            const Folder folder;
            const Failing failing(n, false);
            const std::string identifier = identifierOf([&] { fatal.call(netcdf, folder); });
            failed = n == 0 || Failing::met(); // the first time is for what is allocated once
            const bool noMemory = identifier == "TESSEL:host:outOfMemory" ||
                                  identifier.ends_with(":memoryAllocationFailure");
            failures += noMemory ? 1U : 0U;
            EXPECT_TRUE(identifier == fatal.identifier || (failed && noMemory)) << identifier;
        }
        const long left = aliveAtRest(netcdf) - alive;
        if (n > 0) {
            EXPECT_EQ(left, 0) << "memory is left";
        }
    }
    EXPECT_GT(failures, 0U);
}

INSTANTIATE_TEST_SUITE_P(Lives, FailingAllocations, testing::ValuesIn(lives),
                         [](const auto &row) { return row.param.name; });
INSTANTIATE_TEST_SUITE_P(Rows, FailingAllocations, testing::ValuesIn(fatalCalls()),
                         [](const auto &row) { return row.param.name; });

} // namespace
} // namespace tessel::test
