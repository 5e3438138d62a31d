// tests/guard/allocation_test.cpp: the calls that the library does not survive, and those that come
// before each, with every `operator new` of the guard, the host and the module failing in turn.
// Whatever fails, they do not get through to the library.
#include "fatal_calls.hpp"
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

/// Ends what a row leaves open. What is then there of allocations, behind a call that works.
long aliveAtRest(const Module &netcdf) {
    for (int number = 1; number < 64; ++number) {
        identifierOf([&] { netcdf("abort", number << 16); });
    }
    EXPECT_GT(netcdf("inq_libvers")[0].size(), 0U);
    return allocationsAlive();
}

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
            failures += identifier == "TESSEL:host:outOfMemory" ? 1U : 0U;
            EXPECT_TRUE(identifier == fatal.identifier ||
                        (failed && identifier == "TESSEL:host:outOfMemory"))
                << identifier;
        }
        const long left = aliveAtRest(netcdf) - alive;
        if (n > 0) {
            EXPECT_EQ(left, 0) << "memory is left";
        }
    }
    EXPECT_GT(failures, 0U);
}

INSTANTIATE_TEST_SUITE_P(Rows, FailingAllocations, testing::ValuesIn(fatalCalls()),
                         [](const auto &row) { return row.param.name; });

} // namespace
} // namespace tessel::test
